// Changing the refresh rate of the current mode, and whole display modes.
#include "modes/mode_change.h"

#include "base/adapters.h"
#include "base/number.h"
#include "base/runtime.h"
#include "base/settings.h"
#include "base/state.h"
#include "chips/chips.h"
#include "modes/display_settings.h"
#include "modes/font_size.h"
#include "modes/mode_keys.h"
#include "modes/mode_list.h"
#include "modes/position.h"
#include "modes/timing_list.h"

static_assert(sizeof(DEVMODEA) == 156, "the mode request of the standard size, no driver bytes");

static const DWORD interlaced_display_flag = 2;
static const int nt_safe_rate = 60;

static int Distance(int a, int b) { return a > b ? a - b : b - a; }
// Hz between a rate and the one running beyond which it is not reached.
static const int rate_not_reached = 5;

bool RefreshCloseEnough(int target, int current)
{
    int distance = Distance(current, target);
    if (target > 90) return distance <= 5;
    return distance <= 3 || (target < 50 && current < 50);
}

// The rate to ask Windows for: the list's maximum stands for rates above it,
// which the pixel clock then reaches.
static int OsRequestRate(int target, int max)
{
    if (CurrentAdapter()->flags & ADAPTER_UNCLAMPED_RATE) return target;
    return max < target ? max : target;
}

static void BuildModeRequest(DEVMODEA* mode, DWORD mask, int width, int height, int bits, int dpi, int frequency,
                             bool interlaced)
{
    memset(mode, 0, sizeof *mode);
    mode->dmSize = sizeof *mode;
    lstrcpynA((char*)mode->dmDeviceName, CurrentAdapter()->device_name, sizeof mode->dmDeviceName);
    mode->dmFields = mask;
    mode->dmPelsWidth = (DWORD)width;
    mode->dmPelsHeight = (DWORD)height;
    mode->dmBitsPerPel = (DWORD)bits;
    mode->dmLogPixels = (WORD)dpi;
    mode->dmDisplayFrequency = (DWORD)frequency;
    mode->dmDisplayFlags = interlaced ? interlaced_display_flag : 0;
}

// The display driver finds what the chip driver asks for before the switch.
static void PrepareDisplayDriver(int width, int height, int bits, int frequency)
{
    ChipTiming timing = {};
    uint32_t needs =
        chip_prepare_mode((uint16_t)width, (uint16_t)height, (uint16_t)bits, (uint32_t)frequency, &timing);
    if ((needs & PREPARE_REFRESH_KEY) && ModeKeyRefresh(width, height, bits, 1, frequency) != 1) return;
    if (needs & PREPARE_TIMING) InstallTiming(width, height, &timing);
}

static void SaveMode(int refresh, int width, int height, int bits)
{
    SaveSetting(SETTING_REFRESH, refresh);
    SaveSetting(SETTING_BITS, bits);
    SaveSetting(SETTING_WIDTH, width);
    SaveSetting(SETTING_HEIGHT, height);
}

int SetRefreshRate(int target)
{
    if (target <= 1 || !FitsRate(target)) return 0;
    AdapterRecord* a = CurrentAdapter();
    int current = MeasuredRefreshRate();
    if (RefreshCloseEnough(target, current)) {
        a->refresh_hz = (uint16_t)target;
        return 1;
    }
    int max = MaxRefreshRate(a->width, a->height, a->bits_per_pixel);
    int frequency = OsRequestRate(target, max);
    if (current != frequency) {
        DEVMODEA request;
        BuildModeRequest(&request, DM_DISPLAYFREQUENCY, a->width, a->height, a->bits_per_pixel, 0, frequency,
                         frequency < 50);
        int saved = a->refresh_hz;
        a->refresh_hz = REFRESH_CHANGE_MARKER;
        // An NT miniport may refuse to go from one rate it cannot hold to
        // another; a step through 60 Hz gets it there.
        if (platform == PLATFORM_NT && max <= target && max <= saved) {
            DEVMODEA safe = request;
            safe.dmDisplayFrequency = nt_safe_rate;
            safe.dmDisplayFlags = 0;
            ChangeCurrentDisplay(&safe, 0);
        }
        PrepareDisplayDriver(a->width, a->height, a->bits_per_pixel, frequency);
        LONG r = ChangeCurrentDisplay(&request, CDS_UPDATEREGISTRY);
        a->refresh_hz = (uint16_t)frequency;
        if (r != DISP_CHANGE_SUCCESSFUL) return 0;
    }
    current = MeasuredRefreshRate();
    // A rate the clock could not reach is not running: nothing to keep.
    if ((max < target || Distance(current, target) > rate_not_reached) && !ProgramRefreshClock(target)) return 0;
    SaveMode(target, a->width, a->height, a->bits_per_pixel);
    a->refresh_hz = (uint16_t)target;
    return 1;
}

