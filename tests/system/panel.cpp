#include "system/panel.h"

#include <stdlib.h>

Panel::Panel(const std::string& machine_description)
{
    folder = CopySimBuild("panel");
    if (!machine_description.empty()) Describe(machine_description);
}

Panel::~Panel() { Kill(); }

void Panel::Describe(const std::string& machine_description)
{
    WriteTextFile(folder + "SIMMACHINE.INI", machine_description);
}

bool Panel::Start(const std::string& version, const std::string& arguments)
{
    SetWineVersionFor("vistrel-sim.exe", version);
    std::string line = "\"" + folder + "vistrel-sim.exe\"";
    if (!arguments.empty()) line += " " + arguments;
    return process.Start(line, folder);
}

HWND Panel::WaitWindow(DWORD ms)
{
    DWORD start = GetTickCount();
    for (;;) {
        HWND w = FindWindowA("zentra", NULL);
        DWORD_PTR r;
        if (w && SendMessageTimeoutA(w, WM_NULL, 0, 0, SMTO_NORMAL, ms, &r)) return w;
        if (GetTickCount() - start >= ms || process.WaitExit(0) != -1) return NULL;
        Sleep(20);
    }
}

bool Panel::WaitGone(DWORD ms) { return process.WaitExit(ms) != -1; }

LRESULT Panel::Send(UINT message, WPARAM wparam, LPARAM lparam)
{
    HWND w = FindWindowA("zentra", NULL);
    DWORD_PTR result = 0;
    if (!w || !SendMessageTimeoutA(w, message, wparam, lparam, SMTO_NORMAL, 20000, &result)) return -12345;
    return (LRESULT)result;
}

void Panel::Kill() { process.Kill(); }

std::map<std::string, std::string> Panel::State()
{
    std::map<std::string, std::string> state;
    std::string out_path = folder + "simstate.txt";
    SECURITY_ATTRIBUTES inherit = {sizeof inherit, NULL, TRUE};
    HANDLE out = CreateFileA(out_path.c_str(), GENERIC_WRITE, FILE_SHARE_READ, &inherit, CREATE_ALWAYS, 0, NULL);
    STARTUPINFOA si = {};
    si.cb = sizeof si;
    si.dwFlags = STARTF_USESTDHANDLES;
    si.hStdOutput = out;
    si.hStdError = out;
    PROCESS_INFORMATION pi;
    std::string line = "\"" + folder + "simstate.exe\"";
    if (CreateProcessA(NULL, &line[0], NULL, NULL, TRUE, 0, NULL, folder.c_str(), &si, &pi)) {
        WaitForSingleObject(pi.hProcess, 20000);
        CloseHandle(pi.hProcess);
        CloseHandle(pi.hThread);
    }
    CloseHandle(out);
    HANDLE in = CreateFileA(out_path.c_str(), GENERIC_READ, FILE_SHARE_READ, NULL, OPEN_EXISTING, 0, NULL);
    std::string text;
    char buf[4096];
    DWORD got;
    while (in != INVALID_HANDLE_VALUE && ReadFile(in, buf, sizeof buf, &got, NULL) && got) text.append(buf, got);
    if (in != INVALID_HANDLE_VALUE) CloseHandle(in);
    std::string section;
    size_t pos = 0;
    while (pos < text.size()) {
        size_t end = text.find('\n', pos);
        if (end == std::string::npos) end = text.size();
        std::string l = text.substr(pos, end - pos);
        pos = end + 1;
        if (!l.empty() && l.back() == '\r') l.pop_back();
        if (l.size() > 2 && l[0] == '[') section = l.substr(1, l.size() - 2);
        size_t eq = l.find('=');
        if (eq != std::string::npos && !section.empty()) state[section + "." + l.substr(0, eq)] = l.substr(eq + 1);
    }
    return state;
}

double Panel::StateNumber(const std::string& key)
{
    std::map<std::string, std::string> s = State();
    auto it = s.find(key);
    return it == s.end() ? -1.0 : atof(it->second.c_str());
}

void Panel::SetTextIni(const std::string& section, const std::string& key, const std::string& value)
{
    WritePrivateProfileStringA(section.c_str(), key.c_str(), value.c_str(), (folder + "ZNTR2.INI").c_str());
}

void Panel::SetChipIni(const std::string& section, const std::string& key, const std::string& value)
{
    WritePrivateProfileStringA(section.c_str(), key.c_str(), value.c_str(), (folder + "ZNTR3.INI").c_str());
}

std::string DefaultMachine(const std::string& windows)
{
    return "[Machine]\r\nWindows=" + windows + "\r\n[Card0]\r\nId=5333:8901\r\nBus=0\r\nDevice=10\r\nMemoryMB=4\r\n";
}
