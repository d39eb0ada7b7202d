#include "linalg/products/products.h"

#include "frame/scratch.h"
#include "linalg/lapack.h"
#include "linalg/products/ordered.h"
#include "linalg/scalar.h"

#include <cstring>
#include <initializer_list>
#include <limits>
#include <type_traits>

namespace qx {

namespace {

// Up to here the ordered product is as fast as BLAS.
constexpr int64_t smallProduct = 32 * 32 * 32;

// Large products run in bands, so that a band of a and of the result stays in the caches.
constexpr int32_t band = 1530;

template <ElementType E>
ErrorCode Multiply(const typename Element<E>::type *a, const typename Element<E>::type *b,
                   int32_t m, int32_t k, int32_t n, typename Element<E>::type *c) {
    if (int64_t{m} * n * k <= smallProduct) {
        OrderedProduct(a, b, m, k, n, c);
        return 0;
    }
    const bool inBands = E == ElementType::DBL && m > band && k > 256 && n > 2;
    const int32_t step = inBands ? band : m;
    for (int32_t i = 0; i < m; i += step) {
        const int32_t rows = m - i < step ? m - i : step;
        if (const ErrorCode failed =
                blas::Product(rows, n, k, a + std::ptrdiff_t{i} * k, b, c + std::ptrdiff_t{i} * n))
            return failed;
    }
    return 0;
}

template <ElementType E>
ErrorCode MultiplyCopies(const typename Element<E>::type *a, const typename Element<E>::type *b,
                         int32_t m, int32_t k, int32_t n, typename Element<E>::type *c) {
    const int64_t aSize = int64_t{m} * k, bSize = int64_t{k} * n, cSize = int64_t{m} * n;
    Scratch<E> aCopy, bCopy, cCopy;
    for (const ErrorCode failed :
         {aCopy.allocate(aSize), bCopy.allocate(bSize), cCopy.allocate(cSize)})
        if (failed != 0)
            return failed;
    std::memcpy(aCopy.data(), a, static_cast<std::size_t>(aSize) * sizeof *a);
    std::memcpy(bCopy.data(), b, static_cast<std::size_t>(bSize) * sizeof *b);
    if (const ErrorCode failed = Multiply<E>(aCopy.data(), bCopy.data(), m, k, n, cCopy.data()))
        return failed;
    std::memcpy(c, cCopy.data(), static_cast<std::size_t>(cSize) * sizeof *c);
    return 0;
}

template <ElementType E>
ErrorCode Product(const typename Element<E>::type *a, const typename Element<E>::type *b, int32_t m,
                  int32_t k, int32_t n, typename Element<E>::type *c, int32_t alignedCopy) {
    if (m < 0 || k < 0 || n < 0)
        return ErrNegativeDimension;
    if (m == 0 || n == 0)
        return 0;
    if (k == 0) { // kept: the empty sum is NaN and not zero
        Fill(reinterpret_cast<DBL *>(c), std::ptrdiff_t{m} * n * partsOf<E>,
             std::numeric_limits<double>::quiet_NaN());
        return 0;
    }
    if (alignedCopy != 0)
        return MultiplyCopies<E>(a, b, m, k, n, c);
    return Multiply<E>(a, b, m, k, n, c);
}

// Four rows at a time: four sums that do not wait for each other.
template <ElementType E>
ErrorCode VectorProduct(const typename Element<E>::type *a, int32_t m, int32_t n,
                        const typename Element<E>::type *x, typename Element<E>::type *y) {
    if (m < 0 || n < 0)
        return ErrNegativeDimension;
    if (m == 0 || n == 0)
        return 0;
    typedef typename ScalarOf<E>::type Scalar;
    const auto dot = [=]<int Rows>(std::integral_constant<int, Rows>, int32_t first) {
        Scalar sum[Rows];
        for (int r = 0; r < Rows; ++r)
            sum[r] = ScalarOf<E>::Of(0.0);
        const ElementOf<E> *const row = a + std::ptrdiff_t{first} * n;
        for (std::ptrdiff_t j = 0; j < n; ++j)
            for (int r = 0; r < Rows; ++r)
                sum[r] = sum[r] + row[std::ptrdiff_t{r} * n + j] * x[j];
        for (int r = 0; r < Rows; ++r)
            y[first + r] = sum[r];
    };
    int32_t i = 0;
    for (; i + 4 <= m; i += 4)
        dot(std::integral_constant<int, 4>(), i);
    for (; i < m; ++i)
        dot(std::integral_constant<int, 1>(), i);
    return 0;
}

} // namespace

ErrorCode MatrixProduct(const DBL *a, const DBL *b, int32_t m, int32_t k, int32_t n, DBL *c,
                        int32_t alignedCopy) {
    return Product<ElementType::DBL>(a, b, m, k, n, c, alignedCopy);
}
ErrorCode MatrixProduct(const CDB *a, const CDB *b, int32_t m, int32_t k, int32_t n, CDB *c,
                        int32_t alignedCopy) {
    return Product<ElementType::CDB>(a, b, m, k, n, c, alignedCopy);
}

void OrderedProduct(const DBL *a, const DBL *b, int32_t m, int32_t k, int32_t n, DBL *c) {
    Fill(c, std::ptrdiff_t{m} * n, 0.0);
    AddProduct(m, n, k, a, k, b, n, c, n);
}
void OrderedProduct(const CDB *a, const CDB *b, int32_t m, int32_t k, int32_t n, CDB *c) {
    Fill(&c->re, 2 * std::ptrdiff_t{m} * n, 0.0);
    CxAddProduct(m, n, k, a, k, b, n, c, n);
}

ErrorCode ProductWithConjugate(const CDB *a, const CDB *b, int32_t m, int32_t k, int32_t n,
                               CDB *c) {
    if (m < 0 || k < 1 || n < 0)
        return ErrNegativeDimension;
    return m > 0 && n > 0 ? blas::ProductWithConjugate(m, n, k, a, b, c) : 0;
}

ErrorCode MatrixVectorProduct(const DBL *a, int32_t m, int32_t n, const DBL *x, DBL *y) {
    return VectorProduct<ElementType::DBL>(a, m, n, x, y);
}
ErrorCode MatrixVectorProduct(const CDB *a, int32_t m, int32_t n, const CDB *x, CDB *y) {
    return VectorProduct<ElementType::CDB>(a, m, n, x, y);
}

} // namespace qx
