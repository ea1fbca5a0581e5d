// A booted Trio64V2 on Windows 98 in 1024x768, 16 bits, 75 Hz, with known
// retrace registers (CR11 locked), no stored position and no text file.
#ifndef VISTREL_ADJUST_TEST_H
#define VISTREL_ADJUST_TEST_H

#include <gtest/gtest.h>
#include <windows.h>

#include "adjust/adjust_window.h"
#include "base/adapters.h"
#include "base/protocol.h"
#include "base/state.h"
#include "modes/position.h"
#include "sim.h"
#include "support/machine.h"
#include "support/support.h"

inline const char adjust_card_key[] = "SOFTWARE\\QUORVEL\\PANEL\\53338901";
inline int beep_count;  // default beeps since SetUp

inline uint8_t Crtc(uint16_t index) { return SimReadRegister(0, SIM_REG_CRTC, index); }
inline void SetCrtc(uint16_t index, uint8_t value) { SimWriteRegister(0, SIM_REG_CRTC, index, value); }
inline unsigned VerticalRetrace()
{
    return Crtc(0x10) | (Crtc(0x07) & 0x04 ? 0x100 : 0) | (Crtc(0x07) & 0x80 ? 0x200 : 0);
}

// CR02, CR04, CR07, CR09, CR10, CR15; CR07 keeps the vertical total, display
// end and line compare bits set, so that a step that disturbs them shows.
inline void SetCrt(std::initializer_list<uint8_t> values)
{
    const uint8_t* value = values.begin();
    for (uint16_t index : {0x02, 0x04, 0x07, 0x09, 0x10, 0x15}) SetCrtc(index, *value++);
    SetCrtc(0x11, 0x85);
}
// Horizontal blank start 0x80, retrace start 0x84; vertical blank start 768,
// retrace start 771 (bits 8 and 9 in the overflow registers).
inline void SetUsualCrt() { SetCrt({0x80, 0x84, 0xBF, 0x60, 0x03, 0x00}); }
// Room for 21 steps each way: horizontal retrace 0x98, vertical blank 0x1E0
// and retrace 0x1FF, so that a step up carries into bit 9.
inline void SetRoomyCrt() { SetCrt({0x80, 0x98, 0x3F, 0x40, 0xFF, 0xE0}); }

// A value of the test card's key in the settings store.
inline bool StoredValue(const char* name, int* value)
{
    bool found = false;
    *value = atoi(ReadRegistryRaw(HKEY_LOCAL_MACHINE, adjust_card_key, name, &found).c_str());
    return found;
}

class AdjustTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        SimMachineConfig config;
        SimDefaultMachine(&config);
        BootMachine(config);
        adapter_count = monitor_count = 1;
        adapter_table[0] = AdapterRecord{0x5333, 0x8901, 0, 10 << 3, 16, 1024, 768, 75, 15, 0, 0, 0, ""};
        DeleteRegistryTree(HKEY_LOCAL_MACHINE, adjust_card_key);
        ResetAdjustOffsets();
        beep_count = 0;
        adjust_beep = [](UINT type) WINAPI -> BOOL { beep_count += type == 0xFFFFFFFF; return TRUE; };
        WNDCLASSA wc = {CS_DBLCLKS, AdjustWindowProc, 0, 0, instance, NULL, NULL,
                        (HBRUSH)GetStockObject(BLACK_BRUSH), NULL, adjust_window_class};
        RegisterClassA(&wc);  // fails harmlessly from the second test on
        SetUsualCrt();
    }
    void TearDown() override { DeleteRegistryTree(HKEY_LOCAL_MACHINE, adjust_card_key); }
};

#endif
