#include <gtest/gtest.h>

#include "base/adapters.h"
#include "base/number.h"
#include "base/settings.h"
#include "support/support.h"

static const char card_key[] = "SOFTWARE\\QUORVEL\\PANEL\\12d20018";
static const char program_key[] = "SOFTWARE\\QUORVEL\\PANEL";

class SettingsStore : public ::testing::Test {
protected:
    void SetUp() override
    {
        ResetProgramState();
        ClearSettingsStore();
        adapter_count = 1;
        AdapterRecord* a = &adapter_table[0];
        a->vendor_id = 0x12D2;
        a->device_id = 0x0018;
        a->width = 1024;
        a->height = 768;
        a->bits_per_pixel = 16;
        a->refresh_hz = 85;
    }
    void TearDown() override { ClearSettingsStore(); }
};

TEST_F(SettingsStore, LoadWithoutKeyCreatesNothing)
{
    EXPECT_EQ(-1, LoadSetting(SETTING_REFRESH));
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, card_key));
    EXPECT_EQ(85, SaveSetting(SETTING_REFRESH, 85));
    EXPECT_TRUE(RegistryKeyExists(HKEY_LOCAL_MACHINE, card_key));
    EXPECT_EQ(85, LoadSetting(SETTING_REFRESH));
}

TEST_F(SettingsStore, DecimalTextInTheProgramAndCardKeys)
{
    SaveSetting(SETTING_STANDBY, -1);
    SaveSetting(SETTING_MCLK, 100);
    DWORD type = 0;
    bool found = false;
    EXPECT_STREQ("-1", ReadRegistryRaw(HKEY_LOCAL_MACHINE, program_key, "Standby", &found, &type).c_str());
    EXPECT_TRUE(found);
    EXPECT_EQ((DWORD)REG_SZ, type);
    EXPECT_STREQ("100", ReadRegistryRaw(HKEY_LOCAL_MACHINE, card_key, "mclk").c_str());
    EXPECT_EQ(-1, LoadSetting(SETTING_STANDBY));
    EXPECT_EQ(100, LoadSetting(SETTING_MCLK));
}

TEST_F(SettingsStore, ReadingStopsAtTheDataLength)
{
    // Ten digits fill the ten-byte buffer with no room for a terminator.
    WriteRegistryString(HKEY_LOCAL_MACHINE, card_key, "refresh", "1234567890", false);
    WriteRegistryString(HKEY_LOCAL_MACHINE, program_key, "Shutoff", "-1", false);
    EXPECT_EQ(1234567890, LoadSetting(SETTING_REFRESH));
    EXPECT_EQ(-1, LoadSetting(SETTING_SHUTOFF));
}

// The one number reader: atoi's rules within a length, saturating.
TEST(ParseNumber, ReadsLikeAtoiWithinItsLength)
{
    static const struct {
        const char* text;
        size_t length;
        int32_t value;
    } cases[] = {
        {"123", 2, 12},           {"  -7", 4, -7},          {"-", 1, 0},           {"+85,100", 7, 85},
        {"\t\n 60Hz", 7, 60},     {"abc", 3, 0},            {"", 0, 0},            {"-0", 2, 0},
        {"2147483647", 10, INT32_MAX}, {"2147483648", 10, INT32_MAX}, {"99999999999999999999", 20, INT32_MAX},
        {"-2147483648", 11, INT32_MIN}, {"-2147483649", 11, INT32_MIN}, {"4294967296", 10, INT32_MAX},
        {"12\0" "34", 5, 12},
    };
    for (const auto& c : cases) EXPECT_EQ(c.value, ParseNumber(c.text, c.length)) << c.text;
}

