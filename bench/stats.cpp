// Sorting, selection, the strictly sequential sums, and analysis of variance.
//
// bench_stats [GROUP...]: sort, median, sums, anova; all by default. Peers: std::sort and
// std::nth_element on a copy; for the sums, the latency limit of their order of summation; for
// the analysis of variance, the same sums in doubles with known cells.

#include "bench/timing.h"
#include "stats/basic.h"
#include "stats/factorial_anova.h"
#include "stats/order.h"

#include <cstdint>
#include <cstring>
#include <memory>
#include <random>

namespace {

using qx::bench::Keep;
using qx::bench::LeastTimes;
using qx::bench::Ratios;

// Different arrays of the same kind and length, used in turn, so that the branch predictor cannot
// learn a short one.
class Pool {
public:
    Pool(int32_t n, double (*value)(std::mt19937_64 &, int32_t i, int32_t n))
        : n_(n), copies_(std::max(1, 65536 / n)) {
        std::mt19937_64 random(static_cast<uint64_t>(n));
        for (int32_t copy = 0; copy < copies_; ++copy)
            for (int32_t i = 0; i < n; ++i)
                values_.push_back(value(random, i, n));
    }
    int32_t size() const { return n_; }
    const double *next(int &turn) const {
        turn = turn + 1 < copies_ ? turn + 1 : 0;
        return values_.data() + static_cast<std::size_t>(turn) * static_cast<std::size_t>(n_);
    }

private:
    int32_t n_;
    int copies_;
    std::vector<double> values_;
};

struct Kind {
    const char *name;
    double (*value)(std::mt19937_64 &, int32_t i, int32_t n);
};

double Random(std::mt19937_64 &random, int32_t, int32_t) {
    return static_cast<double>(random() >> 11);
}

const Kind kinds[] = {
    {"random", Random},
    {"sorted", [](std::mt19937_64 &, int32_t i, int32_t) -> double { return i; }},
    {"reversed", [](std::mt19937_64 &, int32_t i, int32_t n) -> double { return n - i; }},
    {"constant", [](std::mt19937_64 &, int32_t, int32_t) { return 3.0; }},
    {"16 values", [](std::mt19937_64 &r, int32_t, int32_t) -> double { return r() % 16; }},
    {"rise and fall",
     [](std::mt19937_64 &, int32_t i, int32_t n) -> double { return std::min(i, n - i); }},
    {"sorted, 1% random",
     [](std::mt19937_64 &r, int32_t i, int32_t n) -> double {
         return r() % 100 == 0 ? r() % static_cast<uint64_t>(n) : static_cast<uint64_t>(i);
     }},
};

template <class Ours, class Peer>
void CompareOnAllKinds(const char *name, const char *peerName, const Ours &ours, const Peer &peer) {
    Ratios all(name);
    for (const Kind &kind : kinds) {
        Ratios ratios(std::string(name) + ", " + kind.name);
        for (const int32_t n : {10, 20, 30, 100, 300, 1000, 10000, 100000, 1000000, 10000000}) {
            const Pool pool(n, kind.value);
            std::vector<double> work(static_cast<std::size_t>(n));
            int ourTurn = 0;
            int peerTurn = 0;
            const auto [ourTime, peerTime] =
                LeastTimes([&] { ours(pool.next(ourTurn), n, work.data()); },
                           [&] { peer(pool.next(peerTurn), n, work.data()); });
            std::printf("%-8s %-18s n %9d %12.3f us  ratio %5.2f\n", name, kind.name, n,
                        ourTime * 1e6, ourTime / peerTime);
            std::fflush(stdout);
            ratios.add(ourTime / peerTime, std::to_string(n));
            all.add(ourTime / peerTime, std::string(kind.name) + ", n " + std::to_string(n));
        }
        ratios.print();
    }
    all.summary(peerName);
}

void CopyTo(double *to, const double *from, int32_t n) {
    std::memcpy(to, from, static_cast<std::size_t>(n) * sizeof(double));
}

void Sort() {
    CompareOnAllKinds(
        "sort", "std::sort on a copy",
        [](const double *x, int32_t n, double *work) {
            qx::SortNaNsFirst({x, n}, qx::SortOrder::Ascending, {work, n});
            Keep(work[0]);
        },
        [](const double *x, int32_t n, double *work) {
            CopyTo(work, x, n);
            std::sort(work, work + n);
            Keep(work[0]);
        });
}

// The peer does only what a median needs: it makes a copy but does not check for NaN.
void Median() {
    CompareOnAllKinds(
        "median", "std::nth_element on a copy",
        [](const double *x, int32_t n, double *) {
            double median;
            qx::ArrayMedian({x, n}, &median);
            Keep(median);
        },
        [](const double *x, int32_t n, double *) {
            const auto copy = std::make_unique_for_overwrite<double[]>(static_cast<std::size_t>(n));
            double *work = copy.get();
            CopyTo(work, x, n);
            std::nth_element(work, work + n / 2, work + n);
            double median = work[n / 2];
            if (n % 2 == 0)
                median = (median + *std::max_element(work, work + n / 2)) * 0.5;
            Keep(median);
        });
}

// A sum in one accumulator from the first term to the last takes at least the latency of one addition
// per term. The limit is measured by such a chain whose term is in a register.
void AdditionChain(int32_t n, double term) {
    double sum = 0.0;
    for (int32_t i = 0; i < n; ++i) {
        asm volatile("" : "+" QX_VECTOR_REGISTER(term));
        sum += term;
    }
    Keep(sum);
}

void Sums() {
    Ratios ratios("sums in a stated order");
    for (const int32_t n : {1000, 3000, 30000, 1000000, 10000000}) {
        const Pool x(n, Random);
        const Pool y(n + 1, Random);
        int turn = 0;
        int otherTurn = 0;
        double result;
        const auto times =
            LeastTimes([&] { AdditionChain(n, 1.25); },
                       [&] {
                           qx::ArrayMean({x.next(turn), n}, &result);
                           Keep(result);
                       },
                       [&] {
                           qx::ArrayRMS({x.next(turn), n}, &result);
                           Keep(result);
                       },
                       [&] {
                           qx::ArrayMSE({x.next(turn), n}, {y.next(otherTurn), n}, &result);
                           Keep(result);
                       });
        std::printf("sums n %9d  limit %6.3f ns a term; ratios: mean %5.3f  RMS %5.3f  MSE %5.3f\n",
                    n, times[0] / n * 1e9, times[1] / times[0], times[2] / times[0],
                    times[3] / times[0]);
        for (int i = 1; i < 4; ++i)
            ratios.add(times[i] / times[0], std::to_string(n));
    }
    ratios.summary("latency of as many additions");
}

// The sums of squares of error and total from deviations from the means of known cells: two passes in
// doubles, without labels and checks.
double PlainSquares(const double *y, const int32_t *cellOf, int32_t n, std::vector<double> &means) {
    std::fill(means.begin(), means.end(), 0.0);
    double mean = 0.0;
    for (int32_t k = 0; k < n; ++k) {
        means[static_cast<std::size_t>(cellOf[k])] += y[k];
        mean += y[k];
    }
    const double observations = n / static_cast<double>(means.size());
    for (double &cell : means)
        cell /= observations;
    mean /= n;
    double error = 0.0;
    double total = 0.0;
    for (int32_t k = 0; k < n; ++k) {
        const double within = y[k] - means[static_cast<std::size_t>(cellOf[k])];
        error += within * within;
        total += (y[k] - mean) * (y[k] - mean);
    }
    return error / total;
}

void Anova() {
    Ratios ratios("analysis of variance, three factors");
    constexpr int32_t levels[] = {4, 5, 3};
    constexpr int32_t cells = 60;
    for (const int32_t n : {240, 6000, 60000, 1200000}) {
        const Pool y(n, Random);
        std::vector<int32_t> cellOf(static_cast<std::size_t>(n));
        std::vector<int32_t> labels[3];
        for (int32_t k = 0; k < n; ++k) {
            cellOf[static_cast<std::size_t>(k)] = k % cells;
            int32_t rest = k % cells;
            for (int i = 0; i < 3; ++i, rest /= levels[i - 1])
                labels[i].push_back(rest % levels[i]);
        }
        std::vector<double> means(cells);
        int turn = 0;
        int otherTurn = 0;
        qx::FactorialTable table;
        const auto [ours, peer] = LeastTimes(
            [&] {
                qx::FactorialDesign design = {{y.next(turn), n}, n / cells, 3, {}};
                for (int i = 0; i < 3; ++i)
                    design.factor[i] = {{labels[i].data(), n}, levels[i], false};
                qx::FactorialAnova(design, nullptr, &table);
                Keep(table.source[0].f);
            },
            [&] { Keep(PlainSquares(y.next(otherTurn), cellOf.data(), n, means)); });
        std::printf("anova n %9d %8.2f ns an observation  ratio %5.2f\n", n, ours / n * 1e9,
                    ours / peer);
        ratios.add(ours / peer, std::to_string(n));
    }
    ratios.summary("two plain passes over known cells");
}

} // namespace

int main(int argc, char **argv) {
    const auto wanted = [&](const char *group) {
        return argc < 2 || std::any_of(argv + 1, argv + argc, [&](const char *argument) {
                   return std::strcmp(argument, group) == 0;
               });
    };
    if (wanted("sums"))
        Sums();
    if (wanted("sort"))
        Sort();
    if (wanted("median"))
        Median();
    if (wanted("anova"))
        Anova();
    return 0;
}
