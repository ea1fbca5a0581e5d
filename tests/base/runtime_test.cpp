// The product's runtime body (USER32 and KERNEL32; here a DLL without any C
// runtime) and the standard body of the other builds, on what the program
// formats, copies and looks for and on the edges: the same bytes from both.
#include <gtest/gtest.h>
#include <limits.h>
#include <math.h>
#include <windows.h>

#include <string>

#include "base/runtime.h"

struct Body {
    const char* name;
    decltype(&FormatText) format;
    decltype(&CopyText) copy;
    decltype(&AppendText) append;
    decltype(&FindChar) first;
    decltype(&FindLastChar) last;
    decltype(&FindInText) find;
    decltype(&SameText) same;
    decltype(&UpperText) upper;
    decltype(&TextLength) length;
    decltype(&memmove) move;
    decltype(&memset) fill;
    decltype(&memcmp) compare;
};

static HMODULE Win32Dll()
{
    static HMODULE dll = LoadLibraryA("runtime-win32.dll");
    return dll;
}
#define WIN32_BODY(name) ((decltype(&name))GetProcAddress(Win32Dll(), #name))

static const Body bodies[] = {
    {"standard", FormatText, CopyText, AppendText, FindChar, FindLastChar, FindInText, SameText, UpperText,
     TextLength, memmove, memset, memcmp},
    {"win32", WIN32_BODY(FormatText), WIN32_BODY(CopyText), WIN32_BODY(AppendText), WIN32_BODY(FindChar),
     WIN32_BODY(FindLastChar), WIN32_BODY(FindInText), WIN32_BODY(SameText), WIN32_BODY(UpperText),
     WIN32_BODY(TextLength), WIN32_BODY(memmove), WIN32_BODY(memset), WIN32_BODY(memcmp)},
};

enum { JUNK = 0x5A, OUT_SIZE = 2048 };

// The whole buffer a call should leave: the text and its terminator over
// junk, or nothing written at all (NULL).
static void ExpectWritten(const char* expected, const char* out)
{
    std::string want(OUT_SIZE, (char)JUNK);
    if (expected) want.replace(0, strlen(expected) + 1, expected, strlen(expected) + 1);
    EXPECT_EQ(want, std::string(out, OUT_SIZE)) << (expected ? expected : "(nothing)");
}

typedef decltype(&FormatText) FormatFn;
#define FORMAT(...) [](FormatFn f, char* o, size_t n) { return f(o, n, __VA_ARGS__); }
static const std::string w1020(1020, 'w'), w1500(1500, 'w');
static const std::string w1023(1023, 'w'), w1020_cut = w1020 + "|12";

static const struct {
    size_t size;
    const char* expected;
    int (*call)(FormatFn f, char* out, size_t size);
} format_cases[] = {
    {64, "1024x768--16 bits, 85 Hz", FORMAT("%dx%d--%d bits, %d Hz", 1024, 768, 16, 85)},
    {64, "SOFTWARE\\QUORVEL\\PANEL\\53338811", FORMAT("%s\\%04x%04x", "SOFTWARE\\QUORVEL\\PANEL", 0x5333, 0x8811)},
    {40, "BUS_01&DEV_1f", FORMAT("BUS_%02x&DEV_%02x", 1, 0x1F)},
    {64, "800x600x16x75H", FORMAT("%dx%dx%dx%d%c", 800, 600, 16, 75, 'H')},
    {16, "-2147483648", FORMAT("%d", INT_MIN)},
    {16, "-7|4294967295", FORMAT("%d|%u", -7, 0xFFFFFFFFu)},
    {32, "ffffffff|ABCDEF|12345", FORMAT("%x|%X|%04x", -1, 0xABCDEF, 0x12345)},
    {32, "[   42|42   |00042]", FORMAT("[%5d|%-5d|%05d]", 42, 42, 42)},
    {32, "[      ab|abcd|z]", FORMAT("[%8s|%-3s|%c]", "ab", "abcd", 'z')},
    {4, "", FORMAT("")},
    {8, "SOFTWAR", FORMAT("%s", "SOFTWARE")},
    {5, "1234", FORMAT("%d", 1234)},
    {1, "", FORMAT("%d", 5)},
    {0, NULL, FORMAT("%d", 5)},
    {OUT_SIZE, w1023.c_str(), FORMAT("%s", w1500.c_str())},
    {OUT_SIZE, w1020_cut.c_str(), FORMAT("%s|%d", w1020.c_str(), 12345)},
};

TEST(Runtime, FormatText)
{
    for (const Body& b : bodies) {
        SCOPED_TRACE(b.name);
        for (const auto& c : format_cases) {
            char out[OUT_SIZE];
            memset(out, JUNK, sizeof out);
            EXPECT_EQ(c.expected ? (int)strlen(c.expected) : 0, c.call(b.format, out, c.size));
            ExpectWritten(c.expected, out);
        }
    }
}

