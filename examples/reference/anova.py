import numpy as np
import qx

#%% Do three groups have the same mean?
values = np.array([6.9, 5.4, 5.8, 4.6, 4.0, 8.3, 6.8, 7.8, 9.2, 6.5, 8.0, 10.5, 8.1, 6.9, 9.3])
groups = np.repeat([0, 1, 2], 5)
between, _, f, p, error, _, total = qx.call("Anova1Way_head", values, groups, 3)
print(f"between {between:.4f}  error {error:.4f}  total {total:.4f}")
print(f"F = {f:.3f}, p = {p:.5f}")

#%% Are rows and columns of a table independent?
chi_square, p = qx.call("Contingency_head", [[20, 30, 25], [35, 25, 15]])
print(f"chi-square {chi_square:.4f}, p = {p:.4f}")
