#include "filters/analog_prototypes.h"

#include "frame/scratch.h"
#include "linalg/eigenproblems/general.h"
#include "poly/complex_roots.h"
#include "spectra/convolution.h"

#include <cmath>

namespace qx {

namespace {

// A larger part is not a rounding error of 0: the roots are of order 1.
constexpr double realWithin = 1e-08;

// The Bessel polynomial whose reciprocal is the filter of order n, scaled to have first and last
// coefficient 1, with ascending coefficients. g is the scaling factor.
ErrorCode ScaledPolynomial(int32_t n, DBL *c, double &g) {
    c[0] = 1.0;
    for (int32_t k = 0; k < n; ++k)
        c[0] *= n - 0.5 * k;
    if (!std::isfinite(c[0]))
        return ErrBadCoefficients; // from about order 150 on
    for (int32_t i = 1; i < n; ++i)
        c[i] = c[i - 1] * 2.0 * (n - i + 1) / (2.0 * n - i + 1) / i;
    c[n] = 1.0;
    g = std::pow(c[0], 1.0 / n);
    double power = g;
    for (int32_t i = n - 1; i > 0; --i, power *= g)
        c[i] = c[i] / power;
    c[0] = 1.0;
    return 0;
}

// The reciprocal of the frequency at which the gain is 3 dB down: where the squares of the even and
// odd parts of c, on the imaginary axis, add up to 2. As a function of the reciprocal frequency
// this is the largest real root.
ErrorCode BesselCutoffScale(const DBL *c, int32_t n, double &scale) {
    const int32_t count = 2 * n + 1;
    RealVector even, odd, evenSquare, oddSquare;
    ComplexVector polynomial;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(even, n + 1), Sized(odd, n + 1), Sized(evenSquare, count),
                        Sized(oddSquare, count), Sized(polynomial, count)))
        return failed;
    for (int32_t i = 0; i <= n; ++i) {
        const double part = i / 2 % 2 == 0 ? c[i] : -c[i];
        even[i] = i % 2 == 0 ? part : 0.0;
        odd[i] = i % 2 == 0 ? 0.0 : part;
    }
    if (const ErrorCode failed = ConvolveReal(even, even, ConvolveDirectly, evenSquare))
        return failed;
    if (const ErrorCode failed = ConvolveReal(odd, odd, ConvolveDirectly, oddSquare))
        return failed;
    for (int32_t i = 0; i < count; ++i)
        polynomial[count - 1 - i] = {evenSquare[i] + oddSquare[i] - (i == 0 ? 2.0 : 0.0), 0.0};
    int32_t roots = 0;
    if (const ErrorCode failed =
            CxPolynomialRoots({polynomial.data(), count}, 100, {polynomial.data(), count}, &roots))
        return failed;
    scale = 0.0;
    for (int32_t i = 0; i < roots; ++i)
        if (std::fabs(polynomial[i].im) < realWithin && polynomial[i].re > scale)
            scale = polynomial[i].re;
    return 0;
}

// The poles are the reciprocals of the eigenvalues of the polynomial's continued-fraction matrix
// multiplied by g.
ErrorCode FindPoles(int32_t n, double g, CDB *poles) {
    Scratch<ElementType::DBL> matrix;
    if (matrix.allocate(int64_t{n} * n) != 0)
        return ErrOutOfMemory;
    for (std::ptrdiff_t i = 0; i < std::ptrdiff_t{n} * n; ++i)
        matrix[i] = 0.0;
    matrix[0] = -1.0;
    for (std::ptrdiff_t k = 1; k < n; ++k) {
        matrix[(k - 1) * n + k] = 1.0 / static_cast<double>(2 * k - 1);
        matrix[k * n + k - 1] = -1.0 / static_cast<double>(2 * k + 1);
    }
    if (const ErrorCode failed = EigenGeneral<ElementType::DBL>({matrix.data(), n, n}, {poles, n}))
        return failed;
    for (int32_t i = 0; i < n; ++i) {
        const double re = poles[i].re * g, im = poles[i].im * g;
        const double modulus2 = re * re + im * im;
        if (modulus2 == 0.0)
            return ErrDegenerateValue;
        poles[i] = {re / modulus2, -im / modulus2};
    }
    return 0;
}

bool IsReal(const CDB &pole) { return std::fabs(pole.im) < realWithin; }

// Real poles first: a single one if their number is odd, then in pairs.
void AddRealPoles(const CDB *poles, int32_t n, double scale, DigitalSections &sections) {
    int32_t left = 0;
    for (int32_t i = 0; i < n; ++i)
        left += IsReal(poles[i]) ? 1 : 0;
    double partner = 0.0;
    bool hasPartner = false;
    for (int32_t i = 0; i < n; ++i) {
        if (!IsReal(poles[i]))
            continue;
        const double pole = poles[i].re * scale;
        if (hasPartner)
            sections.add(PolePair{0.0, scale * scale, -(partner + pole), partner * pole});
        else if (left % 2 != 0)
            sections.add(RealPole{scale, -pole});
        hasPartner = !hasPartner && left % 2 == 0;
        partner = pole;
        --left;
    }
}

void AddPolePairs(const CDB *poles, int32_t n, double scale, DigitalSections &sections) {
    bool isSecond = false; // conjugates are adjacent
    for (int32_t i = 0; i < n; ++i) {
        if (IsReal(poles[i]))
            continue;
        const double re = poles[i].re * scale, im = poles[i].im * scale;
        if (!isSecond)
            sections.add(PolePair{0.0, scale * scale, -2.0 * re, re * re + im * im});
        isSecond = !isSecond;
    }
}

} // namespace

ErrorCode BesselPrototype(int32_t n, DigitalSections &sections) {
    RealVector c;
    ComplexVector poles;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(c, int64_t{n} + 1), Sized(poles, n)))
        return failed;
    double g = 1.0, scale = 0.0;
    if (const ErrorCode failed = ScaledPolynomial(n, c.data(), g))
        return failed;
    if (const ErrorCode failed = FindPoles(n, g, poles.data()))
        return failed;
    if (const ErrorCode failed = BesselCutoffScale(c.data(), n, scale))
        return failed;
    AddRealPoles(poles.data(), n, scale, sections);
    AddPolePairs(poles.data(), n, scale, sections);
    return 0;
}

} // namespace qx
