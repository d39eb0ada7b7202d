#include "linalg/equations/triangular_equation.h"

#include "linalg/products/products.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace qx {
namespace {

constexpr int growthLimit = 500; // exponent

// At most four unknowns: those of one 2 by 2 block.
constexpr int mostUnknowns = 4;
struct SmallSystem {
    int n;
    double a[mostUnknowns][mostUnknowns];
    double x[mostUnknowns]; // the right side, then the solution
};

// Gaussian elimination with complete pivoting.
void Solve(SmallSystem &system, double leastPivot) {
    const int n = system.n;
    auto &a = system.a;
    auto &x = system.x;
    int unknown[mostUnknowns] = {0, 1, 2, 3};
    for (int k = 0; k < n; ++k) {
        int row = k, col = k;
        for (int i = k; i < n; ++i)
            for (int j = k; j < n; ++j)
                if (std::fabs(a[i][j]) > std::fabs(a[row][col])) {
                    row = i;
                    col = j;
                }
        std::swap(a[k], a[row]);
        std::swap(x[k], x[row]);
        std::swap(unknown[k], unknown[col]);
        for (int i = 0; i < n; ++i)
            std::swap(a[i][k], a[i][col]);
        if (!(std::fabs(a[k][k]) >= leastPivot))
            a[k][k] = leastPivot;
        for (int i = k + 1; i < n; ++i) {
            const double factor = a[i][k] / a[k][k];
            for (int j = k + 1; j < n; ++j)
                a[i][j] -= factor * a[k][j];
            x[i] -= factor * x[k];
        }
    }
    double solution[mostUnknowns] = {};
    for (int k = n - 1; k >= 0; --k) {
        double sum = x[k];
        for (int j = k + 1; j < n; ++j)
            sum -= a[k][j] * solution[unknown[j]];
        solution[unknown[k]] = sum / a[k][k];
    }
    for (int k = 0; k < n; ++k)
        x[k] = solution[k];
}

template <ElementType E>
class Substitution {
    typedef ElementOf<E> T;
    typedef typename ScalarOf<E>::type Value;

public:
    Substitution(const TriangularEquation<E> &equation, const MatrixView<E> &f,
                 const MatrixView<E> &work)
        : equation_(equation), f_(f), work_(work) {}

    int run() {
        solve({0, f_.rows()}, {0, f_.cols()});
        return exponent_;
    }

private:
    struct Range {
        int32_t from, to;
        int32_t size() const { return to - from; }
    };

    template <bool Writable>
    static BasicMatrixView<E, Writable> part(const BasicMatrixView<E, Writable> &whole, Range rows,
                                             Range cols) {
        return whole.block(rows.from, cols.from, rows.size(), cols.size());
    }

    // Whether rows i - 1 and i of s or t belong to one block.
    static bool isInPair(const ConstMatrixView<E> &triangle, int32_t i) {
        return E == ElementType::DBL && AbsSum(triangle(i, i - 1)) != 0.0;
    }
    static bool isCell(const ConstMatrixView<E> &triangle, Range range) {
        return range.size() == 1 || (range.size() == 2 && isInPair(triangle, range.from + 1));
    }
    static int32_t middle(const ConstMatrixView<E> &triangle, Range range) {
        const int32_t i = range.from + range.size() / 2;
        return isInPair(triangle, i) ? i + 1 : i;
    }

    void solve(Range rows, Range cols) {
        const bool rowCell = isCell(equation_.s, rows), colCell = isCell(equation_.t, cols);
        if (rowCell && colCell)
            solveCell(rows, cols);
        else if (rowCell || (!colCell && cols.size() > rows.size()))
            splitColumns(rows, cols);
        else
            splitRows(rows, cols);
    }

    void splitColumns(Range rows, Range cols) {
        const int32_t at = middle(equation_.t, cols);
        const Range left = {cols.from, at}, right = {at, cols.to};
        solve(rows, left);
        subtractSolved(part(equation_.s, rows, rows), part(f_, rows, left),
                       part(equation_.t, left, right), part(f_, rows, right), true);
        solve(rows, right);
    }

