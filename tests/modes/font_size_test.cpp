#include <gtest/gtest.h>

#include <map>

#include "base/state.h"
#include "modes/font_size.h"
#include "support/support.h"

static const char fontsize[] = "SOFTWARE\\Microsoft\\Windows\\CurrentVersion\\fontsize";
static const char settings[] = "Display\\Settings";
static const char fonts[] = "Display\\Fonts";
static const char nt_system_fonts[] = "Software\\Fonts";
static const char nt_registrations[] = "SOFTWARE\\Microsoft\\Windows NT\\CurrentVersion\\Fonts";

static std::map<std::string, std::string> Values(HKEY root, const std::string& path)
{
    std::map<std::string, std::string> values;
    HKEY key;
    if (RegOpenKeyExA(root, path.c_str(), 0, KEY_READ, &key) != ERROR_SUCCESS) return values;
    for (DWORD i = 0;; ++i) {
        char name[256], data[256];
        DWORD name_size = sizeof name, data_size = sizeof data - 1;
        if (RegEnumValueA(key, i, name, &name_size, NULL, NULL, (BYTE*)data, &data_size) != ERROR_SUCCESS) break;
        data[data_size] = 0;
        values[name] = data;
    }
    RegCloseKey(key);
    return values;
}

static void DeleteValue(HKEY root, const std::string& path, const std::string& name)
{
    HKEY key;
    if (RegOpenKeyExA(root, path.c_str(), 0, KEY_ALL_ACCESS, &key) != ERROR_SUCCESS) return;
    RegDeleteValueA(key, name.c_str());
    RegCloseKey(key);
}

class FontSizeOn9x : public ::testing::Test {
protected:
    void SetUp() override
    {
        ResetProgramState();
        platform = PLATFORM_9X;
        os_class = OS_CLASS_WIN98;
        Clean();
        std::string base = fontsize;
        WriteRegistryString(HKEY_LOCAL_MACHINE, base + "\\96\\System", "vgasys.fon", "fonts.fon");
        WriteRegistryString(HKEY_LOCAL_MACHINE, base + "\\96\\System", "vgafix.fon", "fixedfon.fon");
        WriteRegistryString(HKEY_LOCAL_MACHINE, base + "\\96\\User", "sserife.fon", "MS Sans Serif 8,10,12,14,18,24");
        WriteRegistryString(HKEY_LOCAL_MACHINE, base + "\\120\\System", "8514sys.fon", "fonts.fon");
        WriteRegistryString(HKEY_LOCAL_MACHINE, base + "\\120\\System", "8514fix.fon", "fixedfon.fon");
        WriteRegistryString(HKEY_LOCAL_MACHINE, base + "\\120\\User", "sseriff.fon", "MS Sans Serif 8,10,12,14,18,24");
        WriteRegistryString(HKEY_LOCAL_MACHINE, base + "\\120\\User", "coure.fon", "Courier 10,12,15");
        WriteRegistryString(HKEY_CURRENT_CONFIG, settings, "Resolution", "1024,768");
        WriteRegistryString(HKEY_CURRENT_CONFIG, fonts, "old.fon", "Old Font");
    }
    void TearDown() override { Clean(); }
    void Clean()
    {
        DeleteRegistryTree(HKEY_LOCAL_MACHINE, fontsize);
        DeleteRegistryTree(HKEY_CURRENT_CONFIG, "Display");
    }
};

TEST_F(FontSizeOn9x, LargeFontsNameThe8514SetAndRecordTheDpi)
{
    SwitchFontSize(132, 132);
    std::map<std::string, std::string> s = Values(HKEY_CURRENT_CONFIG, settings);
    EXPECT_EQ("8514sys.fon", s["fonts.fon"]);
    EXPECT_EQ("8514fix.fon", s["fixedfon.fon"]);
    EXPECT_EQ("132", s["DPIPhysicalX"]);
    EXPECT_EQ("132", s["DPIPhysicalY"]);
    EXPECT_EQ(0u, s.count("DPILogicalY"));
    EXPECT_EQ("1024,768", s["Resolution"]);
    std::map<std::string, std::string> f = Values(HKEY_CURRENT_CONFIG, fonts);
    EXPECT_EQ((std::map<std::string, std::string>{{"MS Sans Serif 8,10,12,14,18,24", "sseriff.fon"},
                                                  {"Courier 10,12,15", "coure.fon"}}),
              f);
}

TEST_F(FontSizeOn9x, ThresholdAndUnequalDpi)
{
    SwitchFontSize(108, 100);
    std::map<std::string, std::string> s = Values(HKEY_CURRENT_CONFIG, settings);
    EXPECT_EQ("vgasys.fon", s["fonts.fon"]);
    EXPECT_EQ("108", s["DPIPhysicalX"]);
    EXPECT_EQ("100", s["DPILogicalY"]);
    EXPECT_EQ(1u, Values(HKEY_CURRENT_CONFIG, fonts).size());
    SwitchFontSize(109, 109);
    EXPECT_EQ("8514sys.fon", Values(HKEY_CURRENT_CONFIG, settings)["fonts.fon"]);
}

