#include "linalg/systems/substitution.h"

#include "frame/lanes.h"

namespace qx::QX_WIDTH {

namespace {

// One row of a strip of right sides, in registers: `Vectors` vectors of columns. In a strip of
// complex columns the real parts come first and the imaginary parts after them, so that no
// operation needs a shuffle.
template <class L, int Vectors>
struct RealRow {
    typedef DBL T;
    static constexpr std::ptrdiff_t columns = Vectors * L::count;
    static constexpr std::ptrdiff_t width = columns;
    L v[Vectors];

    static RealRow load(const DBL *x) {
        RealRow row;
        for (int i = 0; i < Vectors; ++i)
            row.v[i] = L::load(x + i * L::count);
        return row;
    }
    void store(DBL *x) const {
        for (int i = 0; i < Vectors; ++i)
            v[i].store(x + i * L::count);
    }
    static RealRow zero() {
        RealRow row;
        for (int i = 0; i < Vectors; ++i)
            row.v[i] = L(0.0);
        return row;
    }
    void addProduct(const T &a, const DBL *x) {
        for (int i = 0; i < Vectors; ++i)
            v[i] = v[i] + L(a) * L::load(x + i * L::count);
    }
    void subtractProduct(const T &a, const RealRow &x) {
        for (int i = 0; i < Vectors; ++i)
            v[i] = v[i] - L(a) * x.v[i];
    }
    void subtract(const RealRow &x) {
        for (int i = 0; i < Vectors; ++i)
            v[i] = v[i] - x.v[i];
    }
    void divide(const T &a) {
        for (int i = 0; i < Vectors; ++i)
            v[i] = v[i] / L(a);
    }
    static double conjugate(const T &a) { return a; }
    static void gather(const T *x, DBL *row) { load(x).store(row); }
    static void scatter(const DBL *row, T *x) { load(row).store(x); }
};

template <class L, int Vectors>
struct ComplexRow {
    typedef CDB T;
    static constexpr std::ptrdiff_t columns = Vectors * L::count;
    static constexpr std::ptrdiff_t width = 2 * columns;
    L re[Vectors], im[Vectors];

    static ComplexRow load(const DBL *x) {
        ComplexRow row;
        for (int i = 0; i < Vectors; ++i) {
            row.re[i] = L::load(x + i * L::count);
            row.im[i] = L::load(x + columns + i * L::count);
        }
        return row;
    }
    void store(DBL *x) const {
        for (int i = 0; i < Vectors; ++i) {
            re[i].store(x + i * L::count);
            im[i].store(x + columns + i * L::count);
        }
    }
    static ComplexRow zero() {
        ComplexRow row;
        for (int i = 0; i < Vectors; ++i)
            row.re[i] = row.im[i] = L(0.0);
        return row;
    }
    void addProduct(const T &a, const DBL *x) {
        const ComplexRow b = load(x);
        for (int i = 0; i < Vectors; ++i) {
            re[i] = re[i] + (L(a.re) * b.re[i] - L(a.im) * b.im[i]);
            im[i] = im[i] + (L(a.re) * b.im[i] + L(a.im) * b.re[i]);
        }
    }
    void subtractProduct(const T &a, const ComplexRow &b) {
        for (int i = 0; i < Vectors; ++i) {
            re[i] = re[i] - (L(a.re) * b.re[i] - L(a.im) * b.im[i]);
            im[i] = im[i] - (L(a.re) * b.im[i] + L(a.im) * b.re[i]);
        }
    }
    void subtract(const ComplexRow &x) {
        for (int i = 0; i < Vectors; ++i) {
            re[i] = re[i] - x.re[i];
            im[i] = im[i] - x.im[i];
        }
    }
    // As CDB / CDB (linalg/scalar.h).
    void divide(const T &a) {
        const bool realIsLarger = __builtin_fabs(a.re) >= __builtin_fabs(a.im);
        const double large = realIsLarger ? a.re : a.im, small = realIsLarger ? a.im : a.re;
        const double ratio = small / large;
        const L r(ratio), denominator(large + small * ratio);
        for (int i = 0; i < Vectors; ++i) {
            const L x = re[i], y = im[i];
            re[i] = (realIsLarger ? x + y * r : x * r + y) / denominator;
            im[i] = (realIsLarger ? y - x * r : y * r - x) / denominator;
        }
    }
    static T conjugate(const T &a) { return {a.re, -a.im}; }
    static void gather(const T *x, DBL *row) {
        for (std::ptrdiff_t j = 0; j < columns; ++j) {
            row[j] = x[j].re;
            row[columns + j] = x[j].im;
        }
    }
    static void scatter(const DBL *row, T *x) {
        for (std::ptrdiff_t j = 0; j < columns; ++j)
            x[j] = {row[j], row[columns + j]};
    }
};

// The substitutions on one strip.
template <class Row>
class Strip {
    typedef typename Row::T T;

public:
    Strip(DBL *x, std::ptrdiff_t n) : x_(x), n_(n) {}

