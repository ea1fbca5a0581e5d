// The ET6000 model: the CLKDAC in the PCI I/O range found through CR21,
// the clock number, DPMS, and the display driver's mode set read back from
// the registers.
#include "sim_test.h"

static void BootEt6000(int windows = SIM_WINDOWS_98)
{
    SimMachineConfig config = Machine(windows, {Card(0x100c, 0x3208)});
    config.start_bits = 8;
    SimBoot(&config);
}
static uint16_t IoPort(uint8_t offset) { return (uint16_t)(ReadCr(0x21) << 8 | offset); }

TEST(Et6000, ClkdacThroughThePortsCr21Names)
{
    BootEt6000();
    EXPECT_EQ(SimCardBarAddress(0, 1) >> 8, ReadCr(0x21));
    // The memory clock at 0x0A, M then N; a new index starts again at M.
    MachineOutByte(IoPort(0x67), 0x0A);
    EXPECT_EQ(75, MachineInByte(IoPort(0x69)));
    MachineOutByte(IoPort(0x67), 0x0A);
    EXPECT_EQ(75, MachineInByte(IoPort(0x69)));
    EXPECT_EQ(0x24, MachineInByte(IoPort(0x69)));
    EXPECT_NEAR(14318180.0 * 77 / (6 * 2), SimMemoryClockHz(0), 1);
    uint16_t index_port = IoPort(0x67);
    PciWrite(0, 10, 0x04, 0x02);  // I/O decode off
    EXPECT_EQ(0xFF, MachineInByte(index_port));
}

TEST(Et6000, DpmsFromCr34)
{
    BootEt6000();
    const struct { uint8_t cr34; SimDpms state; } cases[] = {
        {0x02, SIM_DPMS_ON}, {0x01, SIM_DPMS_STANDBY}, {0x20, SIM_DPMS_SUSPEND}, {0x21, SIM_DPMS_OFF}};
    for (const auto& c : cases) {
        WriteCr(0x34, c.cr34);
        EXPECT_EQ(c.state, SimDpmsState(0)) << std::hex << (int)c.cr34;
    }
}

TEST(Et6000, DmtModesRunAtTheirRates)
{
    const struct { int w, h, bits, hz; } cases[] = {
        {640, 480, 8, 60}, {1280, 1024, 8, 75}, {1024, 768, 16, 85}, {800, 600, 32, 72}};
    for (const auto& c : cases) {
        BootEt6000(SIM_WINDOWS_NT4);
        const SimTiming* t;
        ASSERT_NO_FATAL_FAILURE(SetDmtMode(c.w, c.h, c.bits, c.hz, &t));
        EXPECT_EQ(2, (MachineInByte(0x3CC) >> 2 & 3) | (ReadCr(0x34) & 0x02) << 1) << "clock 2";
        ExpectOverflowBits(t, 0x3F, 0x01, 0x35, 0x02, 1024);  // bit 8 of the total, bit 10
    }
}

// simstate names the synthesizer registers as the chips' documents do.
TEST(Et6000, SimstateNamesTheRawRegisters)
{
    BootEt6000();
    std::string text = PrintedState();
    EXPECT_NE(std::string::npos, text.find("\nET6000_CLKDAC_MCLK=4B24\n"));
    EXPECT_NE(std::string::npos, text.find("\nET6000_CLKDAC_PLL2="));
    SimCardConfig card = Card(0x1023, 0x939a);
    SimMachineConfig config = Machine(SIM_WINDOWS_98, {card});
    SimBoot(&config);
    SimWriteRegister(0, SIM_REG_SEQUENCER, 0x19, 0x45);
    EXPECT_NE(std::string::npos, PrintedState().find("\nTRIDENT_SR19_CLOCK_HIGH=45\nTRIDENT_SR1A_CLOCK_LOW_B="));
}
