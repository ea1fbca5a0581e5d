// The few string, number-to-text and memory helpers the program uses.
// A retail Windows 95 has no C runtime DLL, so the product takes them from
// USER32 and KERNEL32 (runtime_win32.cpp, which is also the programs' process
// entry); every other build takes them from the standard library
// (runtime_std.cpp). Both give the same results.
//
// memset, memcpy, memmove and memcmp are used under their own names (the
// compiler calls them for structure copies anyway); the product defines them.
#ifndef VISTREL_RUNTIME_H
#define VISTREL_RUNTIME_H

#include <stddef.h>
#include <string.h>

// FormatText writes at most this many characters, whatever the buffer: what
// fits into the 1024 bytes wsprintfA fills.
enum { FORMAT_LIMIT = 1023 };

extern "C" {

size_t TextLength(const char* text);

// Copies text into out of size bytes, cut at size - 1 and terminated; with
// size 0 nothing is written.
void CopyText(char* out, size_t size, const char* text);

// Appends text to the text in out of size bytes when all of it fits;
// otherwise false, and out is left as it was.
bool AppendText(char* out, size_t size, const char* text);

// The first (last) c in text, or NULL; c 0 finds the terminator.
const char* FindChar(const char* text, char c);
const char* FindLastChar(const char* text, char c);

// The first place part occurs in text, or NULL; an empty part is at text.
const char* FindInText(const char* text, const char* part);

// The texts agree in their first length characters (a shorter one ends
// with its terminator within them, at the same place in both).
bool SameText(const char* a, const char* b, size_t length);

// Upper case in place. The product also raises the letters of the ANSI code
// page beyond ASCII; the program only raises ASCII names.
void UpperText(char* text);

// Formats into out of size bytes, cut at size - 1 and at FORMAT_LIMIT, and
// answers the characters written. Only what wsprintfA knows: %d %u %x %X %s
// %c with the flags '-' and '0' and a width; no floating point, no '*',
// nothing of 64 bits.
int FormatText(char* out, size_t size, const char* format, ...);

// Zero-filled memory, or NULL; FreeMemory takes NULL too.
void* AllocZeroed(size_t size);
void FreeMemory(void* block);

}

#endif
