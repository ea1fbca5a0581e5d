// The simulated machine: a small PC with PCI/AGP graphics cards, their VGA
// cores and chip models, the two driver devices, the video BIOS and the
// display driver of Windows 95, 98 or NT 4.0. It implements the machine
// seam (src/hardware/machine.h) for vistrel-sim.exe and the tests.
//
// This header is what tests and the simulation's own programs use to build a
// machine and look inside it. The program itself never includes it.
//
// One machine is current in a process at a time: the one SimBoot built in
// this process's memory, or the persistent one SimAttachPersistent /
// SimOpenPersistent mapped. Every Sim* call and every seam call acts on it.
// Without any machine the seam answers as an empty PC (ports read 0xFF, no
// driver devices) and the display calls go to Wine.
//
// Card numbers (`card` below) are indices into SimMachineConfig.cards.
// Formats of SIMMACHINE.INI and of simstate.exe's report: sim/README.md.
#ifndef VISTREL_SIM_H
#define VISTREL_SIM_H

#include <windows.h>
#include <stdint.h>
#include <stdio.h>

enum SimWindows {
    SIM_WINDOWS_95 = 95,
    SIM_WINDOWS_98 = 98,
    SIM_WINDOWS_NT4 = 4,
};

enum { SIM_MAX_CARDS = 8, SIM_MAX_INITIAL_REGISTERS = 64, SIM_DESCRIPTION_SIZE = 64 };

// A register file of a card, as simstate.exe names them.
enum SimRegisterFile {
    SIM_REG_CRTC,       // CRxx: CRT controller, 0x3D4/0x3D5
    SIM_REG_SEQUENCER,  // SRxx: sequencer, 0x3C4/0x3C5
    SIM_REG_GRAPHICS,   // GRxx: graphics controller, 0x3CE/0x3CF
    SIM_REG_ATTRIBUTE,  // ARxx: attribute controller, 0x3C0/0x3C1
    SIM_REG_MISC,       // MISC: miscellaneous output, written 0x3C2, read 0x3CC (index ignored)
    SIM_REG_FAMILY,     // the family's own register file, by index (later families)
    SIM_REG_PCI,        // the PCI configuration header, by byte offset 0..255
};

struct SimInitialRegister {
    SimRegisterFile file;
    uint16_t index;
    uint8_t value;
};

struct SimCardConfig {
    uint16_t vendor_id;
    uint16_t device_id;
    uint8_t bus;          // 0, or 1 behind the AGP bridge
    uint8_t device;       // PCI device number 0..31
    uint32_t memory_mb;   // video memory
    bool display_device;  // Windows 98 has a display device and a monitor for it
    bool device_node;     // Windows 9x has a Config Manager device node for it
    uint32_t problem;     // that node's "Problem" value; 0 = none
    bool has_edid;
    uint8_t edid[128];    // the monitor's EDID base block
    char driver_desc[SIM_DESCRIPTION_SIZE];  // "" = the usual description for the chip
    int initial_register_count;
    // Applied after the card's reset values and after the display driver
    // programmed the boot mode, so they are what the program finds.
    SimInitialRegister initial_registers[SIM_MAX_INITIAL_REGISTERS];
    // Added with the first machine (defaults in SimDefaultCard):
    uint32_t memory_extra_kb;  // memory beyond memory_mb, in KB (multiples of 64 make sense)
    bool attached;             // Windows 98: the display device is part of the desktop
    // The card's own start-up mode; 0 = the machine's (secondary cards only;
    // the primary card always runs the desktop's mode).
    uint16_t start_width, start_height, start_bits, start_refresh;
    uint32_t crystal_hz;  // NVIDIA: the reference crystal the straps report, 14318180 or 13500000
};

struct SimMachineConfig {
    int windows;  // SimWindows
    int card_count;
    SimCardConfig cards[SIM_MAX_CARDS];
    int primary_card;  // the card that decodes the legacy VGA ports; -1 = none
    // The desktop mode the machine boots into.
    uint16_t start_width, start_height, start_bits, start_refresh;
    // Windows 98: at most this many display devices and monitors; 0 = one for
    // every card with display_device.
    int monitors;
    bool nt_device;   // NT: the kernel device "\\.\Zentra" is installed
    bool vxd_device;  // 9x: "\\.\HWGATE.VXD" can be loaded
    bool video_bios;  // 9x: the primary card's video BIOS answers the program
};

// One S3 Trio64V2 (5333:8901) on bus 0 device 10 with 4 MB and a 17-inch
// monitor of 1998, on Windows 98, booting into 1024x768 at 32 bits, 75 Hz.
void SimDefaultMachine(SimMachineConfig* config);
// A card with the defaults of the description file's [Card<n>] section.
void SimDefaultCard(SimCardConfig* card, uint16_t vendor_id, uint16_t device_id);
// Reads a machine description (SIMMACHINE.INI format, see sim/README.md) over
// the defaults. Returns 1 when the file exists, 0 when the defaults stand.
int SimReadDescription(const char* path, SimMachineConfig* config);

