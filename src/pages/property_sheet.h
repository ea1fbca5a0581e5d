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

// A page's tab: its icon, and its title's key and English text in the text file.
struct PageLabel {
    int icon;
    const char* key;
    const char* fallback;
};
// page: PAGE_DESKTOP ... PAGE_PERFORMANCE.
const PageLabel* PageLabelOf(int page);

// The pages the chip of the adapter at current_adapter allows: bit n for
// page n.
unsigned IncludedPages();

// The position of the requested page among the included ones (bit n of
// included set for page n): its own, or that of the included page before
// it, or 0.
int StartPosition(unsigned included, int requested_page);

enum AnimationOperation {
    ANIMATION_PLAY = 100,
    ANIMATION_STOP = 101,
    ANIMATION_CLOSE = 102,
};

// An animation control in rect of the page: the file the chip file's
// "AVIFile" names beside the executable when it plays, otherwise the
// resource. NULL when neither opens.
HWND CreatePageAnimation(HWND page, int control_id, int resource_id, const RECT* rect);
// source: a file path, or a resource id of the instance (MAKEINTRESOURCEA).
HWND CreateAnimationControl(HWND parent, int control_id, LPCSTR source, const RECT* rect);
void ControlAnimation(HWND control, AnimationOperation operation);

// A page's share of the animation: call it first with every message of the
// page's procedure. It creates the animation in the page's frame control on
// WM_INITDIALOG, plays it while the page is shown and closes it with the
// page; control is the page's own variable for it.
void AnimatePage(HWND page, UINT message, LPARAM lparam, int frame_id, HWND* control);

// Where a window of this place lies wholly inside area: moved the least, and
// at area's top left where it is larger than area.
POINT PlaceInside(const RECT* window, const RECT* area);

#endif
