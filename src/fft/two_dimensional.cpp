#include "fft/two_dimensional.h"

#include "fft/abreast.h"
#include "fft/column_block.h"
#include "fft/execute.h"
#include "fft/passes.h"
#include "fft/shifted_order.h"
#include "frame/heap_block.h"
#include "frame/views.h"

#include <algorithm>
#include <cstddef>
#include <cstring>

namespace qx {
namespace {

typedef HeapBlock<ElementType::CDB> ComplexBlock;

ErrorCode Forward(const FFTPlan *plan, const CDB *in, CDB *out, int32_t n, DBL *work) {
    return FFTComplexForward(plan, &in->re, &in->im, &out->re, &out->im, 2, 2, n, work);
}

ErrorCode Inverse(const FFTPlan *plan, const CDB *in, CDB *out, int32_t n, DBL *work) {
    return FFTComplexInverse(plan, &in->re, &in->im, &out->re, &out->im, 2, 2, n, work);
}

// The index at which an axis of n values holds frequency f, for f from 0 to n-1.
int32_t IndexOf(int32_t f, int32_t n, int32_t shift) {
    if (shift == 0)
        return f;
    const int32_t back = n - n / 2;
    return f < back ? f + n / 2 : f - back;
}

bool StartsBelowZero(const MatrixRegion &region) {
    return region.rowStart < 0 || region.colStart < 0;
}

int32_t RowsTaken(const MatrixRegion &region) {
    return std::min(region.rows, region.matrixRows - region.rowStart);
}

// The rows of a region, each padded with zeros beyond the end of the matrix.
template <ElementType Code>
class RegionRows {
public:
    typedef typename Element<Code>::type T;

    RegionRows(const T *matrix, const MatrixRegion &region) : matrix_(matrix), region_(region) {}

    ErrorCode prepare() {
        return present() < region_.cols ? padded_.allocateCleared(region_.cols) : 0;
    }
    const T *row(int32_t r) const {
        const T *const start =
            matrix_ + (int64_t{region_.rowStart} + r) * region_.matrixCols + region_.colStart;
        if (!padded_.data())
            return start;
        std::memcpy(padded_.data(), start, static_cast<std::size_t>(present()) * sizeof(T));
        return padded_.data();
    }

private:
    int32_t present() const { return region_.matrixCols - region_.colStart; }

    const T *matrix_;
    MatrixRegion region_;
    HeapBlock<Code> padded_;
};

// The columns from first to last, none if last is the lower one.
struct Opposites {
    int32_t first, last;
};

// The output of a forward transform. First it holds the spectra of the rows, at their places in the order of
// columns.
class SpectrumMatrix {
public:
    SpectrumMatrix(CDB *data, int32_t rows, int32_t cols, int32_t shift)
        : data_(data), rows_(rows), cols_(cols), zero_(IndexOf(0, rows, shift)),
          opposites_(shift != 0 && cols % 2 != 0 ? cols - 1 : cols) {}

    CDB *row(int32_t r) const { return data_ + int64_t{r} * cols_; }

    // Transforms the first `cols` columns, of which the first `used` rows are set; the rest counts as zero.
    ErrorCode transformColumns(const FFTPlan &plan, int32_t used, int32_t cols, DBL *work) const {
        return transform(plan, used, cols, work, {1, 0});
    }

    // The same for the columns of spectra of real rows. Those that are opposite to columns from `first` to
    // `last` are set, too: the conjugates at the opposite rows.
    ErrorCode transformHalf(const FFTPlan &plan, int32_t used, int32_t cols, DBL *work,
                            const Opposites &opposites) const {
        return transform(plan, used, cols, work, opposites);
    }

private:
    ErrorCode transform(const FFTPlan &plan, int32_t used, int32_t cols, DBL *work,
                        const Opposites &opposites) const {
        return ColumnsAbreast::suit(plan) ? transformAbreast(plan, used, cols, opposites)
                                          : transformOneByOne(plan, used, cols, work, opposites);
    }

    int32_t rowOf(int32_t frequency) const {
        return frequency < rows_ - zero_ ? frequency + zero_ : frequency - (rows_ - zero_);
    }

