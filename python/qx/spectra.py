r"""Spectra of measured signals in physical units: power densities, transfer functions, coherence,
spectrograms and envelopes.

Arguments have the names, order and defaults of `scipy.signal`. A signal is cut into segments of `nperseg`
values; neighbouring segments share `noverlap` values, and each is multiplied by a window.
"""

from __future__ import annotations

from typing import Any, Literal

import numpy as np
from numpy.typing import ArrayLike, NDArray

from . import windows
from .topical import LAST, Result, along, chosen, count_of, either, positive, refuse, result, served, whole_number
from .topical.axes import as_array, is_pandas

__all__ = ["CrossSpectrum", "Spectrogram", "Spectrum", "TransferFunction", "analytic", "coherence", "csd",
           "envelope", "instantaneous_frequency", "instantaneous_phase", "periodogram", "power",
           "spectrogram", "transfer_function", "welch"]

core = served("spectra")

AT_ONCE = 1 << 20  # number of values in the segments that are processed together
DETRENDS = {"constant": "constant", "linear": "linear", "none": None, False: None}
SCALINGS = {"density": "density", "spectrum": "spectrum"}
AVERAGES = {"mean": "mean", "median": "median"}


@result
class Spectrum(Result):
    """A power spectrum; unpacks into frequencies and values.

    Attributes
    ----------
    frequencies : ndarray
        In the unit of fs.
    values : ndarray
        In the squared unit of x per unit of fs; with scaling "spectrum", in the squared unit of x.
    resolution : float
        The equivalent noise bandwidth of a line, in the unit of fs.
    segments : int
        Number of segments that were averaged.
    scaling : str
        "density" or "spectrum".
    """

    frequencies: NDArray[Any]
    values: NDArray[Any]
    resolution: float
    segments: int
    scaling: str
    _unpacked = ("frequencies", "values")
    _axis = -1  # the axis of the frequencies in the values

    @property
    def amplitude(self) -> Any:
        """The square root of the values; for a density, in the unit of x per root of the unit of fs."""
        return np.sqrt(self.values)

    @property
    def decibels(self) -> Any:
        """10 lg of the values."""
        with np.errstate(divide="ignore"):
            return 10 * np.log10(self.values)

    def power(self, low: Any = -np.inf, high: Any = np.inf) -> Any:
        """The power between two frequencies, including the lines at both. Over the whole density, this is
        the mean square of the detrended signal."""
        if self.scaling != "density":
            refuse("spectra.Spectrum.power", "self", "must be a density to have a power in a band")
        inside = (self.frequencies >= low) & (self.frequencies <= high)
        width = abs(self.frequencies[1] - self.frequencies[0]) if len(self.frequencies) > 1 else 1.0
        return np.compress(inside, self.values, self._axis).sum(self._axis) * width

    def plot(self, axes: Any = None) -> Any:
        """Plots the values in decibels with matplotlib; returns the axes."""
        if axes is None:
            from matplotlib import pyplot
            axes = pyplot.subplots()[1]
        axes.plot(self.frequencies, np.moveaxis(np.asarray(self.decibels), self._axis, 0))
        axes.set(xlabel="frequency", ylabel="density (dB)" if self.scaling == "density" else "power (dB)")
        axes.grid(True, alpha=0.3)
        return axes


@result
class CrossSpectrum(Result):
    """A cross spectrum; unpacks into frequencies and complex values.

    Attributes
    ----------
    frequencies : ndarray
        In the unit of fs.
    values : ndarray of complex128
        The mean of conj(X) Y, in the product of the units of x and y per unit of fs.
    resolution : float
        The equivalent noise bandwidth of a line, in the unit of fs.
    segments : int
        Number of segments that were averaged.
    """

    frequencies: NDArray[Any]
    values: NDArray[Any]
    resolution: float
    segments: int
    _unpacked = ("frequencies", "values")


