// The simulated display driver: mode changes through the seam leave the
// card running the VESA timing of the requested rate (as the card's
// registers give it), the 9x and NT mode lists and rules, and Windows 98's
// display devices and monitors.
#include <math.h>

#include <set>
#include <string>
#include <vector>

#include "modes.h"
#include "sim_test.h"

namespace {

struct Mode {
    int width, height, bits, rate;
};

DEVMODEA Request(int width, int height, int bits, int frequency)
{
    DEVMODEA dm;
    memset(&dm, 0, sizeof dm);
    dm.dmSize = sizeof dm;
    dm.dmFields = DM_PELSWIDTH | DM_PELSHEIGHT | DM_BITSPERPEL | DM_DISPLAYFREQUENCY;
    dm.dmPelsWidth = width;
    dm.dmPelsHeight = height;
    dm.dmBitsPerPel = bits;
    dm.dmDisplayFrequency = frequency;
    return dm;
}

std::string DriverKey9x() { return "System\\CurrentControlSet\\Services\\Class\\DISPLAY\\0000"; }

void SetModeRate9x(const Mode& m)
{
    char key[200], rate[16];
    snprintf(key, sizeof key, "%s\\MODES\\%d\\%d,%d", DriverKey9x().c_str(), m.bits, m.width, m.height);
    snprintf(rate, sizeof rate, "%d", m.rate);
    HKEY k;
    ASSERT_EQ(ERROR_SUCCESS, RegCreateKeyExA(HKEY_LOCAL_MACHINE, key, 0, NULL, 0, KEY_ALL_ACCESS, NULL, &k, NULL));
    RegSetValueExA(k, "RefreshRate", 0, REG_SZ, (const BYTE*)rate, (DWORD)strlen(rate) + 1);
    RegCloseKey(k);
}

void ExpectCardRuns(const Mode& m)
{
    SCOPED_TRACE(testing::Message() << m.width << "x" << m.height << "x" << m.bits << "@" << m.rate);
    // The VESA timings run a little off their names (640x480 "72" at 72.8 Hz).
    EXPECT_NEAR(m.rate, SimRefreshHz(0), 1.0);
    SimCardMode mode = SimGetCardMode(0);
    EXPECT_EQ(m.width, mode.width);
    EXPECT_EQ(m.height, mode.height);
    EXPECT_EQ(m.bits, SimCardDepth(0));
    EXPECT_EQ(m.width, MachineDeviceModeField(NULL, HORZRES));
}

}  // namespace

// Every frequency an NT miniport lists is the VESA timing the card then
// runs: its totals in the CRT registers (characters of 8 pixels, 4 at 15/16
// bits) and its rate within 1 Hz, as the card's own registers give it. (The
// driver is called directly: Wine's desktop would take seconds to follow.)
TEST(DisplayModeChange, EveryS3ChipRunsTheVesaTimingOfEveryListedMode)
{
    // The Savage3D/MV (8a21) is the Savage3D's twin.
    const uint16_t chips[] = {0x8A13, 0x8A20, 0x8904, 0x5631, 0x883D, 0x8A01, 0x8A10, 0x8811, 0x8901};
    for (uint16_t chip : chips) {
        SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, 0x5333, chip);
        config.cards[0].memory_mb = 8;
        SimBoot(&config);
        std::vector<DEVMODEA> listed;
        DEVMODEA dm;
        dm.dmSize = sizeof dm;
        for (DWORD n = 0; MachineEnumDisplaySettings(NULL, n, &dm); n++)
            if (dm.dmBitsPerPel >= 8 && dm.dmDisplayFrequency > 1 && _strnicmp((char*)dm.dmDeviceName, "vga", 3) != 0)
                listed.push_back(dm);
        ASSERT_GT(listed.size(), 20u) << std::hex << chip;
        for (const DEVMODEA& m : listed) {
            SCOPED_TRACE(testing::Message() << std::hex << chip << std::dec << " " << m.dmPelsWidth << "x"
                                            << m.dmPelsHeight << "x" << m.dmBitsPerPel << "@" << m.dmDisplayFrequency);
            bool interlaced = (m.dmDisplayFlags & DM_INTERLACED) != 0;
            const SimTiming* t = SimFindTiming(m.dmPelsWidth, m.dmPelsHeight, m.dmDisplayFrequency, interlaced);
            ASSERT_TRUE(t);
            ASSERT_EQ(1, SimSetCardMode(0, m.dmPelsWidth, m.dmPelsHeight, m.dmBitsPerPel, m.dmDisplayFrequency));
            int pixels_per_character = m.dmBitsPerPel == 15 || m.dmBitsPerPel == 16 ? 4 : 8;
            // At 15/16 bits the total register counts two characters a unit:
            // the line comes out one character (4 pixels) off an even count.
            EXPECT_LE(abs(SimHTotal(0) * pixels_per_character - t->htotal), 4);
            EXPECT_EQ(interlaced ? t->vtotal / 2 : t->vtotal, SimVTotal(0));
            EXPECT_NEAR(m.dmDisplayFrequency, SimRefreshHz(0), 1.0);
            EXPECT_EQ((int)m.dmDisplayFrequency, MachineScreenRefresh());
        }
    }
}

