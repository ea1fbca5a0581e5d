// gatectl.exe: what the program asks of it on Windows 9x by command line.
//   gatectl.exe 2 restart        restart Windows
//   gatectl.exe 3 <class>        post the video memory size to that window
#include "gate.h"
#include "hardware/machine.h"

int WINAPI WinMain(HINSTANCE inst, HINSTANCE previous, LPSTR command_line, int show)
{
    GateRequest request;
    switch (ParseGateCommand(command_line, &request)) {
    case GATE_RESTART: return RestartWindows(ExitWindowsEx) ? 0 : 1;
    case GATE_MEMORY: return ReplyMemorySize(request.window_class, PackMemorySize(MachineVideoMemory())) ? 0 : 1;
    }
    return 0;
}
