// The helpers on the standard library: the simulated build and the tests.
#include "base/runtime.h"

#include <ctype.h>
#include <stdarg.h>
#include <stdio.h>
#include <stdlib.h>

size_t TextLength(const char* text) { return strlen(text); }

void CopyText(char* out, size_t size, const char* text)
{
    if (size) snprintf(out, size, "%s", text);
}

bool AppendText(char* out, size_t size, const char* text)
{
    size_t used = strlen(out);
    if (used + strlen(text) >= size) return false;
    strcpy(out + used, text);
    return true;
}

const char* FindChar(const char* text, char c) { return strchr(text, c); }

const char* FindLastChar(const char* text, char c) { return strrchr(text, c); }

const char* FindInText(const char* text, const char* part) { return strstr(text, part); }

bool SameText(const char* a, const char* b, size_t length) { return strncmp(a, b, length) == 0; }

void UpperText(char* text)
{
    for (; *text; ++text) *text = (char)toupper((unsigned char)*text);
}

int FormatText(char* out, size_t size, const char* format, ...)
{
    char text[FORMAT_LIMIT + 1];
    va_list args;
    va_start(args, format);
    if (vsnprintf(text, sizeof text, format, args) < 0) text[0] = 0;
    va_end(args);
    if (!size) return 0;
    CopyText(out, size, text);
    return (int)strlen(out);
}

void* AllocZeroed(size_t size) { return calloc(1, size); }

void FreeMemory(void* block) { free(block); }
