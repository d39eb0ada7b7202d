#include "multirate/cic.h"

#include "multirate/samples.h"

#include <algorithm>

namespace qx {

namespace {

// Samples at the high rate pass through the cascade in pieces that stay in the first-level cache.
constexpr int32_t pieceSize = 512;

class Cascade {
public:
    Cascade(const CICShape &shape, DBL *state)
        : state_{state,
                 int64_t{shape.width} + 1,
                 state + shape.width,
                 int64_t{shape.width} + 1,
                 shape.stages,
                 shape.width,
                 0},
          kind_(!shape.alternate       ? MovingSum::Plain
                : shape.width % 2 == 0 ? MovingSum::AlternateEven
                                       : MovingSum::AlternateOdd),
          scale_(1.0 / shape.width) {}
    ~Cascade() { StraightenRings(state_); }
    Cascade(const Cascade &) = delete;
    Cascade &operator=(const Cascade &) = delete;

    void run(DBL *piece, int32_t n) { MovingSumStages(state_, kind_, scale_, piece, n); }

private:
    MovingSumState<ElementType::DBL> state_;
    const MovingSum kind_;
    const double scale_;
};

} // namespace

void CICDecimate(const CICShape &shape, DBL *state, const DBL *x, int32_t n, int64_t first,
                 DBL *y) {
    DBL piece[pieceSize];
    Cascade cascade(shape, state);
    int64_t pick = first;
    for (int64_t at = 0; at < n; at += pieceSize) {
        const auto size = static_cast<int32_t>(std::min<int64_t>(pieceSize, n - at));
        CopySamples<ElementType::DBL>(piece, x + at, size);
        cascade.run(piece, size);
        for (; pick < at + size; pick += shape.factor)
            *y++ = piece[pick - at];
    }
}

void CICInterpolate(const CICShape &shape, DBL *state, const DBL *x, int32_t n, int64_t dropped,
                    DBL *y) {
    DBL piece[pieceSize];
    Cascade cascade(shape, state);
    const int64_t total = int64_t{n} * shape.factor;
    int64_t nextSample = 0;
    for (int64_t at = 0; at < total; at += pieceSize) {
        const auto size = static_cast<int32_t>(std::min<int64_t>(pieceSize, total - at));
        Fill(piece, size, 0.0);
        for (; nextSample < at + size; nextSample += shape.factor)
            piece[nextSample - at] = *x++ * shape.factor;
        cascade.run(piece, size);
        const int64_t skipped = std::clamp<int64_t>(dropped - at, 0, size);
        CopySamples<ElementType::DBL>(y, piece + skipped, size - skipped);
        y += size - skipped;
    }
}

} // namespace qx
