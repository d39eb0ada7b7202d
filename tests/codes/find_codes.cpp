#include "tests/codes/witnesses.h"

#include "tests/fuzz/content.h"
#include "tests/fuzz/oddities.h"

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <set>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

// Looks for arguments that make each export raise each code that it documents, one fault at a time
// and then two, and writes them as lines of tests/codes/witnesses.txt. Codes that were not raised,
// and pairs of which the later code always wins, are reported on standard error.
//
//     find_codes MODULE [--only EXPORT] [--tries N] [--code CODE]
//
// With --code it looks for that code alone, with numbers of all magnitudes: a quick way to find
// inputs that do not converge.

namespace qx::test {

namespace {

constexpr std::size_t mostBases = 40, mostAlternatives = 24;
constexpr int32_t largestSize = 60;
constexpr unsigned secondsPerExport = 240;
int32_t tries = 3000;
ErrorCode onlyCode = 0;

struct Base {
    const Recipe *recipe;
    int32_t n;
    std::vector<SpoilPlace> places;
};

bool HasNewAddress(const Spoils &spoils) {
    return std::any_of(spoils.begin(), spoils.end(),
                       [](const Spoil &spoil) { return spoil.action.starts_with("is "); });
}

std::string SizeAction(const std::vector<int32_t> &sizes) {
    std::string text = "size ";
    for (const int32_t each : sizes)
        text.append(text.back() == ' ' ? "" : "x").append(std::to_string(each));
    return text;
}

std::vector<std::string> SizeActions(const SpoilPlace &place) {
    std::vector<std::string> actions;
    for (int d = 0; d < place.dimensions; ++d) {
        const int32_t size = place.sizes[static_cast<std::size_t>(d)];
        for (const int32_t other : {0, 1, 2, 3, 4, size - 1, size + 1, size / 2, 2 * size}) {
            std::vector<int32_t> sizes = place.sizes;
            sizes[static_cast<std::size_t>(d)] = other;
            actions.push_back(SizeAction(sizes));
        }
    }
    if (place.dimensions == 2)
        for (const char *square : {"0x0", "1x1", "2x2", "3x3"})
            actions.push_back(std::string("size ") + square);
    return actions;
}

std::vector<std::string> ActionsOn(const SpoilPlace &place) {
    std::vector<std::string> actions;
    if (place.dimensions == 0 && (place.element == "DBL" || place.element == "SGL")) {
        for (const char *value :
             {"0", "-1", "nan", "inf", "-inf", "1", "0.5", "2", "1e-3", "0.1", "10", "100", "1e4",
              "1e9", "1e300", "-1e300", "1e-300", "-0.5", "3"})
            actions.push_back(std::string("= ") + value);
        char text[40];
        for (const double value :
             {2 * place.value, -place.value, place.value / 2, place.value + 1}) {
            std::snprintf(text, sizeof text, "= %.17g", value);
            actions.push_back(text);
        }
    } else if (place.dimensions == 0) {
        const auto now = static_cast<int64_t>(place.value);
        for (const int64_t value : {int64_t{0},
                                    int64_t{-1},
                                    int64_t{1},
                                    int64_t{2},
                                    int64_t{3},
                                    int64_t{4},
                                    int64_t{5},
                                    int64_t{7},
                                    int64_t{10},
                                    int64_t{30},
                                    int64_t{100},
                                    int64_t{1000},
                                    int64_t{-2},
                                    now + 1,
                                    now - 1,
                                    2 * now,
                                    now / 2,
                                    int64_t{4711},
                                    int64_t{2147483647},
                                    int64_t{-2147483647} - 1})
            actions.push_back(std::string("= ").append(std::to_string(value)));
    } else {
        actions = SizeActions(place);
        if (FindLayout(place.element) != nullptr && place.dimensions == 1)
            actions.push_back("size -1");
        for (const char *action :
             {"fill nan",     "fill 0",       "fill 1",       "fill -1",      "fill inf",
              "at 0 nan",     "at 0 inf",     "at 0 0",       "at 1 0",       "at 0 -1",
              "at 1 -1",      "at 0 1",       "at 1 1",       "at 0 100",     "at 1 100",
              "at 0 1e300",   "up",           "down",         "first",        "scale 1e300",
              "scale 1e-300", "scale 1e-160", "scale -1",     "scale 0",      "fill 0.5",
              "fill 2",       "fill 1e300",   "at 2 0",       "at 2 nan",     "at 2 -1",
              "at 2 100",     "scale 1e20",   "at 3 0",       "scale 10",     "fill 3",
              "wave",         "scale 1e308",  "fill 1.7e308", "at 0 1.7e308", "at 1 1.7e308",
              "at 2 1.7e308", "at 1 nan",     "at 3 nan"})
            actions.push_back(action);
    }
    return actions;
}

// Tries negative sizes, and one array for two arguments, only if the export has a code for them:
// such calls may end the process.
std::vector<Spoil> AllSpoils(const Base &base, const std::vector<ErrorCode> &wanted) {
    const auto wants = [&wanted](ErrorCode code) {
        return std::find(wanted.begin(), wanted.end(), code) != wanted.end();
    };
    std::vector<Spoil> all;
    if (wants(ErrNegativeDimension) || wants(ErrTableNegativeSize))
        for (const SpoilPlace &place : base.places)
            if (place.dimensions > 0)
                all.push_back({place.name, place.dimensions == 1 ? "size -1" : "size -1x2"});
    for (const SpoilPlace &place : base.places)
        for (const std::string &action : ActionsOn(place))
            all.push_back({place.name, action});
    for (const InterceptedArgument &argument : ExportOf(base.recipe->exportName())->arguments) {
        const bool isPointer = !argument.isByValue && (argument.kind == ArgumentKind::Record ||
                                                       argument.kind == ArgumentKind::Number ||
                                                       argument.kind == ArgumentKind::Word);
        if (wants(ErrMeasureNullState) && isPointer)
            all.push_back({argument.name, "null"});
        if (wants(ErrInternal) && argument.kind == ArgumentKind::Word)
            all.push_back({argument.name, "foreign"});
    }
    if (!wants(ErrInternal))
        return all;
    for (const SpoilPlace &place : base.places)
        for (const SpoilPlace &other : base.places)
            if (place.dimensions > 0 && other.name != place.name &&
                other.dimensions == place.dimensions && other.element == place.element)
                all.push_back({place.name, std::string("is ").append(other.name)});
    return all;
}

// Changes all dimensions of one size to another size together, so that the arrays still match.
std::vector<Spoils> JointSizes(const Base &base) {
    std::set<int32_t> sizes;
    for (const SpoilPlace &place : base.places)
        sizes.insert(place.sizes.begin(), place.sizes.end());
    std::vector<Spoils> all(1); // the first: no elements anywhere
    for (const SpoilPlace &place : base.places)
        if (place.dimensions > 0)
            all[0].push_back({place.name, SizeAction(std::vector<int32_t>(place.sizes.size(), 0))});
    for (const int32_t size : sizes)
        for (const int32_t other : {0, 1, 2, 3, 4, 5, size - 1, size + 1}) {
            Spoils spoils;
            for (const SpoilPlace &place : base.places) {
                std::vector<int32_t> changed = place.sizes;
                std::replace(changed.begin(), changed.end(), size, other);
                if (changed != place.sizes)
                    spoils.push_back({place.name, SizeAction(changed)});
            }
            all.push_back(spoils);
        }
    return all;
}

Spoils WildSpoils(const Base &base, int32_t seed, bool mirrors) {
    Spoils spoils;
    for (const SpoilPlace &place : base.places) {
        const bool isReal = place.element == "DBL" || place.element == "CDB";
        const bool hasElements = std::count(place.sizes.begin(), place.sizes.end(), 0) == 0;
        if (!isReal || !hasElements || place.dimensions == 0 || place.dimensions == 3)
            continue;
        spoils.push_back({place.name, "wild " + std::to_string(seed++)});
        if (mirrors && place.dimensions == 2 && place.sizes[0] == place.sizes[1])
            spoils.push_back({place.name, "mirror"});
    }
    return spoils;
}

class Search {
public:
    Search(const Interceptable &target, std::vector<Base> bases)
        : target_(target), bases_(std::move(bases)) {
        for (const ErrorCode code : target.codes)
            if (code != ErrOutOfMemory && (onlyCode == 0 || code == onlyCode))
                wanted_.push_back(code);
    }

