#include "base/texts.h"

#include "base/state.h"

int LoadText(const char* key, const char* fallback, char* buf, int size)
{
    return (int)GetPrivateProfileStringA("TASKBAR", key, fallback, buf, (DWORD)size, text_ini_path);
}

int LoadSetupText(const char* key, const char* fallback, char* buf, int size)
{
    return (int)GetPrivateProfileStringA("Setup", key, fallback, buf, (DWORD)size, text_ini_path);
}

struct TemplateSet {
    int desktop, information, monitor;
};
static const TemplateSet standard_templates = {139, 140, 141};
static const TemplateSet japanese_templates = {161, 162, 163};
static const TemplateSet japanese_large_templates = {164, 165, 166};
static const int performance_template = 154;

static const LANGID japanese_primary = 0x11;
static const int large_font_logpixels = 108;

int PageTemplateFor(int page, LANGID language, int logpixelsy)
{
    if (page == PAGE_PERFORMANCE) return performance_template;
    const TemplateSet* set = &standard_templates;
    if ((language & 0xFF) == japanese_primary)
        set = logpixelsy > large_font_logpixels ? &japanese_large_templates : &japanese_templates;
    switch (page) {
    case PAGE_DESKTOP: return set->desktop;
    case PAGE_INFORMATION: return set->information;
    case PAGE_MONITOR: return set->monitor;
    }
    return 0;
}

int ChoosePageTemplate(int page)
{
    LANGID language = GetSystemDefaultLangID();
    int logpixelsy = 0;
    // Only a Japanese system has a second template set, chosen by font size.
    if ((language & 0xFF) == japanese_primary) {
        HDC dc = GetDC(NULL);
        logpixelsy = GetDeviceCaps(dc, LOGPIXELSY);
        ReleaseDC(NULL, dc);
    }
    return PageTemplateFor(page, language, logpixelsy);
}
