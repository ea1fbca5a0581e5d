// How much building the mode table costs: a display driver with 100 modes
// of 10 refresh rates each, on Windows 98 and on NT 4.0. Prints one line per
// system; the walks of the display settings list a reading without memory
// would need (one for the table, one for every rate looked up) stand beside
// those made.
#include <windows.h>

#include <stdio.h>

#include "base/adapters.h"
#include "base/state.h"
#include "hardware/driver_key.h"
#include "modes/detect.h"
#include "modes/display_settings.h"
#include "modes/mode_keys.h"
#include "modes/mode_list.h"
#include "modes/rate_list.h"
#include "sim.h"
#include "support/registry_opens.h"

enum { BENCH_MODES = 100, BENCH_RATES = 10 };

// 100 modes, each with rates from 56 Hz up in 6 Hz steps.
static int MakeModes(SimListedMode* modes)
{
    static const uint16_t depths[] = {8, 16, 32};
    int count = 0;
    for (int size = 0; count < BENCH_MODES; ++size) {
        for (uint16_t bits : depths) {
            if (count == BENCH_MODES) break;
            SimListedMode* m = &modes[count++];
            m->width = (uint16_t)(640 + 32 * size);
            m->height = (uint16_t)(480 + 24 * size);
            m->bits = bits;
            m->rate_count = BENCH_RATES;
            for (int r = 0; r < BENCH_RATES; ++r) m->rates[r] = (uint16_t)(56 + 6 * r);
        }
    }
    return count;
}

static void Run(int windows)
{
    SimMachineConfig config;
    SimDefaultMachine(&config);
    config.windows = windows;
    SimBoot(&config);
    platform = windows == SIM_WINDOWS_NT4 ? PLATFORM_NT : PLATFORM_9X;
    os_class = windows == SIM_WINDOWS_NT4 ? 3 : OS_CLASS_WIN98;
    adapter_count = 0;
    current_adapter = 0;
    DetectAdapters();

    static SimListedMode modes[BENCH_MODES];
    int count = MakeModes(modes);
    SimSetModeList(modes, count);
    ForgetDisplaySettings();
    SimResetCounters();
    registry_opens = 0;
    LARGE_INTEGER f, t0, t1;
    QueryPerformanceFrequency(&f);
    QueryPerformanceCounter(&t0);
    BuildModeTable(0);
    QueryPerformanceCounter(&t1);
    unsigned opens = registry_opens;

    int entries = 0;
    unsigned lookups = 0;
    for (; entries < MODE_TABLE_SIZE && mode_table[entries].bits_per_pixel; ++entries) {
        int rates = 0;
        while (rates < MODE_RATES && mode_table[entries].rates[rates]) ++rates;
        lookups += (unsigned)(rates < MODE_RATES ? rates + 1 : rates);  // the last lookup ends the list
    }
    const SimCounters* c = SimGetCounters();
    // Without memory every rate looked up on NT walks the whole list again.
    unsigned naive = 1 + (platform == PLATFORM_NT ? lookups : 0);
    printf("platform=%s modes=%d walks=%u enum_calls=%u registry_opens=%u ms=%.1f naive_walks=%u saving=%.0fx\n",
           platform == PLATFORM_NT ? "NT" : "9x", entries, c->enum_settings_walks, c->enum_settings_calls, opens,
           (double)(t1.QuadPart - t0.QuadPart) * 1000.0 / (double)f.QuadPart, naive,
           c->enum_settings_walks ? (double)naive / c->enum_settings_walks : 0.0);
    FreeModeTable();
}

int main()
{
    if (!CountRegistryOpens()) fprintf(stderr, "bench-modetable: registry opens are not counted\n");
    lstrcpynA(chip_ini_path, "Z:\\nonexistent\\ZNTR3.INI", sizeof chip_ini_path);
    lstrcpynA(text_ini_path, "Z:\\nonexistent\\ZNTR2.INI", sizeof text_ini_path);
    Run(SIM_WINDOWS_98);
    Run(SIM_WINDOWS_NT4);
    SimDetach();
    return 0;
}
