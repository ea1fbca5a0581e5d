// The Desktop page's sliders, set from its selection: when it opens and after a refused mode.
#ifndef VISTREL_DESKTOP_PAGE_H
#define VISTREL_DESKTOP_PAGE_H

#include <windows.h>

// Sets all four sliders and their labels from the page's selection.
void SetupDesktopSliders(HWND page);

#endif
