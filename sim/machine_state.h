// The simulated machine's state and the pieces of the simulation that share
// it. The state is one plain struct so that it can live in a file mapping
// and outlive the process, as the hardware outlives a program.
#ifndef VISTREL_SIM_MACHINE_STATE_H
#define VISTREL_SIM_MACHINE_STATE_H

#include <stdint.h>

#include "modes.h"
#include "sim.h"

// A VGA core: the register files and the latches of its index ports.
struct SimVga {
    uint8_t misc;
    uint8_t feature;
    uint8_t subsystem_enable;  // 0x3C3
    uint8_t seq_index, crtc_index, gr_index, ar_index;
    uint8_t ar_expect_data;    // attribute flip-flop: 0 = the next 0x3C0 write is an index
    uint8_t status_reads;      // input status 1 read count; its low bit drives the retrace bits
    uint8_t dac_mask, dac_read_index, dac_write_index, dac_component, dac_reading;
    uint8_t sr[256], cr[256], gr[256], ar[32];
    uint8_t palette[768];
};

// What the display driver last did to a card.
struct SimDriverMode {
    uint16_t width, height, bits;
    uint16_t refresh;        // the nominal rate of the timing it programmed
    uint16_t requested;      // NT: the frequency the miniport was asked for (0/1 = default)
    uint8_t interlaced;
};

struct SimCardState {
    uint8_t pci[256];
    SimVga vga;
    uint8_t family[4096];  // registers of the family beyond the VGA core
    SimDriverMode mode;
    uint8_t class_index;   // 9x: n of the driver key DISPLAY\000n; 0xFF = none
};

enum { SIM_STATE_MAGIC = 0x4D495356, SIM_STATE_VERSION = 4 };

struct SimState {
    uint32_t magic, version, size;
    uint64_t description_hash;  // of the SIMMACHINE.INI bytes (its own value when absent)
    uint32_t boot_count;
    char identity[64];          // names this machine in the registry markers
    SimMachineConfig config;
    uint32_t pci_address;       // 0xCF8
    SimCardState cards[SIM_MAX_CARDS];
};

extern SimState* sim;  // the current machine, or NULL
extern SimCounters sim_counters;

// --- chips.cpp: what each supported chip is on the bus and to its driver ---

enum SimFamily { SIM_FAMILY_VGA, SIM_FAMILY_S3, SIM_FAMILY_NVIDIA, SIM_FAMILY_I740, SIM_FAMILY_BANSHEE,
                 SIM_FAMILY_TRIDENT, SIM_FAMILY_PERMEDIA, SIM_FAMILY_ET6000 };

enum { SIM_BAR_MEMORY = 0, SIM_BAR_IO = 1, SIM_BAR_PREFETCH = 8 };

struct SimBar {
    uint32_t size;  // 0 = not implemented
    uint8_t flags;  // SIM_BAR_*
};

// The S3 chips' differences, in the fields the program's register table uses.
enum SimS3Clock { S3_DCLK_R3, S3_DCLK_R2, S3_DCLK_SAVAGE };
enum SimS3Memory { S3_MEM_TRIO, S3_MEM_VIRGE_VX, S3_MEM_SAVAGE };
struct SimS3Chip {
    SimS3Clock dclk;            // where R lives in SR12 (and SR29)
    SimS3Memory memory_code;    // meaning of CR36 bits 7..5
    double vco_min_hz, vco_max_hz;
    uint16_t m_max, n_min, n_max, r_max;
    uint8_t cr30_chip_id;       // CR30, and the device id in CR2D/CR2E
    // 15/16 bits: two DCLK periods per pixel (SR18 bit 7 set), else one.
    bool doubles_clock_16;
};

struct SimChip {
    uint16_t vendor_id, device_id;
    const char* name;
    SimFamily family;
    uint8_t revision;
    SimBar bars[6];
    // The window through which the VGA ports are reached (S3, i740, Trident):
    // port p at offset window_offset + p of base address register window_bar.
    int8_t window_bar;  // -1: the family decodes its window itself, or has none
    uint32_t window_offset;
    // Highest pixel rate the RAMDAC drives at 8, 15/16 and 32 bits, Hz.
    uint32_t max_pixel_hz[3];
    bool has_15bit;
    const char* driver_desc;  // DriverDesc / Device Description
    const char* driver_file;  // 9x DEFAULT "drv"; NT display DLL (base name + ".dll")
    const char* nt_service;   // NT miniport service
    const SimS3Chip* s3;
};

