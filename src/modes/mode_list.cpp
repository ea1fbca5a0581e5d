// Which modes exist, which refresh rates each offers, and which rate is in
// effect, for the current adapter.
#include "modes/mode_list.h"

#include <windows.h>

#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/number.h"
#include "base/runtime.h"
#include "base/settings.h"
#include "base/state.h"
#include "chips/chips.h"
#include "hardware/driver_key.h"
#include "hardware/machine.h"
#include "modes/display_settings.h"
#include "modes/mode_keys.h"
#include "modes/rate_list.h"

ModeEntry* mode_table;

enum { NO_LIST = -1, NEAREST_WINDOW = 19, LIST_WALK_LIMIT = 128 };
static const int min_nt_frequency = 5;
static const uint16_t table_depths[] = {8, 15, 16, 24, 32};

struct ModeKey {
    int width, height, bits;
};

// The OS rate list on NT: the frequencies the display driver lists for the
// mode, leaving out the VGA driver's modes and "default" frequencies.
struct NtRateSearch {
    ModeKey mode;
    int index;  // position wanted, or RATE_LAST
    int seen;
    int item;
};

static bool VisitNtRate(const ListedMode* m, void* data)
{
    NtRateSearch* s = (NtRateSearch*)data;
    if (m->width != s->mode.width || m->height != s->mode.height || m->bits_per_pixel != s->mode.bits) return true;
    if (m->vga_device || m->frequency < min_nt_frequency) return true;
    if (s->index == RATE_LAST || s->seen == s->index) s->item = m->frequency;
    ++s->seen;
    return true;
}

// An item of a list: the rate, 0 when the list has no such item, or NO_LIST.
// count, when given, receives the number of items of the list.
static int NtOsRate(const ModeKey* mode, int index, int* count)
{
    NtRateSearch s = {*mode, index, 0, 0};
    ForEachListedMode(VisitNtRate, &s);
    if (s.seen == 0) return NO_LIST;
    if (count) *count = s.seen;
    return s.item;
}

static int TextRate(const char* text, int index, int* count)
{
    if (count) *count = CountRateListItems(text);
    return ParseRateList(text, index);
}

static int OsRate(const ModeKey* mode, int index, int* count)
{
    if (platform == PLATFORM_NT) return NtOsRate(mode, index, count);
    char text[RATE_LIST_TEXT_SIZE];
    if (!ModeKeyRates(mode->width, mode->height, mode->bits, text, sizeof text)) return NO_LIST;
    return TextRate(text, index, count);
}

static int ChipListRate(const ModeKey* mode, const char* suffix, int index, int* count)
{
    char section[32], key[32], text[RATE_LIST_TEXT_SIZE];
    FormatText(section, sizeof section, platform == PLATFORM_NT ? "CHIP%04x_NT4%s" : "CHIP%04x_95%s",
               CurrentAdapter()->device_id, suffix);
    FormatText(key, sizeof key, "%dx%dx%d", mode->width, mode->height, mode->bits);
    GetPrivateProfileStringA(section, key, "", text, sizeof text, chip_ini_path);
    if (!text[0]) return NO_LIST;
    return TextRate(text, index, count);
}

// Appends the items of a comma-separated list until one is not a rate.
// False when the list ended early at such an item.
static bool AppendTextRates(const char* text, uint16_t* rates, int max, int* count)
{
    int items = CountRateListItems(text);
    for (int k = 0; k < items; ++k) {
        int rate = ParseRateList(text, k);
        if (rate <= 0) return false;
        if (*count < max) rates[(*count)++] = (uint16_t)rate;
    }
    return true;
}

struct NtRateCollect {
    ModeKey mode;
    uint16_t* rates;
    int max;
    int count;
};

static bool CollectNtRate(const ListedMode* m, void* data)
{
    NtRateCollect* c = (NtRateCollect*)data;
    if (m->width != c->mode.width || m->height != c->mode.height || m->bits_per_pixel != c->mode.bits) return true;
    if (m->vga_device || m->frequency < min_nt_frequency) return true;
    if (c->count < c->max) c->rates[c->count++] = m->frequency;
    return true;
}

