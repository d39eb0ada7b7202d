#include "linalg/factorisations/hessenberg.h"

#include "linalg/factorisations/reflector.h"

namespace qx {

template <ElementType E>
ErrorCode ReduceToHessenberg(const MatrixView<E> &a, int32_t low, int32_t high,
                             const MatrixView<E> &q) {
    typedef ElementOf<E> T;
    typedef Reflector<E> Reflection;
    const int32_t n = a.rows();
    QX_EXPECTS(a.isSquare() && low >= 0 && high < n && (q.isEmpty() || q.rows() == n));
    VectorView<E> kappa, first, column, work;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(kappa, n), Sized(first, n), Sized(column, n),
                                             Sized(work, 2 * int64_t{n})))
        return failed;

    for (int32_t k = low; k < high - 1; ++k) {
        const int32_t rows = high - k;
        T *const below = a.row(k + 1) + k;
        const Reflection reflection(below, a.stride(), rows, Reflection::Leave::Reduced);
        kappa[k] = reflection.kappa;
        const VectorView<E> v = column.part(0, rows);
        for (int32_t i = 0; i < rows; ++i)
            v[i] = a(k + 1 + i, k);
        first[k] = v[0];
        *below = ScalarOf<E>::Of(reflection.beta);
        ReflectFromLeft<E>(a.block(k + 1, k + 1, rows, n - k - 1), v, reflection.kappa);
        ReflectFromRight<E>(a.block(0, k + 1, high + 1, rows), v, Conj(reflection.kappa), work);
    }

    SetIdentity<E>(q);
    for (int32_t k = high - 2; k >= low; --k) {
        const int32_t rows = high - k;
        const VectorView<E> v = column.part(0, rows);
        v[0] = first[k];
        for (int32_t i = 1; i < rows; ++i) {
            v[i] = a(k + 1 + i, k);
            a(k + 1 + i, k) = T{};
        }
        if (!q.isEmpty())
            ReflectFromLeft<E>(q.block(k + 1, k + 1, rows, rows), v, Conj(kappa[k]));
    }
    return 0;
}

template ErrorCode ReduceToHessenberg(const RealMatrix &, int32_t, int32_t, const RealMatrix &);
template ErrorCode ReduceToHessenberg(const ComplexMatrix &, int32_t, int32_t,
                                      const ComplexMatrix &);

} // namespace qx
