#include "bench/special_peers.h"

#include "special/airy.h"
#include "special/bessel_integer.h"
#include "special/bessel_real.h"
#include "special/dawson.h"
#include "special/elliptic.h"
#include "special/kelvin.h"
#include "special/parabolic_cylinder.h"
#include "special/struve.h"
#include "special/zeta.h"

#include <cmath>

#ifdef QX_PEER_BOOST
#include <boost/math/special_functions/airy.hpp>
#include <boost/math/special_functions/bessel.hpp>
#include <boost/math/special_functions/ellint_1.hpp>
#include <boost/math/special_functions/ellint_2.hpp>
#include <boost/math/special_functions/jacobi_elliptic.hpp>
#include <boost/math/special_functions/zeta.hpp>
#endif

namespace qx::bench {

std::vector<SpecialRow> SpecialBesselRows() {
    return {
        {"J of order 0, x to 50", 0, 50, 0, 0, QX_CALL(BesselJ(0, a)),
         Of(QX_GSL(gsl_sf_bessel_J0(a)), QX_CALL(std::cyl_bessel_j(0, a)),
            QX_BOOST(boost::math::cyl_bessel_j(0, a)))},
        {"Y of order 1, x to 50", 0.1, 50, 0, 0, QX_CALL(BesselY(1, a)),
         Of(QX_GSL(gsl_sf_bessel_Y1(a)), QX_CALL(std::cyl_neumann(1, a)),
            QX_BOOST(boost::math::cyl_neumann(1, a)))},
        {"J of integer order to 50", 0, 50, 0.1, 60, QX_CALL(BesselJ(a, b)),
         Of(QX_GSL(gsl_sf_bessel_Jn(static_cast<int>(a), b)), QX_CALL(std::cyl_bessel_j(a, b)),
            QX_BOOST(boost::math::cyl_bessel_j(static_cast<int>(a), b))),
         true},
        {"J of real order to 50", 0, 50, 0.1, 60, QX_CALL(BesselJ(a, b)),
         Of(QX_GSL(gsl_sf_bessel_Jnu(a, b)), QX_CALL(std::cyl_bessel_j(a, b)),
            QX_BOOST(boost::math::cyl_bessel_j(a, b)))},
        {"J of order 200 to 1000", 200, 1000, 100, 1500, QX_CALL(BesselJ(a, b)),
         Of(QX_GSL(gsl_sf_bessel_Jnu(a, b)), QX_CALL(std::cyl_bessel_j(a, b)),
            QX_BOOST(boost::math::cyl_bessel_j(a, b)))},
        {"Y of real order to 50", 0, 50, 0.1, 60, QX_CALL(BesselY(a, b)),
         Of(QX_GSL(gsl_sf_bessel_Ynu(a, b)), QX_CALL(std::cyl_neumann(a, b)),
            QX_BOOST(boost::math::cyl_neumann(a, b)))},
        {"spherical j to order 20", 0, 20, 0.1, 50,
         QX_CALL(SphericalBesselJ(static_cast<int>(a), b)),
         Of(QX_GSL(gsl_sf_bessel_jl(static_cast<int>(a), b)),
            QX_CALL(std::sph_bessel(static_cast<unsigned>(a), b)),
            QX_BOOST(boost::math::sph_bessel(static_cast<unsigned>(a), b))),
         true},
        {"spherical y to order 20", 0, 20, 0.1, 50,
         QX_CALL(SphericalBesselY(static_cast<int>(a), b)),
         Of(QX_GSL(gsl_sf_bessel_yl(static_cast<int>(a), b)),
            QX_CALL(std::sph_neumann(static_cast<unsigned>(a), b)),
            QX_BOOST(boost::math::sph_neumann(static_cast<unsigned>(a), b))),
         true},
        {"I of integer order to 50", 0, 50, 0.1, 60, QX_CALL(BesselI(a, b)),
         Of(QX_GSL(gsl_sf_bessel_In(static_cast<int>(a), b)), QX_CALL(std::cyl_bessel_i(a, b)),
            QX_BOOST(boost::math::cyl_bessel_i(static_cast<int>(a), b))),
         true},
        {"I of real order to 50", 0, 50, 0.1, 60, QX_CALL(BesselI(a, b)),
         Of(QX_GSL(gsl_sf_bessel_Inu(a, b)), QX_CALL(std::cyl_bessel_i(a, b)),
            QX_BOOST(boost::math::cyl_bessel_i(a, b)))},
        {"K of integer order to 50", 0, 50, 0.1, 60, QX_CALL(BesselKn(a, b)),
         Of(QX_GSL(gsl_sf_bessel_Kn(static_cast<int>(a), b)), QX_CALL(std::cyl_bessel_k(a, b)),
            QX_BOOST(boost::math::cyl_bessel_k(static_cast<int>(a), b))),
         true},
        {"Airy, all four", -20, 20, 0, 0, QX_CALL(Airy(a).ai),
         Of(QX_GSL(gsl_sf_airy_Ai(a, 0) + gsl_sf_airy_Ai_deriv(a, 0) + gsl_sf_airy_Bi(a, 0) +
                   gsl_sf_airy_Bi_deriv(a, 0)),
            nullptr,
            QX_BOOST(boost::math::airy_ai(a) + boost::math::airy_ai_prime(a) +
                     boost::math::airy_bi(a) + boost::math::airy_bi_prime(a)))},
        {"K(m)", 0, 0.999, 0, 0, QX_CALL(EllipticK(a)),
         Of(QX_GSL(gsl_sf_ellint_Kcomp(std::sqrt(a), 0)), QX_CALL(std::comp_ellint_1(std::sqrt(a))),
            QX_BOOST(boost::math::ellint_1(std::sqrt(a))))},
        {"E(m)", 0, 0.999, 0, 0, QX_CALL(EllipticE(a)),
         Of(QX_GSL(gsl_sf_ellint_Ecomp(std::sqrt(a), 0)), QX_CALL(std::comp_ellint_2(std::sqrt(a))),
            QX_BOOST(boost::math::ellint_2(std::sqrt(a))))},
        {"F(phi, m)", -1.5, 1.5, 0, 0.99, QX_CALL(EllipticF(a, b)),
         Of(QX_GSL(gsl_sf_ellint_F(a, std::sqrt(b), 0)), QX_CALL(std::ellint_1(std::sqrt(b), a)),
            QX_BOOST(boost::math::ellint_1(std::sqrt(b), a)))},
        {"F(phi, 1), revision", -1.5, 1.5, 1, 1, QX_CALL(EllipticFOfOne(a)),
         WithElder(Of(QX_GSL(gsl_sf_ellint_F(a, b, 0)), QX_CALL(std::ellint_1(b, a)),
                      QX_BOOST(boost::math::ellint_1(b, a))),
                   QX_CALL(EllipticF(a, b)))},
        {"E(phi, m)", -1.5, 1.5, 0, 0.99, QX_CALL(EllipticE(a, b)),
         Of(QX_GSL(gsl_sf_ellint_E(a, std::sqrt(b), 0)), QX_CALL(std::ellint_2(std::sqrt(b), a)),
            QX_BOOST(boost::math::ellint_2(std::sqrt(b), a)))},
        {"sn, cn, dn", -5, 5, 0.01, 0.99, QX_CALL(EllipticJacobi(a, b).sn),
         Of(QX_GSL(([&] {
                double sn, cn, dn;
                gsl_sf_elljac_e(a, b, &sn, &cn, &dn);
                return sn;
            }())),
            nullptr, QX_BOOST(boost::math::jacobi_elliptic(std::sqrt(b), a, &b, &b)))},
        {"Dawson", -10, 10, 0, 0, QX_CALL(Dawson(a)),
         Of(QX_GSL(gsl_sf_dawson(a)), nullptr, nullptr)},
        {"Fresnel", -10, 10, 0, 0, QX_CALL(Fresnel(a).c), {}},
        {"zeta, x to 60", 1.01, 60, 0, 0, QX_CALL(Zeta(a)),
         Of(QX_GSL(gsl_sf_zeta(a)), QX_CALL(std::riemann_zeta(a)), QX_BOOST(boost::math::zeta(a)))},
        {"zeta, x below 0", -30, -0.1, 0, 0, QX_CALL(Zeta(a)),
         Of(QX_GSL(gsl_sf_zeta(a)), QX_CALL(std::riemann_zeta(a)), QX_BOOST(boost::math::zeta(a)))},
        {"ber, bei to order 20", 0.1, 60, 0, 20, QX_CALL(KelvinI(a, static_cast<int>(b)).re), {}},
        {"ker, kei to order 20", 0.1, 60, 0, 20, QX_CALL(KelvinK(a, static_cast<int>(b)).re), {}},
        {"Struve", 0.1, 60, 0, 20, QX_CALL(Struve(a, b)), {}},
        {"parabolic cylinder", -8, 20, -10, 10, QX_CALL(ParabolicCylinder(a, b)), {}},
    };
}

} // namespace qx::bench
