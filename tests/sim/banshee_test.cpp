// The Banshee model: its synthesizers and memory set-up from known register
// values, and the display driver's mode set read back from the registers.
#include "sim_test.h"

enum : uint32_t { DRAM_INIT0 = 0x18, PLL_CTRL0 = 0x40, PLL_CTRL2 = 0x48, DAC_MODE = 0x4C, VID_PROC_CFG = 0x5C };

static void BootBanshee(int memory_mb = 16, int windows = SIM_WINDOWS_98)
{
    SimCardConfig card = Card(0x121a, 0x0003);
    card.memory_mb = memory_mb;
    SimMachineConfig config = Machine(windows, {card});
    config.start_bits = 32;
    SimBoot(&config);
}
static uint32_t Bar0() { return SimCardBarAddress(0, 0); }

// f = 14.31818 MHz x (bits 15..8 + 2) / ((bits 7..2 + 2) x 2^(bits 1..0));
// MISC clock select 0 and 1 are the VGA's fixed clocks.
TEST(Banshee, SynthesizersAndMemorySize)
{
    const struct { int mb; uint32_t pll; int select; double pixel_hz, memory_hz; uint32_t dram_bits; } cases[] = {
        {16, 0x5D3B, 2, 10626774, 10626774, 0x0C000000},  // 95 / (16 x 8); 8 chips
        {32, 0x3A1C, 0, 25175000, 95454533, 0x14000000},
        {4, 0x3A1C, 1, 28322000, 95454533, 0x18000000},  // no code for 4 MB
    };
    for (const auto& c : cases) {
        BootBanshee(c.mb);
        MachineWriteDword(Bar0() + PLL_CTRL0, c.pll);
        MachineWriteDword(Bar0() + PLL_CTRL2, c.pll);
        SimWriteRegister(0, SIM_REG_MISC, 0, (uint8_t)(0xE3 | c.select << 2));
        EXPECT_NEAR(c.pixel_hz, SimPixelClockHz(0), 1) << c.mb;
        EXPECT_NEAR(c.memory_hz, SimMemoryClockHz(0), 1) << c.mb;
        EXPECT_EQ(c.dram_bits, MachineReadDword(Bar0() + DRAM_INIT0) & 0x1C000000) << c.mb;
    }
}

// The driver's mode set read back from CR00/CR1A, CR06/CR07/CR1B and
// pllCtrl0: below 1600 pixels no 2X mode, whatever the clock (2X mode's
// count is held against the driver's in tests/chips).
TEST(Banshee, DmtModesRunAtTheirRates)
{
    const struct { int w, h, hz, bits; } cases[] = {{640, 480, 60, 8}, {1024, 768, 85, 16}, {1280, 1024, 85, 8}};
    for (const auto& c : cases) {
        BootBanshee(16, SIM_WINDOWS_NT4);
        const SimTiming* t;
        ASSERT_NO_FATAL_FAILURE(SetDmtMode(c.w, c.h, c.bits, c.hz, &t));
        EXPECT_EQ(0u, SimReadInternal32(0, VID_PROC_CFG) & 1u << 26);
        EXPECT_EQ(0u, SimReadInternal32(0, DAC_MODE) & 1);
        ExpectOverflowBits(t, 0x1A, 0x01, 0x1B, 0x01, 1024);  // bit 8 of the total, bit 10
    }
    std::string text = PrintedState();
    EXPECT_NE(std::string::npos, text.find("\npllCtrl0=")) << text.substr(text.size() - 300);
    EXPECT_NE(std::string::npos, text.find("\npllCtrl2=0000592C\n"));
}
