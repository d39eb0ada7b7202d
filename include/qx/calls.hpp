#ifndef QX_CALLS_HPP
#define QX_CALLS_HPP

// The common parts of qx/qx.hpp: failures, results, matrices, and the arrays of a call. C++20, with
// or without exceptions.

#include "qx/elements.hpp"
#include "qx/errors.h"
#include "qx/host.h"

#include <algorithm>
#include <complex>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <iterator>
#include <new>
#include <span>
#include <stdexcept>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#if defined(__cpp_exceptions) || defined(_CPPUNWIND)
#define QX_EXCEPTIONS 1
#else
#define QX_EXCEPTIONS 0
#endif

namespace qx {

// The outcome of a call: 0, a warning (positive), or a failure with the argument that its code
// refers to; the argument is empty if the code refers to several or to none.
struct Status {
    const char *function = "";
    const char *argument = "";
    ErrorCode code = QXSuccess;

    // Some exports pass on the host's own statuses.
    bool failed() const { return code < 0 || code == QXHostBadArgument || code == QXHostNoMemory; }
    const char *name() const { return QXHostErrorName(code); }
    const char *text() const { return QXHostErrorText(code); }
};

#if QX_EXCEPTIONS
// A failure as an exception, for example "stats::moment, order: The order, degree or number of taps
// is out of range; it must be at least 1. (ErrOrderNotPositive)".
class Error : public std::runtime_error {
public:
    explicit Error(const Status &status)
        : std::runtime_error(std::string(status.function) + (*status.argument ? ", " : "") +
                             status.argument + ": " + status.text() + " (" + status.name() + ")"),
          status_(status) {}
    const char *function() const { return status_.function; }
    const char *argument() const { return status_.argument; }
    ErrorCode code() const { return status_.code; }
    const char *name() const { return status_.name(); }

private:
    Status status_;
};
#endif

// Passed as the first argument of a function or a stream: it then returns a Returned<T> and does
// not throw.
struct Returning {};
inline constexpr Returning returned{};

// Passed as the first argument of a function whose result is one array: the result is written to
// these elements, and the part of them that it fills is returned. Too few elements give
// ErrSizeMismatch for the argument "into".
template <class T>
struct Into {
    std::span<T> elements;
};
template <class Range>
auto into(Range &range) {
    return Into<std::remove_reference_t<decltype(*std::data(range))>>{
        {std::data(range), std::size(range)}};
}

// A value, or the reason why there is none.
template <class T>
class Returned {
public:
    Returned(T value, const Status &status) : value_(std::move(value)), status_(status) {}

    explicit operator bool() const { return !status_.failed(); }
    const Status &status() const { return status_; }
    ErrorCode code() const { return status_.code; }
    T &operator*() & { return value_; }
    const T &operator*() const & { return value_; }
    T *operator->() { return &value_; }
    const T *operator->() const { return &value_; }

    // The value. A failure is thrown; without exceptions it ends the program.
    T value() && {
        if (status_.failed()) {
#if QX_EXCEPTIONS
            throw Error(status_);
#else
            std::abort();
#endif
        }
        return std::move(value_);
    }

private:
    T value_;
    Status status_;
};

// A matrix stored row by row: in the caller's memory, or in its own.
template <class T>
struct MatrixView {
    const T *data = nullptr;
    std::size_t rows = 0, cols = 0;
};
template <class T>
struct Matrix {
    std::size_t rows = 0, cols = 0;
    std::vector<T> values; // rows times cols

    Matrix() = default;
    Matrix(std::size_t r, std::size_t c) : rows(r), cols(c), values(r * c) {}
    Matrix(std::size_t r, std::size_t c, std::vector<T> all)
        : rows(r), cols(c), values(std::move(all)) {}

    T &operator()(std::size_t row, std::size_t col) { return values[row * cols + col]; }
    const T &operator()(std::size_t row, std::size_t col) const { return values[row * cols + col]; }
    // A matrix that does not have rows times cols values is empty.
    operator MatrixView<T>() const {
        return values.size() == rows * cols ? MatrixView<T>{values.data(), rows, cols}
                                            : MatrixView<T>{};
    }
};
// Three dimensions, the last one fastest.
template <class T>
struct CubeView {
    const T *data = nullptr;
    std::size_t first = 0, second = 0, third = 0;
};

namespace detail {

// The argument that a code of a function refers to.
struct Blame {
    ErrorCode code;
    const char *argument;
};

inline CDB ToC(const std::complex<double> &z) { return {z.real(), z.imag()}; }
inline std::complex<double> FromC(const CDB &z) { return {z.re, z.im}; }

class Call {
public:
    explicit Call(const char *function) { status_.function = function; }
    bool ready() const { return !status_.failed(); }
    const Status &status() const { return status_; }

