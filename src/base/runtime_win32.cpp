// The helpers on USER32 and KERNEL32, the memory functions the compiler
// calls, and the process entry: the product links no C runtime at all.
#include "base/runtime.h"

#include <stdarg.h>
#include <windows.h>

// The byte loops below must stay loops: GCC would otherwise make memset of
// a loop that stores zeros, and memset would call itself.
#pragma GCC optimize("no-tree-loop-distribute-patterns")

extern "C" {

void* memset(void* to, int value, size_t size)
{
    unsigned char* p = (unsigned char*)to;
    while (size--) *p++ = (unsigned char)value;
    return to;
}

void* memcpy(void* to, const void* from, size_t size)
{
    unsigned char* p = (unsigned char*)to;
    const unsigned char* q = (const unsigned char*)from;
    while (size--) *p++ = *q++;
    return to;
}

void* memmove(void* to, const void* from, size_t size)
{
    unsigned char* p = (unsigned char*)to;
    const unsigned char* q = (const unsigned char*)from;
    if (p <= q) return memcpy(to, from, size);
    while (size--) p[size] = q[size];
    return to;
}

int memcmp(const void* a, const void* b, size_t size)
{
    const unsigned char* p = (const unsigned char*)a;
    const unsigned char* q = (const unsigned char*)b;
    for (; size--; ++p, ++q)
        if (*p != *q) return *p < *q ? -1 : 1;
    return 0;
}

size_t TextLength(const char* text) { return (size_t)lstrlenA(text); }

void CopyText(char* out, size_t size, const char* text)
{
    // lstrcpynA counts the terminator in its length.
    if (size) lstrcpynA(out, text, size > 0x7FFFFFFF ? 0x7FFFFFFF : (int)size);
}

bool AppendText(char* out, size_t size, const char* text)
{
    size_t used = TextLength(out);
    size_t more = TextLength(text);
    if (used + more >= size) return false;
    memcpy(out + used, text, more + 1);
    return true;
}

const char* FindChar(const char* text, char c)
{
    for (;; ++text) {
        if (*text == c) return text;
        if (!*text) return NULL;
    }
}

const char* FindLastChar(const char* text, char c)
{
    const char* last = NULL;
    for (;; ++text) {
        if (*text == c) last = text;
        if (!*text) return last;
    }
}

const char* FindInText(const char* text, const char* part)
{
    for (;; ++text) {
        size_t i = 0;
        while (part[i] && text[i] == part[i]) ++i;
        if (!part[i]) return text;
        if (!*text) return NULL;
    }
}

bool SameText(const char* a, const char* b, size_t length)
{
    for (size_t i = 0; i < length; ++i) {
        if (a[i] != b[i]) return false;
        if (!a[i]) break;
    }
    return true;
}

void UpperText(char* text) { CharUpperA(text); }

int FormatText(char* out, size_t size, const char* format, ...)
{
    // wsprintfA fills at most 1024 bytes; one more holds a terminator
    // whatever it left.
    char text[FORMAT_LIMIT + 2];
    va_list args;
    va_start(args, format);
    wvsprintfA(text, format, args);
    va_end(args);
    text[FORMAT_LIMIT] = 0;
    if (!size) return 0;
    CopyText(out, size, text);
    return (int)TextLength(out);
}

void* AllocZeroed(size_t size) { return HeapAlloc(GetProcessHeap(), HEAP_ZERO_MEMORY, size); }

void FreeMemory(void* block)
{
    if (block) HeapFree(GetProcessHeap(), 0, block);
}

// The program name runs to the first blank outside double quotes; the
// arguments start after the blanks that follow it. Bytes beyond ASCII are
// part of the name, not blanks.
const char* SkipProgramName(const char* command_line)
{
    const unsigned char* s = (const unsigned char*)command_line;
    bool quoted = false;
    for (; *s > ' ' || (*s && quoted); ++s)
        if (*s == '"') quoted = !quoted;
    while (*s && *s <= ' ') ++s;
    return (const char*)s;
}

// Where vistrel.exe and gatectl.exe start: WinMain gets what a C runtime's
// start-up would give it, and its answer ends the process.
void ProgramEntry()
{
    // The FPU as the programs have always run: all 64 bits of precision,
    // every exception masked.
    __asm__ __volatile__("fninit");
    STARTUPINFOA start;
    start.dwFlags = 0;
    GetStartupInfoA(&start);
    int show = (start.dwFlags & STARTF_USESHOWWINDOW) ? start.wShowWindow : SW_SHOWDEFAULT;
    ExitProcess((UINT)WinMain(GetModuleHandleA(NULL), NULL, (LPSTR)SkipProgramName(GetCommandLineA()), show));
}

}
