// The registry a real installation has, where the program's own tests do not
// read it back (they follow the driver keys and the monitor).
#include "sim_test.h"

static const std::string class_key = "System\\CurrentControlSet\\Services\\Class\\";

static std::string Dword(DWORD value) { return std::string((const char*)&value, 4); }

TEST(Registry, Windows98DriverKeysAndTheirValues)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98);
    config.cards[config.card_count++] = Card(0x5333, 0x8A20, 1, 0);
    SimBoot(&config);
    EXPECT_EQ("DISPLAY\\0001", RegText(HKEY_LOCAL_MACHINE, "Enum\\PCI\\VEN_5333&DEV_8A20&SUBSYS_00000000&REV_01\\"
                                                           "BUS_01&DEV_00&FUNC_00", "Driver"));
    std::string key = class_key + "DISPLAY\\0000";
    EXPECT_EQ(Dword(4 << 20), ReadRegistryRaw(HKEY_LOCAL_MACHINE, key + "\\INFO", "VideoMemory"));
    EXPECT_EQ("75", RegText(HKEY_LOCAL_MACHINE, key + "\\MODES\\16\\1024,768", "RefreshRate")) << "the boot mode's";
}

TEST(Registry, NtServiceAndItsDevice)
{
    BootWith(SIM_WINDOWS_NT4);
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, class_key + "DISPLAY")) << "the 9x keys are gone";
    std::string service = "System\\CurrentControlSet\\Services\\s3vmini";
    DWORD type = 0;
    std::string memory = ReadRegistryRaw(HKEY_LOCAL_MACHINE, service + "\\Device0", "HardwareInformation.MemorySize",
                                         NULL, &type);
    EXPECT_EQ(Dword(4 << 20), memory);
    EXPECT_EQ((DWORD)REG_BINARY, type);
    EXPECT_EQ(Dword(16), ReadRegistryRaw(HKEY_CURRENT_CONFIG, service + "\\Device0", "DefaultSettings.BitsPerPel"));
    EXPECT_TRUE(RegistryKeyExists(HKEY_LOCAL_MACHINE, "HARDWARE\\RESOURCEMAP\\VIDEO\\s3vmini"));
}