int ProgramRefreshClock(int rate)
{
    if (CurrentAdapter()->flags & (ADAPTER_NO_ADJUST | ADAPTER_NO_CLOCK_REFRESH)) return rate;
    if (rate < 50) return 0;
    if (!chip_open_io()) return 0;
    uint32_t h = chip_get_htotal();
    uint32_t v = chip_get_vtotal();
    uint32_t c = chip_get_char_width();
    double per_frame = (double)c * h * v;
    double before = chip_get_pixel_clock();
    uint32_t ok = chip_set_pixel_clock(rate * per_frame);
    // A synthesizer may take a setting far from the one asked for: that rate
    // is not running, and the clock goes back to where it was.
    if (ok && per_frame > 0 && Distance((int)(chip_get_pixel_clock() / per_frame + 0.5), rate) > rate_not_reached) {
        chip_set_pixel_clock(before);
        ok = 0;
    }
    chip_close_io();
    return ok ? rate : 0;
}

// The rate the user chose for the mode now running, or 0.
static int ChosenRateOfCurrentMode()
{
    const AdapterRecord* a = CurrentAdapter();
    int32_t chosen = LoadSetting(SETTING_REFRESH);
    if (chosen <= 0 || !FitsRate(chosen)) return 0;
    if (LoadSetting(SETTING_BITS) != a->bits_per_pixel || LoadSetting(SETTING_WIDTH) != a->width ||
        LoadSetting(SETTING_HEIGHT) != a->height)
        return 0;
    return chosen;
}

void SyncRefreshRate(int at_startup)
{
    AdapterRecord* a = CurrentAdapter();
    if ((startup_flags & STARTUP_AUTORUN) && at_startup == 0) {
        a->refresh_hz = (uint16_t)SavedRefreshRate();
        a->refresh_hz = (uint16_t)NearestListedRefresh(a->refresh_hz);
        if (a->refresh_hz == 0) a->refresh_hz = (uint16_t)MeasuredRefreshRate();
        else SetRefreshRate(a->refresh_hz);
        RestorePosition();
    } else {
        a->refresh_hz = (uint16_t)OsRefreshRate();
        a->refresh_hz = (uint16_t)MeasuredRefreshRate();
        // After another program changed and restored the display, a 9x
        // driver runs the rate of its own list again: keep the one chosen
        // for this mode, which the next quiet redraw brings back.
        if (at_startup != 0) {
            int chosen = ChosenRateOfCurrentMode();
            if (chosen) a->refresh_hz = (uint16_t)chosen;
        }
    }
    if (a->refresh_hz == 0) a->refresh_hz = RATE_FALLBACK;
}

LONG ApplyDisplayMode(HWND owner, DWORD mask, int width, int height, int bits, int dpi_x, int dpi_y, int refresh)
{
    if (mask != DM_LOGPIXELS) mask |= DM_DISPLAYFREQUENCY;
    AdapterRecord* a = CurrentAdapter();
    int frequency = OsRequestRate(refresh, MaxRefreshRate(width, height, bits));
    DEVMODEA request;
    BuildModeRequest(&request, mask, width, height, bits, dpi_x, frequency,
                     (mask & DM_DISPLAYFREQUENCY) && refresh < 50);
    uint16_t saved = a->refresh_hz;
    a->refresh_hz = REFRESH_CHANGE_MARKER;
    PrepareDisplayDriver(width, height, bits, frequency);
    LONG r = ChangeCurrentDisplay(&request, CDS_UPDATEREGISTRY);
    a->refresh_hz = saved;
    if (r == DISP_CHANGE_SUCCESSFUL || r == DISP_CHANGE_RESTART) {
        // A change that waits for a restart leaves the old mode running.
        if (r == DISP_CHANGE_SUCCESSFUL) {
            a->bits_per_pixel = (uint16_t)bits;
            a->width = (uint16_t)width;
            a->height = (uint16_t)height;
            a->refresh_hz = (uint16_t)frequency;
        }
        InvalidateRect(NULL, NULL, TRUE);
        SaveSetting(SETTING_REFRESH, refresh);
        SaveSetting(SETTING_WIDTH, width);
        SaveSetting(SETTING_HEIGHT, height);
        SaveSetting(SETTING_BITS, bits);
    }
    if (r == DISP_CHANGE_SUCCESSFUL && (mask & DM_DISPLAYFREQUENCY)) {
        SetRefreshRate(refresh);
        RestorePosition();
    }
    if ((mask & DM_LOGPIXELS) && (r == DISP_CHANGE_SUCCESSFUL || r == DISP_CHANGE_RESTART))
        SwitchFontSize(dpi_x, dpi_y);
    return r;
}
