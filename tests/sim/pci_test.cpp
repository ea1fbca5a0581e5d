// The PCI host bridge: configuration mechanism #1, the chipset, the AGP bridge
// and bus 1, empty slots, base address registers as software sizes them.
#include "sim_test.h"

TEST(Pci, ConfigurationSpaceAndTheWindowsItPlaces)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98);
    config.cards[config.card_count++] = Card(0x5333, 0x8A20, 1, 0);  // Savage3D behind the AGP bridge
    SimBoot(&config);
    // The bridge's bus, the multi-function bit and empty slots: the program's PCI search reads them back.
    const struct { int bus, device, function, offset; uint32_t mask, value; const char* what; } reads[] = {
        {0, 0, 0, 0x00, ~0u, 0x71908086, "host bridge"},
        {0, 1, 0, 0x08, ~0xFFu, 0x06040000, "AGP bridge class"},
        {0, 10, 0, 0x08, ~0xFFu, 0x03000000, "VGA-compatible display controller"},
        {0, 10, 0, 0x10, 0xF0000000, 0xC0000000, "bus-0 windows from 0xC0000000"},
        {1, 0, 0, 0x10, 0xF0000000, 0xE0000000, "bus-1 windows from 0xE0000000"},
        {1, 0, 0, 0x34, 0xFF, 0x44, "AGP card: capability list"},
        {1, 0, 0, 0x44, 0xFF, 0x02, "AGP capability"},
        {0, 10, 1, 0x00, ~0u, ~0u, "a single-function card has no function 1"},
    };
    for (const auto& r : reads) EXPECT_EQ(r.value, PciRead(r.bus, r.device, r.function, r.offset) & r.mask) << r.what;
    MachineOutDword(0xCF8, 0x80000000u | 10 << 11);
    MachineOutByte(0xCF8, 0);
    EXPECT_EQ(0x80005000u, MachineInDword(0xCF8)) << "only 32-bit accesses reach the address register";
    EXPECT_EQ(0x89, MachineInByte(0xCFF)) << "the data port's bytes";
    MachineOutDword(0xCF8, 10 << 11);  // enable bit clear: no configuration cycle
    EXPECT_EQ(0xFFFFFFFFu, MachineInDword(0xCFC));

    PciWrite(1, 0, 0x10, 0xFFFFFFFFu);
    PciWrite(1, 0, 0x14, 0xFFFFFFFFu);
    PciWrite(1, 0, 0x00, 0x12345678);
    EXPECT_EQ(0xF8000000u, PciRead(1, 0, 0, 0x10) & 0xFFFFFFF0u) << "128 MB";
    EXPECT_EQ(0u, PciRead(1, 0, 0, 0x14)) << "an unimplemented BAR stays 0";
    EXPECT_EQ(0x8A205333u, PciRead(1, 0, 0, 0x00)) << "ids are read-only";
    // The register window decodes at the address the BAR holds now, with the memory bit.
    uint8_t misc = SimReadRegister(0, SIM_REG_MISC, 0);
    uint32_t bar = SimCardBarAddress(0, 0);
    PciWrite(0, 10, 0x10, bar + 0x04000000);
    EXPECT_EQ(0xFF, MachineReadByte(bar + 0x01008000 + 0x3CC)) << "the old window must be gone";
    EXPECT_EQ(misc, MachineReadByte(bar + 0x05008000 + 0x3CC));
    PciWrite(0, 10, 0x04, PciRead(0, 10, 0, 0x04) & ~2u);
    EXPECT_EQ(0xFF, MachineReadByte(bar + 0x05008000 + 0x3CC));
}
