#include "bench/special_peers.h"

#include "special/dilogarithm.h"
#include "special/error_function.h"
#include "special/exponential_integral.h"
#include "special/hyperbolic_integrals.h"
#include "special/trigonometric_integrals.h"

#include <cmath>

#ifdef QX_PEER_BOOST
#include <boost/math/special_functions/erf.hpp>
#include <boost/math/special_functions/expint.hpp>
#endif

namespace qx::bench {

std::vector<SpecialRow> SpecialIntegralsRows() {
    return {
        {"erf", -4, 4, 0, 0, QX_CALL(Erf(a)),
         Of(QX_GSL(gsl_sf_erf(a)), QX_CALL(std::erf(a)), QX_BOOST(boost::math::erf(a)))},
        {"erfc, x to 20", 0, 20, 0, 0, QX_CALL(ErfC(a)),
         Of(QX_GSL(gsl_sf_erfc(a)), QX_CALL(std::erfc(a)), QX_BOOST(boost::math::erfc(a)))},
        {"E_1, x to 1", 0.001, 1, 0, 0, QX_CALL(ExponentialIntegral(a, 1)),
         Of(QX_GSL(gsl_sf_expint_E1(a)), QX_CALL(-std::expint(-a)),
            QX_BOOST(boost::math::expint(1, a)))},
        {"E_1, x to 50", 1, 50, 0, 0, QX_CALL(ExponentialIntegral(a, 1)),
         Of(QX_GSL(gsl_sf_expint_E1(a)), QX_CALL(-std::expint(-a)),
            QX_BOOST(boost::math::expint(1, a)))},
        {"E_1, x to 1, revision", 0.001, 1, 0, 0, QX_CALL(FastExponentialIntegral(a, 1)),
         WithElder(Of(QX_GSL(gsl_sf_expint_E1(a)), QX_CALL(-std::expint(-a)),
                      QX_BOOST(boost::math::expint(1, a))),
                   QX_CALL(ExponentialIntegral(a, 1)))},
        {"E_1, x to 50, revision", 1, 50, 0, 0, QX_CALL(FastExponentialIntegral(a, 1)),
         WithElder(Of(QX_GSL(gsl_sf_expint_E1(a)), QX_CALL(-std::expint(-a)),
                      QX_BOOST(boost::math::expint(1, a))),
                   QX_CALL(ExponentialIntegral(a, 1)))},
        {"E_n, n to 50, x to 50", 0.1, 50, 2, 50,
         QX_CALL(ExponentialIntegral(a, static_cast<int>(b))),
         Of(QX_GSL(gsl_sf_expint_En(static_cast<int>(b), a)), nullptr,
            QX_BOOST(boost::math::expint(static_cast<unsigned>(b), a))),
         false, true},
        {"Si", 0, 30, 0, 0, QX_CALL(SineIntegral(a)), Of(QX_GSL(gsl_sf_Si(a)), nullptr, nullptr)},
        {"Ci", 0.01, 30, 0, 0, QX_CALL(CosineIntegral(a)),
         Of(QX_GSL(gsl_sf_Ci(a)), nullptr, nullptr)},
        {"Shi", 0, 30, 0, 0, QX_CALL(HyperbolicSineIntegral(a)),
         Of(QX_GSL(gsl_sf_Shi(a)), nullptr, nullptr)},
        {"Chi", 0.01, 30, 0, 0, QX_CALL(HyperbolicCosineIntegral(a)),
         Of(QX_GSL(gsl_sf_Chi(a)), nullptr, nullptr)},
        {"Li2(1 - x)", 0, 10, 0, 0, QX_CALL(Dilogarithm(a)),
         Of(QX_GSL(gsl_sf_dilog(1 - a)), nullptr, nullptr)},
    };
}

} // namespace qx::bench
