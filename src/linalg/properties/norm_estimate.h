#ifndef QX_LINALG_PROPERTIES_NORM_ESTIMATE_H
#define QX_LINALG_PROPERTIES_NORM_ESTIMATE_H

#include "linalg/matrix.h"

#include <algorithm>

namespace qx {

// The largest sum of moduli of a column.
template <ElementType E>
double OneNorm(const ConstMatrixView<E> &a) {
    double largest = 0.0;
    for (int32_t j = 0; j < a.cols(); ++j) {
        double sum = 0.0;
        for (int32_t i = 0; i < a.rows(); ++i)
            sum += Modulus(a(i, j));
        largest = std::max(largest, sum);
    }
    return largest;
}

// Estimates from below the 1-norm of a matrix of order n that is known only by its products with
// vectors: multiply(x) replaces x by A x, multiplyAdjoint(x) by A^H x, and neither can fail. At
// most four or five products of each kind are formed; the estimate is usually exact and seldom
// below a third (N. J. Higham, "FORTRAN codes for estimating the one-norm of a real or complex
// matrix, with applications to condition estimation", 1988). x is memory for n elements. The
// estimate is infinite if a product is not finite.
template <ElementType E, class Multiply, class MultiplyAdjoint>
double EstimateOneNorm(VectorView<E> x, Multiply multiply, MultiplyAdjoint multiplyAdjoint) {
    const auto n = static_cast<int32_t>(x.size());
    const auto sumOf = [n](VectorView<E> v) {
        double sum = 0.0;
        for (int32_t i = 0; i < n; ++i)
            sum += Modulus(v[i]);
        return sum < HUGE_VAL ? sum : HUGE_VAL;
    };
    for (int32_t i = 0; i < n; ++i)
        x[i] = ScalarOf<E>::Of(1.0 / n);
    multiply(x);
    double estimate = sumOf(x);
    if (n == 1 || !(estimate < HUGE_VAL))
        return estimate;
    int32_t column = -1;
    for (int round = 0; round < 5; ++round) {
        for (int32_t i = 0; i < n; ++i) {
            const double modulus = Modulus(x[i]);
            x[i] = modulus > 0.0 ? x[i] / modulus : ScalarOf<E>::Of(1.0);
        }
        multiplyAdjoint(x);
        int32_t next = 0;
        for (int32_t i = 1; i < n; ++i)
            if (Modulus(x[i]) > Modulus(x[next]))
                next = i;
        if (next == column || (column >= 0 && Modulus(x[next]) == Modulus(x[column])))
            break;
        column = next;
        for (int32_t i = 0; i < n; ++i)
            x[i] = ScalarOf<E>::Of(i == column ? 1.0 : 0.0);
        multiply(x);
        const double sum = sumOf(x);
        if (!(sum > estimate))
            break;
        estimate = sum;
    }
    // A vector that guards against matrices which defeat the iteration above.
    for (int32_t i = 0; i < n; ++i)
        x[i] = ScalarOf<E>::Of((i % 2 == 0 ? 1.0 : -1.0) * (1.0 + double(i) / (n - 1)));
    multiply(x);
    return std::max(estimate, 2.0 * sumOf(x) / (3.0 * n));
}

} // namespace qx

#endif