// Boots a machine held in this process's memory, as tests do: resets every
// card, seeds the registry of that Windows, and puts the display into the
// start-up mode. Wine's desktop is resized only when it differs from that
// mode. The machine replaces whatever machine was current in the process.
void SimBoot(const SimMachineConfig* config);
// vistrel-sim.exe's machine: the state lives in the Wine prefix, keyed by
// the folder of the executable, and outlives the process; a description
// whose bytes changed since the last boot boots the machine afresh.
// Returns 1 when the machine is up.
int SimAttachPersistent(const char* exe_folder);
// simstate.exe: looks at the persistent machine of a folder without booting
// it. Returns 0 when that machine has never run.
int SimOpenPersistent(const char* exe_folder);
// Lets go of the current machine (a persistent one stays in its file, as a
// PC stays on when a program ends). Afterwards there is no machine.
void SimDetach();
// Restarts Windows on the current machine without touching its hardware
// description: the cards are reset, the volatile registry (HKEY_DYN_DATA,
// HKLM\HARDWARE) is seeded again and the desktop comes up in the mode the
// registry holds (which is where a Windows 95 colour-depth change waits for
// this moment). A persistent machine also does this by itself when it finds
// that the Wine server was restarted since the program last ran.
void SimRestartWindows();

// Looking inside.
const SimMachineConfig* SimConfig();
// The register files as the chip holds them, without its locks, write
// protection or side effects (a test's back door).
uint8_t SimReadRegister(int card, SimRegisterFile file, uint16_t index);
void SimWriteRegister(int card, SimRegisterFile file, uint16_t index, uint8_t value);
// The 32-bit registers of an NVIDIA, Banshee or Permedia 2 card by their
// offset in the register window, as the chip holds them (read-only straps
// included); 0xFFFFFFFF for an offset or a card the model does not have.
uint32_t SimReadInternal32(int card, uint32_t offset);
void SimWriteInternal32(int card, uint32_t offset, uint32_t value);
double SimPixelClockHz(int card);   // the dot clock: the DCLK synthesizer's output (MISC selects it)
double SimMemoryClockHz(int card);  // the MCLK synthesizer's output
int SimHTotal(int card);            // a line in character clocks, 0 when unknown
int SimVTotal(int card);            // a field in lines, 0 when unknown
// The vertical refresh the card runs at, as the model computes it from its
// registers (for an interlaced mode, the frame rate); 0 when the model
// cannot tell.
double SimRefreshHz(int card);
enum SimDpms { SIM_DPMS_ON, SIM_DPMS_STANDBY, SIM_DPMS_SUSPEND, SIM_DPMS_OFF };
SimDpms SimDpmsState(int card);
// The depth the display driver last set on the card.
int SimCardDepth(int card);
// The mode the display driver last set on the card, and the refresh rate it
// programmed for it (whole Hz, the nominal rate of the VESA timing).
struct SimCardMode {
    int width, height, bits, refresh;
    bool interlaced;
};
SimCardMode SimGetCardMode(int card);
// The display driver's mode set on a card, by the rules of this Windows (NT:
// the frequency, 43 the interlaced timing; 9x: the registry's rate), without
// resizing Wine's desktop or telling any window: for tests that walk many
// modes. 0 when the card does not offer the mode (nothing changes).
int SimSetCardMode(int card, int width, int height, int bits, int frequency);
// The base address register of a card (offset 0x10 + 4 * bar) as the
// machine assigned it at boot, flag bits cleared.
uint32_t SimCardBarAddress(int card, int bar);
// The whole state as simstate.exe prints it.
void SimPrintState(FILE* out);

// A display driver with a mode list of its own, for the benchmark and tests
// of long lists: until the next boot EnumDisplaySettingsA lists these modes
// (on NT one entry per rate, on 9x one per mode, whose MODES key is written
// with its rates) instead of the card's. In this process only; count 0 goes
// back to the card's own list.
enum { SIM_LISTED_RATES = 16 };
struct SimListedMode {
    uint16_t width, height, bits;
    int rate_count;
    uint16_t rates[SIM_LISTED_RATES];
};
void SimSetModeList(const SimListedMode* modes, int count);

// Counters of what crossed the seam, for tests and the benchmark.
struct SimCounters {
    uint32_t port_reads, port_writes;
    uint32_t window_reads, window_writes;
    uint32_t device_opens, device_requests, device_closes;
    uint32_t enum_settings_calls;  // EnumDisplaySettingsA of any mode number
    uint32_t enum_settings_walks;  // ... of mode number 0: the start of a walk
    uint32_t mode_changes;
};
const SimCounters* SimGetCounters();
void SimResetCounters();

#endif
