#include "linalg/factorisations/qr.h"

#include "frame/scratch.h"
#include "linalg/factorisations/reflector.h"
#include "linalg/matrix.h"
#include "linalg/transpose.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

// The Euclidean length of n elements, safe from overflow.
template <ElementType E>
double Length(const ElementOf<E> *x, std::ptrdiff_t stride, int32_t n) {
    double scale = 0.0;
    for (int32_t i = 0; i < n; ++i)
        scale = std::max(scale, AbsSum(x[i * stride]) * 0.5);
    if (scale == 0.0)
        return 0.0;
    double squares = 0.0;
    for (int32_t i = 0; i < n; ++i)
        squares += SquaredModulus(x[i * stride] / scale);
    return scale * std::sqrt(squares);
}

template <ElementType E>
class HouseholderQR {
    typedef ElementOf<E> T;

public:
    HouseholderQR(int32_t m, int32_t n)
        : m_(m), n_(n), count_(std::min(m, n)), stride_(PaddedStride(n)) {}

    ErrorCode take(const T *a) {
        if (const ErrorCode failed = matrix_.allocate(m_ * int64_t{stride_}))
            return failed;
        if (const ErrorCode failed = vectors_.allocate(3 * int64_t{m_} + 2 * int64_t{n_}))
            return failed;
        CopyMatrix<E>(a, n_, m_, n_, matrix_.data(), stride_);
        return 0;
    }

    void factor() {
        for (int32_t k = 0; k < count_; ++k)
            step(k);
    }
    // The lengths of the columns below the rows done are brought down from step to step, and made
    // anew where that has cost half their digits (LAPACK's Working Note 176).
    ErrorCode factorPivoted(I32 *pivots) {
        Scratch<ElementType::DBL> lengths;
        if (const ErrorCode failed = lengths.allocate(2 * int64_t{n_}))
            return failed;
        DBL *const length = lengths.data(), *const reference = length + n_;
        for (int32_t j = 0; j < n_; ++j) {
            pivots[j] = j;
            length[j] = reference[j] = Length<E>(at(0) + j, stride_, m_);
        }
        for (int32_t k = 0; k < count_; ++k) {
            int32_t pivot = k;
            for (int32_t j = k + 1; j < n_; ++j)
                if (length[j] > length[pivot])
                    pivot = j;
            if (pivot != k) {
                exchangeColumns(pivot, k);
                Swap(&pivots[pivot], &pivots[k]);
                length[pivot] = length[k];
                reference[pivot] = reference[k];
            }
            step(k);
            for (int32_t j = k + 1; j < n_; ++j)
                shorten(k, j, length, reference);
        }
        return 0;
    }

    void writeR(int32_t rows, T *r) const {
        for (int32_t i = 0; i < rows; ++i)
            for (int32_t j = 0; j < n_; ++j)
                r[i * n_ + j] = j < i ? T{} : at(i)[j];
    }
    // The first `cols` columns of H0^H H1^H ...
    void writeQ(int32_t cols, T *q) const {
        for (int32_t i = 0; i < m_; ++i)
            for (int32_t j = 0; j < cols; ++j)
                q[i * cols + j] = ScalarOf<E>::Of(i == j ? 1.0 : 0.0);
        for (int32_t k = count_ - 1; k >= 0; --k) {
            column()[0] = first()[k];
            for (int32_t i = k + 1; i < m_; ++i)
                column()[i - k] = at(i)[k];
            ReflectFromLeft<E>(q + k * cols + k, cols, m_ - k, cols - k, column(), Conj(kappa()[k]),
                               work());
        }
    }

private:
    T *at(int32_t row) const { return matrix_.data() + row * stride_; }
    T *kappa() const { return vectors_.data(); }
    T *first() const { return vectors_.data() + count_; } // the vectors' elements on the diagonal
    T *column() const { return vectors_.data() + 2 * count_; }
    T *work() const { return column() + m_; }

    void step(int32_t k) {
        typedef Reflector<E> Reflection;
        const Reflection reflection(at(k) + k, stride_, m_ - k, Reflection::Leave::Reduced);
        kappa()[k] = reflection.kappa;
        for (int32_t i = k; i < m_; ++i)
            column()[i - k] = at(i)[k];
        first()[k] = at(k)[k];
        at(k)[k] = ScalarOf<E>::Of(reflection.beta);
        ReflectFromLeft<E>(at(k) + k + 1, stride_, m_ - k, n_ - k - 1, column(), reflection.kappa,
                           work());
    }

