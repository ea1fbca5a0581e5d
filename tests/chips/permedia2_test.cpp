// The Permedia 2 driver: capability bits from the PCI status word, memory
// from the display driver's values, and what it leaves to others.
#include <gtest/gtest.h>

#include "chips/chips.h"
#include "hardware/driver_key.h"
#include "support/machine.h"

namespace {

TEST(Permedia2, CapabilitiesMemoryAndWhatItLeaves)
{
    const struct { int windows; uint8_t status, byte2; uint32_t caps, size; } cases[] = {
        {SIM_WINDOWS_98, 0x20, 0x80, 0x8005, 8u << 16}, {SIM_WINDOWS_95, 0xDF, 0xC0, 0x0005, 12u << 16},
        {SIM_WINDOWS_NT4, 0x20, 0x40, 0x0005, 4u << 16}, {SIM_WINDOWS_98, 0x00, 0x20, 0x0005, 0},
    };
    for (const auto& c : cases) {
        BootMachine(Machine(c.windows, {Card(0x104c, 0x3d07)}));
        ASSERT_EQ(1, DetectAdapters());
        SimWriteRegister(0, SIM_REG_PCI, 0x06, c.status);
        EXPECT_EQ(c.caps, chip_init()) << c.windows << " " << std::hex << +c.status;
        uint8_t value[4] = {0, 0, c.byte2, 0};
        if (c.windows == SIM_WINDOWS_NT4) DriverKeyValue("", "HardwareInformation.MemorySize", value, 4, REG_BINARY, 0);
        else DriverKeyValue("\\INFO", "VideoMemory", value, 4, REG_DWORD, 0);
        EXPECT_EQ(c.size, chip_get_mem_size()) << c.windows << " " << std::hex << +c.byte2;
        EXPECT_TRUE(chip_hide_page(2) && !chip_hide_page(0) && !chip_hide_page(1));
        EXPECT_EQ(0, any_chip_has_dpms());
        EXPECT_EQ(1u, chip_get_agp_rate());
    }
}

}  // namespace
