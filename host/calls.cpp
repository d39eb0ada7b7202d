#include "qx/host.h"

void QXHostCallsOfComplex(QXHostOfComplex function, int64_t count, const CDB *z,
                          const int32_t *selector, CDB *result, ErrorCode *codes) {
    for (int64_t i = 0; i < count; ++i)
        codes[i] = function(z + i, selector[i], result + i);
}

void QXHostCallsOfOrderAndComplex(QXHostOfOrderAndComplex function, int64_t count,
                                  const double *order, const CDB *z, const int32_t *selector,
                                  CDB *result, ErrorCode *codes) {
    for (int64_t i = 0; i < count; ++i)
        codes[i] = function(order[i], z + i, selector[i], result + i);
}
