#include <gtest/gtest.h>

#include "base/state.h"
#include "base/texts.h"
#include "support/support.h"

TEST(Texts, DefaultsWithoutTheFile)
{
    ResetProgramState();
    char buf[120];
    memset(buf, '#', sizeof buf);
    EXPECT_EQ(7, LoadText("CAPTION", "Vistrel", buf, sizeof buf));
    EXPECT_STREQ("Vistrel", buf);
    memset(buf, '#', sizeof buf);
    EXPECT_EQ(0, LoadSetupText("NoCard", "", buf, 80));
    EXPECT_STREQ("", buf);
}

TEST(Texts, EmptyValuesMissingKeysAndTruncation)
{
    std::string folder = MakeScratchFolder("texts");
    std::string caption(150, 'c');
    WriteTextFile(folder + "ZNTR2.INI", "[TASKBAR]\r\nMenuA=\r\nCAPTION=" + caption +
                                            "\r\nMenuB=Info\r\n[setup]\r\nNoCard=No card here.\r\n");
    ResetProgramState(folder + "ZNTR2.INI");
    char buf[200];
    memset(buf, '#', sizeof buf);
    EXPECT_EQ(0, LoadText("MenuA", "Desktop", buf, 50));  // present but empty: no default
    EXPECT_STREQ("", buf);
    EXPECT_EQ(4, LoadText("MenuB", "Information", buf, 50));
    EXPECT_STREQ("Info", buf);
    EXPECT_EQ(7, LoadText("MenuC", "Monitor", buf, 50));  // missing key: the default
    EXPECT_STREQ("Monitor", buf);
    memset(buf, '#', sizeof buf);
    EXPECT_EQ(99, LoadText("CAPTION", "Vistrel", buf, 100));
    EXPECT_EQ(caption.substr(0, 99), std::string(buf));
    EXPECT_EQ('#', buf[100]);  // nothing written past the buffer given
    EXPECT_EQ(13, LoadSetupText("NoCard", "", buf, 80));  // section names ignore case
    EXPECT_STREQ("No card here.", buf);
}

TEST(Texts, PageTemplatesByLanguageAndFontSize)
{
    const LANGID japanese = MAKELANGID(LANG_JAPANESE, SUBLANG_DEFAULT);
    const LANGID english = MAKELANGID(LANG_ENGLISH, SUBLANG_ENGLISH_US);
    int large[4], normal[4], other[4];
    for (int page = 0; page < 4; ++page) {
        large[page] = PageTemplateFor(page, japanese, 120);
        normal[page] = PageTemplateFor(page, japanese, 96);
        other[page] = PageTemplateFor(page, english, 120);
    }
    EXPECT_EQ((std::vector<int>{164, 165, 166, 154}), std::vector<int>(large, large + 4));
    EXPECT_EQ((std::vector<int>{161, 162, 163, 154}), std::vector<int>(normal, normal + 4));
    EXPECT_EQ((std::vector<int>{139, 140, 141, 154}), std::vector<int>(other, other + 4));
    EXPECT_EQ(161, PageTemplateFor(PAGE_DESKTOP, japanese, 108));  // 108 is still normal
    EXPECT_EQ(164, PageTemplateFor(PAGE_DESKTOP, japanese, 109));
    // This Wine speaks English.
    EXPECT_EQ(139, ChoosePageTemplate(PAGE_DESKTOP));
}
