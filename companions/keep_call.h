// What a SetKeepHook call asks for. The start call (window, 1, 1, length)
// and a timer call (window, 1, 1, minutes) look alike: only the library's
// own phase, set by the start call whether or not the start succeeded,
// tells them apart.
#ifndef VISTREL_KEEP_CALL_H
#define VISTREL_KEEP_CALL_H

#include <windows.h>

enum KeepPhase {
    KEEP_STOPPED,  // no start call since the library was loaded or stopped
    KEEP_STARTED,  // a start call came for the window it names
};

enum KeepCall {
    KEEP_CALL_REFUSED,
    KEEP_CALL_START,
    KEEP_CALL_STOP,
    KEEP_CALL_ARM,        // arm (enable, n >= 1) or disarm (0, 0) one timer
    KEEP_CALL_ENTER_NOW,  // (state, 1, 0)
};

// started_for: the window of the last start call (KEEP_STARTED only).
KeepCall ClassifyKeepCall(KeepPhase phase, HWND started_for, HWND window, DWORD state, DWORD enable, DWORD minutes);

#endif
