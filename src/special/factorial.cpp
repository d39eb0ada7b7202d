#include "special/factorial.h"

#include "frame/arithmetic.h"
#include "frame/constants.h"
#include "special/extended.h"
#include "special/gamma.h"

#include <array>
#include <cstddef>

namespace qx {

namespace {

constexpr int32_t kLastInTable = 33;
constexpr int32_t kLastProduct = 50;
constexpr int32_t kLastFinite = 170;

constexpr double kTable[] = {1.,
                             1.,
                             2.,
                             6.,
                             24.,
                             120.,
                             720.,
                             5040.,
                             40320.,
                             362880.,
                             3628800.,
                             39916800.,
                             479001600.,
                             6227020800.,
                             87178291200.,
                             1307674368000.,
                             20922789888000.,
                             355687428096000.,
                             6402373705728000.,
                             121645100408832000.,
                             2432902008176640000.,
                             51090942171709440000.,
                             1124000727777607680000.,
                             25852016738884976640000.,
                             620448401733239439360000.,
                             15511210043330985984000000.,
                             403291461126605635584000000.,
                             10888869450418352160768000000.,
                             304888344611713860501504000000.,
                             8841761993739701954543616000000.,
                             265252859812191058636308480000000.,
                             8222838654177922817725562880000000.,
                             263130836933693530167218012160000000.,
                             8683317618811886495518194401280000000.};
static_assert(sizeof kTable / sizeof kTable[0] == kLastInTable + 1);

// 33! minus its double; the sum of both is exact.
constexpr double kRestOfLast = 5.568025205059617e+20;

// A look-up takes a fifth of the time of the gamma function.
std::array<double, kLastFinite + 1> AllFinite() {
    const DefaultArithmetic arithmetic; // whatever modes the process has at that time
    std::array<double, kLastFinite + 1> values;
    Extended product = {kTable[kLastInTable], kRestOfLast};
    for (int32_t n = 0; n <= kLastFinite; ++n) {
        if (n > kLastInTable && n <= kLastProduct)
            product = product * Extended{static_cast<double>(n), 0};
        values[static_cast<std::size_t>(n)] = n <= kLastInTable   ? kTable[n]
                                              : n <= kLastProduct ? product.high
                                                                  : GammaFunction(n + 1.0);
    }
    return values;
}

// Computed when the module is loaded: a local static would cost the compiler's guard in each call.
const std::array<double, kLastFinite + 1> kValues = AllFinite();

} // namespace

double Factorial(int32_t n) {
    if (n < 0)
        return kNaN;
    return n <= kLastFinite ? kValues[static_cast<std::size_t>(n)] : kInfinity;
}

double LnFactorial(int32_t n) {
    if (n < 0)
        return kNaN;
    return n == 1 ? 0.0 : LnGammaFunction(n + 1.0);
}

} // namespace qx