    void refuse(ErrorCode code, const char *argument) {
        if (ready()) {
            status_.code = code;
            status_.argument = argument;
        }
    }
    void ended(ErrorCode code, std::span<const Blame> blames) {
        status_.code = code;
        if (!status_.failed())
            return;
        for (const Blame &blame : blames)
            if (blame.code == code)
                status_.argument = blame.argument;
    }
    template <class T>
    Returned<T> with(T value) const {
        return {std::move(value), status_};
    }

private:
    Status status_;
};

// n factor / divisor, rounded up; the largest size if that is too large, and 0 for a factor or
// divisor that the export refuses.
inline std::size_t MostFrom(std::size_t n, int32_t factor, int32_t divisor = 1) {
    if (factor < 1 || divisor < 1)
        return 0;
    const auto times = static_cast<uint64_t>(factor), by = static_cast<uint64_t>(divisor);
    const uint64_t most = n > UINT64_MAX / times ? UINT64_MAX : n * times;
    return static_cast<std::size_t>(
        std::min<uint64_t>(most / by + (most % by != 0 ? 1 : 0), SIZE_MAX));
}

// An array of the host for one call, or for the lifetime of a stream.
template <class T>
class Array1 {
    typedef typename host::Element<T>::Handle1D Handle;

public:
    Array1() = default;
    explicit Array1(Call &call, const char *argument = "", std::span<const T> values = {})
        : handle_(values.size() <= INT32_MAX
                      ? static_cast<Handle>(QXHostCopy1D(host::Element<T>::typeCode,
                                                         static_cast<int32_t>(values.size()),
                                                         values.data()))
                      : nullptr) {
        if (handle_ == nullptr)
            call.refuse(ErrOutOfMemory, argument);
    }
    Array1(const Array1 &) = delete;
    Array1 &operator=(const Array1 &) = delete;
    Array1(Array1 &&other) noexcept : handle_(std::exchange(other.handle_, nullptr)) {}
    Array1 &operator=(Array1 &&other) noexcept {
        std::swap(handle_, other.handle_);
        return *this;
    }
    ~Array1() { QXHostFree(handle_); }

    Handle handle() const { return handle_; }
    std::span<const T> span() const {
        return {static_cast<const T *>(QXHostElements1D(handle_)),
                static_cast<std::size_t>((*handle_)->dimSize)};
    }
    // From now on no resize up to `count` elements allocates memory.
    void reserve(Call &call, const char *argument, std::size_t count) {
        if (count > INT32_MAX ||
            QXHostReserve1D(handle_, host::Element<T>::typeCode, static_cast<int32_t>(count)) != 0)
            call.refuse(ErrOutOfMemory, argument);
    }
    // Replaces the elements; memory is allocated only if there are more than before.
    void assign(Call &call, const char *argument, std::span<const T> values) {
        void *handle = handle_;
        if (values.size() > INT32_MAX ||
            HostBlockReshape(host::Element<T>::typeCode, 1, &handle,
                             static_cast<int32_t>(values.size())) != 0) {
            call.refuse(ErrOutOfMemory, argument);
            return;
        }
        (*handle_)->dimSize = static_cast<int32_t>(values.size());
        if (!values.empty())
            std::memcpy(QXHostElements1D(handle_), values.data(), values.size_bytes());
    }

private:
    Handle handle_ = nullptr;
};

template <class T>
class Array2 {
    typedef typename host::Element<T>::Handle2D Handle;

public:
    Array2() = default;
    explicit Array2(Call &call, const char *argument = "", const MatrixView<T> &m = {})
        : handle_(m.rows <= INT32_MAX && m.cols <= INT32_MAX
                      ? static_cast<Handle>(QXHostCopy2D(host::Element<T>::typeCode,
                                                         static_cast<int32_t>(m.rows),
                                                         static_cast<int32_t>(m.cols), m.data))
                      : nullptr) {
        if (handle_ == nullptr)
            call.refuse(ErrOutOfMemory, argument);
    }
    Array2(const Array2 &) = delete;
    Array2 &operator=(const Array2 &) = delete;
    Array2(Array2 &&other) noexcept : handle_(std::exchange(other.handle_, nullptr)) {}
    Array2 &operator=(Array2 &&other) noexcept {
        std::swap(handle_, other.handle_);
        return *this;
    }
    ~Array2() { QXHostFree(handle_); }

