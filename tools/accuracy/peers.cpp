// The special functions of the C++ library under plain C names, for accuracy.py.

#include <cmath>
#include <cstdint>
#include <exception>

namespace {

// Returns NaN for an argument that the library refuses.
template <class Function>
double Value(Function function) {
    try {
        return function();
    } catch (const std::exception &) {
        return NAN;
    }
}

} // namespace

extern "C" {

double std_j(double v, double x) {
    return Value([=] { return std::cyl_bessel_j(v, x); });
}
double std_y(double v, double x) {
    return Value([=] { return std::cyl_neumann(v, x); });
}
double std_i(double v, double x) {
    return Value([=] { return std::cyl_bessel_i(v, x); });
}
double std_k(double v, double x) {
    return Value([=] { return std::cyl_bessel_k(v, x); });
}
double std_sph_j(int32_t n, double x) {
    return Value([=] { return std::sph_bessel(n, x); });
}
double std_sph_y(int32_t n, double x) {
    return Value([=] { return std::sph_neumann(n, x); });
}
double std_ellint_k(double m) {
    return Value([=] { return std::comp_ellint_1(std::sqrt(m)); });
}
double std_ellint_e(double m) {
    return Value([=] { return std::comp_ellint_2(std::sqrt(m)); });
}
double std_ellint_f(double phi, double m) {
    return Value([=] { return std::ellint_1(std::sqrt(m), phi); });
}
double std_ellint_e2(double phi, double m) {
    return Value([=] { return std::ellint_2(std::sqrt(m), phi); });
}
double std_zeta(double x) {
    return Value([=] { return std::riemann_zeta(x); });
}
double std_expint(double x) {
    return Value([=] { return std::expint(x); });
}
double std_beta(double a, double b) {
    return Value([=] { return std::beta(a, b); });
}
double std_gamma(double x) {
    return Value([=] { return std::tgamma(x); });
}
double std_lgamma(double x) {
    return Value([=] { return std::lgamma(x); });
}
double std_erf(double x) {
    return Value([=] { return std::erf(x); });
}
double std_erfc(double x) {
    return Value([=] { return std::erfc(x); });
}

} // extern "C"
