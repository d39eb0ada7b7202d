#ifndef QX_FRAME_CONSTANTS_H
#define QX_FRAME_CONSTANTS_H

#include <limits>

// Constants that more than one file needs. Each is the double nearest to its value, written as a
// hexadecimal float so that it does not depend on how a compiler reads decimals. A constant that
// only one routine needs, or that is deliberately not the nearest double, is in that routine with
// the reason.

namespace qx {

inline constexpr double kPi = 0x1.921fb54442d18p+1;
inline constexpr double kTwoPi = 0x1.921fb54442d18p+2;
inline constexpr double kHalfPi = 0x1.921fb54442d18p+0;
inline constexpr double kInversePi = 0x1.45f306dc9c883p-2;
inline constexpr double kTwoOverPi = 0x1.45f306dc9c883p-1;

inline constexpr double kRootPi = 0x1.c5bf891b4ef6bp+0;     // gamma(1/2)
inline constexpr double kHalfRootPi = 0x1.c5bf891b4ef6bp-1; // gamma(3/2)
inline constexpr double kInverseRootPi = 0x1.20dd750429b6dp-1;
inline constexpr double kRootTwoPi = 0x1.40d931ff62706p+1;
inline constexpr double kInverseRootTwoPi = 0x1.9884533d43651p-2;

inline constexpr double kRootTwo = 0x1.6a09e667f3bcdp+0;
inline constexpr double kRootHalf = 0x1.6a09e667f3bcdp-1; // cos and sin of pi / 4
inline constexpr double kRootThree = 0x1.bb67ae8584caap+0;

inline constexpr double kE = 0x1.5bf0a8b145769p+1;
inline constexpr double kEuler = 0x1.2788cfc6fb619p-1; // -digamma(1)

inline constexpr double kEpsilon = 0x1p-52;                   // distance from 1 to the next double
inline constexpr double kLogOfLargest = 0x1.62e42fefa39efp+9; // exp overflows above it

inline constexpr double kInfinity = std::numeric_limits<double>::infinity();
inline constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

} // namespace qx

#endif
