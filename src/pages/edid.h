// The lines the Monitor page shows for a VESA EDID base block: year, image
// size, power states and the resolutions the monitor names. Pure: the
// texts come in, the lines go out.
#ifndef VISTREL_EDID_H
#define VISTREL_EDID_H

#include <stddef.h>
#include <stdint.h>

enum {
    EDID_TEXT_SIZE = 50,
    EDID_LINE_SIZE = 64,
    // 3 pairs, a heading with 3 states, a heading with 12 established and
    // 8 standard timings.
    EDID_MAX_LINES = 31,
    // The decoder reads up to byte 53: the last standard timing.
    EDID_BYTES_READ = 54,
};

// The INI texts the lines are made of, looked up by the caller.
struct EdidTexts {
    char year[EDID_TEXT_SIZE];        // "EDIDYear"
    char h_image[EDID_TEXT_SIZE];     // "EDIDHImage"
    char v_image[EDID_TEXT_SIZE];     // "EDIDVImage"
    char dpms[EDID_TEXT_SIZE];        // "EDIDDPMS"
    char standby[EDID_TEXT_SIZE];     // "DPMSStandby"
    char suspend[EDID_TEXT_SIZE];     // "DPMSSuspend"
    char shutoff[EDID_TEXT_SIZE];     // "DPMSShutoff"
    char resolutions[EDID_TEXT_SIZE]; // "EDIDRES"
};

struct EdidLines {
    int count;
    char line[EDID_MAX_LINES][EDID_LINE_SIZE];
};

// Value lines and the lines under a heading start with this.
extern const char monitor_list_indent[];

// 1 and the lines, or 0 and no line for a block that is missing, shorter
// than the bytes read, or without the EDID header.
int DecodeEdidLines(const uint8_t* block, size_t length, const EdidTexts* texts, EdidLines* out);

#endif
