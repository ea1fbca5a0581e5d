// The GDI objects and USER handles this process holds, for leak checks.
// Wine's GetGuiResources answers 0 for both, so the handle spaces are walked
// instead: a handle's low word names its slot, and Wine takes a handle
// without the generation in its high word.
#ifndef VISTREL_TEST_GUI_HANDLES_H
#define VISTREL_TEST_GUI_HANDLES_H

#include <windows.h>

#include <string>

// "gdi G user U": U counts this thread's windows (Wine's own threads of the
// process make theirs when they like), this process's menus and icons/cursors.
inline std::string GuiHandles()
{
    int gdi = 0, windows = 0, menus = 0, icons = 0;
    for (UINT_PTR slot = 1; slot < 0x10000; ++slot) gdi += GetObjectType((HGDIOBJ)slot) != 0;
    // USER handles are even from 0x20.
    for (UINT_PTR slot = 0x20; slot < 0x10000; slot += 2) {
        windows += IsWindow((HWND)slot) && GetWindowThreadProcessId((HWND)slot, NULL) == GetCurrentThreadId();
        menus += IsMenu((HMENU)slot) != 0;
        ICONINFO info;
        if (GetIconInfo((HICON)slot, &info)) {  // copies the icon's bitmaps
            ++icons;
            if (info.hbmColor) DeleteObject(info.hbmColor);
            if (info.hbmMask) DeleteObject(info.hbmMask);
        }
    }
    return "gdi " + std::to_string(gdi) + " user " + std::to_string(windows + menus + icons);
}

#endif
