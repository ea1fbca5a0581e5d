// The driver devices as the program talks to them: open flags, request codes
// and buffer sizes, what each request reaches; and the video BIOS.
#include "sim_test.h"

namespace {

const DWORD read_byte = 0x9C406400, read_dword = 0x9C406408, write_byte = 0x9C40A440, write_dword = 0x9C40A448,
            read_header = 0x9C40644C;

HANDLE OpenNt(DWORD access = GENERIC_READ | GENERIC_WRITE, DWORD share = FILE_SHARE_READ | FILE_SHARE_WRITE,
              const char* name = "\\\\.\\Zentra")
{
    return MachineOpenDevice(name, access, share, OPEN_EXISTING, 0);
}
HANDLE OpenVxd(DWORD creation = CREATE_NEW)
{
    return MachineOpenDevice("\\\\.\\HWGATE.VXD", 0, 0, creation, FILE_FLAG_DELETE_ON_CLOSE);
}

}  // namespace

TEST(NtDevice, RequestsReachThePortsAndConfigurationHeaders)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, 0x5333, 0x8901, 1, 0);
    SimBoot(&config);
    HANDLE device = OpenNt();
    ASSERT_NE(INVALID_HANDLE_VALUE, device);
    DWORD got = 0xDEAD;
    uint8_t index[5] = {0xD4, 0x03, 0, 0, 0x13}, data[5] = {0xD5, 0x03, 0, 0, 0x9A};  // port, then the byte
    ASSERT_TRUE(MachineDeviceRequest(device, write_byte, index, 5, NULL, 0, &got));
    ASSERT_TRUE(MachineDeviceRequest(device, write_byte, data, 5, NULL, 0, &got));
    EXPECT_EQ(0u, got);
    EXPECT_EQ(0x9A, SimReadRegister(0, SIM_REG_CRTC, 0x13));
    uint32_t port = 0x3D5, value = 0x5A5A5A5A;
    ASSERT_TRUE(MachineDeviceRequest(device, read_byte, &port, 4, &value, 1, &got));
    EXPECT_EQ(1u, got);
    EXPECT_EQ(0x5A5A5A9Au, value) << "one byte written";
    uint32_t address[2] = {0xCF8, 0x80000000u | 1 << 16};
    ASSERT_TRUE(MachineDeviceRequest(device, write_dword, address, 8, NULL, 0, &got));
    port = 0xCFC;
    ASSERT_TRUE(MachineDeviceRequest(device, read_dword, &port, 4, &value, 4, &got));
    EXPECT_EQ(4u, got);
    EXPECT_EQ(0x89015333u, value);

    uint8_t header[400];
    const struct {
        uint16_t bus, device;
        DWORD count;
        uint8_t first[4];
    } headers[] = {{1, 0, 256, {0x33, 0x53, 0x01, 0x89}}, {0, 20, 2, {0xFF, 0xFF, 0x5A, 0x5A}}};
    for (const auto& h : headers) {
        memset(header, 0x5A, sizeof header);
        uint16_t where[2] = {h.bus, h.device};
        ASSERT_TRUE(MachineDeviceRequest(device, read_header, where, 4, header, sizeof header, &got));
        EXPECT_EQ(h.count, got) << h.device;
        EXPECT_EQ(0, memcmp(h.first, header, 4)) << h.device;
        EXPECT_EQ(0x5A, header[h.count]) << "nothing written past the count";
    }
    EXPECT_TRUE(MachineCloseDevice(device));
    EXPECT_FALSE(MachineCloseDevice(device)) << "a closed handle is gone";
    EXPECT_FALSE(MachineDeviceRequest(device, read_byte, &port, 4, &value, 1, &got));
    EXPECT_EQ((DWORD)ERROR_INVALID_HANDLE, GetLastError());
}

