// The Desktop page's Apply: the mode change with its confirmation, the way
// back to the old mode, and the offer to restart Windows.
#include "pages/desktop_apply.h"

#include "base/adapters.h"
#include "base/state.h"
#include "base/texts.h"
#include "hardware/companions.h"
#include "hardware/driver_key.h"
#include "hardware/shutdown.h"
#include "modes/mode_change.h"

enum { TITLE_SIZE = 40, MESSAGE_SIZE = 255 };

static int AskUser(HWND owner, const char* key, const char* fallback, UINT style)
{
    char title[TITLE_SIZE], text[MESSAGE_SIZE];
    LoadText("DispChgTle", "Change Display Mode", title, sizeof title);
    LoadText(key, fallback, text, sizeof text);
    return MessageBoxA(owner, text, title, style);
}

static int OfferRestart(HWND owner)
{
    if (AskUser(owner, "RestartMsg",
                "You need to restart windows to change settings. Do you want to restart now?",
                MB_OKCANCEL | MB_ICONQUESTION) != IDOK)
        return 1;
    if (platform == PLATFORM_NT) {
        EnableShutdownPrivilege();
        restart_windows(EWX_REBOOT, 0);
    } else {
        GateRestart();
    }
    return 1;
}

int ApplyDesktopPage(HWND page, DesktopSelection* selection)
{
    const AdapterRecord* a = CurrentAdapter();
    DesktopSelection before;
    before.bits = a->bits_per_pixel;
    before.width = a->width;
    before.height = a->height;
    before.refresh = a->refresh_hz;
    HDC dc = GetDC(page);
    before.dpi_x = GetDeviceCaps(dc, LOGPIXELSX);
    before.dpi_y = GetDeviceCaps(dc, LOGPIXELSY);
    ReleaseDC(page, dc);
    if (platform == PLATFORM_NT && before.bits == 16 && NtDefaultBits() == 15) before.bits = 15;

    DWORD mask = 0;
    if (selection->bits != before.bits) mask |= DM_BITSPERPEL;
    if (selection->width != before.width) mask |= DM_PELSWIDTH;
    if (selection->height != before.height) mask |= DM_PELSHEIGHT;
    if (selection->dpi_x != before.dpi_x || selection->dpi_y != before.dpi_y) mask |= DM_LOGPIXELS;
    if (selection->refresh != before.refresh) mask |= DM_DISPLAYFREQUENCY;
    if (!mask) return 0;

    LONG r = ApplyDisplayMode(page, mask, selection->width, selection->height, selection->bits, selection->dpi_x,
                              selection->dpi_y, selection->refresh);
    if (r != DISP_CHANGE_SUCCESSFUL && r != DISP_CHANGE_RESTART) {
        AskUser(page, "ChangeErr", "Cannot change to the specified display mode!", MB_ICONHAND);
        return 0;
    }
    if (r == DISP_CHANGE_RESTART || mask == DM_LOGPIXELS) return OfferRestart(page);
    if (AskUser(page, "DispConfirm", "Do you want to keep this settings?",
                MB_OKCANCEL | MB_ICONQUESTION | MB_DEFBUTTON2) == IDOK) {
        if (mask & DM_LOGPIXELS) return OfferRestart(page);
        return 1;
    }
    *selection = before;
    ApplyDisplayMode(page, mask, before.width, before.height, before.bits, before.dpi_x, before.dpi_y, before.refresh);
    return 0;
}
