// The Monitor page in the real sheet: the power-saving timers against the
// calls the hook library gets, the picture buttons, and what the simulated
// machine's registry tells about its monitor.
#include <gtest/gtest.h>
#include <windows.h>

#include <commctrl.h>
#include <prsht.h>

#include "adjust/adjust_window.h"
#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/protocol.h"
#include "base/resource_ids.h"
#include "base/settings.h"
#include "base/state.h"
#include "base/texts.h"
#include "hardware/companions.h"
#include "modes/detect.h"
#include "modes/position.h"
#include "pages/monitor_info.h"
#include "pages/sheet_driver.h"
#include "support/machine.h"
#include "support/support.h"

namespace {

struct HookCall {
    HWND window;
    DWORD state, enable, minutes;
    bool operator==(const HookCall&) const = default;
};
std::vector<HookCall> keep_calls;

DWORD WINAPI RecordKeepCall(HWND window, DWORD state, DWORD enable, DWORD minutes)
{
    keep_calls.push_back({window, state, enable, minutes});
    return 1;
}

class MonitorPageTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        BootDefaultAndDetect();
        ClearSettingsStore();
        keep_hook = RecordKeepCall;
        keep_calls.clear();
    }
    void TearDown() override
    {
        ClearSettingsStore();
        ResetAllModules();
    }
};

struct TimerControls {
    int check, edit, spin;
};
const TimerControls standby = {IDC_MONITOR_STANDBY_CHECK, IDC_MONITOR_STANDBY_EDIT, IDC_MONITOR_STANDBY_SPIN};
const TimerControls suspend = {IDC_MONITOR_SUSPEND_CHECK, IDC_MONITOR_SUSPEND_EDIT, IDC_MONITOR_SUSPEND_SPIN};
const TimerControls shutoff = {IDC_MONITOR_SHUTOFF_CHECK, IDC_MONITOR_SHUTOFF_EDIT, IDC_MONITOR_SHUTOFF_SPIN};

void ExpectTimer(HWND page, const TimerControls& t, bool on, const char* minutes)
{
    EXPECT_EQ(on ? BST_CHECKED : BST_UNCHECKED, IsDlgButtonChecked(page, t.check)) << t.check;
    EXPECT_EQ(on, (bool)IsWindowEnabled(GetDlgItem(page, t.edit))) << t.edit;
    EXPECT_EQ(on, (bool)IsWindowEnabled(GetDlgItem(page, t.spin))) << t.spin;
    EXPECT_EQ(minutes, ControlText(page, t.edit)) << t.edit;
}

void Click(HWND sheet, int id) { SendMessageA(GetDlgItem(CurrentPage(sheet), id), BM_CLICK, 0, 0); }