TEST(NtDevice, MalformedRequestsFailAndReachNothing)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, 0x5333, 0x8901);
    SimBoot(&config);
    HANDLE device = OpenNt();
    ASSERT_NE(INVALID_HANDLE_VALUE, device);
    uint32_t port = 0x3CC, too_wide = 0x10000;
    uint16_t where[2] = {0, 10}, no_slot[2] = {0, 32};
    uint8_t write[8] = {0xC2, 0x03, 0, 0, 0x67}, out[400];
    DWORD got;
    const struct {
        DWORD code;
        void* in;
        DWORD in_size, out_size, error;
    } cases[] = {
        {0x9C406404, &port, 4, 4, ERROR_INVALID_FUNCTION},  // no such function
        {0x9C402400, &port, 4, 4, ERROR_INVALID_FUNCTION},  // right function, wrong access bits
        {3, &port, 4, 4, ERROR_INVALID_FUNCTION},           // the 9x device's request
        {read_byte, &port, 3, 1, ERROR_INSUFFICIENT_BUFFER},
        {read_byte, &port, 4, 0, ERROR_INSUFFICIENT_BUFFER},
        {read_dword, &port, 4, 3, ERROR_INSUFFICIENT_BUFFER},
        {write_byte, write, 4, 0, ERROR_INSUFFICIENT_BUFFER},
        {write_dword, write, 7, 0, ERROR_INSUFFICIENT_BUFFER},
        {read_header, where, 4, 399, ERROR_INSUFFICIENT_BUFFER},
        {read_header, where, 3, 400, ERROR_INSUFFICIENT_BUFFER},
        {read_header, no_slot, 4, 400, ERROR_INVALID_PARAMETER},
        {read_byte, &too_wide, 4, 1, ERROR_INVALID_PARAMETER},
        {write_byte, NULL, 5, 0, ERROR_INSUFFICIENT_BUFFER},
    };
    uint8_t misc = SimReadRegister(0, SIM_REG_MISC, 0);
    for (const auto& c : cases) {
        SetLastError(0);
        EXPECT_FALSE(MachineDeviceRequest(device, c.code, c.in, c.in_size, out, c.out_size, &got)) << std::hex << c.code;
        EXPECT_EQ(c.error, GetLastError()) << std::hex << c.code << " in " << c.in_size << " out " << c.out_size;
    }
    EXPECT_FALSE(MachineDeviceRequest(device, write_byte, write, 5, NULL, 0, NULL)) << "no count pointer";
    EXPECT_EQ((DWORD)ERROR_INVALID_PARAMETER, GetLastError());
    EXPECT_EQ(misc, SimReadRegister(0, SIM_REG_MISC, 0)) << "a refused write must not reach the port";
    MachineCloseDevice(device);
}

TEST(DriverDevices, EachOpensOnlyOnItsWindowsWithTheProgramsFlags)
{
    SimMachineConfig nt = MachineWith(SIM_WINDOWS_NT4, 0x5333, 0x8901);
    SimBoot(&nt);
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenNt(GENERIC_READ));
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenNt(GENERIC_READ | GENERIC_WRITE, 0));
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenVxd()) << "NT has no virtual devices";
    HANDLE h = OpenNt(GENERIC_READ | GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE, "\\\\.\\ZENTRA");
    EXPECT_NE(INVALID_HANDLE_VALUE, h) << "device names are not case-sensitive";
    MachineCloseDevice(h);
    nt.nt_device = false;
    SimBoot(&nt);
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenNt()) << "the driver is not installed";

    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    SimBoot(&config);
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenVxd(OPEN_EXISTING)) << "9x loads a dynamic device only with CREATE_NEW";
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenNt()) << "no kernel device on Windows 98";
    h = OpenVxd();
    ASSERT_NE(INVALID_HANDLE_VALUE, h);
    uint32_t physical = SimCardBarAddress(0, 0) + 0x01000000;
    uint8_t out[5] = {0, 0, 0, 0, 0x5A};
    DWORD got = 0;
    ASSERT_TRUE(MachineDeviceRequest(h, 3, &physical, 4, out, 5, &got));
    EXPECT_EQ(4u, got);
    EXPECT_EQ(0x5A, out[4]);
    uint32_t linear;
    memcpy(&linear, out, 4);
    EXPECT_EQ(SimReadRegister(0, SIM_REG_MISC, 0), MachineReadByte(linear + 0x8000 + 0x3CC));
    EXPECT_FALSE(MachineDeviceRequest(h, 3, &physical, 4, out, 3, &got));
    EXPECT_FALSE(MachineDeviceRequest(h, 4, &physical, 4, out, 5, &got));
    EXPECT_TRUE(MachineCloseDevice(h));
}

TEST(VideoBios, OnlyTheTsengBiosTellsItsMemory)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_95, 0x100C, 0x3208);
    config.cards[0].memory_mb = 2;
    config.cards[0].memory_extra_kb = 256;
    SimBoot(&config);
    BiosRegisters regs = {0x1203, 0x00F2, 0, 0}, other = {0x4F00, 0x00F2, 0, 0};
    ASSERT_EQ(1, MachineVideoBios(&regs));
    EXPECT_EQ(0x0024, regs.bx) << "2 MB and 4 x 64 KB";
    EXPECT_EQ(0, MachineVideoBios(&other));
    config = MachineWith(SIM_WINDOWS_95, 0x5333, 0x8901);
    SimBoot(&config);
    regs = {0x1203, 0x00F2, 0, 0};
    EXPECT_EQ(0, MachineVideoBios(&regs));
}
