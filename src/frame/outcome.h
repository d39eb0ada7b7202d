#ifndef QX_FRAME_OUTCOME_H
#define QX_FRAME_OUTCOME_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>
#include <initializer_list>

namespace qx {

// What the body of an export came to: success, a code of the library, or the host's own status
// where the host refused a resize. How it is told to the caller is the ending's business
// (frame/export.h).
class [[nodiscard]] Outcome {
public:
    // 0, a failure or a warning. Implicit, so that a body may return what an inner routine gave.
    Outcome(ErrorCode code = 0) : status_(code) {}
    static Outcome OfHost(int32_t hostStatus) {
        Outcome outcome(hostStatus);
        outcome.isHosts_ = hostStatus != 0;
        return outcome;
    }
    // A failure that leaves its results: the outputs stay as they are.
    static Outcome WithResults(ErrorCode code) {
        Outcome outcome(code);
        outcome.keepsResults_ = true;
        return outcome;
    }

    // Anything but plain success: `if (const Outcome bad = x.resize(n)) return bad;`
    explicit operator bool() const { return status_ != 0; }
    // A failure of the library or a refusal of the host, after which the outputs are settled; a
    // warning is none.
    bool failed() const { return isHosts_ || (status_ < 0 && !keepsResults_); }
    bool isHosts() const { return isHosts_; }

    // The host's status as the library's code.
    ErrorCode code() const { return isHosts_ ? ErrOutOfMemory : status_; }
    // The host's status as it is.
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
