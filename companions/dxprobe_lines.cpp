#include "dxprobe.h"

#include "base/runtime.h"

void FormatProbeVersion(char* out, size_t size, DWORD most, DWORD least)
{
    FormatText(out, size, "%u.%02u.%02u.%04u", (unsigned)HIWORD(most), (unsigned)LOWORD(most),
               (unsigned)HIWORD(least), (unsigned)LOWORD(least));
}

static void EmitPair(const char* label, const char* value, ProbeLineSink emit, void* context)
{
    char line[PROBE_LINE_SIZE];
    FormatText(line, sizeof line, "%s %s", label, value);
    emit(line, context);
}

static void EmitVersion(const char* label, const ProbeVersion& version, const ProbeTexts& texts,
                        ProbeLineSink emit, void* context)
{
    char value[PROBE_TEXT_SIZE];
    if (version.found) FormatProbeVersion(value, sizeof value, version.most, version.least);
    else CopyText(value, sizeof value, texts.text[PROBE_NOT_INSTALLED]);
    EmitPair(label, value, emit, context);
}

void BuildProbeLines(const ProbeFacts& facts, const ProbeTexts& texts, ProbeLineSink emit, void* context)
{
    EmitVersion(texts.text[PROBE_DDRAW], facts.ddraw, texts, emit, context);
    EmitVersion(texts.text[PROBE_D3DIM], facts.d3dim, texts, emit, context);
    EmitPair(texts.text[PROBE_DRIVER], facts.driver[0] ? facts.driver : texts.text[PROBE_UNKNOWN], emit, context);
    if (!facts.direct_draw) {
        emit(texts.text[PROBE_NO_DIRECTDRAW], context);
        return;
    }
    char value[PROBE_TEXT_SIZE];
    if (facts.memory_known) FormatText(value, sizeof value, "%u KB", (unsigned)(facts.memory_bytes / 1024));
    else CopyText(value, sizeof value, texts.text[PROBE_UNKNOWN]);
    EmitPair(texts.text[PROBE_MEMORY], value, emit, context);
    emit(texts.text[PROBE_MODES], context);
    int count = facts.mode_count < PROBE_MAX_MODES ? facts.mode_count : PROBE_MAX_MODES;
    for (int i = 0; i < count; ++i) {
        const ProbeMode& mode = facts.modes[i];
        FormatText(value, sizeof value, "    %u x %u x %u", (unsigned)mode.width, (unsigned)mode.height,
                   (unsigned)mode.bits);
        emit(value, context);
    }
}
