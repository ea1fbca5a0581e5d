#include "gate.h"

#include "base/protocol.h"
#include "base/runtime.h"
#include "hardware/shutdown.h"

uint32_t PackMemorySize(uint32_t bytes)
{
    uint32_t megabytes = bytes >> 20;
    uint32_t kilobytes = (bytes >> 10) & 1023;
    return (megabytes << 16) | (kilobytes / 64 * 64);
}

int ReplyMemorySize(const char* window_class, uint32_t size)
{
    HWND window = FindWindowA(window_class, NULL);
    if (!window) return 0;
    // An unknown size is answered too: the caller would otherwise wait its
    // full ten seconds for nothing.
    return PostMessageA(window, MSG_GATE_REPLY, 0, (LPARAM)size) ? 1 : 0;
}

int RestartWindows(BOOL(WINAPI* exit_windows)(UINT, DWORD))
{
    OSVERSIONINFOA version;
    memset(&version, 0, sizeof version);
    version.dwOSVersionInfoSize = sizeof version;
    // NT refuses a restart from a process that has not enabled the privilege;
    // Windows 9x has no privileges.
    if (GetVersionExA(&version) && version.dwPlatformId == VER_PLATFORM_WIN32_NT) EnableShutdownPrivilege();
    return exit_windows(EWX_REBOOT, 0) ? 1 : 0;
}
