// The machine outlives the program: a second attach of the same folder finds
// the registers as they were left; a changed description is a new machine;
// a restarted Wine server is a restart of Windows. And the description
// file's format.
#include <string>

#include "sim_test.h"

namespace {

std::string TestFolder(const char* name)
{
    char temp[MAX_PATH];
    GetTempPathA(sizeof temp, temp);
    std::string folder = std::string(temp) + name;
    CreateDirectoryA(folder.c_str(), NULL);
    return folder;
}

void WriteText(const std::string& path, const std::string& text)
{
    HANDLE f = CreateFileA(path.c_str(), GENERIC_WRITE, 0, NULL, CREATE_ALWAYS, 0, NULL);
    ASSERT_NE(INVALID_HANDLE_VALUE, f);
    DWORD written;
    WriteFile(f, text.data(), (DWORD)text.size(), &written, NULL);
    CloseHandle(f);
}

std::string Unique() { return std::to_string(GetTickCount()) + "-" + std::to_string(GetCurrentProcessId()); }

}  // namespace

TEST(Persistence, RegistersOutliveTheProcessUntilTheDescriptionChanges)
{
    std::string folder = TestFolder("vistrel-sim-persist");
    std::string ini = folder + "\\SIMMACHINE.INI";
    std::string description = "[Machine]\r\nWindows=98\r\n[Card0]\r\nId=5333:8901\r\n";
    WriteText(ini, "; " + Unique() + "\r\n" + description);
    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    uint8_t reset_value = ReadCr(0x13);
    WriteCr(0x13, (uint8_t)(reset_value ^ 0x5C));
    WriteSr(0x08, 0x06);
    WriteSr(0x0D, 0xA0);
    SimDetach();

    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    EXPECT_EQ(reset_value ^ 0x5C, ReadCr(0x13)) << "the program started again finds the registers as left";
    EXPECT_EQ(SIM_DPMS_OFF, SimDpmsState(0));
    SimDetach();

    ASSERT_EQ(1, SimOpenPersistent(folder.c_str())) << "simstate.exe's view";
    EXPECT_EQ(reset_value ^ 0x5C, SimReadRegister(0, SIM_REG_CRTC, 0x13));
    SimDetach();

    WriteText(ini, "; " + Unique() + " another comment\r\n" + description);
    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    EXPECT_EQ(reset_value, ReadCr(0x13)) << "a changed description, even a comment, is a new machine";
    EXPECT_EQ(SIM_DPMS_ON, SimDpmsState(0));
    SimDetach();
}

TEST(Persistence, RestartedWineServerRestartsWindowsOnTheSameMachine)
{
    std::string folder = TestFolder("vistrel-sim-restart");
    WriteText(folder + "\\SIMMACHINE.INI", "; " + Unique() + "\r\n[Machine]\r\nWindows=98\r\n");
    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    uint8_t reset_value = ReadCr(0x13);
    WriteCr(0x13, (uint8_t)(reset_value ^ 0x33));
    const char* modes = "System\\CurrentControlSet\\Services\\Class\\DISPLAY\\0000\\MODES\\8\\640,480";
    HKEY key;
    ASSERT_EQ(ERROR_SUCCESS, RegOpenKeyExA(HKEY_LOCAL_MACHINE, modes, 0, KEY_SET_VALUE, &key));
    RegSetValueExA(key, "RefreshRate", 0, REG_SZ, (const BYTE*)"72", 3);
    RegCloseKey(key);
    SimDetach();

    // What a restart of the Wine server leaves: no volatile registry.
    RegDeleteKeyA(HKEY_LOCAL_MACHINE, "Software\\VistrelSim\\Session");
    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    EXPECT_EQ(reset_value, ReadCr(0x13)) << "the cards come out of reset";
    EXPECT_EQ("72", RegText(HKEY_LOCAL_MACHINE, modes, "RefreshRate")) << "HKLM survives a restart of Windows";
    EXPECT_TRUE(RegKeyExists(HKEY_DYN_DATA, "Config Manager\\Enum"));
    SimDetach();
}

TEST(Persistence, NeverRunFolderHasNoMachine)
{
    std::string folder = "C:\\nowhere\\vistrel-sim-never-" + Unique();
    EXPECT_EQ(0, SimOpenPersistent(folder.c_str()));
    EXPECT_EQ(NULL, SimConfig());
    EXPECT_EQ(0xFF, MachineInByte(0x3CC)) << "no machine: an empty bus";
}

