// The trust region of NonlinearFit2026.
//
// Peer: GSL's gsl_multifit_nlinear with its defaults (Levenberg-Marquardt, More's scaling, QR), for the
// same models with the same derivatives, start and tolerance, 1e-8. Elder: the damped step of
// GetNewCoef_head, driven as its callers do.

#include "bench/timing.h"
#include "fit/damped_step.h"
#include "fit/nonlinear.h"

#include <algorithm>
#include <cmath>
#include <random>
#include <string>
#include <vector>

#ifdef QX_PEER_GSL
#include <gsl/gsl_multifit_nlinear.h>
#endif

namespace {

using qx::bench::Keep;
using qx::bench::LeastTimes;
using qx::bench::Ratios;

struct Problem {
    const char *name;
    std::vector<double> truth, start;
    // Computes the value, and its derivatives if there is an array for them.
    double (*evaluate)(double x, const double *p, double *d);
};

double Decay(double x, const double *p, double *d) {
    const double e = std::exp(-p[1] * x);
    if (d != nullptr) {
        d[0] = e;
        d[1] = -p[0] * x * e;
        d[2] = 1.0;
    }
    return p[0] * e + p[2];
}
double Peaks(double x, const double *p, double *d) {
    double sum = p[0] + p[1] * x;
    if (d != nullptr) {
        d[0] = 1.0;
        d[1] = x;
    }
    for (int j = 2; j < 8; j += 3) {
        const double z = (x - p[j + 1]) / p[j + 2], e = std::exp(-0.5 * z * z);
        sum += p[j] * e;
        if (d != nullptr) {
            d[j] = e;
            d[j + 1] = p[j] * e * z / p[j + 2];
            d[j + 2] = d[j + 1] * z;
        }
    }
    return sum;
}
double Resonance(double x, const double *p, double *d) {
    const double z = (x - p[1]) / p[2], part = 1.0 / (1.0 + z * z);
    if (d != nullptr) {
        d[0] = part;
        d[1] = 2.0 * p[0] * part * part * z / p[2];
        d[2] = d[1] * z;
        d[3] = 1.0;
    }
    return p[0] * part + p[3];
}

const Problem problems[] = {
    {"decay", {3.0, 0.8, 1.0}, {2.0, 0.4, 0.5}, Decay},
    {"resonance", {4.0, 2.5, 0.6, 1.0}, {3.0, 2.0, 1.0, 0.5}, Resonance},
    {"two peaks",
     {1.0, 0.2, 3.0, 1.5, 0.3, 2.0, 3.5, 0.5},
     {0.5, 0.1, 2.0, 1.4, 0.4, 1.5, 3.7, 0.4},
     Peaks},
};

struct Samples {
    const Problem &problem;
    std::vector<double> x, y;
    Samples(const Problem &of, int n) : problem(of) {
        std::mt19937_64 random(static_cast<unsigned>(n));
        for (int i = 0; i < n; ++i) {
            x.push_back(5.0 * i / (n - 1));
            y.push_back(of.evaluate(x.back(), of.truth.data(), nullptr) +
                        0.1 * (static_cast<double>(random() >> 11) * 0x1p-52 - 1.0));
        }
    }
    std::size_t count() const { return problem.truth.size(); }
};

double Ours(const Samples &samples) {
    const auto n = static_cast<std::ptrdiff_t>(samples.x.size());
    qx::NonlinearFit fit;
    fit.model = {static_cast<int32_t>(samples.count()),
                 [](const void *user, const DBL *p, DBL *out) {
                     const Samples &self = *static_cast<const Samples *>(user);
                     double b[8];
                     for (std::size_t j = 0; j < self.count(); ++j)
                         b[j] = p[j];
                     for (std::size_t i = 0; i < self.x.size(); ++i)
                         out[i] = self.problem.evaluate(self.x[i], b, nullptr);
                     return int32_t{0};
                 },
                 [](const void *user, const DBL *p, DBL *out) {
                     const Samples &self = *static_cast<const Samples *>(user);
                     double b[8], d[8];
                     for (std::size_t j = 0; j < self.count(); ++j)
                         b[j] = p[j];
                     for (std::size_t i = 0; i < self.x.size(); ++i, out += self.count()) {
                         self.problem.evaluate(self.x[i], b, d);
                         for (std::size_t j = 0; j < self.count(); ++j)
                             out[j] = d[j];
                     }
                     return int32_t{0};
                 },
                 &samples};
    fit.y = {samples.y.data(), n};
    fit.tolerance = 1e-8;
    fit.limit = 200;
    DBL p[8];
    for (std::size_t j = 0; j < samples.count(); ++j)
        p[j] = samples.problem.start[j];
    qx::NonlinearResult result;
    result.p = {p, static_cast<std::ptrdiff_t>(samples.count())};
    qx::FitNonlinear(fit, &result);
    return 2.0 * result.cost;
}

double Squares(const Samples &samples, const double *p) {
    double squares = 0;
    for (std::size_t i = 0; i < samples.x.size(); ++i) {
        const double r = samples.y[i] - samples.problem.evaluate(samples.x[i], p, nullptr);
        squares += r * r;
    }
    return squares;
}

// Damping decreases tenfold after a step that lowers the sum of squares and increases after one that does not.
double Elder(const Samples &samples) {
    const std::size_t count = samples.count();
    const auto order = static_cast<int32_t>(count);
    std::vector<double> p = samples.problem.start;
    double squares = Squares(samples, p.data()), lambda = 1e-3;
    DBL a[64], g[8], trial[8];
    for (int step = 0; step < 200; ++step) {
        std::fill(a, a + count * count, 0.0);
        std::fill(g, g + count, 0.0);
        for (std::size_t i = 0; i < samples.x.size(); ++i) {
            double d[8];
            const double r = samples.y[i] - samples.problem.evaluate(samples.x[i], p.data(), d);
            for (std::size_t j = 0; j < count; ++j) {
                g[j] += d[j] * r;
                for (std::size_t k = 0; k < count; ++k)
                    a[j * count + k] += d[j] * d[k];
            }
        }
        std::copy(p.begin(), p.end(), trial);
        qx::AddDampedStep({a, order, order}, {g, order}, lambda, {trial, order});
        const std::vector<double> next(trial, trial + count);
        const double changed = Squares(samples, next.data());
        bool isSmall = true;
        for (std::size_t j = 0; j < count; ++j)
            isSmall = isSmall && std::abs(next[j] - p[j]) <= 1e-8 * std::abs(p[j]);
        const bool isLower = changed <= squares;
        if (isLower) {
            p = next;
            squares = changed;
        }
        if (isSmall)
            break;
        lambda *= isLower ? 0.1 : 10.0;
    }
    return squares;
}

#ifdef QX_PEER_GSL
int Residuals(const gsl_vector *p, void *user, gsl_vector *out) {
    const Samples &self = *static_cast<const Samples *>(user);
    for (std::size_t i = 0; i < self.x.size(); ++i)
        gsl_vector_set(out, i, self.problem.evaluate(self.x[i], p->data, nullptr) - self.y[i]);
    return GSL_SUCCESS;
}
int Derivatives(const gsl_vector *p, void *user, gsl_matrix *out) {
    const Samples &self = *static_cast<const Samples *>(user);
    for (std::size_t i = 0; i < self.x.size(); ++i)
        self.problem.evaluate(self.x[i], p->data, out->data + i * out->tda);
    return GSL_SUCCESS;
}

double Theirs(const Samples &samples) {
    const gsl_multifit_nlinear_parameters parameters = gsl_multifit_nlinear_default_parameters();
    gsl_multifit_nlinear_workspace *const work = gsl_multifit_nlinear_alloc(
        gsl_multifit_nlinear_trust, &parameters, samples.x.size(), samples.count());
    gsl_multifit_nlinear_fdf fdf = {};
    fdf.f = Residuals;
    fdf.df = Derivatives;
    fdf.n = samples.x.size();
    fdf.p = samples.count();
    fdf.params = const_cast<Samples *>(&samples);
    const gsl_vector_const_view start =
        gsl_vector_const_view_array(samples.problem.start.data(), samples.count());
    gsl_multifit_nlinear_init(&start.vector, &fdf, work);
    int info;
    gsl_multifit_nlinear_driver(200, 1e-8, 1e-8, 1e-8, nullptr, nullptr, &info, work);
    const gsl_vector *const rest = gsl_multifit_nlinear_residual(work);
    double squares = 0;
    for (std::size_t i = 0; i < rest->size; ++i)
        squares += gsl_vector_get(rest, i) * gsl_vector_get(rest, i);
    gsl_multifit_nlinear_free(work);
    return squares;
}
#endif

} // namespace

