// The ET6000 driver against the simulated card: its synthesizer in the I/O
// range CR21 names, its memory answers on each Windows, and its withdrawal
// with several monitors.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "chips/chips.h"
#include "chips/et6000.h"
#include "hardware/driver_key.h"
#include "hardware/machine.h"
#include "modes/mode_change.h"
#include "support/machine.h"

namespace {

// Where the machine's BIOS put the card's I/O range: CR21 reads 0xE8.
const uint16_t io_base = 0xE800, clock_index = io_base | 0x67, clock_data = io_base | 0x69;

void BootEt6000(int windows, uint32_t mb = 2, uint32_t extra_kb = 0, bool video_bios = true)
{
    SimMachineConfig config = Machine(windows, {Card(0x100c, 0x3208)});
    SimCardConfig* card = &config.cards[0];
    card->memory_mb = mb;
    card->memory_extra_kb = extra_kb;
    card->initial_registers[card->initial_register_count++] = {SIM_REG_PCI, 0x15, io_base >> 8};
    config.video_bios = video_bios;
    BootMachine(config);
    ASSERT_EQ(1, DetectAdapters());
}

// Windows 95 asks the video BIOS and, where a process cannot call it, reads the
// memory configuration, which counts 2.25 MB as 2.5; 98 and NT read what the
// display driver wrote.
TEST(Et6000, MemoryOnEachWindows)
{
    const struct { int windows; bool bios; uint8_t byte2; uint32_t mb, extra_kb, size; } cases[] = {
        {SIM_WINDOWS_95, true, 0, 2, 256, 0x00020100},  {SIM_WINDOWS_95, true, 0, 2, 0, 2u << 16},
        {SIM_WINDOWS_95, false, 0, 2, 256, 0x00020200}, {SIM_WINDOWS_95, false, 0, 1, 0, 1u << 16},
        {SIM_WINDOWS_95, false, 0, 4, 0, 4u << 16},     {SIM_WINDOWS_98, true, 0x30, 2, 0, 3u << 16},
        {SIM_WINDOWS_98, true, 0x80, 2, 0, 0},          {SIM_WINDOWS_NT4, true, 0x40, 2, 0, 4u << 16},
        {SIM_WINDOWS_NT4, true, 0x11, 2, 0, 0},
    };
    for (const auto& c : cases) {
        ASSERT_NO_FATAL_FAILURE(BootEt6000(c.windows, c.mb, c.extra_kb, c.bios));
        uint8_t value[4] = {0, 0, c.byte2, 0};
        if (c.windows == SIM_WINDOWS_98) DriverKeyValue("\\INFO", "VideoMemory", value, 4, REG_DWORD, 0);
        if (c.windows == SIM_WINDOWS_NT4)
            DriverKeyValue("", "HardwareInformation.MemorySize", value, 4, REG_BINARY, 0);
        EXPECT_EQ(c.size, chip_get_mem_size()) << c.windows << " " << c.mb << "+" << c.extra_kb << " " << c.bios;
    }
}

// The memory types and limits the simulated card never shows.
TEST(Et6000, MemoryFromConfiguration)
{
    const struct { uint8_t status0, config45, banks47; uint32_t size; } cases[] = {
        {0xFF, 0x04, 0x04, 0x00020200}, {0x00, 0x01, 0xFF, 2u << 16}, {0x00, 0x03, 0x00, 4u << 16},
        {0x01, 0x00, 0x07, 0},
    };
    for (const auto& c : cases)
        EXPECT_EQ(c.size, Et6000MemoryFromConfiguration(c.status0, c.config45, c.banks47))
            << std::hex << +c.status0 << " " << +c.config45 << " " << +c.banks47;
}

// The clock the display driver chose (2), then clock 5 (MISC bits 3..2 = 1,
// CR34 bit 1): the driver reads and sets the one the card runs, through the
// index port in the range CR21 names.
TEST(Et6000, SynthesizerThroughThePortsCr21Names)
{
    ASSERT_NO_FATAL_FAILURE(BootEt6000(SIM_WINDOWS_98));
    MachineOutByte(0x3D4, 0x21);
    EXPECT_EQ(io_base >> 8, MachineInByte(0x3D5));
    // Bit 8 of the horizontal total and bit 10 of the vertical, which no mode of the list has.
    SimWriteRegister(0, SIM_REG_CRTC, 0x3F, SimReadRegister(0, SIM_REG_CRTC, 0x3F) | 0x01);
    SimWriteRegister(0, SIM_REG_CRTC, 0x35, SimReadRegister(0, SIM_REG_CRTC, 0x35) | 0x02);
    const struct { uint8_t misc_select, cr34, number; } clocks[] = {{2, 0x00, 2}, {1, 0x02, 5}};
    for (const auto& c : clocks) {
        SimWriteRegister(0, SIM_REG_MISC, 0, (uint8_t)((SimReadRegister(0, SIM_REG_MISC, 0) & ~0x0C) | c.misc_select << 2));
        SimWriteRegister(0, SIM_REG_CRTC, 0x34, c.cr34);
        ASSERT_EQ(0u, chip_init());
        chip_open_io();
        EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0) << +c.number;
        EXPECT_EQ(c.number, MachineInByte(clock_index));
        double target = SimPixelClockHz(0) * 1.1;
        ASSERT_EQ(1u, chip_set_pixel_clock(target));
        EXPECT_NEAR(target, SimPixelClockHz(0), target * 0.01) << +c.number;
        EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0) << +c.number;
        EXPECT_EQ((uint32_t)SimHTotal(0), chip_get_htotal());
        EXPECT_EQ((uint32_t)SimVTotal(0), chip_get_vtotal());
        chip_close_io();
    }
}

// From N = 31 and R = 0 the first fit of a clock above 14.31818 MHz x 129 / 33
// has an M above 127, which the 7-bit field would take as another M: the rate
// reported as reached is the one the card runs.
TEST(Et6000, RateReachedIsTheOneTheCardRuns)
{
    ASSERT_NO_FATAL_FAILURE(BootEt6000(SIM_WINDOWS_98, 4));
    ASSERT_GT(85.0 * 8 * SimHTotal(0) * SimVTotal(0), 14318180.0 * 129 / 33);
    MachineOutByte(clock_index, 2);
    MachineOutByte(clock_data, 100);
    MachineOutByte(clock_data, 31);
    EXPECT_EQ(85, ProgramRefreshClock(85));
    EXPECT_NEAR(85, SimRefreshHz(0), 1.0);
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

}  // namespace
