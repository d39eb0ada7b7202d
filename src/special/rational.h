#ifndef QX_SPECIAL_RATIONAL_H
#define QX_SPECIAL_RATIONAL_H

#include <cstddef>

namespace qx {

// A polynomial in ascending powers.
template <std::size_t N>
inline double Horner(const double (&c)[N], double x) {
    double y = c[N - 1];
    for (std::size_t i = N - 1; i-- > 0;)
        y = y * x + c[i];
    return y;
}

// A rational function about a centre; P and Q are the numbers of coefficients, degree plus one. The
// tables in special/tables consist of these.
template <std::size_t P, std::size_t Q>
struct Rational {
    double centre;
    double numerator[P];
    double denominator[Q];

    double operator()(double x) const {
        const double h = x - centre;
        return Horner(numerator, h) / Horner(denominator, h);
    }
};

} // namespace qx

#endif
