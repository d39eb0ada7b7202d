#ifndef QX_TESTS_HOSTILE_HOST_H
#define QX_TESTS_HOSTILE_HOST_H

#include "frame/elements.h"
#include "qx/errors.h"

#include <cstdint>
#include <functional>
#include <initializer_list>
#include <utility>
#include <vector>

// A host that exposes errors in the frame. It is part of the test program, which exports the names
// that the module looks up. Every successful reshape moves the block, poisons the old one and keeps
// it for a while to detect late writes; both ends of every block are guarded, under the address
// sanitizer against reads as well; elements of 1-D blocks are at addresses that are 4 modulo 16;
// new bytes hold a pattern that does not resemble any result.

namespace qx::test {

struct Reshape {
    int32_t typeCode;
    int32_t numDims;
    int32_t count;
    bool operator==(const Reshape &) const = default;
};

// The reshapes and failures of the calling thread; several threads do not disturb each other.
struct HostRecord {
    std::vector<Reshape> reshapes; // in order, refused ones included
    int32_t failAt = 0;            // the n-th reshape from the last reset fails; 0 for none
    int32_t failStatus = 0;        // the status of that failure
    int32_t sweepStatus = 0;       // the status of registering a sweep; nonzero refuses it
    // Larger blocks are refused with the host's out-of-memory status. The default exceeds what any
    // test needs and prevents absurd requests from being granted lazily.
    std::size_t largestBlock = std::size_t{1} << 30;
    // The byte that fills a new block: about -1e-128 as double, about -1.5e9 as int32. Its guards
    // hold another byte, derived from this one.
    unsigned char freshByte = 0xA5;
    // Called before each reshape.
    std::function<void()> atReshape = nullptr;
};
HostRecord &Host();
// Releases the record of the calling thread, which makes no more calls, to another thread.
void LeaveHost();
constexpr int32_t everyReshape = -1; // as `failAt`
constexpr int32_t statusNoMemory = 2;
// Clears the calling thread's record and sets which reshape fails.
void ResetHost(int32_t failAt = 0, int32_t failStatus = 0);

// Calls every registered sweep, as the host does after an aborted run. An object's sweep is
// unregistered by the call.
void RunSweeps();
// The same for the sweep that was registered with this argument, if there is one.
void RunSweepOf(void *argument);
int RegisteredSweeps();

// Throws if a guard or a poisoned byte has changed; also called by every reshape and free.
void CheckBlocks();
// Checks, and frees the quarantined blocks.
void ForgetMovedBlocks();
int LiveBlocks();

// Elements with the alignment of their C++ type, for single values.
template <ElementType Code>
struct Plain {
    typedef typename Element<Code>::type type;
};
template <>
struct Plain<ElementType::DBL> {
    typedef double type;
};
template <>
struct Plain<ElementType::SGL> {
    typedef float type;
};
template <>
struct Plain<ElementType::I32> {
    typedef int32_t type;
};
template <>
struct Plain<ElementType::U32> {
    typedef uint32_t type;
};

// The handle type of an element.
template <ElementType Code>
struct Handles;
#define QX_TEST_HANDLES(element, one, two)                                                         \
    template <>                                                                                    \
    struct Handles<ElementType::element> {                                                         \
        typedef one OneD;                                                                          \
        typedef two TwoD;                                                                          \
    };
QX_TEST_HANDLES(I32, I32_1D, I32_2D)
QX_TEST_HANDLES(U8, U8_1D, void)
QX_TEST_HANDLES(U32, U32_1D, void)
QX_TEST_HANDLES(SGL, SGL1D, void)
QX_TEST_HANDLES(DBL, DBL1D, DBL2D)
QX_TEST_HANDLES(CSG, CSG1D, void)
QX_TEST_HANDLES(CDB, CDB1D, CDB2D)
#undef QX_TEST_HANDLES
template <ElementType Code>
using Handle1D = typename Handles<Code>::OneD;
template <ElementType Code>
using Handle2D = typename Handles<Code>::TwoD;

namespace detail {
// A block of records has the type code 0 and cannot be resized.
void *NewBlock(int32_t numDims, int32_t typeCode, std::size_t elementSize, int32_t rows,
               int32_t cols);
void FreeBlock(void *handle);
std::size_t BlockSize(void *handle); // sizes and elements
int32_t ReshapeBlock(int32_t typeCode, int32_t numDims, void *handleAddress, int32_t count);
int32_t RegisterSweep(int32_t (*procedure)(void *), void *argument, int32_t mode);
} // namespace detail

// Test arrays: blocks of the hostile host with access to their elements.
template <ElementType Code>
class Array1D {
public:
    typedef typename Element<Code>::type T;
    typedef typename Plain<Code>::type Value;

