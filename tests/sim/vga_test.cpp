// The VGA core: CR11 write protection, the attribute flip-flop, input
// status, colour/mono decoding, and which card answers which access path.
#include "sim_test.h"

class VgaTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
        SimBoot(&config);
    }
};

TEST_F(VgaTest, Cr11ProtectsCr00ToCr07ButTheLineCompareBit)
{
    WriteCr(0x11, ReadCr(0x11) | 0x80);
    uint8_t before[8];
    for (int i = 0; i < 8; i++) before[i] = ReadCr((uint8_t)i);
    for (int i = 0; i < 8; i++) WriteCr((uint8_t)i, (uint8_t)~before[i]);
    for (int i = 0; i < 7; i++) EXPECT_EQ(before[i], ReadCr((uint8_t)i)) << "CR0" << i;
    EXPECT_EQ(before[7] ^ 0x10, ReadCr(0x07)) << "only CR07 bit 4 passes";

    WriteCr(0x11, ReadCr(0x11) & 0x7F);
    WriteCr(0x04, 0x5A);
    EXPECT_EQ(0x5A, ReadCr(0x04));
    WriteCr(0x10, 0x33);  // outside the protected range in any case
    EXPECT_EQ(0x33, ReadCr(0x10));
}

TEST_F(VgaTest, AttributeFlipFlopResetsOnStatusRead)
{
    MachineInByte(0x3DA);
    MachineOutByte(0x3C0, 0x10);
    MachineOutByte(0x3C0, 0x41);
    EXPECT_EQ(0x41, SimReadRegister(0, SIM_REG_ATTRIBUTE, 0x10));

    MachineOutByte(0x3C0, 0x12);  // index, then a status read in the middle
    MachineInByte(0x3DA);
    MachineOutByte(0x3C0, 0x13);  // an index again, not data for 0x12
    MachineOutByte(0x3C0, 0x07);
    EXPECT_EQ(0x07, SimReadRegister(0, SIM_REG_ATTRIBUTE, 0x13));
    EXPECT_NE(0x13, SimReadRegister(0, SIM_REG_ATTRIBUTE, 0x12));
    MachineOutByte(0x3C0, 0x13);
    EXPECT_EQ(0x07, MachineInByte(0x3C1));
}

TEST_F(VgaTest, VerticalRetraceBitToggles)
{
    uint8_t a = MachineInByte(0x3DA), b = MachineInByte(0x3DA), c = MachineInByte(0x3DA);
    EXPECT_NE(a & 0x08, b & 0x08);
    EXPECT_EQ(a & 0x08, c & 0x08);
}

TEST_F(VgaTest, MiscOutputSelectsMonoOrColourCrtPorts)
{
    uint8_t misc = MachineInByte(0x3CC);
    WriteCr(0x13, 0x55);
    MachineOutByte(0x3C2, misc & ~1);
    EXPECT_EQ(0x55, ReadIndexed(0x3B4, 0x13));
    EXPECT_EQ(0xFF, MachineInByte(0x3D5)) << "the colour ports no longer answer";
    MachineOutByte(0x3C2, misc);
    EXPECT_EQ(0x55, ReadCr(0x13));
}

TEST(VgaWindows, EachCardAnswersThroughItsOwnWindowOnlyThePrimaryOnPorts)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901, 0, 10);
    AddCard(&config, 0x8086, 0x7800, 0, 11);  // i740: ports at BAR1 + p
    AddCard(&config, 0x1023, 0x939A, 0, 12);  // Trident: BAR1 + p
    AddCard(&config, 0x10DE, 0x0020, 1, 0);   // Riva TNT: split PRMVIO / PRMCIO
    SimBoot(&config);
    struct {
        int card;
        uint32_t index, data;  // CRT controller index and data addresses
        uint32_t seq;          // sequencer index address
    } paths[4];
    uint32_t s3 = SimCardBarAddress(0, 0) + 0x01008000;
    paths[0] = {0, s3 + 0x3D4, s3 + 0x3D5, s3 + 0x3C4};
    uint32_t i740 = SimCardBarAddress(1, 1);
    paths[1] = {1, i740 + 0x3D4, i740 + 0x3D5, i740 + 0x3C4};
    uint32_t trident = SimCardBarAddress(2, 1);
    paths[2] = {2, trident + 0x3D4, trident + 0x3D5, trident + 0x3C4};
    uint32_t nv = SimCardBarAddress(3, 0);
    paths[3] = {3, nv + 0x601000 + 0x3D4, nv + 0x601000 + 0x3D5, nv + 0xC0000 + 0x3C4};

    for (auto& p : paths) {
        MachineWriteByte(p.index, 0x13);
        MachineWriteByte(p.data, (uint8_t)(0x20 + p.card));
        MachineWriteWord(p.seq, (uint16_t)((0x40 + p.card) << 8 | 0x02));  // index and data in one access
    }
    for (auto& p : paths) {
        EXPECT_EQ(0x20 + p.card, SimReadRegister(p.card, SIM_REG_CRTC, 0x13)) << "card " << p.card;
        EXPECT_EQ(0x40 + p.card, SimReadRegister(p.card, SIM_REG_SEQUENCER, 0x02)) << "card " << p.card;
    }
    EXPECT_EQ(0xFF, MachineReadByte(nv + 0x601000 + 0x3C5)) << "the sequencer is not in PRMCIO";
    EXPECT_EQ(0x20, ReadCr(0x13)) << "legacy ports reach the primary card";
    WriteCr(0x13, 0x77);
    for (int card = 1; card < 4; card++) EXPECT_EQ(0x20 + card, SimReadRegister(card, SIM_REG_CRTC, 0x13));
    EXPECT_EQ(0xFF, MachineReadByte(0xA0000000u)) << "nothing decodes an unassigned address";
}
