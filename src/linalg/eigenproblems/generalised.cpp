#include "linalg/eigenproblems/generalised.h"

#include "linalg/aligned.h"
#include "linalg/factorisations/block_order.h"
#include "linalg/lapack.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

template <ElementType E>
class OrderedPencil {
    typedef ElementOf<E> T;

public:
    explicit OrderedPencil(int32_t n) : n_(n) {}

    ErrorCode compute(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b, SchurOrder order,
                      ComplexVector alpha, VectorView<E> beta) {
        if (const ErrorCode failed =
                memory_.take(Aligned(Sized(s_, n_, n_)), Aligned(Sized(t_, n_, n_)),
                             Aligned(Sized(q_, n_, n_)), Aligned(Sized(z_, n_, n_))))
            return failed;
        CopyTransposed<E>(a, s_);
        CopyTransposed<E>(b, t_);
        const int32_t info = lapack::GeneralisedSchur(n_, s_.data(), t_.data(), alpha.data(),
                                                      beta.data(), q_.data(), z_.data());
        if (const ErrorCode failed = CodeOfSchur(info, n_))
            return failed;
        return order == schurUnordered ? 0 : sort(order, alpha, beta);
    }

    void write(const MatrixView<E> &s, const MatrixView<E> &t, const MatrixView<E> &q,
               const MatrixView<E> &z) const {
        CopyTransposed<E>(s_, s);
        CopyTransposed<E>(t_, t);
        if (!q.isEmpty())
            CopyTransposed<E>(q_, q);
        if (!z.isEmpty())
            CopyTransposed<E>(z_, z);
    }

    // Right eigenvectors of unit length, in columns. The Schur vectors z are lost.
    ErrorCode writeVectors(ConstComplexVector alpha, const ComplexMatrix &vectors) {
        const int32_t info = lapack::GeneralisedVectors(n_, s_.data(), t_.data(), z_.data());
        // The form has overflowed: LAPACK refuses a NaN on the diagonal of t as not being real.
        if (info < 0)
            return info == lapack::noMemory ? ErrOutOfMemory : ErrConditionTooHigh;
        if (info > 0)
            return ErrIterationLimit;
        for (int32_t j = 0; j < n_; ++j) {
            const bool isPair = E == ElementType::DBL && alpha[j].im != 0.0 && j + 1 < n_;
            writeVector(j, isPair ? 1.0 : 0.0, vectors.block(0, j, n_, 1));
            if (isPair) {
                writeVector(j, -1.0, vectors.block(0, j + 1, n_, 1));
                ++j;
            }
        }
        return 0;
    }

private:
    // Column j, plus i times `sign` times the next one.
    void writeVector(int32_t j, double sign, const ComplexMatrix &vector) const {
        const T *const re = z_.row(j);
        double squares = 0.0;
        const auto element = [&](int32_t i) {
            const double im = sign == 0.0 ? ImagPart(re[i]) : sign * RealPart(re[i + n_]);
            return CDB{RealPart(re[i]), im};
        };
        for (int32_t i = 0; i < n_; ++i)
            squares += SquaredModulus(element(i));
        const double length = squares > 0.0 ? std::sqrt(squares) : 1.0;
        for (int32_t i = 0; i < n_; ++i)
            vector(i, 0) = element(i) / length;
    }

    ErrorCode sort(SchurOrder order, ComplexVector alpha, VectorView<E> beta) {
        BlockOrder blocks;
        if (const ErrorCode failed = blocks.allocate(n_))
            return failed;
        for (int32_t i = 0; i < n_;) {
            const int32_t size = E == ElementType::DBL && alpha[i].im != 0.0 && i + 1 < n_ ? 2 : 1;
            const double divisor = RealPart(beta[i]);
            blocks.add(alpha[i].re / divisor, Modulus(alpha[i]) / divisor, size, order);
            i += size;
        }
        const auto move = [&](int32_t from, int32_t to) {
            const int32_t info = lapack::MoveInGeneralisedSchur(n_, s_.data(), t_.data(), q_.data(),
                                                                z_.data(), from, to);
            if (info == 0)
                moveValues(from, to, alpha, beta);
            return info;
        };
        if (const ErrorCode failed = blocks.sort(move))
            return failed;
        for (int32_t i = 0; i < n_; ++i)
            if (alpha[i].im == 0.0 || E == ElementType::CDB)
                readValue(i, &alpha[i], &beta[i]);
        return 0;
    }
    // An exchange leaves numbers of any phase on the diagonal of t. LAPACK expects them to be real
    // and not negative, so column i of s, t and z is multiplied by a phase factor.
    void readValue(int32_t i, CDB *alpha, T *beta) const {
        const double size = Modulus(t_(i, i));
        if (size != 0.0) {
            const auto phase = Conj(t_(i, i)) / size;
            for (int32_t k = 0; k < n_; ++k) {
                s_(i, k) = s_(i, k) * phase;
                t_(i, k) = t_(i, k) * phase;
                z_(i, k) = z_(i, k) * phase;
            }
            t_(i, i) = ScalarOf<E>::Of(size);
        }
        *alpha = {RealPart(s_(i, i)), ImagPart(s_(i, i))};
        *beta = t_(i, i);
    }
    // Moves the values as the blocks were moved.
    void moveValues(int32_t from, int32_t to, ComplexVector alpha, VectorView<E> beta) const {
        const int32_t size = E == ElementType::DBL && alpha[from].im != 0.0 ? 2 : 1;
        for (int32_t step = 0; step < size; ++step)
            for (int32_t i = from + step; i > to + step; --i) {
                Swap(&alpha[i], &alpha[i - 1]);
                Swap(&beta[i], &beta[i - 1]);
            }
    }

