#include "linalg/factorisations/svd.h"

#include "linalg/factorisations/bidiagonal.h"
#include "linalg/factorisations/qr.h"
#include "linalg/factorisations/range.h"
#include "linalg/factorisations/reflector.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

// The decomposition of a tall matrix of m rows and n columns, m >= n. A wide matrix is passed as
// its conjugate transpose, with u and v exchanged.
template <ElementType E>
class TallSVD {
    typedef ElementOf<E> T;
    typedef Reflector<E> Reflection;

public:
    TallSVD(int32_t m, int32_t n, SVDScaling scaling) : m_(m), n_(n), scaling_(scaling) {}

    ErrorCode allocate(bool withVectors) {
        // Later the transposed factors replace the matrix and its right reflectors.
        const int64_t across = withVectors ? n_ * int64_t{PaddedStride(m_)} : 0;
        T *first;
        if (const ErrorCode failed = memory_.take(
                Sized(first, std::max(m_ * int64_t{PaddedStride(n_)}, across)),
                SizedPadded(right_, withVectors ? n_ : 0, n_), Sized(leftKappa_, n_),
                Sized(rightKappa_, n_), Sized(column_, m_), Sized(work_, int64_t{m_} + n_),
                Sized(rowFactors_, n_), Sized(diagonal_, n_), Sized(beside_, n_)))
            return failed;
        matrix_ = {first, m_, n_, PaddedStride(n_)};
        if (withVectors)
            left_ = {first, n_, m_, PaddedStride(m_)};
        return 0;
    }

    void take(const ConstMatrixView<E> &a) { CopyMatrix<E>(a, matrix_); }
    void takeWide(const ConstMatrixView<E> &a) {
        CopyTransposed<E>(a, matrix_);
        for (int32_t i = 0; i < m_; ++i)
            for (int32_t j = 0; j < n_; ++j)
                matrix_(i, j) = Conj(matrix_(i, j));
    }

    ErrorCode values(RealVector s) {
        const int exponent = bringIntoRange();
        bidiagonalise();
        RotationQueue none, nothing;
        if (const ErrorCode failed = DiagonaliseBidiagonal(diagonal_, beside_, none, nothing))
            return failed;
        for (int32_t i = 0; i < n_; ++i)
            s[i] = std::fabs(diagonal_[i]);
        sortValues(s, nullptr);
        restoreRange(s, exponent);
        return 0;
    }

    // u is m by n and v n by n, both without gaps.
    ErrorCode vectors(const MatrixView<E> &u, RealVector s, const MatrixView<E> &v) {
        const int exponent = bringIntoRange();
        Scratch<ElementType::I32> order;
        if (const ErrorCode failed = order.allocate(n_))
            return failed;
        bidiagonalise();
        accumulateRight(v);
        accumulateLeft(u);
        CopyTransposed<E>(u, left_);
        CopyTransposed<E>(v, right_);

        RotationQueue left(PartsOf(left_)), right(PartsOf(right_));
        if (const ErrorCode failed = DiagonaliseBidiagonal(diagonal_, beside_, left, right))
            return failed;

        for (int32_t i = 0; i < n_; ++i) {
            s[i] = std::fabs(diagonal_[i]);
            for (int32_t j = 0; std::signbit(diagonal_[i]) && j < n_; ++j)
                right_(i, j) = -right_(i, j);
        }
        sortValues(s, order.data());
        for (int32_t i = 0; i < n_; ++i) {
            CopyTransposed<E>(left_.block(order[i], 0, 1, m_), u.block(0, i, m_, 1));
            CopyTransposed<E>(right_.block(order[i], 0, 1, n_), v.block(0, i, n_, 1));
        }
        restoreRange(s, exponent);
        return 0;
    }

private:
    T *at(int32_t row) { return matrix_.row(row); }

    int bringIntoRange() {
        if (scaling_ == SVDScaling::Always)
            return ScaleTo<E>(matrix_, 200);
        // kept: small matrices are not scaled up, because values below 2.2e-16 count as zero
        return BringIntoRange<E>(matrix_, 0.0);
    }
    void restoreRange(RealVector s, int exponent) const {
        for (int32_t i = 0; exponent != 0 && i < n_; ++i)
            s[i] = std::ldexp(s[i], exponent);
    }

