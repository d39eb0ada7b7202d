#include "linalg/systems/substitution.h"

#include "linalg/matrix.h"

namespace qx {

template <ElementType E>
ErrorCode Substitute(Factors factors, ConstVectorView<E> a, const MatrixView<E> &x) {
    const int32_t n = x.rows(), rightSides = x.cols();
    QX_EXPECTS(x.isWhole() &&
               a.size() == (factors == Factors::lu ? int64_t{n} * n : PackedLength(n)));
    Scratch<ElementType::DBL> strip;
    if (rightSides > 1)
        if (const ErrorCode failed = strip.allocate(int64_t{n} * stripWidth))
            return failed;
    if constexpr (E == ElementType::DBL)
        SubstituteStrips(factors, a.data(), n, rightSides, x.data(), strip.data());
    else
        CxSubstituteStrips(factors, a.data(), n, rightSides, x.data(), strip.data());
    return 0;
}

template ErrorCode Substitute(Factors, ConstRealVector, const RealMatrix &);
template ErrorCode Substitute(Factors, ConstComplexVector, const ComplexMatrix &);

} // namespace qx