    explicit Array1D(int32_t n = 0)
        : handle_(static_cast<Handle1D<Code>>(
              detail::NewBlock(1, static_cast<int32_t>(Code), sizeof(T), n, 0))) {}
    Array1D(std::initializer_list<Value> values) : Array1D(static_cast<int32_t>(values.size())) {
        assign(values);
    }
    template <class Range, class = decltype(std::declval<const Range &>().begin())>
    explicit Array1D(const Range &values) : Array1D(static_cast<int32_t>(values.size())) {
        assign(values);
    }
    ~Array1D() { detail::FreeBlock(handle_); }
    Array1D(const Array1D &) = delete;
    Array1D &operator=(const Array1D &) = delete;

    Handle1D<Code> handle() const { return handle_; }
    // Resizes the block as a host does.
    void resize(int32_t n) {
        detail::ReshapeBlock(static_cast<int32_t>(Code), 1, &handle_, n);
        (*handle_)->dimSize = n;
    }
    int32_t size() const { return (*handle_)->dimSize; }
    T *data() const { return reinterpret_cast<T *>(*handle_ + 1); }
    // By value: a reference would bind to an address without the alignment of its type.
    Value operator[](std::ptrdiff_t i) const { return data()[i]; }
    std::vector<Value> values() const { return std::vector<Value>(data(), data() + size()); }

private:
    template <class Range>
    void assign(const Range &values) {
        T *next = data();
        for (const Value &value : values)
            *next++ = value;
    }
    Handle1D<Code> handle_;
};

template <ElementType Code>
class Array2D {
public:
    typedef typename Element<Code>::type T;
    typedef typename Plain<Code>::type Value;

    Array2D(int32_t rows = 0, int32_t cols = 0)
        : handle_(static_cast<Handle2D<Code>>(
              detail::NewBlock(2, static_cast<int32_t>(Code), sizeof(T), rows, cols))) {}
    ~Array2D() { detail::FreeBlock(handle_); }
    Array2D(const Array2D &) = delete;
    Array2D &operator=(const Array2D &) = delete;

    Handle2D<Code> handle() const { return handle_; }
    void resize(int32_t rows, int32_t cols) {
        detail::ReshapeBlock(static_cast<int32_t>(Code), 2, &handle_, rows * cols);
        (*handle_)->dimSizes[0] = rows;
        (*handle_)->dimSizes[1] = cols;
    }
    int32_t rows() const { return (*handle_)->dimSizes[0]; }
    int32_t cols() const { return (*handle_)->dimSizes[1]; }
    int32_t size() const { return rows() * cols(); }
    T *data() const { return reinterpret_cast<T *>(*handle_ + 1); }
    Value at(int32_t row, int32_t col) const { return data()[std::ptrdiff_t{row} * cols() + col]; }
    // By value: a reference would bind to an address without the alignment of its type.
    Value operator[](std::ptrdiff_t i) const { return data()[i]; }
    std::vector<Value> values() const { return std::vector<Value>(data(), data() + size()); }

private:
    Handle2D<Code> handle_;
};

using DBLArray = Array1D<ElementType::DBL>;
using CDBArray = Array1D<ElementType::CDB>;
using I32Array = Array1D<ElementType::I32>;
using DBLMatrix = Array2D<ElementType::DBL>;
using CDBMatrix = Array2D<ElementType::CDB>;

} // namespace qx::test

#endif
