#include "poly/arithmetic.h"

#include "frame/extended.h"
#include "frame/scratch.h"
#include "linalg/scalar.h"
#include "poly/complex_arithmetic.h"
#include "spectra/sliding_sums.h"

#include <cmath>

namespace qx {

namespace {

constexpr auto Real = ElementType::DBL;
constexpr auto Complex = ElementType::CDB;

template <ElementType E>
int32_t Length(const ElementOf<E> *p, int32_t n) {
    while (n > 0 && IsZero(p[n - 1]))
        --n;
    return n;
}

// The window slides along the longer one; either way the index of p ascends.
template <ElementType E>
void Product(const ElementOf<E> *p, int32_t m, const ElementOf<E> *q, int32_t n, ElementOf<E> *r) {
    const int32_t count = m + n - 1;
    if (m < n)
        SlidingSums({{p}, m, {q + (n - 1), -1}, n, 1 - int64_t{m}, {r + (count - 1), -1}, count});
    else
        SlidingSums({{q + (n - 1), -1}, n, {p}, m, 1 - int64_t{n}, {r}, count});
}

template <ElementType E>
void Divide(ElementOf<E> *work, int32_t m, const ElementOf<E> *q, int32_t n,
            ElementOf<E> *quotient) {
    for (std::ptrdiff_t k = m - n; k >= 0; --k) {
        const typename ScalarOf<E>::type factor = Quotient(work[k + n - 1], q[n - 1]);
        quotient[k] = factor;
        for (std::ptrdiff_t j = 0; j < n - 1; ++j)
            work[k + j] -= factor * q[j];
    }
}

// x (k + 1) ... (k + order), in twice the precision and with an exponent apart.
double TimesFactorials(double x, int32_t k, int32_t order) {
    if (x == 0.0)
        return x;
    int exponent = 0;
    Extended product = {std::frexp(x, &exponent), 0.0};
    for (int32_t j = 1; j <= order && exponent < 2000; ++j) {
        product = product * Extended{double(k) + j, 0.0};
        if (std::fabs(product.high) > 0x1p500) {
            product = {product.high * 0x1p-500, product.low * 0x1p-500};
            exponent += 500;
        }
    }
    return std::ldexp(product.high, exponent);
}
double TimesFactorialsOf(double x, int32_t k, int32_t order) {
    return TimesFactorials(x, k, order);
}
CDB TimesFactorialsOf(CDB x, int32_t k, int32_t order) {
    return {TimesFactorials(x.re, k, order), TimesFactorials(x.im, k, order)};
}

template <ElementType E>
void DifferentiateAny(const ElementOf<E> *p, int32_t n, int32_t order, ElementOf<E> *q) {
    for (int32_t k = 0; k < n - order; ++k)
        q[k] = TimesFactorialsOf(p[k + order], k, order);
}

template <ElementType E>
ErrorCode ComposeAny(const ElementOf<E> *p, int32_t m, const ElementOf<E> *q, int32_t n,
                     ElementOf<E> *r) {
    const std::ptrdiff_t full = std::ptrdiff_t{m - 1} * (n - 1) + 1;
    Scratch<E> work;
    if (const ErrorCode failed = work.allocate(full))
        return failed;
    r[0] = p[m - 1];
    int32_t length = 1;
    for (std::ptrdiff_t i = m - 2; i >= 0; --i) {
        PolynomialProduct(r, length, q, n, work.data());
        length += n - 1;
        for (std::ptrdiff_t j = 0; j < length; ++j)
            r[j] = work[j];
        r[0] = r[0] + p[i];
    }
    return work.release();
}

} // namespace

int32_t LengthWithoutZeros(const DBL *p, int32_t n) { return Length<Real>(p, n); }
int32_t LengthWithoutZeros(const CDB *p, int32_t n) { return Length<Complex>(p, n); }

void PolynomialProduct(const DBL *p, int32_t m, const DBL *q, int32_t n, DBL *r) {
    Product<Real>(p, m, q, n, r);
}
void PolynomialProduct(const CDB *p, int32_t m, const CDB *q, int32_t n, CDB *r) {
    Product<Complex>(p, m, q, n, r);
}

void DivideInPlace(DBL *work, int32_t m, const DBL *q, int32_t n, DBL *quotient) {
    Divide<Real>(work, m, q, n, quotient);
}
void DivideInPlace(CDB *work, int32_t m, const CDB *q, int32_t n, CDB *quotient) {
    Divide<Complex>(work, m, q, n, quotient);
}

void Differentiate(const DBL *p, int32_t n, int32_t order, DBL *q) {
    DifferentiateAny<Real>(p, n, order, q);
}
void Differentiate(const CDB *p, int32_t n, int32_t order, CDB *q) {
    DifferentiateAny<Complex>(p, n, order, q);
}

ErrorCode Compose(const DBL *p, int32_t m, const DBL *q, int32_t n, DBL *r) {
    return ComposeAny<Real>(p, m, q, n, r);
}
ErrorCode Compose(const CDB *p, int32_t m, const CDB *q, int32_t n, CDB *r) {
    return ComposeAny<Complex>(p, m, q, n, r);
}

} // namespace qx
