#include "qx/matrix_functions.h"

#include "linalg/exports/checks.h"
#include "linalg/functions/functions.h"
#include "linalg/systems/least_squares.h"

namespace qx {
namespace {

// kept: the exports without an `err` check for a square matrix before an empty one
template <class Matrix>
ErrorCode CheckShapeFirst(const Block<Matrix> &a) {
    return FirstFailed({{!a.isSquare(), ErrNotSquare}, {a.isEmpty(), ErrEmptyInput}});
}

void CopyAsComplex(const ConstRealMatrix &from, const ComplexMatrix &to) {
    for (int32_t i = 0; i < from.rows(); ++i)
        for (int32_t j = 0; j < from.cols(); ++j)
            to(i, j) = {from(i, j), 0.0};
}

template <class Matrix>
Outcome Exponential(InOut<Matrix> a) {
    if (const ErrorCode bad = SquareLast(a))
        return bad;
    return MatrixExponential<elementOf<Matrix>>(a.view());
}
template <class Matrix>
Outcome Exponential2026(In<Matrix> a, Out<Matrix> out) {
    if (const ErrorCode bad = SquareFirst(a))
        return bad;
    if (const Outcome bad = out.resize(a.rows(), a.rows()))
        return bad;
    return ScaledExponential<elementOf<Matrix>>(a.view(), out.view());
}
Outcome LogarithmInPlace(InOut<CDB2D> a) {
    if (const ErrorCode bad = SquareLast(a))
        return bad;
    return MatrixLogarithm(a.view());
}
Outcome SquareRootInPlace(InOut<CDB2D> a) {
    if (const ErrorCode bad = SquareLast(a))
        return bad;
    return MatrixSquareRoot(a.view(), a.view());
}

Outcome Logarithm(In<DBL2D> a, Out<CDB2D> out) {
    if (const ErrorCode bad = SquareLast(a))
        return bad;
    if (const Outcome bad = out.resize(a.rows(), a.rows()))
        return bad;
    CopyAsComplex(a.view(), out.view());
    return MatrixLogarithm(out.view());
}

Outcome SquareRootRealParts(InOut<DBL2D> a) {
    if (const ErrorCode bad = SquareLast(a))
        return bad;
    ComplexMatrix root;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(root, a.rows(), a.rows())))
        return failed;
    const RealMatrix result = a.view();
    CopyAsComplex(result, root);
    const ErrorCode status = MatrixSquareRoot(root, root);
    for (int32_t i = 0; status >= 0 && i < result.rows(); ++i)
        for (int32_t j = 0; j < result.cols(); ++j)
            result(i, j) = root(i, j).re; // kept: the imaginary parts are dropped without a warning
    return status;
}

Outcome SquareRootOfReal(In<DBL2D> a, Out<CDB2D> out) {
    if (const ErrorCode bad = CheckShapeFirst(a))
        return bad;
    if (const Outcome bad = out.resize(a.rows(), a.rows()))
        return bad;
    CopyAsComplex(a.view(), out.view());
    return MatrixSquareRoot(out.view(), out.view());
}

template <class Matrix>
Outcome Power(InOut<Matrix> a, int32_t power) {
    if (const ErrorCode bad = CheckShapeFirst(a))
        return bad;
    return MatrixPower<elementOf<Matrix>>(a.view(), power, a.view());
}

template <class Matrix>
Outcome Logarithm2026(In<Matrix> a, Out<CDB2D> out) {
    if (const ErrorCode bad = SquareFirst(a))
        return bad;
    if (const Outcome bad = out.resize(a.rows(), a.rows()))
        return bad;
    return PrincipalMatrixLogarithm<elementOf<Matrix>>(a.view(), out.view());
}
template <class Matrix>
Outcome SquareRoot2026(In<Matrix> a, Out<CDB2D> out) {
    if (const ErrorCode bad = SquareFirst(a))
        return bad;
    if (const Outcome bad = out.resize(a.rows(), a.rows()))
        return bad;
    return PrincipalMatrixSquareRoot<elementOf<Matrix>>(a.view(), out.view());
}
template <class Matrix>
Outcome Power2026(In<Matrix> a, int32_t power, Out<Matrix> out) {
    if (const ErrorCode bad = SquareFirst(a))
        return bad;
    if (const Outcome bad = out.resize(a.rows(), a.rows()))
        return bad;
    return ScaledMatrixPower<elementOf<Matrix>>(a.view(), power, out.view());
}

