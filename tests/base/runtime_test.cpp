// The product's runtime body (USER32 and KERNEL32; here a DLL without any C
// runtime) against the standard body of the other builds: the same bytes
// on what the program formats, copies and looks for, and on the edges.
#include <gtest/gtest.h>
#include <limits.h>
#include <math.h>
#include <windows.h>

#include <string>

#include "base/runtime.h"

static HMODULE Body()
{
    static HMODULE dll = LoadLibraryA("runtime-win32.dll");
    return dll;
}
#define WIN32_BODY(name) ((decltype(&name))GetProcAddress(Body(), #name))

typedef decltype(&FormatText) FormatFn;
static const std::string w1020(1020, 'w'), w1500(1500, 'w');
static const std::string w1023(1023, 'w'), w1020_cut = w1020 + "|12";

// expected NULL: nothing written.
static const struct {
    size_t size;
    const char* expected;
    int (*call)(FormatFn f, char* out, size_t size);
} format_cases[] = {
    {64, "1024x768--16 bits, 85 Hz",
     [](FormatFn f, char* o, size_t n) { return f(o, n, "%dx%d--%d bits, %d Hz", 1024, 768, 16, 85); }},
    {64, "SOFTWARE\\QUORVEL\\PANEL\\53338811",
     [](FormatFn f, char* o, size_t n) { return f(o, n, "%s\\%04x%04x", "SOFTWARE\\QUORVEL\\PANEL", 0x5333, 0x8811); }},
    {40, "BUS_01&DEV_1f", [](FormatFn f, char* o, size_t n) { return f(o, n, "BUS_%02x&DEV_%02x", 1, 0x1F); }},
    {64, "800x600x16x75H", [](FormatFn f, char* o, size_t n) { return f(o, n, "%dx%dx%dx%d%c", 800, 600, 16, 75, 'H'); }},
    {16, "-2147483648", [](FormatFn f, char* o, size_t n) { return f(o, n, "%d", INT_MIN); }},
    {16, "-7|4294967295", [](FormatFn f, char* o, size_t n) { return f(o, n, "%d|%u", -7, 0xFFFFFFFFu); }},
    {32, "ffffffff|ABCDEF|12345", [](FormatFn f, char* o, size_t n) { return f(o, n, "%x|%X|%04x", -1, 0xABCDEF, 0x12345); }},
    {32, "[   42|42   |00042]", [](FormatFn f, char* o, size_t n) { return f(o, n, "[%5d|%-5d|%05d]", 42, 42, 42); }},
    {32, "[      ab|abcd|z]", [](FormatFn f, char* o, size_t n) { return f(o, n, "[%8s|%-3s|%c]", "ab", "abcd", 'z'); }},
    {4, "", [](FormatFn f, char* o, size_t n) { return f(o, n, ""); }},
    {8, "SOFTWAR", [](FormatFn f, char* o, size_t n) { return f(o, n, "%s", "SOFTWARE"); }},
    {5, "1234", [](FormatFn f, char* o, size_t n) { return f(o, n, "%d", 1234); }},
    {1, "", [](FormatFn f, char* o, size_t n) { return f(o, n, "%d", 5); }},
    {0, NULL, [](FormatFn f, char* o, size_t n) { return f(o, n, "%d", 5); }},
    {2000, w1023.c_str(), [](FormatFn f, char* o, size_t n) { return f(o, n, "%s", w1500.c_str()); }},
    {2000, w1020_cut.c_str(), [](FormatFn f, char* o, size_t n) { return f(o, n, "%s|%d", w1020.c_str(), 12345); }},
};

TEST(Runtime, FormatTextAsTheStandardBody)
{
    FormatFn win32 = WIN32_BODY(FormatText);
    ASSERT_TRUE(win32);
    for (size_t i = 0; i < sizeof format_cases / sizeof *format_cases; ++i) {
        const auto& c = format_cases[i];
        char std_out[2048], win32_out[2048];
        memset(std_out, 0x5A, sizeof std_out);
        memset(win32_out, 0x5A, sizeof win32_out);
        int std_length = c.call(FormatText, std_out, c.size);
        EXPECT_EQ(std_length, c.call(win32, win32_out, c.size)) << i;
        EXPECT_EQ(0, memcmp(std_out, win32_out, sizeof std_out)) << i;
        if (c.expected) {
            EXPECT_STREQ(c.expected, std_out) << i;
            EXPECT_EQ((int)strlen(c.expected), std_length) << i;
        } else {
            EXPECT_EQ(0x5A, std_out[0]) << i;
        }
    }
}

TEST(Runtime, BoundedCopiesAsTheStandardBody)
{
    static const struct {
        const char* before;
        size_t size;
        const char* text;
        bool append, ok;
        const char* after;  // NULL: nothing written
    } cases[] = {
        {"", 8, "HookKeep", false, true, "HookKee"},   {"", 9, "HookKeep", false, true, "HookKeep"},
        {"", 1, "abc", false, true, ""},               {"", 0, "abc", false, true, NULL},
        {"Class\\", 14, "DEFAULT", true, true, "Class\\DEFAULT"},
        {"Class\\", 13, "DEFAULT", true, false, "Class\\"},
        {"abc", 4, "", true, true, "abc"},
    };
    auto copy = WIN32_BODY(CopyText);
    auto append = WIN32_BODY(AppendText);
    for (size_t i = 0; i < sizeof cases / sizeof *cases; ++i) {
        const auto& c = cases[i];
        char std_out[32], win32_out[32];
        memset(std_out, 0x5A, sizeof std_out);
        if (c.append) strcpy(std_out, c.before);
        memcpy(win32_out, std_out, sizeof std_out);
        if (c.append) {
            EXPECT_EQ(c.ok, AppendText(std_out, c.size, c.text)) << i;
            EXPECT_EQ(c.ok, append(win32_out, c.size, c.text)) << i;
        } else {
            CopyText(std_out, c.size, c.text);
            copy(win32_out, c.size, c.text);
        }
        EXPECT_EQ(0, memcmp(std_out, win32_out, sizeof std_out)) << i;
        if (c.after) EXPECT_STREQ(c.after, std_out) << i;
        else EXPECT_EQ(0x5A, std_out[0]) << i;
    }
}

