#include "poly/arithmetic.h"

#include "frame/extended.h"
#include "frame/scratch.h"
#include "linalg/scalar.h"
#include "poly/complex_arithmetic.h"
#include "spectra/sliding_sums.h"

#include <cmath>

namespace qx {

namespace {

// x (k + 1) ... (k + order), in twice the precision and with a separate exponent.
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

} // namespace

template <ElementType E>
int32_t LengthWithoutZeros(ConstVectorView<E> p) {
    auto n = static_cast<int32_t>(p.size());
    while (n > 0 && IsZero(p[n - 1]))
        --n;
    return n;
}

// The window slides along the longer polynomial; in both cases the index of p ascends.
template <ElementType E>
void PolynomialProduct(ConstVectorView<E> p, ConstVectorView<E> q, VectorView<E> r) {
    const auto m = static_cast<int32_t>(p.size()), n = static_cast<int32_t>(q.size());
    const int32_t count = m + n - 1;
    QX_EXPECTS(m > 0 && n > 0 && r.size() == count);
    const ElementOf<E> *const lastOfQ = q.data() + (n - 1);
    if (m < n)
        SlidingSums(
            {{p.data()}, m, {lastOfQ, -1}, n, 1 - int64_t{m}, {r.data() + (count - 1), -1}, count});
    else
        SlidingSums({{lastOfQ, -1}, n, {p.data()}, m, 1 - int64_t{n}, {r.data()}, count});
}

template <ElementType E>
void DivideInPlace(VectorView<E> work, ConstVectorView<E> q, VectorView<E> quotient) {
    const std::ptrdiff_t n = q.size();
    QX_EXPECTS(n > 0 && work.size() >= n && quotient.size() == work.size() - n + 1);
    for (std::ptrdiff_t k = quotient.size() - 1; k >= 0; --k) {
        const typename ScalarOf<E>::type factor = Quotient(work[k + n - 1], q[n - 1]);
        quotient[k] = factor;
        for (std::ptrdiff_t j = 0; j < n - 1; ++j)
            work[k + j] -= factor * q[j];
    }
}

template <ElementType E>
void Differentiate(ConstVectorView<E> p, int32_t order, VectorView<E> q) {
    QX_EXPECTS(order >= 0 && q.size() == p.size() - order);
    for (int32_t k = 0; k < q.size(); ++k)
        q[k] = TimesFactorialsOf(p[k + order], k, order);
}

template <ElementType E>
ErrorCode Compose(ConstVectorView<E> p, ConstVectorView<E> q, VectorView<E> r) {
    QX_EXPECTS(r.size() == (p.size() - 1) * (q.size() - 1) + 1);
    Scratch<E> work;
    if (const ErrorCode failed = work.allocate(r.size()))
        return failed;
    r[0] = p[p.size() - 1];
    std::ptrdiff_t length = 1;
    for (std::ptrdiff_t i = p.size() - 2; i >= 0; --i) {
        const VectorView<E> product(work.data(), length + q.size() - 1);
        PolynomialProduct<E>(r.part(0, length), q, product);
        length = product.size();
        for (std::ptrdiff_t j = 0; j < length; ++j)
            r[j] = product[j];
        r[0] = r[0] + p[i];
    }
    return work.release();
}

template int32_t LengthWithoutZeros(ConstRealVector);
template int32_t LengthWithoutZeros(ConstComplexVector);
template void PolynomialProduct(ConstRealVector, ConstRealVector, RealVector);
template void PolynomialProduct(ConstComplexVector, ConstComplexVector, ComplexVector);
template void DivideInPlace(RealVector, ConstRealVector, RealVector);
template void DivideInPlace(ComplexVector, ConstComplexVector, ComplexVector);
template void Differentiate(ConstRealVector, int32_t, RealVector);
template void Differentiate(ConstComplexVector, int32_t, ComplexVector);
template ErrorCode Compose(ConstRealVector, ConstRealVector, RealVector);
template ErrorCode Compose(ConstComplexVector, ConstComplexVector, ComplexVector);

} // namespace qx
