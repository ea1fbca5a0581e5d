// Helpers for the simulated machine's device tests: build machines, and
// reach the hardware the way the program does, through the machine seam.
#ifndef VISTREL_TESTS_SIM_TEST_H
#define VISTREL_TESTS_SIM_TEST_H

#include <gtest/gtest.h>
#include <windows.h>

#include <string>

#include "hardware/machine.h"
#include "sim.h"

inline SimMachineConfig MachineWith(int windows, uint16_t vendor, uint16_t device, int bus = 0, int slot = 10)
{
    SimMachineConfig config;
    SimDefaultMachine(&config);
    config.windows = windows;
    // A 16-bit desktop exercises the clock doubling and the 4-pixel characters.
    config.start_bits = 16;
    SimDefaultCard(&config.cards[0], vendor, device);
    config.cards[0].bus = (uint8_t)bus;
    config.cards[0].device = (uint8_t)slot;
    return config;
}

inline void AddCard(SimMachineConfig* config, uint16_t vendor, uint16_t device, int bus, int slot)
{
    SimCardConfig* card = &config->cards[config->card_count++];
    SimDefaultCard(card, vendor, device);
    card->bus = (uint8_t)bus;
    card->device = (uint8_t)slot;
}

// PCI configuration mechanism #1.
inline uint32_t PciRead(int bus, int device, int function, int offset)
{
    MachineOutDword(0xCF8, 0x80000000u | bus << 16 | device << 11 | function << 8 | (offset & 0xFC));
    return MachineInDword(0xCFC);
}
inline void PciWrite(int bus, int device, int function, int offset, uint32_t value)
{
    MachineOutDword(0xCF8, 0x80000000u | bus << 16 | device << 11 | function << 8 | (offset & 0xFC));
    MachineOutDword(0xCFC, value);
}

// Indexed VGA registers through the legacy ports (the primary card).
inline uint8_t ReadIndexed(uint16_t index_port, uint8_t index)
{
    MachineOutByte(index_port, index);
    return MachineInByte(index_port + 1);
}
inline void WriteIndexed(uint16_t index_port, uint8_t index, uint8_t value)
{
    MachineOutByte(index_port, index);
    MachineOutByte(index_port + 1, value);
}
inline uint8_t ReadCr(uint8_t index) { return ReadIndexed(0x3D4, index); }
inline void WriteCr(uint8_t index, uint8_t value) { WriteIndexed(0x3D4, index, value); }
inline uint8_t ReadSr(uint8_t index) { return ReadIndexed(0x3C4, index); }
inline void WriteSr(uint8_t index, uint8_t value) { WriteIndexed(0x3C4, index, value); }

inline std::string RegText(HKEY root, const char* path, const char* name)
{
    HKEY key;
    if (RegOpenKeyExA(root, path, 0, KEY_QUERY_VALUE, &key) != ERROR_SUCCESS) return "<no key>";
    char buffer[512];
    DWORD size = sizeof buffer - 1, type;
    LONG r = RegQueryValueExA(key, name, NULL, &type, (BYTE*)buffer, &size);
    RegCloseKey(key);
    if (r != ERROR_SUCCESS) return "<no value>";
    buffer[size] = 0;
    return buffer;
}

inline bool RegKeyExists(HKEY root, const char* path)
{
    HKEY key;
    if (RegOpenKeyExA(root, path, 0, KEY_QUERY_VALUE, &key) != ERROR_SUCCESS) return false;
    RegCloseKey(key);
    return true;
}

#endif
