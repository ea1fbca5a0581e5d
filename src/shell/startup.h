// Process entry, the single-instance rule, the operating-system check and
// the hidden main window.
#ifndef VISTREL_STARTUP_H
#define VISTREL_STARTUP_H

#include <windows.h>
#include <stdint.h>

// The whole program: returns the process exit code.
int VistrelMain(HINSTANCE inst, HINSTANCE previous, const char* command_line);

// STARTUP_AUTORUN when the command line holds the "/A" switch.
uint32_t ParseStartupSwitch(const char* command_line);

// Where a second start clicks: the running copy's window corner, kept off the
// screen edges.
POINT WakePoint(const RECT* running_window);

// Wakes the running copy and returns 0, or registers the window classes of a
// first start and returns nonzero.
int InitApplication(HINSTANCE inst);

struct SystemFacts {
    int bits_per_pixel;
    DWORD platform_id;
    DWORD major_version;
    DWORD minor_version;
    DWORD build_number;
};
// Sets platform and os_class from the facts; below 8 bits per pixel the
// settings store is erased. 1 when the program may run here.
int DetectSystemFrom(const SystemFacts* facts);
// DetectSystemFrom on this machine, then the INI paths beside the program.
int DetectSystem();
// Builds text_ini_path and chip_ini_path from the program's own path.
void BuildIniPaths(const char* module_path);

int CreateMainWindow(HINSTANCE inst);

#endif
