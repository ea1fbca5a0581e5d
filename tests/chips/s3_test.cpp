// The S3 family against the simulated chips, whose models compute clocks and totals themselves.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/state.h"
#include "chips/chips.h"
#include "chips/synth.h"
#include "modes/detect.h"
#include "modes/mode_change.h"
#include "modes/mode_list.h"
#include "shell/main_window.h"
#include "support/machine.h"

static void BootS3(uint16_t device_id, int windows = SIM_WINDOWS_98)
{
    BootMachine(Machine(windows, {Card(0x5333, device_id)}));
    ASSERT_EQ(1, DetectAdapters()) << std::hex << device_id;
    RefreshAdapterModes(REFRESH_AT_STARTUP);
}

static uint8_t Seq(uint16_t index) { return SimReadRegister(0, SIM_REG_SEQUENCER, index); }
static void SetSeq(uint16_t index, uint8_t value) { SimWriteRegister(0, SIM_REG_SEQUENCER, index, value); }
static void SetCrtc(uint16_t index, uint8_t value) { SimWriteRegister(0, SIM_REG_CRTC, index, value); }

TEST(S3Registers, Trio64V2ClocksInterlaceModeKeyAndPowerStates)
{
    ASSERT_NO_FATAL_FAILURE(BootS3(0x8901));
    SetSeq(0x11, 0xF3);  // M = 115; bit 7 is not the clock's
    SetSeq(0x10, 0xAC);  // N = 12, R = 1
    EXPECT_EQ(60u, chip_get_mclk());
    EXPECT_EQ(70u, chip_set_mclk(70));
    EXPECT_NEAR(69.94e6, SimMemoryClockHz(0), 0.01e6);
    EXPECT_EQ(70u, chip_get_mclk());
    EXPECT_TRUE(Seq(0x11) & Seq(0x10) & 0x80) << "bit 7 kept";
    // No fit for 60 MHz from where the clock stands: nothing is written.
    SetSeq(0x11, 0x73);
    SetSeq(0x10, 0x2C);
    EXPECT_EQ(0u, chip_set_mclk(60));
    EXPECT_TRUE(Seq(0x11) == 0x73 && Seq(0x10) == 0x2C);
    SetSeq(0x11, 0x80);  // M = 0: nothing to tell
    EXPECT_EQ(0u, chip_get_mclk());

    // Above 8 bits the pixel synthesizer runs at twice the rate when SR18 says so.
    SetSeq(0x18, 0x80);
    CurrentAdapter()->bits_per_pixel = 16;
    chip_open_io();
    double running = chip_get_pixel_clock();
    SetSeq(0x08, 0x00);  // SR18 reads 0 while the extended sequencer is locked
    ASSERT_EQ(1u, chip_set_pixel_clock(running * 1.1));
    EXPECT_GT(SimPixelClockHz(0), 2 * running * 1.05);
    EXPECT_NEAR(SimPixelClockHz(0) / 2, chip_get_pixel_clock(), 1.0);
    CurrentAdapter()->bits_per_pixel = 8;  // SR18 does not count at 8 bits
    EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0);
    chip_close_io();

    // Only the DPMS codes reach the cards, each keeping SR0D's low bits; only
    // On repaints the screen.
    HWND window = CreateWindowExA(0, "STATIC", "", WS_POPUP | WS_VISIBLE, 0, 0, 8, 8, NULL, NULL, NULL, NULL);
    SetSeq(0x0D, 0x05);
    const struct {
        WPARAM state;
        uint8_t bits;
        SimDpms dpms;
    } cases[] = {{1, 0x20, SIM_DPMS_STANDBY}, {2, 0x80, SIM_DPMS_SUSPEND},        {4, 0xA0, SIM_DPMS_OFF},
                 {3, 0xA0, SIM_DPMS_OFF},     {219, 0xA0, SIM_DPMS_OFF}, {0x100000000ull, 0xA0, SIM_DPMS_OFF},
                 {0, 0x00, SIM_DPMS_ON}};
    for (const auto& c : cases) {
        ValidateRect(window, NULL);
        SimResetCounters();
        EXPECT_EQ(1, OnPowerStateMessage(c.state));
        EXPECT_EQ(c.bits | 0x05, Seq(0x0D)) << c.state;
        EXPECT_EQ(c.dpms, SimDpmsState(0)) << c.state;
        EXPECT_EQ(c.state == 0, GetUpdateRect(window, NULL, FALSE) != 0) << c.state;
        if (c.dpms == SIM_DPMS_OFF && c.state != 4)  // refused: nothing written
            EXPECT_EQ(0u, SimGetCounters()->port_writes + SimGetCounters()->window_writes) << c.state;
    }
    EXPECT_EQ(1u, chip_has_dpms());
    EXPECT_EQ(1, any_chip_has_dpms());
    DestroyWindow(window);

    SetCrtc(0x42, 0x20);
    EXPECT_EQ(1u, chip_is_interlaced());
    SetCrtc(0x42, 0xDF);
    EXPECT_EQ(0u, chip_is_interlaced());
    // The 9x display driver takes the rate from the mode's key.
    EXPECT_EQ((uint32_t)PREPARE_REFRESH_KEY, chip_prepare_mode(800, 600, 16, 72));
    platform = PLATFORM_NT;
    EXPECT_EQ(0u, chip_prepare_mode(800, 600, 16, 72));
}

