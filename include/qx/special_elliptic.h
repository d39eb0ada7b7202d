#ifndef QX_SPECIAL_ELLIPTIC_EXPORTS_H
#define QX_SPECIAL_ELLIPTIC_EXPORTS_H

/* Elliptic integrals and Jacobian elliptic functions. A NaN argument gives NaN. The measured errors
   are in docs/accuracy. The formula numbers are those of M. Abramowitz and I. A. Stegun, Handbook
   of mathematical functions, 1964. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Elliptic integral of the first kind by its parameter m = k^2: complete, K(m) = F(pi / 2, m),
    where phi is NaN, else F(phi, m), the integral of (1 - m sin^2(t))^(-1/2) from 0 to phi
    (17.2). Complete by a rational form and the logarithm of 1 - m, incomplete by Landen's
    descending transformation (17.6.8). NaN for m outside [0, 1].
    NaN: m in all results; phi in no result. */
QX_API void QX_Elliptic1(double m, double phi, QX_OUT DBL *value);

/** As QX_Elliptic1, with a selector in place of the NaN: 1 complete, otherwise incomplete. Here
    F(phi, 1) has an absolute error of 1e-16, so that no digits are correct for phi below that;
    QX_Elliptic1_2026 keeps all digits.
    NaN: m in all results; phi in some results. */
QX_API void QX_Elliptic1_85(double m, double phi, QX_OUT DBL *value, int32_t selector);

/** As QX_Elliptic1_85, with F(phi, 1) = ln((1 + sin phi) / cos phi) within 1 eps: below a quarter
    of pi as ln(1 + 2 t / (1 - t)), t = tan(phi / 2). F(phi, 1) is infinite from the double nearest
    to pi / 2 onwards.
    NaN: m in all results; phi in some results. */
QX_API void QX_Elliptic1_2026(double m, double phi, QX_OUT DBL *value, int32_t selector);

/** Elliptic integral of the second kind: complete, E(m), where phi is NaN, else E(phi, m), the
    integral of (1 - m sin^2(t))^(1/2) from 0 to phi, by the same methods. NaN for m outside [0,
    1].
    NaN: m in all results; phi in no result. */
QX_API void QX_Elliptic2(double m, double phi, QX_OUT DBL *value);

/** As QX_Elliptic2, with a selector in place of the NaN: 1 complete, otherwise incomplete.
    NaN: m in all results; phi in some results. */
QX_API void QX_Elliptic2_85(double m, double phi, QX_OUT DBL *value, int32_t selector);

/** Jacobian elliptic functions sn = sin(phi), cn = cos(phi), dn = (1 - m sn^2)^(1/2) of u with
    parameter m, and the amplitude phi, for which F(phi, m) = u: by arithmetic-geometric means
    (16.4), near m = 0 and m = 1 by circular and hyperbolic functions (16.13, 16.15). Each pointer
    may be null. NaN for m outside [0, 1].
    NaN: u, m in all results. */
QX_API void QX_EllipticJ(double u, double m, QX_OUT DBL *sn, QX_OUT DBL *cn, QX_OUT DBL *dn,
                         QX_OUT DBL *phi);

QX_END_DECLS

#endif
