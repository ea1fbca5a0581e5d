// The registry a real installation has, followed the way the program follows
// it: hardware key, driver key, monitor; the NT service.
#include "sim_test.h"

static const std::string class_key = "System\\CurrentControlSet\\Services\\Class\\";

static std::string Dword(DWORD value) { return std::string((const char*)&value, 4); }

TEST(Registry, Windows98FromHardwareKeyToDriverKeyToMonitor)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98);
    config.cards[config.card_count++] = Card(0x5333, 0x8A20, 1, 0);
    SimBoot(&config);
    const std::string hardware = "PCI\\VEN_5333&DEV_8901&SUBSYS_00000000&REV_16\\BUS_00&DEV_0A&FUNC_00";
    EXPECT_EQ("DISPLAY\\0000", RegText(HKEY_LOCAL_MACHINE, "Enum\\" + hardware, "Driver"));
    EXPECT_EQ("DISPLAY\\0001", RegText(HKEY_LOCAL_MACHINE, "Enum\\PCI\\VEN_5333&DEV_8A20&SUBSYS_00000000&REV_01\\"
                                                           "BUS_01&DEV_00&FUNC_00", "Driver"));
    std::string key = class_key + "DISPLAY\\0000";
    EXPECT_EQ("S3 Trio64V2/DX PCI", RegText(HKEY_LOCAL_MACHINE, key, "DriverDesc"));
    EXPECT_EQ("s3vdisp.drv", RegText(HKEY_LOCAL_MACHINE, key + "\\DEFAULT", "drv"));
    EXPECT_EQ(Dword(4 << 20), ReadRegistryRaw(HKEY_LOCAL_MACHINE, key + "\\INFO", "VideoMemory"));
    EXPECT_EQ("75", RegText(HKEY_LOCAL_MACHINE, key + "\\MODES\\16\\1024,768", "RefreshRate")) << "the boot mode's";

    // The monitor's instance is the card's hardware key with '\' made '_'.
    std::string monitor = "Enum\\MONITOR\\DEL730B\\PCI_VEN_5333&DEV_8901&SUBSYS_00000000&REV_16_BUS_00&DEV_0A&FUNC_00";
    EXPECT_EQ("DELL D1028L", RegText(HKEY_LOCAL_MACHINE, monitor, "DeviceDesc"));
    std::string edid((const char*)config.cards[0].edid, 128);
    EXPECT_EQ(edid, ReadRegistryRaw(HKEY_LOCAL_MACHINE, monitor, "EDID"));
    std::string monitor_class = class_key + RegText(HKEY_LOCAL_MACHINE, monitor, "Driver");
    EXPECT_EQ("1280,1024", RegText(HKEY_LOCAL_MACHINE, monitor_class, "MaxResolution"));
    EXPECT_EQ("30.0-69.0,48.0-120.0,+,+", RegText(HKEY_LOCAL_MACHINE, monitor_class + "\\MODES\\1280,1024", "Mode1"));
}

TEST(Registry, NtServiceAndItsDevice)
{
    BootWith(SIM_WINDOWS_NT4);
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, class_key + "DISPLAY")) << "the 9x keys are gone";
    std::string service = "System\\CurrentControlSet\\Services\\s3vmini";
    EXPECT_EQ("System32\\drivers\\s3vmini.sys", RegText(HKEY_LOCAL_MACHINE, service, "ImagePath"));
    DWORD type = 0;
    std::string memory = ReadRegistryRaw(HKEY_LOCAL_MACHINE, service + "\\Device0", "HardwareInformation.MemorySize",
                                         NULL, &type);
    EXPECT_EQ(Dword(4 << 20), memory);
    EXPECT_EQ((DWORD)REG_BINARY, type);
    EXPECT_EQ(Dword(16), ReadRegistryRaw(HKEY_CURRENT_CONFIG, service + "\\Device0", "DefaultSettings.BitsPerPel"));
    EXPECT_TRUE(RegistryKeyExists(HKEY_LOCAL_MACHINE, "HARDWARE\\RESOURCEMAP\\VIDEO\\s3vmini"));
}
