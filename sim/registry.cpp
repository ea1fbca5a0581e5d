// The registry places a real installation of the machine's Windows has for
// its display hardware, seeded from the machine. HKLM and HKCC are seeded
// when the machine boots (what programs write there survives their
// restart); HKEY_DYN_DATA and HKLM\HARDWARE are rebuilt at every start of
// Windows, as Windows does. Every key seeded is listed under
// HKLM\Software\VistrelSim, so that the next boot removes exactly those.
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "machine_state.h"

namespace {

const char marker_key[] = "Software\\VistrelSim";
const char session_key[] = "Software\\VistrelSim\\Session";
const char class_root[] = "System\\CurrentControlSet\\Services\\Class";
const char config_manager[] = "Config Manager\\Enum";
const char resource_map[] = "HARDWARE\\RESOURCEMAP\\VIDEO";
const char device_map[] = "HARDWARE\\DEVICEMAP\\VIDEO";
const char driver_stand_in[] = "simdriver.dll";

struct RootName {
    HKEY root;
    const char* name;
};
const RootName roots[] = {{HKEY_LOCAL_MACHINE, "HKLM"}, {HKEY_CURRENT_CONFIG, "HKCC"}, {HKEY_DYN_DATA, "HKDD"}};

bool IsNt() { return sim->config.windows == SIM_WINDOWS_NT4; }

HKEY Create(HKEY root, const char* path, bool is_volatile = false)
{
    HKEY key = NULL;
    if (RegCreateKeyExA(root, path, 0, NULL, is_volatile ? REG_OPTION_VOLATILE : REG_OPTION_NON_VOLATILE,
                        KEY_ALL_ACCESS, NULL, &key, NULL) != ERROR_SUCCESS)
        return NULL;
    return key;
}

// Seeding writes runs of values into one key: the last key stays open
// (per thread: the device-map watcher writes too).
struct OpenKey {
    HKEY root;
    char path[400];
    bool is_volatile;
    HKEY key;
};
thread_local OpenKey open_key;

void CloseOpenKey()
{
    if (open_key.key) RegCloseKey(open_key.key);
    open_key.key = NULL;
}

void SetValue(HKEY root, const char* path, const char* name, DWORD type, const void* data, DWORD size,
              bool is_volatile = false)
{
    if (!open_key.key || open_key.root != root || open_key.is_volatile != is_volatile ||
        strcmp(open_key.path, path) != 0) {
        CloseOpenKey();
        open_key.key = Create(root, path, is_volatile);
        if (!open_key.key) return;
        open_key.root = root;
        open_key.is_volatile = is_volatile;
        lstrcpynA(open_key.path, path, sizeof open_key.path);
    }
    RegSetValueExA(open_key.key, name, 0, type, (const BYTE*)data, size);
}

void SetText(HKEY root, const char* path, const char* name, const char* text, bool is_volatile = false)
{
    SetValue(root, path, name, REG_SZ, text, (DWORD)strlen(text) + 1, is_volatile);
}

void SetDword(HKEY root, const char* path, const char* name, DWORD value, bool is_volatile = false)
{
    SetValue(root, path, name, REG_DWORD, &value, sizeof value, is_volatile);
}

bool GetText(HKEY root, const char* path, const char* name, char* out, DWORD size)
{
    HKEY key;
    if (RegOpenKeyExA(root, path, 0, KEY_QUERY_VALUE, &key) != ERROR_SUCCESS) return false;
    DWORD type, got = size - 1;
    LONG r = RegQueryValueExA(key, name, NULL, &type, (BYTE*)out, &got);
    RegCloseKey(key);
    if (r != ERROR_SUCCESS || (type != REG_SZ && type != REG_EXPAND_SZ)) return false;
    out[got < size ? got : size - 1] = 0;
    return true;
}

bool GetDword(HKEY root, const char* path, const char* name, DWORD* out)
{
    HKEY key;
    if (RegOpenKeyExA(root, path, 0, KEY_QUERY_VALUE, &key) != ERROR_SUCCESS) return false;
    DWORD type, size = sizeof *out;
    LONG r = RegQueryValueExA(key, name, NULL, &type, (BYTE*)out, &size);
    RegCloseKey(key);
    return r == ERROR_SUCCESS && type == REG_DWORD;
}

bool DeleteTree(HKEY root, const char* path)
{
    CloseOpenKey();
    HKEY key;
    if (RegOpenKeyExA(root, path, 0, KEY_ALL_ACCESS, &key) != ERROR_SUCCESS) return false;
    char child[256];
    for (;;) {
        DWORD size = sizeof child;
        if (RegEnumKeyExA(key, 0, child, &size, NULL, NULL, NULL, NULL) != ERROR_SUCCESS) break;
        char sub[1024];
        snprintf(sub, sizeof sub, "%s\\%s", path, child);
        if (!DeleteTree(root, sub)) break;
    }
    RegCloseKey(key);
    return RegDeleteKeyA(root, path) == ERROR_SUCCESS;
}

// The keys this boot seeds, as "HKLM\path" lines.
char seeded[8192];
size_t seeded_used;

void Remember(HKEY root, const char* path)
{
    const char* name = "HKLM";
    for (const RootName& r : roots)
        if (r.root == root) name = r.name;
    char line[512];
    int n = snprintf(line, sizeof line, "%s\\%s", name, path);
    if (n <= 0 || seeded_used + n + 2 > sizeof seeded) return;
    for (size_t at = 0; at < seeded_used; at += strlen(seeded + at) + 1)
        if (lstrcmpiA(seeded + at, line) == 0) return;
    memcpy(seeded + seeded_used, line, n + 1);
    seeded_used += n + 1;
}

void DeleteEarlierSeeds()
{
    HKEY key;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, marker_key, 0, KEY_QUERY_VALUE, &key) != ERROR_SUCCESS) return;
    static char list[8192];
    DWORD type, size = sizeof list - 2;
    LONG r = RegQueryValueExA(key, "Seeded", NULL, &type, (BYTE*)list, &size);
    RegCloseKey(key);
    if (r != ERROR_SUCCESS || type != REG_MULTI_SZ) return;
    list[size] = list[size + 1] = 0;
    for (const char* line = list; *line; line += strlen(line) + 1) {
        for (const RootName& root : roots) {
            size_t len = strlen(root.name);
            if (_strnicmp(line, root.name, len) == 0 && line[len] == '\\') DeleteTree(root.root, line + len + 1);
        }
    }
}

