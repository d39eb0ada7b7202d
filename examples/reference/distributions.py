import numpy as np
import qx

#%% Probabilities and quantiles
print("P(T <= 2.5), 9 degrees of freedom ", qx.call("TDist_head", 2.5, 9))
print("quantile of that probability      ", qx.call("InvTdist_head", qx.call("TDist_head", 2.5, 9), 9))
print("chi-square, 95 % point, 4 degrees ", qx.call("InvChiSquare_head", 0.95, 4))

#%% Student's distribution nears the normal one
import matplotlib.pyplot as plt  # hidden
t = np.linspace(-4, 4, 200)
curves = {f"{dof} degrees": qx.call("TDist_head", t, dof) for dof in (1, 3, 10)}
curves["normal"] = qx.call("NormDist_head", t)
figure, axes = plt.subplots(figsize=(8, 2.8))  # hidden
for name, p in curves.items():  # hidden
    axes.plot(t, p, label=name)  # hidden
axes.legend(frameon=False)  # hidden
axes.set(xlabel="t", ylabel="Probability")  # hidden
