#ifndef QX_FFT_ABREAST_H
#define QX_FFT_ABREAST_H

#include "fft/plan.h"
#include "frame/heap_block.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstddef>
#include <cstdint>

namespace qx {

// The forward transforms of neighbouring columns of a matrix of interleaved complex values. They run
// abreast, one column in each pair of lanes, so that rows are read and written as they are. The bits are
// those of a transform of each column alone.
class ColumnsAbreast {
public:
    // Whether a plan has what is needed: kernels for all its factors.
    static bool suit(const FFTPlan &plan);

    // For matrices with so many columns. The plan must suit. ErrOutOfMemory.
    ErrorCode prepare(const FFTPlan &plan, int32_t cols);

    // The number of columns to transform at a time, at most mostAbreast.
    int32_t atOnce() const { return atOnce_; }

    // Transforms columns of which row r is at in + r inPitch, in DBL units, and writes row k of the results
    // to out + k outPitch. The two may be the same memory with the same pitch.
    void transform(const DBL *in, std::ptrdiff_t inPitch, DBL *out, std::ptrdiff_t outPitch,
                   int32_t columns) const;
    // The same with the results in memory of this object, until the next call.
    void transform(const DBL *in, std::ptrdiff_t inPitch, int32_t columns) const;
    // Row k of these results. Rows of one block of blockRows() are `pitch` DBL units apart.
    int32_t blockRows() const { return m_; }
    std::ptrdiff_t pitch() const { return rows_.pitch; }
    const DBL *result(int32_t k) const {
        return blocks_ + k / m_ * rows_.leg + k % m_ * rows_.pitch;
    }

private:
    void blocksOf(int32_t level, int32_t n, const DBL *in, std::ptrdiff_t inPitch, DBL *out,
                  int32_t columns) const;
    void topBlocks(const DBL *in, std::ptrdiff_t inPitch, int32_t columns) const;

    const FFTPlan *plan_ = nullptr;
    AbreastLeaf whole_ = nullptr; // for a length that is transformed in one piece
    int32_t atOnce_ = 0;
    int32_t m_ = 1;  // the rows of a block of the first factor
    BlockRows rows_; // where these rows are
    HeapBlock<ElementType::DBL> memory_;
    DBL *blocks_ = nullptr;
};

} // namespace qx

#endif
