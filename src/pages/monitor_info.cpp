#include "pages/monitor_info.h"

#include <stdint.h>

#include "base/runtime.h"
#include "base/state.h"
#include "base/texts.h"
#include "hardware/registry_text.h"
#include "pages/edid.h"

static const char config_manager_enum[] = "Config Manager\\Enum";
static const char monitor_class_root[] = "System\\CurrentControlSet\\Services\\Class\\";

enum {
    UNKNOWN_SIZE = 20,
    NODE_NAME_SIZE = 64,
    // The EDID value is read up to one byte past a base block with one
    // extension block.
    EDID_VALUE_SIZE = 257,
    VALUE_SIZE = 120,
    KEY_PATH_SIZE = 256,
    LINE_SIZE = 160,
};

void DescribeMonitorOwner(const AdapterRecord* adapter, bool windows98, MonitorOwner* owner)
{
    owner->windows98 = windows98;
    owner->twin = (adapter->flags & ADAPTER_TWIN) != 0;
    FormatText(owner->ids, sizeof owner->ids, "PCI_VEN_%04X&DEV_%04X", adapter->vendor_id, adapter->device_id);
    // Upper-case hexadecimal like the key it is looked for in: device 10 is DEV_0A.
    FormatText(owner->slot, sizeof owner->slot, "BUS_%02X&DEV_%02X", adapter->bus, adapter->devfn >> 3);
}

MonitorKeyVerdict JudgeMonitorKey(const char* upper_key, const MonitorOwner* owner, bool have_candidate)
{
    if (!FindInText(upper_key, "MONITOR")) return MONITOR_KEY_PASS;
    if (owner->windows98 && FindInText(upper_key, owner->ids)) {
        if (!owner->twin || FindInText(upper_key, owner->slot)) return MONITOR_KEY_FOUND;
        return MONITOR_KEY_CANDIDATE;
    }
    if (!have_candidate || upper_key[0] == 'R' || upper_key[0] == 'r') return MONITOR_KEY_CANDIDATE;
    return MONITOR_KEY_PASS;
}

int FindMonitorKey(char* hardware_key)
{
    hardware_key[0] = 0;
    HKEY nodes;
    if (RegOpenKeyExA(HKEY_DYN_DATA, config_manager_enum, 0, KEY_READ, &nodes) != ERROR_SUCCESS) return 0;
    MonitorOwner owner;
    DescribeMonitorOwner(CurrentAdapter(), IsWindows98(), &owner);
    char name[NODE_NAME_SIZE];
    for (DWORD i = 0; RegEnumKeyA(nodes, i, name, sizeof name) == ERROR_SUCCESS; ++i) {
        char path[sizeof config_manager_enum + NODE_NAME_SIZE + 1], key[HARDWARE_KEY_SIZE];
        FormatText(path, sizeof path, "%s\\%s", config_manager_enum, name);
        if (!ReadRegistryText(HKEY_DYN_DATA, path, "HardWareKey", key, sizeof key)) continue;
        UpperText(key);
        MonitorKeyVerdict verdict = JudgeMonitorKey(key, &owner, hardware_key[0] != 0);
        if (verdict != MONITOR_KEY_PASS) CopyText(hardware_key, HARDWARE_KEY_SIZE, key);
        if (verdict == MONITOR_KEY_FOUND) break;
    }
    RegCloseKey(nodes);
    return 1;
}

void SplitSyncRanges(const char* mode1, char* horizontal, char* vertical, size_t size)
{
    char field[VALUE_SIZE];
    const char* comma = FindChar(mode1, ',');
    size_t length = comma ? (size_t)(comma - mode1) : TextLength(mode1);
    CopyText(field, length + 1 < sizeof field ? length + 1 : sizeof field, mode1);
    FormatText(horizontal, size, "%s kHz", field);
    field[0] = 0;
    if (comma) {
        const char* next = FindChar(comma + 1, ',');
        length = next ? (size_t)(next - comma - 1) : TextLength(comma + 1);
        CopyText(field, length + 1 < sizeof field ? length + 1 : sizeof field, comma + 1);
    }
    FormatText(vertical, size, "%s Hz", field);
}

static void AddLine(HWND list, const char* line) { SendMessageA(list, LB_ADDSTRING, 0, (LPARAM)line); }

static void AddPair(HWND list, const char* label, const char* value)
{
    char line[LINE_SIZE];
    AddLine(list, label);
    FormatText(line, sizeof line, "%s%s", monitor_list_indent, value);
    AddLine(list, line);
}

static void AddTextPair(HWND list, const char* key, const char* fallback, const char* value)
{
    char label[MONITOR_LABEL_SIZE];
    LoadText(key, fallback, label, sizeof label);
    AddPair(list, label, value);
}

// A text value of an open key, or the unknown text.
static void ReadValueOr(HKEY key, const char* name, const char* unknown, char* out)
{
    if (!ReadRegistryText(key, "", name, out, VALUE_SIZE)) CopyText(out, VALUE_SIZE, unknown);
}

