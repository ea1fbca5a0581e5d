// The two driver devices and the video BIOS, decoding their requests as the
// real drivers do: the NT kernel device "\\.\Zentra" (ports and PCI
// configuration headers) and the 9x dynamic device "\\.\HWGATE.VXD"
// (physical memory mapping).
#include <string.h>

#include "hardware/machine.h"
#include "machine_state.h"

namespace {

enum DeviceKind { DEVICE_NONE, DEVICE_NT, DEVICE_VXD };

// NT requests: device type 0x9C40, METHOD_BUFFERED.
enum : DWORD {
    IOCTL_READ_PORT_BYTE = 0x9C406400,
    IOCTL_READ_PORT_DWORD = 0x9C406408,
    IOCTL_WRITE_PORT_BYTE = 0x9C40A440,
    IOCTL_WRITE_PORT_DWORD = 0x9C40A448,
    IOCTL_READ_PCI_HEADER = 0x9C40644C,
};
enum : DWORD { VXD_MAP_PHYSICAL = 3 };

struct RequestShape {
    DWORD code;
    DWORD in_size, out_size;  // least sizes the driver accepts
};
const RequestShape nt_requests[] = {
    {IOCTL_READ_PORT_BYTE, 4, 1},
    {IOCTL_READ_PORT_DWORD, 4, 4},
    {IOCTL_WRITE_PORT_BYTE, 5, 0},
    {IOCTL_WRITE_PORT_DWORD, 8, 0},
    {IOCTL_READ_PCI_HEADER, 4, 400},  // the interface's header buffer
};
const RequestShape vxd_requests[] = {
    {VXD_MAP_PHYSICAL, 4, 4},
};

// Handles are this process's own: they never reach a Windows call.
enum { MAX_HANDLES = 16 };
const uintptr_t handle_base = 0x7A5E0000;
DeviceKind handles[MAX_HANDLES];

DeviceKind HandleKind(HANDLE device)
{
    uintptr_t v = (uintptr_t)device;
    if (v < handle_base || (v - handle_base) % 4 || (v - handle_base) / 4 >= MAX_HANDLES) return DEVICE_NONE;
    return handles[(v - handle_base) / 4];
}

HANDLE NewHandle(DeviceKind kind)
{
    for (int i = 0; i < MAX_HANDLES; i++) {
        if (handles[i] == DEVICE_NONE) {
            handles[i] = kind;
            return (HANDLE)(handle_base + 4 * i);
        }
    }
    SetLastError(ERROR_TOO_MANY_OPEN_FILES);
    return INVALID_HANDLE_VALUE;
}

const RequestShape* FindShape(const RequestShape* table, size_t count, DWORD code)
{
    for (size_t i = 0; i < count; i++)
        if (table[i].code == code) return &table[i];
    return NULL;
}

uint32_t Load32(const void* p)
{
    uint32_t v;
    memcpy(&v, p, 4);
    return v;
}

BOOL Fail(DWORD error)
{
    SetLastError(error);
    return FALSE;
}

BOOL NtRequest(DWORD code, const uint8_t* in, uint8_t* out, DWORD* returned)
{
    *returned = 0;
    if (code == IOCTL_READ_PCI_HEADER) {
        uint16_t bus, device;
        memcpy(&bus, in, 2);
        memcpy(&device, in + 2, 2);
        if (device > 31) return Fail(ERROR_INVALID_PARAMETER);
        // Like HalGetBusData: an empty slot gives only the invalid vendor id.
        if (PciConfigRead(bus, device, 0, 0) == 0xFF && PciConfigRead(bus, device, 0, 1) == 0xFF) {
            out[0] = out[1] = 0xFF;
            *returned = 2;
            return TRUE;
        }
        for (int i = 0; i < 256; i++) out[i] = PciConfigRead(bus, device, 0, i);
        *returned = 256;
        return TRUE;
    }
    uint32_t port = Load32(in);
    if (port > 0xFFFF) return Fail(ERROR_INVALID_PARAMETER);
    switch (code) {
    case IOCTL_READ_PORT_BYTE:
        out[0] = SimPortRead((uint16_t)port);
        *returned = 1;
        return TRUE;
    case IOCTL_READ_PORT_DWORD: {
        uint32_t v = MachineInDword((uint16_t)port);
        memcpy(out, &v, 4);
        *returned = 4;
        return TRUE;
    }
    case IOCTL_WRITE_PORT_BYTE:
        SimPortWrite((uint16_t)port, in[4]);
        return TRUE;
    case IOCTL_WRITE_PORT_DWORD:
        MachineOutDword((uint16_t)port, Load32(in + 4));
        return TRUE;
    }
    return Fail(ERROR_INVALID_FUNCTION);
}

}  // namespace

