// The hardware floor: ports on both systems, PCI, the register window, registry texts, driver keys.
#include <gtest/gtest.h>

#include "base/adapters.h"
#include "chips/chips.h"
#include "hardware/driver_device.h"
#include "hardware/driver_key.h"
#include "hardware/driver_key_path.h"
#include "hardware/pci.h"
#include "hardware/register_access.h"
#include "hardware/registry_text.h"
#include "modes/detect.h"
#include "support/machine.h"
#include "support/support.h"

// A port write answers 1 through the kernel device, its value on 9x (1 for 0), 0 without the device.
TEST(PortAccess, EachSystemItsWay)
{
    const struct { int windows; bool device; int opened; uint32_t byte, dword, zero, ids; bool requests; } cases[] = {
        {SIM_WINDOWS_NT4, true, 1, 1, 1, 1, 0x89015333, true},
        {SIM_WINDOWS_NT4, false, 0, 0, 0, 0, 0, false},
        {SIM_WINDOWS_98, true, 1, 0x13, 0x80005000, 1, 0x89015333, false},
    };
    uint8_t header[PCI_HEADER_BUFFER_SIZE];
    for (const auto& c : cases) {
        SimMachineConfig config = Machine(c.windows, {Card(0x5333, 0x8901)});
        config.nt_device = c.device;
        BootMachine(config);
        SCOPED_TRACE(testing::Message() << c.windows << (c.device ? " with" : " without") << " the device");
        ASSERT_EQ(c.opened, OpenRegisterAccess());
        SimResetCounters();
        EXPECT_EQ(c.zero, WritePortDword(0xCF8, 0));
        EXPECT_EQ(c.dword, WritePortDword(0xCF8, 0x80005000));
        EXPECT_EQ(c.ids, ReadPortDword(0xCFC));
        EXPECT_EQ(c.byte, WritePortByte(0x3D4, 0x13));
        EXPECT_EQ(c.byte ? 0x13u : 0u, ReadPortByte(0x3D4));
        memset(header, 0xCC, sizeof header);
        EXPECT_EQ(c.requests, ZentraReadPciHeader(driver_handle, 0, 10, header) == 1);
        EXPECT_EQ(c.requests ? 0x03 : 0xCC, header[0x0B]) << "a display controller's header";
        EXPECT_EQ(c.requests, SimGetCounters()->device_requests > 0);
        EXPECT_EQ(1, CloseRegisterAccess());
        EXPECT_EQ(NULL, driver_handle);
    }
}

TEST(PciConfiguration, FindsCardsInBusOrderBehindTheBridge)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 1, 0), Card(0x5333, 0x8901, 0, 12),
                                         Card(0x5333, 0x8901, 0, 9)}));
    const struct { int index, found, bus, devfn; } cases[] = {{0, 1, 0, 9 << 3}, {1, 1, 0, 12 << 3}, {2, 1, 1, 0},
                                                              {3, 0, 1, 0}};  // not found: the outputs as they were
    uint8_t bus = 0xEE, devfn = 0xEE;
    for (const auto& c : cases) {
        EXPECT_EQ(c.found, PciFindDevice(0x5333, 0x8901, c.index, &bus, &devfn)) << c.index;
        EXPECT_EQ(c.bus << 8 | c.devfn, bus << 8 | devfn) << c.index;
    }
    EXPECT_EQ(1, PciFindDevice(0x8086, 0x7113, 0, &bus, &devfn)) << "a function of a multi-function device";
    EXPECT_EQ(7 << 3 | 3, devfn);
    EXPECT_EQ(0x89015333u, PciReadConfigWord(1, 0, 0) | PciReadConfigWord(1, 0, 2) << 16);
}

TEST(RegisterWindow, ReachesTheSameRegistersAsThePortsAndUnknownCommandsNothing)
{
    SimMachineConfig machine = Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901)});
    BootMachine(machine);
    ASSERT_EQ(1, DetectAdapters());
    EXPECT_EQ((SimCardBarAddress(0, 0) & 0xFC000000u) + 0x01000000u, CurrentAdapter()->mapped_registers);
    chip_open_io();
    SimResetCounters();
    chip_write_port(0x103D4, 0x10013);  // value and port packed in one argument, both cut to 16 bits
    chip_write_port(0x3D5, 0xA7);
    EXPECT_EQ(0xA7u, chip_read_port(0x3D5));
    for (uint32_t code : {3u, 5u, 218u, 228u, 230u, 232u, 238u, 239u, 240u, 0xFFFFFFFFu})
        EXPECT_EQ(0u, chip_table[CurrentAdapter()->chip_row].Dispatch(code, 0)) << code;
    chip_close_io();
    EXPECT_EQ(0xA7, SimReadRegister(0, SIM_REG_CRTC, 0x13));
    EXPECT_EQ(0u, SimGetCounters()->port_reads + SimGetCounters()->port_writes) << "all through the window";
    EXPECT_EQ(2u, SimGetCounters()->window_writes);

    machine.vxd_device = false;
    BootMachine(machine);
    ASSERT_EQ(1, DetectAdapters());
    EXPECT_EQ(0u, CurrentAdapter()->mapped_registers) << "port instructions instead";
}

