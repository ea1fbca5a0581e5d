// The S3 model: the SR08 key, the synthesizers' output from hand-computed
// register values, the CRT totals, the memory straps and DPMS.
#include <math.h>

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

TEST(S3Timing, TotalsAndRefreshFromTheCrtRegisters)
{
    BootS3(0x8A20);
    WriteCr(0x11, 0x00);
    WriteCr(0x00, 0x10);
    WriteCr(0x5D, 0x01);   // + 256
    WriteCr(0x5F, 0x01);   // + 512 on a Savage3D
    WriteCr(0x43, 0x00);
    EXPECT_EQ(0x10 + 256 + 512 + 5, SimHTotal(0));
    WriteCr(0x43, 0x80);   // counts double, before the + 5
    EXPECT_EQ(2 * (0x10 + 256 + 512) + 5, SimHTotal(0));
    WriteCr(0x06, 0x20);
    WriteCr(0x07, 0x21);   // bits 8 and 9
    WriteCr(0x5E, 0x01);   // bit 10
    EXPECT_EQ(0x20 + 256 + 512 + 1024 + 2, SimVTotal(0));

    BootS3(0x8901);  // 1024x768, 16 bits, 75 Hz
    double progressive = SimRefreshHz(0);
    EXPECT_NEAR(75.03, progressive, 0.3);
    WriteCr(0x42, ReadCr(0x42) | 0x20);
    EXPECT_NEAR(progressive / 2, SimRefreshHz(0), 0.01) << "interlaced: two fields per frame";
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
