#ifndef QX_FIT_TESTS_LEAST_SQUARES_H
#define QX_FIT_TESTS_LEAST_SQUARES_H

#include "tests/support/hostile_host.h"

#include <cmath>
#include <cstddef>
#include <limits>
#include <utility>
#include <vector>

// Least squares by definition, in extended precision.

namespace qx::test {

typedef long double Long;
typedef std::vector<double> Samples;
typedef std::vector<Samples> Rows;

inline const double nan = std::numeric_limits<double>::quiet_NaN();
inline const double infinity = std::numeric_limits<double>::infinity();

// The inverse of a square matrix, by Gauss-Jordan elimination with row exchanges.
inline std::vector<std::vector<Long>> Inverse(std::vector<std::vector<Long>> a) {
    const std::size_t n = a.size();
    std::vector<std::vector<Long>> inverse(n, std::vector<Long>(n));
    for (std::size_t i = 0; i < n; ++i)
        inverse[i][i] = 1;
    for (std::size_t i = 0; i < n; ++i) {
        std::size_t pivot = i;
        for (std::size_t r = i; r < n; ++r)
            pivot = std::fabs(a[r][i]) > std::fabs(a[pivot][i]) ? r : pivot;
        std::swap(a[i], a[pivot]);
        std::swap(inverse[i], inverse[pivot]);
        const Long factor = a[i][i];
        for (std::size_t j = 0; j < n; ++j) {
            a[i][j] /= factor;
            inverse[i][j] /= factor;
        }
        for (std::size_t r = 0; r < n; ++r) {
            const Long multiple = a[r][i];
            for (std::size_t j = 0; r != i && j < n; ++j) {
                a[r][j] -= multiple * a[i][j];
                inverse[r][j] -= multiple * inverse[i][j];
            }
        }
    }
    return inverse;
}

struct Solution {
    std::vector<Long> c;
    std::vector<std::vector<Long>> covariance;
};

// Solves the normal equations, for well-conditioned rows. `w` may be empty.
inline Solution SolveNormal(const Rows &rows, const Samples &y, const Samples &w) {
    const std::size_t k = rows[0].size();
    std::vector<std::vector<Long>> normal(k, std::vector<Long>(k));
    std::vector<Long> right(k);
    for (std::size_t i = 0; i < rows.size(); ++i)
        for (std::size_t j = 0; j < k; ++j) {
            const Long weighted = Long{rows[i][j]} * (w.empty() ? 1.0 : std::fabs(w[i]));
            right[j] += weighted * y[i];
            for (std::size_t l = 0; l < k; ++l)
                normal[j][l] += weighted * rows[i][l];
        }
    Solution solution = {std::vector<Long>(k), Inverse(normal)};
    for (std::size_t j = 0; j < k; ++j)
        for (std::size_t l = 0; l < k; ++l)
            solution.c[j] += solution.covariance[j][l] * right[l];
    return solution;
}

// The mean over the samples of |w| (y - f)^2.
template <class Model>
Long MeanSquare(const Samples &y, const Samples &w, Model f) {
    Long sum = 0;
    for (std::size_t i = 0; i < y.size(); ++i) {
        const Long rest = y[i] - f(i);
        sum += rest * rest * (w.empty() ? 1.0 : std::fabs(w[i]));
    }
    return sum / y.size();
}

} // namespace qx::test

#endif
