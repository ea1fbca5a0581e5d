// The Information page: the system, this program and the card.
#include "pages/information_page.h"

#include <commctrl.h>
#include <prsht.h>

#include "base/adapters.h"
#include "base/resource_ids.h"
#include "base/runtime.h"
#include "base/state.h"
#include "base/texts.h"
#include "chips/chips.h"
#include "hardware/driver_key.h"
#include "hardware/machine.h"
#include "pages/pages.h"
#include "pages/property_sheet.h"

enum {
    TEXT_SIZE = 100,
    PATH_SIZE = MAX_PATH + 1,
    AUTORUN_TEXT_SIZE = PATH_SIZE + 3,
    MIN_SHOWN_MCLK_MHZ = 11,
    MIN_LISTED_DLL_BITS = 8,
};

static const char run_key[] = "SOFTWARE\\MICROSOFT\\WINDOWS\\CURRENTVERSION\\RUN";
static const char run_value[] = "quorvel";
static const char autorun_switch[] = " /A";
static const char value_indent[] = "              ";
static const char dll_suffix[] = ".dll";

static HWND animation;

// The system and version lines are the page's own to fill.
static const PageText information_texts[] = {
    {IDC_INFO_AUTORUN, "Autorun", "Run this program each time Windows starts.", TEXT_SIZE},
};

// The list's labels, in the list's order; the monitor brings its own.
enum InformationItem {
    ITEM_CURRENT_SET,
    ITEM_BUS_TYPE,
    ITEM_DRIVER_VERSION,
    ITEM_VIDEO_MEMORY,
    ITEM_MCLK,
    ITEM_PHYSICAL_MEMORY,
    ITEM_MEMORY_LOAD,
    ITEM_DDRAW_VERSION,
    ITEM_D3D_VERSION,
};
static const struct {
    const char* key;
    const char* fallback;
} item_labels[] = {
    [ITEM_CURRENT_SET] = {"CurrentSet", "Current Setting :"},
    [ITEM_BUS_TYPE] = {"BusType", "Bus Type :"},
    [ITEM_DRIVER_VERSION] = {"DriverVer", "Driver Version :"},
    [ITEM_VIDEO_MEMORY] = {"VMemory", "VGA Memory :"},
    [ITEM_MCLK] = {"MClk", "Memory Clock :"},
    [ITEM_PHYSICAL_MEMORY] = {"PMemory", "System Memory :"},
    [ITEM_MEMORY_LOAD] = {"MResource", "Memory Utilization :"},
    [ITEM_DDRAW_VERSION] = {"DDrawVer", "DirectDraw Version :"},
    [ITEM_D3D_VERSION] = {"D3DVer", "Direct3D Version :"},
};

// By the memory type code of the chip commands.
static const char* const memory_type_words[] = {"", " Fast-Page DRAM", " EDO DRAM", " SDRAM", " SGRAM"};

static void AddLines(InformationLines* out, const char* label, const char* value)
{
    if (!value[0] || out->count + 2 > INFORMATION_MAX_LINES) return;
    CopyText(out->line[out->count++], INFORMATION_LINE_SIZE, label);
    FormatText(out->line[out->count++], INFORMATION_LINE_SIZE, "%s%s", value_indent, value);
}

static void AddItem(InformationLines* out, InformationItem item, const char* value)
{
    char label[TEXT_SIZE];
    LoadText(item_labels[item].key, item_labels[item].fallback, label, sizeof label);
    AddLines(out, label, value);
}

static void FormatBus(const InformationFacts* facts, char* value, size_t size)
{
    if (!facts->agp) CopyText(value, size, "PCI");
    else if (facts->agp_rate) FormatText(value, size, "%s %dx", "AGP", facts->agp_rate);
    else CopyText(value, size, "AGP");
}

void FormatInformationLines(const InformationFacts* facts, InformationLines* out)
{
    out->count = 0;
    char value[INFORMATION_LINE_SIZE];
    FormatText(value, sizeof value, "%dx%d--%d bits, %d Hz", facts->width, facts->height, facts->bits_per_pixel,
               facts->refresh_hz);
    AddItem(out, ITEM_CURRENT_SET, value);
    FormatBus(facts, value, sizeof value);
    AddItem(out, ITEM_BUS_TYPE, value);
    AddItem(out, ITEM_DRIVER_VERSION, facts->driver_version);
    value[0] = 0;
    uint32_t type = facts->memory_type < sizeof memory_type_words / sizeof memory_type_words[0] ? facts->memory_type : 0;
    if (facts->memory_size)
        FormatText(value, sizeof value, "%d.%d MB%s", HIWORD(facts->memory_size), LOWORD(facts->memory_size),
                   memory_type_words[type]);
    AddItem(out, ITEM_VIDEO_MEMORY, value);
    value[0] = 0;
    if (facts->mclk_mhz >= MIN_SHOWN_MCLK_MHZ) FormatText(value, sizeof value, "%d MHz", facts->mclk_mhz);
    AddItem(out, ITEM_MCLK, value);
    AddLines(out, facts->monitor_label, facts->monitor_name);
    // Thousands of kibibytes: the megabytes a memory box is sold by.
    FormatText(value, sizeof value, "%u MB", (unsigned)(facts->physical_bytes / 1000 / 1024));
    AddItem(out, ITEM_PHYSICAL_MEMORY, value);
    value[0] = 0;
    if (facts->memory_load >= 0) FormatText(value, sizeof value, "%d%%", facts->memory_load);
    AddItem(out, ITEM_MEMORY_LOAD, value);
    AddItem(out, ITEM_DDRAW_VERSION, facts->ddraw_version);
    AddItem(out, ITEM_D3D_VERSION, facts->d3d_version);
}

