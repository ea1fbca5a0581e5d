// Helpers for the simulated machine's own tests: machines built in code, and
// the hardware reached the way the program reaches it, through the seam.
#ifndef VISTREL_TESTS_SIM_TEST_H
#define VISTREL_TESTS_SIM_TEST_H

#include <gtest/gtest.h>

#include "hardware/machine.h"
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

// simstate's report of the current machine.
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
