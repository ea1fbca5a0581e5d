// What the companion tests share: a window that takes MSG_POWER_STATE, input.
#ifndef VISTREL_TEST_POWER_WINDOW_H
#define VISTREL_TEST_POWER_WINDOW_H

#include <windows.h>

#include <string>
#include <vector>

// The timer minute the tests give the hook library: about 20 ms.
enum { UNIT_MS = 20, UNIT_MINUTE = (UNIT_MS * 65536 + 59999) / 60000, LATE_MS = 3000 };

HWND CreatePowerWindow(const char* class_name = "CompanionsPowerWindow");
void DestroyPowerWindow(HWND window);  // and what was posted, so that nothing leaks into the next test
// Dispatches this thread's messages until `count` MSG_POWER_STATE posts to
// window have come or timeout_ms have passed: their states, and in *at the
// GetTickCount of each.
std::vector<int> CollectPowerPosts(HWND window, size_t count, DWORD timeout_ms, std::vector<DWORD>* at = nullptr);

void PressShift();  // through the system's input queue
void NudgeMouse();  // up and to the left
std::string TestFolder();  // with its trailing backslash

#endif
