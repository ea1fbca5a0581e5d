// The machine seam answered by the simulated machine. An empty machine for
// now: no cards, no driver devices; the display is Wine's own.
#include "hardware/machine.h"
#include "sim.h"

uint8_t MachineInByte(uint16_t port) { return 0xFF; }
uint32_t MachineInDword(uint16_t port) { return 0xFFFFFFFF; }
void MachineOutByte(uint16_t port, uint8_t value) {}
void MachineOutDword(uint16_t port, uint32_t value) {}
uint8_t MachineReadByte(uint32_t linear) { return 0xFF; }
uint16_t MachineReadWord(uint32_t linear) { return 0xFFFF; }
uint32_t MachineReadDword(uint32_t linear) { return 0xFFFFFFFF; }
void MachineWriteByte(uint32_t linear, uint8_t value) {}
void MachineWriteWord(uint32_t linear, uint16_t value) {}
void MachineWriteDword(uint32_t linear, uint32_t value) {}
int MachineVideoBios(BiosRegisters* regs) { return 0; }

HANDLE MachineOpenDevice(const char* name, DWORD access, DWORD share, DWORD creation, DWORD flags)
{
    SetLastError(ERROR_FILE_NOT_FOUND);
    return INVALID_HANDLE_VALUE;
}
BOOL MachineDeviceRequest(HANDLE device, DWORD code, void* in, DWORD in_size, void* out, DWORD out_size,
                          DWORD* returned)
{
    SetLastError(ERROR_INVALID_HANDLE);
    return FALSE;
}
BOOL MachineCloseDevice(HANDLE device) { return FALSE; }

BOOL MachineEnumDisplaySettings(const char* device, DWORD mode_number, DEVMODEA* mode)
{
    return EnumDisplaySettingsA(device, mode_number, mode);
}
LONG MachineChangeDisplaySettings(DEVMODEA* mode, DWORD flags) { return ChangeDisplaySettingsA(mode, flags); }
int MachineScreenRefresh()
{
    HDC dc = GetDC(NULL);
    int hz = GetDeviceCaps(dc, VREFRESH);
    ReleaseDC(NULL, dc);
    return hz;
}
int MachineDeviceModeField(const char* device, int cap_index)
{
    HDC dc = CreateDCA(device, NULL, NULL, NULL);
    if (!dc) return 0;
    int value = GetDeviceCaps(dc, cap_index);
    DeleteDC(dc);
    return value;
}
int MachineFindDisplayFunctions(MachineDisplayFunctions* out)
{
    ZeroMemory(out, sizeof *out);
    return 1;
}