    int32_t n_;
    ScratchParts memory_;
    MatrixView<E> s_, t_, q_, z_; // transposed, as LAPACK has them
};

} // namespace

template <ElementType E>
ErrorCode GeneralisedSchur(const MatrixView<E> &a, const MatrixView<E> &b, SchurOrder order,
                           const MatrixView<E> &q, const MatrixView<E> &z, ComplexVector alpha,
                           VectorView<E> beta, const ComplexMatrix &vectors) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && b.rows() == a.rows() && b.isSquare());
    if (!AllFinite<E>(a) || !AllFinite<E>(b))
        return ErrNonFiniteInput;
    OrderedPencil<E> pencil(a.rows());
    if (const ErrorCode failed = pencil.compute(a, b, order, alpha, beta))
        return failed;
    pencil.write(a, b, q, z);
    return vectors.isEmpty() ? 0 : pencil.writeVectors(alpha, vectors);
}

template <ElementType E>
ErrorCode GeneralisedSingular(const MatrixView<E> &a, const MatrixView<E> &b,
                              GeneralisedRanks *ranks, RealVector alpha, RealVector beta,
                              const MatrixView<E> &u, const MatrixView<E> &v,
                              const MatrixView<E> &q) {
    const int32_t m = a.rows(), n = a.cols(), p = b.rows();
    QX_EXPECTS(!a.isEmpty() && !b.isEmpty() && b.cols() == n);
    if (!AllFinite<E>(a) || !AllFinite<E>(b))
        return ErrNonFiniteInput;
    MatrixView<E> at, bt, ut, vt, qt;
    RealVector alphas, betas;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Aligned(Sized(at, n, m)), Aligned(Sized(bt, n, p)),
                                             Aligned(Sized(ut, m, m)), Aligned(Sized(vt, p, p)),
                                             Aligned(Sized(qt, n, n)), Aligned(Sized(alphas, n)),
                                             Aligned(Sized(betas, n))))
        return failed;
    CopyTransposed<E>(a, at);
    CopyTransposed<E>(b, bt);
    const int32_t info =
        lapack::GeneralisedSingular(m, n, p, at.data(), bt.data(), ranks, alphas.data(),
                                    betas.data(), ut.data(), vt.data(), qt.data());
    if (info != 0)
        return info < 0 ? lapack::CodeOf(info) : ErrIterationLimit;
    CopyTransposed<E>(at, a);
    CopyTransposed<E>(bt, b);
    CopyTransposed<E>(ut, u);
    CopyTransposed<E>(vt, v);
    CopyTransposed<E>(qt, q);
    Copy<ElementType::DBL>(alphas, alpha);
    Copy<ElementType::DBL>(betas, beta);
    return 0;
}

template ErrorCode GeneralisedSchur(const RealMatrix &, const RealMatrix &, SchurOrder,
                                    const RealMatrix &, const RealMatrix &, ComplexVector,
                                    RealVector, const ComplexMatrix &);
template ErrorCode GeneralisedSchur(const ComplexMatrix &, const ComplexMatrix &, SchurOrder,
                                    const ComplexMatrix &, const ComplexMatrix &, ComplexVector,
                                    ComplexVector, const ComplexMatrix &);
template ErrorCode GeneralisedSingular(const RealMatrix &, const RealMatrix &, GeneralisedRanks *,
                                       RealVector, RealVector, const RealMatrix &,
                                       const RealMatrix &, const RealMatrix &);
template ErrorCode GeneralisedSingular(const ComplexMatrix &, const ComplexMatrix &,
                                       GeneralisedRanks *, RealVector, RealVector,
                                       const ComplexMatrix &, const ComplexMatrix &,
                                       const ComplexMatrix &);

} // namespace qx
