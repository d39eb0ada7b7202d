#include "tests/codes/witnesses.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <set>

// Every export raises each code that it documents; if a call has two faults, it reports the code
// that comes first in the documentation. The calls are listed in witnesses.txt, which
// tools/find_codes writes, and in by_hand.txt. A code that only a test of the family raises, or
// that no test raises, has a line in without_witness.txt.

namespace qx::test {

namespace {

struct WithoutWitness {
    std::string export_;
    ErrorCode code;
    std::string reason;
};

std::vector<WithoutWitness> ReadExceptions() {
    std::vector<WithoutWitness> found;
    for (const std::string &line : LinesOf(QX_CODES "without_witness.txt")) {
        const std::vector<std::string> fields = FieldsOf(line);
        if (fields.size() != 3 || fields[2].empty() || AllCodes().count(fields[1]) == 0)
            throw std::invalid_argument("not an export, a code and a reason: " + line);
        found.push_back({fields[0], AllCodes().at(fields[1]), fields[2]});
    }
    return found;
}

// The results of running the witnesses, which happens once for all tests.
class Codes : public testing::Test {
protected:
    static void SetUpTestSuite() {
        ASSERT_NE(BindExports(QX_MODULE), nullptr) << QX_MODULE;
        std::vector<std::string> lines = LinesOf(QX_CODES "witnesses.txt");
        const std::vector<std::string> byHand = LinesOf(QX_CODES "by_hand.txt");
        lines.insert(lines.end(), byHand.begin(), byHand.end());
        for (const std::string &line : lines) {
            const Witness witness = ReadWitness(line);
            const SpoiltRun run = RunSpoilt(*witness.recipe, witness.n, witness.spoils);
            const std::string name = witness.recipe->exportName();
            raised[name].insert(run.codes.begin(), run.codes.end());
            const bool raises = witness.later == 0
                                    ? run.hasRaised(witness.code)
                                    : !run.codes.empty() && run.codes.front() == witness.code;
            if (!run.applied || !raises)
                wrong += "\n" + line + ": gives " +
                         (run.codes.empty() ? "nothing" : std::to_string(run.codes.front()));
            if (witness.later == 0)
                witnessed[name].insert(witness.code);
            else if (!ExportOf(name)->hasInOrder(witness.code, witness.later))
                wrong += "\n" + line + ": the documentation lists them in another order";
        }
    }

    static std::string wrong;
    static std::map<std::string, std::set<ErrorCode>> witnessed, raised;
};
std::string Codes::wrong;
std::map<std::string, std::set<ErrorCode>> Codes::witnessed, Codes::raised;

TEST_F(Codes, AreRaisedAsTheWitnessesSayAndInTheOrderOfTheDocumentation) { EXPECT_EQ(wrong, ""); }

// Out-of-memory codes and refused resizes are covered by the conformance tests; exports without a
// recipe have their own tests.
TEST_F(Codes, AreEachWitnessedOrListedWithAReason) {
    std::map<std::string, std::set<ErrorCode>> exceptions;
    for (const WithoutWitness &one : ReadExceptions())
        exceptions[one.export_].insert(one.code);
    std::set<std::string> exempt;
    for (const Exempt &one : ExemptExports())
        exempt.insert(one.name);
    for (const Interceptable &target : AllInterceptable()) {
        if (exempt.count(target.name) != 0)
            continue;
        for (const ErrorCode code : target.codes)
            if (code != ErrOutOfMemory) {
                EXPECT_EQ(witnessed[target.name].count(code) + exceptions[target.name].count(code),
                          1U)
                    << target.name << " | " << NameOf(code)
                    << ": a witness is needed (tools/find_codes), or a reason in "
                       "without_witness.txt";
            }
    }
}

// A reason "raised in FILE, TEST" names a test that exists.
TEST_F(Codes, WithoutWitnessNameExistingTests) {
    const std::string head = "raised in ";
    for (const WithoutWitness &one : ReadExceptions()) {
        if (!one.reason.starts_with(head))
            continue;
        const std::size_t comma = one.reason.find(", ");
        ASSERT_NE(comma, std::string::npos) << one.reason;
        const std::string test = one.reason.substr(comma + 2);
        const std::size_t dot = test.find('.');
        const std::string words = "(" + test.substr(0, dot) + ", " + test.substr(dot + 1) + ")";
        bool isThere = false;
        for (const std::string &line :
             LinesOf(QX_ROOT "/" + one.reason.substr(head.size(), comma - head.size())))
            isThere |= line.find(words) != std::string::npos;
        EXPECT_TRUE(isThere) << one.export_ << ": " << one.reason;
    }
}

TEST_F(Codes, WithoutWitnessAreDocumentedAndNotRaised) {
    for (const WithoutWitness &one : ReadExceptions()) {
        const Interceptable *target = ExportOf(one.export_);
        ASSERT_NE(target, nullptr) << one.export_;
        EXPECT_NE(std::find(target->codes.begin(), target->codes.end(), one.code),
                  target->codes.end())
            << one.export_ << " does not document " << NameOf(one.code);
        EXPECT_EQ(raised[one.export_].count(one.code), 0U)
            << one.export_ << " raises " << NameOf(one.code);
    }
}

// ---- NaN ----

// What the calls of an export's recipes do with a NaN among the elements of each input array, or in
// place of a number: the outcomes of each place, in the order in which a header lists them.
class NaNs {
public:
    explicit NaNs(const Interceptable &target) : target_(target) {}

    // At the largest sizes up to 8 and up to 50: some exports give no result for few samples.
    void look(const Recipe &recipe) {
        std::set<int32_t> sizes;
        for (const int32_t limit : {8, 50}) {
            int32_t largest = recipe.sizes.front();
            for (const int32_t size : recipe.sizes)
                largest = size <= limit ? std::max(largest, size) : largest;
            sizes.insert(largest);
        }
        for (const int32_t size : sizes)
            look(recipe, size);
    }

