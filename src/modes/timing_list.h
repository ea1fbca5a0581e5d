// The 9x display driver's timing list of a mode: values "1", "2", ... of
// DEFAULT\TIMINGS\<width>,<height>, of which it uses "1".
#ifndef VISTREL_TIMING_LIST_H
#define VISTREL_TIMING_LIST_H

#include "chips/chips.h"

enum { TIMING_LIST_MAX = 32, TIMING_VALUE_MAX = 64 };

// Makes the record value "1" of the mode's list, moving the list's values
// one place down first when the chip asks for it. The list is the user's
// display configuration: on any failure it is left as it was. 1, or 0.
int InstallTiming(int width, int height, const ChipTiming* timing);

#endif
