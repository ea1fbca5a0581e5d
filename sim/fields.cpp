// Register field tables and the one reader and writer of split values.
// Sources: the IBM VGA register description (CR00-CR18, SR01, MISC), for
// the S3 bits Linux s3fb.c and savagefb, the X.org s3virge and savage
// drivers and the 86Box S3 model; for the NVIDIA bits the X.org nv driver,
// Linux rivafb (riva_hw.c) and envytools.
#include "fields.h"

int SimFieldWidth(const SimField* field)
{
    int width = 0;
    for (int i = 0; i < field->piece_count; i++) width += field->pieces[i].high_bit - field->pieces[i].low_bit + 1;
    return width;
}

int SimFieldRead(const uint8_t* regs, const SimField* field)
{
    int value = 0, shift = 0;
    for (int i = 0; i < field->piece_count; i++) {
        const SimFieldPiece* p = &field->pieces[i];
        int bits = p->high_bit - p->low_bit + 1;
        value |= ((regs[p->reg] >> p->low_bit) & ((1 << bits) - 1)) << shift;
        shift += bits;
    }
    return value;
}

void SimFieldWrite(uint8_t* regs, const SimField* field, int value)
{
    for (int i = 0; i < field->piece_count; i++) {
        const SimFieldPiece* p = &field->pieces[i];
        int bits = p->high_bit - p->low_bit + 1;
        uint8_t mask = (uint8_t)(((1 << bits) - 1) << p->low_bit);
        regs[p->reg] = (uint8_t)((regs[p->reg] & ~mask) | ((value << p->low_bit) & mask));
        value >>= bits;
    }
}

// IBM VGA: horizontal values are 8 bits but the blanking end (6: CR03 4..0
// and CR05 7) and the retrace end (5); vertical values have bit 8 and 9 in
// the overflow register CR07 (blanking start bit 9 and line compare bit 9 in
// CR09), the blanking end has 8 bits and the retrace end 4.
constexpr SimCrtcFields sim_vga_crtc = {
    .htotal = {.piece_count = 1, .pieces = {{.reg = 0x00, .low_bit = 0, .high_bit = 7}}},
    .hdisplay_end = {.piece_count = 1, .pieces = {{.reg = 0x01, .low_bit = 0, .high_bit = 7}}},
    .hblank_start = {.piece_count = 1, .pieces = {{.reg = 0x02, .low_bit = 0, .high_bit = 7}}},
    .hblank_end = {.piece_count = 2,
                   .pieces = {{.reg = 0x03, .low_bit = 0, .high_bit = 4}, {.reg = 0x05, .low_bit = 7, .high_bit = 7}}},
    .hsync_start = {.piece_count = 1, .pieces = {{.reg = 0x04, .low_bit = 0, .high_bit = 7}}},
    .hsync_end = {.piece_count = 1, .pieces = {{.reg = 0x05, .low_bit = 0, .high_bit = 4}}},
    .vtotal = {.piece_count = 3,
               .pieces = {{.reg = 0x06, .low_bit = 0, .high_bit = 7},
                          {.reg = 0x07, .low_bit = 0, .high_bit = 0},
                          {.reg = 0x07, .low_bit = 5, .high_bit = 5}}},
    .vdisplay_end = {.piece_count = 3,
                     .pieces = {{.reg = 0x12, .low_bit = 0, .high_bit = 7},
                                {.reg = 0x07, .low_bit = 1, .high_bit = 1},
                                {.reg = 0x07, .low_bit = 6, .high_bit = 6}}},
    .vblank_start = {.piece_count = 3,
                     .pieces = {{.reg = 0x15, .low_bit = 0, .high_bit = 7},
                                {.reg = 0x07, .low_bit = 3, .high_bit = 3},
                                {.reg = 0x09, .low_bit = 5, .high_bit = 5}}},
    .vblank_end = {.piece_count = 1, .pieces = {{.reg = 0x16, .low_bit = 0, .high_bit = 7}}},
    .vsync_start = {.piece_count = 3,
                    .pieces = {{.reg = 0x10, .low_bit = 0, .high_bit = 7},
                               {.reg = 0x07, .low_bit = 2, .high_bit = 2},
                               {.reg = 0x07, .low_bit = 7, .high_bit = 7}}},
    .vsync_end = {.piece_count = 1, .pieces = {{.reg = 0x11, .low_bit = 0, .high_bit = 3}}},
    .line_compare = {.piece_count = 3,
                     .pieces = {{.reg = 0x18, .low_bit = 0, .high_bit = 7},
                                {.reg = 0x07, .low_bit = 4, .high_bit = 4},
                                {.reg = 0x09, .low_bit = 6, .high_bit = 6}}},
};

