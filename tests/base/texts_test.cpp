// The page templates by system language and screen font size.
#include <gtest/gtest.h>

#include "base/texts.h"

TEST(Texts, PageTemplatesByLanguageAndFontSize)
{
    const LANGID ja = MAKELANGID(LANG_JAPANESE, SUBLANG_DEFAULT), en = MAKELANGID(LANG_ENGLISH, SUBLANG_DEFAULT);
    static const struct { LANGID language; int logpixelsy; int templates[5]; } cases[] = {
        {ja, 109, {164, 165, 166, 154, 0}}, {ja, 108, {161, 162, 163, 154, 0}},  // 108 is still normal
        {en, 120, {139, 140, 141, 154, 0}},
    };
    for (const auto& c : cases)
        for (int page = 0; page < 5; ++page)
            EXPECT_EQ(c.templates[page], PageTemplateFor(page, c.language, c.logpixelsy)) << c.logpixelsy << page;
    EXPECT_EQ(139, ChoosePageTemplate(PAGE_DESKTOP)) << "this Wine speaks English";
}
