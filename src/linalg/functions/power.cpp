#include "linalg/functions/functions.h"

#include "linalg/products/products.h"
#include "linalg/systems/least_squares.h"
#include "linalg/systems/lu.h"

#include <utility>

namespace qx {

namespace {

// out = base^power for a power that is not negative; base and spare are overwritten.
template <ElementType E>
void RaiseToPower(MatrixView<E> base, int64_t power, MatrixView<E> spare, MatrixView<E> result,
                  const MatrixView<E> &out) {
    // Bit by bit from the lowest, without multiplying by the identity.
    bool isIdentity = true;
    for (int64_t rest = power; rest > 0; rest >>= 1) {
        if ((rest & 1) != 0 && isIdentity) {
            CopyMatrix<E>(base, result);
            isIdentity = false;
        } else if ((rest & 1) != 0) {
            MatrixProduct<E>(base, result, spare);
            std::swap(result, spare);
        }
        if (rest == 1)
            break;
        MatrixProduct<E>(base, base, spare);
        std::swap(base, spare);
    }
    if (isIdentity)
        SetIdentity<E>(out);
    else
        CopyMatrix<E>(result, out);
}

int64_t Magnitude(int32_t power) { return power < 0 ? -int64_t{power} : power; }

} // namespace

template <ElementType E>
ErrorCode MatrixPower(const ConstMatrixView<E> &a, int32_t power, const MatrixView<E> &out) {
    const int32_t n = a.rows();
    QX_EXPECTS(a.isSquare() && n > 0 && out.rows() == n && out.cols() == n);
    MatrixView<E> base, result, spare;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(base, n, n), Sized(result, n, n), Sized(spare, n, n)))
        return failed;
    CopyMatrix<E>(a, base);
    if (power < 0)
        if (const ErrorCode failed = PseudoInverseMatrix<E>(a, -1.0, base))
            return failed;
    RaiseToPower<E>(base, Magnitude(power), spare, result, out);
    return 0;
}

template <ElementType E>
ErrorCode ScaledMatrixPower(const ConstMatrixView<E> &a, int32_t power, const MatrixView<E> &out) {
    const int32_t n = a.rows();
    QX_EXPECTS(a.isSquare() && n > 0 && out.rows() == n && out.cols() == n);
    if (!HoldsOnlyNumbers<E>(a))
        return ErrNonFiniteInput;
    MatrixView<E> base, result, spare;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(base, n, n), Sized(result, n, n), Sized(spare, n, n)))
        return failed;
    CopyMatrix<E>(a, base);
    ErrorCode status = 0;
    if (power < 0) {
        double reciprocalCondition;
        SetIdentity<E>(spare);
        status = SolveSetByLU<E>(a, spare, base, &reciprocalCondition);
        if (status < 0)
            return status;
    }
    RaiseToPower<E>(base, Magnitude(power), spare, result, out);
    return status;
}

template ErrorCode MatrixPower(const ConstRealMatrix &, int32_t, const RealMatrix &);
template ErrorCode MatrixPower(const ConstComplexMatrix &, int32_t, const ComplexMatrix &);
template ErrorCode ScaledMatrixPower(const ConstRealMatrix &, int32_t, const RealMatrix &);
template ErrorCode ScaledMatrixPower(const ConstComplexMatrix &, int32_t, const ComplexMatrix &);

} // namespace qx
