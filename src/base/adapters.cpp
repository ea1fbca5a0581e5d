#include "base/adapters.h"

AdapterRecord adapter_table[MAX_ADAPTERS];
int16_t adapter_count;
int16_t current_adapter;
int16_t monitor_count;
