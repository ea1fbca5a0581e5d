#include "chips/chips.h"

#include <windows.h>

#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/state.h"
#include "chips/banshee.h"
#include "chips/et6000.h"
#include "chips/i740.h"
#include "chips/permedia2.h"
#include "chips/riva.h"
#include "chips/s3.h"
#include "chips/trident.h"
#include "chips/unsupported.h"

#define BANSHEE_FAMILY \
    .Dispatch = BansheeDispatch, .SetPixelClock = BansheeSetPixelClock, .GetPixelClock = BansheeGetPixelClock
#define I740_FAMILY .Dispatch = I740Dispatch, .SetPixelClock = I740SetPixelClock, .GetPixelClock = I740GetPixelClock
#define RIVA_FAMILY .Dispatch = RivaDispatch, .SetPixelClock = RivaSetPixelClock, .GetPixelClock = RivaGetPixelClock
#define S3_FAMILY .Dispatch = S3Dispatch, .SetPixelClock = S3SetPixelClock, .GetPixelClock = S3GetPixelClock
#define ET6000_FAMILY \
    .Dispatch = Et6000Dispatch, .SetPixelClock = Et6000SetPixelClock, .GetPixelClock = Et6000GetPixelClock
#define PERMEDIA2_FAMILY \
    .Dispatch = Permedia2Dispatch, .SetPixelClock = Permedia2SetPixelClock, .GetPixelClock = Permedia2GetPixelClock
#define TRIDENT_FAMILY \
    .Dispatch = TridentDispatch, .SetPixelClock = TridentSetPixelClock, .GetPixelClock = TridentGetPixelClock
#define UNSUPPORTED_FAMILY                                                            \
    .Dispatch = UnsupportedDispatch, .SetPixelClock = UnsupportedSetPixelClock, \
    .GetPixelClock = UnsupportedGetPixelClock

const ChipRow chip_table[CHIP_TABLE_ROWS] = {
    {.vendor_id = 0x12d2, .device_id = 0x0018, RIVA_FAMILY},         // Riva 128
    {.vendor_id = 0x12d2, .device_id = 0x0019, RIVA_FAMILY},         // Riva 128ZX
    {.vendor_id = 0x10de, .device_id = 0x0020, RIVA_FAMILY},         // Riva TNT
    {.vendor_id = 0x8086, .device_id = 0x7800, I740_FAMILY},         // i740
    {.vendor_id = 0x121a, .device_id = 0x0003, BANSHEE_FAMILY},      // Voodoo Banshee
    {.vendor_id = 0x1023, .device_id = 0x939a, TRIDENT_FAMILY},      // Trident 939a
    {.vendor_id = 0x5333, .device_id = 0x8a13, S3_FAMILY},           // Trio3D/2X
    {.vendor_id = 0x5333, .device_id = 0x8a20, S3_FAMILY},           // Savage3D
    {.vendor_id = 0x5333, .device_id = 0x8a21, S3_FAMILY},           // Savage3D/MV
    {.vendor_id = 0x5333, .device_id = 0x8904, S3_FAMILY},           // Trio3D
    {.vendor_id = 0x5333, .device_id = 0x5631, S3_FAMILY},           // ViRGE
    {.vendor_id = 0x5333, .device_id = 0x883d, S3_FAMILY},           // ViRGE/VX
    {.vendor_id = 0x5333, .device_id = 0x8a01, S3_FAMILY},           // ViRGE/DX or GX
    {.vendor_id = 0x5333, .device_id = 0x8a10, S3_FAMILY},           // ViRGE/GX2
    {.vendor_id = 0x5333, .device_id = 0x8811, S3_FAMILY},           // Trio32/Trio64
    {.vendor_id = 0x5333, .device_id = 0x8901, S3_FAMILY},           // Trio64V2
    {.vendor_id = 0x104c, .device_id = 0x3d07, PERMEDIA2_FAMILY},    // TI Permedia 2
    {.vendor_id = 0x3d3d, .device_id = 0x0007, PERMEDIA2_FAMILY},    // Permedia 2
    {.vendor_id = 0x3d3d, .device_id = 0x0009, PERMEDIA2_FAMILY},    // Permedia 2v
    {.vendor_id = 0x100c, .device_id = 0x3208, ET6000_FAMILY},       // ET6000
};

