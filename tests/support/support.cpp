#include "support/support.h"

#include <string.h>

#include <vector>

#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/settings.h"
#include "base/state.h"
#include "hardware/driver_key.h"
#include "hardware/register_access.h"
#include "modes/display_settings.h"
#include "modes/mode_keys.h"
#include "modes/mode_list.h"
#include "modes/position.h"
#include "modes/rate_list.h"

void ResetProgramState(const std::string& text_ini, const std::string& chip_ini)
{
    ResetAllModules();
    std::string folder = MakeScratchFolder("ini");
    std::string text = text_ini.empty() ? folder + "ZNTR2.INI" : text_ini;
    std::string chip = chip_ini.empty() ? folder + "ZNTR3.INI" : chip_ini;
    lstrcpynA(text_ini_path, text.c_str(), sizeof text_ini_path);
    lstrcpynA(chip_ini_path, chip.c_str(), sizeof chip_ini_path);
}

void ClearSettingsStore() { DeleteRegistryTree(HKEY_LOCAL_MACHINE, settings_program_key); }

void DeleteRegistryTree(HKEY root, const std::string& path)
{
    HKEY key;
    if (RegOpenKeyExA(root, path.c_str(), 0, KEY_ALL_ACCESS, &key) != ERROR_SUCCESS) return;
    std::vector<std::string> children;
    char name[256];
    for (DWORD i = 0;; ++i) {
        DWORD size = sizeof name;
        if (RegEnumKeyExA(key, i, name, &size, NULL, NULL, NULL, NULL) != ERROR_SUCCESS) break;
        children.push_back(name);
    }
    RegCloseKey(key);
    for (const std::string& child : children) DeleteRegistryTree(root, path + "\\" + child);
    RegDeleteKeyA(root, path.c_str());
}

void WriteRegistryString(HKEY root, const std::string& path, const std::string& name, const std::string& value,
                         bool terminated)
{
    HKEY key;
    if (RegCreateKeyExA(root, path.c_str(), 0, NULL, 0, KEY_ALL_ACCESS, NULL, &key, NULL) != ERROR_SUCCESS) return;
    if (terminated) {
        RegSetValueExA(key, name.c_str(), 0, REG_SZ, (const BYTE*)value.c_str(), (DWORD)value.size() + 1);
    } else {
        // Like Windows NT, Wine counts a terminator the caller forgot when
        // one follows the data; with something else there it stores exactly
        // the bytes given, as Windows 9x does.
        std::wstring wide_name(name.begin(), name.end()), wide_value(value.begin(), value.end());
        wide_value += L'#';
        RegSetValueExW(key, wide_name.c_str(), 0, REG_SZ, (const BYTE*)wide_value.c_str(),
                       (DWORD)((wide_value.size() - 1) * sizeof(wchar_t)));
    }
    RegCloseKey(key);
}

std::string ReadRegistryRaw(HKEY root, const std::string& path, const std::string& name, bool* found, DWORD* type)
{
    if (found) *found = false;
    HKEY key;
    if (RegOpenKeyExA(root, path.c_str(), 0, KEY_READ, &key) != ERROR_SUCCESS) return "";
    // Ask the stored size first: given room, a read appends a terminator
    // that the stored data may lack.
    char data[1024];
    DWORD size = 0, value_type = 0;
    LONG r = RegQueryValueExA(key, name.c_str(), NULL, &value_type, NULL, &size);
    if (r == ERROR_SUCCESS && size <= sizeof data) r = RegQueryValueExA(key, name.c_str(), NULL, &value_type, (BYTE*)data, &size);
    RegCloseKey(key);
    if (r != ERROR_SUCCESS) return "";
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
    char temp[MAX_PATH];
    GetTempPathA(sizeof temp, temp);
    for (;;) {
        char folder[MAX_PATH];
        snprintf(folder, sizeof folder, "%svistrel-%s-%lu-%u\\", temp, prefix, GetCurrentProcessId(), ++counter);
        if (CreateDirectoryA(folder, NULL)) return folder;
    }
}

void WriteTextFile(const std::string& path, const std::string& text)
{
    HANDLE f = CreateFileA(path.c_str(), GENERIC_WRITE, 0, NULL, CREATE_ALWAYS, 0, NULL);
    if (f == INVALID_HANDLE_VALUE) return;
    DWORD written;
    WriteFile(f, text.data(), (DWORD)text.size(), &written, NULL);
    CloseHandle(f);
}