int main() {
    Ratios ratios("nonlinear fits with derivatives"), overElder("nonlinear fits with derivatives");
    for (const Problem &problem : problems)
        for (const int n : {20, 100, 1000, 10000}) {
            const Samples samples(problem, n);
            const std::string name = std::string(problem.name) + ", n " + std::to_string(n);
            const auto ours = [&] { Keep(Ours(samples)); };
            const auto elder = [&] { Keep(Elder(samples)); };
            double peer = 0, excess = 0;
#ifdef QX_PEER_GSL
            const auto seconds = LeastTimes(ours, elder, [&] { Keep(Theirs(samples)); });
            peer = seconds[2];
            ratios.add(seconds[0] / peer, name);
            excess = Ours(samples) / Theirs(samples) - 1;
#else
            const auto seconds = LeastTimes(ours, elder);
#endif
            overElder.add(seconds[0] / seconds[1], name);
            std::printf("%-10s n %6d %10.2f us  ratio %s  squares %+.1e  elder %s  squares %+.1e\n",
                        problem.name, n, seconds[0] * 1e6,
                        qx::bench::Cell(peer > 0 ? seconds[0] / peer : 0).c_str(), excess,
                        qx::bench::Cell(seconds[0] / seconds[1]).c_str(),
                        Ours(samples) / Elder(samples) - 1);
        }
    ratios.print();
    ratios.summary("GSL multifit_nlinear");
    overElder.summary("the elder's steps in a loop");
    return 0;
}
