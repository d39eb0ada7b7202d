#ifndef QX_FRAME_ELEMENTS_H
#define QX_FRAME_ELEMENTS_H

#include "qx/types.h"

#include <cstddef>

namespace qx {

// Element type codes of the host. Templates are keyed by the code and not by the C++ type,
// because a template argument would drop the alignment that the element typedefs carry.
enum class ElementType : int32_t {
    I32 = QXTypeI32,
    U8 = QXTypeU8,
    U32 = QXTypeU32,
    SGL = QXTypeSGL,
    DBL = QXTypeDBL,
    CSG = QXTypeCSG,
    CDB = QXTypeCDB,
};

template <ElementType Code>
struct Element;
template <>
struct Element<ElementType::I32> {
    typedef ::I32 type;
};
template <>
struct Element<ElementType::U8> {
    typedef ::U8 type;
};
template <>
struct Element<ElementType::U32> {
    typedef ::U32 type;
};
template <>
struct Element<ElementType::SGL> {
    typedef ::SGL type;
};
template <>
struct Element<ElementType::DBL> {
    typedef ::DBL type;
};
template <>
struct Element<ElementType::CSG> {
    typedef ::CSG type;
};
template <>
struct Element<ElementType::CDB> {
    typedef ::CDB type;
};

// Elements lie at addresses that are not aligned for their C++ type, and the algorithms of the
// standard library assume alignment. These do not.

inline void Fill(DBL *to, std::ptrdiff_t count, double value) {
    for (std::ptrdiff_t i = 0; i < count; ++i)
        to[i] = value;
}

inline void Swap(DBL *a, DBL *b) {
    const double held = *a;
    *a = *b;
    *b = held;
}

inline void OrderPair(DBL *a, DBL *b) {
    if (*b < *a)
        Swap(a, b);
}

inline void Reverse(DBL *a, std::ptrdiff_t count) {
    for (std::ptrdiff_t i = 0, j = count - 1; i < j; ++i, --j)
        Swap(&a[i], &a[j]);
}

} // namespace qx

#endif
