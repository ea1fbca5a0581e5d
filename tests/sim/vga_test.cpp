// The VGA core: CR11 write protection, colour/mono decoding, and which card
// answers which access path.
#include "sim_test.h"

TEST(Vga, EachCardAnswersThroughItsOwnWindowOnlyThePrimaryOnPorts)
{
    SimMachineConfig config = Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 0, 10), Card(0x8086, 0x7800, 0, 11),
                                                       Card(0x1023, 0x939A, 0, 12), Card(0x10DE, 0x0020, 1, 0)});
    SimBoot(&config);
    uint32_t s3 = SimCardBarAddress(0, 0) + 0x01008000, nv = SimCardBarAddress(3, 0);
    // S3 at BAR0 + 0x01008000, i740 and Trident at BAR1, Riva split into PRMCIO and PRMVIO.
    const uint32_t crtc[4] = {s3 + 0x3D4, SimCardBarAddress(1, 1) + 0x3D4, SimCardBarAddress(2, 1) + 0x3D4,
                              nv + 0x601000 + 0x3D4};
    const uint32_t sequencer[4] = {s3 + 0x3C4, SimCardBarAddress(1, 1) + 0x3C4, SimCardBarAddress(2, 1) + 0x3C4,
                                   nv + 0xC0000 + 0x3C4};
    for (int card = 0; card < 4; card++) {
        MachineWriteByte(crtc[card], 0x13);
        MachineWriteByte(crtc[card] + 1, (uint8_t)(0x20 + card));
        MachineWriteWord(sequencer[card], (uint16_t)((0x40 + card) << 8 | 0x02));  // index and data at once
    }
    for (int card = 0; card < 4; card++) {
        EXPECT_EQ(0x20 + card, SimReadRegister(card, SIM_REG_CRTC, 0x13)) << card;
        EXPECT_EQ(0x40 + card, SimReadRegister(card, SIM_REG_SEQUENCER, 0x02)) << card;
        EXPECT_EQ(0x20 + card, MachineReadByte(crtc[card] + 1)) << card;
    }
    EXPECT_EQ(0xFF, MachineReadByte(nv + 0x601000 + 0x3C5)) << "the sequencer is not in PRMCIO";
    WriteCr(0x13, 0x77);
    for (int c = 0; c < 4; c++) EXPECT_EQ(c ? 0x20 + c : 0x77, SimReadRegister(c, SIM_REG_CRTC, 0x13)) << c;
    EXPECT_EQ(0xFF, MachineReadByte(0xA0000000u)) << "nothing decodes an unassigned address";

    // CR11 bit 7 write-protects CR00-CR07 but the line compare bit 8 in CR07.
    WriteCr(0x11, ReadCr(0x11) | 0x80);
    uint8_t before[8];
    for (int i = 0; i < 8; i++) before[i] = ReadCr((uint8_t)i);
    for (int i = 0; i < 8; i++) WriteCr((uint8_t)i, (uint8_t)~before[i]);
    for (int i = 0; i < 7; i++) EXPECT_EQ(before[i], ReadCr((uint8_t)i)) << "CR0" << i;
    EXPECT_EQ(before[7] ^ 0x10, ReadCr(0x07));
    WriteCr(0x11, ReadCr(0x11) & 0x7F);
    WriteCr(0x04, 0x5A);
    EXPECT_EQ(0x5A, ReadCr(0x04));
    // MISC bit 0 moves the CRT controller from 0x3Dx to 0x3Bx.
    MachineOutByte(0x3C2, MachineInByte(0x3CC) & ~1);
    EXPECT_EQ(0x5A, ReadIndexed(0x3B4, 0x04));
    EXPECT_EQ(0xFF, MachineInByte(0x3D5)) << "the colour ports no longer answer";
}
