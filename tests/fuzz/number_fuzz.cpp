// The number reader on registry and INI data of any length, unterminated;
// checked against the C library's reading, held to 32 bits.
#include <stdint.h>
#include <stdlib.h>

#include <string>

#include "base/number.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    int32_t got = ParseNumber((const char*)data, size);
    std::string text((const char*)data, size);
    long long want = strtoll(text.c_str(), nullptr, 10);
    if (want > INT32_MAX) want = INT32_MAX;
    if (want < INT32_MIN) want = INT32_MIN;
    if (got != want) abort();
    return 0;
}
