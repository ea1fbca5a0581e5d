// The simulated display driver: a mode change leaves the card running the
// VESA timing of the rate the driver picks (as the card's registers give
// it); the 9x and NT mode lists and rules; Windows 98's display devices.
#include <set>
#include <vector>

#include "modes.h"
#include "sim_test.h"

namespace {

DEVMODEA Request(int width, int height, int bits, int frequency = 0)
{
    DEVMODEA dm = {};
    dm.dmSize = sizeof dm;
    dm.dmFields = DM_PELSWIDTH | DM_PELSHEIGHT | DM_BITSPERPEL | (frequency ? DM_DISPLAYFREQUENCY : 0);
    dm.dmPelsWidth = width;
    dm.dmPelsHeight = height;
    dm.dmBitsPerPel = bits;
    dm.dmDisplayFrequency = frequency;
    return dm;
}

std::vector<DEVMODEA> Listed()
{
    std::vector<DEVMODEA> list;
    DEVMODEA dm = {};
    dm.dmSize = sizeof dm;
    for (DWORD n = 0; MachineEnumDisplaySettings(NULL, n, &dm); n++) list.push_back(dm);
    return list;
}

bool IsVgaDriver(const DEVMODEA& m) { return _strnicmp((const char*)m.dmDeviceName, "vga", 3) == 0; }

const std::string driver_key = "System\\CurrentControlSet\\Services\\Class\\DISPLAY\\0000\\";

}  // namespace

// Every frequency an NT miniport lists is the VESA timing the card then runs:
// its totals in the CRT registers (characters of 8 pixels, 4 at 15/16 bits)
// and its rate within 1 Hz. (Wine's desktop would take seconds to follow.)
TEST(Display, EveryS3ChipRunsTheVesaTimingOfEveryListedMode)
{
    for (uint16_t chip : {0x8A13, 0x8A20, 0x8904, 0x5631, 0x883D, 0x8A01, 0x8A10, 0x8811, 0x8901}) {
        SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, 0x5333, chip);
        config.cards[0].memory_mb = 8;
        SimBoot(&config);
        std::vector<DEVMODEA> listed = Listed();
        ASSERT_GT(listed.size(), 20u) << std::hex << chip;
        for (const DEVMODEA& m : listed) {
            if (m.dmBitsPerPel < 8 || m.dmDisplayFrequency <= 1 || IsVgaDriver(m)) continue;
            SCOPED_TRACE(testing::Message() << std::hex << chip << std::dec << " " << m.dmPelsWidth << "x"
                                            << m.dmPelsHeight << "x" << m.dmBitsPerPel << "@" << m.dmDisplayFrequency);
            bool interlaced = (m.dmDisplayFlags & DM_INTERLACED) != 0;
            const SimTiming* t = SimFindTiming(m.dmPelsWidth, m.dmPelsHeight, m.dmDisplayFrequency, interlaced);
            ASSERT_TRUE(t);
            ASSERT_EQ(1, SimSetCardMode(0, m.dmPelsWidth, m.dmPelsHeight, m.dmBitsPerPel, m.dmDisplayFrequency));
            int pixels_per_character = m.dmBitsPerPel == 15 || m.dmBitsPerPel == 16 ? 4 : 8;
            // At 15/16 bits a unit of the total counts two characters: one off an even count.
            EXPECT_LE(abs(SimHTotal(0) * pixels_per_character - t->htotal), 4);
            EXPECT_EQ(interlaced ? t->vtotal / 2 : t->vtotal, SimVTotal(0));
            EXPECT_NEAR(m.dmDisplayFrequency, SimRefreshHz(0), 1.0);
            EXPECT_EQ((int)m.dmDisplayFrequency, MachineScreenRefresh());
        }
    }
}

