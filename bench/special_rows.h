#ifndef QX_BENCH_SPECIAL_ROWS_H
#define QX_BENCH_SPECIAL_ROWS_H

#include <string>
#include <utility>
#include <vector>

namespace qx::bench {

// The name of the elder among the peers of a revision; it is not one of the other libraries.
inline constexpr char kElder[] = "elder";

// One function of the comparison, timed on random arguments in its usual range.
struct SpecialRow {
    typedef double (*Function)(double, double);

    std::string name;
    double firstLow, firstHigh;   // first argument, uniform
    double secondLow, secondHigh; // second argument; equal if there is none
    Function ours;
    std::vector<std::pair<const char *, Function>> peers;
    bool firstIsInteger = false;
    bool secondIsInteger = false;
};

typedef std::vector<std::pair<const char *, SpecialRow::Function>> Peers;

// Each file of rows defines one of these functions; special.cpp runs all of them.
std::vector<SpecialRow> SpecialBesselRows();
std::vector<SpecialRow> SpecialGammaRows();
std::vector<SpecialRow> SpecialHypergeometricRows();
std::vector<SpecialRow> SpecialIntegralsRows();

} // namespace qx::bench

#endif
