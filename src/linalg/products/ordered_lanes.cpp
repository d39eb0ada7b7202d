#include "linalg/products/ordered.h"

#include "frame/lanes.h"
#include "linalg/products/panel_memory.h"

namespace qx::QX_WIDTH {

namespace {

typedef Lanes<nativeLanes> L;

// A tile of c, a few rows of a few vectors, stays in registers through `depth` terms. The part of b
// that it needs is packed into panels as wide as the tile, padded with zeros at the right edge, and
// the part of a into slivers as high as the tile. A panel stays in the first cache, a block of
// slivers in the second, a block of panels in the third.
constexpr bool isWide = nativeLanes == 8; // with 32 registers instead of 16
constexpr std::ptrdiff_t depth = isWide ? 192 : 256;
constexpr std::ptrdiff_t blockRows = isWide ? 128 : 96;
constexpr std::ptrdiff_t blockCols = 2048;
// Small products pack only the panels, on the stack.
constexpr std::ptrdiff_t smallDepth = 64;
constexpr std::ptrdiff_t smallBand = 128;
constexpr std::ptrdiff_t smallProduct = isWide ? 24 * 24 * 24 : 40 * 40 * 40;
// Operands of up to this size may be used without packing.
constexpr std::ptrdiff_t mostInPlace = 160 * 160;

// How an element of a is changed when it is loaded; packed elements are loaded as they are.
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
    static constexpr std::ptrdiff_t tileRows = isWide ? 8 : 4;
    static constexpr std::ptrdiff_t vectors = isWide ? 3 : 2; // of a row of the tile
    static constexpr std::ptrdiff_t tileCols = vectors * nativeLanes;

    static Sign signOf(Factor f) {
        return f.value == 1.0 ? Sign::plus : f.value == -1.0 ? Sign::minus : Sign::scaled;
    }
    // Term q of `height` rows of an operand is written to to[q height] onwards.
    static void packSliver(const Operand &a, std::ptrdiff_t height, std::ptrdiff_t k, DBL *to) {
        std::ptrdiff_t r = 0;
        if (a.across == 1)
            for (; r + nativeLanes <= height; r += nativeLanes)
                transpose(a.data + r * a.down, a.down, k, to + r, height);
        else if (a.down == 1)
            for (; r + nativeLanes <= height; r += nativeLanes)
                for (std::ptrdiff_t q = 0; q < k; ++q)
                    L::load(a.data + r + q * a.across).store(to + q * height + r);
        for (; r < height; ++r)
            for (std::ptrdiff_t q = 0; q < k; ++q)
                to[q * height + r] = a.data[r * a.down + q * a.across];
    }
    static void scale(DBL *x, std::ptrdiff_t count, Factor factor) {
        for (std::ptrdiff_t i = 0; i < count; ++i)
            x[i] = factor.value * x[i];
    }
    // The same for the columns of an operand, followed by zeros.
    static void packPanel(const Operand &b, std::ptrdiff_t cols, std::ptrdiff_t k, DBL *to) {
        if (cols == tileCols)
            return packSliver({b.data, b.across, b.down}, tileCols, k, to);
        for (std::ptrdiff_t q = 0; q < k; ++q)
            for (std::ptrdiff_t j = 0; j < tileCols; ++j)
                to[q * tileCols + j] = j < cols ? b.data[q * b.down + j * b.across] : 0.0;
    }

    // The first k elements of as many rows as a vector has lanes, written column by column.
    static void transpose(const DBL *x, std::ptrdiff_t down, std::ptrdiff_t k, DBL *to,
                          std::ptrdiff_t height) {
        std::ptrdiff_t q = 0;
        for (; q + nativeLanes <= k; q += nativeLanes) {
            L block[nativeLanes];
            for (int i = 0; i < nativeLanes; ++i)
                block[i] = L::load(x + i * down + q);
            Transpose(block);
            for (int i = 0; i < nativeLanes; ++i)
                block[i].store(to + (q + i) * height);
        }
        for (; q < k; ++q)
            L::gather(x + q, down).store(to + q * height);
    }