    void singles() {
        for (std::size_t b = 0; b < bases_.size(); ++b) {
            look(b, {});
            for (const Spoil &spoil : AllSpoils(bases_[b], wanted_))
                look(b, {spoil});
            for (const Spoils &spoils : JointSizes(bases_[b]))
                look(b, spoils);
        }
    }
    void several(Random &random) {
        std::vector<std::vector<Spoil>> spoils;
        for (const Base &base : bases_)
            spoils.push_back(AllSpoils(base, wanted_));
        for (int32_t left = tries; left > 0 && !missing().empty(); --left) {
            const auto b =
                static_cast<std::size_t>(random.below(static_cast<int32_t>(bases_.size())));
            if (spoils[b].empty())
                continue;
            const std::vector<Spoils> joint = JointSizes(bases_[b]);
            Spoils some;
            if (!joint.empty() && random.oneIn(3))
                some = joint[static_cast<std::size_t>(
                    random.below(static_cast<int32_t>(joint.size())))];
            for (int32_t count = 1 + random.below(3); count > 0; --count)
                some.push_back(spoils[b][static_cast<std::size_t>(
                    random.below(static_cast<int32_t>(spoils[b].size())))]);
            look(b, some);
        }
    }
    // Numbers of all magnitudes in all arrays, also in symmetric matrices: a last resort for
    // iterations that do not converge.
    void wild() {
        for (int32_t seed = 1; seed <= tries / 6; ++seed)
            for (std::size_t b = 0; b < bases_.size() && !missing().empty(); ++b)
                for (const bool mirrors : {false, true})
                    look(b, WildSpoils(bases_[b], seed, mirrors));
    }
    // Two faults in one call, for each pair of codes.
    void pairs() {
        for (std::size_t i = 0; i < wanted_.size(); ++i)
            for (std::size_t j = 0; j < wanted_.size(); ++j)
                if (wanted_[i] < 0 && wanted_[j] < 0 && i != j &&
                    target_.hasInOrder(wanted_[i], wanted_[j]))
                    pair(wanted_[i], wanted_[j]);
    }
    void write() const {
        for (const ErrorCode code : wanted_)
            if (const auto found = found_.find(code); found != found_.end())
                std::printf("%s\n", Written(found->second.front().witness).c_str());
        for (const Witness &witness : pairs_)
            std::printf("%s\n", Written(witness).c_str());
        for (const ErrorCode code : missing())
            std::fprintf(stderr, "NOT RAISED: %s | %s\n", target_.name, NameOf(code).c_str());
    }

private:
    struct Alternative {
        std::size_t base;
        Witness witness;
    };

