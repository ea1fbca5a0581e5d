#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/state.h"
#include "chips/chips.h"
#include "hardware/driver_key.h"
#include "hardware/multimon.h"
#include "modes/detect.h"
#include "modes/mode_keys.h"
#include "modes/rate_list.h"
#include "shell/main_window.h"
#include "support/machine.h"
#include "support/support.h"

static const uint16_t trio64v2_row = 15;

TEST(Detection, OneCardOnEverySystem)
{
    for (int windows : {SIM_WINDOWS_95, SIM_WINDOWS_98, SIM_WINDOWS_NT4}) {
        BootMachine(Machine(windows, {Card(0x5333, 0x8901, 0, 10)}));
        ASSERT_EQ(1, DetectAdapters()) << windows;
        ASSERT_EQ(1, adapter_count);
        const AdapterRecord* a = &adapter_table[0];
        EXPECT_EQ(0x5333, a->vendor_id);
        EXPECT_EQ(0x8901, a->device_id);
        EXPECT_EQ(trio64v2_row, a->chip_row);
        EXPECT_EQ(0, a->bus);
        EXPECT_EQ(windows == SIM_WINDOWS_NT4 ? 10 : 10 << 3, a->devfn);
        EXPECT_EQ(0u, a->flags & ADAPTER_AGP);
        EXPECT_EQ(windows == SIM_WINDOWS_NT4 ? 0 : 1, monitor_count);
        EXPECT_EQ(windows == SIM_WINDOWS_NT4 ? 0u : 1u, a->mapped_registers != 0 ? 1u : 0u);
        EXPECT_STREQ("", a->device_name);
    }
}

TEST(Detection, AgpCardsAndTheRiva128ZX)
{
    for (int windows : {SIM_WINDOWS_98, SIM_WINDOWS_NT4}) {
        BootMachine(Machine(windows, {Card(0x12d2, 0x0019, 1, 0)}));
        ASSERT_EQ(1, DetectAdapters()) << windows;
        EXPECT_EQ(0x0018, adapter_table[0].device_id);
        EXPECT_EQ(1, adapter_table[0].chip_row);
        EXPECT_EQ(1, adapter_table[0].bus);
        EXPECT_TRUE(adapter_table[0].flags & ADAPTER_AGP);
    }
}

TEST(Detection, UnsupportedCardsAreNotTaken)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x1002, 0x4742, 1, 0)}));
    EXPECT_EQ(0, DetectAdapters());
    EXPECT_EQ(0, adapter_count);
    BootMachine(Machine(SIM_WINDOWS_NT4, {Card(0x1002, 0x4742, 1, 0)}));
    EXPECT_EQ(0, DetectAdapters());
    uint16_t row = 99;
    EXPECT_EQ(0, FindChipRow(0x5333, 0x8902, &row));
    EXPECT_EQ(99, row);
    EXPECT_EQ(1, FindChipRow(0x100c, 0x3208, &row));
    EXPECT_EQ(19, row);
}

TEST(Detection, NTTakesTheAgpCardFirst)
{
    BootMachine(Machine(SIM_WINDOWS_NT4, {Card(0x5333, 0x8901, 0, 5), Card(0x5333, 0x8a20, 1, 0)}));
    ASSERT_EQ(1, DetectAdapters());
    EXPECT_EQ(1, adapter_count);
    EXPECT_EQ(0x8a20, adapter_table[0].device_id);
    EXPECT_EQ(1, adapter_table[0].bus);
    EXPECT_EQ(0, adapter_table[0].devfn);
}

TEST(Detection, DefRef17LeavesTheRateToTheDriver)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901)}));
    std::string folder = MakeScratchFolder("defref");
    WriteTextFile(folder + "ZNTR3.INI", "[CHIP8901_95]\r\nDefRef=17\r\n[CHIP8901_NT4]\r\nDefRef=16\r\n");
    lstrcpynA(chip_ini_path, (folder + "ZNTR3.INI").c_str(), sizeof chip_ini_path);
    ASSERT_EQ(1, DetectAdapters());
    EXPECT_TRUE(adapter_table[0].flags & ADAPTER_NO_CLOCK_REFRESH);

    BootMachine(Machine(SIM_WINDOWS_NT4, {Card(0x5333, 0x8901)}));
    lstrcpynA(chip_ini_path, (folder + "ZNTR3.INI").c_str(), sizeof chip_ini_path);
    ASSERT_EQ(1, DetectAdapters());
    EXPECT_FALSE(adapter_table[0].flags & ADAPTER_NO_CLOCK_REFRESH);
}

