// The PCI side of the machine: a 440BX-style host bridge answering
// configuration mechanism #1 (address at 0xCF8, data at 0xCFC..0xCFF), its
// AGP bridge with bus 1 behind it, a south bridge, and each card's
// 256-byte configuration header with sized base address registers.
#include <string.h>

#include "machine_state.h"

namespace {

enum {
    CONFIG_ENABLE = 0x80000000u,
    CONFIG_ADDRESS_MASK = 0x80FFFFFCu,
    COMMAND_IO = 0x0001,
    COMMAND_MEMORY = 0x0002,
    COMMAND_BUS_MASTER = 0x0004,
    STATUS_CAPABILITIES = 0x0010,
    STATUS_DEVSEL_MEDIUM = 0x0200,
    AGP_CAPABILITY_OFFSET = 0x44,
    ROM_SIZE = 0x10000,
};

// Address ranges handed out at boot: bus 0 cards, and bus 1 cards inside
// the AGP bridge's forwarding window.
const uint32_t bus0_memory_start = 0xC0000000u, bus1_memory_start = 0xE0000000u;
const uint32_t bus0_io_start = 0xE000, bus1_io_start = 0xD000;

// The chipset's own functions on bus 0 (read-only headers built on reading).
struct ChipsetFunction {
    uint8_t device, function;
    uint16_t vendor, device_id;
    uint8_t revision;
    uint32_t class_code;  // class, subclass, programming interface
    uint8_t header_type;
};
const ChipsetFunction chipset[] = {
    {0, 0, 0x8086, 0x7190, 0x03, 0x060000, 0x00},  // host bridge
    {1, 0, 0x8086, 0x7191, 0x03, 0x060400, 0x01},  // AGP bridge, bus 1 behind it
    {7, 0, 0x8086, 0x7110, 0x02, 0x060100, 0x80},  // ISA bridge, multi-function
    {7, 1, 0x8086, 0x7111, 0x01, 0x010180, 0x00},  // IDE
    {7, 2, 0x8086, 0x7112, 0x01, 0x0C0300, 0x00},  // USB
    {7, 3, 0x8086, 0x7113, 0x02, 0x068000, 0x00},  // power management
};

void Put16(uint8_t* p, int offset, uint16_t v) { memcpy(p + offset, &v, 2); }
void Put32(uint8_t* p, int offset, uint32_t v) { memcpy(p + offset, &v, 4); }
uint16_t Get16(const uint8_t* p, int offset) { uint16_t v; memcpy(&v, p + offset, 2); return v; }
uint32_t Get32(const uint8_t* p, int offset) { uint32_t v; memcpy(&v, p + offset, 4); return v; }

const ChipsetFunction* FindChipset(int device, int function)
{
    for (const ChipsetFunction& f : chipset)
        if (f.device == device && f.function == function) return &f;
    return NULL;
}

// The end of what the machine handed out behind the AGP bridge, rounded up
// to the bridge's window granularity.
void BridgeLimits(uint32_t* memory_end, uint32_t* io_end)
{
    *memory_end = bus1_memory_start + 0x100000;
    *io_end = bus1_io_start + 0x1000;
    for (int card = 0; card < sim->config.card_count; card++) {
        if (sim->config.cards[card].bus != 1) continue;
        const SimChip* chip = SimCardChip(card);
        for (int i = 0; i < 6; i++) {
            if (!chip->bars[i].size) continue;
            uint32_t base = Get32(sim->cards[card].pci, 0x10 + 4 * i) & ~0xFu;
            uint32_t end = base + chip->bars[i].size;
            if (chip->bars[i].flags & SIM_BAR_IO) {
                end = (end + 0xFFF) & ~0xFFFu;
                if (end > *io_end) *io_end = end;
            } else {
                end = (end + 0xFFFFF) & ~0xFFFFFu;
                if (end > *memory_end) *memory_end = end;
            }
        }
    }
}

uint8_t ChipsetRead(const ChipsetFunction* f, int offset)
{
    uint8_t h[256] = {0};
    Put16(h, 0x00, f->vendor);
    Put16(h, 0x02, f->device_id);
    Put16(h, 0x04, COMMAND_IO | COMMAND_MEMORY | COMMAND_BUS_MASTER);
    Put16(h, 0x06, STATUS_DEVSEL_MEDIUM);
    h[0x08] = f->revision;
    h[0x09] = (uint8_t)f->class_code;
    h[0x0A] = (uint8_t)(f->class_code >> 8);
    h[0x0B] = (uint8_t)(f->class_code >> 16);
    h[0x0E] = f->header_type;
    if ((f->header_type & 0x7F) == 1) {
        h[0x18] = 0;  // primary bus
        h[0x19] = 1;  // secondary bus
        h[0x1A] = 1;  // subordinate bus
        uint32_t bridge_memory_limit, bridge_io_limit;
        BridgeLimits(&bridge_memory_limit, &bridge_io_limit);
        h[0x1C] = (uint8_t)(bus1_io_start >> 8);
        h[0x1D] = (uint8_t)((bridge_io_limit - 1) >> 8);
        Put16(h, 0x20, (uint16_t)(bus1_memory_start >> 16));
        Put16(h, 0x22, (uint16_t)((bridge_memory_limit - 1) >> 16) & 0xFFF0);
        Put16(h, 0x24, (uint16_t)(bus1_memory_start >> 16));
        Put16(h, 0x26, (uint16_t)((bridge_memory_limit - 1) >> 16) & 0xFFF0);
        // Bridge control: forward the legacy VGA ranges when the primary
        // card sits behind the bridge.
        int primary = sim->config.primary_card;
        if (primary >= 0 && primary < sim->config.card_count && sim->config.cards[primary].bus == 1) h[0x3E] = 0x08;
    }
    return h[offset];
}

// The bits of a card's header that software may change.
uint32_t WritableMask(int card, int offset)
{
    const SimChip* chip = SimCardChip(card);
    if (offset == 0x04) return 0x000003FF;
    if (offset >= 0x10 && offset < 0x28) {
        const SimBar* bar = &chip->bars[(offset - 0x10) / 4];
        if (!bar->size) return 0;
        return ~(bar->size - 1) & ((bar->flags & SIM_BAR_IO) ? 0xFFFFFFFCu : 0xFFFFFFF0u);
    }
    if (offset == 0x30) return ~(uint32_t)(ROM_SIZE - 1) | 1;
    if (offset == 0x0C) return 0x0000FFFF;  // cache line size, latency timer
    if (offset == 0x3C) return 0x000000FF;  // interrupt line
    if (offset == AGP_CAPABILITY_OFFSET + 8 && sim->config.cards[card].bus == 1) return 0x00000303;
    return 0;
}

void CardConfigWrite(int card, int offset, uint8_t value)
{
    uint8_t* h = sim->cards[card].pci;
    int aligned = offset & ~3, shift = (offset & 3) * 8;
    uint32_t mask = WritableMask(card, aligned);
    if (aligned == 0x04 && (offset & 3) >= 2) {
        // Status bits 15..11 and 8 are cleared by writing 1.
        uint16_t status = Get16(h, 0x06);
        status &= (uint16_t)~((uint16_t)value << (shift - 16) & 0xF900);
        Put16(h, 0x06, status);
        return;
    }
    uint32_t old = Get32(h, aligned);
    uint32_t byte_mask = mask & (0xFFu << shift);
    Put32(h, aligned, (old & ~byte_mask) | (((uint32_t)value << shift) & byte_mask));
}

void BuildCardHeader(int card, uint32_t* memory_cursor, uint32_t* io_cursor)
{
    const SimCardConfig* c = &sim->config.cards[card];
    const SimChip* chip = SimCardChip(card);
    uint8_t* h = sim->cards[card].pci;
    memset(h, 0, 256);
    Put16(h, 0x00, c->vendor_id);
    Put16(h, 0x02, c->device_id);
    Put16(h, 0x04, COMMAND_IO | COMMAND_MEMORY);
    Put16(h, 0x06, STATUS_DEVSEL_MEDIUM);
    h[0x08] = chip->revision;
    h[0x0B] = 0x03;  // display controller, VGA compatible
    h[0x0D] = 0x20;
    for (int i = 0; i < 6; i++) {
        const SimBar* bar = &chip->bars[i];
        if (!bar->size) continue;
        uint32_t* cursor = (bar->flags & SIM_BAR_IO) ? io_cursor : memory_cursor;
        uint32_t base = (*cursor + bar->size - 1) & ~(bar->size - 1);
        *cursor = base + bar->size;
        Put32(h, 0x10 + 4 * i, base | (bar->flags & (SIM_BAR_IO | SIM_BAR_PREFETCH)));
    }
    h[0x3C] = 0x0B;
    h[0x3D] = 0x01;  // INTA#
    if (c->bus == 1) {
        Put16(h, 0x06, STATUS_DEVSEL_MEDIUM | STATUS_CAPABILITIES);
        h[0x34] = AGP_CAPABILITY_OFFSET;
        h[AGP_CAPABILITY_OFFSET] = 0x02;      // AGP capability
        h[AGP_CAPABILITY_OFFSET + 2] = 0x10;  // version 1.0
        // Status: 1x and 2x transfers, sideband addressing, 32 requests.
        Put32(h, AGP_CAPABILITY_OFFSET + 4, 0x1F000203);
    }
}

}  // namespace