// S3: bit 8 of the horizontal total, display end, blanking start and
// retrace start in CR5D bits 0, 1, 2 and 4; bit 10 of the vertical total,
// display end, blanking start, retrace start and line compare in CR5E bits
// 0, 1, 2, 4 and 6.
constexpr SimCrtcFields sim_s3_crtc = {
    .htotal = {.piece_count = 2,
               .pieces = {{.reg = 0x00, .low_bit = 0, .high_bit = 7}, {.reg = 0x5D, .low_bit = 0, .high_bit = 0}}},
    .hdisplay_end = {.piece_count = 2,
                     .pieces = {{.reg = 0x01, .low_bit = 0, .high_bit = 7},
                                {.reg = 0x5D, .low_bit = 1, .high_bit = 1}}},
    .hblank_start = {.piece_count = 2,
                     .pieces = {{.reg = 0x02, .low_bit = 0, .high_bit = 7},
                                {.reg = 0x5D, .low_bit = 2, .high_bit = 2}}},
    .hblank_end = sim_vga_crtc.hblank_end,
    .hsync_start = {.piece_count = 2,
                    .pieces = {{.reg = 0x04, .low_bit = 0, .high_bit = 7}, {.reg = 0x5D, .low_bit = 4, .high_bit = 4}}},
    .hsync_end = sim_vga_crtc.hsync_end,
    .vtotal = {.piece_count = 4,
               .pieces = {{.reg = 0x06, .low_bit = 0, .high_bit = 7},
                          {.reg = 0x07, .low_bit = 0, .high_bit = 0},
                          {.reg = 0x07, .low_bit = 5, .high_bit = 5},
                          {.reg = 0x5E, .low_bit = 0, .high_bit = 0}}},
    .vdisplay_end = {.piece_count = 4,
                     .pieces = {{.reg = 0x12, .low_bit = 0, .high_bit = 7},
                                {.reg = 0x07, .low_bit = 1, .high_bit = 1},
                                {.reg = 0x07, .low_bit = 6, .high_bit = 6},
                                {.reg = 0x5E, .low_bit = 1, .high_bit = 1}}},
    .vblank_start = {.piece_count = 4,
                     .pieces = {{.reg = 0x15, .low_bit = 0, .high_bit = 7},
                                {.reg = 0x07, .low_bit = 3, .high_bit = 3},
                                {.reg = 0x09, .low_bit = 5, .high_bit = 5},
                                {.reg = 0x5E, .low_bit = 2, .high_bit = 2}}},
    .vblank_end = sim_vga_crtc.vblank_end,
    .vsync_start = {.piece_count = 4,
                    .pieces = {{.reg = 0x10, .low_bit = 0, .high_bit = 7},
                               {.reg = 0x07, .low_bit = 2, .high_bit = 2},
                               {.reg = 0x07, .low_bit = 7, .high_bit = 7},
                               {.reg = 0x5E, .low_bit = 4, .high_bit = 4}}},
    .vsync_end = sim_vga_crtc.vsync_end,
    .line_compare = {.piece_count = 4,
                     .pieces = {{.reg = 0x18, .low_bit = 0, .high_bit = 7},
                                {.reg = 0x07, .low_bit = 4, .high_bit = 4},
                                {.reg = 0x09, .low_bit = 6, .high_bit = 6},
                                {.reg = 0x5E, .low_bit = 6, .high_bit = 6}}},
};

// The Savage3D's horizontal total has bits 10..9 in CR5F 1..0 (the
// program's register table; the public Savage drivers write bit 8 in CR5D
// only).
constexpr SimCrtcFields SavageCrtc()
{
    SimCrtcFields f = sim_s3_crtc;
    f.htotal = {.piece_count = 3,
                .pieces = {{.reg = 0x00, .low_bit = 0, .high_bit = 7},
                           {.reg = 0x5D, .low_bit = 0, .high_bit = 0},
                           {.reg = 0x5F, .low_bit = 0, .high_bit = 1}}};
    return f;
}
const SimCrtcFields sim_savage_crtc = SavageCrtc();