TEST(DisplayModeChange, Windows98DriverRunsTheRegistryRate)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    SimBoot(&config);
    ExpectCardRuns({1024, 768, 16, 75});  // the boot mode
    for (const Mode& m : {Mode{800, 600, 8, 72}, Mode{640, 480, 16, 85}, Mode{1024, 768, 8, 70}}) {
        SetModeRate9x(m);
        DEVMODEA dm = Request(m.width, m.height, m.bits, 0);
        dm.dmFields &= ~DM_DISPLAYFREQUENCY;
        ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&dm, CDS_UPDATEREGISTRY));
        ExpectCardRuns(m);
    }
    EXPECT_EQ("1024,768", RegText(HKEY_CURRENT_CONFIG, "Display\\Settings", "Resolution"));
    EXPECT_EQ("8", RegText(HKEY_CURRENT_CONFIG, "Display\\Settings", "BitsPerPixel"));

    // No RefreshRate for the mode: the DEFAULT key's, else 60 Hz.
    DEVMODEA dm = Request(800, 600, 16, 0);
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&dm, 0));
    ExpectCardRuns({800, 600, 16, 60});
    HKEY k;
    RegOpenKeyExA(HKEY_LOCAL_MACHINE, (DriverKey9x() + "\\DEFAULT").c_str(), 0, KEY_SET_VALUE, &k);
    RegSetValueExA(k, "RefreshRate", 0, REG_SZ, (const BYTE*)"-1", 3);  // "optimal": the highest
    RegCloseKey(k);
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&dm, 0));
    ExpectCardRuns({800, 600, 16, 85});
    // A rate the mode does not offer: the highest one below it.
    SetModeRate9x({800, 600, 16, 74});
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&dm, 0));
    ExpectCardRuns({800, 600, 16, 72});
}

