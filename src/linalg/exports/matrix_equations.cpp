#include "qx/matrix_equations.h"

#include "linalg/equations/matrix_equations.h"
#include "linalg/exports/checks.h"

namespace qx {
namespace {

template <class Matrix>
Outcome SolvedSylvester(In<Matrix> a, In<Matrix> b, In<Matrix> c, int32_t equation, Out<Matrix> x) {
    if (const ErrorCode bad = FirstFailed(
            {{a.isEmpty() || b.isEmpty() || c.isEmpty(), ErrEmptyInput},
             {!a.isSquare() || !b.isSquare(), ErrNotSquare},
             {c.rows() != a.rows() || c.cols() != b.rows(), ErrSizesDisagree},
             {equation < sylvesterSum || equation > sylvesterProducts, ErrInvalidSelector}}))
        return bad;
    if (const Outcome bad = x.resize(a.rows(), b.rows()))
        return bad;
    return SolveSylvester<elementOf<Matrix>>(a.view(), b.view(), c.view(),
                                             SylvesterEquation{equation}, x.view());
}

template <class Matrix>
Outcome SolvedLyapunov(In<Matrix> a, In<Matrix> q, int32_t equation, Out<Matrix> x) {
    if (const ErrorCode bad = FirstFailed(
            {{a.isEmpty() || q.isEmpty(), ErrEmptyInput},
             {!a.isSquare() || !q.isSquare(), ErrNotSquare},
             {a.rows() != q.rows(), ErrSizesDisagree},
             {equation != lyapunovContinuous && equation != lyapunovDiscrete, ErrInvalidSelector}}))
        return bad;
    if (const Outcome bad = x.resize(a.rows(), a.rows()))
        return bad;
    return SolveLyapunov<elementOf<Matrix>>(a.view(), q.view(), LyapunovEquation{equation},
                                            x.view());
}

} // namespace
} // namespace qx

using qx::Returned;

ErrorCode Sylvester2011_head(DBL2D a, DBL2D b, DBL2D c, int32_t equation, DBL2D x) {
    return Returned(qx::SolvedSylvester<DBL2D>, a, b, c, equation, x);
}
ErrorCode CxSylvester2011_head(CDB2D a, CDB2D b, CDB2D c, int32_t equation, CDB2D x) {
    return Returned(qx::SolvedSylvester<CDB2D>, a, b, c, equation, x);
}
ErrorCode Sylvester_head(DBL2D a, DBL2D b, DBL2D c, DBL2D x) {
    return Sylvester2011_head(a, b, c, qx::sylvesterSum, x);
}
ErrorCode CxSylvester_head(CDB2D a, CDB2D b, CDB2D c, CDB2D x) {
    return CxSylvester2011_head(a, b, c, qx::sylvesterSum, x);
}

ErrorCode Lyapunov2011_head(DBL2D a, DBL2D q, int32_t equation, DBL2D x) {
    return Returned(qx::SolvedLyapunov<DBL2D>, a, q, equation, x);
}
ErrorCode CxLyapunov2011_head(CDB2D a, CDB2D q, int32_t equation, CDB2D x) {
    return Returned(qx::SolvedLyapunov<CDB2D>, a, q, equation, x);
}
ErrorCode Lyapunov_head(DBL2D a, DBL2D q, DBL2D x) {
    return Lyapunov2011_head(a, q, qx::lyapunovContinuous, x);
}
ErrorCode CxLyapunov_head(CDB2D a, CDB2D q, CDB2D x) {
    return CxLyapunov2011_head(a, q, qx::lyapunovContinuous, x);
}