const SimChip* SimFindChip(uint16_t vendor_id, uint16_t device_id);  // never NULL
const SimChip* SimCardChip(int card);

// --- the chip families: what is not plain VGA ---
// Every definition names its members (designated initializers): several
// have the same type, and a swapped pair would still compile.

struct SimFamilyOps {
    void (*reset)(int card);
    // Sequencer and CRT controller data ports, after the index was written.
    uint8_t (*read_sr)(int card, uint8_t index);
    void (*write_sr)(int card, uint8_t index, uint8_t value);
    uint8_t (*read_cr)(int card, uint8_t index);
    void (*write_cr)(int card, uint8_t index, uint8_t value);
    // A memory access in the card's base address ranges outside the VGA
    // window: 1 when the family decodes it.
    int (*window_read)(int card, int bar, uint32_t offset, uint8_t* value);
    int (*window_write)(int card, int bar, uint32_t offset, uint8_t value);
    double (*pixel_clock_hz)(int card);   // the dot clock MISC selects, Hz
    double (*memory_clock_hz)(int card);  // Hz
    int (*htotal)(int card);              // character clocks per line
    int (*vtotal)(int card);              // lines per field
    double (*refresh_hz)(int card);       // frames per second, Hz
    SimDpms (*dpms)(int card);
    // The display driver's mode set: CRT timing, depth and pixel clock.
    void (*program_mode)(int card, const struct SimTiming* timing, int bits);
    // I/O ports of the legacy range that the VGA core does not own, and the
    // ports of the card's I/O base address registers (NULL: none); 1 when the
    // family decodes the port.
    int (*read_port)(int card, uint16_t port, uint8_t* value);
    int (*write_port)(int card, uint16_t port, uint8_t value);
    // simstate's raw clock-synthesizer lines, named as the chip's documents
    // name the registers (NULL: none).
    void (*print_raw)(FILE* out, int card);
    // The family's 32-bit registers by their offset in the register window,
    // as the chip holds them (tests' back door; NULL: none). 1 when the
    // family has a register there.
    int (*read_internal32)(int card, uint32_t offset, uint32_t* value);
    int (*write_internal32)(int card, uint32_t offset, uint32_t value);
};

const SimFamilyOps* SimCardOps(int card);
extern const SimFamilyOps sim_vga_ops;
extern const SimFamilyOps sim_s3_ops;
extern const SimFamilyOps sim_riva_ops;
extern const SimFamilyOps sim_banshee_ops;
extern const SimFamilyOps sim_i740_ops;
extern const SimFamilyOps sim_permedia_ops;

// --- permedia.cpp: the display driver's timing list (9x registry) ---
enum { SIM_PERMEDIA_RECORD_SIZE = 14 };
// A timing record as the Permedia 2 display driver keeps it in
// DEFAULT\TIMINGS\<w>,<h>: rate, second rate, horizontal total, front
// porch, sync and back porch in characters of 8 pixels, vertical ones in
// lines, each sync's polarity (1 = positive).
void PermediaTimingRecord(const SimTiming* timing, uint8_t* record);
extern const SimFamilyOps sim_trident_ops;
extern const SimFamilyOps sim_et6000_ops;

// --- et6000.cpp ---
// The ET6000 BIOS's memory answer (interrupt 10h, AX = 1203h, BL = F2h): BX.
uint16_t Et6000BiosMemory(int card);

