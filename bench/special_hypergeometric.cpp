#include "bench/special_peers.h"

#include "special/confluent.h"
#include "special/gauss_regions.h"
#include "special/hypergeometric.h"
#include "special/kummer_regions.h"
#include "special/tricomi_regions.h"

#ifdef QX_PEER_GSL
#include <gsl/gsl_sf_hyperg.h>
#endif
#ifdef QX_PEER_BOOST
#include <boost/math/special_functions/hypergeometric_1F1.hpp>
#endif

namespace qx::bench {

namespace {

// x and b vary; a and c, or the second parameter, are fixed.
Peers GaussPeers() {
    Peers peers;
#ifdef QX_PEER_GSL
    peers.push_back({"GSL", [](double x, double b) -> double {
                         gsl_sf_result r;
                         gsl_sf_hyperg_2F1_e(0.7, b, 2.3, x, &r);
                         return r.val;
                     }});
#endif
    return peers;
}

Peers KummerPeers() {
    Peers peers;
#ifdef QX_PEER_GSL
    peers.push_back({"GSL", [](double x, double a) -> double {
                         gsl_sf_result r;
                         gsl_sf_hyperg_1F1_e(a, 2.3, x, &r);
                         return r.val;
                     }});
#endif
#ifdef QX_PEER_BOOST
    peers.push_back({"Boost", [](double x, double a) -> double {
                         return boost::math::hypergeometric_1F1(a, 2.3, x);
                     }});
#endif
    return peers;
}

Peers TricomiPeers(double b) {
    Peers peers;
#ifdef QX_PEER_GSL
    if (b == 2)
        peers.push_back({"GSL", [](double x, double a) -> double {
                             gsl_sf_result r;
                             gsl_sf_hyperg_U_e(a, 2, x, &r);
                             return r.val;
                         }});
    else
        peers.push_back({"GSL", [](double x, double a) -> double {
                             gsl_sf_result r;
                             gsl_sf_hyperg_U_e(a, 0.3, x, &r);
                             return r.val;
                         }});
#endif
    (void)b;
    return peers;
}

double OurGauss(double x, double b) { return Gauss(x, 0.7, b, 2.3, kGaussPfaffBelow); }
double OurGauss2011(double x, double b) { return Gauss(x, 0.7, b, 2.3, kGauss2011PfaffBelow); }
double Gauss2026(double x, double b) { return GaussByRegion(x, 0.7, b, 2.3); }
double OurKummer(double x, double a) { return Kummer(x, a, 2.3); }
double OurTricomi(double x, double a) { return Tricomi(x, a, 0.3); }
double OurTricomiAtInteger(double x, double a) { return Tricomi(x, a, 2); }
double Kummer2026(double x, double a) { return KummerByRegion(x, a, 2.3); }
double Tricomi2026(double x, double a) { return TricomiByRegion(x, a, 0.3); }
double Tricomi2026AtInteger(double x, double a) { return TricomiByRegion(x, a, 2); }

} // namespace

std::vector<SpecialRow> SpecialHypergeometricRows() {
    return {
        {"Gauss [-1, -0.5]", -1, -0.5, 0.1, 3, OurGauss, GaussPeers()},
        {"Gauss [-0.5, 0.2]", -0.5, 0.2, 0.1, 3, OurGauss, GaussPeers()},
        {"Gauss_2011 [-0.5, 0.2]", -0.5, 0.2, 0.1, 3, OurGauss2011, GaussPeers()},
        {"Gauss [0.2, 0.99]", 0.2, 0.99, 0.1, 3, OurGauss, GaussPeers()},
        {"Kummer [-10, 0], a > 0", -10, 0, 0.1, 5, OurKummer, KummerPeers()},
        {"Kummer [-60, -10], a > 0", -60, -10, 0.1, 5, OurKummer, KummerPeers()},
        {"Kummer [0, 30], a > 0", 0, 30, 0.1, 5, OurKummer, KummerPeers()},
        {"Kummer [0, 30], a < 0", 0, 30, -5, -0.1, OurKummer, KummerPeers()},
        {"Tricomi [0, 6]", 0, 6, 0.1, 3, OurTricomi, TricomiPeers(0.3)},
        {"Tricomi [6, 60]", 6, 60, 0.1, 3, OurTricomi, TricomiPeers(0.3)},
        {"Tricomi [0, 6], b = 2", 0, 6, 0.1, 3, OurTricomiAtInteger, TricomiPeers(2)},
        {"Gauss [-1, -0.5], revision", -1, -0.5, 0.1, 3, Gauss2026,
         WithElder(GaussPeers(), OurGauss2011)},
        {"Gauss [-0.5, 0.2], revision", -0.5, 0.2, 0.1, 3, Gauss2026,
         WithElder(GaussPeers(), OurGauss2011)},
        {"Gauss [0.2, 0.99], revision", 0.2, 0.99, 0.1, 3, Gauss2026,
         WithElder(GaussPeers(), OurGauss2011)},
        {"Kummer [-60, -10], a > 0, revision", -60, -10, 0.1, 5, Kummer2026,
         WithElder(KummerPeers(), OurKummer)},
        {"Kummer [0, 30], a > 0, revision", 0, 30, 0.1, 5, Kummer2026,
         WithElder(KummerPeers(), OurKummer)},
        {"Kummer [0, 30], a < 0, revision", 0, 30, -5, -0.1, Kummer2026,
         WithElder(KummerPeers(), OurKummer)},
        {"Tricomi [0, 6], revision", 0, 6, 0.1, 3, Tricomi2026,
         WithElder(TricomiPeers(0.3), OurTricomi)},
        {"Tricomi [6, 60], revision", 6, 60, 0.1, 3, Tricomi2026,
         WithElder(TricomiPeers(0.3), OurTricomi)},
        {"Tricomi [0, 6], b = 2, revision", 0, 6, 0.1, 3, Tricomi2026AtInteger,
         WithElder(TricomiPeers(2), OurTricomiAtInteger)},
    };
}

} // namespace qx::bench
