#ifndef QX_CALCULUS_VOLUME_H
#define QX_CALCULUS_VOLUME_H

#include "frame/arrays.h"
#include "qx/calculus.h"

#include <algorithm>

namespace qx {

// The view of a block of three dimensions, In<DBL3D>; no other family uses such blocks, and they
// are never outputs.
template <>
struct HandleTraits<DBL3D> : NumericHandle<ElementType::DBL, 3> {};

template <class Handle>
class Block<Handle, 3> {
public:
    typedef typename HandleTraits<Handle>::T T;

    int32_t dimension(int which) const { return std::max((*handle_)->dimSizes[which], 0); }

protected:
    typedef Array3DHandle AnyHandle;
    explicit Block(AnyHandle handle) : handle_(handle) {}
    T *elements() const { return reinterpret_cast<T *>(&(*handle_)[1]); }
    std::size_t bytes() const {
        std::size_t count = sizeof(T);
        for (const int which : {0, 1, 2})
            count *= static_cast<std::size_t>(dimension(which));
        return sizeof(Array3DBlock) + count;
    }
    AnyHandle handle_;
};

} // namespace qx

#endif