    // Loads a row of b, of which only `width` elements are read.
    template <std::ptrdiff_t Vectors>
    static QX_INLINE void loadRow(const DBL *b, std::ptrdiff_t width, L *row) {
        constexpr std::ptrdiff_t whole = (Vectors - 1) * nativeLanes;
        QX_UNROLLED
        for (std::ptrdiff_t v = 0; v < Vectors - 1; ++v)
            row[v] = L::load(b + v * nativeLanes);
        row[Vectors - 1] = L::loadFirst(b + whole, width - whole);
    }

    // The sums of one row of the tile, or of its first vectors.
    template <std::ptrdiff_t Vectors>
    struct Sums {
        static constexpr std::ptrdiff_t count = Vectors;
        QX_INLINE void load(const DBL *c) {
            QX_UNROLLED
            for (std::ptrdiff_t v = 0; v < Vectors; ++v)
                x[v] = L::load(c + v * nativeLanes);
        }
        QX_INLINE void store(DBL *c) const {
            QX_UNROLLED
            for (std::ptrdiff_t v = 0; v < Vectors; ++v)
                x[v].store(c + v * nativeLanes);
        }
        // Loads a part of the last vector.
        QX_INLINE void loadPart(const DBL *c, std::ptrdiff_t width) {
            loadRow<Vectors>(c, width, x);
        }
        QX_INLINE void storePart(DBL *c, std::ptrdiff_t width) const {
            constexpr std::ptrdiff_t whole = (Vectors - 1) * nativeLanes;
            QX_UNROLLED
            for (std::ptrdiff_t v = 0; v < Vectors - 1; ++v)
                x[v].store(c + v * nativeLanes);
            x[Vectors - 1].storeFirst(c + whole, width - whole);
        }
        template <class How>
        QX_INLINE void add(const DBL *a, Factor factor, const L *b) {
            const DBL value = How::sign == Sign::scaled ? factor.value * *a : *a;
            const DBL *const at = How::sign == Sign::scaled ? &value : a;
            QX_UNROLLED
            for (std::ptrdiff_t v = 0; v < Vectors; ++v) {
                const L term = Times(b[v], at);
                x[v] = How::sign == Sign::minus ? x[v] - term : x[v] + term;
            }
        }
        L x[Vectors];
    };
};

// The panel has the real parts of a vector's columns, then their imaginary parts, and so do the
// sums.
struct Complex {
    typedef CDB T;
    typedef ComplexOperand Operand;
    typedef ComplexFactor Factor;
    static constexpr std::ptrdiff_t parts = 2;
    static constexpr std::ptrdiff_t tileRows = isWide ? 8 : 4;
    static constexpr std::ptrdiff_t vectors = 2;
    static constexpr std::ptrdiff_t tileCols = vectors / 2 * nativeLanes;

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
        const double sign = b.isConjugated ? -1.0 : 1.0;
        for (std::ptrdiff_t j = 0; j < tileCols; j += nativeLanes)
            for (std::ptrdiff_t q = 0; q < k; ++q) {
                DBL *const row = to + (q * tileCols + j) * 2;
                if (b.across == 1 && j + nativeLanes <= cols) {
                    const DBL *const x = reinterpret_cast<const DBL *>(b.data + q * b.down + j);
                    const L first = L::load(x), second = L::load(x + nativeLanes);
                    Evens(first, second).store(row);
                    (Odds(first, second) * L(sign)).store(row + nativeLanes);
                } else {
                    packSome(b, q, j, cols, sign, row);
                }
            }
    }
    // The columns from j on of one row, as many as a vector has lanes.
    static void packSome(const Operand &b, std::ptrdiff_t q, std::ptrdiff_t j, std::ptrdiff_t cols,
                         double sign, DBL *to) {
        for (std::ptrdiff_t i = 0; i < nativeLanes; i += 2) {
            const Lanes<2> left = j + i < cols ? at(b, q, j + i) : Lanes<2>(0.0);
            const Lanes<2> right = j + i + 1 < cols ? at(b, q, j + i + 1) : Lanes<2>(0.0);
            TurnsLow(left, right).store(to + i);
            (TurnsHigh(left, right) * Lanes<2>(sign)).store(to + nativeLanes + i);
        }
    }