TEST(Detection, Windows95TakesOneCardOfAKind)
{
    BootMachine(Machine(SIM_WINDOWS_95, {Card(0x5333, 0x8901, 0, 9), Card(0x5333, 0x8901, 0, 11)}));
    ASSERT_EQ(1, DetectAdapters());
    EXPECT_EQ(1, adapter_count);
    EXPECT_EQ(9 << 3, adapter_table[0].devfn);
    EXPECT_FALSE(adapter_table[0].flags & ADAPTER_TWIN);
}

TEST(Detection, TwinCardsOnWindows98)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 0, 9), Card(0x5333, 0x8901, 0, 11)}));
    // Each twin finds its own driver key by bus and device number.
    monitor_count = 2;
    adapter_count = 2;
    for (int i = 0; i < 2; ++i) {
        adapter_table[i].vendor_id = 0x5333;
        adapter_table[i].device_id = 0x8901;
        adapter_table[i].devfn = (uint8_t)((i ? 11 : 9) << 3);
        adapter_table[i].flags = ADAPTER_TWIN;
    }
    char key0[DRIVER_KEY_SIZE], key1[DRIVER_KEY_SIZE];
    current_adapter = 0;
    ASSERT_EQ(1, FindDriverKey(key0));
    current_adapter = 1;
    ASSERT_EQ(1, FindDriverKey(key1));
    EXPECT_STRNE(key0, key1);

    // Both describe themselves alike, so both display devices tie to the
    // first record and the second is dropped.
    ResetProgramState();
    platform = PLATFORM_9X;
    os_class = OS_CLASS_WIN98;
    ASSERT_EQ(1, DetectAdapters());
    EXPECT_EQ(2, monitor_count);
    ASSERT_EQ(1, adapter_count);
    EXPECT_TRUE(adapter_table[0].flags & ADAPTER_TWIN);
    EXPECT_EQ(9 << 3, adapter_table[0].devfn);
    EXPECT_EQ(1, adapter_table[0].display_index);
    EXPECT_STREQ("\\\\.\\DISPLAY2", adapter_table[0].device_name);
    EXPECT_EQ(0, current_adapter);
}

TEST(Detection, DifferentCardsOnWindows98AreSortedByDisplayDevice)
{
    SimCardConfig second = Card(0x5333, 0x8a01, 0, 9);
    SimCardConfig first = Card(0x5333, 0x8901, 1, 0);
    BootMachine(Machine(SIM_WINDOWS_98, {first, second}));
    ASSERT_EQ(1, DetectAdapters());
    ASSERT_EQ(2, adapter_count);
    EXPECT_EQ(0x8901, adapter_table[0].device_id);  // the first display device
    EXPECT_EQ(0, adapter_table[0].display_index);
    EXPECT_EQ(0x8a01, adapter_table[1].device_id);
    EXPECT_EQ(1, adapter_table[1].display_index);
    EXPECT_STREQ("\\\\.\\DISPLAY2", adapter_table[1].device_name);

    RefreshAdapterModes(REFRESH_AT_STARTUP);
    EXPECT_TRUE(adapter_table[0].flags & ADAPTER_PRIMARY);
    EXPECT_TRUE(adapter_table[0].flags & ADAPTER_ATTACHED);
    EXPECT_FALSE(adapter_table[1].flags & ADAPTER_PRIMARY);
    EXPECT_EQ(0, current_adapter);
    EXPECT_GT(adapter_table[1].width, 0);
}

TEST(Detection, LongDriverDescriptionsStillFindTheirDisplayDevice)
{
    SimCardConfig first = Card(0x5333, 0x8901, 1, 0);
    SimCardConfig second = Card(0x5333, 0x8a01, 0, 9);
    lstrcpynA(second.driver_desc, "S3 Inc. ViRGE/DX/GX PCI Accelerator (Display Driver)", SIM_DESCRIPTION_SIZE);
    BootMachine(Machine(SIM_WINDOWS_98, {first, second}));
    ASSERT_EQ(1, DetectAdapters());
    ASSERT_EQ(2, adapter_count);
    EXPECT_EQ(0x8a01, adapter_table[1].device_id);
    EXPECT_EQ(1, adapter_table[1].display_index);
}

