#include "special/hypergeometric.h"

#include "qx/special_hypergeometric.h"

#include "frame/arithmetic.h"
#include "special/confluent.h"
#include "special/gauss_regions.h"
#include "special/kummer_regions.h"
#include "special/tricomi_regions.h"

void QX_Gauss(double x, double a, double b, double c, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::Gauss(x, a, b, c, qx::kGaussPfaffBelow);
}

void QX_Gauss_2011(double x, double a, double b, double c, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::Gauss(x, a, b, c, qx::kGauss2011PfaffBelow);
}

void QX_Gauss_2026(double x, double a, double b, double c, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::GaussByRegion(x, a, b, c);
}

void QX_Kummer(double x, double a, double b, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::Kummer(x, a, b);
}

void QX_Tricomi(double x, double a, double b, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::Tricomi(x, a, b);
}

void QX_Kummer_2026(double x, double a, double b, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::KummerByRegion(x, a, b);
}

void QX_Tricomi_2026(double x, double a, double b, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::TricomiByRegion(x, a, b);
}
