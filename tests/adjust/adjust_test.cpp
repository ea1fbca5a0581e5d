#include "adjust/adjust_test.h"

#include <stdlib.h>
#include <string.h>

#include <string>

#include "adjust/adjust_window.h"
#include "base/adapters.h"
#include "base/protocol.h"
#include "base/state.h"
#include "modes/position.h"
#include "shell/startup.h"
#include "support/machine.h"
#include "support/support.h"

static const char card_key[] = "SOFTWARE\\QUORVEL\\PANEL\\53338901";
int beep_count;

static BOOL WINAPI CountBeep(UINT type)
{
    if (type == 0xFFFFFFFF) ++beep_count;
    return TRUE;
}

bool StoredValue(const char* name, int* value)
{
    bool found = false;
    *value = atoi(ReadRegistryRaw(HKEY_LOCAL_MACHINE, card_key, name, &found).c_str());
    return found;
}

void AdjustTest::SetUp()
{
    SimMachineConfig config;
    SimDefaultMachine(&config);
    BootMachine(config);
    adapter_count = 1;
    monitor_count = 1;
    adapter_table[0] = AdapterRecord{0x5333, 0x8901, 0, 10 << 3, 16, 1024, 768, 75, 15, 0, 0, 0, ""};
    DeleteRegistryTree(HKEY_LOCAL_MACHINE, card_key);
    ResetAdjustOffsets();
    beep_count = 0;
    adjust_beep = CountBeep;

    WNDCLASSA wc;
    memset(&wc, 0, sizeof wc);
    wc.style = CS_DBLCLKS;
    wc.lpfnWndProc = AdjustWindowProc;
    wc.hInstance = instance;
    wc.hbrBackground = (HBRUSH)GetStockObject(BLACK_BRUSH);
    wc.lpszClassName = adjust_window_class;
    RegisterClassA(&wc);  // fails harmlessly from the second test on
    SetUsualCrt();
}

void AdjustTest::TearDown()
{
    DeleteRegistryTree(HKEY_LOCAL_MACHINE, card_key);
    adjust_beep = MessageBeep;
}

void AdjustTest::UseTexts(const char* lines) { WriteTextFile(text_ini_path, std::string("[TASKBAR]\n") + lines); }

uint8_t Crtc(uint16_t index) { return SimReadRegister(0, SIM_REG_CRTC, index); }
void SetCrtc(uint16_t index, uint8_t value) { SimWriteRegister(0, SIM_REG_CRTC, index, value); }

unsigned VerticalRetrace()
{
    uint8_t overflow = Crtc(0x07);
    return Crtc(0x10) | (overflow & 0x04 ? 0x100 : 0) | (overflow & 0x80 ? 0x200 : 0);
}

// CR07 keeps the vertical total, display end and line compare bits set, so
// that a step that disturbs them shows.
static void SetCrt(uint8_t hretrace, unsigned vblank, unsigned vretrace)
{
    SetCrtc(0x02, 0x80);
    SetCrtc(0x04, hretrace);
    uint8_t overflow = 0x33;
    if (vretrace & 0x100) overflow |= 0x04;
    if (vblank & 0x100) overflow |= 0x08;
    if (vretrace & 0x200) overflow |= 0x80;
    SetCrtc(0x07, overflow);
    SetCrtc(0x09, (uint8_t)(0x40 | (vblank & 0x200 ? 0x20 : 0)));
    SetCrtc(0x10, (uint8_t)vretrace);
    SetCrtc(0x15, (uint8_t)vblank);
    SetCrtc(0x11, 0x85);
}

void SetUsualCrt() { SetCrt(0x84, 768, 771); }
void SetRoomyCrt() { SetCrt(0x98, 0x1E0, 0x1FF); }
