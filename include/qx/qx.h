#ifndef QX_QX_H
#define QX_QX_H

/* Every export of the module. */

#include "qx/anova.h"
#include "qx/chirp_z.h"
#include "qx/convolution.h"
#include "qx/convolution_2d.h"
#include "qx/decimation.h"
#include "qx/distributions.h"
#include "qx/eigenproblems.h"
#include "qx/errors.h"
#include "qx/fft.h"
#include "qx/filtering.h"
#include "qx/frame.h"
#include "qx/linear_systems.h"
#include "qx/matrix_factorisations.h"
#include "qx/matrix_functions.h"
#include "qx/matrix_products.h"
#include "qx/matrix_properties.h"
#include "qx/noise.h"
#include "qx/polyphase.h"
#include "qx/rational_resampling.h"
#include "qx/resampling.h"
#include "qx/special.h"
#include "qx/special_matrices.h"
#include "qx/spectra.h"
#include "qx/stats.h"
#include "qx/transforms.h"
#include "qx/types.h"
#include "qx/waveforms.h"
#include "qx/windows.h"
#include "qx/zero_phase.h"

#endif