// --- names ---

uint8_t Revision(int card) { return SimCardChip(card)->revision; }

void HardwareKey(int card, char* out, size_t size)
{
    const SimCardConfig* c = &sim->config.cards[card];
    snprintf(out, size, "PCI\\VEN_%04X&DEV_%04X&SUBSYS_00000000&REV_%02X\\BUS_%02X&DEV_%02X&FUNC_00", c->vendor_id,
             c->device_id, Revision(card), c->bus, c->device);
}

const char* ServiceName(int card) { return SimCardChip(card)->nt_service; }

// The monitor's Plug and Play id from its EDID, e.g. DEL730B.
void MonitorId(const SimCardConfig* c, char* out, size_t size)
{
    if (!c->has_edid) {
        lstrcpynA(out, "DEFAULT_MONITOR", (int)size);
        return;
    }
    unsigned maker = (c->edid[8] << 8) | c->edid[9];
    snprintf(out, size, "%c%c%c%04X", '@' + ((maker >> 10) & 31), '@' + ((maker >> 5) & 31), '@' + (maker & 31),
             c->edid[10] | (c->edid[11] << 8));
}

struct MonitorFacts {
    char name[32];
    char maker[48];
    int max_width, max_height;
    char mode1[48];
};

void ReadEdid(const SimCardConfig* c, MonitorFacts* f)
{
    lstrcpynA(f->name, "Plug and Play Monitor", sizeof f->name);
    lstrcpynA(f->maker, "(Standard monitor types)", sizeof f->maker);
    f->max_width = 1024;
    f->max_height = 768;
    lstrcpynA(f->mode1, "30.0-70.0,50.0-120.0,+,+", sizeof f->mode1);
    if (!c->has_edid) return;
    const uint8_t* e = c->edid;
    static const struct { const char* id; const char* name; } makers[] = {
        {"DEL", "Dell"}, {"NEC", "NEC"}, {"SNY", "Sony"}, {"VSC", "ViewSonic"}, {"APP", "Apple"},
        {"PHL", "Philips"}, {"GSM", "LG Electronics"}, {"MEI", "Panasonic"}, {"IVM", "Iiyama"}, {"SAM", "Samsung"},
    };
    char id[16];
    MonitorId(c, id, sizeof id);
    for (const auto& m : makers)
        if (strncmp(id, m.id, 3) == 0) lstrcpynA(f->maker, m.name, sizeof f->maker);
    if (e[36] & 0x01) f->max_width = 1280, f->max_height = 1024;
    for (int i = 0; i < 8; i++) {
        uint8_t b0 = e[38 + 2 * i], b1 = e[39 + 2 * i];
        if (b0 < 9) break;
        int w = b0 * 8 + 248;
        static const int num[4] = {1, 3, 4, 9}, den[4] = {1, 4, 5, 16};
        int h = w * num[b1 >> 6] / den[b1 >> 6];
        if (w * h > f->max_width * f->max_height) f->max_width = w, f->max_height = h;
    }
    for (int d = 54; d + 18 <= 126; d += 18) {
        if (e[d] || e[d + 1]) continue;
        if (e[d + 3] == 0xFC) {
            char name[14];
            memcpy(name, e + d + 5, 13);
            name[13] = 0;
            char* nl = strchr(name, '\n');
            if (nl) *nl = 0;
            if (name[0]) lstrcpynA(f->name, name, sizeof f->name);
        } else if (e[d + 3] == 0xFD) {
            snprintf(f->mode1, sizeof f->mode1, "%d.0-%d.0,%d.0-%d.0,+,+", e[d + 7], e[d + 8], e[d + 5], e[d + 6]);
        }
    }
}

// --- Windows 9x ---