    void bidiagonalise() {
        for (int32_t i = 0; i < n_; ++i) {
            beside_[i] = i == 0 ? 0.0 : reflectRow(i - 1);
            diagonal_[i] = reflectColumn(i);
        }
    }

    // Clears column i below the diagonal. The rows other than row i are reflected by reflectRow,
    // which has each of them in the cache for its own work.
    double reflectColumn(int32_t i) {
        const int32_t rows = m_ - i, rest = n_ - i - 1;
        const Reflection reflection(at(i) + i, matrix_.stride(), rows, Reflection::Leave::ZeroOnly);
        leftKappa_[i] = reflection.kappa;
        for (int32_t k = 0; k < rows; ++k)
            column_[k] = at(i + k)[i];
        const bool nothing = AbsSum(reflection.kappa) == 0.0;
        for (int32_t k = 0; k < rows; ++k)
            work_[k] = nothing ? T{} : T(Conj(column_[k]));
        for (int32_t j = 0; j < rest; ++j)
            rowFactors_[j] = T{};
        if (nothing || rest < 1)
            return reflection.beta;
        const VectorView<E> factors = rowFactors_.part(0, rest);
        AddTransposedProduct<E>(matrix_.block(i, i + 1, rows, rest), work_.part(0, rows), factors);
        for (int32_t j = 0; j < rest; ++j)
            rowFactors_[j] = -(rowFactors_[j] / reflection.kappa);
        AddOuterProduct<E>(matrix_.block(i, i + 1, 1, rest), column_.part(0, 1), factors);
        return reflection.beta;
    }

    // Clears row i beyond its superdiagonal element, and completes reflectColumn(i).
    double reflectRow(int32_t i) {
        const int32_t rest = n_ - i - 1;
        T *const row = at(i) + i + 1;
        for (int32_t j = 0; j < rest; ++j)
            row[j] = Conj(row[j]);
        const Reflection reflection(row, 1, rest, Reflection::Leave::ZeroOnly);
        rightKappa_[i] = reflection.kappa;
        const auto inverse = Conj(reflection.kappa);
        constexpr int32_t together = 4;
        const bool left = AbsSum(leftKappa_[i]) != 0.0;
        for (int32_t k = 1; k < m_ - i; k += together) {
            const int32_t rows = std::min(together, m_ - i - k);
            const MatrixView<E> block = matrix_.block(i + k, i + 1, rows, rest);
            if (left)
                AddOuterProduct<E>(block, column_.part(k, rows), rowFactors_.part(0, rest));
            ReflectFromRight<E>(block, {row, rest}, inverse, work_);
        }
        return reflection.beta;
    }

    // v = P0 P1 ... where Pi is the reflection that row i holds from its element i + 1 on.
    void accumulateRight(const MatrixView<E> &v) {
        for (int32_t i = n_ - 1; i >= 0; --i) {
            setUnit(v, i);
            if (i > 0)
                ReflectFromLeft<E>(v.block(i, i, n_ - i, n_ - i), {at(i - 1) + i, n_ - i},
                                   Conj(rightKappa_[i - 1]));
        }
    }
    void accumulateLeft(const MatrixView<E> &u) {
        for (int32_t i = n_ - 1; i >= 0; --i) {
            setUnit(u, i);
            for (int32_t k = i; k < m_; ++k)
                column_[k - i] = at(k)[i];
            ReflectFromLeft<E>(u.block(i, i, m_ - i, n_ - i), column_.part(0, m_ - i),
                               Conj(leftKappa_[i]));
        }
    }
    // Row i, and column i from the diagonal on, become those of the unit matrix.
    void setUnit(const MatrixView<E> &a, int32_t i) {
        for (int32_t j = 0; j < n_; ++j)
            a(i, j) = T{};
        for (int32_t k = i; k < a.rows(); ++k)
            a(k, i) = T{};
        a(i, i) = ScalarOf<E>::Of(1.0);
    }

