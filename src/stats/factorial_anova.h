#ifndef QX_STATS_FACTORIAL_ANOVA_H
#define QX_STATS_FACTORIAL_ANOVA_H

#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

constexpr int maxFactors = 3;

struct Factor {
    ConstVectorView<ElementType::I32> labels; // one for each observation
    int32_t levels;
    bool isRandom;
};

// Observations in crossed factors. Their number is the product of the levels times the observations
// per cell.
struct FactorialDesign {
    ConstRealVector y;
    int32_t observations; // per cell; 1 only if all factors are fixed
    int factors;          // 2 or 3
    Factor factor[maxFactors];

    int32_t n() const { return static_cast<int32_t>(y.size()); }
};

// NaN if the source has no such number.
struct AnovaSource {
    double sumOfSquares, degrees, meanSquare, f, p, denominatorDegrees, critical;
};

// The sources A, B, AB, error, total; or A, B, C, AB, AC, BC, ABC, error, total.
struct FactorialTable {
    int sources;
    AnovaSource source[9];
};

// Analysis of variance of a balanced design with two or three factors (unrestricted model). Every
// deviation is computed in twice the precision from the exact differences to one observation, so
// that the results are as accurate as the data, whatever their mean. Critical values are computed
// if `significance` is not null.
// ErrAnovaFactorEmpty (the number of labels is not that of the levels), ErrAnovaCellCount,
// ErrNaNInData, ErrBadSignificance, ErrAnovaDesign (a denominator is not above 0), ErrOutOfMemory.
ErrorCode FactorialAnova(const FactorialDesign &design, const double *significance,
                         FactorialTable *table);

} // namespace qx

#endif
