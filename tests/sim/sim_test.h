// Helpers for the simulated machine's own tests: machines built in code, and
// the hardware reached the way the program reaches it, through the seam.
#ifndef VISTREL_TESTS_SIM_TEST_H
#define VISTREL_TESTS_SIM_TEST_H

#include <gtest/gtest.h>

#include "hardware/machine.h"
#include "modes.h"
#include "sim.h"
#include "support/machine.h"
#include "support/support.h"

// An S3 card; a 16-bit desktop exercises the clock doubling and the 4-pixel characters.
inline SimMachineConfig MachineWith(int windows, uint16_t device = 0x8901, int bus = 0, int slot = 10)
{
    SimMachineConfig config = Machine(windows, {Card(0x5333, device, (uint8_t)bus, (uint8_t)slot)});
    config.start_bits = 16;
    return config;
}
inline void BootWith(int windows, uint16_t device = 0x8901)
{
    SimMachineConfig config = MachineWith(windows, device);
    SimBoot(&config);
}

// PCI configuration mechanism #1.
inline uint32_t PciRead(int bus, int device, int function, int offset)
{
    MachineOutDword(0xCF8, 0x80000000u | bus << 16 | device << 11 | function << 8 | offset);
    return MachineInDword(0xCFC);
}
inline void PciWrite(int bus, int device, int offset, uint32_t value)
{
    MachineOutDword(0xCF8, 0x80000000u | bus << 16 | device << 11 | offset);
    MachineOutDword(0xCFC, value);
}

// Indexed VGA registers of the primary card through the legacy ports.
inline uint8_t ReadIndexed(uint16_t port, uint8_t i) { return MachineOutByte(port, i), MachineInByte(port + 1); }
inline void WriteIndexed(uint16_t port, uint8_t index, uint8_t value)
{
    MachineOutByte(port, index);
    MachineOutByte(port + 1, value);
}
inline uint8_t ReadCr(uint8_t index) { return ReadIndexed(0x3D4, index); }
inline void WriteCr(uint8_t index, uint8_t value) { WriteIndexed(0x3D4, index, value); }
inline uint8_t ReadSr(uint8_t index) { return ReadIndexed(0x3C4, index); }
inline void WriteSr(uint8_t index, uint8_t value) { WriteIndexed(0x3C4, index, value); }

inline std::string RegText(HKEY root, const std::string& path, const char* name)
{
    return ReadRegistryRaw(root, path, name).c_str();
}

// The display driver's mode set runs at the timing's rate with its totals, the
// horizontal one in units of pixels_per_unit, within h_slack; asserts, so call it through
// ASSERT_NO_FATAL_FAILURE.
inline void SetDmtMode(int w, int h, int bits, int hz, const SimTiming** timing, int pixels_per_unit = 8,
                       int h_slack = 0)
{
    ASSERT_TRUE(SimSetCardMode(0, w, h, bits, hz)) << w << "x" << h << "x" << bits << "@" << hz;
    const SimTiming* t = *timing = SimFindTiming(w, h, hz, false);
    EXPECT_NEAR(t->htotal / pixels_per_unit, SimHTotal(0), h_slack) << w << "x" << h;
    EXPECT_EQ(t->vtotal, SimVTotal(0)) << w << "x" << h;
    EXPECT_NEAR(SimTimingFrameRate(t), SimRefreshHz(0), 1.0) << w << "x" << h << "x" << bits << "@" << hz;
}

// Flips the CRTC bits above the total fields: the horizontal total (in
// characters, less 5) moves by 256, the vertical one (less 2) by v_weight.
inline void ExpectOverflowBits(const SimTiming* t, uint8_t h_index, uint8_t h_bit, uint8_t v_index, uint8_t v_bit, int v_weight)
{
    SimWriteRegister(0, SIM_REG_CRTC, h_index, SimReadRegister(0, SIM_REG_CRTC, h_index) ^ h_bit);
    SimWriteRegister(0, SIM_REG_CRTC, v_index, SimReadRegister(0, SIM_REG_CRTC, v_index) ^ v_bit);
    EXPECT_EQ(((t->htotal / 8 - 5) ^ 256) + 5, SimHTotal(0)) << std::hex << "CR" << +h_index;
    EXPECT_EQ(((t->vtotal - 2) ^ v_weight) + 2, SimVTotal(0)) << std::hex << "CR" << +v_index;
}

// The machine as simstate.exe prints it.
inline std::string PrintedState()
{
    std::string text;
    FILE* f = tmpfile();
    if (!f) return text;
    SimPrintState(f);
    rewind(f);
    char buffer[4096];
    for (size_t n; (n = fread(buffer, 1, sizeof buffer, f)) > 0;) text.append(buffer, n);
    fclose(f);
    return text;
}

#endif
