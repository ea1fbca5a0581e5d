#include "power_window.h"

#include "base/protocol.h"

HWND CreatePowerWindow(const char* class_name)
{
    WNDCLASSA type = {0, DefWindowProcA, 0, 0, GetModuleHandleA(NULL), NULL, NULL, NULL, NULL, class_name};
    RegisterClassA(&type);
    return CreateWindowExA(0, class_name, "", WS_POPUP | WS_VISIBLE, 10, 10, 99, 99, NULL, NULL, type.hInstance, NULL);
}

void DestroyPowerWindow(HWND window)
{
    DestroyWindow(window);
    for (MSG message; PeekMessageA(&message, NULL, 0, 0, PM_REMOVE);) DispatchMessageA(&message);
}

std::vector<int> CollectPowerPosts(HWND window, size_t count, DWORD timeout_ms, std::vector<DWORD>* at)
{
    std::vector<int> states;
    DWORD start = GetTickCount();
    for (MSG message; states.size() < count;) {
        if (!PeekMessageA(&message, NULL, 0, 0, PM_REMOVE)) {
            DWORD spent = GetTickCount() - start;
            if (spent >= timeout_ms) break;
            MsgWaitForMultipleObjects(0, NULL, FALSE, timeout_ms - spent, QS_ALLINPUT);
        } else if (message.hwnd != window || message.message != MSG_POWER_STATE) {
            DispatchMessageA(&message);
        } else {
            states.push_back((int)message.wParam);
            if (at) at->push_back(GetTickCount());
        }
    }
    return states;
}

void PressShift()
{
    INPUT keys[2] = {{INPUT_KEYBOARD, {.ki = {VK_SHIFT, 0, 0, 0, 0}}},
                     {INPUT_KEYBOARD, {.ki = {VK_SHIFT, 0, KEYEVENTF_KEYUP, 0, 0}}}};
    SendInput(2, keys, sizeof(INPUT));
}

void NudgeMouse()
{
    INPUT move = {INPUT_MOUSE, {.mi = {-7, -5, 0, MOUSEEVENTF_MOVE, 0, 0}}};
    SendInput(1, &move, sizeof(INPUT));
}

std::string TestFolder()
{
    char path[MAX_PATH];
    std::string folder(path, GetModuleFileNameA(NULL, path, sizeof path));
    return folder.substr(0, folder.find_last_of('\\') + 1);
}
