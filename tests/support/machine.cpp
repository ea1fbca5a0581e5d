#include "support/machine.h"

#include <string.h>

#include "base/adapters.h"
#include "base/state.h"
#include "hardware/driver_key.h"
#include "modes/detect.h"
#include "modes/mode_keys.h"
#include "modes/rate_list.h"
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
    switch (config.windows) {
    case SIM_WINDOWS_95:
        platform = PLATFORM_9X;
        os_class = 3;
        break;
    case SIM_WINDOWS_98:
        platform = PLATFORM_9X;
        os_class = OS_CLASS_WIN98;
        break;
    default:
        platform = PLATFORM_NT;
        os_class = 3;
        break;
    }
}

void BootDefaultAndDetect()
{
    SimMachineConfig config;
    SimDefaultMachine(&config);
    BootMachine(config);
    DetectAdapters();
    RefreshAdapterModes(REFRESH_AT_STARTUP);
}
