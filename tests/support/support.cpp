#include "support/support.h"

#include "base/module_reset.h"
#include "base/settings.h"
#include "base/state.h"
#include "modes/mode_list.h"

// Declared for Vista and later only.
extern "C" LONG WINAPI RegDeleteTreeA(HKEY key, LPCSTR subkey);
extern "C" LONG WINAPI RegSetKeyValueW(HKEY key, LPCWSTR subkey, LPCWSTR name, DWORD type, LPCVOID data, DWORD size);

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
    // Wine, like NT, adds a terminator the caller left out when a zero follows
    // the data; with something else there it stores the bytes given, as 9x does.
    std::wstring wide_path(path.begin(), path.end()), wide_name(name.begin(), name.end()),
        wide_value(value.begin(), value.end());
    wide_value += terminated ? L'\0' : L'#';
    RegSetKeyValueW(root, wide_path.c_str(), wide_name.c_str(), REG_SZ, wide_value.c_str(),
                    (DWORD)((wide_value.size() - !terminated) * sizeof(wchar_t)));
}

std::string ReadRegistryRaw(HKEY root, const std::string& path, const std::string& name, bool* found, DWORD* type)
{
    HKEY key;
    char data[1024];
    DWORD size = 0, value_type = 0;
    LONG r = RegOpenKeyExA(root, path.c_str(), 0, KEY_READ, &key);
    if (r == ERROR_SUCCESS) {
        // The stored size first: given room, a read appends a terminator the data may lack.
        r = RegQueryValueExA(key, name.c_str(), NULL, &value_type, NULL, &size);
        if (r == ERROR_SUCCESS && size > sizeof data) r = ERROR_MORE_DATA;
        if (r == ERROR_SUCCESS) r = RegQueryValueExA(key, name.c_str(), NULL, NULL, (BYTE*)data, &size);
        RegCloseKey(key);
    }
    if (found) *found = r == ERROR_SUCCESS;
    if (type) *type = value_type;
    return r == ERROR_SUCCESS ? std::string(data, size) : "";
}

bool RegistryKeyExists(HKEY root, const std::string& path)
{
    HKEY key;
    return RegOpenKeyExA(root, path.c_str(), 0, KEY_READ, &key) == ERROR_SUCCESS && RegCloseKey(key) == ERROR_SUCCESS;
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
    FILE* f = fopen(path.c_str(), "wb");
    if (f) fwrite(text.data(), 1, text.size(), f), fclose(f);
}

std::string SimBuildFolder()
{
    char dir[MAX_PATH] = "";
    GetEnvironmentVariableA("VISTREL_SIM_DIR", dir, sizeof dir);
    return std::string("Z:") + dir + "/";  // Wine takes '/' for '\'
}

std::string CopySimBuild(const char* prefix)
{
    std::string from = SimBuildFolder(), to = MakeScratchFolder(prefix);
    WIN32_FIND_DATAA found;
    HANDLE search = FindFirstFileA((from + "*").c_str(), &found);
    for (bool more = search != INVALID_HANDLE_VALUE; more; more = FindNextFileA(search, &found))
        if (!(found.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY))
            CopyFileA((from + found.cFileName).c_str(), (to + found.cFileName).c_str(), FALSE);
    if (search != INVALID_HANDLE_VALUE) FindClose(search);
    return to;
}

bool ChildProcess::Start(std::string line, const std::string& folder)
{
    STARTUPINFOA si = {sizeof si};
    return CreateProcessA(NULL, &line[0], NULL, NULL, FALSE, 0, NULL, folder.empty() ? NULL : folder.c_str(), &si,
                          &info) != 0;
}

long ChildProcess::WaitExit(DWORD ms)
{
    DWORD code = 0;
    bool ended = info.hProcess && WaitForSingleObject(info.hProcess, ms) == WAIT_OBJECT_0;
    return ended && GetExitCodeProcess(info.hProcess, &code) ? (long)code : -1;
}

void ChildProcess::Kill()
{
    if (info.hProcess && TerminateProcess(info.hProcess, 1)) WaitForSingleObject(info.hProcess, 5000);
    if (info.hProcess) CloseHandle(info.hProcess), CloseHandle(info.hThread);
    info = PROCESS_INFORMATION();
}

static DialogAnswerer* active_answerer;  // while its hook is set
static HHOOK answer_hook;

static std::string ClassOf(HWND window)
{
    char name[32] = "";
    GetClassNameA(window, name, sizeof name);
    return name;
}

static BOOL CALLBACK ReadStatic(HWND child, LPARAM data)
{
    std::string* out = (std::string*)data;
    char text[512];
    if (ClassOf(child) == "Static" && GetWindowTextA(child, text, sizeof text) > 0)
        *out += (out->empty() ? "" : "\n") + std::string(text);
    return TRUE;
}

// The box gives its button the focus in WM_INITDIALOG and becomes active
// afterwards: answer then.
static LRESULT CALLBACK AnswerHook(int code, WPARAM wparam, LPARAM lparam)
{
    DialogAnswerer* a = active_answerer;
    HWND window = (HWND)wparam;
    char caption[256];
    if (code == HCBT_SETFOCUS && a && !a->answered && ClassOf(GetParent(window)) == "#32770")
        a->default_button = GetDlgCtrlID(window);
    if (code == HCBT_ACTIVATE && a && !a->answered && ClassOf(window) == "#32770") {
        GetWindowTextA(window, caption, sizeof caption);
        a->caption = caption;
        EnumChildWindows(window, ReadStatic, (LPARAM)&a->text);
        a->answered = 1;
        if (a->while_asked) a->while_asked();
        PostMessageA(window, WM_COMMAND, MAKEWPARAM(a->button, BN_CLICKED), (LPARAM)GetDlgItem(window, a->button));
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
    while (int r = rates.size() < 40 ? RefreshRateAt((int)rates.size(), width, height, bits) : 0) rates.push_back(r);
    return rates;
}
