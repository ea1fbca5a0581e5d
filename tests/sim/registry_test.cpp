// The registry a real installation has, followed the way the program
// follows it: device node, hardware key, driver key, monitor node; the NT
// service.
#include "sim_test.h"

static const std::string class_key = "System\\CurrentControlSet\\Services\\Class\\";

// The Config Manager node whose hardware key contains both texts.
static std::string FindNode(const std::string& a, const std::string& b, std::string* node = NULL)
{
    HKEY nodes = NULL;
    RegOpenKeyExA(HKEY_DYN_DATA, "Config Manager\\Enum", 0, KEY_READ, &nodes);
    std::string found;
    char name[64];
    for (DWORD i = 0; found.empty() && RegEnumKeyA(nodes, i, name, sizeof name) == ERROR_SUCCESS; i++) {
        std::string path = std::string("Config Manager\\Enum\\") + name;
        std::string hardware = RegText(HKEY_DYN_DATA, path, "HardWareKey");
        if (hardware.find(a) == std::string::npos || hardware.find(b) == std::string::npos) continue;
        found = hardware;
        if (node) *node = path;
    }
    RegCloseKey(nodes);
    return found;
}

static std::string Dword(DWORD value) { return std::string((const char*)&value, 4); }

TEST(Registry, Windows98FromDeviceNodeToDriverKeyToMonitor)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98);
    config.cards[config.card_count++] = Card(0x5333, 0x8901, 1, 0);  // a twin, told apart by bus and device
    config.cards[1].problem = 22;
    SimBoot(&config);
    std::string node, hardware = FindNode("PCI\\VEN_5333&DEV_8901", "BUS_01&DEV_00", &node);
    EXPECT_EQ(Dword(22), ReadRegistryRaw(HKEY_DYN_DATA, node, "Problem"));
    hardware = FindNode("PCI\\VEN_5333&DEV_8901&SUBSYS_00000000&REV_16\\BUS_00&DEV_0A&FUNC_00", "", &node);
    EXPECT_EQ(Dword(0), ReadRegistryRaw(HKEY_DYN_DATA, node, "Problem"));
    std::string driver = RegText(HKEY_LOCAL_MACHINE, "Enum\\" + hardware, "Driver");
    ASSERT_EQ(0u, driver.find("DISPLAY\\000")) << driver;
    std::string key = class_key + driver;
    EXPECT_EQ("S3 Trio64V2/DX PCI", RegText(HKEY_LOCAL_MACHINE, key, "DriverDesc"));
    EXPECT_EQ("s3vdisp.drv", RegText(HKEY_LOCAL_MACHINE, key + "\\DEFAULT", "drv"));
    EXPECT_EQ(Dword(4 << 20), ReadRegistryRaw(HKEY_LOCAL_MACHINE, key + "\\INFO", "VideoMemory"));
    EXPECT_EQ("75", RegText(HKEY_LOCAL_MACHINE, key + "\\MODES\\16\\1024,768", "RefreshRate")) << "the boot mode's";
    EXPECT_EQ("16", RegText(HKEY_CURRENT_CONFIG, "Display\\Settings", "BitsPerPixel"));

    // The monitor's instance is the card's hardware key with '\' made '_'.
    std::string monitor = "Enum\\" + FindNode("MONITOR\\", "PCI_VEN_5333&DEV_8901&SUBSYS_00000000&REV_16_BUS_00");
    EXPECT_EQ("DELL D1028L", RegText(HKEY_LOCAL_MACHINE, monitor, "DeviceDesc"));
    EXPECT_EQ(std::string((const char*)config.cards[0].edid, 128), ReadRegistryRaw(HKEY_LOCAL_MACHINE, monitor, "EDID"));
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
