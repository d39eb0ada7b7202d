#include "measure/parabolas.h"

#include "frame/scratch.h"
#include "linalg/systems/least_squares.h"

#include <cstring>

namespace qx {

ErrorCode BuildFitMatrix(int32_t w, DBL *fitMatrix) {
    if (w == 3) {
        constexpr double exact[] = {0, 1, 0, -0.5, 0, 0.5, 0.5, -1, 0.5};
        std::memcpy(fitMatrix, exact, sizeof exact);
        return 0;
    }
    Scratch<ElementType::DBL> powers;
    if (const ErrorCode failed = powers.allocate(3 * int64_t{w}))
        return failed;
    for (int32_t i = 0; i < w; ++i) {
        const double t = -(w - 1.0) / 2 + i;
        DBL *const row = powers.data() + 3 * std::ptrdiff_t{i};
        row[0] = 1;
        row[1] = t;
        row[2] = t * t;
    }
    constexpr double defaultTolerance = -1;
    return PseudoInverseMatrix<ElementType::DBL>({powers.data(), w, 3}, defaultTolerance,
                                                 {fitMatrix, 3, w});
}

} // namespace qx
