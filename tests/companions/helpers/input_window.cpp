// A window of another process that takes the keyboard, so that a test can
// show the hook library hears input that never reaches its own process.
// Argument: the name of an event to set once the window has the focus. It runs until killed.
#include <windows.h>

int WINAPI WinMain(HINSTANCE inst, HINSTANCE previous, LPSTR arguments, int show)
{
    WNDCLASSA type = {0, DefWindowProcA, 0, 0, inst, NULL, NULL, NULL, NULL, "CompanionsInputWindow"};
    RegisterClassA(&type);
    HWND window = CreateWindowExA(0, type.lpszClassName, "input", WS_OVERLAPPEDWINDOW | WS_VISIBLE, 200, 200, 300,
                                  200, NULL, NULL, inst, NULL);
    SetForegroundWindow(window);
    SetFocus(window);
    SetEvent(OpenEventA(EVENT_MODIFY_STATE, FALSE, arguments));
    MSG message;
    while (GetMessageA(&message, NULL, 0, 0) > 0) DispatchMessageA(&message);
    return 0;
}
