#include "filters/iir_design.h"

#include "filters/analog_prototypes.h"
#include "filters/section_forms.h"
#include "frame/scratch.h"

#include <limits>

namespace qx {

namespace {

bool IsBand(int32_t type) { return type == Bandpass || type == Bandstop; }

[[maybe_unused]] bool HasRoom(const IIRDesignRequest &request) {
    const CascadeSizes sizes = SizesOfCascade(request.type, request.order, request.form);
    return sizes.a > 0 && request.a.size() >= sizes.a && request.b.size() >= sizes.b;
}

// Runs the prototype into the request's arrays, converting from the native form if another form is
// requested.
template <class Prototype>
ErrorCode Design(const FilterBand &band, const IIRDesignRequest &request,
                 const Prototype &prototype) {
    QX_EXPECTS(HasRoom(request));
    const int32_t native = NativeForm(request.type);
    if (request.form == native) {
        DigitalSections sections(request.type, band, request.a.data(), request.b.data());
        return prototype(sections);
    }
    const CascadeSizes sizes = SizesOfCascade(request.type, request.order, native);
    RealVector a, b;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(a, sizes.a), Sized(b, sizes.b)))
        return failed;
    DigitalSections sections(request.type, band, a.data(), b.data());
    if (const ErrorCode failed = prototype(sections))
        return failed;
    const auto convert = native == SecondOrderSections ? SecondToFourthOrder : FourthToSecondOrder;
    return convert({a, b, native}, {request.a, request.b});
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
    return Design(band, request, [&](DigitalSections &sections) -> ErrorCode {
        ButterworthPrototype(request.order, sections);
        return 0;
    });
}

ErrorCode DesignChebyshev(const FilterBand &band, double ripple, const IIRDesignRequest &request) {
    return Design(band, request, [&](DigitalSections &sections) -> ErrorCode {
        ChebyshevPrototype(request.order, ripple, RippleGain(request.type), sections);
        return 0;
    });
}

ErrorCode DesignInvChebyshev(const FilterBand &band, double attenuation,
                             const IIRDesignRequest &request) {
    return Design(band, request, [&](DigitalSections &sections) -> ErrorCode {
        InvChebyshevPrototype(request.order, attenuation, sections);
        return 0;
    });
}

ErrorCode DesignElliptic(const FilterBand &band, double ripple, double attenuation,
                         const IIRDesignRequest &request) {
    return Design(band, request, [&](DigitalSections &sections) -> ErrorCode {
        EllipticPrototype(request.order, ripple, attenuation, sections);
        return 0;
    });
}

ErrorCode DesignBessel(const FilterBand &band, const IIRDesignRequest &request) {
    return Design(band, request, [&](DigitalSections &sections) {
        return BesselPrototype(request.order, sections);
    });
}

} // namespace qx