TEST(DisplayModeChange, NtRefusesWhatTheModeDoesNotOffer)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, 0x5333, 0x8901);
    SimBoot(&config);
    SimCardMode before = SimGetCardMode(0);
    double pixel = SimPixelClockHz(0);
    const DEVMODEA refused[] = {
        Request(1024, 768, 16, 85),   // beyond the RAMDAC at 16 bits
        Request(1280, 1024, 32, 60),  // beyond 4 MB
        Request(1024, 768, 8, 90),    // no such rate
        Request(848, 480, 8, 60),     // not a size of this machine
        Request(1024, 768, 24, 60),   // no such depth
    };
    for (DEVMODEA dm : refused) {
        EXPECT_EQ(DISP_CHANGE_BADMODE, MachineChangeDisplaySettings(&dm, 0)) << dm.dmPelsWidth << "x" << dm.dmBitsPerPel;
    }
    DEVMODEA test = Request(800, 600, 8, 72);
    EXPECT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&test, CDS_TEST));
    EXPECT_EQ(before.width, SimGetCardMode(0).width);
    EXPECT_EQ(pixel, SimPixelClockHz(0)) << "a refused or tested mode leaves the card alone";

    DEVMODEA fallback = Request(800, 600, 8, 1);  // the hardware default
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&fallback, CDS_UPDATEREGISTRY));
    EXPECT_EQ(60, SimGetCardMode(0).refresh);
    EXPECT_EQ(1, MachineScreenRefresh());
    DWORD bits = 0, size = sizeof bits;
    HKEY k;
    ASSERT_EQ(ERROR_SUCCESS, RegOpenKeyExA(HKEY_CURRENT_CONFIG, "System\\CurrentControlSet\\Services\\s3vmini\\Device0",
                                           0, KEY_QUERY_VALUE, &k));
    RegQueryValueExA(k, "DefaultSettings.BitsPerPel", NULL, NULL, (BYTE*)&bits, &size);
    RegCloseKey(k);
    EXPECT_EQ(8u, bits);

    DEVMODEA interlaced = Request(1024, 768, 8, 43);
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&interlaced, 0));
    EXPECT_TRUE(ReadCr(0x42) & 0x20);
    EXPECT_NEAR(43.48, SimRefreshHz(0), 0.3);
}

TEST(DisplayModeChange, Windows95ChangesDepthOnlyAtTheNextStart)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_95, 0x5333, 0x8901);
    SimBoot(&config);
    DEVMODEA depth = Request(1024, 768, 8, 0);
    EXPECT_EQ(DISP_CHANGE_RESTART, MachineChangeDisplaySettings(&depth, CDS_UPDATEREGISTRY));
    EXPECT_EQ(16, SimCardDepth(0));
    DEVMODEA size = Request(800, 600, 16, 0);
    EXPECT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&size, 0)) << "the size changes at once";
    EXPECT_EQ(800, SimGetCardMode(0).width);
    SimRestartWindows();
    EXPECT_EQ(8, SimCardDepth(0));
    EXPECT_EQ(1024, SimGetCardMode(0).width) << "the registry's mode, not the unsaved 800x600";
}

TEST(DisplayModeLists, Windows9xListsEachModeOnceAndMatchesItsModesKeys)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    SimBoot(&config);
    std::set<std::string> seen;
    DEVMODEA dm;
    dm.dmSize = sizeof dm;
    int desktop_modes = 0;
    for (DWORD n = 0; MachineEnumDisplaySettings(NULL, n, &dm); n++) {
        EXPECT_EQ(0u, dm.dmDisplayFrequency);
        char name[64];
        snprintf(name, sizeof name, "%lux%lux%lu", dm.dmPelsWidth, dm.dmPelsHeight, dm.dmBitsPerPel);
        EXPECT_TRUE(seen.insert(name).second) << name << " listed twice";
        if (dm.dmBitsPerPel < 8) continue;
        desktop_modes++;
        char key[200];
        snprintf(key, sizeof key, "%s\\MODES\\%lu\\%lu,%lu", DriverKey9x().c_str(), dm.dmBitsPerPel, dm.dmPelsWidth,
                 dm.dmPelsHeight);
        std::string list = RegText(HKEY_LOCAL_MACHINE, key, "");
        EXPECT_FALSE(list.empty() || list[0] == '<') << key;
        EXPECT_LE(list.size(), 80u);
    }
    EXPECT_TRUE(seen.count("640x480x4")) << "Windows 9x lists the 16-colour modes";
    EXPECT_TRUE(seen.count("1024x768x15"));
    EXPECT_FALSE(seen.count("1280x1024x32")) << "4 MB are not enough";
    EXPECT_GT(desktop_modes, 10);
    EXPECT_EQ("60,72,75,85", RegText(HKEY_LOCAL_MACHINE, (DriverKey9x() + "\\MODES\\8\\640,480").c_str(), ""));
    EXPECT_EQ("60,70,75", RegText(HKEY_LOCAL_MACHINE, (DriverKey9x() + "\\MODES\\16\\1024,768").c_str(), ""));
}

