// Reading a file's version resource through VERSION.DLL.
#include "pages/file_version.h"

#include <windows.h>

#include "base/runtime.h"

// Drivers and system files of the time name their strings in one of these.
static const char* const file_version_paths[] = {
    "\\StringFileInfo\\040904E4\\FileVersion",
    "\\StringFileInfo\\040904B0\\FileVersion",
};

static void VersionFromBlock(const void* block, char* out, size_t size)
{
    for (const char* path : file_version_paths) {
        char* text = NULL;
        UINT length = 0;
        if (!VerQueryValueA(block, path, (void**)&text, &length) || !text) continue;
        CopyText(out, size, text);
        return;
    }
    VS_FIXEDFILEINFO* fixed = NULL;
    UINT length = 0;
    if (!VerQueryValueA(block, "\\", (void**)&fixed, &length) || !fixed || length < sizeof *fixed) return;
    FormatText(out, size, "%d.%02d.%02d.%02d", HIWORD(fixed->dwProductVersionMS), LOWORD(fixed->dwProductVersionMS),
               HIWORD(fixed->dwProductVersionLS), LOWORD(fixed->dwProductVersionLS));
}

void FileVersionText(const char* path, char* out, size_t size)
{
    if (size) out[0] = 0;
    DWORD handle = 0, length = GetFileVersionInfoSizeA(path, &handle);
    if (!length) return;
    void* block = AllocZeroed(length);
    if (!block) return;
    if (GetFileVersionInfoA(path, 0, length, block)) VersionFromBlock(block, out, size);
    FreeMemory(block);
}
