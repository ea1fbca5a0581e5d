#include "chips/chip_io.h"

#include "base/adapters.h"
#include "base/state.h"
#include "hardware/driver_device.h"
#include "hardware/machine.h"
#include "hardware/pci.h"
#include "hardware/register_access.h"

// The linear address of the port in the current adapter's window, or 0 when
// the port instructions reach it.
static uint32_t WindowAddress(const ChipPortWindow* w, uint16_t port)
{
    uint32_t base = CurrentAdapter()->mapped_registers;
    if (!w->windowed || !base) return 0;
    if (port >= w->low_first && port <= w->low_last) return base + w->low_offset + port;
    return base + w->offset + port;
}

uint32_t ChipInByte(const ChipPortWindow* w, uint16_t port)
{
    if (platform == PLATFORM_NT) return ReadPortByte(port);
    uint32_t address = WindowAddress(w, port);
    return address ? MachineReadByte(address) : MachineInByte(port);
}

uint32_t ChipOutByte(const ChipPortWindow* w, uint16_t port, uint8_t value)
{
    if (platform == PLATFORM_NT) return WritePortByte(port, value);
    uint32_t address = WindowAddress(w, port);
    if (address) MachineWriteByte(address, value);
    else MachineOutByte(port, value);
    return value;
}

uint32_t ChipInDword(const ChipPortWindow* w, uint16_t port)
{
    if (platform == PLATFORM_NT) return ReadPortDword(port);
    uint32_t address = WindowAddress(w, port);
    return address ? MachineReadDword(address) : MachineInDword(port);
}

uint32_t ChipOutDword(const ChipPortWindow* w, uint16_t port, uint32_t value)
{
    if (platform == PLATFORM_NT) return WritePortDword(port, value);
    uint32_t address = WindowAddress(w, port);
    if (address) MachineWriteDword(address, value);
    else MachineOutDword(port, value);
    return value ? value : 1;
}

uint8_t ChipReadIndexed(const ChipPortWindow* w, uint16_t index_port, uint8_t index)
{
    ChipOutByte(w, index_port, index);
    return (uint8_t)ChipInByte(w, (uint16_t)(index_port + 1));
}

void ChipWriteIndexed(const ChipPortWindow* w, uint16_t index_port, uint8_t index, uint8_t value)
{
    ChipOutByte(w, index_port, index);
    ChipOutByte(w, (uint16_t)(index_port + 1), value);
}

uint32_t MapRegisterWindow(const RegisterWindowPlace* place)
{
    HANDLE device = OpenHwgateDevice();
    if (!device) return 0;
    const AdapterRecord* a = CurrentAdapter();
    uint32_t base = PciReadConfigDword(a->bus, a->devfn, place->config_offset) & place->mask;
    uint32_t linear = base ? HwgateMapPhysical(device, base + place->added) : 0;
    CloseHwgateDevice(device);
    return linear;
}
