// What each chip the program supports looks like on the PCI bus and to its
// display driver. Address ranges follow the chips' base address registers;
// the pixel-rate limits are those of the RAMDACs the boards carried.
#include "machine_state.h"

namespace {

const uint32_t MB = 1u << 20, KB = 1u << 10;
const uint32_t MHz = 1000000;

// The S3 synthesizer limits are the program's per-chip table, which the
// model follows (sim/README.md lists where public documents differ).
const SimS3Chip s3_savage3d = {S3_DCLK_SAVAGE, S3_MEM_SAVAGE, 220e6, 550e6, 511, 1, 127, 4, 0xE1, false};
const SimS3Chip s3_virge_vx = {S3_DCLK_R3, S3_MEM_VIRGE_VX, 220e6, 440e6, 127, 0, 31, 4, 0xE1, false};
const SimS3Chip s3_trio64v2 = {S3_DCLK_R3, S3_MEM_TRIO, 140e6, 340e6, 127, 1, 31, 4, 0xE1, true};
const SimS3Chip s3_virge_gx2 = {S3_DCLK_R3, S3_MEM_TRIO, 140e6, 340e6, 127, 1, 31, 4, 0xE1, false};
const SimS3Chip s3_trio3d_2x = {S3_DCLK_R3, S3_MEM_TRIO, 135e6, 270e6, 127, 1, 31, 3, 0xE1, false};
const SimS3Chip s3_trio64 = {S3_DCLK_R2, S3_MEM_TRIO, 135e6, 270e6, 127, 1, 31, 3, 0xE1, true};

#define S3_BARS(size) {{size, SIM_BAR_MEMORY}, {0, 0}, {0, 0}, {0, 0}, {0, 0}, {0, 0}}
#define S3_WINDOW 0, 0x01008000u

const SimChip chips[] = {
    {0x12d2, 0x0018, "NVIDIA/SGS-Thomson Riva 128", SIM_FAMILY_NVIDIA, 0x10,
     {{16 * MB, SIM_BAR_MEMORY}, {16 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH}}, -1, 0,
     {206 * MHz, 206 * MHz, 140 * MHz}, true, "NVIDIA RIVA 128", "rvdisp.drv", "rvmini", NULL},
    {0x12d2, 0x0019, "NVIDIA/SGS-Thomson Riva 128ZX", SIM_FAMILY_NVIDIA, 0x10,
     {{16 * MB, SIM_BAR_MEMORY}, {16 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH}}, -1, 0,
     {250 * MHz, 250 * MHz, 170 * MHz}, true, "NVIDIA RIVA 128ZX", "rvdisp.drv", "rvmini", NULL},
    {0x10de, 0x0020, "NVIDIA Riva TNT", SIM_FAMILY_NVIDIA, 0x04,
     {{16 * MB, SIM_BAR_MEMORY}, {32 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH}}, -1, 0,
     {250 * MHz, 250 * MHz, 200 * MHz}, true, "NVIDIA RIVA TNT", "rvdisp.drv", "rvmini", NULL},
    {0x8086, 0x7800, "Intel i740", SIM_FAMILY_I740, 0x21,
     {{64 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH}, {512 * KB, SIM_BAR_MEMORY}}, 1, 0,
     {203 * MHz, 203 * MHz, 135 * MHz}, true, "Intel740 Graphics Accelerator", "i7disp.drv", "i7mini", NULL},
    {0x121a, 0x0003, "3dfx Voodoo Banshee", SIM_FAMILY_BANSHEE, 0x03,
     {{32 * MB, SIM_BAR_MEMORY}, {32 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH}, {256, SIM_BAR_IO}}, -1, 0,
     {250 * MHz, 250 * MHz, 170 * MHz}, false, "3Dfx Voodoo Banshee", "bsdisp.drv", "bsmini", NULL},
    {0x1023, 0x939a, "Trident (device 939a)", SIM_FAMILY_TRIDENT, 0x02,
     {{4 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH}, {1 * MB, SIM_BAR_MEMORY}}, 1, 0,
     {170 * MHz, 135 * MHz, 80 * MHz}, true, "Trident 3DImage 9750 PCI", "trdisp.drv", "trmini", NULL},
    {0x5333, 0x8a13, "S3 Trio3D/2X", SIM_FAMILY_S3, 0x02, S3_BARS(64 * MB), S3_WINDOW,
     {230 * MHz, 135 * MHz, 110 * MHz}, true, "S3 Trio3D/2X", "s3vdisp.drv", "s3vmini", &s3_trio3d_2x},
    {0x5333, 0x8a20, "S3 Savage3D", SIM_FAMILY_S3, 0x01, S3_BARS(128 * MB), S3_WINDOW,
     {250 * MHz, 230 * MHz, 165 * MHz}, true, "S3 Savage3D", "s3vdisp.drv", "s3vmini", &s3_savage3d},
    {0x5333, 0x8a21, "S3 Savage3D/MV", SIM_FAMILY_S3, 0x01, S3_BARS(128 * MB), S3_WINDOW,
     {250 * MHz, 230 * MHz, 165 * MHz}, true, "S3 Savage3D/MV", "s3vdisp.drv", "s3vmini", &s3_savage3d},
    {0x5333, 0x8904, "S3 Trio3D", SIM_FAMILY_S3, 0x01, S3_BARS(64 * MB), S3_WINDOW,
     {135 * MHz, 135 * MHz, 80 * MHz}, true, "S3 Trio3D", "s3vdisp.drv", "s3vmini", &s3_trio64v2},
    {0x5333, 0x5631, "S3 ViRGE", SIM_FAMILY_S3, 0x06, S3_BARS(64 * MB), S3_WINDOW,
     {135 * MHz, 80 * MHz, 50 * MHz}, true, "S3 ViRGE PCI", "s3vdisp.drv", "s3vmini", &s3_trio64},
    {0x5333, 0x883d, "S3 ViRGE/VX", SIM_FAMILY_S3, 0x01, S3_BARS(64 * MB), S3_WINDOW,
     {220 * MHz, 135 * MHz, 80 * MHz}, true, "S3 ViRGE/VX PCI", "s3vdisp.drv", "s3vmini", &s3_virge_vx},
    {0x5333, 0x8a01, "S3 ViRGE/DX or GX", SIM_FAMILY_S3, 0x01, S3_BARS(64 * MB), S3_WINDOW,
     {170 * MHz, 135 * MHz, 80 * MHz}, true, "S3 ViRGE/DX/GX PCI", "s3vdisp.drv", "s3vmini", &s3_trio64v2},
    {0x5333, 0x8a10, "S3 ViRGE/GX2", SIM_FAMILY_S3, 0x01, S3_BARS(64 * MB), S3_WINDOW,
     {170 * MHz, 135 * MHz, 80 * MHz}, true, "S3 ViRGE/GX2", "s3vdisp.drv", "s3vmini", &s3_virge_gx2},
    {0x5333, 0x8811, "S3 Trio32/Trio64 family", SIM_FAMILY_S3, 0x54, S3_BARS(64 * MB), S3_WINDOW,
     {135 * MHz, 80 * MHz, 50 * MHz}, true, "S3 Trio64 PCI", "s3vdisp.drv", "s3vmini", &s3_trio64},
    {0x5333, 0x8901, "S3 Trio64V2", SIM_FAMILY_S3, 0x16, S3_BARS(64 * MB), S3_WINDOW,
     {135 * MHz, 80 * MHz, 95 * MHz}, true, "S3 Trio64V2/DX PCI", "s3vdisp.drv", "s3vmini", &s3_trio64v2},
    {0x104c, 0x3d07, "Texas Instruments Permedia 2", SIM_FAMILY_PERMEDIA, 0x01,
     {{128 * KB, SIM_BAR_MEMORY}, {8 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH},
      {8 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH}}, -1, 0,
     {230 * MHz, 230 * MHz, 150 * MHz}, false, "TI Permedia 2", "p2disp.drv", "p2mini", NULL},
    {0x3d3d, 0x0007, "3Dlabs Permedia 2", SIM_FAMILY_PERMEDIA, 0x01,
     {{128 * KB, SIM_BAR_MEMORY}, {8 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH},
      {8 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH}}, -1, 0,
     {230 * MHz, 230 * MHz, 150 * MHz}, false, "3Dlabs Permedia 2", "p2disp.drv", "p2mini", NULL},
    {0x3d3d, 0x0009, "3Dlabs Permedia 2v", SIM_FAMILY_PERMEDIA, 0x01,
     {{128 * KB, SIM_BAR_MEMORY}, {8 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH},
      {8 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH}}, -1, 0,
     {230 * MHz, 230 * MHz, 150 * MHz}, false, "3Dlabs Permedia 2v", "p2disp.drv", "p2mini", NULL},
    {0x100c, 0x3208, "Tseng Labs ET6000", SIM_FAMILY_ET6000, 0x70,
     {{16 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH}, {256, SIM_BAR_IO}}, -1, 0,
     {135 * MHz, 135 * MHz, 80 * MHz}, true, "Tseng Labs ET6000", "etdisp.drv", "etmini", NULL},
};

// Any other card: a plain VGA with a frame buffer and nothing the program knows.
const SimChip unknown_chip = {0, 0, "VGA compatible", SIM_FAMILY_VGA, 0x00,
                              {{16 * MB, SIM_BAR_MEMORY | SIM_BAR_PREFETCH}}, -1, 0,
                              {170 * MHz, 135 * MHz, 80 * MHz}, false, "Standard Display Adapter (VGA)", "vga.drv",
                              "vga", NULL};

}  // namespace

const SimChip* SimFindChip(uint16_t vendor_id, uint16_t device_id)
{
    for (const SimChip& chip : chips)
        if (chip.vendor_id == vendor_id && chip.device_id == device_id) return &chip;
    return &unknown_chip;
}

const SimChip* SimCardChip(int card)
{
    const SimCardConfig* c = &sim->config.cards[card];
    return SimFindChip(c->vendor_id, c->device_id);
}

const SimFamilyOps* SimCardOps(int card)
{
    switch (SimCardChip(card)->family) {
    case SIM_FAMILY_S3: return &sim_s3_ops;
    case SIM_FAMILY_NVIDIA: return &sim_riva_ops;
    case SIM_FAMILY_BANSHEE: return &sim_banshee_ops;
    case SIM_FAMILY_I740: return &sim_i740_ops;
    case SIM_FAMILY_PERMEDIA: return &sim_permedia_ops;
    case SIM_FAMILY_TRIDENT: return &sim_trident_ops;
    case SIM_FAMILY_ET6000: return &sim_et6000_ops;
    default: return &sim_vga_ops;
    }
}
