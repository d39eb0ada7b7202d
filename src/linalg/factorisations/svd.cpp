#include "linalg/factorisations/svd.h"

#include "frame/scratch.h"
#include "linalg/factorisations/bidiagonal.h"
#include "linalg/factorisations/qr.h"
#include "linalg/factorisations/range.h"
#include "linalg/factorisations/reflector.h"
#include "linalg/matrix.h"
#include "linalg/transpose.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

// The decomposition of a tall matrix of m rows and n columns, m >= n. A wide one goes in as its
// conjugate transpose, with u and v exchanged.
template <ElementType E>
class TallSVD {
    typedef ElementOf<E> T;
    typedef Reflector<E> Reflection;

public:
    TallSVD(int32_t m, int32_t n) : m_(m), n_(n), stride_(PaddedStride(n)) {}

    ErrorCode allocate(bool withVectors) {
        const int64_t across = PaddedStride(m_);
        const int64_t down = PaddedStride(n_);
        // Later the transposed factors stand where the matrix and its right reflectors were.
        const int64_t left = std::max(int64_t{m_} * down, withVectors ? int64_t{n_} * across : 0);
        if (const ErrorCode failed = matrix_.allocate(left))
            return failed;
        if (const ErrorCode failed = right_.allocate(withVectors ? int64_t{n_} * down : 0))
            return failed;
        if (const ErrorCode failed = vectors_.allocate(4 * int64_t{m_} + 3 * int64_t{n_}))
            return failed;
        return bidiagonal_.allocate(2 * int64_t{n_});
    }

    void take(const T *a) { CopyMatrix<E>(a, n_, m_, n_, matrix_.data(), stride_); }
    void takeWide(const T *a) {
        CopyTransposed<E>(a, m_, n_, m_, matrix_.data(), stride_);
        for (int32_t i = 0; i < m_; ++i)
            for (int32_t j = 0; j < n_; ++j)
                at(i)[j] = Conj(at(i)[j]);
    }

    ErrorCode values(DBL *s) {
        const int exponent = bringIntoRange();
        bidiagonalise();
        RotationQueue none, nothing;
        if (const ErrorCode failed = DiagonaliseBidiagonal(diagonal(), beside(), n_, none, nothing))
            return failed;
        for (int32_t i = 0; i < n_; ++i)
            s[i] = std::fabs(diagonal()[i]);
        sortValues(s, nullptr);
        restoreRange(s, exponent);
        return 0;
    }

    // u is m by n and v n by n, both row-major without gaps.
    ErrorCode vectors(T *u, DBL *s, T *v) {
        const int exponent = bringIntoRange();
        Scratch<ElementType::I32> order;
        if (const ErrorCode failed = order.allocate(n_))
            return failed;
        bidiagonalise();
        accumulateRight(v);
        accumulateLeft(u);
        const std::ptrdiff_t across = PaddedStride(m_);
        CopyTransposed<E>(u, n_, m_, n_, matrix_.data(), across);
        CopyTransposed<E>(v, n_, n_, n_, right_.data(), stride_);

        constexpr int32_t parts = partsOf<E>;
        RotationQueue left(reinterpret_cast<DBL *>(matrix_.data()), across * parts, m_ * parts);
        RotationQueue right(reinterpret_cast<DBL *>(right_.data()), stride_ * parts, n_ * parts);
        if (const ErrorCode failed = DiagonaliseBidiagonal(diagonal(), beside(), n_, left, right))
            return failed;

        for (int32_t i = 0; i < n_; ++i) {
            s[i] = std::fabs(diagonal()[i]);
            if (std::signbit(diagonal()[i]))
                negate(right_.data() + i * stride_);
        }
        sortValues(s, order.data());
        for (int32_t i = 0; i < n_; ++i) {
            CopyTransposed<E>(matrix_.data() + order[i] * across, 0, 1, m_, u + i, n_);
            CopyTransposed<E>(right_.data() + order[i] * stride_, 0, 1, n_, v + i, n_);
        }
        restoreRange(s, exponent);
        return 0;
    }

private:
    T *at(int32_t row) { return matrix_.data() + row * stride_; }
    T *leftKappa() { return vectors_.data(); }
    T *rightKappa() { return vectors_.data() + n_; }
    T *column() { return vectors_.data() + 2 * n_; }
    T *work() { return vectors_.data() + 2 * n_ + m_; }
    DBL *diagonal() { return bidiagonal_.data(); }
    DBL *beside() { return bidiagonal_.data() + n_; }

