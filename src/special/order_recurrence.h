#ifndef QX_SPECIAL_ORDER_RECURRENCE_H
#define QX_SPECIAL_ORDER_RECURRENCE_H

#include "frame/lanes.h"
#include "special/complex_exponent.h"

namespace qx {

// The recurrence f(next) = f(before) + (2 order / z) f of the modified Bessel functions: upwards
// for K, with its signs unchanged, and downwards for I. The rounding errors of the inverse of z, of
// the orders and of each step are carried along to first order: over n steps the plain recurrence
// loses about |z|^(2/3) eps near the turning point, most of it to the rounding of 2 / z.
class OrderRecurrence {
public:
    // The first step goes from `order` in `direction`, +1 or -1. For |z| below 1e-100 or values
    // above 2^996 the correction may overflow; value() is then the uncorrected value.
    OrderRecurrence(Complex z, Extended order, double direction, Complex before, Complex present)
        : before_(Pack(before)), beforeLow_(0.0), present_(Pack(present)), presentLow_(0.0) {
        const ExtendedComplex step = TwoOver(z);
        const ExtendedComplex factor = {order * step.re, order * step.im};
        step_ = Pack({direction * step.re.high, direction * step.im.high});
        stepLow_ = Pack({direction * step.re.low, direction * step.im.low});
        factor_ = Pack({factor.re.high, factor.im.high});
        factorLow_ = Pack({factor.re.low, factor.im.low});
    }

    void advance() {
        const Lanes<2> re = Evens(factor_, factor_);
        const Lanes<2> im = Odds(factor_, factor_) * sign();
        const Lanes<2> turned = present_.reversed();
        const Sum2 one = Product(re, present_);
        const Sum2 other = Product(im, turned);
        const Sum2 product = Sum(one.high, other.high);
        const Sum2 next = Sum(product.high, before_);
        const Lanes<2> ofLow = re * presentLow_ + im * presentLow_.reversed();
        const Lanes<2> ofFactor = Evens(factorLow_, factorLow_) * present_ +
                                  Odds(factorLow_, factorLow_) * sign() * turned;
        const Lanes<2> local = (one.low + other.low) + (product.low + next.low);
        const Lanes<2> nextLow = beforeLow_ + ((ofFactor + local) + ofLow);
        before_ = present_;
        beforeLow_ = presentLow_;
        present_ = next.high;
        presentLow_ = nextLow;
        const Sum2 factor = Sum(factor_, step_);
        factor_ = factor.high;
        factorLow_ = factorLow_ + (stepLow_ + factor.low);
    }

    Complex value() const {
        const Lanes<2> sum = present_ + presentLow_;
        const Complex plain = {present_[0], present_[1]};
        return std::isfinite(sum[0]) && std::isfinite(sum[1]) ? Complex{sum[0], sum[1]} : plain;
    }

private:
    struct Sum2 {
        Lanes<2> high, low;
    };
    static Lanes<2> Pack(Complex z) {
        const double parts[] = {z.re, z.im};
        return Lanes<2>::gather(parts, 1);
    }
    static Lanes<2> sign() { return Pack({-1, 1}); }
    // ExactSum and ExactProduct (frame/extended.h) for two parts each.
    static Sum2 Sum(Lanes<2> a, Lanes<2> b) {
        const Lanes<2> s = a + b;
        const Lanes<2> t = s - a;
        return {s, (a - (s - t)) + (b - t)};
    }
    static Sum2 Product(Lanes<2> a, Lanes<2> b) {
        const Lanes<2> splitter(134217729.0); // 2^27 + 1
        const Lanes<2> p = a * b;
        const Lanes<2> ta = splitter * a;
        const Lanes<2> ah = ta - (ta - a);
        const Lanes<2> al = a - ah;
        const Lanes<2> tb = splitter * b;
        const Lanes<2> bh = tb - (tb - b);
        const Lanes<2> bl = b - bh;
        return {p, ((ah * bh - p) + ah * bl + al * bh) + al * bl};
    }
    static ExtendedComplex TwoOver(Complex z) {
        const Complex quotient = Complex{2, 0} / z;
        const Extended re = ExactProduct(quotient.re, z.re) - ExactProduct(quotient.im, z.im);
        const Extended im = ExactProduct(quotient.re, z.im) + ExactProduct(quotient.im, z.re);
        const Complex rest = {(Extended{2, 0} - re).high, -im.high};
        const Complex low = rest * quotient * 0.5;
        return {{quotient.re, low.re}, {quotient.im, low.im}};
    }

    Lanes<2> step_, stepLow_;
    Lanes<2> factor_, factorLow_; // for the next step
    Lanes<2> before_, beforeLow_, present_, presentLow_;
};

} // namespace qx

#endif
