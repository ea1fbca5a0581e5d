// The registry a real installation has, followed the way the program
// follows it: device node, hardware key, driver key, monitor node; the NT
// device map; and a reboot removing exactly what the last boot seeded.
#include <string>

#include "sim_test.h"

namespace {

// The first Config Manager node whose hardware key contains all the texts.
std::string FindNode(const std::string& a, const std::string& b = "", std::string* node = NULL)
{
    HKEY enum_key;
    if (RegOpenKeyExA(HKEY_DYN_DATA, "Config Manager\\Enum", 0, KEY_READ, &enum_key) != ERROR_SUCCESS) return "";
    std::string found;
    char name[128];
    for (DWORD i = 0; found.empty(); i++) {
        DWORD size = sizeof name;
        if (RegEnumKeyExA(enum_key, i, name, &size, NULL, NULL, NULL, NULL) != ERROR_SUCCESS) break;
        std::string path = std::string("Config Manager\\Enum\\") + name;
        std::string hardware = RegText(HKEY_DYN_DATA, path.c_str(), "HardWareKey");
        if (hardware.find(a) != std::string::npos && hardware.find(b) != std::string::npos) {
            found = hardware;
            if (node) *node = path;
        }
    }
    RegCloseKey(enum_key);
    return found;
}

DWORD RegDword(HKEY root, const char* path, const char* name)
{
    HKEY key;
    DWORD value = 0xFFFFFFFF, size = sizeof value;
    if (RegOpenKeyExA(root, path, 0, KEY_QUERY_VALUE, &key) != ERROR_SUCCESS) return value;
    RegQueryValueExA(key, name, NULL, NULL, (BYTE*)&value, &size);
    RegCloseKey(key);
    return value;
}

}  // namespace

TEST(Registry98, FromDeviceNodeToDriverKeyToMonitor)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901, 0, 10);
    AddCard(&config, 0x5333, 0x8901, 1, 0);  // a twin, told apart by bus and device
    config.cards[1].problem = 22;
    SimBoot(&config);

    std::string node;
    std::string hardware = FindNode("PCI\\VEN_5333&DEV_8901", "BUS_01&DEV_00", &node);
    ASSERT_FALSE(hardware.empty());
    EXPECT_EQ(22u, RegDword(HKEY_DYN_DATA, node.c_str(), "Problem"));
    hardware = FindNode("PCI\\VEN_5333&DEV_8901", "BUS_00&DEV_0A", &node);
    ASSERT_FALSE(hardware.empty());
    EXPECT_EQ(0u, RegDword(HKEY_DYN_DATA, node.c_str(), "Problem"));

    std::string driver = RegText(HKEY_LOCAL_MACHINE, ("Enum\\" + hardware).c_str(), "Driver");
    ASSERT_EQ(0u, driver.find("DISPLAY\\000")) << driver;
    std::string key = "System\\CurrentControlSet\\Services\\Class\\" + driver;
    EXPECT_EQ("S3 Trio64V2/DX PCI", RegText(HKEY_LOCAL_MACHINE, key.c_str(), "DriverDesc"));
    EXPECT_EQ("s3vdisp.drv", RegText(HKEY_LOCAL_MACHINE, (key + "\\DEFAULT").c_str(), "drv"));
    EXPECT_EQ(4u * 1024 * 1024, RegDword(HKEY_LOCAL_MACHINE, (key + "\\INFO").c_str(), "VideoMemory"));
    EXPECT_EQ("75", RegText(HKEY_LOCAL_MACHINE, (key + "\\MODES\\16\\1024,768").c_str(), "RefreshRate"))
        << "the boot mode's rate";

    // The monitor on that card: its node names the card's bus and device.
    std::string monitor = FindNode("MONITOR", "PCI_VEN_5333&DEV_8901", NULL);
    ASSERT_FALSE(monitor.empty());
    std::string monitor_key = "Enum\\" + monitor;
    EXPECT_EQ("DELL D1028L", RegText(HKEY_LOCAL_MACHINE, monitor_key.c_str(), "DeviceDesc"));
    HKEY k;
    ASSERT_EQ(ERROR_SUCCESS, RegOpenKeyExA(HKEY_LOCAL_MACHINE, monitor_key.c_str(), 0, KEY_QUERY_VALUE, &k));
    uint8_t edid[257];
    DWORD size = sizeof edid;
    ASSERT_EQ(ERROR_SUCCESS, RegQueryValueExA(k, "EDID", NULL, NULL, edid, &size));
    RegCloseKey(k);
    EXPECT_EQ(128u, size);
    EXPECT_EQ(0, memcmp(edid, config.cards[0].edid, 128));
    std::string monitor_class =
        "System\\CurrentControlSet\\Services\\Class\\" + RegText(HKEY_LOCAL_MACHINE, monitor_key.c_str(), "Driver");
    std::string max = RegText(HKEY_LOCAL_MACHINE, monitor_class.c_str(), "MaxResolution");
    EXPECT_EQ("1280,1024", max);
    EXPECT_EQ("30.0-69.0,48.0-120.0,+,+",
              RegText(HKEY_LOCAL_MACHINE, (monitor_class + "\\MODES\\" + max).c_str(), "Mode1"));
    EXPECT_EQ("16", RegText(HKEY_CURRENT_CONFIG, "Display\\Settings", "BitsPerPixel"));
}

