// Requests to the two driver devices: the NT kernel device (ports and PCI
// configuration headers) and the Windows 9x mapping device.
#ifndef VISTREL_DRIVER_DEVICE_H
#define VISTREL_DRIVER_DEVICE_H

#include <windows.h>
#include <stdint.h>

enum : DWORD {
    ZENTRA_READ_PORT_BYTE = 0x9C406400,
    ZENTRA_READ_PORT_DWORD = 0x9C406408,
    ZENTRA_WRITE_PORT_BYTE = 0x9C40A440,
    ZENTRA_WRITE_PORT_DWORD = 0x9C40A448,
    ZENTRA_READ_PCI_HEADER = 0x9C40644C,
    HWGATE_MAP_PHYSICAL = 3,
};

enum { PCI_HEADER_BUFFER_SIZE = 400 };

extern const char zentra_device_name[];
extern const char hwgate_device_name[];

// NULL when the NT device cannot be opened.
HANDLE OpenZentraDevice();
void CloseZentraDevice(HANDLE device);
// Each returns 1 when the request was carried out.
int ZentraReadPortByte(HANDLE device, uint32_t port, uint8_t* value);
int ZentraReadPortDword(HANDLE device, uint32_t port, uint32_t* value);
int ZentraWritePortByte(HANDLE device, uint32_t port, uint8_t value);
int ZentraWritePortDword(HANDLE device, uint32_t port, uint32_t value);
// The configuration header of the device at that bus and device number.
int ZentraReadPciHeader(HANDLE device, uint16_t bus, uint16_t device_number, uint8_t header[PCI_HEADER_BUFFER_SIZE]);

// 9x: opens the mapping device for one use; NULL when it cannot be loaded.
HANDLE OpenHwgateDevice();
void CloseHwgateDevice(HANDLE device);
// The linear address at which the physical address is now reachable, or 0.
uint32_t HwgateMapPhysical(HANDLE device, uint32_t physical);

#endif
