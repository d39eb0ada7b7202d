#include "qx/windows.h"

#include "frame/finish.h"
#include "frame/views.h"
#include "windows/dolph_chebyshev.h"
#include "windows/selection.h"
#include "windows/tapers.h"

// A window export is its inner routine on the caller's array, which a failure empties. The real
// and the complex one are the same over another kind of sample.

namespace {

using qx::ElementType;
using qx::In1D;

template <ElementType Code>
struct SignalOf;
template <>
struct SignalOf<ElementType::DBL> {
    typedef qx::RealSignal type;
};
template <>
struct SignalOf<ElementType::CDB> {
    typedef qx::ComplexSignal type;
};

template <class Handle, class Window>
ErrorCode Apply(Handle x, Window window) {
    constexpr ElementType code = qx::HandleTraits<Handle>::code;
    typedef typename SignalOf<code>::type Signal;
    const qx::InOut1D<code> samples(x);
    return qx::Finish(window(Signal(samples.data()), samples.size()), samples);
}

template <class Window>
ErrorCode ApplyReal(DBL1D x, Window window) {
    return Apply(x, window);
}
template <class Window>
ErrorCode ApplyComplex(CDB1D x, Window window) {
    return Apply(x, window);
}

auto Kaiser(double beta) {
    return [=](auto x, int32_t n) { return qx::ApplyKaiserWindow(x, n, beta); };
}
auto DolChebyWin(double ratio, int32_t symmetric) {
    return [=](auto x, int32_t n) { return qx::ApplyDolChebyWindow(x, n, ratio, symmetric); };
}
auto GaussWin(double sigma, int32_t symmetric) {
    return [=](auto x, int32_t n) { return qx::ApplyGaussWindow(x, n, sigma, symmetric); };
}
auto ForceWin(double percent) {
    return [=](auto x, int32_t n) { return qx::ApplyForceWindow(x, n, percent); };
}
auto ExpWin(double finalValue) {
    return [=](auto x, int32_t n) { return qx::ApplyExpWindow(x, n, finalValue); };
}
auto CosTapered(double taperRatio) {
    return [=](auto x, int32_t n) { return qx::ApplyCosTaperedWindow(x, n, taperRatio); };
}
auto TriangleWin() {
    return [](auto x, int32_t n) { return qx::ApplyTriangleWindow(x, n); };
}
auto WelchWin() {
    return [](auto x, int32_t n) { return qx::ApplyWelchWindow(x, n); };
}
auto BartHannWin() {
    return [](auto x, int32_t n) { return qx::ApplyBartHannWindow(x, n); };
}
auto BohmanWin() {
    return [](auto x, int32_t n) { return qx::ApplyBohmanWindow(x, n); };
}
auto ParzenWin() {
    return [](auto x, int32_t n) { return qx::ApplyParzenWindow(x, n); };
}
auto GenCosWin(DBL1D coefs) {
    return [a = In1D<ElementType::DBL>(coefs)](auto x, int32_t n) {
        return qx::ApplyCosineSumWindow(x, n, a.data(), a.size(), 0);
    };
}
auto ScaledGenCosWin(DBL1D coefs) {
    return [a = In1D<ElementType::DBL>(coefs)](auto x, int32_t n) {
        return qx::ApplyCosineSumWindow(x, n, a.data(), a.size(), 1);
    };
}
auto AllCosWin(int32_t selector, int32_t scaled) {
    return
        [=](auto x, int32_t n) { return qx::ApplyCosineWindowBySelector(x, n, selector, scaled); };
}
auto SymmWin(int32_t selector, double param) {
    return [=](auto x, int32_t n) { return qx::ApplySymmetricWindow(selector, x, n, param); };
}
auto ScaledWin(int32_t selector, double param, WindowConstants *constants) {
    return
        [=](auto x, int32_t n) { return qx::ApplyScaledWindow(x, n, selector, param, constants); };
}
auto AllWin(int32_t selector, double param, int32_t scaled, int32_t symmetric) {
    return [=](auto x, int32_t n) {
        return qx::ApplyWindowBySelector(x, n, selector, param, scaled, symmetric);
    };
}

} // namespace

ErrorCode KaiserH(DBL1D x, double beta) { return ApplyReal(x, Kaiser(beta)); }
ErrorCode CxKaiserH(CDB1D x, double beta) { return ApplyComplex(x, Kaiser(beta)); }

ErrorCode DolChebyWinH(DBL1D x, double ratio, int32_t symmetric) {
    return ApplyReal(x, DolChebyWin(ratio, symmetric));
}
ErrorCode CxDolChebyWinH(CDB1D x, double ratio, int32_t symmetric) {
    return ApplyComplex(x, DolChebyWin(ratio, symmetric));
}

