// A vistrel-sim.exe of its own for one test, driven only from outside: its
// window, messages, the registry, its INI files and simstate.exe.
#ifndef VISTREL_SYSTEM_PANEL_H
#define VISTREL_SYSTEM_PANEL_H

#include <windows.h>

#include <map>
#include <string>

#include "support/support.h"

class Panel {
public:
    // A private copy of build/sim with this machine description (none when empty).
    explicit Panel(const std::string& machine_description = "");
    ~Panel();
    // Starts vistrel-sim.exe under the given Windows ("win95", "win98", "nt40").
    bool Start(const std::string& version, const std::string& arguments = "");
    // The main window, once it answers; NULL after ms.
    HWND WaitWindow(DWORD ms = 30000);
    bool WaitGone(DWORD ms);
    LRESULT Send(UINT message, WPARAM wparam, LPARAM lparam);
    // Ends the process the way a crash or a reboot would.
    void Kill();
    // simstate.exe's report: "Card0.RefreshHz" -> "75.03".
    std::map<std::string, std::string> State();
    double StateNumber(const std::string& key);
    void SetTextIni(const std::string& section, const std::string& key, const std::string& value);
    void SetChipIni(const std::string& section, const std::string& key, const std::string& value);
    void Describe(const std::string& machine_description);

    std::string folder;
    ChildProcess process;
};

std::string DefaultMachine(const std::string& windows);

#endif
