// The PCI host bridge: configuration mechanism #1, the AGP bridge and bus 1,
// empty slots, and base address registers as software sizes and moves them.
#include "sim_test.h"

class PciTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901, 0, 10);
        AddCard(&config, 0x5333, 0x8A20, 1, 0);  // Savage3D behind the AGP bridge
        SimBoot(&config);
    }
};

TEST_F(PciTest, IdsOnBothBusesAndNothingInEmptySlots)
{
    EXPECT_EQ(0x89015333u, PciRead(0, 10, 0, 0x00));
    EXPECT_EQ(0x8A205333u, PciRead(1, 0, 0, 0x00));
    EXPECT_EQ(0x03000000u, PciRead(0, 10, 0, 0x08) & 0xFFFFFF00u);  // VGA-compatible display controller
    EXPECT_EQ(0xFFFFFFFFu, PciRead(0, 11, 0, 0x00));
    EXPECT_EQ(0xFFFFFFFFu, PciRead(1, 10, 0, 0x00)) << "the bus-0 card must not show on bus 1";
    EXPECT_EQ(0xFFFFFFFFu, PciRead(2, 0, 0, 0x00));
    EXPECT_EQ(0xFFFFFFFFu, PciRead(0, 10, 1, 0x00)) << "a single-function card has no function 1";
}

TEST_F(PciTest, AgpBridgeLeadsToBusOne)
{
    uint32_t class_code = PciRead(0, 1, 0, 0x08) >> 8;
    EXPECT_EQ(0x060400u, class_code);
    uint32_t buses = PciRead(0, 1, 0, 0x18);
    EXPECT_EQ(0u, buses & 0xFF);           // primary
    EXPECT_EQ(1u, (buses >> 8) & 0xFF);    // secondary
    EXPECT_EQ(1u, (buses >> 16) & 0xFF);   // subordinate
    // The card behind it lies inside the bridge's memory window.
    uint32_t window = PciRead(0, 1, 0, 0x20);
    uint32_t base = (window & 0xFFF0) << 16, limit = (window & 0xFFF00000u) | 0xFFFFF;
    uint32_t bar0 = PciRead(1, 0, 0, 0x10) & 0xFFFFFFF0u;
    EXPECT_GE(bar0, base);
    EXPECT_LE(bar0 + 128u * 1024 * 1024 - 1, limit);
}

TEST_F(PciTest, ByteReadsOfTheDataPortAndTheEnableBit)
{
    MachineOutDword(0xCF8, 0x80000000u | 10 << 11);
    EXPECT_EQ(0x33, MachineInByte(0xCFC));
    EXPECT_EQ(0x53, MachineInByte(0xCFD));
    EXPECT_EQ(0x01, MachineInByte(0xCFE));
    EXPECT_EQ(0x89, MachineInByte(0xCFF));
    EXPECT_EQ(0x80005000u, MachineInDword(0xCF8)) << "the address register reads back";
    MachineOutDword(0xCF8, 10 << 11);  // enable bit clear: no configuration cycle
    EXPECT_EQ(0xFFFFFFFFu, MachineInDword(0xCFC));
}

TEST_F(PciTest, BaseAddressRegistersSizeLikeTheChips)
{
    struct {
        int bus, device;
        uint32_t mask;
    } cases[] = {{0, 10, 0xFC000000u}, {1, 0, 0xF8000000u}};
    for (auto& c : cases) {
        uint32_t saved = PciRead(c.bus, c.device, 0, 0x10);
        PciWrite(c.bus, c.device, 0, 0x10, 0xFFFFFFFFu);
        EXPECT_EQ(c.mask, PciRead(c.bus, c.device, 0, 0x10) & 0xFFFFFFF0u) << "bus " << c.bus;
        PciWrite(c.bus, c.device, 0, 0x10, saved);
        EXPECT_EQ(saved, PciRead(c.bus, c.device, 0, 0x10));
        PciWrite(c.bus, c.device, 0, 0x14, 0xFFFFFFFFu);
        EXPECT_EQ(0u, PciRead(c.bus, c.device, 0, 0x14)) << "an unimplemented BAR stays 0";
    }
    PciWrite(0, 10, 0, 0x00, 0x12345678);
    EXPECT_EQ(0x89015333u, PciRead(0, 10, 0, 0x00)) << "ids are read-only";
}

TEST_F(PciTest, RegisterWindowFollowsTheBaseAddressAndMemoryDecode)
{
    uint32_t base = SimCardBarAddress(0, 0);
    uint32_t misc = base + 0x01000000 + 0x8000 + 0x3CC;
    uint8_t expected = SimReadRegister(0, SIM_REG_MISC, 0);
    EXPECT_EQ(expected, MachineReadByte(misc));

    uint32_t moved = base + 0x04000000;  // the next 64 MB
    PciWrite(0, 10, 0, 0x10, moved);
    EXPECT_EQ(0xFF, MachineReadByte(misc)) << "the old window must be gone";
    EXPECT_EQ(expected, MachineReadByte(moved + 0x01008000 + 0x3CC));

    uint32_t command = PciRead(0, 10, 0, 0x04);
    PciWrite(0, 10, 0, 0x04, command & ~2u);  // memory decode off
    EXPECT_EQ(0xFF, MachineReadByte(moved + 0x01008000 + 0x3CC));
    PciWrite(0, 10, 0, 0x04, command);
    EXPECT_EQ(expected, MachineReadByte(moved + 0x01008000 + 0x3CC));
}
