#ifndef QX_SPECIAL_BETA_H
#define QX_SPECIAL_BETA_H

namespace qx {

// The complete beta function gamma(a) gamma(b) / gamma(a + b). NaN if an argument is not finite,
// and at poles of gamma.
//
// For positive arguments by Stirling's series for all three gammas together, so that the digits
// that cancel between them are not lost. Otherwise by the gamma functions themselves or, beyond 50,
// by reflection to positive arguments: the rounding of 1 - a then costs about |a| ln |a| eps near
// poles and some tens of eps elsewhere.
double CompleteBeta(double a, double b);

} // namespace qx

#endif
