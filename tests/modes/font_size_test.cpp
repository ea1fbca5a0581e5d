// The registry entries a font size change leaves for the next start of Windows.
#include <gtest/gtest.h>

#include <map>

#include "base/state.h"
#include "modes/font_size.h"
#include "support/support.h"

// Declared for Vista and later only.
extern "C" LONG WINAPI RegDeleteKeyValueA(HKEY key, LPCSTR subkey, LPCSTR name);
extern "C" LONG WINAPI RegSetKeyValueA(HKEY key, LPCSTR subkey, LPCSTR name, DWORD type, LPCVOID data, DWORD size);

typedef std::map<std::string, std::string> Values;
static const char fontsize[] = "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\fontsize\\";
static const char nt_fonts[] = "Software\\Fonts";
static const char registrations[] = "SOFTWARE\\Microsoft\\Windows NT\\CurrentVersion\\Fonts";

static Values Read(HKEY root, const std::string& path)
{
    Values values;
    HKEY key;
    char name[256], data[256];
    DWORD n = sizeof name, d = sizeof data - 1;
    if (RegOpenKeyExA(root, path.c_str(), 0, KEY_READ, &key) != ERROR_SUCCESS) return values;
    for (DWORD i = 0; RegEnumValueA(key, i, name, &n, NULL, NULL, (BYTE*)data, &d) == ERROR_SUCCESS; ++i) {
        values[name] = std::string(data, d).c_str();
        n = sizeof name, d = sizeof data - 1;
    }
    RegCloseKey(key);
    return values;
}

TEST(FontSizeOn9x, TheSetFollowsTheDpiWhichIsRecorded)
{
    ResetProgramState();
    platform = PLATFORM_9X;
    DeleteRegistryTree(HKEY_CURRENT_CONFIG, "Display");
    DeleteRegistryTree(HKEY_LOCAL_MACHINE, fontsize);
    const char* seeds[][3] = {{"96\\System", "vgasys.fon", "fonts.fon"},
                              {"96\\User", "sserife.fon", "MS Sans Serif 8,10,12,14,18,24"},
                              {"120\\System", "8514sys.fon", "fonts.fon"},
                              {"120\\System", "8514fix.fon", "fixedfon.fon"},
                              {"120\\User", "sseriff.fon", "MS Sans Serif 8,10,12,14,18,24"},
                              {"120\\User", "coure.fon", "Courier 10,12,15"}};
    for (const auto& s : seeds) WriteRegistryString(HKEY_LOCAL_MACHINE, fontsize + std::string(s[0]), s[1], s[2]);
    WriteRegistryString(HKEY_CURRENT_CONFIG, "Display\\Settings", "Resolution", "1024,768");
    WriteRegistryString(HKEY_CURRENT_CONFIG, "Display\\Fonts", "old.fon", "Old Font");
    SwitchFontSize(132, 132);
    EXPECT_EQ((Values{{"fonts.fon", "8514sys.fon"}, {"fixedfon.fon", "8514fix.fon"}, {"DPIPhysicalX", "132"},
                      {"DPIPhysicalY", "132"}, {"Resolution", "1024,768"}}),
              Read(HKEY_CURRENT_CONFIG, "Display\\Settings"));
    EXPECT_EQ((Values{{"MS Sans Serif 8,10,12,14,18,24", "sseriff.fon"}, {"Courier 10,12,15", "coure.fon"}}),
              Read(HKEY_CURRENT_CONFIG, "Display\\Fonts"));

    SwitchFontSize(108, 100);  // 108 is still small
    EXPECT_EQ((Values{{"fonts.fon", "vgasys.fon"}, {"fixedfon.fon", "8514fix.fon"}, {"DPIPhysicalX", "108"},
                      {"DPIPhysicalY", "100"}, {"DPILogicalY", "100"}, {"Resolution", "1024,768"}}),
              Read(HKEY_CURRENT_CONFIG, "Display\\Settings"));
    EXPECT_EQ((Values{{"MS Sans Serif 8,10,12,14,18,24", "sserife.fon"}}), Read(HKEY_CURRENT_CONFIG, "Display\\Fonts"));

    // Without the set's font list the current one stays.
    DeleteRegistryTree(HKEY_LOCAL_MACHINE, fontsize + std::string("120\\User"));
    SwitchFontSize(109, 109);
    EXPECT_EQ("8514sys.fon", Read(HKEY_CURRENT_CONFIG, "Display\\Settings")["fonts.fon"]);
    EXPECT_EQ((Values{{"MS Sans Serif 8,10,12,14,18,24", "sserife.fon"}}), Read(HKEY_CURRENT_CONFIG, "Display\\Fonts"));
    DeleteRegistryTree(HKEY_LOCAL_MACHINE, fontsize);
    DeleteRegistryTree(HKEY_CURRENT_CONFIG, "Display");
}