void DriverKey9x(int card, char* out, size_t size)
{
    snprintf(out, size, "%s\\DISPLAY\\%04u", class_root, sim->cards[card].class_index);
}

void ModesKey(const char* driver_key, int bits, int width, int height, char* out, size_t size)
{
    snprintf(out, size, "%s\\MODES\\%d\\%d,%d", driver_key, bits, width, height);
}

// A MODES key of a 9x display driver: the rates it offers, ascending.
void WriteModeList(const char* driver_key, int width, int height, int bits, const uint16_t* rates, int count)
{
    char sub[320], list[81];
    ModesKey(driver_key, bits, width, height, sub, sizeof sub);
    SimFormatRates(rates, count, list, sizeof list);
    SetText(HKEY_LOCAL_MACHINE, sub, "", list);
}

void SeedDisplayClass9x(int card)
{
    const SimCardConfig* c = &sim->config.cards[card];
    const SimChip* chip = SimCardChip(card);
    char key[256], sub[320];
    DriverKey9x(card, key, sizeof key);
    SetText(HKEY_LOCAL_MACHINE, key, "DriverDesc", RegistryDriverDesc(card));
    SetText(HKEY_LOCAL_MACHINE, key, "ProviderName", "Microsoft");
    SetText(HKEY_LOCAL_MACHINE, key, "DevLoader", "*vdd");
    SetText(HKEY_LOCAL_MACHINE, key, "Ver", "4.0");
    SetText(HKEY_LOCAL_MACHINE, key, "DriverDate", "4-23-1999");
    snprintf(sub, sizeof sub, "%s\\DEFAULT", key);
    SetText(HKEY_LOCAL_MACHINE, sub, "drv", chip->driver_file);
    SetText(HKEY_LOCAL_MACHINE, sub, "vdd", "*vdd");
    SetText(HKEY_LOCAL_MACHINE, sub, "RefreshRate", "0");
    SetText(HKEY_LOCAL_MACHINE, sub, "DDC", "1");
    snprintf(sub, sizeof sub, "%s\\INFO", key);
    SetDword(HKEY_LOCAL_MACHINE, sub, "VideoMemory", c->memory_mb * 1024 * 1024 + c->memory_extra_kb * 1024);
    SetText(HKEY_LOCAL_MACHINE, sub, "ChipType", chip->name);

    // MODES: one key per mode, its default value the rates the driver
    // offers, ascending; the start-up mode with the rate it boots at.
    SimModeLimits limits = DisplayCardLimits(card);
    const SimMachineConfig* m = &sim->config;
    bool own_start = card != m->primary_card && c->start_width;
    int start_w = own_start ? c->start_width : m->start_width, start_h = own_start ? c->start_height : m->start_height;
    int start_bits = own_start ? c->start_bits : m->start_bits;
    int start_rate = own_start ? c->start_refresh : m->start_refresh;
    for (int d = 0; d < sim_desktop_depth_count; d++) {
        int bits = sim_desktop_depths[d];
        for (int s = 0; s < sim_desktop_size_count; s++) {
            int w = sim_desktop_sizes[s].width, h = sim_desktop_sizes[s].height;
            uint16_t rates[SIM_MAX_RATES];
            int n = SimModeRates(&limits, w, h, bits, rates);
            if (!n) continue;
            WriteModeList(key, w, h, bits, rates, n);
            ModesKey(key, bits, w, h, sub, sizeof sub);
            if (w == start_w && h == start_h && bits == start_bits && start_rate > 1) {
                char rate[16];
                snprintf(rate, sizeof rate, "%d", start_rate);
                SetText(HKEY_LOCAL_MACHINE, sub, "RefreshRate", rate);
            }
        }
    }
}

// The Permedia 2 display driver's own timing list: for each size, its
// DMT timings as records "1", "2", ... of DEFAULT\TIMINGS\<w>,<h>; "1" is
// the one the driver uses (the default rate), the others follow ascending.
void SeedPermediaTimings9x(int card, const char* key)
{
    SimModeLimits limits = DisplayCardLimits(card);
    for (int s = 0; s < sim_desktop_size_count; s++) {
        int w = sim_desktop_sizes[s].width, h = sim_desktop_sizes[s].height;
        uint16_t rates[SIM_MAX_RATES];
        int n = SimModeRates(&limits, w, h, 8, rates);
        if (!n) continue;
        char sub[320], name[8];
        snprintf(sub, sizeof sub, "%s\\DEFAULT\\TIMINGS\\%d,%d", key, w, h);
        int first = SimDefaultRate(rates, n), number = 1;
        for (int pass = 0; pass < 2; pass++) {
            for (int i = 0; i < n; i++) {
                if ((rates[i] == first) != (pass == 0)) continue;
                uint8_t record[SIM_PERMEDIA_RECORD_SIZE];
                PermediaTimingRecord(SimFindTiming(w, h, rates[i], false), record);
                snprintf(name, sizeof name, "%d", number++);
                SetValue(HKEY_LOCAL_MACHINE, sub, name, REG_BINARY, record, sizeof record);
            }
        }
    }
}

