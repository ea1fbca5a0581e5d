#include <gtest/gtest.h>

#include <math.h>

#include "base/adapters.h"
#include "base/state.h"
#include "chips/chips.h"
#include "chips/synth.h"
#include "hardware/driver_key.h"
#include "modes/detect.h"
#include "modes/mode_change.h"
#include "modes/mode_keys.h"
#include "modes/mode_list.h"
#include "modes/rate_list.h"
#include "support/machine.h"
#include "support/support.h"

static void BootS3(uint16_t device_id, int windows = SIM_WINDOWS_98, uint8_t bus = 0)
{
    BootMachine(Machine(windows, {Card(0x5333, device_id, bus, bus ? 0 : 10)}));
    ASSERT_EQ(1, DetectAdapters());
    RefreshAdapterModes(REFRESH_AT_STARTUP);
}

TEST(S3MemoryClock, ReadsTheSynthesizerInWholeMegahertz)
{
    BootS3(0x8901);
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x11, 0x73);  // M = 115
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x10, 0x2C);  // N = 12, R = 1
    EXPECT_EQ(60u, chip_get_mclk());
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x11, 0x80);  // M = 0: nothing to tell
    EXPECT_EQ(0u, chip_get_mclk());
}

TEST(S3MemoryClock, SetAndReadBackAgreeWithTheModel)
{
    BootS3(0x8901);
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x11, 0xF3);  // bit 7 is not the clock's
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x10, 0xAC);
    EXPECT_EQ(70u, chip_set_mclk(70));
    EXPECT_NEAR(69.94e6, SimMemoryClockHz(0), 0.01e6);
    EXPECT_EQ(70u, chip_get_mclk());
    EXPECT_EQ(0x80, SimReadRegister(0, SIM_REG_SEQUENCER, 0x11) & 0x80);
    EXPECT_EQ(0x80, SimReadRegister(0, SIM_REG_SEQUENCER, 0x10) & 0x80);

    // No fit for 60 MHz from where the clock stands: nothing is written.
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x11, 0x73);
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x10, 0x2C);
    EXPECT_EQ(0u, chip_set_mclk(60));
    EXPECT_EQ(0x73, SimReadRegister(0, SIM_REG_SEQUENCER, 0x11));
    EXPECT_EQ(0x2C, SimReadRegister(0, SIM_REG_SEQUENCER, 0x10));
}

// The synthesizer fields as each chip packs them, read independently of the
// driver to check the window it landed in.
static void DecodeDclk(uint16_t id, int* n, int* r)
{
    uint8_t sr12 = SimReadRegister(0, SIM_REG_SEQUENCER, 0x12), sr29 = SimReadRegister(0, SIM_REG_SEQUENCER, 0x29);
    if (id == 0x8a20 || id == 0x8a21) {
        *n = (sr12 & 0x3F) + ((sr29 & 0x10) ? 64 : 0);
        *r = (sr12 >> 6) + ((sr29 & 0x04) ? 4 : 0);
    } else {
        *n = sr12 & 0x1F;
        *r = (id == 0x5631 || id == 0x8811) ? (sr12 >> 5) & 3 : sr12 >> 5;
    }
}

struct VcoWindow {
    uint16_t id;
    double low, high;
};
static const VcoWindow windows[] = {{0x8a13, 135e6, 270e6}, {0x8a20, 220e6, 550e6}, {0x8a21, 220e6, 550e6},
                                    {0x8904, 140e6, 340e6}, {0x5631, 135e6, 270e6}, {0x883d, 220e6, 440e6},
                                    {0x8a01, 140e6, 340e6}, {0x8a10, 140e6, 340e6}, {0x8811, 135e6, 270e6},
                                    {0x8901, 140e6, 340e6}};