    // Loads a row of the panel, which is padded.
    template <std::ptrdiff_t Vectors>
    static QX_INLINE void loadRow(const DBL *panel, std::ptrdiff_t, L *row) {
        QX_UNROLLED
        for (std::ptrdiff_t v = 0; v < Vectors; ++v)
            row[v] = L::load(panel + v * nativeLanes);
    }

    // Element (i, j) as two doubles.
    static QX_INLINE Lanes<2> at(const Operand &a, std::ptrdiff_t i, std::ptrdiff_t j) {
        return Lanes<2>::load(reinterpret_cast<const DBL *>(a.data + i * a.down + j * a.across));
    }

    template <std::ptrdiff_t Vectors>
    struct Sums {
        static constexpr std::ptrdiff_t count = Vectors;
        QX_INLINE void load(const DBL *c) {
            QX_UNROLLED
            for (std::ptrdiff_t v = 0; v < Vectors; v += 2) {
                const L first = L::load(c + v * nativeLanes);
                const L second = L::load(c + (v + 1) * nativeLanes);
                x[v] = Evens(first, second);
                x[v + 1] = Odds(first, second);
            }
        }
        QX_INLINE void store(DBL *c) const {
            QX_UNROLLED
            for (std::ptrdiff_t v = 0; v < Vectors; v += 2) {
                TurnsLow(x[v], x[v + 1]).store(c + v * nativeLanes);
                TurnsHigh(x[v], x[v + 1]).store(c + (v + 1) * nativeLanes);
            }
        }
        // Loads a part of the only pair of vectors.
        QX_INLINE void loadPart(const DBL *c, std::ptrdiff_t width) {
            static_assert(Vectors == 2);
            const std::ptrdiff_t whole = width < nativeLanes ? width : nativeLanes;
            const L first = L::loadFirst(c, whole);
            const L second = L::loadFirst(c + whole, width - whole);
            x[0] = Evens(first, second);
            x[1] = Odds(first, second);
        }
        QX_INLINE void storePart(DBL *c, std::ptrdiff_t width) const {
            const std::ptrdiff_t whole = width < nativeLanes ? width : nativeLanes;
            TurnsLow(x[0], x[1]).storeFirst(c, whole);
            TurnsHigh(x[0], x[1]).storeFirst(c + whole, width - whole);
        }
        template <class How>
        QX_INLINE void add(const DBL *a, Factor factor, const L *b) {
            DBL at[2] = {a[0], How::isConjugated ? -a[1] : a[1]};
            if constexpr (How::sign == Sign::scaled) {
                const double re = at[0], im = at[1];
                at[0] = factor.re * re - factor.im * im;
                at[1] = factor.re * im + factor.im * re;
            }
            const bool asItIs = How::sign != Sign::scaled && !How::isConjugated;
            const DBL *const re = asItIs ? a : at, *const im = re + 1;
            QX_UNROLLED
            for (std::ptrdiff_t v = 0; v < Vectors; v += 2) {
                const L termRe = Times(b[v], re) - Times(b[v + 1], im);
                const L termIm = Times(b[v + 1], re) + Times(b[v], im);
                x[v] = How::sign == Sign::minus ? x[v] - termRe : x[v] + termRe;
                x[v + 1] = How::sign == Sign::minus ? x[v + 1] - termIm : x[v + 1] + termIm;
            }
        }
        L x[Vectors];
    };
};

// Where a tile finds its elements of a, in doubles.
struct Place {
    const DBL *data;
    std::ptrdiff_t down, across;
};

// Where a tile finds its elements of b: in a panel, or in b itself.
struct PanelPlace {
    const DBL *data;
    std::ptrdiff_t down;
};

