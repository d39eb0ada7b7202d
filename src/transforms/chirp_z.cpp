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
    // The length of the way from 1 to z^exponent; the rounding error of the power is proportional to it.
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

// terms[k] = x[k] a^(-k), by one power and a product for each further value.
template <ElementType E>
void TakeStart(ConstVectorView<E> x, const CDB &a, ComplexVector terms) {
    CDB factor = Powers(a).of(static_cast<double>(1 - x.size()));
    for (std::ptrdiff_t k = x.size() - 1; k >= 0; --k) {
        terms[k] = factor * x[k];
        factor = factor * a;
    }
}

// out[m] = sum over k of terms[k] w^(k m).
void SumDirectly(ConstComplexVector terms, const CDB &w, ComplexVector out) {
    const Powers powers(w);
    for (std::ptrdiff_t m = 0; m < out.size(); ++m) {
        CDB sum = {0.0, 0.0};
        double exponent = 0;
        for (const CDB &term : terms) {
            sum += term * powers.of(exponent);
            exponent += static_cast<double>(m);
        }
        out[m] = sum;
    }
}

// Since k m = (k^2 + m^2 - (m - k)^2) / 2, the sum is a convolution with a chirp.
ErrorCode SumByConvolution(ComplexVector terms, const CDB &w, ComplexVector out) {
    const std::ptrdiff_t n = terms.size();
    const int64_t length = int64_t{out.size()} + 2 * n - 1;
    if (length > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    ComplexVector chirp, convolution;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(chirp, int64_t{out.size()} + n), Sized(convolution, length)))
        return failed;
    const Powers powers(w);
    for (std::ptrdiff_t t = 0; t < chirp.size(); ++t) {
        const auto i = static_cast<double>(t - n);
        chirp[t] = powers.of(-(i * i) * 0.5);
    }
    for (std::ptrdiff_t k = 0; k < n; ++k)
        terms[k] = terms[k] / chirp[n - k];
    if (const ErrorCode failed = ConvolveComplex(terms, chirp, ConvolveByTransform, convolution))
        return failed;
    for (std::ptrdiff_t m = 0; m < out.size(); ++m)
        out[m] = convolution[n + m] / chirp[n + m];
    return memory.release();
}

// A number whose exponent may leave the range of double: on the full circle, products of n differences
// do so from n around 4000, although the results formed from them are near 1.
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

// u[k] is the product of 1 / (1 - w^(-j)) over j from 1 to k. The exponents are kept separately.
class Reciprocals {
public:
    ErrorCode build(const Powers &w, std::ptrdiff_t n) {
        if (const ErrorCode failed = memory_.take(Sized(values_, n), Sized(exponents_, n)))
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
    ScratchParts memory_;
    ComplexVector values_;
    I32 *exponents_;
};

// (-1)^k w^(-k (k + step) / 2)
CDB AlternatingChirp(const Powers &w, std::ptrdiff_t k, int step) {
    const auto at = static_cast<double>(k);
    const CDB power = w.of(-at * (at + step) / 2);
    return k % 2 == 0 ? power : CDB{-power.re, -power.im};
}

// Returns the first of the `count` consecutive points, out of the n points w^k / a, around the one nearest
// to the unit circle. *start is 1/a and becomes that point.
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

// The n coefficients, y[0] first, of the polynomial that has the given values at the powers of w. y has
// 2 n - 1 values.
ErrorCode Interpolate(ConstComplexVector values, const CDB &w, ComplexVector y) {
    const std::ptrdiff_t n = values.size();
    const Powers powers(w);
    Reciprocals u;
    if (const ErrorCode failed = u.build(powers, n))
        return failed;
    ComplexVector weighted, sums, binomials;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(weighted, n), Sized(sums, n), Sized(binomials, n)))
        return failed;
    for (std::ptrdiff_t m = 0; m < n; ++m)
        weighted[m] = values[m] * (AlternatingChirp(powers, m, 1) * u.pair(m, n - 1 - m).plain(0));
    SumDirectly(weighted, one / w, sums);
    const CDB last = powers.oneLess(static_cast<double>(-n));
    const Scaled whole = u[n - 1];
    binomials[0] = {1.0, 0.0};
    for (std::ptrdiff_t k = 1; k < n; ++k) {
        const Scaled quotient = u.pair(k, n - k).times(last / whole.value);
        binomials[k] = AlternatingChirp(powers, k, -1) * quotient.plain(-whole.exponent);
    }
    return ConvolveComplex(sums, binomials, ConvolveDirectly, y);
}

} // namespace

template <ElementType E>
ErrorCode ChirpZ(ConstVectorView<E> x, CDB a, CDB w, ChirpMethod method, ComplexVector out) {
    if (const ErrorCode failed = CheckSpiral(a, w))
        return failed;
    ComplexVector terms;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(terms, x.size())))
        return failed;
    TakeStart(x, a, terms);
    if (method == Bluestein)
        return SumByConvolution(terms, w, out);
    SumDirectly(terms, w, out);
    return memory.release();
}

template ErrorCode ChirpZ(ConstRealVector, CDB, CDB, ChirpMethod, ComplexVector);
template ErrorCode ChirpZ(ConstComplexVector, CDB, CDB, ChirpMethod, ComplexVector);

ErrorCode InverseChirpZ(ConstComplexVector in, CDB a, CDB w, ComplexVector out) {
    const std::ptrdiff_t n = in.size(), count = out.size();
    QX_EXPECTS(count > 0 && count <= n);
    if (const ErrorCode failed = CheckSpiral(a, w))
        return failed;
    ComplexVector y;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(y, 2 * int64_t{count} - 1)))
        return failed;
    CDB start = one / a;
    const std::ptrdiff_t first = count < n ? BestStretch(n, count, w, &start) : 0;
    if (Square(start) == 0.0)
        return ErrDegenerateValue;
    if (const ErrorCode failed = Interpolate(in.part(first, count), w, y))
        return failed;
    const Powers powers(start);
    for (std::ptrdiff_t k = 0; k < count; ++k)
        out[k] = y[k] * powers.of(static_cast<double>(-k));
    return memory.release();
}

} // namespace qx
