// What the Windows 9x registry knows about the monitor on the current
// adapter: its device node under HKLM\Enum, found through the Config
// Manager's list of running devices, its EDID block and its driver's
// class key.
#ifndef VISTREL_MONITOR_INFO_H
#define VISTREL_MONITOR_INFO_H

#include <windows.h>
#include <stddef.h>

#include "base/adapters.h"

enum {
    MONITOR_LABEL_SIZE = 50,
    MONITOR_NAME_SIZE = 120,
    HARDWARE_KEY_SIZE = 120,
};

// With list, adds the monitor's lines to that list box; with type_label
// and type_name (MONITOR_LABEL_SIZE and MONITOR_NAME_SIZE bytes) instead,
// copies the "MoniType" label and the monitor's description there and adds
// nothing. 1 when every step was reached, 0 when a key could not be opened
// or a value the next step needs is missing (the lines added stay).
int FillMonitorInfo(HWND list, char* type_label, char* type_name);

// The hardware key of the current adapter's monitor as the Config Manager
// lists it, upper case, into HARDWARE_KEY_SIZE bytes; "" when none is
// listed. 0 when the Config Manager's list cannot be opened.
int FindMonitorKey(char* hardware_key);

// Pure parts.

// What marks a monitor key as the adapter's own: the adapter's ids and, for
// one of several identical cards, its bus and device.
struct MonitorOwner {
    bool windows98;  // only Windows 98 names a monitor after its adapter
    bool twin;
    char ids[24];   // "PCI_VEN_5333&DEV_8901"
    char slot[24];  // "BUS_00&DEV_0A"
};
void DescribeMonitorOwner(const AdapterRecord* adapter, bool windows98, MonitorOwner* owner);

enum MonitorKeyVerdict {
    MONITOR_KEY_PASS,       // not a monitor, or not better than the candidate
    MONITOR_KEY_CANDIDATE,  // the best so far; search on
    MONITOR_KEY_FOUND,      // the adapter's own monitor; stop
};
MonitorKeyVerdict JudgeMonitorKey(const char* upper_key, const MonitorOwner* owner, bool have_candidate);

// The sync ranges of a monitor mode's "Mode1" ("30.0-70.0,50.0-120.0,+,+"):
// "30.0-70.0 kHz" and "50.0-120.0 Hz", each cut at size - 1.
void SplitSyncRanges(const char* mode1, char* horizontal, char* vertical, size_t size);

#endif
