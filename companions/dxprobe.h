// dxprobe.exe's pure part, apart from its window and the system so that it
// can be tested: what the tool found out, and the lines it shows of it.
#ifndef VISTREL_DXPROBE_H
#define VISTREL_DXPROBE_H

#include <windows.h>

enum {
    PROBE_MAX_MODES = 256,
    PROBE_DRIVER_SIZE = 128,   // a display device's description
    PROBE_TEXT_SIZE = 100,
    PROBE_LINE_SIZE = 2 * PROBE_TEXT_SIZE + PROBE_DRIVER_SIZE,
};

// A file's fixed version: the four 16-bit parts, most significant first.
struct ProbeVersion {
    bool found;   // false: no such file, or no version information in it
    DWORD most, least;
};

struct ProbeMode {
    DWORD width, height, bits;
};

struct ProbeFacts {
    ProbeVersion ddraw, d3dim;
    char driver[PROBE_DRIVER_SIZE];   // the primary display device; empty: unknown
    bool direct_draw;                 // DirectDrawCreate made an object
    bool memory_known;
    DWORD memory_bytes;               // video memory DirectDraw reports in all
    int mode_count;                   // at most PROBE_MAX_MODES
    ProbeMode modes[PROBE_MAX_MODES];
};

// The tool's own texts, by what they name; each comes from section DXPROBE
// of the text file, with an English default.
enum ProbeTextId {
    PROBE_TITLE,
    PROBE_DDRAW,
    PROBE_D3DIM,
    PROBE_NOT_INSTALLED,
    PROBE_DRIVER,
    PROBE_UNKNOWN,
    PROBE_NO_DIRECTDRAW,
    PROBE_MEMORY,
    PROBE_MODES,
    PROBE_TEXT_COUNT
};
struct ProbeTexts {
    char text[PROBE_TEXT_COUNT][PROBE_TEXT_SIZE];
};

// "4.06.02.0436": the way DirectX's own files write their versions.
void FormatProbeVersion(char* out, size_t size, DWORD most, DWORD least);

// Hands every line of the tool's list to emit, in order.
typedef void (*ProbeLineSink)(const char* line, void* context);
void BuildProbeLines(const ProbeFacts& facts, const ProbeTexts& texts, ProbeLineSink emit, void* context);

#endif
