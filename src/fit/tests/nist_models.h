#ifndef QX_FIT_TESTS_NIST_MODELS_H
#define QX_FIT_TESTS_NIST_MODELS_H

#include "fit/bounded_lm.h"

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

// Lines that are not comments, of one file.
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

typedef double (*NistValue)(double x, double second, const double *b);

inline double Peaks(double x, const double *b) {
    const double z1 = (x - b[3]) / b[4], z2 = (x - b[6]) / b[7];
    return b[0] * std::exp(-b[1] * x) + b[2] * std::exp(-z1 * z1) + b[5] * std::exp(-z2 * z2);
}
inline double Lanczos(double x, const double *b) {
    return b[0] * std::exp(-b[1] * x) + b[2] * std::exp(-b[3] * x) + b[4] * std::exp(-b[5] * x);
}
inline double Cubics(double x, const double *b) {
    return (b[0] + x * (b[1] + x * (b[2] + x * b[3]))) / (1 + x * (b[4] + x * (b[5] + x * b[6])));
}
inline double Wave(double x, double period, double cosine, double sine) {
    const double phase = 2 * std::numbers::pi * x / period;
    return cosine * std::cos(phase) + sine * std::sin(phase);
}

inline const std::map<std::string, NistValue> &NistValues() {
    static const NistValue chwirut = [](double x, double, const double *b) {
        return std::exp(-b[0] * x) / (b[1] + b[2] * x);
    };
    static const NistValue saturation = [](double x, double, const double *b) {
        return b[0] * (1 - std::exp(-b[1] * x));
    };
    static const NistValue peaks = [](double x, double, const double *b) { return Peaks(x, b); };
    static const NistValue lanczos = [](double x, double, const double *b) {
        return Lanczos(x, b);
    };
    static const NistValue cubics = [](double x, double, const double *b) { return Cubics(x, b); };
    static const std::map<std::string, NistValue> values = {
        {"Bennett5",
         [](double x, double, const double *b) { return b[0] * std::pow(b[1] + x, -1 / b[2]); }},
        {"BoxBOD", saturation},
        {"Chwirut1", chwirut},
        {"Chwirut2", chwirut},
        {"DanWood", [](double x, double, const double *b) { return b[0] * std::pow(x, b[1]); }},
        {"ENSO",
         [](double x, double, const double *b) {
             return b[0] + Wave(x, 12, b[1], b[2]) + Wave(x, b[3], b[4], b[5]) +
                    Wave(x, b[6], b[7], b[8]);
         }},
        {"Eckerle4",
         [](double x, double, const double *b) {
             const double z = (x - b[2]) / b[1];
             return b[0] / b[1] * std::exp(-0.5 * z * z);
         }},
        {"Gauss1", peaks},
        {"Gauss2", peaks},
        {"Gauss3", peaks},
        {"Hahn1", cubics},
        {"Kirby2",
         [](double x, double, const double *b) {
             return (b[0] + x * (b[1] + x * b[2])) / (1 + x * (b[3] + x * b[4]));
         }},
        {"Lanczos1", lanczos},
        {"Lanczos2", lanczos},
        {"Lanczos3", lanczos},
        {"MGH09",
         [](double x, double, const double *b) {
             return b[0] * (x * x + x * b[1]) / (x * x + x * b[2] + b[3]);
         }},
        {"MGH10",
         [](double x, double, const double *b) { return b[0] * std::exp(b[1] / (x + b[2])); }},
        {"MGH17",
         [](double x, double, const double *b) {
             return b[0] + b[1] * std::exp(-x * b[3]) + b[2] * std::exp(-x * b[4]);
         }},
        {"Misra1a", saturation},
        {"Misra1b",
         [](double x, double, const double *b) {
             const double half = 1 + b[1] * x / 2;
             return b[0] * (1 - 1 / (half * half));
         }},
        {"Misra1c", [](double x, double,
                       const double *b) { return b[0] * (1 - 1 / std::sqrt(1 + 2 * b[1] * x)); }},
        {"Misra1d",
         [](double x, double, const double *b) { return b[0] * b[1] * x / (1 + b[1] * x); }},
        // of ln y
        {"Nelson", [](double x, double second,
                      const double *b) { return b[0] - b[1] * x * std::exp(-b[2] * second); }},
        {"Rat42",
         [](double x, double, const double *b) { return b[0] / (1 + std::exp(b[1] - b[2] * x)); }},
        {"Rat43",
         [](double x, double, const double *b) {
             return b[0] / std::pow(1 + std::exp(b[1] - b[2] * x), 1 / b[3]);
         }},
        {"Roszman1",
         [](double x, double, const double *b) {
             return b[0] - b[1] * x - std::atan(b[2] / (x - b[3])) / std::numbers::pi;
         }},
        {"Thurber", cubics},
    };
    return values;
}

// A set as the iteration takes it.
struct NistProblem {
    const NistSet &set;
    NistValue value;
    std::vector<double> number, target;

    explicit NistProblem(const NistSet &of) : set(of), value(NistValues().at(of.name)) {
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
                    return self.value(self.set.x[i], self.set.second[i], b);
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
    // The digits to which all parameters agree with the certified ones, of the 11 that there are.
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
