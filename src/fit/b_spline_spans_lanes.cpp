#include "fit/b_spline_spans.h"
#include "frame/lanes.h"

namespace qx::QX_WIDTH {

namespace {

// Four samples, in as many vectors as the width requires.
struct Four {
    typedef Lanes<nativeLanes> Part;
    static constexpr int parts = 4 / nativeLanes;

    QX_INLINE Four() = default;
    QX_INLINE explicit Four(double value) {
        for (Part &p : part)
            p = Part(value);
    }
    static QX_INLINE Four load(const DBL *x) {
        Four f;
        for (int i = 0; i < parts; ++i)
            f.part[i] = Part::load(x + i * nativeLanes);
        return f;
    }
    QX_INLINE void store(DBL *x) const {
        for (int i = 0; i < parts; ++i)
            part[i].store(x + i * nativeLanes);
    }
    QX_INLINE double sum() const {
        double x[4];
        store(x);
        return (x[0] + x[1]) + (x[2] + x[3]);
    }
    friend QX_INLINE Four operator+(Four a, Four b) {
        for (int i = 0; i < parts; ++i)
            a.part[i] = a.part[i] + b.part[i];
        return a;
    }
    friend QX_INLINE Four operator-(Four a, Four b) {
        for (int i = 0; i < parts; ++i)
            a.part[i] = a.part[i] - b.part[i];
        return a;
    }
    friend QX_INLINE Four operator*(Four a, Four b) {
        for (int i = 0; i < parts; ++i)
            a.part[i] = a.part[i] * b.part[i];
        return a;
    }

    Part part[parts];
};

// Samples i to i + 3; after the last sample its x is repeated, with y and weight 0.
struct FourSamples {
    Four x, y;
    double weight[4];

