#include "support/support.h"

#include "base/module_reset.h"
#include "base/settings.h"
#include "base/state.h"
#include "modes/mode_list.h"

extern "C" LONG WINAPI RegDeleteTreeA(HKEY key, LPCSTR subkey);  // declared for Vista and later only

void ResetProgramState(const std::string& text_ini, const std::string& chip_ini)
{
    ResetAllModules();
    std::string folder = MakeScratchFolder("ini");
    lstrcpynA(text_ini_path, (text_ini.empty() ? folder + "ZNTR2.INI" : text_ini).c_str(), sizeof text_ini_path);
    lstrcpynA(chip_ini_path, (chip_ini.empty() ? folder + "ZNTR3.INI" : chip_ini).c_str(), sizeof chip_ini_path);
}

void ClearSettingsStore() { DeleteRegistryTree(HKEY_LOCAL_MACHINE, settings_program_key); }

void DeleteRegistryTree(HKEY root, const std::string& path) { RegDeleteTreeA(root, path.c_str()); }

void WriteRegistryString(HKEY root, const std::string& path, const std::string& name, const std::string& value,
                         bool terminated)
{
    HKEY key;
    if (RegCreateKeyExA(root, path.c_str(), 0, NULL, 0, KEY_ALL_ACCESS, NULL, &key, NULL) != ERROR_SUCCESS) return;
    // Wine, like NT, adds a terminator the caller left out when a zero follows
    // the data; with something else there it stores the bytes given, as 9x does.
    std::wstring wide_name(name.begin(), name.end()), wide_value(value.begin(), value.end());
    wide_value += terminated ? L'\0' : L'#';
    RegSetValueExW(key, wide_name.c_str(), 0, REG_SZ, (const BYTE*)wide_value.c_str(),
                   (DWORD)((wide_value.size() - !terminated) * sizeof(wchar_t)));
    RegCloseKey(key);
}

std::string ReadRegistryRaw(HKEY root, const std::string& path, const std::string& name, bool* found, DWORD* type)
{
    if (found) *found = false;
    HKEY key;
    if (RegOpenKeyExA(root, path.c_str(), 0, KEY_READ, &key) != ERROR_SUCCESS) return "";
    // The stored size first: given room, a read appends a terminator the data may lack.
    char data[1024];
    DWORD size = 0, value_type = 0;
    LONG r = RegQueryValueExA(key, name.c_str(), NULL, &value_type, NULL, &size);
    if (r == ERROR_SUCCESS && size <= sizeof data) r = RegQueryValueExA(key, name.c_str(), NULL, &value_type, (BYTE*)data, &size);
    RegCloseKey(key);
    if (r != ERROR_SUCCESS || size > sizeof data) return "";
    if (found) *found = true;
    if (type) *type = value_type;
    return std::string(data, size);
}

bool RegistryKeyExists(HKEY root, const std::string& path)
{
    HKEY key;
    if (RegOpenKeyExA(root, path.c_str(), 0, KEY_READ, &key) != ERROR_SUCCESS) return false;
    RegCloseKey(key);
    return true;
}

std::string MakeScratchFolder(const char* prefix)
{
    static unsigned counter;
    char temp[MAX_PATH], folder[MAX_PATH];
    GetTempPathA(sizeof temp, temp);
    do snprintf(folder, sizeof folder, "%svistrel-%s-%lu-%u\\", temp, prefix, GetCurrentProcessId(), ++counter);
    while (!CreateDirectoryA(folder, NULL));
    return folder;
}

void WriteTextFile(const std::string& path, const std::string& text)
{
    HANDLE f = CreateFileA(path.c_str(), GENERIC_WRITE, 0, NULL, CREATE_ALWAYS, 0, NULL);
    DWORD written;
    if (f == INVALID_HANDLE_VALUE) return;
    WriteFile(f, text.data(), (DWORD)text.size(), &written, NULL);
    CloseHandle(f);
}

std::string CopySimBuild(const char* prefix)
{
    char dir[MAX_PATH] = "";
    GetEnvironmentVariableA("VISTREL_SIM_DIR", dir, sizeof dir);
    std::string from = std::string("Z:") + dir + "\\", to = MakeScratchFolder(prefix);
    for (char& c : from)
        if (c == '/') c = '\\';
    WIN32_FIND_DATAA found;
    HANDLE search = FindFirstFileA((from + "*").c_str(), &found);
    if (search == INVALID_HANDLE_VALUE) return to;
    do {
        if (!(found.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY))
            CopyFileA((from + found.cFileName).c_str(), (to + found.cFileName).c_str(), FALSE);
    } while (FindNextFileA(search, &found));
    FindClose(search);
    return to;
}

