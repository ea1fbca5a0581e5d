// The Trident model: the synthesizer pair CR2F chooses, DPMS, and the
// display driver's mode set read back from the registers.
#include "modes.h"
#include "sim_test.h"

static void BootTrident(int memory_mb = 4, int windows = SIM_WINDOWS_98)
{
    SimCardConfig card = Card(0x1023, 0x939a);
    card.memory_mb = memory_mb;
    SimMachineConfig config = Machine(windows, {card});
    config.start_bits = 8;
    SimBoot(&config);
}

// SR18 = 90, SR19 = N 5, R 1: 14.31818 MHz x 98 / (7 x 2).
TEST(Trident, PixelClockFromThePairCr2fChooses)
{
    BootTrident();
    MachineOutByte(0x3C2, 0xEB);  // the synthesizer, as tridentfb selects it
    WriteSr(0x19, 0x45);
    WriteSr(0x18, 0x5A);
    WriteSr(0x1B, 0x05);
    WriteSr(0x1A, 0x5A);
    WriteCr(0x2F, 0x02);
    EXPECT_NEAR(100227260, SimPixelClockHz(0), 1);
    WriteCr(0x2F, 0x00);
    EXPECT_NEAR(200454520, SimPixelClockHz(0), 1);
    WriteSr(0x17, 0x85);
    WriteSr(0x16, 0x5A);
    EXPECT_NEAR(50113630, SimMemoryClockHz(0), 1);
}

TEST(Trident, DpmsFromSr0d)
{
    BootTrident();
    const struct { uint8_t sr0d; SimDpms state; } cases[] = {
        {0x0F, SIM_DPMS_ON}, {0x20, SIM_DPMS_STANDBY}, {0x80, SIM_DPMS_SUSPEND}, {0xA0, SIM_DPMS_OFF}};
    for (const auto& c : cases) {
        WriteSr(0x0D, c.sr0d);
        EXPECT_EQ(c.state, SimDpmsState(0)) << std::hex << (int)c.sr0d;
    }
}

// 32 bits: the synthesizer at twice the pixel clock, halved by GR0F bit 3.
TEST(Trident, DmtModesRunAtTheirRates)
{
    const struct { int w, h, bits, hz; } cases[] = {
        {640, 480, 8, 72}, {1280, 1024, 8, 60}, {1024, 768, 16, 75}, {1024, 768, 32, 70}, {800, 600, 32, 85}};
    for (const auto& c : cases) {
        BootTrident(8, SIM_WINDOWS_NT4);
        ASSERT_TRUE(SimSetCardMode(0, c.w, c.h, c.bits, c.hz)) << c.w << "x" << c.h << "x" << c.bits;
        const SimTiming* t = SimFindTiming(c.w, c.h, c.hz, false);
        EXPECT_EQ(t->htotal / 8, SimHTotal(0));
        EXPECT_EQ(t->vtotal, SimVTotal(0));
        EXPECT_NEAR(SimTimingFrameRate(t), SimRefreshHz(0), 1.0) << c.w << "x" << c.h << "x" << c.bits;
        EXPECT_NEAR(t->pixel_hz * (c.bits == 32 ? 2.0 : 1.0), SimPixelClockHz(0), t->pixel_hz * 0.01);
        SimWriteRegister(0, SIM_REG_CRTC, 0x2B, SimReadRegister(0, SIM_REG_CRTC, 0x2B) ^ 0x01);
        SimWriteRegister(0, SIM_REG_CRTC, 0x27, SimReadRegister(0, SIM_REG_CRTC, 0x27) ^ 0x80);
        EXPECT_EQ(((t->htotal / 8 - 5) ^ 256) + 5, SimHTotal(0)) << "CR2B bit 0 is bit 8 of the total";
        EXPECT_EQ(((t->vtotal - 2) ^ 1024) + 2, SimVTotal(0)) << "CR27 bit 7 is bit 10";
    }
}
