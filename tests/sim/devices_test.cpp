// The driver devices as the program talks to them: open flags, request codes
// and buffer sizes, and what each request answers.
#include "sim_test.h"

static const DWORD read_byte = 0x9C406400, read_dword = 0x9C406408, write_byte = 0x9C40A440,
                   write_dword = 0x9C40A448, read_header = 0x9C40644C;

static HANDLE OpenNt(DWORD access = GENERIC_READ | GENERIC_WRITE, DWORD share = FILE_SHARE_READ | FILE_SHARE_WRITE,
                     const char* name = "\\\\.\\Zentra")
{
    return MachineOpenDevice(name, access, share, OPEN_EXISTING, 0);
}
static HANDLE OpenVxd(DWORD creation = CREATE_NEW)
{
    return MachineOpenDevice("\\\\.\\HWGATE.VXD", 0, 0, creation, FILE_FLAG_DELETE_ON_CLOSE);
}

TEST(NtDevice, RequestsAndTheirRefusals)
{
    SimMachineConfig config = MachineWith(SIM_WINDOWS_NT4, 0x8901, 1, 0);
    SimBoot(&config);
    HANDLE nt = OpenNt();
    ASSERT_NE(INVALID_HANDLE_VALUE, nt);
    uint8_t write[8] = {0xD4, 0x03, 0, 0, 0x13}, out[400];  // port, then the byte
    uint32_t port = 0x3D5, too_wide = 0x10000;
    DWORD got;
    ASSERT_TRUE(MachineDeviceRequest(nt, write_byte, write, 5, NULL, 0, &got));
    // A present card gives its whole header; an empty slot, like HalGetBusData, the invalid vendor id.
    const struct { uint16_t where[2]; DWORD count; uint8_t first[4]; } headers[] = {
        {{1, 0}, 256, {0x33, 0x53, 0x01, 0x89}}, {{0, 20}, 2, {0xFF, 0xFF, 0x5A, 0x5A}}};
    for (const auto& h : headers) {
        memset(out, 0x5A, sizeof out);
        ASSERT_TRUE(MachineDeviceRequest(nt, read_header, (void*)h.where, 4, out, sizeof out, &got));
        EXPECT_EQ(h.count, got);
        EXPECT_EQ(0, memcmp(h.first, out, 4)) << h.count;
        EXPECT_EQ(0x5A, out[h.count]) << "nothing written past the count";
    }

    uint16_t where[2] = {0, 10}, no_slot[2] = {0, 32};
    const struct { DWORD code; void* in; DWORD in_size, out_size, error; } refused[] = {
        {0x9C406404, &port, 4, 4, ERROR_INVALID_FUNCTION},  // no such function
        {0x9C402400, &port, 4, 4, ERROR_INVALID_FUNCTION},  // right function, wrong access bits
        {3, &port, 4, 4, ERROR_INVALID_FUNCTION},           // the 9x device's request
        {read_byte, &port, 3, 1, ERROR_INSUFFICIENT_BUFFER},
        {read_dword, &port, 4, 3, ERROR_INSUFFICIENT_BUFFER},
        {write_byte, write, 4, 0, ERROR_INSUFFICIENT_BUFFER},
        {write_byte, NULL, 5, 0, ERROR_INSUFFICIENT_BUFFER},
        {write_dword, write, 7, 0, ERROR_INSUFFICIENT_BUFFER},
        {read_header, where, 4, 399, ERROR_INSUFFICIENT_BUFFER},
        {read_header, no_slot, 4, 400, ERROR_INVALID_PARAMETER},
        {read_byte, &too_wide, 4, 1, ERROR_INVALID_PARAMETER},
    };
    write[4] = 0x77;
    for (const auto& r : refused) {
        SetLastError(0);
        EXPECT_FALSE(MachineDeviceRequest(nt, r.code, r.in, r.in_size, out, r.out_size, &got)) << std::hex << r.code;
        EXPECT_EQ(r.error, GetLastError()) << std::hex << r.code << std::dec << " " << r.in_size << "/" << r.out_size;
    }
    EXPECT_FALSE(MachineDeviceRequest(nt, write_byte, write, 5, NULL, 0, NULL)) << "no count pointer";
    EXPECT_EQ((DWORD)ERROR_INVALID_PARAMETER, GetLastError());
    EXPECT_EQ(0x13, MachineInByte(0x3D4)) << "a refused write must not reach the port";
    EXPECT_TRUE(MachineCloseDevice(nt));
    EXPECT_FALSE(MachineDeviceRequest(nt, read_byte, &port, 4, out, 1, &got)) << "a closed handle is gone";
    EXPECT_EQ((DWORD)ERROR_INVALID_HANDLE, GetLastError());
}

TEST(DriverDevices, EachOpensOnlyOnItsWindowsWithTheProgramsFlags)
{
    BootWith(SIM_WINDOWS_NT4);
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenNt(GENERIC_READ));
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenNt(GENERIC_READ | GENERIC_WRITE, 0));
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenVxd()) << "NT has no virtual devices";
    HANDLE h = OpenNt(GENERIC_READ | GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE, "\\\\.\\ZENTRA");
    EXPECT_TRUE(MachineCloseDevice(h)) << "names are not case-sensitive";
    BootWith(SIM_WINDOWS_98);
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenVxd(OPEN_EXISTING)) << "9x loads a dynamic device only with CREATE_NEW";
    EXPECT_EQ(INVALID_HANDLE_VALUE, OpenNt()) << "no kernel device on Windows 98";
    h = OpenVxd();
    uint32_t physical = 0xC1000000;
    uint8_t out[5] = {0, 0, 0, 0, 0x5A};
    DWORD got = 0;
    EXPECT_FALSE(MachineDeviceRequest(h, 3, &physical, 4, out, 3, &got)) << "the linear address takes 4 bytes";
    EXPECT_FALSE(MachineDeviceRequest(h, 4, &physical, 4, out, 5, &got)) << "request 3 only";
    ASSERT_TRUE(MachineDeviceRequest(h, 3, &physical, 4, out, 5, &got));
    EXPECT_EQ(std::string("\0\0\0\xC1\x5A", 5), std::string((char*)out, 5)) << "linear is physical";
    EXPECT_TRUE(MachineCloseDevice(h));
}
