#ifndef QX_LINALG_EQUATIONS_PANEL_H
#define QX_LINALG_EQUATIONS_PANEL_H

#include "frame/scratch.h"
#include "linalg/kernels.h"
#include "linalg/products/ordered.h"
#include "linalg/scalar.h"

#include <cstdint>

namespace qx {

// A matrix in scratch memory, its rows `stride` elements apart.
template <ElementType E>
class Panel {
public:
    typedef ElementOf<E> T;

    ErrorCode allocate(int32_t rows, int32_t cols) {
        stride_ = PaddedStride(cols);
        return block_.allocate(rows * int64_t{stride_});
    }
    T *data() const { return block_.data(); }
    std::ptrdiff_t stride() const { return stride_; }
    T *row(int32_t i) const { return block_.data() + i * stride_; }
    T *at(int32_t i, int32_t j) const { return row(i) + j; }

private:
    Scratch<E> block_;
    std::ptrdiff_t stride_ = 0;
};

// A part of a panel, or of any other matrix.
template <class T>
struct Part {
    typedef T Element __attribute__((aligned(1))); // as a template argument, T has lost it
    Element *data;
    std::ptrdiff_t stride;
};
template <ElementType E>
Part<ElementOf<E>> PartOf(const Panel<E> &panel, int32_t i = 0, int32_t j = 0) {
    return {panel.at(i, j), panel.stride()};
}

// c -= a b and c = a b, a being m by k and b k by n, term by term in ascending order.
inline void Subtract(int32_t m, int32_t n, int32_t k, Part<DBL> a, Part<DBL> b, Part<DBL> c) {
    SubtractProduct(m, n, k, a.data, a.stride, b.data, b.stride, c.data, c.stride);
}
inline void Subtract(int32_t m, int32_t n, int32_t k, Part<CDB> a, Part<CDB> b, Part<CDB> c) {
    CxSubtractProduct(m, n, k, a.data, a.stride, b.data, b.stride, c.data, c.stride);
}
inline void Add(int32_t m, int32_t n, int32_t k, Part<DBL> a, Part<DBL> b, Part<DBL> c) {
    AddProduct(m, n, k, a.data, a.stride, b.data, b.stride, c.data, c.stride);
}
inline void Add(int32_t m, int32_t n, int32_t k, Part<CDB> a, Part<CDB> b, Part<CDB> c) {
    CxAddProduct(m, n, k, a.data, a.stride, b.data, b.stride, c.data, c.stride);
}
template <class T>
void Multiply(int32_t m, int32_t n, int32_t k, Part<T> a, Part<T> b, Part<T> c) {
    for (int32_t i = 0; i < m; ++i)
        for (int32_t j = 0; j < n; ++j)
            c.data[i * c.stride + j] = T{};
    Add(m, n, k, a, b, c);
}

} // namespace qx

#endif
