// The simulated display driver: the modes and refresh rates each card
// offers, mode changes that program the card's CRT timing and pixel clock
// like a 9x display driver or an NT miniport, and Wine's desktop kept at
// the primary card's mode. Display devices and monitors are in monitors.cpp.
#include <math.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "hardware/machine.h"
#include "machine_state.h"

namespace {

bool IsNt() { return sim->config.windows == SIM_WINDOWS_NT4; }

// The card of the primary display device, whatever its PCI decoding.
int PrimaryCard()
{
    int card = sim->config.primary_card;
    return SimCardValid(card) && sim->config.cards[card].vendor_id ? card : -1;
}

struct ListedMode {
    uint16_t width, height, bits, frequency;
    bool interlaced;
    const char* driver;  // dmDeviceName
};
enum { MAX_LISTED = 2048, MAX_SYNTHETIC_MODES = 256 };

// A mode list set by SimSetModeList, in place of the card's own.
SimListedMode synthetic_modes[MAX_SYNTHETIC_MODES];
int synthetic_count;

int BaseName(const char* file, char* out, size_t size)
{
    lstrcpynA(out, file, (int)size);
    char* dot = strrchr(out, '.');
    if (dot) *dot = 0;
    return 1;
}

void Add(ListedMode* list, int* count, int width, int height, int bits, int frequency, bool interlaced,
         const char* driver)
{
    if (*count >= MAX_LISTED) return;
    list[(*count)++] = {(uint16_t)width, (uint16_t)height, (uint16_t)bits, (uint16_t)frequency, interlaced, driver};
}

// What EnumDisplaySettingsA walks. Windows 9x lists each resolution and
// depth once (frequency 0), the 16-colour VGA modes included. NT lists one
// entry per frequency of the card's display driver, after the modes of the
// VGA drivers; like real miniports it repeats a frequency here and there and
// offers the hardware default as frequency 1.
int BuildSyntheticList(ListedMode* list, const char* driver_name)
{
    int count = 0;
    for (int i = 0; i < synthetic_count; i++) {
        const SimListedMode* m = &synthetic_modes[i];
        if (!IsNt()) Add(list, &count, m->width, m->height, m->bits, 0, false, driver_name);
        for (int r = 0; IsNt() && r < m->rate_count; r++)
            Add(list, &count, m->width, m->height, m->bits, m->rates[r], false, driver_name);
    }
    return count;
}

int BuildModeList(int card, ListedMode* list, char* driver_name, size_t name_size)
{
    SimModeLimits limits = DisplayCardLimits(card);
    BaseName(SimCardChip(card)->driver_file, driver_name, name_size);
    if (synthetic_count) return BuildSyntheticList(list, driver_name);
    int count = 0;
    if (!IsNt()) {
        Add(list, &count, 640, 480, 4, 0, false, driver_name);
        Add(list, &count, 800, 600, 4, 0, false, driver_name);
    } else {
        Add(list, &count, 640, 480, 4, 60, false, "vga");
        Add(list, &count, 320, 200, 8, 70, false, "vga256");
        Add(list, &count, 640, 480, 8, 70, false, "vga256");
    }
    bool interlace_capable = SimCardChip(card)->family == SIM_FAMILY_S3;
    for (int d = 0; d < sim_desktop_depth_count; d++) {
        int bits = sim_desktop_depths[d];
        for (int s = 0; s < sim_desktop_size_count; s++) {
            int w = sim_desktop_sizes[s].width, h = sim_desktop_sizes[s].height;
            uint16_t rates[SIM_MAX_RATES];
            int n = SimModeRates(&limits, w, h, bits, rates);
            if (!n) continue;
            if (!IsNt()) {
                Add(list, &count, w, h, bits, 0, false, driver_name);
                continue;
            }
            if (w == 640) Add(list, &count, w, h, bits, 1, false, driver_name);
            if (interlace_capable && SimModeInterlacedOffered(&limits, w, h, bits))
                Add(list, &count, w, h, bits, 43, true, driver_name);
            for (int i = 0; i < n; i++) {
                Add(list, &count, w, h, bits, rates[i], false, driver_name);
                if (w == 1024 && bits == 8 && rates[i] == 60) Add(list, &count, w, h, bits, 60, false, driver_name);
            }
        }
    }
    return count;
}

void FillDevMode(DEVMODEA* dm, const ListedMode* m)
{
    WORD size = dm->dmSize ? dm->dmSize : (WORD)sizeof(DEVMODEA);
    WORD extra = dm->dmDriverExtra;
    DEVMODEA full;
    memset(&full, 0, sizeof full);
    lstrcpynA((char*)full.dmDeviceName, m->driver, sizeof full.dmDeviceName);
    full.dmSpecVersion = DM_SPECVERSION;
    full.dmSize = size;
    full.dmDriverExtra = extra;
    full.dmFields = DM_BITSPERPEL | DM_PELSWIDTH | DM_PELSHEIGHT | DM_DISPLAYFREQUENCY | DM_DISPLAYFLAGS;
    full.dmBitsPerPel = m->bits;
    full.dmPelsWidth = m->width;
    full.dmPelsHeight = m->height;
    full.dmDisplayFrequency = m->frequency;
    full.dmDisplayFlags = m->interlaced ? DM_INTERLACED : 0;
    memcpy(dm, &full, size < sizeof full ? size : sizeof full);
}

// The card a display name stands for: NULL and "DISPLAY" the primary, and
// on Windows 98 "\\.\DISPLAYn" the n-th display device. -1 for none.
int DeviceCard(const char* device)
{
    if (!device || !device[0] || lstrcmpiA(device, "DISPLAY") == 0) return PrimaryCard();
    if (sim->config.windows != SIM_WINDOWS_98 || _strnicmp(device, "\\\\.\\DISPLAY", 11) != 0) return -1;
    int cards[SIM_MAX_CARDS];
    int count = DisplayDeviceCards(cards);
    int n = atoi(device + 11);
    return n >= 1 && n <= count ? cards[n - 1] : -1;
}

int WineBits(int bits) { return bits == 15 ? 16 : bits; }

int self_change_depth;  // inside our own resize of Wine's desktop

bool WineDesktopIs(int width, int height, int bits)
{
    DEVMODEA current;
    memset(&current, 0, sizeof current);
    current.dmSize = sizeof current;
    if (!EnumDisplaySettingsA(NULL, ENUM_CURRENT_SETTINGS, &current)) return true;
    return (int)current.dmPelsWidth == width && (int)current.dmPelsHeight == height &&
           (int)current.dmBitsPerPel == WineBits(bits);
}

// Wine's desktop follows the primary card. Wine sends WM_DISPLAYCHANGE on a
// resize; when the size stays, the driver announces the change itself.
void ShowOnWineDesktop(int width, int height, int bits, bool announce)
{
    self_change_depth++;
    if (!WineDesktopIs(width, height, bits)) {
        DEVMODEA dm;
        memset(&dm, 0, sizeof dm);
        dm.dmSize = sizeof dm;
        dm.dmFields = DM_PELSWIDTH | DM_PELSHEIGHT | DM_BITSPERPEL;
        dm.dmPelsWidth = width;
        dm.dmPelsHeight = height;
        dm.dmBitsPerPel = WineBits(bits);
        ChangeDisplaySettingsExA(NULL, &dm, NULL, 0, NULL);
    } else if (announce) {
        DWORD_PTR result;
        SendMessageTimeoutA(HWND_BROADCAST, WM_DISPLAYCHANGE, WineBits(bits), MAKELPARAM(width, height),
                            SMTO_ABORTIFHUNG, 2000, &result);
    }
    self_change_depth--;
}

// Windows repaints every window after a mode change; Wine does not.
void RepaintEverything() { InvalidateRect(NULL, NULL, TRUE); }

// Programs a card for a mode: the VESA timing at the rate the driver picks,
// then the card's CRT controller and clock. frequency is what an NT
// miniport was asked for (0/1 = default); a 9x driver reads the registry.
void SetCardMode(int card, int width, int height, int bits, int frequency, bool interlaced)
{
    SimModeLimits limits = DisplayCardLimits(card);
    uint16_t rates[SIM_MAX_RATES];
    int n = SimModeRates(&limits, width, height, bits, rates);
    int rate;
    if (IsNt()) {
        rate = frequency > 1 ? frequency : SimDefaultRate(rates, n);
    } else {
        char text[80];
        rate = SimChooseRate(rates, n, RegistryRefreshText9x(card, width, height, bits, text, sizeof text) ? text : NULL);
        interlaced = false;
    }
    const SimTiming* timing = SimFindTiming(width, height, interlaced ? 43 : rate, interlaced);
    if (!timing) timing = SimFindTiming(width, height, SimDefaultRate(rates, n), false);
    SimDriverMode* mode = &sim->cards[card].mode;
    mode->width = (uint16_t)width;
    mode->height = (uint16_t)height;
    mode->bits = (uint16_t)bits;
    mode->requested = (uint16_t)(IsNt() ? frequency : 0);
    mode->interlaced = timing && (timing->flags & SIM_TIMING_INTERLACED) ? 1 : 0;
    mode->refresh = timing ? timing->refresh : 0;
    if (timing) SimCardOps(card)->program_mode(card, timing, bits);
}

bool FrequencyOffered(int card, int width, int height, int bits, int frequency)
{
    if (frequency <= 1) return true;
    SimModeLimits limits = DisplayCardLimits(card);
    if (frequency < 50)
        return SimCardChip(card)->family == SIM_FAMILY_S3 && frequency == 43 &&
               SimModeInterlacedOffered(&limits, width, height, bits);
    uint16_t rates[SIM_MAX_RATES];
    int n = SimModeRates(&limits, width, height, bits, rates);
    for (int i = 0; i < n; i++)
        if (rates[i] == frequency) return true;
    return false;
}

HWND driver_window;

// Another program changed Wine's desktop: the display driver sets the card
// to that mode as it would have on Windows, or puts Wine back when the card
// cannot show it.
void OnForeignDisplayChange(int width, int height, int wine_bits)
{
    int card = PrimaryCard();
    if (card < 0) return;
    const SimDriverMode* m = &sim->cards[card].mode;
    if (m->width == width && m->height == height && WineBits(m->bits) == wine_bits) return;
    SimModeLimits limits = DisplayCardLimits(card);
    int bits = wine_bits == 16 && m->bits == 15 ? 15 : wine_bits;
    if (!SimModeOffered(&limits, width, height, bits)) {
        ShowOnWineDesktop(m->width, m->height, m->bits, false);
        return;
    }
    SetCardMode(card, width, height, bits, 0, false);
    sim_counters.mode_changes++;
    RepaintEverything();
}

LRESULT CALLBACK DriverWindowProc(HWND window, UINT message, WPARAM wparam, LPARAM lparam)
{
    if (message == WM_DISPLAYCHANGE && sim && !self_change_depth)
        OnForeignDisplayChange(LOWORD(lparam), HIWORD(lparam), (int)wparam);
    return DefWindowProcA(window, message, wparam, lparam);
}

// A mode change on one card. Only the primary's mode is stored for the next
// start and shown on Wine's desktop.
LONG ChangeCardMode(int card, DEVMODEA* mode, DWORD flags)
{
    sim_counters.mode_changes++;
    bool primary = card == PrimaryCard();
    SimDriverMode want = sim->cards[card].mode;
    int frequency = 0;
    if (!mode) {
        if (primary) RegistryReadDisplaySettings(&want);
        frequency = want.requested;
        flags &= ~CDS_UPDATEREGISTRY;
    } else {
        if (mode->dmFields & DM_PELSWIDTH) want.width = (uint16_t)mode->dmPelsWidth;
        if (mode->dmFields & DM_PELSHEIGHT) want.height = (uint16_t)mode->dmPelsHeight;
        if (mode->dmFields & DM_BITSPERPEL) want.bits = (uint16_t)mode->dmBitsPerPel;
        if (mode->dmFields & DM_DISPLAYFREQUENCY) frequency = (int)mode->dmDisplayFrequency;
    }
    SimModeLimits limits = DisplayCardLimits(card);
    if (!SimModeOffered(&limits, want.width, want.height, want.bits)) return DISP_CHANGE_BADMODE;
    if (IsNt() && !FrequencyOffered(card, want.width, want.height, want.bits, frequency)) return DISP_CHANGE_BADMODE;
    if (flags & CDS_TEST) return DISP_CHANGE_SUCCESSFUL;
    want.requested = (uint16_t)(IsNt() ? frequency : 0);
    // Windows 95 changes the colour depth only when it starts.
    if (sim->config.windows == SIM_WINDOWS_95 && want.bits != sim->cards[card].mode.bits) {
        if (flags & CDS_UPDATEREGISTRY) RegistryWriteDisplaySettings(card, &want);
        return DISP_CHANGE_RESTART;
    }
    SetCardMode(card, want.width, want.height, want.bits, frequency, IsNt() && frequency > 1 && frequency < 50);
    if (flags & CDS_UPDATEREGISTRY) RegistryWriteDisplaySettings(card, &sim->cards[card].mode);
    if (primary) ShowOnWineDesktop(want.width, want.height, want.bits, true);
    RepaintEverything();
    return DISP_CHANGE_SUCCESSFUL;
}

}  // namespace