template <class Field, class How, std::ptrdiff_t Rows>
QX_INLINE void AddToTile(std::ptrdiff_t k, typename Field::Factor factor, const Place &a,
                         const PanelPlace &b, DBL *c, std::ptrdiff_t cStride) {
    typename Field::template Sums<Field::vectors> sums[Rows];
    QX_UNROLLED
    for (std::ptrdiff_t r = 0; r < Rows; ++r)
        sums[r].load(c + r * cStride);
    const DBL *at = a.data, *panel = b.data;
    // The next tile's rows are far from each other in memory; so they are prefetched.
    if constexpr (isWide)
        for (std::ptrdiff_t r = 0; r < Rows; ++r)
            for (std::ptrdiff_t v = 0; v < Field::vectors; ++v)
                __builtin_prefetch(c + (Rows + r) * cStride + v * nativeLanes, 1);
    for (std::ptrdiff_t p = 0; p < k; ++p) {
        L row[Field::vectors];
        QX_UNROLLED
        for (std::ptrdiff_t v = 0; v < Field::vectors; ++v)
            row[v] = L::load(panel + v * nativeLanes);
        QX_UNROLLED
        for (std::ptrdiff_t r = 0; r < Rows; ++r)
            sums[r].template add<How>(at + r * a.down, factor, row);
        panel += b.down;
        at += a.across;
    }
    QX_UNROLLED
    for (std::ptrdiff_t r = 0; r < Rows; ++r)
        sums[r].store(c + r * cStride);
}

// At the right edge: adds `width` doubles of each row, in no more vectors than they need.
template <class Field, class How, std::ptrdiff_t Rows, std::ptrdiff_t Vectors = Field::vectors>
void AddToEdge(std::ptrdiff_t k, typename Field::Factor factor, const Place &a, const PanelPlace &b,
               DBL *c, std::ptrdiff_t cStride, std::ptrdiff_t width) {
    constexpr std::ptrdiff_t parts = Field::parts;
    if constexpr (Vectors > parts)
        if (width <= (Vectors - parts) * nativeLanes)
            return AddToEdge<Field, How, Rows, Vectors - parts>(k, factor, a, b, c, cStride, width);
    typename Field::template Sums<Vectors> sums[Rows];
    QX_UNROLLED
    for (std::ptrdiff_t r = 0; r < Rows; ++r)
        sums[r].loadPart(c + r * cStride, width);
    const DBL *at = a.data, *panel = b.data;
    for (std::ptrdiff_t p = 0; p < k; ++p) {
        L row[Vectors];
        Field::template loadRow<Vectors>(panel, width, row);
        QX_UNROLLED
        for (std::ptrdiff_t r = 0; r < Rows; ++r)
            sums[r].template add<How>(at + r * a.down, factor, row);
        panel += b.down;
        at += a.across;
    }
    QX_UNROLLED
    for (std::ptrdiff_t r = 0; r < Rows; ++r)
        sums[r].storePart(c + r * cStride, width);
}
// Without partial loads of registers, a full tile is computed in a temporary.
template <class Field, class How, std::ptrdiff_t Rows>
void AddAside(std::ptrdiff_t k, typename Field::Factor factor, const Place &a, const PanelPlace &b,
              DBL *c, std::ptrdiff_t cStride, std::ptrdiff_t width) {
    constexpr std::ptrdiff_t whole = Field::vectors * nativeLanes;
    DBL aside[Rows * whole] = {};
    QX_UNROLLED
    for (std::ptrdiff_t r = 0; r < Rows; ++r)
        for (std::ptrdiff_t j = 0; j < width; ++j)
            aside[r * whole + j] = c[r * cStride + j];
    AddToTile<Field, How, Rows>(k, factor, a, b, aside, whole);
    QX_UNROLLED
    for (std::ptrdiff_t r = 0; r < Rows; ++r)
        for (std::ptrdiff_t j = 0; j < width; ++j)
            c[r * cStride + j] = aside[r * whole + j];
}

// Adds `width` doubles of each row.
template <class Field, class How, std::ptrdiff_t Rows>
QX_INLINE void AddToRows(std::ptrdiff_t k, typename Field::Factor factor, const Place &a,
                         const PanelPlace &b, DBL *c, std::ptrdiff_t cStride,
                         std::ptrdiff_t width) {
    if (width == Field::vectors * nativeLanes)
        AddToTile<Field, How, Rows>(k, factor, a, b, c, cStride);
    else if constexpr (isWide)
        AddToEdge<Field, How, Rows>(k, factor, a, b, c, cStride, width);
    else
        AddAside<Field, How, Rows>(k, factor, a, b, c, cStride, width);
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
    DBL panel[smallDepth * Field::vectors * nativeLanes];
    const PanelPlace packed = {panel, Field::vectors * nativeLanes};
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
                    AddToRows<Field, How, Field::tileRows>(terms, factor, place, packed, row,
                                                           cStride, cols * parts);
                    place.data += Field::tileRows * place.down;
                    row += Field::tileRows * cStride;
                }
                for (; i < bottom; ++i) {
                    AddToRows<Field, How, 1>(terms, factor, place, packed, row, cStride,
                                             cols * parts);
                    place.data += place.down;
                    row += cStride;
                }
            }
        }
    }
}

