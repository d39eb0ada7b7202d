#ifndef QX_SPECIAL_TABLES_GAMMA_PAIRS_H
#define QX_SPECIAL_TABLES_GAMMA_PAIRS_H

#include "frame/extended.h"

// Made by tools/approximations/gamma.py: numbers as a double and the rest.

namespace qx::table {

// 1 / gamma(x) on [1, 2] in powers of x - 3/2: 7.0e-31, with the coefficients after these:
inline constexpr Extended inverseGamma[] = {
    {0x1.20dd750429b6dp+0, 0x1.1ae3a914fed80p-56},
    {-0x1.514d3d90584b3p-5, -0x1.f217f14a98ef3p-59},
    {-0x1.0da5a671c048ap-1, -0x1.c2fd1a63503b0p-58},
    {0x1.669be41a93895p-3, -0x1.8930f86069ecfp-57},
    {0x1.a18540be32ca7p-5, 0x1.cd20ad673a0fdp-59},
    {-0x1.5955cc39724a3p-5, 0x1.c9214fd029a46p-59},
    {0x1.b16203e5e344dp-8, 0x1.a5e111d5887fbp-62},
    {0x1.15f7f060ff8c2p-9, 0x1.4566d5b28ed0dp-63},
    {-0x1.232bd878ffabep-10, -0x1.cc9805da6ad12p-64},
    {0x1.3f845ff3a6edbp-13, -0x1.9c0966f38fe6dp-67},
    {0x1.a963c6a36cac3p-16, 0x1.27c7b3a8f9b03p-71},
    {-0x1.d24ca6f39ac53p-17, 0x1.0457fc3565a84p-72},
    {0x1.216694b7d8eacp-19, 0x1.ac42aea39415ap-74},
    {0x1.f1b936cb1c16ap-25, -0x1.4c3331a65337cp-80},
    {-0x1.7ed587ef3220bp-24, 0x1.bbbcfbb287914p-79},
    {0x1.25d5da9f3fa36p-26, 0x1.b67a33cd3e61fp-80},
};

inline constexpr double inverseGammaRest[] = {
    -9.313686445239947e-10, -2.6804741033501147e-10, 7.458932233181524e-11,
    -8.012807061102783e-12, -8.382342381620075e-14, 1.6946340753306925e-13,
    -2.7875778332802698e-14, 1.867044488773798e-15, 1.3054183480085262e-16,
    -4.859964756331537e-17, 5.770014882688782e-18, -2.453449668925567e-19
};

} // namespace qx::table

#endif
