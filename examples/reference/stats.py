import numpy as np
import qx

#%% Location and spread
x = np.array([2.0, 4, 4, 4, 5, 5, 7, 9])
print("mean    ", qx.call("Mean_head", x))
print("median  ", qx.call("Median_head", x))
print("RMS     ", qx.call("RMS_head", x))
print("variance", qx.call("Moment_head", x, 2))
print("modes   ", qx.call("ModeH", x, 0))

#%% A failure has a code, a name and a text
try:
    qx.call("Moment_head", x, 0)
except qx.QxError as error:
    print(error.code, error.name, "-", error.text)

#%% A histogram over the range of the data
import matplotlib.pyplot as plt  # hidden
samples = np.random.default_rng(1).gamma(3.0, size=2000)
counts, centres = qx.call("histgran_head", samples, 30)
print("the fullest bin is around", centres[np.argmax(counts)])
figure, axes = plt.subplots(figsize=(8, 2.6))  # hidden
axes.bar(centres, counts, width=0.9 * (centres[1] - centres[0]), color="#2f6db3")  # hidden
axes.set(title="2000 gamma variates of shape 3", xlabel="Value", ylabel="Count")  # hidden

#%% Intervals of one's own
intervals = [(0.0, 1.0, 0), (1.0, 2.0, 0), (2.0, 100.0, 2)]
counts, summary = qx.call("GenHistH", samples, intervals)
print(counts, summary)
