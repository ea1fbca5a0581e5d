#include "support/machine.h"

#include <gtest/gtest.h>

#include "base/state.h"
#include "modes/detect.h"
#include "support/support.h"

SimCardConfig Card(uint16_t vendor_id, uint16_t device_id, uint8_t bus, uint8_t device)
{
    SimCardConfig card;
    SimDefaultCard(&card, vendor_id, device_id);
    card.bus = bus;
    card.device = device;
    return card;
}

SimMachineConfig Machine(int windows, std::initializer_list<SimCardConfig> cards)
{
    SimMachineConfig config;
    SimDefaultMachine(&config);
    config.windows = windows;
    config.card_count = 0;
    for (const SimCardConfig& c : cards) config.cards[config.card_count++] = c;
    return config;
}

void BootMachine(const SimMachineConfig& config)
{
    SimBoot(&config);
    ResetProgramState();
    platform = config.windows == SIM_WINDOWS_NT4 ? PLATFORM_NT : PLATFORM_9X;
    os_class = config.windows == SIM_WINDOWS_98 ? OS_CLASS_WIN98 : 3;
}

void BootDefaultAndDetect(int windows)
{
    SimMachineConfig config;
    SimDefaultMachine(&config);
    config.windows = windows;
    BootMachine(config);
    ASSERT_EQ(1, DetectAdapters()) << "Windows " << windows;
    RefreshAdapterModes(REFRESH_AT_STARTUP);
}
