// runtime_win32.cpp as a DLL of this machine's word size, linked without
// any C runtime, for the tests to call beside the standard body.
#include <windows.h>

extern "C" BOOL WINAPI BodyEntry(HINSTANCE, DWORD, void*) { return TRUE; }

// The process entry comes along with the body but never runs here.
int WINAPI WinMain(HINSTANCE, HINSTANCE, LPSTR, int) { return 0; }