void SeedEnum9x(int card)
{
    const SimCardConfig* c = &sim->config.cards[card];
    char hardware[200], key[256], parent[256];
    HardwareKey(card, hardware, sizeof hardware);
    snprintf(key, sizeof key, "Enum\\%s", hardware);
    lstrcpynA(parent, key, sizeof parent);
    *strrchr(parent, '\\') = 0;
    Remember(HKEY_LOCAL_MACHINE, parent);
    char driver[32];
    snprintf(driver, sizeof driver, "DISPLAY\\%04u", sim->cards[card].class_index);
    SetText(HKEY_LOCAL_MACHINE, key, "Driver", driver);
    SetText(HKEY_LOCAL_MACHINE, key, "DeviceDesc", RegistryDriverDesc(card));
    SetText(HKEY_LOCAL_MACHINE, key, "Class", "Display");
    SetText(HKEY_LOCAL_MACHINE, key, "Mfg", SimCardChip(card)->name);
    char ids[160];
    snprintf(ids, sizeof ids, "PCI\\VEN_%04X&DEV_%04X&SUBSYS_00000000&REV_%02X,PCI\\VEN_%04X&DEV_%04X", c->vendor_id,
             c->device_id, Revision(card), c->vendor_id, c->device_id);
    SetText(HKEY_LOCAL_MACHINE, key, "HardwareID", ids);
    SetText(HKEY_LOCAL_MACHINE, key, "CompatibleIDs", "PCI\\CC_030000,PCI\\CC_0300");
}

// A monitor's hardware key. Windows 98 names a monitor after the adapter it
// hangs on (its hardware key with '\' made '_'); Windows 95 numbers it.
void MonitorHardwareKey(int card, int number, char* out, size_t size)
{
    char id[24];
    MonitorId(&sim->config.cards[card], id, sizeof id);
    if (sim->config.windows == SIM_WINDOWS_98) {
        char hardware[200];
        HardwareKey(card, hardware, sizeof hardware);
        for (char* p = hardware; *p; p++)
            if (*p == '\\') *p = '_';
        snprintf(out, size, "MONITOR\\%s\\%s", id, hardware);
    } else {
        snprintf(out, size, "MONITOR\\%s\\%04d", id, number + 1);
    }
}

// The cards whose monitor Windows 9x knows: each display device on 98, the
// primary on 95.
int MonitorCards9x(int* cards)
{
    if (sim->config.windows == SIM_WINDOWS_98) return DisplayDeviceCards(cards);
    if (sim->config.primary_card < 0 || sim->config.primary_card >= sim->config.card_count) return 0;
    cards[0] = sim->config.primary_card;
    return 1;
}

void SeedMonitor9x(int card, int number)
{
    const SimCardConfig* c = &sim->config.cards[card];
    MonitorFacts f;
    ReadEdid(c, &f);
    char hardware[256], key[300], id[24];
    MonitorHardwareKey(card, number, hardware, sizeof hardware);
    MonitorId(c, id, sizeof id);
    snprintf(key, sizeof key, "Enum\\MONITOR\\%s", id);
    Remember(HKEY_LOCAL_MACHINE, key);
    snprintf(key, sizeof key, "Enum\\%s", hardware);
    char driver[32], class_key[200], sub[300];
    snprintf(driver, sizeof driver, "MONITOR\\%04d", number);
    SetText(HKEY_LOCAL_MACHINE, key, "DeviceDesc", f.name);
    SetText(HKEY_LOCAL_MACHINE, key, "Mfg", f.maker);
    SetText(HKEY_LOCAL_MACHINE, key, "Class", "Monitor");
    SetText(HKEY_LOCAL_MACHINE, key, "Driver", driver);
    char hardware_id[40];
    snprintf(hardware_id, sizeof hardware_id, "Monitor\\%s", id);
    SetText(HKEY_LOCAL_MACHINE, key, "HardwareID", hardware_id);
    if (c->has_edid) SetValue(HKEY_LOCAL_MACHINE, key, "EDID", REG_BINARY, c->edid, sizeof c->edid);
    snprintf(class_key, sizeof class_key, "%s\\%s", class_root, driver);
    char max[24];
    snprintf(max, sizeof max, "%d,%d", f.max_width, f.max_height);
    SetText(HKEY_LOCAL_MACHINE, class_key, "DriverDesc", f.name);
    SetText(HKEY_LOCAL_MACHINE, class_key, "MaxResolution", max);
    SetText(HKEY_LOCAL_MACHINE, class_key, "DPMS", "1");
    snprintf(sub, sizeof sub, "%s\\MODES\\%s", class_key, max);
    SetText(HKEY_LOCAL_MACHINE, sub, "Mode1", f.mode1);
}

