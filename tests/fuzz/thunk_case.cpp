#include "tests/fuzz/thunk_case.h"

#include "tests/fuzz/oddities.h"

#include <algorithm>

namespace qx::test {

namespace {

// Makes one call and checks everything that must hold for a single call.
Outcome CallAndCheck(const Scenario &scenario, Node &node, const Manner &manner,
                     Observed *observed = nullptr) {
    const Thunk &thunk = *scenario.thunk;
    PreparedCall call(scenario, node, manner);
    const Observed seen =
        Attacked(scenario.disturbance, manner.rubbish, [&call] { return call(); });
    if (observed != nullptr)
        *observed = seen;
    const ErrorCode status = call.status(seen.result);
    if (scenario.writesOneTwice() && !IsKept(thunk.name, Oddity::WorksInInput))
        CheckRefusal(status, call.hasStatus());
    else
        CheckStatus(thunk.name, status, scenario.disturbance, scenario.shares());
    CheckHost();
    for (std::size_t i = 0; i < thunk.parameters.size(); ++i) {
        const Parameter &parameter = thunk.parameters[i];
        if (!parameter.isArray())
            continue;
        if (!call.sizesFitBlock(i) && !IsKept(thunk.name, Oddity::SizeBeyondBlock))
            Tell("the sizes of %s exceed its block", parameter.name);
        if (!call.inputIsUnchanged(i))
            Tell("the input %s has changed", parameter.name);
    }
    if (status < 0 || status == statusNoMemory) // an output may keep its old content
        return {status, 0};
    ValueHash hash;
    for (const OutputValue &value : call.outputs())
        hash.add(value);
    return {status, hash.sizes() ^ hash.elements()};
}

Outcome CallAlone(const Scenario &scenario, const Manner &manner, Observed *observed = nullptr) {
    Node node;
    return CallAndCheck(scenario, node, manner, observed);
}

} // namespace

Outcome RunThunkCase(Random &random, const Thunk &thunk) {
    Node node;
    Outcome last;
    for (int32_t left = 1 + random.below(3); left > 0; --left) {
        const Scenario scenario = SomeScenario(random, thunk);
        const bool shares = scenario.shares();
        const bool isRefused = scenario.writesOneTwice();
        const bool says = scenario.saysNegativeSize();
        const bool again =
            scenario.disturbance.isNone() && !isRefused && (shares || says || random.oneIn(4));
        Outcome outcome;
        {
            const TinyWorkspace workspace(scenario.disturbance.workspace);
            if (again || scenario.disturbance.workspace != 0)
                outcome = CallAlone(scenario, {});
            else
                outcome = CallAndCheck(scenario, node, {});
        }
        last = outcome;
        if (!again)
            continue;
        const Outcome second = CallAlone(scenario, {shares, 0xC2, says});
        if (!says || !IsCodeOfNegativeSize(thunk.name, outcome.status))
            CheckRepetition(thunk.name, outcome, second,
                            says     ? "an empty array for a negative size"
                            : shares ? "an array for each handle"
                                     : "the same call");
    }
    return last;
}

namespace {

// Whether the types of two array arguments allow them to be one array.
bool AreOfOneType(const Parameter &one, const Parameter &other) {
    return one.isArray() && one.kind == other.kind && one.element == other.element;
}

void LetShare(Scenario &scenario, std::size_t first, std::size_t second) {
    scenario.arguments[second] = scenario.arguments[first];
    scenario.arguments[second].aliasOf = static_cast<int>(first);
}

// Calls a scenario in which arguments share an array, and compares with separate arrays of the same
// content.
Outcome RunShared(const Scenario &scenario) {
    const Outcome outcome = CallAlone(scenario, {});
    const bool isComparable = !scenario.writesOneTwice() && scenario.writesInput();
    if (isComparable)
        CheckRepetition(scenario.thunk->name, outcome, CallAlone(scenario, {true, 0xC2, false}),
                        "an array for each handle");
    return outcome;
}

} // namespace

Outcome RunThunkMeetings(Random &random, const Thunk &thunk) {
    Scenario scenario = SomeScenario(random, thunk);
    scenario.disturbance = {};
    for (Argument &argument : scenario.arguments) {
        argument.aliasOf = -1;
        std::fill_n(argument.claims, 2, 0);
    }
    Outcome outcome = CallAlone(scenario, {});
    const std::size_t count = thunk.parameters.size();
    for (std::size_t i = 0; i < count; ++i) {
        Scenario all = scenario;
        bool isMeeting = false;
        for (std::size_t j = i + 1; j < count; ++j) {
            if (!AreOfOneType(thunk.parameters[i], thunk.parameters[j]))
                continue;
            Scenario pair = scenario;
            LetShare(pair, i, j);
            RunShared(pair);
            LetShare(all, i, j);
            isMeeting = true;
        }
        if (isMeeting)
            RunShared(all);
    }
    return outcome;
}

Outcome RunThunkHonesty(Random &random, const Thunk &thunk) {
    Scenario scenario = SomeScenario(random, thunk);
    scenario.disturbance = {};
    Observed calm;
    const Outcome granted = CallAlone(scenario, {}, &calm);
    ForSomeRefusals(random, calm, [&](const Disturbance &disturbance) {
        scenario.disturbance = disturbance;
        const TinyWorkspace workspace(disturbance.workspace);
        CheckHonesty(thunk.name, disturbance, CallAlone(scenario, {}), granted);
    });
    return granted;
}

} // namespace qx::test
