// The machine outlives the program: a second attach of the same folder finds
// the registers as they were left; a changed description is a new machine;
// a restarted Wine server is a restart of Windows. And the description
// file's format.
#include <string>

#include "sim_test.h"

namespace {

// A folder whose machine no earlier run has left behind.
std::string FreshMachine(const std::string& description)
{
    std::string folder = MakeScratchFolder(("sim" + std::to_string(GetTickCount())).c_str());
    WriteTextFile(folder + "SIMMACHINE.INI", description);
    folder.pop_back();
    return folder;
}

}  // namespace

TEST(Persistence, RegistersOutliveTheProcessUntilTheDescriptionChanges)
{
    std::string description = "[Machine]\r\nWindows=98\r\n[Card0]\r\nId=5333:8901\r\n";
    std::string folder = FreshMachine(description);
    EXPECT_EQ(0, SimOpenPersistent(folder.c_str())) << "a folder never run has no machine";
    EXPECT_EQ(0xFF, MachineInByte(0x3CC)) << "no machine: an empty bus";
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

    WriteTextFile(folder + "\\SIMMACHINE.INI", "; a comment\r\n" + description);
    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    EXPECT_EQ(reset_value, ReadCr(0x13)) << "a changed description, even a comment, is a new machine";
    EXPECT_EQ(SIM_DPMS_ON, SimDpmsState(0));
    SimDetach();
}

TEST(Persistence, AnotherMachinesBootAndARestartedWineServer)
{
    std::string folder = FreshMachine("[Machine]\r\nWindows=98\r\n");
    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    uint8_t reset_value = ReadCr(0x13);
    WriteCr(0x13, (uint8_t)(reset_value ^ 0x33));
    SimMachineConfig two = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    two.cards[two.card_count++] = Card(0x5333, 0x8A20, 1, 0);
    SimBoot(&two);  // a test's machine seeds the registry meanwhile
    std::string display = "System\\CurrentControlSet\\Services\\Class\\DISPLAY\\";
    ASSERT_TRUE(RegistryKeyExists(HKEY_LOCAL_MACHINE, display + "0001"));
    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    EXPECT_EQ(reset_value ^ 0x33, ReadCr(0x13)) << "the same Windows session: no restart";
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, display + "0001")) << "the registry is seeded again";
    WriteRegistryString(HKEY_LOCAL_MACHINE, display + "0000\\MODES\\8\\640,480", "RefreshRate", "72");
    SimDetach();

    DeleteRegistryTree(HKEY_LOCAL_MACHINE, "Software\\VistrelSim\\Session");  // what a new Wine server lacks
    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    EXPECT_EQ(reset_value, ReadCr(0x13)) << "the cards come out of reset";
    EXPECT_EQ("72", RegText(HKEY_LOCAL_MACHINE, display + "0000\\MODES\\8\\640,480", "RefreshRate"))
        << "HKLM survives a restart of Windows";
    EXPECT_TRUE(RegistryKeyExists(HKEY_DYN_DATA, "Config Manager\\Enum"));
    SimDetach();
}

TEST(Description, ProfileFormatWithDefaultsAndOverrides)
{
    std::string ini = MakeScratchFolder("sim") + "SIMMACHINE.INI";
    WriteTextFile(ini, "; a comment\r\n[Machine]\r\nWindows=NT4\r\nStartMode=800x600x8@72\r\n"
                       "[Card0]\r\nId=8086:7800\r\nBus=1\r\nDevice=0\r\nMemoryMB=08\r\nDriverDesc=Board; rev. B\r\n"
                       "CR11=80\r\nSR18=8\r\n"
                       "[Card1]\r\nId=5333:8a01\r\nPrimary=1\r\nBus=7\r\nMemoryMB=lots\r\nDisplayDevice=0\r\n"
                       "[Card3]\r\nBus=1\r\n");
    SimMachineConfig config;
    SimDefaultMachine(&config);
    ASSERT_EQ(1, SimReadDescription(ini.c_str(), &config));
    EXPECT_EQ(SIM_WINDOWS_NT4, config.windows);
    EXPECT_EQ(800, config.start_width);
    EXPECT_EQ(8, config.start_bits);
    EXPECT_EQ(72, config.start_refresh);
    ASSERT_EQ(2, config.card_count) << "a section without an Id is no card (but for Card0)";
    const SimCardConfig &a = config.cards[0], &b = config.cards[1];
    EXPECT_EQ(0x8086, a.vendor_id);
    EXPECT_EQ(1, a.bus);
    EXPECT_EQ(0, a.device);
    EXPECT_EQ(8u, a.memory_mb) << "numbers are decimal";
    EXPECT_STREQ("Board; rev. B", a.driver_desc) << "';' after a value is part of it";
    ASSERT_EQ(1, a.initial_register_count) << "SR18=8 is not a two-digit hexadecimal value";
    EXPECT_EQ(SIM_REG_CRTC, a.initial_registers[0].file);
    EXPECT_EQ(0x11, a.initial_registers[0].index);
    EXPECT_EQ(0x80, a.initial_registers[0].value);
    EXPECT_EQ(0x8A01, b.device_id) << "ids are hexadecimal";
    EXPECT_EQ(0, b.bus) << "an impossible bus keeps the default";
    EXPECT_EQ(11, b.device) << "Card1's default slot";
    EXPECT_EQ(4u, b.memory_mb);
    EXPECT_FALSE(b.display_device);
    EXPECT_EQ(1, config.primary_card);

    // Overrides apply after the boot mode: without the clock halving the
    // 16-bit boot mode runs at twice the rate.
    config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    config.cards[0].initial_registers[0] = {SIM_REG_CRTC, 0x11, 0x8E};
    config.cards[0].initial_registers[1] = {SIM_REG_SEQUENCER, 0x18, 0x00};
    config.cards[0].initial_register_count = 2;
    SimBoot(&config);
    EXPECT_EQ(0x8E, ReadCr(0x11));
    EXPECT_NEAR(2 * 75.0, SimRefreshHz(0), 1.0);
}
