#include "filters/iir_design.h"

#include "frame/export.h"
#include "qx/iir_design.h"

namespace qx {
namespace {

// What all exports are given by reference.
struct Arguments {
    FilterBand band;
    int32_t order, type;

    Arguments(const double *fs, const double *fl, const double *fh, const int32_t *n,
              const int32_t *filterType)
        : band{*fs, *fl, *fh}, order(*n), type(*filterType) {
        // An upper edge that passes the checks of a band wherever the cut-off does.
        if (type == Lowpass || type == Highpass)
            band.fh = (band.fs * 0.5 + band.fl) * 0.5;
    }
};

ErrorCode CheckBand(const Arguments &arguments) {
    const auto &[fs, fl, fh] = arguments.band;
    const bool isRising = !(fl >= fh); // NaN passes
    return FirstFailed({{arguments.order < 1, ErrOrderNotPositive},
                        {fl <= 0.0 || fh <= 0.0 || !isRising || fs <= 0.0, ErrBadCutoff}});
}

bool IsAboveNyquist(const FilterBand &band) {
    const double nyquist = band.fs * 0.5;
    return band.fh > nyquist || band.fl > nyquist;
}

bool HasBadSelector(const Arguments &arguments, int32_t form) {
    return arguments.type < Lowpass || arguments.type > Bandstop || SectionOrder(form) == 0;
}

// The checks come when the outputs have their sizes: check() those of the design, then that of the
// selectors. `design` takes the band and the request.
template <class Check, class Design>
Outcome DesignInto(const Arguments &arguments, int32_t form, const Check &check,
                   const Design &design, Out<DBL1D> &a, Out<DBL1D> &b) {
    const CascadeSizes sizes = SizesOfCascade(arguments.type, arguments.order, form);
    if (sizes.a < 1)
        return ErrOrderNotPositive;
    if (const Outcome bad = a.resize(sizes.a))
        return bad;
    if (const Outcome bad = b.resize(sizes.b))
        return bad;
    if (const ErrorCode failed = CheckBand(arguments))
        return failed;
    if (const ErrorCode failed = check(IsAboveNyquist(arguments.band)))
        return failed;
    if (HasBadSelector(arguments, form))
        return ErrInvalidSelector;
    return design(arguments.band,
                  IIRDesignRequest{arguments.type, arguments.order, a.view(), b.view(), form});
}

ErrorCode CheckNyquist(bool isAbove) { return isAbove ? ErrAboveNyquist : 0; }

Outcome Butterworth(Arguments arguments, int32_t form, Out<DBL1D> a, Out<DBL1D> b) {
    return DesignInto(arguments, form, CheckNyquist, DesignButterworth, a, b);
}

Outcome Bessel(Arguments arguments, int32_t form, Out<DBL1D> a, Out<DBL1D> b) {
    return DesignInto(arguments, form, CheckNyquist, DesignBessel, a, b);
}

Outcome Chebyshev(Arguments arguments, double ripple, int32_t form, Out<DBL1D> a, Out<DBL1D> b) {
    const auto check = [=](bool isAbove) {
        return FirstFailed({{isAbove, ErrAboveNyquist}, {ripple <= 0.0, ErrRippleNotPositive}});
    };
    const auto design = [=](const FilterBand &band, const IIRDesignRequest &request) {
        return DesignChebyshev(band, ripple, request);
    };
    return DesignInto(arguments, form, check, design, a, b);
}

// kept: unlike in the elliptic design, the attenuation comes before the Nyquist frequency.
Outcome InvChebyshev(Arguments arguments, double attenuation, int32_t form, Out<DBL1D> a,
                     Out<DBL1D> b) {
    const auto check = [=](bool isAbove) {
        return FirstFailed(
            {{attenuation <= 0.0, ErrAttenuationNotPositive}, {isAbove, ErrAboveNyquist}});
    };
    const auto design = [=](const FilterBand &band, const IIRDesignRequest &request) {
        return DesignInvChebyshev(band, attenuation, request);
    };
    return DesignInto(arguments, form, check, design, a, b);
}

Outcome Elliptic(Arguments arguments, double ripple, double attenuation, int32_t form, Out<DBL1D> a,
                 Out<DBL1D> b) {
    const auto check = [=](bool isAbove) {
        return FirstFailed({{isAbove, ErrAboveNyquist},
                            {ripple <= 0.0, ErrRippleNotPositive},
                            {attenuation <= 0.0, ErrAttenuationNotPositive},
                            {ripple >= attenuation, ErrRippleAboveAttenuation}});
    };
    const auto design = [=](const FilterBand &band, const IIRDesignRequest &request) {
        return DesignElliptic(band, ripple, attenuation, request);
    };
    return DesignInto(arguments, form, check, design, a, b);
}

} // namespace
} // namespace qx

