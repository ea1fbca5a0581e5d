// The NVIDIA model: the extended-register locks, the real-mode access port
// against the register window, the simstate names, DPMS, and the
// display driver's mode set read back from the registers.
#include <math.h>

#include "sim_test.h"

enum : uint16_t { TNT = 0x0020, RIVA128 = 0x0018 };
const uint32_t MPLL = 0x680504;

static void BootRiva(uint16_t device, int memory_mb = 16, uint32_t crystal_hz = 14318180, int windows = SIM_WINDOWS_98)
{
    SimCardConfig card = Card(device == TNT ? 0x10de : 0x12d2, device, device == TNT ? 1 : 0, device == TNT ? 0 : 10);
    card.memory_mb = memory_mb;
    card.crystal_hz = crystal_hz;
    SimMachineConfig config = Machine(windows, {card});
    config.start_bits = 32;
    SimBoot(&config);
}

TEST(Riva, ExtendedCrtcOnlyBehindTheLock)
{
    const struct { uint16_t device, port; uint8_t index, relock, unlocked_reads; } cases[] = {
        {TNT, 0x3D4, 0x1F, 0x75, 3},
        {RIVA128, 0x3C4, 0x06, 0x00, 1},
    };
    for (const auto& c : cases) {
        BootRiva(c.device, 4);
        EXPECT_EQ(0, ReadIndexed(c.port, c.index)) << "locked after reset";
        WriteCr(0x1A, 0xC0);
        EXPECT_EQ(0, SimReadRegister(0, SIM_REG_CRTC, 0x1A)) << "a locked register ignores writes";
        WriteIndexed(c.port, c.index, 0x57);
        EXPECT_EQ(c.unlocked_reads, ReadIndexed(c.port, c.index));
        WriteCr(0x1A, 0xC0);
        EXPECT_EQ(0xC0, ReadCr(0x1A));
        EXPECT_EQ(SIM_DPMS_OFF, SimDpmsState(0));
        WriteIndexed(c.port, c.index, c.relock);
        EXPECT_EQ(0, ReadIndexed(c.port, c.index));
        EXPECT_EQ(0, ReadCr(0x1A)) << "a locked register reads 0";
        EXPECT_EQ(SimReadRegister(0, SIM_REG_CRTC, 0x06), ReadCr(0x06)) << "the VGA's own do not lock";
    }
}

// The driver's mode set, read back from CR00/CR2D, CR06/CR07/CR25 and the
// VPLL, runs within 1 Hz of the timing's exact rate with either crystal.
TEST(Riva, DmtModesRunAtTheirRates)
{
    const struct { uint16_t device; uint32_t crystal; int w, h, hz; } cases[] = {
        {TNT, 14318180, 640, 480, 60},   {TNT, 14318180, 1024, 768, 85}, {TNT, 13500000, 1280, 1024, 85},
        {RIVA128, 14318180, 800, 600, 72}, {RIVA128, 13500000, 1024, 768, 70},
    };
    for (const auto& c : cases) {
        BootRiva(c.device, 8, c.crystal, SIM_WINDOWS_NT4);
        const SimTiming* t;
        ASSERT_NO_FATAL_FAILURE(SetDmtMode(c.w, c.h, 8, c.hz, &t));
        ExpectOverflowBits(t, 0x2D, 0x01, 0x25, 0x01, 1024);  // bit 8 of the total, bit 10
    }
}

// simstate names the synthesizer registers as the chips' documents do.
TEST(Riva, SimstateNamesTheRawRegisters)
{
    BootRiva(TNT);
    SimWriteInternal32(0, MPLL, 0x00018C0A);
    std::string text = PrintedState();
    for (const char* line : {"\nNV_PRAMDAC_MPLL_COEFF=00018C0A\n", "\nNV_PEXTDEV_BOOT_0=00000040\n",
                             "\nNV_PFB_BOOT_0=00000003\n", "\nNV_PRAMDAC_VPLL_COEFF="})
        EXPECT_NE(std::string::npos, text.find(line)) << line;
    BootWith(SIM_WINDOWS_98, 0x8A20);
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x12, 0x46);
    text = PrintedState();
    EXPECT_NE(std::string::npos, text.find("\nS3_SR12_DCLK_VALUE_LOW=46\nS3_SR13_DCLK_VALUE_HIGH="));
    EXPECT_NE(std::string::npos, text.find("\nS3_SR29_DCLK_OVERFLOW="));
}
