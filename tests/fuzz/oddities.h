#ifndef QX_TESTS_FUZZ_ODDITIES_H
#define QX_TESTS_FUZZ_ODDITIES_H

#include "qx/errors.h"

#include <cstring>

namespace qx::test {

// Known deviations of exports from the rules that the fuzzer checks for all others.
enum class Oddity {
    OldContentStays,   // a success that leaves the old content in an output
    SizeBeyondBlock,   // an array whose size is set although the host refused the resize
    DependsOnState,    // a result that depends on earlier calls through a state of the process
    WorksInInput,      // an input that is also work memory, and may be an output as any input may
    RefusalPasses,     // a success with another result if the host or the heap refuses
    AlwaysFails,       // no call succeeds
    TimeFollowsNumber, // time that grows with a number by value, which therefore stays small here
};

struct KeptOddity {
    const char *name;
    Oddity oddity;
    const char *reason;
};

constexpr KeptOddity keptOddities[] = {
    {"Convolution", Oddity::OldContentStays, "with an algorithm that does not exist"},
    {"Rxy", Oddity::OldContentStays, "with an algorithm that does not exist"},
    {"Rxy80", Oddity::OldContentStays, "with an algorithm that does not exist"},
    {"AutoCorrelation", Oddity::SizeBeyondBlock, "the resize is not looked at"},
    {"AutoCorrelation80", Oddity::SizeBeyondBlock, "the resize is not looked at"},
    {"Deconvolution", Oddity::SizeBeyondBlock, "the resize is not looked at"},
    {"EqsSetByLUDri_head", Oddity::AlwaysFails, "by its contract"},
    {"CxEqsSetByLUDri_head", Oddity::AlwaysFails, "by its contract"},
    {"AutoCorrelation", Oddity::RefusalPasses, "the resize is not looked at"},
    {"AutoCorrelation80", Oddity::RefusalPasses, "the resize is not looked at"},
    {"InvDCT_1DH", Oddity::RefusalPasses, "its work memory is not looked at"},
    {"InvDCT_1DH_IDP", Oddity::RefusalPasses, "its work memory is not looked at"},
    {"ReComplexModulatorH", Oddity::OldContentStays, "where x is empty"},
    {"CxDZTH", Oddity::WorksInInput, "a longer one is folded in it"},
    {"CxDZTH_IDP", Oddity::WorksInInput, "a longer one is folded in it"},
    {"InvReOXFFTHCH", Oddity::WorksInInput, "it is left scaled"},
    {"InvReOXFFTHCH_IDP", Oddity::WorksInInput, "it is left scaled"},
    {"ReDZTH", Oddity::TimeFollowsNumber, "there are up to n transforms of any length"},
    {"ReDZTH_IDP", Oddity::TimeFollowsNumber, "there are up to n transforms of any length"},
    {"CxDZTH", Oddity::TimeFollowsNumber, "there are up to n transforms of any length"},
    {"CxDZTH_IDP", Oddity::TimeFollowsNumber, "there are up to n transforms of any length"},
    {"ChirpZT_head", Oddity::TimeFollowsNumber, "the direct sum has n count powers"},
    {"CxChirpZT_head", Oddity::TimeFollowsNumber, "the direct sum has n count powers"},
    {"SavitzkyGolayCoefH", Oddity::OldContentStays, "differentiators that are not wanted"},
    {"GenLinEqsbySVD2011_head", Oddity::TimeFollowsNumber, "refinements that do not settle"},
    {"PolyRootsNtBst_head", Oddity::TimeFollowsNumber, "iterations that do not settle"},
};

// Whether `status` is the code of one of the few exports that have one for an array that claims a
// negative size; the others treat such an array as empty.
inline bool IsCodeOfNegativeSize(const char *name, ErrorCode status) {
    return status == ErrNegativeDimension || status == ErrTableNegativeSize ||
           (status == ErrSizesDisagree && std::strcmp(name, "GenHistH") == 0);
}

inline bool IsKept(const char *name, Oddity oddity) {
    for (const KeptOddity &kept : keptOddities)
        if (std::strcmp(kept.name, name) == 0 && kept.oddity == oddity)
            return true;
    return false;
}

} // namespace qx::test

#endif
