#ifndef QX_FFT_INPUT_WINDOW_H
#define QX_FFT_INPUT_WINDOW_H

#include "frame/scratch.h"

#include <cstdint>

namespace qx {

// The `size` values of an input that a transform reads from `offset` on: the input itself if it
// contains them all, else a scratch copy with zeros before the input's start and after its end.
template <ElementType Code>
class InputWindow {
public:
    typedef typename Element<Code>::type T;

    ErrorCode take(const T *in, int32_t n, int32_t offset, int32_t size) {
        if (offset >= 0 && int64_t{n} - offset >= size) {
            data_ = in + offset;
            return 0;
        }
        if (const ErrorCode failed = copy_.allocate(size))
            return failed;
        for (int32_t j = 0; j < size; ++j) {
            const int64_t i = int64_t{offset} + j;
            copy_[j] = i >= 0 && i < n ? in[i] : T{};
        }
        data_ = copy_.data();
        return 0;
    }

    const T *data() const { return data_; }
    ErrorCode release() { return copy_.release(); }

private:
    const T *data_ = nullptr;
    Scratch<Code> copy_;
};

} // namespace qx

#endif
