/* atan2 with the quotient, the reduction and the sum with the angle of the quadrant carried as
   pairs of doubles. Largest error seen on 10^6 random and locally searched arguments: 0.72 ulp;
   rounding y / x first costs up to 1.5. */

#include "pair.h"

#include <math.h>
#include <stdint.h>

static int ExponentOf(double x) {
    union {
        double value;
        uint64_t bits;
    } word = {x};
    return (int)(word.bits >> 52 & 0x7ff) - 0x3ff;
}

/* The tangent of the angle that remains when the angle of c is subtracted:
   (y - c x) / (x + c y). */
static Pair ReducedTangent(double y, double x, double c) {
    const Pair height = {y, 0}, width = {x, 0};
    return PairQuotient(PairSum(height, ExactProduct(-c, x)), PairSum(width, ExactProduct(c, y)));
}

/* The angle of (x, y) in the first quadrant; the exponents of x and y differ by at most 64. */
static Pair FirstQuadrant(double y, double x) {
    /* Angles 0, atan 1/2, atan 1, atan 3/2 and pi/2, with bounds of y / x about midway. */
    static const struct {
        double bound, c;
        Pair angle;
    } pieces[] = {
        {0.4375, 0, {0, 0}},
        {0.6875, 0.5, {0x1.dac670561bb4fp-2, 0x1.a2b7f222f65e2p-56}},
        {1.1875, 1, {0x1.921fb54442d18p-1, 0x1.1a62633145c07p-55}},
        {2.4375, 1.5, {0x1.f730bd281f69bp-1, 0x1.007887af0cbbdp-56}},
    };
    static const Pair rightAngle = {0x1.921fb54442d18p+0, 0x1.1a62633145c07p-54};
    /* tools/tables/atan_tail.py: |t| up to 7/16, relative error of the arctangent below 3.6e-18 */
    static const double tail[12] = {
        -0x1.5555555555555p-2, 0x1.99999999998c5p-3, -0x1.2492492485503p-3, 0x1.c71c71bd2b8bcp-4,
        -0x1.745d154c84f7ap-4, 0x1.3b1375ce5bdc6p-4, -0x1.110c9ce7b0572p-4, 0x1.e170800a46210p-5,
        -0x1.ab59b417b2d3fp-5, 0x1.7001816fd063fp-5, -0x1.0f62bba6a2558p-5, 0x1.e4167464d3de8p-7};

    Pair angle = rightAngle, t;
    int piece = 0;
    while (piece < 4 && !(y < pieces[piece].bound * x))
        ++piece;
    if (piece == 4) {
        const Pair top = {-x, 0}, bottom = {y, 0};
        t = PairQuotient(top, bottom);
    } else {
        angle = pieces[piece].angle;
        t = ReducedTangent(y, x, pieces[piece].c);
    }
    const double square = t.hi * t.hi;
    const double cubic = t.hi * square * TwelveTerms(tail, square);
    const Pair arctangent = QuickSum(t.hi, cubic + t.lo * (1 - square));
    return PairSum(angle, arctangent);
}

double atan2(double y, double x) {
    static const Pair halfTurn = {0x1.921fb54442d18p+1, 0x1.1a62633145c07p-53};
    const double quarterTurn = 0x1.921fb54442d18p+0;
    const double eighthTurn = 0x1.921fb54442d18p-1, threeEighths = 0x1.2d97c7f3321d2p+1;
    if (x != x || y != y)
        return x + y;
    const double height = fabs(y), width = fabs(x);
    const int left = copysign(1, x) < 0;
    if (height == 0)
        return copysign(left ? halfTurn.hi : 0, y);
    if (width == 0)
        return copysign(quarterTurn, y);
    if (width == height && ExponentOf(width) == 0x400)
        return copysign(left ? threeEighths : eighthTurn, y);

    /* Beyond 2^64 the smaller one changes the angle by less than its rounding error, or the quotient
       is the angle. */
    const int rise = ExponentOf(height) - ExponentOf(width);
    if (rise > 64)
        return copysign(quarterTurn, y);
    if (rise < -64)
        return left ? copysign(halfTurn.hi, y) : copysign(height / width, y);

    /* Near 1 no product below can overflow or lose bits to underflow. */
    const double larger = height > width ? height : width;
    const int up = larger < 0x1p-900 ? 200 : 0;
    const int scale = up - ExponentOf(scalbn(larger, up));
    Pair angle = FirstQuadrant(scalbn(height, scale), scalbn(width, scale));
    if (left) {
        const Pair negative = {-angle.hi, -angle.lo};
        angle = PairSum(halfTurn, negative);
    }
    return copysign(angle.hi + angle.lo, y);
}
