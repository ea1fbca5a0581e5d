// The Trident model: the memory clock and the display driver's mode set
// read back from the registers.
#include "sim_test.h"

static void BootTrident(int memory_mb = 4, int windows = SIM_WINDOWS_98)
{
    SimCardConfig card = Card(0x1023, 0x939a);
    card.memory_mb = memory_mb;
    SimMachineConfig config = Machine(windows, {card});
    config.start_bits = 8;
    SimBoot(&config);
}

// SR16 = 90, SR17 = N 5, R 2: 14.31818 MHz x 98 / (7 x 4).
TEST(Trident, MemoryClockFromSr16Sr17)
{
    BootTrident();
    WriteSr(0x17, 0x85);
    WriteSr(0x16, 0x5A);
    EXPECT_NEAR(50113630, SimMemoryClockHz(0), 1);
}

// 32 bits: the synthesizer at twice the pixel clock, halved by GR0F bit 3.
TEST(Trident, DmtModesRunAtTheirRates)
{
    const struct { int w, h, bits, hz; } cases[] = {
        {640, 480, 8, 72}, {1280, 1024, 8, 60}, {1024, 768, 16, 75}, {1024, 768, 32, 70}, {800, 600, 32, 85}};
    for (const auto& c : cases) {
        BootTrident(8, SIM_WINDOWS_NT4);
        const SimTiming* t;
        ASSERT_NO_FATAL_FAILURE(SetDmtMode(c.w, c.h, c.bits, c.hz, &t));
        EXPECT_NEAR(t->pixel_hz * (c.bits == 32 ? 2.0 : 1.0), SimPixelClockHz(0), t->pixel_hz * 0.01);
        ExpectOverflowBits(t, 0x2B, 0x01, 0x27, 0x80, 1024);  // bit 8 of the total, bit 10
    }
}
