#ifndef QX_LINALG_FUNCTIONS_DIAGONAL_H
#define QX_LINALG_FUNCTIONS_DIAGONAL_H

#include "linalg/scalar.h"

namespace qx {

// Whether every element off the diagonal is exactly 0.
template <ElementType E>
bool IsDiagonal(const ElementOf<E> *a, int32_t n) {
    for (std::ptrdiff_t i = 0; i < n; ++i)
        for (std::ptrdiff_t j = 0; j < n; ++j)
            if (i != j && AbsSum(a[i * n + j]) != 0.0)
                return false;
    return true;
}

} // namespace qx

#endif
