#ifndef QX_LINALG_FACTORISATIONS_ROTATIONS_H
#define QX_LINALG_FACTORISATIONS_ROTATIONS_H

#include "linalg/kernels.h"

namespace qx {

// Collects rotations of the rows of one matrix and applies them many at a time, so that a panel of
// columns passes through hundreds of them while it is in the cache. Their order is kept. Without a
// matrix they are discarded.
class RotationQueue {
public:
    RotationQueue() = default;
    explicit RotationQueue(const RealMatrix &a) : a_(a) {}
    RotationQueue(const RotationQueue &) = delete;
    RotationQueue &operator=(const RotationQueue &) = delete;
    ~RotationQueue() { flush(); }

    void add(int32_t p, int32_t q, double c, double s) {
        if (a_.isEmpty())
            return;
        rotations_[count_++] = {p, q, c, s};
        if (count_ == capacity)
            flush();
    }
    void flush() {
        if (count_ > 0)
            RotateRows(a_.data(), a_.stride(), a_.cols(), rotations_, count_);
        count_ = 0;
    }

private:
    static constexpr int32_t capacity = 512;
    RealMatrix a_;
    int32_t count_ = 0;
    Rotation rotations_[capacity];
};

} // namespace qx

#endif
