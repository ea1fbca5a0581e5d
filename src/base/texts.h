// Every text the user sees comes from the text INI file, with an English
// default built in.
#ifndef VISTREL_TEXTS_H
#define VISTREL_TEXTS_H

#include <windows.h>

// Section "TASKBAR" of the text file. Returns the characters placed in buf.
int LoadText(const char* key, const char* fallback, char* buf, int size);
// Section "Setup" of the text file.
int LoadSetupText(const char* key, const char* fallback, char* buf, int size);

enum {
    PAGE_DESKTOP = 0,
    PAGE_INFORMATION = 1,
    PAGE_MONITOR = 2,
    PAGE_PERFORMANCE = 3,
};

// Dialog template of a property-sheet page for a system language and screen
// font size (vertical logical pixels per inch).
int PageTemplateFor(int page, LANGID language, int logpixelsy);
// The same for this system and screen.
int ChoosePageTemplate(int page);

#endif