// --- vga.cpp ---
void VgaReset(int card);
uint8_t VgaRead(int card, uint16_t port);
void VgaWrite(int card, uint16_t port, uint8_t value);
uint8_t VgaGenericReadCr(int card, uint8_t index);
void VgaGenericWriteCr(int card, uint8_t index, uint8_t value);
// CRT controller fields as register values (character clocks, lines).
struct SimCrtcTiming {
    int htotal, hdisplay_end, hblank_start, hblank_end, hsync_start, hsync_end;
    int vtotal, vdisplay_end, vblank_start, vblank_end, vsync_start, vsync_end;
};
// Writes the values into the fields of a table (the VGA's own, or a
// family's with its overflow bits) and leaves CR11 bit 7 set, as a mode set
// by the BIOS or a driver does.
void VgaWriteTiming(int card, const SimCrtcTiming* t, const struct SimCrtcFields* fields);
// The CRT values of a VESA timing in characters of pixels (8, or 16 where a
// register unit counts two characters): the total less 5, rounded half up;
// vertical ones in lines.
SimCrtcTiming VgaCrtcValues(const SimTiming* t, int pixels = 8);

// --- pci.cpp ---
void PciReset();
uint8_t PciConfigRead(int bus, int device, int function, int offset);
void PciConfigWrite(int bus, int device, int function, int offset, uint8_t value);
int PciFindCard(int bus, int device);  // card index, or -1
uint32_t PciBarBase(int card, int bar);  // 0 when the BAR or memory decode is off
uint32_t PciIoBarBase(int card, int bar);  // an I/O BAR's port base; 0 when not one or I/O decode is off
uint8_t PciPortRead(uint16_t port);
void PciPortWrite(uint16_t port, uint8_t value);
uint32_t PciPortReadDword(uint16_t port);
void PciPortWriteDword(uint16_t port, uint32_t value);

// --- machine.cpp ---
int SimCardValid(int card);
int SimPrimaryCard();  // -1 when no card decodes the legacy ports
void SimResetCards();
void SimApplyInitialRegisters();
uint8_t SimWindowRead(uint32_t address);
void SimWindowWrite(uint32_t address, uint8_t value);
uint8_t SimPortRead(uint16_t port);
void SimPortWrite(uint16_t port, uint8_t value);
uint64_t SimHashBytes(const void* data, size_t size, uint64_t seed);

// --- display.cpp: the display driver ---
// Every card into its start-up mode; the primary's from the registry when
// asked to and the registry has one (a restart of Windows).
void DisplayBoot(int use_registry_mode);
void DisplayEnsureWineDesktop();  // resize Wine's desktop when it differs from the primary's mode
void DisplayAttachProcess();      // the hidden window that hears foreign mode changes
void DisplayDetachProcess();
SimModeLimits DisplayCardLimits(int card);
// Windows 98's display devices: the cards in display-device order (primary
// first); the count is capped by [Machine] Monitors.
int DisplayDeviceCards(int* cards);
// ChangeDisplaySettingsExA of Windows 98: the named display device's card.
LONG WINAPI DisplayChangeSettingsEx(LPCSTR device, DEVMODEA* mode, HWND window, DWORD flags, LPVOID param);

// --- registry.cpp ---
void RegistrySeedMachine();   // the places a real installation has (HKLM, HKCC), afresh
void RegistrySeedVolatile();  // HKEY_DYN_DATA and HKLM\HARDWARE, at every start of Windows
// 1 when the registry was seeded by this machine; *volatile_missing tells a
// restarted Wine server.
int RegistryIsOurs(int* volatile_ours, int* volatile_missing);
// NT: keeps the device key's values in the key Wine names in the device
// map, now and whenever Wine rewrites it (a thread of the simulation).
void RegistryAttachProcess();
void RegistryDetachProcess();
int RegistryDriverKey(int card, char* out, size_t size);  // 9x class key / NT device key under HKLM
// The "RefreshRate" text a 9x display driver reads for a mode: its MODES
// key's, else its DEFAULT key's. 0 when neither has one.
void RegistryWriteModeList9x(int card, int width, int height, int bits, const uint16_t* rates, int count);
int RegistryRefreshText9x(int card, int width, int height, int bits, char* out, size_t size);
void RegistryWriteDisplaySettings(int card, const SimDriverMode* mode);  // CDS_UPDATEREGISTRY
int RegistryReadDisplaySettings(SimDriverMode* mode);  // the mode Windows starts in; 0 = none
const char* RegistryDriverDesc(int card);

#endif
