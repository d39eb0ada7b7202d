#include "linalg/systems/least_squares.h"

#include "frame/scratch.h"
#include "linalg/factorisations/svd.h"
#include "linalg/matrix.h"
#include "linalg/products/products.h"

#include <cstring>
#include <initializer_list>
#include <limits>

namespace qx {

namespace {

// a = U diag(s) V^H, in memory of whoever uses it: u is m by k, s has k values, v is n by k.
template <ElementType E>
struct Decomposition {
    typedef typename Element<E>::type T;
    T *u;
    DBL *s;
    T *v;
    int32_t m, n, k;

    // Scales column i of V by 1 / s[i], or by 0 where s[i] is not above the cut.
    ErrorCode divideBySingularValues(double cut) const {
        ErrorCode status = 0;
        for (int32_t i = 0; i < k; ++i) {
            const bool isUsed = s[i] > cut;
            const double factor = isUsed ? 1.0 / s[i] : 0.0;
            for (std::ptrdiff_t row = 0; row < n; ++row)
                v[row * k + i] = isUsed ? v[row * k + i] * factor : ScalarOf<E>::Of(0.0);
            if (!isUsed)
                status = WarnRankDeficient;
        }
        return status;
    }
};

template <ElementType E>
void ConjugateTranspose(const typename Element<E>::type *a, int32_t rows, int32_t cols,
                        typename Element<E>::type *out) {
    TransposeInto(a, rows, cols, out);
    for (std::ptrdiff_t i = 0; i < std::ptrdiff_t{rows} * cols; ++i)
        out[i] = Conj(out[i]);
}

// The decomposition in scratch memory, with U^H in place of U.
template <ElementType E>
struct OwnDecomposition : Decomposition<E> {
    ErrorCode make(const typename Element<E>::type *a, int32_t rows, int32_t cols) {
        const int32_t values = rows < cols ? rows : cols;
        const int64_t uCount = int64_t{rows} * values;
        for (const ErrorCode failed :
             {uMemory.allocate(uCount), sMemory.allocate(values),
              vMemory.allocate(int64_t{cols} * values), transposed.allocate(uCount)})
            if (failed != 0)
                return failed;
        Decomposition<E>::operator=
            ({uMemory.data(), sMemory.data(), vMemory.data(), rows, cols, values});
        if (const ErrorCode failed = SVDecompose(a, rows, cols, this->u, this->s, this->v, 0))
            return failed;
        ConjugateTranspose<E>(this->u, rows, values, transposed.data());
        return 0;
    }
    Scratch<E> uMemory, vMemory, transposed;
    Scratch<ElementType::DBL> sMemory;
};

double DefaultCut(double largest, int32_t m, int32_t n) {
    return (m > n ? m : n) * largest * epsilon;
}

template <ElementType E>
ErrorCode Solve(const typename Element<E>::type *a, int32_t m, int32_t n,
                const typename Element<E>::type *b, int32_t rightSides,
                typename Element<E>::type *x, double tolerance) {
    if (CheckFinite(a, int64_t{m} * n) != 0 || CheckFinite(b, int64_t{m} * rightSides) != 0)
        return ErrNonFiniteInput;
    OwnDecomposition<E> svd;
    if (const ErrorCode failed = svd.make(a, m, n))
        return failed;
    Scratch<E> product;
    if (const ErrorCode failed = product.allocate(int64_t{svd.k} * rightSides))
        return failed;
    const double relative = tolerance <= 0.0 ? epsilon : tolerance;
    const ErrorCode status = svd.divideBySingularValues(relative * (m > n ? m : n) * svd.s[0]);
    OrderedProduct(svd.transposed.data(), b, svd.k, m, rightSides, product.data());
    OrderedProduct(svd.v, product.data(), n, svd.k, rightSides, x);
    return status;
}

template <ElementType E>
ErrorCode PseudoInverse(const typename Element<E>::type *a, int32_t m, int32_t n, double tolerance,
                        typename Element<E>::type *out) {
    if (m < 1 || n < 1)
        return ErrEmptyInput;
    OwnDecomposition<E> svd;
    if (const ErrorCode failed = svd.make(a, m, n))
        return failed;
    svd.divideBySingularValues(tolerance < 0.0 ? DefaultCut(svd.s[0], m, n) : tolerance);
    OrderedProduct(svd.v, svd.transposed.data(), n, svd.k, m, out);
    return 0;
}

// The decomposition in the memory that is shown to the user, the rest of which becomes 0.
ErrorCode DecomposeIn(DBL *work, int64_t count, const DBL *a, int32_t m, int32_t n, const DBL *b,
                      Decomposition<ElementType::DBL> &svd) {
    if (CheckFinite(a, int64_t{m} * n) != 0 || CheckFinite(b, m) != 0)
        return ErrNonFiniteInput;
    Fill(work, count, 0.0);
    const int32_t k = m < n ? m : n;
    DBL *const s = work + std::ptrdiff_t{m} * k;
    svd = {work, s, s + k, m, n, k};
    return SVDecompose(a, m, n, svd.u, svd.s, svd.v, 0);
}

// x += V scale(U^T r), with memory for k elements.
void AddSolution(const Decomposition<ElementType::DBL> &svd, const DBL *scale, const DBL *r, DBL *w,
                 DBL *x) {
    for (int32_t i = 0; i < svd.k; ++i) {
        double sum = 0.0;
        for (std::ptrdiff_t row = 0; row < svd.m; ++row)
            sum += svd.u[row * svd.k + i] * r[row];
        w[i] = scale == nullptr ? sum : scale[i] * sum;
    }
    for (std::ptrdiff_t row = 0; row < svd.n; ++row) {
        double sum = 0.0;
        for (int32_t i = 0; i < svd.k; ++i)
            sum += svd.v[row * svd.k + i] * w[i];
        x[row] += sum;
    }
}

} // namespace

ErrorCode SolveBySVD(const DBL *a, int32_t m, int32_t n, const DBL *b, int32_t rightSides, DBL *x,
                     double tolerance) {
    return Solve<ElementType::DBL>(a, m, n, b, rightSides, x, tolerance);
}
ErrorCode SolveBySVD(const CDB *a, int32_t m, int32_t n, const CDB *b, int32_t rightSides, CDB *x,
                     double tolerance) {
    return Solve<ElementType::CDB>(a, m, n, b, rightSides, x, tolerance);
}
ErrorCode PseudoInverseMatrix(const DBL *a, int32_t m, int32_t n, double tolerance, DBL *out) {
    return PseudoInverse<ElementType::DBL>(a, m, n, tolerance, out);
}
ErrorCode PseudoInverseMatrix(const CDB *a, int32_t m, int32_t n, double tolerance, CDB *out) {
    return PseudoInverse<ElementType::CDB>(a, m, n, tolerance, out);
}

int64_t LeastSquaresWork(int32_t m, int32_t n) {
    const int64_t k = m < n ? m : n;
    const int64_t decomposing = k; // the off-diagonal of the bidiagonal form
    const int64_t transposing = decomposing < k * m ? k * m : 0;
    return k * (int64_t{m} + n + 1) + int64_t{m} * n + transposing + decomposing;
}

ErrorCode SolveBySVDIn(DBL *work, const DBL *a, int32_t m, int32_t n, const DBL *b, DBL *x,
                       double tolerance) {
    const int64_t count = LeastSquaresWork(m, n);
    Decomposition<ElementType::DBL> svd;
    if (const ErrorCode failed = DecomposeIn(work, count, a, m, n, b, svd))
        return failed;
    const double relative = tolerance <= 0.0 ? epsilon : tolerance;
    const ErrorCode status = svd.divideBySingularValues(relative * (m > n ? m : n) * svd.s[0]);
    Fill(x, n, 0.0);
    AddSolution(svd, nullptr, b, work + count - svd.k, x);
    return status;
}

ErrorCode SolveBySVDRefined(DBL *work, const DBL *a, int32_t m, int32_t n, const DBL *b, DBL *x,
                            double tolerance, int32_t refinements) {
    const int64_t count = LeastSquaresWork(m, n) + m + n;
    Decomposition<ElementType::DBL> svd;
    if (const ErrorCode failed = DecomposeIn(work, count, a, m, n, b, svd))
        return failed;
    // kept: no factor max(m, n) here, and a tolerance of 0 stays.
    const double cut = (tolerance < 0.0 ? epsilon : tolerance) * svd.s[0];
    ErrorCode status = 0;
    for (int32_t i = 0; i < svd.k; ++i) {
        if (!(svd.s[i] > cut))
            status = WarnRankDeficient;
        svd.s[i] = svd.s[i] > cut ? 1.0 / svd.s[i] : 0.0;
    }
    DBL *const rest = work + count - m;
    // A step depends on x alone. Once x has come back to an earlier one, whole turns of the cycle
    // are left out: a step usually changes nothing any more after a few, and the count may be any.
    constexpr int32_t alwaysDone = 16;
    Scratch<ElementType::DBL> earlier;
    if (refinements > alwaysDone)
        if (const ErrorCode failed = earlier.allocate(n))
            return failed;
    int32_t noted = alwaysDone; // the round after which `earlier` was taken
    Fill(x, n, 0.0);
    for (int32_t round = 0; round < refinements; ++round) {
        MatrixVectorProduct(a, m, n, x, rest);
        for (int32_t i = 0; i < m; ++i)
            rest[i] = b[i] - rest[i];
        AddSolution(svd, svd.s, rest, rest - svd.k, x);
        const int32_t done = round + 1;
        if (refinements <= alwaysDone || done < noted)
            continue;
        const auto bytes = sizeof(DBL) * static_cast<std::size_t>(n);
        if (done > noted && std::memcmp(x, earlier.data(), bytes) == 0) {
            const int32_t turn = done - noted;
            round = refinements - 1 - (refinements - done) % turn;
            noted = std::numeric_limits<int32_t>::max();
        } else if (done == noted || done / 2 >= noted) {
            std::memcpy(earlier.data(), x, bytes);
            noted = done;
        }
    }
    return status;
}

} // namespace qx
