#include "qx/special_bessel.h"

#include "frame/arithmetic.h"
#include "special/airy.h"
#include "special/bessel_integer.h"
#include "special/bessel_real.h"
#include "special/kelvin.h"
#include "special/parabolic_cylinder.h"
#include "special/struve.h"

#include <cmath>

void QX_Airy(double x, DBL *ai, DBL *aip, DBL *bi, DBL *bip) {
    const qx::DefaultArithmetic arithmetic;
    const qx::AiryValues values = qx::Airy(x);
    *ai = values.ai;
    *aip = values.aip;
    *bi = values.bi;
    *bip = values.bip;
}

void QX_BesselJr(double order, double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::BesselJ(order, x);
}

void QX_BesselYr(double order, double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::BesselY(order, x);
}

void QX_BesselJs(int32_t n, double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::SphericalBesselJ(n, x);
}

void QX_BesselYs(int32_t n, double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::SphericalBesselY(n, x);
}

void QX_BesselIr(double order, double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::BesselI(order, x);
}

void QX_BesselKn(int32_t n, double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::BesselKn(std::fabs(static_cast<double>(n)), x);
}

void QX_KelvinI(double x, int32_t n, DBL *ber, DBL *bei) {
    const qx::DefaultArithmetic arithmetic;
    const qx::KelvinPair pair = qx::KelvinI(x, n);
    *ber = pair.re;
    *bei = pair.im;
}

void QX_KelvinK(double x, int32_t n, DBL *ker, DBL *kei) {
    const qx::DefaultArithmetic arithmetic;
    const qx::KelvinPair pair = qx::KelvinK(x, n);
    *ker = pair.re;
    *kei = pair.im;
}

void QX_Struve(double x, double v, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::Struve(x, v);
}

void QX_ParabolicCylinder(double x, double v, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::ParabolicCylinder(x, v);
}
