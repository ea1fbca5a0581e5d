// Operations whose modules are still being written. Each answers "nothing
// done" so that the program runs; none pretends to work.
#include "adjust/adjust_window.h"
#include "adjust/position.h"

int RestorePosition() { return 1; }
LRESULT CALLBACK AdjustWindowProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    return DefWindowProcA(window, message, wparam, lparam);
}