const ChipRow* chip_rows = chip_table;

static void ResetChipRows() { chip_rows = chip_table; }
VISTREL_MODULE_RESET(ResetChipRows);

static const ChipRow* CurrentRow() { return &chip_rows[CurrentAdapter()->chip_row]; }

static uint32_t Command(uint32_t command, uintptr_t argument = 0) { return CurrentRow()->Dispatch(command, argument); }

uint32_t chip_init() { return Command(CMD_INIT_CHIP); }
uint32_t chip_open_io() { return Command(CMD_OPEN_IO); }
uint32_t chip_close_io() { return Command(CMD_CLOSE_IO); }
uint32_t chip_get_htotal() { return Command(CMD_GET_HTOTAL); }
uint32_t chip_get_vtotal() { return Command(CMD_GET_VTOTAL); }
uint32_t chip_get_char_width() { return Command(CMD_GET_CHAR_WIDTH); }

uint32_t chip_write_port(uint32_t port, uint32_t value)
{
    return Command(CMD_WRITE_PORT, (value & 0xFFFF) << 16 | (port & 0xFFFF));
}

uint32_t chip_read_port(uint32_t port) { return Command(CMD_READ_PORT, port); }
uint32_t chip_get_mem_size() { return Command(CMD_GET_MEM_SIZE); }

uint32_t chip_prepare_mode(uint16_t width, uint16_t height, uint16_t bits, uint32_t refresh, ChipTiming* timing)
{
    ChipModeRecord mode = {.width = width, .height = height, .bits_per_pixel = bits, .refresh_hz = refresh, .timing = {}};
    uint32_t needs = Command(CMD_PREPARE_MODE, (uintptr_t)&mode);
    if (timing) *timing = mode.timing;
    return needs;
}

uint32_t chip_hide_page(uint32_t page) { return Command(CMD_HIDE_PAGE, page); }

uint32_t chip_map_registers()
{
    // Only Windows 9x lets the program reach a register window itself.
    if (platform != PLATFORM_9X) return 0;
    return Command(CMD_MAP_REGISTERS);
}

uint32_t chip_get_mem_type() { return Command(CMD_GET_MEM_TYPE); }
uint32_t chip_is_interlaced() { return Command(CMD_IS_INTERLACED); }
uint32_t chip_get_mclk() { return Command(CMD_GET_MCLK); }
uint32_t chip_set_mclk(uint32_t mhz) { return Command(CMD_SET_MCLK, mhz); }
uint32_t chip_get_agp_rate() { return Command(CMD_GET_AGP_RATE); }
uint32_t chip_has_dpms() { return Command(CMD_HAS_DPMS); }
uint32_t chip_get_mclk_max() { return Command(CMD_GET_MCLK_MAX); }
uint32_t chip_get_mclk_min() { return Command(CMD_GET_MCLK_MIN); }
uint32_t chip_set_pixel_clock(double hz) { return CurrentRow()->SetPixelClock(hz); }
double chip_get_pixel_clock() { return CurrentRow()->GetPixelClock(); }

bool IsDpmsState(uint32_t code)
{
    return code == CMD_DPMS_ON || code == CMD_DPMS_STANDBY || code == CMD_DPMS_SUSPEND || code == CMD_DPMS_OFF;
}

int any_chip_has_dpms()
{
    int16_t saved = current_adapter;
    int found = 0;
    for (current_adapter = 0; current_adapter < adapter_count; ++current_adapter) {
        if (chip_has_dpms()) {
            found = 1;
            break;
        }
    }
    current_adapter = saved;
    return found;
}

int chip_set_dpms_all(uint32_t state)
{
    int16_t saved = current_adapter;
    for (current_adapter = 0; current_adapter < adapter_count; ++current_adapter) Command(state);
    current_adapter = saved;
    if (state == CMD_DPMS_ON) InvalidateRect(NULL, NULL, TRUE);
    return 1;
}
