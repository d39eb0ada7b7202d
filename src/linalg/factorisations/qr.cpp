#include "linalg/factorisations/qr.h"

#include "linalg/factorisations/reflector.h"

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
    HouseholderQR(int32_t m, int32_t n) : m_(m), n_(n), count_(std::min(m, n)) {}

    ErrorCode take(const ConstMatrixView<E> &a) {
        if (const ErrorCode failed =
                memory_.take(SizedPadded(matrix_, m_, n_), Sized(kappa_, count_),
                             Sized(first_, count_), Sized(column_, m_)))
            return failed;
        CopyMatrix<E>(a, matrix_);
        return 0;
    }

    void factor() {
        for (int32_t k = 0; k < count_; ++k)
            step(k);
    }
    // The lengths of the columns below the finished rows are updated at each step, and recomputed
    // where that has cost half their digits (LAPACK's Working Note 176).
    ErrorCode factorPivoted(IndexVector pivots) {
        RealVector length, reference;
        ScratchParts memory;
        if (const ErrorCode failed = memory.take(Sized(length, n_), Sized(reference, n_)))
            return failed;
        for (int32_t j = 0; j < n_; ++j) {
            pivots[j] = j;
            length[j] = reference[j] = Length<E>(at(0) + j, matrix_.stride(), m_);
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

    void writeR(const MatrixView<E> &r) const {
        for (int32_t i = 0; i < r.rows(); ++i)
            for (int32_t j = 0; j < n_; ++j)
                r(i, j) = j < i ? T{} : at(i)[j];
    }
    // The first columns of H0^H H1^H ...
    void writeQ(const MatrixView<E> &q) const {
        SetIdentity<E>(q);
        for (int32_t k = count_ - 1; k >= 0; --k) {
            column_[0] = first_[k];
            for (int32_t i = k + 1; i < m_; ++i)
                column_[i - k] = at(i)[k];
            ReflectFromLeft<E>(q.block(k, k, m_ - k, q.cols() - k), column_.part(0, m_ - k),
                               Conj(kappa_[k]));
        }
    }

private:
    T *at(int32_t row) const { return matrix_.row(row); }

    void step(int32_t k) {
        typedef Reflector<E> Reflection;
        const Reflection reflection(at(k) + k, matrix_.stride(), m_ - k,
                                    Reflection::Leave::Reduced);
        kappa_[k] = reflection.kappa;
        for (int32_t i = k; i < m_; ++i)
            column_[i - k] = at(i)[k];
        first_[k] = at(k)[k];
        at(k)[k] = ScalarOf<E>::Of(reflection.beta);
        ReflectFromLeft<E>(matrix_.block(k, k + 1, m_ - k, n_ - k - 1), column_.part(0, m_ - k),
                           reflection.kappa);
    }

    void exchangeColumns(int32_t i, int32_t j) {
        for (int32_t row = 0; row < m_; ++row)
            Swap(&at(row)[i], &at(row)[j]);
    }

    void shorten(int32_t k, int32_t j, RealVector length, RealVector reference) const {
        if (length[j] == 0.0)
            return;
        const double part = Modulus(at(k)[j]) / length[j];
        const double left = std::max(0.0, (1.0 + part) * (1.0 - part));
        const double ratio = length[j] / reference[j];
        if (left * (ratio * ratio) > 0x1p-26)
            length[j] *= std::sqrt(left);
        else
            length[j] = reference[j] = Length<E>(at(k + 1) + j, matrix_.stride(), m_ - k - 1);
    }

    int32_t m_, n_, count_;
    ScratchParts memory_;
    MatrixView<E> matrix_;
    VectorView<E> kappa_, first_; // the vectors' elements on the diagonal
    VectorView<E> column_;
};

template <ElementType E>
class GramSchmidtQR {
    typedef ElementOf<E> T;

public:
    GramSchmidtQR(int32_t m, GramSchmidt order) : m_(m), order_(order) {}
    ErrorCode allocate() {
        return memory_.take(SizedPadded(conjugates_, m_, m_), Sized(vector_, m_), Sized(sums_, m_),
                            Sized(products_, m_), Sized(removed_, m_));
    }

    // Projects column j of a onto the basis and writes the coefficients to column j of r.
    void addColumn(const ConstMatrixView<E> &a, int32_t j, const MatrixView<E> &r) {
        double largest = 0.0;
        for (int32_t i = 0; i < m_; ++i)
            largest = std::max(largest, AbsSum(a(i, j)) * 0.5);
        int exponent = 0;
        std::frexp(largest, &exponent);
        for (int32_t i = 0; i < m_; ++i)
            vector_[i] = ScaledBy(a(i, j), -exponent);
        const double before = Length<E>(vector_.data(), 1, m_);
        const int32_t others = std::min(j, m_);
        project(others);
        for (int32_t i = 0; i < m_; ++i)
            r(i, j) = i < others ? T(ScaledBy(sums_[i], exponent)) : T{};
        if (j >= m_)
            return;
        const double after = Length<E>(vector_.data(), 1, m_);
        if (after > before * (m_ * epsilon)) {
            r(j, j) = ScaledBy(ScalarOf<E>::Of(after), exponent);
            keep(j, after);
        } else {
            addAny(j);
        }
    }

    // Basis vector j becomes the unit vector that is farthest from the earlier ones, minus its
    // projection on them.
    void addAny(int32_t j) {
        int32_t farthest = 0;
        double least = 2.0;
        for (int32_t i = 0; i < m_; ++i) {
            double along = 0.0;
            for (int32_t k = 0; k < j; ++k)
                along += SquaredModulus(conjugates_(k, i));
            if (along < least) {
                least = along;
                farthest = i;
            }
        }
        for (int32_t i = 0; i < m_; ++i)
            vector_[i] = ScalarOf<E>::Of(i == farthest ? 1.0 : 0.0);
        project(j);
        keep(j, Length<E>(vector_.data(), 1, m_));
    }

    void writeQ(const MatrixView<E> &q) const {
        for (int32_t i = 0; i < m_; ++i)
            for (int32_t j = 0; j < m_; ++j)
                q(i, j) = Conj(conjugates_(j, i));
    }

private:
    template <class Value>
    static auto ScaledBy(Value value, int exponent) {
        if constexpr (E == ElementType::DBL)
            return std::ldexp(value, exponent);
        else
            return CDB{std::ldexp(value.re, exponent), std::ldexp(value.im, exponent)};
    }

    // Subtracts from the vector, twice, its projections on the first `count` basis vectors: all at
    // once in the classical order, one after the other in the modified order.
    void project(int32_t count) {
        for (int32_t i = 0; i < count; ++i)
            sums_[i] = T{};
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
        const ConstMatrixView<E> basis = conjugates_.block(from, 0, count, m_);
        const VectorView<E> products = products_.part(0, count);
        RowProducts<E>(basis, vector_, products);
        for (int32_t i = 0; i < m_; ++i)
            removed_[i] = T{};
        for (int32_t k = 0; k < count; ++k) {
            sums_[from + k] += products[k];
            products[k] = Conj(products[k]);
        }
        AddTransposedProduct<E>(basis, products, removed_);
        for (int32_t i = 0; i < m_; ++i)
            vector_[i] = vector_[i] - Conj(removed_[i]);
    }
    void keep(int32_t j, double length) {
        for (int32_t i = 0; i < m_; ++i)
            conjugates_(j, i) = Conj(vector_[i]) / length;
    }

    int32_t m_;
    GramSchmidt order_;
    ScratchParts memory_;
    MatrixView<E> conjugates_; // the basis in rows, conjugated
    VectorView<E> vector_, sums_, products_, removed_;
};

// Whether q and r have the shapes of the factors.
template <ElementType E>
bool AreFactors(const ConstMatrixView<E> &a, QRForm form, const ConstMatrixView<E> &q,
                const ConstMatrixView<E> &r) {
    const int32_t m = a.rows(), size = form == qrFull ? m : std::min(m, a.cols());
    return r.rows() == size && r.cols() == a.cols() &&
           (form == qrOnlyR || (q.rows() == m && q.cols() == size));
}

// `pivots` is empty if the columns keep their order.
template <ElementType E>
ErrorCode Decompose(const ConstMatrixView<E> &a, QRForm form, IndexVector pivots,
                    const MatrixView<E> &q, const MatrixView<E> &r) {
    QX_EXPECTS(!a.isEmpty() && AreFactors<E>(a, form, q, r));
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    HouseholderQR<E> qr(a.rows(), a.cols());
    if (const ErrorCode failed = qr.take(a))
        return failed;
    if (pivots.isEmpty())
        qr.factor();
    else if (const ErrorCode failed = qr.factorPivoted(pivots))
        return failed;
    qr.writeR(r);
    if (form != qrOnlyR)
        qr.writeQ(q);
    return 0;
}

} // namespace

