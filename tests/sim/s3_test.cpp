// The S3 model: the SR08 key, the synthesizers' output from hand-computed
// register values, the CRT totals and refresh, the memory straps.
#include <vector>

#include "sim_test.h"

static void BootS3(uint16_t device, int bus = 0, int memory_mb = 4)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, device, bus, bus ? 0 : 10);
    config.cards[0].memory_mb = memory_mb;
    SimBoot(&config);
}

TEST(S3, ExtendedSequencerAnswersOnlyWithTheKey)
{
    BootS3(0x8901);
    uint8_t sr09 = SimReadRegister(0, SIM_REG_SEQUENCER, 0x09), sr11 = SimReadRegister(0, SIM_REG_SEQUENCER, 0x11);
    WriteSr(0x08, 0x05);
    WriteSr(0x09, (uint8_t)~sr09);
    EXPECT_EQ(0x00, ReadSr(0x11)) << "locked registers read 0";
    EXPECT_EQ(sr09, SimReadRegister(0, SIM_REG_SEQUENCER, 0x09)) << "and ignore writes";
    WriteSr(0x08, 0xA6);  // the key is the low nibble
    WriteSr(0x09, 0x42);
    EXPECT_EQ(sr11, ReadSr(0x11));
    EXPECT_EQ(0x42, ReadSr(0x09));
}

TEST(S3, SynthesizersFromHandComputedFields)
{
    const struct { uint16_t device; uint8_t sr12, sr13, sr29; double hz; } cases[] = {
        {0x8901, 0x2C, 0x5F, 0x00, 49602266.43},                 // M = 95, N = 12, R = 1
        {0x8901, 0xAC, 0x5F, 0x00, 14318180.0 * 97 / (14 * 32)},  // SR12 bit 7 is R's on a Trio64V2
        {0x5631, 0xAC, 0x5F, 0x00, 49602266.43},                 // ... but not on a ViRGE
        {0x8811, 0xAC, 0xDF, 0x00, 49602266.43},                 // ... nor a Trio64 (nor SR13 bit 7)
        {0x8A20, 0x46, 0x2C, 0x18, 30028405.28},                 // Savage3D M = 300, N = 70, R = 1
        {0x8A21, 0x86, 0x2C, 0x04, 14318180.0 * 46 / (8 * 64)},   // R = 2 + 4
    };
    for (const auto& c : cases) {
        BootS3(c.device);
        WriteSr(0x08, 0x06);
        WriteSr(0x12, c.sr12);
        WriteSr(0x13, c.sr13);
        WriteSr(0x29, c.sr29);
        EXPECT_NEAR(c.hz, SimPixelClockHz(0), 1.0) << std::hex << c.device << " SR12=" << (int)c.sr12;
    }
}

// The VGA's own modes run at their known rates: mode 12h (25.175 MHz, 100
// characters of 8 dots, 525 lines) at 59.94 Hz, text mode 03h (28.322 MHz,
// 100 of 9 dots, 449 lines) at 70.09 Hz. The S3 bits change mode 12h.
TEST(S3, TotalsAndRefreshFromTheRegisters)
{
    struct Reg { SimRegisterFile file; uint8_t index, value; };
    const Reg mode_12h[] = {{SIM_REG_MISC, 0, 0xE3}, {SIM_REG_SEQUENCER, 0x01, 0x01}, {SIM_REG_CRTC, 0x00, 0x5F},
                            {SIM_REG_CRTC, 0x06, 0x0B}, {SIM_REG_CRTC, 0x07, 0x3E}, {SIM_REG_CRTC, 0x5D, 0x00},
                            {SIM_REG_CRTC, 0x5E, 0x00}, {SIM_REG_CRTC, 0x5F, 0x00}, {SIM_REG_CRTC, 0x42, 0x00},
                            {SIM_REG_CRTC, 0x43, 0x00}, {SIM_REG_CRTC, 0x67, 0x00}, {SIM_REG_SEQUENCER, 0x18, 0x00}};
    const double hz_12h = 25175000.0 / (800 * 525);
    const Reg cr67_16 = {SIM_REG_CRTC, 0x67, 0x50}, sr18 = {SIM_REG_SEQUENCER, 0x18, 0x80};
    const Reg cr43 = {SIM_REG_CRTC, 0x43, 0x80}, cr5f = {SIM_REG_CRTC, 0x5F, 0x01};
    const struct { uint16_t device; const char* what; std::vector<Reg> set; int htotal, vtotal; double hz; } cases[] = {
        {0x8901, "mode 12h", {}, 100, 525, hz_12h},
        {0x8901, "text mode 03h",
         {{SIM_REG_MISC, 0, 0x67}, {SIM_REG_SEQUENCER, 0x01, 0x00}, {SIM_REG_CRTC, 0x06, 0xBF},
          {SIM_REG_CRTC, 0x07, 0x1F}},
         100, 449, 28322000.0 / (900 * 449)},
        {0x8901, "interlaced: a frame of two fields", {{SIM_REG_CRTC, 0x42, 0x20}}, 100, 525, hz_12h / 2},
        {0x8901, "SR18 is not consulted at 8 bits", {sr18}, 100, 525, hz_12h},
        {0x8901, "16 bits: 4 pixels a character", {cr67_16}, 100, 525, 2 * hz_12h},
        {0x8901, "15 bits: 4 pixels a character", {{SIM_REG_CRTC, 0x67, 0x30}}, 100, 525, 2 * hz_12h},
        {0x8901, "16 bits, SR18: two clocks a pixel", {cr67_16, sr18}, 100, 525, hz_12h},
        {0x8901, "24 bits, SR18: 8 pixels a character", {{SIM_REG_CRTC, 0x67, 0x70}, sr18}, 100, 525, hz_12h / 2},
        {0x8901, "CR43: 2 x 0x5F + 5 characters", {cr67_16, sr18, cr43}, 195, 525, hz_12h * 100 / 195},
        {0x8901, "CR5D bit 0, CR5E bit 0; CR5F is no part",
         {{SIM_REG_CRTC, 0x5D, 0x01}, {SIM_REG_CRTC, 0x5E, 0x01}, cr5f}, 356, 1549, hz_12h * 100 * 525 / (356 * 1549)},
        {0x8A20, "Savage3D: CR5F bits 1..0, counted double", {cr5f, cr43}, 2 * (0x5F + 512) + 5, 525, 0},
    };
    for (const auto& c : cases) {
        if (!SimConfig() || SimConfig()->cards[0].device_id != c.device) BootS3(c.device);
        for (const Reg& r : mode_12h) SimWriteRegister(0, r.file, r.index, r.value);
        for (const Reg& r : c.set) SimWriteRegister(0, r.file, r.index, r.value);
        EXPECT_EQ(c.htotal, SimHTotal(0)) << c.what;
        EXPECT_EQ(c.vtotal, SimVTotal(0)) << c.what;
        if (c.hz) EXPECT_NEAR(c.hz, SimRefreshHz(0), 0.001) << c.what;
    }
}

// The straps give 8 MB the public code the program's table lacks; a
// Savage3D on the AGP bus tells it in CR37 bit 6.
TEST(S3, MemoryStrapsAndTheAgpBit)
{
    BootS3(0x8901, 0, 8);
    EXPECT_EQ(3, ReadCr(0x36) >> 5);
    EXPECT_FALSE(ReadCr(0x37) & 0x40);
    BootS3(0x8A20, 1);
    EXPECT_TRUE(ReadCr(0x37) & 0x40);
}
