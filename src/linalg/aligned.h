#ifndef QX_LINALG_ALIGNED_H
#define QX_LINALG_ALIGNED_H

#include "frame/scratch.h"

#include <cstdint>
#include <limits>

namespace qx {

// A scratch block at a multiple of 64 bytes, for LAPACK: its compiled code may count on the
// alignment of its elements, which scratch memory does not promise.
template <ElementType E>
class AlignedScratch {
    typedef typename Element<E>::type T;

public:
    ErrorCode allocate(int64_t count) {
        if (count < 0 || count > std::numeric_limits<int32_t>::max())
            return ErrOutOfMemory;
        return block_.allocate(count * int64_t{sizeof(T)} + alignment - 1);
    }
    T *data() const {
        const auto address = reinterpret_cast<std::uintptr_t>(block_.bytes());
        return reinterpret_cast<T *>((address + alignment - 1) & ~std::uintptr_t{alignment - 1});
    }
    T &operator[](std::ptrdiff_t i) const { return data()[i]; }

private:
    static constexpr int64_t alignment = 64;
    ScratchBytes block_;
};

} // namespace qx

#endif