SimModeLimits DisplayCardLimits(int card)
{
    const SimChip* chip = SimCardChip(card);
    const SimCardConfig* c = &sim->config.cards[card];
    SimModeLimits limits;
    limits.memory_bytes = (uint64_t)c->memory_mb * 1024 * 1024 + (uint64_t)c->memory_extra_kb * 1024;
    memcpy(limits.max_pixel_hz, chip->max_pixel_hz, sizeof limits.max_pixel_hz);
    limits.has_15bit = chip->has_15bit;
    return limits;
}

int DisplayDeviceCards(int* cards)
{
    int count = 0;
    int primary = sim->config.primary_card;
    if (primary >= 0 && primary < sim->config.card_count && sim->config.cards[primary].display_device)
        cards[count++] = primary;
    for (int card = 0; card < sim->config.card_count; card++)
        if (card != primary && sim->config.cards[card].display_device && sim->config.cards[card].vendor_id)
            cards[count++] = card;
    if (sim->config.monitors > 0 && count > sim->config.monitors) count = sim->config.monitors;
    return count;
}

void DisplayBoot(int use_registry_mode)
{
    synthetic_count = 0;
    const SimMachineConfig* config = &sim->config;
    for (int card = 0; card < config->card_count; card++) {
        const SimCardConfig* c = &config->cards[card];
        SimDriverMode want = {config->start_width, config->start_height, config->start_bits, 0,
                              config->start_refresh, 0};
        if (card != config->primary_card && c->start_width)
            want = {c->start_width, c->start_height, c->start_bits, 0, c->start_refresh, 0};
        if (card == config->primary_card && use_registry_mode) {
            SimDriverMode stored;
            if (RegistryReadDisplaySettings(&stored)) want = stored;
        }
        SimModeLimits limits = DisplayCardLimits(card);
        if (!SimModeOffered(&limits, want.width, want.height, want.bits)) {
            want.width = 640;
            want.height = 480;
            want.bits = 8;
        }
        int frequency = FrequencyOffered(card, want.width, want.height, want.bits, want.requested) ? want.requested : 0;
        SetCardMode(card, want.width, want.height, want.bits, frequency, frequency > 1 && frequency < 50);
    }
}

