#include "chips/reg_field.h"

static uint8_t PieceMask(const RegPiece& p) { return (uint8_t)((0xFFu >> (7 - p.high + p.low)) << p.low); }

uint32_t ReadField(const RegAccess* regs, const RegField* field)
{
    uint8_t read[REG_FIELD_MAX_PIECES];
    uint32_t value = 0;
    int shift = 0;
    for (int i = 0; i < field->count; ++i) {
        const RegPiece& p = field->pieces[i];
        int earlier = 0;
        while (earlier < i && field->pieces[earlier].index != p.index) ++earlier;
        read[i] = earlier < i ? read[earlier] : regs->read(p.index);
        value |= (uint32_t)((read[i] & PieceMask(p)) >> p.low) << shift;
        shift += p.high - p.low + 1;
    }
    return value;
}

// The bits the values put into register index, and which bits those are.
static void Gather(const RegFieldValue* values, int count, uint8_t index, uint8_t* bits, uint8_t* mask)
{
    *bits = *mask = 0;
    for (int v = 0; v < count; ++v) {
        uint32_t rest = values[v].value;
        const RegField* f = values[v].field;
        for (int i = 0; i < f->count; ++i) {
            const RegPiece& p = f->pieces[i];
            if (p.index == index) {
                *mask |= PieceMask(p);
                *bits |= (uint8_t)((rest << p.low) & PieceMask(p));
            }
            rest >>= p.high - p.low + 1;
        }
    }
}

enum { MAX_REGISTERS = 16 };

static int AddRegister(uint8_t* list, int n, uint8_t index)
{
    for (int k = 0; k < n; ++k)
        if (list[k] == index) return n;
    if (n < MAX_REGISTERS) list[n++] = index;
    return n;
}

void WriteFields(const RegAccess* regs, const RegFieldValue* values, int count, const uint8_t* order, int order_count)
{
    uint8_t list[MAX_REGISTERS];
    int n = 0;
    for (int o = 0; o < order_count; ++o) n = AddRegister(list, n, order[o]);
    for (int v = 0; v < count; ++v)
        for (int i = 0; i < values[v].field->count; ++i) n = AddRegister(list, n, values[v].field->pieces[i].index);
    for (int k = 0; k < n; ++k) {
        uint8_t bits, mask;
        Gather(values, count, list[k], &bits, &mask);
        if (!mask) continue;
        if (mask != 0xFF) bits |= (uint8_t)(regs->read(list[k]) & ~mask);
        regs->write(list[k], bits);
    }
}
