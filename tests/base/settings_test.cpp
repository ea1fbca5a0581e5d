// The settings store in Wine's registry, and the number reader behind it.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/number.h"
#include "base/settings.h"
#include "support/support.h"

static const char program_key[] = "SOFTWARE\\QUORVEL\\PANEL", card_key[] = "SOFTWARE\\QUORVEL\\PANEL\\12d20018",
                  card_key53[] = "SOFTWARE\\QUORVEL\\PANEL\\53330018";

// Windows 9x stores the count it is given, but Wine, like NT, adds a
// terminator the count left out: the count is caught in the import table.
extern "C" decltype(&RegSetValueExA) __imp_RegSetValueExA;
static decltype(&RegSetValueExA) real_set_value;
static DWORD stored_count;
static LONG WINAPI CountingSetValue(HKEY key, LPCSTR name, DWORD reserved, DWORD type, const BYTE* data, DWORD count)
{
    stored_count = count;
    return real_set_value(key, name, reserved, type, data, count);
}

class SettingsStore : public ::testing::Test {
protected:
    void SetUp() override
    {
        DWORD protection;
        if (!real_set_value && VirtualProtect(&__imp_RegSetValueExA, sizeof(void*), PAGE_READWRITE, &protection))
            real_set_value = __imp_RegSetValueExA, __imp_RegSetValueExA = CountingSetValue;
        ASSERT_TRUE(real_set_value);
        ResetProgramState();
        ClearSettingsStore();
        adapter_count = 1;
        adapter_table[0] = AdapterRecord{0x12D2, 0x0018, 0, 0, 16, 1024, 768, 85, 0, 0, 0, 0, ""};
    }
    void TearDown() override { ClearSettingsStore(); }
};

TEST_F(SettingsStore, EveryValueIsDecimalTextWithoutTerminator)
{
    EXPECT_EQ(-1, LoadSetting(SETTING_REFRESH));
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, card_key)) << "a load creates nothing";
    static const struct { int id; int32_t value; const char* name; } cases[] = {
        {SETTING_REFRESH, 85, "refresh"}, {SETTING_WIDTH, 1280, "width"}, {SETTING_HEIGHT, 1024, "height"},
        {SETTING_BITS, 16, "bits"}, {SETTING_MCLK, 100, "mclk"}, {SETTING_MCLK_DEFAULT, 57, "mclkdef"},
        {SETTING_POSITION_H, 1, "1024x768x16x85H"}, {SETTING_POSITION_V, 8425, "1024x768x16x85V"},
        {SETTING_STANDBY, -1, "Standby"}, {SETTING_SUSPEND, 0, "Suspend"}, {SETTING_SHUTOFF, 15, "Shutoff"},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(c.value, SaveSetting(c.id, c.value)) << c.name;
        std::string text = std::to_string(c.value);
        EXPECT_EQ(text.size(), stored_count) << c.name;
        DWORD type = 0;
        const char* key = c.name[0] == 'S' ? program_key : card_key;  // the timers are the program's
        EXPECT_EQ(text, ReadRegistryRaw(HKEY_LOCAL_MACHINE, key, c.name, NULL, &type).c_str()) << c.name;
        EXPECT_EQ((DWORD)REG_SZ, type) << c.name;
        EXPECT_EQ(c.value, LoadSetting(c.id)) << c.name;
    }
    // A position belongs to its mode, and goes below 1.
    adapter_table[0].refresh_hz = 75;
    EXPECT_EQ(-1, LoadSetting(SETTING_POSITION_H));
    adapter_table[0].refresh_hz = 85;
    EXPECT_EQ(0, SaveSetting(SETTING_POSITION_H, 0));
    EXPECT_EQ(-1, LoadSetting(SETTING_POSITION_H));
    EXPECT_EQ(8425, LoadSetting(SETTING_POSITION_V));
    // Other installations, and Windows 9x, may leave the terminator out.
    WriteRegistryString(HKEY_LOCAL_MACHINE, card_key, "refresh", "1234567890", false);  // fills the buffer
    WriteRegistryString(HKEY_LOCAL_MACHINE, card_key, "mclk", "12345678901", false);    // too long for it
    EXPECT_EQ(1234567890, LoadSetting(SETTING_REFRESH));
    EXPECT_EQ(-1, LoadSetting(SETTING_MCLK));
}

TEST_F(SettingsStore, ResetErasesCardKeysAndTimersOnly)
{
    ResetSettings();
    for (int id : {0, 2, 9, 13, 16}) EXPECT_EQ(-1, SaveSetting(id, 5)) << id;
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, program_key)) << "nothing to reset, no such values";
    SaveSetting(SETTING_REFRESH, 85);
    adapter_table[0].vendor_id = 0x5333;
    for (int id : {SETTING_REFRESH, SETTING_STANDBY, SETTING_SUSPEND, SETTING_SHUTOFF}) SaveSetting(id, 5);
    WriteRegistryString(HKEY_LOCAL_MACHINE, program_key, "Other", "kept");
    ResetSettings();
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, card_key) || RegistryKeyExists(HKEY_LOCAL_MACHINE, card_key53));
    for (int id : {SETTING_STANDBY, SETTING_SUSPEND, SETTING_SHUTOFF}) EXPECT_EQ(-1, LoadSetting(id)) << id;
    EXPECT_STREQ("kept", ReadRegistryRaw(HKEY_LOCAL_MACHINE, program_key, "Other").c_str());
}

// atoi's rules within a length, saturating.
TEST(ParseNumber, ReadsLikeAtoiWithinItsLength)
{
    static const struct { const char* text; size_t length; int32_t value; } cases[] = {
        {"123", 2, 12}, {"  -7", 4, -7}, {"-", 1, 0}, {"+85,100", 7, 85}, {"\t\n 60Hz", 7, 60}, {"abc", 3, 0},
        {"-0", 2, 0}, {"12\0" "34", 5, 12}, {"2147483647", 10, INT32_MAX}, {"2147483648", 10, INT32_MAX},
        {"4294967296", 10, INT32_MAX}, {"-2147483648", 11, INT32_MIN}, {"-2147483649", 11, INT32_MIN},
    };
    for (const auto& c : cases) EXPECT_EQ(c.value, ParseNumber(c.text, c.length)) << c.text;
}
