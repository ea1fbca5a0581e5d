// The settings store: whole numbers kept as decimal text in the registry,
// one key for the program and one per kind of card.
#ifndef VISTREL_SETTINGS_H
#define VISTREL_SETTINGS_H

#include <stdint.h>

enum SettingId {
    SETTING_RESET = 1,
    SETTING_REFRESH = 3,
    SETTING_WIDTH = 4,
    SETTING_HEIGHT = 5,
    SETTING_BITS = 6,
    SETTING_POSITION_H = 7,
    SETTING_POSITION_V = 8,
    SETTING_STANDBY = 10,
    SETTING_SUSPEND = 11,
    SETTING_SHUTOFF = 12,
    SETTING_MCLK = 14,
    SETTING_MCLK_DEFAULT = 15,
};

extern const char settings_program_key[];

// The stored value, or -1 when it cannot be read.
int32_t LoadSetting(int id);
// Stores the value (ids 7 and 8: a value below 1 deletes it). The value, or -1.
// SETTING_RESET erases the whole store.
int32_t SaveSetting(int id, int32_t value);
// Erases every card key and the power-saving timers.
void ResetSettings();

#endif
