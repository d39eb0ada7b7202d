// random_distributions normal|student|fisher|chi-square POINTS [SEED [LOW HIGH]]: the errors of the revisions of 2026
// of a distribution and its inverse at random points, in eps, against the ball arithmetic of Arb (F. Johansson,
// Arb: efficient arbitrary-precision midpoint-radius interval arithmetic, 2017), whose precision is raised until
// 100 bits are certain. Needs libflint-arb-dev. Built and run as
//
//     g++ -std=c++20 -O2 -Iinclude -Ibuild/release/include tools/accuracy/random_distributions.cpp
//         -Lbuild/release -lqxanalysis -lqxrt -Wl,-rpath,$PWD/build/release -lflint-arb -lflint
//         -o random_distributions
//     nice -n 19 ./random_distributions fisher 20000
//
// Degrees of freedom are between LOW and HIGH, 1 and 100 by default; a third are whole and a third half
// numbers. Normal points are in [-38, 38], Student's within 1e-3 to 100, Fisher's within 1e-3 to 1e3, and
// chi-square's within 1e-3 to 10 times the degrees. Probabilities of the inverses, in either tail, are in turn
// uniform and 10^u with u uniform over -260 to 0. Values outside 1e-290 to 1e290 are left out.
// src/stats/README.md has the figures of such runs.

#include "arb_ball.h"
#include "qx/distributions.h"

#include <arb_hypgeom.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <random>
#include <string>