TEST_F(MonitorPageTest, TimersAreStoredAndHandedToTheHookLibraryOnApply)
{
    SaveSetting(SETTING_SUSPEND, 100);
    SaveSetting(SETTING_SHUTOFF, -1);
    const std::vector<HookCall> none;
    RunSheet(PAGE_MONITOR, {
        [](HWND sheet) {
            HWND page = CurrentPage(sheet);
            ExpectTimer(page, standby, false, "1");
            ExpectTimer(page, suspend, true, "100");
            ExpectTimer(page, shutoff, false, "1");
            Click(sheet, IDC_MONITOR_STANDBY_CHECK);
            ExpectTimer(page, standby, true, "1");
            EXPECT_TRUE(ApplyEnabled(sheet));
            // Leaving the page and coming back applies nothing.
            PropSheet_SetCurSel(sheet, NULL, PAGE_DESKTOP);
            PropSheet_SetCurSel(sheet, NULL, PAGE_MONITOR);
            EXPECT_TRUE(keep_calls.empty());
            PressSheetButton(sheet, PSBTN_APPLYNOW);
        },
        [&](HWND sheet) {
            EXPECT_EQ(1, LoadSetting(SETTING_STANDBY));
            EXPECT_EQ(std::vector<HookCall>({{NULL, 1, 1, 1}}), keep_calls);
            EXPECT_FALSE(ApplyEnabled(sheet));
            keep_calls.clear();
            PressSheetButton(sheet, PSBTN_APPLYNOW);
        },
        [&](HWND sheet) {
            EXPECT_EQ(none, keep_calls) << "nothing changed";
            // The arrow key of the up-down alone changes the number, not the page.
            SendMessageA(GetDlgItem(CurrentPage(sheet), IDC_MONITOR_STANDBY_EDIT), WM_KEYDOWN, VK_UP, 0);
            SendMessageA(GetDlgItem(CurrentPage(sheet), IDC_MONITOR_SUSPEND_EDIT), WM_KEYDOWN, VK_UP, 0);
            EXPECT_EQ("2", ControlText(CurrentPage(sheet), IDC_MONITOR_STANDBY_EDIT));
            EXPECT_EQ("100", ControlText(CurrentPage(sheet), IDC_MONITOR_SUSPEND_EDIT)) << "the longest timer";
            EXPECT_FALSE(ApplyEnabled(sheet));
            Click(sheet, IDC_MONITOR_SUSPEND_CHECK);
            ExpectTimer(CurrentPage(sheet), suspend, false, "100");
            PressSheetButton(sheet, PSBTN_APPLYNOW);
        },
        [&](HWND sheet) {
            EXPECT_EQ(2, LoadSetting(SETTING_STANDBY));
            EXPECT_EQ(-1, LoadSetting(SETTING_SUSPEND));
            EXPECT_EQ(-1, LoadSetting(SETTING_SHUTOFF));
            EXPECT_EQ(std::vector<HookCall>({{NULL, 1, 1, 2}, {NULL, 2, 0, 0}}), keep_calls);
        },
    });
}

// Windows NT keeps nothing about the monitor: a picture stands in for the
// list. Without picture moving both of its buttons are off; with it Adjust
// opens the adjustment window over the sheet and Default forgets the mode's
// position.
TEST_F(MonitorPageTest, SystemAndAdapterDecideWhatThePageOffers)
{
    WNDCLASSA wc = {};
    wc.lpfnWndProc = AdjustWindowProc;
    wc.hInstance = instance;
    wc.lpszClassName = adjust_window_class;
    RegisterClassA(&wc);
    static const struct {
        int windows;
        uint32_t flags;
        bool list, adjust;
    } cases[] = {
        {SIM_WINDOWS_98, 0, true, true},
        {SIM_WINDOWS_NT4, ADAPTER_NO_ADJUST, false, false},
    };
    for (const auto& c : cases) {
        BootMachine(Machine(c.windows, {Card(0x5333, 0x8901)}));
        DetectAdapters();
        CurrentAdapter()->flags |= c.flags;
        SaveSetting(SETTING_POSITION_H, 0x90);
        adjust_offset_h = 3;
        RunSheet(PAGE_MONITOR, {[&](HWND sheet) {
            HWND page = CurrentPage(sheet);
            EXPECT_EQ(0, adjust_offset_h) << "offsets of an earlier visit are not undone again";
            EXPECT_EQ(c.list, (bool)IsWindowVisible(GetDlgItem(page, IDC_MONITOR_LIST))) << c.windows;
            EXPECT_EQ(c.list, (bool)IsWindowVisible(GetDlgItem(page, IDC_MONITOR_INFO_GROUP))) << c.windows;
            EXPECT_EQ(!c.list, (bool)IsWindowVisible(GetDlgItem(page, IDC_MONITOR_NT_PICTURE))) << c.windows;
            if (c.list) EXPECT_EQ("        DELL D1028L", ListLines(GetDlgItem(page, IDC_MONITOR_LIST)).at(1));
            EXPECT_EQ(c.adjust, (bool)IsWindowEnabled(GetDlgItem(page, IDC_MONITOR_ADJUST))) << c.windows;
            EXPECT_EQ(c.adjust, (bool)IsWindowEnabled(GetDlgItem(page, IDC_MONITOR_DEFAULT))) << c.windows;
            if (!c.adjust) return;
            Click(sheet, IDC_MONITOR_ADJUST);
            HWND adjust = FindWindowA(adjust_window_class, NULL);
            EXPECT_TRUE(adjust && GetWindow(adjust, GW_OWNER) == sheet);
            DestroyWindow(adjust);
            Click(sheet, IDC_MONITOR_DEFAULT);
            EXPECT_EQ(-1, LoadSetting(SETTING_POSITION_H));
        }});
    }
}

