// random_hypergeometric kummer|tricomi|gauss POINTS [SEED]: the errors of QX_Kummer_2026, QX_Tricomi_2026 or
// QX_Gauss_2026 at random points, against the ball arithmetic of Arb (F. Johansson, Arb: efficient
// arbitrary-precision midpoint-radius interval arithmetic, 2017), whose precision is raised until 70 bits are
// certain. Needs libflint-arb-dev. Built and run as
//
//     g++ -std=c++20 -O2 -Iinclude -Ibuild/release/include tools/accuracy/random_hypergeometric.cpp
//         -Lbuild/release -lqxanalysis -lqxrt -Wl,-rpath,$PWD/build/release -lflint-arb -lflint
//         -o random_hypergeometric
//     nice -n 19 ./random_hypergeometric kummer 280000
//
// Four tenths of the points have |a|, |b|, |c| <= 5, the others <= 100; a quarter of the parameters are whole
// and a quarter half numbers. x is in [0.001, 100] for Tricomi's function, in [-100, 100] for Kummer's and in
// [-100, 1] for Gauss's, a quarter of it next to 1. Points whose value is outside 1e-300 to 1e300, poles, and
// those for which Arb needs more than 8192 bits are left out. Prints for both ranges of the parameters the
// largest error and where, the number of NaN and of errors above 1e-13 and 1e-10, and the time of the calls.
// src/special/README.md has the figures of such runs.

#include "arb_ball.h"
#include "qx/special_hypergeometric.h"

#include <arb_hypgeom.h>

#include <algorithm>
#include <chrono>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <random>
#include <string>
#include <vector>

namespace {

struct Point {
    double a, b, c, x;
    bool isSmall; // parameters up to 5
};

struct Kind {
    const char *name;
    double (*value)(const Point &);
    void (*reference)(Ball &, const Ball &a, const Ball &b, const Ball &c, const Ball &x,
                      slong bits);
    double (*argument)(std::mt19937_64 &);
};

double Uniform(std::mt19937_64 &random, double low, double high) {
    return std::uniform_real_distribution<double>(low, high)(random);
}

double Parameter(std::mt19937_64 &random, double limit) {
    const double any = Uniform(random, -limit, limit);
    switch (random() % 4) {
    case 0:
        return std::rint(any);
    case 1:
        return std::rint(any - 0.5) + 0.5;
    default:
        return any;
    }
}

// M(a, b, x). At the poles b = 0, -1, -2, ... Arb takes a limit of its own: there, the series if it ends
// before the pole, and otherwise no reference.
void KummerReference(Ball &out, const Ball &a, const Ball &b, const Ball &, const Ball &x,
                     slong bits) {
    if (!arb_is_int(b.v) || arb_is_positive(b.v)) {
        arb_hypgeom_m(out.v, a.v, b.v, x.v, 0, bits);
        return;
    }
    const long first = std::lround(a.middle()), second = std::lround(b.middle());
    if (!arb_is_int(a.v) || first > 0 || first <= second) {
        arb_indeterminate(out.v);
        return;
    }
    Ball term(1.0);
    arb_one(out.v);
    for (long k = 0; k < -first; ++k) {
        arb_mul(term.v, term.v, x.v, bits);
        arb_mul_si(term.v, term.v, first + k, bits);
        arb_div_si(term.v, term.v, (second + k) * (k + 1), bits);
        arb_add(out.v, out.v, term.v, bits);
    }
}

const Kind kinds[] = {
    {"kummer",
     [](const Point &p) {
         double value;
         QX_Kummer_2026(p.x, p.a, p.b, &value);
         return value;
     },
     KummerReference, [](std::mt19937_64 &random) { return Uniform(random, -100, 100); }},
    {"tricomi",
     [](const Point &p) {
         double value;
         QX_Tricomi_2026(p.x, p.a, p.b, &value);
         return value;
     },
     [](Ball &out, const Ball &a, const Ball &b, const Ball &, const Ball &x, slong bits) {
         arb_hypgeom_u(out.v, a.v, b.v, x.v, bits);
     },
     [](std::mt19937_64 &random) {
         return random() % 3 == 0 ? Uniform(random, 0.001, 100)
                                  : std::exp(Uniform(random, std::log(0.001), std::log(100.0)));
     }},
    {"gauss",
     [](const Point &p) {
         double value;
         QX_Gauss_2026(p.x, p.a, p.b, p.c, &value);
         return value;
     },
     [](Ball &out, const Ball &a, const Ball &b, const Ball &c, const Ball &x, slong bits) {
         arb_hypgeom_2f1(out.v, a.v, b.v, c.v, x.v, 0, bits);
     },
     [](std::mt19937_64 &random) {
         switch (random() % 4) {
         case 0:
             return Uniform(random, -100, 1);
         case 1:
             return 1 - std::exp(Uniform(random, -12, 0));
         default:
             return Uniform(random, -1, 1);
         }
     }},
};

// False if the value cannot be found or is outside 1e-300 to 1e300.
bool FindReference(const Kind &kind, const Point &p, Ball &out) {
    const Ball a(p.a), b(p.b), c(p.c), x(p.x);
    for (slong bits = 128; bits <= 8192; bits *= 2) {
        kind.reference(out, a, b, c, x, bits);
        if (arb_rel_accuracy_bits(out.v) >= 70) {
            const double size = std::fabs(out.middle());
            return size > 1e-300 && size < 1e300;
        }
    }
    return false;
}

double RelativeError(double value, const Ball &reference) {
    Ball error(value);
    arb_sub(error.v, error.v, reference.v, 256);
    arb_div(error.v, error.v, reference.v, 256);
    return std::fabs(error.middle());
}

struct Tally {
    std::vector<double> errors;
    double worst = 0;
    Point where = {};
    long nan = 0;

