// PCI configuration space on Windows 9x, through configuration mechanism #1.
#ifndef VISTREL_PCI_H
#define VISTREL_PCI_H

#include <stdint.h>

// The index-th device (from 0) with these ids, in bus/device/function order.
int PciFindDevice(uint16_t vendor_id, uint16_t device_id, int index, uint8_t* bus, uint8_t* devfn);
uint16_t PciReadConfigWord(uint8_t bus, uint8_t devfn, uint8_t offset);
uint32_t PciReadConfigDword(uint8_t bus, uint8_t devfn, uint8_t offset);

#endif
