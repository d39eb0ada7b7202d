#ifndef QX_SPECIAL_DIAGONAL_H
#define QX_SPECIAL_DIAGONAL_H

#include <cmath>

namespace qx {

// The few complex operations that the Kelvin functions need, in a fixed order of arithmetic;
// arguments stay far from overflow.
struct Complex {
    double re, im;
};

inline Complex operator+(Complex a, Complex b) { return {a.re + b.re, a.im + b.im}; }
inline Complex operator+(Complex a, double b) { return {a.re + b, a.im}; }
inline Complex operator-(Complex a, Complex b) { return {a.re - b.re, a.im - b.im}; }
inline Complex operator*(Complex a, double b) { return {a.re * b, a.im * b}; }
inline Complex operator*(Complex a, Complex b) {
    return {a.re * b.re - a.im * b.im, a.re * b.im + a.im * b.re};
}
inline Complex operator/(Complex a, Complex b) {
    if (std::fabs(b.re) >= std::fabs(b.im)) {
        const double r = b.im / b.re;
        const double d = b.re + b.im * r;
        return {(a.re + a.im * r) / d, (a.im - a.re * r) / d};
    }
    const double r = b.re / b.im;
    const double d = b.re * r + b.im;
    return {(a.re * r + a.im) / d, (a.im * r - a.re) / d};
}
inline Complex SquareRoot(Complex a) { // of the right half plane
    const double re = std::sqrt(0.5 * (std::hypot(a.re, a.im) + a.re));
    return {re, a.im / (2 * re)};
}
inline Complex Log(Complex a) { return {std::log(std::hypot(a.re, a.im)), std::atan2(a.im, a.re)}; }
inline Complex Exp(Complex a) {
    const double e = std::exp(a.re);
    return {e * std::cos(a.im), e * std::sin(a.im)};
}
inline double Size(Complex a) { return std::fabs(a.re) + std::fabs(a.im); }

} // namespace qx

#endif
