// Port access of a chip family: the kernel device on NT, and on Windows 9x
// either the port instructions or the chip's memory-mapped register window.
#ifndef VISTREL_CHIP_IO_H
#define VISTREL_CHIP_IO_H

#include <stdint.h>

// Where VGA port p lies in a family's register window.
struct ChipPortWindow {
    bool windowed;              // false: port instructions even when mapped
    uint16_t low_first, low_last;  // a range of ports with an offset of their own
    uint32_t low_offset;
    uint32_t offset;            // offset added to every other port
};

enum : uint16_t {
    VGA_SEQ_INDEX = 0x3C4,
    VGA_SEQ_DATA = 0x3C5,
    VGA_CRTC_INDEX = 0x3D4,
    VGA_CRTC_DATA = 0x3D5,
    VGA_GRAPHICS_INDEX = 0x3CE,
    VGA_GRAPHICS_DATA = 0x3CF,
    VGA_MISC_READ = 0x3CC,
};

uint32_t ChipInByte(const ChipPortWindow* w, uint16_t port);
uint32_t ChipOutByte(const ChipPortWindow* w, uint16_t port, uint8_t value);
uint32_t ChipInDword(const ChipPortWindow* w, uint16_t port);
uint32_t ChipOutDword(const ChipPortWindow* w, uint16_t port, uint32_t value);

// Index/data register pairs such as the sequencer and the CRT controller.
uint8_t ChipReadIndexed(const ChipPortWindow* w, uint16_t index_port, uint8_t index);
void ChipWriteIndexed(const ChipPortWindow* w, uint16_t index_port, uint8_t index, uint8_t value);

// Where a family's register window is found: a base address register of
// the card, masked, plus an offset.
struct RegisterWindowPlace {
    uint8_t config_offset;
    uint32_t mask;
    uint32_t added;
};
// The linear address of the current adapter's register window, or 0.
uint32_t MapRegisterWindow(const RegisterWindowPlace* place);

#endif
