// The VGA core every card carries: miscellaneous output, sequencer, CRT
// controller, graphics and attribute controllers, input status and the DAC,
// as IBM's VGA defines them. Families hook the sequencer and CRT controller
// data ports for their extended registers.
#include <string.h>

#include "machine_state.h"
#include "modes.h"

namespace {

// Mode 12h (640x480, 16 colours, 25.175 MHz dot clock): what the BIOS
// leaves behind at power-on before a display driver takes over.
const uint8_t reset_sequencer[5] = {0x03, 0x01, 0x0F, 0x00, 0x06};
const uint8_t reset_crtc[25] = {0x5F, 0x4F, 0x50, 0x82, 0x54, 0x80, 0x0B, 0x3E, 0x00, 0x40, 0x00, 0x00, 0x00,
                                0x00, 0x00, 0x00, 0xEA, 0x8C, 0xDF, 0x28, 0x00, 0xE7, 0x04, 0xE3, 0xFF};
const uint8_t reset_graphics[9] = {0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x05, 0x0F, 0xFF};
const uint8_t reset_attribute[21] = {0x00, 0x01, 0x02, 0x03, 0x04, 0x05, 0x14, 0x07, 0x38, 0x39, 0x3A,
                                     0x3B, 0x3C, 0x3D, 0x3E, 0x3F, 0x01, 0x00, 0x0F, 0x00, 0x00};
const uint8_t reset_misc = 0xE3;

enum {
    MISC_COLOUR_PORTS = 0x01,     // CRT controller at 0x3D4, else 0x3B4
    MISC_CLOCK_SELECT = 0x0C,
    CR11_PROTECT = 0x80,          // write-protects CR00-CR07 (but CR07 bit 4)
    CR07_LINE_COMPARE_8 = 0x10,
    STATUS1_DISPLAY_DISABLED = 0x01,
    STATUS1_VERTICAL_RETRACE = 0x08,
};

SimVga* Core(int card) { return &sim->cards[card].vga; }

bool IsCrtcIndexPort(int card, uint16_t port)
{
    return port == ((Core(card)->misc & MISC_COLOUR_PORTS) ? 0x3D4 : 0x3B4);
}
bool IsStatusPort(int card, uint16_t port)
{
    return port == ((Core(card)->misc & MISC_COLOUR_PORTS) ? 0x3DA : 0x3BA);
}

uint8_t ReadStatus1(int card)
{
    SimVga* v = Core(card);
    // Reading input status 1 puts the attribute flip-flop back to "index".
    v->ar_expect_data = 0;
    v->status_reads++;
    return (v->status_reads & 1) ? STATUS1_VERTICAL_RETRACE | STATUS1_DISPLAY_DISABLED : 0;
}

uint8_t ReadDac(SimVga* v)
{
    uint8_t value = v->palette[(v->dac_read_index * 3 + v->dac_component) % 768];
    if (++v->dac_component == 3) {
        v->dac_component = 0;
        v->dac_read_index++;
    }
    return value;
}

void WriteDac(SimVga* v, uint8_t value)
{
    v->palette[(v->dac_write_index * 3 + v->dac_component) % 768] = value & 0x3F;
    if (++v->dac_component == 3) {
        v->dac_component = 0;
        v->dac_write_index++;
    }
}

void SetField(uint8_t* reg, uint8_t mask, int shift, int value)
{
    *reg = (uint8_t)((*reg & ~mask) | ((value << shift) & mask));
}

// Generic family: plain VGA without an extended model.
uint8_t GenericReadSr(int card, uint8_t index) { return Core(card)->sr[index]; }
void GenericWriteSr(int card, uint8_t index, uint8_t value) { Core(card)->sr[index] = value; }
int NoWindow(int, int, uint32_t, uint8_t*) { return 0; }
int NoWindowWrite(int, int, uint32_t, uint8_t) { return 0; }
double UnknownClock(int) { return 0; }
int GenericHTotal(int card) { return Core(card)->cr[0x00] + 5; }
int GenericVTotal(int card)
{
    const uint8_t* cr = Core(card)->cr;
    return cr[0x06] + ((cr[0x07] & 0x01) << 8) + ((cr[0x07] & 0x20) << 4) + 2;
}
double UnknownRefresh(int) { return 0; }
SimDpms AlwaysOn(int) { return SIM_DPMS_ON; }
void KeepRegisters(int card, const SimTiming*, int) {}

}  // namespace

void VgaReset(int card)
{
    SimVga* v = Core(card);
    memset(v, 0, sizeof *v);
    v->misc = reset_misc;
    v->subsystem_enable = 1;
    v->dac_mask = 0xFF;
    memcpy(v->sr, reset_sequencer, sizeof reset_sequencer);
    memcpy(v->cr, reset_crtc, sizeof reset_crtc);
    memcpy(v->gr, reset_graphics, sizeof reset_graphics);
    memcpy(v->ar, reset_attribute, sizeof reset_attribute);
    for (int i = 0; i < 768; i++) v->palette[i] = (uint8_t)((i / 3) & 0x3F);
}

uint8_t VgaGenericReadCr(int card, uint8_t index) { return Core(card)->cr[index]; }

