#ifndef QX_BENCH_SPECIAL_ROWS_H
#define QX_BENCH_SPECIAL_ROWS_H

#include <string>
#include <utility>
#include <vector>

namespace qx::bench {

// One function of the comparison: time per call over random arguments of its ordinary range.
struct SpecialRow {
    typedef double (*Function)(double, double);

    std::string name;
    double firstLow, firstHigh;   // first argument, uniform
    double secondLow, secondHigh; // second argument; equal where there is none
    Function ours;
    std::vector<std::pair<const char *, Function>> peers;
    bool firstIsInteger = false;
    bool secondIsInteger = false;
};

// Each file of rows offers one of these; special.cpp runs all of them.
std::vector<SpecialRow> SpecialBesselRows();
std::vector<SpecialRow> SpecialGammaRows();
std::vector<SpecialRow> SpecialHypergeometricRows();
std::vector<SpecialRow> SpecialIntegralsRows();

} // namespace qx::bench

#endif