static int Registered(const char* res)
{
    int n = 0;
    for (const auto& kv : Read(HKEY_LOCAL_MACHINE, registrations)) n += kv.first.find(res) != std::string::npos;
    return n;
}

// Wine keeps its own system fonts and DPI in this key: they are put back.
TEST(FontSizeOnNT, SystemFontsAndRegistrationsSwapBothWays)
{
    ResetProgramState();
    platform = PLATFORM_NT;
    struct Saved {
        const char* name;
        std::string data;
        bool found;
        DWORD type;
    } saved[] = {{"FONTS.FON"}, {"FIXEDFON.FON"}, {"OEMFONT.FON"}, {"LogPixels"}};
    for (Saved& s : saved) s.data = ReadRegistryRaw(HKEY_CURRENT_CONFIG, nt_fonts, s.name, &s.found, &s.type);
    WriteRegistryString(HKEY_CURRENT_CONFIG, nt_fonts, "FONTS.FON", "vgasys.fon");

    SwitchFontSize(120, 120);
    Values s = Read(HKEY_CURRENT_CONFIG, nt_fonts);
    EXPECT_EQ("8514sys.fon", s["FONTS.FON"]);
    EXPECT_EQ("8514fix.fon", s["FIXEDFON.FON"]);
    EXPECT_EQ("8514oem.fon", s["OEMFONT.FON"]);
    DWORD type = 0;
    EXPECT_EQ(std::string("\x78\0\0\0", 4), ReadRegistryRaw(HKEY_CURRENT_CONFIG, nt_fonts, "LogPixels", NULL, &type));
    EXPECT_EQ((DWORD)REG_DWORD, type);
    EXPECT_EQ(0, Registered("(VGA res)"));
    EXPECT_EQ(4, Registered("(8514a res)"));
    EXPECT_EQ("SSERIFF.FON", Read(HKEY_LOCAL_MACHINE, registrations)["MS Sans Serif 8,10,12,14,18,24 (8514a res)"]);
    SwitchFontSize(96, 96);
    EXPECT_EQ("vgasys.fon", Read(HKEY_CURRENT_CONFIG, nt_fonts)["FONTS.FON"]);
    EXPECT_EQ(4, Registered("(VGA res)"));
    EXPECT_EQ(0, Registered("(8514a res)"));
    // A system font of neither set was chosen by someone else.
    WriteRegistryString(HKEY_CURRENT_CONFIG, nt_fonts, "FONTS.FON", "custom.fon");
    Values before = Read(HKEY_CURRENT_CONFIG, nt_fonts);
    SwitchFontSize(120, 120);
    EXPECT_EQ(before, Read(HKEY_CURRENT_CONFIG, nt_fonts));
    EXPECT_EQ(0, Registered("(8514a res)"));

    for (const Saved& v : saved) {
        if (v.found) RegSetKeyValueA(HKEY_CURRENT_CONFIG, nt_fonts, v.name, v.type, &v.data[0], (DWORD)v.data.size());
        else RegDeleteKeyValueA(HKEY_CURRENT_CONFIG, nt_fonts, v.name);
    }
    for (const auto& kv : Read(HKEY_LOCAL_MACHINE, registrations))
        if (kv.first.find(" res)") != std::string::npos)
            RegDeleteKeyValueA(HKEY_LOCAL_MACHINE, registrations, kv.first.c_str());
}