void SeedFonts9x()
{
    static const struct { const char* set; const char* name; const char* data; } values[] = {
        {"96\\System", "vgasys.fon", "fonts.fon"},    {"96\\System", "vgafix.fon", "fixedfon.fon"},
        {"96\\System", "vgaoem.fon", "oemfonts.fon"}, {"120\\System", "8514sys.fon", "fonts.fon"},
        {"120\\System", "8514fix.fon", "fixedfon.fon"}, {"120\\System", "8514oem.fon", "oemfonts.fon"},
        {"96\\User", "COURE.FON", "Courier 10,12,15"}, {"96\\User", "SSERIFE.FON", "MS Sans Serif 8,10,12,14,18,24"},
        {"96\\User", "SERIFE.FON", "MS Serif 8,10,12,14,18,24"}, {"96\\User", "SMALLE.FON", "Small Fonts"},
        {"120\\User", "COURF.FON", "Courier 10,12,15"}, {"120\\User", "SSERIFF.FON", "MS Sans Serif 8,10,12,14,18,24"},
        {"120\\User", "SERIFF.FON", "MS Serif 8,10,12,14,18,24"}, {"120\\User", "SMALLF.FON", "Small Fonts"},
    };
    const char root[] = "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\fontsize";
    Remember(HKEY_LOCAL_MACHINE, root);
    for (const auto& v : values) {
        char key[200];
        snprintf(key, sizeof key, "%s\\%s", root, v.set);
        SetText(HKEY_LOCAL_MACHINE, key, v.name, v.data);
        if (strncmp(v.set, "96\\", 3) == 0)
            SetText(HKEY_CURRENT_CONFIG, strstr(v.set, "User") ? "Display\\Fonts" : "Display\\Settings", v.data,
                    v.name);
    }
}

void SeedMachine9x()
{
    int class_count = 0;
    for (int card = 0; card < sim->config.card_count; card++) {
        sim->cards[card].class_index = 0xFF;
        if (!sim->config.cards[card].vendor_id || !sim->config.cards[card].device_node) continue;
        sim->cards[card].class_index = (uint8_t)class_count++;
        SeedDisplayClass9x(card);
        if (SimCardChip(card)->family == SIM_FAMILY_PERMEDIA) {
            char key[256];
            DriverKey9x(card, key, sizeof key);
            SeedPermediaTimings9x(card, key);
        }
        SeedEnum9x(card);
    }
    char path[200];
    snprintf(path, sizeof path, "%s\\DISPLAY", class_root);
    Remember(HKEY_LOCAL_MACHINE, path);
    snprintf(path, sizeof path, "%s\\MONITOR", class_root);
    Remember(HKEY_LOCAL_MACHINE, path);
    int cards[SIM_MAX_CARDS];
    int monitors = MonitorCards9x(cards);
    for (int i = 0; i < monitors; i++) SeedMonitor9x(cards[i], i);

    Remember(HKEY_CURRENT_CONFIG, "Display");
    const SimMachineConfig* m = &sim->config;
    SimDriverMode start = {m->start_width, m->start_height, m->start_bits, 0, 0, 0};
    if (m->primary_card >= 0 && m->primary_card < m->card_count) RegistryWriteDisplaySettings(m->primary_card, &start);
    SetText(HKEY_CURRENT_CONFIG, "Display\\Settings", "DPILogicalX", "96");
    SetText(HKEY_CURRENT_CONFIG, "Display\\Settings", "DPILogicalY", "96");
    SetText(HKEY_CURRENT_CONFIG, "Display\\Settings", "DPIPhysicalX", "96");
    SetText(HKEY_CURRENT_CONFIG, "Display\\Settings", "DPIPhysicalY", "96");
    SeedFonts9x();
}

void SeedVolatile9x()
{
    DeleteTree(HKEY_DYN_DATA, config_manager);
    struct Node {
        char hardware[256];
        DWORD problem;
    };
    static Node nodes[4 + 2 * SIM_MAX_CARDS];
    int n = 0;
    lstrcpynA(nodes[n].hardware, "HTREE\\ROOT\\0", 256), nodes[n++].problem = 0;
    lstrcpynA(nodes[n].hardware, "PCI\\VEN_8086&DEV_7190&SUBSYS_00000000&REV_03\\BUS_00&DEV_00&FUNC_00", 256),
        nodes[n++].problem = 0;
    lstrcpynA(nodes[n].hardware, "PCI\\VEN_8086&DEV_7191&SUBSYS_00000000&REV_03\\BUS_00&DEV_01&FUNC_00", 256),
        nodes[n++].problem = 0;
    for (int card = 0; card < sim->config.card_count; card++) {
        const SimCardConfig* c = &sim->config.cards[card];
        if (!c->vendor_id || !c->device_node) continue;
        HardwareKey(card, nodes[n].hardware, sizeof nodes[n].hardware);
        nodes[n++].problem = c->problem;
    }
    int cards[SIM_MAX_CARDS];
    int monitors = MonitorCards9x(cards);
    for (int i = 0; i < monitors; i++) {
        MonitorHardwareKey(cards[i], i, nodes[n].hardware, sizeof nodes[n].hardware);
        nodes[n++].problem = 0;
    }
    for (int i = 0; i < n; i++) {
        char key[96];
        snprintf(key, sizeof key, "%s\\C29A%04X", config_manager, 0x1C40 + i * 0x2C);
        SetText(HKEY_DYN_DATA, key, "HardWareKey", nodes[i].hardware, true);
        SetDword(HKEY_DYN_DATA, key, "Problem", nodes[i].problem, true);
        // DN_STARTED | DN_DRIVER_LOADED ..., or DN_HAS_PROBLEM.
        SetDword(HKEY_DYN_DATA, key, "Status", nodes[i].problem ? 0x01802400 : 0x0180600A, true);
    }
}