// Offsets of what is found, -1 for nothing.
static long At(const char* text, const char* found) { return found ? (long)(found - text) : -1; }

TEST(Runtime, SearchesAsTheStandardBody)
{
    static const struct {
        const char* text;
        char c;
        const char* part;
        long first, last, found;
    } cases[] = {
        {"56,60,72", ',', "60", 2, 5, 3},
        {"PCI\\VEN_5333&DEV_8811\\BUS_01", '\\', "BUS_01", 3, 21, 22},
        {"abab", 'b', "abc", 1, 3, -1},
        {"75", ',', "", -1, -1, 0},
        {"", ',', "PCI", -1, -1, -1},
        {"aab", 0, "ab", 3, 3, 1},
    };
    auto first = WIN32_BODY(FindChar);
    auto last = WIN32_BODY(FindLastChar);
    auto find = WIN32_BODY(FindInText);
    auto length = WIN32_BODY(TextLength);
    for (const auto& c : cases) {
        const char* t = c.text;
        EXPECT_EQ(c.first, At(t, FindChar(t, c.c))) << t;
        EXPECT_EQ(c.first, At(t, first(t, c.c))) << t;
        EXPECT_EQ(c.last, At(t, FindLastChar(t, c.c))) << t;
        EXPECT_EQ(c.last, At(t, last(t, c.c))) << t;
        EXPECT_EQ(c.found, At(t, FindInText(t, c.part))) << t;
        EXPECT_EQ(c.found, At(t, find(t, c.part))) << t;
        EXPECT_EQ(strlen(t), TextLength(t));
        EXPECT_EQ(strlen(t), length(t));
    }
}

TEST(Runtime, ComparisonAndCaseAsTheStandardBody)
{
    static const struct {
        const char* a;
        const char* b;
        size_t length;
        bool same;
    } cases[] = {
        {"S3 Trio64V2", "S3 Trio64V2", 31, true},     {"S3 Trio64", "S3 Trio64V2", 31, false},
        {"S3 Trio64V2", "S3 Trio64", 31, false},      {"S3 Trio64V2/DX", "S3 Trio64V2/GX", 12, true},
        {"S3 Trio64V2/DX", "S3 Trio64V2/GX", 13, false}, {"a", "b", 0, true},
        {"ab\0x", "ab\0y", 4, true},  // nothing counts after the end
    };
    auto same = WIN32_BODY(SameText);
    for (const auto& c : cases) {
        EXPECT_EQ(c.same, SameText(c.a, c.b, c.length)) << c.a << " " << c.b << " " << c.length;
        EXPECT_EQ(c.same, same(c.a, c.b, c.length)) << c.a << " " << c.b << " " << c.length;
    }
    char std_key[] = "pci\\ven_5333&dev_8a01\\bus_01&dev_1f", win32_key[sizeof std_key];
    memcpy(win32_key, std_key, sizeof std_key);
    UpperText(std_key);
    WIN32_BODY(UpperText)(win32_key);
    EXPECT_STREQ("PCI\\VEN_5333&DEV_8A01\\BUS_01&DEV_1F", std_key);
    EXPECT_STREQ(std_key, win32_key);
}

TEST(Runtime, MemoryAsTheStandardBody)
{
    auto move = WIN32_BODY(memmove);
    auto fill = WIN32_BODY(memset);
    auto compare = WIN32_BODY(memcmp);
    char std_bytes[] = "0123456789", win32_bytes[] = "0123456789";
    memmove(std_bytes + 2, std_bytes, 6);
    move(win32_bytes + 2, win32_bytes, 6);
    memmove(std_bytes, std_bytes + 3, 5);
    move(win32_bytes, win32_bytes + 3, 5);
    memset(std_bytes + 7, 0x141, 2);
    fill(win32_bytes + 7, 0x141, 2);
    EXPECT_STREQ("1234534AA9", std_bytes);
    EXPECT_STREQ(std_bytes, win32_bytes);
    EXPECT_GT(compare("ab\x80", "ab\x7F", 3), 0);
    EXPECT_LT(compare("a", "b", 1), 0);
    EXPECT_EQ(0, compare("ab", "ac", 1));

    unsigned char* block = (unsigned char*)WIN32_BODY(AllocZeroed)(100000);
    ASSERT_TRUE(block);
    for (int i = 0; i < 100000; i += 997) ASSERT_EQ(0, block[i]) << i;
    WIN32_BODY(FreeMemory)(block);
    WIN32_BODY(FreeMemory)(NULL);
}

// The clock code still asks for trunc, which the product body provides.
TEST(Runtime, WholeDoublesAsTheStandardBody)
{
    auto whole = (double (*)(double))GetProcAddress(Body(), "trunc");
    for (double x : {0.0, 0.49, 0.5, 2.5, -1.5, 45.0 + 0.5, 57.272727 + 0.5, 4503599627370495.5, 4503599627370497.0,
                     1e300, -1e300})
        EXPECT_EQ(trunc(x), whole(x)) << x;
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
    auto skip = (const char* (*)(const char*))GetProcAddress(Body(), "SkipProgramName");
    ASSERT_TRUE(skip);
    for (const auto& c : cases) EXPECT_STREQ(c.arguments, skip(c.line)) << c.line;
}
