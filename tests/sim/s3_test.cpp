// The S3 model: the SR08 key, the synthesizers' output from hand-computed
// register values, the CRT totals and refresh, the memory straps and DPMS.
#include <vector>

#include "sim_test.h"

static void BootS3(uint16_t device, int bus = 0, int memory_mb = 4)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, device, bus, bus ? 0 : 10);
    config.cards[0].memory_mb = memory_mb;
    if (memory_mb < 2) config.start_bits = 8;
    SimBoot(&config);
}

TEST(S3, ExtendedSequencerAnswersOnlyWithTheKey)
{
    BootS3(0x8901);
    uint8_t sr09 = SimReadRegister(0, SIM_REG_SEQUENCER, 0x09), sr11 = SimReadRegister(0, SIM_REG_SEQUENCER, 0x11);
    WriteSr(0x08, 0x05);
    EXPECT_EQ(0x00, ReadSr(0x11)) << "locked registers read 0";
    WriteSr(0x09, (uint8_t)~sr09);
    EXPECT_EQ(sr09, SimReadRegister(0, SIM_REG_SEQUENCER, 0x09)) << "locked registers ignore writes";
    WriteSr(0x02, 0x0E);
    EXPECT_EQ(0x0E, ReadSr(0x02)) << "the standard sequencer is never locked";
    WriteSr(0x08, 0xA6);  // the key is the low nibble
    EXPECT_EQ(sr11, ReadSr(0x11));
    WriteSr(0x09, 0x42);
    EXPECT_EQ(0x42, ReadSr(0x09));
    EXPECT_EQ(0xA6, ReadSr(0x08));
}

TEST(S3, SynthesizersFromHandComputedFields)
{
    const struct {
        uint16_t device;
        uint8_t sr12, sr13, sr29;
        double hz;
    } cases[] = {
        {0x8901, 0x2C, 0x5F, 0x00, 49602266.43},                       // M = 95, N = 12, R = 1
        {0x8901, 0xAC, 0x5F, 0x00, 14318180.0 * 97 / (14 * 32)},        // SR12 bit 7 is R's on a Trio64V2
        {0x5631, 0xAC, 0x5F, 0x00, 49602266.43},                       // ... but not on a ViRGE
        {0x8811, 0xAC, 0xDF, 0x00, 49602266.43},                       // ... nor a Trio64 (nor SR13 bit 7)
        {0x8A20, 0x46, 0x2C, 0x18, 30028405.28},                       // Savage3D M = 300, N = 70, R = 1
        {0x8A21, 0x86, 0x2C, 0x04, 14318180.0 * 46 / (8 * 64)},        // R = 2 + 4
    };
    for (const auto& c : cases) {
        BootS3(c.device);
        WriteSr(0x08, 0x06);
        WriteSr(0x12, c.sr12);
        WriteSr(0x13, c.sr13);
        WriteSr(0x29, c.sr29);
        EXPECT_NEAR(c.hz, SimPixelClockHz(0), 1.0) << std::hex << c.device << " SR12=" << (int)c.sr12;
    }
    // MCLK resets to about 60 MHz; SR10 bit 7 is not part of R.
    EXPECT_NEAR(59829537.86, SimMemoryClockHz(0), 1.0);
    WriteSr(0x10, 0x80 | 0x41);  // N = 1, R = 2
    WriteSr(0x11, 0x80 | 0x3A);  // M = 58
    EXPECT_NEAR(14318180.0 * 60 / (3 * 4), SimMemoryClockHz(0), 1.0);
}

TEST(S3, TotalsFromTheCrtRegisters)
{
    const struct {
        uint16_t device;
        uint8_t cr43;
        int htotal;
    } cases[] = {
        {0x8901, 0x00, 0x10 + 256 + 5},              // CR5D bit 0; CR5F is not part of it
        {0x8A20, 0x00, 0x10 + 256 + 512 + 5},        // CR5F bits 1..0 on a Savage3D
        {0x8A20, 0x80, 2 * (0x10 + 256 + 512) + 5},  // counts double, before the + 5
    };
    for (const auto& c : cases) {
        BootS3(c.device);
        WriteCr(0x11, 0x00);
        WriteCr(0x00, 0x10);
        WriteCr(0x5D, 0x01);
        WriteCr(0x5F, 0x01);
        WriteCr(0x43, c.cr43);
        EXPECT_EQ(c.htotal, SimHTotal(0)) << std::hex << c.device << " CR43=" << (int)c.cr43;
    }
    WriteCr(0x06, 0x20);
    WriteCr(0x07, 0x21);  // bits 8 and 9
    WriteCr(0x5E, 0x01);  // bit 10
    EXPECT_EQ(0x20 + 256 + 512 + 1024 + 2, SimVTotal(0));
}