void FormatSystemLine(const OSVERSIONINFOA* version, int os_class, char* out, size_t size)
{
    const char* format = version->dwPlatformId == VER_PLATFORM_WIN32_NT ? "Microsoft Windows NT %u.%u (Build: %u)\n%s"
                         : os_class < OS_CLASS_WIN98                    ? "Microsoft Windows 95 %u.%u (Build: %u)\n950%s"
                                                                        : "Microsoft Windows 98 %u.%u (Build: %u)\n%s";
    // Windows 95 keeps its version in the build number's high half.
    FormatText(out, size, format, (unsigned)version->dwMajorVersion, (unsigned)version->dwMinorVersion,
               (unsigned)LOWORD(version->dwBuildNumber), version->szCSDVersion);
}

// This program's full path; false when it does not fit whole.
static bool ProgramPath(char* path)
{
    DWORD length = GetModuleFileNameA(NULL, path, PATH_SIZE);
    return length > 0 && length < PATH_SIZE - 1;
}

int StartWithWindows(bool change, bool on)
{
    // A cut path would start whatever file it happens to name.
    char wanted[AUTORUN_TEXT_SIZE];
    if (!ProgramPath(wanted) || !AppendText(wanted, sizeof wanted, autorun_switch)) return 0;
    HKEY run;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, run_key, 0, KEY_READ | KEY_WRITE, &run) != ERROR_SUCCESS) return 0;
    char stored[AUTORUN_TEXT_SIZE];
    DWORD type = 0, length = sizeof stored - 1;
    bool present = RegQueryValueExA(run, run_value, NULL, &type, (BYTE*)stored, &length) == ERROR_SUCCESS &&
                   type == REG_SZ;
    if (present) {
        stored[length] = 0;
        present = lstrcmpiA(stored, wanted) == 0;
    }
    if (change && on && !present)
        present = RegSetValueExA(run, run_value, 0, REG_SZ, (const BYTE*)wanted, (DWORD)TextLength(wanted) + 1) ==
                  ERROR_SUCCESS;
    else if (change && !on && present)
        present = RegDeleteValueA(run, run_value) != ERROR_SUCCESS;
    RegCloseKey(run);
    return present;
}

// folder, a backslash unless it ends with one, and name; false when it does not fit.
static bool JoinPath(char* folder, size_t size, const char* name)
{
    size_t length = TextLength(folder);
    if (length && folder[length - 1] != '\\' && !AppendText(folder, size, "\\")) return false;
    return AppendText(folder, size, name);
}

static bool SystemFilePath(const char* name, char* path)
{
    UINT length = GetSystemDirectoryA(path, PATH_SIZE);
    return length > 0 && length < PATH_SIZE && JoinPath(path, PATH_SIZE, name);
}

// Windows NT's display DLL as its display settings name it: the device of
// the first mode of 256 colours or more (the modes before are the VGA's).
static bool ListedDisplayDll(char* name, size_t size)
{
    DEVMODEA mode;
    for (DWORD i = 0;; ++i) {
        memset(&mode, 0, sizeof mode);
        mode.dmSize = sizeof mode;
        if (!MachineEnumDisplaySettings(NULL, i, &mode)) return false;
        if (mode.dmBitsPerPel < MIN_LISTED_DLL_BITS) continue;
        char device[sizeof mode.dmDeviceName + 1];
        memcpy(device, mode.dmDeviceName, sizeof mode.dmDeviceName);
        device[sizeof mode.dmDeviceName] = 0;
        return device[0] && FormatText(name, size, "%s%s", device, dll_suffix) ==
                                (int)(TextLength(device) + sizeof dll_suffix - 1);
    }
}

static bool DriverFilePath(char* path)
{
    char image[DRIVER_IMAGE_SIZE];
    bool named = DriverImageName(image) == 1;
    if (platform != PLATFORM_NT) return named && SystemFilePath(image, path);
    if (!named) return ListedDisplayDll(image, sizeof image) && SystemFilePath(image, path);
    UINT length = GetWindowsDirectoryA(path, PATH_SIZE);
    return length > 0 && length < PATH_SIZE && JoinPath(path, PATH_SIZE, image);
}

