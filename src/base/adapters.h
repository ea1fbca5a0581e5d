// The adapter table: one record per supported card, filled by detection.
#ifndef VISTREL_ADAPTERS_H
#define VISTREL_ADAPTERS_H

#include <stdint.h>

enum {
    ADAPTER_NO_ADJUST = 0x0001,       // no picture moving and no clock-based refresh
    ADAPTER_UNCLAMPED_RATE = 0x0004,  // Windows is asked for rates above the mode list's maximum
    ADAPTER_NO_CLOCK_REFRESH = 0x0008,  // refresh left to the display driver
    ADAPTER_TWIN = 0x0010,            // same ids as another card: match bus and device too
    ADAPTER_INFO_STALE = 0x0040,      // memory clock changed since the Information list was made
    ADAPTER_ATTACHED = 0x0100,        // attached to the desktop (Windows 98)
    ADAPTER_PRIMARY = 0x0200,         // primary display device (Windows 98)
    ADAPTER_AGP = 0x8000,             // behind the AGP bridge
};

enum { MAX_ADAPTERS = 8, DEVICE_NAME_SIZE = 32 };

// Rate in refresh_hz while this program itself is changing the mode.
enum { REFRESH_CHANGE_MARKER = 0xFFFF };

struct AdapterRecord {
    uint16_t vendor_id;
    uint16_t device_id;  // a Riva 128ZX (0x0019) is recorded as 0x0018
    uint8_t bus;         // 1 = behind the AGP bridge
    uint8_t devfn;       // 9x: PCI device/function byte; NT: slot number
    uint16_t bits_per_pixel;
    uint16_t width;
    uint16_t height;
    uint16_t refresh_hz;
    uint16_t chip_row;
    uint16_t display_index;  // Windows 98: display device number
    uint32_t flags;
    uint32_t mapped_registers;  // 9x: linear address of the register window
    char device_name[DEVICE_NAME_SIZE];  // Windows 98: display device name
};

extern AdapterRecord adapter_table[MAX_ADAPTERS];
extern int16_t adapter_count;
extern int16_t current_adapter;
extern int16_t monitor_count;

inline AdapterRecord* CurrentAdapter() { return &adapter_table[current_adapter]; }

#endif
