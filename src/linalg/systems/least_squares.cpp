#include "linalg/systems/least_squares.h"

#include "linalg/factorisations/range.h"
#include "linalg/factorisations/svd.h"
#include "linalg/products/products.h"

#include <algorithm>
#include <cstring>
#include <limits>

namespace qx {

namespace {

constexpr auto Real = ElementType::DBL;

// a = U diag(s) V^H for a of m by n, in memory that the user of the struct provides: u is m by k, v
// is n by k.
template <ElementType E>
struct Decomposition {
    MatrixView<E> u, v;
    RealVector s;

    // Scales column i of V by 1 / s[i], or by 0 where s[i] is not above the cut.
    ErrorCode divideBySingularValues(double cut) const {
        ErrorCode status = 0;
        for (int32_t i = 0; i < v.cols(); ++i) {
            const bool isUsed = s[i] > cut;
            const double factor = isUsed ? 1.0 / s[i] : 0.0;
            for (int32_t row = 0; row < v.rows(); ++row)
                v(row, i) = isUsed ? v(row, i) * factor : ScalarOf<E>::Of(0.0);
            if (!isUsed)
                status = WarnRankDeficient;
        }
        return status;
    }
    // max(m, n) times the largest singular value, times `relative`.
    double cutAt(double relative) const { return relative * std::max(u.rows(), v.rows()) * s[0]; }
};

double OrEpsilon(double tolerance) { return tolerance <= 0.0 ? epsilon : tolerance; }

// The decomposition in scratch memory, with U^H beside U.
template <ElementType E>
struct OwnDecomposition : Decomposition<E> {
    ErrorCode make(const ConstMatrixView<E> &a, SVDScaling scaling = SVDScaling::LargeNorms) {
        const int32_t m = a.rows(), n = a.cols(), k = std::min(m, n);
        if (const ErrorCode failed = memory.take(Sized(this->u, m, k), Sized(this->s, k),
                                                 Sized(this->v, n, k), Sized(adjoint, k, m)))
            return failed;
        if (const ErrorCode failed = SVDecompose<E>(a, this->u, this->s, this->v, scaling))
            return failed;
        CopyTransposed<E>(this->u, adjoint);
        for (ElementOf<E> &element : adjoint.elements())
            element = Conj(element);
        return 0;
    }
    ScratchParts memory;
    MatrixView<E> adjoint; // of U
};

// Decomposes a in the work memory that the export returns to its caller; the rest of that memory
// becomes 0.
ErrorCode DecomposeIn(RealVector work, const ConstRealMatrix &a, ConstRealVector b,
                      Decomposition<Real> &svd) {
    if (!AllFinite<Real>(a) || !AllFinite<Real>(b))
        return ErrNonFiniteInput;
    Fill(work.data(), work.size(), 0.0);
    const int32_t m = a.rows(), n = a.cols(), k = std::min(m, n);
    svd.u = {work.data(), m, k};
    svd.s = {svd.u.data() + std::ptrdiff_t{m} * k, k};
    svd.v = {svd.s.data() + k, n, k};
    return SVDecompose<Real>(a, svd.u, svd.s, svd.v);
}

// x += V scale(U^T r); w is memory for k elements. With an empty scale the sums are not scaled.
void AddSolution(const Decomposition<Real> &svd, ConstRealVector scale, ConstRealVector r,
                 RealVector w, RealVector x) {
    for (int32_t i = 0; i < svd.u.cols(); ++i) {
        double sum = 0.0;
        for (int32_t row = 0; row < svd.u.rows(); ++row)
            sum += svd.u(row, i) * r[row];
        w[i] = scale.isEmpty() ? sum : scale[i] * sum;
    }
    for (int32_t row = 0; row < svd.v.rows(); ++row) {
        double sum = 0.0;
        for (int32_t i = 0; i < svd.v.cols(); ++i)
            sum += svd.v(row, i) * w[i];
        x[row] += sum;
    }
}

} // namespace

template <ElementType E>
ErrorCode SolveBySVD(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                     const MatrixView<E> &x, double tolerance) {
    QX_EXPECTS(b.rows() == a.rows() && x.rows() == a.cols() && x.cols() == b.cols());
    if (!AllFinite<E>(a) || !AllFinite<E>(b))
        return ErrNonFiniteInput;
    OwnDecomposition<E> svd;
    if (const ErrorCode failed = svd.make(a))
        return failed;
    MatrixView<E> product;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(product, svd.v.cols(), b.cols())))
        return failed;
    const ErrorCode status = svd.divideBySingularValues(svd.cutAt(OrEpsilon(tolerance)));
    OrderedProduct<E>(svd.adjoint, b, product);
    OrderedProduct<E>(svd.v, product, x);
    return status;
}

