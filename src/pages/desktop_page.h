// The Desktop page's sliders, for its Apply to set back after a revert.
#ifndef VISTREL_DESKTOP_PAGE_H
#define VISTREL_DESKTOP_PAGE_H

#include <windows.h>

// Sets all four sliders and their labels from the page's selection.
void SetupDesktopSliders(HWND page);

#endif