TEST(Registry98, RebootRemovesWhatTheLastBootSeededOnly)
{
    SimMachineConfig two = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901, 0, 10);
    AddCard(&two, 0x5333, 0x8A20, 1, 0);
    SimBoot(&two);
    const char* second = "System\\CurrentControlSet\\Services\\Class\\DISPLAY\\0001";
    ASSERT_TRUE(RegKeyExists(HKEY_LOCAL_MACHINE, second));
    HKEY k;
    ASSERT_EQ(ERROR_SUCCESS,
              RegCreateKeyExA(HKEY_LOCAL_MACHINE, "SOFTWARE\\VistrelSimTest", 0, NULL, 0, KEY_ALL_ACCESS, NULL, &k, NULL));
    RegCloseKey(k);

    SimMachineConfig one = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    SimBoot(&one);
    EXPECT_FALSE(RegKeyExists(HKEY_LOCAL_MACHINE, second));
    EXPECT_TRUE(FindNode("DEV_8A20").empty());
    EXPECT_TRUE(RegKeyExists(HKEY_LOCAL_MACHINE, "SOFTWARE\\VistrelSimTest")) << "keys of others stay";
    RegDeleteKeyA(HKEY_LOCAL_MACHINE, "SOFTWARE\\VistrelSimTest");

    SimMachineConfig nt = MachineWith(SIM_WINDOWS_NT4, 0x5333, 0x8901);
    SimBoot(&nt);
    EXPECT_FALSE(RegKeyExists(HKEY_LOCAL_MACHINE, "System\\CurrentControlSet\\Services\\Class\\DISPLAY"));
}

TEST(RegistryNt, DeviceMapLeadsToTheDriversValues)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, 0x5333, 0x8901);
    config.cards[0].memory_mb = 8;
    SimBoot(&config);
    // As the program resolves "\Device\Video0" into a key below HKLM.
    std::string path = RegText(HKEY_LOCAL_MACHINE, "HARDWARE\\DEVICEMAP\\VIDEO", "\\Device\\Video0");
    ASSERT_EQ(0u, path.find("\\Registry\\Machine\\")) << path;
    std::string key = path.substr(strlen("\\Registry\\Machine\\"));
    EXPECT_EQ("S3 Trio64V2/DX PCI", RegText(HKEY_LOCAL_MACHINE, key.c_str(), "Device Description"));
    HKEY k;
    ASSERT_EQ(ERROR_SUCCESS, RegOpenKeyExA(HKEY_LOCAL_MACHINE, key.c_str(), 0, KEY_QUERY_VALUE, &k));
    uint8_t size_bytes[4] = {0};
    DWORD size = sizeof size_bytes, type = 0;
    EXPECT_EQ(ERROR_SUCCESS, RegQueryValueExA(k, "HardwareInformation.MemorySize", NULL, &type, size_bytes, &size));
    RegCloseKey(k);
    EXPECT_EQ((DWORD)REG_BINARY, type);
    EXPECT_EQ(0x80, size_bytes[2]) << "8 MB";
    std::string service_key = key.substr(0, key.rfind('\\'));
    EXPECT_EQ("System32\\drivers\\s3vmini.sys", RegText(HKEY_LOCAL_MACHINE, service_key.c_str(), "ImagePath"));

    EXPECT_TRUE(RegKeyExists(HKEY_LOCAL_MACHINE, "HARDWARE\\RESOURCEMAP\\VIDEO\\s3vmini"));
    EXPECT_EQ(16u, RegDword(HKEY_CURRENT_CONFIG, "System\\CurrentControlSet\\Services\\s3vmini\\device0",
                            "DefaultSettings.BitsPerPel"));
    EXPECT_EQ("S3 Trio64V2/DX PCI", RegText(HKEY_LOCAL_MACHINE, "System\\CurrentControlSet\\Services\\s3vmini\\Device0",
                                           "Device Description"));
}
