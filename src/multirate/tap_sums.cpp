#include "multirate/tap_sums.h"

#include <cstring>

namespace qx::QX_WIDTH {

namespace {

#ifdef __AVX2__
constexpr int vectorBytes = 32;
#else
constexpr int vectorBytes = 16;
#endif

// A vector of reals; every operation does in each lane what it would do to one number.
template <class Real>
struct Vector {
    typedef Real type __attribute__((vector_size(vectorBytes)));
    static constexpr int count = vectorBytes / sizeof(Real);
    static type broadcast(Real v) {
        if constexpr (count == 2)
            return type{v, v};
        else if constexpr (count == 4)
            return type{v, v, v, v};
        else
            return type{v, v, v, v, v, v, v, v};
    }
};
template <class Real>
struct Single {
    typedef Real type;
    static constexpr int count = 1;
    static type broadcast(Real value) { return value; }
};

// Keyed by the element's code, since a template argument would drop the alignment of its type.
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
                  typename Lane::type (*sum)[Parts]) const {
        for (int32_t j = first; j < end; ++j)
            for (int row = 0; row < Rows; ++row) {
                const auto factor = Lane::broadcast(rows[row].taps[j * tapStep]);
                const T *sample = samples + rows[row].offsets[j * offsetStep] + at;
                for (int part = 0; part < Parts; ++part) {
                    typename Lane::type value;
                    std::memcpy(&value, sample + part * Lane::count, sizeof value);
                    sum[row][part] = sum[row][part] + factor * value;
                }
            }
    }

    // Several chains of additions side by side hide the latency of each.
    template <int Rows, int Parts, class Lane>
    void sumAt(const TapRow<Code> *rows, int32_t at) const {
        typename Lane::type sum[Rows][Parts] = {};
        int32_t common = rows[0].terms;
        for (int row = 1; row < Rows; ++row)
            if (rows[row].terms < common)
                common = rows[row].terms;
        addTerms<Rows, Parts, Lane>(rows, at, 0, common, sum);
        for (int row = 0; row < Rows; ++row) {
            if (Rows > 1)
                addTerms<1, Parts, Lane>(rows + row, at, common, rows[row].terms, sum + row);
            for (int part = 0; part < Parts; ++part) {
                const auto scaled = Lane::broadcast(scale) * sum[row][part];
                std::memcpy(rows[row].sums + at + part * Lane::count, &scaled, sizeof scaled);
            }
        }
    }

    template <int Rows>
    void sumRows(const TapRow<Code> *rows) const {
        typedef Vector<Real> Wide;
        typedef Single<Real> Narrow;
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
