// The VGA core every card carries: miscellaneous output, sequencer, CRT
// controller, graphics and attribute controllers, input status and the DAC,
// as IBM's VGA defines them. Families hook the sequencer and CRT controller
// data ports for their extended registers.
#include <string.h>

#include "fields.h"
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
    CR11_PROTECT = 0x80,          // write-protects CR00-CR07 (but CR07 bit 4)
    CR11_VINT_DISABLE = 0x20,
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
// A line is the horizontal total register plus 5 character clocks, a frame
// the vertical total register plus 2 lines.
int GenericHTotal(int card) { return SimFieldRead(Core(card)->cr, &sim_vga_crtc.htotal) + 5; }
int GenericVTotal(int card) { return SimFieldRead(Core(card)->cr, &sim_vga_crtc.vtotal) + 2; }
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
    uint8_t value;
    if (ops->read_port && ops->read_port(card, port, &value)) return value;
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
    if (ops->write_port && ops->write_port(card, port, value)) return;
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

void VgaWriteTiming(int card, const SimCrtcTiming* t, const SimCrtcFields* fields)
{
    uint8_t* cr = Core(card)->cr;
    SimFieldWrite(cr, &sim_cr11_protect, 0);
    // No horizontal retrace delay; vertical retrace interrupts off.
    cr[0x05] = 0;
    cr[0x11] = CR11_VINT_DISABLE;
    SimFieldWrite(cr, &fields->htotal, t->htotal);
    SimFieldWrite(cr, &fields->hdisplay_end, t->hdisplay_end);
    SimFieldWrite(cr, &fields->hblank_start, t->hblank_start);
    SimFieldWrite(cr, &fields->hblank_end, t->hblank_end);
    SimFieldWrite(cr, &fields->hsync_start, t->hsync_start);
    SimFieldWrite(cr, &fields->hsync_end, t->hsync_end);
    SimFieldWrite(cr, &fields->vtotal, t->vtotal);
    SimFieldWrite(cr, &fields->vdisplay_end, t->vdisplay_end);
    SimFieldWrite(cr, &fields->vblank_start, t->vblank_start);
    SimFieldWrite(cr, &fields->vblank_end, t->vblank_end);
    SimFieldWrite(cr, &fields->vsync_start, t->vsync_start);
    SimFieldWrite(cr, &fields->vsync_end, t->vsync_end);
    // The line compare at its maximum: no split screen.
    SimFieldWrite(cr, &fields->line_compare, (1 << SimFieldWidth(&fields->line_compare)) - 1);
    SimFieldWrite(cr, &sim_cr03_retrace_access, 1);
    SimFieldWrite(cr, &sim_cr11_protect, 1);
}

const SimFamilyOps sim_vga_ops = {
    .reset = VgaReset,
    .read_sr = GenericReadSr,
    .write_sr = GenericWriteSr,
    .read_cr = VgaGenericReadCr,
    .write_cr = VgaGenericWriteCr,
    .window_read = NoWindow,
    .window_write = NoWindowWrite,
    .pixel_clock_hz = UnknownClock,
    .memory_clock_hz = UnknownClock,
    .htotal = GenericHTotal,
    .vtotal = GenericVTotal,
    .refresh_hz = UnknownRefresh,
    .dpms = AlwaysOn,
    .program_mode = KeepRegisters,
    .read_port = NULL,
    .write_port = NULL,
    .print_raw = NULL,
    .read_internal32 = NULL,
    .write_internal32 = NULL,
};

SimCrtcTiming VgaCrtcValues(const SimTiming* t, int pixels)
{
    SimCrtcTiming c;
    c.htotal = ((t->htotal + 4) / 8 - 5 + pixels / 16) * 8 / pixels;
    c.hdisplay_end = t->width / pixels - 1;
    c.hblank_start = t->width / pixels;
    c.hblank_end = t->htotal / pixels - 1;
    c.hsync_start = t->hsync_start / pixels;
    c.hsync_end = t->hsync_end / pixels;
    c.vtotal = t->vtotal - 2;
    c.vdisplay_end = t->height - 1;
    c.vblank_start = t->height;
    c.vblank_end = t->vtotal - 1;
    c.vsync_start = t->vsync_start;
    c.vsync_end = t->vsync_end;
    return c;
}
