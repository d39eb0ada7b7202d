#include "qx/matrix_properties.h"

#include "linalg/exports/checks.h"
#include "linalg/properties/definiteness.h"
#include "linalg/properties/determinant_and_norms.h"
#include "linalg/properties/special.h"
#include "linalg/properties/vectors.h"

namespace qx {
namespace {

// The element of a handle type as an output: DBL or CDB.
template <class Handle>
using OutElement = OutValue<typename ScalarOf<elementOf<Handle>>::type>;

bool IsNoType(int32_t type) {
    return type < int32_t(MatrixType::general) || type > int32_t(MatrixType::upperTriangular);
}

template <class Matrix>
Outcome Determinant(In<Matrix> a, int32_t matrixType, OutElement<Matrix> det) {
    if (const Outcome bad = SquareLast(a))
        return bad;
    if (IsNoType(matrixType))
        return ErrInvalidSelector;
    return MatrixDeterminant<elementOf<Matrix>>(a.view(), MatrixType{matrixType}, det.address());
}

// kept: the rank is -1 after a failure.
template <class Matrix>
Outcome Rank(In<Matrix> a, double tolerance, int32_t *rank) {
    *rank = -1;
    if (a.isEmpty())
        return ErrEmptyInput;
    return MatrixRank<elementOf<Matrix>>(a.view(), tolerance, rank);
}

template <class Matrix>
Outcome Condition(In<Matrix> a, int32_t normType, OutDBL cond) {
    if (a.isEmpty())
        return ErrEmptyInput;
    return ConditionNumber<elementOf<Matrix>>(a.view(), normType, cond.address());
}

template <class Matrix>
Outcome Norm(In<Matrix> a, int32_t normType, OutDBL norm) {
    if (a.isEmpty())
        return ErrEmptyInput;
    return MatrixNorm<elementOf<Matrix>>(a.view(), normType, norm.address());
}

template <class Matrix>
Outcome Rank2026(In<Matrix> a, double tolerance, OutI32 rank) {
    if (a.isEmpty())
        return ErrEmptyInput;
    return ScaledRank<elementOf<Matrix>>(a.view(), tolerance, rank.address());
}
template <class Matrix>
Outcome Condition2026(In<Matrix> a, int32_t normType, OutDBL cond) {
    if (a.isEmpty())
        return ErrEmptyInput;
    return ScaledConditionNumber<elementOf<Matrix>>(a.view(), normType, cond.address());
}
template <class Matrix>
Outcome Norm2026(In<Matrix> a, int32_t normType, OutDBL norm) {
    if (a.isEmpty())
        return ErrEmptyInput;
    return ScaledNorm<elementOf<Matrix>>(a.view(), normType, norm.address());
}

template <class Matrix>
Outcome Trace(In<Matrix> a, OutElement<Matrix> trace) {
    if (const Outcome bad = SquareLast(a))
        return bad;
    const auto elements = a.view();
    auto sum = ScalarOf<elementOf<Matrix>>::Of(0.0);
    for (int32_t i = 0; i < elements.rows(); ++i)
        sum = sum + elements(i, i);
    trace = sum;
    return 0;
}

template <class Vector>
Outcome DotProduct(In<Vector> x, In<Vector> y, OutElement<Vector> dot) {
    if (const Outcome bad = LastFailed(
            {{x.isEmpty() || y.isEmpty(), ErrEmptyInput}, {x.size() != y.size(), ErrSizeMismatch}}))
        return bad;
    auto sum = ScalarOf<elementOf<Vector>>::Of(0.0);
    for (int32_t i = 0; i < x.size(); ++i)
        sum = sum + x.data()[i] * y.data()[i];
    dot = sum;
    return 0;
}

template <class Vector>
ErrorCode CheckNorm(const Block<Vector> &x, double p) {
    return FirstFailed(
        {{x.isEmpty(), ErrEmptyInput}, {p != p, ErrNonFiniteInput}, {p == 0.0, ErrTooFewWeights}});
}
template <class Vector>
Outcome NormOfVector(In<Vector> x, double p, OutDBL norm) {
    if (const ErrorCode bad = CheckNorm(x, p))
        return bad;
    norm = VectorNorm<elementOf<Vector>>(x.view(), p);
    return 0;
}
// If the norm is 0 or not finite, the vector is left as it is.
template <class Vector>
Outcome UnitVector(InOut<Vector> x, double p, OutDBL norm) {
    if (const ErrorCode bad = CheckNorm(x, p))
        return bad;
    const double size = VectorNorm<elementOf<Vector>>(x.view(), p);
    norm = size;
    if (size == 0.0 || !(size < std::numeric_limits<double>::infinity()))
        return 0;
    const double reciprocal = 1.0 / size;
    for (ElementOf<elementOf<Vector>> &element : x.view())
        element = element * reciprocal;
    return 0;
}

Outcome TestSymmetry(In<DBL2D> a, double tolerance, bool relative, OutI32 isSymmetric) {
    if (const Outcome bad = SquareFirst(a))
        return bad;
    return CheckSymmetric<ElementType::DBL>(a.view(), tolerance, relative, false,
                                            isSymmetric.address());
}
Outcome CxTestSymmetry(In<CDB2D> a, double tolerance, bool relative, bool isHermitian,
                       OutI32 isSymmetric) {
    if (const Outcome bad = SquareFirst(a))
        return bad;
    return CheckSymmetric<ElementType::CDB>(a.view(), tolerance, relative, isHermitian,
                                            isSymmetric.address());
}

template <class Matrix>
Outcome TestDefiniteness(In<Matrix> a, OutI32 isDefinite) {
    if (const Outcome bad = SquareLast(a))
        return bad;
    return CheckPositiveDefinite<elementOf<Matrix>>(a.view(), isDefinite.address());
}

// kept: the rank is -1 after a failure.
template <class Matrix>
Outcome TestSemiDefiniteness(In<Matrix> a, double tolerance, OutI32 isSemiDefinite, int32_t *rank) {
    *rank = -1;
    if (const Outcome bad = SquareFirst(a))
        return bad;
    return CheckPositiveSemiDefinite<elementOf<Matrix>>(a.view(), tolerance,
                                                        isSemiDefinite.address(), rank);
}

template <class Matrix, class Vector>
Outcome Polynomial(In<Matrix> a, Out<Vector> poly) {
    if (const Outcome bad = SquareLast(a))
        return bad;
    if (a.rows() == std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    if (const Outcome bad = poly.resize(a.rows() + 1))
        return bad;
    return CharacteristicPolynomial<elementOf<Matrix>>(a.view(), poly.view());
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;

int32_t Determinant_head(DBL2D a, const int32_t *matrixType, DBL *det, ErrorCode *err) {
    return InErr(err, qx::Determinant<DBL2D>, a, *matrixType, det);
}
int32_t CxDeterminant_head(CDB2D a, const int32_t *matrixType, CDB *det, ErrorCode *err) {
    return InErr(err, qx::Determinant<CDB2D>, a, *matrixType, det);
}
int32_t Rank_head(DBL2D a, const double *tolerance, int32_t *rank, ErrorCode *err) {
    return InErr(err, qx::Rank<DBL2D>, a, *tolerance, rank);
}
int32_t CxRank_head(CDB2D a, const double *tolerance, int32_t *rank, ErrorCode *err) {
    return InErr(err, qx::Rank<CDB2D>, a, *tolerance, rank);
}
int32_t CondNumber_head(DBL2D a, const int32_t *normType, DBL *cond, ErrorCode *err) {
    return InErr(err, qx::Condition<DBL2D>, a, *normType, cond);
}
int32_t CxCondNumber_head(CDB2D a, const int32_t *normType, DBL *cond, ErrorCode *err) {
    return InErr(err, qx::Condition<CDB2D>, a, *normType, cond);
}
int32_t Norm_head(DBL2D a, const int32_t *normType, DBL *norm, ErrorCode *err) {
    return InErr(err, qx::Norm<DBL2D>, a, *normType, norm);
}
int32_t CxNorm_head(CDB2D a, const int32_t *normType, DBL *norm, ErrorCode *err) {
    return InErr(err, qx::Norm<CDB2D>, a, *normType, norm);
}
ErrorCode Rank2026_head(DBL2D a, double tolerance, int32_t *rank) {
    return Returned(qx::Rank2026<DBL2D>, a, tolerance, rank);
}
ErrorCode CxRank2026_head(CDB2D a, double tolerance, int32_t *rank) {
    return Returned(qx::Rank2026<CDB2D>, a, tolerance, rank);
}
ErrorCode CondNumber2026_head(DBL2D a, int32_t normType, DBL *cond) {
    return Returned(qx::Condition2026<DBL2D>, a, normType, cond);
}
ErrorCode CxCondNumber2026_head(CDB2D a, int32_t normType, DBL *cond) {
    return Returned(qx::Condition2026<CDB2D>, a, normType, cond);
}
ErrorCode Norm2026_head(DBL2D a, int32_t normType, DBL *norm) {
    return Returned(qx::Norm2026<DBL2D>, a, normType, norm);
}
ErrorCode CxNorm2026_head(CDB2D a, int32_t normType, DBL *norm) {
    return Returned(qx::Norm2026<CDB2D>, a, normType, norm);
}
int32_t Trace_head(DBL2D a, DBL *trace, ErrorCode *err) {
    return InErr(err, qx::Trace<DBL2D>, a, trace);
}
int32_t CxTrace_head(CDB2D a, CDB *trace, ErrorCode *err) {
    return InErr(err, qx::Trace<CDB2D>, a, trace);
}

int32_t DotProduct_head(DBL1D x, DBL1D y, DBL *dot, ErrorCode *err) {
    return InErr(err, qx::DotProduct<DBL1D>, x, y, dot);
}
int32_t DotprodCx(CDB1D x, CDB1D y, CDB *dot, ErrorCode *err) {
    return InErr(err, qx::DotProduct<CDB1D>, x, y, dot);
}
ErrorCode vectorNormH(DBL1D x, double p, DBL *norm) {
    return Returned(qx::NormOfVector<DBL1D>, x, p, norm);
}
ErrorCode CxVectorNormH(CDB1D x, double p, DBL *norm) {
    return Returned(qx::NormOfVector<CDB1D>, x, p, norm);
}
int32_t unitVector_head(DBL1D x, DBL *norm, ErrorCode *err) {
    return InErr(err, qx::UnitVector<DBL1D>, x, 2.0, norm);
}
int32_t CxUnitVector_head(CDB1D x, DBL *norm, ErrorCode *err) {
    return InErr(err, qx::UnitVector<CDB1D>, x, 2.0, norm);
}
int32_t unitVector80_head(DBL1D x, double p, DBL *norm, ErrorCode *err) {
    return InErr(err, qx::UnitVector<DBL1D>, x, p, norm);
}
int32_t CxUnitVector80_head(CDB1D x, double p, DBL *norm, ErrorCode *err) {
    return InErr(err, qx::UnitVector<CDB1D>, x, p, norm);
}

ErrorCode CheckSym_head(DBL2D a, double tolerance, int32_t relative, int32_t *isSymmetric) {
    return Returned(qx::TestSymmetry, a, tolerance, relative != 0, isSymmetric);
}
ErrorCode CxCheckSym_head(CDB2D a, double tolerance, int32_t relative, int32_t hermitian,
                          int32_t *isSymmetric) {
    return Returned(qx::CxTestSymmetry, a, tolerance, relative != 0, hermitian != 0, isSymmetric);
}
int32_t CheckPosdef_head(DBL2D a, int32_t *isPositiveDefinite, ErrorCode *err) {
    return InErr(err, qx::TestDefiniteness<DBL2D>, a, isPositiveDefinite);
}
int32_t CxCheckPosdef_head(CDB2D a, int32_t *isPositiveDefinite, ErrorCode *err) {
    return InErr(err, qx::TestDefiniteness<CDB2D>, a, isPositiveDefinite);
}
ErrorCode CheckPosSemiDef_head(DBL2D a, double tolerance, int32_t *isSemiDefinite, int32_t *rank) {
    return Returned(qx::TestSemiDefiniteness<DBL2D>, a, tolerance, isSemiDefinite, rank);
}
ErrorCode CxCheckPosSemiDef_head(CDB2D a, double tolerance, int32_t *isSemiDefinite,
                                 int32_t *rank) {
    return Returned(qx::TestSemiDefiniteness<CDB2D>, a, tolerance, isSemiDefinite, rank);
}

int32_t MatrixCharacteristicPoly_head(DBL2D a, DBL1D poly, ErrorCode *err) {
    return InErr(err, qx::Polynomial<DBL2D, DBL1D>, a, poly);
}
int32_t CxMatrixCharacteristicPoly_head(CDB2D a, CDB1D poly, ErrorCode *err) {
    return InErr(err, qx::Polynomial<CDB2D, CDB1D>, a, poly);
}