// The default machine's monitor, a Dell D1028L, read off its EDID by hand.
const std::vector<std::string> monitor_lines = {
    "Monitor Type", "        DELL D1028L", "Manufacturer", "        Dell",
};
const std::vector<std::string> edid_lines = {
    "Year of Manufacture :", "        1998", "Max H. Image Size(cm) :", "        30",
    "Max V. Image Size(cm) :", "        23", "DPMS Support :", "        Stand By", "        Suspend",
    "        Shutoff", "Resolution Support :", "        640 x 480 60Hz", "        640 x 480 75Hz",
    "        800 x 600 60Hz", "        800 x 600 75Hz", "        1024 x 768 60Hz", "        1024 x 768 75Hz",
    "        1024 x 768 85Hz", "        800 x 600 85Hz", "        1280 x 1024 60Hz", "        640 x 480 85Hz",
};
const std::vector<std::string> driver_lines = {
    "Max Resolution", "        1280,1024", "Horizontal Sync", "        30.0-69.0 kHz",
    "Vertical Sync", "        48.0-120.0 Hz",
};

std::string MonitorNode()
{
    char key[HARDWARE_KEY_SIZE];
    FindMonitorKey(key);
    return std::string("Enum\\") + key;
}

void CutEdid()
{
    std::string edid = ReadRegistryRaw(HKEY_LOCAL_MACHINE, MonitorNode(), "EDID");
    HKEY key;
    ASSERT_EQ(ERROR_SUCCESS, RegOpenKeyExA(HKEY_LOCAL_MACHINE, MonitorNode().c_str(), 0, KEY_SET_VALUE, &key));
    RegSetValueExA(key, "EDID", 0, REG_BINARY, (const BYTE*)edid.data(), 40);
    RegCloseKey(key);
}

void DropMode1()
{
    std::string driver = ReadRegistryRaw(HKEY_LOCAL_MACHINE, MonitorNode(), "Driver");
    DeleteRegistryTree(HKEY_LOCAL_MACHINE,
                       "System\\CurrentControlSet\\Services\\Class\\" + std::string(driver.c_str()) + "\\MODES");
}

std::vector<std::string> Join(std::initializer_list<std::vector<std::string>> parts)
{
    std::vector<std::string> all;
    for (const auto& p : parts) all.insert(all.end(), p.begin(), p.end());
    return all;
}

TEST_F(MonitorPageTest, MonitorListFromTheRegistry)
{
    const std::vector<std::string> max_only(driver_lines.begin(), driver_lines.begin() + 2);
    const SimCardConfig trio = Card(0x5333, 0x8901);
    SimCardConfig without_monitor = trio;
    without_monitor.display_device = false;
    const struct {
        int windows;
        SimCardConfig card;
        void (*change)();
        std::vector<std::string> lines;
        int result;
        const char* name;
    } cases[] = {
        {SIM_WINDOWS_98, trio, NULL, Join({monitor_lines, edid_lines, driver_lines}), 1, "DELL D1028L"},
        // Windows 95 names its monitor after no adapter.
        {SIM_WINDOWS_95, trio, NULL, Join({monitor_lines, edid_lines, driver_lines}), 1, "DELL D1028L"},
        {SIM_WINDOWS_98, trio, CutEdid, Join({monitor_lines, driver_lines}), 1, "DELL D1028L"},
        {SIM_WINDOWS_98, trio, DropMode1, Join({monitor_lines, edid_lines, max_only}), 0, "DELL D1028L"},
        {SIM_WINDOWS_98, without_monitor, NULL,
         {"Monitor Type", "        Unknown", "Manufacturer", "        Unknown"}, 0, "Unknown"},
    };
    HWND list = CreateWindowA("LISTBOX", "", WS_POPUP, 0, 0, 200, 200, NULL, NULL, NULL, NULL);
    for (const auto& c : cases) {
        BootMachine(Machine(c.windows, {c.card}));
        DetectAdapters();
        if (c.change) ASSERT_NO_FATAL_FAILURE(c.change());
        SendMessageA(list, LB_RESETCONTENT, 0, 0);
        EXPECT_EQ(c.result, FillMonitorInfo(list, NULL, NULL)) << c.windows;
        EXPECT_EQ(c.lines, ListLines(list)) << c.windows;

        char label[MONITOR_LABEL_SIZE], name[MONITOR_NAME_SIZE];
        memset(label, '#', sizeof label);
        memset(name, '#', sizeof name);
        SendMessageA(list, LB_RESETCONTENT, 0, 0);
        EXPECT_EQ(1, FillMonitorInfo(list, label, name));
        EXPECT_STREQ("Monitor Type", label);
        EXPECT_STREQ(c.name, name);
        EXPECT_EQ(0, SendMessageA(list, LB_GETCOUNT, 0, 0));
    }
    DestroyWindow(list);
}

