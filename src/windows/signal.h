#ifndef QX_WINDOWS_SIGNAL_H
#define QX_WINDOWS_SIGNAL_H

#include "frame/views.h"

#include <cstddef>

namespace qx {

// The effect of a window on a sample: the real and the complex form of every window are one
// template over these functions. A complex sample has both parts multiplied by the same real value.
inline void Scale(DBL &sample, double w) { sample *= w; }
inline void Scale(CDB &sample, double w) {
    sample.re *= w;
    sample.im *= w;
}
inline void Clear(DBL &sample) { sample = 0.0; }
inline void Clear(CDB &sample) { sample = {0.0, 0.0}; }

template <ElementType E>
int32_t Count(VectorView<E> x) {
    return static_cast<int32_t>(x.size());
}

// Multiplies the samples by the first values of w.
template <ElementType E>
void Multiply(VectorView<E> x, ConstRealVector w) {
    for (std::ptrdiff_t i = 0; i < x.size(); ++i)
        Scale(x[i], w[i]);
}

} // namespace qx

#endif
