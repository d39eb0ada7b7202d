#include "filters/cascade.h"
#include "frame/lane_masks.h"

// Sections s, s + 1, ... are in the lanes of one or two vectors, and each is `lag` samples behind
// its predecessor, so that all of them can process their next sample together. With a lag of 2 a
// value has two steps to reach the next lane; with 1 this path would be longer than the recursion
// of a section itself. The wave starts and ends with sections that work alone.
namespace qx::QX_WIDTH {
namespace {

typedef Lanes<nativeLanes> L;
constexpr int lanes = nativeLanes;
constexpr int lag = 2;
// Vectors that are processed together: eight sections.
constexpr int vectors = 8 / lanes;
constexpr int together = vectors * lanes;
// Samples that pass through all sections before the next ones, so that they stay in the cache.
constexpr int32_t tile = 2048;

constexpr double smallest = 2.2250738585072014e-308;

inline double FlushOne(double value) { return __builtin_fabs(value) <= smallest ? 0.0 : value; }

// Almost always there is nothing to flush, and a branch does not delay the recursion.
inline L FlushEach(L value) {
    const LaneMask<L> small = Magnitude(value) <= L(smallest);
    return __builtin_expect(Any(small), 0) ? Select(small, L(0.0), value) : value;
}

template <int Order>
inline double OneSection(const DBL *a, const DBL *b, DBL *state, double v) {
    double w = v;
    for (int j = 0; j < Order; ++j)
        w = w - a[j] * state[j];
    v = b[0] * w;
    for (int j = 0; j < Order; ++j)
        v = v + b[j + 1] * state[j];
    for (int j = Order - 1; j > 0; --j)
        state[j] = state[j - 1];
    state[0] = FlushOne(w);
    return v;
}

// The values of a group of sections, one section in each lane. Lanes without a section pass their
// input on, and the result is not used; if it were 0, each step would have something to flush.
template <int Order>
struct Group {
    L a[Order][vectors], b[Order + 1][vectors], state[Order][vectors];
    L pending[lag][vectors]; // the inputs of each section for the next steps

    void load(const CascadeRun &run, int32_t first, int32_t sections) {
        for (int j = 0; j < Order; ++j) {
            spread(run.a + first * Order + j, Order, sections, 0.0, a[j]);
            spread(run.state + first * Order + j, Order, sections, 0.0, state[j]);
        }
        for (int j = 0; j <= Order; ++j)
            spread(run.b + first * (Order + 1) + j, Order + 1, sections, j == 0 ? 1.0 : 0.0, b[j]);
    }
    void storeState(const CascadeRun &run, int32_t first, int32_t sections) const {
        for (int j = 0; j < Order; ++j)
            for (int s = 0; s < sections; ++s)
                run.state[(first + s) * Order + j] = state[j][s / lanes][s % lanes];
    }

    static void spread(const DBL *from, int step, int count, double rest, L *to) {
        double values[together];
        for (int s = 0; s < together; ++s)
            values[s] = s < count ? from[s * step] : rest;
        for (int i = 0; i < vectors; ++i)
            to[i] = L::load(values + i * lanes);
    }
};

// One step of the vectors that have sections: all sections process their pending inputs; `next` is
// the first section's input `lag` steps later. The outputs of the sections are returned in `given`.
template <int Order, int Count>
inline void Step(Group<Order> &group, double next, L (&given)[Count]) {
    L before(next);
#pragma GCC unroll 4
    for (int i = 0; i < Count; ++i) {
        L w = group.pending[0][i];
        for (int j = 0; j < Order; ++j)
            w = w - group.a[j][i] * group.state[j][i];
        L v = group.b[0][i] * w;
        for (int j = 0; j < Order; ++j)
            v = v + group.b[j + 1][i] * group.state[j][i];
        for (int j = Order - 1; j > 0; --j)
            group.state[j][i] = group.state[j - 1][i];
        group.state[0][i] = FlushEach(w);
        group.pending[0][i] = group.pending[1][i];
        group.pending[1][i] = MovedUp(before, v);
        before = v;
        given[i] = v;
    }
}

template <int Order>
class Wave {
public:
    Wave(const CascadeRun &run, int32_t first, int32_t sections)
        : run_(run), first_(first), sections_(sections), ahead_(lag * (sections - 1)) {}

