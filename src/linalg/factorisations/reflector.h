#ifndef QX_LINALG_FACTORISATIONS_REFLECTOR_H
#define QX_LINALG_FACTORISATIONS_REFLECTOR_H

#include "linalg/kernels.h"
#include "linalg/scalar.h"

namespace qx {

// Elementary unitary matrices H = I - v v^H / kappa (A. S. Householder). H maps the vector x from
// which it is made to (beta, 0, ..., 0) with real beta; its inverse is H^H, which has the conjugate
// of kappa. kappa = 0 means H = I.
template <ElementType E>
class Reflector {
    typedef ElementOf<E> T;
    typedef typename ScalarOf<E>::type Value;

public:
    // Which vectors need no reflection: only the zero vector, or every vector that already is
    // (beta, 0, ..., 0), as in LAPACK.
    enum class Leave { ZeroOnly, Reduced };

    // x[0], x[stride], ... becomes v. The vector is scaled by the sum of its absolute values, so
    // that no square overflows, and beta gets the sign opposite to x[0], so that nothing cancels.
    Reflector(T *x, std::ptrdiff_t stride, int32_t n, Leave leave) {
        double scale = 0.0;
        for (int32_t i = 1; i < n; ++i)
            scale += AbsSum(x[i * stride]);
        if (leave == Leave::Reduced && scale == 0.0 && ImagPart(x[0]) == 0.0) {
            beta = RealPart(x[0]);
            return;
        }
        scale += AbsSum(x[0]);
        if (scale == 0.0)
            return;
        double squares = 0.0;
        for (int32_t i = 0; i < n; ++i) {
            x[i * stride] = x[i * stride] / scale;
            squares += SquaredModulus(x[i * stride]);
        }
        const Value first = x[0];
        const double norm = -std::copysign(std::sqrt(squares), RealPart(first));
        kappa = ScalarOf<E>::Of(squares) - first * norm;
        x[0] = first - ScalarOf<E>::Of(norm);
        beta = norm * scale;
    }

    double beta = 0.0;
    Value kappa = ScalarOf<E>::Of(0.0);
};

// a becomes H a: a - v (v^H a) / kappa.
template <ElementType E>
void ReflectFromLeft(const MatrixView<E> &a, ConstVectorView<E> v,
                     typename ScalarOf<E>::type kappa) {
    QX_EXPECTS(v.size() == a.rows());
    if (AbsSum(kappa) == 0.0 || a.cols() < 1)
        return;
    if constexpr (E == ElementType::DBL)
        ReflectFromLeftReal(a.data(), a.stride(), a.rows(), a.cols(), v.data(), kappa);
    else
        ReflectFromLeftComplex(a.data(), a.stride(), a.rows(), a.cols(), v.data(), kappa);
}

// a becomes a H: a - (a v) v^H / kappa. `work` has at least rows + cols elements.
template <ElementType E>
void ReflectFromRight(const MatrixView<E> &a, ConstVectorView<E> v,
                      typename ScalarOf<E>::type kappa, VectorView<E> work) {
    const int32_t rows = a.rows(), cols = a.cols();
    if (AbsSum(kappa) == 0.0 || rows < 1)
        return;
    const VectorView<E> conjugate = work.part(0, cols), product = work.part(cols, rows);
    for (int32_t j = 0; j < cols; ++j)
        conjugate[j] = Conj(v[j]);
    RowProducts<E>(a, v, product);
    for (ElementOf<E> &element : product)
        element = -(element / kappa);
    AddOuterProduct<E>(a, product, conjugate);
}

} // namespace qx

#endif
