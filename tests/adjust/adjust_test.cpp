#include "adjust/adjust_test.h"

#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "adjust/adjust_window.h"
#include "adjust/position.h"
#include "hardware/adapters.h"
#include "shell/globals.h"
#include "shell/startup.h"

const char test_card_key[] = "SOFTWARE\\QUORVEL\\PANEL\\53338901";
int beep_count;

static const int test_card = 0;

static BOOL WINAPI CountBeep(UINT type)
{
    if (type == 0xFFFFFFFF) ++beep_count;
    return TRUE;
}

void RegisterAdjustClass()
{
    WNDCLASSEXA wc;
    if (GetClassInfoExA(GetModuleHandleA(NULL), adjust_window_class, &wc)) return;
    memset(&wc, 0, sizeof wc);
    wc.cbSize = sizeof wc;
    wc.style = CS_DBLCLKS;
    wc.lpfnWndProc = AdjustWindowProc;
    wc.hInstance = GetModuleHandleA(NULL);
    wc.hCursor = LoadCursorA(NULL, (LPCSTR)IDC_ARROW);
    wc.hbrBackground = (HBRUSH)GetStockObject(BLACK_BRUSH);
    wc.lpszClassName = adjust_window_class;
    RegisterClassExA(&wc);
}

bool StoredValue(const char* name, int* value)
{
    HKEY key;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, test_card_key, 0, KEY_READ, &key) != ERROR_SUCCESS) return false;
    // Stored without a terminating zero.
    char data[16];
    memset(data, 0, sizeof data);
    DWORD size = sizeof data - 1;
    LONG result = RegQueryValueExA(key, name, NULL, NULL, (BYTE*)data, &size);
    RegCloseKey(key);
    if (result != ERROR_SUCCESS) return false;
    *value = atoi(data);
    return true;
}

static void ForgetCardKey() { RegDeleteKeyA(HKEY_LOCAL_MACHINE, test_card_key); }

void AdjustTest::SetUp()
{
    SimMachineConfig config;
    SimDefaultMachine(&config);
    SimBoot(&config);

    platform = PLATFORM_9X;
    os_class = OS_CLASS_WIN98;
    instance = GetModuleHandleA(NULL);
    adapter_count = 1;
    current_adapter = 0;
    monitor_count = 1;
    AdapterRecord* a = &adapter_table[0];
    memset(a, 0, sizeof *a);
    a->vendor_id = 0x5333;
    a->device_id = 0x8901;
    a->devfn = 10 << 3;
    a->width = 1024;
    a->height = 768;
    a->bits_per_pixel = 16;
    a->refresh_hz = 75;
    a->chip_row = 15;

    char folder[MAX_PATH];
    GetTempPathA(sizeof folder, folder);
    snprintf(ini_path, sizeof ini_path, "%svistrel-adjust-%lu.ini", folder, GetCurrentProcessId());
    DeleteFileA(ini_path);
    snprintf(text_ini_path, sizeof text_ini_path, "%s", ini_path);

    ForgetCardKey();
    ResetAdjustOffsets();
    beep_count = 0;
    adjust_beep = CountBeep;
    RegisterAdjustClass();
    SetCrt(UsualCrt());
}

void AdjustTest::TearDown()
{
    ForgetCardKey();
    DeleteFileA(ini_path);
    adjust_beep = MessageBeep;
}

uint8_t Crtc(uint16_t index) { return SimReadRegister(test_card, SIM_REG_CRTC, index); }

void SetCrtc(uint16_t index, uint8_t value) { SimWriteRegister(test_card, SIM_REG_CRTC, index, value); }

unsigned VerticalRetrace()
{
    uint8_t overflow = Crtc(0x07);
    return Crtc(0x10) | (overflow & 0x04 ? 0x100 : 0) | (overflow & 0x80 ? 0x200 : 0);
}

unsigned VerticalBlank()
{
    return Crtc(0x15) | (Crtc(0x07) & 0x08 ? 0x100 : 0) | (Crtc(0x09) & 0x20 ? 0x200 : 0);
}

void SetCrt(const CrtStart& start)
{
    SetCrtc(0x02, start.hblank);
    SetCrtc(0x04, start.hretrace);
    // Overflow bits of the vertical total, display end and line compare
    // stay set, so that a step that disturbs them shows.
    uint8_t overflow = 0x01 | 0x02 | 0x10 | 0x20;
    if (start.vretrace & 0x100) overflow |= 0x04;
    if (start.vblank & 0x100) overflow |= 0x08;
    if (start.vretrace & 0x200) overflow |= 0x80;
    SetCrtc(0x07, overflow);
    SetCrtc(0x09, (uint8_t)(0x40 | (start.vblank & 0x200 ? 0x20 : 0)));
    SetCrtc(0x10, (uint8_t)start.vretrace);
    SetCrtc(0x15, (uint8_t)start.vblank);
    SetCrtc(0x11, start.cr11);
}

CrtStart UsualCrt() { return CrtStart{0x80, 0x84, 768, 771, 0x85}; }
CrtStart RoomyCrt() { return CrtStart{0x80, 0x98, 0x1E0, 0x1FF, 0x85}; }

void AdjustTest::UseTexts(const char* lines)
{
    FILE* f = fopen(ini_path, "w");
    ASSERT_TRUE(f != NULL);
    fprintf(f, "[TASKBAR]\n%s", lines);
    fclose(f);
}
