// Points this program's import slots of a system function at a stand-in, so
// that a test can count or fail the calls the program's code makes.
#ifndef VISTREL_TEST_IMPORT_SLOT_H
#define VISTREL_TEST_IMPORT_SLOT_H

#include <windows.h>

// The real function, or NULL when no slot of this program imports it.
inline FARPROC RedirectImport(const char* dll, const char* name, FARPROC stand_in)
{
    FARPROC real = GetProcAddress(GetModuleHandleA(dll), name);
    BYTE* image = (BYTE*)GetModuleHandleA(NULL);
    IMAGE_NT_HEADERS* nt = (IMAGE_NT_HEADERS*)(image + ((IMAGE_DOS_HEADER*)image)->e_lfanew);
    IMAGE_DATA_DIRECTORY iat = nt->OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_IAT];
    ULONG_PTR* slots = (ULONG_PTR*)(image + iat.VirtualAddress);
    DWORD old;
    bool found = false;
    VirtualProtect(slots, iat.Size, PAGE_READWRITE, &old);
    for (DWORD i = 0; i < iat.Size / sizeof *slots; ++i) {
        if (slots[i] != (ULONG_PTR)real) continue;
        slots[i] = (ULONG_PTR)stand_in;
        found = true;
    }
    VirtualProtect(slots, iat.Size, old, &old);
    return found ? real : NULL;
}

#endif
