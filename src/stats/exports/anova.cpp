#include "stats/anova.h"

#include "frame/export.h"
#include "qx/anova.h"
#include "stats/factorial_anova.h"

#include <cstdlib>

namespace qx {
namespace {

template <auto Test>
ErrorCode Contingency(In<I32_2D> table, OutDBL chiSquare, OutDBL p) {
    if (table.hasNegativeSize())
        return ErrTableNegativeSize;
    return Test(table.view(), chiSquare.address(), p.address());
}

template <auto Analysis>
ErrorCode OneWay(In<DBL1D> y, In<I32_1D> labels, int32_t k, double alpha, OutDBL ssBetween,
                 OutDBL msBetween, OutDBL f, OutDBL p, OutDBL ssError, OutDBL msError,
                 OutDBL ssTotal, OutDBL fCritical) {
    if (const ErrorCode failed = FirstFailed(
            {{y.size() != labels.size(), ErrSizeMismatch}, {y.isEmpty(), ErrEmptyInput}}))
        return failed;
    OneWayTable table = {};
    const ErrorCode status = Analysis(y.view(), labels.view(), k, alpha, &table);
    ssBetween = table.ssBetween;
    msBetween = table.msBetween;
    f = table.f;
    p = table.p;
    ssError = table.ssError;
    msError = table.msError;
    ssTotal = table.ssTotal;
    fCritical = table.fCritical;
    return status;
}

// A factor as passed by the caller: a negative number of levels means a random factor.
struct GivenFactor {
    const In<I32_1D> &labels;
    int32_t levels;
    int64_t size() const { return std::abs(int64_t{levels}); }
    bool isRandom() const { return levels < 0; }
};
typedef std::initializer_list<GivenFactor> GivenFactors;

template <class Holds>
bool Any(GivenFactors factors, Holds holds) {
    for (const GivenFactor &factor : factors)
        if (holds(factor))
            return true;
    return false;
}

// Whether the design has n observations.
bool HasCount(GivenFactors factors, int32_t observations, int32_t n) {
    int64_t count = observations;
    for (const GivenFactor &factor : factors) {
        if (factor.size() > n || count > n)
            return false;
        count *= factor.size();
    }
    return count == n;
}

// The columns are those of AnovaSource, in the order of the outputs.
constexpr double AnovaSource::*columnsOfTable[] = {&AnovaSource::sumOfSquares,
                                                   &AnovaSource::degrees,
                                                   &AnovaSource::meanSquare,
                                                   &AnovaSource::f,
                                                   &AnovaSource::p,
                                                   &AnovaSource::denominatorDegrees,
                                                   &AnovaSource::critical};

Outcome Factorial(In<DBL1D> y, GivenFactors factors, int32_t observations,
                  const double *significance, std::initializer_list<Out<DBL1D> *> columns) {
    typedef const GivenFactor &Given;
    if (const Outcome bad = FirstFailed(
            {{y.isEmpty(), ErrEmptyInput},
             {Any(factors, [&](Given factor) { return factor.labels.size() != y.size(); }),
              ErrSizeMismatch},
             {Any(factors, [](Given factor) { return factor.size() < 2; }), ErrAnovaFewLevels},
             {observations < 1, ErrAnovaNoReplication},
             {observations == 1 && Any(factors, [](Given factor) { return factor.isRandom(); }),
              ErrAnovaNegativeSelector},
             {!HasCount(factors, observations, y.size()), ErrAnovaCountMismatch}}))
        return bad;
    FactorialDesign design = {y.view(), observations, 0, {}};
    for (Given factor : factors)
        design.factor[design.factors++] = {factor.labels.view(),
                                           static_cast<int32_t>(factor.size()), factor.isRandom()};
    FactorialTable table;
    if (const Outcome bad = FactorialAnova(design, significance, &table))
        return bad;
    for (Out<DBL1D> *column : columns)
        if (const Outcome bad = column->resize(table.sources))
            return bad;
    double AnovaSource::*const *member = columnsOfTable;
    for (Out<DBL1D> *column : columns) {
        for (int i = 0; i < table.sources; ++i)
            column->data()[i] = table.source[i].**member;
        ++member;
    }
    return 0;
}

template <class... Columns>
Outcome TwoFactors(In<DBL1D> y, In<I32_1D> a, In<I32_1D> b, int32_t levelsA, int32_t levelsB,
                   int32_t observations, const double *significance, Columns... columns) {
    return Factorial(y, {{a, levelsA}, {b, levelsB}}, observations, significance, {&columns...});
}

template <class... Columns>
Outcome ThreeFactors(In<DBL1D> y, In<I32_1D> a, In<I32_1D> b, In<I32_1D> c, int32_t levelsA,
                     int32_t levelsB, int32_t levelsC, int32_t observations,
                     const double *significance, Columns... columns) {
    return Factorial(y, {{a, levelsA}, {b, levelsB}, {c, levelsC}}, observations, significance,
                     {&columns...});
}

// With six columns, or with the critical values as a seventh.
typedef Out<DBL1D> Column;
constexpr auto twoFactors = TwoFactors<Column, Column, Column, Column, Column, Column>;
constexpr auto twoFactorsCritical =
    TwoFactors<Column, Column, Column, Column, Column, Column, Column>;
constexpr auto threeFactors = ThreeFactors<Column, Column, Column, Column, Column, Column>;
constexpr auto threeFactorsCritical =
    ThreeFactors<Column, Column, Column, Column, Column, Column, Column>;
constexpr const double *noSignificance = nullptr;

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;

int32_t Contingency_head(I32_2D table, DBL *chiSquare, DBL *p, ErrorCode *err) {
    return InErr(err, qx::Contingency<qx::ContingencyTest>, table, chiSquare, p);
}

int32_t Contingency2026_head(I32_2D table, DBL *chiSquare, DBL *p, ErrorCode *err) {
    return InErr(err, qx::Contingency<qx::ContingencyTail>, table, chiSquare, p);
}

int32_t Anova1Way_head(DBL1D y, I32_1D labels, const int32_t *k, DBL *ssBetween, DBL *msBetween,
                       DBL *f, DBL *p, DBL *ssError, DBL *msError, DBL *ssTotal, ErrorCode *err) {
    DBL fCritical;
    return Anova1Way_head_2017(y, labels, k, 0.0, ssBetween, msBetween, f, p, ssError, msError,
                               ssTotal, &fCritical, err);
}

int32_t Anova1Way_head_2017(DBL1D y, I32_1D labels, const int32_t *k, double alpha, DBL *ssBetween,
                            DBL *msBetween, DBL *f, DBL *p, DBL *ssError, DBL *msError,
                            DBL *ssTotal, DBL *fCritical, ErrorCode *err) {
    return InErr(err, qx::OneWay<qx::OneWayAnova>, y, labels, *k, alpha, ssBetween, msBetween, f, p,
                 ssError, msError, ssTotal, fCritical);
}

int32_t Anova1Way_head_2026(DBL1D y, I32_1D labels, const int32_t *k, double alpha, DBL *ssBetween,
                            DBL *msBetween, DBL *f, DBL *p, DBL *ssError, DBL *msError,
                            DBL *ssTotal, DBL *fCritical, ErrorCode *err) {
    return InErr(err, qx::OneWay<qx::OneWayAnovaByDifferences>, y, labels, *k, alpha, ssBetween,
                 msBetween, f, p, ssError, msError, ssTotal, fCritical);
}

ErrorCode Anova2Way_head(DBL1D y, I32_1D labelsA, I32_1D labelsB, int32_t levelsA, int32_t levelsB,
                         int32_t observations, DBL1D sumsOfSquares, DBL1D degrees,
                         DBL1D meanSquares, DBL1D f, DBL1D p, DBL1D denominatorDegrees) {
    return Returned(qx::twoFactors, y, labelsA, labelsB, levelsA, levelsB, observations,
                    qx::noSignificance, sumsOfSquares, degrees, meanSquares, f, p,
                    denominatorDegrees);
}

ErrorCode Anova2Way_head_2017(DBL1D y, I32_1D labelsA, I32_1D labelsB, int32_t levelsA,
                              int32_t levelsB, int32_t observations, double significance,
                              DBL1D sumsOfSquares, DBL1D degrees, DBL1D meanSquares, DBL1D f,
                              DBL1D p, DBL1D denominatorDegrees, DBL1D critical) {
    return Returned(qx::twoFactorsCritical, y, labelsA, labelsB, levelsA, levelsB, observations,
                    &significance, sumsOfSquares, degrees, meanSquares, f, p, denominatorDegrees,
                    critical);
}

ErrorCode ANOVA3Way_head(DBL1D y, I32_1D labelsA, I32_1D labelsB, I32_1D labelsC, int32_t levelsA,
                         int32_t levelsB, int32_t levelsC, int32_t observations,
                         DBL1D sumsOfSquares, DBL1D degrees, DBL1D meanSquares, DBL1D f, DBL1D p,
                         DBL1D denominatorDegrees) {
    return Returned(qx::threeFactors, y, labelsA, labelsB, labelsC, levelsA, levelsB, levelsC,
                    observations, qx::noSignificance, sumsOfSquares, degrees, meanSquares, f, p,
                    denominatorDegrees);
}

ErrorCode ANOVA3Way_head_2017(DBL1D y, I32_1D labelsA, I32_1D labelsB, I32_1D labelsC,
                              int32_t levelsA, int32_t levelsB, int32_t levelsC,
                              int32_t observations, double significance, DBL1D sumsOfSquares,
                              DBL1D degrees, DBL1D meanSquares, DBL1D f, DBL1D p,
                              DBL1D denominatorDegrees, DBL1D critical) {
    return Returned(qx::threeFactorsCritical, y, labelsA, labelsB, labelsC, levelsA, levelsB,
                    levelsC, observations, &significance, sumsOfSquares, degrees, meanSquares, f, p,
                    denominatorDegrees, critical);
}
