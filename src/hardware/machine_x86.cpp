// The machine seam on a real PC: port instructions, register windows,
// the driver devices and the display driver through USER32 and GDI32.
#include "hardware/machine.h"

#include <ddraw.h>

#include "base/runtime.h"

uint8_t MachineInByte(uint16_t port)
{
    uint8_t value;
    __asm__ __volatile__("inb %w1, %b0" : "=a"(value) : "Nd"(port));
    return value;
}

uint32_t MachineInDword(uint16_t port)
{
    uint32_t value;
    __asm__ __volatile__("inl %w1, %0" : "=a"(value) : "Nd"(port));
    return value;
}

void MachineOutByte(uint16_t port, uint8_t value)
{
    __asm__ __volatile__("outb %b0, %w1" : : "a"(value), "Nd"(port));
}

void MachineOutDword(uint16_t port, uint32_t value)
{
    __asm__ __volatile__("outl %0, %w1" : : "a"(value), "Nd"(port));
}

uint8_t MachineReadByte(uint32_t linear) { return *(volatile uint8_t*)(uintptr_t)linear; }
uint16_t MachineReadWord(uint32_t linear) { return *(volatile uint16_t*)(uintptr_t)linear; }
uint32_t MachineReadDword(uint32_t linear) { return *(volatile uint32_t*)(uintptr_t)linear; }
void MachineWriteByte(uint32_t linear, uint8_t value) { *(volatile uint8_t*)(uintptr_t)linear = value; }
void MachineWriteWord(uint32_t linear, uint16_t value) { *(volatile uint16_t*)(uintptr_t)linear = value; }
void MachineWriteDword(uint32_t linear, uint32_t value) { *(volatile uint32_t*)(uintptr_t)linear = value; }

// A 32-bit Windows program cannot raise interrupt 10h itself; the only BIOS
// service the program needs has a registry equivalent on every system but
// Windows 95, where it is not available.
int MachineVideoBios(BiosRegisters* regs) { return 0; }

HANDLE MachineOpenDevice(const char* name, DWORD access, DWORD share, DWORD creation, DWORD flags)
{
    return CreateFileA(name, access, share, NULL, creation, flags, NULL);
}

BOOL MachineDeviceRequest(HANDLE device, DWORD code, void* in, DWORD in_size, void* out, DWORD out_size,
                          DWORD* returned)
{
    return DeviceIoControl(device, code, in, in_size, out, out_size, returned, NULL);
}

BOOL MachineCloseDevice(HANDLE device) { return CloseHandle(device); }

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

typedef HRESULT(WINAPI* DirectDrawCreateProc)(GUID*, IDirectDraw**, IUnknown*);

uint32_t MachineVideoMemory()
{
    // Windows 95 may have no DirectX at all, so ddraw.dll is not imported.
    HMODULE ddraw = LoadLibraryA("ddraw.dll");
    if (!ddraw) return 0;
    uint32_t total = 0;
    DirectDrawCreateProc create = (DirectDrawCreateProc)GetProcAddress(ddraw, "DirectDrawCreate");
    IDirectDraw* draw = NULL;
    if (create && SUCCEEDED(create(NULL, &draw, NULL)) && draw) {
        // The DirectX 3 form of the capabilities is the oldest that every
        // runtime since takes.
        DDCAPS_DX3 caps;
        memset(&caps, 0, sizeof caps);
        caps.dwSize = sizeof caps;
        if (SUCCEEDED(draw->GetCaps((DDCAPS*)&caps, NULL))) total = caps.dwVidMemTotal;
        draw->Release();
    }
    FreeLibrary(ddraw);
    return total;
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
    HMODULE user32 = GetModuleHandleA("USER32");
    if (!user32) {
        ZeroMemory(out, sizeof *out);
        return 0;
    }
    out->EnumDisplayDevicesA = (EnumDisplayDevicesA_fn)GetProcAddress(user32, "EnumDisplayDevicesA");
    out->EnumDisplayMonitors = (EnumDisplayMonitors_fn)GetProcAddress(user32, "EnumDisplayMonitors");
    out->GetMonitorInfoA = (GetMonitorInfoA_fn)GetProcAddress(user32, "GetMonitorInfoA");
    out->MonitorFromPoint = (MonitorFromPoint_fn)GetProcAddress(user32, "MonitorFromPoint");
    out->MonitorFromRect = (MonitorFromRect_fn)GetProcAddress(user32, "MonitorFromRect");
    out->MonitorFromWindow = (MonitorFromWindow_fn)GetProcAddress(user32, "MonitorFromWindow");
    out->ChangeDisplaySettingsExA = (ChangeDisplaySettingsExA_fn)GetProcAddress(user32, "ChangeDisplaySettingsExA");
    return 1;
}