TEST(Display, Windows9xRunsTheRegistryRateAndListsEachModeOnce)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    SimBoot(&config);
    EXPECT_NEAR(75.0, SimRefreshHz(0), 1.0) << "the boot mode";
    const struct {
        int width, height, bits;
        const char *mode_rate, *default_rate;  // the RefreshRate texts of the mode's key and of DEFAULT
        int hz;
    } changes[] = {
        {800, 600, 8, "72", "0", 72},    {640, 480, 16, "85", "0", 85}, {1024, 768, 8, "70", "0", 70},
        {800, 600, 16, NULL, "0", 60},   // none: the default, 60 Hz
        {800, 600, 16, NULL, "-1", 85},  // the highest
        {800, 600, 16, "74", "0", 72},   // the highest listed not above it
    };
    for (const auto& c : changes) {
        std::string mode = driver_key + "MODES\\" + std::to_string(c.bits) + "\\" + std::to_string(c.width) + "," +
                           std::to_string(c.height);
        if (c.mode_rate) WriteRegistryString(HKEY_LOCAL_MACHINE, mode, "RefreshRate", c.mode_rate);
        WriteRegistryString(HKEY_LOCAL_MACHINE, driver_key + "DEFAULT", "RefreshRate", c.default_rate);
        DEVMODEA dm = Request(c.width, c.height, c.bits);
        ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&dm, CDS_UPDATEREGISTRY)) << mode;
        EXPECT_NEAR(c.hz, SimRefreshHz(0), 1.0) << mode;
        EXPECT_EQ(c.hz, MachineScreenRefresh()) << mode;
        EXPECT_EQ(c.bits, SimCardDepth(0)) << mode;
        EXPECT_EQ(c.width, MachineDeviceModeField(NULL, HORZRES)) << mode;
    }
    EXPECT_EQ("800,600", RegText(HKEY_CURRENT_CONFIG, "Display\\Settings", "Resolution"));
    EXPECT_EQ("16", RegText(HKEY_CURRENT_CONFIG, "Display\\Settings", "BitsPerPixel"));

    std::set<std::string> seen;
    for (const DEVMODEA& m : Listed()) {
        std::string name = std::to_string(m.dmPelsWidth) + "x" + std::to_string(m.dmPelsHeight) + "x" +
                           std::to_string(m.dmBitsPerPel);
        EXPECT_EQ(0u, m.dmDisplayFrequency) << name;
        EXPECT_TRUE(seen.insert(name).second) << name << " listed twice";
    }
    for (const char* name : {"640x480x4", "800x600x4", "1024x768x15", "1280x1024x8"}) EXPECT_TRUE(seen.count(name)) << name;
    EXPECT_FALSE(seen.count("1280x1024x32")) << "4 MB are not enough";
    EXPECT_FALSE(seen.count("848x480x8")) << "Wine has no such desktop";
    // The default machine's MODES keys.
    const char* const rates[][2] = {{"8\\640,480", "60,72,75,85"},  {"8\\1152,864", "75"},
                                    {"8\\1280,1024", "60,75"},      {"16\\1024,768", "60,70,75"},
                                    {"15\\1280,768", "60"},         {"32\\1024,768", "60,70,75,85"}};
    for (const auto& r : rates) EXPECT_EQ(r[1], RegText(HKEY_LOCAL_MACHINE, driver_key + "MODES\\" + r[0], "")) << r[0];
}

TEST(Display, NtListsFrequenciesLikeAMiniportAndRefusesOthers)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, 0x5333, 0x8901);
    SimBoot(&config);
    std::vector<int> rates_1024x768x8;
    int vga_modes = 0, default_frequency = 0;
    for (const DEVMODEA& m : Listed()) {
        if (IsVgaDriver(m)) vga_modes++;
        else if (m.dmDisplayFrequency == 1) default_frequency++;
        else if (m.dmPelsWidth == 1024 && m.dmBitsPerPel == 8) rates_1024x768x8.push_back(m.dmDisplayFrequency);
    }
    EXPECT_EQ(3, vga_modes);
    EXPECT_EQ(4, default_frequency) << "each 640x480 depth once more";
    EXPECT_EQ((std::vector<int>{43, 60, 60, 70, 75, 85}), rates_1024x768x8);
    DEVMODEA current = {};
    current.dmSize = sizeof current;
    ASSERT_TRUE(MachineEnumDisplaySettings(NULL, ENUM_CURRENT_SETTINGS, &current));
    EXPECT_EQ(1024u, current.dmPelsWidth);
    EXPECT_EQ(75u, current.dmDisplayFrequency);

    double pixel = SimPixelClockHz(0);
    const DEVMODEA refused[] = {
        Request(1024, 768, 16, 85),   // beyond the RAMDAC at 16 bits
        Request(1280, 1024, 32, 60),  // beyond 4 MB
        Request(1024, 768, 8, 90),    // no such rate
        Request(848, 480, 8, 60),     // not a size of this machine
        Request(1024, 768, 24, 60),   // no such depth
    };
    for (DEVMODEA dm : refused)
        EXPECT_EQ(DISP_CHANGE_BADMODE, MachineChangeDisplaySettings(&dm, 0)) << dm.dmPelsWidth << "x" << dm.dmBitsPerPel;
    DEVMODEA test = Request(800, 600, 8, 72);
    EXPECT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&test, CDS_TEST));
    EXPECT_EQ(pixel, SimPixelClockHz(0)) << "a refused or tested mode leaves the card alone";

    DEVMODEA fallback = Request(800, 600, 8, 1);  // the hardware default
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&fallback, CDS_UPDATEREGISTRY));
    EXPECT_NEAR(60.0, SimRefreshHz(0), 1.0);
    EXPECT_EQ(1, MachineScreenRefresh());
    EXPECT_EQ(std::string("\x08\0\0\0", 4), ReadRegistryRaw(HKEY_CURRENT_CONFIG, "System\\CurrentControlSet\\Services"
                                                            "\\s3vmini\\Device0", "DefaultSettings.BitsPerPel"));
    DEVMODEA interlaced = Request(1024, 768, 8, 43);
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&interlaced, 0));
    EXPECT_TRUE(ReadCr(0x42) & 0x20);
    EXPECT_NEAR(43.57, SimRefreshHz(0), 0.01);
    EXPECT_EQ(43, MachineScreenRefresh());
}

