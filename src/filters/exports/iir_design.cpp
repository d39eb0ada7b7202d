#include "filters/iir_design.h"

#include "filters/pole_zero_prototypes.h"
#include "frame/export.h"
#include "qx/iir_design.h"

#include <cmath>

namespace qx {
namespace {

// The arguments that all exports take by reference.
struct Arguments {
    FilterBand band;
    int32_t order, type;

    Arguments(const double *fs, const double *fl, const double *fh, const int32_t *n,
              const int32_t *filterType)
        : band{*fs, *fl, *fh}, order(*n), type(*filterType) {
        // An upper edge that passes the checks of a band whenever the cut-off does.
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

// The checks run after the outputs have been resized: check() runs those of the design, then the
// selectors are checked. `design` receives the band and the request.
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

// kept: unlike in the elliptic design, the attenuation is checked before the Nyquist frequency.
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

// The outputs of the designs with poles and zeros.
struct Places {
    Out<DBL1D> &a, &b;
    Out<CDB1D> &zeros, &poles;
    OutDBL &gain;
};

ErrorCode CheckDesign(const FilterBand &band, int32_t order, int32_t type) {
    constexpr int32_t highestOrder = 500;
    const auto &[fs, fl, fh] = band;
    const bool isBand = type == Bandpass || type == Bandstop;
    const bool hasRate = fs > 0.0 && std::isfinite(fs);
    const bool hasEdges = isBand ? fl > 0.0 && fh > fl : fl > 0.0;
    return FirstFailed({{order < 1, ErrOrderNotPositive},
                        {order > highestOrder, ErrLengthTooLarge},
                        {type < Lowpass || type > Bandstop, ErrInvalidSelector},
                        {!hasRate || !hasEdges, ErrBadCutoff},
                        {!((isBand ? fh : fl) < fs * 0.5), ErrAboveNyquist}});
}

// `fill` adds the poles and zeros to the sections.
template <class Fill>
Outcome DesignByPoles(const FilterBand &band, int32_t order, int32_t type, double gainAt0,
                      const Fill &fill, const Places &places) {
    const int32_t sections = SectionsOf(type, order), poles = PolesOf(type, order);
    if (const Outcome bad = places.a.resize(2 * sections))
        return bad;
    if (const Outcome bad = places.b.resize(3 * sections))
        return bad;
    if (const Outcome bad = places.zeros.resize(poles))
        return bad;
    if (const Outcome bad = places.poles.resize(poles))
        return bad;
    PoleZeroSections filled(
        type, band, gainAt0,
        {places.a.view(), places.b.view(), places.zeros.view(), places.poles.view()});
    if (const ErrorCode failed = fill(filled))
        return failed;
    for (const DBL &value : places.b.view())
        if (!std::isfinite(value))
            return ErrDegenerateValue;
    places.gain = filled.gain();
    return std::isfinite(filled.gain()) ? 0 : ErrDegenerateValue;
}

Outcome ButterworthByPoles(FilterBand band, int32_t order, int32_t type, Out<DBL1D> a, Out<DBL1D> b,
                           Out<CDB1D> zeros, Out<CDB1D> poles, OutDBL gain) {
    if (const ErrorCode bad = CheckDesign(band, order, type))
        return bad;
    const auto fill = [=](PoleZeroSections &sections) -> ErrorCode {
        ButterworthPoles(order, sections);
        return 0;
    };
    return DesignByPoles(band, order, type, 1.0, fill, {a, b, zeros, poles, gain});
}

Outcome BesselByPoles(FilterBand band, int32_t order, int32_t type, Out<DBL1D> a, Out<DBL1D> b,
                      Out<CDB1D> zeros, Out<CDB1D> poles, OutDBL gain) {
    if (const ErrorCode bad = CheckDesign(band, order, type))
        return bad;
    const auto fill = [=](PoleZeroSections &sections) { return BesselPoles(order, sections); };
    return DesignByPoles(band, order, type, 1.0, fill, {a, b, zeros, poles, gain});
}

Outcome ChebyshevByPoles(FilterBand band, double ripple, int32_t order, int32_t type, Out<DBL1D> a,
                         Out<DBL1D> b, Out<CDB1D> zeros, Out<CDB1D> poles, OutDBL gain) {
    if (const ErrorCode bad = CheckDesign(band, order, type))
        return bad;
    if (!(ripple > 0.0))
        return ErrRippleNotPositive;
    const auto fill = [=](PoleZeroSections &sections) -> ErrorCode {
        ChebyshevPoles(order, ripple, sections);
        return 0;
    };
    return DesignByPoles(band, order, type, GainAt0(order, ripple), fill,
                         {a, b, zeros, poles, gain});
}

Outcome InvChebyshevByPoles(FilterBand band, double attenuation, int32_t order, int32_t type,
                            Out<DBL1D> a, Out<DBL1D> b, Out<CDB1D> zeros, Out<CDB1D> poles,
                            OutDBL gain) {
    if (const ErrorCode bad = CheckDesign(band, order, type))
        return bad;
    if (!(attenuation > 0.0))
        return ErrAttenuationNotPositive;
    const auto fill = [=](PoleZeroSections &sections) -> ErrorCode {
        InvChebyshevPoles(order, attenuation, sections);
        return 0;
    };
    return DesignByPoles(band, order, type, 1.0, fill, {a, b, zeros, poles, gain});
}

Outcome EllipticByPoles(FilterBand band, double ripple, double attenuation, int32_t order,
                        int32_t type, Out<DBL1D> a, Out<DBL1D> b, Out<CDB1D> zeros,
                        Out<CDB1D> poles, OutDBL gain) {
    if (const ErrorCode bad = CheckDesign(band, order, type))
        return bad;
    if (const ErrorCode bad = FirstFailed({{!(ripple > 0.0), ErrRippleNotPositive},
                                           {!(attenuation > 0.0), ErrAttenuationNotPositive},
                                           {ripple >= attenuation, ErrRippleAboveAttenuation}}))
        return bad;
    const auto fill = [=](PoleZeroSections &sections) -> ErrorCode {
        EllipticPoles(order, ripple, attenuation, sections);
        return 0;
    };
    return DesignByPoles(band, order, type, GainAt0(order, ripple), fill,
                         {a, b, zeros, poles, gain});
}

} // namespace
} // namespace qx

using qx::Arguments;
using qx::FilterBand;
using qx::InErrWithHost;
using qx::NativeForm;
using qx::Returned;

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

ErrorCode BWCoefs2026(double fs, double fl, double fh, int32_t order, int32_t type, DBL1D a,
                      DBL1D b, CDB1D zeros, CDB1D poles, double *gain) {
    return Returned(qx::ButterworthByPoles, FilterBand{fs, fl, fh}, order, type, a, b, zeros, poles,
                    gain);
}

ErrorCode ChebyshevCoefs2026(double fs, double fl, double fh, double ripple, int32_t order,
                             int32_t type, DBL1D a, DBL1D b, CDB1D zeros, CDB1D poles,
                             double *gain) {
    return Returned(qx::ChebyshevByPoles, FilterBand{fs, fl, fh}, ripple, order, type, a, b, zeros,
                    poles, gain);
}

ErrorCode InvChebyshevCoefs2026(double fs, double fl, double fh, double attenuation, int32_t order,
                                int32_t type, DBL1D a, DBL1D b, CDB1D zeros, CDB1D poles,
                                double *gain) {
    return Returned(qx::InvChebyshevByPoles, FilterBand{fs, fl, fh}, attenuation, order, type, a, b,
                    zeros, poles, gain);
}

ErrorCode EllipticCoefs2026(double fs, double fl, double fh, double ripple, double attenuation,
                            int32_t order, int32_t type, DBL1D a, DBL1D b, CDB1D zeros, CDB1D poles,
                            double *gain) {
    return Returned(qx::EllipticByPoles, FilterBand{fs, fl, fh}, ripple, attenuation, order, type,
                    a, b, zeros, poles, gain);
}

ErrorCode BesselCoefs2026(double fs, double fl, double fh, int32_t order, int32_t type, DBL1D a,
                          DBL1D b, CDB1D zeros, CDB1D poles, double *gain) {
    return Returned(qx::BesselByPoles, FilterBand{fs, fl, fh}, order, type, a, b, zeros, poles,
                    gain);
}
