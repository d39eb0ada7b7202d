#ifndef QX_FIT_TESTS_NIST_MODELS_H
#define QX_FIT_TESTS_NIST_MODELS_H

#include "fit/bounded_lm.h"
#include "fit/nonlinear.h"

#include <cmath>
#include <fstream>
#include <map>
#include <numbers>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

// The nonlinear regression sets of NIST's Statistical Reference Datasets and their models.

namespace qx::test {

// x is the number of the observation where a model has two predictors.
struct NistSet {
    std::string name, level;
    double squares, deviation; // of the residuals, certified
    std::vector<double> starts[2], certified, errors;
    std::vector<double> x, y;
    std::vector<double> second; // predictor
};

// The lines of a file that are not comments.
inline std::istringstream Uncommented(const std::string &path) {
    std::ifstream file(path);
    if (!file)
        throw std::runtime_error("cannot read " + path);
    std::string text;
    for (std::string line; std::getline(file, line);)
        if (line.empty() || line[0] != '#')
            text += line + "\n";
    return std::istringstream(text);
}

inline std::vector<NistSet> ReadNistSets(const std::string &path) {
    std::istringstream in = Uncommented(path);
    std::vector<NistSet> sets;
    NistSet set;
    int parameters, observations, predictors;
    while (in >> set.name >> set.level >> parameters >> observations >> predictors >> set.squares >>
           set.deviation) {
        NistSet full = set;
        double first, next, certified, error;
        for (int i = 0; i < parameters && in >> first >> next >> certified >> error; ++i) {
            full.starts[0].push_back(first);
            full.starts[1].push_back(next);
            full.certified.push_back(certified);
            full.errors.push_back(error);
        }
        for (int i = 0; i < observations; ++i) {
            double y, x, more = 0.0;
            in >> y >> x;
            if (predictors == 2)
                in >> more;
            full.y.push_back(y);
            full.x.push_back(x);
            full.second.push_back(more);
        }
        sets.push_back(full);
    }
    return sets;
}

// A number and its derivative with respect to one parameter.
struct Dual {
    double value, slope = 0.0;
    Dual(double v) : value(v) {}
    Dual(double v, double s) : value(v), slope(s) {}
};
inline Dual operator-(Dual a) { return {-a.value, -a.slope}; }
inline Dual operator+(Dual a, Dual b) { return {a.value + b.value, a.slope + b.slope}; }
inline Dual operator-(Dual a, Dual b) { return {a.value - b.value, a.slope - b.slope}; }
inline Dual operator*(Dual a, Dual b) {
    return {a.value * b.value, a.slope * b.value + a.value * b.slope};
}
inline Dual operator/(Dual a, Dual b) {
    const double ratio = a.value / b.value;
    return {ratio, (a.slope - ratio * b.slope) / b.value};
}
inline Dual exp(Dual a) {
    const double e = std::exp(a.value);
    return {e, e * a.slope};
}
inline Dual log(Dual a) { return {std::log(a.value), a.slope / a.value}; }
inline Dual pow(Dual a, Dual b) { return exp(b * log(a)); }
inline Dual pow(double a, Dual b) { return exp(b * Dual(std::log(a))); }
inline Dual sqrt(Dual a) {
    const double root = std::sqrt(a.value);
    return {root, a.slope / (2.0 * root)};
}
inline Dual sin(Dual a) { return {std::sin(a.value), std::cos(a.value) * a.slope}; }
inline Dual cos(Dual a) { return {std::cos(a.value), -std::sin(a.value) * a.slope}; }
inline Dual atan(Dual a) { return {std::atan(a.value), a.slope / (1.0 + a.value * a.value)}; }

// A model for numbers and for dual numbers, from the same formula.
struct NistModel {
    double (*value)(double x, double second, const double *b);
    Dual (*dual)(double x, double second, const Dual *b);
    template <class Text>
    NistModel(Text)
        : value([](double x, double second, const double *b) { return Text{}(x, second, b); }),
          dual([](double x, double second, const Dual *b) { return Text{}(x, second, b); }) {}
};

template <class T>
T Peaks(double x, const T *b) {
    using std::exp;
    const T z1 = (x - b[3]) / b[4], z2 = (x - b[6]) / b[7];
    return b[0] * exp(-b[1] * x) + b[2] * exp(-z1 * z1) + b[5] * exp(-z2 * z2);
}
template <class T>
T Lanczos(double x, const T *b) {
    using std::exp;
    return b[0] * exp(-b[1] * x) + b[2] * exp(-b[3] * x) + b[4] * exp(-b[5] * x);
}
template <class T>
T Cubics(double x, const T *b) {
    return (b[0] + x * (b[1] + x * (b[2] + x * b[3]))) / (1 + x * (b[4] + x * (b[5] + x * b[6])));
}
template <class T>
T Wave(double x, T period, T cosine, T sine) {
    using std::cos;
    using std::sin;
    const T phase = 2 * std::numbers::pi * x / period;
    return cosine * cos(phase) + sine * sin(phase);
}

inline const std::map<std::string, NistModel> &NistModels() {
    using std::atan;
    using std::exp;
    using std::pow;
    using std::sqrt;
    static const NistModel chwirut = [](double x, double, const auto *b) {
        return exp(-b[0] * x) / (b[1] + b[2] * x);
    };
    static const NistModel saturation = [](double x, double, const auto *b) {
        return b[0] * (1 - exp(-b[1] * x));
    };
    static const NistModel peaks = [](double x, double, const auto *b) { return Peaks(x, b); };
    static const NistModel lanczos = [](double x, double, const auto *b) { return Lanczos(x, b); };
    static const NistModel cubics = [](double x, double, const auto *b) { return Cubics(x, b); };
    static const std::map<std::string, NistModel> models = {
        {"Bennett5",
         [](double x, double, const auto *b) { return b[0] * pow(b[1] + x, -1 / b[2]); }},
        {"BoxBOD", saturation},
        {"Chwirut1", chwirut},
        {"Chwirut2", chwirut},
        {"DanWood", [](double x, double, const auto *b) { return b[0] * pow(x, b[1]); }},
        {"ENSO",
         [](double x, double, const auto *b) {
             typedef std::decay_t<decltype(b[0])> T;
             return b[0] + Wave(x, T(12), b[1], b[2]) + Wave(x, b[3], b[4], b[5]) +
                    Wave(x, b[6], b[7], b[8]);
         }},
        {"Eckerle4",
         [](double x, double, const auto *b) {
             const auto z = (x - b[2]) / b[1];
             return b[0] / b[1] * exp(-0.5 * z * z);
         }},
        {"Gauss1", peaks},
        {"Gauss2", peaks},
        {"Gauss3", peaks},
        {"Hahn1", cubics},
        {"Kirby2",
         [](double x, double, const auto *b) {
             return (b[0] + x * (b[1] + x * b[2])) / (1 + x * (b[3] + x * b[4]));
         }},
        {"Lanczos1", lanczos},
        {"Lanczos2", lanczos},
        {"Lanczos3", lanczos},
        {"MGH09",
         [](double x, double, const auto *b) {
             return b[0] * (x * x + x * b[1]) / (x * x + x * b[2] + b[3]);
         }},
        {"MGH10", [](double x, double, const auto *b) { return b[0] * exp(b[1] / (x + b[2])); }},
        {"MGH17",
         [](double x, double, const auto *b) {
             return b[0] + b[1] * exp(-x * b[3]) + b[2] * exp(-x * b[4]);
         }},
        {"Misra1a", saturation},
        {"Misra1b",
         [](double x, double, const auto *b) {
             const auto half = 1 + b[1] * x / 2;
             return b[0] * (1 - 1 / (half * half));
         }},
        {"Misra1c",
         [](double x, double, const auto *b) { return b[0] * (1 - 1 / sqrt(1 + 2 * b[1] * x)); }},
        {"Misra1d",
         [](double x, double, const auto *b) { return b[0] * b[1] * x / (1 + b[1] * x); }},
        // of ln y
        {"Nelson", [](double x, double second,
                      const auto *b) { return b[0] - b[1] * x * exp(-b[2] * second); }},
        {"Rat42",
         [](double x, double, const auto *b) { return b[0] / (1 + exp(b[1] - b[2] * x)); }},
        {"Rat43", [](double x, double,
                     const auto *b) { return b[0] / pow(1 + exp(b[1] - b[2] * x), 1 / b[3]); }},
        {"Roszman1",
         [](double x, double, const auto *b) {
             return b[0] - b[1] * x - atan(b[2] / (x - b[3])) / std::numbers::pi;
         }},
        {"Thurber", cubics},
    };
    return models;
}

// A set in the form that the iteration takes.
struct NistProblem {
    const NistSet &set;
    NistModel functions;
    std::vector<double> number, target;