void PciReset()
{
    sim->pci_address = 0;
    uint32_t memory0 = bus0_memory_start, memory1 = bus1_memory_start;
    uint32_t io0 = bus0_io_start, io1 = bus1_io_start;
    for (int card = 0; card < sim->config.card_count; card++) {
        bool behind_bridge = sim->config.cards[card].bus == 1;
        BuildCardHeader(card, behind_bridge ? &memory1 : &memory0, behind_bridge ? &io1 : &io0);
    }
}

int PciFindCard(int bus, int device)
{
    if (!sim) return -1;
    for (int card = 0; card < sim->config.card_count; card++) {
        const SimCardConfig* c = &sim->config.cards[card];
        if (c->vendor_id && c->bus == bus && c->device == device) return card;
    }
    return -1;
}

uint8_t PciConfigRead(int bus, int device, int function, int offset)
{
    int card = PciFindCard(bus, device);
    if (card >= 0) return function == 0 ? sim->cards[card].pci[offset] : 0xFF;
    const ChipsetFunction* f = bus == 0 ? FindChipset(device, function) : NULL;
    return f ? ChipsetRead(f, offset) : 0xFF;
}

void PciConfigWrite(int bus, int device, int function, int offset, uint8_t value)
{
    int card = PciFindCard(bus, device);
    if (card >= 0 && function == 0) CardConfigWrite(card, offset, value);
}

