#include "linalg/products/ordered.h"

#include "frame/lanes.h"
#include "linalg/products/panel_memory.h"

namespace qx::QX_WIDTH {

namespace {

typedef Lanes<nativeLanes> L;

// A tile of c, some rows of two vectors, stays in registers through `depth` terms. The part of b
// that it meets is packed into panels as wide as the tile, padded with zeros at the right edge, the
// part of a into slivers as high as the tile. A panel stays in the first cache, a block of slivers
// in the second, a block of panels in the third.
constexpr std::ptrdiff_t depth = 256;
constexpr std::ptrdiff_t blockRows = 96;
constexpr std::ptrdiff_t blockCols = 2048;
// Of small products only the panels are packed, on the stack.
constexpr std::ptrdiff_t smallDepth = 64;
constexpr std::ptrdiff_t smallBand = 128;
constexpr std::ptrdiff_t smallProduct = 40 * 40 * 40;

// What happens to an element of a on its way: none of it where it has been packed.
enum class Sign { plus, minus, scaled };
struct Packed {
    static constexpr Sign sign = Sign::plus;
    static constexpr bool isConjugated = false;
};
template <Sign S, bool Conjugated>
struct Taken {
    static constexpr Sign sign = S;
    static constexpr bool isConjugated = Conjugated;
};

struct Real {
    typedef DBL T;
    typedef RealOperand Operand;
    typedef RealFactor Factor;
    static constexpr std::ptrdiff_t parts = 1;
    static constexpr std::ptrdiff_t tileRows = 4;
    static constexpr std::ptrdiff_t tileCols = 2 * nativeLanes;

    static Sign signOf(Factor f) {
        return f.value == 1.0 ? Sign::plus : f.value == -1.0 ? Sign::minus : Sign::scaled;
    }
    // Term q of `height` rows of an operand goes to to[q height] and on.
    static void packSliver(const Operand &a, std::ptrdiff_t height, std::ptrdiff_t k, DBL *to) {
        std::ptrdiff_t r = 0;
        if (a.across == 1)
            for (; r + 2 <= height; r += 2)
                interleave(a.data + r * a.down, a.down, k, to + r, height);
        else if (a.down == 1)
            for (; r + 2 <= height; r += 2)
                for (std::ptrdiff_t q = 0; q < k; ++q)
                    Lanes<2>::load(a.data + r + q * a.across).store(to + q * height + r);
        for (; r < height; ++r)
            for (std::ptrdiff_t q = 0; q < k; ++q)
                to[q * height + r] = a.data[r * a.down + q * a.across];
    }
    static void scale(DBL *x, std::ptrdiff_t count, Factor factor) {
        for (std::ptrdiff_t i = 0; i < count; ++i)
            x[i] = factor.value * x[i];
    }
    // The same of the columns of an operand, with zeros after them.
    static void packPanel(const Operand &b, std::ptrdiff_t cols, std::ptrdiff_t k, DBL *to) {
        if (cols == tileCols)
            return packSliver({b.data, b.across, b.down}, tileCols, k, to);
        for (std::ptrdiff_t q = 0; q < k; ++q)
            for (std::ptrdiff_t j = 0; j < tileCols; ++j)
                to[q * tileCols + j] = j < cols ? b.data[q * b.down + j * b.across] : 0.0;
    }

    // The first k elements of two rows, by turns.
    static void interleave(const DBL *x, std::ptrdiff_t down, std::ptrdiff_t k, DBL *to,
                           std::ptrdiff_t height) {
        std::ptrdiff_t q = 0;
        for (; q + 2 <= k; q += 2) {
            const Lanes<2> upper = Lanes<2>::load(x + q), lower = Lanes<2>::load(x + down + q);
            TurnsLow(upper, lower).store(to + q * height);
            TurnsHigh(upper, lower).store(to + (q + 1) * height);
        }
        for (; q < k; ++q) {
            to[q * height] = x[q];
            to[q * height + 1] = x[down + q];
        }
    }

    // The sums of one row of the tile.
    struct Sums {
        QX_INLINE void load(const DBL *c) {
            x = L::load(c);
            y = L::load(c + nativeLanes);
        }
        QX_INLINE void store(DBL *c) const {
            x.store(c);
            y.store(c + nativeLanes);
        }
        template <class How>
        QX_INLINE void add(const DBL *a, Factor factor, L bx, L by) {
            const L value(How::sign == Sign::scaled ? factor.value * *a : *a);
            if constexpr (How::sign == Sign::minus) {
                x = x - value * bx;
                y = y - value * by;
            } else {
                x = x + value * bx;
                y = y + value * by;
            }
        }
        L x, y;
    };
};

// The panel has the real parts of a row, then the imaginary parts, and so have the sums.
struct Complex {
    typedef CDB T;
    typedef ComplexOperand Operand;
    typedef ComplexFactor Factor;
    static constexpr std::ptrdiff_t parts = 2;
    static constexpr std::ptrdiff_t tileRows = 4;
    static constexpr std::ptrdiff_t tileCols = nativeLanes;