    // kept: small values are not brought up, for what is below 2.2e-16 counts as zero
    int bringIntoRange() { return BringIntoRange<E>(matrix_.data(), stride_, m_, n_, 0.0); }
    void restoreRange(DBL *s, int exponent) const {
        for (int32_t i = 0; exponent != 0 && i < n_; ++i)
            s[i] = std::ldexp(s[i], exponent);
    }

    void bidiagonalise() {
        for (int32_t i = 0; i < n_; ++i) {
            beside()[i] = i == 0 ? 0.0 : reflectRow(i - 1);
            diagonal()[i] = reflectColumn(i);
        }
    }

    // Clears column i below the diagonal. The reflection of the rows is left to reflectRow, which
    // has every row in the cache for its own work, except for row i.
    double reflectColumn(int32_t i) {
        const int32_t rows = m_ - i, rest = n_ - i - 1;
        const Reflection reflection(at(i) + i, stride_, rows, Reflection::Leave::ZeroOnly);
        leftKappa()[i] = reflection.kappa;
        for (int32_t k = 0; k < rows; ++k)
            column()[k] = at(i + k)[i];
        const bool nothing = AbsSum(reflection.kappa) == 0.0;
        for (int32_t k = 0; k < rows; ++k)
            conjugate()[k] = nothing ? T{} : T(Conj(column()[k]));
        for (int32_t j = 0; j < rest; ++j)
            rowFactors()[j] = T{};
        if (nothing || rest < 1)
            return reflection.beta;
        AddTransposedProduct(at(i) + i + 1, stride_, rows, rest, conjugate(), rowFactors());
        for (int32_t j = 0; j < rest; ++j)
            rowFactors()[j] = -(rowFactors()[j] / reflection.kappa);
        AddOuterProduct(at(i) + i + 1, stride_, 1, rest, column(), rowFactors());
        return reflection.beta;
    }

    // Clears row i beyond the element beside the diagonal, and completes reflectColumn(i).
    double reflectRow(int32_t i) {
        const int32_t rest = n_ - i - 1;
        T *const row = at(i) + i + 1;
        for (int32_t j = 0; j < rest; ++j)
            row[j] = Conj(row[j]);
        const Reflection reflection(row, 1, rest, Reflection::Leave::ZeroOnly);
        rightKappa()[i] = reflection.kappa;
        const auto inverse = Conj(reflection.kappa);
        constexpr int32_t together = 4;
        const bool left = AbsSum(leftKappa()[i]) != 0.0;
        for (int32_t k = 1; k < m_ - i; k += together) {
            const int32_t rows = std::min(together, m_ - i - k);
            T *const block = at(i + k) + i + 1;
            if (left)
                AddOuterProduct(block, stride_, rows, rest, column() + k, rowFactors());
            ReflectFromRight<E>(block, stride_, rows, rest, row, inverse, conjugate());
        }
        return reflection.beta;
    }

    // v = P0 P1 ... where Pi is the reflection that row i holds from its element i + 1 on.
    void accumulateRight(T *v) {
        for (int32_t i = n_ - 1; i >= 0; --i) {
            setUnit(v, i, n_);
            if (i > 0)
                ReflectFromLeft<E>(v + i * n_ + i, n_, n_ - i, n_ - i, at(i - 1) + i,
                                   Conj(rightKappa()[i - 1]), work());
        }
    }
    void accumulateLeft(T *u) {
        for (int32_t i = n_ - 1; i >= 0; --i) {
            setUnit(u, i, m_);
            for (int32_t k = i; k < m_; ++k)
                column()[k - i] = at(k)[i];
            ReflectFromLeft<E>(u + i * n_ + i, n_, m_ - i, n_ - i, column(), Conj(leftKappa()[i]),
                               work());
        }
    }
    // Row and column i of a matrix with n columns, from the diagonal on, become the unit vector.
    void setUnit(T *a, int32_t i, int32_t rows) {
        for (int32_t j = i; j < n_; ++j)
            a[i * n_ + j] = T{};
        for (int32_t k = i; k < rows; ++k)
            a[k * n_ + i] = T{};
        for (int32_t k = 0; k < i; ++k)
            a[i * n_ + k] = T{};
        a[i * n_ + i] = ScalarOf<E>::Of(1.0);
    }