TEST(Description, ProfileFormatWithDefaultsAndOverrides)
{
    std::string folder = TestFolder("vistrel-sim-description");
    std::string ini = folder + "\\SIMMACHINE.INI";
    WriteText(ini,
              "; a full-line comment\r\n"
              "[Machine]\r\n"
              "Windows=NT4\r\n"
              "Monitors=2\r\n"
              "StartMode=800x600x8@72\r\n"
              "[Card0]\r\n"
              "Id=8086:7800\r\n"
              "Bus=1\r\n"
              "Device=0\r\n"
              "MemoryMB=08\r\n"
              "DriverDesc=Board; rev. B\r\n"
              "CR11=80\r\n"
              "SR18=8\r\n"
              "[Card1]\r\n"
              "Id=5333:8a01\r\n"
              "Primary=1\r\n"
              "Bus=7\r\n"
              "MemoryMB=lots\r\n"
              "DisplayDevice=0\r\n"
              "EDID=00FFFFFFFFFFFF00" + std::string(240, '1') + "\r\n"
              "[Card3]\r\n"
              "Bus=1\r\n");
    SimMachineConfig config;
    SimDefaultMachine(&config);
    ASSERT_EQ(1, SimReadDescription(ini.c_str(), &config));
    EXPECT_EQ(SIM_WINDOWS_NT4, config.windows);
    EXPECT_EQ(2, config.monitors);
    EXPECT_EQ(800, config.start_width);
    EXPECT_EQ(72, config.start_refresh);
    ASSERT_EQ(2, config.card_count) << "a section without an Id is no card (but for Card0)";
    const SimCardConfig& a = config.cards[0];
    EXPECT_EQ(0x8086, a.vendor_id);
    EXPECT_EQ(1, a.bus);
    EXPECT_EQ(0, a.device);
    EXPECT_EQ(8u, a.memory_mb) << "numbers are decimal";
    EXPECT_STREQ("Board; rev. B", a.driver_desc) << "';' after a value is part of it";
    ASSERT_EQ(1, a.initial_register_count) << "SR18=8 is not a two-digit hexadecimal value";
    EXPECT_EQ(SIM_REG_CRTC, a.initial_registers[0].file);
    EXPECT_EQ(0x11, a.initial_registers[0].index);
    EXPECT_EQ(0x80, a.initial_registers[0].value);
    const SimCardConfig& b = config.cards[1];
    EXPECT_EQ(0x8A01, b.device_id) << "ids are hexadecimal";
    EXPECT_EQ(0, b.bus) << "an impossible bus keeps the default";
    EXPECT_EQ(11, b.device) << "Card1's default slot";
    EXPECT_EQ(4u, b.memory_mb);
    EXPECT_FALSE(b.display_device);
    EXPECT_TRUE(b.has_edid);
    EXPECT_EQ(0x11, b.edid[8]);
    EXPECT_EQ(1, config.primary_card);

    SimMachineConfig defaults;
    SimDefaultMachine(&defaults);
    EXPECT_EQ(0, SimReadDescription((folder + "\\MISSING.INI").c_str(), &defaults));
    EXPECT_EQ(SIM_WINDOWS_98, defaults.windows);
    EXPECT_EQ(0x8901, defaults.cards[0].device_id);
    EXPECT_EQ(1998, defaults.cards[0].edid[17] + 1990) << "the default monitor is of 1998";
}

TEST(Description, RegisterOverridesAreWhatTheProgramFinds)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    config.cards[0].initial_registers[0] = {SIM_REG_CRTC, 0x11, 0x8E};
    config.cards[0].initial_registers[1] = {SIM_REG_SEQUENCER, 0x18, 0x00};
    config.cards[0].initial_register_count = 2;
    SimBoot(&config);
    EXPECT_EQ(0x8E, ReadCr(0x11));
    WriteSr(0x08, 0x06);
    EXPECT_EQ(0x00, ReadSr(0x18));
    // Without the clock halving the 16-bit boot mode runs at twice the rate.
    EXPECT_NEAR(2 * 75.0, SimRefreshHz(0), 1.0);
}
