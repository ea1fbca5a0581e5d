#include <gtest/gtest.h>

#include <string.h>

#include "base/adapters.h"
#include "base/state.h"
#include "chips/chips.h"
#include "hardware/driver_device.h"
#include "hardware/driver_key.h"
#include "hardware/machine.h"
#include "hardware/pci.h"
#include "hardware/register_access.h"
#include "hardware/registry_text.h"
#include "modes/detect.h"
#include "modes/mode_keys.h"
#include "modes/rate_list.h"
#include "support/machine.h"
#include "support/support.h"

TEST(KernelDevice, PortAndHeaderRequests)
{
    BootMachine(Machine(SIM_WINDOWS_NT4, {Card(0x5333, 0x8901, 1, 0)}));
    ASSERT_EQ(1, OpenRegisterAccess());
    EXPECT_EQ(1u, WritePortByte(0x3D4, 0x13));
    EXPECT_EQ(1u, WritePortByte(0x3D5, 0x5A));
    EXPECT_EQ(0x5A, SimReadRegister(0, SIM_REG_CRTC, 0x13));
    EXPECT_EQ(0x13u, ReadPortByte(0x3D4));
    EXPECT_EQ(0x5Au, ReadPortByte(0x3D5));
    EXPECT_EQ(SimReadRegister(0, SIM_REG_MISC, 0), ReadPortByte(0x3CC));
    // Configuration mechanism #1 through the dword requests.
    EXPECT_NE(0u, WritePortDword(0xCF8, 0x80010000));
    EXPECT_EQ(0x89015333u, ReadPortDword(0xCFC));

    uint8_t header[PCI_HEADER_BUFFER_SIZE];
    memset(header, 0xCC, sizeof header);
    ASSERT_EQ(1, ZentraReadPciHeader(driver_handle, 1, 0, header));
    EXPECT_EQ(0x33, header[0]);
    EXPECT_EQ(0x53, header[1]);
    EXPECT_EQ(0x01, header[2]);
    EXPECT_EQ(0x89, header[3]);
    EXPECT_EQ(1, CloseRegisterAccess());
    EXPECT_EQ(NULL, driver_handle);
    EXPECT_EQ(1, CloseRegisterAccess());
}

TEST(KernelDevice, MalformedRequestsFail)
{
    BootMachine(Machine(SIM_WINDOWS_NT4, {Card(0x5333, 0x8901)}));
    HANDLE device = OpenZentraDevice();
    ASSERT_TRUE(device);
    uint32_t port = 0x3CC;
    uint8_t out[PCI_HEADER_BUFFER_SIZE];
    DWORD returned;
    EXPECT_FALSE(MachineDeviceRequest(device, 0x9C406404, &port, 4, out, 1, &returned));  // no such code
    EXPECT_FALSE(MachineDeviceRequest(device, ZENTRA_READ_PORT_BYTE, &port, 2, out, 1, &returned));
    EXPECT_FALSE(MachineDeviceRequest(device, ZENTRA_READ_PORT_DWORD, &port, 4, out, 2, &returned));
    uint16_t where[2] = {0, 10};
    EXPECT_FALSE(MachineDeviceRequest(device, ZENTRA_READ_PCI_HEADER, where, 4, out, 256, &returned));
    EXPECT_TRUE(MachineDeviceRequest(device, ZENTRA_READ_PCI_HEADER, where, 4, out, sizeof out, &returned));
    CloseZentraDevice(device);
}

TEST(KernelDevice, WithoutTheDeviceNothingIsAsked)
{
    SimMachineConfig config = Machine(SIM_WINDOWS_NT4, {Card(0x5333, 0x8901)});
    config.nt_device = false;
    BootMachine(config);
    EXPECT_EQ(0, OpenRegisterAccess());
    SimResetCounters();
    EXPECT_EQ(0u, ReadPortByte(0x3CC));
    EXPECT_EQ(0u, WritePortByte(0x3D4, 0x11));
    EXPECT_EQ(0u, SimGetCounters()->device_requests);
    EXPECT_EQ(0, DetectAdapters());
}

TEST(PortInstructions, Windows9xWritesGiveTheValueBack)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901)}));
    EXPECT_EQ(1, OpenRegisterAccess());
    EXPECT_EQ(0x11u, WritePortByte(0x3D4, 0x11));
    EXPECT_EQ(0x11u, ReadPortByte(0x3D4));
    SimResetCounters();
    CloseRegisterAccess();
    EXPECT_EQ(0u, SimGetCounters()->device_requests);
}

