// References for the complex Bessel and Airy functions, by the ball arithmetic of Arb (F.
// Johansson, Arb: efficient arbitrary-precision midpoint-radius interval arithmetic, 2017): the
// precision is raised until every value is certain to 110 bits. Needs libflint-arb-dev.
//
// The input line "bessel ORDER RE IM" gives J, Y, I, K, H1, H2, the line "airy RE IM" gives Ai, Ai', Bi, Bi'.
// Each value is an output line: for scaled = 0 and 1 the parts as two doubles each, RE RE_LOW IM IM_LOW,
// then the amplitude of the oscillation over the absolute value: |f'| |z| / max(|s|, |z|^(2/3),
// 1) with s^2 = order^2 -+ z^2; for Airy functions |f'| / sqrt |z|, for their derivatives |f| sqrt
// |z|. The sign of a zero imaginary part chooses the side of a cut.

#include <acb_hypgeom.h>

#include <cmath>
#include <cstdio>
#include <cstring>
#include <utility>

namespace {

slong precision;

class Ball {
public:
    Ball() { acb_init(v); }
    Ball(double re, double im = 0) : Ball() { acb_set_d_d(v, re, im); }
    Ball(const Ball &other) : Ball() { acb_set(v, other.v); }
    Ball &operator=(const Ball &other) {
        acb_set(v, other.v);
        return *this;
    }
    ~Ball() { acb_clear(v); }
    double size() const {
        arb_t a;
        arb_init(a);
        acb_abs(a, v, 60);
        const double size = arf_get_d(arb_midref(a), ARF_RND_NEAR);
        arb_clear(a);
        return size;
    }
    bool isGood() const { return acb_rel_accuracy_bits(v) >= 110; }
    acb_t v;
};

Ball operator+(const Ball &a, const Ball &b) {
    Ball c;
    acb_add(c.v, a.v, b.v, precision);
    return c;
}
Ball operator-(const Ball &a, const Ball &b) {
    Ball c;
    acb_sub(c.v, a.v, b.v, precision);
    return c;
}
Ball operator*(const Ball &a, const Ball &b) {
    Ball c;
    acb_mul(c.v, a.v, b.v, precision);
    return c;
}
Ball operator/(const Ball &a, const Ball &b) {
    Ball c;
    acb_div(c.v, a.v, b.v, precision);
    return c;
}
Ball Exp(const Ball &a) {
    Ball c;
    acb_exp(c.v, a.v, precision);
    return c;
}
Ball TurnByPi(double turns) { // exp(i pi turns)
    Ball c;
    acb_exp_pi_i(c.v, Ball(turns).v, precision);
    return c;
}
Ball Pi() {
    Ball c;
    acb_const_pi(c.v, precision);
    return c;
}
Ball I(double order, const Ball &z) {
    Ball c;
    acb_hypgeom_bessel_i(c.v, Ball(order).v, z.v, precision);
    return c;
}
Ball K(double order, const Ball &z) {
    Ball c;
    acb_hypgeom_bessel_k(c.v, Ball(order).v, z.v, precision);
    return c;
}
const Ball kI(0, 1);

// The functions of x + i y with y >= 0, from I and K of |order| in the right half-plane.
void Bessel(double order, double x, double y, Ball (&f)[6]) {
    const double u = std::fabs(order);
    const Ball w(y, -x);
    const Ball half = TurnByPi(0.5 * u);
    f[0] = half * I(u, w);
    f[4] = Ball(0, -2) / Pi() / half * K(u, w);
    f[1] = kI * (f[0] - f[4]);
    f[5] = f[0] + f[0] - f[4];
    const Ball place(std::fabs(x), x < 0 ? -y : y);
    const Ball i = I(u, place);
    const Ball k = K(u, place);
    f[2] = x < 0 ? TurnByPi(u) * i : i;
    f[3] = x < 0 ? k / TurnByPi(u) - kI * Pi() * i : k;
    if (order >= 0)
        return;
    Ball c, s;
    acb_cos_pi(c.v, Ball(u).v, precision);
    acb_sin_pi(s.v, Ball(u).v, precision);
    const Ball j = f[0];
    f[0] = j * c - f[1] * s;
    f[1] = j * s + f[1] * c;
    f[2] = f[2] + Ball(2) / Pi() * s * f[3];
    f[4] = f[4] * TurnByPi(u);
    f[5] = f[5] / TurnByPi(u);
}

void PrintPart(const arb_t x) {
    const double high = arf_get_d(arb_midref(x), ARF_RND_NEAR);
    arf_t rest;
    arf_init(rest);
    if (std::isfinite(high)) {
        arf_set_d(rest, high);
        arf_sub(rest, arb_midref(x), rest, 200, ARF_RND_NEAR);
    }
    std::printf("%.17g %.17g ", high, arf_get_d(rest, ARF_RND_NEAR));
    arf_clear(rest);
}

// The value is conjugated if the point is below the real axis.
void Print(Ball plain, Ball scaled, bool isBelow, double amplitude) {
    for (Ball *value : {&plain, &scaled}) {
        if (isBelow)
            acb_conj(value->v, value->v);
        PrintPart(acb_realref(value->v));
        PrintPart(acb_imagref(value->v));
    }
    std::printf("%.6g\n", amplitude);
}

template <int N>
bool AreGood(const Ball (&f)[N]) {
    bool isGood = true;
    for (const Ball &value : f)
        isGood = isGood && value.isGood();
    return isGood;
}

void BesselLines(double order, double x, double y) {
    const bool isBelow = std::signbit(y);
    y = std::fabs(y);
    Ball f[6], next[6];
    precision = 80;
    do {
        precision *= 2;
        Bessel(order, x, y, f);
    } while (precision < 40000 && !AreGood(f));
    Bessel(order + 1, x, y, next);
    const Ball z(x, y);
    const Ball decay = Exp(Ball(-y));
    const Ball scales[] = {
        decay, decay, Exp(Ball(-std::fabs(x))), Exp(z), Exp(Ball(y, -x)), Exp(Ball(-y, x))};
    const double size = z.size();
    for (int n = 0; n < 6; ++n) {
        const int k = !isBelow || n < 4 ? n : 9 - n; // the Hankel functions are exchanged
        const bool isModified = k == 2 || k == 3;
        const Ball slope =
            k == 2 ? Ball(order) * f[k] + z * next[k] : Ball(order) * f[k] - z * next[k];
        const Ball square = isModified ? Ball(order * order) + z * z : Ball(order * order) - z * z;
        const double pace =
            std::fmax(std::sqrt(square.size()), std::fmax(1, std::pow(size, 2.0 / 3)));
        Print(f[k], f[k] * scales[k], isBelow, (slope / f[k]).size() / pace);
    }
}

void AiryLines(double x, double y) {
    const bool isBelow = std::signbit(y);
    const Ball z(x, std::fabs(y));
    Ball f[4];
    precision = 80;
    do {
        precision *= 2;
        acb_hypgeom_airy(f[0].v, f[1].v, f[2].v, f[3].v, z.v, precision);
    } while (precision < 40000 && !AreGood(f));
    Ball root;
    acb_sqrt(root.v, z.v, precision);
    const Ball zeta = Ball(2) / Ball(3) * z * root;
    Ball growth;
    arb_abs(acb_realref(growth.v), acb_realref(zeta.v));
    const Ball scales[] = {Exp(zeta), Exp(Ball(0) - growth)};
    for (int k = 0; k < 4; ++k) {
        const double ratio = (f[k ^ 1] / f[k]).size();
        const double pace = std::sqrt(std::fmax(1, z.size()));
        Print(f[k], f[k] * scales[k / 2], isBelow, k % 2 == 0 ? ratio / pace : ratio * pace);
    }
}

} // namespace

int main() {
    char name[16];
    while (std::scanf("%15s", name) == 1) {
        double a[3] = {};
        const int count = std::strcmp(name, "airy") == 0 ? 2 : 3;
        for (int n = 0; n < count; ++n)
            if (std::scanf("%lf", &a[n]) != 1)
                return 1;
        if (count == 2)
            AiryLines(a[0], a[1]);
        else
            BesselLines(a[0], a[1], a[2]);
    }
    return 0;
}
