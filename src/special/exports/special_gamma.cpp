#include "qx/special_gamma.h"

#include "frame/arithmetic.h"
#include "special/beta.h"
#include "special/digamma.h"
#include "special/factorial.h"
#include "special/gamma.h"
#include "special/zeta.h"

#include <cmath>

namespace {

constexpr int32_t kComplete = 1; // value of the selectors

} // namespace

void QX_Beta(double a, double b, double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = std::isnan(x) ? qx::CompleteBeta(a, b) : qx::IncompleteBeta(a, b, x);
}

void QX_Beta_85(double a, double b, double x, DBL *value, int32_t selector) {
    const qx::DefaultArithmetic arithmetic;
    *value = selector == kComplete ? qx::CompleteBeta(a, b) : qx::IncompleteBeta(a, b, x);
}

void QX_Fact(int32_t n, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::Factorial(n);
}

void QX_LnFact(int32_t n, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::LnFactorial(n);
}

void QX_Gamma(double a, double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = std::isnan(x) ? qx::GammaFunction(a) : qx::IncompleteGammaP(a, x);
}

void QX_Gamma_85(double a, double x, DBL *value, int32_t selector) {
    const qx::DefaultArithmetic arithmetic;
    *value = selector == kComplete ? qx::GammaFunction(a) : qx::IncompleteGammaP(a, x);
}

void QX_GammaC(double a, double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::IncompleteGammaQ(a, x);
}

void QX_LnGamma(double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::LnGammaFunction(x);
}

void QX_Stirling(double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::StirlingGamma(x);
}

void QX_Psi(double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::Digamma(x);
}

void QX_Zeta(double x, DBL *value) {
    const qx::DefaultArithmetic arithmetic;
    *value = qx::Zeta(x);
}
