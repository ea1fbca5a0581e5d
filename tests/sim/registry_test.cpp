// The registry a real installation has, followed the way the program
// follows it: device node, hardware key, driver key, monitor node; the NT
// device map; and a reboot removing exactly what the last boot seeded.
#include "sim_test.h"

namespace {

const std::string class_key = "System\\CurrentControlSet\\Services\\Class\\";

// The first Config Manager node whose hardware key contains both texts.
std::string FindNode(const std::string& a, const std::string& b, std::string* node = NULL)
{
    HKEY nodes;
    if (RegOpenKeyExA(HKEY_DYN_DATA, "Config Manager\\Enum", 0, KEY_READ, &nodes) != ERROR_SUCCESS) return "";
    std::string found;
    char name[64];
    for (DWORD i = 0, size = sizeof name; found.empty(); i++, size = sizeof name) {
        if (RegEnumKeyExA(nodes, i, name, &size, NULL, NULL, NULL, NULL) != ERROR_SUCCESS) break;
        std::string path = std::string("Config Manager\\Enum\\") + name;
        std::string hardware = RegText(HKEY_DYN_DATA, path, "HardWareKey");
        if (hardware.find(a) == std::string::npos || hardware.find(b) == std::string::npos) continue;
        found = hardware;
        if (node) *node = path;
    }
    RegCloseKey(nodes);
    return found;
}

DWORD RegDword(HKEY root, const std::string& path, const char* name)
{
    std::string raw = ReadRegistryRaw(root, path, name);
    DWORD value = 0xFFFFFFFF;
    if (raw.size() == 4) memcpy(&value, raw.data(), 4);
    return value;
}

}  // namespace

TEST(Registry, Windows98FromDeviceNodeToDriverKeyToMonitor)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    config.cards[config.card_count++] = Card(0x5333, 0x8901, 1, 0);  // a twin, told apart by bus and device
    config.cards[1].problem = 22;
    SimBoot(&config);
    std::string node, hardware = FindNode("PCI\\VEN_5333&DEV_8901", "BUS_01&DEV_00", &node);
    ASSERT_FALSE(hardware.empty());
    EXPECT_EQ(22u, RegDword(HKEY_DYN_DATA, node, "Problem"));
    hardware = FindNode("PCI\\VEN_5333&DEV_8901", "BUS_00&DEV_0A", &node);
    ASSERT_FALSE(hardware.empty());
    EXPECT_EQ(0u, RegDword(HKEY_DYN_DATA, node, "Problem"));

    std::string driver = RegText(HKEY_LOCAL_MACHINE, "Enum\\" + hardware, "Driver");
    ASSERT_EQ(0u, driver.find("DISPLAY\\000")) << driver;
    std::string key = class_key + driver;
    EXPECT_EQ("S3 Trio64V2/DX PCI", RegText(HKEY_LOCAL_MACHINE, key, "DriverDesc"));
    EXPECT_EQ("s3vdisp.drv", RegText(HKEY_LOCAL_MACHINE, key + "\\DEFAULT", "drv"));
    EXPECT_EQ(4u << 20, RegDword(HKEY_LOCAL_MACHINE, key + "\\INFO", "VideoMemory"));
    EXPECT_EQ("75", RegText(HKEY_LOCAL_MACHINE, key + "\\MODES\\16\\1024,768", "RefreshRate")) << "the boot mode's";
    EXPECT_EQ("16", RegText(HKEY_CURRENT_CONFIG, "Display\\Settings", "BitsPerPixel"));

    // The monitor on that card: its node names the card's bus and device.
    std::string monitor = "Enum\\" + FindNode("MONITOR", "PCI_VEN_5333&DEV_8901&SUBSYS_00000000&REV_16_BUS_00&DEV_0A");
    EXPECT_EQ("DELL D1028L", RegText(HKEY_LOCAL_MACHINE, monitor, "DeviceDesc"));
    EXPECT_EQ(std::string((const char*)config.cards[0].edid, 128), ReadRegistryRaw(HKEY_LOCAL_MACHINE, monitor, "EDID"));
    std::string monitor_class = class_key + RegText(HKEY_LOCAL_MACHINE, monitor, "Driver");
    EXPECT_EQ("1280,1024", RegText(HKEY_LOCAL_MACHINE, monitor_class, "MaxResolution"));
    EXPECT_EQ("30.0-69.0,48.0-120.0,+,+", RegText(HKEY_LOCAL_MACHINE, monitor_class + "\\MODES\\1280,1024", "Mode1"));
}

TEST(Registry, RebootRemovesWhatTheLastBootSeededOnly)
{
    SimMachineConfig two = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    two.cards[two.card_count++] = Card(0x5333, 0x8A20, 1, 0);
    SimBoot(&two);
    ASSERT_TRUE(RegistryKeyExists(HKEY_LOCAL_MACHINE, class_key + "DISPLAY\\0001"));
    WriteRegistryString(HKEY_LOCAL_MACHINE, "Software\\VistrelSimTest", "", "");
    SimMachineConfig one = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    SimBoot(&one);
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, class_key + "DISPLAY\\0001"));
    EXPECT_TRUE(FindNode("DEV_8A20", "").empty());
    EXPECT_TRUE(RegistryKeyExists(HKEY_LOCAL_MACHINE, "Software\\VistrelSimTest")) << "keys of others stay";
    DeleteRegistryTree(HKEY_LOCAL_MACHINE, "Software\\VistrelSimTest");
    SimMachineConfig nt = MachineWith(SIM_WINDOWS_NT4, 0x5333, 0x8901);
    SimBoot(&nt);
    EXPECT_FALSE(RegistryKeyExists(HKEY_LOCAL_MACHINE, class_key + "DISPLAY"));
}

TEST(Registry, NtDeviceMapLeadsToTheDriversValues)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, 0x5333, 0x8901);
    config.cards[0].memory_mb = 8;
    SimBoot(&config);
    // As the program resolves "\Device\Video0" into a key below HKLM.
    std::string path = RegText(HKEY_LOCAL_MACHINE, "HARDWARE\\DEVICEMAP\\VIDEO", "\\Device\\Video0");
    ASSERT_EQ(0u, path.find("\\Registry\\Machine\\")) << path;
    std::string service = "System\\CurrentControlSet\\Services\\s3vmini";
    for (std::string key : {path.substr(strlen("\\Registry\\Machine\\")), service + "\\Device0"}) {
        EXPECT_EQ("S3 Trio64V2/DX PCI", RegText(HKEY_LOCAL_MACHINE, key, "Device Description")) << key;
        DWORD type = 0;
        EXPECT_EQ(std::string("\0\0\x80\0", 4),
                  ReadRegistryRaw(HKEY_LOCAL_MACHINE, key, "HardwareInformation.MemorySize", NULL, &type)) << key;
        EXPECT_EQ((DWORD)REG_BINARY, type);
        std::string parent = key.substr(0, key.rfind('\\'));
        EXPECT_EQ("System32\\drivers\\s3vmini.sys", RegText(HKEY_LOCAL_MACHINE, parent, "ImagePath")) << parent;
    }
    EXPECT_TRUE(RegistryKeyExists(HKEY_LOCAL_MACHINE, "HARDWARE\\RESOURCEMAP\\VIDEO\\s3vmini"));
    EXPECT_EQ(16u, RegDword(HKEY_CURRENT_CONFIG, service + "\\Device0", "DefaultSettings.BitsPerPel"));
    EXPECT_EQ(16u, RegDword(HKEY_LOCAL_MACHINE, service + "\\Device0", "DefaultSettings.BitsPerPel"));
}