ErrorCode GaussWinH(DBL1D x, double sigma, int32_t symmetric) {
    return ApplyReal(x, GaussWin(sigma, symmetric));
}
ErrorCode CxGaussWinH(CDB1D x, double sigma, int32_t symmetric) {
    return ApplyComplex(x, GaussWin(sigma, symmetric));
}

ErrorCode ForceWinH(DBL1D x, double percent) { return ApplyReal(x, ForceWin(percent)); }
ErrorCode CxForceWinH(CDB1D x, double percent) { return ApplyComplex(x, ForceWin(percent)); }

ErrorCode ExpWinH(DBL1D x, double finalValue) { return ApplyReal(x, ExpWin(finalValue)); }
ErrorCode CxExpWinH(CDB1D x, double finalValue) { return ApplyComplex(x, ExpWin(finalValue)); }

ErrorCode CosTaperedH(DBL1D x, double taperRatio) { return ApplyReal(x, CosTapered(taperRatio)); }
ErrorCode CxCosTaperedH(CDB1D x, double taperRatio) {
    return ApplyComplex(x, CosTapered(taperRatio));
}

ErrorCode TriangleWinH(DBL1D x) { return ApplyReal(x, TriangleWin()); }
ErrorCode CxTriangleWinH(CDB1D x) { return ApplyComplex(x, TriangleWin()); }

ErrorCode WelchWinH(DBL1D x) { return ApplyReal(x, WelchWin()); }
ErrorCode CxWelchWinH(CDB1D x) { return ApplyComplex(x, WelchWin()); }

ErrorCode BartHannWinH(DBL1D x) { return ApplyReal(x, BartHannWin()); }
ErrorCode CxBartHannWinH(CDB1D x) { return ApplyComplex(x, BartHannWin()); }

ErrorCode BohmanWinH(DBL1D x) { return ApplyReal(x, BohmanWin()); }
ErrorCode CxBohmanWinH(CDB1D x) { return ApplyComplex(x, BohmanWin()); }

ErrorCode ParzenWinH(DBL1D x) { return ApplyReal(x, ParzenWin()); }
ErrorCode CxParzenWinH(CDB1D x) { return ApplyComplex(x, ParzenWin()); }

ErrorCode GenCosWinH(DBL1D x, DBL1D coefs) { return ApplyReal(x, GenCosWin(coefs)); }
ErrorCode CxGenCosWinH(CDB1D x, DBL1D coefs) { return ApplyComplex(x, GenCosWin(coefs)); }

ErrorCode ScaledGenCosWinH(DBL1D x, DBL1D coefs) { return ApplyReal(x, ScaledGenCosWin(coefs)); }
ErrorCode ScaledCxGenCosWinH(CDB1D x, DBL1D coefs) {
    return ApplyComplex(x, ScaledGenCosWin(coefs));
}

ErrorCode AllCosWinH(DBL1D x, int32_t selector, int32_t scaled) {
    return ApplyReal(x, AllCosWin(selector, scaled));
}
ErrorCode CxAllCosWinH(CDB1D x, int32_t selector, int32_t scaled) {
    return ApplyComplex(x, AllCosWin(selector, scaled));
}

ErrorCode SymmWinH(DBL1D x, int32_t selector, double param) {
    return ApplyReal(x, SymmWin(selector, param));
}
ErrorCode CxSymmWinH(CDB1D x, int32_t selector, double param) {
    return ApplyComplex(x, SymmWin(selector, param));
}

ErrorCode ScaledWinH(DBL1D x, int32_t selector, double param, WindowConstants *constants) {
    return ApplyReal(x, ScaledWin(selector, param, constants));
}
ErrorCode CxScaledWinH(CDB1D x, int32_t selector, double param, WindowConstants *constants) {
    return ApplyComplex(x, ScaledWin(selector, param, constants));
}

ErrorCode AllWinH(DBL1D x, int32_t selector, double param, int32_t scaled, int32_t symmetric) {
    return ApplyReal(x, AllWin(selector, param, scaled, symmetric));
}
ErrorCode CxAllWinH(CDB1D x, int32_t selector, double param, int32_t scaled, int32_t symmetric) {
    return ApplyComplex(x, AllWin(selector, param, scaled, symmetric));
}

// The oldest: the code travels in *err.

int32_t Kaiser_Bessel(DBL1D x, const DBL *beta, ErrorCode *err) {
    return qx::Report(err, KaiserH(x, *beta));
}
int32_t ForceWindCIN(DBL1D x, const DBL *percent, ErrorCode *err) {
    return qx::Report(err, ForceWinH(x, *percent));
}
int32_t ExpWindCIN(DBL1D x, const DBL *finalValue, ErrorCode *err) {
    return qx::Report(err, ExpWinH(x, *finalValue));
}
int32_t TriangleWin(DBL1D x, ErrorCode *err) { return qx::Report(err, TriangleWinH(x)); }
int32_t CosTapered(DBL1D x, ErrorCode *err) { return qx::Report(err, CosTaperedH(x, 0.2)); }
