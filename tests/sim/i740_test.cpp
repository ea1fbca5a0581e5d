// The i740 model: the XR index/data pair, the two clock sets chosen by the
// MISC clock select, the memory clock choice, DPMS sync select, and the
// display driver's mode set read back through CR30/CR35.
#include "sim_test.h"

static void BootI740(int windows = SIM_WINDOWS_98)
{
    SimMachineConfig config = Machine(windows, {Card(0x8086, 0x7800, 1, 0)});
    config.start_bits = 32;
    SimBoot(&config);
}
static void WriteXr(uint8_t index, uint8_t value) { WriteIndexed(0x3D6, index, value); }
static uint8_t ReadXr(uint8_t index) { return ReadIndexed(0x3D6, index); }

// f = 66.6667 MHz (/4 without divisor select bit 0) x 4 or 16 (bit 2) x
// (M + 2) / ((N + 2) x 2^P), M and N with their bits 9..8 in XRC2/XRCA.
TEST(I740, ClockSetsByTheClockSelect)
{
    const struct { uint8_t misc_select, base, m, n, high, divisor; double hz; } cases[] = {
        {2, 0xC8, 25, 10, 0x00, 0x25, 600000300},  // M 25, N 10, P 2, loop by 16
        {1, 0xC8, 25, 10, 0x00, 0x20, 37500019},   // the reference divided by 4
        {3, 0xC8, 0, 0, 0x11, 0x01, 66666700 * 4.0 * 258 / 258},  // M 256, N 256
    };
    for (const auto& c : cases) {
        BootI740();
        WriteXr(c.base, c.m);
        WriteXr(c.base + 1, c.n);
        WriteXr(c.base + 2, c.high);
        WriteXr(c.base + 3, c.divisor);
        MachineOutByte(0x3C2, (uint8_t)(0xE3 | c.misc_select << 2));
        EXPECT_NEAR(c.hz, SimPixelClockHz(0), 1) << std::hex << (int)c.base << " " << (int)c.divisor;
        EXPECT_EQ(c.m, ReadXr(c.base));
    }
    const struct { uint8_t code; double hz; } memory[] = {{0, 66667000}, {1, 75000000}, {2, 88889000}, {3, 100000000}};
    for (const auto& m : memory) {
        WriteXr(0xCE, (uint8_t)(0xF0 | m.code));
        EXPECT_NEAR(m.hz, SimMemoryClockHz(0), 1);
    }
}

// The XR pair is also reached in the register window at BAR1 + port.
TEST(I740, DmtModesRunAtTheirRates)
{
    const struct { int w, h, hz, bits; } cases[] = {
        {640, 480, 60, 8}, {800, 600, 72, 16}, {1024, 768, 85, 16}, {1280, 1024, 75, 8}};
    for (const auto& c : cases) {
        BootI740(SIM_WINDOWS_NT4);
        const SimTiming* t;
        ASSERT_NO_FATAL_FAILURE(SetDmtMode(c.w, c.h, c.bits, c.hz, &t));
        EXPECT_EQ(8, (MachineInByte(0x3CC) & 0x0C)) << "clock select 2: set B";
        ExpectOverflowBits(t, 0x35, 0x01, 0x30, 0x08, 2048);  // bit 8 of the total, bit 11
    }
    BootI740();
    uint32_t window = SimCardBarAddress(0, 1);
    MachineWriteByte(window + 0x3D6, 0x61);
    MachineWriteByte(window + 0x3D7, 0x0A);
    EXPECT_EQ(SIM_DPMS_OFF, SimDpmsState(0)) << "XR61 bit 1 stops the horizontal sync, bit 3 the vertical";
    EXPECT_NE(std::string::npos, PrintedState().find("\nVCLK2_VCO_DIV_SEL="));
}
