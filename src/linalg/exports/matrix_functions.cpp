#include "qx/matrix_functions.h"

#include "frame/export.h"
#include "linalg/functions/functions.h"
#include "linalg/systems/least_squares.h"

namespace qx {
namespace {

template <class Handle>
constexpr ElementType elementOf = HandleTraits<Handle>::code;

// kept: of the exports with an `err`, the last failed check decides
template <class Matrix>
ErrorCode CheckSquare(const Block<Matrix> &a) {
    return LastFailed({{a.isEmpty(), ErrEmptyInput}, {!a.isSquare(), ErrNotSquare}});
}
// kept: of the others a shape that is not square comes before an empty one
template <class Matrix>
ErrorCode CheckShapeFirst(const Block<Matrix> &a) {
    return FirstFailed({{!a.isSquare(), ErrNotSquare}, {a.isEmpty(), ErrEmptyInput}});
}

template <class Matrix>
Outcome Exponential(InOut<Matrix> a) {
    const ErrorCode bad = CheckSquare(a);
    return bad != 0 ? bad : MatrixExponential(a.data(), a.rows());
}
Outcome LogarithmInPlace(InOut<CDB2D> a) {
    const ErrorCode bad = CheckSquare(a);
    return bad != 0 ? bad : MatrixLogarithm(a.data(), a.rows());
}
Outcome SquareRootInPlace(InOut<CDB2D> a) {
    const ErrorCode bad = CheckSquare(a);
    return bad != 0 ? bad : MatrixSquareRoot(a.data(), a.rows());
}

Outcome Logarithm(In<DBL2D> a, Out<CDB2D> out) {
    if (const ErrorCode bad = CheckSquare(a))
        return bad;
    const int32_t n = a.rows();
    if (const Outcome bad = out.resize(n, n))
        return bad;
    for (int64_t i = 0; i < int64_t{n} * n; ++i)
        out.data()[i] = {a.data()[i], 0.0};
    return MatrixLogarithm(out.data(), n);
}

Outcome SquareRootRealParts(InOut<DBL2D> a) {
    if (const ErrorCode bad = CheckSquare(a))
        return bad;
    const int64_t count = int64_t{a.rows()} * a.rows();
    Scratch<ElementType::CDB> root;
    if (const ErrorCode failed = root.allocate(count))
        return failed;
    const ErrorCode status = MatrixSquareRoot(a.data(), a.rows(), root.data());
    for (int64_t i = 0; status >= 0 && i < count; ++i)
        a.data()[i] = root[i].re; // kept: the imaginary parts go without a sign
    return status;
}

Outcome SquareRootOfReal(In<DBL2D> a, Out<CDB2D> out) {
    if (const ErrorCode bad = CheckShapeFirst(a))
        return bad;
    if (const Outcome bad = out.resize(a.rows(), a.rows()))
        return bad;
    return MatrixSquareRoot(a.data(), a.rows(), out.data());
}

template <class Matrix>
Outcome Power(InOut<Matrix> a, int32_t power) {
    if (const ErrorCode bad = CheckShapeFirst(a))
        return bad;
    const int64_t count = int64_t{a.rows()} * a.rows();
    Scratch<elementOf<Matrix>> result;
    if (const ErrorCode failed = result.allocate(count))
        return failed;
    if (const ErrorCode failed = MatrixPowerInteger(a.data(), a.rows(), power, result.data()))
        return failed;
    for (int64_t i = 0; i < count; ++i)
        a.data()[i] = result[i];
    return 0;
}

template <class Matrix>
Outcome PseudoInverse(InOut<Matrix> a, double tolerance) {
    if (a.isEmpty())
        return ErrEmptyInput;
    if (const ErrorCode failed =
            PseudoInverseMatrix(a.data(), a.rows(), a.cols(), tolerance, a.data()))
        return failed;
    a.exchangeSizes();
    return 0;
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