namespace {

slong precision;

bool IsCertain(const Ball &a) { return arb_rel_accuracy_bits(a.v) >= 100; }

Ball operator+(const Ball &a, const Ball &b) {
    Ball out;
    arb_add(out.v, a.v, b.v, precision);
    return out;
}
Ball operator-(const Ball &a, const Ball &b) {
    Ball out;
    arb_sub(out.v, a.v, b.v, precision);
    return out;
}
Ball operator*(const Ball &a, const Ball &b) {
    Ball out;
    arb_mul(out.v, a.v, b.v, precision);
    return out;
}
Ball operator/(const Ball &a, const Ball &b) {
    Ball out;
    arb_div(out.v, a.v, b.v, precision);
    return out;
}
Ball Exp(const Ball &a) {
    Ball out;
    arb_exp(out.v, a.v, precision);
    return out;
}
Ball Log(const Ball &a) {
    Ball out;
    arb_log(out.v, a.v, precision);
    return out;
}
Ball LogGamma(const Ball &a) {
    Ball out;
    arb_lgamma(out.v, a.v, precision);
    return out;
}
Ball Pi() {
    Ball out;
    arb_const_pi(out.v, precision);
    return out;
}
// The regularised incomplete beta function.
Ball LowerBeta(const Ball &a, const Ball &b, const Ball &x) {
    Ball out;
    arb_hypgeom_beta_lower(out.v, a.v, b.v, x.v, 1, precision);
    return out;
}
// The logarithm of 1 - a.
Ball LogComplement(const Ball &a) {
    Ball out;
    arb_neg(out.v, a.v);
    arb_log1p(out.v, out.v, precision);
    return out;
}

struct Point {
    double x, n, d; // n and d: degrees of freedom
};

struct Parts {
    Ball probability, survival, density;
};

struct Distribution {
    const char *name;
    Parts (*parts)(const Point &);
    double (*value)(const Point &, int32_t what);
    double (*inverse)(double p, int32_t tail, const Point &); // p.x counts for nothing
    double (*argument)(std::mt19937_64 &, const Point &);
};

double Uniform(std::mt19937_64 &random, double low, double high) {
    return std::uniform_real_distribution<double>(low, high)(random);
}
double Logarithmic(std::mt19937_64 &random, double low, double high) {
    return std::exp(Uniform(random, std::log(low), std::log(high)));
}

const Distribution distributions[] = {
    {"normal",
     [](const Point &p) {
         Parts parts;
         const Ball x(p.x), z = x / Exp(Log(2.0) / 2.0), opposite = Ball(0.0) - z;
         arb_hypgeom_erfc(parts.probability.v, opposite.v, precision);
         arb_hypgeom_erfc(parts.survival.v, z.v, precision);
         parts.probability = parts.probability / 2.0;
         parts.survival = parts.survival / 2.0;
         parts.density = Exp(Ball(0.0) - x * x / 2.0 - Log(Ball(2.0) * Pi()) / 2.0);
         return parts;
     },
     [](const Point &p, int32_t what) {
         double value;
         ErrorCode err;
         NormDist2026_head(&p.x, &what, &value, &err);
         return value;
     },
     [](double p, int32_t tail, const Point &) {
         double x;
         ErrorCode err;
         InvNdist2026_head(&p, &tail, &x, &err);
         return x;
     },
     [](std::mt19937_64 &random, const Point &) { return Uniform(random, -38, 38); }},
    {"student",
     [](const Point &p) {
         const Ball t(p.x), n(p.n), sum = n + t * t;
         const Ball tail = LowerBeta(n / 2.0, 0.5, n / sum) / 2.0, rest = Ball(1.0) - tail;
         const Ball density = Exp(LogGamma((n + 1.0) / 2.0) - LogGamma(n / 2.0) -
                                  Log(n * Pi()) / 2.0 - (n + 1.0) / 2.0 * Log(sum / n));
         return p.x < 0 ? Parts{tail, rest, density} : Parts{rest, tail, density};
     },
     [](const Point &p, int32_t what) {
         double value;
         ErrorCode err;
         TDist2026_head(&p.x, &p.n, &what, &value, &err);
         return value;
     },
     [](double p, int32_t tail, const Point &at) {
         double t;
         ErrorCode err;
         InvTdist2026_head(&p, &tail, &at.n, &t, &err);
         return t;
     },
     [](std::mt19937_64 &random, const Point &) {
         const double t = Logarithmic(random, 1e-3, 100);
         return random() % 2 == 0 ? t : -t;
     }},
    {"fisher",
     [](const Point &p) {
         const Ball f(p.x), n(p.n), d(p.d), sum = n * f + d, x = n * f / sum, y = d / sum;
         return Parts{LowerBeta(n / 2.0, d / 2.0, x), LowerBeta(d / 2.0, n / 2.0, y),
                      Exp(n / 2.0 * Log(x) + d / 2.0 * Log(y) - Log(f) + LogGamma((n + d) / 2.0) -
                          LogGamma(n / 2.0) - LogGamma(d / 2.0))};
     },
     [](const Point &p, int32_t what) {
         double value;
         ErrorCode err;
         FDist2026_head(&p.x, &p.n, &p.d, &what, &value, &err);
         return value;
     },
     [](double p, int32_t tail, const Point &at) {
         double f;
         ErrorCode err;
         InvFDist2026_head(&p, &tail, &at.n, &at.d, &f, &err);
         return f;
     },
     [](std::mt19937_64 &random, const Point &) { return Logarithmic(random, 1e-3, 1e3); }},
    {"chi-square",
     [](const Point &p) {
         Parts parts;
         const Ball a = Ball(p.n) / 2.0, x = Ball(p.x) / 2.0;
         arb_hypgeom_gamma_lower(parts.probability.v, a.v, x.v, 1, precision);
         arb_hypgeom_gamma_upper(parts.survival.v, a.v, x.v, 1, precision);
         parts.density = Exp((a - 1.0) * Log(x) - x - LogGamma(a)) / 2.0;
         return parts;
     },
     [](const Point &p, int32_t what) {
         double value;
         ErrorCode err;
         ChiSquare2026_head(&p.x, &p.n, &what, &value, &err);
         return value;
     },
     [](double p, int32_t tail, const Point &at) {
         double x;
         ErrorCode err;
         InvChiSquare2026_head(&p, &tail, &at.n, &x, &err);
         return x;
     },
     [](std::mt19937_64 &random, const Point &p) { return p.n * Logarithmic(random, 1e-3, 10); }},
};

// The parts at a point, certain; false if 12800 bits are not enough.
bool FindParts(const Distribution &of, const Point &p, Parts &parts) {
    for (precision = 400; precision <= 12800; precision *= 2) {
        parts = of.parts(p);
        if (IsCertain(parts.probability) && IsCertain(parts.survival) && IsCertain(parts.density))
            return true;
    }
    precision = 400;
    return false;
}

bool IsInRange(double x) { return std::fabs(x) > 1e-290 && std::fabs(x) < 1e290; }

// The largest error of one kind of value.
struct Worst {
    const char *name;
    double error = 0;
    Point where = {};
    long points = 0;

