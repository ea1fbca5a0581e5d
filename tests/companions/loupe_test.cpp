// loupe.exe's command line, as the panel writes it, and the part of the
// screen it enlarges.
#include <gtest/gtest.h>
#include <string.h>
#include <string>

#include "../../companions/loupe.h"

namespace {

const std::string long_title(200, 't');
const std::string long_path = "C:\\" + std::string(300, 'p') + "\\ZNTR2.INI";

const struct {
    std::string arguments, title, path;
    bool two;
} parse_cases[] = {
    {"\"Zoom In\" C:\\Program Files\\Vistrel\\ZNTR2.INI", "Zoom In", "C:\\Program Files\\Vistrel\\ZNTR2.INI", false},
    {"\"Zoom In\" C:\\Program Files\\Vistrel 2\\ZNTR2.INI 2", "Zoom In", "C:\\Program Files\\Vistrel 2\\ZNTR2.INI", true},
    {"  \"\" C:\\V\\ZNTR2.INI\t2  ", "", "C:\\V\\ZNTR2.INI", true},
    {"\"Zoom\" C:\\V\\ZNTR2", "Zoom", "C:\\V\\ZNTR2", false},
    {"\"Zoom\"2", "Zoom", "", true},
    {"\"Zoom In", "Zoom In", "", false},
    {"Zoom C:\\V\\A.INI", "Zoom", "C:\\V\\A.INI", false},
    {"", "", "", false},
    {"\"" + long_title + "\" C:\\A.INI", long_title.substr(0, LOUPE_TITLE_SIZE - 1), "C:\\A.INI", false},
    {"\"Zoom\" " + long_path + " 2", "Zoom", "", true},
};

TEST(ParseLoupeCommand, TakesTitlePathAndMonitors)
{
    for (const auto& c : parse_cases) {
        LoupeCommand command;
        memset(&command, 0x55, sizeof command);
        ParseLoupeCommand(c.arguments.c_str(), &command);
        EXPECT_EQ(c.title, command.title) << c.arguments;
        EXPECT_EQ(c.path, command.text_path) << c.arguments;
        EXPECT_EQ(c.two, command.two_monitors) << c.arguments;
    }
}

TEST(LoupeSource, FollowsThePointerInsideTheScreen)
{
    const RECT screen = {-1024, 0, 1280, 1024};   // a second monitor left of the first
    const struct { POINT pointer; int zoom; RECT source; } cases[] = {
        {{600, 500}, 2, {472, 404, 728, 596}},
        {{600, 500}, 3, {515, 436, 686, 564}},     // 171 x 128: a partly shown pixel counts
        {{-1020, 5}, 4, {-1024, 0, -896, 96}},
        {{1279, 1023}, 2, {1024, 832, 1280, 1024}},
    };
    for (const auto& c : cases) {
        RECT got = LoupeSource(c.pointer, 512, 384, c.zoom, screen);
        EXPECT_EQ(0, memcmp(&c.source, &got, sizeof got))
            << c.pointer.x << "," << c.pointer.y << " x" << c.zoom << ": " << got.left << "," << got.top << " "
            << got.right << "," << got.bottom;
    }
}

}  // namespace
