// The Performance page's slider arithmetic, free of windows.
#ifndef VISTREL_PERFORMANCE_PAGE_H
#define VISTREL_PERFORMANCE_PAGE_H

// Where a trackbar notification (code, thumb position) moves the memory
// clock from current within lowest..highest, in the page's 16-bit signed
// steps of 1 MHz; -1 when it stays.
int MemoryClockTarget(int code, int thumb, int current, int lowest, int highest);

#endif
