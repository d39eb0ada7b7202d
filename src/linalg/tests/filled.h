#ifndef QX_LINALG_TESTS_FILLED_H
#define QX_LINALG_TESTS_FILLED_H

#include "tests/support/hostile_host.h"

#include <vector>

namespace qx::test {

// A matrix of the hostile host with its content, row after row.
template <ElementType E>
struct Filled : Array2D<E> {
    typedef Array2D<E> Base;
    using Base::Base;
    Filled(int rows, int cols, const std::vector<typename Base::Value> &values) : Base(rows, cols) {
        for (std::size_t i = 0; i < values.size(); ++i)
            this->data()[i] = values[i];
    }
};
typedef Filled<ElementType::DBL> FilledDBL;
typedef Filled<ElementType::CDB> FilledCDB;

} // namespace qx::test

#endif
