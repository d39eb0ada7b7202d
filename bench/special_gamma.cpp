#include "bench/special_peers.h"

#include "frame/constants.h"
#include "special/beta.h"
#include "special/digamma.h"
#include "special/factorial.h"
#include "special/gamma.h"
#include "stats/distributions.h"
#include "stats/tail_distributions.h"

#include <cmath>

#ifdef QX_PEER_GSL
#include <gsl/gsl_cdf.h>
#endif
#ifdef QX_PEER_BOOST
#include <boost/math/distributions.hpp>
#include <boost/math/special_functions/beta.hpp>
#include <boost/math/special_functions/digamma.hpp>
#include <boost/math/special_functions/factorials.hpp>
#include <boost/math/special_functions/gamma.hpp>
#endif

namespace qx::bench {

namespace {

// The result of a routine that returns it through a pointer.
template <class Routine, class... Arguments>
double From(Routine routine, Arguments... arguments) {
    double value = 0;
    routine(arguments..., &value);
    return value;
}

constexpr auto kSurvival = DistributionValue::Survival;

int32_t Int(double x) { return static_cast<int32_t>(x); }

} // namespace

// The quantiles by bisection and the normal distribution by low-order formulas are much less accurate than
// other libraries' functions, so they have no peers; their revisions come last. The elder of a tail
// computes the lower one.
std::vector<SpecialRow> SpecialGammaRows() {
    return {
        {"gamma, x to 33", 0.1, 33, 0, 0, QX_CALL(GammaFunction(a)),
         Of(QX_GSL(gsl_sf_gamma(a)), QX_CALL(std::tgamma(a)), QX_BOOST(boost::math::tgamma(a)))},
        {"gamma, x in [33, 170]", 33, 170, 0, 0, QX_CALL(GammaFunction(a)),
         Of(QX_GSL(gsl_sf_gamma(a)), QX_CALL(std::tgamma(a)), QX_BOOST(boost::math::tgamma(a)))},
        {"gamma, x in [-100, 0]", -100, 0, 0, 0, QX_CALL(GammaFunction(a)),
         Of(QX_GSL(gsl_sf_gamma(a)), QX_CALL(std::tgamma(a)), QX_BOOST(boost::math::tgamma(a)))},
        {"ln gamma, x to 33", 0.1, 33, 0, 0, QX_CALL(LnGammaFunction(a)),
         Of(QX_GSL(gsl_sf_lngamma(a)), QX_CALL(std::lgamma(a)), QX_BOOST(boost::math::lgamma(a)))},
        {"ln gamma, x in [33, 2000]", 33, 2000, 0, 0, QX_CALL(LnGammaFunction(a)),
         Of(QX_GSL(gsl_sf_lngamma(a)), QX_CALL(std::lgamma(a)), QX_BOOST(boost::math::lgamma(a)))},
        {"P(a, x) to 20", 0.1, 20, 0.1, 20, QX_CALL(IncompleteGammaP(a, b)),
         Of(QX_GSL(gsl_sf_gamma_inc_P(a, b)), nullptr, QX_BOOST(boost::math::gamma_p(a, b)))},
        {"Q(a, x) to 20", 0.1, 20, 0.1, 20, QX_CALL(IncompleteGammaQ(a, b)),
         Of(QX_GSL(gsl_sf_gamma_inc_Q(a, b)), nullptr, QX_BOOST(boost::math::gamma_q(a, b)))},
        {"B(a, b) to 20", 0.1, 20, 0.1, 20, QX_CALL(CompleteBeta(a, b)),
         Of(QX_GSL(gsl_sf_beta(a, b)), QX_CALL(std::beta(a, b)),
            QX_BOOST(boost::math::beta(a, b)))},
        {"I_x(a, 2.5), a to 20", 0.1, 20, 0.01, 0.99, QX_CALL(IncompleteBeta(a, 2.5, b)),
         Of(QX_GSL(gsl_sf_beta_inc(a, 2.5, b)), nullptr, QX_BOOST(boost::math::ibeta(a, 2.5, b)))},
        {"n!, n to 170", 0, 171, 0, 0, QX_CALL(Factorial(Int(a))),
         Of(QX_GSL(gsl_sf_fact(static_cast<unsigned>(a))), QX_CALL(std::tgamma(a + 1)),
            QX_BOOST(boost::math::factorial<double>(static_cast<unsigned>(a)))),
         true},
        {"ln n!, n to 1000", 0, 1000, 0, 0, QX_CALL(LnFactorial(Int(a))),
         Of(QX_GSL(gsl_sf_lnfact(static_cast<unsigned>(a))), QX_CALL(std::lgamma(a + 1)), nullptr),
         true},
        {"digamma, x to 20", 0.01, 20, 0, 0, QX_CALL(Digamma(a)),
         Of(QX_GSL(gsl_sf_psi(a)), nullptr, QX_BOOST(boost::math::digamma(a)))},
        {"digamma, x in [-20, 0]", -20, 0, 0, 0, QX_CALL(Digamma(a)),
         Of(QX_GSL(gsl_sf_psi(a)), nullptr, QX_BOOST(boost::math::digamma(a)))},
        {"t distribution", -4, 4, 1, 50, QX_CALL(From(StudentCDF, a, Int(b))),
         Of(QX_GSL(gsl_cdf_tdist_P(a, b)), nullptr,
            QX_BOOST(boost::math::cdf(boost::math::students_t(b), a))),
         false, true},
        {"F distribution, d = 9", 0.01, 5, 1, 50, QX_CALL(From(FisherCDF, a, Int(b), 9)),
         Of(QX_GSL(gsl_cdf_fdist_P(a, b, 9)), nullptr,
            QX_BOOST(boost::math::cdf(boost::math::fisher_f(b, 9), a))),
         false, true},
        {"chi-square distribution", 0.1, 60, 1, 50, QX_CALL(From(ChiSquareCDF, a, Int(b))),
         Of(QX_GSL(gsl_cdf_chisq_P(a, b)), nullptr,
            QX_BOOST(boost::math::cdf(boost::math::chi_squared(b), a))),
         false, true},
        {"normal distribution", -5, 5, 0, 0, QX_CALL(From(NormalCDF, a)), {}},
        {"normal quantile", 0.001, 0.999, 0, 0, QX_CALL(From(NormalQuantile, a)), {}},
        {"t quantile",
         0.001,
         0.999,
         1,
         50,
         QX_CALL(From(StudentQuantile, a, Int(b))),
         {},
         false,
         true},
        {"F quantile, d = 9",
         0.001,
         0.999,
         1,
         50,
         QX_CALL(From(FisherQuantile, a, Int(b), 9)),
         {},
         false,
         true},
        {"chi-square quantile",
         0.001,
         0.999,
         1,
         50,
         QX_CALL(From(ChiSquareQuantile, a, Int(b))),
         {},
         false,
         true},
        {"normal tail, revision", -5, 5, 0, 0, QX_CALL(NormalValue(a, kSurvival)),
         WithElder(
             Of(QX_GSL(gsl_cdf_ugaussian_Q(a)), QX_CALL(0.5 * std::erfc(a / kRootTwo)),
                QX_BOOST(boost::math::cdf(boost::math::complement(boost::math::normal(), a)))),
             QX_CALL(From(NormalCDF, a)))},
        {"t tail, revision", -4, 4, 1, 50, QX_CALL(StudentValue(a, b, kSurvival)),
         WithElder(
             Of(QX_GSL(gsl_cdf_tdist_Q(a, b)), nullptr,
                QX_BOOST(boost::math::cdf(boost::math::complement(boost::math::students_t(b), a)))),
             QX_CALL(From(StudentCDF, a, Int(b))))},
        {"F tail, d = 9, revision", 0.01, 5, 1, 50, QX_CALL(FisherValue(a, b, 9, kSurvival)),
         WithElder(Of(QX_GSL(gsl_cdf_fdist_Q(a, b, 9)), nullptr,
                      QX_BOOST(boost::math::cdf(
                          boost::math::complement(boost::math::fisher_f(b, 9), a)))),
                   QX_CALL(From(FisherCDF, a, Int(b), 9)))},
        {"chi-square tail, revision", 0.1, 60, 1, 50, QX_CALL(ChiSquareValue(a, b, kSurvival)),
         WithElder(Of(QX_GSL(gsl_cdf_chisq_Q(a, b)), nullptr,
                      QX_BOOST(boost::math::cdf(
                          boost::math::complement(boost::math::chi_squared(b), a)))),
                   QX_CALL(From(ChiSquareCDF, a, Int(b))))},
        {"normal quantile, revision", 0.001, 0.999, 0, 0, QX_CALL(NormalPoint(a, false)),
         WithElder(Of(QX_GSL(gsl_cdf_ugaussian_Pinv(a)), nullptr,
                      QX_BOOST(boost::math::quantile(boost::math::normal(), a))),
                   QX_CALL(From(NormalQuantile, a)))},
        {"t quantile, revision", 0.001, 0.999, 1, 50, QX_CALL(StudentPoint(a, false, b)),
         WithElder(Of(QX_GSL(gsl_cdf_tdist_Pinv(a, b)), nullptr,
                      QX_BOOST(boost::math::quantile(boost::math::students_t(b), a))),
                   QX_CALL(From(StudentQuantile, a, Int(b))))},
        {"F quantile, d = 9, revision", 0.001, 0.999, 1, 50, QX_CALL(FisherPoint(a, false, b, 9)),
         WithElder(Of(QX_GSL(gsl_cdf_fdist_Pinv(a, b, 9)), nullptr,
                      QX_BOOST(boost::math::quantile(boost::math::fisher_f(b, 9), a))),
                   QX_CALL(From(FisherQuantile, a, Int(b), 9)))},
        {"chi-square quantile, revision", 0.001, 0.999, 1, 50, QX_CALL(ChiSquarePoint(a, false, b)),
         WithElder(Of(QX_GSL(gsl_cdf_chisq_Pinv(a, b)), nullptr,
                      QX_BOOST(boost::math::quantile(boost::math::chi_squared(b), a))),
                   QX_CALL(From(ChiSquareQuantile, a, Int(b))))},
    };
}

} // namespace qx::bench
