// The Monitor page: moving the picture, the power-saving timers the hook
// library runs, and what the registry knows about the monitor.
#include <windows.h>

#include <commctrl.h>
#include <prsht.h>

#include "adjust/adjust_window.h"
#include "base/adapters.h"
#include "base/resource_ids.h"
#include "base/settings.h"
#include "base/state.h"
#include "chips/chips.h"
#include "hardware/companions.h"
#include "modes/position.h"
#include "pages/monitor_info.h"
#include "pages/pages.h"
#include "pages/property_sheet.h"

enum { TEXT_SIZE = 50, FIRST_MINUTES = 1, LAST_MINUTES = 100 };

static HWND animation;

static const PageText monitor_texts[] = {
    {IDC_MONITOR_ADJUST_GROUP, "AdjustGrp", "Screen Adjustment", TEXT_SIZE},
    {IDC_MONITOR_ADJUST, "AdjustBtn", "Adjust", TEXT_SIZE},
    {IDC_MONITOR_DEFAULT, "DefaultBtn", "Default", TEXT_SIZE},
    {IDC_MONITOR_POWER_GROUP, "PowerGrp", "Power Saving", TEXT_SIZE},
    {IDC_MONITOR_STANDBY_CHECK, "DPMSStandby", "Stand By", TEXT_SIZE},
    {IDC_MONITOR_SUSPEND_CHECK, "DPMSSuspend", "Suspend", TEXT_SIZE},
    {IDC_MONITOR_SHUTOFF_CHECK, "DPMSShutoff", "Shutoff", TEXT_SIZE},
    {IDC_MONITOR_STANDBY_UNIT, "Minute", "minutes", TEXT_SIZE},
    {IDC_MONITOR_SUSPEND_UNIT, "Minute", "minutes", TEXT_SIZE},
    {IDC_MONITOR_SHUTOFF_UNIT, "Minute", "minutes", TEXT_SIZE},
    {IDC_MONITOR_INFO_GROUP, "MonitorGrp", "Monitor Information", TEXT_SIZE},
};

// A timer is on with the stored minutes (0 or more), off when -1 is stored
// or nothing; the hook library numbers its states as the DPMS commands.
struct PowerTimer {
    int setting;
    int check, edit, spin;
    DWORD state;
};
static const PowerTimer power_timers[] = {
    {.setting = SETTING_STANDBY, .check = IDC_MONITOR_STANDBY_CHECK, .edit = IDC_MONITOR_STANDBY_EDIT,
     .spin = IDC_MONITOR_STANDBY_SPIN, .state = CMD_DPMS_STANDBY},
    {.setting = SETTING_SUSPEND, .check = IDC_MONITOR_SUSPEND_CHECK, .edit = IDC_MONITOR_SUSPEND_EDIT,
     .spin = IDC_MONITOR_SUSPEND_SPIN, .state = CMD_DPMS_SUSPEND},
    {.setting = SETTING_SHUTOFF, .check = IDC_MONITOR_SHUTOFF_CHECK, .edit = IDC_MONITOR_SHUTOFF_EDIT,
     .spin = IDC_MONITOR_SHUTOFF_SPIN, .state = CMD_DPMS_OFF},
};
static const int32_t timer_off = -1;

static void ShowTimer(HWND page, const PowerTimer& timer, bool on)
{
    CheckDlgButton(page, timer.check, on ? BST_CHECKED : BST_UNCHECKED);
    EnableWindow(GetDlgItem(page, timer.edit), on);
    EnableWindow(GetDlgItem(page, timer.spin), on);
}

static void ShowMonitorInfo(HWND page)
{
    if (platform == PLATFORM_9X) {
        FillMonitorInfo(GetDlgItem(page, IDC_MONITOR_LIST), NULL, NULL);
        return;
    }
    // Windows NT keeps nothing about the monitor that the page could show.
    ShowWindow(GetDlgItem(page, IDC_MONITOR_NT_PICTURE), SW_SHOW);
    ShowWindow(GetDlgItem(page, IDC_MONITOR_INFO_GROUP), SW_HIDE);
    ShowWindow(GetDlgItem(page, IDC_MONITOR_LIST), SW_HIDE);
}