static void SystemFileVersion(const char* name, char* version)
{
    char path[PATH_SIZE];
    version[0] = 0;
    if (SystemFilePath(name, path)) FileVersionText(path, version, FILE_VERSION_SIZE);
}

static void GatherFacts(InformationFacts* facts)
{
    memset(facts, 0, sizeof *facts);
    const AdapterRecord* adapter = CurrentAdapter();
    facts->width = adapter->width;
    facts->height = adapter->height;
    facts->bits_per_pixel = adapter->bits_per_pixel;
    facts->refresh_hz = adapter->refresh_hz;
    facts->agp = (adapter->flags & ADAPTER_AGP) != 0;
    if (facts->agp) facts->agp_rate = chip_get_agp_rate();
    facts->memory_size = chip_get_mem_size();
    if (facts->memory_size) facts->memory_type = chip_get_mem_type();
    facts->mclk_mhz = chip_get_mclk();
    char path[PATH_SIZE];
    if (DriverFilePath(path)) FileVersionText(path, facts->driver_version, sizeof facts->driver_version);
    if (FillMonitorInfo(NULL, facts->monitor_label, facts->monitor_name) != 1) facts->monitor_name[0] = 0;
    MEMORYSTATUS memory;
    memset(&memory, 0, sizeof memory);
    memory.dwLength = sizeof memory;
    GlobalMemoryStatus(&memory);
    facts->physical_bytes = memory.dwTotalPhys;
    facts->memory_load = platform == PLATFORM_NT ? -1 : (int)memory.dwMemoryLoad;
    SystemFileVersion("ddraw.dll", facts->ddraw_version);
    SystemFileVersion("d3dim.dll", facts->d3d_version);
}

static void FillInformationList(HWND page)
{
    HCURSOR previous = SetCursor(LoadCursorA(NULL, IDC_WAIT));
    InformationFacts facts;
    GatherFacts(&facts);
    InformationLines lines;
    FormatInformationLines(&facts, &lines);
    HWND list = GetDlgItem(page, IDC_INFO_LIST);
    SendMessageA(list, LB_RESETCONTENT, 0, 0);
    for (int i = 0; i < lines.count; ++i) SendMessageA(list, LB_ADDSTRING, 0, (LPARAM)lines.line[i]);
    SetCursor(previous);
}

static void ShowVersionLines(HWND page)
{
    OSVERSIONINFOA system;
    memset(&system, 0, sizeof system);
    system.dwOSVersionInfoSize = sizeof system;
    GetVersionExA(&system);
    char line[SYSTEM_LINE_SIZE];
    FormatSystemLine(&system, os_class, line, sizeof line);
    SetDlgItemTextA(page, IDC_INFO_SYSTEM, line);

    char label[TEXT_SIZE], path[PATH_SIZE], version[FILE_VERSION_SIZE] = "";
    LoadText("PanelVer", "Version", label, sizeof label);
    if (ProgramPath(path)) FileVersionText(path, version, sizeof version);
    FormatText(line, sizeof line, "%s %s", label, version);
    SetDlgItemTextA(page, IDC_INFO_VERSION, line);
}

static void OnInitDialog(HWND page)
{
    ShowVersionLines(page);
    SetPageTexts(page, information_texts, sizeof information_texts / sizeof information_texts[0]);
    CheckDlgButton(page, IDC_INFO_AUTORUN, StartWithWindows(false, false) ? BST_CHECKED : BST_UNCHECKED);
    FillInformationList(page);
}

static BOOL OnNotify(HWND page, UINT code)
{
    if (code == (UINT)PSN_APPLY) {
        FillInformationList(page);
        StartWithWindows(true, IsDlgButtonChecked(page, IDC_INFO_AUTORUN) == BST_CHECKED);
        SetWindowLongPtrA(page, DWLP_MSGRESULT, PSNRET_NOERROR);
        return TRUE;
    }
    AdapterRecord* adapter = CurrentAdapter();
    if (code == (UINT)PSN_SETACTIVE && (adapter->flags & ADAPTER_INFO_STALE)) {
        adapter->flags &= ~ADAPTER_INFO_STALE;
        FillInformationList(page);
    }
    return FALSE;
}

INT_PTR CALLBACK InformationPageProc(HWND page, UINT message, WPARAM wparam, LPARAM lparam)
{
    AnimatePage(page, message, lparam, IDC_INFO_FRAME, &animation);
    switch (message) {
    case WM_INITDIALOG: OnInitDialog(page); return TRUE;
    case WM_COMMAND:
        if (LOWORD(wparam) != IDC_INFO_AUTORUN || HIWORD(wparam) != BN_CLICKED) return FALSE;
        PropSheet_Changed(GetParent(page), page);
        return TRUE;
    case WM_NOTIFY: return OnNotify(page, ((const NMHDR*)lparam)->code);
    }
    return FALSE;
}
