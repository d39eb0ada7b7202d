#include "filters/section_forms.h"

#include "poly/multiple_roots.h"
#include "spectra/convolution.h"

#include <algorithm>

namespace qx {

namespace {

bool Fits(const CascadeCoefficients &from, const CascadeOutput &to, int32_t a, int32_t b) {
    const int32_t order = SectionOrder(from.form), sections = from.aCount / order;
    return from.aCount == order * sections && from.bCount == (order + 1) * sections &&
           to.aCount >= a && to.bCount >= b;
}

// (1, a[0], a[1]) (1, a[2], a[3]) and (b[0], b[1], b[2]) (b[3], b[4], b[5]).
ErrorCode MultiplyOut(const DBL *a, const DBL *b, DBL *fourthA, DBL *fourthB) {
    const double first[3] = {1.0, a[0], a[1]}, second[3] = {1.0, a[2], a[3]};
    double product[5];
    if (const ErrorCode failed = ConvolveReal(first, 3, second, 3, ConvolveDirectly, product))
        return failed;
    for (int k = 0; k < 4; ++k)
        fourthA[k] = product[k + 1];
    return ConvolveReal(b, 3, b + 3, 3, ConvolveDirectly, fourthB);
}

// A polynomial of degree 4 as a multiple of two factors |r|^2 - 2 re(r) x + x^2, each with a root r
// and its conjugate.
struct Factors {
    double re[2], modulus2[2];
    bool exist = false; // not if the degree is lower, or a coefficient NaN

    // Conjugate roots come next to each other.
    ErrorCode find(double c0, const DBL *rest);

private:
    void take(int which, const CDB &root) {
        re[which] = root.re;
        modulus2[which] = root.re * root.re + root.im * root.im;
    }
};

ErrorCode Factors::find(double c0, const DBL *rest) {
    const CDB polynomial[5] = {{c0, 0}, {rest[0], 0}, {rest[1], 0}, {rest[2], 0}, {rest[3], 0}};
    CDB refined[5], roots[5];
    I32 multiplicity[5];
    int32_t refinedCount = 0, count = 0;
    const ErrorCode status = MultipleRootsComplex(polynomial, 5, 0, -1.0, refined, &refinedCount,
                                                  roots, multiplicity, &count);
    if (status == ErrOutOfMemory)
        return status;
    int32_t degree = 0;
    for (int32_t i = 0; status >= 0 && i < count; ++i)
        degree += multiplicity[i];
    exist = degree >= 4;
    if (exist) {
        take(0, roots[0]);
        take(1, roots[std::min(count - 1, 2)]);
    }
    return 0;
}

// A section of lower order stays whole, beside one that is 1.
ErrorCode SplitDenominator(const DBL *a, DBL *second) {
    Factors factors;
    if (const ErrorCode failed = factors.find(1.0, a))
        return failed;
    for (int k = 0; k < 4; ++k)
        second[k] = k < 2 ? +a[k] : 0.0;
    for (int i = 0; factors.exist && i < 2; ++i) {
        second[2 * i] = -2.0 * factors.re[i] / factors.modulus2[i];
        second[2 * i + 1] = 1.0 / factors.modulus2[i];
    }
    return 0;
}

// The first factor takes b[4], which is b[0] here, along.
ErrorCode SplitNumerator(const DBL *b, DBL *second) {
    Factors factors;
    if (const ErrorCode failed = factors.find(b[0], b + 1))
        return failed;
    for (int k = 0; k < 6; ++k)
        second[k] = k < 3 ? +b[k] : k == 3 ? 1.0 : 0.0;
    for (int i = 0; factors.exist && i < 2; ++i) {
        const double gain = i == 0 ? +b[0] : 1.0;
        second[3 * i] = factors.modulus2[i] * gain;
        second[3 * i + 1] = -2.0 * factors.re[i] * gain;
        second[3 * i + 2] = gain;
    }
    return 0;
}

} // namespace

ErrorCode SecondToFourthOrder(const CascadeCoefficients &second, const CascadeOutput &fourth) {
    const int32_t sections = second.aCount / 2, pairs = (sections + 1) >> 1;
    if (!Fits(second, fourth, 4 * pairs, 5 * pairs))
        return ErrCoefficientSizes;
    const DBL *a = second.a, *b = second.b;
    DBL *toA = fourth.a, *toB = fourth.b;
    if (sections % 2 != 0) {
        for (int k = 0; k < 4; ++k)
            toA[k] = k < 2 ? +a[k] : 0.0;
        for (int k = 0; k < 5; ++k)
            toB[k] = k < 3 ? +b[k] : 0.0;
        a += 2, b += 3, toA += 4, toB += 5;
    }
    for (int32_t pair = 0; pair < sections / 2; ++pair, a += 4, b += 6, toA += 4, toB += 5)
        if (const ErrorCode failed = MultiplyOut(a, b, toA, toB))
            return failed;
    return 0;
}

ErrorCode FourthToSecondOrder(const CascadeCoefficients &fourth, const CascadeOutput &second) {
    const int32_t sections = fourth.aCount / 4;
    if (!Fits(fourth, second, 4 * sections, 6 * sections))
        return ErrCoefficientSizes;
    for (std::ptrdiff_t s = 0; s < sections; ++s) {
        if (const ErrorCode failed = SplitDenominator(fourth.a + 4 * s, second.a + 4 * s))
            return failed;
        if (const ErrorCode failed = SplitNumerator(fourth.b + 5 * s, second.b + 6 * s))
            return failed;
    }
    return 0;
}

} // namespace qx