    explicit NistProblem(const NistSet &of) : set(of), functions(NistModels().at(of.name)) {
        for (std::size_t i = 0; i < set.y.size(); ++i) {
            number.push_back(static_cast<double>(i));
            target.push_back(set.name == "Nelson" ? std::log(set.y[i]) : set.y[i]);
        }
    }
    FitModel model() const {
        return {static_cast<int32_t>(set.certified.size()),
                [](double x, const DBL *p, int32_t count, const void *user) {
                    const NistProblem &self = *static_cast<const NistProblem *>(user);
                    double b[9];
                    for (int32_t j = 0; j < count; ++j)
                        b[j] = p[j];
                    const auto i = static_cast<std::size_t>(x);
                    return self.functions.value(self.set.x[i], self.set.second[i], b);
                },
                nullptr, nullptr, this};
    }
    FitSamples samples() const {
        const auto n = static_cast<std::ptrdiff_t>(target.size());
        return {{number.data(), n}, {target.data(), n}, {}};
    }
    struct Result {
        double digits, squares;
        int steps;
    };
    Result solve(int start) const {
        std::vector<DBL> p(set.starts[start].begin(), set.starts[start].end());
        int32_t iterations = 2000;
        double lambda = 0.1, mse = 0;
        BoundedLM(model(), samples(), leastSquares, {}, p.data(), &iterations, 1e-15, &lambda,
                  &mse);
        return {digits({p.begin(), p.end()}), mse * static_cast<double>(target.size()), iterations};
    }
    // Fits by the trust-region method, with derivatives or by differences.
    NonlinearResult fit(int start, bool withDerivatives, std::vector<double> *parameters,
                        double tolerance = 0.0, const RealMatrix &covariance = {}) const {
        const auto values = [](const void *user, const DBL *p, DBL *out) {
            const NistProblem &self = *static_cast<const NistProblem *>(user);
            const std::vector<double> b(p, p + self.set.certified.size());
            for (std::size_t i = 0; i < self.target.size(); ++i)
                out[i] = self.functions.value(self.set.x[i], self.set.second[i], b.data());
            return int32_t{0};
        };
        const auto jacobian = [](const void *user, const DBL *p, DBL *out) {
            const NistProblem &self = *static_cast<const NistProblem *>(user);
            const std::size_t count = self.set.certified.size();
            std::vector<Dual> b(count, 0.0);
            for (std::size_t j = 0; j < count; ++j)
                b[j] = Dual(p[j]);
            for (std::size_t j = 0; j < count; ++j) {
                b[j].slope = 1.0;
                for (std::size_t i = 0; i < self.target.size(); ++i)
                    out[i * count + j] =
                        self.functions.dual(self.set.x[i], self.set.second[i], b.data()).slope;
                b[j].slope = 0.0;
            }
            return int32_t{0};
        };
        NonlinearFit request;
        request.model = {static_cast<int32_t>(set.certified.size()), values, nullptr, this};
        if (withDerivatives)
            request.model.jacobian = jacobian;
        request.y = samples().y;
        request.tolerance = tolerance;
        request.limit = 10000;
        std::vector<DBL> p(set.starts[start].begin(), set.starts[start].end());
        NonlinearResult result;
        result.p = {p.data(), static_cast<std::ptrdiff_t>(p.size())};
        result.covariance = covariance;
        FitNonlinear(request, &result);
        parameters->assign(p.begin(), p.end());
        return result;
    }
    double squares(const std::vector<double> &p) const {
        double sum = 0;
        for (std::size_t i = 0; i < target.size(); ++i) {
            const double r = target[i] - functions.value(set.x[i], set.second[i], p.data());
            sum += r * r;
        }
        return sum;
    }
    // The number of digits, out of 11, to which all parameters agree with the certified ones.
    double digits(const std::vector<double> &p) const {
        double least = 11;
        for (std::size_t j = 0; j < p.size(); ++j) {
            const double error = std::fabs(p[j] / set.certified[j] - 1);
            least = std::isnan(error) ? 0 : std::min(least, -std::log10(error));
        }
        return std::max(0.0, least);
    }
};

} // namespace qx::test

#endif
