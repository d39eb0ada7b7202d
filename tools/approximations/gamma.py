#!/usr/bin/python3
"""Coefficients of the gamma function on [2, 3]: src/special/tables/reciprocal_gamma.h.

usage: gamma.py REPOSITORY
"""

import sys

from mpmath import gamma

from rational import Table

t = Table("gamma.py", "QX_SPECIAL_TABLES_RECIPROCAL_GAMMA_H")
t.add("gammaTwoToThree", "gamma(x) in x", gamma, 2, 3, 7, 6)
t.write(sys.argv[1] + "/src/special/tables/reciprocal_gamma.h")
