// The machine outlives the program: a second attach of the same folder finds
// the registers as they were left; another machine's boot seeds the registry
// again; a restarted Wine server is a restart of Windows; a changed
// description is a new machine.
#include "sim_test.h"

TEST(Persistence, TheMachineOutlivesTheProcessUntilItsDescriptionChanges)
{
    std::string folder = MakeScratchFolder(("sim" + std::to_string(GetTickCount())).c_str());
    std::string description = "[Machine]\r\nWindows=98\r\n[Card0]\r\nId=5333:8901\r\n";
    WriteTextFile(folder + "SIMMACHINE.INI", description);
    folder.pop_back();
    EXPECT_EQ(0, SimOpenPersistent(folder.c_str())) << "a folder never run has no machine";
    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    uint8_t reset_value = ReadCr(0x13);
    WriteCr(0x13, (uint8_t)(reset_value ^ 0x5C));
    SimDetach();
    ASSERT_EQ(1, SimOpenPersistent(folder.c_str())) << "simstate.exe's view";
    EXPECT_EQ(reset_value ^ 0x5C, SimReadRegister(0, SIM_REG_CRTC, 0x13));

    SimMachineConfig two = MachineWith(SIM_WINDOWS_98);
    two.cards[two.card_count++] = Card(0x5333, 0x8A20, 1, 0);
    SimBoot(&two);  // a test's machine seeds the registry meanwhile
    std::string display = "System\\CurrentControlSet\\Services\\Class\\DISPLAY\\";
    std::string mode = display + "0000\\MODES\\8\\640,480";
    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    EXPECT_EQ(reset_value ^ 0x5C, ReadCr(0x13)) << "the program started again finds the registers as left";
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, display + "0001")) << "the registry is seeded again";
    WriteRegistryString(HKEY_LOCAL_MACHINE, mode, "RefreshRate", "72");
    WriteRegistryString(HKEY_LOCAL_MACHINE, "Software\\VistrelSimTest", "", "");
    SimDetach();

    DeleteRegistryTree(HKEY_LOCAL_MACHINE, "Software\\VistrelSim\\Session");  // what a new Wine server lacks
    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    EXPECT_EQ(reset_value, ReadCr(0x13)) << "a restart of Windows: the cards come out of reset";
    EXPECT_EQ("72", RegText(HKEY_LOCAL_MACHINE, mode, "RefreshRate")) << "HKLM survives it";
    WriteCr(0x13, (uint8_t)(reset_value ^ 0x5C));
    SimDetach();

    WriteTextFile(folder + "\\SIMMACHINE.INI", "; a comment\r\n" + description);
    ASSERT_EQ(1, SimAttachPersistent(folder.c_str()));
    EXPECT_EQ(reset_value, ReadCr(0x13)) << "a changed description, even a comment, is a new machine";
    EXPECT_TRUE(RegistryKeyExists(HKEY_LOCAL_MACHINE, "Software\\VistrelSimTest")) << "keys of others stay";
    DeleteRegistryTree(HKEY_LOCAL_MACHINE, "Software\\VistrelSimTest");
    SimDetach();
}