    // An array in a record that is read and written counts as an output if a NaN in it has no
    // effect.
    std::map<std::string, std::string> words() const {
        std::map<std::string, std::string> found;
        for (const auto &[place, outcomes] : seen_)
            if (mayBeOutputs_.count(place) == 0 || outcomes != std::set<Outcome>{unseen})
                found[place] = wordsOf(outcomes);
        return found;
    }

private:
    typedef std::pair<int, std::string> Outcome;
    static inline const Outcome unseen = {1002, "in no result"};

    void look(const Recipe &recipe, int32_t n) {
        const SpoiltRun as = RunSpoilt(recipe, n, {});
        for (const SpoilPlace &place : as.places) {
            const InterceptedArgument &argument = argumentOf(place);
            if (argument.isOutput || !mayBeNaN(place))
                continue;
            if (!argument.isInput && place.dimensions > 0 && isField(place))
                mayBeOutputs_.insert(place.name);
            int64_t count = 1;
            for (const int32_t size : place.sizes)
                count *= size;
            for (const int64_t at : positions(count)) {
                const std::string action =
                    place.dimensions == 0 ? "= nan" : "at " + std::to_string(at) + " nan";
                const SpoiltRun run = RunSpoilt(recipe, n, {{place.name, action}});
                if (run.applied)
                    seen_[place.name].insert(outcome(as, run));
            }
        }
    }

    // The first, the middle and the last element, and others evenly between them.
    static std::set<int64_t> positions(int64_t count) {
        constexpr int64_t steps = 32;
        std::set<int64_t> found = {0, count / 2, count - 1};
        for (int64_t i = 1; i < steps; ++i)
            found.insert(i * (count - 1) / steps);
        return found;
    }

    static std::string wordsOf(const std::set<Outcome> &outcomes) {
        std::string words;
        for (const auto &[order, word] : outcomes)
            words += (words.empty() ? "" : " or ") + word;
        return words;
    }
    const InterceptedArgument &argumentOf(const SpoilPlace &place) const {
        const std::string name = place.name.substr(0, place.name.find('.'));
        return *std::find_if(target_.arguments.begin(), target_.arguments.end(),
                             [&](const InterceptedArgument &one) { return one.name == name; });
    }
    static bool isField(const SpoilPlace &place) {
        return place.name.find('.') != std::string::npos;
    }
    static bool mayBeNaN(const SpoilPlace &place) {
        const std::string &e = place.element;
        return e == "DBL" || e == "SGL" || e == "CDB" || e == "CSG";
    }
    Outcome outcome(const SpoiltRun &as, const SpoiltRun &run) const {
        for (const ErrorCode code : run.codes)
            if (code < 0) {
                const auto at = std::find(target_.codes.begin(), target_.codes.end(), code);
                return {static_cast<int>(at - target_.codes.begin()),
                        "refused with " + NameOf(code)};
            }
        const auto count = [](const SpoiltRun &of) {
            return std::count_if(of.numbers.begin(), of.numbers.end(),
                                 [](double number) { return number != number; });
        };
        const auto nans = count(run);
        if (nans <= count(as))
            return unseen;
        return nans == static_cast<std::ptrdiff_t>(run.numbers.size())
                   ? Outcome{1000, "in all results"}
                   : Outcome{1001, "in some results"};
    }

    const Interceptable &target_;
    std::map<std::string, std::set<Outcome>> seen_;
    std::set<std::string> mayBeOutputs_;
};

// What a call shows of the effect that a header describes: these words say why no result is NaN.
std::string SeenOf(std::string words) {
    for (const std::string reason : {"skipped", "by position (kept)"})
        if (const std::size_t at = words.find(reason); at != std::string::npos)
            words.replace(at, reason.size(), "in no result");
    return words;
}

// The sentence as it appears in a header, with places of the same outcome joined.
std::string SentenceOf(const Interceptable &target, std::map<std::string, std::string> words) {
    std::string sentence;
    for (const InterceptedArgument &argument : target.arguments)
        for (auto first = words.begin(); first != words.end();) {
            if (first->first.substr(0, first->first.find('.')) != argument.name) {
                ++first;
                continue;
            }
            const std::string word = first->second;
            std::string places;
            for (const InterceptedArgument &other : target.arguments)
                for (auto at = words.begin(); at != words.end();)
                    if (at->second == word &&
                        at->first.substr(0, at->first.find('.')) == other.name) {
                        places += (places.empty() ? "" : ", ") + at->first;
                        at = words.erase(at);
                    } else {
                        ++at;
                    }
            sentence += (sentence.empty() ? "NaN: " : "; ") + places + " " + word;
            first = words.begin();
        }
    return sentence + ".";
}

TEST(NaN, DoesInEachInputWhatItsHeaderSays) {
    ASSERT_NE(BindExports(QX_MODULE), nullptr) << QX_MODULE;
    std::map<std::string, std::vector<const Recipe *>> recipes;
    for (const Recipe &recipe : AllRecipes())
        recipes[recipe.exportName()].push_back(&recipe);
    for (const Interceptable &target : AllInterceptable()) {
        NaNs nans(target);
        for (const Recipe *recipe : recipes[target.name])
            nans.look(*recipe);
        std::map<std::string, std::string> told;
        for (const EffectOfNaN &effect : target.nan)
            told[effect.place] = SeenOf(effect.words);
        if (nans.words() != told) {
            ADD_FAILURE() << target.name << ": according to its recipes, \""
                          << SentenceOf(target, nans.words()) << "\"";
        }
    }
}

} // namespace

} // namespace qx::test
