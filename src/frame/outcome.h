#ifndef QX_FRAME_OUTCOME_H
#define QX_FRAME_OUTCOME_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>
#include <initializer_list>

namespace qx {

// The result of an export's body: success, a code of the library, or the host's own status if the
// host refused a resize. The ending decides how it is returned to the caller (frame/export.h).
class [[nodiscard]] Outcome {
public:
    // 0, a failure or a warning. Implicit, so that a body may return the result of an inner
    // routine.
    Outcome(ErrorCode code = 0) : status_(code) {}
    static Outcome OfHost(int32_t hostStatus) {
        Outcome outcome(hostStatus);
        outcome.isHosts_ = hostStatus != 0;
        return outcome;
    }
    // A failure that keeps its results: the outputs are left as they are.
    static Outcome WithResults(ErrorCode code) {
        Outcome outcome(code);
        outcome.keepsResults_ = true;
        return outcome;
    }

    // Anything but plain success: `if (const Outcome bad = x.resize(n)) return bad;`
    explicit operator bool() const { return status_ != 0; }
    // A failure of the library or a refusal of the host, after which the outputs are settled. A
    // warning is not a failure.
    bool failed() const { return isHosts_ || (status_ < 0 && !keepsResults_); }
    bool isHosts() const { return isHosts_; }

    // The outcome as a code of the library.
    ErrorCode code() const { return isHosts_ ? ErrOutOfMemory : status_; }
    // The code, or the host's status unchanged.
    int32_t raw() const { return status_; }

private:
    int32_t status_;
    bool isHosts_ = false;
    bool keepsResults_ = false;
};

// One check of a frame: the code applies where `failed` holds.
struct Check {
    bool failed;
    ErrorCode code;
};

// The first failed check decides: the rule of nearly all exports.
inline ErrorCode FirstFailed(std::initializer_list<Check> checks) {
    for (const Check &check : checks)
        if (check.failed)
            return check.code;
    return 0;
}

// All checks run and the last failed one decides: the rule of some older exports.
inline ErrorCode LastFailed(std::initializer_list<Check> checks) {
    ErrorCode status = 0;
    for (const Check &check : checks)
        if (check.failed)
            status = check.code;
    return status;
}

} // namespace qx

#endif
