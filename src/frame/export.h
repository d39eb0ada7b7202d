#ifndef QX_FRAME_EXPORT_H
#define QX_FRAME_EXPORT_H

#include "frame/arrays.h"

#include <tuple>
#include <utility>

namespace qx {

// An export is one line: the ending that tells its outcome, the body, and the arguments.
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
// The body's parameter types say what each argument is, and the frame does the rest from them:
//   - a failure settles every output (Out, InOut, OutDBL ...), in the order of the parameters,
//     whether the body reached it or not: arrays are emptied, scalars become NaN. Warnings and
//     success leave them.
//   - an In or Spoiled whose array is also an Out of the call reads a copy, so that a host that
//     works in place gets the result of separate arrays.
//   - everything else (numbers, plain pointers, plan keepers) is handed on as it is.
// A body is a function or a lambda whose parameters have their types written out; it returns an
// Outcome or an ErrorCode. What a twin does differently is a template argument of its body, or a
// capture.

namespace detail {

template <class Parameter>
struct ParameterKind {
    static constexpr bool isInput = false;
    static constexpr bool isOutputArray = false;
    static constexpr bool isOutput = requires(Parameter parameter) { parameter.settleFailure(); };
};
template <class Handle>
struct ParameterKind<In<Handle>> {
    static constexpr bool isInput = true;
    static constexpr bool isOutputArray = false;
    static constexpr bool isOutput = false;
};
template <class Handle>
struct ParameterKind<Spoiled<Handle>> : ParameterKind<In<Handle>> {};
template <class Handle, OnFailure Failure, ElementType EmptyCode>
struct ParameterKind<Out<Handle, Failure, EmptyCode>> {
    static constexpr bool isInput = false;
    static constexpr bool isOutputArray = true;
    static constexpr bool isOutput = true;
};

struct NoCopy {};
// Where an input that is also an output has its copy.
struct Copy {
    ScratchBytes memory;
    void *block = nullptr;
};

template <class... Parameters>
class Frame {
public:
    template <class... Arguments>
    explicit Frame(Arguments &&...arguments)
        : parameters_(Parameters(std::forward<Arguments>(arguments))...) {}

    template <class Body>
    Outcome run(Body body) {
        if (const Outcome bad = separateInputs(std::index_sequence_for<Parameters...>()))
            return bad;
        return std::apply(body, parameters_);
    }

    void settleFailure() {
        std::apply([](auto &...parameter) { (settle(parameter), ...); }, parameters_);
    }

private:
    static constexpr bool hasInput = (ParameterKind<Parameters>::isInput || ...);
    static constexpr bool hasOutput = (ParameterKind<Parameters>::isOutputArray || ...);

    template <class Parameter>
    static void settle(Parameter &parameter) {
        if constexpr (ParameterKind<Parameter>::isOutput)
            parameter.settleFailure();
    }

    template <std::size_t... I>
    ErrorCode separateInputs(std::index_sequence<I...>) {
        ErrorCode status = 0;
        if constexpr (hasInput && hasOutput)
            (void)(((status = separate<I>()) != 0) || ...);
        return status;
    }
    template <std::size_t I>
    ErrorCode separate() {
        auto &parameter = std::get<I>(parameters_);
        if constexpr (ParameterKind<std::decay_t<decltype(parameter)>>::isInput) {
            if (isOutputToo(parameter.identity()))
                return parameter.readCopyIn(std::get<I>(copies_).memory,
                                            std::get<I>(copies_).block);
        }
        return 0;
    }
    bool isOutputToo(const void *identity) {
        return std::apply(
            [identity](auto &...parameter) { return (isOutput(parameter, identity) || ...); },
            parameters_);
    }
    template <class Parameter>
    static bool isOutput(Parameter &parameter, const void *identity) {
        if constexpr (ParameterKind<Parameter>::isOutputArray)
            return parameter.identity() == identity;
        else
            return false;
    }

    std::tuple<Parameters...> parameters_;
    std::tuple<std::conditional_t<hasOutput && ParameterKind<Parameters>::isInput, Copy, NoCopy>...>
        copies_;
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

// The code is in *err, and the function result is 0 whatever happened.
template <class Body, class... Arguments>
int32_t InErr(ErrorCode *err, Body body, Arguments &&...arguments) {
    *err = detail::RunFrame(body, std::forward<Arguments>(arguments)...).code();
    return 0;
}

// The code is in *err. The function result is the host's own status where the host refused a
// resize, else 0.
template <class Body, class... Arguments>
int32_t InErrWithHost(ErrorCode *err, Body body, Arguments &&...arguments) {
    const Outcome outcome = detail::RunFrame(body, std::forward<Arguments>(arguments)...);
    *err = outcome.code();
    return outcome.isHosts() ? outcome.raw() : 0;
}

// The code is in *err and is the function result too, where the host's own status takes its place
// if the host refused a resize.
template <class Body, class... Arguments>
int32_t InErrAndReturnedWithHost(ErrorCode *err, Body body, Arguments &&...arguments) {
    const Outcome outcome = detail::RunFrame(body, std::forward<Arguments>(arguments)...);
    *err = outcome.code();
    return outcome.raw();
}

} // namespace qx

#endif