// A higher refresh asks for a clock a little above the one running: from
// there the search lands on every chip just below the target, in its VCO
// window.
TEST(S3PixelClock, EveryChipLandsJustBelowTheTargetInsideItsWindow)
{
    for (const VcoWindow& w : windows) {
        BootS3(w.id);
        bool doubled = CurrentAdapter()->bits_per_pixel != 8 && (SimReadRegister(0, SIM_REG_SEQUENCER, 0x18) & 0x80);
        // Beside the fields SR13 bit 7 is kept, and SR12 bit 7 of the chips with a two-bit R cleared.
        bool savage = w.id == 0x8a20 || w.id == 0x8a21, r2 = w.id == 0x5631 || w.id == 0x8811;
        if (!savage) SimWriteRegister(0, SIM_REG_SEQUENCER, 0x13, SimReadRegister(0, SIM_REG_SEQUENCER, 0x13) | 0x80);
        if (r2) SimWriteRegister(0, SIM_REG_SEQUENCER, 0x12, SimReadRegister(0, SIM_REG_SEQUENCER, 0x12) | 0x80);
        chip_open_io();
        double running = chip_get_pixel_clock();
        chip_close_io();
        for (double factor = 0.98; factor <= 1.3; factor += 0.04) {
            double target = running * factor;
            ASSERT_NE(0u, chip_open_io());
            uint32_t ok = chip_set_pixel_clock(target);
            double read = chip_get_pixel_clock();
            chip_close_io();
            ASSERT_EQ(1u, ok) << std::hex << w.id << std::dec << " " << target;
            if (!savage) EXPECT_EQ(0x80, SimReadRegister(0, SIM_REG_SEQUENCER, 0x13) & 0x80);
            if (r2) EXPECT_EQ(0, SimReadRegister(0, SIM_REG_SEQUENCER, 0x12) & 0x80);
            int n, r;
            DecodeDclk(w.id, &n, &r);
            double out = SimPixelClockHz(0);
            double wanted = doubled ? 2 * target : target;
            double step = reference_crystal_hz / ((n + 2) << r);
            EXPECT_LE(out, wanted + 1) << std::hex << w.id;
            EXPECT_GT(out, wanted - step - 1) << std::hex << w.id;
            EXPECT_NEAR(doubled ? out / 2 : out, read, 1.0);
            double vco = out * (1 << r);
            EXPECT_GE(vco, w.low - 1) << std::hex << w.id;
            EXPECT_LE(vco, w.high + 1) << std::hex << w.id;
        }
    }
}

TEST(S3PixelClock, Savage3DHighBitsAndScreenOff)
{
    BootS3(0x8a20);
    CurrentAdapter()->bits_per_pixel = 8;
    // Start from N = 20, R = 4 (R bit 2 lives in SR29).
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x12, 20);
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x29, 0xE4);
    uint8_t sr01 = SimReadRegister(0, SIM_REG_SEQUENCER, 0x01);
    chip_open_io();
    // 15 MHz: M = trunc(16 x 22 x 15 MHz / fref) - 2 = 366, VCO 240 MHz.
    ASSERT_EQ(1u, chip_set_pixel_clock(15e6));
    chip_close_io();
    EXPECT_EQ(366 - 256, SimReadRegister(0, SIM_REG_SEQUENCER, 0x13));
    EXPECT_EQ(20, SimReadRegister(0, SIM_REG_SEQUENCER, 0x12));
    EXPECT_EQ(0xE0 | 0x08 | 0x04, SimReadRegister(0, SIM_REG_SEQUENCER, 0x29));
    EXPECT_EQ(sr01, SimReadRegister(0, SIM_REG_SEQUENCER, 0x01));
    EXPECT_NEAR(reference_crystal_hz * 368 / (22 * 16), SimPixelClockHz(0), 1.0);
}

TEST(S3PixelClock, DoubledAboveEightBits)
{
    BootS3(0x8901);
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x18, 0x80);
    CurrentAdapter()->bits_per_pixel = 16;
    chip_open_io();
    double running = chip_get_pixel_clock();
    // SR18 reads 0 while the extended sequencer is locked.
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x08, 0x00);
    ASSERT_EQ(1u, chip_set_pixel_clock(running * 1.1));
    double read16 = chip_get_pixel_clock();
    chip_close_io();
    EXPECT_GT(SimPixelClockHz(0), 2 * running * 1.05);  // the synthesizer runs at twice the rate
    EXPECT_NEAR(SimPixelClockHz(0) / 2, read16, 1.0);
    CurrentAdapter()->bits_per_pixel = 8;  // SR18 does not count at 8 bits
    chip_open_io();
    EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0);
    chip_close_io();
}

