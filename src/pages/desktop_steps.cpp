// How the Desktop page's sliders step, and the choices a step leads to.
#include "pages/desktop_steps.h"

#include <windows.h>

#include <commctrl.h>

static int Clamp(int value, int low, int high) { return value < low ? low : value > high ? high : value; }

int SliderTarget(int code, int thumb, int position, int maximum, bool settle)
{
    int target;
    switch (code) {
    case TB_LINEUP:
    case TB_PAGEUP: target = position - 1; break;
    case TB_LINEDOWN:
    case TB_PAGEDOWN: target = position + 1; break;
    case TB_THUMBPOSITION:
    case TB_THUMBTRACK: target = thumb; break;
    case TB_TOP: target = 0; break;
    case TB_BOTTOM: target = maximum; break;
    default: return -1;
    }
    // A thumb position from outside the range would name no mode.
    target = Clamp(target, 0, maximum);
    if (settle && code == TB_THUMBPOSITION) return target;
    return target == position ? -1 : target;
}

int FontTarget(int code, int thumb, int dpi)
{
    int from_grid = (dpi - FONT_DPI_MIN) % FONT_DPI_STEP;
    int target;
    switch (code) {
    case TB_LINEUP: target = dpi - 1; break;
    case TB_LINEDOWN: target = dpi + 1; break;
    case TB_PAGEUP: target = dpi - (from_grid ? from_grid : FONT_DPI_STEP); break;
    case TB_PAGEDOWN: target = dpi + FONT_DPI_STEP - from_grid; break;
    case TB_THUMBPOSITION:
    case TB_THUMBTRACK: target = thumb; break;
    case TB_TOP: target = FONT_DPI_MIN; break;
    case TB_BOTTOM: target = FONT_DPI_MAX; break;
    default: return -1;
    }
    target = Clamp(target, FONT_DPI_MIN, FONT_DPI_MAX);
    return target == dpi ? -1 : target;
}

int ChooseRefresh(const uint16_t* rates, int count, int wanted, int* position, int* maximum)
{
    *position = *maximum = 0;
    if (count <= 0 || !rates[0]) return 0;
    int chosen = rates[0];
    int i = 0;
    for (; i < count && rates[i]; ++i) {
        if (rates[i] >= wanted + 2) continue;
        chosen = rates[i];
        *position = i;
    }
    *maximum = i - 1;
    return chosen;
}

static int ScreenFont(int dpi) { return dpi == SMALL_FONT_DPI ? SMALL_FONT_DPI : LARGE_FONT_DPI; }

bool FollowScreenFont(int height, int screen_x, int screen_y, int* dpi_x, int* dpi_y)
{
    if (height <= 480) return false;
    int x = ScreenFont(screen_x), y = ScreenFont(screen_y);
    if (*dpi_x == x && *dpi_y == y) return false;
    *dpi_x = x;
    *dpi_y = y;
    return true;
}
