#include "filters/cascade.h"
#include "filters/direct_form.h"

#include "frame/export.h"
#include "qx/filtering.h"

#include <algorithm>
#include <cstring>
#include <limits>

namespace qx {
namespace {

template <class Handle>
using Kept = InOut<Handle, OnFailure::Keep>;

// kept: the exports for arrays keep the state if their byte is 1; those for one sample clear it if
// theirs is not 0.
bool ClearsUnlessKept(const uint8_t *keepState) { return *keepState != 1; }
bool ClearsIfReset(const uint8_t *reset) { return *reset != 0; }

template <class View>
Outcome EmptiedOnFailure(View &view, Outcome outcome) {
    if (outcome.failed())
        view.empty();
    return outcome;
}

// Resizes a state to `size`. A state of the wrong size is discarded, together with its partner. If
// the host refuses, the state is emptied.
template <class View>
Outcome Fit(View &state, int32_t size, bool &clears) {
    if (state.size() == size)
        return 0;
    clears = true;
    return EmptiedOnFailure(state, state.resize(size));
}

template <class View>
void Clear(View &state) {
    std::memset(static_cast<void *>(state.data()), 0,
                sizeof *state.data() * static_cast<std::size_t>(state.size()));
}

// The number of values that a filter stores for this many coefficients; none if there are none.
int32_t Memory(int32_t coefficients) { return std::max(0, coefficients - 1); }

// The operation that the given coefficients imply.
enum class Path { Nothing, FIR, IIR, Missing };
Path DirectPath(bool hasA, bool hasB) {
    if (!hasB)
        return hasA ? Path::Missing : Path::Nothing;
    return hasA ? Path::IIR : Path::FIR;
}
Path CascadePath(bool hasA, bool hasB) {
    if (hasA && hasB)
        return Path::IIR;
    return hasA || hasB ? Path::Missing : Path::Nothing;
}

// The filter for a signal of the handle type `Signal`.
template <class Signal, class Coefficients>
using Filter = DirectForm<HandleTraits<Coefficients>::code, HandleTraits<Signal>::code>;

// On the FIR path a and yState are not read. Inline, like its callers, for the exports that are
// called for each sample: a view passed through memory takes as long as the sample.
template <class Signal, class Coefficients>
inline ErrorCode RunDirect(Path path, const In<Coefficients> &a, const In<Coefficients> &b,
                           VectorView<HandleTraits<Signal>::code> xState,
                           VectorView<Filter<Signal, Coefficients>::output> yState,
                           ConstVectorView<HandleTraits<Signal>::code> x,
                           VectorView<Filter<Signal, Coefficients>::output> y) {
    typedef Filter<Signal, Coefficients> F;
    return path == Path::FIR ? F::fir(b.view(), x, xState, y)
                             : F::iir(b.view(), xState, a.view(), yState, x, y);
}

// If the second resize is refused, the first state is still cleared.
template <class XState, class YState>
Outcome FitBoth(XState &xState, int32_t nb, YState &yState, int32_t na, bool clears) {
    if (const Outcome bad = Fit(xState, Memory(nb), clears))
        return bad;
    if (const Outcome bad = Fit(yState, Memory(na), clears)) {
        Clear(xState);
        return bad;
    }
    if (clears) {
        Clear(xState);
        Clear(yState);
    }
    return 0;
}

// In place, with separate states of x and y. Errors before the filtering leave the states
// unchanged, except one whose resize was refused.
template <class Signal, class Coefficients>
Outcome FilterTwoStates(Kept<Signal> x, In<Coefficients> a, In<Coefficients> b, Kept<Signal> xState,
                        Kept<Signal> yState, bool clears) {
    if (x.isEmpty())
        return ErrEmptyInput;
    const Path path = DirectPath(!a.isEmpty(), !b.isEmpty());
    if (path == Path::Nothing)
        return 0;
    if (path == Path::Missing)
        return EmptiedOnFailure(x, ErrSizesDisagree);
    if (const Outcome bad = FitBoth(xState, b.size(), yState, a.size(), clears))
        return bad;
    return EmptiedOnFailure(
        x, RunDirect<Signal>(path, a, b, xState.view(), yState.view(), x.view(), x.view()));
}

// A real signal through a complex filter.
Outcome FilterIntoComplex(In<DBL1D> x, Out<CDB1D> y, In<CDB1D> a, In<CDB1D> b, Kept<DBL1D> xState,
                          Kept<CDB1D> yState, bool clears) {
    if (x.isEmpty())
        return ErrEmptyInput;
    const Path path = DirectPath(!a.isEmpty(), !b.isEmpty());
    if (path == Path::Missing)
        return ErrSizesDisagree;
    if (const Outcome bad = y.resize(x.size()))
        return bad;
    if (path == Path::Nothing) {
        for (std::ptrdiff_t t = 0; t < x.size(); ++t)
            y.data()[t] = {x.data()[t], 0.0};
        return 0;
    }
    if (const Outcome bad = FitBoth(xState, b.size(), yState, a.size(), clears))
        return bad;
    return RunDirect<DBL1D>(path, a, b, xState.view(), yState.view(), x.view(), y.view());
}

// The states of x and y in one array.
template <class Signal>
inline Outcome RunJoined(Path path, const In<DBL1D> &a, const In<DBL1D> &b, InOut<Signal> &state,
                         bool clears, VectorView<HandleTraits<Signal>::code> x) {
    const int32_t ofX = Memory(b.size());
    const int32_t ofY = path == Path::IIR ? Memory(a.size()) : 0;
    if (ofX > std::numeric_limits<int32_t>::max() - ofY)
        return ErrOutOfMemory;
    if (const Outcome bad = Fit(state, ofX + ofY, clears))
        return bad;
    if (clears)
        Clear(state);
    const auto values = state.view();
    return RunDirect<Signal>(path, a, b, values.part(0, ofX), values.part(ofX, ofY), x, x);
}

template <class Signal>
Outcome FilterOneState(InOut<Signal> x, In<DBL1D> a, In<DBL1D> b, InOut<Signal> state,
                       bool clears) {
    if (x.isEmpty())
        return ErrEmptyInput;
    const Path path = DirectPath(!a.isEmpty(), !b.isEmpty());
    if (path == Path::Nothing)
        return 0;
    if (path == Path::Missing)
        return ErrSizesDisagree;
    return RunJoined<Signal>(path, a, b, state, clears, x.view());
}

template <ElementType E, class State>
Outcome RunCascade(int32_t form, const In<DBL1D> &a, const In<DBL1D> &b, State &state, bool clears,
                   VectorView<E> x) {
    const int32_t order = SectionOrder(form);
    if (const Outcome bad = Fit(state, a.size() / order * order, clears))
        return bad;
    if (clears)
        Clear(state);
    return FilterIIRCascade<E>({a.view(), b.view(), form}, state.view(), x);
}

template <class Signal>
Outcome FilterCascade(Kept<Signal> x, int32_t form, In<DBL1D> a, In<DBL1D> b, Kept<Signal> state,
                      bool clears) {
    if (x.isEmpty())
        return ErrEmptyInput;
    const Path path = CascadePath(!a.isEmpty(), !b.isEmpty());
    if (path == Path::Nothing)
        return 0;
    if (path == Path::Missing)
        return EmptiedOnFailure(x, ErrSizesDisagree);
    // kept: unlike the other codes, this one leaves x unchanged.
    if (SectionOrder(form) == 0)
        return ErrInvalidSelector;
    const Outcome outcome = RunCascade(form, a, b, state, clears, x.view());
    return outcome.isHosts() ? outcome : EmptiedOnFailure(x, outcome);
}

// The first modes are the forms of sections.
enum SampleMode : int32_t { DirectIIR = FourthOrderSections + 1, DirectFIR };

template <class Signal>
Outcome RunSample(typename HandleTraits<Signal>::T *sample, int32_t mode, const In<DBL1D> &a,
                  const In<DBL1D> &b, InOut<Signal> &state, bool clears) {
    if (mode < SecondOrderSections || mode > DirectFIR)
        return ErrInvalidSelector;
    const bool isCascade = mode < DirectIIR;
    // kept: the FIR mode ignores a if there is a numerator; without one it does not.
    const bool hasA = !a.isEmpty() && (mode != DirectFIR || b.isEmpty());
    const Path path = isCascade ? CascadePath(hasA, !b.isEmpty()) : DirectPath(hasA, !b.isEmpty());
    if (path == Path::Nothing)
        return 0;
    if (path == Path::Missing)
        return ErrSizesDisagree;
    const VectorView<HandleTraits<Signal>::code> x(sample, 1);
    if (isCascade)
        return RunCascade(mode, a, b, state, clears, x);
    return RunJoined<Signal>(path, a, b, state, clears, x);
}

// kept: a failure leaves 0 in the sample, not the NaN of other scalars.
template <class Signal>
Outcome FilterSample(typename HandleTraits<Signal>::T *x, int32_t mode, In<DBL1D> a, In<DBL1D> b,
                     InOut<Signal> state, bool clears) {
    const Outcome outcome = RunSample<Signal>(x, mode, a, b, state, clears);
    if (outcome.failed())
        *x = {};
    return outcome;
}

} // namespace
} // namespace qx

