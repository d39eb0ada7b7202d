#include "qx/generalised_problems.h"

#include "linalg/eigenproblems/general.h"
#include "linalg/eigenproblems/generalised.h"
#include "linalg/exports/checks.h"

#include <limits>

namespace qx {
namespace {

template <class Matrix>
ErrorCode CheckPencil(const Block<Matrix> &a, const Block<Matrix> &b) {
    return FirstFailed({{a.isEmpty() || b.isEmpty(), ErrEmptyInput},
                        {!a.isSquare(), ErrNotSquare},
                        {a.rows() != b.rows() || a.cols() != b.cols(), ErrBandVectorSize}});
}

// The order is checked before the outputs are resized, and so before anything is computed.
template <class Matrix>
ErrorCode CheckPencilAndOrder(const Block<Matrix> &a, const Block<Matrix> &b, int32_t order) {
    if (const ErrorCode bad = CheckPencil(a, b))
        return bad;
    return IsNoSchurOrder(order) ? ErrInvalidSelector : 0;
}

// Resizes the outputs of a form of order n, with q and z if they are wanted.
template <class Matrix, class Vector>
Outcome ResizeForm(int32_t n, bool withVectors, Out<Matrix> &q, Out<Matrix> &z, Out<CDB1D> &alpha,
                   Out<Vector> &beta) {
    if (const Outcome bad = ResizeIf(withVectors, q, n))
        return bad;
    if (const Outcome bad = ResizeIf(withVectors, z, n))
        return bad;
    if (const Outcome bad = alpha.resize(n))
        return bad;
    return beta.resize(n);
}

template <class Matrix, class Vector>
Outcome QZ(InOut<Matrix> a, InOut<Matrix> b, bool withVectors, int32_t order, Out<Matrix> q,
           Out<Matrix> z, Out<CDB1D> alpha, Out<Vector> beta) {
    if (const ErrorCode bad = CheckPencilAndOrder(a, b, order))
        return bad;
    if (const Outcome bad = ResizeForm(a.rows(), withVectors, q, z, alpha, beta))
        return bad;
    return GeneralisedSchur<elementOf<Matrix>>(a.view(), b.view(), SchurOrder{order}, q.view(),
                                               z.view(), alpha.view(), beta.view(), {});
}

template <class Matrix, class Vector>
Outcome QZWithEigenvectors(InOut<Matrix> a, InOut<Matrix> b, int32_t order, Out<Matrix> q,
                           Out<Matrix> z, Out<CDB1D> alpha, Out<Vector> beta, Out<CDB2D> vectors) {
    const int32_t n = a.rows();
    if (const ErrorCode bad = CheckPencilAndOrder(a, b, order))
        return bad;
    if (const Outcome bad = ResizeForm(n, true, q, z, alpha, beta))
        return bad;
    if (const Outcome bad = vectors.resize(n, n))
        return bad;
    return GeneralisedSchur<elementOf<Matrix>>(a.view(), b.view(), SchurOrder{order}, q.view(),
                                               z.view(), alpha.view(), beta.view(), vectors.view());
}

// alpha / beta: infinite if beta is 0, and NaN if both are 0.
CDB EigenvalueOf(CDB alpha, CDB beta) {
    if (AbsSum(beta) != 0.0)
        return alpha / beta;
    const double inf = std::numeric_limits<double>::infinity();
    const double nan = std::numeric_limits<double>::quiet_NaN();
    return AbsSum(alpha) != 0.0 ? CDB{inf, 0.0} : CDB{nan, nan};
}

template <class Matrix>
Outcome GeneralisedEigen(In<Matrix> a, In<Matrix> b, int32_t output, Out<CDB1D> values,
                         Out<CDB2D> vectors) {
    constexpr ElementType E = elementOf<Matrix>;
    const int32_t n = a.rows();
    if (const ErrorCode bad = CheckPencil(a, b))
        return bad;
    if (output != eigenValuesOnly && output != eigenValuesAndVectors)
        return ErrInvalidSelector;
    if (const Outcome bad = values.resize(n))
        return bad;
    const bool withVectors = output == eigenValuesAndVectors;
    if (const Outcome bad = ResizeIf(withVectors, vectors, n))
        return bad;
    MatrixView<E> s, t;
    VectorView<E> beta;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(s, n, n), Sized(t, n, n), Sized(beta, n)))
        return failed;
    CopyMatrix<E>(a.view(), s);
    CopyMatrix<E>(b.view(), t);
    const ComplexVector alpha = values.view();
    if (const ErrorCode failed =
            GeneralisedSchur<E>(s, t, schurUnordered, {}, {}, alpha, beta, vectors.view()))
        return failed;
    for (int32_t i = 0; i < n; ++i)
        alpha[i] = EigenvalueOf(alpha[i], {RealPart(beta[i]), ImagPart(beta[i])});
    return 0;
}