struct EdidText {
    size_t field;  // offset in EdidTexts
    const char* key;
    const char* fallback;
};
static const EdidText edid_texts[] = {
    {offsetof(EdidTexts, year), "EDIDYear", "Year of Manufacture :"},
    {offsetof(EdidTexts, h_image), "EDIDHImage", "Max H. Image Size(cm) :"},
    {offsetof(EdidTexts, v_image), "EDIDVImage", "Max V. Image Size(cm) :"},
    {offsetof(EdidTexts, dpms), "EDIDDPMS", "DPMS Support :"},
    {offsetof(EdidTexts, standby), "DPMSStandby", "Stand By"},
    {offsetof(EdidTexts, suspend), "DPMSSuspend", "Suspend"},
    {offsetof(EdidTexts, shutoff), "DPMSShutoff", "Shutoff"},
    {offsetof(EdidTexts, resolutions), "EDIDRES", "Resolution Support :"},
};

static void AddEdidLines(HWND list, HKEY node)
{
    uint8_t block[EDID_VALUE_SIZE];
    DWORD length = sizeof block;
    if (RegQueryValueExA(node, "EDID", NULL, NULL, block, &length) != ERROR_SUCCESS) return;
    EdidTexts texts;
    for (const EdidText& t : edid_texts) LoadText(t.key, t.fallback, (char*)&texts + t.field, EDID_TEXT_SIZE);
    EdidLines lines;
    if (!DecodeEdidLines(block, length, &texts, &lines)) return;
    for (int i = 0; i < lines.count; ++i) AddLine(list, lines.line[i]);
}

// The sync ranges of the monitor's largest mode.
static int AddSyncLines(HWND list, HKEY monitor_class, const char* max_resolution)
{
    char path[KEY_PATH_SIZE];
    FormatText(path, sizeof path, "MODES\\%s", max_resolution);
    HKEY mode;
    if (RegOpenKeyExA(monitor_class, path, 0, KEY_READ, &mode) != ERROR_SUCCESS) return 0;
    char mode1[VALUE_SIZE];
    if (ReadRegistryText(mode, "", "Mode1", mode1, sizeof mode1)) {
        char horizontal[VALUE_SIZE], vertical[VALUE_SIZE];
        SplitSyncRanges(mode1, horizontal, vertical, VALUE_SIZE);
        AddTextPair(list, "MoniHsync", "Horizontal Sync", horizontal);
        AddTextPair(list, "MoniVsync", "Vertical Sync", vertical);
    }
    RegCloseKey(mode);
    return 1;
}

// What the monitor's driver class key says: the largest mode and its sync ranges.
static int AddDriverLines(HWND list, const char* driver)
{
    char path[KEY_PATH_SIZE];
    FormatText(path, sizeof path, "%s%s", monitor_class_root, driver);
    HKEY monitor_class;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, path, 0, KEY_READ, &monitor_class) != ERROR_SUCCESS) return 0;
    int result = 0;
    char max_resolution[VALUE_SIZE];
    if (ReadRegistryText(monitor_class, "", "MaxResolution", max_resolution, sizeof max_resolution)) {
        AddTextPair(list, "MoniMaxRes", "Max Resolution", max_resolution);
        result = AddSyncLines(list, monitor_class, max_resolution);
    }
    RegCloseKey(monitor_class);
    return result;
}

int FillMonitorInfo(HWND list, char* type_label, char* type_name)
{
    char unknown[UNKNOWN_SIZE];
    LoadText("UnKnown", "Unknown", unknown, sizeof unknown);
    char hardware_key[HARDWARE_KEY_SIZE];
    if (!FindMonitorKey(hardware_key)) return 0;
    char path[KEY_PATH_SIZE];
    FormatText(path, sizeof path, "Enum\\%s", hardware_key);
    HKEY node;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, path, 0, KEY_READ, &node) != ERROR_SUCCESS) return 0;

    char label[MONITOR_LABEL_SIZE], value[VALUE_SIZE];
    LoadText("MoniType", "Monitor Type", label, sizeof label);
    ReadValueOr(node, "DeviceDesc", unknown, value);
    if (type_label) {
        CopyText(type_label, MONITOR_LABEL_SIZE, label);
        CopyText(type_name, MONITOR_NAME_SIZE, value);
        RegCloseKey(node);
        return 1;
    }
    AddPair(list, label, value);
    ReadValueOr(node, "Mfg", unknown, value);
    AddTextPair(list, "MoniMfg", "Manufacturer", value);
    AddEdidLines(list, node);
    char driver[VALUE_SIZE];
    bool has_driver = ReadRegistryText(node, "", "Driver", driver, sizeof driver);
    RegCloseKey(node);
    return has_driver ? AddDriverLines(list, driver) : 0;
}
