"""Writes fit_bounds.dat: quantiles of Student's distribution by mpmath with 40 digits, and the results of R's
lm, confint and predict for data sets that come with R. Needs python3-mpmath and r-base-core.

    /usr/bin/python3 make_fit_bounds.py > fit_bounds.dat
"""

import subprocess

import mpmath

R = """
show <- function(name, fit, x, y, w, level) {
    at <- data.frame(x = x)
    conf <- predict(fit, at, interval = "confidence", level = level)
    pred <- predict(fit, at, interval = "prediction", level = level, weights = 1)
    both <- confint(fit, level = level)
    cat("fit", name, nrow(both), length(x), format(level, digits = 17), "\\n")
    out <- function(rows) for (i in seq_len(nrow(rows)))
        cat(formatC(rows[i, ], digits = 17, format = "g", width = 1), "\\n")
    out(cbind(coef(fit), both))
    out(cbind(x, y, w, conf[, 2:3], pred[, 2:3]))
}
x <- cars$speed; y <- cars$dist; one <- rep(1, length(x)); w <- 1 / x
show("cars", lm(y ~ x), x, y, one, 0.95)
show("cars_weighted", lm(y ~ x, weights = w), x, y, w, 0.99)
show("cars_square", lm(y ~ x + I(x^2)), x, y, one, 0.9)
x <- women$height; y <- women$weight; one <- rep(1, length(x))
show("women_cubic", lm(y ~ x + I(x^2) + I(x^3)), x, y, one, 0.95)
x <- pressure$temperature; y <- log(pressure$pressure); w <- pressure$pressure
show("pressure_weighted", lm(y ~ x + I(x^2), weights = w), x, y, w, 0.8)
"""


def two_sided_t(confidence, dof):
    """From I_x(dof / 2, 1 / 2) = 1 - confidence with x = dof / (dof + t^2)."""
    dof = mpmath.mpf(dof)
    outside = 1 - mpmath.mpf(confidence)

    def excess(log_t):
        t2 = mpmath.exp(2 * log_t)
        return mpmath.log(mpmath.betainc(dof / 2, 0.5, 0, dof / (dof + t2), regularized=True)) - \
            mpmath.log(outside) if outside < 0.5 else \
            mpmath.log(mpmath.betainc(0.5, dof / 2, 0, t2 / (dof + t2), regularized=True)) - \
            mpmath.log(confidence)

    low, high = mpmath.mpf(-60), mpmath.mpf(60)
    sign = 1 if excess(low) > 0 else -1
    for _ in range(90):
        middle = (low + high) / 2
        low, high = (middle, high) if sign * excess(middle) > 0 else (low, middle)
    return mpmath.exp(low)


mpmath.mp.dps = 40
print("# Written by make_fit_bounds.py.")
for dof in (1, 2, 3, 4, 7, 10, 30, 101, 1000):
    for confidence in (1e-12, 0.001, 0.3, 0.5, 0.8, 0.95, 0.99, 0.9999999, 1 - 2.0**-50):
        print("t", repr(confidence), dof, mpmath.nstr(two_sided_t(confidence, dof), 20))
print(subprocess.run(["Rscript", "-e", R], capture_output=True, text=True, check=True).stdout, end="")
