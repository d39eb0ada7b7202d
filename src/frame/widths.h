#ifndef QX_FRAME_WIDTHS_H
#define QX_FRAME_WIDTHS_H

// Routines over lanes exist once per width of the processor. A header declares such a routine with
// one line,
//
//     QX_BY_WIDTH(void, AddArrays, (const DBL *x, const DBL *y, DBL *sum, int32_t n))
//
// and a source in the LANES list of the family's CMakeLists.txt defines it in the namespace of the
// width that it is being compiled for:
//
//     namespace qx::QX_WIDTH {
//     void AddArrays(const DBL *x, const DBL *y, DBL *sum, int32_t n) { ... Lanes<nativeLanes> ... }
//     }
//
// Everybody calls qx::AddArrays(...).

#define QX_WIDTH baseline
#define QX_BY_WIDTH(result, name, parameters)                                                      \
    namespace baseline {                                                                           \
    result name parameters;                                                                        \
    }                                                                                              \
    using baseline::name;

#endif