    // Rows of results, of neighbouring frequencies that wrap around neither here nor, negated, at the
    // opposite rows.
    struct Results {
        const DBL *first;
        std::ptrdiff_t pitch;
        int32_t frequency, rows;
    };

    // Sets these rows of the columns from c on, and of the columns that are opposite to them.
    void setRows(const Results &results, int32_t c, int32_t count,
                 const Opposites &opposites) const {
        const int32_t from = std::max(c, opposites.first);
        const int32_t conjugates = std::max(0, std::min(c + count - 1, opposites.last) - from + 1);
        const int32_t f = results.frequency;
        const std::ptrdiff_t pitch = 2 * std::ptrdiff_t{cols_};
        DBL *const opposite = &row(rowOf(f == 0 ? 0 : rows_ - f))->re;
        SpreadRows({results.first, results.pitch, &row(rowOf(f))[c].re, pitch,
                    conjugates == 0 ? opposite : opposite + 2 * (opposites_ - from), -pitch,
                    results.rows, count, conjugates == 0 ? 0 : from - c, conjugates});
    }

    // Calls set(f, end) for the longest ranges of frequencies that wrap around neither here nor, negated,
    // at the opposite rows, in blocks of m.
    template <class Set>
    void forRanges(int32_t m, const Set &set) const {
        for (int32_t f = 0; f < rows_;) {
            int32_t end = std::min(rows_, (f / m + 1) * m);
            for (const int32_t limit : {1, rows_ - zero_, zero_ + 1})
                if (f < limit)
                    end = std::min(end, limit);
            set(f, end);
            f = end;
        }
    }

    ErrorCode transformAbreast(const FFTPlan &plan, int32_t used, int32_t cols,
                               const Opposites &opposites) const {
        ColumnsAbreast abreast;
        if (const ErrorCode failed = abreast.prepare(plan, cols))
            return failed;
        for (int32_t r = used; r < rows_; ++r)
            std::fill_n(row(r), cols, CDB{0, 0});
        const std::ptrdiff_t pitch = 2 * std::ptrdiff_t{cols_};
        const bool rowsStay = zero_ == 0 && opposites.last < opposites.first;
        for (int32_t c = 0; c < cols; c += abreast.atOnce()) {
            const int32_t count = std::min(abreast.atOnce(), cols - c);
            DBL *const first = &data_[c].re;
            if (rowsStay) {
                abreast.transform(first, pitch, first, pitch, count);
                continue;
            }
            abreast.transform(first, pitch, count);
            forRanges(abreast.blockRows(), [&](int32_t f, int32_t end) {
                setRows({abreast.result(f), abreast.pitch(), f, end - f}, c, count, opposites);
            });
        }
        return 0;
    }

    ErrorCode transformOneByOne(const FFTPlan &plan, int32_t used, int32_t cols, DBL *work,
                                const Opposites &opposites) const {
        const int64_t pitch = PaddedPitch(rows_);
        ComplexBlock columns, results, turned;
        if (const ErrorCode failed = columns.allocateCleared(ColumnsAtOnce * pitch))
            return failed;
        if (const ErrorCode failed = results.allocate(ColumnsAtOnce * pitch))
            return failed;
        if (const ErrorCode failed = turned.allocate(ColumnsAtOnce * int64_t{rows_}))
            return failed;
        for (int32_t c = 0; c < cols; c += ColumnsAtOnce) {
            const int32_t count = ColumnsInBlock(c, cols);
            GatherColumns<ElementType::CDB>(data_ + c, cols_, used, count, columns.data(), pitch);
            for (int32_t i = 0; i < count; ++i)
                if (const ErrorCode failed = Forward(&plan, columns.data() + i * pitch,
                                                     results.data() + i * pitch, rows_, work))
                    return failed;
            ScatterColumns<ElementType::CDB>(results.data(), pitch, rows_, count, turned.data(),
                                             ColumnsAtOnce);
            forRanges(rows_, [&](int32_t f, int32_t end) {
                setRows({&turned[f * ColumnsAtOnce].re, 2 * ColumnsAtOnce, f, end - f}, c, count,
                        opposites);
            });
        }
        return 0;
    }

