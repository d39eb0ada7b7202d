import numpy as np
import qx

#%% All roots of a polynomial; coefficients begin with the constant term
roots = qx.call("CxPolyRoots_head", np.array([-1, 0, 0, 0, 0, 1], complex), 100)
print(np.sort_complex(roots.round(6)))

#%% Roots known roughly, improved: real ones one by one, others in pairs
coefficients = np.polynomial.polynomial.polyfromroots([1, 2, -0.5 + 1j, -0.5 - 1j]).real
print(qx.call("PolyRootsNtBst_head", coefficients, [0.8, 2.3], 50, 1e-14,
              [-0.52 + 0.98j, -0.52 - 0.98j], 50, 1e-14))

#%% Multiple roots with their multiplicities
import matplotlib.pyplot as plt  # hidden
a = np.polynomial.polynomial.polyfromroots([1] * 6 + [0.5] * 8 + [-0.75] * 5)
_, roots, _, multiplicities = qx.call("MultPolyRoots_head", a, 1, 0.0)
for root, times in zip(roots, multiplicities):
    print(f"{root.real:.15f}  {times} times")
scattered = qx.call("CxPolyRoots_head", a.astype(complex), 100)
figure, axes = plt.subplots(figsize=(8, 2.6))  # hidden
axes.plot(scattered.real, scattered.imag, "o", color="#c9d3df", label="one by one")  # hidden
axes.plot(roots.real, roots.imag, "+", color="#c8553d", markersize=12, label="as multiple roots")  # hidden
axes.legend(frameon=False)  # hidden
axes.set(xlabel="real part", ylabel="imaginary part")  # hidden
