// A booted Trio64V2 on Windows 98 in 1024x768, 16 bits, 75 Hz, with known
// retrace registers (CR11 locked), no stored position and no text file.
#ifndef VISTREL_ADJUST_TEST_H
#define VISTREL_ADJUST_TEST_H

#include <gtest/gtest.h>
#include <stdint.h>
#include <windows.h>

#include "sim.h"

class AdjustTest : public ::testing::Test {
protected:
    void SetUp() override;
    void TearDown() override;
    // Writes these [TASKBAR] lines into the program's text file.
    void UseTexts(const char* lines);
};

// Horizontal blank start 0x80 and retrace start 0x84; vertical blank start
// 768, retrace start 771 (bits 8 and 9 in the overflow registers).
void SetUsualCrt();
// Room for 21 steps each way: horizontal retrace 0x98, vertical blank 0x1E0
// and retrace 0x1FF, so that a step up carries into bit 9.
void SetRoomyCrt();
uint8_t Crtc(uint16_t index);
void SetCrtc(uint16_t index, uint8_t value);
unsigned VerticalRetrace();

extern int beep_count;  // default beeps since SetUp
// A value of the test card's key in the settings store.
bool StoredValue(const char* name, int* value);

#endif
