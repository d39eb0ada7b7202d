#ifndef QX_LINALG_RECIPES_CONTENTS_H
#define QX_LINALG_RECIPES_CONTENTS_H

#include <cmath>
#include <cstdint>

namespace qx::test {

// Contents of the matrices in recipes for which noise does not serve: element (i, j), or element i
// of a packed matrix. Imaginary parts are noise below 1.

// Diagonally dominant.
struct PositiveDefinite {
    int32_t n;
    double operator()(int32_t i, int32_t j) const { return i == j ? 3.0 * n : 1.0 / (1.0 + i + j); }
};
// The same as a packed lower triangle.
struct PositivePacked {
    int32_t n;
    double operator()(int32_t index) const {
        int32_t column = 0;
        // Beyond the last column, in an array that is longer than the triangle, any value will do.
        for (; column < n - 1 && index >= n - column; ++column)
            index -= n - column;
        return PositiveDefinite{n}(column + index, column);
    }
};
// Rows and columns of very different magnitude.
struct Graded {
    double operator()(int32_t i, int32_t j) const {
        return std::ldexp(1.0 + (3 * i + j) % 5, 4 * (i % 7) - 5 * (j % 6));
    }
};

} // namespace qx::test

#endif
