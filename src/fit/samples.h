#ifndef QX_FIT_SAMPLES_H
#define QX_FIT_SAMPLES_H

#include "frame/views.h"

#include <cmath>

namespace qx {

// The samples of a fit: as many x as y, and as many weights, of which the absolute value counts, or
// no weights.
struct FitSamples {
    ConstRealVector x, y, w;

    int32_t n() const { return static_cast<int32_t>(y.size()); }
    double weight(int32_t i) const { return w.isEmpty() ? 1.0 : std::fabs(w[i]); }
    const DBL *weights() const { return w.isEmpty() ? nullptr : w.data(); } // or null
};

// The outputs of a fit beside its parameters: its values, which may overwrite y, and the mean of
// |w| (y - f)^2. Either may be absent.
struct FitOutput {
    RealVector values;
    DBL *mse = nullptr;
};

} // namespace qx

#endif
