#include "filters/iir_design.h"

#include "filters/analog_prototypes.h"
#include "filters/section_forms.h"
#include "frame/scratch.h"

#include <initializer_list>
#include <limits>

namespace qx {

namespace {

ErrorCode FirstOf(std::initializer_list<ErrorCode> codes) {
    for (const ErrorCode code : codes)
        if (code != 0)
            return code;
    return 0;
}

bool IsBand(int32_t type) { return type == Bandpass || type == Bandstop; }

ErrorCode CheckOrderAndBand(const FilterBand &band, const IIRDesignRequest &request) {
    if (request.order < 1)
        return ErrOrderNotPositive;
    const bool isRising = !(band.fl >= band.fh); // NaN passes
    return band.fl <= 0.0 || band.fh <= 0.0 || !isRising || band.fs <= 0.0 ? ErrBadCutoff : 0;
}

ErrorCode CheckNyquist(const FilterBand &band) {
    const double nyquist = band.fs * 0.5;
    return band.fh > nyquist || band.fl > nyquist ? ErrAboveNyquist : 0;
}

ErrorCode CheckShape(const IIRDesignRequest &request) {
    const CascadeSizes sizes = SizesOfCascade(request.type, request.order, request.form);
    if (request.type < Lowpass || request.type > Bandstop || SectionOrder(request.form) == 0)
        return ErrInvalidSelector;
    const bool fits = sizes.a > 0 && request.aCount >= sizes.a && request.bCount >= sizes.b;
    return fits ? 0 : ErrCoefficientSizes;
}

// Runs the prototype into the request's arrays, through the native form where another is wanted.
template <class Prototype>
ErrorCode Design(const FilterBand &band, const IIRDesignRequest &request,
                 const Prototype &prototype) {
    const int32_t native = NativeForm(request.type);
    if (request.form == native) {
        DigitalSections sections(request.type, band, request.a, request.b);
        return prototype(sections);
    }
    const CascadeSizes sizes = SizesOfCascade(request.type, request.order, native);
    Scratch<ElementType::DBL> a, b;
    if (a.allocate(sizes.a) != 0 || b.allocate(sizes.b) != 0)
        return ErrOutOfMemory;
    DigitalSections sections(request.type, band, a.data(), b.data());
    if (const ErrorCode failed = prototype(sections))
        return failed;
    const auto convert = native == SecondOrderSections ? SecondToFourthOrder : FourthToSecondOrder;
    return convert({a.data(), sizes.a, b.data(), sizes.b, native},
                   {request.a, request.aCount, request.b, request.bCount});
}

GainIn RippleGain(int32_t type) {
    return IsBand(type) ? GainIn::LastSection : GainIn::FirstSection;
}

} // namespace

CascadeSizes SizesOfCascade(int32_t type, int32_t order, int32_t form) {
    const int64_t pairs = (int64_t{order} + 1) >> 1;
    const int64_t sections = form == FourthOrderSections && !IsBand(type)  ? (pairs + 1) >> 1
                             : form != FourthOrderSections && IsBand(type) ? 2 * pairs
                                                                           : pairs;
    const int64_t a = (form == FourthOrderSections ? 4 : 2) * sections;
    const int64_t b = a + sections;
    if (order < 1 || b > std::numeric_limits<int32_t>::max())
        return {0, 0};
    return {static_cast<int32_t>(a), static_cast<int32_t>(b)};
}

ErrorCode DesignButterworth(const FilterBand &band, const IIRDesignRequest &request) {
    if (const ErrorCode failed =
            FirstOf({CheckOrderAndBand(band, request), CheckNyquist(band), CheckShape(request)}))
        return failed;
    return Design(band, request, [&](DigitalSections &sections) -> ErrorCode {
        ButterworthPrototype(request.order, sections);
        return 0;
    });
}

ErrorCode DesignChebyshev(const FilterBand &band, double ripple, const IIRDesignRequest &request) {
    if (const ErrorCode failed =
            FirstOf({CheckOrderAndBand(band, request), CheckNyquist(band),
                     ripple <= 0.0 ? ErrRippleNotPositive : 0, CheckShape(request)}))
        return failed;
    return Design(band, request, [&](DigitalSections &sections) -> ErrorCode {
        ChebyshevPrototype(request.order, ripple, RippleGain(request.type), sections);
        return 0;
    });
}

ErrorCode DesignInvChebyshev(const FilterBand &band, double attenuation,
                             const IIRDesignRequest &request) {
    // kept: unlike in the elliptic design, the attenuation comes before the Nyquist frequency.
    if (const ErrorCode failed = FirstOf({CheckOrderAndBand(band, request),
                                          attenuation <= 0.0 ? ErrAttenuationNotPositive : 0,
                                          CheckNyquist(band), CheckShape(request)}))
        return failed;
    return Design(band, request, [&](DigitalSections &sections) -> ErrorCode {
        InvChebyshevPrototype(request.order, attenuation, sections);
        return 0;
    });
}

ErrorCode DesignElliptic(const FilterBand &band, double ripple, double attenuation,
                         const IIRDesignRequest &request) {
    if (const ErrorCode failed =
            FirstOf({CheckOrderAndBand(band, request), CheckNyquist(band),
                     ripple <= 0.0 ? ErrRippleNotPositive : 0,
                     attenuation <= 0.0 ? ErrAttenuationNotPositive : 0,
                     ripple >= attenuation ? ErrRippleAboveAttenuation : 0, CheckShape(request)}))
        return failed;
    return Design(band, request, [&](DigitalSections &sections) -> ErrorCode {
        EllipticPrototype(request.order, ripple, attenuation, sections);
        return 0;
    });
}

ErrorCode DesignBessel(const FilterBand &band, const IIRDesignRequest &request) {
    if (const ErrorCode failed =
            FirstOf({CheckOrderAndBand(band, request), CheckNyquist(band), CheckShape(request)}))
        return failed;
    return Design(band, request, [&](DigitalSections &sections) {
        return BesselPrototype(request.order, sections);
    });
}

} // namespace qx
