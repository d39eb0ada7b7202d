#include "linalg/factorisations/schur.h"

#include "linalg/aligned.h"
#include "linalg/factorisations/block_order.h"
#include "linalg/lapack.h"

#include <cmath>

namespace qx {
namespace {

template <ElementType E>
class OrderedSchur {
    typedef ElementOf<E> T;

public:
    explicit OrderedSchur(int32_t n) : n_(n) {}

    // Computes the form without ordering it.
    ErrorCode compute(const ConstMatrixView<E> &a, bool withVectors, ComplexVector w) {
        const int32_t vectorsOrder = withVectors ? n_ : 0;
        if (const ErrorCode failed =
                memory_.take(Aligned(Sized(form_, n_, n_)),
                             Aligned(Sized(vectors_, vectorsOrder, vectorsOrder))))
            return failed;
        CopyTransposed<E>(a, form_);
        const int32_t info = lapack::Schur(n_, form_.data(), w.data(), vectors());
        if (const ErrorCode failed = CodeOfSchur(info, n_))
            return failed;
        return blocks_.allocate(n_);
    }
    ErrorCode sort(SchurOrder order, ComplexVector w) {
        classify(order, w);
        const auto move = [this](int32_t from, int32_t to) {
            return lapack::MoveInSchur(n_, form_.data(), vectors(), from, to);
        };
        if (const ErrorCode failed = blocks_.sort(move))
            return failed;
        readValues(w);
        return 0;
    }
    ErrorCode sortUntilInOrder(SchurOrder order, ComplexVector w) {
        constexpr int mostRounds = 20; // two were enough in all cases tried
        for (int round = 0; round < mostRounds; ++round) {
            if (const ErrorCode failed = sort(order, w))
                return failed;
            classify(order, w);
            if (blocks_.isInOrder())
                return 0;
        }
        return WarnLowAccuracy;
    }
    void write(const MatrixView<E> &t, const MatrixView<E> &z) const {
        CopyTransposed<E>(form_, t);
        if (!z.isEmpty())
            CopyTransposed<E>(vectors_, z);
    }

private:
    T *vectors() const { return vectors_.isEmpty() ? nullptr : vectors_.data(); }
    // The form is stored column by column, as LAPACK requires.
    T &at(int32_t i, int32_t j) const { return form_(j, i); }

    // Lists the blocks along the diagonal, each with the key by which they are sorted in ascending
    // order.
    void classify(SchurOrder order, ComplexVector w) {
        blocks_.clear();
        const double tiny = epsilon * sumOf(w);
        for (int32_t i = 0; i < n_;) {
            const bool isPair = E == ElementType::DBL && w[i].im != 0.0 && i + 1 < n_;
            if (isPair && std::fabs(w[i].im / w[i].re) <= n_ * epsilon &&
                std::fabs(w[i].im) <= tiny) {
                at(i + 1, i) = {};
                w[i].im = w[i + 1].im = 0.0;
                continue;
            }
            const int32_t size = isPair ? 2 : 1;
            blocks_.add(w[i].re, Modulus(w[i]), size, order);
            i += size;
        }
    }
    double sumOf(ConstComplexVector w) const {
        double sum = 0.0;
        for (int32_t i = 0; i < n_; ++i)
            sum += AbsSum(w[i]);
        return sum;
    }

    void readValues(ComplexVector w) const {
        for (int32_t i = 0; i < n_; ++i) {
            w[i] = {RealPart(at(i, i)), ImagPart(at(i, i))};
            if (E == ElementType::CDB || i + 1 == n_ || RealPart(at(i + 1, i)) == 0.0)
                continue;
            const double im = std::sqrt(std::fabs(RealPart(at(i + 1, i)))) *
                              std::sqrt(std::fabs(RealPart(at(i, i + 1))));
            w[i].im = im;
            w[i + 1] = {RealPart(at(i + 1, i + 1)), -im};
            ++i;
        }
    }

    int32_t n_;
    ScratchParts memory_;
    MatrixView<E> form_, vectors_;
    BlockOrder blocks_;
};

} // namespace

template <ElementType E>
ErrorCode SchurDecompose(const ConstMatrixView<E> &a, SchurOrder order, const MatrixView<E> &z,
                         const MatrixView<E> &t, ComplexVector w) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && w.size() == a.rows());
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    OrderedSchur<E> schur(a.rows());
    if (const ErrorCode failed = schur.compute(a, !z.isEmpty(), w))
        return failed;
    if (order != schurUnordered)
        if (const ErrorCode failed = schur.sort(order, w))
            return failed;
    schur.write(t, z);
    return 0;
}

template <ElementType E>
ErrorCode SchurInOrder(const ConstMatrixView<E> &a, SchurOrder order, const MatrixView<E> &z,
                       const MatrixView<E> &t, ComplexVector w) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && w.size() == a.rows());
    if (!HoldsOnlyNumbers<E>(a))
        return ErrNonFiniteInput;
    OrderedSchur<E> schur(a.rows());
    if (const ErrorCode failed = schur.compute(a, !z.isEmpty(), w))
        return failed;
    const ErrorCode status = order == schurUnordered ? 0 : schur.sortUntilInOrder(order, w);
    if (status >= 0)
        schur.write(t, z);
    return status;
}

template ErrorCode SchurDecompose(const ConstRealMatrix &, SchurOrder, const RealMatrix &,
                                  const RealMatrix &, ComplexVector);
template ErrorCode SchurInOrder(const ConstRealMatrix &, SchurOrder, const RealMatrix &,
                                const RealMatrix &, ComplexVector);
template ErrorCode SchurDecompose(const ConstComplexMatrix &, SchurOrder, const ComplexMatrix &,
                                  const ComplexMatrix &, ComplexVector);

} // namespace qx
