// Which raster system fonts Windows loads at its next start: the VGA set
// for small fonts, the 8514 set for large ones. Only registry entries
// change; no font file is copied.
#include "modes/font_size.h"

#include <windows.h>

#include "base/runtime.h"
#include "base/state.h"

static const int large_font_threshold = 108;  // dots per inch above this: large fonts
enum { ENUM_BUFFER_SIZE = 63, FONT_FILE_SIZE = 64 };

struct FontSet {
    const char* system_key;  // 9x: fontsize entries of the system fonts
    const char* user_key;    // 9x: fontsize entries of the user fonts
    const char* fonts_fon;
    const char* fixedfon_fon;
    const char* oemfont_fon;
    const char* registrations[4][2];  // NT: font description, file
};

static const FontSet small_fonts = {
    "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\fontsize\\96\\System",
    "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\fontsize\\96\\User",
    "vgasys.fon",
    "vgafix.fon",
    "vgaoem.fon",
    {{"Courier 10,12,15 (VGA res)", "COURE.FON"},
     {"MS Sans Serif 8,10,12,14,18,24 (VGA res)", "SSERIFE.FON"},
     {"MS Serif 8,10,12,14,18,24 (VGA res)", "SERIFE.FON"},
     {"Small Fonts (VGA res)", "SMALLE.FON"}},
};

static const FontSet large_fonts = {
    "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\fontsize\\120\\System",
    "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\fontsize\\120\\User",
    "8514sys.fon",
    "8514fix.fon",
    "8514oem.fon",
    {{"Courier 10,12,15 (8514a res)", "COURF.FON"},
     {"MS Sans Serif 8,10,12,14,18,24 (8514a res)", "SSERIFF.FON"},
     {"MS Serif 8,10,12,14,18,24 (8514a res)", "SERIFF.FON"},
     {"Small Fonts (8514a res)", "SMALLF.FON"}},
};

static const char display_settings_key[] = "Display\\Settings";
static const char display_fonts_key[] = "Display\\Fonts";
static const char nt_system_fonts_key[] = "Software\\Fonts";
static const char nt_font_registry_key[] = "SOFTWARE\\Microsoft\\Windows NT\\CurrentVersion\\Fonts";

// Text values in keys Windows owns are written as Windows writes them:
// with the terminating zero its readers expect.
static void WriteText(HKEY key, const char* name, const char* text)
{
    RegSetValueExA(key, name, 0, REG_SZ, (const BYTE*)text, (DWORD)TextLength(text) + 1);
}

static void WriteNumberText(HKEY key, const char* name, int value)
{
    char text[16];
    FormatText(text, sizeof text, "%d", value);
    WriteText(key, name, text);
}

// Copies every value of from into to with name and data exchanged: the
// fontsize keys map font files to the names Windows looks them up by.
static void CopyExchanged(HKEY from, HKEY to)
{
    for (DWORD i = 0;; ++i) {
        char name[ENUM_BUFFER_SIZE], data[ENUM_BUFFER_SIZE + 1];
        DWORD name_length = sizeof name, data_length = ENUM_BUFFER_SIZE;
        if (RegEnumValueA(from, i, name, &name_length, NULL, NULL, (BYTE*)data, &data_length) != ERROR_SUCCESS) return;
        data[data_length] = 0;
        WriteText(to, data, name);
    }
}

static void EmptyKey(HKEY key)
{
    for (;;) {
        char name[ENUM_BUFFER_SIZE + 1];
        DWORD name_length = sizeof name;
        if (RegEnumValueA(key, 0, name, &name_length, NULL, NULL, NULL, NULL) != ERROR_SUCCESS) return;
        if (RegDeleteValueA(key, name) != ERROR_SUCCESS) return;
    }
}

static void SwitchOnWindows9x(const FontSet* set, int dpi_x, int dpi_y)
{
    HKEY system_fonts, settings;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, set->system_key, 0, KEY_READ, &system_fonts) != ERROR_SUCCESS) return;
    if (RegOpenKeyExA(HKEY_CURRENT_CONFIG, display_settings_key, 0, KEY_READ | KEY_WRITE, &settings) !=
        ERROR_SUCCESS) {
        RegCloseKey(system_fonts);
        return;
    }
    CopyExchanged(system_fonts, settings);
    WriteNumberText(settings, "DPIPhysicalX", dpi_x);
    WriteNumberText(settings, "DPIPhysicalY", dpi_y);
    if (dpi_y != dpi_x) WriteNumberText(settings, "DPILogicalY", dpi_y);
    RegCloseKey(settings);
    RegCloseKey(system_fonts);

    // The source first: without it the font list must not be emptied.
    HKEY user_fonts, fonts;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, set->user_key, 0, KEY_READ, &user_fonts) != ERROR_SUCCESS) return;
    if (RegOpenKeyExA(HKEY_CURRENT_CONFIG, display_fonts_key, 0, KEY_READ | KEY_WRITE, &fonts) != ERROR_SUCCESS) {
        RegCloseKey(user_fonts);
        return;
    }
    EmptyKey(fonts);
    CopyExchanged(user_fonts, fonts);
    RegCloseKey(fonts);
    RegCloseKey(user_fonts);
}

static void SwitchOnWindowsNT(const FontSet* set, const FontSet* other, int dpi_x)
{
    HKEY system_fonts;
    if (RegOpenKeyExA(HKEY_CURRENT_CONFIG, nt_system_fonts_key, 0, KEY_READ | KEY_WRITE, &system_fonts) !=
        ERROR_SUCCESS)
        return;
    char current[FONT_FILE_SIZE + 1];
    DWORD length = FONT_FILE_SIZE;
    memset(current, 0, sizeof current);
    RegQueryValueExA(system_fonts, "FONTS.FON", NULL, NULL, (BYTE*)current, &length);
    // A system font of neither set was chosen by someone else: leave it be.
    if (lstrcmpiA(current, large_fonts.fonts_fon) != 0 && lstrcmpiA(current, small_fonts.fonts_fon) != 0) {
        RegCloseKey(system_fonts);
        return;
    }
    WriteText(system_fonts, "FONTS.FON", set->fonts_fon);
    WriteText(system_fonts, "FIXEDFON.FON", set->fixedfon_fon);
    WriteText(system_fonts, "OEMFONT.FON", set->oemfont_fon);
    DWORD logpixels = (DWORD)dpi_x;
    RegSetValueExA(system_fonts, "LogPixels", 0, REG_DWORD, (const BYTE*)&logpixels, sizeof logpixels);
    RegCloseKey(system_fonts);

    HKEY registrations;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, nt_font_registry_key, 0, KEY_READ | KEY_WRITE, &registrations) !=
        ERROR_SUCCESS)
        return;
    for (const auto& font : other->registrations) RegDeleteValueA(registrations, font[0]);
    for (const auto& font : set->registrations) WriteText(registrations, font[0], font[1]);
    RegCloseKey(registrations);
}

void SwitchFontSize(int dpi_x, int dpi_y)
{
    bool large = dpi_x > large_font_threshold;
    const FontSet* set = large ? &large_fonts : &small_fonts;
    const FontSet* other = large ? &small_fonts : &large_fonts;
    if (platform == PLATFORM_9X) SwitchOnWindows9x(set, dpi_x, dpi_y);
    else if (platform == PLATFORM_NT) SwitchOnWindowsNT(set, other, dpi_x);
}
