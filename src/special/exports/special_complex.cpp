#include "qx/special_complex.h"

#include "frame/export.h"
#include "special/bessel_complex.h"

namespace qx {
namespace {

Outcome Told(const ComplexValue &found, OutCDB result) {
    result = found.value;
    switch (found.status) {
    case BesselStatus::Good:
        return 0;
    case BesselStatus::Singular:
        return ErrBesselStatusOne;
    case BesselStatus::Overflow:
        return ErrOverflow;
    case BesselStatus::HalfLost:
        return WarnLowAccuracy;
    case BesselStatus::AllLost:
        return ErrBesselStatusFour;
    }
    return ErrInternal;
}

template <BesselKind Kind>
Outcome Bessel(double order, const CDB *z, int32_t scaled, OutCDB result) {
    return Told(ComplexBessel(Kind, order, *z, scaled != 0), result);
}

template <AiryKind Kind>
Outcome Airy(const CDB *z, int32_t scaled, OutCDB result) {
    return Told(ComplexAiry(Kind, *z, scaled != 0), result);
}

} // namespace
} // namespace qx

using qx::AiryKind;
using qx::BesselKind;
using qx::Returned;

ErrorCode QX_CxBesselJr(double order, const CDB *z, int32_t scaled, CDB *result) {
    return Returned(qx::Bessel<BesselKind::J>, order, z, scaled, result);
}
ErrorCode QX_CxBesselYr(double order, const CDB *z, int32_t scaled, CDB *result) {
    return Returned(qx::Bessel<BesselKind::Y>, order, z, scaled, result);
}
ErrorCode QX_CxBesselIr(double order, const CDB *z, int32_t scaled, CDB *result) {
    return Returned(qx::Bessel<BesselKind::I>, order, z, scaled, result);
}
ErrorCode QX_CxBesselKr(double order, const CDB *z, int32_t scaled, CDB *result) {
    return Returned(qx::Bessel<BesselKind::K>, order, z, scaled, result);
}
ErrorCode QX_CxBesselH1r(double order, const CDB *z, int32_t scaled, CDB *result) {
    return Returned(qx::Bessel<BesselKind::H1>, order, z, scaled, result);
}
ErrorCode QX_CxBesselH2r(double order, const CDB *z, int32_t scaled, CDB *result) {
    return Returned(qx::Bessel<BesselKind::H2>, order, z, scaled, result);
}

ErrorCode QX_CxAiryAi(const CDB *z, int32_t scaled, CDB *result) {
    return Returned(qx::Airy<AiryKind::Ai>, z, scaled, result);
}
ErrorCode QX_CxAiryAiP(const CDB *z, int32_t scaled, CDB *result) {
    return Returned(qx::Airy<AiryKind::AiDerivative>, z, scaled, result);
}
ErrorCode QX_CxAiryBi(const CDB *z, int32_t scaled, CDB *result) {
    return Returned(qx::Airy<AiryKind::Bi>, z, scaled, result);
}
ErrorCode QX_CxAiryBiP(const CDB *z, int32_t scaled, CDB *result) {
    return Returned(qx::Airy<AiryKind::BiDerivative>, z, scaled, result);
}
