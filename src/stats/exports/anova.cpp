#include "qx/anova.h"

#include "frame/finish.h"
#include "frame/views.h"
#include "stats/anova.h"

using qx::ElementType;
using qx::In1D;
using qx::In2D;

int32_t Contingency_head(I32_2D table, DBL *chiSquare, DBL *p, ErrorCode *err) {
    const In2D<ElementType::I32> counts(table);
    return qx::Report(
        err, qx::ContingencyTest(counts.data(), counts.rows(), counts.cols(), chiSquare, p),
        chiSquare, p);
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
    const In1D<ElementType::DBL> data(y);
    const In1D<ElementType::I32> levels(labels);
    const int32_t n = data.size();
    ErrorCode status =
        qx::FirstFailed({{n != levels.size(), ErrSizeMismatch}, {n < 1, ErrEmptyInput}});
    qx::OneWayTable table = {};
    if (status == 0)
        status = qx::OneWayAnova(data.data(), levels.data(), n, *k, alpha, &table);
    *ssBetween = table.ssBetween;
    *msBetween = table.msBetween;
    *f = table.f;
    *p = table.p;
    *ssError = table.ssError;
    *msError = table.msError;
    *ssTotal = table.ssTotal;
    *fCritical = table.fCritical;
    return qx::Report(err, status, ssBetween, msBetween, f, p, ssError, msError, ssTotal,
                      fCritical);
}
