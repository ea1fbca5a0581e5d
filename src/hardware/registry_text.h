// Text values of registry keys that Windows or the display driver own.
#ifndef VISTREL_REGISTRY_TEXT_H
#define VISTREL_REGISTRY_TEXT_H

#include <windows.h>

// Reads a text value of at most size - 1 bytes into out, always terminated
// (empty on failure). 1 when the key and value could be read.
int ReadRegistryText(HKEY root, const char* path, const char* name, char* out, DWORD size);

#endif
