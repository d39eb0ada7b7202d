#ifndef QX_FILTERS_FILTER_BAND_H
#define QX_FILTERS_FILTER_BAND_H

#include <cstdint>

namespace qx {

enum FilterType : int32_t { Lowpass = 0, Highpass = 1, Bandpass = 2, Bandstop = 3 };

// Frequencies in the unit of the sampling rate fs. Lowpass and highpass filters have their cut-off
// in fl only.
struct FilterBand {
    double fs, fl, fh;
};

} // namespace qx

#endif
