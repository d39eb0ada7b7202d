#include "qx/special_elliptic.h"

#include "frame/arithmetic.h"
#include "special/elliptic.h"

#include <cmath>

namespace {

constexpr int32_t kComplete = 1; // value of the selectors

void SetIfAsked(DBL *target, double value) {
    if (target != nullptr)
        *target = value;
}

} // namespace

void QX_Elliptic1(double m, double phi, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = std::isnan(phi) ? qx::EllipticK(m) : qx::EllipticF(phi, m);
}

void QX_Elliptic1_85(double m, double phi, DBL *value, int32_t selector) {
    const qx::DefaultArithmetic arithmetic;
    *value = selector == kComplete ? qx::EllipticK(m) : qx::EllipticF(phi, m);
}

void QX_Elliptic1_2026(double m, double phi, DBL *value, int32_t selector) {
    const qx::DefaultArithmetic arithmetic;
    if (selector == kComplete)
        *value = qx::EllipticK(m);
    else
        *value = m == 1 ? qx::EllipticFOfOne(phi) : qx::EllipticF(phi, m);
}

void QX_Elliptic2(double m, double phi, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = std::isnan(phi) ? qx::EllipticE(m) : qx::EllipticE(phi, m);
}

void QX_Elliptic2_85(double m, double phi, DBL *value, int32_t selector) {
    const qx::DefaultArithmetic arithmetic;
    *value = selector == kComplete ? qx::EllipticE(m) : qx::EllipticE(phi, m);
}

void QX_EllipticJ(double u, double m, DBL *sn, DBL *cn, DBL *dn, DBL *phi) {
    const qx::DefaultArithmetic arithmetic;
    const qx::JacobiValues values = qx::EllipticJacobi(u, m);
    SetIfAsked(sn, values.sn);
    SetIfAsked(cn, values.cn);
    SetIfAsked(dn, values.dn);
    SetIfAsked(phi, values.phi);
}