@result
class TransferFunction(Result):
    """The transfer function from an input to an output; unpacks into frequencies and complex gains.

    Attributes
    ----------
    frequencies : ndarray
        In the unit of fs.
    values : ndarray of complex128
        The gain, in units of y per unit of x.
    coherence : ndarray
        The fraction of the output's power that the input explains, from 0 to 1.
    resolution : float
        The equivalent noise bandwidth of a line, in the unit of fs.
    segments : int
        Number of segments that were averaged.
    """

    frequencies: NDArray[Any]
    values: NDArray[Any]
    coherence: NDArray[Any]
    resolution: float
    segments: int
    _unpacked = ("frequencies", "values")

    @property
    def error(self) -> Any:
        r"""The relative standard error of the magnitude,
        :math:`\sqrt{(1 - \gamma^2) / (2 n \gamma^2)}` for n independent segments (J. S. Bendat and A. G.
        Piersol, "Random data", 1971). Overlapping segments are counted as independent here."""
        with np.errstate(divide="ignore", invalid="ignore"):
            return np.sqrt((1 - self.coherence) / (2 * self.segments * self.coherence))


@result
class Spectrogram(Result):
    """Spectra of segments; unpacks into frequencies, times and values.

    Attributes
    ----------
    frequencies : ndarray
        In the unit of fs.
    times : ndarray
        The centres of the segments.
    values : ndarray
        One column for each time.
    resolution : float
        The equivalent noise bandwidth of a line, in the unit of fs.
    """

    frequencies: NDArray[Any]
    times: NDArray[Any]
    values: NDArray[Any]
    resolution: float
    _unpacked = ("frequencies", "times", "values")

    def plot(self, axes: Any = None) -> Any:
        """Plots the values in decibels as colours with matplotlib; returns the axes."""
        if axes is None:
            from matplotlib import pyplot
            axes = pyplot.subplots()[1]
        shown = 10 * np.log10(np.maximum(self.values, np.finfo(float).tiny))
        axes.pcolormesh(self.times, self.frequencies, shown, shading="nearest")
        axes.set(xlabel="time", ylabel="frequency")
        return axes