template <ElementType E>
ErrorCode PseudoInverseMatrix(const ConstMatrixView<E> &a, double tolerance,
                              const MatrixView<E> &out) {
    QX_EXPECTS(out.rows() == a.cols() && out.cols() == a.rows());
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    OwnDecomposition<E> svd;
    if (const ErrorCode failed = svd.make(a))
        return failed;
    const double cut = std::max(a.rows(), a.cols()) * svd.s[0] * epsilon;
    svd.divideBySingularValues(tolerance < 0.0 ? cut : tolerance);
    OrderedProduct<E>(svd.v, svd.adjoint, out);
    return 0;
}

int64_t LeastSquaresWork(int32_t m, int32_t n) {
    const int64_t k = m < n ? m : n;
    const int64_t decomposing = k; // the off-diagonal of the bidiagonal form
    const int64_t transposing = decomposing < k * m ? k * m : 0;
    return k * (int64_t{m} + n + 1) + int64_t{m} * n + transposing + decomposing;
}

ErrorCode SolveBySVDIn(RealVector work, const ConstRealMatrix &a, ConstRealVector b, RealVector x,
                       double tolerance) {
    QX_EXPECTS(work.size() == LeastSquaresWork(a.rows(), a.cols()));
    Decomposition<Real> svd;
    if (const ErrorCode failed = DecomposeIn(work, a, b, svd))
        return failed;
    const ErrorCode status = svd.divideBySingularValues(svd.cutAt(OrEpsilon(tolerance)));
    const std::ptrdiff_t k = svd.s.size();
    Fill(x.data(), x.size(), 0.0);
    AddSolution(svd, {}, b, work.part(work.size() - k, k), x);
    return status;
}

ErrorCode SolveBySVDRefined(RealVector work, const ConstRealMatrix &a, ConstRealVector b,
                            RealVector x, double tolerance, int32_t refinements) {
    const int32_t m = a.rows(), n = a.cols();
    QX_EXPECTS(work.size() == LeastSquaresWork(m, n) + m + n);
    Decomposition<Real> svd;
    if (const ErrorCode failed = DecomposeIn(work, a, b, svd))
        return failed;
    // kept: no factor max(m, n) here, and a tolerance of 0 is used as it is.
    const double cut = (tolerance < 0.0 ? epsilon : tolerance) * svd.s[0];
    ErrorCode status = 0;
    for (DBL &s : svd.s) {
        if (!(s > cut))
            status = WarnRankDeficient;
        s = s > cut ? 1.0 / s : 0.0;
    }
    const std::ptrdiff_t k = svd.s.size();
    const RealVector rest = work.part(work.size() - m, m), sums = work.part(work.size() - m - k, k);
    // A step depends only on x. Once x returns to an earlier value, whole periods of the cycle are
    // skipped: after a few steps x usually no longer changes, and the number of refinements has no
    // limit.
    constexpr int32_t alwaysDone = 16;
    Scratch<Real> earlier;
    if (refinements > alwaysDone)
        if (const ErrorCode failed = earlier.allocate(n))
            return failed;
    int32_t noted = alwaysDone; // the round after which `earlier` was taken
    Fill(x.data(), n, 0.0);
    for (int32_t round = 0; round < refinements; ++round) {
        MatrixVectorProduct<Real>(a, x, rest);
        for (int32_t i = 0; i < m; ++i)
            rest[i] = b[i] - rest[i];
        AddSolution(svd, svd.s, rest, sums, x);
        const int32_t done = round + 1;
        if (refinements <= alwaysDone || done < noted)
            continue;
        const auto bytes = sizeof(DBL) * static_cast<std::size_t>(n);
        if (done > noted && std::memcmp(x.data(), earlier.data(), bytes) == 0) {
            const int32_t turn = done - noted;
            round = refinements - 1 - (refinements - done) % turn;
            noted = std::numeric_limits<int32_t>::max();
        } else if (done == noted || done / 2 >= noted) {
            std::memcpy(earlier.data(), x.data(), bytes);
            noted = done;
        }
    }
    return status;
}

