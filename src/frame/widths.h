#ifndef QX_FRAME_WIDTHS_H
#define QX_FRAME_WIDTHS_H

#include <cstdint>

// Routines over lanes exist once per width of the processor. A header declares such a routine with
// one line,
//
//     QX_BY_WIDTH(void, AddArrays, (const DBL *x, const DBL *y, DBL *sum, int32_t n))
//
// and a source in the LANES list of the family's CMakeLists.txt, which is compiled for each width,
// defines it in the namespace of the width:
//
//     namespace qx::QX_WIDTH {
//     void AddArrays(const DBL *x, const DBL *y, DBL *sum, int32_t n) { ... Lanes<nativeLanes> ...
//     }
//     }
//
// QX_BY_WIDTH_TO_8 in place of QX_BY_WIDTH, and WIDE_LANES in place of LANES, are for routines that
// gain from eight lanes; the others run with four lanes there.
//
// Callers write qx::AddArrays(...), which costs one well-predicted branch more than a plain
// function. It is an object: it has no overloads, no default arguments and no function address.
// Routines of one width call each other directly, because name look-up finds their own namespace
// first.
//
// Whatever a LANES source needs from elsewhere must be a function that is neither a template nor
// inline, or be in the namespace of the width, as Lanes is: of an inline function that several
// widths share, the linker might keep the one compiled for the wider width.

#ifndef QX_WIDTH
#define QX_WIDTH baseline
#endif

// Where there are routines of eight lanes (cmake/QxFamily.cmake has the same condition). Not on
// Windows: g++ keeps 64-byte vectors on the stack with aligned stores but does not align the stack
// for them there (GCC bug 54412). Not on 32-bit x86, which has eight registers in place of 32.
// A build with QX_ONE_WIDTH has two lanes only.
#if defined(__x86_64__) && !defined(_WIN32) && !defined(QX_ONE_WIDTH)
#define QX_HAS_EIGHT_LANES
#endif

namespace qx {

// The number of lanes of the routines that are called, 2, 4 or 8: the largest that the processor,
// the operating system and the build support. QX_WIDTH=2 or QX_WIDTH=4 in the environment forces a
// smaller one. It is set when the module is loaded, before static initialisers; code that runs even
// earlier sees 2. On ARM it is always 2.
extern int32_t lanesInUse;

#if (defined(__x86_64__) || defined(__i386__)) && !defined(QX_ONE_WIDTH)
#define QX_HAS_AVX2_BUILD 1

template <auto Baseline, auto Avx2>
struct ByWidth;
template <class Result, class... Arguments, Result (*Baseline)(Arguments...),
          Result (*Avx2)(Arguments...)>
struct ByWidth<Baseline, Avx2> {
    __attribute__((always_inline)) Result operator()(Arguments... arguments) const {
        return lanesInUse >= 4 ? Avx2(arguments...) : Baseline(arguments...);
    }
};

template <auto Baseline, auto Avx2, auto Avx512>
struct ByWidthTo8;
template <class Result, class... Arguments, Result (*Baseline)(Arguments...),
          Result (*Avx2)(Arguments...), Result (*Avx512)(Arguments...)>
struct ByWidthTo8<Baseline, Avx2, Avx512> {
    __attribute__((always_inline)) Result operator()(Arguments... arguments) const {
        return lanesInUse == 8   ? Avx512(arguments...)
               : lanesInUse == 4 ? Avx2(arguments...)
                                 : Baseline(arguments...);
    }
};

#define QX_BY_WIDTH(result, name, parameters)                                                      \
    namespace baseline {                                                                           \
    result name parameters;                                                                        \
    }                                                                                              \
    namespace avx2 {                                                                               \
    result name parameters;                                                                        \
    }                                                                                              \
    constexpr ByWidth<baseline::name, avx2::name> name{};

#ifdef QX_HAS_EIGHT_LANES
#define QX_BY_WIDTH_TO_8(result, name, parameters)                                                 \
    namespace baseline {                                                                           \
    result name parameters;                                                                        \
    }                                                                                              \
    namespace avx2 {                                                                               \
    result name parameters;                                                                        \
    }                                                                                              \
    namespace avx512 {                                                                             \
    result name parameters;                                                                        \
    }                                                                                              \
    constexpr ByWidthTo8<baseline::name, avx2::name, avx512::name> name{};
#else
#define QX_BY_WIDTH_TO_8(result, name, parameters) QX_BY_WIDTH(result, name, parameters)
#endif

#else

template <auto Baseline>
struct OfOneWidth;
template <class Result, class... Arguments, Result (*Baseline)(Arguments...)>
struct OfOneWidth<Baseline> {
    __attribute__((always_inline)) Result operator()(Arguments... arguments) const {
        return Baseline(arguments...);
    }
};

#define QX_BY_WIDTH(result, name, parameters)                                                      \
    namespace baseline {                                                                           \
    result name parameters;                                                                        \
    }                                                                                              \
    constexpr OfOneWidth<baseline::name> name{};
#define QX_BY_WIDTH_TO_8(result, name, parameters) QX_BY_WIDTH(result, name, parameters)

#endif

} // namespace qx

#endif
