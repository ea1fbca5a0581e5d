// The simulated display driver: a mode change leaves the card running the
// VESA timing of the rate the driver picks (as the card's registers give
// it); the 9x and NT mode lists and rules.
#include <vector>

#include "modes.h"
#include "sim_test.h"

static DEVMODEA Request(DWORD width, DWORD height, DWORD bits, DWORD frequency = 0)
{
    DWORD fields = DM_PELSWIDTH | DM_PELSHEIGHT | DM_BITSPERPEL | (frequency ? DM_DISPLAYFREQUENCY : 0);
    return {.dmSize = sizeof(DEVMODEA), .dmFields = fields, .dmBitsPerPel = bits, .dmPelsWidth = width,
            .dmPelsHeight = height, .dmDisplayFrequency = frequency};
}

static std::vector<DEVMODEA> Listed()
{
    std::vector<DEVMODEA> list;
    for (DEVMODEA m = {.dmSize = sizeof m}; MachineEnumDisplaySettings(NULL, list.size(), &m);) list.push_back(m);
    return list;
}

static bool IsVgaDriver(const DEVMODEA& m) { return _strnicmp((const char*)m.dmDeviceName, "vga", 3) == 0; }

// Every frequency an NT miniport lists is the VESA timing the card then runs:
// its totals in the CRT registers (characters of 8 pixels, 4 at 15/16 bits)
// and its rate within 1 Hz. (Wine's desktop would take seconds to follow.)
TEST(Display, EveryS3ChipRunsTheVesaTimingOfEveryListedMode)
{
    for (uint16_t chip : {0x8A13, 0x8A20, 0x8904, 0x5631, 0x883D, 0x8A01, 0x8A10, 0x8811, 0x8901}) {
        SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, chip);
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
            // At 15/16 bits a unit of the total counts two characters of 4 pixels: one off an even count.
            EXPECT_LE(abs(SimHTotal(0) * (m.dmBitsPerPel == 15 || m.dmBitsPerPel == 16 ? 4 : 8) - t->htotal), 4);
            EXPECT_EQ(interlaced ? t->vtotal / 2 : t->vtotal, SimVTotal(0));
            EXPECT_EQ(m.dmPelsWidth / 8 - 1, SimReadRegister(0, SIM_REG_CRTC, 0x01)) << "display end in characters";
            EXPECT_NEAR(m.dmDisplayFrequency, SimRefreshHz(0), 1.0);
            EXPECT_EQ((int)m.dmDisplayFrequency, MachineScreenRefresh());
        }
    }
}

TEST(Display, Windows9xRunsTheRegistryRateAndKeepsTheModeLists)
{
    BootWith(SIM_WINDOWS_98);
    const std::string driver_key = "System\\CurrentControlSet\\Services\\Class\\DISPLAY\\0000\\";
    // The RefreshRate texts of the mode's key (NULL: none) and of DEFAULT, and the rate the driver runs.
    const struct { int width, height, bits; const char *mode_rate, *default_rate; int hz; } changes[] = {
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
        EXPECT_EQ(c.width, MachineDeviceModeField(NULL, HORZRES)) << mode;
    }
    EXPECT_EQ("800,600", RegText(HKEY_CURRENT_CONFIG, "Display\\Settings", "Resolution"));
    EXPECT_EQ("16", RegText(HKEY_CURRENT_CONFIG, "Display\\Settings", "BitsPerPixel"));

    // 9x lists modes without frequencies: the rates are in the MODES keys, which the mode-list tests read.
    for (const DEVMODEA& m : Listed()) EXPECT_EQ(0u, m.dmDisplayFrequency) << m.dmPelsWidth << "x" << m.dmBitsPerPel;
}