TEST(Display, Windows95ChangesDepthOnlyAtTheNextStartAndHasOneDisplay)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_95, 0x5333, 0x8901);
    SimBoot(&config);
    DEVMODEA depth = Request(1024, 768, 8), size = Request(800, 600, 16);
    EXPECT_EQ(DISP_CHANGE_RESTART, MachineChangeDisplaySettings(&depth, CDS_UPDATEREGISTRY));
    EXPECT_EQ(16, SimCardDepth(0));
    EXPECT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&size, 0)) << "the size changes at once";
    EXPECT_EQ(800, SimGetCardMode(0).width);
    SimRestartWindows();
    EXPECT_EQ(8, SimCardDepth(0));
    EXPECT_EQ(1024, SimGetCardMode(0).width) << "the registry's mode, not the unsaved 800x600";
    MachineDisplayFunctions f;
    memset(&f, 0x5A, sizeof f);
    EXPECT_EQ(1, MachineFindDisplayFunctions(&f));
    EXPECT_TRUE(!f.EnumDisplayDevicesA && !f.EnumDisplayMonitors && !f.MonitorFromWindow && !f.GetMonitorInfoA);
    EXPECT_EQ(0, MachineDeviceModeField("\\\\.\\DISPLAY1", HORZRES));
}

TEST(Display, Windows98ReportsEachCardAndLaysMonitorsSideBySide)
{
    SimMachineConfig config = Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 0, 10), Card(0x5333, 0x8A20, 1, 0),
                                                       Card(0x5333, 0x8901, 0, 12)});
    SimCardConfig& second = config.cards[1];
    second.start_width = 800, second.start_height = 600, second.start_bits = 16, second.start_refresh = 75;
    lstrcpynA(second.driver_desc, "An adapter with a description longer than 31", SIM_DESCRIPTION_SIZE);
    config.cards[2].attached = false;
    SimBoot(&config);
    MachineDisplayFunctions f;
    ASSERT_EQ(1, MachineFindDisplayFunctions(&f));
    ASSERT_TRUE(f.EnumDisplayDevicesA && f.EnumDisplayMonitors && f.MonitorFromPoint);
    DISPLAY_DEVICEA dd;
    memset(&dd, 0x5A, sizeof dd);
    dd.cb = 168;
    const struct {
        const char *name, *text;
        DWORD flags;
    } devices[] = {{"\\\\.\\DISPLAY1", "S3 Trio64V2/DX PCI", DISPLAY_DEVICE_ATTACHED_TO_DESKTOP | DISPLAY_DEVICE_PRIMARY_DEVICE},
                   {"\\\\.\\DISPLAY2", second.driver_desc, DISPLAY_DEVICE_ATTACHED_TO_DESKTOP},
                   {"\\\\.\\DISPLAY3", "S3 Trio64V2/DX PCI", 0}};
    for (DWORD i = 0; i < 3; i++) {
        ASSERT_TRUE(f.EnumDisplayDevicesA(NULL, i, &dd, 0)) << i;
        EXPECT_STREQ(devices[i].name, dd.DeviceName);
        EXPECT_STREQ(devices[i].text, dd.DeviceString);
        EXPECT_EQ(devices[i].flags, dd.StateFlags) << i;
    }
    EXPECT_EQ(0x5A, (uint8_t)dd.DeviceID[0]) << "nothing written past the 168 bytes asked for";
    EXPECT_FALSE(f.EnumDisplayDevicesA(NULL, 3, &dd, 0));
    dd.cb = 100;
    EXPECT_FALSE(f.EnumDisplayDevicesA(NULL, 0, &dd, 0));

    std::vector<RECT> monitors;
    f.EnumDisplayMonitors(NULL, NULL, [](HMONITOR, HDC, LPRECT r, LPARAM found) -> BOOL {
        ((std::vector<RECT>*)found)->push_back(*r);
        return TRUE;
    }, (LPARAM)&monitors);
    ASSERT_EQ(2u, monitors.size()) << "the detached device has no monitor on the desktop";
    EXPECT_EQ(0, monitors[0].left);
    EXPECT_EQ(1024, monitors[1].left);
    EXPECT_EQ(1824, monitors[1].right);
    EXPECT_EQ(600, monitors[1].bottom);
    EXPECT_EQ(NULL, f.MonitorFromPoint({5000, 10}, MONITOR_DEFAULTTONULL));
    EXPECT_EQ(800, MachineDeviceModeField("\\\\.\\DISPLAY2", HORZRES));
    EXPECT_EQ(16, MachineDeviceModeField("\\\\.\\DISPLAY2", BITSPIXEL));
    config.monitors = 1;
    SimBoot(&config);
    dd.cb = 168;
    EXPECT_FALSE(f.EnumDisplayDevicesA(NULL, 1, &dd, 0)) << "Monitors=1 caps the display devices";
}
