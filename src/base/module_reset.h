// Every module that keeps state between calls offers a reset to the state a
// fresh process has, registered where it is defined so that none can be
// forgotten: tests begin each case with ResetAllModules(). The product never
// resets anything and carries no registrations.
#ifndef VISTREL_MODULE_RESET_H
#define VISTREL_MODULE_RESET_H

typedef void (*ModuleResetFn)();

#ifdef VISTREL_PRODUCT
#define VISTREL_MODULE_RESET(fn) static_assert(sizeof(&fn) > 0, "a reset")
#else
struct ModuleResetEntry {
    explicit ModuleResetEntry(ModuleResetFn fn);
};
#define VISTREL_MODULE_RESET(fn) static ModuleResetEntry fn##_entry(fn)
#endif

// Runs every registered reset, in the order the modules were linked.
void ResetAllModules();

#endif
