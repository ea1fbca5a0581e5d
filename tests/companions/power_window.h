// A window of the test thread that takes MSG_POWER_STATE the way the main
// window does, and a record of what arrived when.
#ifndef VISTREL_TEST_POWER_WINDOW_H
#define VISTREL_TEST_POWER_WINDOW_H

#include <windows.h>

#include <string>
#include <vector>

struct PowerPost {
    int state;
    DWORD at;  // GetTickCount when it was taken from the queue
};

HWND CreatePowerWindow();
void DestroyPowerWindow(HWND window);

// Dispatches this thread's messages until `count` MSG_POWER_STATE posts to
// window have arrived or timeout_ms have passed; returns those that came.
std::vector<PowerPost> CollectPowerPosts(HWND window, size_t count, DWORD timeout_ms);
std::vector<int> States(const std::vector<PowerPost>& posts);

// The start call's minute length for a timer minute of about `ms` milliseconds.
DWORD MinuteLengthFor(DWORD ms);

// Input as a user would make it: SendInput, taken by the system's input queue.
void PressShift();
void NudgeMouse();

// Folder of the test program, with its trailing backslash.
std::string TestFolder();

#endif
