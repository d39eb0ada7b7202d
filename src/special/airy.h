#ifndef QX_SPECIAL_AIRY_H
#define QX_SPECIAL_AIRY_H

namespace qx {

struct AiryValues {
    double ai, aip, bi, bip;
};

// Ai, Ai', Bi, Bi'. The exponentials overflow for x > 103.892; there Ai and Ai' are 0, and Bi and
// Bi' are the largest double.
//
//   x < -2.09            modulus and phase with rational forms in 1 / zeta^2, zeta = 2/3 |x|^1.5;
//                        the phase is formed in two doubles, so the values keep their digits
//                        relative to the modulus however many turns there are
//   -2.09 ... 2.09       Maclaurin series; beyond, Ai loses digits to cancellation
//   2.09 < x             Ai, Ai' by rational forms of degree 7 over 7 in 1 / zeta
//   2.09 ... 8.3203353   Bi, Bi' by the Maclaurin series, whose terms are all positive
//   8.3203353 < x        Bi, Bi' by rational forms in 1 / zeta; zeta = 16 at the threshold
AiryValues Airy(double x);

} // namespace qx

#endif