template <class Field, bool Conjugated>
void AddSmallAs(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, typename Field::Factor factor,
                const typename Field::Operand &a, const typename Field::Operand &b,
                typename Field::T *result, std::ptrdiff_t cStride) {
    const Sign sign = Field::signOf(factor);
    DBL *const c = reinterpret_cast<DBL *>(result);
    cStride *= Field::parts;
    if (sign == Sign::plus)
        AddSmall<Field, Taken<Sign::plus, Conjugated>>(m, n, k, factor, a, b, c, cStride);
    else if (sign == Sign::minus)
        AddSmall<Field, Taken<Sign::minus, Conjugated>>(m, n, k, factor, a, b, c, cStride);
    else
        AddSmall<Field, Taken<Sign::scaled, Conjugated>>(m, n, k, factor, a, b, c, cStride);
}

// The height of the next sliver: that of a tile, or, at the lower edge, half of it or the number of
// remaining rows.
template <class Field>
std::ptrdiff_t SliverHeight(std::ptrdiff_t rows) {
    return rows >= Field::tileRows ? Field::tileRows : rows >= 4 ? 4 : rows;
}

// The slivers of the first rows and terms of a, each term by term.
template <class Field>
void PackSlivers(const typename Field::Operand &a, std::ptrdiff_t rows, std::ptrdiff_t k, Sign sign,
                 typename Field::Factor factor, DBL *to) {
    const std::ptrdiff_t count = rows * k * Field::parts;
    DBL *sliver = to;
    std::ptrdiff_t height = 0;
    for (std::ptrdiff_t i = 0; i < rows; i += height) {
        height = SliverHeight<Field>(rows - i);
        Field::packSliver(From(a, i, 0), height, k, sliver);
        sliver += height * k * Field::parts;
    }
    if (sign == Sign::minus)
        Real::scale(to, count, {-1.0});
    else if (sign == Sign::scaled)
        Field::scale(to, count, factor);
}

// Calls add<height>(first row) for each sliver.
template <class Field, class Add>
QX_INLINE void ForEachSliver(std::ptrdiff_t rows, const Add &add) {
    constexpr std::ptrdiff_t tileRows = Field::tileRows;
    std::ptrdiff_t i = 0;
    for (; i + tileRows <= rows; i += tileRows)
        add.template operator()<tileRows>(i);
    if (tileRows > 4 && rows - i >= 4) {
        add.template operator()<4>(i);
        i += 4;
    }
    switch (rows - i) {
    case 1:
        return add.template operator()<1>(i);
    case 2:
        return add.template operator()<2>(i);
    case 3:
        return add.template operator()<3>(i);
    }
}

// Adds the products of all slivers of a block with one panel.
template <class Field>
void AddPanel(std::ptrdiff_t rows, std::ptrdiff_t k, const DBL *slivers, const PanelPlace &b,
              DBL *c, std::ptrdiff_t cStride, std::ptrdiff_t width) {
    constexpr std::ptrdiff_t parts = Field::parts;
    ForEachSliver<Field>(rows, [&]<std::ptrdiff_t Rows>(std::ptrdiff_t i) {
        AddToRows<Field, Packed, Rows>(k, {}, {slivers + i * k * parts, parts, Rows * parts}, b,
                                       c + i * cStride, cStride, width);
    });
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
            const std::ptrdiff_t panelSize = terms * Field::vectors * nativeLanes;
            DBL *panel = panels;
            for (std::ptrdiff_t j = left; j < right; j += tileCols, panel += panelSize)
                Field::packPanel(From(b, p, j), right - j < tileCols ? right - j : tileCols, terms,
                                 panel);
            for (std::ptrdiff_t i = 0; i < m; i += blockRows) {
                const std::ptrdiff_t rows = m - i < blockRows ? m - i : blockRows;
                PackSlivers<Field>(From(a, i, p), rows, terms, sign, factor, slivers);
                panel = panels;
                for (std::ptrdiff_t j = left; j < right; j += tileCols, panel += panelSize)
                    AddPanel<Field>(rows, terms, slivers, {panel, Field::vectors * nativeLanes},
                                    c + i * cStride + j * Field::parts, cStride,
                                    (right - j < tileCols ? right - j : tileCols) * Field::parts);
            }
        }
    }
}

