// loupe.exe's pure parts, apart from its window so that they can be tested.
#ifndef VISTREL_LOUPE_H
#define VISTREL_LOUPE_H

#include <windows.h>

enum {
    LOUPE_TITLE_SIZE = 128,
    LOUPE_PATH_SIZE = MAX_PATH,
    LOUPE_MIN_ZOOM = 2,
    LOUPE_MAX_ZOOM = 4,
};

struct LoupeCommand {
    char title[LOUPE_TITLE_SIZE];      // cut at LOUPE_TITLE_SIZE - 1
    char text_path[LOUPE_PATH_SIZE];   // empty: none given, or too long to be whole
    bool two_monitors;
};

// The arguments after the program name, as the panel writes them:
//   "<title>" <text file path>[ 2]
// The path is not quoted and may hold blanks: it is everything after the
// title up to an optional last word "2". An unquoted title is one word.
void ParseLoupeCommand(const char* arguments, LoupeCommand* command);

// The part of the screen a client area of width x height shows at zoom:
// centred on the pointer, moved inside the screen where it would stick out.
RECT LoupeSource(POINT pointer, int width, int height, int zoom, const RECT& screen);

#endif
