#ifndef QX_FILTERS_DIRECT_FORM_H
#define QX_FILTERS_DIRECT_FORM_H

#include "frame/elements.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Filters of one numerator and one denominator, a[0] included:
//
//     y[t] = (b[0] x[t] + ... + b[nb-1] x[t-nb+1] - a[1] y[t-1] - ... - a[na-1] y[t-na+1]) / a[0]
//
// summed from the oldest sample of x to the newest, then of y. The values before x[0] and y[0]
// stand in xState (nb - 1) and yState (na - 1), the newest last, which are brought up to date. The
// signal may be cut anywhere with no change to a bit. y may be x.
//
// ErrEmptyInput for a count below 1; ErrOutOfMemory, with nothing done.

// Coefficients and signals, real or complex: real filters of both kinds of signal, complex filters
// of both kinds of signal.
template <ElementType Coefficient, ElementType Signal>
struct DirectForm {
    static constexpr auto output = Coefficient == ElementType::CDB || Signal == ElementType::CDB
                                       ? ElementType::CDB
                                       : ElementType::DBL;
    typedef typename Element<Coefficient>::type C;
    typedef typename Element<Signal>::type X;
    typedef typename Element<output>::type Y;

    // Without a denominator. One tap multiplies and keeps no state.
    static ErrorCode fir(const C *b, int32_t nb, const X *x, int32_t n, X *state, Y *y);
    static ErrorCode iir(const C *b, int32_t nb, X *xState, const C *a, int32_t na, Y *yState,
                         const X *x, int32_t n, Y *y);
};

extern template struct DirectForm<ElementType::DBL, ElementType::DBL>;
extern template struct DirectForm<ElementType::DBL, ElementType::CDB>;
extern template struct DirectForm<ElementType::CDB, ElementType::CDB>;
extern template struct DirectForm<ElementType::CDB, ElementType::DBL>;

} // namespace qx

#endif
