// A booted Trio64V2 on Windows 98 in 1024x768, 16 bits, 75 Hz, with the CRT
// controller's retrace registers set to known values, an empty card key in
// the settings store and no text file.
#ifndef VISTREL_ADJUST_TEST_H
#define VISTREL_ADJUST_TEST_H

#include <gtest/gtest.h>
#include <stdint.h>
#include <windows.h>

#include "sim.h"

// Where the picture starts in every test.
struct CrtStart {
    uint8_t hblank;    // CR02
    uint8_t hretrace;  // CR04
    unsigned vblank;   // CR15 + CR07 bit 3 + CR09 bit 5
    unsigned vretrace; // CR10 + CR07 bits 2 and 7
    uint8_t cr11;
};

class AdjustTest : public ::testing::Test {
protected:
    void SetUp() override;
    void TearDown() override;
    // Writes a text file with these lines in [TASKBAR] and makes it the program's.
    void UseTexts(const char* lines);

    char ini_path[MAX_PATH] = "";
};

// Retrace a few units after blank, as modes have it.
CrtStart UsualCrt();
// Retrace far enough from blank for 21 steps each way, with bits 8 and 9 to carry.
CrtStart RoomyCrt();
// Puts the retrace registers where the test wants them, CR11 locked.
void SetCrt(const CrtStart& start);
uint8_t Crtc(uint16_t index);
void SetCrtc(uint16_t index, uint8_t value);
unsigned VerticalRetrace();
unsigned VerticalBlank();

// Default beeps asked for since SetUp.
extern int beep_count;

// The window class start-up registers, registered once for the tests.
void RegisterAdjustClass();

// The settings store's card key of the test adapter.
extern const char test_card_key[];
bool StoredValue(const char* name, int* value);

#endif
