// The machine description: defaults, and SIMMACHINE.INI read with the
// profile functions (so a ';' only starts a comment at the start of a line).
#include <ctype.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "machine_state.h"

namespace {

// The monitor of the default machine: a Dell D1028L CRT of 1998. The block
// is the base block of the dump Analog/Dell/DEL730B/2851309C83FD in
// linuxhw/EDID (linux-hardware.org), CC BY 4.0.
const uint8_t default_edid[128] = {
    0x00, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0x00, 0x10, 0xAC, 0x0B, 0x73, 0x35, 0x50, 0x55, 0x41,
    0x1F, 0x08, 0x01, 0x01, 0x08, 0x1E, 0x17, 0xB9, 0xE8, 0x00, 0xB2, 0xA0, 0x57, 0x49, 0x9B, 0x26,
    0x10, 0x48, 0x4F, 0xA5, 0x4A, 0x00, 0x61, 0x59, 0x45, 0x59, 0x81, 0x80, 0x31, 0x59, 0x01, 0x01,
    0x01, 0x01, 0x01, 0x01, 0x01, 0x01, 0x10, 0x0B, 0xD0, 0xB4, 0x20, 0x5E, 0x63, 0x10, 0x12, 0x6C,
    0x62, 0x08, 0xFA, 0xB8, 0x00, 0x00, 0x00, 0x1A, 0x00, 0x00, 0x00, 0xFF, 0x00, 0x38, 0x34, 0x37,
    0x37, 0x39, 0x43, 0x41, 0x55, 0x50, 0x35, 0x38, 0x38, 0x0A, 0x00, 0x00, 0x00, 0xFC, 0x00, 0x44,
    0x45, 0x4C, 0x4C, 0x20, 0x44, 0x31, 0x30, 0x32, 0x38, 0x4C, 0x0A, 0x20, 0x00, 0x00, 0x00, 0xFD,
    0x00, 0x30, 0x78, 0x1E, 0x45, 0xFF, 0x00, 0x0A, 0x20, 0x20, 0x20, 0x20, 0x20, 0x20, 0x00, 0xB5,
};

const char missing[] = "\x01";  // default that tells a missing key from an empty one

struct RegisterPrefix {
    const char* prefix;
    SimRegisterFile file;
    int digits;  // hexadecimal digits of the index
};
const RegisterPrefix register_prefixes[] = {
    {"CR", SIM_REG_CRTC, 2}, {"SR", SIM_REG_SEQUENCER, 2}, {"GR", SIM_REG_GRAPHICS, 2},
    {"AR", SIM_REG_ATTRIBUTE, 2}, {"PCI", SIM_REG_PCI, 2}, {"FR", SIM_REG_FAMILY, 3},
};

bool ParseNumber(const char* text, int base, long* out)
{
    while (*text == ' ' || *text == '\t') text++;
    if (!*text) return false;
    char* end;
    long v = strtol(text, &end, base);
    while (*end == ' ' || *end == '\t') end++;
    if (*end) return false;
    *out = v;
    return true;
}

bool ParseHexDigits(const char* text, int digits, unsigned* out)
{
    unsigned v = 0;
    for (int i = 0; i < digits; i++) {
        if (!isxdigit((unsigned char)text[i])) return false;
        v = v * 16 + (isdigit((unsigned char)text[i]) ? text[i] - '0' : (toupper((unsigned char)text[i]) - 'A' + 10));
    }
    *out = v;
    return true;
}

struct Profile {
    const char* path;
    char section[16];
};

bool ReadText(const Profile* p, const char* key, char* out, DWORD size)
{
    GetPrivateProfileStringA(p->section, key, missing, out, size, p->path);
    return strcmp(out, missing) != 0;
}

void ReadInt(const Profile* p, const char* key, long low, long high, int base, long* inout)
{
    char text[64];
    long v;
    if (ReadText(p, key, text, sizeof text) && ParseNumber(text, base, &v) && v >= low && v <= high) *inout = v;
}

void ReadBool(const Profile* p, const char* key, bool* inout)
{
    long v = *inout;
    ReadInt(p, key, 0, 1, 10, &v);
    *inout = v != 0;
}

// "1024x768x16@75" (the rate may be left out: 60).
bool ParseMode(const char* text, uint16_t* width, uint16_t* height, uint16_t* bits, uint16_t* refresh)
{
    unsigned w, h, b, r = 60;
    char tail;
    int n = sscanf(text, " %ux%ux%u@%u %c", &w, &h, &b, &r, &tail);
    if (n != 3 && n != 4) return false;
    if (w < 320 || w > 4096 || h < 200 || h > 4096 || (b != 8 && b != 15 && b != 16 && b != 32) || r > 240)
        return false;
    *width = (uint16_t)w;
    *height = (uint16_t)h;
    *bits = (uint16_t)b;
    *refresh = (uint16_t)r;
    return true;
}

void ReadRegisterOverrides(const Profile* p, SimCardConfig* card)
{
    static char lines[32768];
    DWORD n = GetPrivateProfileSectionA(p->section, lines, sizeof lines, p->path);
    for (const char* line = lines; line < lines + n && *line; line += strlen(line) + 1) {
        const char* eq = strchr(line, '=');
        if (!eq) continue;
        char key[16];
        size_t key_len = (size_t)(eq - line);
        while (key_len && line[key_len - 1] == ' ') key_len--;
        if (key_len >= sizeof key) continue;
        memcpy(key, line, key_len);
        key[key_len] = 0;
        unsigned value;
        const char* v = eq + 1;
        while (*v == ' ') v++;
        if (!ParseHexDigits(v, 2, &value) || (v[2] && v[2] != ' ')) continue;
        SimInitialRegister r = {SIM_REG_MISC, 0, (uint8_t)value};
        bool known = lstrcmpiA(key, "MISC") == 0;
        for (const RegisterPrefix& rp : register_prefixes) {
            size_t len = strlen(rp.prefix);
            unsigned index;
            if (known || key_len != len + rp.digits || _strnicmp(key, rp.prefix, len) != 0) continue;
            if (!ParseHexDigits(key + len, rp.digits, &index)) continue;
            r.file = rp.file;
            r.index = (uint16_t)index;
            known = true;
        }
        if (known && card->initial_register_count < SIM_MAX_INITIAL_REGISTERS)
            card->initial_registers[card->initial_register_count++] = r;
    }
}

bool ReadCard(const Profile* p, int n, SimCardConfig* card, bool* primary)
{
    char text[300];
    unsigned vendor = 0x5333, device = 0x8901;
    if (ReadText(p, "Id", text, sizeof text)) {
        if (!ParseHexDigits(text, 4, &vendor) || text[4] != ':' || !ParseHexDigits(text + 5, 4, &device))
            return false;
    } else if (n != 0) {
        return false;
    }
    SimDefaultCard(card, (uint16_t)vendor, (uint16_t)device);
    card->device = (uint8_t)(10 + n);
    long v = card->bus;
    ReadInt(p, "Bus", 0, 1, 10, &v);
    card->bus = (uint8_t)v;
    v = card->device;
    ReadInt(p, "Device", 0, 31, 10, &v);
    card->device = (uint8_t)v;
    v = card->memory_mb;
    ReadInt(p, "MemoryMB", 1, 256, 10, &v);
    card->memory_mb = (uint32_t)v;
    v = card->memory_extra_kb;
    ReadInt(p, "MemoryExtraKB", 0, 1023, 10, &v);
    card->memory_extra_kb = (uint32_t)v;
    // The straps offer two crystals; any other value keeps the default.
    v = card->crystal_hz;
    ReadInt(p, "CrystalHz", 13500000, 14318180, 10, &v);
    if (v == 13500000 || v == 14318180) card->crystal_hz = (uint32_t)v;
    ReadBool(p, "DisplayDevice", &card->display_device);
    ReadBool(p, "Attached", &card->attached);
    ReadBool(p, "DeviceNode", &card->device_node);
    v = (long)card->problem;
    ReadInt(p, "Problem", 0, 0x7FFFFFFF, 10, &v);
    card->problem = (uint32_t)v;
    if (ReadText(p, "DriverDesc", text, sizeof text)) lstrcpynA(card->driver_desc, text, sizeof card->driver_desc);
    if (ReadText(p, "EDID", text, sizeof text)) {
        uint8_t edid[128];
        bool ok = strlen(text) == 256;
        for (int i = 0; ok && i < 128; i++) {
            unsigned b;
            ok = ParseHexDigits(text + 2 * i, 2, &b);
            edid[i] = (uint8_t)b;
        }
        if (ok) memcpy(card->edid, edid, sizeof edid);
        card->has_edid = ok;
    }
    if (ReadText(p, "StartMode", text, sizeof text))
        ParseMode(text, &card->start_width, &card->start_height, &card->start_bits, &card->start_refresh);
    bool is_primary = false;
    ReadBool(p, "Primary", &is_primary);
    *primary = is_primary;
    ReadRegisterOverrides(p, card);
    return true;
}

}  // namespace

