// The same steps as in first_call.c with the C++ layer: arrays release their memory and a
// failure is an exception.

#include "qx/host.hpp"
#include "qx/qx.h"

#include <cstdio>

namespace {

double Moment(const qx::host::Array1D<double> &x, int32_t order) {
    double value;
    ErrorCode err;
    Moment_head(x.handle(), &order, &value, &err);
    qx::host::check(err);
    return value;
}

} // namespace

int main() {
    const qx::host::Array1D<double> x{2, 4, 4, 4, 5, 5, 7, 9};
    double mean;
    ErrorCode err;
    Mean_head(x.handle(), &mean, &err);
    qx::host::check(err);
    std::printf("mean      %g\nvariance  %g\nmodes    ", mean, Moment(x, 2));

    const qx::host::Array1D<double> modes;
    qx::host::check(ModeH(x.handle(), 0, modes.handle()));
    for (const double mode : modes)
        std::printf(" %g", mode);
    std::printf("\n");

    try {
        Moment(x, 0);
    } catch (const qx::host::Error &error) {
        std::printf("a moment of order 0: %s (%s, %d)\n", error.what(), error.name(),
                    static_cast<int>(error.code()));
    }
}