const SimField sim_misc_clock_select = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 2, .high_bit = 3}}};
const SimField sim_misc_hsync_negative = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 6, .high_bit = 6}}};
const SimField sim_misc_vsync_negative = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 7, .high_bit = 7}}};
const SimField sim_sr01_eight_dots = {.piece_count = 1, .pieces = {{.reg = 0x01, .low_bit = 0, .high_bit = 0}}};
const SimField sim_sr01_screen_off = {.piece_count = 1, .pieces = {{.reg = 0x01, .low_bit = 5, .high_bit = 5}}};
const SimField sim_cr03_retrace_access = {.piece_count = 1, .pieces = {{.reg = 0x03, .low_bit = 7, .high_bit = 7}}};
const SimField sim_cr11_protect = {.piece_count = 1, .pieces = {{.reg = 0x11, .low_bit = 7, .high_bit = 7}}};

const SimS3Fields sim_s3 = {
    .unlock_key = {.piece_count = 1, .pieces = {{.reg = 0x08, .low_bit = 0, .high_bit = 3}}},
    .dpms_hsync_off = {.piece_count = 1, .pieces = {{.reg = 0x0D, .low_bit = 4, .high_bit = 5}}},
    .dpms_vsync_off = {.piece_count = 1, .pieces = {{.reg = 0x0D, .low_bit = 6, .high_bit = 7}}},
    .mclk_n = {.piece_count = 1, .pieces = {{.reg = 0x10, .low_bit = 0, .high_bit = 4}}},
    .mclk_r = {.piece_count = 1, .pieces = {{.reg = 0x10, .low_bit = 5, .high_bit = 6}}},
    .mclk_m = {.piece_count = 1, .pieces = {{.reg = 0x11, .low_bit = 0, .high_bit = 6}}},
    .dclk_n = {.piece_count = 1, .pieces = {{.reg = 0x12, .low_bit = 0, .high_bit = 4}}},
    .dclk_m = {.piece_count = 1, .pieces = {{.reg = 0x13, .low_bit = 0, .high_bit = 6}}},
    .dclk_r2 = {.piece_count = 1, .pieces = {{.reg = 0x12, .low_bit = 5, .high_bit = 6}}},
    .dclk_r3 = {.piece_count = 1, .pieces = {{.reg = 0x12, .low_bit = 5, .high_bit = 7}}},
    .savage_dclk_n = {.piece_count = 2,
                      .pieces = {{.reg = 0x12, .low_bit = 0, .high_bit = 5},
                                 {.reg = 0x29, .low_bit = 4, .high_bit = 4}}},
    .savage_dclk_r = {.piece_count = 2,
                      .pieces = {{.reg = 0x12, .low_bit = 6, .high_bit = 7},
                                 {.reg = 0x29, .low_bit = 2, .high_bit = 2}}},
    .savage_dclk_m = {.piece_count = 2,
                      .pieces = {{.reg = 0x13, .low_bit = 0, .high_bit = 7},
                                 {.reg = 0x29, .low_bit = 3, .high_bit = 3}}},
    .pixel_doubling = {.piece_count = 1, .pieces = {{.reg = 0x18, .low_bit = 7, .high_bit = 7}}},
    .memory_straps = {.piece_count = 1, .pieces = {{.reg = 0x36, .low_bit = 5, .high_bit = 7}}},
    .agp_card = {.piece_count = 1, .pieces = {{.reg = 0x37, .low_bit = 6, .high_bit = 6}}},
    .interlaced = {.piece_count = 1, .pieces = {{.reg = 0x42, .low_bit = 5, .high_bit = 5}}},
    .horizontal_double = {.piece_count = 1, .pieces = {{.reg = 0x43, .low_bit = 7, .high_bit = 7}}},
    .offset = {.piece_count = 2,
               .pieces = {{.reg = 0x13, .low_bit = 0, .high_bit = 7}, {.reg = 0x51, .low_bit = 4, .high_bit = 5}}},
    .color_mode = {.piece_count = 1, .pieces = {{.reg = 0x67, .low_bit = 4, .high_bit = 7}}},
};

