#ifndef QX_FILTERS_REMEZ_H
#define QX_FILTERS_REMEZ_H

#include "frame/views.h"
#include "frame/widths.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Equiripple FIR filters with linear phase by the Remez exchange algorithm, after J. H. McClellan,
// T. W. Parks and L. R. Rabiner, "A computer program for designing optimum FIR linear phase digital
// filters", 1973: the taps that minimise the largest weighted deviation from the desired response
// on a grid over all bands.

enum RemezType : int32_t { RemezMultiband = 1, RemezDifferentiator = 2, RemezHilbert = 3 };

// The bands have edges[2 b] and edges[2 b + 1], in the unit of fs, a gain (for a differentiator: a
// slope in cycles per sample) and a weight (for a differentiator it is divided by the frequency).
struct RemezBands {
    ConstRealVector desired, weight, edges;
    double fs;
    RemezType type;

    std::ptrdiff_t count() const { return desired.size(); }
    double lower(std::ptrdiff_t band) const { return edges[2 * band] / fs; }
    double upper(std::ptrdiff_t band) const { return edges[2 * band + 1] / fs; }
    double firstEdge() const { return edges[0]; }
    double lastEdge() const { return edges[edges.size() - 1]; }
};

// Computes the n taps of h, symmetric for a multiband filter, antisymmetric for the others, and
// stores the deviation in *ripple. A maxIterations not above 0 means 100.
//
// ErrBadDesignField: n below 3; a number that is not finite; edges that do not begin or end where
// the type requires it; a weight that vanishes with the symmetry factor; or an exchange whose
// deviation decreases, that has two extrema at one point, or that does not converge within its
// iterations; in that last case *ripple is the last deviation. ErrEmptyInput: no band.
// ErrBadCutoff: fs or a weight not above 0, a negative edge or gain, edges that do not ascend.
// ErrAboveNyquist. ErrBadTapCount: an even n with a gain at the Nyquist frequency. ErrOutOfMemory:
// no memory, or about 4090 taps and more, the limit of the design.
ErrorCode RemezDesign(const RemezBands &bands, RealVector h, double *ripple, int32_t maxIterations);

// The interpolating polynomial of an exchange: through y[j] at x[j], with ad[j] = 1 / (product of
// x[j] - x[k] over the other k).
struct Interpolation {
    const DBL *x, *y, *ad;
    int32_t count;
};

// The number of points that are evaluated together.
constexpr int32_t interpolationGroup = 8;

// The values of the polynomial at a group of places: the sum over j of c y[j] divided by the sum of
// c, with c = ad[j] / (place - x[j]), both in this order, the second sum compensated. At x[j]
// itself the value is NaN.
QX_BY_WIDTH(void, Interpolate, (const Interpolation &polynomial, const DBL *places, DBL *values))

// The products of x[j] - x[k] over the other k in ascending order, for each j. Products of some
// hundred distances leave the range of a double, so product[j] is to be multiplied by
// 2^exponent[j].
struct Distances {
    const DBL *x;
    int32_t count;
    DBL *product;
    I32 *exponent;
};
QX_BY_WIDTH(void, MultiplyDistances, (const Distances &distances))

} // namespace qx

#endif
