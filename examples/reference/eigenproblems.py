import numpy as np
import qx

#%% Eigenvalues of random matrices lie in a disc
import matplotlib.pyplot as plt  # hidden
rng = np.random.default_rng(2)
n = 200
values = qx.call("EigenValueVector_head", rng.normal(size=(n, n)) / np.sqrt(n), 0)[0]
figure, axes = plt.subplots(figsize=(3.4, 3.4))  # hidden
axes.plot(values.real, values.imag, ".", color="#2f6db3")  # hidden
axes.add_patch(plt.Circle((0, 0), 1, fill=False, color="#b34a2f"))  # hidden
axes.set_aspect("equal")  # hidden

#%% Modes of a chain of masses: the eigenvectors of a symmetric matrix
n = 40
chain = 2 * np.eye(n) - np.eye(n, k=1) - np.eye(n, k=-1)
modes, squares = qx.call("SymEvectorEvalue_head", chain, 1)
figure, axes = plt.subplots(figsize=(8, 2.4))  # hidden
for mode in range(3):  # hidden
    axes.plot(modes[:, mode], label=f"frequency {np.sqrt(squares[mode]):.3f}")  # hidden
axes.legend()  # hidden

#%% Schur form with eigenvalues of falling modulus
a = np.array([[1.0, 2, 0], [-3, 1, 1], [0, 1, 5]])
t, u, w = qx.call("Schur80_head", a, 1, 4)
print(np.round(t, 3), w, np.abs(u @ t @ u.T - a).max())