// --- Windows NT 4.0 ---

void ServiceKey(int card, char* out, size_t size)
{
    snprintf(out, size, "System\\CurrentControlSet\\Services\\%s", ServiceName(card));
}

// Wine keeps HKCC\System\CurrentControlSet volatile, so the HKCC copy is
// written volatile and made again from the HKLM copy at each start of
// Windows.
void WriteDefaultSettings(HKEY root, const char* key, const SimDriverMode* mode)
{
    bool v = root == HKEY_CURRENT_CONFIG;
    SetDword(root, key, "DefaultSettings.BitsPerPel", mode->bits, v);
    SetDword(root, key, "DefaultSettings.XResolution", mode->width, v);
    SetDword(root, key, "DefaultSettings.YResolution", mode->height, v);
    SetDword(root, key, "DefaultSettings.VRefresh", mode->requested, v);
    SetDword(root, key, "DefaultSettings.Flags", mode->interlaced ? DM_INTERLACED : 0, v);
    SetDword(root, key, "DefaultSettings.XPanning", 0, v);
    SetDword(root, key, "DefaultSettings.YPanning", 0, v);
}

bool ReadDefaultSettings(HKEY root, const char* key, SimDriverMode* mode)
{
    DWORD b, x, y, v = 0, flags = 0;
    if (!GetDword(root, key, "DefaultSettings.BitsPerPel", &b) || !GetDword(root, key, "DefaultSettings.XResolution", &x) ||
        !GetDword(root, key, "DefaultSettings.YResolution", &y))
        return false;
    GetDword(root, key, "DefaultSettings.VRefresh", &v);
    GetDword(root, key, "DefaultSettings.Flags", &flags);
    mode->width = (uint16_t)x;
    mode->height = (uint16_t)y;
    mode->bits = (uint16_t)b;
    mode->requested = (uint16_t)v;
    mode->interlaced = (flags & DM_INTERLACED) ? 1 : 0;
    return true;
}

void WriteDeviceValues(int card, const char* key)
{
    const SimCardConfig* c = &sim->config.cards[card];
    SetText(HKEY_LOCAL_MACHINE, key, "Device Description", RegistryDriverDesc(card));
    char dll[40];
    lstrcpynA(dll, SimCardChip(card)->driver_file, sizeof dll);
    char* dot = strrchr(dll, '.');
    if (dot) *dot = 0;
    dll[strlen(dll) + 1] = 0;
    SetValue(HKEY_LOCAL_MACHINE, key, "InstalledDisplayDrivers", REG_MULTI_SZ, dll, (DWORD)strlen(dll) + 2);
    DWORD bytes = c->memory_mb * 1024 * 1024 + c->memory_extra_kb * 1024;
    SetValue(HKEY_LOCAL_MACHINE, key, "HardwareInformation.MemorySize", REG_BINARY, &bytes, sizeof bytes);
}

void SeedMachineNt()
{
    int card = sim->config.primary_card;
    if (card < 0 || card >= sim->config.card_count || !sim->config.cards[card].vendor_id) return;
    char service[200], device[240], image[80];
    ServiceKey(card, service, sizeof service);
    Remember(HKEY_LOCAL_MACHINE, service);
    Remember(HKEY_CURRENT_CONFIG, service);
    snprintf(image, sizeof image, "System32\\drivers\\%s.sys", ServiceName(card));
    SetValue(HKEY_LOCAL_MACHINE, service, "ImagePath", REG_EXPAND_SZ, image, (DWORD)strlen(image) + 1);
    SetDword(HKEY_LOCAL_MACHINE, service, "Type", SERVICE_KERNEL_DRIVER);
    SetDword(HKEY_LOCAL_MACHINE, service, "Start", SERVICE_DEMAND_START);
    SetDword(HKEY_LOCAL_MACHINE, service, "ErrorControl", SERVICE_ERROR_NORMAL);
    SetText(HKEY_LOCAL_MACHINE, service, "Group", "Video");
    snprintf(device, sizeof device, "%s\\Device0", service);
    WriteDeviceValues(card, device);
    const SimMachineConfig* m = &sim->config;
    SimDriverMode start = {m->start_width, m->start_height, m->start_bits, 0, m->start_refresh, 0};
    RegistryWriteDisplaySettings(card, &start);
}

