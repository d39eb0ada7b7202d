#ifndef QX_SPECIAL_TESTS_EXPORTS_H
#define QX_SPECIAL_TESTS_EXPORTS_H

#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <chrono>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <functional>
#include <limits>
#include <map>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

// Shared by the tests of the special functions: exports with a common signature, tables of
// references, and calls with arbitrary bits.

namespace qx::test {

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
constexpr double kInfinity = std::numeric_limits<double>::infinity();

typedef std::array<double, 4> Arguments; // surplus arguments are ignored

inline std::string Text(const Arguments &arguments) {
    std::ostringstream text;
    text.precision(17);
    for (const double x : arguments)
        text << ' ' << x;
    return text.str();
}

// An export as a function of numbers that fills up to four outputs.
typedef std::function<void(const Arguments &, double *)> Export;
typedef std::map<std::string, Export> ExportMap;

// Converts any double to an int32, for arguments from the fuzz tests.
inline int32_t Whole(double x) {
    if (!(std::fabs(x) < 2147483647.0))
        return x > 0 ? std::numeric_limits<int32_t>::max() : std::numeric_limits<int32_t>::min();
    return static_cast<int32_t>(x);
}

inline double Value(const ExportMap &exports, const std::string &name, const Arguments &arguments,
                    int output = 0) {
    double out[4] = {};
    exports.at(name)(arguments, out);
    return out[output];
}

// Compares the lines of a data file, NAME ARGUMENT ... OUTPUT VALUE BOUND with an absolute bound,
// with the exports; returns the number of lines.
inline int ExpectAgreement(const ExportMap &exports, const std::string &path) {
    std::ifstream file(path);
    std::string line;
    int count = 0;
    while (std::getline(file, line)) {
        std::istringstream in(line);
        std::string name;
        in >> name;
        std::vector<double> numbers;
        for (std::string word; in >> word;) // strtod reads nan, streams do not
            numbers.push_back(std::strtod(word.c_str(), nullptr));
        if (numbers.size() < 4) {
            ADD_FAILURE() << line;
            continue;
        }
        const std::size_t given = numbers.size() - 3;
        Arguments arguments = {};
        for (std::size_t i = 0; i < given; ++i)
            arguments.at(i) = numbers[i];
        const double ours = Value(exports, name, arguments, static_cast<int>(numbers[given]));
        EXPECT_LE(std::fabs(ours - numbers[given + 1]), numbers[given + 2])
            << line << " ours " << ours;
        EXPECT_FALSE(std::isnan(ours)) << line;
        ++count;
    }
    return count;
}

// A rule of the domain or a limit: NaN expects any NaN, other values must be equal.
struct Rule {
    const char *name;
    Arguments arguments;
    double expected;
};

inline void ExpectRule(const ExportMap &exports, const Rule &rule) {
    const double ours = Value(exports, rule.name, rule.arguments);
    const auto &a = rule.arguments;
    if (std::isnan(rule.expected))
        EXPECT_TRUE(std::isnan(ours)) << rule.name << ' ' << Text(a) << " gave " << ours;
    else
        EXPECT_EQ(ours, rule.expected) << rule.name << ' ' << Text(a);
}

// Arguments of every kind: random bit patterns, and numbers of ordinary magnitude, which reach more
// of the methods.
class Bits {
public:
    double next() {
        state_ = state_ * 6364136223846793005U + 1442695040888963407U;
        const uint64_t bits = state_ ^ (state_ >> 29);
        double x = 0;
        if (bits % 3 == 0) {
            std::memcpy(&x, &bits, sizeof x);
            return x;
        }
        x = std::exp2(static_cast<double>(bits >> 8 & 0xFFFFF) * 0x1p-20 * 40 - 20);
        const double rounded = bits % 2 != 0 ? std::rint(x) : x;
        return bits >> 40 & 1 ? -rounded : rounded;
    }

private:
    uint64_t state_ = 20240607;
};

// Ends the process if one step takes half a minute, and names the step.
class Watchdog {
public:
    Watchdog() : thread_([this] { watch(); }) {}
    ~Watchdog() {
        done_ = true;
        thread_.join();
    }
    Watchdog(const Watchdog &) = delete;
    Watchdog &operator=(const Watchdog &) = delete;

    void step(const std::string *name, const Arguments *arguments) {
        name_ = name;
        arguments_ = arguments;
        ++steps_;
    }

private:
    void watch() {
        int64_t last = -1;
        for (int looks = 0; !done_; ++looks) {
            std::this_thread::sleep_for(std::chrono::milliseconds(20));
            if (steps_ != last)
                looks = 0;
            last = steps_;
            if (looks > 1500) {
                std::fprintf(stderr, "%s %s does not return\n", name_.load()->c_str(),
                             Text(*arguments_.load()).c_str());
                std::_Exit(1);
            }
        }
    }

    std::atomic<const std::string *> name_ = nullptr;
    std::atomic<const Arguments *> arguments_ = nullptr;
    std::atomic<int64_t> steps_ = 0;
    std::atomic<bool> done_ = false;
    std::thread thread_;
};

// Checks that calls return for any arguments. Makes `calls` calls in all, an equal share for each
// export; QX_FUZZ sets the number for each export instead.
inline void ExpectSoon(const ExportMap &exports, int calls) {
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
    constexpr int slower = 20;
#else
    constexpr int slower = 1;
#endif
    const char *wanted = std::getenv("QX_FUZZ");
    const int count =
        wanted != nullptr ? std::atoi(wanted) : calls / slower / static_cast<int>(exports.size());
    Watchdog watchdog;
    for (const auto &[name, function] : exports) {
        Bits bits;
        for (int i = 0; i < count; ++i) {
            Arguments arguments;
            for (double &x : arguments)
                x = bits.next();
            double out[4];
            watchdog.step(&name, &arguments);
            function(arguments, out);
        }
    }
}

// A threshold between two methods: the values on both sides must agree within the relative
// tolerance.
struct Seam {
    const char *name;
    Arguments arguments;
    int which; // index of the argument at the threshold
    double tolerance;
};

inline void ExpectNoStep(const ExportMap &exports, const Seam &seam) {
    Arguments low = seam.arguments;
    Arguments high = seam.arguments;
    const auto i = static_cast<std::size_t>(seam.which);
    low.at(i) = std::nextafter(low.at(i), -kInfinity);
    high.at(i) = std::nextafter(high.at(i), kInfinity);
    const double below = Value(exports, seam.name, low);
    const double above = Value(exports, seam.name, high);
    EXPECT_NEAR(below, above, seam.tolerance * std::fabs(below) + 1e-15)
        << seam.name << ' ' << seam.arguments.at(i);
}

} // namespace qx::test

#endif
