"""The linear regression sets of NIST's Statistical Reference Datasets with their exact solutions.

    make_nist_linear.py > nist_linear.dat

The data are those of https://www.itl.nist.gov/div898/strd/lls/lls.shtml (a work of the United
States government, free of rights). They are decimal numbers, so the coefficients, their variances
and the residuals are computed in rational arithmetic; the script compares them with the certified
values, which have 15 digits. The sets of Wampler are polynomials of degree 5, to which the last
three add multiples of a vector that is orthogonal to them (R. H. Wampler, "A report on the accuracy
of some widely used least squares computer programs", 1970).

A set is a line NAME KIND N K PREDICTORS, K lines with a coefficient and its standard deviation, the
sum of squared residuals, and N lines with y and the predictors. KIND is "polynomial", or "terms" if
the predictors are the columns of the matrix.
"""

from fractions import Fraction
from math import isqrt


def pairs(text):
    return [tuple(word.split(",")) for word in text.split()]


NORRIS = pairs("""
0.1,0.2  338.8,337.4  118.1,118.2  888.0,884.6  9.2,10.1  228.1,226.5  668.5,666.3  998.5,996.3
449.1,448.6  778.9,777.0  559.2,558.2  0.3,0.4  0.1,0.6  778.1,775.5  668.8,666.9  339.3,338.0
448.9,447.5  10.8,11.6  557.7,556.0  228.3,228.1  998.0,995.8  888.8,887.6  119.6,120.2  0.3,0.3
0.6,0.3  557.6,556.8  339.3,339.1  888.0,887.2  998.5,999.0  778.9,779.0  10.2,11.1  117.6,118.3
228.9,229.2  668.4,669.1  449.2,448.9  0.2,0.5
""")
PONTIUS = pairs("""
.11019,150000  .21956,300000  .32949,450000  .43899,600000  .54803,750000  .65694,900000
.76562,1050000  .87487,1200000  .98292,1350000  1.09146,1500000  1.20001,1650000
1.30822,1800000  1.41599,1950000  1.52399,2100000  1.63194,2250000  1.73947,2400000
1.84646,2550000  1.95392,2700000  2.06128,2850000  2.16844,3000000  .11052,150000  .22018,300000
.32939,450000  .43886,600000  .54798,750000  .65739,900000  .76596,1050000  .87474,1200000
.98300,1350000  1.09150,1500000  1.20004,1650000  1.30818,1800000  1.41613,1950000
1.52408,2100000  1.63159,2250000  1.73965,2400000  1.84696,2550000  1.95445,2700000
2.06177,2850000  2.16829,3000000
""")
FILIP = pairs("""
0.8116,-6.860120914  0.9072,-4.324130045  0.9052,-4.358625055  0.9039,-4.358426747
0.8053,-6.955852379  0.8377,-6.661145254  0.8667,-6.355462942  0.8809,-6.118102026
0.7975,-7.115148017  0.8162,-6.815308569  0.8515,-6.519993057  0.8766,-6.204119983
0.8885,-5.853871964  0.8859,-6.109523091  0.8959,-5.79832982  0.8913,-5.482672118
0.8959,-5.171791386  0.8971,-4.851705903  0.9021,-4.517126416  0.909,-4.143573228
0.9139,-3.709075441  0.9199,-3.499489089  0.8692,-6.300769497  0.8872,-5.953504836
0.89,-5.642065153  0.891,-5.031376979  0.8977,-4.680685696  0.9035,-4.329846955
0.9078,-3.928486195  0.7675,-8.56735134  0.7705,-8.363211311  0.7713,-8.107682739
0.7736,-7.823908741  0.7775,-7.522878745  0.7841,-7.218819279  0.7971,-6.920818754
0.8329,-6.628932138  0.8641,-6.323946875  0.8804,-5.991399828  0.7668,-8.781464495
0.7633,-8.663140179  0.7678,-8.473531488  0.7697,-8.247337057  0.77,-7.971428747
0.7749,-7.676129393  0.7796,-7.352812702  0.7897,-7.072065318  0.8131,-6.774174009
0.8498,-6.478861916  0.8741,-6.159517513  0.8061,-6.835647144  0.846,-6.53165267
0.8751,-6.224098421  0.8856,-5.910094889  0.8919,-5.598599459  0.8934,-5.290645224
0.894,-4.974284616  0.8957,-4.64454848  0.9047,-4.290560426  0.9129,-3.885055584
0.9209,-3.408378962  0.9219,-3.13200249  0.7739,-8.726767166  0.7681,-8.66695597
0.7665,-8.511026475  0.7703,-8.165388579  0.7702,-7.886056648  0.7761,-7.588043762
0.7809,-7.283412422  0.7961,-6.995678626  0.8253,-6.691862621  0.8602,-6.392544977
0.8809,-6.067374056  0.8301,-6.684029655  0.8664,-6.378719832  0.8834,-6.065855188
0.8898,-5.752272167  0.8964,-5.132414673  0.8963,-4.811352704  0.9074,-4.098269308
0.9119,-3.66174277  0.9228,-3.2644011
""")
LONGLEY = pairs("""
60323,1,83.0,234289,2356,1590,107608,1947  61122,1,88.5,259426,2325,1456,108632,1948
60171,1,88.2,258054,3682,1616,109773,1949  61187,1,89.5,284599,3351,1650,110929,1950
63221,1,96.2,328975,2099,3099,112075,1951  63639,1,98.1,346999,1932,3594,113270,1952
64989,1,99.0,365385,1870,3547,115094,1953  63761,1,100.0,363112,3578,3350,116219,1954
66019,1,101.2,397469,2904,3048,117388,1955  67857,1,104.6,419180,2822,2857,118734,1956
68169,1,108.4,442769,2936,2798,120445,1957  66513,1,110.8,444546,4681,2637,121950,1958
68655,1,112.6,482704,3813,2552,123366,1959  69564,1,114.2,502601,3931,2514,125368,1960
69331,1,115.7,518173,4806,2572,127852,1961  70551,1,116.9,554894,4007,2827,130081,1962
""")
NOINT1 = [(str(70 + x), str(x)) for x in range(60, 71)]
NOINT2 = [("3", "4"), ("4", "5"), ("4", "6")]
DISTURBANCE = [759, -2048, 2048, -2048, 2523, -2048, 2048, -2048, 1838, -2048, 2048]
DISTURBANCE += DISTURBANCE[-2::-1]


