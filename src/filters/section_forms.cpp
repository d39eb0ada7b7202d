#include "filters/section_forms.h"

#include "poly/multiple_roots.h"
#include "spectra/convolution.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

bool Fits(const CascadeCoefficients &from, const CascadeOutput &to, std::ptrdiff_t a,
          std::ptrdiff_t b) {
    const std::ptrdiff_t order = SectionOrder(from.form), sections = from.a.size() / order;
    return from.a.size() == order * sections && from.b.size() == (order + 1) * sections &&
           to.a.size() >= a && to.b.size() >= b;
}

// Multiplies (1, a[0], a[1]) by (1, a[2], a[3]) and (b[0], b[1], b[2]) by (b[3], b[4], b[5]).
ErrorCode MultiplyOut(const DBL *a, const DBL *b, DBL *fourthA, DBL *fourthB) {
    const double first[3] = {1.0, a[0], a[1]}, second[3] = {1.0, a[2], a[3]};
    double product[5];
    if (const ErrorCode failed =
            ConvolveReal({first, 3}, {second, 3}, ConvolveDirectly, {product, 5}))
        return failed;
    for (int k = 0; k < 4; ++k)
        fourthA[k] = product[k + 1];
    return ConvolveReal({b, 3}, {b + 3, 3}, ConvolveDirectly, {fourthB, 5});
}

// A polynomial of degree 4 as a multiple of two factors modulus2 - 2 re x + x^2, each with a pair
// of its roots: re is their mean, modulus2 their product.
struct Factors {
    double re[2], modulus2[2];
    bool exist = false; // false if the degree is lower, or a coefficient is NaN

    ErrorCode find(double c0, const DBL *rest);

private:
    ErrorCode findWithin(double tolerance, const CDB *polynomial);
    void take(int which, const CDB &root, const CDB &next);
    void takeFour(const CDB *roots);
    double deviation(const CDB *polynomial) const;
};

bool IsReal(const CDB &root) { return std::fabs(root.im) < 1e-8 * std::fabs(root.re); }

// Conjugate roots are adjacent; two real roots also form a pair, wherever they are.
void Factors::take(int which, const CDB &root, const CDB &next) {
    re[which] = IsReal(root) ? 0.5 * (root.re + next.re) : +root.re;
    modulus2[which] = IsReal(root) ? root.re * next.re : root.re * root.re + root.im * root.im;
}

void Factors::takeFour(const CDB *roots) {
    CDB ordered[4];
    int32_t n = 0;
    for (const bool real : {true, false})
        for (int32_t i = 0; i < 4; ++i)
            if (IsReal(roots[i]) == real)
                ordered[n++] = roots[i];
    take(0, ordered[0], ordered[1]);
    take(1, ordered[2], ordered[3]);
}

// The deviation of the product of the factors from the polynomial, relative to the largest
// coefficient.
double Factors::deviation(const CDB *polynomial) const {
    const double product[5] = {
        modulus2[0] * modulus2[1], -2.0 * (modulus2[0] * re[1] + re[0] * modulus2[1]),
        modulus2[0] + modulus2[1] + 4.0 * re[0] * re[1], -2.0 * (re[0] + re[1]), 1.0};
    double greatest = 0.0, most = 0.0;
    for (int k = 0; k < 5; ++k) {
        most = std::max(most, std::fabs(product[k] * polynomial[4].re - polynomial[k].re));
        greatest = std::max(greatest, std::fabs(polynomial[k].re));
    }
    return most / greatest;
}

ErrorCode Factors::findWithin(double tolerance, const CDB *polynomial) {
    CDB refined[5], roots[5];
    I32 multiplicity[5];
    MultipleRoots found = {{refined, 5}, {roots, 5}, {multiplicity, 5}};
    const ErrorCode status = FindMultipleRoots({polynomial, 5}, false, tolerance, &found);
    const int32_t count = found.count;
    if (status == ErrOutOfMemory)
        return status;
    int32_t degree = 0;
    for (int32_t i = 0; status >= 0 && i < count; ++i)
        degree += multiplicity[i];
    exist = degree >= 4;
    if (exist && count == 4) {
        takeFour(roots);
    } else if (exist) {
        take(0, roots[0], roots[0]);
        take(1, roots[count - 1], roots[count - 1]);
    }
    return 0;
}

// In bands far below the sampling rate, different roots are so close to each other that they are
// taken for one; the product of the factors is then another polynomial. In that case the roots are
// distinguished as far as possible.
ErrorCode Factors::find(double c0, const DBL *rest) {
    const CDB polynomial[5] = {{c0, 0}, {rest[0], 0}, {rest[1], 0}, {rest[2], 0}, {rest[3], 0}};
    if (const ErrorCode failed = findWithin(-1.0, polynomial))
        return failed;
    if (exist && deviation(polynomial) > 1e-12)
        return findWithin(1e-300, polynomial);
    return 0;
}

// A section of lower order is kept whole, followed by a section equal to 1.
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

// The first factor includes b[4], which is b[0] here.
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
    const std::ptrdiff_t sections = second.a.size() / 2, pairs = (sections + 1) >> 1;
    if (!Fits(second, fourth, 4 * pairs, 5 * pairs))
        return ErrCoefficientSizes;
    const DBL *a = second.a.data(), *b = second.b.data();
    DBL *toA = fourth.a.data(), *toB = fourth.b.data();
    if (sections % 2 != 0) {
        for (int k = 0; k < 4; ++k)
            toA[k] = k < 2 ? +a[k] : 0.0;
        for (int k = 0; k < 5; ++k)
            toB[k] = k < 3 ? +b[k] : 0.0;
        a += 2, b += 3, toA += 4, toB += 5;
    }
    for (std::ptrdiff_t pair = 0; pair < sections / 2; ++pair, a += 4, b += 6, toA += 4, toB += 5)
        if (const ErrorCode failed = MultiplyOut(a, b, toA, toB))
            return failed;
    return 0;
}

ErrorCode FourthToSecondOrder(const CascadeCoefficients &fourth, const CascadeOutput &second) {
    const std::ptrdiff_t sections = fourth.a.size() / 4;
    if (!Fits(fourth, second, 4 * sections, 6 * sections))
        return ErrCoefficientSizes;
    for (std::ptrdiff_t s = 0; s < sections; ++s) {
        if (const ErrorCode failed = SplitDenominator(&fourth.a[4 * s], &second.a[4 * s]))
            return failed;
        if (const ErrorCode failed = SplitNumerator(&fourth.b[5 * s], &second.b[6 * s]))
            return failed;
    }
    return 0;
}

} // namespace qx
