// The Riva family against the simulated NV3/NV4 chips, whose models compute clocks and totals themselves.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/settings.h"
#include "base/state.h"
#include "chips/chips.h"
#include "hardware/driver_key.h"
#include "hardware/machine.h"
#include "modes/detect.h"
#include "modes/mode_list.h"
#include "support/machine.h"

namespace {

enum : uint16_t { TNT = 0x0020, RIVA128 = 0x0018 };
const uint32_t MPLL = 0x680504, VPLL = 0x680508;

void BootRiva(uint16_t device, int windows = SIM_WINDOWS_98, int memory_mb = 16, uint32_t crystal_hz = 14318180)
{
    SimCardConfig card = Card(device == TNT ? 0x10de : 0x12d2, device, device == TNT ? 1 : 0, device == TNT ? 0 : 10);
    card.memory_mb = memory_mb;
    card.crystal_hz = crystal_hz;
    BootMachine(Machine(windows, {card}));
    ASSERT_EQ(1, DetectAdapters());
    RefreshAdapterModes(REFRESH_AT_STARTUP);
}

uint8_t LockRegister(uint16_t device)
{
    uint16_t port = device == TNT ? 0x3D4 : 0x3C4;
    MachineOutByte(port, device == TNT ? 0x1F : 0x06);
    return MachineInByte((uint16_t)(port + 1));
}

int CardMhz() { return (int)(SimMemoryClockHz(0) / 1e6 + 0.5); }

// Each open unlocks and each close locks again; a Riva 128 found unlocked stays so.
TEST(Riva, ExtendedRegistersUnlockedOnlyWhileOpen)
{
    const struct { uint16_t device; bool unlocked_before; uint8_t after_close; } cases[] = {
        {TNT, false, 0}, {TNT, true, 0}, {RIVA128, false, 0}, {RIVA128, true, 1}};
    for (const auto& c : cases) {
        ASSERT_NO_FATAL_FAILURE(BootRiva(c.device));
        if (c.unlocked_before) MachineOutByte((uint16_t)(c.device == TNT ? 0x3D5 : 0x3C5), 0x57);
        ASSERT_EQ(1u, chip_open_io());
        EXPECT_NE(0, LockRegister(c.device)) << c.device;
        chip_close_io();
        EXPECT_EQ(c.after_close, LockRegister(c.device)) << c.device << " unlocked before " << c.unlocked_before;
    }
}

// 0x00018C0A (N = 140, M = 10, P = 1) is 100 MHz from 14.31818 MHz; with the
// strap on 13.5 MHz every clock comes from that crystal. The window, the real-mode
// port pair and NT's kernel device read the same registers.
TEST(Riva, ClocksAndMemoryFromEveryPath)
{
    const struct { uint16_t device; int windows, mb; uint32_t crystal; bool window; uint32_t mclk, memory; } cases[] = {
        {TNT, SIM_WINDOWS_98, 16, 14318180, true, 100, 16u << 16},
        {TNT, SIM_WINDOWS_98, 16, 14318180, false, 100, 16u << 16},
        {TNT, SIM_WINDOWS_95, 2, 13500000, true, 95, 2u << 16},
        {RIVA128, SIM_WINDOWS_98, 4, 13500000, false, 95, 4u << 16},
        {RIVA128, SIM_WINDOWS_98, 8, 14318180, true, 100, 8u << 16},
        {TNT, SIM_WINDOWS_NT4, 16, 13500000, false, 95, 16u << 16},
        {RIVA128, SIM_WINDOWS_NT4, 4, 14318180, false, 100, 4u << 16},
    };
    for (const auto& c : cases) {
        ASSERT_NO_FATAL_FAILURE(BootRiva(c.device, c.windows, c.mb, c.crystal));
        if (!c.window) CurrentAdapter()->mapped_registers = 0;
        EXPECT_EQ(c.windows != SIM_WINDOWS_NT4 && c.window, CurrentAdapter()->mapped_registers != 0);
        SimWriteInternal32(0, MPLL, 0x00018C0A);
        SimWriteInternal32(0, VPLL, SimReadInternal32(0, VPLL) | 0xFFF80000);
        EXPECT_EQ(c.mclk, chip_get_mclk()) << c.device << " " << c.crystal;
        EXPECT_EQ(c.memory, chip_get_mem_size()) << c.device << " " << c.windows;
        chip_open_io();
        EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0);
        ASSERT_EQ(1u, chip_set_pixel_clock(SimPixelClockHz(0) * 1.2));
        EXPECT_NEAR(SimPixelClockHz(0), chip_get_pixel_clock(), 1.0);
        EXPECT_EQ((uint32_t)SimHTotal(0), chip_get_htotal());
        EXPECT_EQ((uint32_t)SimVTotal(0), chip_get_vtotal());
        chip_close_io();
        EXPECT_EQ(0xFFF80000u, SimReadInternal32(0, VPLL) & 0xFFF80000) << "the bits above P stay";
    }
}

