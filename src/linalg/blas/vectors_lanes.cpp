#include "frame/lanes.h"
#include "linalg/blas/blas.h"

namespace qx::QX_WIDTH {

template <class L>
static QX_INLINE void RotateSome(DBL *x, DBL *y, double c, double s) {
    const L p = L::load(x), q = L::load(y);
    (L(c) * p + L(s) * q).store(x);
    (L(c) * q - L(s) * p).store(y);
}

void RotateReal(std::ptrdiff_t n, DBL *x, DBL *y, double c, double s) {
    std::ptrdiff_t i = 0;
    for (; i + nativeLanes <= n; i += nativeLanes)
        RotateSome<Lanes<nativeLanes>>(x + i, y + i, c, s);
    for (; i < n; ++i)
        RotateSome<Lanes<1>>(x + i, y + i, c, s);
}

} // namespace qx::QX_WIDTH