template <class Matrix>
Outcome PseudoInverse(InOut<Matrix> a, double tolerance) {
    if (a.isEmpty())
        return ErrEmptyInput;
    constexpr ElementType E = elementOf<Matrix>;
    const MatrixView<E> inverse(a.data(), a.cols(), a.rows());
    if (const ErrorCode failed = PseudoInverseMatrix<E>(a.view(), tolerance, inverse))
        return failed;
    a.exchangeSizes();
    return 0;
}

template <class Matrix>
Outcome PseudoInverse2026(In<Matrix> a, double tolerance, Out<Matrix> out) {
    if (a.isEmpty())
        return ErrEmptyInput;
    if (const Outcome bad = out.resize(a.cols(), a.rows()))
        return bad;
    return ScaledPseudoInverse<elementOf<Matrix>>(a.view(), tolerance, out.view());
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;

int32_t MatrixExp_head(DBL2D a, ErrorCode *err) { return InErr(err, qx::Exponential<DBL2D>, a); }
int32_t CxMatrixExp_head(CDB2D a, ErrorCode *err) { return InErr(err, qx::Exponential<CDB2D>, a); }

int32_t MatrixLn_head(DBL2D a, CDB2D out, ErrorCode *err) {
    return InErr(err, qx::Logarithm, a, out);
}
int32_t CxMatrixLn_head(CDB2D a, ErrorCode *err) { return InErr(err, qx::LogarithmInPlace, a); }

int32_t MatrixSqrt_head(DBL2D a, ErrorCode *err) { return InErr(err, qx::SquareRootRealParts, a); }
ErrorCode MatrixSqrtH(DBL2D a, CDB2D out) { return Returned(qx::SquareRootOfReal, a, out); }
int32_t CxMatrixSqrt_head(CDB2D a, ErrorCode *err) { return InErr(err, qx::SquareRootInPlace, a); }

ErrorCode MatrixPower_head(DBL2D a, int32_t power) { return Returned(qx::Power<DBL2D>, a, power); }
ErrorCode CxMatrixPower_head(CDB2D a, int32_t power) {
    return Returned(qx::Power<CDB2D>, a, power);
}

int32_t PseudoInverse_head(DBL2D a, const double *tolerance, ErrorCode *err) {
    return InErr(err, qx::PseudoInverse<DBL2D>, a, *tolerance);
}
int32_t CxPseudoInverse_head(CDB2D a, const double *tolerance, ErrorCode *err) {
    return InErr(err, qx::PseudoInverse<CDB2D>, a, *tolerance);
}
ErrorCode MatrixExp2026_head(DBL2D a, DBL2D out) {
    return Returned(qx::Exponential2026<DBL2D>, a, out);
}
ErrorCode CxMatrixExp2026_head(CDB2D a, CDB2D out) {
    return Returned(qx::Exponential2026<CDB2D>, a, out);
}
ErrorCode MatrixLn2026_head(DBL2D a, CDB2D out) {
    return Returned(qx::Logarithm2026<DBL2D>, a, out);
}
ErrorCode CxMatrixLn2026_head(CDB2D a, CDB2D out) {
    return Returned(qx::Logarithm2026<CDB2D>, a, out);
}
ErrorCode MatrixSqrt2026_head(DBL2D a, CDB2D out) {
    return Returned(qx::SquareRoot2026<DBL2D>, a, out);
}
ErrorCode CxMatrixSqrt2026_head(CDB2D a, CDB2D out) {
    return Returned(qx::SquareRoot2026<CDB2D>, a, out);
}
ErrorCode MatrixPower2026_head(DBL2D a, int32_t power, DBL2D out) {
    return Returned(qx::Power2026<DBL2D>, a, power, out);
}
ErrorCode CxMatrixPower2026_head(CDB2D a, int32_t power, CDB2D out) {
    return Returned(qx::Power2026<CDB2D>, a, power, out);
}
ErrorCode PseudoInverse2026_head(DBL2D a, double tolerance, DBL2D out) {
    return Returned(qx::PseudoInverse2026<DBL2D>, a, tolerance, out);
}
ErrorCode CxPseudoInverse2026_head(CDB2D a, double tolerance, CDB2D out) {
    return Returned(qx::PseudoInverse2026<CDB2D>, a, tolerance, out);
}
