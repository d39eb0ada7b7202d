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

// The polynomial of a table of them on intervals of length 1 / `perUnit` from 0 on, each in powers of
// the distance from the middle of its interval in interval lengths. Even and odd powers are summed
// apart, which halves the time; the leading coefficient, added last, exceeds the rest.
template <std::size_t Count, std::size_t N>
inline double Piece(const double (&table)[Count][N], double perUnit, double x) {
    const double place = perUnit * x;
    const auto index = static_cast<std::size_t>(place);
    const double(&c)[N] = table[index < Count ? index : Count - 1];
    const double h = place - (static_cast<double>(index < Count ? index : Count - 1) + 0.5);
    const double z = h * h;
    double even = 0.0, odd = 0.0;
    for (std::size_t i = N - 1; i > 0; --i)
        (i % 2 == 0 ? even : odd) = (i % 2 == 0 ? even : odd) * z + c[i];
    return c[0] + (odd * h + even * z);
}

} // namespace qx

#endif