// The VGA's own modes run at their known rates: mode 12h (25.175 MHz, 100
// characters of 8 dots, 525 lines) at 59.94 Hz, text mode 03h (28.322 MHz,
// 100 of 9 dots, 449 lines) at 70.09 Hz. The S3 bits change mode 12h.
TEST(S3, RefreshFromTheRegisters)
{
    struct Reg {
        SimRegisterFile file;
        uint8_t index, value;
    };
    const Reg mode_12h[] = {{SIM_REG_MISC, 0, 0xE3},    {SIM_REG_SEQUENCER, 0x01, 0x01}, {SIM_REG_CRTC, 0x00, 0x5F},
                            {SIM_REG_CRTC, 0x06, 0x0B}, {SIM_REG_CRTC, 0x07, 0x3E},      {SIM_REG_CRTC, 0x5D, 0x00},
                            {SIM_REG_CRTC, 0x5E, 0x00}, {SIM_REG_CRTC, 0x42, 0x00},      {SIM_REG_CRTC, 0x43, 0x00},
                            {SIM_REG_CRTC, 0x67, 0x00}, {SIM_REG_SEQUENCER, 0x18, 0x00}};
    const double hz_12h = 25175000.0 / (800 * 525);
    const Reg cr67_16 = {SIM_REG_CRTC, 0x67, 0x50}, sr18 = {SIM_REG_SEQUENCER, 0x18, 0x80};
    const struct {
        const char* what;
        std::vector<Reg> changes;
        double hz;
    } cases[] = {
        {"mode 12h", {}, hz_12h},
        {"text mode 03h",
         {{SIM_REG_MISC, 0, 0x67}, {SIM_REG_SEQUENCER, 0x01, 0x00}, {SIM_REG_CRTC, 0x06, 0xBF}, {SIM_REG_CRTC, 0x07, 0x1F}},
         28322000.0 / (900 * 449)},
        {"interlaced: a frame of two fields", {{SIM_REG_CRTC, 0x42, 0x20}}, hz_12h / 2},
        {"SR18 is not consulted at 8 bits", {sr18}, hz_12h},
        {"16 bits: 4 pixels a character", {cr67_16}, 2 * hz_12h},
        {"15 bits: 4 pixels a character", {{SIM_REG_CRTC, 0x67, 0x30}}, 2 * hz_12h},
        {"16 bits, SR18: two clocks a pixel", {cr67_16, sr18}, hz_12h},
        {"CR43: 2 x 0x5F + 5 characters", {cr67_16, sr18, {SIM_REG_CRTC, 0x43, 0x80}}, hz_12h * 100 / 195},
        {"the synthesizer, M = 95, N = 12, R = 1",
         {{SIM_REG_MISC, 0, 0xEF}, {SIM_REG_SEQUENCER, 0x12, 0x2C}, {SIM_REG_SEQUENCER, 0x13, 0x5F}},
         14318180.0 * 97 / (14 * 2) / (800 * 525)},
    };
    BootS3(0x8901);
    for (const auto& c : cases) {
        for (const Reg& r : mode_12h) SimWriteRegister(0, r.file, r.index, r.value);
        for (const Reg& r : c.changes) SimWriteRegister(0, r.file, r.index, r.value);
        EXPECT_NEAR(c.hz, SimRefreshHz(0), 0.001) << c.what;
    }
}

TEST(S3, MemoryStrapsAgpBitAndDpms)
{
    // CR36 bits 7..5 as the straps set them (the public codes).
    const struct {
        uint16_t device;
        int mb, code;
    } straps[] = {{0x8901, 4, 0}, {0x8901, 2, 4}, {0x8901, 1, 6}, {0x8901, 8, 3}, {0x8A01, 4, 0},
                  {0x883D, 2, 0}, {0x883D, 4, 1}, {0x883D, 6, 2}, {0x883D, 8, 3}, {0x8A20, 8, 0},
                  {0x8A20, 4, 2}, {0x8A20, 2, 6}};
    for (const auto& s : straps) {
        BootS3(s.device, 0, s.mb);
        EXPECT_EQ(s.code, ReadCr(0x36) >> 5) << std::hex << s.device << std::dec << " " << s.mb << " MB";
    }
    EXPECT_FALSE(ReadCr(0x37) & 0x40) << "a Savage3D on bus 0";
    BootS3(0x8A20, 1);
    EXPECT_TRUE(ReadCr(0x37) & 0x40) << "a Savage3D on the AGP bus";

    const struct {
        uint8_t bits;
        SimDpms state;
    } dpms[] = {{0x10, SIM_DPMS_STANDBY}, {0x40, SIM_DPMS_SUSPEND}, {0xA0, SIM_DPMS_OFF}, {0x00, SIM_DPMS_ON}};
    WriteSr(0x08, 0x06);
    for (const auto& d : dpms) {
        WriteSr(0x0D, (uint8_t)(0x05 | d.bits));
        EXPECT_EQ(d.state, SimDpmsState(0)) << std::hex << (int)d.bits;
    }
}
