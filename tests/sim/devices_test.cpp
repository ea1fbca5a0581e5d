// The driver devices as the program talks to them: open flags, request
// codes and buffer sizes, what each request reaches; and the video BIOS.
#include "sim_test.h"

namespace {

const DWORD read_byte = 0x9C406400, read_dword = 0x9C406408, write_byte = 0x9C40A440, write_dword = 0x9C40A448,
            read_header = 0x9C40644C;

HANDLE OpenNt()
{
    return MachineOpenDevice("\\\\.\\Zentra", GENERIC_READ | GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE,
                             OPEN_EXISTING, 0);
}
HANDLE OpenVxd() { return MachineOpenDevice("\\\\.\\HWGATE.VXD", 0, 0, CREATE_NEW, FILE_FLAG_DELETE_ON_CLOSE); }

#pragma pack(push, 1)
struct PortByte {
    uint32_t port;
    uint8_t value;
};
#pragma pack(pop)

}  // namespace

class NtDeviceTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, 0x5333, 0x8901, 1, 0);
        SimBoot(&config);
        device = OpenNt();
        ASSERT_NE(INVALID_HANDLE_VALUE, device);
    }
    void TearDown() override { MachineCloseDevice(device); }
    HANDLE device;
};

TEST_F(NtDeviceTest, PortRequestsReachThePrimaryCard)
{
    PortByte index = {0x3D4, 0x13}, data = {0x3D5, 0x9A};
    DWORD got = 0xDEAD;
    ASSERT_TRUE(MachineDeviceRequest(device, write_byte, &index, 5, NULL, 0, &got));
    ASSERT_TRUE(MachineDeviceRequest(device, write_byte, &data, 5, NULL, 0, &got));
    EXPECT_EQ(0u, got);
    EXPECT_EQ(0x9A, SimReadRegister(0, SIM_REG_CRTC, 0x13));
    uint32_t port = 0x3D5;
    uint8_t value[4] = {0};
    ASSERT_TRUE(MachineDeviceRequest(device, read_byte, &port, 4, value, 1, &got));
    EXPECT_EQ(1u, got);
    EXPECT_EQ(0x9A, value[0]);

    // PCI configuration through the dword requests.
    uint32_t address[2] = {0xCF8, 0x80000000u | 1 << 16};
    ASSERT_TRUE(MachineDeviceRequest(device, write_dword, address, 8, NULL, 0, &got));
    port = 0xCFC;
    uint32_t ids = 0;
    ASSERT_TRUE(MachineDeviceRequest(device, read_dword, &port, 4, &ids, 4, &got));
    EXPECT_EQ(4u, got);
    EXPECT_EQ(0x89015333u, ids);
}

TEST_F(NtDeviceTest, ConfigurationHeadersOfPresentAndEmptySlots)
{
    uint8_t header[400];
    memset(header, 0x5A, sizeof header);
    uint16_t where[2] = {1, 0};
    DWORD got = 0;
    ASSERT_TRUE(MachineDeviceRequest(device, read_header, where, 4, header, sizeof header, &got));
    EXPECT_EQ(256u, got);
    EXPECT_EQ(0x5333, header[0] | header[1] << 8);
    EXPECT_EQ(0x8901, header[2] | header[3] << 8);
    EXPECT_EQ(0x03, header[0x0B]);
    EXPECT_EQ(0x5A, header[256]) << "only the 256-byte header is written";

    memset(header, 0x5A, sizeof header);
    where[0] = 0;
    where[1] = 20;
    ASSERT_TRUE(MachineDeviceRequest(device, read_header, where, 4, header, sizeof header, &got));
    EXPECT_EQ(2u, got);
    EXPECT_EQ(0xFFFF, header[0] | header[1] << 8) << "an empty slot reads as the invalid vendor id";
    EXPECT_EQ(0x5A, header[2]);
    where[1] = 32;
    EXPECT_FALSE(MachineDeviceRequest(device, read_header, where, 4, header, sizeof header, &got));
}