    Handle handle() const { return handle_; }
    MatrixView<T> view() const {
        return {static_cast<const T *>(QXHostElements2D(handle_)),
                static_cast<std::size_t>((*handle_)->dimSizes[0]),
                static_cast<std::size_t>((*handle_)->dimSizes[1])};
    }

private:
    Handle handle_ = nullptr;
};

// An array of three dimensions, for input only.
template <class T, class Handle>
class Array3 {
public:
    Array3(Call &call, const char *argument, const CubeView<T> &cube)
        : handle_(cube.first <= INT32_MAX && cube.second <= INT32_MAX && cube.third <= INT32_MAX
                      ? static_cast<Handle>(QXHostCopy3D(
                            host::Element<T>::typeCode, static_cast<int32_t>(cube.first),
                            static_cast<int32_t>(cube.second), static_cast<int32_t>(cube.third),
                            cube.data))
                      : nullptr) {
        if (handle_ == nullptr)
            call.refuse(ErrOutOfMemory, argument);
    }
    Array3(const Array3 &) = delete;
    Array3 &operator=(const Array3 &) = delete;
    ~Array3() { QXHostFree(handle_); }
    Handle handle() const { return handle_; }

private:
    Handle handle_;
};

// An array of records, for input only.
template <class Record, class Handle>
class Records {
public:
    Records(Call &call, const char *argument, std::span<const Record> records)
        : handle_(records.size() <= INT32_MAX
                      ? static_cast<Handle>(QXHostCopyRecords(
                            sizeof(Record), static_cast<int32_t>(records.size()), records.data()))
                      : nullptr) {
        if (handle_ == nullptr)
            call.refuse(ErrOutOfMemory, argument);
    }
    Records(const Records &) = delete;
    Records &operator=(const Records &) = delete;
    ~Records() { QXHostFree(handle_); }
    Handle handle() const { return handle_; }

private:
    Handle handle_;
};

// The plan of one call site in one thread.
class Plan {
public:
    Plan() = default;
    Plan(const Plan &) = delete;
    Plan &operator=(const Plan &) = delete;
    ~Plan() {
        if (word_ != nullptr)
            QXHostReleaseObject(word_);
    }
    template <class Slot>
    Slot *address() {
        return reinterpret_cast<Slot *>(&word_);
    }

private:
    void *word_ = nullptr;
};

template <class T>
Matrix<T> MatrixOf(const MatrixView<T> &m) {
    return {m.rows, m.cols, std::vector<T>(m.data, m.data + m.rows * m.cols)};
}
template <class T>
std::vector<T> Taken(const Array1<T> &array) {
    const std::span<const T> found = array.span();
    return std::vector<T>(found.begin(), found.end());
}
template <class T>
Matrix<T> Taken(const Array2<T> &array) {
    return MatrixOf(array.view());
}

// Runs a step that allocates memory for a container; the call fails if there is none.
template <class Step>
void Allocating([[maybe_unused]] Call &call, const Step &step) {
#if QX_EXCEPTIONS
    try {
        step();
    } catch (const std::bad_alloc &) {
        call.refuse(ErrOutOfMemory, "");
    }
#else
    step();
#endif
}
// Copies an output to a container. After a failure the container stays empty.
template <class To, class From>
void Take(Call &call, To &to, const From &from) {
    if (call.ready())
        Allocating(call, [&] { to = Taken(from); });
}
template <class T>
std::span<T> CopiedInto(Call &call, std::span<T> place, std::span<const T> found) {
    if (!call.ready())
        return {};
    if (place.size() < found.size()) {
        call.refuse(ErrSizeMismatch, "into");
        return {};
    }
    if (!found.empty())
        std::memcpy(place.data(), found.data(), found.size_bytes());
    return place.first(found.size());
}
template <class T>
void TakeInto(Call &call, std::span<T> &place, const Array1<T> &from) {
    place = CopiedInto(call, place, call.ready() ? from.span() : std::span<const T>());
}
template <class T>
void TakeInto(Call &call, std::span<T> &place, const Array2<T> &from) {
    std::span<const T> found;
    if (call.ready())
        found = {from.view().data, from.view().rows * from.view().cols};
    place = CopiedInto(call, place, found);
}

} // namespace detail
} // namespace qx

#endif