void DisplayEnsureWineDesktop()
{
    int card = PrimaryCard();
    if (card < 0) return;
    const SimDriverMode* m = &sim->cards[card].mode;
    if (m->width) ShowOnWineDesktop(m->width, m->height, m->bits, false);
}

void DisplayAttachProcess()
{
    if (driver_window) return;
    WNDCLASSA wc;
    memset(&wc, 0, sizeof wc);
    wc.lpfnWndProc = DriverWindowProc;
    wc.hInstance = GetModuleHandleA(NULL);
    wc.lpszClassName = "VistrelSimDisplayDriver";
    RegisterClassA(&wc);
    // Topmost, so that Wine's broadcast, which goes in z-order, reaches the
    // driver before any window of the program.
    driver_window = CreateWindowExA(WS_EX_TOPMOST | WS_EX_TOOLWINDOW, wc.lpszClassName, "", WS_POPUP, 0, 0, 0, 0,
                                    NULL, NULL, wc.hInstance, NULL);
}

void DisplayDetachProcess()
{
    if (driver_window) DestroyWindow(driver_window);
    driver_window = NULL;
}

int SimSetCardMode(int card, int width, int height, int bits, int frequency)
{
    if (!sim || !SimCardValid(card)) return 0;
    SimModeLimits limits = DisplayCardLimits(card);
    if (!SimModeOffered(&limits, width, height, bits)) return 0;
    if (IsNt() && !FrequencyOffered(card, width, height, bits, frequency)) return 0;
    SetCardMode(card, width, height, bits, frequency, IsNt() && frequency > 1 && frequency < 50);
    return 1;
}