uint32_t PciBarBase(int card, int bar)
{
    const uint8_t* h = sim->cards[card].pci;
    const SimBar* b = &SimCardChip(card)->bars[bar];
    if (!b->size || (b->flags & SIM_BAR_IO) || !(Get16(h, 0x04) & COMMAND_MEMORY)) return 0;
    return Get32(h, 0x10 + 4 * bar) & 0xFFFFFFF0u;
}

uint32_t PciIoBarBase(int card, int bar)
{
    const uint8_t* h = sim->cards[card].pci;
    const SimBar* b = &SimCardChip(card)->bars[bar];
    if (!b->size || !(b->flags & SIM_BAR_IO) || !(Get16(h, 0x04) & COMMAND_IO)) return 0;
    return Get32(h, 0x10 + 4 * bar) & 0xFFFCu;
}

namespace {
uint8_t DataRead(int byte)
{
    uint32_t a = sim->pci_address;
    if (!(a & CONFIG_ENABLE)) return 0xFF;
    return PciConfigRead((a >> 16) & 0xFF, (a >> 11) & 0x1F, (a >> 8) & 7, (a & 0xFC) + byte);
}
void DataWrite(int byte, uint8_t value)
{
    uint32_t a = sim->pci_address;
    if (a & CONFIG_ENABLE) PciConfigWrite((a >> 16) & 0xFF, (a >> 11) & 0x1F, (a >> 8) & 7, (a & 0xFC) + byte, value);
}
}  // namespace

// Only a 32-bit access to 0xCF8 reaches the address register; byte accesses
// there belong to other devices of the chipset.
uint8_t PciPortRead(uint16_t port) { return port >= 0xCFC ? DataRead(port - 0xCFC) : 0xFF; }
void PciPortWrite(uint16_t port, uint8_t value)
{
    if (port >= 0xCFC) DataWrite(port - 0xCFC, value);
}

uint32_t PciPortReadDword(uint16_t port)
{
    if (port == 0xCF8) return sim->pci_address;
    uint32_t v = 0;
    for (int i = 3; i >= 0; i--) v = (v << 8) | PciPortRead((uint16_t)(port + i));
    return v;
}

void PciPortWriteDword(uint16_t port, uint32_t value)
{
    if (port == 0xCF8) {
        sim->pci_address = value & CONFIG_ADDRESS_MASK;
        return;
    }
    for (int i = 0; i < 4; i++) PciPortWrite((uint16_t)(port + i), (uint8_t)(value >> (8 * i)));
}