TEST(Runtime, BoundedCopies)
{
    static const struct {
        const char* before;  // NULL: a copy, else an append to this
        size_t size;
        const char* text;
        bool ok;
        const char* after;
    } cases[] = {
        {NULL, 8, "HookKeep", true, "HookKee"},  {NULL, 9, "HookKeep", true, "HookKeep"},
        {NULL, 1, "abc", true, ""},              {NULL, 0, "abc", true, NULL},
        {"Class\\", 14, "DEFAULT", true, "Class\\DEFAULT"},
        {"Class\\", 13, "DEFAULT", false, "Class\\"},
        {"abc", 4, "", true, "abc"},
    };
    for (const Body& b : bodies) {
        SCOPED_TRACE(b.name);
        for (const auto& c : cases) {
            char out[OUT_SIZE];
            memset(out, JUNK, sizeof out);
            if (c.before) {
                strcpy(out, c.before);
                EXPECT_EQ(c.ok, b.append(out, c.size, c.text)) << c.before << c.text;
            } else {
                b.copy(out, c.size, c.text);
            }
            ExpectWritten(c.after, out);
        }
    }
}

// Offsets of what is found, -1 for nothing.
static long At(const char* text, const char* found) { return found ? (long)(found - text) : -1; }

TEST(Runtime, SearchesAndComparisons)
{
    static const struct {
        const char* text;
        char c;
        const char* part;
        long first, last, found;
    } searches[] = {
        {"56,60,72", ',', "60", 2, 5, 3},
        {"PCI\\VEN_5333&DEV_8811\\BUS_01", '\\', "BUS_01", 3, 21, 22},
        {"abab", 'b', "abc", 1, 3, -1},
        {"75", ',', "", -1, -1, 0},
        {"", ',', "PCI", -1, -1, -1},
        {"aab", 0, "ab", 3, 3, 1},
    };
    static const struct {
        const char* a;
        const char* b;
        size_t length;
        bool same;
    } comparisons[] = {
        {"S3 Trio64V2", "S3 Trio64V2", 31, true},        {"S3 Trio64", "S3 Trio64V2", 31, false},
        {"S3 Trio64V2", "S3 Trio64", 31, false},         {"S3 Trio64V2/DX", "S3 Trio64V2/GX", 12, true},
        {"S3 Trio64V2/DX", "S3 Trio64V2/GX", 13, false}, {"a", "b", 0, true},
        {"ab\0x", "ab\0y", 4, true},  // nothing counts after the end
    };
    for (const Body& b : bodies) {
        SCOPED_TRACE(b.name);
        for (const auto& s : searches) {
            EXPECT_EQ(s.first, At(s.text, b.first(s.text, s.c))) << s.text;
            EXPECT_EQ(s.last, At(s.text, b.last(s.text, s.c))) << s.text;
            EXPECT_EQ(s.found, At(s.text, b.find(s.text, s.part))) << s.text;
            EXPECT_EQ(strlen(s.text), b.length(s.text)) << s.text;
        }
        for (const auto& c : comparisons) EXPECT_EQ(c.same, b.same(c.a, c.b, c.length)) << c.a << "/" << c.b << c.length;
        char key[] = "pci\\ven_5333&dev_8a01\\bus_01&dev_1f";
        b.upper(key);
        EXPECT_STREQ("PCI\\VEN_5333&DEV_8A01\\BUS_01&DEV_1F", key);
    }
}

TEST(Runtime, Memory)
{
    for (const Body& b : bodies) {
        SCOPED_TRACE(b.name);
        char bytes[] = "0123456789";
        b.move(bytes + 2, bytes, 6);
        b.move(bytes, bytes + 3, 5);
        b.fill(bytes + 7, 0x141, 2);
        EXPECT_STREQ("1234534AA9", bytes);
        EXPECT_GT(b.compare("ab\x80", "ab\x7F", 3), 0);
        EXPECT_LT(b.compare("a", "b", 1), 0);
        EXPECT_EQ(0, b.compare("ab", "ac", 1));
    }
    unsigned char* block = (unsigned char*)WIN32_BODY(AllocZeroed)(100000);
    ASSERT_TRUE(block);
    for (int i = 0; i < 100000; i += 997) ASSERT_EQ(0, block[i]) << i;
    WIN32_BODY(FreeMemory)(block);
    WIN32_BODY(FreeMemory)(NULL);
}

// The process entry hands WinMain the command line without the program name.
TEST(Runtime, ProgramNameSkippedAsTheRuntimeSkipsIt)
{
    static const struct {
        const char* line;
        const char* arguments;
    } cases[] = {
        {"\"C:\\Program Files\\Vistrel\\vistrel.exe\" /A", "/A"},
        {"C:\\VISTREL\\VISTREL.EXE /A", "/A"},
        {"gatectl.exe \t 2  restart ", "2  restart "},
        {"C:\\\"Program Files\"\\gatectl.exe 3 Cls", "3 Cls"},
        {"\"a b\"c d", "d"},
        {"\"vistrel.exe\"", ""},
        {"\"unterminated /A", ""},
        {"", ""},
        {"vistrel.exe\x01/A", "/A"},
        {"C:\\GR\xd6\xdf" "E\\VISTREL.EXE /A", "/A"},  // bytes beyond ASCII belong to the name
    };
    auto skip = (const char* (*)(const char*))GetProcAddress(Win32Dll(), "SkipProgramName");
    ASSERT_TRUE(skip);
    for (const auto& c : cases) EXPECT_STREQ(c.arguments, skip(c.line)) << c.line;
}
