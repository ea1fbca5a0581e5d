#include "modes/timing_list.h"

#include <windows.h>

#include "base/runtime.h"
#include "hardware/driver_key.h"

struct TimingValue {
    DWORD type;
    DWORD size;
    BYTE data[TIMING_VALUE_MAX];
};

// The values "1" up to the first one missing.
struct TimingList {
    int count;
    TimingValue values[TIMING_LIST_MAX];
};

static void ValueName(int number, char* out, size_t size) { FormatText(out, size, "%d", number); }

// False when a value cannot be read whole or the list is longer than we
// can put back.
static bool ReadTimingList(HKEY key, TimingList* list)
{
    list->count = 0;
    for (;;) {
        char name[12];
        ValueName(list->count + 1, name, sizeof name);
        TimingValue v;
        v.size = sizeof v.data;
        LONG r = RegQueryValueExA(key, name, NULL, &v.type, v.data, &v.size);
        if (r == ERROR_FILE_NOT_FOUND) return true;
        if (r != ERROR_SUCCESS || list->count == TIMING_LIST_MAX) return false;
        list->values[list->count++] = v;
    }
}

static bool WriteValue(HKEY key, int number, DWORD type, const BYTE* data, DWORD size)
{
    char name[12];
    ValueName(number, name, sizeof name);
    return RegSetValueExA(key, name, 0, type, data, size) == ERROR_SUCCESS;
}

// Puts value number back as the list had it.
static void RestoreValue(HKEY key, const TimingList* list, int number)
{
    if (number <= list->count) {
        const TimingValue* v = &list->values[number - 1];
        WriteValue(key, number, v->type, v->data, v->size);
        return;
    }
    char name[12];
    ValueName(number, name, sizeof name);
    RegDeleteValueA(key, name);
}

// The list's values move down from the last one up, so that every moment
// between two writes still holds each timing at least once; a failed write
// puts back what the earlier ones changed.
static bool WriteTimingList(HKEY key, const TimingList* list, const ChipTiming* timing, bool shift)
{
    int top = shift ? list->count + 1 : 1;
    for (int number = top; number >= 1; --number) {
        bool written = number == 1 ? WriteValue(key, 1, REG_BINARY, timing->record, CHIP_TIMING_SIZE)
                                   : WriteValue(key, number, list->values[number - 2].type,
                                                list->values[number - 2].data, list->values[number - 2].size);
        if (written) continue;
        for (int undo = number + 1; undo <= top; ++undo) RestoreValue(key, list, undo);
        return false;
    }
    return true;
}

int InstallTiming(int width, int height, const ChipTiming* timing)
{
    char subkey[40];
    FormatText(subkey, sizeof subkey, "\\DEFAULT\\TIMINGS\\%d,%d", width, height);
    HKEY key;
    if (OpenDriverSubkeyForUpdate(subkey, &key) != 1) return 0;
    static TimingList list;
    bool ok = ReadTimingList(key, &list);
    if (ok) {
        const TimingValue* first = &list.values[0];
        bool shift = list.count > 0 && first->size > 0 && timing->shift_above > first->data[0];
        ok = WriteTimingList(key, &list, timing, shift);
    }
    RegCloseKey(key);
    return ok ? 1 : 0;
}
