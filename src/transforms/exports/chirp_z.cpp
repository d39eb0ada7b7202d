#include "transforms/chirp_z.h"

#include "frame/export.h"
#include "qx/chirp_z.h"

namespace qx {
namespace {

template <class Input>
Outcome Forward(In<Input> in, CDB a, CDB w, int32_t count, uint32_t method, Out<CDB1D> out) {
    if (const ErrorCode failed =
            FirstFailed({{in.isEmpty(), ErrEmptyInput}, {method > Bluestein, ErrInvalidSelector}}))
        return failed;
    const int32_t points = count < 1 ? in.size() : count;
    if (const Outcome bad = out.resize(points))
        return bad;
    return ChirpZ(in.view(), a, w, static_cast<ChirpMethod>(method), out.view());
}

Outcome Inverse(In<CDB1D> in, CDB a, CDB w, int32_t count, Out<CDB1D> out) {
    const int32_t points = count < 1 ? in.size() : count;
    if (const ErrorCode failed =
            FirstFailed({{in.isEmpty(), ErrEmptyInput}, {points > in.size(), ErrSizesDisagree}}))
        return failed;
    if (const Outcome bad = out.resize(points))
        return bad;
    return InverseChirpZ(in.view(), a, w, out.view());
}

} // namespace
} // namespace qx

using qx::Returned;

ErrorCode ChirpZT_head(DBL1D in, const CDB *a, const CDB *w, int32_t count, uint32_t method,
                       CDB1D out) {
    return Returned(qx::Forward<DBL1D>, in, *a, *w, count, method, out);
}

ErrorCode CxChirpZT_head(CDB1D in, const CDB *a, const CDB *w, int32_t count, uint32_t method,
                         CDB1D out) {
    return Returned(qx::Forward<CDB1D>, in, *a, *w, count, method, out);
}

ErrorCode InvChirpZT_head(CDB1D in, const CDB *a, const CDB *w, int32_t count, CDB1D out) {
    return Returned(qx::Inverse, in, *a, *w, count, out);
}
