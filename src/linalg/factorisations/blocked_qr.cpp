#include "linalg/aligned.h"
#include "linalg/factorisations/qr.h"
#include "linalg/factorisations/range.h"
#include "linalg/lapack.h"

#include <algorithm>

namespace qx {
namespace {

// The reflections and r as LAPACK leaves them: the transposed matrix, row j of which is a column.
template <ElementType E>
class BlockedQR {
public:
    ErrorCode factor(const ConstMatrixView<E> &a, IndexVector pivots) {
        m_ = a.rows();
        n_ = a.cols();
        if (const ErrorCode failed =
                memory_.take(Aligned(Sized(columns_, n_, m_)), Aligned(Sized(tau_, count())),
                             Aligned(Sized(order_, pivots.size()))))
            return failed;
        CopyTransposed<E>(a, columns_);
        exponent_ = BringIntoRange<E>(columns_, 0x1p-400);
        const int32_t info =
            pivots.isEmpty()
                ? lapack::FactorQR(m_, n_, columns_.data(), tau_.data())
                : lapack::FactorPivotedQR(m_, n_, columns_.data(), order_.data(), tau_.data());
        for (std::ptrdiff_t j = 0; j < pivots.size(); ++j)
            pivots[j] = order_[j] - 1;
        return info < 0 ? lapack::CodeOf(info) : 0;
    }
    void writeR(const MatrixView<E> &r) const {
        for (int32_t i = 0; i < r.rows(); ++i)
            for (int32_t j = 0; j < n_; ++j)
                r(i, j) = j < i ? ElementOf<E>{} : TimesPower(columns_(j, i), exponent_);
    }
    ErrorCode writeQ(const MatrixView<E> &q) const {
        ScratchParts memory;
        MatrixView<E> columns;
        if (const ErrorCode failed = memory.take(Aligned(Sized(columns, q.cols(), m_))))
            return failed;
        for (int32_t j = 0; j < q.cols(); ++j)
            for (int32_t i = 0; i < m_; ++i)
                columns(j, i) = j < count() ? columns_(j, i) : ElementOf<E>{};
        if (const int32_t info = lapack::FormQ(m_, q.cols(), count(), columns.data(), tau_.data()))
            return lapack::CodeOf(info);
        CopyTransposed<E>(columns, q);
        return 0;
    }

private:
    int32_t count() const { return std::min(m_, n_); }

    int32_t m_ = 0, n_ = 0;
    int exponent_ = 0;
    ScratchParts memory_;
    MatrixView<E> columns_;
    VectorView<E> tau_;
    IndexVector order_;
};

} // namespace

template <ElementType E>
ErrorCode QRDecomposeBlocked(const ConstMatrixView<E> &a, QRForm form, IndexVector pivots,
                             const MatrixView<E> &q, const MatrixView<E> &r) {
    if (std::min(a.rows(), a.cols()) < fewestBlocked)
        return pivots.isEmpty() ? QRDecompose<E>(a, form, q, r)
                                : QRDecomposePivoted<E>(a, form, pivots, q, r);
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    BlockedQR<E> qr;
    if (const ErrorCode failed = qr.factor(a, pivots))
        return failed;
    qr.writeR(r);
    return form == qrOnlyR ? 0 : qr.writeQ(q);
}

template ErrorCode QRDecomposeBlocked(const ConstRealMatrix &, QRForm, IndexVector,
                                      const RealMatrix &, const RealMatrix &);
template ErrorCode QRDecomposeBlocked(const ConstComplexMatrix &, QRForm, IndexVector,
                                      const ComplexMatrix &, const ComplexMatrix &);

} // namespace qx