using qx::ClearsIfReset;
using qx::ClearsUnlessKept;
using qx::InErrWithHost;
using qx::Returned;

int32_t IIR_Filter(DBL1D x, DBL1D a, DBL1D b, DBL1D xState, DBL1D yState, const uint8_t *keepState,
                   ErrorCode *err) {
    return InErrWithHost(err, qx::FilterTwoStates<DBL1D, DBL1D>, x, a, b, xState, yState,
                         ClearsUnlessKept(keepState));
}

int32_t CxSigIIR_Filter(CDB1D x, DBL1D a, DBL1D b, CDB1D xState, CDB1D yState,
                        const uint8_t *keepState, ErrorCode *err) {
    return InErrWithHost(err, qx::FilterTwoStates<CDB1D, DBL1D>, x, a, b, xState, yState,
                         ClearsUnlessKept(keepState));
}

int32_t CxIIR_Filter_H(CDB1D x, CDB1D a, CDB1D b, CDB1D xState, CDB1D yState,
                       const uint8_t *keepState, ErrorCode *err) {
    return InErrWithHost(err, qx::FilterTwoStates<CDB1D, CDB1D>, x, a, b, xState, yState,
                         ClearsUnlessKept(keepState));
}

ErrorCode CxIIRReSig_Filter_H(DBL1D x, CDB1D y, CDB1D a, CDB1D b, DBL1D xState, CDB1D yState,
                              const uint8_t *keepState) {
    return Returned(qx::FilterIntoComplex, x, y, a, b, xState, yState, ClearsUnlessKept(keepState));
}

