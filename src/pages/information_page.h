// The Information page's parts that work without its window: the lines it
// shows and the start-up entry it writes.
#ifndef VISTREL_INFORMATION_PAGE_H
#define VISTREL_INFORMATION_PAGE_H

#include <windows.h>
#include <stddef.h>
#include <stdint.h>

#include "pages/file_version.h"
#include "pages/monitor_info.h"

// What the list tells about the current card and the system; an empty text,
// a zero memory size, a memory clock of 10 MHz or less and a negative
// memory load are facts not had.
struct InformationFacts {
    uint16_t width, height, bits_per_pixel, refresh_hz;
    bool agp;
    uint32_t agp_rate;     // 2 for 2x, 0 unknown
    uint32_t memory_size;  // megabytes in the high 16 bits, the digit after the point in the low
    uint32_t memory_type;  // 1 fast-page DRAM, 2 EDO, 3 SDRAM, 4 SGRAM
    uint32_t mclk_mhz;
    char driver_version[FILE_VERSION_SIZE];
    char monitor_label[MONITOR_LABEL_SIZE];
    char monitor_name[MONITOR_NAME_SIZE];
    size_t physical_bytes;
    int memory_load;  // percent; Windows NT's is not shown
    char ddraw_version[FILE_VERSION_SIZE];
    char d3d_version[FILE_VERSION_SIZE];
};

enum { INFORMATION_MAX_LINES = 20, INFORMATION_LINE_SIZE = 160, SYSTEM_LINE_SIZE = 192 };
struct InformationLines {
    int count;
    char line[INFORMATION_MAX_LINES][INFORMATION_LINE_SIZE];
};

// A label line and an indented value line for each fact had, in the list's
// order; the labels from the text file.
void FormatInformationLines(const InformationFacts* facts, InformationLines* out);

// The operating system's two lines; os_class tells Windows 95 from 98.
void FormatSystemLine(const OSVERSIONINFOA* version, int os_class, char* out, size_t size);

// The Run entry that starts this program with Windows: with change false
// whether it is there for this program's path; with change true makes it so
// (on) or removes it (not on) and answers whether it is there now. An entry
// of the same name for another path counts as absent and is only ever
// overwritten. 0 when the Run key cannot be opened for writing.
int StartWithWindows(bool change, bool on);

#endif