// Wine keeps HKLM\HARDWARE\DEVICEMAP\VIDEO itself and rewrites
// "\Device\Video0" whenever a process sets up its display devices, pointing
// it at a key of its own that it also rewrites. The device key's values
// are therefore mirrored into the key Wine names, and again after each
// rewrite.
void MirrorIntoWineDeviceKey()
{
    int card = sim->config.primary_card;
    if (card < 0 || card >= sim->config.card_count) return;
    char path[400];
    if (!GetText(HKEY_LOCAL_MACHINE, device_map, "\\Device\\Video0", path, sizeof path)) return;
    const char prefix[] = "\\Registry\\Machine\\";
    if (_strnicmp(path, prefix, sizeof prefix - 1) != 0) return;
    char* key = path + sizeof prefix - 1;
    char service[200];
    ServiceKey(card, service, sizeof service);
    if (_strnicmp(key, service, strlen(service)) == 0) return;
    HKEY probe;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, key, 0, KEY_SET_VALUE, &probe) != ERROR_SUCCESS) return;
    RegCloseKey(probe);
    WriteDeviceValues(card, key);
    CloseOpenKey();
    char image[80];
    snprintf(image, sizeof image, "System32\\drivers\\%s.sys", ServiceName(card));
    char* last = strrchr(key, '\\');
    if (!last) return;
    *last = 0;
    SetValue(HKEY_LOCAL_MACHINE, key, "ImagePath", REG_EXPAND_SZ, image, (DWORD)strlen(image) + 1);
    CloseOpenKey();
}

void SeedVolatileNt()
{
    DeleteTree(HKEY_LOCAL_MACHINE, resource_map);
    int card = sim->config.primary_card;
    if (card < 0 || card >= sim->config.card_count || !sim->config.cards[card].vendor_id) return;
    HKEY key = Create(HKEY_LOCAL_MACHINE, "HARDWARE\\RESOURCEMAP", true);
    if (key) RegCloseKey(key);
    char path[200];
    snprintf(path, sizeof path, "%s\\%s", resource_map, ServiceName(card));
    // A CM_RESOURCE_LIST with the card's first memory range.
    uint32_t list[9] = {1, 5 /* PCIBus */, 0, 0x00010001, 0, 0x03, SimCardBarAddress(card, 0), 0,
                        SimCardChip(card)->bars[0].size};
    SetValue(HKEY_LOCAL_MACHINE, path, "\\Device\\Video0.Raw", 8, list, sizeof list, true);
    SetValue(HKEY_LOCAL_MACHINE, path, "\\Device\\Video0.Translated", 8, list, sizeof list, true);
    char device[240];
    ServiceKey(card, path, sizeof path);
    snprintf(device, sizeof device, "%s\\Device0", path);
    SimDriverMode mode;
    if (ReadDefaultSettings(HKEY_LOCAL_MACHINE, device, &mode)) WriteDefaultSettings(HKEY_CURRENT_CONFIG, device, &mode);
    MirrorIntoWineDeviceKey();
}

HANDLE watcher_thread, watcher_stop;

DWORD WINAPI WatchWine(void*)
{
    HKEY key;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, device_map, 0, KEY_NOTIFY | KEY_QUERY_VALUE, &key) != ERROR_SUCCESS)
        return 0;
    HANDLE changed = CreateEventA(NULL, FALSE, FALSE, NULL);
    HANDLE events[2] = {watcher_stop, changed};
    for (;;) {
        RegNotifyChangeKeyValue(key, FALSE, REG_NOTIFY_CHANGE_LAST_SET | REG_NOTIFY_CHANGE_NAME, changed, TRUE);
        if (WaitForMultipleObjects(2, events, FALSE, INFINITE) != WAIT_OBJECT_0 + 1) break;
        // Wine writes the whole set in a burst: let it finish.
        while (WaitForSingleObject(changed, 50) == WAIT_OBJECT_0) {
        }
        if (WaitForSingleObject(watcher_stop, 0) == WAIT_OBJECT_0) break;
        MirrorIntoWineDeviceKey();
    }
    CloseHandle(changed);
    RegCloseKey(key);
    return 0;
}

}  // namespace

const char* RegistryDriverDesc(int card)
{
    const SimCardConfig* c = &sim->config.cards[card];
    return c->driver_desc[0] ? c->driver_desc : SimCardChip(card)->driver_desc;
}

int RegistryDriverKey(int card, char* out, size_t size)
{
    if (IsNt()) {
        char service[200];
        ServiceKey(card, service, sizeof service);
        snprintf(out, size, "%s\\Device0", service);
        return 1;
    }
    if (sim->cards[card].class_index == 0xFF) {
        out[0] = 0;
        return 0;
    }
    DriverKey9x(card, out, size);
    return 1;
}

void RegistryWriteModeList9x(int card, int width, int height, int bits, const uint16_t* rates, int count)
{
    char key[256];
    if (!RegistryDriverKey(card, key, sizeof key)) return;
    WriteModeList(key, width, height, bits, rates, count);
}

int RegistryRefreshText9x(int card, int width, int height, int bits, char* out, size_t size)
{
    char key[256], sub[320];
    if (!RegistryDriverKey(card, key, sizeof key)) return 0;
    ModesKey(key, bits, width, height, sub, sizeof sub);
    if (GetText(HKEY_LOCAL_MACHINE, sub, "RefreshRate", out, (DWORD)size) && out[0]) return 1;
    snprintf(sub, sizeof sub, "%s\\DEFAULT", key);
    return GetText(HKEY_LOCAL_MACHINE, sub, "RefreshRate", out, (DWORD)size) && out[0];
}