TEST(Display, NtListsFrequenciesLikeAMiniportAndRefusesOthers)
{
    BootWith(SIM_WINDOWS_NT4);
    std::vector<int> vga, rates_640x480x8, rates_1024x768x8;
    for (const DEVMODEA& m : Listed()) {
        if (IsVgaDriver(m)) vga.push_back(m.dmPelsWidth);
        else if (m.dmBitsPerPel == 8 && m.dmPelsWidth == 640) rates_640x480x8.push_back(m.dmDisplayFrequency);
        else if (m.dmBitsPerPel == 8 && m.dmPelsWidth == 1024) rates_1024x768x8.push_back(m.dmDisplayFrequency);
    }
    EXPECT_EQ((std::vector<int>{640, 320, 640}), vga);
    EXPECT_EQ((std::vector<int>{1, 60, 72, 75, 85}), rates_640x480x8) << "the hardware default as frequency 1";
    EXPECT_EQ((std::vector<int>{43, 60, 60, 70, 75, 85}), rates_1024x768x8);

    double pixel = SimPixelClockHz(0);
    DEVMODEA refused[] = {
        Request(1024, 768, 16, 85),   // beyond the RAMDAC at 16 bits
        Request(1280, 1024, 32, 60),  // beyond 4 MB
        Request(1024, 768, 8, 90),    // no such rate
        Request(848, 480, 8, 60),     // not a size of this machine
        Request(1024, 768, 24, 60),   // no such depth
    };
    for (DEVMODEA& m : refused)
        EXPECT_EQ(DISP_CHANGE_BADMODE, MachineChangeDisplaySettings(&m, 0)) << m.dmPelsWidth << "x" << m.dmBitsPerPel;
    DEVMODEA test = Request(800, 600, 8, 72), fallback = Request(800, 600, 8, 1);
    DEVMODEA interlaced = Request(1024, 768, 8, 43);
    EXPECT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&test, CDS_TEST));
    EXPECT_EQ(pixel, SimPixelClockHz(0)) << "a refused or tested mode leaves the card alone";
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&fallback, CDS_UPDATEREGISTRY));
    EXPECT_NEAR(60.0, SimRefreshHz(0), 1.0) << "the hardware default";
    EXPECT_EQ(1, MachineScreenRefresh());
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&interlaced, 0));
    EXPECT_NEAR(43.57, SimRefreshHz(0), 0.01);
    EXPECT_EQ(43, MachineScreenRefresh());
}

// Windows 98 alone has the Ex form, the one that reaches a second display
// device: the plain form changes the primary whatever dmDeviceName says.
TEST(Display, OnlyTheExFormChangesASecondDisplayDevice)
{
    for (int windows : {SIM_WINDOWS_95, SIM_WINDOWS_NT4}) {
        BootWith(windows);
        MachineDisplayFunctions f;
        EXPECT_TRUE(MachineFindDisplayFunctions(&f) && !f.ChangeDisplaySettingsExA) << windows;
    }
    SimMachineConfig config = Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 0, 9), Card(0x5333, 0x8A01, 0, 10)});
    config.start_bits = 16;
    SimBoot(&config);
    MachineDisplayFunctions f;
    ASSERT_TRUE(MachineFindDisplayFunctions(&f) && f.ChangeDisplaySettingsExA);
    DEVMODEA plain = Request(800, 600, 16), ex = Request(640, 480, 8);
    lstrcpyA((char*)plain.dmDeviceName, "\\\\.\\DISPLAY2");
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, MachineChangeDisplaySettings(&plain, 0));
    ASSERT_EQ(DISP_CHANGE_SUCCESSFUL, f.ChangeDisplaySettingsExA("\\\\.\\DISPLAY2", &ex, NULL, 0, NULL));
    EXPECT_EQ(DISP_CHANGE_BADPARAM, f.ChangeDisplaySettingsExA("\\\\.\\DISPLAY3", &plain, NULL, 0, NULL));
    EXPECT_TRUE(SimGetCardMode(0).width == 800 && SimGetCardMode(1).width == 640 && SimGetCardMode(1).bits == 8);
}