    // Requires more than `ahead` samples.
    template <int Count>
    void go(DBL *x, int32_t n, bool isLast) {
        start(x);
        group_.load(run_, first_, sections_);
        for (int d = 0; d < lag; ++d)
            for (int i = 0; i < vectors; ++i)
                group_.pending[d][i] = L::load(pending_[d] + i * lanes);
        const int32_t steps = n - ahead_;
        middle<Count>(x, steps, n, isLast);
        for (int d = 0; d < lag; ++d)
            for (int i = 0; i < vectors; ++i)
                group_.pending[d][i].store(pending_[d] + i * lanes);
        group_.storeState(run_, first_, sections_);
        finish(x + steps, isLast);
    }

private:
    void one(int s, double *values, int count) const {
        const std::ptrdiff_t at = first_ + s;
        for (int i = 0; i < count; ++i)
            values[i] = OneSection<Order>(run_.a + at * Order, run_.b + at * (Order + 1),
                                          run_.state + at * Order, values[i]);
    }

    // Each section runs far enough ahead of the last one for the wave to begin.
    void start(const DBL *x) {
        double values[lag * together];
        for (int i = 0; i < ahead_; ++i)
            values[i] = x[i];
        for (int d = 0; d < lag; ++d)
            pending_[d][0] = x[ahead_ + d];
        for (int s = 0; s + 1 < sections_; ++s) {
            const int count = ahead_ - lag * s;
            one(s, values, count);
            for (int d = 0; d < lag; ++d)
                pending_[d][s + 1] = values[count - lag + d];
        }
    }

    template <int Count>
    void middle(DBL *x, int32_t steps, int32_t n, bool isLast) {
        Group<Order> group = group_;
        const int last = sections_ - 1;
        const DBL *const in = x + ahead_ + lag;
        const int32_t inCount = n - ahead_ - lag;
        alignas(32) double results[together];
        for (int32_t t = 0; t < steps; ++t) {
            L given[Count];
            Step<Order, Count>(group, t < inCount ? in[t] : 0.0, given);
            for (int i = 0; i < Count; ++i)
                given[i].store(results + i * lanes);
            x[t] = isLast ? FlushOne(results[last]) : results[last];
        }
        group_ = group;
    }

    // The sections after the first one catch up.
    void finish(DBL *x, bool isLast) const {
        double values[lag * together];
        int count = 0;
        for (int s = 1; s < sections_; ++s) {
            for (int i = count - 1; i >= 0; --i)
                values[i + lag] = values[i];
            for (int d = 0; d < lag; ++d)
                values[d] = pending_[d][s];
            count += lag;
            one(s, values, count);
        }
        for (int i = 0; i < count; ++i)
            x[i] = isLast ? FlushOne(values[i]) : values[i];
    }

    const CascadeRun &run_;
    const int32_t first_, sections_, ahead_;
    Group<Order> group_;
    double pending_[lag][together] = {};
};

template <int Order>
void RunTile(const CascadeRun &run, DBL *x, int32_t n) {
    for (int32_t s = 0; s < run.sections; s += together) {
        const int32_t left = run.sections - s;
        Wave<Order> wave(run, s, left < together ? left : together);
        if (left <= lanes)
            wave.template go<1>(x, n, true);
        else if (left <= 2 * lanes)
            wave.template go<2>(x, n, true);
        else
            wave.template go<vectors>(x, n, left <= together);
    }
}

template <int Order>
void RunTiles(const CascadeRun &run) {
    for (int32_t done = 0; done < run.n;) {
        const int32_t left = run.n - done;
        const int32_t count = left < 2 * tile ? left : tile;
        RunTile<Order>(run, run.x + done, count);
        done += count;
    }
}

} // namespace

void RunCascadeInLanes(const CascadeRun &run) {
    if (run.order == 2)
        RunTiles<2>(run);
    else
        RunTiles<4>(run);
}

} // namespace qx::QX_WIDTH
