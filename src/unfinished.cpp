// Operations whose modules are still being written. Each answers "nothing
// done" so that the program runs; none pretends to work.
#include "adjust/adjust_window.h"
#include "adjust/position.h"
#include "chips/chips.h"
#include "hardware/detect.h"
#include "modes/mode_change.h"
#include "modes/mode_list.h"

int DetectAdapters() { return 0; }
void RefreshAdapterModes(int at_startup) {}
int RefreshRateAt(int index, int width, int height, int bits) { return 0; }
int CombinedRateRange(int width, int height, int bits, int* lowest, int* highest) { return 0; }
int SetRefreshRate(int target) { return 0; }
int RestorePosition() { return 1; }
LRESULT CALLBACK AdjustWindowProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    return DefWindowProcA(window, message, wparam, lparam);
}
int chip_set_dpms_all(uint32_t state) { return 1; }
bool IsDpmsState(uint32_t code) { return false; }
