// The panning dialog, template "MOVESCREEN": the picture is moved with the
// mouse on an arrow pad.
#ifndef VISTREL_PANNING_DIALOG_H
#define VISTREL_PANNING_DIALOG_H

#include <windows.h>

// Modal; 1 after Save, 0 after Cancel.
int OpenPanningDialog(HWND owner, const char* title);

enum {
    PAD_SIZE = 168,
    // Deferred from the mouse handler, so that it returns before the
    // registers are touched: wParam is VK_LEFT, VK_UP, VK_RIGHT or VK_DOWN.
    MSG_PAN_ARROW = WM_USER + 111,
    // The button is up: the pad shows its released picture again.
    MSG_PAN_RELEASE = WM_USER + 112,
};

enum PadElement { PAD_NOTHING, PAD_UP, PAD_DOWN, PAD_LEFT, PAD_RIGHT, PAD_AUTO };

// The element under a point of the pad, in the pad's own pixels.
PadElement PadHit(int x, int y);
// Where the pad starts along one axis of the frame: centred, or at the
// frame's start where the frame is smaller.
int PadOrigin(int frame_start, int frame_size, int pad_size);

struct PanningState {
    int offset_h, offset_v;
    bool arrow_shown;   // an arrow's picture is up while the button is held
    bool auto_latched;  // the AUTO picture stays up
    int picture;        // resource id of the picture on display
};
// The open dialog's state, for looking at only.
const PanningState* PanningDialogState();

#endif
