#ifndef QX_FIT_MODELS_H
#define QX_FIT_MODELS_H

#include "fit/bounded_lm.h"
#include "fit/model_sums.h"
#include "frame/constants.h"

#include <cmath>

namespace qx {

// The models of the bounded fits. evaluate returns the value at x and the derivatives with respect
// to the parameters, in their order; common terms, such as the exponential, are computed once.

// a exp(b x) + c
struct ExponentialModel {
    static constexpr int32_t count = 3;
    static constexpr auto &inLanes = ExponentialSums;
    static double value(double x, const DBL *p, const void *) {
        return p[0] * std::exp(p[1] * x) + p[2];
    }
    static double evaluate(double x, const DBL *p, const void *, double *d) {
        const double e = std::exp(p[1] * x);
        d[0] = e;
        d[1] = p[0] * x * e;
        d[2] = 1.0;
        return p[0] * e + p[2];
    }
};

// a x^b + c for x > 0. It is fitted as an exponential of ln x, which needs to be taken only once.
struct PowerModel {
    static double value(double x, const DBL *p, const void *) {
        return p[0] * std::pow(x, p[1]) + p[2];
    }
};

// a exp(-0.5 ((x - m) / s)^2) + c
struct GaussianModel {
    static constexpr int32_t count = 4;
    static constexpr auto &inLanes = GaussianSums;
    static double value(double x, const DBL *p, const void *) {
        const double z = (x - p[1]) / p[2];
        return p[0] * std::exp(-0.5 * (z * z)) + p[3];
    }
    static double evaluate(double x, const DBL *p, const void *, double *d) {
        const double z = (x - p[1]) / p[2];
        const double e = std::exp(-0.5 * (z * z));
        const double slope = p[0] * e * z / p[2];
        d[0] = e;
        d[1] = slope;
        d[2] = slope * z;
        d[3] = 1.0;
        return p[0] * e + p[3];
    }
};

// The sums of the normal equations in registers.
template <class Model>
void NormalEquations(const FitSamples &samples, const DBL *p, int32_t, double *mse, DBL *a,
                     DBL *jacobian, DBL *g, const void *user) {
    constexpr int32_t count = Model::count;
    double products[count][count] = {};
    double slopes[count] = {};
    double squares = 0.0;
    for (int32_t k = 0; k < samples.n(); ++k) {
        double d[count];
        const double r = samples.y[k] - Model::evaluate(samples.x[k], p, user, d);
        const double weight = samples.weight(k);
        squares += weight * (r * r);
        for (int32_t i = 0; i < count; ++i) {
            const double weighted = weight * d[i];
            for (int32_t j = 0; j <= i; ++j)
                products[i][j] += weighted * d[j];
            slopes[i] += weighted * r;
        }
        for (int32_t i = 0; jacobian != nullptr && i < count; ++i)
            jacobian[std::ptrdiff_t{k} * count + i] = d[i];
    }
    *mse = squares / samples.n();
    for (int32_t i = 0; i < count; ++i) {
        g[i] = slopes[i];
        for (int32_t j = 0; j < count; ++j)
            a[i * count + j] = j <= i ? products[i][j] : products[j][i];
    }
}

// The same in lanes, for models that support it.
template <class Model>
void NormalEquationsInLanes(const FitSamples &samples, const DBL *p, int32_t count, double *mse,
                            DBL *a, DBL *jacobian, DBL *g, const void *user) {
    if (jacobian != nullptr) {
        NormalEquations<Model>(samples, p, count, mse, a, jacobian, g, user);
        return;
    }
    DBL sums[SumsOfModel(Model::count)];
    Model::inLanes(samples.x.data(), samples.y.data(), samples.weights(), samples.n(), p, sums);
    *mse = sums[0] / samples.n();
    const DBL *next = sums + 1;
    for (int32_t i = 0; i < Model::count; ++i) {
        for (int32_t j = 0; j <= i; ++j)
            a[i * Model::count + j] = a[j * Model::count + i] = *next++;
        g[i] = *next++;
    }
}

// The model in the form that the iteration takes; `user` is passed to its functions.
template <class Model>
FitModel FitModelOf(const void *user = nullptr) {
    return {Model::count,
            [](double x, const DBL *p, int32_t, const void *constants) {
                return Model::value(x, p, constants);
            },
            [](double x, const DBL *p, int32_t, DBL *out, const void *constants) {
                double d[Model::count];
                Model::evaluate(x, p, constants, d);
                for (int32_t i = 0; i < Model::count; ++i)
                    out[i] = d[i];
            },
            [] {
                if constexpr (requires { Model::inLanes; })
                    return NormalEquationsInLanes<Model>;
                else
                    return NormalEquations<Model>;
            }(),
            user};
}

} // namespace qx

#endif
