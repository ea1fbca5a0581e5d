// HookKeep.dll: notices when the user leaves the machine alone and asks the
// registered window to put the monitor into a power-saving state.
//
// Keyboard and mouse hooks, global and set from this library, run inside
// every process that takes input and stamp the time of the last input into
// a section that all copies of the library share. A watcher thread in the
// process that registered the window compares that stamp with the armed
// timers and posts MSG_POWER_STATE when one expires. The first input after
// a state was entered posts 0 from inside the hook, so the monitor wakes
// without waiting for the watcher.
#define HOOKKEEP_BUILD
#include "hookkeep.h"

#include "base/protocol.h"
#include "keep_call.h"

enum { TIMER_COUNT = 3 };
static const DWORD timer_state[TIMER_COUNT] = {KEEP_STATE_STANDBY, KEEP_STATE_SUSPEND, KEEP_STATE_OFF};

// Windows without hooks in them (console windows, MS-DOS boxes) still move
// the cursor; the watcher looks at it this often while a timer runs or the
// monitor sleeps.
enum { CURSOR_POLL_MS = 1000 };

// Seen by every process the hooks are loaded into. Written by the hooks of
// any process and by the watching process; each field is one aligned word.
struct KeepShared {
    HWND window;
    HHOOK keyboard_hook;
    HHOOK mouse_hook;
    DWORD last_input;
    LONG cursor_x;
    LONG cursor_y;
    LONG asleep;  // a state was posted and no input came since
};
static KeepShared shared __attribute__((section(".keep"), shared)) = {NULL, NULL, NULL, 0, -1, -1, 0};

// Only in the process that made the start call.
static HINSTANCE library_instance;
static CRITICAL_SECTION watch_lock;
static HANDLE watch_thread;
static HANDLE watch_wake;
static bool watch_stopping;
static bool hooks_set;  // the shared hook handles are ours, not a dead process's
static KeepPhase phase;
static HWND started_for;
static DWORD minute_ms;
static DWORD timer_minutes[TIMER_COUNT];
static DWORD period_start;  // last_input at the start of the idle period being timed
static DWORD period_entered;  // states posted in this idle period
static DWORD period_deepest;  // the deepest of them

// A post to no window would land in the queue of whatever thread the hook
// runs in.
static void PostState(DWORD state)
{
    HWND window = shared.window;
    if (window) PostMessageA(window, MSG_POWER_STATE, state, 0);
}

static void NoteInput()
{
    shared.last_input = GetTickCount();
    if (InterlockedExchange(&shared.asleep, 0)) PostState(0);
}

// The cursor really moved; Windows also sends WM_MOUSEMOVE when a window
// appears or moves under a still cursor, and that must not wake the monitor.
static bool CursorMoved(POINT at)
{
    if (at.x == shared.cursor_x && at.y == shared.cursor_y) return false;
    shared.cursor_x = at.x;
    shared.cursor_y = at.y;
    return true;
}

// HC_NOREMOVE comes each time a program only peeks at the same message; a
// program that does so in a loop would keep the monitor awake for ever.
static LRESULT CALLBACK KeyboardHook(int code, WPARAM wparam, LPARAM lparam)
{
    if (code == HC_ACTION) NoteInput();
    // Windows 9x needs the real hook handle here, hence the shared copy.
    return CallNextHookEx(shared.keyboard_hook, code, wparam, lparam);
}

static LRESULT CALLBACK MouseHook(int code, WPARAM wparam, LPARAM lparam)
{
    if (code == HC_ACTION) {
        const MOUSEHOOKSTRUCT* mouse = (const MOUSEHOOKSTRUCT*)lparam;
        bool move = wparam == WM_MOUSEMOVE || wparam == WM_NCMOUSEMOVE;
        if (!move || CursorMoved(mouse->pt)) NoteInput();
    }
    return CallNextHookEx(shared.mouse_hook, code, wparam, lparam);
}

static void PollCursor()
{
    POINT at;
    // Fails while another desktop has the input (a locked NT workstation).
    if (GetCursorPos(&at) && CursorMoved(at)) NoteInput();
}

static int TimerIndex(DWORD state)
{
    for (int i = 0; i < TIMER_COUNT; ++i)
        if (timer_state[i] == state) return i;
    return -1;
}

// Milliseconds of inactivity before timer i expires; 0xFFFFFFFF is beyond
// what GetTickCount can measure and never expires.
static DWORD TimerDeadline(int i)
{
    unsigned long long ms = (unsigned long long)timer_minutes[i] * minute_ms;
    return ms >= 0xFFFFFFFFull ? 0xFFFFFFFF : (DWORD)ms;
}

static bool TimerPending(int i)
{
    return timer_minutes[i] != 0 && !(period_entered & timer_state[i]) && TimerDeadline(i) != 0xFFFFFFFF;
}

static void EnterState(DWORD state, DWORD idle_since)
{
    period_entered |= state;
    // A lighter state that runs out after a deeper one would only bring the
    // monitor part of the way back.
    if (state < period_deepest) return;
    period_deepest = state;
    InterlockedExchange(&shared.asleep, 1);
    PostState(state);
    // Input that came while we decided saw no state to wake from.
    if (shared.last_input != idle_since && InterlockedExchange(&shared.asleep, 0)) PostState(0);
}

