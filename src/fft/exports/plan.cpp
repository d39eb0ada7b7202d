#include "fft/plan.h"

FFTPlan *create_oxfft_table(int32_t length) { return qx::create_oxfft_table(length); }

void destroy_oxfft_table(FFTPlan *plan) { qx::destroy_oxfft_table(plan); }
