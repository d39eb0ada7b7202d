#include "transforms/chirp_z.h"

#include "frame/complex.h"
#include "frame/scratch.h"
#include "spectra/convolution.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstring>
#include <limits>

namespace qx {
namespace {

typedef Scratch<ElementType::CDB> Work;

constexpr CDB one = {1.0, 0.0};

double Square(const CDB &z) { return z.re * z.re + z.im * z.im; }

// The real powers of one value.
class Powers {
public:
    explicit Powers(const CDB &z) : square_(Square(z)), angle_(std::atan2(z.im, z.re)) {}
    CDB of(double exponent) const {
        const double magnitude = std::pow(square_, exponent / 2);
        const double angle = exponent * angle_;
        return {magnitude * std::cos(angle), magnitude * std::sin(angle)};
    }
    // 1 - z^exponent without cancellation where the power is near 1.
    CDB oneLess(double exponent) const {
        const double logarithm = exponent / 2 * std::log(square_);
        const double angle = exponent * angle_;
        const double magnitude = std::exp(logarithm);
        const double sine = std::sin(angle / 2);
        return {-std::expm1(logarithm) + 2 * magnitude * sine * sine, -magnitude * std::sin(angle)};
    }
    // How far z^exponent has come from 1 on its way: its rounding error is a fraction of that.
    double way(double exponent) const {
        return std::fabs(exponent) * std::hypot(std::log(square_) / 2, angle_);
    }

private:
    double square_, angle_;
};

bool IsFinite(const CDB &z) { return std::isfinite(z.re) && std::isfinite(z.im); }

ErrorCode CheckSpiral(const CDB &a, const CDB &w) {
    for (const CDB &z : {a, w}) {
        if (!IsFinite(z))
            return ErrNonFiniteInput;
        if (Square(z) == 0.0)
            return ErrTooFewWeights;
    }
    return 0;
}

// terms[k] = x[k] a^(-k), from one power and a product for each further value.
template <ElementType Code>
void TakeStart(const typename Element<Code>::type *x, std::ptrdiff_t n, const CDB &a, CDB *terms) {
    CDB factor = Powers(a).of(static_cast<double>(1 - n));
    for (std::ptrdiff_t k = n - 1; k >= 0; --k) {
        terms[k] = factor * x[k];
        factor = factor * a;
    }
}

// out[m] = sum over k of terms[k] w^(k m).
void SumDirectly(const CDB *terms, std::ptrdiff_t n, const CDB &w, CDB *out, std::ptrdiff_t count) {
    const Powers powers(w);
    for (std::ptrdiff_t m = 0; m < count; ++m) {
        CDB sum = {0.0, 0.0};
        double exponent = 0;
        for (std::ptrdiff_t k = 0; k < n; ++k) {
            sum += terms[k] * powers.of(exponent);
            exponent += static_cast<double>(m);
        }
        out[m] = sum;
    }
}

// By k m = (k^2 + m^2 - (m - k)^2) / 2 the sum is a convolution with a chirp.
ErrorCode SumByConvolution(CDB *terms, int32_t n, const CDB &w, CDB *out, int32_t count) {
    const int64_t chirpLength = int64_t{count} + n;
    const int64_t length = chirpLength + n - 1;
    if (length > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    Work memory;
    if (const ErrorCode failed = memory.allocate(chirpLength + length))
        return failed;
    CDB *const chirp = memory.data();
    CDB *const convolution = chirp + chirpLength;
    const Powers powers(w);
    for (std::ptrdiff_t t = 0; t < chirpLength; ++t) {
        const auto i = static_cast<double>(t - n);
        chirp[t] = powers.of(-(i * i) * 0.5);
    }
    for (std::ptrdiff_t k = 0; k < n; ++k)
        terms[k] = terms[k] / chirp[n - k];
    if (const ErrorCode failed =
            ConvolveComplex(&terms->re, n, &chirp->re, static_cast<int32_t>(chirpLength),
                            &convolution->re, ConvolveByTransform))
        return failed;
    for (std::ptrdiff_t m = 0; m < count; ++m)
        out[m] = convolution[n + m] / chirp[n + m];
    return memory.release();
}

template <ElementType Code>
ErrorCode Transform(const typename Element<Code>::type *x, int32_t n, const CDB &a, const CDB &w,
                    uint32_t method, CDB *out, int32_t count) {
    if (const ErrorCode failed = CheckSpiral(a, w))
        return failed;
    Work terms;
    if (const ErrorCode failed = terms.allocate(n))
        return failed;
    TakeStart<Code>(x, n, a, terms.data());
    if (method == Bluestein)
        return SumByConvolution(terms.data(), n, w, out, count);
    SumDirectly(terms.data(), n, w, out, count);
    return terms.release();
}

// A number whose exponent may leave the range of double: on the full circle products of n
// differences do so from n around 4000, though what is formed of them is near 1.
struct Scaled {
    CDB value = {1.0, 0.0};
    int32_t exponent = 0;

    Scaled times(const CDB &factor) const {
        const CDB product = value * factor;
        int shift = 0;
        std::frexp(std::max(std::fabs(product.re), std::fabs(product.im)), &shift);
        return {{std::ldexp(product.re, -shift), std::ldexp(product.im, -shift)}, exponent + shift};
    }
    CDB plain(int32_t further) const {
        return {std::ldexp(value.re, exponent + further), std::ldexp(value.im, exponent + further)};
    }
};

// u[k], the product of 1 / (1 - w^(-j)) over j from 1 to k. The exponents stand apart.
class Reciprocals {
public:
    ErrorCode build(const Powers &w, std::ptrdiff_t n) {
        if (const ErrorCode failed = values_.allocate(n))
            return failed;
        if (const ErrorCode failed = exponents_.allocate(n))
            return failed;
        Scaled u;
        for (std::ptrdiff_t k = 0; k < n; ++k) {
            if (k > 0) {
                const CDB difference = w.oneLess(static_cast<double>(-k));
                const double rounding =
                    std::numeric_limits<double>::epsilon() * w.way(static_cast<double>(k));
                if (std::hypot(difference.re, difference.im) <= rounding)
                    return ErrDegenerateValue;
                u = u.times(one / difference);
            }
            values_[k] = u.value;
            exponents_[k] = u.exponent;
        }
        return 0;
    }
    Scaled operator[](std::ptrdiff_t k) const { return {values_[k], exponents_[k]}; }
    // u[i] u[j]
    Scaled pair(std::ptrdiff_t i, std::ptrdiff_t j) const {
        Scaled product = (*this)[i].times(values_[j]);
        product.exponent += exponents_[j];
        return product;
    }

private:
    Work values_;
    Scratch<ElementType::I32> exponents_;
};

// (-1)^k w^(-k (k + step) / 2)
CDB AlternatingChirp(const Powers &w, std::ptrdiff_t k, int step) {
    const auto at = static_cast<double>(k);
    const CDB power = w.of(-at * (at + step) / 2);
    return k % 2 == 0 ? power : CDB{-power.re, -power.im};
}

// Where `count` of the n points w^k / a lie best, and 1/a as seen from there.
std::ptrdiff_t BestStretch(std::ptrdiff_t n, std::ptrdiff_t count, const CDB &w, CDB *start) {
    const double growth = std::sqrt(Square(w));
    double magnitude = std::sqrt(Square(*start));
    double nearest = std::fabs(magnitude - 1.0);
    std::ptrdiff_t index = 0;
    for (std::ptrdiff_t k = 1; k < n; ++k) {
        magnitude *= growth;
        const double distance = std::fabs(magnitude - 1.0);
        if (distance > nearest)
            break;
        if (distance < nearest)
            index = k;
        nearest = distance;
    }
    const std::ptrdiff_t first = std::clamp<std::ptrdiff_t>(index - count / 2, 0, n - count);
    for (std::ptrdiff_t k = 0; k < first; ++k)
        *start = *start * w;
    return first;
}

// The polynomial of n coefficients, y[0] first, that has the given values at the powers of w.
// `work` has 3 n values beside the 2 n - 1 of y.
ErrorCode Interpolate(const CDB *values, int32_t n, const CDB &w, CDB *work, CDB *y) {
    const Powers powers(w);
    Reciprocals u;
    if (const ErrorCode failed = u.build(powers, n))
        return failed;
    CDB *const weighted = work;
    CDB *const sums = weighted + n;
    CDB *const binomials = sums + n;
    for (std::ptrdiff_t m = 0; m < n; ++m)
        weighted[m] = values[m] * (AlternatingChirp(powers, m, 1) * u.pair(m, n - 1 - m).plain(0));
    SumDirectly(weighted, n, one / w, sums, n);
    const CDB last = powers.oneLess(static_cast<double>(-n));
    const Scaled whole = u[n - 1];
    binomials[0] = {1.0, 0.0};
    for (std::ptrdiff_t k = 1; k < n; ++k) {
        const Scaled quotient = u.pair(k, n - k).times(last / whole.value);
        binomials[k] = AlternatingChirp(powers, k, -1) * quotient.plain(-whole.exponent);
    }
    return ConvolveComplex(&sums->re, n, &binomials->re, n, &y->re, ConvolveDirectly);
}

} // namespace

ErrorCode ChirpZ(const DBL *x, int32_t n, CDB a, CDB w, uint32_t method, CDB *out, int32_t count) {
    return Transform<ElementType::DBL>(x, n, a, w, method, out, count);
}
ErrorCode ChirpZ(const CDB *x, int32_t n, CDB a, CDB w, uint32_t method, CDB *out, int32_t count) {
    return Transform<ElementType::CDB>(x, n, a, w, method, out, count);
}

ErrorCode InverseChirpZ(const CDB *in, int32_t n, CDB a, CDB w, CDB *out, int32_t count) {
    if (const ErrorCode failed = CheckSpiral(a, w))
        return failed;
    Work memory;
    if (const ErrorCode failed = memory.allocate(5 * int64_t{count}))
        return failed;
    CDB start = one / a;
    const std::ptrdiff_t first = count < n ? BestStretch(n, count, w, &start) : 0;
    if (Square(start) == 0.0)
        return ErrDegenerateValue;
    CDB *const y = memory.data();
    if (const ErrorCode failed =
            Interpolate(in + first, count, w, y + 2 * std::ptrdiff_t{count}, y))
        return failed;
    const Powers powers(start);
    for (std::ptrdiff_t k = 0; k < count; ++k)
        out[k] = y[k] * powers.of(static_cast<double>(-k));
    return memory.release();
}

} // namespace qx
