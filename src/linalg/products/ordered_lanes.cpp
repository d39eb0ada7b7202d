#include "linalg/products/ordered.h"

#include "frame/lanes.h"

namespace qx::QX_WIDTH {

namespace {

typedef Lanes<nativeLanes> L;

// A tile of c stays in registers through `depth` terms: 4 rows of 2 vectors, which leaves room for
// the operands among 16 registers. The part of b that it meets is packed beforehand, as wide as the
// tile and padded with zeros at the right edge. Rows are taken in bands whose part of a stays in
// the second cache.
constexpr std::ptrdiff_t tileRows = 4;
constexpr std::ptrdiff_t tileWidth = 2 * nativeLanes; // in doubles
constexpr std::ptrdiff_t depth = 64;
constexpr std::ptrdiff_t bandRows = 128;

struct Real {
    typedef DBL T;
    static constexpr std::ptrdiff_t parts = 1;
    struct Panel {
        DBL b[depth][tileWidth];
    };
    static void pack(Panel &panel, std::ptrdiff_t p, std::ptrdiff_t j, const T *b) {
        panel.b[p][j] = b == nullptr ? 0.0 : *b;
    }
    static L term(const T &a, const Panel &panel, std::ptrdiff_t p, std::ptrdiff_t at) {
        return L(a) * L::load(&panel.b[p][at]);
    }
};

// Beside b = (re, im) stands i b = (-im, re), so that a b is a.re b + a.im (i b) without a shuffle.
struct Complex {
    typedef CDB T;
    static constexpr std::ptrdiff_t parts = 2;
    struct Panel {
        DBL b[depth][tileWidth];
        DBL ib[depth][tileWidth];
    };
    static void pack(Panel &panel, std::ptrdiff_t p, std::ptrdiff_t j, const T *b) {
        const double re = b == nullptr ? 0.0 : b->re, im = b == nullptr ? 0.0 : b->im;
        panel.b[p][2 * j] = re;
        panel.b[p][2 * j + 1] = im;
        panel.ib[p][2 * j] = -im;
        panel.ib[p][2 * j + 1] = re;
    }
    static L term(const T &a, const Panel &panel, std::ptrdiff_t p, std::ptrdiff_t at) {
        return L(a.re) * L::load(&panel.b[p][at]) + L(a.im) * L::load(&panel.ib[p][at]);
    }
};

template <class Field, bool Subtract, std::ptrdiff_t Rows>
void UpdateTile(std::ptrdiff_t k, const typename Field::T *a, std::ptrdiff_t aStride,
                const typename Field::Panel &panel, DBL *c, std::ptrdiff_t cStride) {
    L sum[Rows][2];
    for (std::ptrdiff_t r = 0; r < Rows; ++r)
        for (std::ptrdiff_t v = 0; v < 2; ++v)
            sum[r][v] = L::load(c + r * cStride + v * nativeLanes);
    for (std::ptrdiff_t p = 0; p < k; ++p)
        for (std::ptrdiff_t r = 0; r < Rows; ++r)
            for (std::ptrdiff_t v = 0; v < 2; ++v) {
                const L term = Field::term(a[r * aStride + p], panel, p, v * nativeLanes);
                sum[r][v] = Subtract ? sum[r][v] - term : sum[r][v] + term;
            }
    for (std::ptrdiff_t r = 0; r < Rows; ++r)
        for (std::ptrdiff_t v = 0; v < 2; ++v)
            sum[r][v].store(c + r * cStride + v * nativeLanes);
}

// All rows of one tile's columns. At the right edge a full tile is computed aside.
template <class Field, bool Subtract>
void UpdateColumns(std::ptrdiff_t m, std::ptrdiff_t k, const typename Field::T *a,
                   std::ptrdiff_t aStride, const typename Field::Panel &panel, DBL *c,
                   std::ptrdiff_t cStride, std::ptrdiff_t width) {
    if (width == tileWidth) {
        std::ptrdiff_t i = 0;
        for (; i + tileRows <= m; i += tileRows)
            UpdateTile<Field, Subtract, tileRows>(k, a + i * aStride, aStride, panel,
                                                  c + i * cStride, cStride);
        for (; i < m; ++i)
            UpdateTile<Field, Subtract, 1>(k, a + i * aStride, aStride, panel, c + i * cStride,
                                           cStride);
        return;
    }
    for (std::ptrdiff_t i = 0; i < m; ++i) {
        DBL aside[tileWidth] = {};
        for (std::ptrdiff_t j = 0; j < width; ++j)
            aside[j] = c[i * cStride + j];
        UpdateTile<Field, Subtract, 1>(k, a + i * aStride, aStride, panel, aside, tileWidth);
        for (std::ptrdiff_t j = 0; j < width; ++j)
            c[i * cStride + j] = aside[j];
    }
}

template <class Field, bool Subtract>
void Update(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, const typename Field::T *a,
            std::ptrdiff_t aStride, const typename Field::T *b, std::ptrdiff_t bStride,
            typename Field::T *c, std::ptrdiff_t cStride) {
    constexpr std::ptrdiff_t tileCols = tileWidth / Field::parts;
    typename Field::Panel panel;
    for (std::ptrdiff_t p = 0; p < k; p += depth) {
        const std::ptrdiff_t terms = k - p < depth ? k - p : depth;
        for (std::ptrdiff_t i = 0; i < m; i += bandRows) {
            const std::ptrdiff_t rows = m - i < bandRows ? m - i : bandRows;
            for (std::ptrdiff_t j = 0; j < n; j += tileCols) {
                const std::ptrdiff_t cols = n - j < tileCols ? n - j : tileCols;
                for (std::ptrdiff_t q = 0; q < terms; ++q)
                    for (std::ptrdiff_t col = 0; col < tileCols; ++col)
                        Field::pack(panel, q, col,
                                    col < cols ? b + (p + q) * bStride + j + col : nullptr);
                UpdateColumns<Field, Subtract>(rows, terms, a + i * aStride + p, aStride, panel,
                                               reinterpret_cast<DBL *>(c + i * cStride + j),
                                               cStride * Field::parts, cols * Field::parts);
            }
        }
    }
}

} // namespace

void AddProductReal(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, const DBL *a,
                    std::ptrdiff_t aStride, const DBL *b, std::ptrdiff_t bStride, DBL *c,
                    std::ptrdiff_t cStride) {
    Update<Real, false>(m, n, k, a, aStride, b, bStride, c, cStride);
}
void SubtractProductReal(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, const DBL *a,
                         std::ptrdiff_t aStride, const DBL *b, std::ptrdiff_t bStride, DBL *c,
                         std::ptrdiff_t cStride) {
    Update<Real, true>(m, n, k, a, aStride, b, bStride, c, cStride);
}
void AddProductComplex(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, const CDB *a,
                       std::ptrdiff_t aStride, const CDB *b, std::ptrdiff_t bStride, CDB *c,
                       std::ptrdiff_t cStride) {
    Update<Complex, false>(m, n, k, a, aStride, b, bStride, c, cStride);
}
void SubtractProductComplex(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, const CDB *a,
                            std::ptrdiff_t aStride, const CDB *b, std::ptrdiff_t bStride, CDB *c,
                            std::ptrdiff_t cStride) {
    Update<Complex, true>(m, n, k, a, aStride, b, bStride, c, cStride);
}

} // namespace qx::QX_WIDTH
