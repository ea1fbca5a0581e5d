// EDID blocks of any length and content into the Monitor page's lines,
// with texts as long as the INI file may make them.
#include <stdint.h>
#include <stdlib.h>
#include <string.h>

#include <vector>

#include "pages/edid.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    static EdidTexts texts;
    memset(&texts, 'T', sizeof texts);
    for (char* t = (char*)&texts; t < (char*)(&texts + 1); t += EDID_TEXT_SIZE) t[EDID_TEXT_SIZE - 1] = 0;

    std::vector<uint8_t> block(data, data + size);  // exactly size bytes
    static EdidLines out;
    memset(&out, 0x5A, sizeof out);
    int ok = DecodeEdidLines(block.data(), size, &texts, &out);
    if (out.count < 0 || out.count > EDID_MAX_LINES || (!ok && out.count)) abort();
    for (int i = 0; i < out.count; ++i)
        if (!memchr(out.line[i], 0, EDID_LINE_SIZE)) abort();
    return 0;
}
