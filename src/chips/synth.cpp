#include "chips/synth.h"

double SynthFrequency(const SynthLimits* limits, SynthSetting s)
{
    return limits->fref_hz * (s.m + limits->a) / ((double)(s.n + limits->b) * (double)(1u << s.r));
}

// The chips' own code computes M in 16-bit unsigned arithmetic: a target so
// low that the product falls below a wraps around to a huge M.
static uint16_t MultiplierFor(const SynthLimits* limits, double target, uint16_t n, uint16_t r)
{
    // Truncated toward zero; what lies beyond 32 bits, or at -1 and below,
    // stands for a huge M.
    double product = (double)(1u << r) * (n + limits->b) * target / limits->fref_hz;
    uint32_t whole = product > -1.0 && product < 4294967296.0 ? (uint32_t)(product < 0 ? 0.0 : product) : 0xFFFFFFFFu;
    return (uint16_t)((uint16_t)whole - (uint16_t)limits->a);
}

int SearchSynthesizer(const SynthLimits* limits, double target_hz, SynthSetting* setting)
{
    double ratio_min = limits->vco_min_hz / limits->fref_hz;
    double ratio_max = limits->vco_max_hz / limits->fref_hz;
    uint16_t n = setting->n, r = setting->r;
    for (int step = 0; step < SYNTH_SEARCH_STEPS; ++step) {
        uint16_t m = MultiplierFor(limits, target_hz, n, r);
        if (m >= limits->m_min && m <= limits->m_max) {
            double ratio = (double)(m + limits->a) / (n + limits->b);
            if (ratio >= ratio_min && ratio <= ratio_max) {
                setting->m = m;
                setting->n = n;
                setting->r = r;
                return 1;
            }
            m = ratio < ratio_min ? 0 : (uint16_t)(limits->m_max + 1);
        }
        if (m == 0) {  // too low: a larger divider raises M
            if (n < limits->n_max) ++n;
            else if (r < limits->r_max) ++r;
            else return 0;
        } else {  // too high
            if (n > limits->n_min) --n;
            else if (r > limits->r_min) --r;
            else return 0;
        }
    }
    return 0;
}
