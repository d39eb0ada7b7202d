#include "filters/zero_phase.h"

#include "frame/export.h"
#include "qx/zero_phase.h"

#include <algorithm>

namespace qx {
namespace {

typedef InOut<DBL1D, OnFailure::Keep> Kept;

Outcome Fit(Kept &state, int32_t size, bool &clears) {
    if (state.size() == size)
        return 0;
    clears = true;
    return state.resize(size);
}
void Clear(Kept &state) { Fill(state.data(), state.size(), 0.0); }

// Keeps all four states, or clears all of them.
Outcome RunDirect(Kept &x, const In<DBL1D> &a, const In<DBL1D> &b, Kept *const (&states)[4],
                  bool clears) {
    auto &[xForward, xBackward, yForward, yBackward] = states;
    for (Kept *const state : states) {
        const bool ofX = state == xForward || state == xBackward;
        const int32_t coefficients = ofX ? b.size() : a.size();
        if (const Outcome bad = Fit(*state, std::max(0, coefficients - 1), clears))
            return bad;
    }
    if (clears)
        for (Kept *const state : states)
            Clear(*state);
    return ZeroPhaseDirect(a.view(), b.view(), {xForward->view(), yForward->view()},
                           {xBackward->view(), yBackward->view()}, x.view());
}

// Failures leave x unchanged.
Outcome FilterDirect(Kept x, In<DBL1D> a, In<DBL1D> b, Kept xForward, Kept xBackward, Kept yForward,
                     Kept yBackward, int32_t keepState) {
    if (x.isEmpty())
        return ErrEmptyInput;
    if (b.isEmpty())
        return a.isEmpty() ? 0 : ErrSizesDisagree;
    Kept *const states[] = {&xForward, &xBackward, &yForward, &yBackward};
    const Outcome outcome = RunDirect(x, a, b, states, keepState == 0);
    if (outcome)
        for (Kept *const state : states)
            state->empty();
    return outcome;
}

// kept: here a failure also leaves the states unchanged, except one that has already been resized.
Outcome FilterCascade(Kept x, int32_t form, In<DBL1D> a, In<DBL1D> b, Kept forward, Kept backward,
                      int32_t keepState) {
    if (x.isEmpty())
        return ErrEmptyInput;
    if (a.isEmpty() || b.isEmpty())
        return a.isEmpty() && b.isEmpty() ? 0 : ErrSizesDisagree;
    bool clears = keepState == 0;
    if (const Outcome bad = Fit(forward, a.size(), clears))
        return bad;
    if (const Outcome bad = Fit(backward, a.size(), clears)) {
        Clear(forward);
        return bad;
    }
    if (clears) {
        Clear(forward);
        Clear(backward);
    }
    return ZeroPhaseCascade({a.view(), b.view(), form}, forward.view(), backward.view(), x.view());
}

} // namespace
} // namespace qx

using qx::ReturnedWithHost;

ErrorCode zeroPhaseFiltH(DBL1D x, DBL1D a, DBL1D b, DBL1D xStateForward, DBL1D xStateBackward,
                         DBL1D yStateForward, DBL1D yStateBackward, int32_t keepState) {
    return ReturnedWithHost(qx::FilterDirect, x, a, b, xStateForward, xStateBackward, yStateForward,
                            yStateBackward, keepState);
}

ErrorCode zeroPhaseCascadeFiltH(DBL1D x, const int32_t *form, DBL1D a, DBL1D b, DBL1D stateForward,
                                DBL1D stateBackward, int32_t keepState) {
    return ReturnedWithHost(qx::FilterCascade, x, *form, a, b, stateForward, stateBackward,
                            keepState);
}
