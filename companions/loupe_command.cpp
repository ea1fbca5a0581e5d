#include "loupe.h"

#include "base/runtime.h"

static bool IsBlank(char c) { return c == ' ' || c == '\t'; }

static void CopyPart(char* out, size_t size, const char* from, const char* end)
{
    size_t length = (size_t)(end - from);
    if (length >= size) length = size - 1;
    memcpy(out, from, length);
    out[length] = 0;
}

void ParseLoupeCommand(const char* arguments, LoupeCommand* command)
{
    command->title[0] = 0;
    command->text_path[0] = 0;
    command->two_monitors = false;
    const char* p = arguments;
    while (IsBlank(*p)) ++p;
    const char* rest;
    if (*p == '"') {
        const char* close = p + 1;
        while (*close && *close != '"') ++close;
        CopyPart(command->title, sizeof command->title, p + 1, close);
        rest = *close ? close + 1 : close;
    } else {
        const char* end = p;
        while (*end && !IsBlank(*end)) ++end;
        CopyPart(command->title, sizeof command->title, p, end);
        rest = end;
    }
    while (IsBlank(*rest)) ++rest;
    const char* end = rest + TextLength(rest);
    while (end > rest && IsBlank(end[-1])) --end;
    if (end > rest && end[-1] == '2' && (end - 1 == rest || IsBlank(end[-2]))) {
        command->two_monitors = true;
        --end;
        while (end > rest && IsBlank(end[-1])) --end;
    }
    // A path cut short would name another file: better none, and the
    // built-in texts.
    if ((size_t)(end - rest) < sizeof command->text_path)
        CopyPart(command->text_path, sizeof command->text_path, rest, end);
}

static LONG Place(LONG centre, int length, LONG low, LONG high)
{
    LONG start = centre - length / 2;
    if (start + length > high) start = high - length;
    if (start < low) start = low;
    return start;
}

RECT LoupeSource(POINT pointer, int width, int height, int zoom, const RECT& screen)
{
    int w = (width + zoom - 1) / zoom;
    int h = (height + zoom - 1) / zoom;
    RECT source;
    source.left = Place(pointer.x, w, screen.left, screen.right);
    source.top = Place(pointer.y, h, screen.top, screen.bottom);
    source.right = source.left + w;
    source.bottom = source.top + h;
    return source;
}
