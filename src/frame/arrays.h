#ifndef QX_FRAME_ARRAYS_H
#define QX_FRAME_ARRAYS_H

#include "frame/elements.h"
#include "frame/host_binding.h"
#include "frame/outcome.h"
#include "frame/scratch.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <tuple>
#include <type_traits>

namespace qx {

// Views of host arrays, named by the handle type in the declaration of the export: In<DBL1D>,
// Out<CDB2D>, InOut<DBL1D>. The handle determines the element, so a view of another element does
// not compile. Views read the block through the handle at every use, so that no pointer outlives a
// resize. Handles are assumed not to be null and are not tested.
//
// A block with a negative size is treated as an empty array: size(), rows() and cols() are never
// below 0. Where an export has a code for such a block, its body asks hasNegativeSize().

// The element and the number of dimensions of a handle type.
template <class Handle>
struct HandleTraits;

template <ElementType Code, int Dimensions>
struct NumericHandle {
    typedef typename Element<Code>::type T;
    static constexpr ElementType code = Code;
    static constexpr int dimensions = Dimensions;
};
template <>
struct HandleTraits<I32_1D> : NumericHandle<ElementType::I32, 1> {};
template <>
struct HandleTraits<U8_1D> : NumericHandle<ElementType::U8, 1> {};
template <>
struct HandleTraits<U32_1D> : NumericHandle<ElementType::U32, 1> {};
template <>
struct HandleTraits<SGL1D> : NumericHandle<ElementType::SGL, 1> {};
template <>
struct HandleTraits<DBL1D> : NumericHandle<ElementType::DBL, 1> {};
template <>
struct HandleTraits<CSG1D> : NumericHandle<ElementType::CSG, 1> {};
template <>
struct HandleTraits<CDB1D> : NumericHandle<ElementType::CDB, 1> {};
template <>
struct HandleTraits<I32_2D> : NumericHandle<ElementType::I32, 2> {};
template <>
struct HandleTraits<DBL2D> : NumericHandle<ElementType::DBL, 2> {};
template <>
struct HandleTraits<CDB2D> : NumericHandle<ElementType::CDB, 2> {};

// An input array of records: template <> struct HandleTraits<HistInterval1D>
//     : RecordHandle<HistInterval> {};
template <class Record>
struct RecordHandle {
    typedef Record T;
    static constexpr int dimensions = 1;
};

// What can be read from a block of one or two dimensions.
template <class Handle, int Dimensions = HandleTraits<Handle>::dimensions>
class Block;

template <class Handle>
class Block<Handle, 1> {
public:
    typedef typename HandleTraits<Handle>::T T;

    int32_t size() const { return std::max((*handle_)->dimSize, 0); }
    bool isEmpty() const { return size() < 1; }
    bool hasNegativeSize() const { return (*handle_)->dimSize < 0; }

protected:
    typedef Array1DHandle AnyHandle;
    explicit Block(AnyHandle handle) : handle_(handle) {}
    T *elements() const { return reinterpret_cast<T *>(&(*handle_)[1]); }
    std::size_t bytes() const {
        return sizeof(Array1DBlock) + sizeof(T) * static_cast<std::size_t>(size());
    }
    AnyHandle handle_;
};

template <class Handle>
class Block<Handle, 2> {
public:
    typedef typename HandleTraits<Handle>::T T;

    int32_t rows() const { return std::max((*handle_)->dimSizes[0], 0); }
    int32_t cols() const { return std::max((*handle_)->dimSizes[1], 0); }
    bool isEmpty() const { return rows() < 1 || cols() < 1; }
    bool isSquare() const { return rows() == cols(); }
    bool hasNegativeSize() const {
        return (*handle_)->dimSizes[0] < 0 || (*handle_)->dimSizes[1] < 0;
    }

protected:
    typedef Array2DHandle AnyHandle;
    explicit Block(AnyHandle handle) : handle_(handle) {}
    T *elements() const { return reinterpret_cast<T *>(&(*handle_)[1]); }
    std::size_t bytes() const {
        return sizeof(Array2DBlock) +
               sizeof(T) * static_cast<std::size_t>(rows()) * static_cast<std::size_t>(cols());
    }
    AnyHandle handle_;
};

// The view of a block of numbers for inner routines (frame/views.h).
template <bool Writable, class Handle>
auto ViewOf(const Block<Handle> &block,
            typename detail::ViewedElement<HandleTraits<Handle>::code, Writable>::type *elements) {
    if constexpr (HandleTraits<Handle>::dimensions == 1)
        return BasicVectorView<HandleTraits<Handle>::code, Writable>(elements, block.size());
    else
        return BasicMatrixView<HandleTraits<Handle>::code, Writable>(elements, block.rows(),
                                                                     block.cols());
}

// An input.
template <class Handle>
class In : public Block<Handle> {
    typedef Block<Handle> Base;

public:
    In(Handle handle) : Base(reinterpret_cast<typename Base::AnyHandle>(handle)) {}
    const typename Base::T *data() const { return this->elements(); }
    // The elements for inner routines, until the next resize of an output.
    auto view() const { return ViewOf<false>(*this, this->elements()); }