static const struct S3Chip { uint16_t id; double vco_low, vco_high; uint32_t agp_rate; } chips[] = {
    {0x8a13, 135e6, 270e6, 2}, {0x8a20, 220e6, 550e6, 2}, {0x8a21, 220e6, 550e6, 2}, {0x8904, 140e6, 340e6, 1},
    {0x5631, 135e6, 270e6, 0}, {0x883d, 220e6, 440e6, 0}, {0x8a01, 140e6, 340e6, 0}, {0x8a10, 140e6, 340e6, 1},
    {0x8811, 135e6, 270e6, 0}, {0x8901, 140e6, 340e6, 0}};

// From the running clock every chip lands just below each higher target, in
// its VCO window, keeping SR13 bit 7 and clearing SR12 bit 7 of a two-bit R;
// its totals read as the model counts them.
TEST(S3PixelClock, EveryChipLandsJustBelowTheTargetInsideItsWindow)
{
    for (const S3Chip& w : chips) {
        ASSERT_NO_FATAL_FAILURE(BootS3(w.id));
        bool doubled = CurrentAdapter()->bits_per_pixel != 8 && (Seq(0x18) & 0x80);
        bool savage = w.id == 0x8a20 || w.id == 0x8a21, r2 = w.id == 0x5631 || w.id == 0x8811;
        if (!savage) SetSeq(0x13, Seq(0x13) | 0x80);
        if (r2) SetSeq(0x12, Seq(0x12) | 0x80);
        EXPECT_EQ(w.agp_rate, chip_get_agp_rate()) << std::hex << w.id;
        chip_open_io();
        EXPECT_EQ((uint32_t)SimHTotal(0), chip_get_htotal()) << std::hex << w.id;
        EXPECT_EQ((uint32_t)SimVTotal(0), chip_get_vtotal()) << std::hex << w.id;
        double running = chip_get_pixel_clock();
        for (double target = running * 0.98; target <= running * 1.3; target += running * 0.04) {
            ASSERT_EQ(1u, chip_set_pixel_clock(target)) << std::hex << w.id << std::dec << " " << target;
            if (!savage) EXPECT_EQ(0x80, Seq(0x13) & 0x80);
            if (r2) EXPECT_EQ(0, Seq(0x12) & 0x80);
            uint8_t sr12 = Seq(0x12), sr29 = Seq(0x29);  // N and R as the chip packs them
            int n = savage ? (sr12 & 0x3F) + (sr29 & 0x10 ? 64 : 0) : sr12 & 0x1F;
            int r = savage ? (sr12 >> 6) + (sr29 & 0x04 ? 4 : 0) : r2 ? (sr12 >> 5) & 3 : sr12 >> 5;
            double out = SimPixelClockHz(0), wanted = doubled ? 2 * target : target;
            EXPECT_LE(out, wanted + 1) << std::hex << w.id;
            EXPECT_GT(out, wanted - reference_crystal_hz / ((n + 2) << r) - 1) << std::hex << w.id;
            EXPECT_NEAR(doubled ? out / 2 : out, chip_get_pixel_clock(), 1.0);
            EXPECT_GE(out * (1 << r), w.vco_low - 1) << std::hex << w.id;
            EXPECT_LE(out * (1 << r), w.vco_high + 1) << std::hex << w.id;
        }
        chip_close_io();
    }
}

TEST(S3PixelClock, Savage3DHighBitsWithTheScreenOffMeanwhileAndItsTotals)
{
    ASSERT_NO_FATAL_FAILURE(BootS3(0x8a20));
    CurrentAdapter()->bits_per_pixel = 8;
    SetSeq(0x12, 20);  // N = 20, R = 4 (R bit 2 lives in SR29)
    SetSeq(0x29, 0xE4);
    uint8_t sr01 = Seq(0x01);
    chip_open_io();
    // 15 MHz: M = trunc(16 x 22 x 15 MHz / fref) - 2 = 366, VCO 240 MHz.
    ASSERT_EQ(1u, chip_set_pixel_clock(15e6));
    EXPECT_EQ(366 - 256, Seq(0x13));
    EXPECT_EQ(20, Seq(0x12));
    EXPECT_EQ(0xE0 | 0x08 | 0x04, Seq(0x29));
    EXPECT_EQ(sr01, Seq(0x01));
    EXPECT_NEAR(reference_crystal_hz * 368 / (22 * 16), SimPixelClockHz(0), 1.0);
    const uint8_t totals[][2] = {{0x00, 0x10}, {0x5D, 0x01}, {0x5F, 0x02}, {0x43, 0x80},
                                 {0x06, 0x20}, {0x07, 0x21}, {0x5E, 0x01}};
    for (const auto& r : totals) SetCrtc(r[0], r[1]);
    EXPECT_EQ(2u * (0x10 + 256 + 1024) + 5, chip_get_htotal());
    EXPECT_EQ(0x20u + 256 + 512 + 1024 + 2, chip_get_vtotal());
    chip_close_io();
}

