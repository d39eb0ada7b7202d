#ifndef QX_FILTERS_JACOBI_LATTICE_H
#define QX_FILTERS_JACOBI_LATTICE_H

#include "filters/elliptic_functions.h"

namespace qx {

// Jacobi's elliptic functions of a modulus k that is given by the ratio K' / K of its quarter
// periods, by theta functions (NIST Digital Library of Mathematical Functions, chapters 20 and 22).
// Their nome is exp(-pi K' / K), or exp(-pi K / K') if that is smaller. Therefore four terms are
// enough, and k, its complement kc and all functions have small relative errors for any modulus,
// even near 0 and near 1.
class JacobiLattice {
public:
    explicit JacobiLattice(double periodRatio); // K' / K, positive

    double k, kc;
    // At `fraction` K from 0, which is `complement` K from K; both are in [0, 1] and their sum is
    // 1.
    JacobiFunctions at(double fraction, double complement) const;

private:
    JacobiFunctions byTrigonometric(double fraction, double complement) const;
    JacobiFunctions byHyperbolic(double fraction) const;

    double periodRatio_, lnNome_;
    double theta2_, theta3_, theta4_; // theta2 without 2 q^(1/4)
};

// The incomplete integral F(atan(t), k) from the complement kc: Carlson's R_F by duplication (B. C.
// Carlson, "Numerical computation of real or complex elliptic integrals", 1995).
double EllipticFOfTangent(double t, double kc);

} // namespace qx

#endif