    void exchangeColumns(int32_t i, int32_t j) {
        for (int32_t row = 0; row < m_; ++row)
            Swap(&at(row)[i], &at(row)[j]);
    }

    void shorten(int32_t k, int32_t j, DBL *length, DBL *reference) const {
        if (length[j] == 0.0)
            return;
        const double part = Modulus(at(k)[j]) / length[j];
        const double left = std::max(0.0, (1.0 + part) * (1.0 - part));
        const double ratio = length[j] / reference[j];
        if (left * (ratio * ratio) > 0x1p-26)
            length[j] *= std::sqrt(left);
        else
            length[j] = reference[j] = Length<E>(at(k) + stride_ + j, stride_, m_ - k - 1);
    }

    int32_t m_, n_, count_;
    std::ptrdiff_t stride_;
    Scratch<E> matrix_, vectors_;
};

template <ElementType E>
ErrorCode Decompose(const ElementOf<E> *a, int32_t m, int32_t n, int32_t form, I32 *pivots,
                    ElementOf<E> *q, ElementOf<E> *r) {
    if (m < 1 || n < 1)
        return ErrEmptyInput;
    if (form < qrFull || form > qrOnlyR)
        return ErrInvalidSelector;
    if (CheckFinite(a, int64_t{m} * n) != 0)
        return ErrNonFiniteInput;
    HouseholderQR<E> qr(m, n);
    if (const ErrorCode failed = qr.take(a))
        return failed;
    if (pivots == nullptr)
        qr.factor();
    else if (const ErrorCode failed = qr.factorPivoted(pivots))
        return failed;
    const int32_t size = form == qrFull ? m : std::min(m, n);
    qr.writeR(size, r);
    if (form != qrOnlyR)
        qr.writeQ(size, q);
    return 0;
}

template <ElementType E>
class GramSchmidtQR {
    typedef ElementOf<E> T;

public:
    GramSchmidtQR(int32_t m, GramSchmidt order) : m_(m), order_(order), stride_(PaddedStride(m)) {}
    ErrorCode allocate() {
        if (const ErrorCode failed = basis_.allocate(m_ * int64_t{stride_}))
            return failed;
        return vectors_.allocate(4 * int64_t{m_});
    }

    // Column j of a (n columns) into column j of r.
    void addColumn(const T *a, int32_t n, int32_t j, T *r) {
        double largest = 0.0;
        for (int32_t i = 0; i < m_; ++i)
            largest = std::max(largest, AbsSum(a[i * n + j]) * 0.5);
        int exponent = 0;
        std::frexp(largest, &exponent);
        for (int32_t i = 0; i < m_; ++i)
            vector()[i] = ScaledBy(a[i * n + j], -exponent);
        const double before = Length<E>(vector(), 1, m_);
        const int32_t others = std::min(j, m_);
        project(others);
        for (int32_t i = 0; i < m_; ++i)
            r[i * n + j] = i < others ? T(ScaledBy(sums()[i], exponent)) : T{};
        if (j >= m_)
            return;
        const double after = Length<E>(vector(), 1, m_);
        if (after > before * (m_ * epsilon)) {
            r[j * n + j] = ScaledBy(ScalarOf<E>::Of(after), exponent);
            keep(j, after);
        } else {
            addAny(j);
        }
    }

    // Basis vector j becomes the unit vector that lies farthest from those before, less its part
    // along them.
    void addAny(int32_t j) {
        int32_t farthest = 0;
        double least = 2.0;
        for (int32_t i = 0; i < m_; ++i) {
            double along = 0.0;
            for (int32_t k = 0; k < j; ++k)
                along += SquaredModulus(conjugate(k)[i]);
            if (along < least) {
                least = along;
                farthest = i;
            }
        }
        for (int32_t i = 0; i < m_; ++i)
            vector()[i] = ScalarOf<E>::Of(i == farthest ? 1.0 : 0.0);
        project(j);
        keep(j, Length<E>(vector(), 1, m_));
    }

