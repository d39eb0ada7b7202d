#include "qx/eigenproblems.h"

#include "frame/export.h"
#include "linalg/eigenproblems/general.h"
#include "linalg/eigenproblems/symmetric.h"
#include "linalg/factorisations/schur.h"

namespace qx {
namespace {

// The vectors of an eigenproblem, if they are wanted.
Outcome ResizeVectors(Out<CDB2D> &vectors, int32_t output, int32_t n) {
    return output == eigenValuesAndVectors ? vectors.resize(n, n) : vectors.resize(0, 0);
}

// kept: of the exports with an `err`, the last failed check decides
template <class Matrix>
ErrorCode CheckSquare(const Block<Matrix> &a) {
    return LastFailed({{a.isEmpty(), ErrEmptyInput}, {!a.isSquare(), ErrNotSquare}});
}

Outcome Eigen(In<DBL2D> a, int32_t output, Out<CDB1D> values, Out<CDB2D> vectors) {
    if (const ErrorCode bad = CheckSquare(a))
        return bad;
    if (const Outcome bad = values.resize(a.rows()))
        return bad;
    if (const Outcome bad = ResizeVectors(vectors, output, a.rows()))
        return bad;
    return EigenGeneral(a.data(), a.rows(), output, values.data(), vectors.data());
}

Outcome CxEigen(In<CDB2D> a, int32_t matrixType, int32_t output, Out<CDB1D> values,
                Out<CDB2D> vectors) {
    if (const ErrorCode bad = CheckSquare(a))
        return bad;
    if (const Outcome bad = values.resize(a.rows()))
        return bad;
    if (const Outcome bad = ResizeVectors(vectors, output, a.rows()))
        return bad;
    return CxEigenGeneral(a.data(), a.rows(), matrixType, output, values.data(), vectors.data());
}

Outcome SymEigen(InOut<DBL2D> a, int32_t output, Out<DBL1D> values) {
    if (const ErrorCode bad = CheckSquare(a))
        return bad;
    if (const Outcome bad = values.resize(a.rows()))
        return bad;
    return SymmetricEigen(a.data(), a.rows(), output, values.data(), a.data());
}

template <class Matrix>
Outcome Schur(InOut<Matrix> a, bool withVectors, int32_t order, Out<Matrix> u, Out<CDB1D> w) {
    const int32_t n = a.rows();
    if (const ErrorCode bad = FirstFailed(
            {{a.isEmpty(), ErrEmptyInput},
             {!a.isSquare(), ErrNotSquare},
             {order < schurUnordered || order > schurModulusDescending, ErrInvalidSelector}}))
        return bad;
    if (const Outcome bad = withVectors ? u.resize(n, n) : u.resize(0, 0))
        return bad;
    if (const Outcome bad = w.resize(n))
        return bad;
    return SchurDecompose(a.data(), n, order, withVectors ? u.data() : nullptr, a.data(), w.data());
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;

int32_t EigenValueVector_head(DBL2D a, const int32_t *output, CDB1D values, CDB2D vectors,
                              ErrorCode *err) {
    return InErr(err, qx::Eigen, a, *output, values, vectors);
}
int32_t CxEigenValueVector_head(CDB2D a, const int32_t *matrixType, const int32_t *output,
                                CDB1D values, CDB2D vectors, ErrorCode *err) {
    return InErr(err, qx::CxEigen, a, *matrixType, *output, values, vectors);
}
int32_t SymEvectorEvalue_head(DBL2D a, const int32_t *output, DBL1D values, ErrorCode *err) {
    return InErr(err, qx::SymEigen, a, *output, values);
}

ErrorCode Schur80_head(DBL2D a, int32_t wantVectors, int32_t order, DBL2D u, CDB1D w) {
    return Returned(qx::Schur<DBL2D>, a, wantVectors != 0, order, u, w);
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
