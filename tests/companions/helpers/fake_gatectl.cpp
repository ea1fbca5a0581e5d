// Stands in for gatectl.exe: posts, for "3", the size in FAKE_GATECTL_REPLY as the answer, then
// WM_APP with its process id and its command line (a global atom) to the program's window.
#include <windows.h>
#include <stdlib.h>

int WINAPI WinMain(HINSTANCE inst, HINSTANCE previous, LPSTR arguments, int show)
{
    HWND window = FindWindowA("zentra", NULL);
    char size[32];
    if (arguments[0] == '3' && GetEnvironmentVariableA("FAKE_GATECTL_REPLY", size, sizeof size))
        PostMessageA(window, 1228, 0, (LPARAM)strtoul(size, NULL, 0));
    PostMessageA(window, WM_APP, GetCurrentProcessId(), GlobalAddAtomA(GetCommandLineA()));
    return 0;
}