TEST_F(FontSizeOn9x, AMissingFontListLeavesTheCurrentOneAlone)
{
    DeleteRegistryTree(HKEY_LOCAL_MACHINE, std::string(fontsize) + "\\120\\User");
    SwitchFontSize(120, 120);
    EXPECT_EQ("8514sys.fon", Values(HKEY_CURRENT_CONFIG, settings)["fonts.fon"]);
    EXPECT_EQ((std::map<std::string, std::string>{{"old.fon", "Old Font"}}), Values(HKEY_CURRENT_CONFIG, fonts));
}

class FontSizeOnNT : public ::testing::Test {
protected:
    void SetUp() override
    {
        ResetProgramState();
        platform = PLATFORM_NT;
        os_class = 3;
        // Wine keeps its own DPI here: put it back afterwards.
        saved = Values(HKEY_CURRENT_CONFIG, nt_system_fonts);
        bool found = false;
        saved_logpixels = ReadRegistryRaw(HKEY_CURRENT_CONFIG, nt_system_fonts, "LogPixels", &found);
        had_logpixels = found;
        WriteRegistryString(HKEY_CURRENT_CONFIG, nt_system_fonts, "FONTS.FON", "vgasys.fon");
    }
    void TearDown() override
    {
        for (const char* v : {"FONTS.FON", "FIXEDFON.FON", "OEMFONT.FON", "LogPixels"})
            DeleteValue(HKEY_CURRENT_CONFIG, nt_system_fonts, v);
        for (const auto& kv : saved)
            if (kv.first != "LogPixels") WriteRegistryString(HKEY_CURRENT_CONFIG, nt_system_fonts, kv.first, kv.second);
        if (had_logpixels) {
            HKEY key;
            RegCreateKeyExA(HKEY_CURRENT_CONFIG, nt_system_fonts, 0, NULL, 0, KEY_ALL_ACCESS, NULL, &key, NULL);
            RegSetValueExA(key, "LogPixels", 0, REG_DWORD, (const BYTE*)saved_logpixels.data(), 4);
            RegCloseKey(key);
        }
        for (const char* res : {"VGA res", "8514a res"}) {
            for (const char* face : {"Courier 10,12,15", "MS Sans Serif 8,10,12,14,18,24", "MS Serif 8,10,12,14,18,24",
                                     "Small Fonts"})
                DeleteValue(HKEY_LOCAL_MACHINE, nt_registrations, std::string(face) + " (" + res + ")");
        }
    }
    int Registered(const char* res)
    {
        int n = 0;
        for (const auto& kv : Values(HKEY_LOCAL_MACHINE, nt_registrations))
            if (kv.first.find(res) != std::string::npos) ++n;
        return n;
    }
    std::map<std::string, std::string> saved;
    std::string saved_logpixels;
    bool had_logpixels = false;
};

TEST_F(FontSizeOnNT, RegistrationsSwapBothWays)
{
    SwitchFontSize(120, 120);
    std::map<std::string, std::string> s = Values(HKEY_CURRENT_CONFIG, nt_system_fonts);
    EXPECT_EQ("8514sys.fon", s["FONTS.FON"]);
    EXPECT_EQ("8514fix.fon", s["FIXEDFON.FON"]);
    EXPECT_EQ("8514oem.fon", s["OEMFONT.FON"]);
    DWORD type = 0;
    std::string logpixels = ReadRegistryRaw(HKEY_CURRENT_CONFIG, nt_system_fonts, "LogPixels", NULL, &type);
    EXPECT_EQ((DWORD)REG_DWORD, type);
    ASSERT_EQ(4u, logpixels.size());
    EXPECT_EQ(120, *(const int*)logpixels.data());
    EXPECT_EQ(0, Registered("(VGA res)"));
    EXPECT_EQ(4, Registered("(8514a res)"));
    EXPECT_EQ("SSERIFF.FON", Values(HKEY_LOCAL_MACHINE, nt_registrations)["MS Sans Serif 8,10,12,14,18,24 (8514a res)"]);

    SwitchFontSize(96, 96);
    EXPECT_EQ("vgasys.fon", Values(HKEY_CURRENT_CONFIG, nt_system_fonts)["FONTS.FON"]);
    EXPECT_EQ(4, Registered("(VGA res)"));
    EXPECT_EQ(0, Registered("(8514a res)"));
}

TEST_F(FontSizeOnNT, ASystemFontOfNeitherSetIsLeftAlone)
{
    WriteRegistryString(HKEY_CURRENT_CONFIG, nt_system_fonts, "FONTS.FON", "custom.fon");
    std::map<std::string, std::string> before = Values(HKEY_CURRENT_CONFIG, nt_system_fonts);
    SwitchFontSize(120, 120);
    EXPECT_EQ(before, Values(HKEY_CURRENT_CONFIG, nt_system_fonts));
    EXPECT_EQ(0, Registered("(8514a res)"));
}
