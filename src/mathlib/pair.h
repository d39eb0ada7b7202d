#ifndef QX_MATHLIB_PAIR_H
#define QX_MATHLIB_PAIR_H

/* Unevaluated sums hi + lo with |lo| at most half an ulp of hi: about 100 bits. The error-free
   sum and product are those of D. E. Knuth, The Art of Computer Programming, volume 2, and
   T. J. Dekker, A Floating-Point Technique for Extending the Available Precision (1971).
   They hold only without contraction and regrouping. */
typedef struct {
    double hi, lo;
} Pair;

/* a + b, where |a| is not below |b|. */
static inline Pair QuickSum(double a, double b) {
    const double sum = a + b;
    const Pair result = {sum, b - (sum - a)};
    return result;
}

static inline Pair ExactSum(double a, double b) {
    const double sum = a + b;
    const double bPart = sum - a;
    const Pair result = {sum, (a - (sum - bPart)) + (b - bPart)};
    return result;
}

static inline Pair ExactProduct(double a, double b) {
    const double splitter = 0x1p27 + 1;
    const double aScaled = splitter * a, bScaled = splitter * b;
    const double aHigh = aScaled - (aScaled - a), bHigh = bScaled - (bScaled - b);
    const double aLow = a - aHigh, bLow = b - bHigh;
    const double product = a * b;
    const double error = ((aHigh * bHigh - product) + aHigh * bLow + aLow * bHigh) + aLow * bLow;
    const Pair result = {product, error};
    return result;
}

static inline Pair PairSum(Pair a, Pair b) {
    const Pair sum = ExactSum(a.hi, b.hi);
    return QuickSum(sum.hi, sum.lo + (a.lo + b.lo));
}

static inline Pair PairQuotient(Pair a, Pair b) {
    const double quotient = a.hi / b.hi;
    const Pair back = ExactProduct(quotient, b.hi);
    const double rest = ((a.hi - back.hi) - back.lo) + (a.lo - quotient * b.lo);
    return QuickSum(quotient, rest / b.hi);
}

static inline Pair Scaled(Pair a, double powerOfTwo) {
    const Pair result = {a.hi * powerOfTwo, a.lo * powerOfTwo};
    return result;
}

/* The polynomial of 12 ascending coefficients in four independent chains, so that it takes the
   time of 3 steps instead of 11. */
static inline double TwelveTerms(const double *c, double x) {
    const double x2 = x * x, x4 = x2 * x2;
    const double low = (c[0] + c[1] * x) + (c[2] + c[3] * x) * x2;
    const double middle = (c[4] + c[5] * x) + (c[6] + c[7] * x) * x2;
    const double high = (c[8] + c[9] * x) + (c[10] + c[11] * x) * x2;
    return low + (middle + high * x4) * x4;
}

#endif
