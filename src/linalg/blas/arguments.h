#ifndef QX_LINALG_BLAS_ARGUMENTS_H
#define QX_LINALG_BLAS_ARGUMENTS_H

#include "linalg/scalar.h"

#include <cstddef>
#include <cstdint>

namespace qx::blas {

// How the BLAS routines read their arguments.

inline bool Is(const char *option, char letter) {
    return *option == letter || *option == letter + 32;
}

inline bool IsReal(double a, double value) { return a == value; }
inline bool IsReal(CDB a, double value) { return a.re == value && a.im == 0.0; }

// A vector with an increment; if it is negative, the first element is the last in memory.
template <ElementType E>
struct Strided {
    ElementOf<E> *data;
    std::ptrdiff_t step;

    Strided(const ElementOf<E> *x, std::ptrdiff_t n, std::ptrdiff_t increment)
        : data(const_cast<ElementOf<E> *>(x) + (increment < 0 ? (1 - n) * increment : 0)),
          step(increment) {}
    ElementOf<E> &operator[](std::ptrdiff_t i) const { return data[i * step]; }
    Strided from(std::ptrdiff_t i) const {
        Strided rest = *this;
        rest.data += i * step;
        return rest;
    }
};

// x[i] = factor x[i]; a factor of 0 does not read x, and a factor of 1 changes nothing.
template <ElementType E>
void Scale(const Strided<E> &x, std::ptrdiff_t n, typename ScalarOf<E>::type factor) {
    if (IsReal(factor, 1.0))
        return;
    const bool clear = IsReal(factor, 0.0);
    for (std::ptrdiff_t i = 0; i < n; ++i)
        x[i] = clear ? ScalarOf<E>::Of(0.0) : factor * x[i];
}

} // namespace qx::blas

#endif
