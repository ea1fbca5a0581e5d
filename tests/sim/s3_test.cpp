// The S3 model: the SR08 key, the synthesizers' output from hand-computed
// register values, the CRT totals and refresh, the memory straps and DPMS.
#include <math.h>

#include <vector>

#include "sim_test.h"

namespace {

void BootS3(uint16_t device, int bus = 0, int memory_mb = 4)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, device, bus, bus ? 0 : 10);
    config.cards[0].memory_mb = memory_mb;
    if (memory_mb < 2) config.start_bits = 8;
    SimBoot(&config);
}

}  // namespace

TEST(S3Lock, ExtendedSequencerAnswersOnlyWithTheKey)
{
    BootS3(0x8901);
    WriteSr(0x08, 0x00);
    uint8_t sr11 = SimReadRegister(0, SIM_REG_SEQUENCER, 0x11);
    EXPECT_EQ(0x00, ReadSr(0x11)) << "locked registers read 0";
    WriteSr(0x11, 0x42);
    EXPECT_EQ(sr11, SimReadRegister(0, SIM_REG_SEQUENCER, 0x11)) << "locked registers ignore writes";
    WriteSr(0x02, 0x0E);
    EXPECT_EQ(0x0E, ReadSr(0x02)) << "the standard sequencer is never locked";

    WriteSr(0x08, 0xA6);  // the key is the low nibble
    EXPECT_EQ(sr11, ReadSr(0x11));
    WriteSr(0x11, 0x42);
    EXPECT_EQ(0x42, ReadSr(0x11));
    WriteSr(0x08, 0x05);
    EXPECT_EQ(0x00, ReadSr(0x11));
}

TEST(S3Synthesizers, OutputFromHandComputedFields)
{
    struct {
        uint16_t device;
        uint8_t sr12, sr13, sr29;
        double hz;
    } cases[] = {
        // M = 95, N = 12, R = 1: 14318180 * 97 / (14 * 2)
        {0x8901, 0x2C, 0x5F, 0x00, 49602266.43},
        // Bit 7 of SR12 belongs to R on a Trio64V2 (R = 5) ...
        {0x8901, 0xAC, 0x5F, 0x00, 14318180.0 * 97 / (14 * 32)},
        // ... but not on a ViRGE or Trio64, where R has two bits.
        {0x5631, 0xAC, 0x5F, 0x00, 49602266.43},
        {0x8811, 0xAC, 0xDF, 0x00, 49602266.43},
        // Savage3D M = 300, N = 70, R = 1: SR29 bits 3 and 4, SR13 = 44, SR12 = 6 | 1 << 6.
        {0x8A20, 0x46, 0x2C, 0x18, 30028405.28},
        {0x8A21, 0x86, 0x2C, 0x04, 14318180.0 * 46 / (8 * 64)},  // R = 2 + 4
    };
    for (auto& c : cases) {
        BootS3(c.device);
        WriteSr(0x08, 0x06);
        WriteSr(0x12, c.sr12);
        WriteSr(0x13, c.sr13);
        WriteSr(0x29, c.sr29);
        EXPECT_NEAR(c.hz, SimPixelClockHz(0), 1.0) << std::hex << c.device << " SR12=" << (int)c.sr12;
    }
}

TEST(S3Synthesizers, MemoryClockResetsToSixtyMegahertz)
{
    BootS3(0x8901);
    WriteSr(0x08, 0x06);
    EXPECT_EQ(0x2C, ReadSr(0x10));
    EXPECT_EQ(0x73, ReadSr(0x11));
    EXPECT_NEAR(59829537.86, SimMemoryClockHz(0), 1.0);
    WriteSr(0x10, 0x80 | 0x41);  // bit 7 is not part of R: N = 1, R = 2
    WriteSr(0x11, 0x80 | 0x3A);  // M = 58
    EXPECT_NEAR(14318180.0 * 60 / (3 * 4), SimMemoryClockHz(0), 1.0);
}

TEST(S3Timing, TotalsFromTheCrtRegisters)
{
    struct {
        uint16_t device;
        uint8_t cr43;
        int htotal;
    } cases[] = {
        {0x8901, 0x00, 0x10 + 256 + 5},               // CR5D bit 0; CR5F is not part of it
        {0x8A20, 0x00, 0x10 + 256 + 512 + 5},         // CR5F bits 1..0 on a Savage3D
        {0x8A20, 0x80, 2 * (0x10 + 256 + 512) + 5},   // counts double, before the + 5
    };
    for (auto& c : cases) {
        BootS3(c.device);
        WriteCr(0x11, 0x00);
        WriteCr(0x00, 0x10);
        WriteCr(0x5D, 0x01);
        WriteCr(0x5F, 0x01);
        WriteCr(0x43, c.cr43);
        EXPECT_EQ(c.htotal, SimHTotal(0)) << std::hex << c.device << " CR43=" << (int)c.cr43;
    }
    WriteCr(0x06, 0x20);
    WriteCr(0x07, 0x21);   // bits 8 and 9
    WriteCr(0x5E, 0x01);   // bit 10
    EXPECT_EQ(0x20 + 256 + 512 + 1024 + 2, SimVTotal(0));
}

