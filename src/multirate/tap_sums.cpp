#include "multirate/tap_sums.h"

#include "frame/lanes.h"

namespace qx::QX_WIDTH {

namespace {

// Lanes for the type of an element.
template <ElementType Code, int N>
struct LanesOf {
    typedef Lanes<N> type;
    static constexpr int most = nativeLanes;
};
template <int N>
struct LanesOf<ElementType::SGL, N> {
    typedef FloatLanes<N> type;
    static constexpr int most = nativeFloatLanes;
};

// Keyed by the element's code, because a template argument would drop the alignment attribute of
// its type.
template <ElementType Code, class PlainReal>
struct Problem {
    typedef PlainReal Real;
    typedef typename Element<Code>::type T;
    std::ptrdiff_t tapStep;
    std::ptrdiff_t offsetStep;
    const T *samples;
    Real scale;
    int32_t width;

    // Adds terms `first` to `end` - 1 of `Rows` rows to sums of `Parts` lanes each.
    template <int Rows, int Parts, class Lane>
    void addTerms(const TapRow<Code> *rows, int32_t at, int32_t first, int32_t end,
                  Lane (*sum)[Parts]) const {
        for (int32_t j = first; j < end; ++j)
            for (int row = 0; row < Rows; ++row) {
                const Lane factor(rows[row].taps[j * tapStep]);
                const T *sample = samples + rows[row].offsets[j * offsetStep] + at;
                for (int part = 0; part < Parts; ++part)
                    sum[row][part] =
                        sum[row][part] + factor * Lane::load(sample + part * Lane::count);
            }
    }

    // Several independent chains of additions hide the latency of each.
    template <int Rows, int Parts, class Lane>
    void sumAt(const TapRow<Code> *rows, int32_t at) const {
        Lane sum[Rows][Parts];
        for (auto &sums : sum)
            for (Lane &part : sums)
                part = Lane(0);
        int32_t common = rows[0].terms;
        for (int row = 1; row < Rows; ++row)
            if (rows[row].terms < common)
                common = rows[row].terms;
        addTerms<Rows, Parts, Lane>(rows, at, 0, common, sum);
        for (int row = 0; row < Rows; ++row) {
            if (Rows > 1)
                addTerms<1, Parts, Lane>(rows + row, at, common, rows[row].terms, sum + row);
            for (int part = 0; part < Parts; ++part)
                (Lane(scale) * sum[row][part]).store(rows[row].sums + at + part * Lane::count);
        }
    }

    template <int Rows>
    void sumRows(const TapRow<Code> *rows) const {
        typedef typename LanesOf<Code, LanesOf<Code, 1>::most>::type Wide;
        typedef typename LanesOf<Code, 1>::type Narrow;
        int32_t at = 0;
        for (; at + 8 * Wide::count <= width; at += 8 * Wide::count)
            for (int row = 0; row < Rows; ++row)
                sumAt<1, 8, Wide>(rows + row, at);
        for (; at + 2 * Wide::count <= width; at += 2 * Wide::count)
            sumAt<Rows, 2, Wide>(rows, at);
        for (; at + Wide::count <= width; at += Wide::count)
            sumAt<Rows, 1, Wide>(rows, at);
        for (; at < width; ++at)
            sumAt<Rows, 1, Narrow>(rows, at);
    }

    void run(const TapRow<Code> *rows, int32_t count) const {
        int32_t row = 0;
        for (; row + 4 <= count; row += 4)
            sumRows<4>(rows + row);
        for (; row < count; ++row)
            sumRows<1>(rows + row);
    }
};

} // namespace

void TapSumsDBL(const TapRow<ElementType::DBL> *rows, int32_t count, std::ptrdiff_t tapStep,
                std::ptrdiff_t offsetStep, const DBL *samples, double scale, int32_t width) {
    const Problem<ElementType::DBL, double> problem{tapStep, offsetStep, samples, scale, width};
    problem.run(rows, count);
}

void TapSumsSGL(const TapRow<ElementType::SGL> *rows, int32_t count, std::ptrdiff_t tapStep,
                std::ptrdiff_t offsetStep, const SGL *samples, float scale, int32_t width) {
    const Problem<ElementType::SGL, float> problem{tapStep, offsetStep, samples, scale, width};
    problem.run(rows, count);
}

} // namespace qx::QX_WIDTH
