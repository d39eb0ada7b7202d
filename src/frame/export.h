#ifndef QX_FRAME_EXPORT_H
#define QX_FRAME_EXPORT_H

#include "frame/arithmetic.h"
#include "frame/arrays.h"

#include <array>
#include <tuple>
#include <utility>

namespace qx {

// An export is one line: the ending that returns its outcome, the body, and the arguments.
//
//     Outcome SolveLU(In<DBL2D> a, In<DBL1D> b, Out<DBL1D> x) {
//         if (const Outcome bad = LastFailed({{a.isEmpty(), ErrEmptyInput}, ...})) return bad;
//         if (const Outcome bad = x.resize(b.size())) return bad;
//         return SolveByLU(a.data(), a.rows(), b.data(), x.data());
//     }
//
//     int32_t EqsByLUDri_head(DBL2D a, DBL1D b, DBL1D x, ErrorCode *err) {
//         return InErrWithHost(err, SolveLU, a, b, x);
//     }
//
// The types of the body's parameters describe the arguments, and the frame does the rest:
//   - a failure settles every output (Out, InOut, OutDBL ...), in the order of the parameters,
//     whether the body reached it or not: arrays are emptied, scalars become NaN. Warnings and
//     success leave them.
//   - two outputs that are one array are refused with ErrInternal, before the body runs.
//   - an In or Spoiled whose array is also an Out of the call reads a copy, so that a host that
//     works in place gets the result of separate arrays.
//   - a caller's record that contains arrays is a class with inputs(), a tuple of references to its
//     input views, and outputs(), a tuple of the identity() of each of its outputs.
//   - the body runs in the arithmetic in which results are defined (frame/arithmetic.h), whatever
//     the host has set; this includes its calls to the host. An export without a frame, or one that
//     computes an argument of the body, declares a DefaultArithmetic itself.
//   - everything else (numbers, plain pointers, plan keepers) is passed through unchanged.
// A body is a function or a lambda whose parameters have explicit types; it returns an Outcome or
// an ErrorCode. What a twin does differently is a template argument of its body or a capture.

namespace detail {

template <class Parameter>
concept SettlesFailure = requires(Parameter parameter) {
    parameter.settleFailure();
};
template <class Parameter>
concept HasInputs = requires(Parameter parameter) {
    parameter.inputs();
};
template <class Parameter>
concept HasOutputs = requires(Parameter parameter) {
    parameter.outputs();
};

// The copy of an input that is also an output.
struct Copy {
    ScratchBytes memory;
    void *block = nullptr;
};

// The inputs of a parameter, as references to views.
template <class Parameter>
auto InputsOf(Parameter &parameter) {
    if constexpr (HasInputs<Parameter>)
        return parameter.inputs();
    else
        return std::tuple<>();
}
// The outputs of a parameter, by the address that identifies each array.
template <class Parameter>
auto OutputsOf(const Parameter &parameter) {
    if constexpr (HasOutputs<Parameter>)
        return parameter.outputs();
    else
        return std::tuple<>();
}
template <class Parameter>
constexpr std::size_t inputCount =
    std::tuple_size_v<decltype(InputsOf(std::declval<Parameter &>()))>;
template <class Parameter>
constexpr std::size_t outputCount =
    std::tuple_size_v<decltype(OutputsOf(std::declval<Parameter &>()))>;

template <class... Parameters>
class Frame {
public:
    template <class... Arguments>
    explicit Frame(Arguments &&...arguments)
        : parameters_(Parameters(std::forward<Arguments>(arguments))...) {}

    template <class Body>
    Outcome run(Body body) {
        if constexpr (outputs > 1 || (inputs > 0 && outputs > 0))
            if (const ErrorCode bad = separate())
                return bad;
        return std::apply(body, parameters_);
    }

    void settleFailure() {
        std::apply([](auto &...parameter) { (settle(parameter), ...); }, parameters_);
    }

private:
    static constexpr std::size_t inputs = (inputCount<Parameters> + ... + 0);
    static constexpr std::size_t outputs = (outputCount<Parameters> + ... + 0);
    typedef std::array<const void *, outputs> Identities;