// The VGA's own modes as the BIOS sets them run at their known rates: mode
// 12h (25.175 MHz, 100 characters of 8 dots a line, 525 lines) at 59.94 Hz,
// text mode 03h (28.322 MHz, 100 of 9 dots, 449 lines) at 70.09 Hz. The S3
// bits change mode 12h as the chip's description has them.
TEST(S3Timing, RefreshFromTheRegisters)
{
    struct Reg {
        SimRegisterFile file;
        uint8_t index, value;
    };
    const Reg mode_12h[] = {{SIM_REG_MISC, 0, 0xE3},       {SIM_REG_SEQUENCER, 0x01, 0x01},
                            {SIM_REG_CRTC, 0x00, 0x5F},    {SIM_REG_CRTC, 0x06, 0x0B},
                            {SIM_REG_CRTC, 0x07, 0x3E},    {SIM_REG_CRTC, 0x5D, 0x00},
                            {SIM_REG_CRTC, 0x5E, 0x00},    {SIM_REG_CRTC, 0x42, 0x00},
                            {SIM_REG_CRTC, 0x43, 0x00},    {SIM_REG_CRTC, 0x67, 0x00},
                            {SIM_REG_SEQUENCER, 0x18, 0x00}};
    const double hz_12h = 25175000.0 / (800 * 525);
    struct {
        const char* what;
        std::vector<Reg> changes;
        double hz;
    } cases[] = {
        {"mode 12h", {}, hz_12h},
        {"text mode 03h",
         {{SIM_REG_MISC, 0, 0x67}, {SIM_REG_SEQUENCER, 0x01, 0x00}, {SIM_REG_CRTC, 0x06, 0xBF},
          {SIM_REG_CRTC, 0x07, 0x1F}},
         28322000.0 / (900 * 449)},
        {"interlaced: a frame of two fields", {{SIM_REG_CRTC, 0x42, 0x20}}, hz_12h / 2},
        {"SR18 is not consulted at 8 bits", {{SIM_REG_SEQUENCER, 0x18, 0x80}}, hz_12h},
        {"16 bits: 4 pixels a character", {{SIM_REG_CRTC, 0x67, 0x50}}, 2 * hz_12h},
        {"16 bits, SR18: two clocks a pixel", {{SIM_REG_CRTC, 0x67, 0x50}, {SIM_REG_SEQUENCER, 0x18, 0x80}}, hz_12h},
        {"CR43: 2 x 0x5F + 5 characters",
         {{SIM_REG_CRTC, 0x67, 0x50}, {SIM_REG_SEQUENCER, 0x18, 0x80}, {SIM_REG_CRTC, 0x43, 0x80}},
         hz_12h * 100 / 195},
        {"the synthesizer, M = 95, N = 12, R = 1",
         {{SIM_REG_MISC, 0, 0xEF}, {SIM_REG_SEQUENCER, 0x12, 0x2C}, {SIM_REG_SEQUENCER, 0x13, 0x5F}},
         14318180.0 * 97 / (14 * 2) / (800 * 525)},
    };
    BootS3(0x8901);
    for (auto& c : cases) {
        for (const Reg& r : mode_12h) SimWriteRegister(0, r.file, r.index, r.value);
        for (const Reg& r : c.changes) SimWriteRegister(0, r.file, r.index, r.value);
        EXPECT_NEAR(c.hz, SimRefreshHz(0), 0.001) << c.what;
    }
}

TEST(S3Straps, MemorySizeReadsBackThroughTheProgramsTable)
{
    // The program's CR36 table: Savage3D by (s & 6) >> 1, ViRGE/VX by s & 3,
    // the others by s (odd = unknown).
    auto decode = [](uint16_t device, int s) {
        if (device == 0x8A20) {
            static const int mb[4] = {8, 4, 4, 2};
            return mb[(s & 6) >> 1];
        }
        if (device == 0x883D) return 2 * ((s & 3) + 1);
        if (s & 1) return 0;
        return s == 4 ? 2 : s == 6 ? 1 : 4;
    };
    struct {
        uint16_t device;
        int mb;
    } cases[] = {{0x8901, 4}, {0x8901, 2}, {0x8901, 1}, {0x8A01, 4}, {0x883D, 2}, {0x883D, 4},
                 {0x883D, 6}, {0x883D, 8}, {0x8A20, 8}, {0x8A20, 4}, {0x8A20, 2}};
    for (auto& c : cases) {
        BootS3(c.device, 0, c.mb);
        EXPECT_EQ(c.mb, decode(c.device, ReadCr(0x36) >> 5)) << std::hex << c.device << std::dec << " " << c.mb << " MB";
    }
}

TEST(S3Straps, Savage3dTellsAgpInCr37)
{
    BootS3(0x8A20, 1);
    EXPECT_TRUE(ReadCr(0x37) & 0x40);
    BootS3(0x8A20, 0);
    EXPECT_FALSE(ReadCr(0x37) & 0x40);
}

TEST(S3Dpms, SyncControlBitsGiveTheFourStates)
{
    BootS3(0x8901);
    struct {
        uint8_t bits;
        SimDpms state;
    } cases[] = {{0x20, SIM_DPMS_STANDBY}, {0x80, SIM_DPMS_SUSPEND}, {0xA0, SIM_DPMS_OFF}, {0x00, SIM_DPMS_ON}};
    WriteSr(0x08, 0x06);
    WriteSr(0x0D, 0x05);
    for (auto& c : cases) {
        WriteSr(0x0D, (uint8_t)((ReadSr(0x0D) & 0x0F) | c.bits));
        EXPECT_EQ(c.state, SimDpmsState(0)) << std::hex << (int)c.bits;
    }
    EXPECT_EQ(0x05, ReadSr(0x0D));
}
