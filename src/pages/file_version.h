// The version a file's version resource states, as the Information page
// shows it for this program, the display driver and DirectX.
#ifndef VISTREL_FILE_VERSION_H
#define VISTREL_FILE_VERSION_H

#include <stddef.h>

enum { FILE_VERSION_SIZE = 64 };

// The "FileVersion" text of the US English block (Windows ANSI code page,
// then Unicode), else the fixed product version as "4.10.01.08"; cut at
// size - 1. Empty when the file has no version resource.
void FileVersionText(const char* path, char* out, size_t size);

#endif
