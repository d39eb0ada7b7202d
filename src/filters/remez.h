#ifndef QX_FILTERS_REMEZ_H
#define QX_FILTERS_REMEZ_H

#include "frame/views.h"
#include "frame/widths.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Equiripple FIR filters with linear phase by the exchange of Remez, after J. H. McClellan, T. W.
// Parks and L. R. Rabiner, "A computer program for designing optimum FIR linear phase digital
// filters", 1973: the taps whose greatest weighted deviation from what is desired, on a grid of all
// bands, is the least.

enum RemezType : int32_t { RemezMultiband = 1, RemezDifferentiator = 2, RemezHilbert = 3 };

// The bands have edges[2 b] and edges[2 b + 1], in the unit of fs, a gain (of a differentiator: a
// slope in cycles per sample) and a weight (of a differentiator: one that is divided by the
// frequency).
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

// The n taps of h, symmetric for a multiband filter, antisymmetric for the others; the deviation
// into *ripple. maxIterations not above 0 means 100.
//
// ErrBadDesignField: n below 3; a number that is not finite; edges that do not begin or end where
// the type needs it; a weight that vanishes with the factor of the symmetry; or an exchange that
// loses, has two extrema at one place or does not settle within its rounds, and then *ripple has
// the last deviation. ErrEmptyInput: no band. ErrBadCutoff: fs or a weight not above 0, a negative
// edge or gain, edges that do not rise. ErrAboveNyquist. ErrBadTapCount: an even n with a gain at
// the Nyquist frequency. ErrOutOfMemory: no memory, or about 4090 taps and more, the limit of the
// design.
ErrorCode RemezDesign(const RemezBands &bands, RealVector h, double *ripple, int32_t maxIterations);

// The interpolating polynomial of an exchange: through y[j] at x[j], with ad[j] = 1 / (product of
// x[j] - x[k] over the other k).
struct Interpolation {
    const DBL *x, *y, *ad;
    int32_t count;
};

// Points that are evaluated at once.
constexpr int32_t interpolationGroup = 8;

// Its values at a group of places: the sum over j of c y[j] by the sum of c, c = ad[j] / (place -
// x[j]), both in this order, the second one compensated. At x[j] itself it is NaN.
QX_BY_WIDTH(void, Interpolate, (const Interpolation &polynomial, const DBL *places, DBL *values))

// The products of x[j] - x[k] over the other k in ascending order, for each j. As the products of
// some hundred distances leave the range of a double, product[j] is to be multiplied by
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
