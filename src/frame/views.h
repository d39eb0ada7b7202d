#ifndef QX_FRAME_VIEWS_H
#define QX_FRAME_VIEWS_H

#include "frame/elements.h"
#include "frame/expects.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <type_traits>

namespace qx {

// Views of elements that are owned elsewhere. Inner routines take them in place of a pointer with
// its sizes: vectors by value, which are two words in registers, and matrices by reference, because
// a copy on the stack costs more than many operations on small matrices. They are keyed by the
// element's code and not by its C++ type, because a template argument would drop the alignment
// attribute of the element types.
//
// VectorView<E> and MatrixView<E> are writable, ConstVectorView<E> and ConstMatrixView<E> are not;
// the former convert implicitly to the latter. Inner routines that are templates of E are called as
// Solve<E>(a, b, x) and defined for both element types by
//     template ErrorCode Solve<ElementType::DBL>(...);
//     template ErrorCode Solve<ElementType::CDB>(...);
// in their source file.

namespace detail {
template <ElementType E, bool Writable>
struct ViewedElement {
    typedef const typename Element<E>::type type;
};
template <ElementType E>
struct ViewedElement<E, true> {
    typedef typename Element<E>::type type;
};
} // namespace detail

template <ElementType E, bool Writable>
class BasicVectorView {
public:
    typedef typename detail::ViewedElement<E, Writable>::type T;
    static constexpr ElementType code = E;

    BasicVectorView() = default;
    BasicVectorView(T *data, std::ptrdiff_t size) : data_(data), size_(size) {
        QX_EXPECTS(size >= 0);
    }
    operator BasicVectorView<E, false>() const requires Writable { return {data_, size_}; }

    T *data() const { return data_; }
    std::ptrdiff_t size() const { return size_; }
    bool isEmpty() const { return size_ == 0; }
    T &operator[](std::ptrdiff_t i) const { return data_[i]; }

    // For loops over the elements. A class, because `auto` and template arguments would drop the
    // alignment attribute of a pointer.
    struct Iterator {
        T *at;
        T &operator*() const { return *at; }
        Iterator &operator++() {
            ++at;
            return *this;
        }
        bool operator==(const Iterator &) const = default;
    };
    Iterator begin() const { return {data_}; }
    Iterator end() const { return {data_ + size_}; }

    // `count` elements from element `first` on.
    BasicVectorView part(std::ptrdiff_t first, std::ptrdiff_t count) const {
        QX_EXPECTS(first >= 0 && count >= 0 && first + count <= size_);
        return {data_ + first, count};
    }

private:
    T *data_ = nullptr;
    std::ptrdiff_t size_ = 0;
};

namespace detail {
// The members that all views of matrices share.
class MatrixPlace {
public:
    MatrixPlace() = default;
    MatrixPlace(const void *data, int32_t rows, int32_t cols, std::ptrdiff_t stride)
        : data_(const_cast<void *>(data)), rows_(rows), cols_(cols), stride_(stride) {
        QX_EXPECTS(rows >= 0 && cols >= 0 && stride >= cols);
    }
    int32_t rows() const { return rows_; }
    int32_t cols() const { return cols_; }
    std::ptrdiff_t stride() const { return stride_; }
    bool isEmpty() const { return rows_ == 0 || cols_ == 0; }
    bool isSquare() const { return rows_ == cols_; }
    // Whether the elements are contiguous.
    bool isWhole() const { return stride_ == cols_; }
    int64_t count() const { return int64_t{rows_} * cols_; }

protected:
    void *data_ = nullptr;

private:
    int32_t rows_ = 0, cols_ = 0;
    std::ptrdiff_t stride_ = 0;
};
} // namespace detail

// Row-major; `stride` elements lie between the starts of consecutive rows. A writable view is
// derived from the constant one, so that a function takes it by reference without a copy.
template <ElementType E, bool Writable>
class BasicMatrixView
    : public std::conditional_t<Writable, BasicMatrixView<E, false>, detail::MatrixPlace> {
    typedef std::conditional_t<Writable, BasicMatrixView<E, false>, detail::MatrixPlace> Base;

public:
    typedef typename detail::ViewedElement<E, Writable>::type T;
    static constexpr ElementType code = E;

    BasicMatrixView() = default;
    BasicMatrixView(T *data, int32_t rows, int32_t cols) : Base(data, rows, cols, cols) {}
    BasicMatrixView(T *data, int32_t rows, int32_t cols, std::ptrdiff_t stride)
        : Base(data, rows, cols, stride) {}

    T *data() const { return static_cast<T *>(this->data_); }
    T *row(std::ptrdiff_t i) const { return data() + i * this->stride(); }
    T &operator()(std::ptrdiff_t i, std::ptrdiff_t j) const {
        return data()[i * this->stride() + j];
    }

    // The matrix of `rows` by `cols` whose first element is (i, j).
    BasicMatrixView block(int32_t i, int32_t j, int32_t rows, int32_t cols) const {
        QX_EXPECTS(i >= 0 && j >= 0 && i + rows <= this->rows() && j + cols <= this->cols());
        return {row(i) + j, rows, cols, this->stride()};
    }
    // All elements of a contiguous matrix.
    BasicVectorView<E, Writable> elements() const {
        QX_EXPECTS(this->isWhole());
        return {data(), static_cast<std::ptrdiff_t>(this->count())};
    }
};

template <ElementType E>
using VectorView = BasicVectorView<E, true>;
template <ElementType E>
using ConstVectorView = BasicVectorView<E, false>;
template <ElementType E>
using MatrixView = BasicMatrixView<E, true>;
template <ElementType E>
using ConstMatrixView = BasicMatrixView<E, false>;

// Copies all elements of a vector to another of the same size that does not overlap it.
template <ElementType E>
void Copy(ConstVectorView<E> from, VectorView<E> to) {
    QX_EXPECTS(from.size() == to.size());
    if (!from.isEmpty())
        std::memcpy(static_cast<void *>(to.data()), from.data(),
                    sizeof(typename VectorView<E>::T) * static_cast<std::size_t>(from.size()));
}

typedef VectorView<ElementType::DBL> RealVector;
typedef ConstVectorView<ElementType::DBL> ConstRealVector;
typedef MatrixView<ElementType::DBL> RealMatrix;
typedef ConstMatrixView<ElementType::DBL> ConstRealMatrix;
typedef VectorView<ElementType::CDB> ComplexVector;
typedef ConstVectorView<ElementType::CDB> ConstComplexVector;
typedef MatrixView<ElementType::CDB> ComplexMatrix;
typedef ConstMatrixView<ElementType::CDB> ConstComplexMatrix;

} // namespace qx

#endif