void SimSetModeList(const SimListedMode* modes, int count)
{
    synthetic_count = 0;
    for (int i = 0; i < count && i < MAX_SYNTHETIC_MODES; i++) synthetic_modes[synthetic_count++] = modes[i];
    int card = PrimaryCard();
    if (!sim || card < 0 || IsNt()) return;
    for (int i = 0; i < synthetic_count; i++) {
        const SimListedMode* m = &synthetic_modes[i];
        RegistryWriteModeList9x(card, m->width, m->height, m->bits, m->rates, m->rate_count);
    }
}

BOOL MachineEnumDisplaySettings(const char* device, DWORD mode_number, DEVMODEA* mode)
{
    sim_counters.enum_settings_calls++;
    if (mode_number == 0) sim_counters.enum_settings_walks++;
    if (!sim) return EnumDisplaySettingsA(device, mode_number, mode);
    int card = DeviceCard(device);
    if (card < 0 || !mode) return FALSE;
    static ListedMode list[MAX_LISTED];
    static char driver_name[32];
    if (mode_number == ENUM_CURRENT_SETTINGS || mode_number == ENUM_REGISTRY_SETTINGS) {
        SimDriverMode m = sim->cards[card].mode;
        if (mode_number == ENUM_REGISTRY_SETTINGS && card == sim->config.primary_card) RegistryReadDisplaySettings(&m);
        BaseName(SimCardChip(card)->driver_file, driver_name, sizeof driver_name);
        int frequency = !IsNt() ? 0 : m.requested <= 1 ? 1 : m.refresh;
        ListedMode current = {m.width, m.height, m.bits, (uint16_t)frequency, m.interlaced != 0, driver_name};
        FillDevMode(mode, &current);
        return TRUE;
    }
    int count = BuildModeList(card, list, driver_name, sizeof driver_name);
    if (mode_number >= (DWORD)count) return FALSE;
    FillDevMode(mode, &list[mode_number]);
    return TRUE;
}

