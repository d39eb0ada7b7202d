#include "stats/anova.h"

#include "frame/export.h"
#include "qx/anova.h"

namespace qx {
namespace {

ErrorCode Contingency(In<I32_2D> table, OutDBL chiSquare, OutDBL p) {
    if (table.hasNegativeSize())
        return ErrTableNegativeSize;
    return ContingencyTest(table.data(), table.rows(), table.cols(), chiSquare.address(),
                           p.address());
}

ErrorCode OneWay(In<DBL1D> y, In<I32_1D> labels, int32_t k, double alpha, OutDBL ssBetween,
                 OutDBL msBetween, OutDBL f, OutDBL p, OutDBL ssError, OutDBL msError,
                 OutDBL ssTotal, OutDBL fCritical) {
    if (const ErrorCode failed = FirstFailed(
            {{y.size() != labels.size(), ErrSizeMismatch}, {y.isEmpty(), ErrEmptyInput}}))
        return failed;
    OneWayTable table = {};
    const ErrorCode status = OneWayAnova(y.data(), labels.data(), y.size(), k, alpha, &table);
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

} // namespace
} // namespace qx

using qx::InErr;

int32_t Contingency_head(I32_2D table, DBL *chiSquare, DBL *p, ErrorCode *err) {
    return InErr(err, qx::Contingency, table, chiSquare, p);
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
    return InErr(err, qx::OneWay, y, labels, *k, alpha, ssBetween, msBetween, f, p, ssError,
                 msError, ssTotal, fCritical);
}