class _Segments:
    """How a signal is cut into segments, and the scale of a line of its spectra."""

    def __init__(self, function: Any, n: Any, fs: Any, window: Any, nperseg: Any, noverlap: Any, nfft: Any,
                 detrend: Any, scaling: Any, is_complex: Any) -> None:
        if n < 1:
            refuse(function, "x", "is empty", "ErrEmptyInput")
        fs = positive(function, "fs", fs, "ErrSamplingNotPositive")
        if nperseg is None:
            nperseg = min(256, n) if isinstance(window, (str, tuple)) else np.size(window)
        self.length = min(whole_number(function, "nperseg", nperseg, 1), n)
        noverlap = self.length // 2 if noverlap is None else whole_number(function, "noverlap", noverlap, 0)
        if noverlap >= self.length:
            refuse(function, "noverlap", f"must be below the length of a segment, {self.length}; got "
                   f"{noverlap}", "ErrSizesDisagree")
        self.step = self.length - noverlap
        self.size = self.length if nfft is None else whole_number(function, "nfft", nfft, 1)
        if self.size < self.length:
            refuse(function, "nfft", f"must be at least the length of a segment, {self.length}; got {nfft}",
                   "ErrSizesDisagree")
        self.count = (n - noverlap) // self.step
        self.detrend = chosen(function, "detrend", detrend, DETRENDS)
        self.scaling = chosen(function, "scaling", scaling, SCALINGS)
        self.window = windows.get(window, self.length)
        squares, total = np.sum(self.window**2), np.sum(self.window)
        self.scale = 1 / (fs * squares) if self.scaling == "density" else 1 / total**2
        self.resolution = fs * squares / total**2
        self.is_complex, self.fs = is_complex, fs
        self.frequencies = (np.fft.fftfreq if is_complex else np.fft.rfftfreq)(self.size, 1 / fs)
        self.times = (np.arange(self.count) * self.step + self.length / 2) / fs
        if not is_complex:  # the positive frequencies include the power at the negative ones
            self.scale = np.full(len(self.frequencies), 2 * self.scale)
            self.scale[0] /= 2
            if self.size % 2 == 0 and self.size > 1:
                self.scale[-1] /= 2

    def _trendless(self, rows: Any) -> Any:
        if self.detrend is None:
            return rows
        rows = rows - rows.mean(-1, keepdims=True)
        if self.detrend == "linear" and self.length > 1:
            t = np.arange(self.length) - (self.length - 1) / 2
            rows -= (rows @ t)[:, None] * (t / (t @ t))
        return rows

    def spectra(self, x: Any) -> Any:
        """The transforms of the segments, a few rows at a time."""
        x = np.ascontiguousarray(x, complex if self.is_complex else float)
        cut = np.lib.stride_tricks.sliding_window_view(x, self.length)[::self.step]
        rows_at_once = max(1, AT_ONCE // self.size)
        half = len(self.frequencies)
        padded = self.size > self.length
        transform = core.welch_complex if self.is_complex else core.welch
        sized = core.welch_complex_sized if self.is_complex else core.welch_sized
        for first in range(0, len(cut), rows_at_once):
            rows = self._trendless(cut[first:first + rows_at_once]) * self.window
            found = np.empty((len(rows), half), complex)
            for row, place in zip(rows, found):
                place[:] = (sized(row, 0, self.size, 0) if padded else transform(row))[:half]
            yield found

    def powers(self, x: Any) -> Any:
        return np.concatenate([found.real**2 + found.imag**2 for found in self.spectra(x)])

    def mean_power(self, x: Any) -> Any:
        """The mean of the powers. For real values, each transform takes two segments, as its real and
        imaginary parts: its power at k and n - k is the sum of the powers of both."""
        cut = np.lib.stride_tricks.sliding_window_view(x, self.length)[::self.step]
        n, total = self.size, np.zeros(self.size)
        rows_at_once = max(2, AT_ONCE // n & ~1)
        for first in range(0, len(cut), rows_at_once):
            rows = self._trendless(cut[first:first + rows_at_once]) * self.window
            if not self.is_complex:
                pairs = np.zeros(((len(rows) + 1) // 2, n), complex)
                pairs.real[:, :self.length] = rows[::2]
                pairs.imag[:len(rows) // 2, :self.length] = rows[1::2]
                rows = pairs
            elif n > self.length:
                rows = np.pad(rows, ((0, 0), (0, n - self.length)))
            for row in rows:
                total = total + core.welch_power(row)
        if not self.is_complex:
            total = (total + np.roll(total[::-1], 1))[:len(self.frequencies)] / 2
        return total * (float(n) * n / self.count)

    def sums(self, x: Any, y: Any) -> Any:
        """The sums of |X|^2, |Y|^2 and conj(X) Y over the segments."""
        xx, yy, xy = 0.0, 0.0, 0.0
        for of_x, of_y in zip(self.spectra(x), self.spectra(y)):
            xx = xx + np.sum(of_x.real**2 + of_x.imag**2, 0)
            yy = yy + np.sum(of_y.real**2 + of_y.imag**2, 0)
            xy = xy + np.sum(of_x.conj() * of_y, 0)
        factor = self.scale / self.count
        return xx * factor, yy * factor, xy * factor


def _is_complex(x: Any) -> Any:
    return (x.to_numpy() if is_pandas(x) else as_array(x)).dtype.kind == "c"


def _median_bias(n: Any) -> Any:
    """The expected median of n values from an exponential distribution of mean 1."""
    k = 2 * np.arange(1.0, (n - 1) // 2 + 1)
    return 1 + np.sum(1 / (k + 1) - 1 / k)


def welch(x: ArrayLike, fs: float = 1.0, window: str | tuple[Any, ...] | ArrayLike = "hann",
          nperseg: int | None = None, noverlap: int | None = None, nfft: int | None = None,
          detrend: Literal["constant", "linear", "none"] = "constant",
          scaling: Literal["density", "spectrum"] = "density", average: Literal["mean", "median"] = "mean",
          axis: int = LAST) -> Spectrum:
    r"""The power spectral density, averaged over overlapping segments.

    .. math:: P_k = \frac{2}{f_s \sum w^2} \Big\langle |X_k|^2 \Big\rangle

    with the factor 2 for real values at all frequencies except 0 and fs / 2. P. D. Welch, "The use of fast
    Fourier transform for the estimation of power spectra", 1967.

    Parameters
    ----------
    x : array_like
        Real or complex values. Complex values have a two-sided spectrum in the order of `qx.fft.fft`.
    fs : float
        The sampling rate.
    window : str, tuple or array_like
        As for `qx.windows.get`.
    nperseg : int, optional
        Number of values in a segment; by default 256, or all values if there are fewer.
    noverlap : int, optional
        Number of values shared by neighbouring segments; half a segment by default.
    nfft : int, optional
        Length of the transforms; the segments are zero-padded to it.
    detrend : {"constant", "linear", "none"}
        What is subtracted from each segment: its mean, its least-squares line, or nothing.
    scaling : {"density", "spectrum"}
        Power per unit of frequency, or the power of a line, which for a tone is its mean square.
    average : {"mean", "median"}
        How the segments are averaged. The median, corrected for its bias, ignores a few disturbed segments.
    axis : int
        The axis of time.

    Returns
    -------
    Spectrum

    Raises
    ------
    ValueError
        If x is empty, noverlap is not below nperseg, nfft is below it, or an option is not a valid choice.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = np.sin(2 * np.pi * 50 * np.arange(1000) / 1000)
    >>> found = qx.spectra.welch(x, 1000, nperseg=500)
    >>> float(found.frequencies[found.values.argmax()]), round(found.power(40, 60), 6)
    (50.0, 0.5)
    """
    average = chosen("spectra.welch", "average", average, AVERAGES)
    cut = _Segments("spectra.welch", count_of(x, axis), fs, window, nperseg, noverlap, nfft, detrend,
                    scaling, _is_complex(x))

    def of_channel(channel: Any) -> Any:
        if average == "mean":
            return cut.mean_power(channel) * cut.scale
        powers = cut.powers(channel)
        return np.median(powers, 0) / _median_bias(len(powers)) * cut.scale

    found = Spectrum(cut.frequencies, along(of_channel, x, axis), cut.resolution, cut.count, cut.scaling)
    found._axis = 0 if axis is LAST and is_pandas(x) else int(axis)
    return found


def periodogram(x: ArrayLike, fs: float = 1.0, window: str | tuple[Any, ...] | ArrayLike = "boxcar",
                nfft: int | None = None, detrend: Literal["constant", "linear", "none"] = "constant",
                scaling: Literal["density", "spectrum"] = "density", axis: int = LAST) -> Spectrum:
    """The power spectral density of all values as one segment: `welch` with a single segment.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    fs : float
        The sampling rate.
    window : str, tuple or array_like
        As for `qx.windows.get`.
    nfft : int, optional
        Length of the transform; the values are zero-padded to it.
    detrend : {"constant", "linear", "none"}
        What is subtracted from the values before the transform.
    scaling : {"density", "spectrum"}
        Power per unit of frequency, or the power of a line.
    axis : int
        The axis of time.

    Returns
    -------
    Spectrum

    Raises
    ------
    ValueError
        As for `welch`.

    Examples
    --------
    >>> import qx
    >>> qx.spectra.periodogram([1.0, -1.0, 1.0, -1.0]).values
    array([0., 0., 4.])
    """
    return welch(x, fs, window, count_of(x, axis), 0, nfft, detrend, scaling, axis=axis)


def power(x: ArrayLike, axis: int = LAST) -> NDArray[np.float64]:
    r"""The two-sided power spectrum without a window: :math:`|X_k|^2 / n^2`, whose sum is the mean
    square.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    axis : int
        The axis along which to transform.

    Returns
    -------
    ndarray of float64
        In the order of `qx.fft.fft`.

    Raises
    ------
    ValueError
        If x is empty.

    Examples
    --------
    >>> import qx
    >>> qx.spectra.power([1.0, -1.0, 1.0, -1.0])
    array([0., 0., 1., 0.])
    """
    return either(core.power, core.power_complex, x, axis)


def _pair(function: Any, x: Any, y: Any, fs: Any, window: Any, nperseg: Any, noverlap: Any, nfft: Any,
          detrend: Any, axis: Any) -> Any:
    """The segments of two signals and the sums of their spectra, channel by channel."""
    if axis is LAST and is_pandas(x):
        axis = 0
    x, y = (one.to_numpy() if is_pandas(one) else as_array(one) for one in (x, y))
    if x.shape != y.shape:
        refuse(function, "x, y", f"must have the same shape; got {x.shape} and {y.shape}", "ErrSizeMismatch")
    is_complex = x.dtype.kind == "c" or y.dtype.kind == "c"
    n = count_of(x, axis)
    cut = _Segments(function, n, fs, window, nperseg, noverlap, nfft, detrend, "density", is_complex)
    both = np.concatenate([x, y], axis)
    return cut, along(lambda channel: cut.sums(channel[:n], channel[n:]), both, axis)


def csd(x: ArrayLike, y: ArrayLike, fs: float = 1.0, window: str | tuple[Any, ...] | ArrayLike = "hann",
        nperseg: int | None = None, noverlap: int | None = None, nfft: int | None = None,
        detrend: Literal["constant", "linear", "none"] = "constant", axis: int = LAST) -> CrossSpectrum:
    r"""The cross power spectral density: the mean of :math:`\overline{X_k} Y_k`, scaled like `welch`.

    Parameters
    ----------
    x, y : array_like
        Two signals of the same shape.
    fs : float
        The sampling rate.
    window : str, tuple or array_like
        As for `qx.windows.get`.
    nperseg : int, optional
        Number of values in a segment; by default 256, or all values if there are fewer.
    noverlap : int, optional
        Number of values shared by neighbouring segments; half a segment by default.
    nfft : int, optional
        Length of the transforms.
    detrend : {"constant", "linear", "none"}
        What is subtracted from each segment.
    axis : int
        The axis of time.

    Returns
    -------
    CrossSpectrum

    Raises
    ------
    ValueError
        As for `welch`, and if x and y differ in shape.

    Examples
    --------
    >>> import qx
    >>> x = qx.noise.gaussian(4096, seed=1)
    >>> bool(abs(qx.spectra.csd(x, x).values.imag).max() == 0)
    True
    """
    cut, (_, _, xy) = _pair("spectra.csd", x, y, fs, window, nperseg, noverlap, nfft, detrend, axis)
    return CrossSpectrum(cut.frequencies, xy, cut.resolution, cut.count)


def transfer_function(x: ArrayLike, y: ArrayLike, fs: float = 1.0,
                      window: str | tuple[Any, ...] | ArrayLike = "hann", nperseg: int | None = None,
                      noverlap: int | None = None, nfft: int | None = None,
                      detrend: Literal["constant", "linear", "none"] = "constant",
                      estimator: Literal["H1", "H2"] = "H1", axis: int = LAST) -> TransferFunction:
    r"""The gain from an input x to an output y, with the coherence.

    .. math:: H_1 = \frac{\langle\overline{X} Y\rangle}{\langle|X|^2\rangle},\quad
              H_2 = \frac{\langle|Y|^2\rangle}{\langle\overline{Y} X\rangle},\quad
              \gamma^2 = \frac{|\langle\overline{X} Y\rangle|^2}{\langle|X|^2\rangle\langle|Y|^2\rangle}

    Parameters
    ----------
    x, y : array_like
        Input and output, of the same shape.
    fs : float
        The sampling rate.
    window : str, tuple or array_like
        As for `qx.windows.get`.
    nperseg : int, optional
        Number of values in a segment; by default 256, or all values if there are fewer.
    noverlap : int, optional
        Number of values shared by neighbouring segments; half a segment by default.
    nfft : int, optional
        Length of the transforms.
    detrend : {"constant", "linear", "none"}
        What is subtracted from each segment.
    estimator : {"H1", "H2"}
        "H1" is not biased by noise at the output, "H2" is not biased by noise at the input.
    axis : int
        The axis of time.

    Returns
    -------
    TransferFunction

    Raises
    ------
    ValueError
        As for `welch`, and if x and y differ in shape.

    Examples
    --------
    >>> import qx
    >>> x = qx.noise.gaussian(20000, seed=1)
    >>> f = qx.filters.butterworth(2, 0.1)
    >>> found = qx.spectra.transfer_function(x, f(x), nperseg=512)
    >>> bool(abs(found.values - f.response(found.frequencies).values).max() < 0.02)
    True
    """
    which = chosen("spectra.transfer_function", "estimator", estimator, {"H1": 1, "H2": 2})
    cut, (xx, yy, xy) = _pair("spectra.transfer_function", x, y, fs, window, nperseg, noverlap, nfft,
                              detrend, axis)
    with np.errstate(divide="ignore", invalid="ignore"):
        values = xy / xx if which == 1 else yy / xy.conj()
        found = (xy.real**2 + xy.imag**2) / (xx * yy)
    return TransferFunction(cut.frequencies, values, found.real, cut.resolution, cut.count)


def coherence(x: ArrayLike, y: ArrayLike, fs: float = 1.0, window: str | tuple[Any, ...] | ArrayLike = "hann",
              nperseg: int | None = None, noverlap: int | None = None, nfft: int | None = None,
              detrend: Literal["constant", "linear", "none"] = "constant", axis: int = LAST) -> Spectrum:
    """The coherence of two signals: the fraction, from 0 to 1, of the power of one that is linearly explained
    by the other. It unpacks into frequencies and values. With a single segment it is 1.

    Parameters
    ----------
    x, y : array_like
        Two signals of the same shape.
    fs : float
        The sampling rate.
    window : str, tuple or array_like
        As for `qx.windows.get`.
    nperseg : int, optional
        Number of values in a segment; by default 256, or all values if there are fewer.
    noverlap : int, optional
        Number of values shared by neighbouring segments; half a segment by default.
    nfft : int, optional
        Length of the transforms.
    detrend : {"constant", "linear", "none"}
        What is subtracted from each segment.
    axis : int
        The axis of time.

    Returns
    -------
    Spectrum

    Raises
    ------
    ValueError
        As for `welch`, and if x and y differ in shape.

    Examples
    --------
    >>> import qx
    >>> x = qx.noise.gaussian(4096, seed=1)
    >>> bool(abs(qx.spectra.coherence(x, 2 * x).values - 1).max() < 1e-12)
    True
    """
    found = transfer_function(x, y, fs, window, nperseg, noverlap, nfft, detrend, axis=axis)
    return Spectrum(found.frequencies, found.coherence, found.resolution, found.segments, "coherence")


def spectrogram(x: ArrayLike, fs: float = 1.0, window: str | tuple[Any, ...] | ArrayLike = ("tukey", 0.25),
                nperseg: int | None = None, noverlap: int | None = None, nfft: int | None = None,
                detrend: Literal["constant", "linear", "none"] = "constant",
                scaling: Literal["density", "spectrum"] = "density", axis: int = LAST) -> Spectrogram:
    """The power spectral densities of successive segments.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    fs : float
        The sampling rate.
    window : str, tuple or array_like
        As for `qx.windows.get`.
    nperseg : int, optional
        Number of values in a segment; by default 256, or all values if there are fewer.
    noverlap : int, optional
        Number of values shared by neighbouring segments; an eighth of a segment by default.
    nfft : int, optional
        Length of the transforms.
    detrend : {"constant", "linear", "none"}
        What is subtracted from each segment.
    scaling : {"density", "spectrum"}
        Power per unit of frequency, or the power of a line.
    axis : int
        The axis of time; frequencies and times are the last two axes of the result.

    Returns
    -------
    Spectrogram

    Raises
    ------
    ValueError
        As for `welch`.

    Examples
    --------
    >>> import qx
    >>> found = qx.spectra.spectrogram(qx.signals.chirp(8000, 0, 400, fs=1000), 1000)
    >>> found.frequencies[found.values.argmax(0)[[0, -1]]].round()
    array([  8., 387.])
    """
    n = count_of(x, axis)
    if noverlap is None:
        length = min(256 if nperseg is None else nperseg, n) if isinstance(window, (str, tuple)) else np.size(window)
        noverlap = int(length) // 8
    cut = _Segments("spectra.spectrogram", n, fs, window, nperseg, noverlap, nfft, detrend, scaling,
                    _is_complex(x))
    array = as_array(x).T if is_pandas(x) and axis is LAST else np.moveaxis(as_array(x), axis, -1)
    size = cut.count * len(cut.frequencies)
    flat = along(lambda channel: (cut.powers(channel) * cut.scale).T.ravel(), array)
    assert flat.shape[-1] == size
    return Spectrogram(cut.frequencies, cut.times,
                       flat.reshape(*flat.shape[:-1], len(cut.frequencies), cut.count), cut.resolution)


def analytic(x: ArrayLike, axis: int = LAST) -> NDArray[np.complex128]:
    """The analytic signal: x plus i times its Hilbert transform.

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray of complex128

    Raises
    ------
    ValueError
        If x is empty.

    Examples
    --------
    >>> import qx
    >>> abs(qx.spectra.analytic([1.0, 0.0, -1.0, 0.0])).round(12)
    array([1., 1., 1., 1.])
    """
    return along(lambda channel: channel + 1j * core.analytic(channel), x, axis)


def envelope(x: ArrayLike, axis: int = LAST) -> NDArray[np.float64]:
    """The envelope: the magnitude of the analytic signal of x less its mean.

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray of float64
        The magnitude at each time, measured from the mean.

    Raises
    ------
    ValueError
        If x is empty.

    Examples
    --------
    >>> import qx
    >>> qx.spectra.envelope([4.0, 3.0, 2.0, 3.0]).round(12)
    array([1., 1., 1., 1.])
    """
    return along(lambda channel: np.abs(_about_mean(channel)), x, axis)


def _about_mean(channel: Any) -> Any:
    found = core.analytic(channel)
    return (channel - np.mean(channel)) + 1j * found


def instantaneous_phase(x: ArrayLike, axis: int = LAST) -> NDArray[np.float64]:
    """The unwrapped phase, in radians, of the analytic signal of x less its mean.

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If x is empty.

    Examples
    --------
    >>> import qx
    >>> (qx.spectra.instantaneous_phase([1.0, 0.0, -1.0, 0.0, 1.0, 0.0, -1.0, 0.0])[-1] / 3.14159265).round(6)
    3.5
    """
    return along(lambda channel: core.instantaneous_phase(np.angle(_about_mean(channel)), 0), x, axis)


def instantaneous_frequency(x: ArrayLike, fs: float = 1.0, axis: int = LAST) -> NDArray[np.float64]:
    """The slope of the instantaneous phase, over the two intervals around each value, and over one at the ends.

    Parameters
    ----------
    x : array_like
        Real values, at least 2.
    fs : float
        The sampling rate.
    axis : int
        The axis of time.

    Returns
    -------
    ndarray of float64
        In the unit of fs.

    Raises
    ------
    ValueError
        If x has fewer than 2 values.

    Examples
    --------
    >>> import qx
    >>> x = qx.signals.chirp(4000, 50, 150, fs=1000)
    >>> found = qx.spectra.instantaneous_frequency(x, 1000)
    >>> bool(abs(found[2000] - 100) < 0.5)
    True
    """
    if count_of(x, axis) < 2:
        refuse("spectra.instantaneous_frequency", "x", "at least two values are needed", "ErrFewerThanTwo")
    return along(lambda channel: np.gradient(
        core.instantaneous_phase(np.angle(_about_mean(channel)), 0)) * (fs / (2 * np.pi)), x, axis)
