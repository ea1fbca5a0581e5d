// Adapter detection on machines built in code.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/state.h"
#include "chips/chips.h"
#include "hardware/driver_key.h"
#include "hardware/multimon.h"
#include "modes/detect.h"
#include "support/machine.h"
#include "support/support.h"

struct Slot {
    uint16_t vendor, device;
    uint8_t bus, slot;
    uint32_t problem = 0;
    bool display_device = true, device_node = true;
    const char* description = "";
};

static SimMachineConfig MachineOf(int windows, const Slot* slots, int count)
{
    SimMachineConfig config = Machine(windows, {});
    for (int i = 0; i < count && slots[i].vendor; ++i) {
        SimCardConfig c = Card(slots[i].vendor, slots[i].device, slots[i].bus, slots[i].slot);
        c.problem = slots[i].problem;
        c.display_device = slots[i].display_device;
        c.device_node = slots[i].device_node;
        if (slots[i].description[0]) lstrcpynA(c.driver_desc, slots[i].description, SIM_DESCRIPTION_SIZE);
        config.cards[config.card_count++] = c;
    }
    return config;
}

static const uint16_t any = 0xFFFF;
// The chip file leaves the Trio64V2's rate to the 9x display driver.
static const uint32_t T = ADAPTER_NO_CLOCK_REFRESH, A = ADAPTER_AGP;

TEST(Detection, WhichCardsBecomeRecordsInWhichOrder)
{
    std::string ini = MakeScratchFolder("detect") + "ZNTR3.INI";
    WriteTextFile(ini, "[CHIP8901_95]\r\nDefRef=17\r\n[CHIP8901_NT4]\r\nDefRef=16\r\n");
    struct Found {
        uint16_t device_id;
        uint8_t devfn;
        uint32_t flags;  // of AGP, TWIN and NO_CLOCK_REFRESH
        uint16_t display_index;
    };
    const char* long_name = "S3 Inc. ViRGE/DX/GX PCI Accelerator (Display Driver)";
    struct Case {
        const char* what;
        int windows;
        Slot cards[4];
        Found found[2];  // device_id 0 ends
    } cases[] = {
        {"95", 95, {{0x5333, 0x8901, 0, 10}}, {{0x8901, 10 << 3, T, 0}}},
        {"98", 98, {{0x5333, 0x8901, 0, 10}}, {{0x8901, 10 << 3, T, 0}}},
        {"NT: the slot, not devfn", 4, {{0x5333, 0x8901, 0, 10}}, {{0x8901, 10, 0, 0}}},
        {"98 AGP 128ZX as a 128", 98, {{0x12d2, 0x0019, 1, 0}}, {{0x0018, 0, A, 0}}},
        {"NT AGP 128ZX", 4, {{0x12d2, 0x0019, 1, 0}}, {{0x0018, 0, A, 0}}},
        {"98 unsupported", 98, {{0x1002, 0x4742, 1, 0}}, {}},
        {"NT unsupported", 4, {{0x1002, 0x4742, 1, 0}}, {}},
        {"NT takes the AGP card first", 4, {{0x5333, 0x8901, 0, 5}, {0x5333, 0x8a20, 1, 0}}, {{0x8a20, 0, A, 0}}},
        {"95 takes one card of a kind", 95, {{0x5333, 0x8901, 0, 9}, {0x5333, 0x8901, 0, 11}}, {{0x8901, 9 << 3, T, 0}}},
        // Twins describe themselves alike: both display devices tie to the first.
        {"98 twins", 98, {{0x5333, 0x8901, 0, 9}, {0x5333, 0x8901, 0, 11}},
         {{0x8901, 9 << 3, T | ADAPTER_TWIN, 1}}},
        {"98 sorted by display device", 98, {{0x5333, 0x8901, 1, 0}, {0x5333, 0x8a01, 0, 9}},
         {{0x8901, 0, A | T, 0}, {0x8a01, 9 << 3, 0, 1}}},
        {"98 long driver description", 98, {{0x5333, 0x8901, 1, 0}, {0x5333, 0x8a01, 0, 9, 0, true, true, long_name}},
         {{0x8901, 0, A | T, 0}, {0x8a01, 9 << 3, 0, 1}}},
        {"98 drops a problem, no display device, no device node", 98,
         {{0x5333, 0x8a01, 0, 9, 22}, {0x5333, 0x8a10, 0, 11, 0, false}, {0x5333, 0x8904, 0, 12, 0, true, false},
          {0x5333, 0x8901, 1, 0}},
         {{0x8901, 0, A | T, any}}},
        {"98 problem on the other card", 98, {{0x5333, 0x8a01, 0, 9}, {0x5333, 0x8901, 1, 0, 10}},
         {{0x8a01, 9 << 3, 0, any}}},
    };
    for (const Case& c : cases) {
        BootMachine(MachineOf(c.windows, c.cards, 4));
        lstrcpynA(chip_ini_path, ini.c_str(), sizeof chip_ini_path);
        int expected = 0;
        while (expected < 2 && c.found[expected].device_id) ++expected;
        EXPECT_EQ(expected ? 1 : 0, DetectAdapters()) << c.what;
        ASSERT_EQ(expected, adapter_count) << c.what;
        EXPECT_EQ(0, current_adapter) << c.what;
        for (int i = 0; i < expected; ++i) {
            const Found& f = c.found[i];
            const AdapterRecord& a = adapter_table[i];
            EXPECT_EQ(f.device_id, a.device_id) << c.what;
            EXPECT_EQ(f.flags & A ? 1 : 0, a.bus) << c.what;
            EXPECT_EQ(f.devfn, a.devfn) << c.what;
            EXPECT_EQ(f.flags, a.flags & (A | T | ADAPTER_TWIN)) << c.what;
            if (f.display_index != any) EXPECT_EQ(f.display_index, a.display_index) << c.what;
            std::string name = monitor_count < 2 ? "" : "\\\\.\\DISPLAY" + std::to_string(a.display_index + 1);
            EXPECT_EQ(name, a.device_name) << c.what;
            // 9x reaches the registers through the card's window; NT through the kernel device.
            EXPECT_EQ(c.windows != 4 && a.vendor_id == 0x5333, a.mapped_registers != 0) << c.what;
        }
    }
}

