#include "pages/edid.h"

#include "base/runtime.h"

const char monitor_list_indent[] = "        ";

static const uint8_t edid_header[8] = {0x00, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0x00};

// Where the block keeps what the list shows.
enum : uint8_t {
    EDID_YEAR = 17,  // years since 1990
    EDID_H_IMAGE_CM = 21,
    EDID_V_IMAGE_CM = 22,
    EDID_FEATURES = 24,
    EDID_STANDARD_TIMINGS = 38,
};
enum { STANDARD_TIMINGS = 8, STANDARD_UNUSED_BELOW = 9, YEAR_BASE = 1990 };

struct FeatureLine {
    uint8_t bit;
    size_t text;  // offset of the text in EdidTexts
};
static const FeatureLine power_states[] = {
    {.bit = 0x80, .text = offsetof(EdidTexts, standby)},
    {.bit = 0x40, .text = offsetof(EdidTexts, suspend)},
    {.bit = 0x20, .text = offsetof(EdidTexts, shutoff)},
};

// The established timings the list names, in its order; the others (720 x
// 400, 640 x 480 at 67 Hz, 832 x 624) are left out.
struct EstablishedTiming {
    uint8_t byte, bit;
    const char* text;
};
static const EstablishedTiming established_timings[] = {
    {.byte = 35, .bit = 5, .text = "640 x 480 60Hz"},
    {.byte = 35, .bit = 3, .text = "640 x 480 72Hz"},
    {.byte = 35, .bit = 2, .text = "640 x 480 75Hz"},
    {.byte = 35, .bit = 1, .text = "800 x 600 56Hz"},
    {.byte = 35, .bit = 0, .text = "800 x 600 60Hz"},
    {.byte = 36, .bit = 7, .text = "800 x 600 72Hz"},
    {.byte = 36, .bit = 6, .text = "800 x 600 75Hz"},
    {.byte = 36, .bit = 4, .text = "1024 x 768 87Hz(Interlace)"},
    {.byte = 36, .bit = 3, .text = "1024 x 768 60Hz"},
    {.byte = 36, .bit = 2, .text = "1024 x 768 70Hz"},
    {.byte = 36, .bit = 1, .text = "1024 x 768 75Hz"},
    {.byte = 36, .bit = 0, .text = "1280 x 1024 75Hz"},
};

// Height per width by the top two bits of a standard timing's second byte.
struct Aspect {
    int numerator, denominator;
};
static const Aspect standard_aspects[4] = {{1, 1}, {3, 4}, {4, 5}, {9, 16}};

static void AddLine(EdidLines* out, const char* indent, const char* text)
{
    if (out->count == EDID_MAX_LINES) return;
    FormatText(out->line[out->count++], EDID_LINE_SIZE, "%s%s", indent, text);
}

static void AddPair(EdidLines* out, const char* label, int value)
{
    AddLine(out, "", label);
    char number[12];
    FormatText(number, sizeof number, "%d", value);
    AddLine(out, monitor_list_indent, number);
}

static void AddPowerStates(const uint8_t* block, const EdidTexts* texts, EdidLines* out)
{
    uint8_t features = block[EDID_FEATURES];
    if (!(features & 0xE0)) return;
    AddLine(out, "", texts->dpms);
    for (const FeatureLine& state : power_states)
        if (features & state.bit) AddLine(out, monitor_list_indent, (const char*)texts + state.text);
}

static void AddStandardTimings(const uint8_t* block, EdidLines* out)
{
    for (int i = 0; i < STANDARD_TIMINGS; ++i) {
        const uint8_t* entry = block + EDID_STANDARD_TIMINGS + 2 * i;
        if (entry[0] < STANDARD_UNUSED_BELOW) return;
        int width = entry[0] * 8 + 248;
        const Aspect& aspect = standard_aspects[entry[1] >> 6];
        char text[EDID_LINE_SIZE];
        FormatText(text, sizeof text, "%d x %d %uHz", width, width * aspect.numerator / aspect.denominator,
                   (unsigned)(entry[1] & 0x3F) + 60);
        AddLine(out, monitor_list_indent, text);
    }
}

int DecodeEdidLines(const uint8_t* block, size_t length, const EdidTexts* texts, EdidLines* out)
{
    out->count = 0;
    if (!block || length < EDID_BYTES_READ || memcmp(block, edid_header, sizeof edid_header) != 0) return 0;
    AddPair(out, texts->year, block[EDID_YEAR] + YEAR_BASE);
    AddPair(out, texts->h_image, block[EDID_H_IMAGE_CM]);
    AddPair(out, texts->v_image, block[EDID_V_IMAGE_CM]);
    AddPowerStates(block, texts, out);
    AddLine(out, "", texts->resolutions);
    for (const EstablishedTiming& t : established_timings)
        if (block[t.byte] & (1 << t.bit)) AddLine(out, monitor_list_indent, t.text);
    AddStandardTimings(block, out);
    return 1;
}