    static Sign signOf(Factor f) { return f.im != 0.0 ? Sign::scaled : Real::signOf({f.re}); }
    static void packSliver(const Operand &a, std::ptrdiff_t height, std::ptrdiff_t k, DBL *to) {
        const Lanes<2> sign(Lanes<2>::Vector{1.0, a.isConjugated ? -1.0 : 1.0});
        for (std::ptrdiff_t r = 0; r < height; ++r)
            for (std::ptrdiff_t q = 0; q < k; ++q)
                (at(a, r, q) * sign).store(to + 2 * (q * height + r));
    }
    static void scale(DBL *x, std::ptrdiff_t count, Factor factor) {
        for (std::ptrdiff_t i = 0; i < count; i += 2) {
            const double re = x[i], im = x[i + 1];
            x[i] = factor.re * re - factor.im * im;
            x[i + 1] = factor.re * im + factor.im * re;
        }
    }
    static void packPanel(const Operand &b, std::ptrdiff_t cols, std::ptrdiff_t k, DBL *to) {
        const Lanes<2> sign(b.isConjugated ? -1.0 : 1.0), none(0.0);
        for (std::ptrdiff_t j = 0; j < tileCols; j += 2)
            for (std::ptrdiff_t q = 0; q < k; ++q) {
                const Lanes<2> left = j < cols ? at(b, q, j) : none;
                const Lanes<2> right = j + 1 < cols ? at(b, q, j + 1) : none;
                TurnsLow(left, right).store(to + q * 2 * tileCols + j);
                (TurnsHigh(left, right) * sign).store(to + (q * 2 + 1) * tileCols + j);
            }
    }

    // Element (i, j) as two doubles.
    static QX_INLINE Lanes<2> at(const Operand &a, std::ptrdiff_t i, std::ptrdiff_t j) {
        return Lanes<2>::load(reinterpret_cast<const DBL *>(a.data + i * a.down + j * a.across));
    }