    void splitRows(Range rows, Range cols) {
        const int32_t at = middle(equation_.s, rows);
        const Range upper = {rows.from, at}, lower = {at, rows.to};
        solve(lower, cols);
        subtractSolved(part(equation_.s, upper, lower), part(f_, lower, cols),
                       part(equation_.t, cols, cols), part(f_, upper, cols), false);
        solve(upper, cols);
    }

    // Subtracts the terms of the solved part y from f: s y t, or in a sum y t or s y alone.
    void subtractSolved(const ConstMatrixView<E> &s, const ConstMatrixView<E> &y,
                        const ConstMatrixView<E> &t, const MatrixView<E> &f, bool throughT) {
        if (equation_.products) {
            const MatrixView<E> yt(work_.data(), y.rows(), t.cols(), work_.stride());
            OrderedProduct<E>(y, t, yt);
            SubtractProduct<E>(s, yt, f);
        } else if (throughT) {
            SubtractProduct<E>(y, t, f);
        } else {
            SubtractProduct<E>(s, y, f);
        }
    }

    void solveCell(Range rows, Range cols) {
        if (rows.size() == 1 && cols.size() == 1) {
            const Value s = equation_.s(rows.from, rows.from);
            const Value t = equation_.t(cols.from, cols.from);
            const Value factor =
                equation_.products ? s * t - ScalarOf<E>::Of(equation_.tau) : s + t;
            T &y = f_(rows.from, cols.from);
            y = y / factor;
            limitGrowth(AbsSum(y));
        } else if constexpr (E == ElementType::DBL) {
            solvePairs(rows, cols);
        }
    }

    void solvePairs(Range rows, Range cols) {
        const int r = rows.size(), c = cols.size();
        SmallSystem system = {r * c, {}, {}};
        const ConstMatrixView<E> s = part(equation_.s, rows, rows);
        const ConstMatrixView<E> t = part(equation_.t, cols, cols);
        const MatrixView<E> f = part(f_, rows, cols);
        for (int i = 0; i < r; ++i)
            for (int j = 0; j < c; ++j) {
                system.x[i * c + j] = f(i, j);
                for (int k = 0; k < r; ++k)
                    for (int l = 0; l < c; ++l)
                        system.a[i * c + j][k * c + l] =
                            equation_.products
                                ? s(i, k) * t(l, j) - (i == k && j == l ? equation_.tau : 0.0)
                                : (j == l ? s(i, k) : 0.0) + (i == k ? t(l, j) : 0.0);
            }
        Solve(system, equation_.leastPivot);
        double largest = 0.0;
        for (int i = 0; i < r; ++i)
            for (int j = 0; j < c; ++j) {
                f(i, j) = system.x[i * c + j];
                largest = std::max(largest, std::fabs(system.x[i * c + j]));
            }
        limitGrowth(largest);
    }

    void limitGrowth(double size) {
        if (!(size > 0x1p500))
            return;
        for (int32_t i = 0; i < f_.rows(); ++i)
            for (int32_t j = 0; j < f_.cols(); ++j)
                f_(i, j) = f_(i, j) * 0x1p-500;
        exponent_ += growthLimit;
    }

    const TriangularEquation<E> &equation_;
    MatrixView<E> f_, work_;
    int exponent_ = 0;
};

} // namespace

template <ElementType E>
int SolveTriangularEquation(const TriangularEquation<E> &equation, const MatrixView<E> &f,
                            const MatrixView<E> &work) {
    QX_EXPECTS(f.rows() == equation.s.rows() && f.cols() == equation.t.rows());
    return Substitution<E>(equation, f, work).run();
}

template int SolveTriangularEquation(const TriangularEquation<ElementType::DBL> &,
                                     const RealMatrix &, const RealMatrix &);
template int SolveTriangularEquation(const TriangularEquation<ElementType::CDB> &,
                                     const ComplexMatrix &, const ComplexMatrix &);

} // namespace qx
