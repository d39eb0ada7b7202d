#ifndef QX_SPECIAL_BETA_H
#define QX_SPECIAL_BETA_H

namespace qx {

// The complete beta function gamma(a) gamma(b) / gamma(a + b). NaN where an argument is not finite
// or at a pole of gamma.
//
// For positive arguments by Stirling's series for all three gammas at once, so that the digits
// that cancel between them are not lost; otherwise by the gammas themselves, or, beyond 50, by
// reflection to positive arguments: the rounding of 1 - a then costs about |a| ln |a| eps beside
// poles and some tens elsewhere.
double CompleteBeta(double a, double b);

} // namespace qx

#endif
