#include "linalg/properties/vectors.h"

#include <limits>

namespace qx {

namespace {

constexpr double infinity = std::numeric_limits<double>::infinity();

// NaN if one of the moduli is NaN.
template <ElementType E>
double Extreme(ConstVectorView<E> x, bool largest) {
    double extreme = Modulus(x[0]);
    for (std::ptrdiff_t i = 1; i < x.size() && extreme == extreme; ++i) {
        const double size = Modulus(x[i]);
        if (size != size || (largest ? size > extreme : size < extreme))
            extreme = size;
    }
    return extreme;
}

} // namespace

template <ElementType E>
double VectorNorm(ConstVectorView<E> x, double p) {
    QX_EXPECTS(!x.isEmpty() && p == p && p != 0.0);
    if (p == infinity || p == -infinity)
        return Extreme<E>(x, p > 0.0);
    double sum = 0.0;
    if (p == 2.0) {
        for (const ElementOf<E> &element : x)
            sum += SquaredModulus(element);
        return std::sqrt(sum);
    }
    for (const ElementOf<E> &element : x)
        sum += p == 1.0 ? Modulus(element) : std::pow(Modulus(element), p);
    return p == 1.0 ? sum : std::pow(sum, 1.0 / p);
}

template double VectorNorm(ConstRealVector, double);
template double VectorNorm(ConstComplexVector, double);

} // namespace qx
