// Simulated machines built in code for the unit tests.
#ifndef VISTREL_TEST_MACHINE_H
#define VISTREL_TEST_MACHINE_H

#include <initializer_list>

#include "sim.h"

SimCardConfig Card(uint16_t vendor_id, uint16_t device_id, uint8_t bus = 0, uint8_t device = 10);
SimMachineConfig Machine(int windows, std::initializer_list<SimCardConfig> cards);
// Boots the machine and gives the program a fresh state on that Windows.
void BootMachine(const SimMachineConfig& config);
// Boots the default machine (one Trio64V2) on that Windows, detects its one
// card and reads its mode; asserts, so call it through ASSERT_NO_FATAL_FAILURE.
void BootDefaultAndDetect(int windows = SIM_WINDOWS_98);

#endif