    std::vector<ErrorCode> missing() const {
        std::vector<ErrorCode> codes;
        for (const ErrorCode code : wanted_)
            if (found_.count(code) == 0)
                codes.push_back(code);
        return codes;
    }
    void look(std::size_t b, Spoils spoils) {
        const Base &base = bases_[b];
        const bool isLong = std::any_of(spoils.begin(), spoils.end(), [](const Spoil &spoil) {
            return spoil.action == "= 2147483647";
        });
        if (isLong && IsKept(target_.name, Oddity::TimeFollowsNumber))
            return;
        SpoiltRun run = RunSpoilt(*base.recipe, base.n, spoils);
        if (!run.applied)
            return;
        for (const ErrorCode code : std::set<ErrorCode>(run.codes.begin(), run.codes.end()))
            if (code != 0 && code != ErrOutOfMemory) {
                std::vector<Alternative> &all = found_[code];
                if (all.size() >= mostAlternatives)
                    continue;
                if (all.empty())
                    reduce(base, code, spoils);
                all.push_back({b, {base.recipe, base.n, code, 0, spoils}});
            }
    }
    // Removes spoils that are not needed to raise the code.
    static void reduce(const Base &base, ErrorCode code, Spoils &spoils) {
        for (std::size_t i = 0; i < spoils.size() && spoils.size() > 1;) {
            Spoils fewer = spoils;
            fewer.erase(fewer.begin() + static_cast<std::ptrdiff_t>(i));
            const SpoiltRun run = RunSpoilt(*base.recipe, base.n, fewer);
            if (run.applied && run.hasRaised(code))
                spoils = fewer;
            else
                ++i;
        }
    }
    static bool touchOne(const Spoils &a, const Spoils &b) {
        return std::any_of(a.begin(), a.end(), [&](const Spoil &one) {
            return std::any_of(b.begin(), b.end(),
                               [&](const Spoil &other) { return other.place == one.place; });
        });
    }
    void pair(ErrorCode first, ErrorCode later) {
        if (found_.count(first) == 0 || found_.count(later) == 0)
            return;
        const Witness *against = nullptr;
        Witness both;
        for (const Alternative &a : found_[first])
            for (const Alternative &b : found_[later]) {
                if (a.base != b.base || a.witness.spoils.empty() || b.witness.spoils.empty() ||
                    touchOne(a.witness.spoils, b.witness.spoils) ||
                    HasNewAddress(a.witness.spoils) || HasNewAddress(b.witness.spoils))
                    continue;
                Witness one = a.witness;
                one.later = later;
                one.spoils.insert(one.spoils.end(), b.witness.spoils.begin(),
                                  b.witness.spoils.end());
                const SpoiltRun run = RunSpoilt(*one.recipe, one.n, one.spoils);
                if (!run.applied || run.codes.empty())
                    continue;
                if (run.codes.front() == first) {
                    pairs_.push_back(one);
                    return;
                }
                if (run.codes.front() == later && against == nullptr) {
                    both = one;
                    against = &both;
                }
            }
        if (against != nullptr && !target_.hasInOrder(later, first))
            std::fprintf(stderr, "LATER WINS: %s\n", Written(*against).c_str());
    }