// Raw synthesizer fields with the bits each layout ignores or adds, read as
// the model reads them.
TEST(S3PixelClock, EachLayoutReadsAsTheModel)
{
    struct Case {
        uint16_t id;
        uint8_t sr12, sr13, sr29;
    } cases[] = {
        {0x8901, 0x85, 0xE4, 0x00},  // R = 4; SR13 bit 7 is not M
        {0x5631, 0xA7, 0x64, 0x00},  // R has two bits: SR12 bit 7 is not R
        {0x8a20, 0x4A, 0x2C, 0xF3},  // SR29 bit 4: N + 64
        {0x8a20, 0x8A, 0x2C, 0xEC},  // SR29 bits 3 and 2: M + 256, R + 4
    };
    for (const Case& c : cases) {
        BootS3(c.id);
        CurrentAdapter()->bits_per_pixel = 8;
        SimWriteRegister(0, SIM_REG_SEQUENCER, 0x12, c.sr12);
        SimWriteRegister(0, SIM_REG_SEQUENCER, 0x13, c.sr13);
        SimWriteRegister(0, SIM_REG_SEQUENCER, 0x29, c.sr29);
        chip_open_io();
        EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0) << std::hex << c.id << " " << (int)c.sr12;
        chip_close_io();
    }
}

TEST(S3Registers, TimingTotalsAsTheModelCountsThem)
{
    for (const VcoWindow& w : windows) {
        BootS3(w.id);
        chip_open_io();
        EXPECT_EQ((uint32_t)SimHTotal(0), chip_get_htotal()) << std::hex << w.id;
        EXPECT_EQ((uint32_t)SimVTotal(0), chip_get_vtotal()) << std::hex << w.id;
        chip_close_io();
    }
    BootS3(0x8a20);
    SimWriteRegister(0, SIM_REG_CRTC, 0x00, 0x10);
    SimWriteRegister(0, SIM_REG_CRTC, 0x5D, 0x01);
    SimWriteRegister(0, SIM_REG_CRTC, 0x5F, 0x02);
    SimWriteRegister(0, SIM_REG_CRTC, 0x43, 0x80);
    SimWriteRegister(0, SIM_REG_CRTC, 0x06, 0x20);
    SimWriteRegister(0, SIM_REG_CRTC, 0x07, 0x21);
    SimWriteRegister(0, SIM_REG_CRTC, 0x5E, 0x01);
    chip_open_io();
    EXPECT_EQ(2u * (0x10 + 256 + 1024) + 5, chip_get_htotal());
    EXPECT_EQ(0x20u + 256 + 512 + 1024 + 2, chip_get_vtotal());
    chip_close_io();
}

TEST(S3Registers, MemorySizeFromTheStraps)
{
    struct Case {
        uint16_t id;
        uint32_t mb;
    } cards[] = {{0x8901, 1}, {0x8901, 2}, {0x8901, 4}, {0x8a20, 2}, {0x8a20, 4}, {0x8a20, 8},
                 {0x883d, 2}, {0x883d, 4}, {0x883d, 6}, {0x883d, 8}};
    for (const Case& c : cards) {
        SimCardConfig card = Card(0x5333, c.id);
        card.memory_mb = c.mb;
        BootMachine(Machine(SIM_WINDOWS_98, {card}));
        ASSERT_EQ(1, DetectAdapters());
        EXPECT_EQ(c.mb << 16, chip_get_mem_size()) << std::hex << c.id << " " << std::dec << c.mb;
    }
    BootS3(0x883d);
    SimWriteRegister(0, SIM_REG_CRTC, 0x36, 0xC0);  // bit 7 is not the ViRGE/VX's
    EXPECT_EQ(6u << 16, chip_get_mem_size());
    // Straps the older chips do not define show no size at all.
    BootS3(0x8901);
    SimWriteRegister(0, SIM_REG_CRTC, 0x36, 0x2E);
    EXPECT_EQ(0u, chip_get_mem_size());
    // Nor do registers that cannot be read (a 0 strap would say 4 MB).
    BootS3(0x8901, SIM_WINDOWS_NT4);
    SimMachineConfig config = Machine(SIM_WINDOWS_NT4, {Card(0x5333, 0x8901)});
    config.nt_device = false;
    SimBoot(&config);
    EXPECT_EQ(0u, chip_get_mem_size());
}

