#include "base/adapters.h"

#include "base/module_reset.h"
#include "base/runtime.h"

AdapterRecord adapter_table[MAX_ADAPTERS];
int16_t adapter_count;
int16_t current_adapter;
int16_t monitor_count;

static void ResetAdapters()
{
    memset(adapter_table, 0, sizeof adapter_table);
    adapter_count = 0;
    current_adapter = 0;
    monitor_count = 0;
}
VISTREL_MODULE_RESET(ResetAdapters);