TEST_F(SettingsStore, ReadsWhatOtherInstallationsWrote)
{
    // Data that stops short of a terminator, and some that has one.
    WriteRegistryString(HKEY_LOCAL_MACHINE, card_key, "width", "1280", false);
    WriteRegistryString(HKEY_LOCAL_MACHINE, card_key, "height", "1024", true);
    WriteRegistryString(HKEY_LOCAL_MACHINE, card_key, "bits", " +32x", false);
    WriteRegistryString(HKEY_LOCAL_MACHINE, card_key, "refresh", "abc", false);
    WriteRegistryString(HKEY_LOCAL_MACHINE, card_key, "mclkdef", "12345678901", false);  // too long for the buffer
    EXPECT_EQ(1280, LoadSetting(SETTING_WIDTH));
    EXPECT_EQ(1024, LoadSetting(SETTING_HEIGHT));
    EXPECT_EQ(32, LoadSetting(SETTING_BITS));
    EXPECT_EQ(0, LoadSetting(SETTING_REFRESH));
    EXPECT_EQ(-1, LoadSetting(SETTING_MCLK_DEFAULT));
}

TEST_F(SettingsStore, PositionValuesNamedAfterTheModeAndDeletedBelowOne)
{
    SaveSetting(SETTING_POSITION_H, 95);
    SaveSetting(SETTING_POSITION_V, 0x1E9 + 256 * 0x1F);
    bool found = false;
    EXPECT_STREQ("95", ReadRegistryRaw(HKEY_LOCAL_MACHINE, card_key, "1024x768x16x85H", &found).c_str());
    EXPECT_TRUE(found);
    EXPECT_EQ(95, LoadSetting(SETTING_POSITION_H));
    EXPECT_EQ(0x1E9 + 256 * 0x1F, LoadSetting(SETTING_POSITION_V));

    adapter_table[0].refresh_hz = 75;  // another mode: nothing stored
    EXPECT_EQ(-1, LoadSetting(SETTING_POSITION_H));

    adapter_table[0].refresh_hz = 85;
    SaveSetting(SETTING_POSITION_H, 0);
    ReadRegistryRaw(HKEY_LOCAL_MACHINE, card_key, "1024x768x16x85H", &found);
    EXPECT_FALSE(found);
    EXPECT_EQ(-1, LoadSetting(SETTING_POSITION_H));
    EXPECT_NE(-1, LoadSetting(SETTING_POSITION_V));
}

TEST_F(SettingsStore, ResetErasesCardKeysAndTimersOnly)
{
    SaveSetting(SETTING_REFRESH, 85);
    adapter_table[0].vendor_id = 0x5333;
    adapter_table[0].device_id = 0x8901;
    SaveSetting(SETTING_REFRESH, 75);
    SaveSetting(SETTING_STANDBY, 5);
    SaveSetting(SETTING_SUSPEND, 10);
    SaveSetting(SETTING_SHUTOFF, 15);
    WriteRegistryString(HKEY_LOCAL_MACHINE, program_key, "Other", "kept");

    ResetSettings();
    EXPECT_TRUE(RegistryKeyExists(HKEY_LOCAL_MACHINE, program_key));
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, card_key));
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, "SOFTWARE\\QUORVEL\\PANEL\\53338901"));
    EXPECT_EQ(-1, LoadSetting(SETTING_STANDBY));
    EXPECT_EQ(-1, LoadSetting(SETTING_SUSPEND));
    EXPECT_EQ(-1, LoadSetting(SETTING_SHUTOFF));
    EXPECT_EQ("kept", std::string(ReadRegistryRaw(HKEY_LOCAL_MACHINE, program_key, "Other").c_str()));
}

TEST_F(SettingsStore, ResetWithoutStoreCreatesNothing)
{
    ResetSettings();
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, program_key));
}

TEST_F(SettingsStore, UndefinedIdsTouchNothing)
{
    for (int id : {0, 2, 9, 13, 16}) {
        EXPECT_EQ(-1, SaveSetting(id, 5)) << id;
        EXPECT_EQ(-1, LoadSetting(id)) << id;
    }
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, card_key));
}