    // Exchange sort, which determines the order of equal values.
    void sortValues(RealVector s, I32 *order) const {
        for (int32_t i = 0; order != nullptr && i < n_; ++i)
            order[i] = i;
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = i + 1; j < n_; ++j)
                if (s[i] < s[j]) {
                    Swap(&s[i], &s[j]);
                    if (order != nullptr)
                        Swap(&order[i], &order[j]);
                }
    }

    int32_t m_, n_;
    SVDScaling scaling_;
    ScratchParts memory_;
    MatrixView<E> matrix_, left_, right_; // the last two are the transposed factors
    VectorView<E> leftKappa_, rightKappa_, column_, work_, rowFactors_;
    RealVector diagonal_, beside_;
};

// Completes the orthonormal columns of `thin` to a unitary matrix.
template <ElementType E>
ErrorCode Complete(const ConstMatrixView<E> &thin, const MatrixView<E> &full) {
    MatrixView<E> r;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(r, thin.rows(), thin.cols())))
        return failed;
    if (const ErrorCode failed = QRDecompose<E>(thin, qrFull, full, r))
        return failed;
    for (int32_t j = 0; j < thin.cols(); ++j)
        for (int32_t i = 0; !(RealPart(r(j, j)) > 0.0) && i < thin.rows(); ++i)
            full(i, j) = -full(i, j);
    return 0;
}

// For a tall or square matrix. u may be larger than that of the decomposition.
template <ElementType E>
ErrorCode Vectors(TallSVD<E> &svd, const MatrixView<E> &u, RealVector s, const MatrixView<E> &v) {
    if (u.cols() == v.cols())
        return svd.vectors(u, s, v);
    MatrixView<E> thin;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(thin, u.rows(), v.cols())))
        return failed;
    if (const ErrorCode failed = svd.vectors(thin, s, v))
        return failed;
    return Complete<E>(thin, u);
}

template <ElementType E>
bool AreFactors(const ConstMatrixView<E> &a, const ConstMatrixView<E> &u, ConstRealVector s,
                const ConstMatrixView<E> &v) {
    const int32_t k = std::min(a.rows(), a.cols());
    const bool thin = u.cols() == k && v.cols() == k;
    return u.rows() == a.rows() && v.rows() == a.cols() && s.size() == k &&
           (thin || (u.isSquare() && v.isSquare()));
}

} // namespace

template <ElementType E>
ErrorCode SVDecompose(const ConstMatrixView<E> &a, const MatrixView<E> &u, RealVector s,
                      const MatrixView<E> &v, SVDScaling scaling) {
    const int32_t m = a.rows(), n = a.cols();
    QX_EXPECTS(!a.isEmpty() && MayBeTaken<E>(a, scaling) && AreFactors<E>(a, u, s, v));
    TallSVD<E> svd(std::max(m, n), std::min(m, n), scaling);
    if (const ErrorCode failed = svd.allocate(true))
        return failed;
    if (m >= n) {
        svd.take(a);
        return Vectors<E>(svd, u, s, v);
    }
    svd.takeWide(a);
    return Vectors<E>(svd, v, s, u);
}

template <ElementType E>
ErrorCode SingularValues(const ConstMatrixView<E> &a, RealVector s, SVDScaling scaling) {
    const int32_t m = a.rows(), n = a.cols();
    QX_EXPECTS(!a.isEmpty() && MayBeTaken<E>(a, scaling) && s.size() == std::min(m, n));
    TallSVD<E> svd(std::max(m, n), std::min(m, n), scaling);
    if (const ErrorCode failed = svd.allocate(false))
        return failed;
    if (m >= n)
        svd.take(a);
    else
        svd.takeWide(a);
    return svd.values(s);
}

template ErrorCode SVDecompose(const ConstRealMatrix &, const RealMatrix &, RealVector,
                               const RealMatrix &, SVDScaling);
template ErrorCode SVDecompose(const ConstComplexMatrix &, const ComplexMatrix &, RealVector,
                               const ComplexMatrix &, SVDScaling);
template ErrorCode SingularValues(const ConstRealMatrix &, RealVector, SVDScaling);
template ErrorCode SingularValues(const ConstComplexMatrix &, RealVector, SVDScaling);

} // namespace qx