using qx::Arguments;
using qx::InErrWithHost;
using qx::NativeForm;

int32_t BWCoefs(const double *fs, const double *fl, const double *fh, const int32_t *order,
                const int32_t *type, DBL1D a, DBL1D b, ErrorCode *err) {
    return InErrWithHost(err, qx::Butterworth, Arguments(fs, fl, fh, order, type),
                         NativeForm(*type), a, b);
}

int32_t BesselCoefs(const double *fs, const double *fl, const double *fh, const int32_t *order,
                    const int32_t *type, DBL1D a, DBL1D b, ErrorCode *err) {
    return InErrWithHost(err, qx::Bessel, Arguments(fs, fl, fh, order, type), NativeForm(*type), a,
                         b);
}

int32_t ChebyshevCoefs(const double *fs, const double *fl, const double *fh, const double *ripple,
                       const int32_t *order, const int32_t *type, DBL1D a, DBL1D b,
                       ErrorCode *err) {
    return InErrWithHost(err, qx::Chebyshev, Arguments(fs, fl, fh, order, type), *ripple,
                         NativeForm(*type), a, b);
}

int32_t InvChebyshevCoefs(const double *fs, const double *fl, const double *fh,
                          const double *attenuation, const int32_t *order, const int32_t *type,
                          DBL1D a, DBL1D b, ErrorCode *err) {
    return InErrWithHost(err, qx::InvChebyshev, Arguments(fs, fl, fh, order, type), *attenuation,
                         NativeForm(*type), a, b);
}

int32_t EllipticCoefs(const double *fs, const double *fl, const double *fh, const double *ripple,
                      const double *attenuation, const int32_t *order, const int32_t *type, DBL1D a,
                      DBL1D b, ErrorCode *err) {
    return InErrWithHost(err, qx::Elliptic, Arguments(fs, fl, fh, order, type), *ripple,
                         *attenuation, NativeForm(*type), a, b);
}

int32_t BWCoefs90(const double *fs, const double *fl, const double *fh, const int32_t *order,
                  const int32_t *type, int32_t form, DBL1D a, DBL1D b, ErrorCode *err) {
    return InErrWithHost(err, qx::Butterworth, Arguments(fs, fl, fh, order, type), form, a, b);
}

int32_t BesselCoefs90(const double *fs, const double *fl, const double *fh, const int32_t *order,
                      const int32_t *type, int32_t form, DBL1D a, DBL1D b, ErrorCode *err) {
    return InErrWithHost(err, qx::Bessel, Arguments(fs, fl, fh, order, type), form, a, b);
}

int32_t ChebyshevCoefs90(const double *fs, const double *fl, const double *fh, const double *ripple,
                         const int32_t *order, const int32_t *type, int32_t form, DBL1D a, DBL1D b,
                         ErrorCode *err) {
    return InErrWithHost(err, qx::Chebyshev, Arguments(fs, fl, fh, order, type), *ripple, form, a,
                         b);
}

int32_t InvChebyshevCoefs90(const double *fs, const double *fl, const double *fh,
                            const double *attenuation, const int32_t *order, const int32_t *type,
                            int32_t form, DBL1D a, DBL1D b, ErrorCode *err) {
    return InErrWithHost(err, qx::InvChebyshev, Arguments(fs, fl, fh, order, type), *attenuation,
                         form, a, b);
}

int32_t EllipticCoefs90(const double *fs, const double *fl, const double *fh, const double *ripple,
                        const double *attenuation, const int32_t *order, const int32_t *type,
                        int32_t form, DBL1D a, DBL1D b, ErrorCode *err) {
    return InErrWithHost(err, qx::Elliptic, Arguments(fs, fl, fh, order, type), *ripple,
                         *attenuation, form, a, b);
}