// Posts every state whose time has come, in the order they ran out, and
// answers how long the watcher may wait before looking again.
static DWORD CheckTimers()
{
    PollCursor();
    DWORD last = shared.last_input;
    if (last != period_start) {
        period_start = last;
        period_entered = 0;
        period_deepest = 0;
    }
    DWORD idle = GetTickCount() - last;
    for (;;) {
        int next = -1;
        for (int i = 0; i < TIMER_COUNT; ++i)
            if (TimerPending(i) && TimerDeadline(i) <= idle && (next < 0 || TimerDeadline(i) < TimerDeadline(next)))
                next = i;
        if (next < 0) break;
        EnterState(timer_state[next], last);
    }
    bool pending = false;
    DWORD wait = CURSOR_POLL_MS;
    for (int i = 0; i < TIMER_COUNT; ++i) {
        if (!TimerPending(i)) continue;
        pending = true;
        if (TimerDeadline(i) - idle < wait) wait = TimerDeadline(i) - idle;
    }
    return pending || shared.asleep ? wait : INFINITE;
}

static DWORD WINAPI WatchThread(void*)
{
    for (;;) {
        EnterCriticalSection(&watch_lock);
        bool stop = watch_stopping;
        DWORD wait = stop ? 0 : CheckTimers();
        LeaveCriticalSection(&watch_lock);
        if (stop) return 0;
        WaitForSingleObject(watch_wake, wait);
    }
}

static void WakeWatcher()
{
    if (watch_wake) SetEvent(watch_wake);
}

static void StopWatching()
{
    if (watch_thread) {
        EnterCriticalSection(&watch_lock);
        watch_stopping = true;
        LeaveCriticalSection(&watch_lock);
        SetEvent(watch_wake);
        WaitForSingleObject(watch_thread, INFINITE);
        CloseHandle(watch_thread);
        watch_thread = NULL;
    }
    if (watch_wake) CloseHandle(watch_wake);
    watch_wake = NULL;
    if (hooks_set) {
        if (shared.keyboard_hook) UnhookWindowsHookEx(shared.keyboard_hook);
        if (shared.mouse_hook) UnhookWindowsHookEx(shared.mouse_hook);
    }
    hooks_set = false;
    shared.keyboard_hook = NULL;
    shared.mouse_hook = NULL;
    // Asleep first: a hook that still sees it set posts to the window.
    InterlockedExchange(&shared.asleep, 0);
    shared.window = NULL;
}

static DWORD StartWatching(HWND window, DWORD minute_length)
{
    StopWatching();
    if (minute_length == 0) minute_length = KEEP_REAL_MINUTE;
    unsigned long long ms = 60000ull * minute_length / KEEP_REAL_MINUTE;
    minute_ms = ms == 0 ? 1 : ms > 0xFFFFFFFFull ? 0xFFFFFFFF : (DWORD)ms;
    for (int i = 0; i < TIMER_COUNT; ++i) timer_minutes[i] = 0;

    POINT at;
    if (GetCursorPos(&at)) CursorMoved(at);
    shared.last_input = GetTickCount();
    period_start = shared.last_input;
    period_entered = 0;
    period_deepest = 0;
    shared.window = window;

    // Without hooks (refused by the system) the cursor poll still works.
    shared.keyboard_hook = SetWindowsHookExA(WH_KEYBOARD, KeyboardHook, library_instance, 0);
    shared.mouse_hook = SetWindowsHookExA(WH_MOUSE, MouseHook, library_instance, 0);
    hooks_set = true;

    watch_stopping = false;
    watch_wake = CreateEventA(NULL, FALSE, FALSE, NULL);
    DWORD thread_id;
    if (watch_wake) watch_thread = CreateThread(NULL, 0, WatchThread, NULL, 0, &thread_id);
    if (!watch_thread) {
        StopWatching();
        return 0;
    }
    return 1;
}

static DWORD ArmTimer(int i, DWORD enable, DWORD minutes)
{
    EnterCriticalSection(&watch_lock);
    timer_minutes[i] = enable ? minutes : 0;
    LeaveCriticalSection(&watch_lock);
    WakeWatcher();
    return 1;
}

static DWORD EnterNow(DWORD state)
{
    EnterCriticalSection(&watch_lock);
    // The program turns its stored timers off when the user picks a state
    // from the menu; ours follow, or they would fire behind its back.
    for (int i = 0; i < TIMER_COUNT; ++i) timer_minutes[i] = 0;
    period_start = shared.last_input;
    period_entered = 0;
    period_deepest = 0;
    EnterState(state, period_start);
    LeaveCriticalSection(&watch_lock);
    WakeWatcher();
    return 1;
}

HOOKKEEP_API DWORD WINAPI SetKeepHook(HWND window, DWORD state, DWORD enable, DWORD minutes)
{
    switch (ClassifyKeepCall(phase, started_for, window, state, enable, minutes)) {
    case KEEP_CALL_START:
        phase = KEEP_STARTED;
        started_for = window;
        return StartWatching(window, minutes);
    case KEEP_CALL_STOP:
        phase = KEEP_STOPPED;
        started_for = NULL;
        StopWatching();
        return 1;
    case KEEP_CALL_ENTER_NOW:
        return watch_thread ? EnterNow(state) : 0;
    case KEEP_CALL_ARM:
        return watch_thread ? ArmTimer(TimerIndex(state), enable, minutes) : 0;
    case KEEP_CALL_REFUSED:
        break;
    }
    return 0;
}

BOOL WINAPI DllMain(HINSTANCE inst, DWORD reason, void* reserved)
{
    if (reason == DLL_PROCESS_ATTACH) {
        library_instance = inst;
        InitializeCriticalSection(&watch_lock);
        DisableThreadLibraryCalls(inst);
    } else if (reason == DLL_PROCESS_DETACH && watch_thread) {
        // The process is going without the stop call: its watcher is gone or
        // cannot be waited for here, but the window must not get our posts.
        InterlockedExchange(&shared.asleep, 0);
        shared.window = NULL;
    }
    return TRUE;
}
