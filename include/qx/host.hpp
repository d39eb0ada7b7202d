#ifndef QX_HOST_HPP
#define QX_HOST_HPP

// The stand-in host for C++ programs: arrays and plan words that clean up after themselves.
//
//     qx::host::Array1D<double> x{1.0, 2.0, 4.0};
//     double mean;
//     ErrorCode status;
//     Mean_head(x.handle(), &mean, &status);
//     qx::host::check(status);

#include "qx/elements.hpp"
#include "qx/host.h"

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <new>
#include <span>
#include <stdexcept>
#include <utility>

namespace qx::host {

// A failure of an export as an exception. Warnings do not throw.
class Error : public std::runtime_error {
public:
    explicit Error(ErrorCode code) : std::runtime_error(QXHostErrorText(code)), code_(code) {}
    ErrorCode code() const { return code_; }
    const char *name() const { return QXHostErrorName(code_); }

private:
    ErrorCode code_;
};

inline ErrorCode check(ErrorCode code) {
    if (code < 0 || code == QXHostBadArgument || code == QXHostNoMemory)
        throw Error(code);
    return code;
}

// An array of one dimension. The handle stays the same for the lifetime of the array; pointers,
// spans and references to elements are valid until the next call that has the array as an output.
template <class T>
class Array1D {
    static constexpr int32_t code = Element<T>::typeCode;
    typedef typename Element<T>::Handle1D Handle;

public:
    explicit Array1D(int32_t n = 0) : handle_(owned(QXHostNew1D(code, n))) {}
    explicit Array1D(std::span<const T> values)
        : handle_(owned(values.size() <= INT32_MAX
                            ? QXHostCopy1D(code, static_cast<int32_t>(values.size()), values.data())
                            : nullptr)) {}
    Array1D(std::initializer_list<T> values)
        : Array1D(std::span<const T>(values.begin(), values.size())) {}
    Array1D(Array1D &&other) noexcept : handle_(std::exchange(other.handle_, nullptr)) {}
    Array1D &operator=(Array1D &&other) noexcept {
        std::swap(handle_, other.handle_);
        return *this;
    }
    ~Array1D() { QXHostFree(handle_); }

    Handle handle() const { return handle_; }
    int32_t size() const { return (*handle_)->dimSize; }
    T *data() const { return static_cast<T *>(QXHostElements1D(handle_)); }
    T &operator[](std::ptrdiff_t i) const { return data()[i]; }
    std::span<T> span() const { return {data(), static_cast<std::size_t>(size())}; }
    T *begin() const { return data(); }
    T *end() const { return data() + size(); }

private:
    static Handle owned(void *handle) {
        if (handle == nullptr)
            throw std::bad_alloc();
        return static_cast<Handle>(handle);
    }
    Handle handle_;
};

// An array of two dimensions, stored row by row.
template <class T>
class Array2D {
    static constexpr int32_t code = Element<T>::typeCode;
    typedef typename Element<T>::Handle2D Handle;

public:
    explicit Array2D(int32_t rows = 0, int32_t cols = 0)
        : handle_(owned(QXHostNew2D(code, rows, cols))) {}
    // Takes the values row by row; their number must be rows times cols.
    Array2D(int32_t rows, int32_t cols, std::span<const T> values)
        : handle_(owned(int64_t{rows} * cols == static_cast<int64_t>(values.size())
                            ? QXHostCopy2D(code, rows, cols, values.data())
                            : throw std::invalid_argument("rows times cols values are needed"))) {}
    Array2D(Array2D &&other) noexcept : handle_(std::exchange(other.handle_, nullptr)) {}
    Array2D &operator=(Array2D &&other) noexcept {
        std::swap(handle_, other.handle_);
        return *this;
    }
    ~Array2D() { QXHostFree(handle_); }

    Handle handle() const { return handle_; }
    int32_t rows() const { return (*handle_)->dimSizes[0]; }
    int32_t cols() const { return (*handle_)->dimSizes[1]; }
    T *data() const { return static_cast<T *>(QXHostElements2D(handle_)); }
    T &at(int32_t row, int32_t col) const { return data()[std::ptrdiff_t{row} * cols() + col]; }
    std::span<T> row(int32_t row) const { return {&at(row, 0), static_cast<std::size_t>(cols())}; }

private:
    static Handle owned(void *handle) {
        if (handle == nullptr)
            throw std::bad_alloc();
        return static_cast<Handle>(handle);
    }
    Handle handle_;
};

// The word in which a call site keeps its plan from call to call: SpectrumH(x, plan.address()).
class Slot {
public:
    Slot() = default;
    Slot(const Slot &) = delete;
    Slot &operator=(const Slot &) = delete;
    ~Slot() { release(); }

    void **address() { return &word_; }
    void release() {
        if (word_ != nullptr)
            QXHostReleaseObject(std::exchange(word_, nullptr));
    }

private:
    void *word_ = nullptr;
};

// The instance-data word of a call site of an _IDP export, with the export that releases it:
// qx::host::Instance node(TransformUnreserveProc);
template <class Result, class Word>
class Instance {
public:
    typedef Result (*Unreserve)(Word *word);

    explicit Instance(Unreserve unreserve) : unreserve_(unreserve) {}
    Instance(const Instance &) = delete;
    Instance &operator=(const Instance &) = delete;
    ~Instance() { unreserve_(&word_); }

    Word *address() { return &word_; }

private:
    Unreserve unreserve_;
    Word word_ = nullptr;
};
template <class Result, class Word>
Instance(Result (*)(Word *)) -> Instance<Result, Word>;

} // namespace qx::host

#endif
