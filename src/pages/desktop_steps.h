// How the Desktop page's sliders step, and the choices a step leads to.
#ifndef VISTREL_DESKTOP_STEPS_H
#define VISTREL_DESKTOP_STEPS_H

#include <stdint.h>

enum { FONT_DPI_MIN = 72, FONT_DPI_MAX = 192, FONT_DPI_STEP = 24, SMALL_FONT_DPI = 96, LARGE_FONT_DPI = 120 };

// Where a trackbar notification (code and thumb: low and high word of the
// WM_HSCROLL wParam) moves a slider of 0..maximum that stands at position;
// -1 when it stays. With settle a TB_THUMBPOSITION always counts, also where
// the thumb already stands.
int SliderTarget(int code, int thumb, int position, int maximum, bool settle);
// The font slider's new dots per inch, on the 24-dpi grid for a page step;
// -1 when it stays.
int FontTarget(int code, int thumb, int dpi);
// Of a mode's rates (ascending, 0 ends them, at most count), the highest not
// more than 1 Hz above wanted, else the lowest; 0 without rates. position
// receives its index, maximum the index of the last rate (both 0 without).
int ChooseRefresh(const uint16_t* rates, int count, int wanted, int* position, int* maximum);
// Above 480 lines the font size follows the screen's, counting any size but
// the small and the large one as large. True when the selection changed.
bool FollowScreenFont(int height, int screen_x, int screen_y, int* dpi_x, int* dpi_y);

#endif
