// The machine's buses: which device answers a port or a memory address,
// the reset of the cards, and the back doors tests use to look inside.
#include <string.h>

#include "machine_state.h"

SimState* sim;
SimCounters sim_counters;

namespace {

enum { COMMAND_IO = 0x0001 };

bool IsVgaPort(uint16_t port) { return port >= 0x3B0 && port <= 0x3DF; }

// Where a card's memory window shows its VGA ports: the S3, i740 and
// Trident windows put port p at a fixed offset; the NVIDIA chips split the
// ports between their PRMVIO (0x3C2-0x3C5) and PRMCIO blocks.
int WindowPort(int card, int bar, uint32_t offset)
{
    const SimChip* chip = SimCardChip(card);
    if (chip->family == SIM_FAMILY_NVIDIA) {
        if (bar != 0) return -1;
        if (offset >= 0xC0000 + 0x3C2 && offset <= 0xC0000 + 0x3C5) return (int)(offset - 0xC0000);
        if (offset >= 0x601000 + 0x3B0 && offset < 0x601000 + 0x3E0) {
            int port = (int)(offset - 0x601000);
            return port >= 0x3C2 && port <= 0x3C5 ? -1 : port;
        }
        return -1;
    }
    if (chip->window_bar != bar || offset < chip->window_offset) return -1;
    uint32_t port = offset - chip->window_offset;
    return IsVgaPort((uint16_t)port) && port < 0x10000 ? (int)port : -1;
}

// Finds the card and base address register whose range holds an address.
int DecodeAddress(uint32_t address, int* bar, uint32_t* offset)
{
    if (!sim) return -1;
    for (int card = 0; card < sim->config.card_count; card++) {
        const SimChip* chip = SimCardChip(card);
        for (int i = 0; i < 6; i++) {
            uint32_t base = PciBarBase(card, i);
            if (base && address >= base && address - base < chip->bars[i].size) {
                *bar = i;
                *offset = address - base;
                return card;
            }
        }
    }
    return -1;
}

// The card whose I/O base address register holds a port, or -1. Its
// family's port hooks decode what lies there.
int DecodeIoPort(uint16_t port)
{
    for (int card = 0; card < sim->config.card_count; card++) {
        const SimChip* chip = SimCardChip(card);
        for (int i = 0; i < 6; i++) {
            uint32_t base = PciIoBarBase(card, i);
            if (base && port >= base && port - base < chip->bars[i].size) return card;
        }
    }
    return -1;
}

}  // namespace

int SimCardValid(int card) { return sim && card >= 0 && card < sim->config.card_count; }

int SimPrimaryCard()
{
    if (!sim) return -1;
    int card = sim->config.primary_card;
    if (!SimCardValid(card) || !sim->config.cards[card].vendor_id) return -1;
    if (!(sim->cards[card].pci[0x04] & COMMAND_IO)) return -1;
    return card;
}

void SimResetCards()
{
    PciReset();
    for (int card = 0; card < sim->config.card_count; card++) {
        memset(&sim->cards[card].vga, 0, sizeof sim->cards[card].vga);
        memset(sim->cards[card].family, 0, sizeof sim->cards[card].family);
        memset(&sim->cards[card].mode, 0, sizeof sim->cards[card].mode);
        SimCardOps(card)->reset(card);
    }
}

void SimApplyInitialRegisters()
{
    for (int card = 0; card < sim->config.card_count; card++) {
        const SimCardConfig* c = &sim->config.cards[card];
        for (int i = 0; i < c->initial_register_count && i < SIM_MAX_INITIAL_REGISTERS; i++) {
            const SimInitialRegister* r = &c->initial_registers[i];
            SimWriteRegister(card, r->file, r->index, r->value);
        }
    }
}

uint8_t SimPortRead(uint16_t port)
{
    if (!sim) return 0xFF;
    if (port >= 0xCF8 && port <= 0xCFF) return PciPortRead(port);
    int primary = SimPrimaryCard();
    if (IsVgaPort(port) && primary >= 0) return VgaRead(primary, port);
    int card = DecodeIoPort(port);
    const SimFamilyOps* ops = card >= 0 ? SimCardOps(card) : NULL;
    uint8_t value;
    if (ops && ops->read_port && ops->read_port(card, port, &value)) return value;
    return 0xFF;
}

void SimPortWrite(uint16_t port, uint8_t value)
{
    if (!sim) return;
    if (port >= 0xCF8 && port <= 0xCFF) {
        PciPortWrite(port, value);
        return;
    }
    int primary = SimPrimaryCard();
    if (IsVgaPort(port) && primary >= 0) {
        VgaWrite(primary, port, value);
        return;
    }
    int card = DecodeIoPort(port);
    const SimFamilyOps* ops = card >= 0 ? SimCardOps(card) : NULL;
    if (ops && ops->write_port) ops->write_port(card, port, value);
}

uint8_t SimWindowRead(uint32_t address)
{
    int bar;
    uint32_t offset;
    int card = DecodeAddress(address, &bar, &offset);
    if (card < 0) return 0xFF;
    int port = WindowPort(card, bar, offset);
    if (port >= 0) return VgaRead(card, (uint16_t)port);
    uint8_t value;
    const SimFamilyOps* ops = SimCardOps(card);
    if (ops->window_read && ops->window_read(card, bar, offset, &value)) return value;
    return 0xFF;
}