bool ChildProcess::Start(const std::string& command_line, const std::string& folder)
{
    STARTUPINFOA si = {sizeof si};
    std::string line = command_line;
    return CreateProcessA(NULL, &line[0], NULL, NULL, FALSE, 0, NULL, folder.empty() ? NULL : folder.c_str(), &si,
                          &info) != 0;
}

long ChildProcess::WaitExit(DWORD ms)
{
    DWORD code = 0;
    if (!info.hProcess || WaitForSingleObject(info.hProcess, ms) != WAIT_OBJECT_0) return -1;
    GetExitCodeProcess(info.hProcess, &code);
    return (long)code;
}

void ChildProcess::Kill()
{
    if (!info.hProcess) return;
    if (TerminateProcess(info.hProcess, 1)) WaitForSingleObject(info.hProcess, 5000);
    CloseHandle(info.hProcess);
    CloseHandle(info.hThread);
    info = PROCESS_INFORMATION();
}

ChildProcess::~ChildProcess() { Kill(); }

void SetWineVersionFor(const std::string& exe_name, const std::string& version)
{
    WriteRegistryString(HKEY_CURRENT_USER, "Software\\Wine\\AppDefaults\\" + exe_name, "Version", version);
}

static DialogAnswerer* active_answerer;
static HHOOK answer_hook;

static BOOL CALLBACK ReadStatic(HWND child, LPARAM data)
{
    std::string* out = (std::string*)data;
    char cls[32], text[512];
    GetClassNameA(child, cls, sizeof cls);
    if (lstrcmpiA(cls, "Static") == 0 && GetWindowTextA(child, text, sizeof text) > 0)
        *out += (out->empty() ? "" : "\n") + std::string(text);
    return TRUE;
}

static bool IsDialog(HWND window)
{
    char cls[32] = "";
    return window && GetClassNameA(window, cls, sizeof cls) && lstrcmpA(cls, "#32770") == 0;
}

// The box gives its button the focus in WM_INITDIALOG and becomes active
// afterwards: answer then.
static LRESULT CALLBACK AnswerHook(int code, WPARAM wparam, LPARAM lparam)
{
    DialogAnswerer* a = active_answerer;
    char caption[256];
    if (code == HCBT_SETFOCUS && a && !a->answered && IsDialog(GetParent((HWND)wparam)))
        a->default_button = GetDlgCtrlID((HWND)wparam);
    if (code == HCBT_ACTIVATE && a && !a->answered && IsDialog((HWND)wparam)) {
        HWND box = (HWND)wparam;
        GetWindowTextA(box, caption, sizeof caption);
        a->caption = caption;
        EnumChildWindows(box, ReadStatic, (LPARAM)&a->text);
        a->answered = 1;
        PostMessageA(box, WM_COMMAND, MAKEWPARAM(a->button, BN_CLICKED), (LPARAM)GetDlgItem(box, a->button));
    }
    return CallNextHookEx(answer_hook, code, wparam, lparam);
}

DialogAnswerer::DialogAnswerer(int button_id) : button(button_id)
{
    active_answerer = this;
    answer_hook = SetWindowsHookExA(WH_CBT, AnswerHook, NULL, GetCurrentThreadId());
}

DialogAnswerer::~DialogAnswerer()
{
    UnhookWindowsHookEx(answer_hook);
    active_answerer = nullptr;
}

std::vector<int> OfferedRates(int width, int height, int bits)
{
    std::vector<int> rates;
    for (int r; rates.size() < 40 && (r = RefreshRateAt((int)rates.size(), width, height, bits)) > 0;) rates.push_back(r);
    return rates;
}

bool PumpUntil(bool (*condition)(void*), void* data, DWORD ms)
{
    for (DWORD start = GetTickCount();;) {
        MSG msg;
        while (PeekMessageA(&msg, NULL, 0, 0, PM_REMOVE)) {
            TranslateMessage(&msg);
            DispatchMessageA(&msg);
        }
        if (condition(data)) return true;
        if (GetTickCount() - start >= ms) return false;
        MsgWaitForMultipleObjects(0, NULL, FALSE, 20, QS_ALLINPUT);
    }
}
