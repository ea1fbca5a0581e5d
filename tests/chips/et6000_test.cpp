// The ET6000 driver: its withdrawal with several monitors, its memory answers
// on each Windows, and its synthesizer's M field.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "chips/chips.h"
#include "chips/et6000.h"
#include "chips/synth.h"
#include "hardware/driver_key.h"
#include "support/machine.h"

namespace {

void BootEt6000(int windows, uint32_t mb = 2, uint32_t extra_kb = 0)
{
    SimMachineConfig config = Machine(windows, {Card(0x100c, 0x3208)});
    config.cards[0].memory_mb = mb;
    config.cards[0].memory_extra_kb = extra_kb;
    BootMachine(config);
    ASSERT_EQ(1, DetectAdapters());
}

// Windows 95 asks the video BIOS; 98 and NT read what the display driver wrote.
TEST(Et6000, MemoryOnEachWindows)
{
    const struct { int windows; uint8_t byte2; uint32_t extra_kb, size; } cases[] = {
        {SIM_WINDOWS_95, 0, 256, 0x00020100},   {SIM_WINDOWS_95, 0, 0, 0x00020000},
        {SIM_WINDOWS_98, 0x30, 0, 3u << 16},    {SIM_WINDOWS_98, 0x80, 0, 0},
        {SIM_WINDOWS_NT4, 0x40, 0, 4u << 16},   {SIM_WINDOWS_NT4, 0x11, 0, 0},
    };
    for (const auto& c : cases) {
        ASSERT_NO_FATAL_FAILURE(BootEt6000(c.windows, 2, c.extra_kb));
        uint8_t value[4] = {0, 0, c.byte2, 0};
        if (c.windows == SIM_WINDOWS_98) DriverKeyValue("\\INFO", "VideoMemory", value, 4, REG_DWORD, 0);
        if (c.windows == SIM_WINDOWS_NT4)
            DriverKeyValue("", "HardwareInformation.MemorySize", value, 4, REG_BINARY, 0);
        EXPECT_EQ(c.size, chip_get_mem_size()) << c.windows << " " << std::hex << +c.byte2;
    }
}

// Without the BIOS, the memory configuration registers give the figure in the BIOS's format.
TEST(Et6000, MemoryFromConfigurationAndBios)
{
    EXPECT_EQ(0x00020100u, Et6000MemoryFromBios(0x0024));
    const struct { uint8_t status0, config45, banks47; uint32_t size; } cases[] = {
        {0x03, 0x00, 0x07, 2u << 16},   {0xFF, 0x04, 0x04, 0x00020200}, {0x03, 0x04, 0x07, 4u << 16},
        {0x00, 0x01, 0xFF, 2u << 16},   {0x00, 0x03, 0x00, 4u << 16},   {0x01, 0x00, 0x07, 0},
        {0x03, 0x00, 0x00, 0x00000100},
    };
    for (const auto& c : cases)
        EXPECT_EQ(c.size, Et6000MemoryFromConfiguration(c.status0, c.config45, c.banks47))
            << std::hex << +c.status0 << " " << +c.config45 << " " << +c.banks47;
}

// With two monitors the driver withdraws before touching a register and hides the Monitor page.
TEST(Et6000, WithdrawsWithSeveralMonitors)
{
    ASSERT_NO_FATAL_FAILURE(BootEt6000(SIM_WINDOWS_98));
    for (int16_t monitors : {1, 2}) {
        monitor_count = monitors;
        SimResetCounters();
        EXPECT_EQ(monitors > 1 ? 9u : 0u, chip_init());
        EXPECT_EQ(monitors > 1, SimGetCounters()->port_reads == 0);
        EXPECT_EQ(monitors > 1 ? 1u : 0u, chip_hide_page(2));
        EXPECT_EQ(0u, chip_hide_page(1));
    }
}

// The M field holds 7 bits: no fit above 127 is ever handed to it.
TEST(Et6000, SearchKeepsMWithinItsField)
{
    for (double target = 20e6; target < 200e6; target += 0.5e6) {
        for (uint16_t n = 1; n <= 31; n += 6) {
            SynthSetting s = {.m = 0, .n = n, .r = 0};
            if (!SearchSynthesizer(&et6000_pixel_clock, target, &s)) continue;
            ASSERT_TRUE(s.m >= 1 && s.m <= 127) << target << " from N " << n << ": M " << s.m;
        }
    }
}

}  // namespace
