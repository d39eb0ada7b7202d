#include "linalg/factorisations/hessenberg.h"

#include "frame/scratch.h"
#include "linalg/factorisations/reflector.h"

namespace qx {

template <ElementType E>
ErrorCode ReduceToHessenberg(ElementOf<E> *a, std::ptrdiff_t stride, int32_t n, int32_t low,
                             int32_t high, ElementOf<E> *q, std::ptrdiff_t qStride) {
    typedef ElementOf<E> T;
    typedef Reflector<E> Reflection;
    Scratch<E> vectors;
    if (const ErrorCode failed = vectors.allocate(5 * int64_t{n}))
        return failed;
    T *const kappa = vectors.data(), *const first = kappa + n, *const v = first + n,
             *const work = v + n;

    for (int32_t k = low; k < high - 1; ++k) {
        const int32_t rows = high - k;
        T *const column = a + (k + 1) * stride + k;
        const Reflection reflection(column, stride, rows, Reflection::Leave::Reduced);
        kappa[k] = reflection.kappa;
        for (int32_t i = 0; i < rows; ++i)
            v[i] = column[i * stride];
        first[k] = v[0];
        column[0] = ScalarOf<E>::Of(reflection.beta);
        ReflectFromLeft<E>(column + 1, stride, rows, n - k - 1, v, reflection.kappa, work);
        ReflectFromRight<E>(a + k + 1, stride, high + 1, rows, v, Conj(reflection.kappa), work);
    }

    for (int32_t i = 0; q != nullptr && i < n; ++i)
        for (int32_t j = 0; j < n; ++j)
            q[i * qStride + j] = ScalarOf<E>::Of(i == j ? 1.0 : 0.0);
    for (int32_t k = high - 2; k >= low; --k) {
        T *const column = a + (k + 1) * stride + k;
        const int32_t rows = high - k;
        v[0] = first[k];
        for (int32_t i = 1; i < rows; ++i) {
            v[i] = column[i * stride];
            column[i * stride] = T{};
        }
        if (q != nullptr)
            ReflectFromLeft<E>(q + (k + 1) * qStride + k + 1, qStride, rows, rows, v,
                               Conj(kappa[k]), work);
    }
    return 0;
}

template ErrorCode ReduceToHessenberg<ElementType::DBL>(DBL *, std::ptrdiff_t, int32_t, int32_t,
                                                        int32_t, DBL *, std::ptrdiff_t);
template ErrorCode ReduceToHessenberg<ElementType::CDB>(CDB *, std::ptrdiff_t, int32_t, int32_t,
                                                        int32_t, CDB *, std::ptrdiff_t);

} // namespace qx
