// The machine seam answered by the simulated machine: port instructions and
// register-window accesses. The driver devices and the video BIOS are in
// devices.cpp, the display driver in display.cpp.
#include "hardware/machine.h"
#include "machine_state.h"

uint8_t MachineInByte(uint16_t port)
{
    sim_counters.port_reads++;
    return SimPortRead(port);
}

// A 32-bit port access reaches the PCI address register whole; anywhere
// else it is four byte accesses at consecutive ports.
uint32_t MachineInDword(uint16_t port)
{
    sim_counters.port_reads++;
    if (!sim) return 0xFFFFFFFF;
    if (port == 0xCF8 || port == 0xCFC) return PciPortReadDword(port);
    uint32_t v = 0;
    for (int i = 3; i >= 0; i--) v = (v << 8) | SimPortRead((uint16_t)(port + i));
    return v;
}

void MachineOutByte(uint16_t port, uint8_t value)
{
    sim_counters.port_writes++;
    SimPortWrite(port, value);
}

void MachineOutDword(uint16_t port, uint32_t value)
{
    sim_counters.port_writes++;
    if (!sim) return;
    if (port == 0xCF8 || port == 0xCFC) {
        PciPortWriteDword(port, value);
        return;
    }
    for (int i = 0; i < 4; i++) SimPortWrite((uint16_t)(port + i), (uint8_t)(value >> (8 * i)));
}

// Wider window accesses arrive at the chip as consecutive bytes, low first
// (a word write to the CRT index port sets index and data).
uint8_t MachineReadByte(uint32_t linear)
{
    sim_counters.window_reads++;
    return SimWindowRead(linear);
}

uint16_t MachineReadWord(uint32_t linear)
{
    sim_counters.window_reads++;
    uint8_t low = SimWindowRead(linear);
    return (uint16_t)(low | SimWindowRead(linear + 1) << 8);
}

uint32_t MachineReadDword(uint32_t linear)
{
    sim_counters.window_reads++;
    uint32_t v = 0;
    for (int i = 0; i < 4; i++) v |= (uint32_t)SimWindowRead(linear + i) << (8 * i);
    return v;
}

void MachineWriteByte(uint32_t linear, uint8_t value)
{
    sim_counters.window_writes++;
    SimWindowWrite(linear, value);
}

void MachineWriteWord(uint32_t linear, uint16_t value)
{
    sim_counters.window_writes++;
    SimWindowWrite(linear, (uint8_t)value);
    SimWindowWrite(linear + 1, (uint8_t)(value >> 8));
}

void MachineWriteDword(uint32_t linear, uint32_t value)
{
    sim_counters.window_writes++;
    for (int i = 0; i < 4; i++) SimWindowWrite(linear + i, (uint8_t)(value >> (8 * i)));
}
