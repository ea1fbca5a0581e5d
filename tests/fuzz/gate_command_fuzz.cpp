// gatectl.exe's command line as any process may start it.
#include <stdint.h>
#include <stdlib.h>
#include <string.h>

#include "gate_command.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    // Exactly as long as the text, so that a read past its end shows.
    char* arguments = new char[size + 1];
    memcpy(arguments, data, size);
    arguments[size] = 0;
    GateRequest request;
    memset(&request, 0x5A, sizeof request);
    int command = ParseGateCommand(arguments, &request);
    delete[] arguments;
    if (command != request.command) abort();
    const char* end = (const char*)memchr(request.window_class, 0, GATE_CLASS_SIZE);
    if (!end) abort();
    bool named = end != request.window_class;
    if (named != (command == GATE_MEMORY)) abort();
    if (command != GATE_NONE && command != GATE_RESTART && command != GATE_MEMORY) abort();
    return 0;
}