template <class Matrix>
Outcome GeneralisedSVD(InOut<Matrix> a, InOut<Matrix> b, Out<DBL1D> alpha, Out<DBL1D> beta,
                       Out<Matrix> u, Out<Matrix> v, Out<Matrix> q, OutI32 k, OutI32 l) {
    const int32_t m = a.rows(), n = a.cols(), p = b.rows();
    if (const ErrorCode bad = FirstFailed(
            {{a.isEmpty() || b.isEmpty(), ErrEmptyInput}, {b.cols() != n, ErrBandVectorSize}}))
        return bad;
    if (const Outcome bad = alpha.resize(n))
        return bad;
    if (const Outcome bad = beta.resize(n))
        return bad;
    if (const Outcome bad = u.resize(m, m))
        return bad;
    if (const Outcome bad = v.resize(p, p))
        return bad;
    if (const Outcome bad = q.resize(n, n))
        return bad;
    GeneralisedRanks ranks;
    if (const ErrorCode failed = GeneralisedSingular<elementOf<Matrix>>(
            a.view(), b.view(), &ranks, alpha.view(), beta.view(), u.view(), v.view(), q.view()))
        return failed;
    k = ranks.k;
    l = ranks.l;
    return 0;
}

} // namespace
} // namespace qx

using qx::Returned;

ErrorCode QZ80_head(DBL2D a, DBL2D b, int32_t wantVectors, int32_t order, DBL2D q, DBL2D z,
                    CDB1D alpha, DBL1D beta) {
    return Returned(qx::QZ<DBL2D, DBL1D>, a, b, wantVectors != 0, order, q, z, alpha, beta);
}
ErrorCode CxQZ80_head(CDB2D a, CDB2D b, int32_t wantVectors, int32_t order, CDB2D q, CDB2D z,
                      CDB1D alpha, CDB1D beta) {
    return Returned(qx::QZ<CDB2D, CDB1D>, a, b, wantVectors != 0, order, q, z, alpha, beta);
}
ErrorCode QZ_head(DBL2D a, DBL2D b, int32_t wantVectors, DBL2D q, DBL2D z, CDB1D alpha,
                  DBL1D beta) {
    return QZ80_head(a, b, wantVectors, qx::schurUnordered, q, z, alpha, beta);
}
ErrorCode CxQZ_head(CDB2D a, CDB2D b, int32_t wantVectors, CDB2D q, CDB2D z, CDB1D alpha,
                    CDB1D beta) {
    return CxQZ80_head(a, b, wantVectors, qx::schurUnordered, q, z, alpha, beta);
}

ErrorCode TmiQZ_head(DBL2D a, DBL2D b, int32_t order, DBL2D q, DBL2D z, CDB1D alpha, DBL1D beta,
                     CDB2D vectors) {
    return Returned(qx::QZWithEigenvectors<DBL2D, DBL1D>, a, b, order, q, z, alpha, beta, vectors);
}
ErrorCode CxTmiQZ_head(CDB2D a, CDB2D b, int32_t order, CDB2D q, CDB2D z, CDB1D alpha, CDB1D beta,
                       CDB2D vectors) {
    return Returned(qx::QZWithEigenvectors<CDB2D, CDB1D>, a, b, order, q, z, alpha, beta, vectors);
}

ErrorCode GenEigenEx_head(DBL2D a, DBL2D b, int32_t output, CDB1D values, CDB2D vectors) {
    return Returned(qx::GeneralisedEigen<DBL2D>, a, b, output, values, vectors);
}
ErrorCode CxGenEigenEx_head(CDB2D a, CDB2D b, int32_t output, CDB1D values, CDB2D vectors) {
    return Returned(qx::GeneralisedEigen<CDB2D>, a, b, output, values, vectors);
}

ErrorCode GSVD_head(DBL2D a, DBL2D b, DBL1D alpha, DBL1D beta, DBL2D u, DBL2D v, DBL2D q,
                    int32_t *k, int32_t *l) {
    return Returned(qx::GeneralisedSVD<DBL2D>, a, b, alpha, beta, u, v, q, k, l);
}
ErrorCode CxGSVD_head(CDB2D a, CDB2D b, DBL1D alpha, DBL1D beta, CDB2D u, CDB2D v, CDB2D q,
                      int32_t *k, int32_t *l) {
    return Returned(qx::GeneralisedSVD<CDB2D>, a, b, alpha, beta, u, v, q, k, l);
}
