#ifndef QX_FRAME_VIEWS_H
#define QX_FRAME_VIEWS_H

#include "frame/arrays.h"
#include "frame/elements.h"
#include "frame/host_binding.h"
#include "qx/errors.h"

#include <limits>

namespace qx {

// The views that frame/arrays.h replaces.
//
// Views of host arrays. They hold the handle and read the block through it at every use, so
// that no pointer outlives a resize. Handles are never null and are not tested.

template <class Handle, ElementType Code, int Dimensions>
concept HandleOf = HandleTraits<Handle>::code == Code && HandleTraits<Handle>::dimensions == Dimensions;

template <ElementType Code>
class In1D {
public:
    typedef typename Element<Code>::type T;

    template <class Handle>
        requires HandleOf<Handle, Code, 1>
    explicit In1D(Handle handle) : handle_(reinterpret_cast<Array1DHandle>(handle)) {}
    int32_t size() const { return (*handle_)->dimSize; }
    const T *data() const { return reinterpret_cast<const T *>(&(*handle_)[1]); }

private:
    Array1DHandle handle_;
};

template <ElementType Code>
class In2D {
public:
    typedef typename Element<Code>::type T;

    template <class Handle>
        requires HandleOf<Handle, Code, 2>
    explicit In2D(Handle handle) : handle_(reinterpret_cast<Array2DHandle>(handle)) {}
    int32_t rows() const { return (*handle_)->dimSizes[0]; }
    int32_t cols() const { return (*handle_)->dimSizes[1]; }
    bool isEmpty() const { return rows() < 1 || cols() < 1; }
    const T *data() const { return reinterpret_cast<const T *>(&(*handle_)[1]); }

private:
    Array2DHandle handle_;
};

// An output. EmptyCode is the element type that the host is told when the output is emptied;
// it differs from Code only in the few exports that were written so.
//
// A view takes the address of the frame's own handle argument, because the host is given that
// address and may replace the handle itself.
template <ElementType Code, ElementType EmptyCode = Code>
class Out1D {
public:
    typedef typename Element<Code>::type T;

    template <class Handle>
        requires HandleOf<Handle, Code, 1>
    explicit Out1D(Handle &handle) : handle_(reinterpret_cast<Array1DHandle &>(handle)) {}
    int32_t size() const { return (*handle_)->dimSize; }
    T *data() const { return reinterpret_cast<T *>(&(*handle_)[1]); }

    // Resizes to `count` elements: 0 or the host's own status.
    int32_t reshape(int32_t count) const {
        const int32_t hostStatus = HostBlockReshape(static_cast<int32_t>(Code), 1, &handle_, count);
        if (hostStatus == 0)
            (*handle_)->dimSize = count;
        return hostStatus;
    }
    // The same with the host's status translated, as every family but the transforms has it.
    ErrorCode resize(int32_t count) const { return reshape(count) == 0 ? 0 : ErrOutOfMemory; }

    // The size becomes 0 even where the host refuses.
    void empty() const {
        HostBlockReshape(static_cast<int32_t>(EmptyCode), 1, &handle_, 0);
        (*handle_)->dimSize = 0;
    }

private:
    Array1DHandle &handle_;
};

template <ElementType Code, ElementType EmptyCode = Code>
class Out2D {
public:
    typedef typename Element<Code>::type T;

    template <class Handle>
        requires HandleOf<Handle, Code, 2>
    explicit Out2D(Handle &handle) : handle_(reinterpret_cast<Array2DHandle &>(handle)) {}
    int32_t rows() const { return (*handle_)->dimSizes[0]; }
    int32_t cols() const { return (*handle_)->dimSizes[1]; }
    T *data() const { return reinterpret_cast<T *>(&(*handle_)[1]); }

    // The host takes the count in int32. A product that wraps there would leave a block that is
    // smaller than its dimensions say, so it is refused as memory that cannot be had.
    int32_t reshape(int32_t rows, int32_t cols) const {
        const int64_t count = int64_t{rows} * cols;
        if (count > std::numeric_limits<int32_t>::max())
            return ErrOutOfMemory;
        const int32_t hostStatus =
            HostBlockReshape(static_cast<int32_t>(Code), 2, &handle_, static_cast<int32_t>(count));
        if (hostStatus == 0)
            setSizes(rows, cols);
        return hostStatus;
    }
    ErrorCode resize(int32_t rows, int32_t cols) const {
        return reshape(rows, cols) == 0 ? 0 : ErrOutOfMemory;
    }

    void empty() const {
        HostBlockReshape(static_cast<int32_t>(EmptyCode), 2, &handle_, 0);
        setSizes(0, 0);
    }

private:
    void setSizes(int32_t rows, int32_t cols) const {
        (*handle_)->dimSizes[0] = rows;
        (*handle_)->dimSizes[1] = cols;
    }

    Array2DHandle &handle_;
};

// An array that is input and output at once is an output whose content is read first.
template <ElementType Code>
using InOut1D = Out1D<Code>;
template <ElementType Code>
using InOut2D = Out2D<Code>;

} // namespace qx

#endif
