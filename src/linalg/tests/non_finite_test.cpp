#include "linalg/tests/host_matrix.h"
#include "qx/qx.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <limits>
#include <string>
#include <type_traits>
#include <vector>

namespace qx::test {
namespace {

// Every export that refuses non-finite numbers, through each of its code paths and in each of its
// inputs. The numbers are put in the first, a middle and the last place.

enum Reads : unsigned {
    Everything = 0,
    RightSide = 1,   // has a second input, of one column
    Rectangular = 2, // takes matrices that are not square
    Lower = 4,       // reads the lower triangle, or
    Upper = 8,       // the upper one
    DiagonalOnly = 16,
    LargestIsFine = 32, // takes the largest finite number
    FullOnly = 64,      // takes a diagonal matrix element by element
};

template <ElementType E>
struct Refuser {
    std::string name;
    std::function<ErrorCode(HostMatrix<E> a, HostMatrix<E> b)> call;
    unsigned reads = Everything;
};

template <ElementType E, class Real, class Complex>
constexpr auto Twin(Real real, Complex complex) {
    if constexpr (E == ElementType::DBL)
        return real;
    else
        return complex;
}

// The code of an export that writes it to its last argument.
template <class Export, class... Arguments>
ErrorCode ErrOf(Export call, Arguments... arguments) {
    ErrorCode err = 0;
    call(arguments..., &err);
    return err;
}

template <ElementType E>
Array1D<E> Elements(const HostMatrix<E> &a) {
    return Array1D<E>(a.values());
}
template <ElementType E>
Array1D<E> PackedOf(const HostMatrix<E> &a, int32_t triangle) {
    std::vector<typename Array1D<E>::Value> packed;
    for (int j = 0; j < a.cols(); ++j)
        for (int i = triangle == 0 ? j : 0; i < (triangle == 0 ? a.rows() : j + 1); ++i)
            packed.push_back(a.values()[i * a.cols() + j]);
    return Array1D<E>(packed);
}
template <ElementType E>
using Triangle = std::conditional_t<E == ElementType::DBL, PackedTriangle, CxPackedTriangle>;

template <ElementType E>
std::vector<Refuser<E>> Systems() {
    typedef HostMatrix<E> M;
    typedef Array1D<E> V;
    const unsigned any = RightSide | Rectangular;
    std::vector<Refuser<E>> all = {
        {"GenLinEqs",
         [](M a, M b) {
             V x, right = Elements(b);
             return ErrOf(Twin<E>(GenLinEqs_head, CxGenLinEqs_head), a.handle(), right.handle(),
                          x.handle());
         },
         any},
        {"EqsSetBySVDDri",
         [](M a, M b) {
             M x;
             return Twin<E>(EqsSetBySVDDri_head, CxEqsSetBySVDDri_head)(a.handle(), b.handle(),
                                                                        x.handle());
         },
         any},
        {"GenLinEqs2026",
         [](M a, M b) {
             V x, right = Elements(b);
             return Twin<E>(GenLinEqs2026_head, CxGenLinEqs2026_head)(a.handle(), right.handle(),
                                                                      x.handle(), -1.0);
         },
         any | LargestIsFine},
        {"EqsSetBySVD2026",
         [](M a, M b) {
             M x;
             return Twin<E>(EqsSetBySVD2026_head, CxEqsSetBySVD2026_head)(a.handle(), b.handle(),
                                                                          x.handle(), -1.0);
         },
         any | LargestIsFine},
        {"EqsSetByLU2026",
         [](M a, M b) {
             M x;
             DBL reciprocal;
             return Twin<E>(EqsSetByLU2026_head, CxEqsSetByLU2026_head)(a.handle(), b.handle(),
                                                                        x.handle(), &reciprocal);
         },
         RightSide | LargestIsFine},
        {"PseudoInverse2026",
         [](M a, M) {
             M out;
             return Twin<E>(PseudoInverse2026_head, CxPseudoInverse2026_head)(a.handle(), -1.0,
                                                                              out.handle());
         },
         Rectangular | LargestIsFine},
        {"EqsByCholeskyDri",
         [](M a, M b) {
             V x, right = Elements(b);
             return ErrOf(Twin<E>(EqsByCholeskyDri_head, CxEqsByCholeskyDri_head), a.handle(),
                          right.handle(), x.handle());
         },
         RightSide},
        {"PseudoInverse",
         [](M a, M) {
             const double tolerance = -1.0;
             return ErrOf(Twin<E>(PseudoInverse_head, CxPseudoInverse_head), a.handle(),
                          &tolerance);
         },
         Rectangular},
    };
    for (const int32_t triangle : {0, 1}) {
        const std::string name = triangle == 0 ? ": lower" : ": upper";
        const unsigned reads = triangle == 0 ? Lower : Upper;
        all.push_back({"EqsSetByCholeskyDri" + name,
                       [=](M a, M b) {
                           M x;
                           return Twin<E>(EqsSetByCholeskyDri_head, CxEqsSetByCholeskyDri_head)(
                               a.handle(), triangle, b.handle(), x.handle());
                       },
                       RightSide});
        all.push_back({"TriEqsSetDri" + name,
                       [=](M a, M b) {
                           M x;
                           return Twin<E>(TriEqsSetDri_head, CxTriEqsSetDri_head)(
                               a.handle(), triangle, b.handle(), x.handle());
                       },
                       RightSide | reads});
        all.push_back({"TriLinEqs" + name,
                       [=](M a, M b) {
                           V packed = PackedOf(a, triangle), right = Elements(b);
                           const Triangle<E> record = {packed.handle(), triangle};
                           return ErrOf(Twin<E>(TriLinEqs_head, CxTriLinEqs_head), &record,
                                        right.handle());
                       },
                       RightSide | reads});
        all.push_back({"Tri_InvMatrix" + name,
                       [=](M a, M) {
                           V packed = PackedOf(a, triangle);
                           Triangle<E> record = {packed.handle(), triangle};
                           return ErrOf(Twin<E>(Tri_InvMatrix_head, CxTri_InvMatrix_head), &record);
                       },
                       reads});
        all.push_back({"InvMatrixTriDri" + name,
                       [=](M a, M) {
                           return ErrOf(Twin<E>(InvMatrixTriDri_head, CxInvMatrixTriDri_head),
                                        a.handle(), &triangle);
                       },
                       reads});
    }
    return all;
}

template <ElementType E>
std::vector<Refuser<E>> Factorisations() {
    typedef HostMatrix<E> M;
    typedef Array1D<ElementType::DBL> Reals;
    typedef Array1D<ElementType::CDB> Complexes;
    std::vector<Refuser<E>> all = {
        {"SVD",
         [](M a, M) {
             Reals s;
             M v;
             return ErrOf(Twin<E>(SVD_head, CxSVD_head), a.handle(), s.handle(), v.handle());
         },
         Rectangular},
        {"SVDEx",
         [](M a, M) {
             Reals s;
             M u, v;
             return Twin<E>(SVDEx_head, CxSVDEx_head)(a.handle(), 1, u.handle(), s.handle(),
                                                      v.handle());
         },
         Rectangular},
        {"SVD2026",
         [](M a, M) {
             Reals s;
             M u, v;
             return Twin<E>(SVD2026_head, CxSVD2026_head)(a.handle(), 1, u.handle(), s.handle(),
                                                          v.handle());
         },
         Rectangular | LargestIsFine},
        {"SVDS2026",
         [](M a, M) {
             Reals s;
             return Twin<E>(SVDS2026_head, CxSVDS2026_head)(a.handle(), s.handle());
         },
         Rectangular | LargestIsFine},
        {"SVDS",
         [](M a, M) {
             Reals s;
             return ErrOf(Twin<E>(SVDS_head, CxSVDS_head), a.handle(), s.handle());
         },
         Rectangular},
        {"Hessenberg",
         [](M a, M) {
             M q;
             return Twin<E>(Hessenberg_head, CxHessenberg_head)(a.handle(), 1, a.rows(),
                                                                q.handle());
         }},
    };
    for (const int32_t choice : {0, 1, 2}) {
        const std::string name = std::to_string(choice);
        all.push_back({"qrd " + name,
                       [=](M a, M) {
                           M q, r;
                           return ErrOf(Twin<E>(qrd_head, Cxqrd_head), a.handle(), &choice,
                                        q.handle(), r.handle());
                       },
                       Rectangular});
        for (const int32_t pivoting : {0, 1})
            all.push_back({"QRDec " + name + (pivoting != 0 ? ", pivoted" : ""),
                           [=](M a, M) {
                               M q, r;
                               I32_2DArray permutation;
                               return Twin<E>(QRDecH, CxQRDecH)(a.handle(), pivoting, choice,
                                                                permutation.handle(), q.handle(),
                                                                r.handle());
                           },
                           Rectangular});
    }
    for (const int32_t job : {0, 1, 2, 3})
        all.push_back({std::to_string(job) + " MatrixBalance", [=](M a, M) {
                           Reals scale;
                           int32_t low, high;
                           return Twin<E>(MatrixBalance_head, CxMatrixBalance_head)(
                               a.handle(), job, &low, &high, scale.handle());
                       }});
    for (const int32_t order : {0, 1, 4})
        all.push_back({std::to_string(order) + " Schur80", [=](M a, M) {
                           M u;
                           Complexes w;
                           return Twin<E>(Schur80_head, CxSchur80_head)(a.handle(), 1, order,
                                                                        u.handle(), w.handle());
                       }});
    return all;
}

// A and B of generalised problems and of matrix equations; the matrix that is not tested is the
// identity.
template <ElementType E>
HostMatrix<E> Unit(int n) {
    HostMatrix<E> unit(n, n);
    for (int i = 0; i < n; ++i)
        reinterpret_cast<double &>(unit.data()[i * n + i]) = 1.0;
    return unit;
}
template <ElementType E>
std::vector<Refuser<E>> TwoMatrices() {
    typedef HostMatrix<E> M;
    typedef Array1D<ElementType::DBL> Reals;
    typedef Array1D<ElementType::CDB> Complexes;
    std::vector<Refuser<E>> all;
    for (const bool isFirst : {true, false}) {
        const std::string name = isFirst ? ": first" : ": second";
        all.push_back({"QZ80" + name, [=](M a, M) {
                           M unit = Unit<E>(a.rows()), q, z;
                           Complexes alpha;
                           Array1D<E> beta;
                           return Twin<E>(QZ80_head, CxQZ80_head)(
                               (isFirst ? a : unit).handle(), (isFirst ? unit : a).handle(), 1, 0,
                               q.handle(), z.handle(), alpha.handle(), beta.handle());
                       }});
        all.push_back({"GenEigenEx" + name, [=](M a, M) {
                           const M unit = Unit<E>(a.rows());
                           Complexes values;
                           CDB2DArray vectors;
                           return Twin<E>(GenEigenEx_head, CxGenEigenEx_head)(
                               (isFirst ? a : unit).handle(), (isFirst ? unit : a).handle(), 1,
                               values.handle(), vectors.handle());
                       }});
        all.push_back({"GSVD" + name, [=](M a, M) {
                           M unit = Unit<E>(a.rows()), u, v, q;
                           Reals alpha, beta;
                           int32_t k, l;
                           return Twin<E>(GSVD_head, CxGSVD_head)(
                               (isFirst ? a : unit).handle(), (isFirst ? unit : a).handle(),
                               alpha.handle(), beta.handle(), u.handle(), v.handle(), q.handle(),
                               &k, &l);
                       }});
        for (const int32_t equation : {0, 1})
            all.push_back({"Lyapunov" + name + (equation == 0 ? ", continuous" : ", discrete"),
                           [=](M a, M) {
                               const M unit = Unit<E>(a.rows());
                               M x;
                               return Twin<E>(Lyapunov2011_head, CxLyapunov2011_head)(
                                   (isFirst ? a : unit).handle(), (isFirst ? unit : a).handle(),
                                   equation, x.handle());
                           },
                           LargestIsFine});
    }
    for (const int place : {0, 1, 2})
        for (const int32_t equation : {0, 1, 2})
            all.push_back({std::to_string(equation) + " Sylvester, input " + std::to_string(place),
                           [=](M a, M) {
                               const M unit = Unit<E>(a.rows());
                               M x;
                               const auto at = [&](int input) {
                                   return (place == input ? a : unit).handle();
                               };
                               return Twin<E>(Sylvester2011_head, CxSylvester2011_head)(
                                   at(0), at(1), at(2), equation, x.handle());
                           },
                           LargestIsFine});
    return all;
}

template <ElementType E>
std::vector<Refuser<E>> Properties() {
    typedef HostMatrix<E> M;
    std::vector<Refuser<E>> all = {
        {"MatrixExp",
         [](M a, M) { return ErrOf(Twin<E>(MatrixExp_head, CxMatrixExp_head), a.handle()); },
         FullOnly},
        {"MatrixExp2026",
         [](M a, M) {
             M out;
             return Twin<E>(MatrixExp2026_head, CxMatrixExp2026_head)(a.handle(), out.handle());
         },
         LargestIsFine},
        {"MatrixLn2026",
         [](M a, M) {
             CDB2DArray out;
             return Twin<E>(MatrixLn2026_head, CxMatrixLn2026_head)(a.handle(), out.handle());
         },
         LargestIsFine},
        {"MatrixSqrt2026",
         [](M a, M) {
             CDB2DArray out;
             return Twin<E>(MatrixSqrt2026_head, CxMatrixSqrt2026_head)(a.handle(), out.handle());
         },
         LargestIsFine},
        {"MatrixPower2026",
         [](M a, M) {
             M out;
             return Twin<E>(MatrixPower2026_head, CxMatrixPower2026_head)(a.handle(), 0,
                                                                          out.handle());
         },
         LargestIsFine},
        {"MatrixPower -1",
         [](M a, M) { return Twin<E>(MatrixPower_head, CxMatrixPower_head)(a.handle(), -1); }},
        {"Rank",
         [](M a, M) {
             const double tolerance = -1.0;
             int32_t rank;
             return ErrOf(Twin<E>(Rank_head, CxRank_head), a.handle(), &tolerance, &rank);
         },
         Rectangular},
        {"Rank2026",
         [](M a, M) {
             int32_t rank;
             return Twin<E>(Rank2026_head, CxRank2026_head)(a.handle(), -1.0, &rank);
         },
         Rectangular | LargestIsFine},
        {"CheckPosdef",
         [](M a, M) {
             int32_t isDefinite;
             return ErrOf(Twin<E>(CheckPosdef_head, CxCheckPosdef_head), a.handle(), &isDefinite);
         },
         DiagonalOnly},
        {"CheckPosSemiDef",
         [](M a, M) {
             int32_t isSemiDefinite, rank;
             return Twin<E>(CheckPosSemiDef_head, CxCheckPosSemiDef_head)(a.handle(), -1.0,
                                                                          &isSemiDefinite, &rank);
         }},
        {"MatrixCharacteristicPoly",
         [](M a, M) {
             Array1D<E> polynomial;
             return ErrOf(Twin<E>(MatrixCharacteristicPoly_head, CxMatrixCharacteristicPoly_head),
                          a.handle(), polynomial.handle());
         }},
    };
    for (const int32_t type : {0, 1, 2, 3}) {
        const std::string name = std::to_string(type);
        const unsigned reads = type == 0 ? Rectangular : Everything;
        all.push_back({"Determinant " + name, [=](M a, M) {
                           std::conditional_t<E == ElementType::DBL, DBL, CDB> det;
                           return ErrOf(Twin<E>(Determinant_head, CxDeterminant_head), a.handle(),
                                        &type, &det);
                       }});
        all.push_back({"Norm2026 " + name,
                       [=](M a, M) {
                           DBL norm;
                           return Twin<E>(Norm2026_head, CxNorm2026_head)(a.handle(), type, &norm);
                       },
                       Rectangular | LargestIsFine});
        all.push_back({"CondNumber2026 " + name,
                       [=](M a, M) {
                           DBL cond;
                           return Twin<E>(CondNumber2026_head, CxCondNumber2026_head)(a.handle(),
                                                                                      type, &cond);
                       },
                       reads | LargestIsFine});
        all.push_back({"Norm " + name,
                       [=](M a, M) {
                           DBL norm;
                           return ErrOf(Twin<E>(Norm_head, CxNorm_head), a.handle(), &type, &norm);
                       },
                       Rectangular});
        all.push_back({"CondNumber " + name,
                       [=](M a, M) {
                           DBL cond;
                           return ErrOf(Twin<E>(CondNumber_head, CxCondNumber_head), a.handle(),
                                        &type, &cond);
                       },
                       reads});
    }
    return all;
}

// Exports that exist only for real matrices, or whose complex twin has another form.
std::vector<Refuser<ElementType::DBL>> RealOnly() {
    typedef DBL2DArray M;
    std::vector<Refuser<ElementType::DBL>> all = {
        {"GenLinEqs2010",
         [](M a, M b) {
             DBLArray x, work, right = Elements(b);
             return GenLinEqs2010_head(a.handle(), right.handle(), x.handle(), -1.0, work.handle());
         },
         RightSide | Rectangular},
        {"Schur2026",
         [](M a, M) {
             M u;
             CDBArray w;
             return Schur2026_head(a.handle(), 1, 1, u.handle(), w.handle());
         },
         LargestIsFine},
        {"GenLinEqsbySVD2011",
         [](M a, M b) {
             DBLArray x, work, right = Elements(b);
             return GenLinEqsbySVD2011_head(a.handle(), right.handle(), x.handle(), -1.0, 2,
                                            work.handle());
         },
         RightSide | Rectangular},
        {"MatrixLn",
         [](M a, M) {
             CDB2DArray log;
             return ErrOf(MatrixLn_head, a.handle(), log.handle());
         }},
        {"MatrixSqrt", [](M a, M) { return ErrOf(MatrixSqrt_head, a.handle()); }},
        {"MatrixSqrtH",
         [](M a, M) {
             CDB2DArray root;
             return MatrixSqrtH(a.handle(), root.handle());
         }},
    };
    for (const int32_t output : {0, 1}) {
        const std::string name = std::to_string(output);
        all.push_back({"EigenValueVector " + name, [=](M a, M) {
                           CDBArray values;
                           CDB2DArray vectors;
                           return ErrOf(EigenValueVector_head, a.handle(), &output, values.handle(),
                                        vectors.handle());
                       }});
        all.push_back({"SymEvectorEvalue " + name, [=](M a, M) {
                           DBLArray values;
                           return ErrOf(SymEvectorEvalue_head, a.handle(), &output,
                                        values.handle());
                       }});
        all.push_back({"CheckSym " + name, [=](M a, M) {
                           int32_t isSymmetric;
                           return CheckSym_head(a.handle(), -1.0, output, &isSymmetric);
                       }});
    }
    return all;
}
std::vector<Refuser<ElementType::CDB>> ComplexOnly() {
    typedef CDB2DArray M;
    std::vector<Refuser<ElementType::CDB>> all = {
        {"CxMatrixLn", [](M a, M) { return ErrOf(CxMatrixLn_head, a.handle()); }},
        {"CxMatrixSqrt", [](M a, M) { return ErrOf(CxMatrixSqrt_head, a.handle()); }},
    };
    for (const int32_t choice : {0, 1}) {
        const std::string name = std::to_string(choice);
        all.push_back({"CxEigenValueVector: type and output " + name, [=](M a, M) {
                           CDBArray values;
                           CDB2DArray vectors;
                           return ErrOf(CxEigenValueVector_head, a.handle(), &choice, &choice,
                                        values.handle(), vectors.handle());
                       }});
        all.push_back({"CxCheckSym " + name, [=](M a, M) {
                           int32_t isSymmetric;
                           return CxCheckSym_head(a.handle(), -1.0, choice, choice, &isSymmetric);
                       }});
    }
    return all;
}

// The matrices that are tried: full ones with a dominant diagonal, and a diagonal one.
struct Shape {
    int rows, cols;
    bool isDiagonal;
};
const std::vector<Shape> shapes = {{1, 1, false}, {2, 2, false}, {3, 3, false},
                                   {3, 3, true},  {4, 2, false}, {2, 4, false}};

bool IsTried(unsigned reads, const Shape &shape) {
    if (shape.rows != shape.cols)
        return (reads & Rectangular) != 0;
    return (reads & FullOnly) == 0 || (!shape.isDiagonal && shape.rows > 1);
}
bool IsRead(unsigned reads, const Shape &shape, int i, int j) {
    if ((reads & Lower) != 0)
        return i >= j;
    if ((reads & Upper) != 0)
        return i <= j;
    return i == j || ((reads & DiagonalOnly) == 0 && !shape.isDiagonal);
}

template <ElementType E>
HostMatrix<E> Made(const Shape &shape) {
    HostMatrix<E> a(shape.rows, shape.cols);
    for (int i = 0; i < shape.rows; ++i)
        for (int j = 0; j < shape.cols; ++j)
            reinterpret_cast<double &>(a.data()[i * shape.cols + j]) = i == j             ? 4.0 + i
                                                                       : shape.isDiagonal ? 0.0
                                                                                          : 1.0;
    return a;
}

template <ElementType E>
void ExpectRefusals(const std::vector<Refuser<E>> &refusers) {
    constexpr int parts = E == ElementType::CDB ? 2 : 1;
    constexpr double infinite = std::numeric_limits<double>::infinity();
    constexpr double largest = std::numeric_limits<double>::max();
    for (const Refuser<E> &refuser : refusers)
        for (const Shape &shape : shapes) {
            if (!IsTried(refuser.reads, shape))
                continue;
            SCOPED_TRACE(testing::Message()
                         << refuser.name << (parts == 2 ? ", complex, " : ", ") << shape.rows
                         << " by " << shape.cols << (shape.isDiagonal ? ", diagonal" : ""));
            const HostMatrix<E> a = Made<E>(shape), b = Made<E>({shape.rows, 1, false});
            EXPECT_NE(refuser.call(a, b), ErrNonFiniteInput) << "all is finite";
            for (const double bad : {std::numeric_limits<double>::quiet_NaN(), infinite, -infinite,
                                     largest, -largest}) {
                if (std::isfinite(bad) && (refuser.reads & LargestIsFine) != 0)
                    continue;
                const auto expectRefused = [&](bool inRight, int at, int part) {
                    HostMatrix<E> first = a, second = b;
                    DBL *const elements =
                        reinterpret_cast<DBL *>((inRight ? second : first).data());
                    elements[at * parts + part] = bad;
                    EXPECT_EQ(refuser.call(first, second), ErrNonFiniteInput)
                        << bad << " in " << (inRight ? "b" : "a") << "[" << at << "] " << part;
                };
                const int tried = (refuser.reads & DiagonalOnly) != 0 ? 1 : parts;
                for (int part = 0; part < tried; ++part) {
                    for (int i = 0; i < shape.rows; ++i)
                        for (int j = 0; j < shape.cols; ++j)
                            if (IsRead(refuser.reads, shape, i, j))
                                expectRefused(false, i * shape.cols + j, part);
                    for (int i = 0; (refuser.reads & RightSide) != 0 && i < shape.rows; ++i)
                        expectRefused(true, i, part);
                }
            }
        }
}

TEST(NonFinite, NumbersAreRefusedWhereverTheyAre) {
    ExpectRefusals(Systems<ElementType::DBL>());
    ExpectRefusals(Systems<ElementType::CDB>());
    ExpectRefusals(Factorisations<ElementType::DBL>());
    ExpectRefusals(Factorisations<ElementType::CDB>());
    ExpectRefusals(TwoMatrices<ElementType::DBL>());
    ExpectRefusals(TwoMatrices<ElementType::CDB>());
    ExpectRefusals(Properties<ElementType::DBL>());
    ExpectRefusals(Properties<ElementType::CDB>());
    ExpectRefusals(RealOnly());
    ExpectRefusals(ComplexOnly());
}

} // namespace
} // namespace qx::test