static bool ReadChipList(const ModeKey* mode, const char* suffix, char* text, DWORD size)
{
    char section[32], key[32];
    FormatText(section, sizeof section, platform == PLATFORM_NT ? "CHIP%04x_NT4%s" : "CHIP%04x_95%s",
               CurrentAdapter()->device_id, suffix);
    FormatText(key, sizeof key, "%dx%dx%d", mode->width, mode->height, mode->bits);
    GetPrivateProfileStringA(section, key, "", text, size, chip_ini_path);
    return text[0] != 0;
}

// The combined rate list of a mode, each source read once: the base list
// (the system's, else the chip file's) up to its first item that is not a
// rate, then, when the base list ran to its end, the extended list likewise.
// This is the list RefreshRateAt walks item by item. Returns the count.
static int ReadCombinedList(const ModeKey* mode, uint16_t* rates, int max)
{
    int count = 0;
    bool complete;
    char text[RATE_LIST_TEXT_SIZE];
    if (platform == PLATFORM_NT) {
        NtRateCollect c = {*mode, rates, max, 0};
        ForEachListedMode(CollectNtRate, &c);
        count = c.count;
        complete = true;
        if (!count && !ReadChipList(mode, "", text, sizeof text)) return 0;
        if (!count) complete = AppendTextRates(text, rates, max, &count);
    } else {
        if (!ModeKeyRates(mode->width, mode->height, mode->bits, text, sizeof text) &&
            !ReadChipList(mode, "", text, sizeof text))
            return 0;
        complete = AppendTextRates(text, rates, max, &count);
    }
    if (!complete || (CurrentAdapter()->flags & ADAPTER_NO_CLOCK_REFRESH)) return count;
    if (ReadChipList(mode, "E", text, sizeof text)) AppendTextRates(text, rates, max, &count);
    return count;
}

int RefreshRateAt(int index, int width, int height, int bits)
{
    ModeKey mode = {width, height, bits};
    uint16_t rates[LIST_WALK_LIMIT];
    int count = ReadCombinedList(&mode, rates, LIST_WALK_LIMIT);
    return index >= 0 && index < count ? rates[index] : 0;
}

int CombinedRateRange(int width, int height, int bits, int* lowest, int* highest)
{
    ModeKey mode = {width, height, bits};
    uint16_t rates[LIST_WALK_LIMIT];
    int count = ReadCombinedList(&mode, rates, LIST_WALK_LIMIT);
    *lowest = *highest = 0;
    for (int i = 0; i < count; ++i) {
        if (!*lowest || rates[i] < *lowest) *lowest = rates[i];
        if (rates[i] > *highest) *highest = rates[i];
    }
    return *highest > 0;
}

int MaxRefreshRate(int width, int height, int bits)
{
    ModeKey mode = {width, height, bits};
    int rate = OsRate(&mode, RATE_LAST, NULL);
    if (rate > 0) return rate;
    rate = ChipListRate(&mode, "", RATE_LAST, NULL);
    if (rate >= 1) return rate;
    return NO_RATE_LIMIT;
}

int NearestListedRefresh(int target)
{
    if (target <= 0) return 0;
    const AdapterRecord* a = CurrentAdapter();
    ModeKey mode = {a->width, a->height, a->bits_per_pixel};
    uint16_t rates[LIST_WALK_LIMIT];
    int count = ReadCombinedList(&mode, rates, LIST_WALK_LIMIT);
    int lower = 0, upper = 0;
    for (int i = 0; i <= count; ++i) {
        if (i == count) return lower;
        int rate = rates[i];
        if (rate >= target) {
            upper = rate;
            break;
        }
        lower = rate;
    }
    if (!upper) return lower;
    if (upper == target) return upper;
    for (int d = 1; d <= NEAREST_WINDOW; ++d) {
        if (lower + d >= target) return lower;
        if (upper - d <= target) return upper;
    }
    return 0;
}

int OsRefreshRate()
{
    if (platform == PLATFORM_NT) {
        int hz = MachineScreenRefresh();
        if (hz < 10) return 0;  // 0 or 1: the driver's default timing
        if (hz < 50) return RATE_INTERLACED;
        return hz;
    }
    if (!IsWindows98()) {
        int hz = DefaultKeyRefresh();
        if (hz > 1) return hz < 50 ? RATE_INTERLACED : hz;
    }
    const AdapterRecord* a = CurrentAdapter();
    int hz = ModeKeyRefresh(a->width, a->height, a->bits_per_pixel, 0, 0);
    return hz < 2 ? 0 : hz;
}

