// Prints the state of the simulated machine of the folder this program sits in.
#include <stdio.h>
#include <string.h>
#include <windows.h>

#include "sim.h"

int main()
{
    char folder[MAX_PATH];
    DWORD n = GetModuleFileNameA(NULL, folder, sizeof folder);
    if (n >= sizeof folder) n = sizeof folder - 1;
    folder[n] = 0;
    char* last = strrchr(folder, '\\');
    if (last) *last = 0;
    if (!SimOpenPersistent(folder)) {
        fprintf(stderr, "simstate: no machine has run in %s\n", folder);
        return 1;
    }
    SimPrintState(stdout);
    return 0;
}
