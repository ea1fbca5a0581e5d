#include "hardware/companions.h"

#include "base/module_reset.h"
#include "base/protocol.h"
#include "base/runtime.h"
#include "base/settings.h"
#include "hookkeep.h"

BOOL(WINAPI* restart_windows)(UINT flags, DWORD reason) = ExitWindowsEx;
DWORD(WINAPI* keep_hook)(HWND window, DWORD state, DWORD enable, DWORD minutes) = SetKeepHook;
DWORD gate_reply_timeout = GATE_REPLY_TIMEOUT_MS;
DWORD power_minute_length = KEEP_REAL_MINUTE;

static const char gate_program[] = "gatectl.exe";
enum { GATE_COMMAND_SIZE = 64 };

static uint32_t gate_memory_size;

int GateRestart()
{
    char command[GATE_COMMAND_SIZE];
    FormatText(command, sizeof command, "%s 2 restart", gate_program);
    if (WinExec(command, SW_SHOW) >= 32) return 1;
    return restart_windows(EWX_REBOOT, 0) ? 1 : 0;
}

// Takes the companion's answer from this thread's queue as soon as it is
// there. Nothing else is dispatched meanwhile, so no other part of the
// program runs while it waits.
static uint32_t WaitForGateReply()
{
    DWORD start = GetTickCount();
    for (;;) {
        MSG message;
        if (PeekMessageA(&message, NULL, MSG_GATE_REPLY, MSG_GATE_REPLY, PM_REMOVE)) return (uint32_t)message.lParam;
        if (GetTickCount() - start > gate_reply_timeout) return 0;
    }
}

uint32_t GateMemorySize()
{
    if (gate_memory_size) return gate_memory_size;
    char command[GATE_COMMAND_SIZE];
    FormatText(command, sizeof command, "%s 3 %s", gate_program, main_window_class);
    if (WinExec(command, SW_SHOW) < 32) return 0;
    gate_memory_size = WaitForGateReply();
    return gate_memory_size;
}

void ForgetGateMemorySize() { gate_memory_size = 0; }

static void ResetCompanions()
{
    restart_windows = ExitWindowsEx;
    keep_hook = SetKeepHook;
    gate_reply_timeout = GATE_REPLY_TIMEOUT_MS;
    power_minute_length = KEEP_REAL_MINUTE;
    gate_memory_size = 0;
}
VISTREL_MODULE_RESET(ResetCompanions);

int StartPowerTimers(HWND main_window, int on)
{
    if (!on) {
        keep_hook(NULL, KEEP_STATE_ALL, 0, 0);
        return 1;
    }
    static const struct {
        int setting;
        DWORD state;
    } timers[] = {
        {SETTING_STANDBY, KEEP_STATE_STANDBY},
        {SETTING_SUSPEND, KEEP_STATE_SUSPEND},
        {SETTING_SHUTOFF, KEEP_STATE_OFF},
    };
    keep_hook(main_window, KEEP_STATE_STANDBY, 1, power_minute_length);
    for (const auto& timer : timers) {
        int32_t minutes = LoadSetting(timer.setting);
        if (minutes > 0) keep_hook(main_window, timer.state, 1, (DWORD)minutes);
    }
    return 1;
}