HANDLE MachineOpenDevice(const char* name, DWORD access, DWORD share, DWORD creation, DWORD flags)
{
    sim_counters.device_opens++;
    bool nt = sim && sim->config.windows == SIM_WINDOWS_NT4;
    if (sim && name && nt && sim->config.nt_device && lstrcmpiA(name, "\\\\.\\Zentra") == 0) {
        if (access != (GENERIC_READ | GENERIC_WRITE) || share != (FILE_SHARE_READ | FILE_SHARE_WRITE) ||
            creation != OPEN_EXISTING || flags != 0) {
            SetLastError(ERROR_ACCESS_DENIED);
            return INVALID_HANDLE_VALUE;
        }
        return NewHandle(DEVICE_NT);
    }
    if (sim && name && !nt && sim->config.vxd_device && lstrcmpiA(name, "\\\\.\\HWGATE.VXD") == 0) {
        // Windows 9x loads a dynamic device only for this creation mode.
        if (creation != CREATE_NEW || !(flags & FILE_FLAG_DELETE_ON_CLOSE)) {
            SetLastError(ERROR_FILE_NOT_FOUND);
            return INVALID_HANDLE_VALUE;
        }
        return NewHandle(DEVICE_VXD);
    }
    SetLastError(ERROR_FILE_NOT_FOUND);
    return INVALID_HANDLE_VALUE;
}

BOOL MachineDeviceRequest(HANDLE device, DWORD code, void* in, DWORD in_size, void* out, DWORD out_size,
                          DWORD* returned)
{
    sim_counters.device_requests++;
    DeviceKind kind = sim ? HandleKind(device) : DEVICE_NONE;
    if (kind == DEVICE_NONE) return Fail(ERROR_INVALID_HANDLE);
    const RequestShape* shape = kind == DEVICE_NT
                                    ? FindShape(nt_requests, sizeof nt_requests / sizeof *nt_requests, code)
                                    : FindShape(vxd_requests, sizeof vxd_requests / sizeof *vxd_requests, code);
    if (!shape) return Fail(ERROR_INVALID_FUNCTION);
    if (in_size < shape->in_size || (shape->in_size && !in)) return Fail(ERROR_INSUFFICIENT_BUFFER);
    if (out_size < shape->out_size || (shape->out_size && !out)) return Fail(ERROR_INSUFFICIENT_BUFFER);
    if (kind == DEVICE_NT) {
        // NT's DeviceIoControl stores the count without checking the pointer.
        if (!returned) return Fail(ERROR_INVALID_PARAMETER);
        return NtRequest(code, (const uint8_t*)in, (uint8_t*)out, returned);
    }
    // The mapping device hands out linear = physical: the machine decodes
    // window accesses by the address itself.
    uint32_t physical = Load32(in);
    memcpy(out, &physical, 4);
    if (returned) *returned = 4;
    return TRUE;
}

BOOL MachineCloseDevice(HANDLE device)
{
    uintptr_t v = (uintptr_t)device;
    if (HandleKind(device) == DEVICE_NONE) return Fail(ERROR_INVALID_HANDLE);
    handles[(v - handle_base) / 4] = DEVICE_NONE;
    sim_counters.device_closes++;
    return TRUE;
}

// Interrupt 10h of the primary card's BIOS. Only the Tseng BIOS answers
// function 12h, BL = F2h, with the memory it found.
int MachineVideoBios(BiosRegisters* regs)
{
    int card = SimPrimaryCard();
    if (card < 0 || sim->config.windows == SIM_WINDOWS_NT4 || !sim->config.video_bios || !regs) return 0;
    if (regs->ax != 0x1203 || (regs->bx & 0xFF) != 0xF2) return 0;
    if (SimCardChip(card)->family != SIM_FAMILY_ET6000) return 0;
    regs->bx = Et6000BiosMemory(card);
    regs->ax = 0x1212;
    return 1;
}
