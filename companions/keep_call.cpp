#include "keep_call.h"

#include "hookkeep.h"

static bool IsTimerState(DWORD state)
{
    return state == KEEP_STATE_STANDBY || state == KEEP_STATE_SUSPEND || state == KEEP_STATE_OFF;
}

KeepCall ClassifyKeepCall(KeepPhase phase, HWND started_for, HWND window, DWORD state, DWORD enable, DWORD minutes)
{
    // A window of its own starts watching for it; the same window again
    // only comes with timer calls.
    if (window && (phase == KEEP_STOPPED || window != started_for)) return KEEP_CALL_START;
    if (phase == KEEP_STOPPED) return KEEP_CALL_REFUSED;
    if (state == KEEP_STATE_ALL) return enable || minutes ? KEEP_CALL_REFUSED : KEEP_CALL_STOP;
    if (!IsTimerState(state)) return KEEP_CALL_REFUSED;
    return enable && minutes == 0 ? KEEP_CALL_ENTER_NOW : KEEP_CALL_ARM;
}