TEST_F(NtDeviceTest, BadCodesAndShortBuffersFail)
{
    uint32_t port = 0x3CC;
    uint8_t out[400];
    uint16_t where[2] = {1, 0};
    PortByte write = {0x3C2, 0x67};
    DWORD got;
    struct {
        DWORD code;
        void* in;
        DWORD in_size;
        DWORD out_size;
        DWORD error;
    } cases[] = {
        {0x9C406404, &port, 4, 4, ERROR_INVALID_FUNCTION},  // no such function
        {0x9C402400, &port, 4, 4, ERROR_INVALID_FUNCTION},  // right function, wrong access bits
        {3, &port, 4, 4, ERROR_INVALID_FUNCTION},           // the 9x device's request
        {read_byte, &port, 2, 1, ERROR_INSUFFICIENT_BUFFER},
        {read_byte, &port, 4, 0, ERROR_INSUFFICIENT_BUFFER},
        {read_dword, &port, 4, 3, ERROR_INSUFFICIENT_BUFFER},
        {write_byte, &write, 4, 0, ERROR_INSUFFICIENT_BUFFER},
        {write_dword, &write, 5, 0, ERROR_INSUFFICIENT_BUFFER},
        {read_header, where, 4, 255, ERROR_INSUFFICIENT_BUFFER},
        {read_header, where, 3, 400, ERROR_INSUFFICIENT_BUFFER},
    };
    uint8_t misc = SimReadRegister(0, SIM_REG_MISC, 0);
    for (auto& c : cases) {
        SetLastError(0);
        EXPECT_FALSE(MachineDeviceRequest(device, c.code, c.in, c.in_size, out, c.out_size, &got)) << std::hex << c.code;
        EXPECT_EQ(c.error, GetLastError()) << std::hex << c.code;
    }
    EXPECT_EQ(misc, SimReadRegister(0, SIM_REG_MISC, 0)) << "a refused write must not reach the port";
    uint32_t too_wide = 0x10000;
    EXPECT_FALSE(MachineDeviceRequest(device, read_byte, &too_wide, 4, out, 1, &got));
}

TEST(NtDeviceOpen, OnlyTheProgramsOpenFlagsOnAnNtMachine)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, 0x5333, 0x8901);
    SimBoot(&config);
    EXPECT_EQ(INVALID_HANDLE_VALUE, MachineOpenDevice("\\\\.\\Zentra", GENERIC_READ, FILE_SHARE_READ | FILE_SHARE_WRITE,
                                                      OPEN_EXISTING, 0));
    EXPECT_EQ(INVALID_HANDLE_VALUE, MachineOpenDevice("\\\\.\\Zentra", GENERIC_READ | GENERIC_WRITE, 0, OPEN_EXISTING, 0));
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenVxd()) << "NT has no virtual devices";
    HANDLE h = MachineOpenDevice("\\\\.\\ZENTRA", GENERIC_READ | GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE,
                                 OPEN_EXISTING, 0);
    ASSERT_NE(INVALID_HANDLE_VALUE, h) << "device names are not case-sensitive";
    EXPECT_TRUE(MachineCloseDevice(h));
    EXPECT_FALSE(MachineCloseDevice(h)) << "a closed handle is gone";
    uint32_t port = 0x3CC;
    uint8_t out;
    DWORD got;
    EXPECT_FALSE(MachineDeviceRequest(h, read_byte, &port, 4, &out, 1, &got));
    EXPECT_EQ((DWORD)ERROR_INVALID_HANDLE, GetLastError());

    config.nt_device = false;
    SimBoot(&config);
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenNt()) << "the driver is not installed";
}

TEST(VxdDevice, MapsPhysicalAddressesOntoTheCardsWindow)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_98, 0x5333, 0x8901);
    SimBoot(&config);
    EXPECT_EQ(INVALID_HANDLE_VALUE, MachineOpenDevice("\\\\.\\HWGATE.VXD", 0, 0, OPEN_EXISTING, 0))
        << "Windows 9x loads a dynamic device only with CREATE_NEW and delete-on-close";
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenNt()) << "no kernel device on Windows 98";
    HANDLE h = OpenVxd();
    ASSERT_NE(INVALID_HANDLE_VALUE, h);
    uint32_t physical = SimCardBarAddress(0, 0) + 0x01000000;
    uint8_t out[5] = {0};
    DWORD got = 0;
    ASSERT_TRUE(MachineDeviceRequest(h, 3, &physical, 4, out, 5, &got));
    uint32_t linear;
    memcpy(&linear, out, 4);
    EXPECT_EQ(4u, got);
    EXPECT_EQ(SimReadRegister(0, SIM_REG_MISC, 0), MachineReadByte(linear + 0x8000 + 0x3CC));
    EXPECT_FALSE(MachineDeviceRequest(h, 3, &physical, 4, out, 3, &got));
    EXPECT_FALSE(MachineDeviceRequest(h, 4, &physical, 4, out, 5, &got));
    EXPECT_TRUE(MachineCloseDevice(h));
}

TEST(VideoBios, TsengMemoryQuery)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_95, 0x100C, 0x3208);
    config.cards[0].memory_mb = 2;
    config.cards[0].memory_extra_kb = 256;
    SimBoot(&config);
    BiosRegisters regs = {0x1203, 0x00F2, 0, 0};
    ASSERT_EQ(1, MachineVideoBios(&regs));
    EXPECT_EQ(0x0024, regs.bx) << "2 MB and 4 x 64 KB";
    BiosRegisters other = {0x4F00, 0, 0, 0};
    EXPECT_EQ(0, MachineVideoBios(&other));

    config = MachineWith(SIM_WINDOWS_95, 0x5333, 0x8901);
    SimBoot(&config);
    regs = {0x1203, 0x00F2, 0, 0};
    EXPECT_EQ(0, MachineVideoBios(&regs)) << "only the Tseng BIOS knows this call";
}
