// The machine state as INI text, the way simstate.exe prints it
// (sim/README.md describes the keys).
#include "machine_state.h"

namespace {

const char* const dpms_names[] = {"On", "Standby", "Suspend", "Off"};
const char* WindowsName(int windows)
{
    return windows == SIM_WINDOWS_95 ? "95" : windows == SIM_WINDOWS_NT4 ? "NT4" : "98";
}

void PrintFile(FILE* out, const char* prefix, const uint8_t* regs, int count)
{
    for (int i = 0; i < count; i++) fprintf(out, "%s%02X=%02X\n", prefix, i, regs[i]);
}

void PrintCard(FILE* out, int card)
{
    const SimCardConfig* c = &sim->config.cards[card];
    const SimCardState* s = &sim->cards[card];
    const SimChip* chip = SimCardChip(card);
    fprintf(out, "[Card%d]\n", card);
    fprintf(out, "Id=%04x:%04x\n", c->vendor_id, c->device_id);
    fprintf(out, "Chip=%s\n", chip->name);
    fprintf(out, "Bus=%u\nDevice=%u\nMemoryMB=%u\n", c->bus, c->device, c->memory_mb);
    fprintf(out, "Primary=%d\n", card == sim->config.primary_card ? 1 : 0);
    fprintf(out, "Width=%u\nHeight=%u\nBits=%u\nDriverRefresh=%u\nInterlaced=%u\n", s->mode.width, s->mode.height,
            s->mode.bits, s->mode.refresh, s->mode.interlaced);
    fprintf(out, "DPMS=%s\n", dpms_names[SimDpmsState(card)]);
    fprintf(out, "PixelClockHz=%.0f\n", SimPixelClockHz(card));
    fprintf(out, "MemoryClockHz=%.0f\n", SimMemoryClockHz(card));
    fprintf(out, "HTotal=%d\nVTotal=%d\n", SimHTotal(card), SimVTotal(card));
    fprintf(out, "RefreshHz=%.3f\n", SimRefreshHz(card));
    fprintf(out, "MISC=%02X\n", s->vga.misc);
    PrintFile(out, "SR", s->vga.sr, 256);
    PrintFile(out, "CR", s->vga.cr, 256);
    PrintFile(out, "GR", s->vga.gr, 9);
    PrintFile(out, "AR", s->vga.ar, 21);
    PrintFile(out, "PCI", s->pci, 0x50);
    const SimFamilyOps* ops = SimCardOps(card);
    if (ops->print_raw) ops->print_raw(out, card);
}

}  // namespace

void SimPrintState(FILE* out)
{
    if (!sim) return;
    fprintf(out, "[Machine]\n");
    fprintf(out, "Windows=%s\n", WindowsName(sim->config.windows));
    fprintf(out, "Cards=%d\n", sim->config.card_count);
    fprintf(out, "PrimaryCard=%d\n", sim->config.primary_card);
    fprintf(out, "BootCount=%u\n", sim->boot_count);
    fprintf(out, "PciAddress=%08X\n", sim->pci_address);
    for (int card = 0; card < sim->config.card_count; card++) PrintCard(out, card);
}
