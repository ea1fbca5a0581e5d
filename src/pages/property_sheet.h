// The property sheet that holds the pages of one adapter, and the animation
// every page plays in its corner.
#ifndef VISTREL_PROPERTY_SHEET_H
#define VISTREL_PROPERTY_SHEET_H

#include <windows.h>

// Builds and runs the modal sheet for the adapter at current_adapter with
// the pages its chip allows, starting on the requested page (or the
// included page before it; PAGE_DESKTOP ... PAGE_PERFORMANCE of
// base/texts.h); returns when the user closes it.
void OpenPropertySheet(HINSTANCE inst, HWND owner, int requested_page);

#endif
