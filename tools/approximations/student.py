#!/usr/bin/python3
"""Writes src/special/tables/student.h: the relative deficit of Student's density at 0 against the normal density.

usage: student.py REPOSITORY
"""

import sys

from mpmath import exp, loggamma, mp, mpf, sqrt

from rational import Table


def lacking(w):
    if w < mpf(10)**-15:
        return w / 4 - w * w / 32
    return 1 - exp(loggamma((1 / w + 1) / 2) - loggamma(1 / w / 2)) * sqrt(2 * w)


if __name__ == "__main__":
    mp.dps = 60
    t = Table("student.py", "QX_SPECIAL_TABLES_STUDENT_H")
    WHAT = "1 - gamma((n + 1) / 2) / (gamma(n / 2) sqrt(n / 2)) in "
    t.add("studentFirst", WHAT + "n", lambda n: lacking(1 / n), 1, 3, 7, 7)
    t.add("studentSecond", WHAT + "n", lambda n: lacking(1 / n), 3, 10, 7, 7)
    t.add("studentThird", WHAT + "n", lambda n: lacking(1 / n), 10, 40, 5, 5)
    t.add("studentMany", "the same by n in 1 / n", lambda w: lacking(w) / w if w else mpf(1) / 4, 0, mpf(1) / 40, 4, 4)
    t.write(sys.argv[1] + "/src/special/tables/student.h")