template <ElementType E>
ErrorCode QRDecompose(const ConstMatrixView<E> &a, QRForm form, const MatrixView<E> &q,
                      const MatrixView<E> &r) {
    return Decompose<E>(a, form, {}, q, r);
}

template <ElementType E>
ErrorCode QRDecomposePivoted(const ConstMatrixView<E> &a, QRForm form, IndexVector pivots,
                             const MatrixView<E> &q, const MatrixView<E> &r) {
    QX_EXPECTS(pivots.size() == a.cols());
    return Decompose<E>(a, form, pivots, q, r);
}

template <ElementType E>
ErrorCode QRByGramSchmidt(const ConstMatrixView<E> &a, GramSchmidt order, const MatrixView<E> &q,
                          const MatrixView<E> &r) {
    QX_EXPECTS(!a.isEmpty() && AreFactors<E>(a, qrFull, q, r));
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    GramSchmidtQR<E> qr(a.rows(), order);
    if (const ErrorCode failed = qr.allocate())
        return failed;
    for (int32_t j = 0; j < a.cols(); ++j)
        qr.addColumn(a, j, r);
    for (int32_t j = a.cols(); j < a.rows(); ++j)
        qr.addAny(j);
    qr.writeQ(q);
    return 0;
}

template ErrorCode QRDecompose(const ConstRealMatrix &, QRForm, const RealMatrix &,
                               const RealMatrix &);
template ErrorCode QRDecompose(const ConstComplexMatrix &, QRForm, const ComplexMatrix &,
                               const ComplexMatrix &);
template ErrorCode QRDecomposePivoted(const ConstRealMatrix &, QRForm, IndexVector,
                                      const RealMatrix &, const RealMatrix &);
template ErrorCode QRDecomposePivoted(const ConstComplexMatrix &, QRForm, IndexVector,
                                      const ComplexMatrix &, const ComplexMatrix &);
template ErrorCode QRByGramSchmidt(const ConstRealMatrix &, GramSchmidt, const RealMatrix &,
                                   const RealMatrix &);
template ErrorCode QRByGramSchmidt(const ConstComplexMatrix &, GramSchmidt, const ComplexMatrix &,
                                   const ComplexMatrix &);

} // namespace qx