    const Interceptable &target_;
    std::vector<Base> bases_;
    std::vector<ErrorCode> wanted_;
    std::map<ErrorCode, std::vector<Alternative>> found_;
    std::vector<Witness> pairs_;
};

std::vector<Base> BasesOf(const Interceptable &target) {
    std::vector<Base> bases;
    std::vector<const Recipe *> recipes;
    for (const Recipe &recipe : AllRecipes())
        if (recipe.exportName() == target.name)
            recipes.push_back(&recipe);
    // The outer loop is over sizes, so that each recipe is tried early; size 8 comes first.
    std::set<int32_t> sizes;
    for (const Recipe *recipe : recipes)
        for (const int32_t n : recipe->sizes)
            if (n <= largestSize || n == recipe->sizes.front())
                sizes.insert(n);
    std::vector<int32_t> order(sizes.begin(), sizes.end());
    std::stable_sort(order.begin(), order.end(),
                     [](int32_t a, int32_t b) { return std::abs(a - 8) < std::abs(b - 8); });
    for (const int32_t n : order)
        for (const Recipe *recipe : recipes)
            if (bases.size() < mostBases &&
                std::count(recipe->sizes.begin(), recipe->sizes.end(), n) > 0)
                bases.push_back({recipe, n, RunSpoilt(*recipe, n, {}).places});
    return bases;
}

void SearchIn(const Interceptable &target) {
    alarm(secondsPerExport);
    Search search(target, BasesOf(target));
    Random random(1);
    if (onlyCode == 0) {
        search.singles();
        search.several(random);
    }
    search.wild();
    search.pairs();
    search.write();
    std::fflush(stdout);
    std::_Exit(0);
}

int Main(int count, char **words) {
    std::string only;
    for (int i = 2; i + 1 < count; i += 2) {
        if (std::string(words[i]) == "--only")
            only = words[i + 1];
        else if (std::string(words[i]) == "--tries")
            tries = std::atoi(words[i + 1]);
        else if (std::string(words[i]) == "--code")
            onlyCode = AllCodes().at(words[i + 1]);
        else
            return 2;
    }
    if (count < 2 || BindExports(words[1]) == nullptr)
        return 2;
    const rlimit memory = {rlim_t{2} << 30, rlim_t{2} << 30};
    setrlimit(RLIMIT_AS, &memory);
    for (const Interceptable &target : AllInterceptable()) {
        const bool hasRecipe =
            std::any_of(AllRecipes().begin(), AllRecipes().end(),
                        [&](const Recipe &recipe) { return recipe.exportName() == target.name; });
        if (!hasRecipe || target.codes.empty() || (!only.empty() && only != target.name))
            continue;
        // In a separate process: a call that crashes or does not return ends the search for one
        // export only.
        const pid_t child = fork();
        if (child == 0)
            SearchIn(target);
        int status = 0;
        waitpid(child, &status, 0);
        if (status != 0)
            std::fprintf(stderr, "ENDED: %s with %d\n", target.name, status);
    }
    return 0;
}

} // namespace

} // namespace qx::test

int main(int count, char **words) {
    const int status = qx::test::Main(count, words);
    if (status == 2)
        std::fprintf(stderr,
                     "usage: find_codes MODULE [--only EXPORT] [--tries N] [--code CODE]\n");
    return status;
}