    template <class Parameter>
    static void settle(Parameter &parameter) {
        if constexpr (SettlesFailure<Parameter>)
            parameter.settleFailure();
    }

    Identities identitiesOfOutputs() const {
        const auto all =
            std::apply([](auto &...parameter) { return std::tuple_cat(OutputsOf(parameter)...); },
                       parameters_);
        return std::apply([](auto... identity) { return Identities{identity...}; }, all);
    }
    // A record may have no arrays if it needs none.
    template <std::size_t... I>
    static bool isAmong(const void *identity, const Identities &all, std::index_sequence<I...>) {
        return ((all[I] == identity) || ...) && identity != nullptr;
    }
    template <std::size_t... I>
    static bool twoAreOne(const Identities &all, std::index_sequence<I...>) {
        return (isAmong(all[I], all, std::make_index_sequence<I>()) || ...);
    }

    ErrorCode separate() {
        constexpr std::make_index_sequence<outputs> everyOutput;
        const Identities all = identitiesOfOutputs();
        if (twoAreOne(all, everyOutput))
            return ErrInternal;
        ErrorCode status = 0;
        std::size_t at = 0;
        const auto copyIfMet = [&](auto &input) {
            Copy &copy = copies_[at++];
            if (isAmong(input.identity(), all, everyOutput))
                status = input.readCopyIn(copy.memory, copy.block);
            return status == 0;
        };
        std::apply(
            [&](auto &...input) { (void)(copyIfMet(input) && ...); },
            std::apply([](auto &...parameter) { return std::tuple_cat(InputsOf(parameter)...); },
                       parameters_));
        return status;
    }

    std::tuple<Parameters...> parameters_;
    std::array<Copy, outputs == 0 ? 0 : inputs> copies_;
};

// The frame of a body: its parameters are those of the function or the lambda.
template <class Body>
struct FrameOf : FrameOf<decltype(&Body::operator())> {};
template <class Result, class... Parameters>
struct FrameOf<Result (*)(Parameters...)> {
    typedef Frame<Parameters...> type;
};
template <class Lambda, class Result, class... Parameters>
struct FrameOf<Result (Lambda::*)(Parameters...) const> {
    typedef Frame<Parameters...> type;
};

template <class Body, class... Arguments>
Outcome RunFrame(Body body, Arguments &&...arguments) {
    const DefaultArithmetic arithmetic;
    typename FrameOf<Body>::type frame(std::forward<Arguments>(arguments)...);
    const Outcome outcome = frame.run(body);
    if (outcome.failed())
        frame.settleFailure();
    return outcome;
}

} // namespace detail

// The function result is the code.
template <class Body, class... Arguments>
ErrorCode Returned(Body body, Arguments &&...arguments) {
    return detail::RunFrame(body, std::forward<Arguments>(arguments)...).code();
}

// The function result is the code or, where the host refused a resize, its own status.
template <class Body, class... Arguments>
int32_t ReturnedWithHost(Body body, Arguments &&...arguments) {
    return detail::RunFrame(body, std::forward<Arguments>(arguments)...).raw();
}

// The code is in *err, and the function result is always 0.
template <class Body, class... Arguments>
int32_t InErr(ErrorCode *err, Body body, Arguments &&...arguments) {
    *err = detail::RunFrame(body, std::forward<Arguments>(arguments)...).code();
    return 0;
}

// The code is in *err. The function result is the host's status if the host refused a resize,
// otherwise 0.
template <class Body, class... Arguments>
int32_t InErrWithHost(ErrorCode *err, Body body, Arguments &&...arguments) {
    const Outcome outcome = detail::RunFrame(body, std::forward<Arguments>(arguments)...);
    *err = outcome.code();
    return outcome.isHosts() ? outcome.raw() : 0;
}

// The code is in *err and is also the function result, unless the host refused a resize: then the
// function result is the host's status.
template <class Body, class... Arguments>
int32_t InErrAndReturnedWithHost(ErrorCode *err, Body body, Arguments &&...arguments) {
    const Outcome outcome = detail::RunFrame(body, std::forward<Arguments>(arguments)...);
    *err = outcome.code();
    return outcome.raw();
}

} // namespace qx

#endif