// NVIDIA: CR25 carries bit 10 of the vertical total, display end, retrace
// start and blanking start (bits 0..3) and bit 6 of the horizontal blanking
// end (bit 4); CR2D bit 8 of the horizontal total, display end, blanking
// start and retrace start (bits 0..3).
constexpr SimCrtcFields sim_nv_crtc = {
    .htotal = {.piece_count = 2,
               .pieces = {{.reg = 0x00, .low_bit = 0, .high_bit = 7}, {.reg = 0x2D, .low_bit = 0, .high_bit = 0}}},
    .hdisplay_end = {.piece_count = 2,
                     .pieces = {{.reg = 0x01, .low_bit = 0, .high_bit = 7},
                                {.reg = 0x2D, .low_bit = 1, .high_bit = 1}}},
    .hblank_start = {.piece_count = 2,
                     .pieces = {{.reg = 0x02, .low_bit = 0, .high_bit = 7},
                                {.reg = 0x2D, .low_bit = 2, .high_bit = 2}}},
    .hblank_end = {.piece_count = 3,
                   .pieces = {{.reg = 0x03, .low_bit = 0, .high_bit = 4},
                              {.reg = 0x05, .low_bit = 7, .high_bit = 7},
                              {.reg = 0x25, .low_bit = 4, .high_bit = 4}}},
    .hsync_start = {.piece_count = 2,
                    .pieces = {{.reg = 0x04, .low_bit = 0, .high_bit = 7}, {.reg = 0x2D, .low_bit = 3, .high_bit = 3}}},
    .hsync_end = sim_vga_crtc.hsync_end,
    .vtotal = {.piece_count = 4,
               .pieces = {{.reg = 0x06, .low_bit = 0, .high_bit = 7},
                          {.reg = 0x07, .low_bit = 0, .high_bit = 0},
                          {.reg = 0x07, .low_bit = 5, .high_bit = 5},
                          {.reg = 0x25, .low_bit = 0, .high_bit = 0}}},
    .vdisplay_end = {.piece_count = 4,
                     .pieces = {{.reg = 0x12, .low_bit = 0, .high_bit = 7},
                                {.reg = 0x07, .low_bit = 1, .high_bit = 1},
                                {.reg = 0x07, .low_bit = 6, .high_bit = 6},
                                {.reg = 0x25, .low_bit = 1, .high_bit = 1}}},
    .vblank_start = {.piece_count = 4,
                     .pieces = {{.reg = 0x15, .low_bit = 0, .high_bit = 7},
                                {.reg = 0x07, .low_bit = 3, .high_bit = 3},
                                {.reg = 0x09, .low_bit = 5, .high_bit = 5},
                                {.reg = 0x25, .low_bit = 3, .high_bit = 3}}},
    .vblank_end = sim_vga_crtc.vblank_end,
    .vsync_start = {.piece_count = 4,
                    .pieces = {{.reg = 0x10, .low_bit = 0, .high_bit = 7},
                               {.reg = 0x07, .low_bit = 2, .high_bit = 2},
                               {.reg = 0x07, .low_bit = 7, .high_bit = 7},
                               {.reg = 0x25, .low_bit = 2, .high_bit = 2}}},
    .vsync_end = sim_vga_crtc.vsync_end,
    .line_compare = sim_vga_crtc.line_compare,
};

const SimNvFields sim_nv = {
    .pll_m = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 0, .high_bit = 7}}},
    .pll_n = {.piece_count = 1, .pieces = {{.reg = 1, .low_bit = 0, .high_bit = 7}}},
    .pll_p = {.piece_count = 1, .pieces = {{.reg = 2, .low_bit = 0, .high_bit = 2}}},
    .crystal_14318 = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 6, .high_bit = 6}}},
    .ram_amount = {.piece_count = 1, .pieces = {{.reg = 0, .low_bit = 0, .high_bit = 1}}},
    .hsync_off = {.piece_count = 1, .pieces = {{.reg = 0x1A, .low_bit = 6, .high_bit = 6}}},
    .vsync_off = {.piece_count = 1, .pieces = {{.reg = 0x1A, .low_bit = 7, .high_bit = 7}}},
    .rma_phase = {.piece_count = 1, .pieces = {{.reg = 0x38, .low_bit = 0, .high_bit = 2}}},
    .pixel_format = {.piece_count = 1, .pieces = {{.reg = 0x28, .low_bit = 0, .high_bit = 1}}},
    .offset = {.piece_count = 2,
               .pieces = {{.reg = 0x13, .low_bit = 0, .high_bit = 7}, {.reg = 0x19, .low_bit = 5, .high_bit = 7}}},
};
