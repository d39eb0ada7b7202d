#ifndef QX_WINDOWS_SIGNAL_H
#define QX_WINDOWS_SIGNAL_H

#include "frame/elements.h"

#include <cstddef>

namespace qx {

// What a window multiplies: the real and the complex form of every window are one text over
// these two. A complex sample has both parts multiplied by the same real value.

struct RealSignal {
    RealSignal(DBL *samples) : x(samples) {}
    void scale(std::ptrdiff_t i, double w) const { x[i] *= w; }
    void clear(std::ptrdiff_t i) const { x[i] = 0.0; }
    DBL *x;
};

struct ComplexSignal {
    ComplexSignal(CDB *samples) : x(samples) {}
    void scale(std::ptrdiff_t i, double w) const {
        x[i].re *= w;
        x[i].im *= w;
    }
    void clear(std::ptrdiff_t i) const { x[i] = {0.0, 0.0}; }
    CDB *x;
};

// Multiplies n samples by the window w.
template <class Signal>
void Multiply(Signal x, int32_t n, const DBL *w) {
    for (int32_t i = 0; i < n; ++i)
        x.scale(i, w[i]);
}

} // namespace qx

#endif