// Of two identical cards each finds its own monitor by bus and device.
TEST_F(MonitorPageTest, TwinCardsFindTheirOwnMonitors)
{
    BootMachine(Machine(SIM_WINDOWS_98, {Card(0x5333, 0x8901, 0, 10), Card(0x5333, 0x8901, 0, 11)}));
    adapter_count = 2;
    for (int16_t adapter : {0, 1}) {
        adapter_table[adapter] = {.vendor_id = 0x5333, .device_id = 0x8901, .devfn = (uint8_t)((10 + adapter) << 3),
                                  .flags = ADAPTER_TWIN};
    }
    for (int16_t adapter : {0, 1}) {
        current_adapter = adapter;
        char key[HARDWARE_KEY_SIZE];
        memset(key, '#', sizeof key);
        ASSERT_EQ(1, FindMonitorKey(key));
        EXPECT_TRUE(strstr(key, adapter ? "BUS_00&DEV_0B" : "BUS_00&DEV_0A")) << key;
    }
}

TEST(MonitorInfo, KeysOfOtherAdaptersAndSystems)
{
    MonitorOwner owner = {.windows98 = true, .twin = false, .ids = "PCI_VEN_5333&DEV_8901", .slot = "BUS_00&DEV_0A"};
    const char ours[] = "MONITOR\\DEL730B\\PCI_VEN_5333&DEV_8901&SUBSYS_00000000&REV_16_BUS_00&DEV_0A&FUNC_00";
    static const struct {
        const char* key;
        bool windows98, have_candidate;
        MonitorKeyVerdict verdict;
    } cases[] = {
        {ours, true, true, MONITOR_KEY_FOUND},
        {ours, false, true, MONITOR_KEY_PASS},
        {ours, false, false, MONITOR_KEY_CANDIDATE},
        {"MONITOR\\DEL730B\\PCI_VEN_10DE&DEV_0020&SUBSYS_00000000&REV_04_BUS_01&DEV_00&FUNC_00", true, true,
         MONITOR_KEY_PASS},
        {"ROOT\\MONITOR\\0000", true, true, MONITOR_KEY_CANDIDATE},
    };
    for (const auto& c : cases) {
        owner.windows98 = c.windows98;
        EXPECT_EQ(c.verdict, JudgeMonitorKey(c.key, &owner, c.have_candidate)) << c.key << " " << c.windows98;
    }
}

TEST(MonitorInfo, SyncRangesOfMode1)
{
    static const struct {
        const char* mode1;
        const char* horizontal;
        const char* vertical;
    } cases[] = {
        {"30.0-70.0,50.0-120.0,+,+", "30.0-70.0 kHz", "50.0-120.0 Hz"},
        {"31.5,60", "31.5 kHz", "60 Hz"},
        {"31.5", "31.5 kHz", " Hz"},
    };
    for (const auto& c : cases) {
        char horizontal[32], vertical[32];
        memset(horizontal, '#', sizeof horizontal);
        memset(vertical, '#', sizeof vertical);
        SplitSyncRanges(c.mode1, horizontal, vertical, sizeof horizontal);
        EXPECT_STREQ(c.horizontal, horizontal) << c.mode1;
        EXPECT_STREQ(c.vertical, vertical) << c.mode1;
    }
}

}  // namespace
