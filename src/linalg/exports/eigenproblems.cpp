#include "qx/eigenproblems.h"

#include "linalg/eigenproblems/general.h"
#include "linalg/eigenproblems/symmetric.h"
#include "linalg/exports/checks.h"
#include "linalg/factorisations/schur.h"

namespace qx {
namespace {

bool IsNoOutput(int32_t output) {
    return output != eigenValuesOnly && output != eigenValuesAndVectors;
}

template <Steps steps>
Outcome Eigen(In<DBL2D> a, int32_t output, Out<CDB1D> values, Out<CDB2D> vectors) {
    if (const ErrorCode bad = SquareLast(a))
        return bad;
    if (const Outcome bad = values.resize(a.rows()))
        return bad;
    if (const Outcome bad = ResizeIf(output == eigenValuesAndVectors, vectors, a.rows()))
        return bad;
    if (IsNoOutput(output))
        return ErrInvalidSelector;
    const auto solve =
        steps == Steps::Blocked ? EigenBlocked<ElementType::DBL> : EigenGeneral<ElementType::DBL>;
    return solve(a.view(), values.view(), vectors.view());
}

template <Steps steps>
Outcome CxEigen(In<CDB2D> a, int32_t matrixType, int32_t output, Out<CDB1D> values,
                Out<CDB2D> vectors) {
    if (const ErrorCode bad = SquareLast(a))
        return bad;
    if (const Outcome bad = values.resize(a.rows()))
        return bad;
    if (const Outcome bad = ResizeIf(output == eigenValuesAndVectors, vectors, a.rows()))
        return bad;
    if ((matrixType != generalMatrix && matrixType != hermitianMatrix) || IsNoOutput(output))
        return ErrInvalidSelector;
    if (matrixType == hermitianMatrix)
        return EigenHermitian(a.view(), steps, values.view(), vectors.view());
    const auto solve =
        steps == Steps::Blocked ? EigenBlocked<ElementType::CDB> : EigenGeneral<ElementType::CDB>;
    return solve(a.view(), values.view(), vectors.view());
}

template <Steps steps>
Outcome SymEigen(InOut<DBL2D> a, int32_t output, Out<DBL1D> values) {
    if (const ErrorCode bad = SquareLast(a))
        return bad;
    if (const Outcome bad = values.resize(a.rows()))
        return bad;
    if (IsNoOutput(output))
        return ErrInvalidSelector;
    const RealMatrix vectors = output == eigenValuesAndVectors ? a.view() : RealMatrix();
    const auto solve = steps == Steps::Blocked ? SymmetricEigenBlocked<ElementType::DBL>
                                               : SymmetricEigen<ElementType::DBL>;
    return solve(a.view(), values.view(), vectors);
}

template <class Matrix>
Outcome PrepareSchur(const InOut<Matrix> &a, bool withVectors, int32_t order, Out<Matrix> &u,
                     Out<CDB1D> &w) {
    const int32_t n = a.rows();
    if (const ErrorCode bad = FirstFailed({{a.isEmpty(), ErrEmptyInput},
                                           {!a.isSquare(), ErrNotSquare},
                                           {IsNoSchurOrder(order), ErrInvalidSelector}}))
        return bad;
    if (const Outcome bad = ResizeIf(withVectors, u, n))
        return bad;
    return w.resize(n);
}
template <class Matrix>
Outcome Schur(InOut<Matrix> a, bool withVectors, int32_t order, Out<Matrix> u, Out<CDB1D> w) {
    if (const Outcome bad = PrepareSchur<Matrix>(a, withVectors, order, u, w))
        return bad;
    return SchurDecompose<elementOf<Matrix>>(a.view(), SchurOrder{order}, u.view(), a.view(),
                                             w.view());
}
Outcome Schur2026(InOut<DBL2D> a, bool withVectors, int32_t order, Out<DBL2D> u, Out<CDB1D> w) {
    if (const Outcome bad = PrepareSchur<DBL2D>(a, withVectors, order, u, w))
        return bad;
    return SchurInOrder<ElementType::DBL>(a.view(), SchurOrder{order}, u.view(), a.view(),
                                          w.view());
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;
constexpr auto OneByOne = qx::Steps::OneByOne, Blocked = qx::Steps::Blocked;

int32_t EigenValueVector_head(DBL2D a, const int32_t *output, CDB1D values, CDB2D vectors,
                              ErrorCode *err) {
    return InErr(err, qx::Eigen<OneByOne>, a, *output, values, vectors);
}
int32_t CxEigenValueVector_head(CDB2D a, const int32_t *matrixType, const int32_t *output,
                                CDB1D values, CDB2D vectors, ErrorCode *err) {
    return InErr(err, qx::CxEigen<OneByOne>, a, *matrixType, *output, values, vectors);
}
int32_t EigenValueVector2026_head(DBL2D a, const int32_t *output, CDB1D values, CDB2D vectors,
                                  ErrorCode *err) {
    return InErr(err, qx::Eigen<Blocked>, a, *output, values, vectors);
}
int32_t CxEigenValueVector2026_head(CDB2D a, const int32_t *matrixType, const int32_t *output,
                                    CDB1D values, CDB2D vectors, ErrorCode *err) {
    return InErr(err, qx::CxEigen<Blocked>, a, *matrixType, *output, values, vectors);
}
int32_t SymEvectorEvalue_head(DBL2D a, const int32_t *output, DBL1D values, ErrorCode *err) {
    return InErr(err, qx::SymEigen<OneByOne>, a, *output, values);
}
int32_t SymEvectorEvalue2026_head(DBL2D a, const int32_t *output, DBL1D values, ErrorCode *err) {
    return InErr(err, qx::SymEigen<Blocked>, a, *output, values);
}

ErrorCode Schur80_head(DBL2D a, int32_t wantVectors, int32_t order, DBL2D u, CDB1D w) {
    return Returned(qx::Schur<DBL2D>, a, wantVectors != 0, order, u, w);
}
ErrorCode Schur2026_head(DBL2D a, int32_t wantVectors, int32_t order, DBL2D u, CDB1D w) {
    return Returned(qx::Schur2026, a, wantVectors != 0, order, u, w);
}
ErrorCode CxSchur80_head(CDB2D a, int32_t wantVectors, int32_t order, CDB2D u, CDB1D w) {
    return Returned(qx::Schur<CDB2D>, a, wantVectors != 0, order, u, w);
}
ErrorCode Schur_head(DBL2D a, int32_t wantVectors, DBL2D u, CDB1D w) {
    return Schur80_head(a, wantVectors, qx::schurUnordered, u, w);
}
ErrorCode CxSchur_head(CDB2D a, int32_t wantVectors, CDB2D u, CDB1D w) {
    return CxSchur80_head(a, wantVectors, qx::schurUnordered, u, w);
}