    struct Sums {
        QX_INLINE void load(const DBL *c) {
            const L first = L::load(c), second = L::load(c + nativeLanes);
            re = Evens(first, second);
            im = Odds(first, second);
        }
        QX_INLINE void store(DBL *c) const {
            TurnsLow(re, im).store(c);
            TurnsHigh(re, im).store(c + nativeLanes);
        }
        template <class How>
        QX_INLINE void add(const DBL *a, Factor factor, L bRe, L bIm) {
            double x = a[0], y = How::isConjugated ? -a[1] : a[1];
            if constexpr (How::sign == Sign::scaled) {
                const double scaled = factor.re * x - factor.im * y;
                y = factor.re * y + factor.im * x;
                x = scaled;
            }
            const L vx(x), vy(y);
            const L termRe = vx * bRe - vy * bIm, termIm = vx * bIm + vy * bRe;
            re = How::sign == Sign::minus ? re - termRe : re + termRe;
            im = How::sign == Sign::minus ? im - termIm : im + termIm;
        }
        L re, im;
    };
};

// Where a tile finds its elements of a, in doubles.
struct Place {
    const DBL *data;
    std::ptrdiff_t down, across;
};

template <class Field, class How, std::ptrdiff_t Rows>
QX_INLINE void AddToTile(std::ptrdiff_t k, typename Field::Factor factor, const Place &a,
                         const DBL *panel, DBL *c, std::ptrdiff_t cStride) {
    typename Field::Sums sums[Rows];
    for (std::ptrdiff_t r = 0; r < Rows; ++r)
        sums[r].load(c + r * cStride);
    const DBL *at = a.data;
    for (std::ptrdiff_t p = 0; p < k; ++p) {
        const L first = L::load(panel), second = L::load(panel + nativeLanes);
        for (std::ptrdiff_t r = 0; r < Rows; ++r)
            sums[r].template add<How>(at + r * a.down, factor, first, second);
        panel += 2 * nativeLanes;
        at += a.across;
    }
    for (std::ptrdiff_t r = 0; r < Rows; ++r)
        sums[r].store(c + r * cStride);
}

// At the right edge a full tile is computed aside.
template <class Field, class How, std::ptrdiff_t Rows>
void AddToEdge(std::ptrdiff_t k, typename Field::Factor factor, const Place &a, const DBL *panel,
               DBL *c, std::ptrdiff_t cStride, std::ptrdiff_t width) {
    DBL aside[Rows * 2 * nativeLanes] = {};
    for (std::ptrdiff_t r = 0; r < Rows; ++r)
        for (std::ptrdiff_t j = 0; j < width; ++j)
            aside[r * 2 * nativeLanes + j] = c[r * cStride + j];
    AddToTile<Field, How, Rows>(k, factor, a, panel, aside, 2 * nativeLanes);
    for (std::ptrdiff_t r = 0; r < Rows; ++r)
        for (std::ptrdiff_t j = 0; j < width; ++j)
            c[r * cStride + j] = aside[r * 2 * nativeLanes + j];
}

// `width` doubles of each of the rows.
template <class Field, class How, std::ptrdiff_t Rows>
QX_INLINE void AddToRows(std::ptrdiff_t k, typename Field::Factor factor, const Place &a,
                         const DBL *panel, DBL *c, std::ptrdiff_t cStride, std::ptrdiff_t width) {
    if (width == 2 * nativeLanes)
        AddToTile<Field, How, Rows>(k, factor, a, panel, c, cStride);
    else
        AddToEdge<Field, How, Rows>(k, factor, a, panel, c, cStride, width);
}

// An operand without its first rows and columns.
template <class Operand>
Operand From(Operand a, std::ptrdiff_t row, std::ptrdiff_t col) {
    a.data += row * a.down + col * a.across;
    return a;
}

template <class Field, class How>
void AddSmall(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, typename Field::Factor factor,
              const typename Field::Operand &a, const typename Field::Operand &b, DBL *c,
              std::ptrdiff_t cStride) {
    constexpr std::ptrdiff_t parts = Field::parts;
    DBL panel[smallDepth * 2 * nativeLanes];
    for (std::ptrdiff_t p = 0; p < k; p += smallDepth) {
        const std::ptrdiff_t terms = k - p < smallDepth ? k - p : smallDepth;
        for (std::ptrdiff_t top = 0; top < m; top += smallBand) {
            const std::ptrdiff_t bottom = m - top < smallBand ? m : top + smallBand;
            for (std::ptrdiff_t j = 0; j < n; j += Field::tileCols) {
                const std::ptrdiff_t cols = n - j < Field::tileCols ? n - j : Field::tileCols;
                Field::packPanel(From(b, p, j), cols, terms, panel);
                std::ptrdiff_t i = top;
                Place place = {reinterpret_cast<const DBL *>(a.data + i * a.down + p * a.across),
                               a.down * parts, a.across * parts};
                DBL *row = c + i * cStride + j * parts;
                for (; i + Field::tileRows <= bottom; i += Field::tileRows) {
                    AddToRows<Field, How, Field::tileRows>(terms, factor, place, panel, row,
                                                           cStride, cols * parts);
                    place.data += Field::tileRows * place.down;
                    row += Field::tileRows * cStride;
                }
                for (; i < bottom; ++i) {
                    AddToRows<Field, How, 1>(terms, factor, place, panel, row, cStride,
                                             cols * parts);
                    place.data += place.down;
                    row += cStride;
                }
            }
        }
    }
}

template <class Field, bool Conjugated>
void AddSmallAs(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, Sign sign,
                typename Field::Factor factor, const typename Field::Operand &a,
                const typename Field::Operand &b, DBL *c, std::ptrdiff_t cStride) {
    if (sign == Sign::plus)
        AddSmall<Field, Taken<Sign::plus, Conjugated>>(m, n, k, factor, a, b, c, cStride);
    else if (sign == Sign::minus)
        AddSmall<Field, Taken<Sign::minus, Conjugated>>(m, n, k, factor, a, b, c, cStride);
    else
        AddSmall<Field, Taken<Sign::scaled, Conjugated>>(m, n, k, factor, a, b, c, cStride);
}

// The slivers of the first rows and terms of a, each with one term after the other.
template <class Field>
void PackSlivers(const typename Field::Operand &a, std::ptrdiff_t rows, std::ptrdiff_t k, Sign sign,
                 typename Field::Factor factor, DBL *to) {
    const std::ptrdiff_t count = rows * k * Field::parts;
    DBL *sliver = to;
    for (std::ptrdiff_t i = 0; i < rows; i += Field::tileRows) {
        const std::ptrdiff_t height = rows - i < Field::tileRows ? rows - i : Field::tileRows;
        Field::packSliver(From(a, i, 0), height, k, sliver);
        sliver += height * k * Field::parts;
    }
    if (sign == Sign::minus)
        Real::scale(to, count, {-1.0});
    else if (sign == Sign::scaled)
        Field::scale(to, count, factor);
}

// All rows of a block of slivers with one panel.
template <class Field>
void AddPanel(std::ptrdiff_t rows, std::ptrdiff_t k, const DBL *slivers, const DBL *panel, DBL *c,
              std::ptrdiff_t cStride, std::ptrdiff_t width) {
    constexpr std::ptrdiff_t tileRows = Field::tileRows, parts = Field::parts;
    constexpr auto add = []<std::ptrdiff_t Rows>(std::ptrdiff_t terms, const DBL *sliver,
                                                 const DBL *b, DBL *to, std::ptrdiff_t stride,
                                                 std::ptrdiff_t doubles) {
        AddToRows<Field, Packed, Rows>(terms, {}, {sliver, parts, Rows * parts}, b, to, stride,
                                       doubles);
    };
    std::ptrdiff_t i = 0;
    for (; i + tileRows <= rows; i += tileRows)
        add.template operator()<tileRows>(k, slivers + i * k * parts, panel, c + i * cStride,
                                          cStride, width);
    slivers += i * k * parts;
    c += i * cStride;
    switch (rows - i) {
    case 1:
        return add.template operator()<1>(k, slivers, panel, c, cStride, width);
    case 2:
        return add.template operator()<2>(k, slivers, panel, c, cStride, width);
    case 3:
        return add.template operator()<3>(k, slivers, panel, c, cStride, width);
    }
}

template <class Field>
void AddLarge(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, Sign sign,
              typename Field::Factor factor, const typename Field::Operand &a,
              const typename Field::Operand &b, DBL *c, std::ptrdiff_t cStride, DBL *memory) {
    constexpr std::ptrdiff_t cols = blockCols / Field::parts, tileCols = Field::tileCols;
    constexpr std::ptrdiff_t sliverSize = blockRows * depth * Field::parts;
    static_assert(sliverSize + blockCols * depth <= PanelMemory::size);
    DBL *const slivers = memory, *const panels = memory + sliverSize;
    for (std::ptrdiff_t left = 0; left < n; left += cols) {
        const std::ptrdiff_t right = n - left < cols ? n : left + cols;
        for (std::ptrdiff_t p = 0; p < k; p += depth) {
            const std::ptrdiff_t terms = k - p < depth ? k - p : depth;
            const std::ptrdiff_t panelSize = terms * 2 * nativeLanes;
            DBL *panel = panels;
            for (std::ptrdiff_t j = left; j < right; j += tileCols, panel += panelSize)
                Field::packPanel(From(b, p, j), right - j < tileCols ? right - j : tileCols, terms,
                                 panel);
            for (std::ptrdiff_t i = 0; i < m; i += blockRows) {
                const std::ptrdiff_t rows = m - i < blockRows ? m - i : blockRows;
                PackSlivers<Field>(From(a, i, p), rows, terms, sign, factor, slivers);
                panel = panels;
                for (std::ptrdiff_t j = left; j < right; j += tileCols, panel += panelSize)
                    AddPanel<Field>(rows, terms, slivers, panel, c + i * cStride + j * Field::parts,
                                    cStride,
                                    (right - j < tileCols ? right - j : tileCols) * Field::parts);
            }
        }
    }
}

template <class Field>
void Add(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, typename Field::Factor factor,
         const typename Field::Operand &a, const typename Field::Operand &b,
         typename Field::T *result, std::ptrdiff_t cStride) {
    const Sign sign = Field::signOf(factor);
    DBL *const c = reinterpret_cast<DBL *>(result);
    cStride *= Field::parts;
    if (m * n > smallProduct / (k + 1) && m > Field::tileRows && n > Field::tileCols) {
        const PanelMemory memory;
        if (memory.data() != nullptr)
            return AddLarge<Field>(m, n, k, sign, factor, a, b, c, cStride, memory.data());
    }
    if constexpr (Field::parts == 2)
        if (a.isConjugated)
            return AddSmallAs<Field, true>(m, n, k, sign, factor, a, b, c, cStride);
    AddSmallAs<Field, false>(m, n, k, sign, factor, a, b, c, cStride);
}

} // namespace

void AddProductReal(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, RealFactor factor,
                    RealOperand a, RealOperand b, DBL *c, std::ptrdiff_t cStride) {
    Add<Real>(m, n, k, factor, a, b, c, cStride);
}
void AddProductComplex(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, ComplexFactor factor,
                       ComplexOperand a, ComplexOperand b, CDB *c, std::ptrdiff_t cStride) {
    Add<Complex>(m, n, k, factor, a, b, c, cStride);
}

} // namespace qx::QX_WIDTH