// Without any copy: a real product whose operands fit in the second cache, where the rows of b are
// contiguous.
template <class How>
void AddInPlace(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, const RealOperand &a,
                const RealOperand &b, DBL *c, std::ptrdiff_t cStride) {
    for (std::ptrdiff_t j = 0; j < n; j += Real::tileCols) {
        const std::ptrdiff_t width = n - j < Real::tileCols ? n - j : Real::tileCols;
        ForEachSliver<Real>(m, [&]<std::ptrdiff_t Rows>(std::ptrdiff_t i) {
            AddToRows<Real, How, Rows>(k, {}, {a.data + i * a.down, a.down, a.across},
                                       {b.data + j, b.down}, c + i * cStride + j, cStride, width);
        });
    }
}
template <class Field>
bool AddIfInPlace(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k,
                  typename Field::Factor factor, const typename Field::Operand &a,
                  const typename Field::Operand &b, DBL *c, std::ptrdiff_t cStride) {
    const Sign sign = Field::signOf(factor);
    if (b.across != 1 || sign == Sign::scaled || m * k > mostInPlace || n * k > mostInPlace)
        return false;
    if (sign == Sign::plus)
        AddInPlace<Taken<Sign::plus, false>>(m, n, k, a, b, c, cStride);
    else
        AddInPlace<Taken<Sign::minus, false>>(m, n, k, a, b, c, cStride);
    return true;
}

// Adds the product if it is large and there is memory; returns whether it was added.
template <class Field>
bool AddIfLarge(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, typename Field::Factor factor,
                const typename Field::Operand &a, const typename Field::Operand &b,
                typename Field::T *c, std::ptrdiff_t cStride) {
    if (m * n <= smallProduct / (k + 1) || m <= Field::tileRows || n <= Field::tileCols)
        return false;
    const PanelMemory memory;
    if (memory.data() == nullptr)
        return false;
    AddLarge<Field>(m, n, k, Field::signOf(factor), factor, a, b, reinterpret_cast<DBL *>(c),
                    cStride * Field::parts, memory.data());
    return true;
}

} // namespace

// Small products gain nothing from eight lanes.
#ifdef QX_HAS_EIGHT_LANES
namespace narrower = avx2;
#else
namespace narrower = QX_WIDTH;
#endif

void AddProductReal(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, RealFactor factor,
                    RealOperand a, RealOperand b, DBL *c, std::ptrdiff_t cStride) {
    if constexpr (isWide)
        if (AddIfInPlace<Real>(m, n, k, factor, a, b, c, cStride))
            return;
    if (AddIfLarge<Real>(m, n, k, factor, a, b, c, cStride))
        return;
    if constexpr (isWide)
        narrower::AddProductReal(m, n, k, factor, a, b, c, cStride);
    else
        AddSmallAs<Real, false>(m, n, k, factor, a, b, c, cStride);
}
void AddProductComplex(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, ComplexFactor factor,
                       ComplexOperand a, ComplexOperand b, CDB *c, std::ptrdiff_t cStride) {
    if (AddIfLarge<Complex>(m, n, k, factor, a, b, c, cStride))
        return;
    if constexpr (isWide)
        narrower::AddProductComplex(m, n, k, factor, a, b, c, cStride);
    else if (a.isConjugated)
        AddSmallAs<Complex, true>(m, n, k, factor, a, b, c, cStride);
    else
        AddSmallAs<Complex, false>(m, n, k, factor, a, b, c, cStride);
}

} // namespace qx::QX_WIDTH