TEST(DisplayModeLists, NtListsFrequenciesLikeAMiniport)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, 0x5333, 0x8901);
    SimBoot(&config);
    DEVMODEA dm;
    dm.dmSize = sizeof dm;
    std::vector<int> rates_1024x768x8;
    bool vga_mode = false, default_frequency = false;
    for (DWORD n = 0; MachineEnumDisplaySettings(NULL, n, &dm); n++) {
        if (_strnicmp((char*)dm.dmDeviceName, "vga", 3) == 0) vga_mode = true;
        else if (dm.dmDisplayFrequency == 1) default_frequency = true;
        else if (dm.dmPelsWidth == 1024 && dm.dmBitsPerPel == 8) rates_1024x768x8.push_back(dm.dmDisplayFrequency);
        // Every frequency listed is one the miniport then sets.
        if (dm.dmBitsPerPel >= 8 && _strnicmp((char*)dm.dmDeviceName, "vga", 3) != 0 && n % 7 == 0) {
            DEVMODEA copy = dm;
            EXPECT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&copy, CDS_TEST));
        }
    }
    EXPECT_TRUE(vga_mode);
    EXPECT_TRUE(default_frequency);
    EXPECT_EQ((std::vector<int>{43, 60, 60, 70, 75, 85}), rates_1024x768x8);

    DEVMODEA current;
    current.dmSize = sizeof current;
    ASSERT_TRUE(MachineEnumDisplaySettings(NULL, ENUM_CURRENT_SETTINGS, &current));
    EXPECT_EQ(1024u, current.dmPelsWidth);
    EXPECT_EQ(75u, current.dmDisplayFrequency);
    EXPECT_EQ(16, MachineDeviceModeField("DISPLAY", BITSPIXEL));
}

TEST(DisplayDevices, Windows98ReportsEachCardAndLaysMonitorsSideBySide)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901, 0, 10);
    AddCard(&config, 0x5333, 0x8A20, 1, 0);
    config.cards[1].start_width = 800;
    config.cards[1].start_height = 600;
    config.cards[1].start_bits = 16;
    config.cards[1].start_refresh = 75;
    lstrcpynA(config.cards[1].driver_desc, "An adapter with a description longer than 31", SIM_DESCRIPTION_SIZE);
    AddCard(&config, 0x5333, 0x8901, 0, 12);
    config.cards[2].attached = false;
    SimBoot(&config);

    MachineDisplayFunctions f;
    ASSERT_EQ(1, MachineFindDisplayFunctions(&f));
    ASSERT_TRUE(f.EnumDisplayDevicesA && f.EnumDisplayMonitors && f.GetMonitorInfoA);
    DISPLAY_DEVICEA dd;
    memset(&dd, 0x5A, sizeof dd);
    dd.cb = 168;
    ASSERT_TRUE(f.EnumDisplayDevicesA(NULL, 0, &dd, 0));
    EXPECT_STREQ("\\\\.\\DISPLAY1", dd.DeviceName);
    EXPECT_STREQ("S3 Trio64V2/DX PCI", dd.DeviceString);
    EXPECT_EQ((DWORD)(DISPLAY_DEVICE_ATTACHED_TO_DESKTOP | DISPLAY_DEVICE_PRIMARY_DEVICE), dd.StateFlags);
    EXPECT_EQ(0x5A, (uint8_t)dd.DeviceID[0]) << "nothing written past the 168 bytes asked for";
    ASSERT_TRUE(f.EnumDisplayDevicesA(NULL, 1, &dd, 0));
    EXPECT_STREQ("An adapter with a description longer than 31", dd.DeviceString);
    EXPECT_EQ((DWORD)DISPLAY_DEVICE_ATTACHED_TO_DESKTOP, dd.StateFlags);
    ASSERT_TRUE(f.EnumDisplayDevicesA(NULL, 2, &dd, 0));
    EXPECT_EQ(0u, dd.StateFlags);
    EXPECT_FALSE(f.EnumDisplayDevicesA(NULL, 3, &dd, 0));
    dd.cb = 100;
    EXPECT_FALSE(f.EnumDisplayDevicesA(NULL, 0, &dd, 0));

    struct Found {
        RECT rects[4];
        int count;
    } found = {};
    f.EnumDisplayMonitors(NULL, NULL, [](HMONITOR m, HDC, LPRECT r, LPARAM data) -> BOOL {
        Found* found = (Found*)data;
        found->rects[found->count++] = *r;
        return TRUE;
    }, (LPARAM)&found);
    ASSERT_EQ(2, found.count) << "the detached device has no monitor on the desktop";
    EXPECT_EQ(0, found.rects[0].left);
    EXPECT_EQ(1024, found.rects[0].right);
    EXPECT_EQ(1024, found.rects[1].left);
    EXPECT_EQ(1824, found.rects[1].right);
    EXPECT_EQ(600, found.rects[1].bottom);
    HMONITOR second = f.MonitorFromPoint({1500, 10}, MONITOR_DEFAULTTONULL);
    MONITORINFO info;
    info.cbSize = sizeof info;
    ASSERT_TRUE(f.GetMonitorInfoA(second, &info));
    EXPECT_EQ(0u, info.dwFlags);
    EXPECT_EQ(NULL, f.MonitorFromPoint({5000, 10}, MONITOR_DEFAULTTONULL));
    EXPECT_EQ(second, f.MonitorFromPoint({5000, 10}, MONITOR_DEFAULTTONEAREST));
    EXPECT_EQ(800, MachineDeviceModeField("\\\\.\\DISPLAY2", HORZRES));
    EXPECT_EQ(16, MachineDeviceModeField("\\\\.\\DISPLAY2", BITSPIXEL));
    EXPECT_EQ(0, MachineDeviceModeField("\\\\.\\DISPLAY9", HORZRES));

    config.monitors = 1;
    SimBoot(&config);
    dd.cb = 168;
    EXPECT_TRUE(f.EnumDisplayDevicesA(NULL, 0, &dd, 0));
    EXPECT_FALSE(f.EnumDisplayDevicesA(NULL, 1, &dd, 0)) << "Monitors=1 caps the display devices";
}