// NT reads the size from the display driver's binary value, by its third and fourth bytes.
TEST(Riva, MemorySizeOnNtFromTheDriversValue)
{
    ASSERT_NO_FATAL_FAILURE(BootRiva(TNT, SIM_WINDOWS_NT4));
    char key[DRIVER_KEY_SIZE];
    ASSERT_EQ(1, FindDriverKey(key));
    const struct { uint32_t bytes, size; } cases[] = {
        {8u << 20, 8u << 16}, {4u << 20, 4u << 16}, {12u << 20, 12u << 16}, {16u << 20, 16u << 16},
        {32u << 20, 32u << 16}, {2u << 20, 0}, {64u << 20, 0}};
    for (const auto& c : cases) {
        HKEY k;
        ASSERT_EQ(ERROR_SUCCESS, RegOpenKeyExA(HKEY_LOCAL_MACHINE, key, 0, KEY_SET_VALUE, &k));
        RegSetValueExA(k, "HardwareInformation.MemorySize", 0, REG_BINARY, (const BYTE*)&c.bytes, sizeof c.bytes);
        RegCloseKey(k);
        EXPECT_EQ(c.size, chip_get_mem_size()) << std::hex << c.bytes;
    }
}

// Every clock of the range lands within 4 MHz of the request, and the answer is the
// clock the card really runs; a first fit 5 MHz off gives way to its neighbour.
TEST(Riva, MemoryClockLandsNearTheRequest)
{
    ASSERT_NO_FATAL_FAILURE(BootRiva(TNT));
    EXPECT_EQ(90u, chip_get_mclk_min());
    EXPECT_EQ(133u, chip_get_mclk_max());
    // P from 1 and the VCO up to 256 MHz end the clock at 128 MHz: above, nothing is written.
    for (uint32_t mhz = 90; mhz <= 133; ++mhz) {
        uint32_t running = SimReadInternal32(0, MPLL), set = chip_set_mclk(mhz);
        EXPECT_EQ(mhz > 128, set == 0) << mhz;
        if (set == 0) EXPECT_EQ(running, SimReadInternal32(0, MPLL)) << mhz;
        else EXPECT_NEAR(mhz, SimMemoryClockHz(0) / 1e6, 4.0) << mhz;
        if (set) EXPECT_EQ(CardMhz(), (int)set) << mhz;
    }
    SimWriteInternal32(0, MPLL, 0x00010E01);  // N = 14, M = 1, P = 1: 7.2 MHz steps
    EXPECT_EQ(104u, chip_set_mclk(105));      // N = 14 gives 100; M = 2, N = 29 gives 103.8
    EXPECT_EQ(0x00011D02u, SimReadInternal32(0, MPLL));
    SimWriteInternal32(0, MPLL, 0x00010000);  // M = 0: nothing to tell
    EXPECT_EQ(0u, chip_get_mclk());
}

// The sheet's power states: the screen stays off but for On, the registers the
// sequence borrows come back, and the lock is put back.
TEST(Riva, PowerStatesThroughTheSyncBits)
{
    for (uint16_t device : {TNT, RIVA128}) {
        ASSERT_NO_FATAL_FAILURE(BootRiva(device));
        uint8_t cr00 = SimReadRegister(0, SIM_REG_CRTC, 0x00), cr11 = SimReadRegister(0, SIM_REG_CRTC, 0x11);
        const struct { uint32_t command; uint8_t sync; SimDpms state; } steps[] = {
            {CMD_DPMS_STANDBY, uint8_t(device == TNT ? 0x80 : 0x40), device == TNT ? SIM_DPMS_SUSPEND : SIM_DPMS_STANDBY},
            {CMD_DPMS_SUSPEND, 0x40, SIM_DPMS_STANDBY},
            {CMD_DPMS_OFF, 0xC0, SIM_DPMS_OFF},
            {CMD_DPMS_ON, 0x00, SIM_DPMS_ON},
        };
        for (const auto& s : steps) {
            EXPECT_EQ(1, chip_set_dpms_all(s.command));
            EXPECT_EQ(s.sync, SimReadRegister(0, SIM_REG_CRTC, 0x1A) & 0xC0) << device << " " << s.command;
            EXPECT_EQ(s.state, SimDpmsState(0)) << device << " " << s.command;
            EXPECT_EQ(s.command != CMD_DPMS_ON, (SimReadRegister(0, SIM_REG_SEQUENCER, 0x01) & 0x20) != 0);
            EXPECT_EQ(cr00, SimReadRegister(0, SIM_REG_CRTC, 0x00));
            EXPECT_EQ(cr11, SimReadRegister(0, SIM_REG_CRTC, 0x11));
            EXPECT_EQ(0, LockRegister(device));
        }
    }
}

// With "/A" the stored clock comes back after a restart, but only from within the card's range.
TEST(Riva, StoredClockReappliedAtStartWithinRange)
{
    ASSERT_NO_FATAL_FAILURE(BootRiva(TNT));
    const int own = CardMhz();
    const struct { int32_t stored; int expected; } cases[] = {{134, own}, {89, own}, {0, own}, {120, 120}, {90, 90}};
    for (const auto& c : cases) {
        SaveSetting(SETTING_MCLK, c.stored);
        SimRestartWindows();
        ResetProgramState();
        platform = PLATFORM_9X, os_class = OS_CLASS_WIN98, startup_flags = STARTUP_AUTORUN;
        ASSERT_EQ(1, DetectAdapters());
        EXPECT_NEAR(c.expected, CardMhz(), 1) << c.stored;
    }
}

}  // namespace
