#ifndef QX_ELEMENTS_HPP
#define QX_ELEMENTS_HPP

// The element types of arrays with their type codes and handle types.

#include "qx/types.h"

#include <complex>
#include <cstdint>

namespace qx::host {

template <class T>
struct Element {};
template <>
struct Element<int32_t> {
    static constexpr int32_t typeCode = QXTypeI32;
    typedef I32_1D Handle1D;
    typedef I32_2D Handle2D;
};
template <>
struct Element<uint8_t> {
    static constexpr int32_t typeCode = QXTypeU8;
    typedef U8_1D Handle1D;
    typedef Array2DHandle Handle2D;
};
template <>
struct Element<uint32_t> {
    static constexpr int32_t typeCode = QXTypeU32;
    typedef U32_1D Handle1D;
    typedef Array2DHandle Handle2D;
};
template <>
struct Element<float> {
    static constexpr int32_t typeCode = QXTypeSGL;
    typedef SGL1D Handle1D;
    typedef Array2DHandle Handle2D;
};
template <>
struct Element<double> {
    static constexpr int32_t typeCode = QXTypeDBL;
    typedef DBL1D Handle1D;
    typedef DBL2D Handle2D;
};
template <>
struct Element<std::complex<float>> {
    static constexpr int32_t typeCode = QXTypeCSG;
    typedef CSG1D Handle1D;
    typedef Array2DHandle Handle2D;
};
template <>
struct Element<std::complex<double>> {
    static constexpr int32_t typeCode = QXTypeCDB;
    typedef CDB1D Handle1D;
    typedef CDB2D Handle2D;
};

} // namespace qx::host

#endif
