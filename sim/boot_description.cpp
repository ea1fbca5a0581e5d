// Linked into vistrel-sim.exe and the simulated gatectl.exe: the machine is
// switched on before the program starts, from SIMMACHINE.INI beside the
// executable.
#include <string.h>
#include <windows.h>

#include "sim.h"

namespace {
struct PowerOn {
    PowerOn()
    {
        char folder[MAX_PATH];
        DWORD n = GetModuleFileNameA(NULL, folder, sizeof folder);
        if (n >= sizeof folder) n = sizeof folder - 1;
        folder[n] = 0;
        char* last = strrchr(folder, '\\');
        if (last) *last = 0;
        SimAttachPersistent(folder);
    }
} power_on;
}  // namespace
