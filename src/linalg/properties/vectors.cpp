#include "linalg/properties/vectors.h"

#include "linalg/scalar.h"
#include "qx/errors.h"

#include <limits>

namespace qx {

namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();

// NaN where one of the moduli is.
template <ElementType E>
double Extreme(const ElementOf<E> *x, int32_t n, bool largest) {
    double extreme = Modulus(x[0]);
    for (int32_t i = 1; i < n && extreme == extreme; ++i) {
        const double size = Modulus(x[i]);
        if (size != size || (largest ? size > extreme : size < extreme))
            extreme = size;
    }
    return extreme;
}

template <ElementType E>
double NormOf(const ElementOf<E> *x, int32_t n, double p) {
    if (p == infinity || p == -infinity)
        return Extreme<E>(x, n, p > 0.0);
    double sum = 0.0;
    if (p == 2.0) {
        for (int32_t i = 0; i < n; ++i)
            sum += SquaredModulus(x[i]);
        return std::sqrt(sum);
    }
    for (int32_t i = 0; i < n; ++i)
        sum += p == 1.0 ? Modulus(x[i]) : std::pow(Modulus(x[i]), p);
    return p == 1.0 ? sum : std::pow(sum, 1.0 / p);
}

template <ElementType E>
ErrorCode Norm(ElementOf<E> *x, int32_t n, double p, DBL *norm, int32_t scaleToUnit) {
    if (n < 1)
        return ErrEmptyInput;
    if (p != p)
        return ErrNonFiniteInput;
    if (p == 0.0)
        return ErrTooFewWeights;
    *norm = NormOf<E>(x, n, p);
    if (scaleToUnit == 0 || *norm == 0.0 || !(*norm < infinity))
        return 0;
    const double reciprocal = 1.0 / *norm;
    for (int32_t i = 0; i < n; ++i)
        x[i] = x[i] * reciprocal;
    return 0;
}

} // namespace

ErrorCode VectorNorm(DBL *x, int32_t n, double p, DBL *norm, int32_t scaleToUnit) {
    return Norm<ElementType::DBL>(x, n, p, norm, scaleToUnit);
}
ErrorCode VectorNorm(CDB *x, int32_t n, double p, DBL *norm, int32_t scaleToUnit) {
    return Norm<ElementType::CDB>(x, n, p, norm, scaleToUnit);
}

} // namespace qx
