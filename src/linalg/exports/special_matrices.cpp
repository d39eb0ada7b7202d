#include "qx/special_matrices.h"

#include "linalg/exports/checks.h"
#include "linalg/properties/special.h"
#include "linalg/transpose.h"

namespace qx {
namespace {

enum Kind : int32_t { identity, diagonal, toeplitz, vandermonde, companion };

struct Shape {
    int32_t rows, cols;
};

template <class Vector>
Shape ShapeOf(int32_t kind, int32_t size, In<Vector> x, In<Vector> y) {
    switch (kind) {
    case identity:
        return {size, size};
    case toeplitz:
        return {x.size(), y.size()};
    case companion:
        return {x.size() - 1, x.size() - 1};
    default:
        return {x.size(), x.size()};
    }
}

template <class Vector, class Matrix>
Outcome MakeKind(int32_t kind, int32_t size, In<Vector> x, In<Vector> y, Out<Matrix> out) {
    const Shape shape = ShapeOf(kind, size, x, y);
    const bool isEmpty = shape.rows < 1 || shape.cols < 1;
    if (const Outcome bad = LastFailed({{kind != companion && isEmpty, ErrEmptyInput},
                                        {kind == companion && x.size() < 2, ErrFewerThanTwo},
                                        {kind < identity || kind > companion, ErrInvalidSelector}}))
        return bad;
    if (const Outcome bad = out.resize(shape.rows, shape.cols))
        return bad;
    constexpr ElementType E = elementOf<Matrix>;
    switch (kind) {
    case identity:
        SetIdentity<E>(out.view());
        return 0;
    case diagonal:
        FillDiagonal<E>(x.view(), out.view());
        return 0;
    case toeplitz:
        FillToeplitz<E>(x.view(), y.view(), out.view());
        return 0;
    case vandermonde:
        FillVandermonde<E>(x.view(), out.view());
        return 0;
    default:
        FillCompanion<E>(x.view(), out.view());
        return 0;
    }
}

template <class Vector, class Matrix>
Outcome OuterProduct(In<Vector> x, In<Vector> y, Out<Matrix> out) {
    if (x.isEmpty() || y.isEmpty())
        return ErrEmptyInput;
    if (const Outcome bad = out.resize(x.size(), y.size()))
        return bad;
    const auto product = out.view();
    for (int32_t i = 0; i < product.rows(); ++i)
        for (int32_t j = 0; j < product.cols(); ++j)
            product(i, j) = x.data()[i] * y.data()[j];
    return 0;
}

template <class Matrix>
Outcome KroneckerProduct(In<Matrix> a, In<Matrix> b, Out<Matrix> out) {
    if (a.isEmpty() || b.isEmpty())
        return ErrEmptyInput;
    const int64_t rows = int64_t{a.rows()} * b.rows(), cols = int64_t{a.cols()} * b.cols();
    if (rows * cols > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    if (const Outcome bad = out.resize(static_cast<int32_t>(rows), static_cast<int32_t>(cols)))
        return bad;
    const auto left = a.view(), right = b.view();
    const auto product = out.view();
    for (int32_t i = 0; i < product.rows(); ++i)
        for (int32_t j = 0; j < product.cols(); ++j)
            product(i, j) = left(i / right.rows(), j / right.cols()) *
                            right(i % right.rows(), j % right.cols());
    return 0;
}

template <class Vector, class Matrix>
Outcome Expand(In<Vector> packed, int32_t triangle, Out<Matrix> out) {
    const int32_t n = OrderOfPacked(packed.size());
    if (const Outcome bad = FirstFailed({{packed.isEmpty(), ErrEmptyInput}, {n < 1, ErrNotSquare}}))
        return bad;
    if (triangle < lowerTriangle || triangle > symmetric) // kept: does nothing and reports success
        return 0;
    if (const Outcome bad = out.resize(n, n))
        return bad;
    ExpandPacked<elementOf<Vector>>(packed.view(), Triangle{triangle}, out.view());
    return 0;
}

template <class Matrix, class Vector>
Outcome Pack(In<Matrix> a, int32_t triangle, Out<Vector> packed) {
    const int64_t length = PackedLength(a.rows());
    if (const Outcome bad =
            FirstFailed({{a.isEmpty(), ErrEmptyInput},
                         {!a.isSquare(), ErrNotSquare},
                         {triangle < lowerTriangle || triangle > symmetric, ErrInvalidSelector},
                         {length > std::numeric_limits<int32_t>::max(), ErrOutOfMemory}}))
        return bad;
    if (const Outcome bad = packed.resize(static_cast<int32_t>(length)))
        return bad;
    PackMatrix<elementOf<Matrix>>(a.view(), Triangle{triangle}, packed.view());
    return 0;
}

template <class Matrix>
Outcome Transposed(In<Matrix> a, Out<Matrix> out) {
    if (a.isEmpty())
        return ErrEmptyInput;
    if (const Outcome bad = out.resize(a.cols(), a.rows()))
        return bad;
    const std::ptrdiff_t rows = a.rows(), cols = a.cols();
    Transpose<elementOf<Matrix>>(a.data(), cols, rows, cols, out.data(), rows);
    return 0;
}

template <class Matrix>
Outcome Zeros(int32_t rows, int32_t cols, Out<Matrix> out) {
    typedef HandleTraits<Matrix> Traits;
    if (rows < 1 || cols < 1)
        return ErrEmptyInput;
    const int64_t count = int64_t{rows} * cols;
    Scratch<Traits::code> trial; // kept: the memory is allocated as a trial and released
    if (const Outcome bad = trial.allocate(count))
        return bad;
    trial.release();
    if (const Outcome bad = out.resize(rows, cols))
        return bad;
    std::memset(static_cast<void *>(out.data()), 0,
                static_cast<std::size_t>(count) * sizeof(typename Traits::T));
    return 0;
}

Outcome FromEigenvalues(In<DBL1D> values, Out<DBL2D> out) {
    if (values.isEmpty())
        return ErrEmptyInput;
    if (const Outcome bad = out.resize(values.size(), values.size()))
        return bad;
    FillWithEigenvalues(values.view(), out.view());
    return 0;
}

template <class Vector, class Matrix>
Outcome Correlations(In<Vector> x, In<Vector> y, int32_t maxLag, int32_t normalization,
                     Out<Matrix> out) {
    if (const Outcome bad =
            FirstFailed({{x.isEmpty() || y.isEmpty(), ErrEmptyInput},
                         {x.size() != y.size(), ErrSizeMismatch},
                         {maxLag < 0 || maxLag >= x.size(), ErrIndexOutOfRange},
                         {normalization < unscaled || normalization > biased, ErrInvalidSelector}}))
        return bad;
    if (const Outcome bad = out.resize(maxLag + 1, maxLag + 1))
        return bad;
    return CorrelationMatrix<elementOf<Vector>>(x.view(), y.view(), CorrelationScale{normalization},
                                                out.view());
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;

int32_t SpecialMatrix_head(const int32_t *kind, const int32_t *size, DBL1D x, DBL1D y, DBL2D out,
                           ErrorCode *err) {
    return InErr(err, qx::MakeKind<DBL1D, DBL2D>, *kind, *size, x, y, out);
}
int32_t CxSpecialMatrix_head(const int32_t *kind, const int32_t *size, CDB1D x, CDB1D y, CDB2D out,
                             ErrorCode *err) {
    return InErr(err, qx::MakeKind<CDB1D, CDB2D>, *kind, *size, x, y, out);
}
int32_t OuterProd_head(DBL1D x, DBL1D y, DBL2D out, ErrorCode *err) {
    return InErr(err, qx::OuterProduct<DBL1D, DBL2D>, x, y, out);
}
int32_t OuterProdCx_head(CDB1D x, CDB1D y, CDB2D out, ErrorCode *err) {
    return InErr(err, qx::OuterProduct<CDB1D, CDB2D>, x, y, out);
}
ErrorCode KroneckerProd_H(DBL2D a, DBL2D b, DBL2D out) {
    return Returned(qx::KroneckerProduct<DBL2D>, a, b, out);
}
ErrorCode CxKroneckerProd_H(CDB2D a, CDB2D b, CDB2D out) {
    return Returned(qx::KroneckerProduct<CDB2D>, a, b, out);
}

int32_t Compact_to_Matrix_head(const PackedTriangle *a, DBL2D out, ErrorCode *err) {
    return InErr(err, qx::Expand<DBL1D, DBL2D>, a->packed, a->triangle, out);
}
int32_t CxCompact_to_Matrix_head(const CxPackedTriangle *a, CDB2D out, ErrorCode *err) {
    return InErr(err, qx::Expand<CDB1D, CDB2D>, a->packed, a->triangle, out);
}
int32_t Matrix_to_Compact_head(DBL2D a, const int32_t *triangle, DBL1D packed, ErrorCode *err) {
    return InErr(err, qx::Pack<DBL2D, DBL1D>, a, *triangle, packed);
}
int32_t CxMatrix_to_Compact_head(CDB2D a, const int32_t *triangle, CDB1D packed, ErrorCode *err) {
    return InErr(err, qx::Pack<CDB2D, CDB1D>, a, *triangle, packed);
}
ErrorCode CompactToMatrix_H(DBL1D packed, DBL2D out) {
    return Returned(qx::Expand<DBL1D, DBL2D>, packed, qx::symmetric, out);
}
ErrorCode MatrixToCompact_H(DBL2D a, DBL1D packed) {
    return Returned(qx::Pack<DBL2D, DBL1D>, a, qx::symmetric, packed);
}

ErrorCode Transpose_head(DBL2D a, DBL2D out) { return Returned(qx::Transposed<DBL2D>, a, out); }
int32_t CxTranspose_head(CDB2D a, CDB2D out, ErrorCode *err) {
    return InErr(err, qx::Transposed<CDB2D>, a, out);
}
ErrorCode InitialMatrixH(int32_t rows, int32_t cols, DBL2D out) {
    return Returned(qx::Zeros<DBL2D>, rows, cols, out);
}
ErrorCode CxInitialMatrixH(int32_t rows, int32_t cols, CDB2D out) {
    return Returned(qx::Zeros<CDB2D>, rows, cols, out);
}
int32_t CreateMatrixFromEVs_head(DBL1D values, DBL2D out, ErrorCode *err) {
    return InErr(err, qx::FromEigenvalues, values, out);
}
ErrorCode AutoCorrMtrxH(DBL1D x, DBL1D y, int32_t maxLag, int32_t normalization, DBL2D out) {
    return Returned(qx::Correlations<DBL1D, DBL2D>, x, y, maxLag, normalization, out);
}
ErrorCode CxAutoCorrMtrxH(CDB1D x, CDB1D y, int32_t maxLag, int32_t normalization, CDB2D out) {
    return Returned(qx::Correlations<CDB1D, CDB2D>, x, y, maxLag, normalization, out);
}
