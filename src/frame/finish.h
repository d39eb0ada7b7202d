#ifndef QX_FRAME_FINISH_H
#define QX_FRAME_FINISH_H

#include "frame/outcome.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>
#include <cstring>

namespace qx {

// The end of a frame: a failure empties every output, in argument order, also those that were
// not reached; success and warnings leave them.
template <class... Outputs>
ErrorCode Finish(ErrorCode status, const Outputs &...outputs) {
    if (status < 0)
        (outputs.empty(), ...);
    return status;
}

// The end of a transform frame, whose status may be the host's own: anything but 0 empties.
template <class... Outputs>
ErrorCode FinishTransform(int32_t status, const Outputs &...outputs) {
    if (status != 0)
        (outputs.empty(), ...);
    return status;
}

// The NaN of a failed scalar output, to the bit.
inline void SetQuietNaN(DBL *value) {
    constexpr uint64_t bits = 0x7FF8000000000000;
    std::memcpy(value, &bits, sizeof bits);
}

// The end of a frame with an error out-parameter: the status is written, a failure turns the
// scalar outputs into NaN, and the function result is 0 whatever happened.
template <class... Scalars>
int32_t Report(ErrorCode *err, ErrorCode status, Scalars *...scalars) {
    *err = status;
    if (status < 0)
        (SetQuietNaN(scalars), ...);
    return 0;
}

} // namespace qx

#endif