TEST(DisplayDevices, Windows95AndNtHaveNoMultiMonitorFunctions)
{
    for (int windows : {SIM_WINDOWS_95, SIM_WINDOWS_NT4}) {
        SimMachineConfig config = MachineWith(windows, 0x5333, 0x8901);
        SimBoot(&config);
        MachineDisplayFunctions f;
        memset(&f, 0x5A, sizeof f);
        EXPECT_EQ(1, MachineFindDisplayFunctions(&f));
        EXPECT_EQ(NULL, f.EnumDisplayDevicesA);
        EXPECT_EQ(NULL, f.EnumDisplayMonitors);
        EXPECT_EQ(NULL, f.MonitorFromWindow);
        EXPECT_EQ(0, MachineDeviceModeField("\\\\.\\DISPLAY1", HORZRES));
    }
}

TEST(DisplayForeignChange, AnotherProgramsModeChangeReprogramsTheCard)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    SimBoot(&config);
    SetModeRate9x({800, 600, 16, 72});
    DEVMODEA dm = Request(800, 600, 16, 0);
    dm.dmFields &= ~DM_DISPLAYFREQUENCY;
    // Straight to Wine, as another process would.
    if (ChangeDisplaySettingsExA(NULL, &dm, NULL, 0, NULL) != DISP_CHANGE_SUCCESSFUL)
        GTEST_SKIP() << "Wine's display cannot change modes here";
    MSG msg;
    while (PeekMessageA(&msg, NULL, 0, 0, PM_REMOVE)) DispatchMessageA(&msg);
    ExpectCardRuns({800, 600, 16, 72});
    SimBoot(&config);  // back to the boot mode, and Wine's desktop with it
    HDC dc = GetDC(NULL);
    EXPECT_EQ(1024, GetDeviceCaps(dc, HORZRES));
    ReleaseDC(NULL, dc);
}
