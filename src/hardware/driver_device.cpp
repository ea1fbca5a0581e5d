#include "hardware/driver_device.h"

#include "base/runtime.h"
#include "hardware/machine.h"

const char zentra_device_name[] = "\\\\.\\Zentra";
const char hwgate_device_name[] = "\\\\.\\HWGATE.VXD";

#pragma pack(push, 1)
struct PortByteWrite {
    uint32_t port;
    uint8_t value;
};
#pragma pack(pop)
struct PortDwordWrite {
    uint32_t port;
    uint32_t value;
};
struct PciHeaderRequest {
    uint16_t bus;
    uint16_t device;
};
static_assert(sizeof(PortByteWrite) == 5, "the device takes the byte write packed");
static_assert(sizeof(PortDwordWrite) == 8, "port and value");
static_assert(sizeof(PciHeaderRequest) == 4, "bus and device number");

static HANDLE ValidOrNull(HANDLE h) { return h == INVALID_HANDLE_VALUE ? NULL : h; }

HANDLE OpenZentraDevice()
{
    return ValidOrNull(MachineOpenDevice(zentra_device_name, GENERIC_READ | GENERIC_WRITE,
                                         FILE_SHARE_READ | FILE_SHARE_WRITE, OPEN_EXISTING, 0));
}

void CloseZentraDevice(HANDLE device)
{
    if (device) MachineCloseDevice(device);
}

static int Request(HANDLE device, DWORD code, void* in, DWORD in_size, void* out, DWORD out_size)
{
    if (!device) return 0;
    DWORD returned = 0;
    return MachineDeviceRequest(device, code, in, in_size, out, out_size, &returned) ? 1 : 0;
}

int ZentraReadPortByte(HANDLE device, uint32_t port, uint8_t* value)
{
    return Request(device, ZENTRA_READ_PORT_BYTE, &port, sizeof port, value, sizeof *value);
}

int ZentraReadPortDword(HANDLE device, uint32_t port, uint32_t* value)
{
    return Request(device, ZENTRA_READ_PORT_DWORD, &port, sizeof port, value, sizeof *value);
}

int ZentraWritePortByte(HANDLE device, uint32_t port, uint8_t value)
{
    PortByteWrite in = {port, value};
    return Request(device, ZENTRA_WRITE_PORT_BYTE, &in, sizeof in, NULL, 0);
}

int ZentraWritePortDword(HANDLE device, uint32_t port, uint32_t value)
{
    PortDwordWrite in = {port, value};
    return Request(device, ZENTRA_WRITE_PORT_DWORD, &in, sizeof in, NULL, 0);
}

int ZentraReadPciHeader(HANDLE device, uint16_t bus, uint16_t device_number, uint8_t header[PCI_HEADER_BUFFER_SIZE])
{
    PciHeaderRequest in = {bus, device_number};
    return Request(device, ZENTRA_READ_PCI_HEADER, &in, sizeof in, header, PCI_HEADER_BUFFER_SIZE);
}

HANDLE OpenHwgateDevice()
{
    return ValidOrNull(MachineOpenDevice(hwgate_device_name, 0, 0, CREATE_NEW, FILE_FLAG_DELETE_ON_CLOSE));
}

void CloseHwgateDevice(HANDLE device)
{
    if (device) MachineCloseDevice(device);
}

uint32_t HwgateMapPhysical(HANDLE device, uint32_t physical)
{
    uint8_t out[5];
    memset(out, 0, sizeof out);
    if (!Request(device, HWGATE_MAP_PHYSICAL, &physical, sizeof physical, out, sizeof out)) return 0;
    uint32_t linear;
    memcpy(&linear, out, sizeof linear);
    return linear;
}
