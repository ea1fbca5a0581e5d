// The machine beneath the program: everything user-mode Win32 does not give.
//
// Two implementations exist: machine_x86.cpp drives the real PC (port
// instructions, register windows, the driver devices, the display driver
// through USER32/GDI32), and sim/ answers from the simulated machine.
// Only bytes move through here; every encoding, register protocol and
// decision stays in the program.
#ifndef VISTREL_MACHINE_H
#define VISTREL_MACHINE_H

#include <windows.h>
#include <stdint.h>

// CPU port instructions (Windows 9x lets a program execute them itself).
uint8_t MachineInByte(uint16_t port);
uint32_t MachineInDword(uint16_t port);
void MachineOutByte(uint16_t port, uint8_t value);
void MachineOutDword(uint16_t port, uint32_t value);

// A chip's memory-mapped register window, at a linear address that the 9x
// mapping device handed out.
uint8_t MachineReadByte(uint32_t linear);
uint16_t MachineReadWord(uint32_t linear);
uint32_t MachineReadDword(uint32_t linear);
void MachineWriteByte(uint32_t linear, uint8_t value);
void MachineWriteWord(uint32_t linear, uint16_t value);
void MachineWriteDword(uint32_t linear, uint32_t value);

// The video BIOS (interrupt 10h) with the 16-bit registers it takes and
// gives back. Returns 1 when the call could be made.
struct BiosRegisters {
    uint16_t ax, bx, cx, dx;
};
int MachineVideoBios(BiosRegisters* regs);

// The driver devices "\\.\Zentra" and "\\.\HWGATE.VXD", with the semantics of
// CreateFileA, DeviceIoControl (synchronous) and CloseHandle.
HANDLE MachineOpenDevice(const char* name, DWORD access, DWORD share, DWORD creation, DWORD flags);
BOOL MachineDeviceRequest(HANDLE device, DWORD code, void* in, DWORD in_size, void* out, DWORD out_size,
                          DWORD* returned);
BOOL MachineCloseDevice(HANDLE device);

// The display driver, as Windows reports and changes it.
BOOL MachineEnumDisplaySettings(const char* device, DWORD mode_number, DEVMODEA* mode);
LONG MachineChangeDisplaySettings(DEVMODEA* mode, DWORD flags);
// GetDeviceCaps(VREFRESH) of the screen.
int MachineScreenRefresh();
// The display memory the primary display driver reports to DirectDraw
// (dwVidMemTotal), in bytes; 0 without DirectDraw.
uint32_t MachineVideoMemory();
// GetDeviceCaps(HORZRES, VERTRES or BITSPIXEL) of a DC made with CreateDCA of
// the device name; 0 when no DC can be made.
int MachineDeviceModeField(const char* device, int cap_index);

// The Windows 98 functions, which Windows 95 and NT 4.0 lack: NULL there.
typedef BOOL(WINAPI* EnumDisplayDevicesA_fn)(LPCSTR, DWORD, PDISPLAY_DEVICEA, DWORD);
typedef BOOL(WINAPI* EnumDisplayMonitors_fn)(HDC, LPCRECT, MONITORENUMPROC, LPARAM);
typedef BOOL(WINAPI* GetMonitorInfoA_fn)(HMONITOR, LPMONITORINFO);
typedef HMONITOR(WINAPI* MonitorFromPoint_fn)(POINT, DWORD);
typedef HMONITOR(WINAPI* MonitorFromRect_fn)(LPCRECT, DWORD);
typedef HMONITOR(WINAPI* MonitorFromWindow_fn)(HWND, DWORD);
typedef LONG(WINAPI* ChangeDisplaySettingsExA_fn)(LPCSTR, DEVMODEA*, HWND, DWORD, LPVOID);
struct MachineDisplayFunctions {
    EnumDisplayDevicesA_fn EnumDisplayDevicesA;
    EnumDisplayMonitors_fn EnumDisplayMonitors;
    GetMonitorInfoA_fn GetMonitorInfoA;
    MonitorFromPoint_fn MonitorFromPoint;
    MonitorFromRect_fn MonitorFromRect;
    MonitorFromWindow_fn MonitorFromWindow;
    ChangeDisplaySettingsExA_fn ChangeDisplaySettingsExA;
};
// Looked up once per call in USER32 (GetModuleHandleA + GetProcAddress); a
// member is NULL where the system lacks the function. Returns 0 when USER32
// has no module handle.
int MachineFindDisplayFunctions(MachineDisplayFunctions* out);

#endif
