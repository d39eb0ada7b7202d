#ifndef QX_STATS_TAIL_DISTRIBUTIONS_H
#define QX_STATS_TAIL_DISTRIBUTIONS_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// Distributions and their inverses, accurate to the last digits in either tail. The argument must
// not be NaN, and degrees of freedom must be positive; degrees above 1e25, including infinity,
// count as 1e25, with which the distributions have reached their limits.

enum class DistributionValue {
    Probability,
    Survival,
    LogProbability,
    LogSurvival,
    Density,
};

double NormalValue(double x, DistributionValue what);
double StudentValue(double t, double dof, DistributionValue what);
double FisherValue(double f, double n, double d, DistributionValue what);
double ChiSquareValue(double x, double dof, DistributionValue what);

// The point below which (above which if isUpper) the probability is p, 0 <= p <= 1.
double NormalPoint(double p, bool isUpper);
double StudentPoint(double p, bool isUpper, double dof);
double FisherPoint(double p, bool isUpper, double n, double d);
double ChiSquarePoint(double p, bool isUpper, double dof);

} // namespace qx

#endif
