// Simulated machines built in code for the unit tests.
#ifndef VISTREL_TEST_MACHINE_H
#define VISTREL_TEST_MACHINE_H

#include <gtest/gtest.h>

#include <initializer_list>

#include "base/adapters.h"
#include "base/state.h"
#include "modes/detect.h"
#include "sim.h"
#include "support/support.h"

inline SimCardConfig Card(uint16_t vendor_id, uint16_t device_id, uint8_t bus = 0, uint8_t device = 10)
{
    SimCardConfig card;
    SimDefaultCard(&card, vendor_id, device_id);
    card.bus = bus;
    card.device = device;
    return card;
}

inline SimMachineConfig Machine(int windows, std::initializer_list<SimCardConfig> cards)
{
    SimMachineConfig config;
    SimDefaultMachine(&config);
    config.windows = windows;
    config.card_count = 0;
    for (const SimCardConfig& c : cards) config.cards[config.card_count++] = c;
    return config;
}

// Boots the machine and gives the program a fresh state on that Windows.
inline void BootMachine(const SimMachineConfig& config)
{
    SimBoot(&config);
    ResetProgramState();
    platform = config.windows == SIM_WINDOWS_NT4 ? PLATFORM_NT : PLATFORM_9X;
    os_class = config.windows == SIM_WINDOWS_98 ? OS_CLASS_WIN98 : 3;
}

// Boots the default machine (one Trio64V2) on that Windows, detects its one
// card and reads its mode; asserts, so call it through ASSERT_NO_FATAL_FAILURE.
inline void BootDefaultAndDetect(int windows = SIM_WINDOWS_98)
{
    BootMachine(Machine(windows, {Card(0x5333, 0x8901)}));
    ASSERT_EQ(1, DetectAdapters()) << "Windows " << windows;
    RefreshAdapterModes(REFRESH_AT_STARTUP);
}

// Windows 98 with two display devices, detected, the second one's record
// current: a 2 MB primary without 1024x768 at 32 bits, a 4 MB card with it.
inline void BootTwoDisplayDevicesOn98()
{
    SimMachineConfig config = Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 0, 9), Card(0x5333, 0x8a01, 0, 10)});
    config.cards[0].memory_mb = 2;
    config.start_bits = 16;
    BootMachine(config);
    ASSERT_TRUE(DetectAdapters() == 1 && adapter_count == 2);
    RefreshAdapterModes(REFRESH_AT_STARTUP);
    current_adapter = 1;
}

#endif
