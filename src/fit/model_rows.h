#ifndef QX_FIT_MODEL_ROWS_H
#define QX_FIT_MODEL_ROWS_H

#include "qx/types.h"

#include <cstddef>

namespace qx {

// Consecutive rows of a linear model H c = y: the columns of H one after the other, then y.
struct RowBlock {
    int32_t first, count; // the samples
    DBL *start;
    DBL *column(int32_t j) const { return start + std::ptrdiff_t{j} * count; }
};

// Whoever can write blocks of rows: a function object (const RowBlock &) that outlives this. So a
// model of any length is solved for with a few thousand elements of memory.
class ModelRows {
public:
    template <class Writer>
    ModelRows(const Writer &writer)
        : writer_(&writer), write_([](const void *self, const RowBlock &block) {
              (*static_cast<const Writer *>(self))(block);
          }) {}
    void write(const RowBlock &block) const { write_(writer_, block); }

private:
    const void *writer_;
    void (*write_)(const void *writer, const RowBlock &block);
};

// n rows of k columns and the target, unweighted; the weights count as |w|, or there are none.
struct LinearModel {
    ModelRows rows;
    int32_t n, k;
    const DBL *w;
};

} // namespace qx

#endif
