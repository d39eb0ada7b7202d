#include "qx/generalised_problems.h"

#include "frame/export.h"
#include "linalg/eigenproblems/general.h"
#include "linalg/eigenproblems/generalised.h"
#include "linalg/factorisations/schur.h"
#include "linalg/scalar.h"

#include <limits>

namespace qx {
namespace {

template <class Matrix>
ErrorCode CheckPencil(const Block<Matrix> &a, const Block<Matrix> &b) {
    return FirstFailed({{a.isEmpty() || b.isEmpty(), ErrEmptyInput},
                        {!a.isSquare(), ErrNotSquare},
                        {a.rows() != b.rows() || a.cols() != b.cols(), ErrBandVectorSize}});
}

template <class Matrix>
Outcome ResizeIf(bool wanted, Out<Matrix> &matrix, int32_t n) {
    return wanted ? matrix.resize(n, n) : matrix.resize(0, 0);
}

// The order is checked before the outputs grow, and so before anything is computed.
template <class Matrix, class Vector>
Outcome QZ(InOut<Matrix> a, InOut<Matrix> b, bool withVectors, int32_t order, Out<Matrix> q,
           Out<Matrix> z, Out<CDB1D> alpha, Out<Vector> beta) {
    const int32_t n = a.rows();
    if (const ErrorCode bad = CheckPencil(a, b))
        return bad;
    if (order < schurUnordered || order > schurModulusDescending)
        return ErrInvalidSelector;
    if (const Outcome bad = ResizeIf(withVectors, q, n))
        return bad;
    if (const Outcome bad = ResizeIf(withVectors, z, n))
        return bad;
    if (const Outcome bad = alpha.resize(n))
        return bad;
    if (const Outcome bad = beta.resize(n))
        return bad;
    return GeneralisedSchur(a.data(), b.data(), n, order, withVectors ? q.data() : nullptr,
                            withVectors ? z.data() : nullptr, alpha.data(), beta.data(), nullptr);
}

template <class Matrix, class Vector>
Outcome QZWithEigenvectors(InOut<Matrix> a, InOut<Matrix> b, int32_t order, Out<Matrix> q,
                           Out<Matrix> z, Out<CDB1D> alpha, Out<Vector> beta, Out<CDB2D> vectors) {
    const int32_t n = a.rows();
    if (const ErrorCode bad = CheckPencil(a, b))
        return bad;
    if (order < schurUnordered || order > schurModulusDescending)
        return ErrInvalidSelector;
    if (const Outcome bad = q.resize(n, n))
        return bad;
    if (const Outcome bad = z.resize(n, n))
        return bad;
    if (const Outcome bad = alpha.resize(n))
        return bad;
    if (const Outcome bad = beta.resize(n))
        return bad;
    if (const Outcome bad = vectors.resize(n, n))
        return bad;
    return GeneralisedSchur(a.data(), b.data(), n, order, q.data(), z.data(), alpha.data(),
                            beta.data(), vectors.data());
}

CDB Quotient(CDB alpha, CDB beta) {
    if (AbsSum(beta) != 0.0)
        return alpha / beta;
    const double inf = std::numeric_limits<double>::infinity();
    const double nan = std::numeric_limits<double>::quiet_NaN();
    return AbsSum(alpha) != 0.0 ? CDB{inf, 0.0} : CDB{nan, nan};
}
CDB Quotient(CDB alpha, double beta) { return Quotient(alpha, CDB{beta, 0.0}); }

template <class Matrix>
Outcome GeneralisedEigen(In<Matrix> a, In<Matrix> b, int32_t output, Out<CDB1D> values,
                         Out<CDB2D> vectors) {
    constexpr ElementType E = HandleTraits<Matrix>::code;
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
    const int64_t count = int64_t{n} * n;
    Scratch<E> copies;
    if (const ErrorCode failed = copies.allocate(2 * count + n))
        return failed;
    for (int64_t i = 0; i < count; ++i) {
        copies[i] = a.data()[i];
        copies[count + i] = b.data()[i];
    }
    typename Element<E>::type *const beta = copies.data() + 2 * count;
    if (const ErrorCode failed =
            GeneralisedSchur(copies.data(), copies.data() + count, n, schurUnordered, nullptr,
                             nullptr, values.data(), beta, withVectors ? vectors.data() : nullptr))
        return failed;
    for (int32_t i = 0; i < n; ++i)
        values.data()[i] = Quotient(values.data()[i], beta[i]);
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
    return GeneralisedSingular(a.data(), b.data(), m, n, p, k.address(), l.address(), alpha.data(),
                               beta.data(), u.data(), v.data(), q.data());
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
