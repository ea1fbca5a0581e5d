#include "shell/commands.h"

#include "adjust/panning_dialog.h"
#include "base/adapters.h"
#include "base/module_reset.h"
#include "base/runtime.h"
#include "base/settings.h"
#include "base/state.h"
#include "base/texts.h"
#include "hardware/companions.h"
#include "hookkeep.h"
#include "pages/property_sheet.h"
#include "shell/tray_menu.h"

UINT(WINAPI* run_program)(LPCSTR command_line, UINT show) = WinExec;

static void ResetCommands() { run_program = WinExec; }
VISTREL_MODULE_RESET(ResetCommands);

enum {
    CAPTION_SIZE = 120,
    QUESTION_SIZE = 200,
    COMMAND_LINE_SIZE = 16 + MENU_TEXT_SIZE + INI_PATH_SIZE,
};

// The display applet on one of its tabs; the settings tab is "3".
static void OpenDisplayProperties(char tab)
{
    char command[] = "Control.exe desk.cpl @0,3";
    command[sizeof command - 2] = tab;
    run_program(command, SW_SHOW);
}

static void AskToClose(HWND window)
{
    char caption[CAPTION_SIZE], question[QUESTION_SIZE];
    LoadText("CAPTION", "Vistrel", caption, sizeof caption);
    LoadText("TBEnd", "Close this application will disable all the functions it supports. Do you want to close it ?",
             question, sizeof question);
    if (MessageBoxA(window, question, caption, MB_YESNO | MB_ICONEXCLAMATION | MB_DEFBUTTON2) == IDYES)
        DestroyWindow(window);
}

// loupe.exe "<its entry's label>" <text file>[ 2]: its title, the file of its
// own texts, and whether a second monitor is there.
static void StartZoomTool()
{
    const MenuItemRecord* entry = MenuRecordOfCommand(MENU_ZOOM);
    char command[COMMAND_LINE_SIZE];
    FormatText(command, sizeof command, "%s \"%s\" %s%s", "loupe.exe", entry ? entry->text : "", text_ini_path,
               monitor_count > 1 ? " 2" : "");
    run_program(command, SW_SHOW);
}

// Dispatches what arrives meanwhile, so that the menu is gone from the
// screen and the mouse has settled before the monitor changes its state.
static void SettleFor(DWORD ms)
{
    DWORD start = GetTickCount();
    for (;;) {
        MSG message;
        while (PeekMessageA(&message, NULL, 0, 0, PM_REMOVE)) {
            // The main loop must see the end of the program.
            if (message.message == WM_QUIT) {
                PostQuitMessage((int)message.wParam);
                return;
            }
            TranslateMessage(&message);
            DispatchMessageA(&message);
        }
        DWORD waited = GetTickCount() - start;
        if (waited > ms) return;
        MsgWaitForMultipleObjects(0, NULL, FALSE, ms - waited + 1, QS_ALLINPUT);
    }
}

static void EnterPowerState(DWORD state)
{
    SettleFor(POWER_SETTLE_MS);
    // An immediate state ends the timers: the Monitor page shows them off.
    SaveSetting(SETTING_STANDBY, -1);
    SaveSetting(SETTING_SUSPEND, -1);
    SaveSetting(SETTING_SHUTOFF, -1);
    keep_hook(NULL, state, 1, 0);
}

static int OpenAdapterPage(HWND window, UINT command, bool nested)
{
    int adapter = (int)(command - MENU_FIRST_PAGE) / MENU_PAGES_PER_ADAPTER;
    // Any process can send the command: an empty record would drive another
    // chip family's registers, and a second sheet would move current_adapter
    // under the pages of the first.
    if (adapter >= adapter_count || nested) return 0;
    current_adapter = (int16_t)adapter;
    OpenPropertySheet(instance, window, (int)(command - MENU_FIRST_PAGE) % MENU_PAGES_PER_ADAPTER);
    return 1;
}

static int RunCommand(HWND window, UINT command, bool nested)
{
    if (command >= MENU_FIRST_PAGE && command <= MENU_LAST_PAGE) return OpenAdapterPage(window, command, nested);
    switch (command) {
    case MENU_DISPLAY_PROPERTIES: OpenDisplayProperties('3'); return 1;
    case MENU_DISPLAY_TAB_0:
    case MENU_DISPLAY_TAB_0 + 1:
    case MENU_DISPLAY_TAB_0 + 2: OpenDisplayProperties((char)('0' + command - MENU_DISPLAY_TAB_0)); return 1;
    case MENU_DIRECTX_INFO: run_program("dxprobe.exe", SW_SHOW); return 1;
    case MENU_PANNING: {
        // No entry of the menu has this id: without one there is no title.
        const MenuItemRecord* entry = MenuRecordOfCommand(MENU_PANNING);
        if (entry) OpenPanningDialog(window, entry->text);
        return 1;
    }
    case MENU_READ_208: MenuRecordOfCommand(MENU_READ_208); return 1;
    case MENU_CLOSE: AskToClose(window); return 1;
    case MENU_ZOOM: StartZoomTool(); return 1;
    case MENU_STANDBY: EnterPowerState(KEEP_STATE_STANDBY); return 1;
    case MENU_SUSPEND: EnterPowerState(KEEP_STATE_SUSPEND); return 1;
    case MENU_SHUTOFF: EnterPowerState(KEEP_STATE_OFF); return 1;
    }
    return 0;  // Minimize (the menu has closed, which is all it does) and anything else
}

int OnMenuCommand(HWND window, UINT command)
{
    // A command that arrives inside another's message loop (the sheet's, a
    // question's) leaves the flag to the one that set it.
    bool outermost = !(shell_state & STATE_COMMAND_RUNNING);
    shell_state |= STATE_COMMAND_RUNNING;
    int handled = RunCommand(window, command, !outermost);
    if (outermost) shell_state &= ~STATE_COMMAND_RUNNING;
    last_activity_tick = GetTickCount();
    return handled;
}