    void writeQ(T *q) const {
        for (int32_t i = 0; i < m_; ++i)
            for (int32_t j = 0; j < m_; ++j)
                q[i * m_ + j] = Conj(conjugate(j)[i]);
    }

private:
    // The basis stands in rows, conjugated.
    T *conjugate(int32_t row) const { return basis_.data() + row * stride_; }
    T *vector() const { return vectors_.data(); }
    T *sums() const { return vectors_.data() + m_; }
    T *products() const { return vectors_.data() + 2 * m_; }
    T *removed() const { return vectors_.data() + 3 * m_; }

    template <class Value>
    static auto ScaledBy(Value value, int exponent) {
        if constexpr (E == ElementType::DBL)
            return std::ldexp(value, exponent);
        else
            return CDB{std::ldexp(value.re, exponent), std::ldexp(value.im, exponent)};
    }

    // Takes from the vector, twice, its parts along the first `count` basis vectors: in the
    // classical order all at once, in the modified order one after the other.
    void project(int32_t count) {
        for (int32_t i = 0; i < count; ++i)
            sums()[i] = T{};
        for (int pass = 0; pass < 2; ++pass) {
            if (order_ == GramSchmidt::Classical)
                projectOn(0, count);
            else
                for (int32_t k = 0; k < count; ++k)
                    projectOn(k, 1);
        }
    }
    void projectOn(int32_t from, int32_t count) {
        if (count < 1)
            return;
        RowProducts(conjugate(from), stride_, count, m_, vector(), products());
        for (int32_t i = 0; i < m_; ++i)
            removed()[i] = T{};
        for (int32_t k = 0; k < count; ++k) {
            sums()[from + k] += products()[k];
            products()[k] = Conj(products()[k]);
        }
        AddTransposedProduct(conjugate(from), stride_, count, m_, products(), removed());
        for (int32_t i = 0; i < m_; ++i)
            vector()[i] = vector()[i] - Conj(removed()[i]);
    }
    void keep(int32_t j, double length) {
        for (int32_t i = 0; i < m_; ++i)
            conjugate(j)[i] = Conj(vector()[i]) / length;
    }

    int32_t m_;
    GramSchmidt order_;
    std::ptrdiff_t stride_;
    Scratch<E> basis_, vectors_;
};

template <ElementType E>
ErrorCode Orthogonalise(const ElementOf<E> *a, int32_t m, int32_t n, GramSchmidt order,
                        ElementOf<E> *q, ElementOf<E> *r) {
    if (m < 1 || n < 1)
        return ErrEmptyInput;
    if (CheckFinite(a, int64_t{m} * n) != 0)
        return ErrNonFiniteInput;
    GramSchmidtQR<E> qr(m, order);
    if (const ErrorCode failed = qr.allocate())
        return failed;
    for (int32_t j = 0; j < n; ++j)
        qr.addColumn(a, n, j, r);
    for (int32_t j = n; j < m; ++j)
        qr.addAny(j);
    qr.writeQ(q);
    return 0;
}

} // namespace

ErrorCode QRDecompose(const DBL *a, int32_t m, int32_t n, int32_t form, DBL *q, DBL *r) {
    return Decompose<ElementType::DBL>(a, m, n, form, nullptr, q, r);
}
ErrorCode QRDecompose(const CDB *a, int32_t m, int32_t n, int32_t form, CDB *q, CDB *r) {
    return Decompose<ElementType::CDB>(a, m, n, form, nullptr, q, r);
}
ErrorCode QRDecomposePivoted(const DBL *a, int32_t m, int32_t n, int32_t form, I32 *pivots, DBL *q,
                             DBL *r) {
    return Decompose<ElementType::DBL>(a, m, n, form, pivots, q, r);
}
ErrorCode QRDecomposePivoted(const CDB *a, int32_t m, int32_t n, int32_t form, I32 *pivots, CDB *q,
                             CDB *r) {
    return Decompose<ElementType::CDB>(a, m, n, form, pivots, q, r);
}
ErrorCode QRByGramSchmidt(const DBL *a, int32_t m, int32_t n, GramSchmidt order, DBL *q, DBL *r) {
    return Orthogonalise<ElementType::DBL>(a, m, n, order, q, r);
}
ErrorCode QRByGramSchmidt(const CDB *a, int32_t m, int32_t n, GramSchmidt order, CDB *q, CDB *r) {
    return Orthogonalise<ElementType::CDB>(a, m, n, order, q, r);
}

} // namespace qx