void RegistryWriteDisplaySettings(int card, const SimDriverMode* mode)
{
    if (card != sim->config.primary_card) return;
    if (!IsNt()) {
        char text[32];
        snprintf(text, sizeof text, "%d,%d", mode->width, mode->height);
        SetText(HKEY_CURRENT_CONFIG, "Display\\Settings", "Resolution", text);
        snprintf(text, sizeof text, "%d", mode->bits);
        SetText(HKEY_CURRENT_CONFIG, "Display\\Settings", "BitsPerPixel", text);
        CloseOpenKey();
        return;
    }
    char service[200], device[240];
    ServiceKey(card, service, sizeof service);
    snprintf(device, sizeof device, "%s\\Device0", service);
    WriteDefaultSettings(HKEY_CURRENT_CONFIG, device, mode);
    WriteDefaultSettings(HKEY_LOCAL_MACHINE, device, mode);
    CloseOpenKey();
}

int RegistryReadDisplaySettings(SimDriverMode* mode)
{
    int card = sim->config.primary_card;
    if (card < 0 || card >= sim->config.card_count) return 0;
    if (!IsNt()) {
        char resolution[32], bits[16];
        int w, h;
        if (!GetText(HKEY_CURRENT_CONFIG, "Display\\Settings", "Resolution", resolution, sizeof resolution) ||
            !GetText(HKEY_CURRENT_CONFIG, "Display\\Settings", "BitsPerPixel", bits, sizeof bits) ||
            sscanf(resolution, "%d,%d", &w, &h) != 2)
            return 0;
        mode->width = (uint16_t)w;
        mode->height = (uint16_t)h;
        mode->bits = (uint16_t)atoi(bits);
        mode->requested = 0;
        return mode->bits != 0;
    }
    char service[200], device[240];
    ServiceKey(card, service, sizeof service);
    snprintf(device, sizeof device, "%s\\Device0", service);
    return ReadDefaultSettings(HKEY_LOCAL_MACHINE, device, mode);
}

// Each card's display driver file where its Windows keeps it (what the
// driver key's "drv" or the service's "ImagePath" names): a copy of the
// versioned stand-in built beside the running program, when it is there.
static void InstallDriverFiles()
{
    char source[MAX_PATH], folder[MAX_PATH], target[MAX_PATH + 80];
    DWORD length = GetModuleFileNameA(NULL, source, sizeof source);
    char* slash = length < sizeof source ? strrchr(source, '\\') : NULL;
    if (!slash || (size_t)(slash - source) + sizeof driver_stand_in >= sizeof source) return;
    strcpy(slash + 1, driver_stand_in);
    UINT folder_length = IsNt() ? GetWindowsDirectoryA(folder, sizeof folder) : GetSystemDirectoryA(folder, sizeof folder);
    if (!folder_length || folder_length >= sizeof folder) return;
    for (int card = 0; card < sim->config.card_count; card++) {
        if (!sim->config.cards[card].vendor_id) continue;
        if (IsNt()) snprintf(target, sizeof target, "%s\\System32\\drivers\\%s.sys", folder, ServiceName(card));
        else snprintf(target, sizeof target, "%s\\%s", folder, SimCardChip(card)->driver_file);
        CopyFileA(source, target, FALSE);
    }
}

void RegistrySeedMachine()
{
    DeleteEarlierSeeds();
    seeded_used = 0;
    if (IsNt()) SeedMachineNt();
    else SeedMachine9x();
    seeded[seeded_used] = 0;
    SetValue(HKEY_LOCAL_MACHINE, marker_key, "Seeded", REG_MULTI_SZ, seeded, (DWORD)seeded_used + 1);
    SetText(HKEY_LOCAL_MACHINE, marker_key, "Machine", sim->identity);
    CloseOpenKey();
    InstallDriverFiles();
}

void RegistrySeedVolatile()
{
    if (IsNt()) SeedVolatileNt();
    else SeedVolatile9x();
    SetText(HKEY_LOCAL_MACHINE, session_key, "Machine", sim->identity, true);
    CloseOpenKey();
}

int RegistryIsOurs(int* volatile_ours, int* volatile_missing)
{
    char text[80];
    *volatile_missing = !GetText(HKEY_LOCAL_MACHINE, session_key, "Machine", text, sizeof text);
    *volatile_ours = !*volatile_missing && strcmp(text, sim->identity) == 0;
    return GetText(HKEY_LOCAL_MACHINE, marker_key, "Machine", text, sizeof text) && strcmp(text, sim->identity) == 0;
}

void RegistryAttachProcess()
{
    if (!IsNt()) return;
    MirrorIntoWineDeviceKey();
    if (watcher_thread) return;
    watcher_stop = CreateEventA(NULL, TRUE, FALSE, NULL);
    watcher_thread = CreateThread(NULL, 0, WatchWine, NULL, 0, NULL);
}

void RegistryDetachProcess()
{
    if (!watcher_thread) return;
    SetEvent(watcher_stop);
    WaitForSingleObject(watcher_thread, 2000);
    CloseHandle(watcher_thread);
    CloseHandle(watcher_stop);
    watcher_thread = watcher_stop = NULL;
}
