#ifndef QX_STATS_FACTORIAL_ANOVA_H
#define QX_STATS_FACTORIAL_ANOVA_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

constexpr int maxFactors = 3;

struct Factor {
    const I32 *labels; // one for each observation
    int32_t levels;
    bool isRandom;
};

// Observations in crossed factors: n is the product of the levels and the observations per cell.
struct FactorialDesign {
    const DBL *y;
    int32_t n;
    int32_t observations; // per cell; 1 only where all factors are fixed
    int factors;          // 2 or 3
    Factor factor[maxFactors];
};

// NaN where the source has no such number.
struct AnovaSource {
    double sumOfSquares, degrees, meanSquare, f, p, denominatorDegrees, critical;
};

// A, B, AB, error, total; or A, B, C, AB, AC, BC, ABC, error, total.
struct FactorialTable {
    int sources;
    AnovaSource source[9];
};

// Analysis of variance of a balanced design with two or three factors (unrestricted model). Every
// deviation is formed in twice the precision from the exact differences to one observation, so the
// results have the digits of the data whatever their mean. Critical values where `significance` is
// not null.
// ErrAnovaFactorEmpty (other labels in number than levels), ErrAnovaCellCount, ErrNaNInData,
// ErrBadSignificance, ErrAnovaDesign (a denominator is not above 0), ErrOutOfMemory.
ErrorCode FactorialAnova(const FactorialDesign &design, const double *significance,
                         FactorialTable *table);

} // namespace qx

#endif
