#ifndef QX_FIT_SEQUENTIAL_QR_H
#define QX_FIT_SEQUENTIAL_QR_H

#include "fit/model_rows.h"
#include "frame/scratch.h"

namespace qx {

// Reads the rows of a linear model block by block, for work that passes over them once.
class RowStream {
public:
    // ErrOutOfMemory. A block holds about 24 kB, to stay in the first cache, but at least 64 rows.
    ErrorCode open(const LinearModel &model);
    // Sets *block to the next block; returns false after the last one.
    bool next(RowBlock *block);

private:
    const LinearModel *model_ = nullptr;
    int32_t capacity_ = 0, done_ = 0;
    Scratch<ElementType::DBL> memory_;
};

// The triangle R of a QR factorisation of the weighted rows and Q^T y beside it, by Householder
// reflections of each block of rows in turn against the triangle so far (G. H. Golub, "Numerical
// methods for solving linear least squares problems", 1965; the sequential form is that of J.
// Demmel, L. Grigori, M. Hoemmen, J. Langou, "Communication-optimal parallel and sequential QR and
// LU factorizations", 2012). Q is never formed. The method is as stable as the factorisation of all
// rows at once, and reads each row once.
class SequentialQR {
public:
    // ErrOutOfMemory; ErrNonFiniteInput if a weighted element of H is not finite. A target that is
    // not finite affects only the target column.
    ErrorCode reduce(const LinearModel &model);

    // Row i of R, valid from its diagonal element on; element i of Q^T y is at index k.
    DBL *row(int32_t i) const { return memory_.data() + i * stride(); }
    std::ptrdiff_t stride() const { return std::ptrdiff_t{k_} + 1; }
    double target(int32_t i) const { return row(i)[k_]; }

private:
    void reflect(int32_t j, const RowBlock &block);

    int32_t k_ = 0;
    Scratch<ElementType::DBL> memory_; // R, and k + 1 products
};

} // namespace qx

#endif
