#include "windows/selection.h"

#include "frame/scratch.h"
#include "windows/constants.h"
#include "windows/dolph_chebyshev.h"
#include "windows/tapers.h"

#include <cmath>

namespace qx {

namespace {

// The selectors by name.
enum Selector : int32_t {
    Rectangle = 0,
    CosineTapered = 12,
    Triangle = 30,
    BartlettHanning = 31,
    Bohman = 32,
    Parzen = 33,
    Welch = 34,
    Kaiser = 60,
    DolphChebyshev = 61,
    Gaussian = 62,
    Force = 64,
    Exponential = 65,
};

bool IsCosineSum(int32_t selector) {
    return selector != Rectangle && CosineWindowCoefs(selector).count > 0;
}

// Selectors 30 to 34 and 60 to 62: the windows on whose periodic form other routines are built.
template <ElementType E>
ErrorCode ApplyPeriodicShape(VectorView<E> x, int32_t selector, double param) {
    switch (selector) {
    case Triangle:
        return ApplyTriangleWindow(x);
    case BartlettHanning:
        return ApplyBartHannWindow(x);
    case Bohman:
        return ApplyBohmanWindow(x);
    case Parzen:
        return ApplyParzenWindow(x);
    case Welch:
        return ApplyWelchWindow(x);
    case Kaiser:
        return ApplyKaiserWindow(x, param);
    case DolphChebyshev:
        return ApplyDolChebyWindow(x, param, false);
    case Gaussian:
        return ApplyGaussWindow(x, param, false);
    default:
        return ErrInvalidSelector;
    }
}

// The symmetric window applied to ones.
ErrorCode GenerateSymmetric(RealVector w, int32_t selector, double param) {
    if (selector == Rectangle)
        return 0;
    if (selector == DolphChebyshev)
        return ApplyDolChebyWindow(w, param, true);
    if (selector == Gaussian)
        return ApplyGaussWindow(w, param, true);
    // The periodic window with one sample less, followed by its first sample.
    const RealVector periodic = w.part(0, w.size() - 1);
    const ErrorCode status = IsCosineSum(selector)
                                 ? ApplyCosineWindowBySelector(periodic, selector, false)
                                 : ApplyPeriodicShape(periodic, selector, param);
    w[w.size() - 1] = w[0];
    return status;
}

} // namespace

double WindowDefaultParam(int32_t selector, double param) {
    const bool isNaN = std::isnan(param);
    switch (selector) {
    case CosineTapered:
        return isNaN ? 0.2 : param;
    case Kaiser:
        return isNaN ? 0.0 : param;
    case DolphChebyshev:
        return isNaN || param < 0.0 ? 60.0 : param;
    case Gaussian:
        return isNaN || param < 0.0 ? 0.2 : param;
    case Force:
        return isNaN ? 50.0 : param;
    case Exponential:
        return isNaN ? 0.1 : param;
    default:
        return 0.0;
    }
}

double PreparedWindowParam(int32_t selector, double param) {
    const double value = WindowDefaultParam(selector, param);
    return selector == DolphChebyshev ? std::pow(10.0, value / 20.0) : value;
}

ErrorCode GenerateForMeasurement(RealVector w, int32_t selector, double param) {
    Fill(w.data(), w.size(), 1.0);
    return ApplyPeriodicShape(w, selector, param);
}

template <ElementType E>
ErrorCode ApplySymmetricWindow(int32_t selector, VectorView<E> x, double param) {
    if (x.size() <= 1)
        return x.isEmpty() ? ErrEmptyInput : 0;
    RealVector window;
    ScratchParts memory;
    if (const ErrorCode status = memory.take(Sized(window, x.size())))
        return status;
    Fill(window.data(), window.size(), 1.0);
    const ErrorCode status = GenerateSymmetric(window, selector, param);
    if (status == 0)
        Multiply<E>(x, window);
    return Merge(status, memory.release());
}

template <ElementType E>
ErrorCode ApplyScaledWindow(VectorView<E> x, int32_t selector, double param,
                            WindowConstants *constants) {
    if (selector == Rectangle) {
        *constants = {1.0, 1.0};
        return 0;
    }
    if (IsCosineSum(selector)) {
        const ErrorCode status = WindowConstantsFromTable(selector, constants);
        return status != 0 || x.isEmpty() ? status : ApplyCosineWindowBySelector(x, selector, true);
    }

    RealVector window;
    ScratchParts memory;
    if (const ErrorCode status = memory.take(Sized(window, x.size())))
        return status;
    ErrorCode status = GenerateForMeasurement(window, selector, param);
    if (status == 0)
        status = MeasureWindowConstants(window, constants);
    if (status == 0) {
        const double gain = 1.0 / constants->cg;
        for (std::ptrdiff_t i = 0; i < x.size(); ++i)
            Scale(x[i], window[i] * gain);
    }
    return Merge(status, memory.release());
}

template <ElementType E>
ErrorCode ApplyWindowBySelector(VectorView<E> x, int32_t selector, double param, bool scaled,
                                bool symmetric) {
    if (scaled && symmetric)
        return ErrInvalidSelector;
    const double value = PreparedWindowParam(selector, param);
    if (scaled) {
        WindowConstants discarded;
        return ApplyScaledWindow(x, selector, value, &discarded);
    }
    if (symmetric)
        return ApplySymmetricWindow(selector, x, value);
    if (selector == Rectangle)
        return 0;
    if (IsCosineSum(selector))
        return ApplyCosineWindowBySelector(x, selector, false);
    switch (selector) {
    case CosineTapered:
        return ApplyCosTaperedWindow(x, value);
    case Force:
        return ApplyForceWindow(x, value);
    case Exponential:
        return ApplyExpWindow(x, value);
    default:
        return ApplyPeriodicShape(x, selector, value);
    }
}

#define QX_INSTANTIATE(View)                                                                       \
    template ErrorCode ApplySymmetricWindow(int32_t, View, double);                                \
    template ErrorCode ApplyScaledWindow(View, int32_t, double, WindowConstants *);                \
    template ErrorCode ApplyWindowBySelector(View, int32_t, double, bool, bool);

QX_INSTANTIATE(RealVector)
QX_INSTANTIATE(ComplexVector)

} // namespace qx
