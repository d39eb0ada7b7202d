#ifndef QX_WINDOWS_TAPERS_H
#define QX_WINDOWS_TAPERS_H

#include "qx/errors.h"
#include "windows/signal.h"

namespace qx {

// The windows that are not cosine sums. Each multiplies the n samples of x in place and is periodic
// (the mirror of sample i is n - i) unless its line says otherwise. ErrEmptyInput for n < 1; a
// single sample is left as it is, unless stated.

// 2 i / n up to the middle. A single sample becomes 0.
template <ElementType E>
ErrorCode ApplyTriangleWindow(VectorView<E> x);
// 1 - ((i - n/2) / (n/2))^2.
template <ElementType E>
ErrorCode ApplyWelchWindow(VectorView<E> x);
// 0.62 - 0.48 |i/n - 1/2| - 0.38 cos(2 pi i / n).
template <ElementType E>
ErrorCode ApplyBartHannWindow(VectorView<E> x);
// With t = |i - n/2| / (n/2): 1 - 6 t^2 + 6 t^3 for t up to 1/2, 2 (1 - t)^3 beyond.
template <ElementType E>
ErrorCode ApplyParzenWindow(VectorView<E> x);
// sin(theta) / pi - (2 i / n) cos(theta) with theta = 2 pi i / n.
template <ElementType E>
ErrorCode ApplyBohmanWindow(VectorView<E> x);
// I0(beta sqrt(1 - u^2)) / I0(beta) with u = 1 - 2 i / n and its own series of I0.
template <ElementType E>
ErrorCode ApplyKaiserWindow(VectorView<E> x, double beta);
// exp(-t^2 / (2 sigma^2)), t in units of n + 1 samples from the middle at n/2, or, if
// `symmetric`, of n samples from (n - 1)/2. A sigma of 0 or less counts as 0.2.
template <ElementType E>
ErrorCode ApplyGaussWindow(VectorView<E> x, double sigma, bool symmetric);
// Keeps the first `percent` per cent of the samples. ErrFewerThanTwo for n < 2.
template <ElementType E>
ErrorCode ApplyForceWindow(VectorView<E> x, double percent);
// Decays exponentially from 1 to `finalValue`. ErrFewerThanTwo for n < 2, then
// ErrFinalValueNotPositive.
template <ElementType E>
ErrorCode ApplyExpWindow(VectorView<E> x, double finalValue);
// sin^2 tapers over `taperRatio` of the samples, half at each end, symmetric; a ratio of 1 or
// more is the Hanning window, which is periodic.
template <ElementType E>
ErrorCode ApplyCosTaperedWindow(VectorView<E> x, double taperRatio);

} // namespace qx

#endif
