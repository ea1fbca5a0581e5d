#include "hardware/pci.h"

#include "hardware/machine.h"

enum : uint16_t { PCI_CONFIG_ADDRESS = 0xCF8, PCI_CONFIG_DATA = 0xCFC };

struct PciHeaderField {
    uint8_t offset;
};
static const PciHeaderField pci_vendor_device = {0x00};
static const PciHeaderField pci_header_type = {0x0C};  // byte 2 of this dword
static const PciHeaderField pci_secondary_bus = {0x18};  // byte 1 of this dword

static const uint32_t pci_enable = 0x80000000u;
static const uint8_t header_multifunction = 0x80;
static const uint8_t header_layout_mask = 0x7F;
static const uint8_t header_layout_bridge = 0x01;
enum { PCI_MAX_BUSES = 256, PCI_SLOTS = 32, PCI_FUNCTIONS = 8 };

uint32_t PciReadConfigDword(uint8_t bus, uint8_t devfn, uint8_t offset)
{
    MachineOutDword(PCI_CONFIG_ADDRESS, pci_enable | (uint32_t)bus << 16 | (uint32_t)devfn << 8 | (offset & 0xFC));
    return MachineInDword(PCI_CONFIG_DATA);
}

uint16_t PciReadConfigWord(uint8_t bus, uint8_t devfn, uint8_t offset)
{
    return (uint16_t)(PciReadConfigDword(bus, devfn, offset) >> ((offset & 2) * 8));
}

struct PciSearch {
    uint16_t vendor_id, device_id;
    int remaining;  // matches still to skip
    bool bus_exists[PCI_MAX_BUSES];
};

// One present function: a match, or a bridge that opens a further bus.
static bool VisitFunction(PciSearch* s, uint8_t bus, uint8_t devfn, uint32_t ids)
{
    if ((ids & 0xFFFF) == s->vendor_id && (ids >> 16) == s->device_id && s->remaining-- == 0) return true;
    uint8_t layout = (uint8_t)(PciReadConfigDword(bus, devfn, pci_header_type.offset) >> 16) & header_layout_mask;
    if (layout == header_layout_bridge) {
        uint8_t secondary = (uint8_t)(PciReadConfigDword(bus, devfn, pci_secondary_bus.offset) >> 8);
        if (secondary > bus) s->bus_exists[secondary] = true;
    }
    return false;
}

static bool IsMultiFunction(uint8_t bus, uint8_t devfn)
{
    return (PciReadConfigDword(bus, devfn, pci_header_type.offset) >> 16) & header_multifunction;
}

static bool ScanBus(PciSearch* s, uint8_t bus, uint8_t* devfn_found)
{
    for (uint8_t slot = 0; slot < PCI_SLOTS; ++slot) {
        for (uint8_t function = 0; function < PCI_FUNCTIONS; ++function) {
            uint8_t devfn = (uint8_t)(slot << 3 | function);
            uint32_t ids = PciReadConfigDword(bus, devfn, pci_vendor_device.offset);
            bool absent = (ids & 0xFFFF) == 0xFFFF || (ids & 0xFFFF) == 0;
            if (!absent && VisitFunction(s, bus, devfn, ids)) {
                *devfn_found = devfn;
                return true;
            }
            if (function == 0 && (absent || !IsMultiFunction(bus, devfn))) break;
        }
    }
    return false;
}

// Buses are visited in ascending order; a bridge always leads to a higher
// bus number, so every bus is known before its turn comes.
int PciFindDevice(uint16_t vendor_id, uint16_t device_id, int index, uint8_t* bus, uint8_t* devfn)
{
    static PciSearch search;
    search = PciSearch();
    search.vendor_id = vendor_id;
    search.device_id = device_id;
    search.remaining = index;
    search.bus_exists[0] = true;
    for (int b = 0; b < PCI_MAX_BUSES; ++b) {
        if (search.bus_exists[b] && ScanBus(&search, (uint8_t)b, devfn)) {
            *bus = (uint8_t)b;
            return 1;
        }
    }
    return 0;
}
