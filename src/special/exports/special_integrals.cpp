#include "qx/special_integrals.h"

#include "frame/arithmetic.h"
#include "special/dawson.h"
#include "special/dilogarithm.h"
#include "special/error_function.h"
#include "special/exponential_integral.h"
#include "special/hyperbolic_integrals.h"
#include "special/trigonometric_integrals.h"

void QX_Erf(double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::Erf(x);
}

void QX_ErfC(double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::ErfC(x);
}

void QX_ExpI(double x, int32_t n, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::ExponentialIntegral(x, n);
}

void QX_ExpI_2026(double x, int32_t n, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::FastExponentialIntegral(x, n);
}

void QX_SinI(double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::SineIntegral(x);
}

void QX_CosI(double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::CosineIntegral(x);
}

void QX_SinhI(double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::HyperbolicSineIntegral(x);
}

void QX_CoshI(double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::HyperbolicCosineIntegral(x);
}

void QX_Diln(double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::Dilogarithm(x);
}

void QX_Dawson(double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::Dawson(x);
}

void QX_FresnelIntegrals(double x, DBL *c, DBL *s) {
    const qx::DefaultArithmetic arithmetic;
    const qx::FresnelValues values = qx::Fresnel(x);
    *c = values.c;
    *s = values.s;
}
