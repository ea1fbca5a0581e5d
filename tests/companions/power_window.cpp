#include "power_window.h"

#include "shell/main_window.h"

static const char power_window_class[] = "CompanionsPowerWindow";

HWND CreatePowerWindow()
{
    WNDCLASSA type = {};
    type.lpfnWndProc = DefWindowProcA;
    type.hInstance = GetModuleHandleA(NULL);
    type.lpszClassName = power_window_class;
    RegisterClassA(&type);
    HWND window = CreateWindowExA(0, power_window_class, "power", WS_OVERLAPPEDWINDOW, 10, 10, 200, 100, NULL, NULL,
                                  type.hInstance, NULL);
    return window;
}

void DestroyPowerWindow(HWND window)
{
    DestroyWindow(window);
    // Nothing posted to the old window may leak into the next test.
    MSG message;
    while (PeekMessageA(&message, NULL, 0, 0, PM_REMOVE)) DispatchMessageA(&message);
}

std::vector<PowerPost> CollectPowerPosts(HWND window, size_t count, DWORD timeout_ms)
{
    std::vector<PowerPost> posts;
    DWORD start = GetTickCount();
    while (posts.size() < count) {
        MSG message;
        while (posts.size() < count && PeekMessageA(&message, NULL, 0, 0, PM_REMOVE)) {
            if (message.hwnd == window && message.message == MSG_POWER_STATE)
                posts.push_back({(int)message.wParam, GetTickCount()});
            else {
                TranslateMessage(&message);
                DispatchMessageA(&message);
            }
        }
        DWORD spent = GetTickCount() - start;
        if (posts.size() >= count || spent >= timeout_ms) break;
        MsgWaitForMultipleObjects(0, NULL, FALSE, timeout_ms - spent, QS_ALLINPUT);
    }
    return posts;
}

std::vector<int> States(const std::vector<PowerPost>& posts)
{
    std::vector<int> states;
    for (const PowerPost& post : posts) states.push_back(post.state);
    return states;
}

DWORD MinuteLengthFor(DWORD ms) { return (ms * 65536 + 59999) / 60000; }

void PressShift()
{
    INPUT keys[2] = {};
    keys[0].type = INPUT_KEYBOARD;
    keys[0].ki.wVk = VK_SHIFT;
    keys[1] = keys[0];
    keys[1].ki.dwFlags = KEYEVENTF_KEYUP;
    SendInput(2, keys, sizeof(INPUT));
}

void NudgeMouse()
{
    // Away from the nearer screen edge, where a move would be clamped to nothing.
    POINT at = {0, 0};
    GetCursorPos(&at);
    INPUT move = {};
    move.type = INPUT_MOUSE;
    move.mi.dx = at.x > 100 ? -7 : 7;
    move.mi.dy = at.y > 100 ? -5 : 5;
    move.mi.dwFlags = MOUSEEVENTF_MOVE;
    SendInput(1, &move, sizeof(INPUT));
}

std::string TestFolder()
{
    char path[MAX_PATH];
    DWORD length = GetModuleFileNameA(NULL, path, sizeof path);
    std::string folder(path, length);
    return folder.substr(0, folder.find_last_of('\\') + 1);
}
