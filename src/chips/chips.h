// The chip table and the numbered chip commands every chip driver answers.
// Everything the program does to a graphics chip goes through the wrappers
// below, on the adapter at current_adapter.
#ifndef VISTREL_CHIPS_H
#define VISTREL_CHIPS_H

#include <stddef.h>
#include <stdint.h>

enum ChipCommand : uint32_t {
    CMD_DPMS_ON = 0,
    CMD_DPMS_STANDBY = 1,
    CMD_DPMS_SUSPEND = 2,
    CMD_DPMS_OFF = 4,
    CMD_INIT_CHIP = 219,
    CMD_OPEN_IO = 220,
    CMD_CLOSE_IO = 221,
    CMD_GET_HTOTAL = 222,
    CMD_GET_VTOTAL = 223,
    CMD_GET_CHAR_WIDTH = 224,
    CMD_WRITE_PORT = 225,
    CMD_READ_PORT = 226,
    CMD_GET_MEM_SIZE = 227,
    CMD_PREPARE_MODE = 229,
    CMD_HIDE_PAGE = 230,
    CMD_MAP_REGISTERS = 231,
    CMD_GET_MEM_TYPE = 232,
    CMD_IS_INTERLACED = 233,
    CMD_GET_MCLK = 234,
    CMD_SET_MCLK = 235,
    CMD_GET_AGP_RATE = 236,
    CMD_HAS_DPMS = 237,
    CMD_GET_MCLK_MAX = 238,
    CMD_GET_MCLK_MIN = 239,
};

// Capability bits of CMD_INIT_CHIP, ORed into the adapter's flags.
enum {
    CHIP_CAP_NO_ADJUST = 0x0001,
    CHIP_CAP_UNCLAMPED_RATE = 0x0004,
    CHIP_CAP_NO_CLOCK_REFRESH = 0x0008,
    CHIP_CAP_AGP = 0x8000,
};

enum { CHIP_TIMING_SIZE = 14 };

// A timing record for the head of the display driver's timing list of a
// mode: the timings there move one place down first when the rate of the
// list's first timing (byte 0) is below shift_above.
struct ChipTiming {
    const uint8_t* record;  // CHIP_TIMING_SIZE bytes
    uint8_t shift_above;
};

// Argument of CMD_PREPARE_MODE, passed by address. The driver answers what
// the display driver must find before the mode change, and the mode change
// writes it.
struct ChipModeRecord {
    uint16_t width;
    uint16_t height;
    uint16_t bits_per_pixel;
    uint32_t refresh_hz;
    ChipTiming timing;  // answered with PREPARE_TIMING
};

enum {
    PREPARE_REFRESH_KEY = 0x1,  // the 9x driver reads the rate from the mode's "RefreshRate"
    PREPARE_TIMING = 0x2,       // and, once that is stored, the timing record from its list
};

typedef uint32_t (*ChipDispatchFn)(uint32_t command, uintptr_t argument);
typedef uint32_t (*ChipSetPixelClockFn)(double hz);
typedef double (*ChipGetPixelClockFn)();

struct ChipRow {
    uint16_t vendor_id;
    uint16_t device_id;
    ChipDispatchFn Dispatch;
    ChipSetPixelClockFn SetPixelClock;
    ChipGetPixelClockFn GetPixelClock;
};

enum { CHIP_TABLE_ROWS = 20 };
extern const ChipRow chip_table[CHIP_TABLE_ROWS];
// The rows the wrappers dispatch through, by the adapter's chip_row: the
// chip table, or a table a test puts here to stand in for a family.
extern const ChipRow* chip_rows;

uint32_t chip_init();
uint32_t chip_open_io();
uint32_t chip_close_io();
uint32_t chip_get_htotal();
uint32_t chip_get_vtotal();
uint32_t chip_get_char_width();
uint32_t chip_write_port(uint32_t port, uint32_t value);
uint32_t chip_read_port(uint32_t port);
uint32_t chip_get_mem_size();
// What the display driver must find before this mode is set (PREPARE_*),
// with the timing record in *timing when one is answered.
uint32_t chip_prepare_mode(uint16_t width, uint16_t height, uint16_t bits, uint32_t refresh,
                           ChipTiming* timing = nullptr);
uint32_t chip_hide_page(uint32_t page);
uint32_t chip_map_registers();
uint32_t chip_get_mem_type();
uint32_t chip_is_interlaced();
uint32_t chip_get_mclk();
uint32_t chip_set_mclk(uint32_t mhz);
uint32_t chip_get_agp_rate();
uint32_t chip_has_dpms();
uint32_t chip_get_mclk_max();
uint32_t chip_get_mclk_min();
uint32_t chip_set_pixel_clock(double hz);
double chip_get_pixel_clock();
int any_chip_has_dpms();
int chip_set_dpms_all(uint32_t state);

// A DPMS state code (On, Standby, Suspend, Off) as the power message carries it.
bool IsDpmsState(uint32_t code);

#endif
