#include "frame/lane_masks.h"
#include "frame/lanes.h"
#include "multirate/moving_sums.h"

namespace qx::QX_WIDTH {

namespace {

typedef Lanes<nativeLanes> L;
constexpr int stages = wavefrontStages;
constexpr int vectors = stages / nativeLanes;
// Stage k processes sample t - skew k while the first stage processes sample t, so that the output
// of a stage has the time of three pairs of additions before it is the input of the next stage.
constexpr int skew = 3;
constexpr int32_t behind = skew * (stages - 1);

template <MovingSum Kind, class V>
QX_INLINE V Next(V v, V x, V oldest) {
    if constexpr (Kind == MovingSum::Plain)
        return v + x - oldest;
    else if constexpr (Kind == MovingSum::AlternateEven)
        return x - v - oldest;
    else
        return x - v + oldest;
}

// The rings interleaved: row r contains for each stage the input that it needs when the first stage
// needs the one at index r of its own ring.
class Rows {
public:
    Rows(const MovingSumState<ElementType::DBL> &state, int32_t first)
        : state_(state), first_(first) {
        exchange([](DBL &row, DBL &ring) { row = ring; });
    }
    void putBack() {
        exchange([](DBL &row, DBL &ring) { ring = row; });
    }
    DBL *row(int32_t r) { return rows_ + r * stages; }

private:
    template <class Move>
    void exchange(Move move) {
        for (int k = 0; k < stages; ++k) {
            DBL *const ring = state_.rings + (first_ + k) * state_.ringStep;
            int32_t at = (state_.width - skew * k % state_.width) % state_.width;
            for (int32_t r = 0; r < state_.width; ++r) {
                move(rows_[r * stages + k], ring[at]);
                at = at + 1 == state_.width ? 0 : at + 1;
            }
        }
    }

    const MovingSumState<ElementType::DBL> &state_;
    int32_t first_;
    DBL rows_[wavefrontWidth * stages];
};

// The running values of all stages, and their outputs at the latest `skew` times, latest first.
struct Front {
    DBL v[stages];
    DBL given[skew][stages];
};

// One time step of the stages from `from` to `to` - 1.
template <MovingSum Kind>
void StepSome(int from, int to, double scale, const DBL *x, DBL *row, Front &front) {
    DBL given[stages] = {};
    for (int k = from; k < to; ++k) {
        const double input = k == 0 ? *x : front.given[skew - 1][k - 1];
        front.v[k] = Next<Kind, double>(front.v[k], input, row[k]);
        row[k] = input;
        given[k] = front.v[k] * scale;
    }
    __builtin_memmove(front.given[1], front.given[0], sizeof front.given - sizeof given);
    __builtin_memcpy(front.given[0], given, sizeof given);
}

// All stages, for `count` time steps from row r on; x is the first stage's sample. Returns the next
// row.
template <MovingSum Kind>
int32_t StepAll(int32_t count, int32_t r, int32_t width, double scale, DBL *x, Rows &rows,
                Front &front) {
    L v[vectors], given[skew][vectors];
    for (int i = 0; i < vectors; ++i) {
        v[i] = L::load(front.v + i * nativeLanes);
        for (int age = 0; age < skew; ++age)
            given[age][i] = L::load(front.given[age] + i * nativeLanes);
    }
    for (int32_t t = 0; t < count; ++t) {
        DBL *const row = rows.row(r);
        L latest[vectors];
        QX_UNROLLED
        for (int i = 0; i < vectors; ++i) {
            const L before = i == 0 ? L(x[t]) : given[skew - 1][i - 1];
            const L input = MovedUp(before, given[skew - 1][i]);
            v[i] = Next<Kind, L>(v[i], input, L::load(row + i * nativeLanes));
            input.store(row + i * nativeLanes);
            latest[i] = v[i] * L(scale);
        }
        x[t - behind] = latest[vectors - 1][nativeLanes - 1];
        QX_UNROLLED
        for (int i = 0; i < vectors; ++i) {
            QX_UNROLLED
            for (int age = skew - 1; age > 0; --age)
                given[age][i] = given[age - 1][i];
            given[0][i] = latest[i];
        }
        r = r + 1 == width ? 0 : r + 1;
    }
    for (int i = 0; i < vectors; ++i) {
        v[i].store(front.v + i * nativeLanes);
        for (int age = 0; age < skew; ++age)
            given[age][i].store(front.given[age] + i * nativeLanes);
    }
    return r;
}

template <MovingSum Kind>
void Pass(const MovingSumState<ElementType::DBL> &state, int32_t first, double scale, DBL *x,
          int32_t n) {
    Rows rows(state, first);
    Front front = {};
    for (int k = 0; k < stages; ++k)
        front.v[k] = state.sums[(first + k) * state.sumStep];
    int32_t r = state.position;
    const auto stepSome = [&](int from, int to, const DBL *sample) {
        StepSome<Kind>(from, to, scale, sample, rows.row(r), front);
        r = r + 1 == state.width ? 0 : r + 1;
    };
    for (int32_t t = 0; t < behind; ++t)
        stepSome(0, t / skew + 1, x + t);
    r = StepAll<Kind>(n - behind, r, state.width, scale, x + behind, rows, front);
    for (int32_t t = 0; t < behind; ++t) {
        stepSome(t / skew + 1, stages, nullptr);
        x[n - behind + t] = front.given[0][stages - 1];
    }
    rows.putBack();
    for (int k = 0; k < stages; ++k)
        state.sums[(first + k) * state.sumStep] = front.v[k];
}

} // namespace

void MovingSumWavefront(const MovingSumState<ElementType::DBL> &state, int32_t first,
                        MovingSum kind, double scale, DBL *x, int32_t n) {
    if (kind == MovingSum::Plain)
        Pass<MovingSum::Plain>(state, first, scale, x, n);
    else if (kind == MovingSum::AlternateEven)
        Pass<MovingSum::AlternateEven>(state, first, scale, x, n);
    else
        Pass<MovingSum::AlternateOdd>(state, first, scale, x, n);
}

} // namespace qx::QX_WIDTH
