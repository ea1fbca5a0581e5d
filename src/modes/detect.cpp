#include "modes/detect.h"

#include <stddef.h>
#include <windows.h>

#include "base/adapters.h"
#include "base/runtime.h"
#include "base/settings.h"
#include "base/state.h"
#include "chips/chips.h"
#include "hardware/driver_device.h"
#include "hardware/driver_key.h"
#include "hardware/machine.h"
#include "hardware/pci.h"
#include "modes/mode_change.h"
#include "modes/mode_list.h"

static const uint16_t riva_128zx = 0x0019;
static const uint16_t riva_128 = 0x0018;
static const int defref_no_clock_refresh = 17;
static const char config_manager_enum[] = "Config Manager\\Enum";
static const char class_key_prefix[] = "System\\CurrentControlSet\\Services\\Class\\";
static const char nt_video_map[] = "hardware\\devicemap\\video";
static const char nt_video0_value[] = "\\device\\video0";
static const uint8_t nt_bus_order[] = {1, 0};
enum { NT_SLOTS = 32, HARDWARE_KEY_SIZE = 120, NODE_KEY_SIZE = 80, DESCRIPTION_SIZE = 100 };
// The display device structure as Windows 98 has it, without the later
// DeviceID and DeviceKey.
static const DWORD display_device_size = 168;
static_assert(offsetof(DISPLAY_DEVICEA, DeviceID) == 168, "the Windows 98 display device structure");

int FindChipRow(uint16_t vendor_id, uint16_t device_id, uint16_t* row)
{
    for (uint16_t i = 0; i < CHIP_TABLE_ROWS; ++i) {
        if (chip_table[i].vendor_id == vendor_id && chip_table[i].device_id == device_id) {
            *row = i;
            return 1;
        }
    }
    return 0;
}

int CountDisplayDevices()
{
    if (!IsWindows98()) return 1;
    MachineDisplayFunctions f;
    if (!MachineFindDisplayFunctions(&f) || !f.EnumDisplayDevicesA) return 1;
    int count = 0;
    DISPLAY_DEVICEA device;
    for (;;) {
        memset(&device, 0, sizeof device);
        device.cb = display_device_size;
        if (!f.EnumDisplayDevicesA(NULL, (DWORD)count, &device, 0)) break;
        ++count;
    }
    return count > 0 ? count : 1;
}

static AdapterRecord* NewRecord(uint16_t vendor_id, uint16_t device_id, uint8_t bus, uint8_t devfn, uint16_t row)
{
    current_adapter = adapter_count++;
    AdapterRecord* a = CurrentAdapter();
    memset(a, 0, sizeof *a);
    a->vendor_id = vendor_id;
    a->device_id = device_id == riva_128zx ? riva_128 : device_id;
    a->bus = bus;
    a->devfn = devfn;
    a->chip_row = row;
    if (bus == 1) a->flags |= ADAPTER_AGP;
    return a;
}

// The clock the user chose on the Performance page, again at each start
// with Windows; a stored value outside the card's range (a damaged or
// hand-edited registry) would drive the memory beyond what it takes.
static void ReapplyMemoryClock()
{
    int32_t mclk = LoadSetting(SETTING_MCLK);
    if (mclk <= 0) return;
    uint32_t highest = chip_get_mclk_max();
    if ((uint32_t)mclk < chip_get_mclk_min() || (uint32_t)mclk > highest || highest == 0) return;
    chip_set_mclk((uint32_t)mclk);
}

static void CompleteRecord(const char* section_format)
{
    AdapterRecord* a = CurrentAdapter();
    char section[32];
    FormatText(section, sizeof section, section_format, a->device_id);
    if (GetPrivateProfileIntA(section, "DefRef", 0, chip_ini_path) == defref_no_clock_refresh)
        a->flags |= ADAPTER_NO_CLOCK_REFRESH;
    a->mapped_registers = chip_map_registers();
    a->flags |= chip_init();
    if (startup_flags & STARTUP_AUTORUN) ReapplyMemoryClock();
}

static void DetectOnWindows9x()
{
    monitor_count = (int16_t)CountDisplayDevices();
    for (uint16_t row = 0; row < CHIP_TABLE_ROWS; ++row) {
        for (int index = 0; index < monitor_count && adapter_count < MAX_ADAPTERS; ++index) {
            uint8_t bus, devfn;
            if (!PciFindDevice(chip_table[row].vendor_id, chip_table[row].device_id, index, &bus, &devfn)) break;
            AdapterRecord* a = NewRecord(chip_table[row].vendor_id, chip_table[row].device_id, bus, devfn, row);
            if (index > 0) {
                a->flags |= ADAPTER_TWIN;
                AdapterRecord* before = a - 1;
                if (adapter_count > 1 && before->vendor_id == a->vendor_id && before->device_id == a->device_id)
                    before->flags |= ADAPTER_TWIN;
            }
            CompleteRecord("CHIP%04x_95");
        }
    }
}

static void DetectOnWindowsNT()
{
    HANDLE device = OpenZentraDevice();
    if (!device) return;
    for (uint8_t bus : nt_bus_order) {
        for (uint16_t slot = 0; slot < NT_SLOTS; ++slot) {
            uint8_t header[PCI_HEADER_BUFFER_SIZE];
            uint16_t row;
            if (!ZentraReadPciHeader(device, bus, slot, header)) continue;
            uint16_t vendor_id = (uint16_t)(header[0] | header[1] << 8);
            uint16_t device_id = (uint16_t)(header[2] | header[3] << 8);
            if (!FindChipRow(vendor_id, device_id, &row)) continue;
            NewRecord(vendor_id, device_id, bus, (uint8_t)slot, row);
            CompleteRecord("CHIP%04x_NT4");
            CloseZentraDevice(device);
            return;
        }
    }
    CloseZentraDevice(device);
}

