#ifndef QX_LINALG_TESTS_HOST_MATRIX_H
#define QX_LINALG_TESTS_HOST_MATRIX_H

#include "linalg/tests/exact.h"
#include "tests/support/hostile_host.h"

#include <vector>

namespace qx::test {

// A copyable host matrix made from plain elements or zeros.
template <ElementType Code>
class HostMatrix : public Array2D<Code> {
    typedef Array2D<Code> Base;

public:
    explicit HostMatrix(int rows = 0, int cols = 0)
        : HostMatrix(rows, cols,
                     std::vector<typename Base::Value>(static_cast<std::size_t>(rows * cols))) {}
    HostMatrix(int rows, int cols, const std::vector<typename Base::Value> &elements)
        : Base(rows, cols) {
        for (std::size_t i = 0; i < elements.size(); ++i)
            this->data()[i] = elements[i];
    }
    HostMatrix(const HostMatrix &other) : HostMatrix(other.rows(), other.cols(), other.values()) {}
};
typedef HostMatrix<ElementType::DBL> DBL2DArray;
typedef HostMatrix<ElementType::CDB> CDB2DArray;
typedef HostMatrix<ElementType::I32> I32_2DArray;

inline DBL2DArray Matrix(int m, int n, const std::vector<double> &a) { return DBL2DArray(m, n, a); }
inline CDB2DArray Matrix(int m, int n, const std::vector<CDB> &a) { return CDB2DArray(m, n, a); }
inline DBLArray Vector(const std::vector<double> &x) { return DBLArray(x); }
inline CDBArray Vector(const std::vector<CDB> &x) { return CDBArray(x); }

template <class Array>
Exact Contents(const Array &a) {
    return Exact(a.rows(), a.cols(), a.data());
}

} // namespace qx::test

#endif
