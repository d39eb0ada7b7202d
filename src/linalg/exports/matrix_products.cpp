#include "qx/matrix_products.h"

#include "linalg/exports/checks.h"
#include "linalg/products/products.h"

namespace qx {
namespace {

template <class Matrix>
Outcome Product(In<Matrix> a, In<Matrix> b, Out<Matrix> c, bool copied) {
    if (a.cols() != b.rows())
        return ErrInnerDimensionMismatch;
    if (a.hasNegativeSize() || b.hasNegativeSize())
        return ErrNegativeDimension;
    if (const Outcome bad = c.resize(a.rows(), b.cols()))
        return bad;
    if (copied)
        return MatrixProductOfCopies<elementOf<Matrix>>(a.view(), b.view(), c.view());
    MatrixProduct<elementOf<Matrix>>(a.view(), b.view(), c.view());
    return 0;
}

// The copy that the caller may ask for would change nothing here.
template <class Matrix, class Vector>
Outcome MatrixTimesVector(In<Matrix> a, In<Vector> x, Out<Vector> y) {
    if (a.hasNegativeSize() || x.hasNegativeSize())
        return ErrNegativeDimension;
    if (a.isEmpty() || x.isEmpty())
        return y.resize(0);
    if (a.cols() != x.size())
        return ErrInnerDimensionMismatch;
    if (const Outcome bad = y.resize(a.rows()))
        return bad;
    MatrixVectorProduct<elementOf<Matrix>>(a.view(), x.view(), y.view());
    return 0;
}

template <class Matrix, class Vector>
Outcome VectorTimesMatrix(In<Vector> x, In<Matrix> a, Out<Vector> y, bool copied) {
    if (x.size() != a.rows())
        return ErrInnerDimensionMismatch;
    if (x.hasNegativeSize() || a.hasNegativeSize())
        return ErrNegativeDimension;
    if (const Outcome bad = y.resize(a.cols()))
        return bad;
    if (copied)
        return MatrixProductOfCopies<elementOf<Matrix>>(AsRow(x.view()), a.view(), AsRow(y.view()));
    MatrixProduct<elementOf<Matrix>>(AsRow(x.view()), a.view(), AsRow(y.view()));
    return 0;
}

} // namespace
} // namespace qx

using qx::InErrWithHost;

int32_t MatrixMulAligned_head(DBL2D a, DBL2D b, DBL2D c, int32_t alignedCopy, ErrorCode *err) {
    return InErrWithHost(err, qx::Product<DBL2D>, a, b, c, alignedCopy != 0);
}
int32_t MatrixMul_head(DBL2D a, DBL2D b, DBL2D c, ErrorCode *err) {
    return MatrixMulAligned_head(a, b, c, 0, err);
}
int32_t AxBCxAlignedCIN(CDB2D a, CDB2D b, CDB2D c, int32_t alignedCopy, ErrorCode *err) {
    return InErrWithHost(err, qx::Product<CDB2D>, a, b, c, alignedCopy != 0);
}
int32_t AxBCxCIN(CDB2D a, CDB2D b, CDB2D c, ErrorCode *err) {
    return AxBCxAlignedCIN(a, b, c, 0, err);
}

int32_t AxVectAligned_head(DBL2D a, DBL1D x, DBL1D y, int32_t, ErrorCode *err) {
    return InErrWithHost(err, qx::MatrixTimesVector<DBL2D, DBL1D>, a, x, y);
}
int32_t AxVect_head(DBL2D a, DBL1D x, DBL1D y, ErrorCode *err) {
    return AxVectAligned_head(a, x, y, 0, err);
}
int32_t AxVectorCxAligned(CDB2D a, CDB1D x, CDB1D y, int32_t, ErrorCode *err) {
    return InErrWithHost(err, qx::MatrixTimesVector<CDB2D, CDB1D>, a, x, y);
}
int32_t AxVectorCx(CDB2D a, CDB1D x, CDB1D y, ErrorCode *err) {
    return AxVectorCxAligned(a, x, y, 0, err);
}

int32_t vectxAAligned_head(DBL1D x, DBL2D a, DBL1D y, int32_t alignedCopy, ErrorCode *err) {
    return InErrWithHost(err, qx::VectorTimesMatrix<DBL2D, DBL1D>, x, a, y, alignedCopy != 0);
}
int32_t vectxA_head(DBL1D x, DBL2D a, DBL1D y, ErrorCode *err) {
    return vectxAAligned_head(x, a, y, 0, err);
}
int32_t CxVectxAAligned_head(CDB1D x, CDB2D a, CDB1D y, int32_t alignedCopy, ErrorCode *err) {
    return InErrWithHost(err, qx::VectorTimesMatrix<CDB2D, CDB1D>, x, a, y, alignedCopy != 0);
}
int32_t CxVectxA_head(CDB1D x, CDB2D a, CDB1D y, ErrorCode *err) {
    return CxVectxAAligned_head(x, a, y, 0, err);
}
