#include "linalg/eigenproblems/complex_qr.h"
#include "linalg/eigenproblems/general.h"
#include "linalg/eigenproblems/symmetric.h"
#include "linalg/factorisations/hessenberg.h"
#include "linalg/factorisations/range.h"
#include "linalg/kernels.h"

#include <cmath>

namespace qx {
namespace {

constexpr auto E = ElementType::CDB;

class ComplexEigenproblem {
public:
    ErrorCode solve(const ConstComplexMatrix &a, ComplexVector values,
                    const ComplexMatrix &vectors) {
        n_ = a.rows();
        const int32_t order = vectors.isEmpty() ? 0 : n_; // of the matrices for vectors
        ComplexMatrix q;
        if (const ErrorCode failed = memory_.take(
                SizedPadded(matrix_, n_, n_), SizedPadded(transposed_, order, order),
                SizedPadded(q, order, order), Sized(x_, n_), Sized(v_, n_), Sized(scale_, n_)))
            return failed;

        CopyMatrix<E>(a, matrix_);
        const int exponent = BringIntoRange<E>(matrix_, 0x1p-400);
        const Balanced range = Balance<E>(matrix_, true, true, scale_);
        if (const ErrorCode failed = ReduceToHessenberg<E>(matrix_, range.low, range.high, q))
            return failed;
        CopyTransposed<E>(q, transposed_);
        if (const ErrorCode failed =
                ComplexSchurIteration(matrix_, range, 0.0, values, transposed_))
            return failed;
        if (!vectors.isEmpty())
            writeVectors(range, vectors);
        for (int32_t i = 0; exponent != 0 && i < n_; ++i)
            values[i] = {std::ldexp(values[i].re, exponent), std::ldexp(values[i].im, exponent)};
        return 0;
    }

private:
    void writeVectors(Balanced range, const ComplexMatrix &vectors) {
        double norm = 0.0;
        for (int32_t i = 0; i < n_; ++i)
            for (int32_t j = i; j < n_; ++j)
                norm += AbsSum(matrix_(i, j));
        const double least = epsilon * (norm > 0.0 ? norm : 1.0);
        for (int32_t j = 0; j < n_; ++j) {
            substituteBack(j, least);
            for (CDB &element : v_)
                element = {0.0, 0.0};
            AddTransposedProduct<E>(transposed_.block(0, 0, j + 1, n_), x_.part(0, j + 1), v_);
            UndoScaling<E>(scale_, range, EigenvectorSide::Right, AsColumn(v_));
            UndoPermutation<E>(scale_, range, AsColumn(v_));
            normalise();
            for (int32_t i = 0; i < n_; ++i)
                vectors(i, j) = v_[i];
        }
    }

    // The eigenvector of the triangular matrix that belongs to its diagonal element j.
    void substituteBack(int32_t j, double least) const {
        x_[j] = {1.0, 0.0};
        for (int32_t i = j - 1; i >= 0; --i) {
            CDB sum;
            RowProducts<E>(matrix_.block(i, i + 1, 1, j - i), x_.part(i + 1, j - i), {&sum, 1});
            CDB distance = matrix_(i, i) - matrix_(j, j);
            if (AbsSum(distance) < least)
                distance = {least, 0.0};
            x_[i] = -(sum / distance);
            const double size = AbsSum(x_[i]);
            for (int32_t k = i; epsilon * size * size > 1.0 && k <= j; ++k)
                x_[k] = x_[k] / size;
        }
    }

    void normalise() const {
        double squares = 0.0;
        for (int32_t i = 0; i < n_; ++i)
            squares += SquaredModulus(v_[i]);
        if (!(squares > 0.0))
            return;
        const double length = std::sqrt(squares);
        for (int32_t i = 0; i < n_; ++i)
            v_[i] = v_[i] / length;
    }

    int32_t n_ = 0;
    ScratchParts memory_;
    ComplexMatrix matrix_, transposed_;
    ComplexVector x_, v_;
    RealVector scale_;
};

} // namespace

template <>
ErrorCode EigenGeneral(const ConstComplexMatrix &a, ComplexVector values,
                       const ComplexMatrix &vectors) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && values.size() == a.rows());
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    return ComplexEigenproblem().solve(a, values, vectors);
}

ErrorCode EigenHermitian(const ConstComplexMatrix &a, Steps steps, ComplexVector values,
                         const ComplexMatrix &vectors) {
    RealVector real;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(real, a.rows())))
        return failed;
    const auto solve = steps == Steps::Blocked ? SymmetricEigenBlocked<E> : SymmetricEigen<E>;
    if (const ErrorCode failed = solve(a, real, vectors))
        return failed;
    for (int32_t i = 0; i < a.rows(); ++i)
        values[i] = {real[i], 0.0};
    return 0;
}

} // namespace qx
