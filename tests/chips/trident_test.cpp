// The Trident 939a driver against the simulated card's registers.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "chips/chips.h"
#include "support/machine.h"

namespace {

void BootTrident(uint32_t memory_mb = 4)
{
    SimCardConfig card = Card(0x1023, 0x939a);
    card.memory_mb = memory_mb;
    BootMachine(Machine(SIM_WINDOWS_98, {card}));
    ASSERT_EQ(1, DetectAdapters());
}

uint8_t Seq(uint16_t index) { return SimReadRegister(0, SIM_REG_SEQUENCER, index); }
void SetSeq(uint16_t index, uint8_t value) { SimWriteRegister(0, SIM_REG_SEQUENCER, index, value); }
void SetCrtc(uint16_t index, uint8_t value) { SimWriteRegister(0, SIM_REG_CRTC, index, value); }

// SGRAM cards of each size as they reset, then other codes: only the listed
// ones tell a size or a type; other bits of the registers do not count.
TEST(Trident, MemorySizeAndTypeCodes)
{
    for (uint32_t mb : {1u, 2u, 8u, 4u}) {
        ASSERT_NO_FATAL_FAILURE(BootTrident(mb));
        EXPECT_EQ(mb << 16, chip_get_mem_size());
        EXPECT_EQ(4u, chip_get_mem_type());
    }
    const struct { uint8_t cr1f, cr2a; uint32_t size, type; } cases[] = {
        {0x27, 0x0C, 2u << 16, 4}, {0x05, 0x00, 0, 0},      {0x03, 0xF4, 1u << 16, 2},
        {0xF4, 0x08, 8u << 16, 3}, {0x0F, 0xF3, 4u << 16, 0},
    };
    for (const auto& c : cases) {
        SetCrtc(0x1F, c.cr1f);
        SetCrtc(0x2A, c.cr2a);
        EXPECT_EQ(c.size, chip_get_mem_size()) << std::hex << +c.cr1f;
        EXPECT_EQ(c.type, chip_get_mem_type()) << std::hex << +c.cr2a;
    }
    EXPECT_EQ((uint32_t)CHIP_CAP_NO_CLOCK_REFRESH, CurrentAdapter()->flags & 0xFF);
}

// The chip does not offer power saving, yet switches its syncs when all adapters are told.
TEST(Trident, PowerStatesWithoutOfferingThem)
{
    ASSERT_NO_FATAL_FAILURE(BootTrident());
    EXPECT_EQ(0, any_chip_has_dpms());
    SetSeq(0x0D, 0x05);
    SetSeq(0x08, 0x30);
    const struct { uint32_t state; uint8_t sr0d; SimDpms dpms; } cases[] = {
        {1, 0x25, SIM_DPMS_STANDBY}, {2, 0x85, SIM_DPMS_SUSPEND}, {4, 0xA5, SIM_DPMS_OFF}, {0, 0x05, SIM_DPMS_ON}};
    for (const auto& c : cases) {
        chip_set_dpms_all(c.state);
        EXPECT_EQ(c.sr0d, Seq(0x0D)) << c.state;
        EXPECT_EQ(c.dpms, SimDpmsState(0)) << c.state;
    }
    EXPECT_EQ(0x36, Seq(0x08));
}

// CR2F bit 1 picks the synthesizer pair the card runs on; the other pair is
// not touched, and SR01 is as it was after the write.
TEST(Trident, PixelClockOfThePairCr2fSelects)
{
    ASSERT_NO_FATAL_FAILURE(BootTrident());
    for (uint8_t cr2f : {0x02, 0xFD}) {
        const uint16_t used = cr2f & 2 ? 0x18 : 0x1A, other = cr2f & 2 ? 0x1A : 0x18;
        SetCrtc(0x2F, cr2f);
        SetSeq(0x01, 0x01);
        SetSeq(used, 0x5E);      // M = 94
        SetSeq(used + 1, 0x8C);  // N = 12, R = 2
        SetSeq(other, 0x11);
        SetSeq(other + 1, 0x22);
        chip_open_io();
        EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0);
        ASSERT_EQ(1u, chip_set_pixel_clock(40e6));
        EXPECT_NEAR(40e6, SimPixelClockHz(0), 0.3e6);
        EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0);
        chip_close_io();
        EXPECT_TRUE(Seq(other) == 0x11 && Seq(other + 1) == 0x22) << +cr2f;
        EXPECT_EQ(0x01, Seq(0x01));
    }
}

}  // namespace
