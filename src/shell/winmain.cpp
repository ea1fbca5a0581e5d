#include <windows.h>

#include "shell/startup.h"

int WINAPI WinMain(HINSTANCE inst, HINSTANCE previous, LPSTR command_line, int show)
{
    return VistrelMain(inst, previous, command_line);
}
