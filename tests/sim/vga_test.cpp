// The VGA core: CR11 write protection, colour/mono decoding, and which card
// answers which access path.
#include "sim_test.h"

TEST(Vga, Cr11ProtectsCr00ToCr07ButTheLineCompareBit)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    SimBoot(&config);
    WriteCr(0x11, ReadCr(0x11) | 0x80);
    uint8_t before[9];
    for (int i = 0; i < 9; i++) before[i] = ReadCr((uint8_t)i);
    for (int i = 0; i < 9; i++) WriteCr((uint8_t)i, (uint8_t)~before[i]);
    for (int i = 0; i < 7; i++) EXPECT_EQ(before[i], ReadCr((uint8_t)i)) << "CR0" << i;
    EXPECT_EQ(before[7] ^ 0x10, ReadCr(0x07)) << "only CR07 bit 4 passes";
    EXPECT_EQ((uint8_t)~before[8], ReadCr(0x08)) << "CR08 is not protected";
    WriteCr(0x11, ReadCr(0x11) & 0x7F);
    WriteCr(0x04, 0x5A);
    EXPECT_EQ(0x5A, ReadCr(0x04));

    // MISC bit 0 moves the CRT controller between 0x3Dx and 0x3Bx.
    uint8_t misc = MachineInByte(0x3CC);
    WriteCr(0x13, 0x55);
    MachineOutByte(0x3C2, misc & ~1);
    EXPECT_EQ(0x55, ReadIndexed(0x3B4, 0x13));
    EXPECT_EQ(0xFF, MachineInByte(0x3D5)) << "the colour ports no longer answer";
    MachineOutByte(0x3C2, misc);
    EXPECT_EQ(0x55, ReadCr(0x13));
}

TEST(Vga, EachCardAnswersThroughItsOwnWindowOnlyThePrimaryOnPorts)
{
    SimMachineConfig config = Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 0, 10), Card(0x8086, 0x7800, 0, 11),
                                                       Card(0x1023, 0x939A, 0, 12), Card(0x10DE, 0x0020, 1, 0)});
    SimBoot(&config);
    uint32_t s3 = SimCardBarAddress(0, 0) + 0x01008000, nv = SimCardBarAddress(3, 0);
    const struct {
        uint32_t crtc, sequencer;  // index addresses
    } paths[4] = {
        {s3 + 0x3D4, s3 + 0x3C4},
        {SimCardBarAddress(1, 1) + 0x3D4, SimCardBarAddress(1, 1) + 0x3C4},  // i740: BAR1 + port
        {SimCardBarAddress(2, 1) + 0x3D4, SimCardBarAddress(2, 1) + 0x3C4},  // Trident: BAR1 + port
        {nv + 0x601000 + 0x3D4, nv + 0xC0000 + 0x3C4},                       // Riva TNT: PRMCIO, PRMVIO
    };
    for (int card = 0; card < 4; card++) {
        MachineWriteByte(paths[card].crtc, 0x13);
        MachineWriteByte(paths[card].crtc + 1, (uint8_t)(0x20 + card));
        MachineWriteWord(paths[card].sequencer, (uint16_t)((0x40 + card) << 8 | 0x02));  // index and data at once
    }
    for (int card = 0; card < 4; card++) {
        EXPECT_EQ(0x20 + card, SimReadRegister(card, SIM_REG_CRTC, 0x13)) << "card " << card;
        EXPECT_EQ(0x40 + card, SimReadRegister(card, SIM_REG_SEQUENCER, 0x02)) << "card " << card;
        EXPECT_EQ(0x20 + card, MachineReadByte(paths[card].crtc + 1)) << "card " << card;
    }
    EXPECT_EQ(0xFF, MachineReadByte(nv + 0x601000 + 0x3C5)) << "the sequencer is not in PRMCIO";
    EXPECT_EQ(0x20, ReadCr(0x13)) << "legacy ports reach the primary card";
    WriteCr(0x13, 0x77);
    for (int card = 1; card < 4; card++) EXPECT_EQ(0x20 + card, SimReadRegister(card, SIM_REG_CRTC, 0x13));
    EXPECT_EQ(0xFF, MachineReadByte(0xA0000000u)) << "nothing decodes an unassigned address";
    EXPECT_EQ(0xFF, MachineInByte(0x3E0)) << "nor a port outside the VGA range";
}
