// The Permedia 2 models: the RAMDAC's synthesizers through both index
// schemes, the memory configuration and the 66 MHz status bit, the sync
// control, the display driver's mode set read back from the timing
// generator, and the driver's timing list in the registry.
#include "sim_test.h"

enum : uint16_t { TI = 0x3d07, PM2 = 0x0007, PM2V = 0x0009 };
enum : uint32_t { MEM_CONFIG = 0x10C0, H_TOTAL = 0x3010, V_TOTAL = 0x3038, VIDEO_CONTROL = 0x3058 };

static void BootPermedia(uint16_t device, int bus = 0, int memory_mb = 8, int windows = SIM_WINDOWS_98)
{
    SimCardConfig card = Card(device == TI ? 0x104c : 0x3d3d, device, (uint8_t)bus, bus ? 0 : 10);
    card.memory_mb = memory_mb;
    SimMachineConfig config = Machine(windows, {card});
    config.start_width = 800;
    config.start_height = 600;
    config.start_bits = 16;
    config.start_refresh = 60;
    SimBoot(&config);
}
static uint32_t Bar0() { return SimCardBarAddress(0, 0); }
static void WriteRamdac(uint16_t device, uint16_t index, uint8_t value)
{
    if (device == PM2V) {
        MachineWriteDword(Bar0() + 0x4028, index >> 8);
        MachineWriteDword(Bar0() + 0x4020, index & 0xFF);
        MachineWriteDword(Bar0() + 0x4030, value);
    } else {
        MachineWriteDword(Bar0() + 0x4000, index);
        MachineWriteDword(Bar0() + 0x4050, value);
    }
}

// Permedia 2: f = fref x A1 / (A2 x 2^(A3 bits 2..0)) while A3 bit 3 runs
// it; 2v: fref x feedback / (prescale x 2^postscale) (pm2fb).
TEST(Permedia, SynthesizersMemoryAndBusSpeed)
{
    const struct { uint16_t device; int bus, mb; uint16_t numerator, denominator, post; uint8_t post_value;
                   double hz; uint32_t banks; } cases[] = {
        {TI, 0, 4, 0x20, 0x21, 0x22, 0x0A, 51136357, 0x20000000},
        {PM2, 1, 8, 0x30, 0x31, 0x32, 0x0A, 51136357, 0x60000000},
        {PM2, 0, 8, 0x20, 0x21, 0x22, 0x02, 0, 0x60000000},  // stopped
        {PM2V, 1, 8, 0x202, 0x201, 0x203, 0x02, 51136357, 0x60000000},
        {PM2V, 0, 2, 0x20F, 0x20E, 0x210, 0x02, 51136357, 0x00000000},
    };
    for (const auto& c : cases) {
        BootPermedia(c.device, c.bus, c.mb);
        WriteRamdac(c.device, c.numerator, 100);
        WriteRamdac(c.device, c.denominator, 7);
        WriteRamdac(c.device, c.post, c.post_value);
        bool pixel = c.post == 0x22 || c.post == 0x203;
        EXPECT_NEAR(c.hz, pixel ? SimPixelClockHz(0) : SimMemoryClockHz(0), 1) << c.device << " " << c.numerator;
        EXPECT_EQ(c.banks, MachineReadDword(Bar0() + MEM_CONFIG) & 0x60000000) << c.mb;
        EXPECT_EQ(c.bus == 1, (SimReadRegister(0, SIM_REG_PCI, 0x06) >> 5) & 1) << "66 MHz capable on AGP";
    }
}

// VIDEO_CONTROL bits 4..3 and 6..5: 0 holds the sync low (stopped), 1 and 3
// run it active high or low.
TEST(Permedia, DpmsFromTheSyncControl)
{
    BootPermedia(PM2);
    const struct { uint32_t video; SimDpms state; } cases[] = {
        {0x29, SIM_DPMS_ON}, {0x79, SIM_DPMS_ON}, {0x21, SIM_DPMS_STANDBY}, {0x09, SIM_DPMS_SUSPEND}, {0x01, SIM_DPMS_OFF}};
    for (const auto& c : cases) {
        MachineWriteDword(Bar0() + VIDEO_CONTROL, c.video);
        EXPECT_EQ(c.state, SimDpmsState(0)) << std::hex << c.video;
    }
}

// The timing generator counts in 32-bit units (64 with VIDEO_CONTROL bit
// 16): 4 pixels at 8 bits, 2 at 16, 1 at 32.
TEST(Permedia, DmtModesRunAtTheirRates)
{
    const struct { uint16_t device; int w, h, hz, bits, pixels_per_unit; } cases[] = {
        {PM2, 640, 480, 60, 8, 4},      {TI, 800, 600, 85, 16, 4},  {PM2, 1024, 768, 75, 32, 2},
        {PM2V, 1280, 1024, 75, 8, 8},   {PM2V, 1280, 720, 60, 16, 4},
    };
    for (const auto& c : cases) {
        BootPermedia(c.device, 0, 8, SIM_WINDOWS_NT4);
        const SimTiming* t;
        ASSERT_NO_FATAL_FAILURE(SetDmtMode(c.w, c.h, c.bits, c.hz, &t, c.pixels_per_unit, 2));
        EXPECT_EQ((uint32_t)t->vtotal - 1, MachineReadDword(Bar0() + V_TOTAL));
    }
    EXPECT_NE(std::string::npos, PrintedState().find("\nPM2VI_RD_CLK0_FEEDBACK="));
}

// DEFAULT\TIMINGS\<w>,<h>: "1" the default rate, then the others ascending;
// 14 bytes: rate, rate, total / 8 (16 bits), front porch, sync, back porch
// / 8, polarity, vertical total (16 bits), porch, sync, porch, polarity.
TEST(Permedia, DisplayDriverTimingList)
{
    BootPermedia(PM2);
    std::string key = "System\\CurrentControlSet\\Services\\Class\\DISPLAY\\0000\\DEFAULT\\TIMINGS\\";
    const uint8_t vga60[14] = {60, 60, 100, 0, 2, 12, 6, 0, 0x0D, 0x02, 10, 2, 33, 0};
    EXPECT_EQ(std::string((const char*)vga60, 14), ReadRegistryRaw(HKEY_LOCAL_MACHINE, key + "640,480", "1"));
    const char* rates_800[] = {"\x3C", "\x38", "\x48", "\x4B", "\x55"};  // 60, 56, 72, 75, 85
    for (int i = 0; i < 5; i++)
        EXPECT_EQ(rates_800[i][0], ReadRegistryRaw(HKEY_LOCAL_MACHINE, key + "800,600", std::to_string(i + 1))[0]) << i;
    bool found = true;
    ReadRegistryRaw(HKEY_LOCAL_MACHINE, key + "800,600", "6", &found);
    EXPECT_FALSE(found);
}
