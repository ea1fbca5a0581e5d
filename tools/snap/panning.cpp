// The panning dialog on its own, for the tour's camera: the panel opens it
// only for a command no menu entry carries. Boots the machine described
// beside the executable, like vistrel-sim.exe, and ends when the dialog does.
#include <windows.h>

#include "adjust/panning_dialog.h"
#include "base/state.h"

int WINAPI WinMain(HINSTANCE inst, HINSTANCE, LPSTR, int)
{
    instance = inst;
    return OpenPanningDialog(NULL, "Screen Panning");
}
