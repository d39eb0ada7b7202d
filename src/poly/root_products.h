#ifndef QX_POLY_ROOT_PRODUCTS_H
#define QX_POLY_ROOT_PRODUCTS_H

#include "frame/complex.h"
#include "frame/elements.h"
#include "linalg/scalar.h"
#include "poly/sylvester_matrices.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The descending coefficients of a product to which factors x - root are added one by one.
class GrowingProduct {
public:
    GrowingProduct(CDB *coefficients) : a_(coefficients) { a_[0] = {1.0, 0.0}; }
    void multiply(CDB root) {
        a_[degree_ + 1] = {};
        SubtractShifted(root, degree_ + 1, a_);
        ++degree_;
    }

private:
    CDB *a_;
    int32_t degree_ = 0;
};

// Leja's order, in which multiplying the factors keeps the coefficients of their product accurate:
// each root is the one farthest from those before it, by the product of the distances; the first is
// the largest. logSize(j) and logDistance(j, i) are logarithms of the modulus of root j and of its
// distance from root i. `sums` is work memory.
template <class LogSize, class LogDistance>
void LejaOrder(int32_t count, LogSize logSize, LogDistance logDistance, I32 *order, DBL *sums) {
    for (int32_t j = 0; j < count; ++j) {
        order[j] = j;
        sums[j] = logSize(j);
    }
    for (int32_t i = 0; i < count; ++i) {
        int32_t next = i;
        for (int32_t j = i + 1; j < count; ++j)
            if (sums[order[j]] > sums[order[next]])
                next = j;
        Swap(&order[i], &order[next]);
        for (int32_t j = i + 1; j < count; ++j) {
            const double distance = logDistance(order[j], order[i]);
            sums[order[j]] = (i == 0 ? 0.0 : double(sums[order[j]])) + distance;
        }
    }
}

} // namespace qx

#endif
