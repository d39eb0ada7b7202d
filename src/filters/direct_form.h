#ifndef QX_FILTERS_DIRECT_FORM_H
#define QX_FILTERS_DIRECT_FORM_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Filters with a numerator and a denominator, including a[0]:
//
//     y[t] = (b[0] x[t] + ... + b[nb-1] x[t-nb+1] - a[1] y[t-1] - ... - a[na-1] y[t-na+1]) / a[0]
//
// summed from the oldest to the newest sample of x, then of y. The values before x[0] and y[0] are
// in xState (nb - 1) and yState (na - 1), newest last, and are updated. The signal may be split
// anywhere without changing a bit. y has the size of x and may be x. ErrOutOfMemory, with nothing
// done.

// Coefficients and signals may be real or complex: real and complex filters for real and complex
// signals.
template <ElementType Coefficient, ElementType Signal>
struct DirectForm {
    static constexpr auto output = Coefficient == ElementType::CDB || Signal == ElementType::CDB
                                       ? ElementType::CDB
                                       : ElementType::DBL;
    typedef ConstVectorView<Coefficient> Coefficients;

    // Without a denominator. A single tap multiplies and has no state.
    static ErrorCode fir(Coefficients b, ConstVectorView<Signal> x, VectorView<Signal> state,
                         VectorView<output> y);
    static ErrorCode iir(Coefficients b, VectorView<Signal> xState, Coefficients a,
                         VectorView<output> yState, ConstVectorView<Signal> x,
                         VectorView<output> y);
};

extern template struct DirectForm<ElementType::DBL, ElementType::DBL>;
extern template struct DirectForm<ElementType::DBL, ElementType::CDB>;
extern template struct DirectForm<ElementType::CDB, ElementType::CDB>;
extern template struct DirectForm<ElementType::CDB, ElementType::DBL>;

} // namespace qx

#endif
