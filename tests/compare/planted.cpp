#include "tests/compare/trampolines.h"

#include "qx/basic_statistics.h"
#include "qx/convolution.h"
#include "qx/dct_dst.h"
#include "qx/errors.h"

#include <cmath>
#include <csignal>
#include <cstdlib>
#include <dlfcn.h>
#include <limits>

// A module that forwards every call to another module, named by the environment, except for a few
// exports in which a small difference is planted.

// Defined by the host, in the program that loads the module.
extern "C" int32_t HostBlockReshape(int32_t typeCode, int32_t numDims, void *handleAddress,
                                    int32_t count);

namespace {

void *original = nullptr;

__attribute__((constructor)) void Load() {
    original = qx::test::BindExports(std::getenv("QX_ORIGINAL_MODULE"));
    if (original == nullptr)
        std::abort();
}

template <class Function>
Function *Original(Function *, const char *name) {
    return reinterpret_cast<Function *>(dlsym(original, name));
}

} // namespace

// The last bit of some results.
int32_t RMS_head(DBL1D x, DBL *rms, ErrorCode *err) {
    const int32_t result = Original(RMS_head, "RMS_head")(x, rms, err);
    if ((*x)->dimSize == 8)
        *rms = std::nextafter(*rms, std::numeric_limits<double>::infinity());
    return result;
}

// Another code.
int32_t Mean_head(DBL1D x, DBL *mean, ErrorCode *err) {
    const int32_t result = Original(Mean_head, "Mean_head")(x, mean, err);
    if ((*x)->dimSize == 8)
        *err = ErrOutOfMemory;
    return result;
}

// One resize too many.
int32_t Convolution(DBL1D x, DBL1D y, DBL1D out, const int32_t *algorithm, ErrorCode *err) {
    if ((*x)->dimSize == 2)
        HostBlockReshape(QXTypeDBL, 1, &out, 1);
    return Original(Convolution, "Convolution")(x, y, out, algorithm, err);
}

// A size that is too small.
ErrorCode DCT_1DH(DBL1D in, DBL1D out, int32_t size, PlanSlot *slot) {
    const ErrorCode code = Original(DCT_1DH, "DCT_1DH")(in, out, size, slot);
    if ((*out)->dimSize > 0)
        --(*out)->dimSize;
    return code;
}

// A crash.
ErrorCode CxRMS_head(CDB1D z, DBL *rms) {
    if ((*z)->dimSize == 3)
        std::raise(SIGSEGV);
    return Original(CxRMS_head, "CxRMS_head")(z, rms);
}

// A call that does not return.
int32_t MSE_head(DBL1D x, DBL1D y, DBL *mse, ErrorCode *err) {
    for (volatile bool forever = (*x)->dimSize == 3; forever;) {
    }
    return Original(MSE_head, "MSE_head")(x, y, mse, err);
}