// A text as long as its buffer allows is whole; one byte more is no text at all.
TEST(RegistryText, FillsTheBufferExactlyOrNotAtAll)
{
    const std::string key = "Software\\VistrelTest\\RegistryText";
    const struct { const char* name; std::string stored; bool terminated; int read; } cases[] = {
        {"fits", std::string(119, 'f'), true, 1}, {"short", std::string(119, 's'), false, 1},
        {"long", std::string(120, 'l'), true, 0}, {"open", std::string(120, 'o'), false, 0}, {"missing", "", true, 0}};
    for (const auto& c : cases) {
        if (!c.stored.empty()) WriteRegistryString(HKEY_CURRENT_USER, key, c.name, c.stored, c.terminated);
        char text[120];
        memset(text, '#', sizeof text);
        EXPECT_EQ(c.read, ReadRegistryText(HKEY_CURRENT_USER, key.c_str(), c.name, text, sizeof text)) << c.name;
        EXPECT_EQ(c.read ? c.stored : "", std::string(text, strnlen(text, sizeof text))) << c.name;
    }
    DeleteRegistryTree(HKEY_CURRENT_USER, "Software\\VistrelTest");
}

// NT finds the driver key in the video device map, 9x through the card's device node.
TEST(DriverKey, TheDeviceMapOnNtTheDeviceNodeOn9x)
{
    BootMachine(Machine(SIM_WINDOWS_NT4, {Card(0x5333, 0x8901)}));
    std::string map = ReadRegistryRaw(HKEY_LOCAL_MACHINE, "HARDWARE\\DEVICEMAP\\VIDEO", "\\Device\\Video0").c_str();
    ASSERT_EQ(0u, map.find("\\Registry\\Machine\\")) << map;
    const struct { int windows; std::string key, image, description; } cases[] = {
        {SIM_WINDOWS_NT4, map.substr(18), "System32\\drivers\\s3vmini.sys", "Device Description"},
        {SIM_WINDOWS_98, "System\\CurrentControlSet\\Services\\Class\\DISPLAY\\0000", "s3vdisp.drv", "DriverDesc"},
    };
    char key[DRIVER_KEY_SIZE], image[80], text[80];
    for (const auto& c : cases) {
        BootMachine(Machine(c.windows, {Card(0x5333, 0x8901)}));
        ASSERT_EQ(1, DetectAdapters()) << c.windows;
        memset(key, '#', sizeof key);
        memset(image, '#', sizeof image);
        ASSERT_EQ(1, FindDriverKey(key)) << c.windows;
        EXPECT_EQ(c.key, key);
        EXPECT_EQ(1, DriverImageName(image));
        EXPECT_EQ(c.image, image);
        EXPECT_EQ(1, DriverKeyValue("", c.description.c_str(), text, sizeof text, REG_SZ, 1));
        EXPECT_STREQ("S3 Trio64V2/DX PCI", text);
    }
    // A device node whose hardware key names no driver has no driver key.
    const std::string hardware = "Enum\\PCI\\VEN_5333&DEV_8901&SUBSYS_00000000&REV_16\\BUS_00&DEV_0A&FUNC_00";
    WriteRegistryString(HKEY_LOCAL_MACHINE, hardware, "Driver", "");
    EXPECT_EQ(-1, FindDriverKey(key));
    EXPECT_EQ(-1, DriverImageName(key));
}

// The NT device map's kernel path: an empty value is no key, whatever the
// buffer holds past its terminator; a long key is cut to the buffer.
TEST(DriverKeyPath, KernelPathToMachineKey)
{
    const char empty[] = "\0\\Registry\\Machine\\System\\Left";
    const struct { const char* path; int result; const char* key; } cases[] = {
        {"\\Registry\\Machine\\System\\Video", 1, "System\\"},
        {"\\Registry\\Machine", -1, ""}, {empty, -1, ""},
    };
    for (const auto& c : cases) {
        char key[8];
        memset(key, '#', sizeof key);
        EXPECT_EQ(c.result, DriverKeyFromDevicePath(c.path, key, sizeof key)) << c.path;
        if (c.result == 1) EXPECT_EQ(std::string(c.key), key);
    }
}