TEST(PciConfiguration, FindsCardsInBusOrderBehindTheBridge)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 1, 0), Card(0x5333, 0x8901, 0, 12),
                                         Card(0x5333, 0x8901, 0, 9)}));
    uint8_t bus = 0xEE, devfn = 0xEE;
    ASSERT_EQ(1, PciFindDevice(0x5333, 0x8901, 0, &bus, &devfn));
    EXPECT_EQ(0, bus);
    EXPECT_EQ(9 << 3, devfn);
    ASSERT_EQ(1, PciFindDevice(0x5333, 0x8901, 1, &bus, &devfn));
    EXPECT_EQ(0, bus);
    EXPECT_EQ(12 << 3, devfn);
    ASSERT_EQ(1, PciFindDevice(0x5333, 0x8901, 2, &bus, &devfn));
    EXPECT_EQ(1, bus);
    EXPECT_EQ(0, devfn);
    EXPECT_EQ(0, PciFindDevice(0x5333, 0x8901, 3, &bus, &devfn));
    EXPECT_EQ(0, PciFindDevice(0x10de, 0x0020, 0, &bus, &devfn));
    EXPECT_EQ(0x5333, PciReadConfigWord(1, 0, 0));
    EXPECT_EQ(0x8901, PciReadConfigWord(1, 0, 2));
}

TEST(RegisterWindow, ReachesTheSameRegistersAsThePorts)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901)}));
    ASSERT_EQ(1, DetectAdapters());
    const AdapterRecord* a = CurrentAdapter();
    ASSERT_NE(0u, a->mapped_registers);
    EXPECT_EQ((SimCardBarAddress(0, 0) & 0xFC000000u) + 0x01000000u, a->mapped_registers);
    chip_open_io();
    SimResetCounters();
    chip_write_port(0x3D4, 0x13);
    chip_write_port(0x3D5, 0xA7);
    EXPECT_EQ(0xA7u, chip_read_port(0x3D5));
    chip_close_io();
    EXPECT_EQ(0xA7, SimReadRegister(0, SIM_REG_CRTC, 0x13));
    EXPECT_EQ(0u, SimGetCounters()->port_writes);  // all through the window
    EXPECT_GE(SimGetCounters()->window_writes, 2u);

    SimMachineConfig no_vxd = Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901)});
    no_vxd.vxd_device = false;
    BootMachine(no_vxd);
    ASSERT_EQ(1, DetectAdapters());
    EXPECT_EQ(0u, CurrentAdapter()->mapped_registers);  // port instructions instead
}

TEST(ChipCommands, UnknownCodesTouchNothing)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901)}));
    ASSERT_EQ(1, DetectAdapters());
    SimResetCounters();
    for (uint32_t code : {3u, 5u, 218u, 228u, 230u, 232u, 238u, 239u, 240u, 0xFFFFFFFFu})
        EXPECT_EQ(0u, chip_table[CurrentAdapter()->chip_row].Dispatch(code, 0)) << code;
    EXPECT_EQ(0u, SimGetCounters()->port_reads + SimGetCounters()->port_writes + SimGetCounters()->window_reads +
                      SimGetCounters()->window_writes);
    // The port command packs value and port in one argument.
    chip_open_io();
    chip_write_port(0x103D4, 0x10011);  // both cut to 16 bits
    EXPECT_EQ(0x11u, chip_read_port(0x3D4));
    chip_close_io();
}

// A text exactly as long as its buffer allows is a whole text; one byte
// more is not cut into a different one.
TEST(RegistryText, FillsTheBufferExactlyOrNotAtAll)
{
    const std::string key = "Software\\VistrelTest\\RegistryText";
    WriteRegistryString(HKEY_CURRENT_USER, key, "fits", std::string(119, 'f'));
    WriteRegistryString(HKEY_CURRENT_USER, key, "long", std::string(120, 'l'));
    WriteRegistryString(HKEY_CURRENT_USER, key, "open", std::string(120, 'o'), false);
    char text[120];
    memset(text, '#', sizeof text);
    EXPECT_EQ(1, ReadRegistryText(HKEY_CURRENT_USER, key.c_str(), "fits", text, sizeof text));
    EXPECT_EQ(std::string(119, 'f'), text);
    for (const char* name : {"long", "open", "missing"}) {
        memset(text, '#', sizeof text);
        EXPECT_EQ(0, ReadRegistryText(HKEY_CURRENT_USER, key.c_str(), name, text, sizeof text)) << name;
        EXPECT_STREQ("", text) << name;
    }
    DeleteRegistryTree(HKEY_CURRENT_USER, "Software\\VistrelTest");
}
