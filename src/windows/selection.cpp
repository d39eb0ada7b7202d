#include "windows/selection.h"

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

// Selectors 30 to 34 and 60 to 62: the windows whose periodic form other routines build on.
template <class Signal>
ErrorCode ApplyPeriodicShape(Signal x, int32_t n, int32_t selector, double param) {
    switch (selector) {
    case Triangle:
        return ApplyTriangleWindow(x, n);
    case BartlettHanning:
        return ApplyBartHannWindow(x, n);
    case Bohman:
        return ApplyBohmanWindow(x, n);
    case Parzen:
        return ApplyParzenWindow(x, n);
    case Welch:
        return ApplyWelchWindow(x, n);
    case Kaiser:
        return ApplyKaiserWindow(x, n, param);
    case DolphChebyshev:
        return ApplyDolChebyWindow(x, n, param, 0);
    case Gaussian:
        return ApplyGaussWindow(x, n, param, 0);
    default:
        return ErrInvalidSelector;
    }
}

ErrorCode AllocateOnes(Scratch<ElementType::DBL> &window, int32_t n) {
    if (const ErrorCode status = window.allocate(n))
        return status;
    for (int32_t i = 0; i < n; ++i)
        window[i] = 1.0;
    return 0;
}

// The symmetric window over n ones.
ErrorCode GenerateSymmetric(DBL *w, int32_t n, int32_t selector, double param) {
    if (selector == Rectangle)
        return 0;
    if (selector == DolphChebyshev)
        return ApplyDolChebyWindow(RealSignal(w), n, param, 1);
    if (selector == Gaussian)
        return ApplyGaussWindow(RealSignal(w), n, param, 1);
    // The periodic window of one sample less, closed by its first sample.
    const ErrorCode status = IsCosineSum(selector)
                                 ? ApplyCosineWindowBySelector(RealSignal(w), n - 1, selector, 0)
                                 : ApplyPeriodicShape(RealSignal(w), n - 1, selector, param);
    w[n - 1] = w[0];
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

ErrorCode GenerateForMeasurement(int32_t n, int32_t selector, double param,
                                 Scratch<ElementType::DBL> &window) {
    if (const ErrorCode status = AllocateOnes(window, n))
        return status;
    return ApplyPeriodicShape(RealSignal(window.data()), n, selector, param);
}

template <class Signal>
ErrorCode ApplySymmetricWindow(int32_t selector, Signal x, int32_t n, double param) {
    if (n <= 1)
        return n < 1 ? ErrEmptyInput : 0;
    Scratch<ElementType::DBL> window;
    if (const ErrorCode status = AllocateOnes(window, n))
        return status;
    const ErrorCode status = GenerateSymmetric(window.data(), n, selector, param);
    if (status == 0)
        Multiply(x, n, window.data());
    return Merge(status, window.release());
}

template <class Signal>
ErrorCode ApplyScaledWindow(Signal x, int32_t n, int32_t selector, double param,
                            WindowConstants *constants) {
    if (n < 0)
        return ErrNegativeDimension;
    if (selector == Rectangle) {
        *constants = {1.0, 1.0};
        return 0;
    }
    if (IsCosineSum(selector)) {
        const ErrorCode status = WindowConstantsFromTable(selector, constants);
        return status != 0 || n == 0 ? status : ApplyCosineWindowBySelector(x, n, selector, 1);
    }

    Scratch<ElementType::DBL> window;
    ErrorCode status = GenerateForMeasurement(n, selector, param, window);
    if (status == 0)
        status = MeasureWindowConstants(window.data(), n, constants);
    if (status == 0) {
        const double gain = 1.0 / constants->cg;
        for (int32_t i = 0; i < n; ++i)
            x.scale(i, window[i] * gain);
    }
    return Merge(status, window.release());
}

template <class Signal>
ErrorCode ApplyWindowBySelector(Signal x, int32_t n, int32_t selector, double param, int32_t scaled,
                                int32_t symmetric) {
    if (scaled != 0 && symmetric != 0)
        return ErrInvalidSelector;
    const double value = PreparedWindowParam(selector, param);
    if (scaled != 0) {
        WindowConstants discarded;
        return ApplyScaledWindow(x, n, selector, value, &discarded);
    }
    if (symmetric != 0)
        return ApplySymmetricWindow(selector, x, n, value);
    if (selector == Rectangle)
        return 0;
    if (IsCosineSum(selector))
        return ApplyCosineWindowBySelector(x, n, selector, 0);
    switch (selector) {
    case CosineTapered:
        return ApplyCosTaperedWindow(x, n, value);
    case Force:
        return ApplyForceWindow(x, n, value);
    case Exponential:
        return ApplyExpWindow(x, n, value);
    default:
        return ApplyPeriodicShape(x, n, selector, value);
    }
}

#define QX_INSTANTIATE(Signal)                                                                     \
    template ErrorCode ApplySymmetricWindow(int32_t, Signal, int32_t, double);                     \
    template ErrorCode ApplyScaledWindow(Signal, int32_t, int32_t, double, WindowConstants *);     \
    template ErrorCode ApplyWindowBySelector(Signal, int32_t, int32_t, double, int32_t, int32_t);

QX_INSTANTIATE(RealSignal)
QX_INSTANTIATE(ComplexSignal)

} // namespace qx