void SimWindowWrite(uint32_t address, uint8_t value)
{
    int bar;
    uint32_t offset;
    int card = DecodeAddress(address, &bar, &offset);
    if (card < 0) return;
    int port = WindowPort(card, bar, offset);
    if (port >= 0) {
        VgaWrite(card, (uint16_t)port, value);
        return;
    }
    const SimFamilyOps* ops = SimCardOps(card);
    if (ops->window_write) ops->window_write(card, bar, offset, value);
}

uint64_t SimHashBytes(const void* data, size_t size, uint64_t seed)
{
    uint64_t h = seed ^ 0xCBF29CE484222325ull;
    const uint8_t* p = (const uint8_t*)data;
    for (size_t i = 0; i < size; i++) h = (h ^ p[i]) * 0x100000001B3ull;
    return h;
}

const SimMachineConfig* SimConfig() { return sim ? &sim->config : NULL; }

uint8_t SimReadRegister(int card, SimRegisterFile file, uint16_t index)
{
    if (!SimCardValid(card)) return 0xFF;
    SimCardState* c = &sim->cards[card];
    switch (file) {
    case SIM_REG_CRTC: return c->vga.cr[index & 0xFF];
    case SIM_REG_SEQUENCER: return c->vga.sr[index & 0xFF];
    case SIM_REG_GRAPHICS: return c->vga.gr[index & 0xFF];
    case SIM_REG_ATTRIBUTE: return c->vga.ar[index & 0x1F];
    case SIM_REG_MISC: return c->vga.misc;
    case SIM_REG_FAMILY: return index < sizeof c->family ? c->family[index] : 0xFF;
    case SIM_REG_PCI: return c->pci[index & 0xFF];
    }
    return 0xFF;
}

void SimWriteRegister(int card, SimRegisterFile file, uint16_t index, uint8_t value)
{
    if (!SimCardValid(card)) return;
    SimCardState* c = &sim->cards[card];
    switch (file) {
    case SIM_REG_CRTC: c->vga.cr[index & 0xFF] = value; break;
    case SIM_REG_SEQUENCER: c->vga.sr[index & 0xFF] = value; break;
    case SIM_REG_GRAPHICS: c->vga.gr[index & 0xFF] = value; break;
    case SIM_REG_ATTRIBUTE: c->vga.ar[index & 0x1F] = value; break;
    case SIM_REG_MISC: c->vga.misc = value; break;
    case SIM_REG_FAMILY:
        if (index < sizeof c->family) c->family[index] = value;
        break;
    case SIM_REG_PCI: c->pci[index & 0xFF] = value; break;
    }
}

uint32_t SimReadInternal32(int card, uint32_t offset)
{
    uint32_t value;
    const SimFamilyOps* ops = SimCardValid(card) ? SimCardOps(card) : NULL;
    return ops && ops->read_internal32 && ops->read_internal32(card, offset, &value) ? value : 0xFFFFFFFF;
}

void SimWriteInternal32(int card, uint32_t offset, uint32_t value)
{
    const SimFamilyOps* ops = SimCardValid(card) ? SimCardOps(card) : NULL;
    if (ops && ops->write_internal32) ops->write_internal32(card, offset, value);
}

double SimPixelClockHz(int card) { return SimCardValid(card) ? SimCardOps(card)->pixel_clock_hz(card) : 0; }
double SimMemoryClockHz(int card) { return SimCardValid(card) ? SimCardOps(card)->memory_clock_hz(card) : 0; }
int SimHTotal(int card) { return SimCardValid(card) ? SimCardOps(card)->htotal(card) : 0; }
int SimVTotal(int card) { return SimCardValid(card) ? SimCardOps(card)->vtotal(card) : 0; }
double SimRefreshHz(int card) { return SimCardValid(card) ? SimCardOps(card)->refresh_hz(card) : 0; }
SimDpms SimDpmsState(int card) { return SimCardValid(card) ? SimCardOps(card)->dpms(card) : SIM_DPMS_ON; }
int SimCardDepth(int card) { return SimCardValid(card) ? sim->cards[card].mode.bits : 0; }

SimCardMode SimGetCardMode(int card)
{
    SimCardMode m = {0, 0, 0, 0, false};
    if (!SimCardValid(card)) return m;
    const SimDriverMode* d = &sim->cards[card].mode;
    m.width = d->width;
    m.height = d->height;
    m.bits = d->bits;
    m.refresh = d->refresh;
    m.interlaced = d->interlaced != 0;
    return m;
}

uint32_t SimCardBarAddress(int card, int bar)
{
    if (!SimCardValid(card) || bar < 0 || bar > 5) return 0;
    uint32_t v;
    memcpy(&v, sim->cards[card].pci + 0x10 + 4 * bar, 4);
    return v & ((v & 1) ? 0xFFFFFFFCu : 0xFFFFFFF0u);
}

const SimCounters* SimGetCounters() { return &sim_counters; }
void SimResetCounters() { memset(&sim_counters, 0, sizeof sim_counters); }