    CDB *data_;
    int32_t rows_, cols_;
    int32_t zero_;      // the row of frequency 0
    int32_t opposites_; // the sum of the indices of two opposite columns
};

// The first n/2 + 1 values, in plain or in shifted order, of the spectrum whose half-complex
// form is h.
void KeepHalf(const DBL *h, int32_t n, int32_t shift, CDB *kept) {
    const std::ptrdiff_t half = n / 2;
    if (shift == 0)
        JoinMirrored(h + 1, h + n - 1, &kept[1].re, (n - 1) / 2);
    else
        for (std::ptrdiff_t k = 1; k <= (n - 1) / 2; ++k)
            kept[half - k] = CDB{h[k], -h[n - k]};
    kept[shift == 0 ? 0 : half] = CDB{h[0], 0};
    if (n % 2 == 0)
        kept[shift == 0 ? half : 0] = CDB{h[half], 0};
}

// Writes the inverse transforms of the rows of frequencies 0 to count - 1, in this order, to results.
ErrorCode InverseRows(const FFTPlan *plan, const CDB *in, int32_t rows, int32_t cols, int32_t shift,
                      int32_t count, CDB *results, DBL *work) {
    ComplexBlock plain;
    if (shift != 0)
        if (const ErrorCode failed = plain.allocate(cols))
            return failed;
    for (int32_t f = 0; f < count; ++f) {
        const CDB *row = in + int64_t{IndexOf(f, rows, shift)} * cols;
        if (shift != 0) {
            RotateFromShifted(row, cols, plain.data());
            row = plain.data();
        }
        if (const ErrorCode failed =
                Inverse(plan, row, results + f * PaddedPitch(cols), cols, work))
            return failed;
    }
    return 0;
}

// Copies `count` columns of spectra of real data, with frequencies 0 to n/2 from the top, in half-complex
// form.
void GatherHalfComplex(const CDB *work, int64_t workPitch, int32_t n, int32_t count, DBL *columns,
                       int64_t pitch) {
    for (int32_t f = 0; f <= n / 2; ++f) {
        const CDB *const row = work + f * workPitch;
        const bool hasImaginary = f > 0 && f <= (n - 1) / 2;
        for (int32_t c = 0; c < count; ++c) {
            columns[c * pitch + f] = row[c].re;
            if (hasImaginary)
                columns[c * pitch + n - f] = row[c].im;
        }
    }
}

// The columns of the complex and of the real inverse.
struct ComplexColumns {
    static constexpr auto Code = ElementType::CDB;
    static int32_t rowsUsed(int32_t rows) { return rows; }
    static constexpr auto gather = GatherColumns<Code>;
    static int64_t columnWork(const FFTPlan *plan) { return plan->complexWork; }
    static ErrorCode inverse(const FFTPlan *plan, CDB *in, CDB *out, int32_t n, DBL *work) {
        return Inverse(plan, in, out, n, work);
    }
};
struct RealColumns {
    static constexpr auto Code = ElementType::DBL;
    static int32_t rowsUsed(int32_t rows) { return rows / 2 + 1; }
    static constexpr auto gather = GatherHalfComplex;
    static int64_t columnWork(const FFTPlan *plan) { return plan->realWork; }
    static ErrorCode inverse(const FFTPlan *plan, DBL *in, DBL *out, int32_t n, DBL *work) {
        return FFTRealInverse(plan, in, out, 1, 1, n, work);
    }
};

// Rows first, then columns.
// kept: a failed column ends the loop unreported, and the columns from there on stay unwritten.
// No column fails for lack of memory, because all memory is allocated before the first row.
template <class Columns>
ErrorCode InverseMatrix(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *in,
                        int32_t rows, int32_t cols, int32_t shift,
                        typename Element<Columns::Code>::type *out) {
    const int64_t pitch = PaddedPitch(rows);
    const int32_t used = Columns::rowsUsed(rows);
    TransformWork work;
    ComplexBlock matrix;
    HeapBlock<Columns::Code> columns;
    HeapBlock<Columns::Code> results;
    if (const ErrorCode failed =
            work.take(std::max(rowPlan->complexWork, Columns::columnWork(columnPlan))))
        return failed;
    if (const ErrorCode failed = matrix.allocate(used * PaddedPitch(cols)))
        return failed;
    if (const ErrorCode failed = columns.allocate(ColumnsAtOnce * pitch))
        return failed;
    if (const ErrorCode failed = results.allocate(ColumnsAtOnce * pitch))
        return failed;
    if (const ErrorCode failed =
            InverseRows(rowPlan, in, rows, cols, shift, used, matrix.data(), work.data()))
        return failed;
    int32_t done = ColumnsAtOnce;
    for (int32_t c = 0; c < cols && done == ColumnsAtOnce; c += ColumnsAtOnce) {
        const int32_t count = ColumnsInBlock(c, cols);
        Columns::gather(matrix.data() + c, PaddedPitch(cols), rows, count, columns.data(), pitch);
        done = 0;
        while (done < count &&
               Columns::inverse(columnPlan, columns.data() + done * pitch,
                                results.data() + done * pitch, rows, work.data()) >= 0)
            ++done;
        ScatterColumns<Columns::Code>(results.data(), pitch, rows, done, out + c, cols);
    }
    return 0;
}

} // namespace

ErrorCode FFT2DComplexForward(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *in,
                              const MatrixRegion &region, int32_t shift, CDB *out) {
    if (StartsBelowZero(region))
        return ErrIndexOutOfRange;
    const int32_t cols = region.cols;
    const int32_t used = RowsTaken(region);
    TransformWork work;
    ComplexBlock spectrum;
    if (const ErrorCode failed = work.take(std::max(rowPlan->complexWork, columnPlan->complexWork)))
        return failed;
    if (const ErrorCode failed = spectrum.allocate(cols))
        return failed;
    RegionRows<ElementType::CDB> rows(in, region);
    if (const ErrorCode failed = rows.prepare())
        return failed;
    const SpectrumMatrix target(out, region.rows, cols, shift);
    const int32_t back = cols / 2;
    for (int32_t r = 0; r < used; ++r) {
        CDB *const row = target.row(r);
        CDB *const plain = shift == 0 ? row : spectrum.data();
        if (const ErrorCode failed = Forward(rowPlan, rows.row(r), plain, cols, work.data()))
            return failed;
        if (shift != 0) {
            Copy<ElementType::CDB>({plain + (cols - back), back}, {row, back});
            Copy<ElementType::CDB>({plain, cols - back}, {row + back, cols - back});
        }
    }
    return target.transformColumns(*columnPlan, used, cols, work.data());
}

ErrorCode FFT2DRealForward(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const DBL *in,
                           const MatrixRegion &region, int32_t shift, CDB *out) {
    if (StartsBelowZero(region))
        return ErrIndexOutOfRange;
    const int32_t cols = region.cols;
    const int32_t kept = cols / 2 + 1;
    const int32_t used = RowsTaken(region);
    TransformWork work;
    HeapBlock<ElementType::DBL> half;
    if (const ErrorCode failed = work.take(std::max(rowPlan->realWork, columnPlan->complexWork)))
        return failed;
    if (const ErrorCode failed = half.allocate(cols))
        return failed;
    RegionRows<ElementType::DBL> rows(in, region);
    if (const ErrorCode failed = rows.prepare())
        return failed;
    const SpectrumMatrix target(out, region.rows, cols, shift);
    for (int32_t r = 0; r < used; ++r) {
        if (const ErrorCode failed =
                FFTRealForward(rowPlan, rows.row(r), half.data(), 1, 1, cols, work.data()))
            return failed;
        KeepHalf(half.data(), cols, shift, target.row(r));
    }
    // Frequency 0 and, if n is even, n/2 are their own opposites.
    const int32_t first = shift != 0 && cols % 2 != 0 ? 0 : 1;
    const int32_t last = shift == 0 && cols % 2 != 0 ? kept - 1 : kept - 2;
    return target.transformHalf(*columnPlan, used, kept, work.data(), {first, last});
}

ErrorCode FFT2DComplexInverse(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *in,
                              int32_t rows, int32_t cols, int32_t shift, CDB *out) {
    return InverseMatrix<ComplexColumns>(rowPlan, columnPlan, in, rows, cols, shift, out);
}

ErrorCode FFT2DRealInverse(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *in,
                           int32_t rows, int32_t cols, int32_t shift, DBL *out) {
    return InverseMatrix<RealColumns>(rowPlan, columnPlan, in, rows, cols, shift, out);
}

} // namespace qx
