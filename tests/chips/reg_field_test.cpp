#include <gtest/gtest.h>

#include <stdio.h>
#include <string.h>

#include <string>

#include "chips/reg_field.h"

// A register file of junk that logs every access.
static uint8_t file[256];
static std::string accesses;

static std::string Hex(int v)
{
    char text[4];
    snprintf(text, sizeof text, "%02X", v);
    return text;
}
static uint8_t Read(uint8_t i) { return accesses += " r" + Hex(i), file[i]; }
static void Write(uint8_t i, uint8_t value) { accesses += " w" + Hex(i) + "=" + Hex(value), file[i] = value; }

static const RegAccess junk_file = {.read = Read, .write = Write};

static constexpr RegField vertical_total = {{0x06, 0, 7}, {0x07, 0, 0}, {0x07, 5, 5}, {0x5E, 0, 0}};
static constexpr RegField m7 = {{0x13, 0, 6}}, n5 = {{0x12, 0, 4}}, r3 = {{0x12, 5, 7}}, r2 = {{0x12, 5, 6}},
                          bit7 = {{0x12, 7, 7}};
static constexpr RegField m9 = {{0x13, 0, 7}, {0x29, 3, 3}}, n7 = {{0x12, 0, 5}, {0x29, 4, 4}};
static constexpr RegField r3_high = {{0x12, 6, 7}, {0x29, 2, 2}};
static const uint8_t sr29_first[] = {0x29};
static_assert(vertical_total.Highest() == 0x7FF && m9.Highest() == 511);

TEST(RegField, WritesEachRegisterOnceKeepingTheOtherBits)
{
    const struct {  // the fields' values, the registers named first, the accesses, the fields read back
        const char* what;
        RegFieldValue values[3];
        int count;
        const uint8_t* first;
        const char* expected;
        uint32_t read_back[3];
    } cases[] = {
        {"bits above the field are dropped; CR07 read and written once",
         {{&vertical_total, 0xF8C3}}, 1, nullptr, " w06=C3 r07 w07=84 r5E w5E=A4", {0xC3}},
        {"a register the pieces cover whole is not read", {{&m7, 0xFF}, {&n5, 0x33}, {&r3, 13}}, 3, nullptr,
         " r13 w13=FF w12=B3", {0x7F, 0x13, 5}},
        {"a cleared bit makes the write whole", {{&n5, 3}, {&r2, 3}, {&bit7, 0}}, 3, nullptr, " w12=63", {3, 3, 0}},
        {"a register named first leads", {{&m9, 300}, {&n7, 70}, {&r3_high, 1}}, 3, sr29_first,
         " r29 w29=B9 w13=2C w12=46", {300, 70, 1}},
        {"a register named first but in no field is left alone", {{&m7, 1}}, 1, sr29_first, " r13 w13=81", {1}},
    };
    for (const auto& c : cases) {
        memset(file, 0xA5, sizeof file);
        accesses.clear();
        WriteFields(&junk_file, c.values, c.count, c.first, c.first ? 1 : 0);
        EXPECT_EQ(c.expected, accesses) << c.what;
        for (int i = 0; i < c.count; ++i) EXPECT_EQ(c.read_back[i], ReadField(&junk_file, c.values[i].field)) << c.what;
    }
    accesses.clear();
    ReadField(&junk_file, &vertical_total);
    EXPECT_EQ(" r06 r07 r5E", accesses);
}