TEST(S3Registers, PowerStatesKeepTheLowSyncBits)
{
    BootS3(0x8901);
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x0D, 0x05);
    struct Case {
        uint32_t state;
        uint8_t bits;
        SimDpms dpms;
    } cases[] = {{CMD_DPMS_STANDBY, 0x20, SIM_DPMS_STANDBY},
                 {CMD_DPMS_SUSPEND, 0x80, SIM_DPMS_SUSPEND},
                 {CMD_DPMS_OFF, 0xA0, SIM_DPMS_OFF},
                 {CMD_DPMS_ON, 0x00, SIM_DPMS_ON}};
    for (const Case& c : cases) {
        EXPECT_EQ(1, chip_set_dpms_all(c.state));
        EXPECT_EQ(c.bits | 0x05, SimReadRegister(0, SIM_REG_SEQUENCER, 0x0D));
        EXPECT_EQ(c.dpms, SimDpmsState(0));
    }
    EXPECT_EQ(1u, chip_has_dpms());
}

TEST(S3Registers, InterlaceAgpAndCapabilities)
{
    BootS3(0x8901);
    SimWriteRegister(0, SIM_REG_CRTC, 0x42, 0x20);
    EXPECT_EQ(1u, chip_is_interlaced());
    SimWriteRegister(0, SIM_REG_CRTC, 0x42, 0xDF);
    EXPECT_EQ(0u, chip_is_interlaced());
    EXPECT_EQ(0u, chip_get_agp_rate());
    EXPECT_EQ(0u, chip_get_mclk_max());

    for (uint16_t id : {0x8a10, 0x8904}) {
        BootS3(id);
        EXPECT_EQ(1u, chip_get_agp_rate());
    }
    BootS3(0x8a13);
    EXPECT_EQ(2u, chip_get_agp_rate());
    EXPECT_TRUE(CurrentAdapter()->flags & ADAPTER_NO_CLOCK_REFRESH);

    SimCardConfig savage = Card(0x5333, 0x8a20, 1, 0);
    savage.initial_registers[0] = {SIM_REG_CRTC, 0x37, 0x40};
    savage.initial_register_count = 1;
    BootMachine(Machine(SIM_WINDOWS_98, {savage}));
    ASSERT_EQ(1, DetectAdapters());
    EXPECT_EQ(CHIP_CAP_AGP, chip_init());
    EXPECT_EQ(2u, chip_get_agp_rate());
    BootMachine(Machine(SIM_WINDOWS_NT4, {savage}));
    ASSERT_EQ(1, DetectAdapters());
    EXPECT_EQ(0u, chip_init());  // NT does not ask the strap
}

TEST(S3Registers, PrepareModeAsksFor9xRefreshKey)
{
    BootS3(0x8901);
    EXPECT_EQ((uint32_t)PREPARE_REFRESH_KEY, chip_prepare_mode(800, 600, 16, 72));
    BootS3(0x8901, SIM_WINDOWS_NT4);
    EXPECT_EQ(0u, chip_prepare_mode(800, 600, 16, 72));
}

TEST(S3Registers, Trio3D2XNeverTouchesThePixelClock)
{
    BootS3(0x8a13);
    SimResetCounters();
    EXPECT_GT(MeasuredRefreshRate(), 0);
    EXPECT_EQ(90, ProgramRefreshClock(90));  // left to the display driver
    const SimCounters* c = SimGetCounters();
    EXPECT_EQ(0u, c->port_reads + c->port_writes + c->window_reads + c->window_writes);
}