// Raw fields with the bits each layout ignores or adds, read as the model reads them.
TEST(S3PixelClock, EachLayoutReadsAsTheModel)
{
    const uint8_t cases[][4] = {
        {0x01, 0x85, 0xE4, 0x00},  // Trio64V2: R = 4; SR13 bit 7 is not M
        {0x02, 0xA7, 0x64, 0x00},  // ViRGE: R has two bits, SR12 bit 7 is not R
        {0x03, 0x4A, 0x2C, 0xD3},  // Savage3D: SR29 bit 4 is N + 64, bits 5 and 3 are not
        {0x03, 0x8A, 0x2C, 0xEC},  // Savage3D: SR29 bits 3 and 2: M + 256, R + 4
    };
    for (const auto& c : cases) {
        ASSERT_NO_FATAL_FAILURE(BootS3(c[0] == 1 ? 0x8901 : c[0] == 2 ? 0x5631 : 0x8a20));
        CurrentAdapter()->bits_per_pixel = 8;
        for (int i = 0; i < 3; ++i) SetSeq((uint16_t)(i == 2 ? 0x29 : 0x12 + i), c[1 + i]);
        chip_open_io();
        EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0) << (int)c[0] << " " << (int)c[1];
        chip_close_io();
    }
}

TEST(S3Registers, MemorySizeFromTheStraps)
{
    const uint32_t cards[][2] = {{0x8901, 1}, {0x8901, 2}, {0x8901, 4}, {0x8a20, 2}, {0x8a20, 4},
                                 {0x8a20, 8}, {0x883d, 2}, {0x883d, 4}, {0x883d, 6}, {0x883d, 8}};
    for (const auto& c : cards) {
        SimCardConfig card = Card(0x5333, (uint16_t)c[0]);
        card.memory_mb = c[1];
        BootMachine(Machine(SIM_WINDOWS_98, {card}));
        ASSERT_EQ(1, DetectAdapters());
        EXPECT_EQ(c[1] << 16, chip_get_mem_size()) << std::hex << c[0] << " " << std::dec << c[1];
    }
    SetCrtc(0x36, 0xC0);  // bit 7 is not the ViRGE/VX's
    EXPECT_EQ(6u << 16, chip_get_mem_size());
    ASSERT_NO_FATAL_FAILURE(BootS3(0x8901));
    SetCrtc(0x36, 0x2E);  // straps the older chips do not define
    EXPECT_EQ(0u, chip_get_mem_size());
    // Nor do registers that cannot be read (a 0 strap would say 4 MB).
    SimMachineConfig config = Machine(SIM_WINDOWS_NT4, {Card(0x5333, 0x8901)});
    config.nt_device = false;
    SimBoot(&config);
    platform = PLATFORM_NT;
    EXPECT_EQ(0u, chip_get_mem_size());
}

// The Trio3D/2X leaves the refresh to the display driver: no register is
// touched. On 9x the Savage3D's strap tells an AGP card; NT does not ask it.
TEST(S3Registers, WhatTheDisplayDriverDoesAndTheAgpStrap)
{
    ASSERT_NO_FATAL_FAILURE(BootS3(0x8a13));
    EXPECT_TRUE(CurrentAdapter()->flags & ADAPTER_NO_CLOCK_REFRESH);
    SimResetCounters();
    EXPECT_GT(MeasuredRefreshRate(), 0);
    EXPECT_EQ(90, ProgramRefreshClock(90));
    const SimCounters* c = SimGetCounters();
    EXPECT_EQ(0u, c->port_reads + c->port_writes + c->window_reads + c->window_writes);
    SimCardConfig savage = Card(0x5333, 0x8a20, 1, 0);
    savage.initial_registers[0] = {SIM_REG_CRTC, 0x37, 0x40};
    savage.initial_register_count = 1;
    for (int windows : {SIM_WINDOWS_98, SIM_WINDOWS_NT4}) {
        BootMachine(Machine(windows, {savage}));
        ASSERT_EQ(1, DetectAdapters());
        EXPECT_EQ(windows == SIM_WINDOWS_98 ? (uint32_t)CHIP_CAP_AGP : 0u, chip_init());
    }
}
