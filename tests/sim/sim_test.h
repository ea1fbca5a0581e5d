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

// The refresh rate as the program reads it from an S3 chip: pixel clock
// from SR12/SR13 (SR29 on a Savage3D), halved by SR18 bit 7 above 8 bits,
// over character width, horizontal and vertical totals.
struct S3Reading {
    double pixel_hz;
    int htotal, vtotal, char_width;
    double refresh() const { return pixel_hz / ((double)char_width * htotal * vtotal); }
};
inline S3Reading ReadS3Refresh(bool savage, bool two_bit_r, int bits)
{
    WriteSr(0x08, 0x06);
    int m, n, r;
    uint8_t sr12 = ReadSr(0x12), sr13 = ReadSr(0x13);
    if (savage) {
        uint8_t sr29 = ReadSr(0x29);
        m = sr13 + 256 * ((sr29 >> 3) & 1);
        n = (sr12 & 0x3F) + 64 * ((sr29 >> 4) & 1);
        r = (sr12 >> 6) + 4 * ((sr29 >> 2) & 1);
    } else {
        m = sr13 & 0x7F;
        n = sr12 & 0x1F;
        r = two_bit_r ? (sr12 >> 5) & 3 : (sr12 >> 5) & 7;
    }
    S3Reading reading;
    reading.pixel_hz = 14318180.0 * (m + 2) / ((n + 2) * (double)(1 << r));
    if (bits != 8 && (ReadSr(0x18) & 0x80)) reading.pixel_hz /= 2;
    int t = ReadCr(0x00) + 256 * (ReadCr(0x5D) & 1);
    if (savage) t += 512 * (ReadCr(0x5F) & 3);
    if (ReadCr(0x43) & 0x80) t *= 2;
    reading.htotal = t + 5;
    uint8_t cr07 = ReadCr(0x07);
    reading.vtotal = ReadCr(0x06) + 256 * (cr07 & 1) + 512 * ((cr07 >> 5) & 1) + 1024 * (ReadCr(0x5E) & 1) + 2;
    reading.char_width = bits == 15 || bits == 16 ? 4 : 8;
    return reading;
}

#endif