// The picture control loaded its bitmap from the template but does not
// delete it when it goes: take it back and delete it here.
static void FreePicture(HWND page)
{
    HGDIOBJ picture = (HGDIOBJ)SendDlgItemMessageA(page, IDC_MONITOR_NT_PICTURE, STM_SETIMAGE, IMAGE_BITMAP, 0);
    if (picture) DeleteObject(picture);
}

static void OnInitDialog(HWND page)
{
    if (CurrentAdapter()->flags & ADAPTER_NO_ADJUST) {
        EnableWindow(GetDlgItem(page, IDC_MONITOR_ADJUST), FALSE);
        EnableWindow(GetDlgItem(page, IDC_MONITOR_DEFAULT), FALSE);
    }
    SetPageTexts(page, monitor_texts, sizeof monitor_texts / sizeof monitor_texts[0]);
    ShowMonitorInfo(page);
    for (const PowerTimer& timer : power_timers) {
        SetDlgItemInt(page, timer.edit, FIRST_MINUTES, FALSE);
        SendDlgItemMessageA(page, timer.spin, UDM_SETRANGE, 0, MAKELPARAM(LAST_MINUTES, FIRST_MINUTES));
        int32_t minutes = LoadSetting(timer.setting);
        if (minutes < 0) continue;
        ShowTimer(page, timer, true);
        SetDlgItemInt(page, timer.edit, (UINT)minutes, FALSE);
    }
    ResetAdjustOffsets();
}

static void OnCommand(HWND page, int id)
{
    if (id == IDC_MONITOR_ADJUST) {
        OpenAdjustWindow(page);
        return;
    }
    if (id == IDC_MONITOR_DEFAULT) {
        ResetPosition();
        return;
    }
    for (const PowerTimer& timer : power_timers) {
        if (id != timer.check) continue;
        PropSheet_Changed(GetParent(page), page);
        ShowTimer(page, timer, IsDlgButtonChecked(page, timer.check) != BST_CHECKED);
    }
}

// Stores what the page shows and tells the hook library what changed.
static void ApplyTimer(HWND page, const PowerTimer& timer)
{
    int32_t stored = LoadSetting(timer.setting);
    if (IsDlgButtonChecked(page, timer.check) == BST_CHECKED) {
        UINT minutes = GetDlgItemInt(page, timer.edit, NULL, FALSE);
        if ((int32_t)minutes == stored) return;
        SaveSetting(timer.setting, (int32_t)minutes);
        if (minutes) keep_hook(NULL, timer.state, 1, minutes);
        else keep_hook(NULL, timer.state, 0, 0);
    } else if (stored >= 0) {
        SaveSetting(timer.setting, timer_off);
        keep_hook(NULL, timer.state, 0, 0);
    }
}

static void OnApply(HWND page)
{
    PropSheet_UnChanged(GetParent(page), page);
    for (const PowerTimer& timer : power_timers) ApplyTimer(page, timer);
    SetWindowLongPtrA(page, DWLP_MSGRESULT, PSNRET_NOERROR);
}

INT_PTR CALLBACK MonitorPageProc(HWND page, UINT message, WPARAM wparam, LPARAM lparam)
{
    AnimatePage(page, message, lparam, IDC_MONITOR_FRAME, &animation);
    switch (message) {
    case WM_INITDIALOG: OnInitDialog(page); return TRUE;
    case WM_COMMAND: OnCommand(page, LOWORD(wparam)); return TRUE;
    case WM_DESTROY: FreePicture(page); return FALSE;
    case WM_NOTIFY:
        if (((const NMHDR*)lparam)->code != (UINT)PSN_APPLY) return FALSE;
        OnApply(page);
        return TRUE;
    }
    return FALSE;
}