    QX_INLINE FourSamples(const SpanSamples &s, int32_t i) {
        const int32_t left = s.count - i;
        if (left >= 4) {
            x = Four::load(s.x + i);
            y = Four::load(s.y + i);
            for (int lane = 0; lane < 4; ++lane)
                weight[lane] = s.w == nullptr ? 1.0 : __builtin_fabs(s.w[i + lane]);
            return;
        }
        double xs[4], ys[4];
        for (int lane = 0; lane < 4; ++lane) {
            const bool isThere = lane < left;
            xs[lane] = s.x[isThere ? i + lane : s.count - 1];
            ys[lane] = isThere ? s.y[i + lane] : 0.0;
            weight[lane] = !isThere ? 0.0 : s.w == nullptr ? 1.0 : __builtin_fabs(s.w[i + lane]);
        }
        x = Four::load(xs);
        y = Four::load(ys);
    }
};

// The degree + 1 splines that are not 0 in a span, by the recurrence of M. G. Cox and C. de Boor
// (1972), with the inverse widths of the supports formed once.
template <int Degree>
class Basis {
public:
    explicit QX_INLINE Basis(const DBL *knots) {
        for (int j = 1; j <= Degree; ++j) {
            left_[j] = knots[1 - j];
            right_[j] = knots[j];
        }
        double *inverse = inverse_;
        for (int j = 1; j <= Degree; ++j)
            for (int r = 0; r < j; ++r)
                *inverse++ = 1.0 / (knots[r + 1] - knots[r + 1 - j]);
    }
    QX_INLINE void at(Four x, Four *basis) const {
        Four left[Degree + 1], right[Degree + 1];
        const double *inverse = inverse_;
        basis[0] = Four(1.0);
#pragma GCC unroll 16
        for (int j = 1; j <= Degree; ++j) {
            left[j] = x - Four(left_[j]);
            right[j] = Four(right_[j]) - x;
            Four carried(0.0);
#pragma GCC unroll 16
            for (int r = 0; r < j; ++r) {
                const Four share = basis[r] * Four(*inverse++);
                basis[r] = carried + right[r + 1] * share;
                carried = left[j - r] * share;
            }
            basis[j] = carried;
        }
    }

private:
    double left_[Degree + 1], right_[Degree + 1], inverse_[Degree * (Degree + 1) / 2];
};

template <int Degree>
void WriteRows(const SpanSamples &samples, const DBL *knots, double scale, DBL *work) {
    const Basis<Degree> spline(knots);
    for (int32_t i = 0; i < samples.count; i += 4) {
        const FourSamples four(samples, i);
        double roots[4];
        for (int lane = 0; lane < 4; ++lane)
            roots[lane] = __builtin_sqrt(four.weight[lane]) * scale;
        const Four root = Four::load(roots);
        Four basis[Degree + 1];
        spline.at(four.x, basis);
        for (int j = 0; j <= Degree; ++j)
            (basis[j] * root).store(work + j * kSplineRows + i);
        (four.y * root).store(work + (Degree + 1) * kSplineRows + i);
    }
}

// H = I - tau u u' with u = (1, v / (alpha - beta)) maps (alpha, v) to (beta, 0), where alpha is
// the diagonal element r[0] and v the column; Rest columns follow, the target last. The sign of
// beta is chosen so that nothing cancels.
template <int Rest>
void Reflect(DBL *v, int32_t rows, DBL *r, int32_t target) {
    Four squares(0.0), products[Rest];
    for (Four &product : products)
        product = Four(0.0);
    for (int32_t i = 0; i < rows; i += 4) {
        const Four element = Four::load(v + i);
        squares = squares + element * element;
#pragma GCC unroll 16
        for (int c = 0; c < Rest; ++c)
            products[c] = products[c] + element * Four::load(v + (c + 1) * kSplineRows + i);
    }
    const double below = squares.sum(), alpha = r[0];
    if (below == 0.0)
        return;
    const double beta = -__builtin_copysign(__builtin_sqrt(alpha * alpha + below), alpha);
    const double tau = (beta - alpha) / beta, factor = 1.0 / (alpha - beta);
    r[0] = beta;
    Four steps[Rest];
#pragma GCC unroll 16
    for (int c = 0; c < Rest; ++c) {
        DBL &above = r[c == Rest - 1 ? target : c + 1];
        const double step = tau * (above + factor * products[c].sum());
        above -= step;
        steps[c] = Four(step * factor);
    }
    if constexpr (Rest > 1) // otherwise only the rest of the target remains, which is not needed
        for (int32_t i = 0; i < rows; i += 4) {
            const Four element = Four::load(v + i);
#pragma GCC unroll 16
            for (int c = 0; c < Rest; ++c) {
                DBL *const at = v + (c + 1) * kSplineRows + i;
                (Four::load(at) - steps[c] * element).store(at);
            }
        }
}

template <int Rest>
void ReflectAll(DBL *v, int32_t rows, DBL *r, int32_t target) {
    Reflect<Rest>(v, rows, r, target);
    if constexpr (Rest > 1)
        ReflectAll<Rest - 1>(v + kSplineRows, rows, r + target + 1, target);
}

template <int Degree>
void Reduce(const SpanSamples &samples, const DBL *knots, double scale, DBL *triangle, DBL *work) {
    WriteRows<Degree>(samples, knots, scale, work);
    ReflectAll<Degree + 1>(work, samples.count, triangle, Degree + 1);
}

template <int Degree>
void Evaluate(const SpanSamples &samples, const DBL *knots, const DBL *coefficients, DBL *values,
              DBL *squares) {
    const Basis<Degree> spline(knots);
    Four sum = Four::load(squares);
    for (int32_t i = 0; i < samples.count; i += 4) {
        const FourSamples four(samples, i);
        Four basis[Degree + 1], value(0.0);
        spline.at(four.x, basis);
        for (int j = 0; j <= Degree; ++j)
            value = value + basis[j] * Four(coefficients[j]);
        const Four rest = four.y - value;
        sum = sum + Four::load(four.weight) * (rest * rest);
        if (samples.count - i >= 4) {
            value.store(values + i);
            continue;
        }
        double last[4];
        value.store(last);
        for (int32_t lane = 0; lane < samples.count - i; ++lane)
            values[i + lane] = last[lane];
    }
    sum.store(squares);
}

} // namespace

void ReduceSpan(const SpanSamples *samples, const DBL *knots, int32_t degree, double scale,
                DBL *triangle, DBL *work) {
    constexpr decltype(&Reduce<1>) reduce[] = {Reduce<1>, Reduce<2>, Reduce<3>,
                                               Reduce<4>, Reduce<5>, Reduce<6>,
                                               Reduce<7>, Reduce<8>, Reduce<kHighestSplineDegree>};
    reduce[degree - 1](*samples, knots, scale, triangle, work);
}

void EvaluateSpan(const SpanSamples *samples, const DBL *knots, int32_t degree,
                  const DBL *coefficients, DBL *values, DBL *squares) {
    constexpr decltype(&Evaluate<1>) evaluate[] = {
        Evaluate<1>, Evaluate<2>, Evaluate<3>,
        Evaluate<4>, Evaluate<5>, Evaluate<6>,
        Evaluate<7>, Evaluate<8>, Evaluate<kHighestSplineDegree>};
    evaluate[degree - 1](*samples, knots, coefficients, values, squares);
}

} // namespace qx::QX_WIDTH
