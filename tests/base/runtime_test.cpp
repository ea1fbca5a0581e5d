// The product's runtime body (USER32 and KERNEL32; here a DLL without any C
// runtime) and the standard body of the other builds: the same bytes from both.
#include <gtest/gtest.h>
#include <windows.h>

#include <string>

#include "base/runtime.h"

// Each body as a table of the same functions.
#define FUNCTIONS(X) X(FormatText) X(AppendText) X(FindChar) X(FindLastChar) X(FindInText) X(SameText) X(UpperText) \
    X(memmove) X(memset) X(memcmp)
#define FIELD(name) decltype(&name) name;
#define STANDARD(name) name,
#define WIN32_BODY(name) (decltype(&name))GetProcAddress(dll, #name),
struct Body { const char* name; FUNCTIONS(FIELD) };
static HMODULE dll = LoadLibraryA("runtime-win32.dll");
static const Body bodies[] = {{"standard", FUNCTIONS(STANDARD)}, {"win32", FUNCTIONS(WIN32_BODY)}};

enum { JUNK = 0x5A, OUT_SIZE = 2048 };
typedef decltype(&FormatText) FormatFn;
#define FORMAT(...) [](FormatFn f, char* o, size_t n) { return f(o, n, __VA_ARGS__); }
static const std::string w1020(1020, 'w'), w1500(1500, 'w'), w1023(1023, 'w'), w1020_cut = w1020 + "|12";

// The whole buffer counts: the text and its terminator over junk, or nothing at all (NULL).
TEST(Runtime, FormatText)
{
    static const struct { size_t size; const char* expected; int (*call)(FormatFn, char*, size_t); } cases[] = {
        {64, "SOFTWARE\\QUORVEL\\PANEL\\53338811", FORMAT("%s\\%04x%04x", "SOFTWARE\\QUORVEL\\PANEL", 0x5333, 0x8811)},
        {16, "-2147483648", FORMAT("%d", INT32_MIN)}, {16, "-7|4294967295", FORMAT("%d|%u", -7, 0xFFFFFFFFu)},
        {32, "ffffffff|ABCDEF|12345", FORMAT("%x|%X|%04x", -1, 0xABCDEF, 0x12345)},
        {32, "[   42|42   |00042]", FORMAT("[%5d|%-5d|%05d]", 42, 42, 42)},
        {32, "[      ab|abcd|z]", FORMAT("[%8s|%-3s|%c]", "ab", "abcd", 'z')},
        {4, "", FORMAT("")}, {8, "SOFTWAR", FORMAT("%s", "SOFTWARE")}, {1, "", FORMAT("%d", 5)},
        {0, NULL, FORMAT("%d", 5)}, {OUT_SIZE, w1023.c_str(), FORMAT("%s", w1500.c_str())},
        {OUT_SIZE, w1020_cut.c_str(), FORMAT("%s|%d", w1020.c_str(), 12345)},
    };
    for (const Body& b : bodies)
        for (const auto& c : cases) {
            char out[OUT_SIZE];
            memset(out, JUNK, sizeof out);
            EXPECT_EQ(c.expected ? (int)strlen(c.expected) : 0, c.call(b.FormatText, out, c.size)) << b.name;
            std::string want(OUT_SIZE, (char)JUNK);
            if (c.expected) want.replace(0, strlen(c.expected) + 1, c.expected, strlen(c.expected) + 1);
            EXPECT_EQ(want, std::string(out, OUT_SIZE)) << b.name << (c.expected ? c.expected : " (nothing)");
        }
}

static long At(const char* text, const char* found) { return found ? (long)(found - text) : -1; }  // -1: none

TEST(Runtime, SearchesComparisonsAndMemory)
{
    static const struct { const char* text; char c; const char* part; long first, last, found; } searches[] = {
        {"56,60,72", ',', "60", 2, 5, 3},  {"PCI\\VEN_5333&DEV_8811\\BUS_01", '\\', "BUS_01", 3, 21, 22},
        {"abab", 'b', "abc", 1, 3, -1},    {"75", ',', "", -1, -1, 0},
        {"", ',', "PCI", -1, -1, -1},      {"aab", 0, "ab", 3, 3, 1},
    };
    static const struct { const char *a, *b; size_t length; bool same; } comparisons[] = {
        {"S3 Trio64V2", "S3 Trio64V2", 31, true},        {"S3 Trio64", "S3 Trio64V2", 31, false},
        {"S3 Trio64V2", "S3 Trio64", 31, false},         {"S3 Trio64V2/DX", "S3 Trio64V2/GX", 12, true},
        {"S3 Trio64V2/DX", "S3 Trio64V2/GX", 13, false}, {"ab\0x", "ab\0y", 4, true},  // nothing counts after the end
    };
    for (const Body& b : bodies) {
        SCOPED_TRACE(b.name);
        for (const auto& s : searches) {
            EXPECT_EQ(s.first, At(s.text, b.FindChar(s.text, s.c))) << s.text;
            EXPECT_EQ(s.last, At(s.text, b.FindLastChar(s.text, s.c))) << s.text;
            EXPECT_EQ(s.found, At(s.text, b.FindInText(s.text, s.part))) << s.text;
        }
        for (const auto& c : comparisons) EXPECT_EQ(c.same, b.SameText(c.a, c.b, c.length)) << c.a << c.length;
        char path[16] = "Class\\", key[] = "pci\\ven_5333&dev_8a01";
        EXPECT_TRUE(b.AppendText(path, 14, "DEFAULT") && !b.AppendText(path, 14, "X")) << "all, or none";
        EXPECT_STREQ("Class\\DEFAULT", path);
        b.UpperText(key);
        EXPECT_STREQ("PCI\\VEN_5333&DEV_8A01", key);
        char bytes[] = "0123456789";
        b.memmove(bytes + 2, bytes, 6);
        b.memmove(bytes, bytes + 3, 5);
        b.memset(bytes + 7, 0x141, 2);
        EXPECT_STREQ("1234534AA9", bytes);
        EXPECT_TRUE(b.memcmp("ab\x80", "ab\x7F", 3) > 0 && b.memcmp("a", "b", 1) < 0 && !b.memcmp("ab", "ac", 1));
    }
}

// The process entry hands WinMain the command line without the program name.
TEST(Runtime, ProgramNameSkippedAsTheRuntimeSkipsIt)
{
    static const struct { const char *line, *arguments; } cases[] = {
        {"\"C:\\Program Files\\Vistrel\\vistrel.exe\" /A", "/A"}, {"gatectl.exe \t 2  restart ", "2  restart "},
        {"C:\\\"Program Files\"\\gatectl.exe 3 Cls", "3 Cls"},     {"\"a b\"c d", "d"},
        {"\"unterminated /A", ""}, {"", ""}, {"vistrel.exe\x01/A", "/A"},
        {"C:\\GR\xd6\xdf" "E\\VISTREL.EXE /A", "/A"},  // bytes beyond ASCII belong to the name
    };
    auto skip = (const char* (*)(const char*))GetProcAddress(dll, "SkipProgramName");
    ASSERT_TRUE(skip);
    for (const auto& c : cases) EXPECT_STREQ(c.arguments, skip(c.line)) << c.line;
}