    void negate(T *row) {
        for (int32_t j = 0; j < n_; ++j)
            row[j] = -row[j];
    }

    // Exchange sort, which decides where equal values go.
    void sortValues(DBL *s, I32 *order) const {
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

    T *conjugate() { return work(); }
    T *rowFactors() { return work() + m_ + n_; }

    int32_t m_, n_;
    std::ptrdiff_t stride_;
    Scratch<E> matrix_, right_, vectors_;
    Scratch<ElementType::DBL> bidiagonal_;
};

template <ElementType E>
ErrorCode CheckInput(const ElementOf<E> *a, int32_t m, int32_t n) {
    if (m < 1 || n < 1)
        return ErrEmptyInput;
    return CheckFinite(a, int64_t{m} * n) != 0 ? ErrNonFiniteInput : 0;
}

// Completes the orthonormal columns of the rows by cols matrix `thin` to a unitary matrix.
template <ElementType E>
ErrorCode Complete(const ElementOf<E> *thin, int32_t rows, int32_t cols, ElementOf<E> *full) {
    Scratch<E> r;
    if (const ErrorCode failed = r.allocate(int64_t{rows} * cols))
        return failed;
    if (const ErrorCode failed = QRDecompose(thin, rows, cols, qrFull, full, r.data()))
        return failed;
    for (int32_t j = 0; j < cols; ++j)
        for (int32_t i = 0; !(RealPart(r[j * cols + j]) > 0.0) && i < rows; ++i)
            full[i * rows + j] = -full[i * rows + j];
    return 0;
}

// a is tall or square.
template <ElementType E>
ErrorCode Vectors(TallSVD<E> &svd, int32_t m, int32_t n, bool full, ElementOf<E> *u, DBL *s,
                  ElementOf<E> *v) {
    if (!full || m == n)
        return svd.vectors(u, s, v);
    Scratch<E> thin;
    if (const ErrorCode failed = thin.allocate(int64_t{m} * n))
        return failed;
    if (const ErrorCode failed = svd.vectors(thin.data(), s, v))
        return failed;
    return Complete<E>(thin.data(), m, n, u);
}

template <ElementType E>
ErrorCode Decompose(const ElementOf<E> *a, int32_t m, int32_t n, ElementOf<E> *u, DBL *s,
                    ElementOf<E> *v, int32_t fullSize) {
    if (const ErrorCode failed = CheckInput<E>(a, m, n))
        return failed;
    TallSVD<E> svd(std::max(m, n), std::min(m, n));
    if (const ErrorCode failed = svd.allocate(true))
        return failed;
    if (m >= n) {
        svd.take(a);
        return Vectors(svd, m, n, fullSize != 0, u, s, v);
    }
    svd.takeWide(a);
    return Vectors(svd, n, m, fullSize != 0, v, s, u);
}

template <ElementType E>
ErrorCode Values(const ElementOf<E> *a, int32_t m, int32_t n, DBL *s) {
    if (const ErrorCode failed = CheckInput<E>(a, m, n))
        return failed;
    TallSVD<E> svd(std::max(m, n), std::min(m, n));
    if (const ErrorCode failed = svd.allocate(false))
        return failed;
    if (m >= n)
        svd.take(a);
    else
        svd.takeWide(a);
    return svd.values(s);
}

} // namespace

ErrorCode SVDecompose(const DBL *a, int32_t m, int32_t n, DBL *u, DBL *s, DBL *v,
                      int32_t fullSize) {
    return Decompose<ElementType::DBL>(a, m, n, u, s, v, fullSize);
}
ErrorCode SVDecompose(const CDB *a, int32_t m, int32_t n, CDB *u, DBL *s, CDB *v,
                      int32_t fullSize) {
    return Decompose<ElementType::CDB>(a, m, n, u, s, v, fullSize);
}
ErrorCode SingularValues(const DBL *a, int32_t m, int32_t n, DBL *s) {
    return Values<ElementType::DBL>(a, m, n, s);
}
ErrorCode SingularValues(const CDB *a, int32_t m, int32_t n, DBL *s) {
    return Values<ElementType::CDB>(a, m, n, s);
}

} // namespace qx