void SimDefaultCard(SimCardConfig* card, uint16_t vendor_id, uint16_t device_id)
{
    memset(card, 0, sizeof *card);
    card->vendor_id = vendor_id;
    card->device_id = device_id;
    card->bus = 0;
    card->device = 10;
    card->memory_mb = 4;
    card->display_device = true;
    card->attached = true;
    card->device_node = true;
    card->has_edid = true;
    memcpy(card->edid, default_edid, sizeof default_edid);
    card->crystal_hz = 14318180;
}

void SimDefaultMachine(SimMachineConfig* config)
{
    memset(config, 0, sizeof *config);
    config->windows = SIM_WINDOWS_98;
    config->card_count = 1;
    SimDefaultCard(&config->cards[0], 0x5333, 0x8901);
    config->primary_card = 0;
    config->start_width = 1024;
    config->start_height = 768;
    // Wine's virtual desktop shows every process but the one that changed
    // it 32 bits per pixel; a 32-bit desktop looks the same from everywhere.
    config->start_bits = 32;
    config->start_refresh = 75;
    config->monitors = 0;
    config->nt_device = true;
    config->vxd_device = true;
    config->video_bios = true;
}

int SimReadDescription(const char* path, SimMachineConfig* config)
{
    char full[MAX_PATH];
    if (!GetFullPathNameA(path, sizeof full, full, NULL)) lstrcpynA(full, path, sizeof full);
    if (GetFileAttributesA(full) == INVALID_FILE_ATTRIBUTES) return 0;

    Profile p = {full, "Machine"};
    char text[64];
    if (ReadText(&p, "Windows", text, sizeof text)) {
        if (lstrcmpiA(text, "95") == 0) config->windows = SIM_WINDOWS_95;
        else if (lstrcmpiA(text, "98") == 0) config->windows = SIM_WINDOWS_98;
        else if (lstrcmpiA(text, "NT4") == 0 || lstrcmpiA(text, "NT") == 0) config->windows = SIM_WINDOWS_NT4;
    }
    long v = config->monitors;
    ReadInt(&p, "Monitors", 0, SIM_MAX_CARDS, 10, &v);
    config->monitors = (int)v;
    if (ReadText(&p, "StartMode", text, sizeof text))
        ParseMode(text, &config->start_width, &config->start_height, &config->start_bits, &config->start_refresh);
    ReadBool(&p, "KernelDevice", &config->nt_device);
    ReadBool(&p, "MappingDevice", &config->vxd_device);
    ReadBool(&p, "VideoBios", &config->video_bios);

    config->card_count = 0;
    config->primary_card = -1;
    for (int n = 0; n < SIM_MAX_CARDS; n++) {
        snprintf(p.section, sizeof p.section, "Card%d", n);
        bool primary = false;
        SimCardConfig* card = &config->cards[config->card_count];
        if (!ReadCard(&p, n, card, &primary)) continue;
        if (primary && config->primary_card < 0) config->primary_card = config->card_count;
        config->card_count++;
    }
    if (config->primary_card < 0 && config->card_count > 0) config->primary_card = 0;
    return 1;
}
