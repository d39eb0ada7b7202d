#ifndef QX_LINALG_FUNCTIONS_DIAGONAL_H
#define QX_LINALG_FUNCTIONS_DIAGONAL_H

#include "linalg/matrix.h"

namespace qx {

// Whether every element off the diagonal is exactly 0.
template <ElementType E>
bool IsDiagonal(const ConstMatrixView<E> &a) {
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < a.cols(); ++j)
            if (i != j && AbsSum(a(i, j)) != 0.0)
                return false;
    return true;
}

} // namespace qx

#endif
