// Register fields of the VGA and the S3 chips as data: a value split over
// several registers is a list of pieces, low bits first, each a bit range of
// one register of a file (the form Linux's svgalib register sets use). The
// tables are written from the IBM VGA register description and the public
// S3 documents; sim/README.md lists where the program's own description of a
// register differs and which of the two the model follows.
#ifndef VISTREL_SIM_FIELDS_H
#define VISTREL_SIM_FIELDS_H

#include <stdint.h>

enum { SIM_FIELD_MAX_PIECES = 4 };

struct SimFieldPiece {
    uint8_t reg;       // index in the register file
    uint8_t low_bit;   // lowest bit of the register that the piece occupies
    uint8_t high_bit;  // highest bit
};

struct SimField {
    uint8_t piece_count;
    SimFieldPiece pieces[SIM_FIELD_MAX_PIECES];
};

// The value of a field assembled from a register file.
int SimFieldRead(const uint8_t* regs, const SimField* field);
// Writes the value's bits into the pieces, the registers' other bits kept;
// bits beyond the field's width are dropped.
void SimFieldWrite(uint8_t* regs, const SimField* field, int value);
// Width of a field in bits.
int SimFieldWidth(const SimField* field);
// A field with one more bit above its others: a family's overflow bit.
constexpr SimField SimFieldWithBit(const SimField& field, uint8_t reg, uint8_t bit)
{
    SimField f = field;
    f.pieces[f.piece_count++] = {.reg = reg, .low_bit = bit, .high_bit = bit};
    return f;
}

// The CRT controller's timing fields as the IBM VGA has them (8 horizontal
// bits, 10 vertical, the overflow bits in CR07 and CR09).
struct SimCrtcFields {
    SimField htotal, hdisplay_end, hblank_start, hblank_end, hsync_start, hsync_end;
    SimField vtotal, vdisplay_end, vblank_start, vblank_end, vsync_start, vsync_end;
    SimField line_compare;
};
extern const SimCrtcFields sim_vga_crtc;
// The same with the S3 extension bits (CR5D, CR5E).
extern const SimCrtcFields sim_s3_crtc;
// The Savage3D's: the horizontal total two bits wider in CR5F.
extern const SimCrtcFields sim_savage_crtc;

// Single-register fields of the VGA.
extern const SimField sim_misc_clock_select;  // MISC 3..2: 25.175 MHz, 28.322 MHz, external
extern const SimField sim_misc_hsync_negative, sim_misc_vsync_negative;
extern const SimField sim_sr01_eight_dots;    // SR01 0: character clocks of 8 dots, else 9
extern const SimField sim_sr01_screen_off;    // SR01 5
extern const SimField sim_cr03_retrace_access;  // CR03 7: vertical retrace registers readable (set in every mode)
extern const SimField sim_cr11_protect;       // CR11 7: CR00-CR07 write protected

// S3 extended registers.
struct SimS3Fields {
    SimField unlock_key;               // SR08 3..0; 6 opens SR09 and above
    SimField dpms_hsync_off, dpms_vsync_off;  // SR0D 5..4, 7..6
    SimField mclk_n, mclk_r, mclk_m;   // SR10 4..0, SR10 6..5, SR11 6..0
    SimField dclk_n, dclk_m;           // SR12 4..0, SR13 6..0
    SimField dclk_r2, dclk_r3;         // SR12 6..5 (Trio32/64, ViRGE), SR12 7..5 (the others)
    SimField savage_dclk_n, savage_dclk_r, savage_dclk_m;  // with SR29 bits 4, 2 and 3
    SimField pixel_doubling;           // SR18 7
    SimField memory_straps;            // CR36 7..5
    SimField agp_card;                 // CR37 6 (Savage3D)
    SimField interlaced;               // CR42 5
    SimField horizontal_double;        // CR43 7
    SimField offset;                   // CR13 7..0, CR51 5..4: bytes per line / 8
    SimField color_mode;               // CR67 7..4
};
extern const SimS3Fields sim_s3;

// The NVIDIA Riva 128 and TNT (X.org nv and Linux rivafb register use,
// envytools' register database). The CRT controller: bit 8 of the
// horizontal values in CR2D, bit 10 of the vertical ones in CR25.
extern const SimCrtcFields sim_nv_crtc;
struct SimNvFields {
    // On the four bytes of a 32-bit internal register, low byte first.
    SimField pll_m, pll_n, pll_p;      // NV_PRAMDAC_*_COEFF 7..0, 15..8, 18..16
    SimField crystal_14318;            // NV_PEXTDEV_BOOT_0 6: 14.31818 MHz, else 13.5 MHz
    SimField ram_amount;               // NV_PFB_BOOT_0 1..0
    // CRT controller registers.
    SimField hsync_off, vsync_off;     // CR1A 6, 7
    SimField rma_phase;                // CR38 2..0: 1 signature, 3 address, 5 data
    SimField pixel_format;             // CR28 1..0: 0 VGA, 1 8 bits, 2 15/16 bits, 3 32 bits
    SimField offset;                   // CR13 7..0, CR19 7..5: bytes per line / 8
};
extern const SimNvFields sim_nv;

#endif