ErrorCode IIR_Filter_OneState(DBL1D x, DBL1D a, DBL1D b, DBL1D state, const uint8_t *keepState) {
    return Returned(qx::FilterOneState<DBL1D>, x, a, b, state, ClearsUnlessKept(keepState));
}

ErrorCode CxSigIIR_Filter_OneState(CDB1D x, DBL1D a, DBL1D b, CDB1D state,
                                   const uint8_t *keepState) {
    return Returned(qx::FilterOneState<CDB1D>, x, a, b, state, ClearsUnlessKept(keepState));
}

int32_t IIR_Filter2(DBL1D x, const int32_t *form, DBL1D a, DBL1D b, DBL1D state,
                    const uint8_t *keepState, ErrorCode *err) {
    return InErrWithHost(err, qx::FilterCascade<DBL1D>, x, *form, a, b, state,
                         ClearsUnlessKept(keepState));
}

int32_t CxSigIIR_Filter2(CDB1D x, const int32_t *form, DBL1D a, DBL1D b, CDB1D state,
                         const uint8_t *keepState, ErrorCode *err) {
    return InErrWithHost(err, qx::FilterCascade<CDB1D>, x, *form, a, b, state,
                         ClearsUnlessKept(keepState));
}

ErrorCode IIR_Filter_PtbyPt(DBL *x, int32_t mode, DBL1D a, DBL1D b, DBL1D state,
                            const uint8_t *reset) {
    return Returned(qx::FilterSample<DBL1D>, x, mode, a, b, state, ClearsIfReset(reset));
}

ErrorCode CxSigIIR_Filter_PtbyPt(CDB *x, int32_t mode, DBL1D a, DBL1D b, CDB1D state,
                                 const uint8_t *reset) {
    return Returned(qx::FilterSample<CDB1D>, x, mode, a, b, state, ClearsIfReset(reset));
}