template <ElementType E>
ErrorCode SolveScaledBySVD(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                           const MatrixView<E> &x, double tolerance) {
    QX_EXPECTS(b.rows() == a.rows() && x.rows() == a.cols() && x.cols() == b.cols());
    if (!HoldsOnlyNumbers<E>(a) || !HoldsOnlyNumbers<E>(b))
        return ErrNonFiniteInput;
    const int32_t k = std::min(a.rows(), a.cols());
    ScaledCopy<E> scaled;
    OwnDecomposition<E> svd;
    ScaledColumns<E> sides;
    MatrixView<E> product;
    ScratchParts memory;
    if (const ErrorCode failed = scaled.make(a))
        return failed;
    if (const ErrorCode failed = svd.make(scaled.matrix, SVDScaling::Always))
        return failed;
    if (const ErrorCode failed = sides.make(b))
        return failed;
    if (const ErrorCode failed = memory.take(Sized(product, k, b.cols())))
        return failed;
    OrderedProduct<E>(svd.adjoint, sides.matrix, product);
    const double cut = svd.cutAt(tolerance >= 0.0 ? tolerance : epsilon);
    ErrorCode status = 0;
    for (int32_t i = 0; i < k; ++i) {
        const bool isUsed = svd.s[i] > cut;
        status = isUsed ? status : WarnRankDeficient;
        for (int32_t j = 0; j < b.cols(); ++j)
            product(i, j) = isUsed ? product(i, j) / svd.s[i] : ScalarOf<E>::Of(0.0);
    }
    OrderedProduct<E>(svd.v, product, x);
    sides.scaleBack(x, scaled.exponent);
    return status;
}

template <ElementType E>
ErrorCode ScaledPseudoInverse(const ConstMatrixView<E> &a, double tolerance,
                              const MatrixView<E> &out) {
    QX_EXPECTS(out.rows() == a.cols() && out.cols() == a.rows());
    if (!HoldsOnlyNumbers<E>(a))
        return ErrNonFiniteInput;
    ScaledCopy<E> scaled;
    OwnDecomposition<E> svd;
    if (const ErrorCode failed = scaled.make(a))
        return failed;
    if (const ErrorCode failed = svd.make(scaled.matrix, SVDScaling::Always))
        return failed;
    const double cut = svd.cutAt(epsilon);
    for (int32_t i = 0; i < svd.s.size(); ++i) {
        const double s = svd.s[i];
        const bool isUsed = tolerance >= 0.0 ? TimesPower(s, scaled.exponent) > tolerance : s > cut;
        for (int32_t row = 0; row < svd.v.rows(); ++row)
            svd.v(row, i) = isUsed ? svd.v(row, i) / s : ScalarOf<E>::Of(0.0);
    }
    OrderedProduct<E>(svd.v, svd.adjoint, out);
    for (ElementOf<E> &element : out.elements())
        element = TimesPower(element, -scaled.exponent);
    return 0;
}

template ErrorCode SolveScaledBySVD(const ConstRealMatrix &, const ConstRealMatrix &,
                                    const RealMatrix &, double);
template ErrorCode SolveScaledBySVD(const ConstComplexMatrix &, const ConstComplexMatrix &,
                                    const ComplexMatrix &, double);
template ErrorCode ScaledPseudoInverse(const ConstRealMatrix &, double, const RealMatrix &);
template ErrorCode ScaledPseudoInverse(const ConstComplexMatrix &, double, const ComplexMatrix &);
template ErrorCode SolveBySVD(const ConstRealMatrix &, const ConstRealMatrix &, const RealMatrix &,
                              double);
template ErrorCode SolveBySVD(const ConstComplexMatrix &, const ConstComplexMatrix &,
                              const ComplexMatrix &, double);
template ErrorCode PseudoInverseMatrix(const ConstRealMatrix &, double, const RealMatrix &);
template ErrorCode PseudoInverseMatrix(const ConstComplexMatrix &, double, const ComplexMatrix &);

} // namespace qx
