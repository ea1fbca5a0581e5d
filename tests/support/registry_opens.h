// Counts the registry keys this program opens: its import slot of
// RegOpenKeyExA, through which all its registry code calls, is pointed at a
// counter.
#ifndef VISTREL_TEST_REGISTRY_OPENS_H
#define VISTREL_TEST_REGISTRY_OPENS_H

#include "support/import_slot.h"

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
    if (real_registry_open) return true;
    real_registry_open = (decltype(real_registry_open))RedirectImport("advapi32.dll", "RegOpenKeyExA",
                                                                       (FARPROC)CountedRegistryOpen);
    return real_registry_open != NULL;
}

#endif