def wampler(step, disturbance):
    rows = []
    for x in range(21):
        y = sum((step * x) ** j for j in range(6)) + disturbance * DISTURBANCE[x]
        rows.append((str(y) if y.denominator == 1 else f"{float(y):.5f}", str(x)))
        assert Fraction(rows[-1][0]) == y
    return rows


TENTH, ONE = Fraction(1, 10), Fraction(1)
SETS = [
    # name, kind, k, rows, first certified coefficient, its deviation, certified sum of squares
    ("Norris", "polynomial", 2, NORRIS, "-0.262323073774029", "0.232818234301152",
     "26.6173985294224"),
    ("Pontius", "polynomial", 3, PONTIUS, "0.673565789473684E-03", "0.107938612033077E-03",
     "0.155761768796992E-05"),
    ("NoInt1", "terms", 1, NOINT1, "2.07438016528926", "0.165289256198347E-01",
     "127.272727272727"),
    ("NoInt2", "terms", 1, NOINT2, "0.727272727272727", "0.420827318078432E-01",
     "0.272727272727273"),
    ("Filip", "polynomial", 11, FILIP, "-1467.48961422980", "298.084530995537",
     "0.795851382172941E-03"),
    ("Longley", "terms", 7, LONGLEY, "-3482258.63459582", "890420.383607373", "836424.055505915"),
    ("Wampler1", "polynomial", 6, wampler(ONE, 0), "1", "0", "0"),
    ("Wampler2", "polynomial", 6, wampler(TENTH, 0), "1", "0", "0"),
    ("Wampler3", "polynomial", 6, wampler(ONE, 1), "1", "2152.32624678170", "83554268"),
    ("Wampler4", "polynomial", 6, wampler(ONE, 100), "1", "215232.624678170", "835542680000"),
    ("Wampler5", "polynomial", 6, wampler(ONE, 10000), "1", "21523262.4678170",
     "8355426800000000"),
]


def solve(matrix, right):
    """Gauss-Jordan elimination; the matrix is regular."""
    n = len(matrix)
    rows = [row + extra for row, extra in zip(matrix, right)]
    for i in range(n):
        pivot = next(r for r in range(i, n) if rows[r][i] != 0)
        rows[i], rows[pivot] = rows[pivot], rows[i]
        rows[i] = [value / rows[i][i] for value in rows[i]]
        for r in range(n):
            if r != i:
                rows[r] = [a - rows[r][i] * b for a, b in zip(rows[r], rows[i])]
    return [row[n:] for row in rows]


def root(value):
    shift = 10**80
    return Fraction(isqrt(value.numerator * shift**2 // value.denominator), shift)


def agrees(value, certified):
    certified = Fraction(certified)
    return value == certified or abs(value - certified) < abs(certified) / 10**14


for name, kind, k, data, first, deviation, squares in SETS:
    exact = [[Fraction(word) for word in row] for row in data]
    if kind == "polynomial":
        matrix = [[row[1] ** j for j in range(k)] for row in exact]
    else:
        matrix = [row[1:] for row in exact]
    y = [row[0] for row in exact]
    normal = [[sum(row[i] * row[j] for row in matrix) for j in range(k)] for i in range(k)]
    right = [[sum(row[i] * t for row, t in zip(matrix, y))] + [Fraction(i == j) for j in range(k)]
             for i in range(k)]
    solution = solve(normal, right)
    c = [row[0] for row in solution]
    rest = sum((t - sum(a * b for a, b in zip(row, c))) ** 2 for row, t in zip(matrix, y))
    deviations = [root(solution[i][1 + i] * rest / (len(y) - k)) for i in range(k)]
    assert agrees(c[0], first) and agrees(deviations[0], deviation) and agrees(rest, squares), name
    print(name, kind, len(y), k, len(data[0]) - 1)
    for value, error in zip(c, deviations):
        print(f"{float(value)!r} {float(error)!r}")
    print(repr(float(rest)))
    for row in data:
        print(*row)
