// Values split across the 8-bit registers of one index/data pair, such as
// the vertical total in CR06, CR07 bits 0 and 5 and CR5E bit 0, described as
// data: a field is the list of its pieces from the value's low bits up.
#ifndef VISTREL_REG_FIELD_H
#define VISTREL_REG_FIELD_H

#include <initializer_list>
#include <stdint.h>

// Bits low..high of register index hold the next bits of the value.
struct RegPiece {
    uint8_t index;
    uint8_t low, high;
};

enum { REG_FIELD_MAX_PIECES = 4 };

void RegFieldIsMalformed();  // never defined: a call fails the build

struct RegField {
    uint8_t count;
    RegPiece pieces[REG_FIELD_MAX_PIECES];

    // Built by the compiler alone: a piece with its bits reversed or past
    // bit 7, or too many pieces, does not compile.
    consteval RegField(std::initializer_list<RegPiece> list) : count(0), pieces{}
    {
        if (list.size() > REG_FIELD_MAX_PIECES) RegFieldIsMalformed();
        for (const RegPiece& p : list) {
            if (p.low > p.high || p.high > 7) RegFieldIsMalformed();
            pieces[count++] = p;
        }
    }

    // The largest value the field holds.
    consteval uint32_t Highest() const
    {
        int bits = 0;
        for (int i = 0; i < count; ++i) bits += pieces[i].high - pieces[i].low + 1;
        return bits >= 32 ? 0xFFFFFFFFu : (1u << bits) - 1;
    }
};

// How the registers of one index/data pair are reached.
struct RegAccess {
    uint8_t (*read)(uint8_t index);
    void (*write)(uint8_t index, uint8_t value);
};

struct RegFieldValue {
    const RegField* field;
    uint32_t value;
};

// Each register the field names is read once.
uint32_t ReadField(const RegAccess* regs, const RegField* field);

// Writes the values into their fields in one pass, each register once: the
// order_count registers of order first, then the others in the order the
// pieces first name them (16 registers at most). A register whose bits the
// pieces cover whole is written without being read; otherwise its other
// bits are read and kept. Value bits above a field's width are ignored.
void WriteFields(const RegAccess* regs, const RegFieldValue* values, int count, const uint8_t* order = nullptr,
                 int order_count = 0);

inline void WriteField(const RegAccess* regs, const RegField* field, uint32_t value)
{
    const RegFieldValue v = {.field = field, .value = value};
    WriteFields(regs, &v, 1);
}

#endif
