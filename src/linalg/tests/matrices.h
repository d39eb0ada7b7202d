#ifndef QX_LINALG_TESTS_MATRICES_H
#define QX_LINALG_TESTS_MATRICES_H

#include "frame/views.h"
#include "tests/support/recipe.h"

#include <cmath>
#include <functional>
#include <string>
#include <vector>

namespace qx::test {

inline std::vector<double> Reals(int count, uint64_t seed) {
    Noise noise(seed);
    std::vector<double> x(static_cast<std::size_t>(count));
    for (double &value : x)
        value = noise.symmetric();
    return x;
}
inline std::vector<CDB> Complexes(int count, uint64_t seed) {
    Noise noise(seed);
    std::vector<CDB> x(static_cast<std::size_t>(count));
    for (CDB &z : x) {
        z.re = noise.symmetric();
        z.im = noise.symmetric();
    }
    return x;
}

// Views of the elements of vectors, for internal routines.
inline qx::RealMatrix View(std::vector<double> &a, int m, int n) { return {a.data(), m, n}; }
inline qx::ComplexMatrix View(std::vector<CDB> &a, int m, int n) { return {a.data(), m, n}; }
inline ConstRealMatrix View(const std::vector<double> &a, int m, int n) { return {a.data(), m, n}; }
inline ConstComplexMatrix View(const std::vector<CDB> &a, int m, int n) { return {a.data(), m, n}; }
// The element type of a vector.
template <class Vector>
constexpr ElementType elementIn = ElementType::DBL;
template <>
inline constexpr ElementType elementIn<std::vector<CDB>> = ElementType::CDB;
template <>
inline constexpr ElementType elementIn<std::vector<int32_t>> = ElementType::I32;
template <class T>
VectorView<elementIn<std::vector<T>>> View(std::vector<T> &x) {
    return {x.data(), static_cast<std::ptrdiff_t>(x.size())};
}
template <class T>
ConstVectorView<elementIn<std::vector<T>>> View(const std::vector<T> &x) {
    return {x.data(), static_cast<std::ptrdiff_t>(x.size())};
}

// The kinds of matrices on which factorisations are tried: element (i, j) of an m by n matrix.
struct MatrixKind {
    const char *name;
    std::function<double(int i, int j, int m, int n, Noise &noise)> element;
};

inline const std::vector<MatrixKind> &MatrixKinds() {
    static const std::vector<MatrixKind> kinds = {
        {"random", [](int, int, int, int, Noise &noise) { return noise.symmetric(); }},
        {"zero", [](int, int, int, int, Noise &) { return 0.0; }},
        {"ones, of rank 1", [](int, int, int, int, Noise &) { return 1.0; }},
        {"graded", [](int i, int j, int, int,
                      Noise &noise) { return std::ldexp(noise.symmetric(), 40 - i - j); }},
        {"of rank 2", [](int i, int j, int, int, Noise &) { return 1.0 + i + 3.0 * j * i; }},
        {"badly scaled",
         [](int i, int j, int, int, Noise &noise) {
             return std::ldexp(noise.symmetric(), i % 3 * 30 + j % 2 * 20);
         }},
        {"huge", [](int, int, int, int, Noise &noise) { return noise.symmetric() * 0x1p1000; }},
        {"nearly defective",
         [](int i, int j, int, int, Noise &) {
             return i == j ? 2.0 : j == i + 1 ? 1.0 : j == 0 && i > 0 ? 1e-10 : 0.0;
         }},
        {"Hilbert", [](int i, int j, int, int, Noise &) { return 1.0 / (i + j + 1); }},
        {"Vandermonde", [](int i, int j, int m, int,
                           Noise &) { return std::pow(static_cast<double>(i + 1) / m, j); }},
        {"Frank",
         [](int i, int j, int, int n, Noise &) {
             return j < i - 1 ? 0.0 : static_cast<double>(n - std::max(i, j));
         }},
        {"Kahan",
         [](int i, int j, int, int, Noise &) {
             return std::pow(std::sin(1.2), i) * (i == j ? 1.0 : i < j ? -std::cos(1.2) : 0.0);
         }},
        {"Grcar",
         [](int i, int j, int, int, Noise &) {
             return j == i - 1 ? -1.0 : j >= i && j <= i + 3 ? 1.0 : 0.0;
         }},
    };
    return kinds;
}

inline std::vector<double> RealMatrix(const MatrixKind &kind, int m, int n) {
    Noise noise(static_cast<uint64_t>(m * 1000 + n));
    std::vector<double> a;
    for (int i = 0; i < m; ++i)
        for (int j = 0; j < n; ++j)
            a.push_back(kind.element(i, j, m, n, noise));
    return a;
}
// The same with each element multiplied by a phase.
inline std::vector<CDB> ComplexMatrix(const MatrixKind &kind, int m, int n) {
    Noise noise(static_cast<uint64_t>(m * 1000 + n)), phase(7);
    std::vector<CDB> a;
    for (int i = 0; i < m; ++i)
        for (int j = 0; j < n; ++j) {
            const double modulus = kind.element(i, j, m, n, noise);
            const double angle = 3.0 * phase.symmetric();
            a.push_back({modulus * std::cos(angle), modulus * std::sin(angle)});
        }
    return a;
}

// a 2^power.
inline std::vector<double> Scaled(std::vector<double> a, int power) {
    for (double &x : a)
        x = std::ldexp(x, power);
    return a;
}
inline std::vector<CDB> Scaled(std::vector<CDB> a, int power) {
    for (CDB &x : a)
        x = {std::ldexp(x.re, power), std::ldexp(x.im, power)};
    return a;
}

} // namespace qx::test

#endif