// ChangeDisplaySettingsA: the primary display device (dmDeviceName is not
// looked at, as on Windows).
LONG MachineChangeDisplaySettings(DEVMODEA* mode, DWORD flags)
{
    if (!sim) {
        sim_counters.mode_changes++;
        return ChangeDisplaySettingsA(mode, flags);
    }
    int card = PrimaryCard();
    if (card < 0) return DISP_CHANGE_FAILED;
    return ChangeCardMode(card, mode, flags);
}

LONG WINAPI DisplayChangeSettingsEx(LPCSTR device, DEVMODEA* mode, HWND window, DWORD flags, LPVOID param)
{
    if (!sim || window || param) return DISP_CHANGE_BADPARAM;
    int card = DeviceCard(device);
    if (card < 0) return DISP_CHANGE_BADPARAM;
    return ChangeCardMode(card, mode, flags);
}

// GetDeviceCaps(VREFRESH): what the card's registers give, named by the
// nominal rate of the timing the driver set, or of the driver's list, when
// it lies within 1 Hz of it (a VESA 72 Hz timing runs at 72.8 Hz), else
// rounded; an NT miniport reports 1 for the hardware default it was asked
// for.
int MachineScreenRefresh()
{
    if (!sim) {
        HDC dc = GetDC(NULL);
        int hz = GetDeviceCaps(dc, VREFRESH);
        ReleaseDC(NULL, dc);
        return hz;
    }
    int card = PrimaryCard();
    if (card < 0) return 0;
    const SimDriverMode* m = &sim->cards[card].mode;
    if (IsNt() && m->requested <= 1) return 1;
    double hz = SimRefreshHz(card);
    if (hz <= 0 || fabs(hz - m->refresh) < 1.0) return m->refresh;
    SimModeLimits limits = DisplayCardLimits(card);
    uint16_t rates[SIM_MAX_RATES];
    int n = SimModeRates(&limits, m->width, m->height, m->bits, rates);
    for (int i = 0; i < n; i++)
        if (fabs(hz - rates[i]) < 1.0) return rates[i];
    return (int)(hz + 0.5);
}

// DirectDraw's total: the primary card's whole memory. Without a machine
// no display driver of ours answers.
uint32_t MachineVideoMemory()
{
    int card = sim ? PrimaryCard() : -1;
    if (card < 0) return 0;
    return (uint32_t)DisplayCardLimits(card).memory_bytes;
}

int MachineDeviceModeField(const char* device, int cap_index)
{
    if (!sim) {
        HDC dc = CreateDCA(device, NULL, NULL, NULL);
        if (!dc) return 0;
        int value = GetDeviceCaps(dc, cap_index);
        DeleteDC(dc);
        return value;
    }
    int card = DeviceCard(device);
    if (card < 0) return 0;
    const SimDriverMode* m = &sim->cards[card].mode;
    switch (cap_index) {
    case HORZRES: return m->width;
    case VERTRES: return m->height;
    // NT reports a 15-bit mode as 16 bits per pixel.
    case BITSPIXEL: return IsNt() && m->bits == 15 ? 16 : m->bits;
    case PLANES: return 1;
    default: {
        HDC dc = CreateDCA("DISPLAY", NULL, NULL, NULL);
        if (!dc) return 0;
        int value = GetDeviceCaps(dc, cap_index);
        DeleteDC(dc);
        return value;
    }
    }
}
