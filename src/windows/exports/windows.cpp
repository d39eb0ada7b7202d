#include "qx/windows.h"

#include "frame/export.h"
#include "windows/constants.h"
#include "windows/dolph_chebyshev.h"
#include "windows/selection.h"
#include "windows/tapers.h"

namespace qx {
namespace {

// Each export applies the inner routine of its window to the caller's array; the real and the
// complex export are one template over the type of sample.

template <class Handle>
ErrorCode Kaiser(InOut<Handle> x, double beta) {
    return ApplyKaiserWindow(x.view(), beta);
}

template <class Handle>
ErrorCode DolphChebyshev(InOut<Handle> x, double ratio, int32_t symmetric) {
    return ApplyDolChebyWindow(x.view(), ratio, symmetric != 0);
}

template <class Handle>
ErrorCode Gaussian(InOut<Handle> x, double sigma, int32_t symmetric) {
    return ApplyGaussWindow(x.view(), sigma, symmetric != 0);
}

template <class Handle>
ErrorCode Force(InOut<Handle> x, double percent) {
    return ApplyForceWindow(x.view(), percent);
}

template <class Handle>
ErrorCode Exponential(InOut<Handle> x, double finalValue) {
    return ApplyExpWindow(x.view(), finalValue);
}

template <class Handle>
ErrorCode CosineTapered(InOut<Handle> x, double taperRatio) {
    return ApplyCosTaperedWindow(x.view(), taperRatio);
}

template <class Handle>
ErrorCode Triangle(InOut<Handle> x) {
    return ApplyTriangleWindow(x.view());
}

template <class Handle>
ErrorCode Welch(InOut<Handle> x) {
    return ApplyWelchWindow(x.view());
}

template <class Handle>
ErrorCode BartlettHanning(InOut<Handle> x) {
    return ApplyBartHannWindow(x.view());
}

template <class Handle>
ErrorCode Bohman(InOut<Handle> x) {
    return ApplyBohmanWindow(x.view());
}

template <class Handle>
ErrorCode Parzen(InOut<Handle> x) {
    return ApplyParzenWindow(x.view());
}

template <class Handle>
ErrorCode CosineSum(InOut<Handle> x, In<DBL1D> coefs) {
    return ApplyCosineSumWindow(x.view(), coefs.view(), false);
}

template <class Handle>
ErrorCode ScaledCosineSum(InOut<Handle> x, In<DBL1D> coefs) {
    return ApplyCosineSumWindow(x.view(), coefs.view(), true);
}

template <class Handle>
ErrorCode CosineBySelector(InOut<Handle> x, int32_t selector, int32_t scaled) {
    return ApplyCosineWindowBySelector(x.view(), selector, scaled != 0);
}

template <class Handle>
ErrorCode Symmetric(InOut<Handle> x, int32_t selector, double param) {
    return ApplySymmetricWindow(selector, x.view(), param);
}

// kept: a negative size leaves the constants unchanged; any other failure sets them to their values
// after a failure.
template <class Handle>
ErrorCode Scaled(InOut<Handle> x, int32_t selector, double param, WindowConstants *constants) {
    if (x.hasNegativeSize())
        return ErrNegativeDimension;
    const ErrorCode status = ApplyScaledWindow(x.view(), selector, param, constants);
    if (status < 0)
        OutValue<WindowConstants>(constants).settleFailure();
    return status;
}

template <class Handle>
ErrorCode BySelector(InOut<Handle> x, int32_t selector, double param, int32_t scaled,
                     int32_t symmetric) {
    // Only the scaled form distinguishes a negative size from an empty array.
    if (scaled != 0 && symmetric == 0 && x.hasNegativeSize())
        return ErrNegativeDimension;
    return ApplyWindowBySelector(x.view(), selector, param, scaled != 0, symmetric != 0);
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;

ErrorCode KaiserH(DBL1D x, double beta) { return Returned(qx::Kaiser<DBL1D>, x, beta); }
ErrorCode CxKaiserH(CDB1D x, double beta) { return Returned(qx::Kaiser<CDB1D>, x, beta); }

ErrorCode DolChebyWinH(DBL1D x, double ratio, int32_t symmetric) {
    return Returned(qx::DolphChebyshev<DBL1D>, x, ratio, symmetric);
}
ErrorCode CxDolChebyWinH(CDB1D x, double ratio, int32_t symmetric) {
    return Returned(qx::DolphChebyshev<CDB1D>, x, ratio, symmetric);
}

ErrorCode GaussWinH(DBL1D x, double sigma, int32_t symmetric) {
    return Returned(qx::Gaussian<DBL1D>, x, sigma, symmetric);
}
ErrorCode CxGaussWinH(CDB1D x, double sigma, int32_t symmetric) {
    return Returned(qx::Gaussian<CDB1D>, x, sigma, symmetric);
}

ErrorCode ForceWinH(DBL1D x, double percent) { return Returned(qx::Force<DBL1D>, x, percent); }
ErrorCode CxForceWinH(CDB1D x, double percent) { return Returned(qx::Force<CDB1D>, x, percent); }

ErrorCode ExpWinH(DBL1D x, double finalValue) {
    return Returned(qx::Exponential<DBL1D>, x, finalValue);
}
ErrorCode CxExpWinH(CDB1D x, double finalValue) {
    return Returned(qx::Exponential<CDB1D>, x, finalValue);
}

ErrorCode CosTaperedH(DBL1D x, double taperRatio) {
    return Returned(qx::CosineTapered<DBL1D>, x, taperRatio);
}
ErrorCode CxCosTaperedH(CDB1D x, double taperRatio) {
    return Returned(qx::CosineTapered<CDB1D>, x, taperRatio);
}

ErrorCode TriangleWinH(DBL1D x) { return Returned(qx::Triangle<DBL1D>, x); }
ErrorCode CxTriangleWinH(CDB1D x) { return Returned(qx::Triangle<CDB1D>, x); }

ErrorCode WelchWinH(DBL1D x) { return Returned(qx::Welch<DBL1D>, x); }
ErrorCode CxWelchWinH(CDB1D x) { return Returned(qx::Welch<CDB1D>, x); }

ErrorCode BartHannWinH(DBL1D x) { return Returned(qx::BartlettHanning<DBL1D>, x); }
ErrorCode CxBartHannWinH(CDB1D x) { return Returned(qx::BartlettHanning<CDB1D>, x); }

ErrorCode BohmanWinH(DBL1D x) { return Returned(qx::Bohman<DBL1D>, x); }
ErrorCode CxBohmanWinH(CDB1D x) { return Returned(qx::Bohman<CDB1D>, x); }

ErrorCode ParzenWinH(DBL1D x) { return Returned(qx::Parzen<DBL1D>, x); }
ErrorCode CxParzenWinH(CDB1D x) { return Returned(qx::Parzen<CDB1D>, x); }

ErrorCode GenCosWinH(DBL1D x, DBL1D coefs) { return Returned(qx::CosineSum<DBL1D>, x, coefs); }
ErrorCode CxGenCosWinH(CDB1D x, DBL1D coefs) { return Returned(qx::CosineSum<CDB1D>, x, coefs); }

ErrorCode ScaledGenCosWinH(DBL1D x, DBL1D coefs) {
    return Returned(qx::ScaledCosineSum<DBL1D>, x, coefs);
}
ErrorCode ScaledCxGenCosWinH(CDB1D x, DBL1D coefs) {
    return Returned(qx::ScaledCosineSum<CDB1D>, x, coefs);
}

ErrorCode AllCosWinH(DBL1D x, int32_t selector, int32_t scaled) {
    return Returned(qx::CosineBySelector<DBL1D>, x, selector, scaled);
}
ErrorCode CxAllCosWinH(CDB1D x, int32_t selector, int32_t scaled) {
    return Returned(qx::CosineBySelector<CDB1D>, x, selector, scaled);
}

ErrorCode SymmWinH(DBL1D x, int32_t selector, double param) {
    return Returned(qx::Symmetric<DBL1D>, x, selector, param);
}
ErrorCode CxSymmWinH(CDB1D x, int32_t selector, double param) {
    return Returned(qx::Symmetric<CDB1D>, x, selector, param);
}

ErrorCode ScaledWinH(DBL1D x, int32_t selector, double param, WindowConstants *constants) {
    return Returned(qx::Scaled<DBL1D>, x, selector, param, constants);
}
ErrorCode CxScaledWinH(CDB1D x, int32_t selector, double param, WindowConstants *constants) {
    return Returned(qx::Scaled<CDB1D>, x, selector, param, constants);
}

ErrorCode AllWinH(DBL1D x, int32_t selector, double param, int32_t scaled, int32_t symmetric) {
    return Returned(qx::BySelector<DBL1D>, x, selector, param, scaled, symmetric);
}
ErrorCode CxAllWinH(CDB1D x, int32_t selector, double param, int32_t scaled, int32_t symmetric) {
    return Returned(qx::BySelector<CDB1D>, x, selector, param, scaled, symmetric);
}

// The oldest exports, which return the code in *err.

int32_t Kaiser_Bessel(DBL1D x, const DBL *beta, ErrorCode *err) {
    return InErr(err, qx::Kaiser<DBL1D>, x, *beta);
}
int32_t ForceWindCIN(DBL1D x, const DBL *percent, ErrorCode *err) {
    return InErr(err, qx::Force<DBL1D>, x, *percent);
}
int32_t ExpWindCIN(DBL1D x, const DBL *finalValue, ErrorCode *err) {
    return InErr(err, qx::Exponential<DBL1D>, x, *finalValue);
}
int32_t TriangleWin(DBL1D x, ErrorCode *err) { return InErr(err, qx::Triangle<DBL1D>, x); }
int32_t CosTapered(DBL1D x, ErrorCode *err) { return InErr(err, qx::CosineTapered<DBL1D>, x, 0.2); }