    void add(const Ball &relative, const Point &p) {
        const double e = std::fabs(relative.middle()) / 0x1p-52;
        ++points;
        if (!(e <= error)) {
            error = e;
            where = p;
        }
    }
};

void Measure(const Distribution &of, long points, std::mt19937_64 random, double low, double high) {
    Worst worst[] = {{"probability"},  {"survival"}, {"log probability"},
                     {"log survival"}, {"density"},  {"inverse"}};
    long leftOut = 0;
    const auto degrees = [&] {
        const double any = Uniform(random, low, high);
        const double whole = std::rint(any), half = std::floor(any) + 0.5;
        const unsigned kind = random() % 3;
        const double chosen = kind == 0 ? whole : kind == 1 ? half : any;
        return chosen >= low && chosen <= high ? chosen : any;
    };
    for (long i = 0; i < points; ++i) {
        Point p = {0, degrees(), degrees()};
        p.x = of.argument(random, p);
        Parts parts;
        if (FindParts(of, p, parts)) {
            const Ball &lower = parts.probability, &upper = parts.survival;
            const bool isLow = lower.middle() < upper.middle();
            const Ball exact[] = {lower, upper, isLow ? Log(lower) : LogComplement(upper),
                                  isLow ? LogComplement(lower) : Log(upper), parts.density};
            for (int32_t what = 0; what < 5; ++what)
                if (IsInRange(exact[what].middle()))
                    worst[what].add(Ball(of.value(p, what)) / exact[what] - 1.0, p);
        } else
            ++leftOut;
        const double probability =
            random() % 2 == 0 ? Uniform(random, 0, 1) : std::pow(10, Uniform(random, -260, 0));
        const int32_t tail = random() % 2;
        p.x = of.inverse(probability, tail, p);
        // A Newton step from the point found leads to the exact one, to second order.
        if (IsInRange(p.x) && FindParts(of, p, parts))
            worst[5].add(((tail == 0 ? parts.probability : parts.survival) - probability) /
                             (parts.density * p.x),
                         p);
        else
            ++leftOut;
    }
    for (const Worst &w : worst)
        std::printf("%s, %-15s %6ld points, worst %.2f eps at %.17g, %.17g and %.17g degrees\n",
                    of.name, w.name, w.points, w.error, w.where.x, w.where.n, w.where.d);
    std::printf("left out %ld\n", leftOut);
}

} // namespace

int main(int argc, char **argv) {
    const std::string name = argc > 2 ? argv[1] : "";
    for (const Distribution &of : distributions)
        if (of.name == name) {
            Measure(of, std::atol(argv[2]),
                    std::mt19937_64(argc > 3 ? std::strtoull(argv[3], nullptr, 10) : 1),
                    argc > 5 ? std::atof(argv[4]) : 1, argc > 5 ? std::atof(argv[5]) : 100);
            return 0;
        }
    std::fputs(
        "usage: random_distributions normal|student|fisher|chi-square POINTS [SEED [LOW HIGH]]\n",
        stderr);
    return 2;
}