int SavedRefreshRate()
{
    const AdapterRecord* a = CurrentAdapter();
    if (a->refresh_hz != 0) return a->refresh_hz;
    int32_t saved = LoadSetting(SETTING_REFRESH);
    if (saved > 0 && FitsRate(saved)) {
        if (LoadSetting(SETTING_BITS) == a->bits_per_pixel && LoadSetting(SETTING_WIDTH) == a->width &&
            LoadSetting(SETTING_HEIGHT) == a->height)
            return saved;
        // The saved rate belonged to another mode.
        SaveSetting(SETTING_REFRESH, 0);
    }
    return OsRefreshRate();
}

int MeasuredRefreshRate()
{
    if (CurrentAdapter()->flags & (ADAPTER_NO_ADJUST | ADAPTER_NO_CLOCK_REFRESH)) {
        int hz = OsRefreshRate();
        return hz <= 0 ? RATE_FALLBACK : NearestListedRefresh(hz);
    }
    if (chip_is_interlaced()) return RATE_INTERLACED;
    if (!chip_open_io()) return 0;
    uint32_t h = chip_get_htotal();
    uint32_t v = chip_get_vtotal();
    uint32_t c = chip_get_char_width();
    double pixel_clock = chip_get_pixel_clock();
    chip_close_io();
    uint32_t clocks_per_frame = c * v * h;
    if (!clocks_per_frame) return 0;
    return NearestListedRefresh((int)(pixel_clock / clocks_per_frame));
}

void FreeModeTable()
{
    FreeMemory(mode_table);
    mode_table = NULL;
}
VISTREL_MODULE_RESET(FreeModeTable);

struct TableBuild {
    int include_15bit;
    int count;
};

static bool CollectMode(const ListedMode* m, void* data)
{
    TableBuild* b = (TableBuild*)data;
    if (b->count == MODE_TABLE_SIZE) return false;
    if (m->bits_per_pixel < 8 || (m->bits_per_pixel == 15 && !b->include_15bit)) return true;
    if (m->width < 640 || m->height < 480) return true;
    for (int i = b->count - 1; i >= 0; --i) {
        const ModeEntry* e = &mode_table[i];
        if (e->width == m->width && e->height == m->height && e->bits_per_pixel == m->bits_per_pixel) return true;
    }
    ModeEntry* e = &mode_table[b->count++];
    e->width = m->width;
    e->height = m->height;
    e->bits_per_pixel = m->bits_per_pixel;
    return b->count < MODE_TABLE_SIZE;
}

static bool ComesBefore(const ModeEntry* b, const ModeEntry* a)
{
    return b->width < a->width || (b->width == a->width && b->height < a->height);
}

static void SortModeTable(int count)
{
    for (uint16_t depth : table_depths) {
        for (int i = 0; i < count; ++i) {
            if (mode_table[i].bits_per_pixel != depth) continue;
            for (int j = i + 1; j < count; ++j) {
                if (mode_table[j].bits_per_pixel != depth || !ComesBefore(&mode_table[j], &mode_table[i])) continue;
                ModeEntry t = mode_table[i];
                mode_table[i] = mode_table[j];
                mode_table[j] = t;
            }
        }
    }
}

int BuildModeTable(int include_15bit)
{
    FreeModeTable();
    mode_table = (ModeEntry*)AllocZeroed(MODE_TABLE_SIZE * sizeof(ModeEntry));
    if (!mode_table) return 1;
    TableBuild build = {include_15bit, 0};
    ForEachListedMode(CollectMode, &build);
    SortModeTable(build.count);
    // Every 9x mode's rate list lies below the same driver key.
    if (platform != PLATFORM_NT) HoldDriverKey();
    for (int i = 0; i < build.count; ++i) {
        ModeEntry* e = &mode_table[i];
        ModeKey mode = {e->width, e->height, e->bits_per_pixel};
        uint16_t rates[LIST_WALK_LIMIT];
        int count = ReadCombinedList(&mode, rates, LIST_WALK_LIMIT);
        for (int k = 0; k < count && k < MODE_RATES; ++k) InsertRate(e->rates, MODE_RATES, rates[k]);
    }
    ReleaseDriverKey();
    return 1;
}