    void solve(Factors factors, const T *a) {
        switch (factors) {
        case Factors::lu:
            return solveLU(a);
        case Factors::lowerPacked:
            return eliminateForward(a);
        case Factors::upperPacked:
            return eliminateBackward(a);
        case Factors::cholesky:
            eliminateForward(a);
            return solveTransposed(a);
        }
    }

private:
    DBL *at(std::ptrdiff_t i) const { return x_ + i * Row::width; }
    Row sumOfProducts(const T *row, std::ptrdiff_t first, std::ptrdiff_t end) const {
        Row sum = Row::zero();
        for (std::ptrdiff_t k = first; k < end; ++k)
            sum.addProduct(row[k], at(k));
        return sum;
    }

    void solveLU(const T *a) {
        for (std::ptrdiff_t i = 1; i < n_; ++i) {
            Row x = Row::load(at(i));
            x.subtract(sumOfProducts(a + i * n_, 0, i));
            x.store(at(i));
        }
        for (std::ptrdiff_t i = n_ - 1; i >= 0; --i) {
            Row x = Row::load(at(i));
            x.subtract(sumOfProducts(a + i * n_, i + 1, n_));
            x.divide(a[i * n_ + i]);
            x.store(at(i));
        }
    }

    // Divides unknown j by its pivot and subtracts it from the unknowns first to end - 1, whose
    // coefficients are contiguous.
    void eliminate(std::ptrdiff_t j, const T &pivot, std::ptrdiff_t first, std::ptrdiff_t end,
                   const T *coefficients) {
        Row x = Row::load(at(j));
        x.divide(pivot);
        x.store(at(j));
        for (std::ptrdiff_t i = first; i < end; ++i) {
            Row other = Row::load(at(i));
            other.subtractProduct(coefficients[i - first], x);
            other.store(at(i));
        }
    }
    void eliminateForward(const T *column) {
        for (std::ptrdiff_t j = 0; j < n_; ++j) {
            eliminate(j, column[0], j + 1, n_, column + 1);
            column += n_ - j;
        }
    }
    void eliminateBackward(const T *packed) {
        for (std::ptrdiff_t j = n_ - 1; j >= 0; --j) {
            const T *const column = packed + j * (j + 1) / 2;
            eliminate(j, column[j], 0, j, column);
        }
    }
    void solveTransposed(const T *packed) {
        const T *column = packed + n_ * (n_ + 1) / 2;
        for (std::ptrdiff_t j = n_ - 1; j >= 0; --j) {
            column -= n_ - j;
            Row x = Row::load(at(j));
            for (std::ptrdiff_t i = j + 1; i < n_; ++i)
                x.subtractProduct(Row::conjugate(column[i - j]), Row::load(at(i)));
            x.divide(Row::conjugate(column[0]));
            x.store(at(j));
        }
    }

    DBL *x_;
    std::ptrdiff_t n_;
};

template <class Row>
void SolveStrip(Factors factors, const typename Row::T *a, std::ptrdiff_t n,
                std::ptrdiff_t rightSides, typename Row::T *x, DBL *strip) {
    for (std::ptrdiff_t i = 0; i < n; ++i)
        Row::gather(x + i * rightSides, strip + i * Row::width);
    Strip<Row>(strip, n).solve(factors, a);
    for (std::ptrdiff_t i = 0; i < n; ++i)
        Row::scatter(strip + i * Row::width, x + i * rightSides);
}

// Wide strips while there are columns for them, then narrower ones.
template <template <class, int> class Row, int Vectors, class T>
void SolveAll(Factors factors, const T *a, std::ptrdiff_t n, std::ptrdiff_t rightSides, T *x,
              DBL *strip) {
    typedef Row<Lanes<nativeLanes>, Vectors> Wide;
    typedef Row<Lanes<nativeLanes>, 1> Narrow;
    typedef Row<Lanes<1>, 1> Single;
    static_assert(Wide::width <= stripWidth);
    if (rightSides == 1) // a strip of one column has the layout of the vector itself
        return Strip<Single>(reinterpret_cast<DBL *>(x), n).solve(factors, a);
    std::ptrdiff_t j = 0;
    for (; j + Wide::columns <= rightSides; j += Wide::columns)
        SolveStrip<Wide>(factors, a, n, rightSides, x + j, strip);
    for (; j + Narrow::columns <= rightSides; j += Narrow::columns)
        SolveStrip<Narrow>(factors, a, n, rightSides, x + j, strip);
    for (; j < rightSides; ++j)
        SolveStrip<Single>(factors, a, n, rightSides, x + j, strip);
}

} // namespace

void SubstituteStrips(Factors factors, const DBL *a, std::ptrdiff_t n, std::ptrdiff_t rightSides,
                      DBL *x, DBL *strip) {
    SolveAll<RealRow, nativeLanes == 8 ? 4 : 8>(factors, a, n, rightSides, x, strip);
}
void CxSubstituteStrips(Factors factors, const CDB *a, std::ptrdiff_t n, std::ptrdiff_t rightSides,
                        CDB *x, DBL *strip) {
    SolveAll<ComplexRow, nativeLanes == 8 ? 2 : 4>(factors, a, n, rightSides, x, strip);
}

} // namespace qx::QX_WIDTH
