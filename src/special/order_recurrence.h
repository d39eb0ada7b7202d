#ifndef QX_SPECIAL_ORDER_RECURRENCE_H
#define QX_SPECIAL_ORDER_RECURRENCE_H

#include "special/complex_exponent.h"

namespace qx {

// The recurrence f(next) = f(before) + (2 order / z) f of the modified Bessel functions, for K with
// its signs as they are and upwards, for I downwards. What rounding takes from z's inverse, from
// the orders and from each step is carried along to first order: over n steps the plain recurrence
// loses about |z|^(2/3) eps next to the turning point, most of it to the rounding of 2 / z.
class OrderRecurrence {
public:
    // The first step is from `order` by `direction`, +1 or -1. For |z| below 1e-100, or values
    // above 2^996, the correction may be lost, and value() is the plain one.
    OrderRecurrence(Complex z, Extended order, double direction, Complex before, Complex present)
        : step_(TwoOver(z)), before_{before, {0, 0}}, present_{present, {0, 0}} {
        factor_ = {order * step_.re, order * step_.im};
        if (direction < 0)
            step_ = {-step_.re, -step_.im};
    }

    void advance() {
        const Complex c = {factor_.re.high, factor_.im.high};
        const Complex rest = {factor_.re.low, factor_.im.low};
        const Complex p = present_.high;
        const Extended reRe = ExactProduct(c.re, p.re);
        const Extended imIm = ExactProduct(c.im, p.im);
        const Extended reIm = ExactProduct(c.re, p.im);
        const Extended imRe = ExactProduct(c.im, p.re);
        const Extended productRe = ExactSum(reRe.high, -imIm.high);
        const Extended productIm = ExactSum(reIm.high, imRe.high);
        const Extended re = ExactSum(productRe.high, before_.high.re);
        const Extended im = ExactSum(productIm.high, before_.high.im);
        const Complex local = {re.low + productRe.low + (reRe.low - imIm.low),
                               im.low + productIm.low + (reIm.low + imRe.low)};
        const Pair next = {{re.high, im.high},
                           before_.low + c * present_.low + (rest * p + local)};
        before_ = present_;
        present_ = next;
        factor_ = {factor_.re + step_.re, factor_.im + step_.im};
    }

    Complex value() const { return Sum(present_); }

private:
    struct Pair {
        Complex high, low;
    };
    static Complex Sum(const Pair &p) {
        const Complex sum = p.high + p.low;
        return std::isfinite(sum.re) && std::isfinite(sum.im) ? sum : p.high;
    }
    static ExtendedComplex TwoOver(Complex z) {
        const Complex quotient = Complex{2, 0} / z;
        const Extended re = ExactProduct(quotient.re, z.re) - ExactProduct(quotient.im, z.im);
        const Extended im = ExactProduct(quotient.re, z.im) + ExactProduct(quotient.im, z.re);
        const Complex rest = {(Extended{2, 0} - re).high, -im.high};
        const Complex low = rest * quotient * 0.5;
        return {{quotient.re, low.re}, {quotient.im, low.im}};
    }

    ExtendedComplex step_;
    ExtendedComplex factor_; // of the next step
    Pair before_, present_;
};

} // namespace qx

#endif
