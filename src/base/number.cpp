#include "base/number.h"

static bool IsBlank(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\v' || c == '\f'; }

int32_t ParseNumber(const char* text, size_t length)
{
    size_t i = 0;
    while (i < length && IsBlank(text[i])) ++i;
    bool negative = false;
    if (i < length && (text[i] == '+' || text[i] == '-')) negative = text[i++] == '-';
    // Counted in the negative range, which holds one value more.
    int64_t value = 0;
    while (i < length && text[i] >= '0' && text[i] <= '9') {
        value = value * 10 - (text[i++] - '0');
        if (value < INT32_MIN) {
            value = INT32_MIN;
            break;
        }
    }
    if (negative) return (int32_t)value;
    return value < -INT32_MAX ? INT32_MAX : (int32_t)-value;
}
