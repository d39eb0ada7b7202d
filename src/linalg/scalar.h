#ifndef QX_LINALG_SCALAR_H
#define QX_LINALG_SCALAR_H

#include "frame/complex.h"

#include <cmath>

namespace qx {

// Functions with the same names for real and complex elements, so that one text of an algorithm
// serves both.

inline double Conj(double a) { return a; }
inline CDB Conj(CDB a) { return {a.re, -a.im}; }
inline double RealPart(double a) { return a; }
inline double RealPart(CDB a) { return a.re; }
inline double ImagPart(double) { return 0.0; }
inline double ImagPart(CDB a) { return a.im; }
// |re| + |im|: distinguishes large from small as well as the modulus does, without a square root.
inline double AbsSum(double a) { return std::fabs(a); }
inline double AbsSum(CDB a) { return std::fabs(a.re) + std::fabs(a.im); }
inline double SquaredModulus(double a) { return a * a; }
inline double SquaredModulus(CDB a) { return a.re * a.re + a.im * a.im; }
inline double Modulus(double a) { return std::fabs(a); }
inline double Modulus(CDB a) { return std::hypot(a.re, a.im); }

inline void Swap(CDB *a, CDB *b) {
    const CDB held = *a;
    *a = *b;
    *b = held;
}
inline void Swap(I32 *a, I32 *b) {
    const int32_t held = *a;
    *a = *b;
    *b = held;
}

// An element in a block, with the alignment that its typedef has.
template <ElementType E>
using ElementOf = typename Element<E>::type;

// A local value of an element type: a template argument would drop the typedef's alignment, and a
// local value needs none of it.
template <ElementType E>
struct ScalarOf;
template <>
struct ScalarOf<ElementType::DBL> {
    typedef double type;
    static type Of(double real) { return real; }
};
template <>
struct ScalarOf<ElementType::CDB> {
    typedef CDB type;
    static type Of(double real) { return {real, 0.0}; }
};

// The number of DBL in an element; real factors act on these alone.
template <ElementType E>
constexpr int32_t partsOf = E == ElementType::CDB ? 2 : 1;

inline constexpr double epsilon = 0x1p-52;

} // namespace qx

#endif