void VgaGenericWriteCr(int card, uint8_t index, uint8_t value)
{
    SimVga* v = Core(card);
    if (index <= 0x07 && (v->cr[0x11] & CR11_PROTECT)) {
        // Only the line compare bit 8 in CR07 escapes the protection.
        if (index == 0x07) SetField(&v->cr[0x07], CR07_LINE_COMPARE_8, 0, value);
        return;
    }
    v->cr[index] = value;
}

uint8_t VgaRead(int card, uint16_t port)
{
    SimVga* v = Core(card);
    const SimFamilyOps* ops = SimCardOps(card);
    if (IsStatusPort(card, port)) return ReadStatus1(card);
    if (IsCrtcIndexPort(card, port)) return v->crtc_index;
    if (IsCrtcIndexPort(card, port - 1)) return ops->read_cr(card, v->crtc_index);
    switch (port) {
    case 0x3C0: return v->ar_index;
    case 0x3C1: return v->ar[v->ar_index & 0x1F];
    case 0x3C2: return 0x10;  // input status 0: the monitor sense line reads high
    case 0x3C3: return v->subsystem_enable;
    case 0x3C4: return v->seq_index;
    case 0x3C5: return ops->read_sr(card, v->seq_index);
    case 0x3C6: return v->dac_mask;
    case 0x3C7: return v->dac_reading ? 0x03 : 0x00;
    case 0x3C8: return v->dac_write_index;
    case 0x3C9: return ReadDac(v);
    case 0x3CA: return v->feature;
    case 0x3CC: return v->misc;
    case 0x3CE: return v->gr_index;
    case 0x3CF: return v->gr[v->gr_index];
    default: return 0xFF;
    }
}

void VgaWrite(int card, uint16_t port, uint8_t value)
{
    SimVga* v = Core(card);
    const SimFamilyOps* ops = SimCardOps(card);
    if (IsStatusPort(card, port)) {
        v->feature = value;
        return;
    }
    if (IsCrtcIndexPort(card, port)) {
        v->crtc_index = value;
        return;
    }
    if (IsCrtcIndexPort(card, port - 1)) {
        ops->write_cr(card, v->crtc_index, value);
        return;
    }
    switch (port) {
    case 0x3C0:
        if (!v->ar_expect_data) {
            v->ar_index = value & 0x3F;
        } else if ((v->ar_index & 0x1F) <= 0x14) {
            v->ar[v->ar_index & 0x1F] = value;
        }
        v->ar_expect_data ^= 1;
        break;
    case 0x3C2: v->misc = value; break;
    case 0x3C3: v->subsystem_enable = value & 1; break;
    case 0x3C4: v->seq_index = value; break;
    case 0x3C5: ops->write_sr(card, v->seq_index, value); break;
    case 0x3C6: v->dac_mask = value; break;
    case 0x3C7: v->dac_read_index = value; v->dac_component = 0; v->dac_reading = 1; break;
    case 0x3C8: v->dac_write_index = value; v->dac_component = 0; v->dac_reading = 0; break;
    case 0x3C9: WriteDac(v, value); break;
    case 0x3CE: v->gr_index = value; break;
    case 0x3CF: v->gr[v->gr_index] = value; break;
    default: break;
    }
}

void VgaWriteTiming(int card, const SimCrtcTiming* t)
{
    uint8_t* cr = Core(card)->cr;
    cr[0x11] &= ~CR11_PROTECT;
    cr[0x00] = (uint8_t)t->htotal;
    cr[0x01] = (uint8_t)t->hdisplay_end;
    cr[0x02] = (uint8_t)t->hblank_start;
    SetField(&cr[0x03], 0x1F, 0, t->hblank_end);
    cr[0x03] |= 0x80;
    cr[0x04] = (uint8_t)t->hsync_start;
    cr[0x05] = (uint8_t)((t->hsync_end & 0x1F) | ((t->hblank_end & 0x20) << 2));
    cr[0x06] = (uint8_t)t->vtotal;
    cr[0x07] = (uint8_t)(((t->vtotal >> 8) & 1) | (((t->vdisplay_end >> 8) & 1) << 1) |
                         (((t->vsync_start >> 8) & 1) << 2) | (((t->vblank_start >> 8) & 1) << 3) |
                         CR07_LINE_COMPARE_8 | (((t->vtotal >> 9) & 1) << 5) |
                         (((t->vdisplay_end >> 9) & 1) << 6) | (((t->vsync_start >> 9) & 1) << 7));
    cr[0x09] = (uint8_t)((cr[0x09] & 0x9F) | 0x40 | (((t->vblank_start >> 9) & 1) << 5));
    cr[0x10] = (uint8_t)t->vsync_start;
    cr[0x12] = (uint8_t)t->vdisplay_end;
    cr[0x15] = (uint8_t)t->vblank_start;
    cr[0x16] = (uint8_t)t->vblank_end;
    cr[0x18] = 0xFF;
    cr[0x11] = (uint8_t)(CR11_PROTECT | 0x20 | (t->vsync_end & 0x0F));
}

const SimFamilyOps sim_vga_ops = {
    VgaReset, GenericReadSr, GenericWriteSr, VgaGenericReadCr, VgaGenericWriteCr, NoWindow, NoWindowWrite,
    UnknownClock, UnknownClock, GenericHTotal, GenericVTotal, UnknownRefresh, AlwaysOn, KeepRegisters,
};
