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

// A source of blocks of rows: a function object (const RowBlock &) that must outlive this. It
// allows a model of any length to be solved with a few thousand elements of memory.
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

// n rows of k columns and the target, unweighted; the weights count as |w|, and may be absent.
struct LinearModel {
    ModelRows rows;
    int32_t n, k;
    const DBL *w;
};

} // namespace qx

#endif