    // For the frame: an input that is also an output of the call reads from a copy from here on.
    auto inputs() { return std::tie(*this); }
    const void *identity() const { return this->handle_; }
    ErrorCode readCopyIn(ScratchBytes &memory, void *&block) {
        // Scratch memory starts at any byte; the size fields of a block are aligned.
        constexpr std::size_t alignment = alignof(int32_t);
        const std::size_t size = this->bytes();
        if (const ErrorCode failed = memory.allocate(static_cast<int64_t>(size + alignment - 1)))
            return failed;
        const std::size_t beyond = reinterpret_cast<std::uintptr_t>(memory.bytes()) % alignment;
        block = static_cast<char *>(memory.bytes()) + (alignment - beyond) % alignment;
        std::memcpy(block, *this->handle_, size);
        this->handle_ = reinterpret_cast<typename Base::AnyHandle>(&block);
        return 0;
    }
};

// An input that the export uses as work memory: its elements are overwritten, its size is kept, and
// a failure does not empty it.
template <class Handle>
class Spoiled : public In<Handle> {
public:
    using In<Handle>::In;
    typename In<Handle>::T *data() const { return this->elements(); }
    auto view() const { return ViewOf<true>(*this, this->elements()); }
};

// An output. EmptyCode is the element type that the host is given when the output is emptied; it
// differs from the element's own in only a few exports. A failure empties the output unless it is
// Kept.
//
// A view takes the address of the frame's own handle argument: the host receives that address and
// may replace the handle.
enum class OnFailure { Empty, Keep };

template <class Handle, OnFailure Failure = OnFailure::Empty,
          ElementType EmptyCode = HandleTraits<Handle>::code>
class Out : public Block<Handle> {
    typedef Block<Handle> Base;
    typedef typename Base::AnyHandle AnyHandle;
    static constexpr auto code = static_cast<int32_t>(HandleTraits<Handle>::code);
    static constexpr int dimensions = HandleTraits<Handle>::dimensions;

public:
    Out(Handle &handle)
        : Base(reinterpret_cast<AnyHandle>(handle)),
          address_(reinterpret_cast<AnyHandle *>(&handle)) {}

    typename Base::T *data() const { return this->elements(); }
    // The elements for inner routines, until the next resize.
    auto view() const { return ViewOf<true>(*this, this->elements()); }

    Outcome resize(int32_t count) requires(dimensions == 1) {
        const int32_t hostStatus = reshape(code, count);
        if (hostStatus == 0)
            (*this->handle_)->dimSize = count;
        return Outcome::OfHost(hostStatus);
    }
    // The host takes the count as an int32. A product that wraps would give a block smaller than
    // its dimensions, so such a request is refused as out of memory.
    static bool mayHave(int32_t rows, int32_t cols) requires(dimensions == 2) {
        return int64_t{rows} * cols <= std::numeric_limits<int32_t>::max();
    }
    Outcome resize(int32_t rows, int32_t cols) requires(dimensions == 2) {
        const int64_t count = int64_t{rows} * cols;
        if (!mayHave(rows, cols))
            return ErrOutOfMemory;
        const int32_t hostStatus = reshape(code, static_cast<int32_t>(count));
        if (hostStatus == 0)
            setSizes(rows, cols);
        return Outcome::OfHost(hostStatus);
    }

    // Rows become columns; the elements have already been rearranged in place.
    void exchangeSizes() requires(dimensions == 2) { setSizes(this->cols(), this->rows()); }

    // Sets the sizes to 0 even if the host refuses.
    void empty() {
        reshape(static_cast<int32_t>(EmptyCode), 0);
        if constexpr (dimensions == 1)
            (*this->handle_)->dimSize = 0;
        else
            setSizes(0, 0);
    }
    void settleFailure() {
        if constexpr (Failure == OnFailure::Empty)
            empty();
    }

    // For the frame.
    auto outputs() const { return std::tuple(identity()); }
    const void *identity() const { return this->handle_; }

private:
    int32_t reshape(int32_t typeCode, int32_t count) {
        const int32_t hostStatus = HostBlockReshape(typeCode, dimensions, address_, count);
        this->handle_ = *address_;
        return hostStatus;
    }
    void setSizes(int32_t rows, int32_t cols) {
        (*this->handle_)->dimSizes[0] = rows;
        (*this->handle_)->dimSizes[1] = cols;
    }
    AnyHandle *address_;
};

// An array that is both input and output: an output whose content is read first.
template <class Handle, OnFailure Failure = OnFailure::Empty>
using InOut = Out<Handle, Failure>;

// The value that a failure leaves in a scalar output: 0 for integers and records of integers,
// otherwise the quiet NaN.
template <class T>
inline constexpr bool FailsToZero = std::is_integral_v<T>;

// A scalar output, or a record of numbers of one kind. A failure sets it to a value that is defined
// to the bit.
template <class T>
class OutValue {
public:
    OutValue(T *address) : address_(address) {}
    T *address() const { return address_; }
    void operator=(const T &value) const { *address_ = value; }
    void settleFailure() const {
        if constexpr (FailsToZero<T>) {
            *address_ = T{};
        } else {
            constexpr uint64_t quietNaN = 0x7FF8000000000000;
            static_assert(sizeof(T) % sizeof quietNaN == 0);
            for (std::size_t at = 0; at < sizeof(T); at += sizeof quietNaN)
                std::memcpy(reinterpret_cast<char *>(address_) + at, &quietNaN, sizeof quietNaN);
        }
    }

private:
    T *address_;
};
typedef OutValue<double> OutDBL;
typedef OutValue<int32_t> OutI32;
typedef OutValue<CDB> OutCDB;

} // namespace qx

#endif
