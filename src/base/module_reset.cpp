#include "base/module_reset.h"

#ifndef VISTREL_PRODUCT

enum { MODULE_RESETS = 32 };

static ModuleResetFn resets[MODULE_RESETS];
static int reset_count;

ModuleResetEntry::ModuleResetEntry(ModuleResetFn fn)
{
    // More modules than slots is a fault of the build, not of a test.
    if (reset_count == MODULE_RESETS) __builtin_trap();
    resets[reset_count++] = fn;
}

void ResetAllModules()
{
    for (int i = 0; i < reset_count; ++i) resets[i]();
}

#endif