    void add(const Point &p, double value, const Ball &reference) {
        if (std::isnan(value)) {
            ++nan;
            return;
        }
        errors.push_back(RelativeError(value, reference));
        if (!(errors.back() <= worst)) {
            worst = errors.back();
            where = p;
        }
    }
    void print(const Kind &kind, const char *range) const {
        const auto above = [&](double limit) {
            return std::count_if(errors.begin(), errors.end(),
                                 [&](double e) { return !(e <= limit); });
        };
        std::printf(
            "%s, parameters to %s: %zu points, worst %.2g (%.1f eps) at a %.17g b %.17g c %.17g x "
            "%.17g, NaN %ld, above 1e-13 %td, above 1e-10 %td\n",
            kind.name, range, errors.size() + static_cast<std::size_t>(nan), worst, worst / 0x1p-52,
            where.a, where.b, where.c, where.x, nan, above(1e-13), above(1e-10));
    }
};

void Measure(const Kind &kind, long points, std::mt19937_64 random) {
    Tally small, large;
    long leftOut = 0;
    double spent = 0, longest = 0;
    for (long i = 0; i < points; ++i) {
        Point p = {};
        p.isSmall = random() % 10 < 4;
        const double limit = p.isSmall ? 5 : 100;
        for (double *parameter : {&p.a, &p.b, &p.c})
            *parameter = Parameter(random, limit);
        p.x = kind.argument(random);
        const auto start = std::chrono::steady_clock::now();
        const double value = kind.value(p);
        const double time =
            std::chrono::duration<double, std::micro>(std::chrono::steady_clock::now() - start)
                .count();
        spent += time;
        longest = std::max(longest, time);
        Ball reference;
        if (FindReference(kind, p, reference))
            (p.isSmall ? small : large).add(p, value, reference);
        else
            ++leftOut;
    }
    small.print(kind, "5");
    large.print(kind, "100");
    std::printf("left out %ld, mean time %.2f us, longest %.0f us\n", leftOut,
                spent / static_cast<double>(points), longest);
}

} // namespace

int main(int argc, char **argv) {
    const std::string name = argc > 2 ? argv[1] : "";
    for (const Kind &kind : kinds)
        if (kind.name == name) {
            Measure(kind, std::atol(argv[2]),
                    std::mt19937_64(argc > 3 ? std::strtoull(argv[3], nullptr, 10) : 1));
            return 0;
        }
    std::fputs("usage: random_hypergeometric kummer|tricomi|gauss POINTS [SEED]\n", stderr);
    return 2;
}
