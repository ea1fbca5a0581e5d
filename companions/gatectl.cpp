#include <windows.h>

int WINAPI WinMain(HINSTANCE inst, HINSTANCE previous, LPSTR command_line, int show) { return 0; }