std::string WindowsPathOf(const std::string& unix_path)
{
    std::string path = "Z:" + unix_path;
    for (char& c : path)
        if (c == '/') c = '\\';
    return path;
}

std::string SimBuildFolder()
{
    char dir[MAX_PATH];
    DWORD n = GetEnvironmentVariableA("VISTREL_SIM_DIR", dir, sizeof dir);
    std::string folder = n && n < sizeof dir ? WindowsPathOf(dir) : "";
    if (!folder.empty() && folder.back() != '\\') folder += '\\';
    return folder;
}

std::string CopySimBuild(const char* prefix)
{
    std::string from = SimBuildFolder(), to = MakeScratchFolder(prefix);
    WIN32_FIND_DATAA found;
    HANDLE search = FindFirstFileA((from + "*").c_str(), &found);
    if (search == INVALID_HANDLE_VALUE) return to;
    do {
        if (found.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) continue;
        CopyFileA((from + found.cFileName).c_str(), (to + found.cFileName).c_str(), FALSE);
    } while (FindNextFileA(search, &found));
    FindClose(search);
    return to;
}

bool ChildProcess::Start(const std::string& command_line, const std::string& folder)
{
    STARTUPINFOA si = {};
    si.cb = sizeof si;
    std::vector<char> line(command_line.begin(), command_line.end());
    line.push_back(0);
    return CreateProcessA(NULL, line.data(), NULL, NULL, FALSE, 0, NULL, folder.empty() ? NULL : folder.c_str(), &si,
                          &info) != 0;
}

long ChildProcess::WaitExit(DWORD ms)
{
    if (!info.hProcess) return -1;
    if (WaitForSingleObject(info.hProcess, ms) != WAIT_OBJECT_0) return -1;
    DWORD code = 0;
    GetExitCodeProcess(info.hProcess, &code);
    return (long)code;
}

void ChildProcess::Kill()
{
    if (!info.hProcess) return;
    if (WaitForSingleObject(info.hProcess, 0) != WAIT_OBJECT_0) {
        TerminateProcess(info.hProcess, 1);
        WaitForSingleObject(info.hProcess, 5000);
    }
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

static BOOL CALLBACK CollectStaticText(HWND child, LPARAM data)
{
    char cls[32], text[512];
    GetClassNameA(child, cls, sizeof cls);
    if (lstrcmpiA(cls, "Static") == 0 && GetWindowTextA(child, text, sizeof text) > 0) {
        std::string* out = (std::string*)data;
        if (!out->empty()) *out += "\n";
        *out += text;
    }
    return TRUE;
}

static LRESULT CALLBACK AnswerHook(int code, WPARAM wparam, LPARAM lparam)
{
    // The box's WM_INITDIALOG has run when it becomes active: answer then.
    if (code == HCBT_ACTIVATE && active_answerer && !active_answerer->answered) {
        HWND box = (HWND)wparam;
        char cls[32];
        GetClassNameA(box, cls, sizeof cls);
        if (strcmp(cls, "#32770") == 0) {
            char caption[256];
            GetWindowTextA(box, caption, sizeof caption);
            active_answerer->caption = caption;
            EnumChildWindows(box, CollectStaticText, (LPARAM)&active_answerer->text);
            active_answerer->answered = 1;
            PostMessageA(box, WM_COMMAND, MAKEWPARAM(active_answerer->button, BN_CLICKED),
                         (LPARAM)GetDlgItem(box, active_answerer->button));
        }
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
    for (int i = 0; i < 40; ++i) {
        int r = RefreshRateAt(i, width, height, bits);
        if (r <= 0) break;
        rates.push_back(r);
    }
    return rates;
}

void PumpMessages()
{
    MSG msg;
    while (PeekMessageA(&msg, NULL, 0, 0, PM_REMOVE)) {
        TranslateMessage(&msg);
        DispatchMessageA(&msg);
    }
}

bool PumpUntil(bool (*condition)(void*), void* data, DWORD ms)
{
    DWORD start = GetTickCount();
    for (;;) {
        PumpMessages();
        if (condition(data)) return true;
        if (GetTickCount() - start >= ms) return false;
        MsgWaitForMultipleObjects(0, NULL, FALSE, 20, QS_ALLINPUT);
    }
}
