// Counts the registry keys this program opens: its import slot of
// RegOpenKeyExA, through which all its registry code calls, is pointed at a
// counter.
#ifndef VISTREL_TEST_REGISTRY_OPENS_H
#define VISTREL_TEST_REGISTRY_OPENS_H

#include <windows.h>

inline unsigned registry_opens;
inline LONG(WINAPI* real_registry_open)(HKEY, LPCSTR, DWORD, REGSAM, PHKEY);

inline LONG WINAPI CountedRegistryOpen(HKEY root, LPCSTR path, DWORD options, REGSAM access, PHKEY key)
{
    ++registry_opens;
    return real_registry_open(root, path, options, access, key);
}

// False when no slot of this program imports it.
inline bool CountRegistryOpens()
{
    static bool counting;
    if (counting) return true;
    real_registry_open = (decltype(real_registry_open))GetProcAddress(GetModuleHandleA("advapi32.dll"), "RegOpenKeyExA");
    BYTE* image = (BYTE*)GetModuleHandleA(NULL);
    IMAGE_NT_HEADERS* nt = (IMAGE_NT_HEADERS*)(image + ((IMAGE_DOS_HEADER*)image)->e_lfanew);
    IMAGE_DATA_DIRECTORY iat = nt->OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_IAT];
    ULONG_PTR* slots = (ULONG_PTR*)(image + iat.VirtualAddress);
    DWORD old;
    VirtualProtect(slots, iat.Size, PAGE_READWRITE, &old);
    for (DWORD i = 0; i < iat.Size / sizeof *slots; ++i) {
        if (slots[i] != (ULONG_PTR)real_registry_open) continue;
        slots[i] = (ULONG_PTR)CountedRegistryOpen;
        counting = true;
    }
    VirtualProtect(slots, iat.Size, old, &old);
    return counting;
}

#endif
