#include "linalg/matrix.h"

#include "frame/scratch.h"

#include <cstring>

namespace qx {

namespace {

// kept: the lower bound is a truncated constant, so the last numbers above -DBL_MAX are refused.
bool IsRefused(double x) { return !(x < 0x1.fffffffffffffp1023 && x > -1.7976931348623e308); }

// Tiles that fit into the first cache, so that neither side is read or written in long strides.
constexpr int32_t tile = 16;

template <ElementType E>
void Transpose(const typename Element<E>::type *a, std::ptrdiff_t rows, std::ptrdiff_t cols,
               typename Element<E>::type *out) {
    for (std::ptrdiff_t top = 0; top < rows; top += tile) {
        const std::ptrdiff_t bottom = top + tile < rows ? top + tile : rows;
        for (std::ptrdiff_t j = 0; j < cols; ++j)
            for (std::ptrdiff_t i = top; i < bottom; ++i)
                out[j * rows + i] = a[i * cols + j];
    }
}

template <ElementType E>
ErrorCode TransposeOrCopy(typename Element<E>::type *a, int32_t rows, int32_t cols,
                          typename Element<E>::type *out) {
    const int64_t count = int64_t{rows} * cols;
    const bool isVector = rows == 1 || cols == 1;
    if (out == nullptr && isVector)
        return 0;
    if (isVector) {
        std::memcpy(out, a, static_cast<std::size_t>(count) * sizeof *a);
        return 0;
    }
    if (out != nullptr) {
        Transpose<E>(a, rows, cols, out);
        return 0;
    }
    Scratch<E> copy;
    if (const ErrorCode failed = copy.allocate(count))
        return failed;
    std::memcpy(copy.data(), a, static_cast<std::size_t>(count) * sizeof *a);
    Transpose<E>(copy.data(), rows, cols, a);
    return 0;
}

// Visits the packed elements in their order: at(i, j, packed element).
template <class At>
void ForEachPacked(std::ptrdiff_t n, int32_t triangle, At at) {
    std::ptrdiff_t next = 0;
    for (std::ptrdiff_t j = 0; j < n; ++j) {
        const std::ptrdiff_t first = triangle == upperTriangle ? 0 : j;
        const std::ptrdiff_t last = triangle == upperTriangle ? j : n - 1;
        for (std::ptrdiff_t i = first; i <= last; ++i)
            at(i, j, next++);
    }
}

template <ElementType E>
void Pack(const typename Element<E>::type *a, std::ptrdiff_t n, int32_t triangle,
          typename Element<E>::type *packed) {
    ForEachPacked(n, triangle, [=](std::ptrdiff_t i, std::ptrdiff_t j, std::ptrdiff_t at) {
        packed[at] = a[i * n + j];
    });
}

template <ElementType E>
void Expand(const typename Element<E>::type *packed, std::ptrdiff_t n, int32_t triangle,
            typename Element<E>::type *a) {
    ForEachPacked(n, triangle, [=](std::ptrdiff_t i, std::ptrdiff_t j, std::ptrdiff_t at) {
        // The mirror image first: on the diagonal the element itself stands.
        if (triangle == symmetric)
            a[j * n + i] = packed[at];
        else if (triangle == hermitian)
            a[j * n + i] = Conj(packed[at]);
        else
            a[j * n + i] = ScalarOf<E>::Of(0.0);
        a[i * n + j] = packed[at];
    });
}

} // namespace

ErrorCode CheckFinite(const DBL *x, int64_t n) {
    for (int64_t i = 0; i < n; ++i)
        if (IsRefused(x[i]))
            return 1;
    return 0;
}

ErrorCode CheckFinite(const CDB *x, int64_t n) { return CheckFinite(&x->re, 2 * n); }

ErrorCode TransposeMatrix(DBL *a, int32_t rows, int32_t cols, DBL *out) {
    return TransposeOrCopy<ElementType::DBL>(a, rows, cols, out);
}
ErrorCode TransposeMatrix(CDB *a, int32_t rows, int32_t cols, CDB *out) {
    return TransposeOrCopy<ElementType::CDB>(a, rows, cols, out);
}
void TransposeInto(const DBL *a, int32_t rows, int32_t cols, DBL *out) {
    Transpose<ElementType::DBL>(a, rows, cols, out);
}
void TransposeInto(const CDB *a, int32_t rows, int32_t cols, CDB *out) {
    Transpose<ElementType::CDB>(a, rows, cols, out);
}

int32_t OrderOfPacked(int32_t length) {
    if (length < 0)
        return -1;
    const auto n = static_cast<int32_t>(std::floor(std::sqrt(2.0 * length)));
    return PackedLength(n) == length ? n : -1;
}

void PackMatrix(const DBL *a, int32_t n, int32_t triangle, DBL *packed) {
    Pack<ElementType::DBL>(a, n, triangle, packed);
}
void PackMatrix(const CDB *a, int32_t n, int32_t triangle, CDB *packed) {
    Pack<ElementType::CDB>(a, n, triangle, packed);
}
void ExpandPacked(const DBL *packed, int32_t n, int32_t triangle, DBL *a) {
    Expand<ElementType::DBL>(packed, n, triangle, a);
}
void ExpandPacked(const CDB *packed, int32_t n, int32_t triangle, CDB *a) {
    Expand<ElementType::CDB>(packed, n, triangle, a);
}

} // namespace qx