int DetectAdapters()
{
    if (platform == PLATFORM_NT) DetectOnWindowsNT();
    else DetectOnWindows9x();
    if (adapter_count == 0) return 0;
    ReconcileAdapters();
    return adapter_count > 0 ? 1 : 0;
}

// Takes record i out of the table: the last record moves into its place.
static void RemoveRecord(int i)
{
    --adapter_count;
    if (i != adapter_count) adapter_table[i] = adapter_table[adapter_count];
}

static void DropProblemCards()
{
    for (int i = 0; i < adapter_count;) {
        current_adapter = (int16_t)i;
        uint32_t problem = 0;
        int found = ReadDeviceNodeValue("Problem", &problem);
        if (found == -1 || (found == 1 && problem != 0)) RemoveRecord(i);
        else ++i;
    }
}

static void TieToDisplayDevices(EnumDisplayDevicesA_fn enum_devices)
{
    DISPLAY_DEVICEA device;
    for (DWORD n = 0;; ++n) {
        memset(&device, 0, sizeof device);
        device.cb = display_device_size;
        if (!enum_devices(NULL, n, &device, 0)) break;
        for (int i = 0; i < adapter_count; ++i) {
            current_adapter = (int16_t)i;
            char description[DESCRIPTION_SIZE + 1];
            memset(description, 0, sizeof description);
            if (DriverKeyValue("", "DriverDesc", description, DESCRIPTION_SIZE, REG_SZ, 1) != 1) description[0] = 0;
            // Windows 98 names the device with the whole description: compare
            // as much of both as a record keeps.
            if (SameText(description, device.DeviceString, DEVICE_NAME_SIZE - 1)) {
                AdapterRecord* a = CurrentAdapter();
                lstrcpynA(a->device_name, device.DeviceName, DEVICE_NAME_SIZE);
                a->display_index = (uint16_t)n;
                break;
            }
        }
    }
}

static void SortByDisplayIndex()
{
    for (int i = 0; i < adapter_count; ++i) {
        for (int j = i + 1; j < adapter_count; ++j) {
            if (adapter_table[j].display_index < adapter_table[i].display_index) {
                AdapterRecord t = adapter_table[i];
                adapter_table[i] = adapter_table[j];
                adapter_table[j] = t;
            }
        }
    }
}

void ReconcileAdapters()
{
    CurrentAdapter()->device_name[0] = 0;
    if (!IsWindows98() || monitor_count < 2) return;
    DropProblemCards();
    MachineDisplayFunctions f;
    if (!MachineFindDisplayFunctions(&f) || !f.EnumDisplayDevicesA) {
        current_adapter = 0;
        return;
    }
    TieToDisplayDevices(f.EnumDisplayDevicesA);
    for (int i = 0; i < adapter_count;) {
        if (!adapter_table[i].device_name[0]) RemoveRecord(i);
        else ++i;
    }
    SortByDisplayIndex();
    current_adapter = 0;
}

static void ReadDeviceMode(AdapterRecord* a)
{
    const char* device = a->device_name;
    if (!MachineDeviceModeField(device, HORZRES)) device = "DISPLAY";
    a->width = (uint16_t)MachineDeviceModeField(device, HORZRES);
    a->height = (uint16_t)MachineDeviceModeField(device, VERTRES);
    a->bits_per_pixel = (uint16_t)TrueBitsPerPixel(MachineDeviceModeField(device, BITSPIXEL));
}

static void ReadDesktopFlags(AdapterRecord* a, EnumDisplayDevicesA_fn enum_devices)
{
    a->flags &= ~(uint32_t)(ADAPTER_ATTACHED | ADAPTER_PRIMARY);
    DISPLAY_DEVICEA device;
    memset(&device, 0, sizeof device);
    device.cb = display_device_size;
    if (!enum_devices || !enum_devices(NULL, a->display_index, &device, 0)) return;
    if (device.StateFlags & DISPLAY_DEVICE_ATTACHED_TO_DESKTOP) a->flags |= ADAPTER_ATTACHED;
    if (device.StateFlags & DISPLAY_DEVICE_PRIMARY_DEVICE) a->flags |= ADAPTER_PRIMARY;
}

void RefreshAdapterModes(int at_startup)
{
    if (IsWindows98() && monitor_count >= 2) {
        MachineDisplayFunctions f;
        if (!MachineFindDisplayFunctions(&f)) f.EnumDisplayDevicesA = NULL;
        int16_t before = current_adapter;
        for (current_adapter = 0; current_adapter < adapter_count; ++current_adapter) {
            AdapterRecord* a = CurrentAdapter();
            ReadDeviceMode(a);
            ReadDesktopFlags(a, f.EnumDisplayDevicesA);
            SyncRefreshRate(at_startup);
        }
        current_adapter = before;
        if (at_startup == REFRESH_AT_STARTUP) {
            current_adapter = 0;
            for (int16_t i = 0; i < adapter_count; ++i) {
                if (adapter_table[i].flags & ADAPTER_PRIMARY) {
                    current_adapter = i;
                    break;
                }
            }
        }
        return;
    }
    AdapterRecord* a = CurrentAdapter();
    HDC dc = GetDC(NULL);
    a->width = (uint16_t)GetDeviceCaps(dc, HORZRES);
    a->height = (uint16_t)GetDeviceCaps(dc, VERTRES);
    a->bits_per_pixel = (uint16_t)TrueBitsPerPixel(GetDeviceCaps(dc, BITSPIXEL));
    ReleaseDC(NULL, dc);
    SyncRefreshRate(at_startup);
}
