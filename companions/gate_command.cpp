#include "gate_command.h"

#include "base/runtime.h"

static const char* SkipBlanks(const char* s)
{
    while (*s == ' ' || *s == '\t') ++s;
    return s;
}

// Length of the word at s.
static size_t WordLength(const char* s)
{
    size_t n = 0;
    while (s[n] && s[n] != ' ' && s[n] != '\t') ++n;
    return n;
}

static bool RestIsBlank(const char* s) { return *SkipBlanks(s) == 0; }

// The word at s is word (lower case) in any case of ASCII letters.
static bool IsWord(const char* s, size_t n, const char* word)
{
    for (size_t i = 0; i < n; ++i)
        if ((s[i] | 0x20) != word[i]) return false;
    return word[n] == 0;
}

int ParseGateCommand(const char* arguments, GateRequest* request)
{
    request->command = GATE_NONE;
    request->window_class[0] = 0;
    if (!arguments) return GATE_NONE;
    const char* s = SkipBlanks(arguments);
    size_t n = WordLength(s);
    if (n != 1) return GATE_NONE;

    if (s[0] == '2') {
        // Restarting is the one thing here that cannot be taken back: only
        // the exact request does it.
        s = SkipBlanks(s + 1);
        n = WordLength(s);
        if (!IsWord(s, n, "restart") || !RestIsBlank(s + n)) return GATE_NONE;
        request->command = GATE_RESTART;
        return GATE_RESTART;
    }
    if (s[0] == '3') {
        s = SkipBlanks(s + 1);
        size_t length = TextLength(s);
        while (length > 0 && (s[length - 1] == ' ' || s[length - 1] == '\t')) --length;
        if (length >= 2 && s[0] == '"' && s[length - 1] == '"') {
            ++s;
            length -= 2;
        }
        if (length == 0) return GATE_NONE;
        if (length > GATE_CLASS_SIZE - 1) length = GATE_CLASS_SIZE - 1;
        memcpy(request->window_class, s, length);
        request->window_class[length] = 0;
        request->command = GATE_MEMORY;
        return GATE_MEMORY;
    }
    return GATE_NONE;
}