TEST(Detection, EveryChipOfTheTableIsFoundInItsRow)
{
    static const uint16_t chips[20][2] = {
        {0x12d2, 0x0018}, {0x12d2, 0x0019}, {0x10de, 0x0020}, {0x8086, 0x7800}, {0x121a, 0x0003},
        {0x1023, 0x939a}, {0x5333, 0x8a13}, {0x5333, 0x8a20}, {0x5333, 0x8a21}, {0x5333, 0x8904},
        {0x5333, 0x5631}, {0x5333, 0x883d}, {0x5333, 0x8a01}, {0x5333, 0x8a10}, {0x5333, 0x8811},
        {0x5333, 0x8901}, {0x104c, 0x3d07}, {0x3d3d, 0x0007}, {0x3d3d, 0x0009}, {0x100c, 0x3208}};
    for (int first = 0; first < 20; first += MAX_ADAPTERS) {
        Slot slots[MAX_ADAPTERS] = {};
        int n = 0;
        for (; n < MAX_ADAPTERS && first + n < 20; ++n)
            slots[n] = {chips[first + n][0], chips[first + n][1], 0, (uint8_t)(20 - n)};
        BootMachine(MachineOf(SIM_WINDOWS_95, slots, n));
        ASSERT_EQ(1, DetectAdapters());
        ASSERT_EQ(n, adapter_count);
        for (int i = 0; i < n; ++i) {
            const AdapterRecord& a = adapter_table[i];
            const uint16_t* chip = chips[first + (20 - a.devfn / 8)];
            EXPECT_EQ(chip[0], chip_table[a.chip_row].vendor_id) << std::hex << chip[1];
            EXPECT_EQ(chip[1], chip_table[a.chip_row].device_id) << std::hex << chip[1];
        }
    }
}

// Twins find their own driver keys by bus and device number.
TEST(Detection, TwinsHaveTheirOwnDriverKeys)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 0, 9), Card(0x5333, 0x8901, 0, 11)}));
    char keys[2][DRIVER_KEY_SIZE];
    for (current_adapter = 0, adapter_count = 2; current_adapter < 2; ++current_adapter) {
        adapter_table[current_adapter] = AdapterRecord{0x5333, 0x8901, 0, (uint8_t)(current_adapter ? 11 << 3 : 9 << 3)};
        adapter_table[current_adapter].flags = ADAPTER_TWIN;
        ASSERT_EQ(1, FindDriverKey(keys[current_adapter]));
    }
    EXPECT_STRNE(keys[0], keys[1]);
}

TEST(MonitorRect, OneScreenOrTheAdaptersOwnMonitor)
{
    RECT r;
    ASSERT_NO_FATAL_FAILURE(BootDefaultAndDetect(SIM_WINDOWS_95));
    EXPECT_EQ(1, GetAdapterMonitorRect(&r));
    EXPECT_TRUE(r.left == 0 && r.right == GetSystemMetrics(SM_CXSCREEN) && r.bottom == GetSystemMetrics(SM_CYSCREEN));

    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 1, 0), Card(0x5333, 0x8a01, 0, 9)}));
    ASSERT_EQ(1, DetectAdapters());
    RefreshAdapterModes(REFRESH_AT_STARTUP);
    EXPECT_TRUE(adapter_table[0].flags & ADAPTER_PRIMARY);
    EXPECT_FALSE(adapter_table[1].flags & ADAPTER_PRIMARY);
    EXPECT_TRUE(adapter_table[1].flags & ADAPTER_ATTACHED);
    current_adapter = 1;
    ASSERT_EQ(1, GetAdapterMonitorRect(&r));
    EXPECT_EQ(adapter_table[0].width, r.left);  // the second monitor sits to the right
    EXPECT_EQ(adapter_table[0].width + adapter_table[1].width, r.right);
    adapter_table[1].display_index = 5;  // more than there are monitors
    ASSERT_EQ(1, GetAdapterMonitorRect(&r));
    EXPECT_EQ(0, r.left);
}