TEST(Detection, Windows98DropsCardsItDoesNotRun)
{
    SimCardConfig broken = Card(0x5333, 0x8a01, 0, 9);
    broken.problem = 22;
    SimCardConfig headless = Card(0x5333, 0x8a10, 0, 11);
    headless.display_device = false;
    SimCardConfig nodeless = Card(0x5333, 0x8904, 0, 12);
    nodeless.device_node = false;
    SimCardConfig good = Card(0x5333, 0x8901, 1, 0);
    SimMachineConfig config = Machine(SIM_WINDOWS_98, {broken, headless, nodeless, good});
    BootMachine(config);
    ASSERT_EQ(1, DetectAdapters());
    ASSERT_EQ(1, adapter_count);
    EXPECT_EQ(0x8901, adapter_table[0].device_id);

    broken.problem = 0;
    SimMachineConfig alone = Machine(SIM_WINDOWS_98, {broken, Card(0x5333, 0x8901, 1, 0)});
    alone.cards[1].problem = 10;
    BootMachine(alone);
    ASSERT_EQ(1, DetectAdapters());
    EXPECT_EQ(0x8a01, adapter_table[0].device_id);
}

TEST(MonitorRect, OneScreenOrTheAdaptersOwnMonitor)
{
    BootMachine(Machine(SIM_WINDOWS_95, {Card(0x5333, 0x8901)}));
    ASSERT_EQ(1, DetectAdapters());
    RECT r;
    EXPECT_EQ(1, GetAdapterMonitorRect(&r));
    EXPECT_EQ(0, r.left);
    EXPECT_EQ(GetSystemMetrics(SM_CXSCREEN), r.right);
    EXPECT_EQ(GetSystemMetrics(SM_CYSCREEN), r.bottom);

    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 1, 0), Card(0x5333, 0x8a01, 0, 9)}));
    ASSERT_EQ(1, DetectAdapters());
    ASSERT_EQ(2, adapter_count);
    RefreshAdapterModes(REFRESH_AT_STARTUP);
    current_adapter = 1;
    ASSERT_EQ(1, GetAdapterMonitorRect(&r));
    EXPECT_EQ(adapter_table[0].width, r.left);  // the second monitor sits to the right
    EXPECT_EQ(adapter_table[0].width + adapter_table[1].width, r.right);
    adapter_table[1].display_index = 5;  // more than there are monitors
    ASSERT_EQ(1, GetAdapterMonitorRect(&r));
    EXPECT_EQ(0, r.left);
    EXPECT_EQ(5, adapter_table[1].display_index);
}

TEST(PowerMessage, OnlyDpmsStatesReachTheCards)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901)}));
    ASSERT_EQ(1, DetectAdapters());
    EXPECT_EQ(1, OnPowerStateMessage(4));
    EXPECT_EQ(SIM_DPMS_OFF, SimDpmsState(0));
    double pixel = SimPixelClockHz(0), memory = SimMemoryClockHz(0);
    SimResetCounters();
    for (WPARAM foreign : {(WPARAM)3, (WPARAM)219, (WPARAM)229, (WPARAM)231, (WPARAM)235, (WPARAM)0x100000000ull})
        EXPECT_EQ(1, OnPowerStateMessage(foreign));
    EXPECT_EQ(0u, SimGetCounters()->port_writes + SimGetCounters()->window_writes);
    EXPECT_EQ(SIM_DPMS_OFF, SimDpmsState(0));
    EXPECT_EQ(pixel, SimPixelClockHz(0));
    EXPECT_EQ(memory, SimMemoryClockHz(0));
    EXPECT_EQ(1, OnPowerStateMessage(1));
    EXPECT_EQ(SIM_DPMS_STANDBY, SimDpmsState(0));
    EXPECT_EQ(1, OnPowerStateMessage(0));
    EXPECT_EQ(SIM_DPMS_ON, SimDpmsState(0));
    EXPECT_EQ(1, any_chip_has_dpms());
}
