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

static SimCardConfig C(uint16_t vendor, uint16_t device, uint8_t bus, uint8_t slot, uint32_t problem = 0,
                       bool display_device = true, bool device_node = true, const char* description = "")
{
    SimCardConfig c = Card(vendor, device, bus, slot);
    c.problem = problem;
    c.display_device = display_device;
    c.device_node = device_node;
    if (description[0]) lstrcpynA(c.driver_desc, description, SIM_DESCRIPTION_SIZE);
    return c;
}

static SimMachineConfig MachineOf(int windows, const SimCardConfig* cards, int count)
{
    SimMachineConfig config = Machine(windows, {});
    for (; config.card_count < count && cards[config.card_count].vendor_id; ++config.card_count)
        config.cards[config.card_count] = cards[config.card_count];
    return config;
}

static const uint16_t any = 0xFFFF;
// The chip file leaves the Trio64V2's rate to the 9x display driver.
static const uint32_t T = ADAPTER_NO_CLOCK_REFRESH, A = ADAPTER_AGP;

TEST(Detection, WhichCardsBecomeRecordsInWhichOrder)
{
    std::string ini = MakeScratchFolder("detect") + "ZNTR3.INI";
    WriteTextFile(ini, "[CHIP8901_95]\r\nDefRef=17\r\n[CHIP8901_NT4]\r\nDefRef=16\r\n");
    struct Found {  // flags: of AGP, TWIN and NO_CLOCK_REFRESH
        uint16_t device_id, devfn, flags, display_index;
    };
    const char* long_name = "S3 Inc. ViRGE/DX/GX PCI Accelerator (Display Driver)";
    struct Case {
        const char* what;
        int windows;
        SimCardConfig cards[4];
        Found found[2];  // device_id 0 ends
    } cases[] = {
        {"95", 95, {C(0x5333, 0x8901, 0, 10)}, {{0x8901, 10 << 3, T, 0}}},
        {"98", 98, {C(0x5333, 0x8901, 0, 10)}, {{0x8901, 10 << 3, T, 0}}},
        {"NT: the slot, not devfn", 4, {C(0x5333, 0x8901, 0, 10)}, {{0x8901, 10, 0, 0}}},
        {"98 AGP 128ZX as a 128", 98, {C(0x12d2, 0x0019, 1, 0)}, {{0x0018, 0, A, 0}}},
        {"NT AGP 128ZX", 4, {C(0x12d2, 0x0019, 1, 0)}, {{0x0018, 0, A, 0}}},
        {"98 unsupported", 98, {C(0x1002, 0x4742, 1, 0)}, {}},
        {"NT unsupported", 4, {C(0x1002, 0x4742, 1, 0)}, {}},
        {"NT takes the AGP card first", 4, {C(0x5333, 0x8901, 0, 5), C(0x5333, 0x8a20, 1, 0)}, {{0x8a20, 0, A, 0}}},
        {"95 takes one card of a kind", 95, {C(0x5333, 0x8901, 0, 9), C(0x5333, 0x8901, 0, 11)},
         {{0x8901, 9 << 3, T, 0}}},
        // Twins describe themselves alike: both display devices tie to the first.
        {"98 twins", 98, {C(0x5333, 0x8901, 0, 9), C(0x5333, 0x8901, 0, 11)},
         {{0x8901, 9 << 3, T | ADAPTER_TWIN, 1}}},
        {"98 sorted by display device", 98, {C(0x5333, 0x8901, 1, 0), C(0x5333, 0x8a01, 0, 9)},
         {{0x8901, 0, A | T, 0}, {0x8a01, 9 << 3, 0, 1}}},
        {"98 long driver description", 98, {C(0x5333, 0x8901, 1, 0), C(0x5333, 0x8a01, 0, 9, 0, true, true, long_name)},
         {{0x8901, 0, A | T, 0}, {0x8a01, 9 << 3, 0, 1}}},
        {"98 drops a problem, no display device, no device node", 98,
         {C(0x5333, 0x8a01, 0, 9, 22), C(0x5333, 0x8a10, 0, 11, 0, false), C(0x5333, 0x8904, 0, 12, 0, true, false),
          C(0x5333, 0x8901, 1, 0)},
         {{0x8901, 0, A | T, any}}},
        {"98 problem on the other card", 98, {C(0x5333, 0x8a01, 0, 9), C(0x5333, 0x8901, 1, 0, 10)},
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
            // 9x reaches the registers of the S3 and NVIDIA chips through the card's window; NT through the kernel device.
            bool windowed = a.vendor_id == 0x5333 || a.vendor_id == 0x12d2 || a.vendor_id == 0x10de;
            EXPECT_EQ(c.windows != 4 && windowed, a.mapped_registers != 0) << c.what;
        }
        // The first display device is the primary one; the second's monitor sits to its right.
        RefreshAdapterModes(REFRESH_AT_STARTUP);
        for (current_adapter = 0; current_adapter < expected; ++current_adapter) {
            const AdapterRecord& a = *CurrentAdapter();
            RECT r;
            ASSERT_EQ(1, GetAdapterMonitorRect(&r));
            if (a.display_index != current_adapter) continue;
            EXPECT_EQ(monitor_count > 1 && !current_adapter, (a.flags & ADAPTER_PRIMARY) != 0) << c.what;
            EXPECT_EQ(current_adapter ? adapter_table[0].width : 0, r.left) << c.what;
            EXPECT_EQ(r.left + a.width, r.right) << c.what;
        }
        if (expected == 2) {  // a display device beyond the monitors: the one screen
            RECT r;
            current_adapter = 1;
            adapter_table[1].display_index = 5;
            ASSERT_EQ(1, GetAdapterMonitorRect(&r));
            EXPECT_TRUE(r.left == 0 && adapter_table[1].display_index == 5) << c.what;
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
        SimMachineConfig config = Machine(SIM_WINDOWS_95, {});
        for (int n = 0; n < MAX_ADAPTERS && first + n < 20; ++n)
            config.cards[config.card_count++] = Card(chips[first + n][0], chips[first + n][1], 0, (uint8_t)(20 - n));
        BootMachine(config);
        ASSERT_EQ(1, DetectAdapters());
        ASSERT_EQ(config.card_count, adapter_count);
        for (int i = 0; i < adapter_count; ++i) {
            const uint16_t* chip = chips[first + 20 - adapter_table[i].devfn / 8];  // the card in that slot
            const ChipRow& row = chip_table[adapter_table[i].chip_row];
            EXPECT_TRUE(row.vendor_id == chip[0] && row.device_id == chip[1]) << std::hex << chip[0] << ":" << chip[1];
        }
    }
}

// Twins find their own driver keys by bus and device number.
TEST(Detection, TwinsHaveTheirOwnDriverKeys)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 0, 9), Card(0x5333, 0x8901, 0, 11)}));
    char keys[2][DRIVER_KEY_SIZE];
    for (current_adapter = 0, adapter_count = 2; current_adapter < 2; ++current_adapter) {
        uint8_t devfn = (uint8_t)(current_adapter ? 11 << 3 : 9 << 3);
        adapter_table[current_adapter] = {.vendor_id = 0x5333, .device_id = 0x8901, .devfn = devfn};
        adapter_table[current_adapter].flags = ADAPTER_TWIN;
        ASSERT_EQ(1, FindDriverKey(keys[current_adapter]));
    }
    EXPECT_STRNE(keys[0], keys[1]);
}
