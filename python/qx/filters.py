r"""Filters as objects. A filter is designed by name and applied to arrays of any dimension, forwards, in
both directions or block by block.

    lowpass = qx.filters.butterworth(4, 40, fs=1000)
    y = lowpass(x)                     # along the last axis
    y = lowpass.zero_phase(x)          # without delay, with extended ends
    stream = lowpass.stream()          # y = stream(block) for each block

Frequencies are in the unit of the sampling rate `fs`; with its default of 1.0, in cycles per sample.
"""

from __future__ import annotations

import math
from typing import Any, Literal

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .topical import (LAST, Result, Stream, along, chosen, count_of, either, refuse, result, served, vector,
                      whole_number)

__all__ = ["Filter", "FilterStream", "Response", "bessel", "butterworth", "chebyshev1", "chebyshev2",
           "elliptic", "equiripple", "from_ba", "from_sos", "median", "narrow", "savgol",
           "windowed"]

core = served("filters")

KINDS = {"lowpass": 0, "highpass": 1, "bandpass": 2, "bandstop": 3}
EXTENSIONS = {"odd": "odd", "even": "even", "constant": "constant", "none": None}
RINGING = 1e-10  # the level to which the impulse response decays over the length of an extension
EMPTY = np.empty(0)


@result
class Response(Result):
    """A frequency response; unpacks into frequencies and values, like the result of
    `scipy.signal.freqz`.

    Attributes
    ----------
    frequencies : ndarray
        In the unit of fs.
    values : ndarray of complex
        The gain :math:`H(e^{i\\omega})`.
    delay : ndarray
        The group delay in samples; NaN where the gain is 0.
    """

    frequencies: NDArray[Any]
    values: NDArray[Any]
    delay: NDArray[Any]
    _unpacked = ("frequencies", "values")

    @property
    def magnitude(self) -> Any:
        """The absolute value of the gain."""
        return np.abs(self.values)

    @property
    def decibels(self) -> Any:
        """The gain in decibels, 20 lg of the magnitude."""
        with np.errstate(divide="ignore"):
            return 20 * np.log10(self.magnitude)

    @property
    def phase(self) -> Any:
        """The phase in radians, unwrapped."""
        return np.unwrap(np.angle(self.values))


class Filter:
    r"""A linear filter: a cascade of second-order sections, or a single quotient.

    .. math:: H(z) = \prod_s \frac{b_{s0} + b_{s1} z^{-1} + b_{s2} z^{-2}}
                                   {1 + a_{s1} z^{-1} + a_{s2} z^{-2}}
              \quad\text{or}\quad \frac{\sum_j b_j z^{-j}}{\sum_j a_j z^{-j}}

    Filters are returned by the design functions of this module, by `from_sos` and by `from_ba`. They are
    immutable and can be pickled.

    Examples
    --------
    >>> import qx
    >>> f = qx.filters.butterworth(2, 100, fs=1000)
    >>> f
    Filter: butterworth lowpass of order 2, cutoff 100, fs 1000; 1 section
    >>> f([1.0, 1.0, 1.0, 1.0]).round(4)
    array([0.0675, 0.2795, 0.5614, 0.7961])
    """

    ripple: float  # of an equiripple filter
    _designed: tuple[NDArray[Any], NDArray[Any]] | None = None  # zeros and poles, where the design returns them

    def __init__(self, b: Any, a: Any, is_cascade: Any, fs: Any = 1.0, title: Any = "",
                 main: Any = None) -> None:
        self.is_complex = bool(np.iscomplexobj(b) or np.iscomplexobj(a))
        kind = complex if self.is_complex else float
        self._b, self._a = np.asarray(b, kind), np.asarray(a, kind)
        self._b.flags.writeable = self._a.flags.writeable = False
        self._is_cascade, self.fs, self.title = is_cascade, float(fs), title
        self._main = main  # a frequency of the pass band, in cycles per sample
        self._rings: int | None = None  # _ringing(), once it is known
        # The states at rest, in full size, so that no call has to allocate them.
        sizes = [2 * (len(self._b) // 3)] if is_cascade else [max(len(self._b) - 1, 0), max(len(self._a) - 1, 0)]
        self._rest = [np.zeros(size) for size in sizes]
        self._rest_complex = [np.zeros(size, complex) for size in sizes]

    # Applying

    def __call__(self, x: ArrayLike, axis: int = LAST) -> Any:
        """The filtered signal.

        Parameters
        ----------
        x : array_like
            Real or complex samples, of any dimension. Complex samples are filtered as two real signals.
        axis : int
            The axis of time; for a pandas table, the rows by default.

        Returns
        -------
        ndarray, or the pandas type of x
            The same shape as x.

        Raises
        ------
        ValueError
            If x is empty.
        """
        if type(x) is np.ndarray and x.ndim == 1 and axis is LAST:
            return self._run_complex(x) if x.dtype.kind == "c" else self._run(x)
        return either(self._run, self._run_complex, x, axis)

    def _run(self, x: Any) -> Any:
        if self.is_complex:
            rest, rest_complex = self._rest[0], self._rest_complex[1]
            return core.Filter_complex_of_real(x, self._a, self._b, rest, rest_complex, 0)[0]
        if self._is_cascade:
            return core.Filter_cascade(x, 0, self._a, self._b, *self._rest, 0)[0]
        return core.Filter_direct(x, self._a, self._b, *self._rest, 0)[0]

    def _run_complex(self, x: Any) -> Any:
        if self.is_complex:
            return core.Filter_complex(x, self._a, self._b, *self._rest_complex, 0)[0]
        if self._is_cascade:
            return core.Filter_cascade_complex(x, 0, self._a, self._b, *self._rest_complex, 0)[0]
        return core.Filter_direct_complex(x, self._a, self._b, *self._rest_complex, 0)[0]

    def zero_phase(self, x: ArrayLike, axis: int = LAST,
                   extension: Literal["odd", "even", "constant", "none"] = "odd",
                   pad: int | None = None) -> Any:
        r"""The signal filtered forwards and backwards, which removes the delay and squares the magnitude.

        The signal is extended at both ends, and the filter starts as if the first value had always been
        there. An offset or a ramp in the pass band therefore comes out unchanged.

        Parameters
        ----------
        x : array_like
            Real or complex samples, of any dimension.
        axis : int
            The axis of time.
        extension : {"odd", "even", "constant", "none"}
            The extension at the ends: the signal reflected about its end point, :math:`2 x_0 - x_j`; its
            mirror image; the end value repeated; nothing.
        pad : int, optional
            Number of values to add at each end. By default, as many as the filter rings for, but at most
            one less than the number of values.

        Returns
        -------
        ndarray, or the pandas type of x
            The same shape as x.

        Raises
        ------
        ValueError
            If x is empty, pad is not below its length, or extension is not a valid choice.

        Examples
        --------
        >>> import numpy as np, qx
        >>> ramp = np.arange(100.0)
        >>> f = qx.filters.butterworth(2, 0.1)
        >>> bool(np.allclose(f.zero_phase(ramp), ramp))
        True
        """
        kind = chosen("filters.Filter.zero_phase", "extension", extension, EXTENSIONS)
        n = count_of(x, axis)
        if kind is None or n < 2:
            pad = 0
        elif pad is None:
            pad = min(self._ringing(), n - 1)
        elif not 0 <= pad < n:
            refuse("filters.Filter.zero_phase", "pad", f"must be from 0 to {n - 1}, one less than the number "
                   f"of values; got {pad}", "ErrSizesDisagree")
        return along(lambda channel: self._both_ways(channel, kind, pad), x, axis)

    def _both_ways(self, x: Any, kind: Any, pad: Any) -> Any:
        long = np.pad(x, pad, "edge") if kind == "constant" else \
            np.pad(x, pad, "reflect", reflect_type=kind) if kind else x
        there = self._from_rest(long)
        # Backwards with the conjugate, so that the magnitude is squared and no phase remains.
        behind = Filter(self._b.conj(), self._a.conj(), False) if self.is_complex else self
        back = behind._from_rest(there[::-1])
        return back[::-1][pad:pad + len(x)]

    def _from_rest(self, x: Any) -> Any:
        """x, filtered as if its first value had always been there."""
        x = np.ascontiguousarray(x)
        return FilterStream(self, dtype=complex if x.dtype.kind == "c" else float, value=x[0])(x) \
            if len(x) else self(x)

    def _ringing(self) -> Any:
        """The number of samples until the impulse response has decayed to RINGING, by the largest pole."""
        if self._rings is None:
            largest = float(np.abs(self.poles).max(initial=0)) if self.is_iir else 0.0
            rings = math.ceil(math.log(RINGING) / math.log(largest)) if 0 < largest < 1 else 0
            self._rings = max(rings, 3 * len(self._b))
        return self._rings

    def stream(self, channels: int | None = None, axis: int = -1,
               dtype: type[float] | type[complex] = float) -> FilterStream:
        """The filter as a stream: all blocks together have the same bits as `self(x)`.

        Parameters
        ----------
        channels : int, optional
            Number of channels of a two-dimensional block; without it, blocks have one dimension.
        axis : int
            The axis of time in a two-dimensional block.
        dtype : {float, complex}
            The type of the samples.

        Returns
        -------
        FilterStream

        Examples
        --------
        >>> import numpy as np, qx
        >>> f = qx.filters.butterworth(4, 0.1)
        >>> stream, x = f.stream(), np.ones(100)
        >>> bool(np.all(np.r_[stream(x[:7]), stream(x[7:])] == f(x)))
        True
        """
        return FilterStream(self, channels, axis, dtype)

    # Properties

    @property
    def is_iir(self) -> bool:
        """Whether the filter has feedback."""
        return bool(len(self._a) > (0 if self._is_cascade else 1) and np.any(self._a[not self._is_cascade:]))

    @property
    def sos(self) -> NDArray[Any]:
        """The second-order sections, one to a row: b0, b1, b2, 1, a1, a2, as in SciPy."""
        if self._is_cascade:
            b, a = self._b.reshape(-1, 3), self._a.reshape(-1, 2)
            return np.hstack([b, np.ones((len(b), 1)), a])
        if max(len(self._b), len(self._a)) > 3:
            refuse("filters.Filter.sos", "self", "is a quotient of an order above 2, which is "
                   "not split into sections", "ErrCoefficientSizes")
        a = np.r_[self._a, np.zeros(3 - len(self._a))] if len(self._a) else np.array([1.0, 0, 0])
        return np.r_[np.r_[self._b, np.zeros(3 - len(self._b))], a][None] / a[0]

    @property
    def ba(self) -> tuple[NDArray[Any], NDArray[Any]]:
        """Numerator and denominator in ascending powers of 1/z. At high orders they lose digits;
        `sos` does not."""
        if not self._is_cascade:
            return self._b.copy(), self._a.copy() if len(self._a) else np.ones(1)
        b, a = np.ones(1), np.ones(1)
        for row in self.sos:
            b, a = np.convolve(b, row[:3]), np.convolve(a, row[3:])
        return b, a

    @property
    def taps(self) -> NDArray[Any]:
        """The impulse response of a filter without feedback."""
        if self.is_iir:
            refuse("filters.Filter.taps", "self", "a filter with feedback has infinitely many taps",
                   "ErrBadCoefficients")
        return self.ba[0]

    def _pairs(self) -> Any:
        """The numerator and the denominator of each factor."""
        if self._is_cascade:
            return [(row[:3], row[3:]) for row in self.sos]
        return [self.ba]

    def _roots(self, which: Any) -> Any:
        found = []
        for pair in self._pairs():
            # A polynomial in 1/z: the same number of powers in both, and the highest power of z first.
            pair = [np.trim_zeros(one, "b") for one in pair]
            size = max(map(len, pair))
            coefficients = np.r_[pair[which], np.zeros(size - len(pair[which]))]
            found.append(_roots(coefficients))
        return np.concatenate([*found, np.empty(0, complex)])

    @property
    def poles(self) -> NDArray[np.complex128]:
        """The poles in the z plane; a filter without feedback has all of them at 0. For an IIR design,
        these are the poles from which its coefficients were rounded."""
        return self._designed[1] if self._designed else self._roots(1)

    @property
    def zeros(self) -> NDArray[np.complex128]:
        """The zeros in the z plane; for an IIR design, those from which its coefficients were rounded."""
        return self._designed[0] if self._designed else self._roots(0)

    @property
    def is_stable(self) -> bool:
        """Whether all poles of the stored coefficients are inside the unit circle."""
        return bool(np.all(np.abs(self._roots(1)) < 1))

    @property
    def delay(self) -> float:
        """The group delay in samples. Symmetric taps have the same delay at all frequencies; other filters
        report the delay in the middle of the pass band. `response().delay` has it for each frequency."""
        if not self.is_iir:
            h = self.taps
            rounding = 1e-12 * np.abs(h).max()
            if min(np.abs(h - h[::-1]).max(), np.abs(h + h[::-1]).max()) <= rounding:
                return (len(h) - 1) / 2
        main = self._main
        if main is None:
            coarse = self.response(1024)
            main = coarse.frequencies[np.argmax(coarse.magnitude)] / self.fs
        return float(self.response(np.array([main]), 1.0).delay[0])

    def response(self, frequencies: ArrayLike = 512, fs: float | None = None) -> Response:
        """Gain, phase and group delay.

        Parameters
        ----------
        frequencies : int or array_like
            Number of frequencies, evenly spaced from 0 to below fs / 2; or the frequencies themselves, in
            the unit of fs.
        fs : float, optional
            The sampling rate; by default, that of the design.

        Returns
        -------
        Response

        Examples
        --------
        >>> import qx
        >>> f = qx.filters.butterworth(4, 40, fs=1000)
        >>> f.response([0, 40, 80]).decibels.round(2)
        array([  0.  ,  -3.01, -24.66])
        """
        fs = self.fs if fs is None else float(fs)
        if np.ndim(frequencies) == 0:
            n = whole_number("filters.Filter.response", "frequencies", frequencies, 1)
            frequencies = np.arange(n) * (fs / 2 / n)
        frequencies = np.asarray(frequencies, float)
        z = np.exp(-2j * np.pi * frequencies.ravel() / fs)
        values, delay = np.ones(z.size, complex), np.zeros(z.size)
        with np.errstate(divide="ignore", invalid="ignore"):
            for b, a in self._pairs():
                above, below = _polynomial(b, z), _polynomial(a, z)
                values *= above / below
                delay += (_polynomial(b * np.arange(len(b)), z) / above
                          - _polynomial(a * np.arange(len(a)), z) / below).real
        delay[np.abs(values) < 1e-12] = np.nan
        return Response(frequencies, values.reshape(frequencies.shape), delay.reshape(frequencies.shape))

    def plot(self, axes: Any = None, frequencies: ArrayLike = 2048) -> Any:
        """Plots the gain in decibels against frequency with matplotlib.

        Parameters
        ----------
        axes : matplotlib Axes, optional
            The axes to draw in; new ones by default.
        frequencies : int or array_like
            As for `response`.

        Returns
        -------
        matplotlib Axes
        """
        if axes is None:
            from matplotlib import pyplot
            axes = pyplot.subplots()[1]
        shown = self.response(frequencies)
        axes.plot(shown.frequencies, np.maximum(shown.decibels, -300))
        axes.set(xlabel="frequency" if self.fs != 1 else "frequency (cycles per sample)",
                 ylabel="gain (dB)", title=self.title)
        axes.grid(True, alpha=0.3)
        return axes

    def __mul__(self, other: Any) -> Any:
        """The cascade of both filters."""
        if not isinstance(other, Filter):
            return NotImplemented
        if self.is_complex or other.is_complex:
            (b, a), (c, d) = self.ba, other.ba
            return from_ba(np.convolve(b, c), np.convolve(a, d), self.fs)
        return from_sos(np.vstack([self.sos, other.sos]), self.fs)

    def __repr__(self) -> str:
        if self._is_cascade:
            count = len(self._b) // 3
            size = f"{count} section{'s' * (count != 1)}"
        elif self.is_iir:
            size = f"{len(self._b)} and {len(self._a)} coefficients"
        else:
            size = f"{len(self._b)} taps"
        return f"Filter: {self.title + '; ' if self.title else ''}{size}"

    def _repr_html_(self) -> str:
        rows = "".join("<tr>" + "".join(f"<td>{value:.10g}</td>" for value in row) + "</tr>"
                       for row in self.sos) if self._is_cascade else ""
        head = "".join(f"<th>{name}</th>" for name in ("b0", "b1", "b2", "a0", "a1", "a2"))
        table = f"<table><tr>{head}</tr>{rows}</table>" if rows else ""
        return f"<p>{self!r}</p>{table}"


def _polynomial(coefficients: Any, z: Any) -> Any:
    """The value of a polynomial with coefficients in ascending powers."""
    if len(coefficients) < 8:
        return np.polynomial.polynomial.polyval(z, coefficients)
    return core.Filter_polynomial(np.asarray(coefficients, complex), np.asarray(z, complex))


def _roots(descending: Any) -> Any:
    """The roots of a polynomial, highest power first: the eigenvalues of the companion matrix, and 0 for each
    trailing zero coefficient. Leading zero coefficients are ignored."""
    kept = np.trim_zeros(descending)
    degree = len(kept) - 1
    at_zero = len(descending) - len(np.trim_zeros(descending, "b")) if degree >= 0 else 0
    if degree < 1:
        return np.zeros(at_zero, complex)
    companion = np.eye(degree, k=-1, dtype=kept.dtype)
    companion[0] = -kept[1:] / kept[0]
    values, _ = core.Filter_roots_complex(companion, 0, 0) if kept.dtype.kind == "c" else \
        core.Filter_roots(companion, 0)
    return np.r_[values, np.zeros(at_zero)]


class FilterStream(Stream):
    """A filter that is applied block by block, as returned by `Filter.stream`.

    It is called with blocks of any size, and has `reset()`, `copy()` and `finish()`. It can be pickled in
    the middle of a signal.
    """

    def __init__(self, filter_: Any, channels: Any = None, axis: Any = -1, dtype: Any = float,
                 value: Any = 0.0) -> None:
        self.filter, self._value = filter_, value
        if filter_.is_complex:
            self._output = complex
        super().__init__(channels, axis, dtype)

    def _start(self) -> Any:
        """The state as if `value` had always been there: zeros for 0, and where no steady state exists."""
        f, value = self.filter, self._value
        if not f._is_cascade:
            b, a = f.ba
            gain = b.sum() / a.sum() if value and a.sum() else 0.0
            feedback = len(f._a) - 1 if len(f._a) else 0
            kind = complex if f.is_complex else self.dtype
            return (np.full(max(len(b) - 1, 0), value, self.dtype),
                    np.full(feedback, value * gain, kind))
        state = []
        for row in f.sos if value else ():
            total = row[3:].sum()
            inner = value / total if total else 0.0
            state += [inner, inner]
            value = inner * row[:3].sum()
        return np.array(state or np.zeros(2 * (len(f._b) // 3)), self.dtype)

    def _step(self, state: Any, block: Any) -> Any:
        f, is_complex = self.filter, self.dtype.kind == "c"
        if f._is_cascade:
            run = core.Filter_cascade_complex if is_complex else core.Filter_cascade
            return run(block, 0, f._a, f._b, state, 1)
        if f.is_complex:
            run = core.Filter_complex if is_complex else core.Filter_complex_of_real
        else:
            run = core.Filter_direct_complex if is_complex else core.Filter_direct
        found, *states = run(block, f._a, f._b, *state, 1)
        return found, states


# Design

def _edges(function: Any, kind: Any, cutoff: Any, fs: Any) -> Any:
    """The code of the kind, and the edges fl and fh in the unit of fs."""
    code = chosen(function, "kind", kind, KINDS)
    edges = np.atleast_1d(np.asarray(cutoff, float))
    needed = 1 if code < 2 else 2
    if edges.shape != (needed,):
        refuse(function, "cutoff", f"a {kind} needs {'one frequency' if needed == 1 else 'two'}; "
               f"got {cutoff!r}" + "; pass the kind for a band" * (code == 0), "ErrSizesDisagree")
    if not np.all(np.isfinite(edges)) or not fs > 0:
        refuse(function, "cutoff, fs", "must be finite, and fs above 0", "ErrBadCutoff")
    if np.any(edges <= 0) or np.any(edges >= fs / 2):
        refuse(function, "cutoff", f"must be between 0 and half the sampling rate, {fs / 2:g}; got "
               f"{cutoff!r}" + "; pass fs for frequencies in its unit" * (fs == 1),
               "ErrAboveNyquist" if np.any(edges > fs / 2) else "ErrBadCutoff")
    if needed == 2 and not edges[0] < edges[1]:
        refuse(function, "cutoff", f"must be increasing; got {cutoff!r}", "ErrBadCutoff")
    return code, float(edges[0]), float(edges[-1])


def _main(code: Any, fl: Any, fh: Any, fs: Any) -> Any:
    """A frequency of the pass band in cycles per sample."""
    return (0.0, 0.5 - 1e-9, math.sqrt(fl * fh) / fs, 0.0)[code]


def _iir(name: Any, order: Any, levels: Any, cutoff: Any, kind: Any, fs: Any) -> Any:
    function = f"filters.{name}"
    order = whole_number(function, "order", order, 1, "ErrOrderNotPositive")
    code, fl, fh = _edges(function, kind, cutoff, fs)
    for argument, level in levels.items():
        if not level > 0:
            refuse(function, argument, f"must be above 0 dB; got {level}",
                   "ErrRippleNotPositive" if argument == "ripple" else "ErrAttenuationNotPositive")
    if len(levels) == 2 and not levels["ripple"] < levels["attenuation"]:
        refuse(function, "ripple", "must be below the attenuation", "ErrRippleAboveAttenuation")
    a, b, zeros, poles, _ = getattr(core, name)(fs, fl, fh, *levels.values(), order, code)
    shown = f"{fl:g}" if code < 2 else f"{fl:g} to {fh:g}"
    found = Filter(b, a, True, fs, f"{name} {kind} of order {order}, cutoff {shown}, fs {fs:g}",
                   _main(code, fl, fh, fs))
    found._designed = zeros, poles
    return found


def butterworth(order: int, cutoff: float | tuple[float, float],
                kind: Literal["lowpass", "highpass", "bandpass", "bandstop"] = "lowpass",
                fs: float = 1.0) -> Filter:
    r"""A Butterworth filter: maximally flat, 3 dB down at the cutoff.

    .. math:: |H|^2 = \frac{1}{1 + \Omega^{2n}}

    Parameters
    ----------
    order : int
        The order n of the prototype; a band filter has twice as many poles.
    cutoff : float or (float, float)
        The edge frequency, or the two edges of a band, in the unit of fs.
    kind : {"lowpass", "highpass", "bandpass", "bandstop"}
        Which frequencies pass.
    fs : float
        The sampling rate.

    Returns
    -------
    Filter

    Raises
    ------
    ValueError
        If the order is below 1, an edge is not between 0 and fs / 2, or kind is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.filters.butterworth(4, (48, 52), "bandstop", fs=1000)
    Filter: butterworth bandstop of order 4, cutoff 48 to 52, fs 1000; 4 sections
    """
    return _iir("butterworth", order, {}, cutoff, kind, fs)


def chebyshev1(order: int, ripple: float, cutoff: float | tuple[float, float],
               kind: Literal["lowpass", "highpass", "bandpass", "bandstop"] = "lowpass",
               fs: float = 1.0) -> Filter:
    r"""A Chebyshev filter with equal ripples in the pass band.

    .. math:: |H|^2 = \frac{1}{1 + \varepsilon^2 T_n(\Omega)^2},\quad \varepsilon^2 = 10^{r/10} - 1

    Parameters
    ----------
    order : int
        The order n of the prototype.
    ripple : float
        The ripple in the pass band, in dB. At the cutoff, the gain is down by the same amount.
    cutoff : float or (float, float)
        The edge frequency, or the two edges of a band, in the unit of fs.
    kind : {"lowpass", "highpass", "bandpass", "bandstop"}
        Which frequencies pass.
    fs : float
        The sampling rate.

    Returns
    -------
    Filter

    Raises
    ------
    ValueError
        If the order is below 1, the ripple is not above 0, an edge is not between 0 and fs / 2, or kind
        is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.filters.chebyshev1(5, 0.5, 100, fs=1000).response([100]).decibels.round(6)
    array([-0.5])
    """
    return _iir("chebyshev1", order, {"ripple": float(ripple)}, cutoff, kind, fs)


def chebyshev2(order: int, attenuation: float, cutoff: float | tuple[float, float],
               kind: Literal["lowpass", "highpass", "bandpass", "bandstop"] = "lowpass",
               fs: float = 1.0) -> Filter:
    r"""An inverse Chebyshev filter: flat in the pass band, with equal ripples in the stop band.

    .. math:: |H|^2 = \frac{1}{1 + 1 / (\varepsilon^2 T_n(1/\Omega)^2)},\quad
              \varepsilon^2 = \frac{1}{10^{a/10} - 1}

    Parameters
    ----------
    order : int
        The order n of the prototype.
    attenuation : float
        The minimum attenuation in the stop band, in dB.
    cutoff : float or (float, float)
        The edge of the stop band, or its two edges, in the unit of fs.
    kind : {"lowpass", "highpass", "bandpass", "bandstop"}
        Which frequencies pass.
    fs : float
        The sampling rate.

    Returns
    -------
    Filter

    Raises
    ------
    ValueError
        If the order is below 1, the attenuation is not above 0, an edge is not between 0 and fs / 2, or
        kind is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.filters.chebyshev2(5, 60, 100, fs=1000).response([100]).decibels.round(6)
    array([-60.])
    """
    return _iir("chebyshev2", order, {"attenuation": float(attenuation)}, cutoff, kind, fs)


def elliptic(order: int, ripple: float, attenuation: float, cutoff: float | tuple[float, float],
             kind: Literal["lowpass", "highpass", "bandpass", "bandstop"] = "lowpass",
             fs: float = 1.0) -> Filter:
    r"""An elliptic filter: equal ripples in both bands, and the narrowest transition band.

    .. math:: |H|^2 = \frac{1}{1 + \varepsilon^2 R_n(\Omega)^2}

    Parameters
    ----------
    order : int
        The order n of the prototype.
    ripple : float
        The ripple in the pass band, in dB.
    attenuation : float
        The minimum attenuation in the stop band, in dB.
    cutoff : float or (float, float)
        The edge of the pass band, or its two edges, in the unit of fs.
    kind : {"lowpass", "highpass", "bandpass", "bandstop"}
        Which frequencies pass.
    fs : float
        The sampling rate.

    Returns
    -------
    Filter

    Raises
    ------
    ValueError
        If the order is below 1, ripple or attenuation is not above 0, the ripple is not below the
        attenuation, an edge is not between 0 and fs / 2, or kind is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> f = qx.filters.elliptic(6, 0.1, 80, (48, 52), "bandstop", fs=1000)
    >>> bool(f.response([50]).decibels[0] < -79.9)
    True
    """
    return _iir("elliptic", order, {"ripple": float(ripple), "attenuation": float(attenuation)}, cutoff,
                kind, fs)


def bessel(order: int, cutoff: float | tuple[float, float],
           kind: Literal["lowpass", "highpass", "bandpass", "bandstop"] = "lowpass", fs: float = 1.0) -> Filter:
    r"""A Bessel filter: the flattest group delay, 3 dB down at the cutoff.

    .. math:: |H|^2 = \frac{B_n(0)^2}{|B_n(i\Omega)|^2}

    with the reverse Bessel polynomial :math:`B_n`. The bilinear transform distorts the delay near fs / 2.

    Parameters
    ----------
    order : int
        The order n of the prototype, up to 500.
    cutoff : float or (float, float)
        The edge frequency, or the two edges of a band, in the unit of fs.
    kind : {"lowpass", "highpass", "bandpass", "bandstop"}
        Which frequencies pass.
    fs : float
        The sampling rate.

    Returns
    -------
    Filter

    Raises
    ------
    ValueError
        If the order is below 1 or too high, an edge is not between 0 and fs / 2, or kind is not a valid
        choice.

    Examples
    --------
    >>> import qx
    >>> qx.filters.bessel(4, 40, fs=1000).response([40]).decibels.round(2)
    array([-3.01])
    """
    return _iir("bessel", order, {}, cutoff, kind, fs)


def windowed(taps: int, cutoff: float | tuple[float, float],
             kind: Literal["lowpass", "highpass", "bandpass", "bandstop"] = "lowpass",
             window: str | tuple[Any, ...] | ArrayLike = "hamming", fs: float = 1.0,
             scale: bool = True) -> Filter:
    r"""A linear-phase filter: the ideal response, truncated by a window.

    .. math:: h_i = w_i \frac{\sin(\omega_c (i - c))}{\pi (i - c)},\quad c = \frac{N - 1}{2}

    for the lowpass; the other kinds are differences of such responses.

    Parameters
    ----------
    taps : int
        The length N; odd for a highpass or a bandstop.
    cutoff : float or (float, float)
        The edge frequency, or the two edges of a band, in the unit of fs; the gain is one half there.
    kind : {"lowpass", "highpass", "bandpass", "bandstop"}
        Which frequencies pass.
    window : str, tuple or array_like
        A window, as for `qx.windows.get`: its name, its name and parameter, or its values.
    fs : float
        The sampling rate.
    scale : bool
        Whether to scale the gain to 1 in the middle of the pass band (at 0, at fs / 2 or between the edges).

    Returns
    -------
    Filter

    Raises
    ------
    ValueError
        If taps is below 1, or even for a highpass or a bandstop, an edge is not between 0 and fs / 2, or
        kind or window is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> f = qx.filters.windowed(101, 40, fs=1000)
    >>> f.delay, f.response([0, 40]).magnitude.round(3)
    (50.0, array([1. , 0.5]))
    """
    from . import windows
    name = "filters.windowed"
    taps = whole_number(name, "taps", taps, 1, "ErrOrderNotPositive")
    code, fl, fh = _edges(name, kind, cutoff, fs)
    if code in (1, 3) and taps % 2 == 0:
        refuse(name, "taps", f"a {kind} needs an odd number, since an even number makes the gain at fs / 2 "
               f"0; got {taps}", "ErrBadTapCount")
    h = core.windowed(fs, fl, fh, taps, code)[0] * windows.get(window, taps, symmetric=True)
    middle = (0.0, 0.5, (fl + fh) / 2 / fs, 0.0)[code]
    if scale:
        h = h / np.sum(h * np.cos(2 * np.pi * middle * (np.arange(taps) - (taps - 1) / 2)))
    shown = f"{fl:g}" if code < 2 else f"{fl:g} to {fh:g}"
    return Filter(h, EMPTY, False, fs, f"windowed {kind}, cutoff {shown}, fs {fs:g}", middle)


def equiripple(taps: int, bands: ArrayLike, desired: ArrayLike, weight: ArrayLike | None = None,
               kind: Literal["symmetric", "differentiator", "hilbert"] = "symmetric",
               fs: float = 1.0) -> Filter:
    """The linear-phase filter with the least weighted deviation from the desired gain in each band.

    After McClellan, Parks and Rabiner, "A computer program for designing optimum FIR linear phase digital
    filters", 1973.

    Parameters
    ----------
    taps : int
        The length.
    bands : array_like
        The edges of the bands, two for each, in ascending order, in the unit of fs.
    desired : array_like
        The gain of each band; for a differentiator, the slope, that is, the gain divided by the frequency
        in cycles per sample.
    weight : array_like, optional
        The weight of a deviation in each band; 1 by default.
    kind : {"symmetric", "differentiator", "hilbert"}
        Symmetric taps, or antisymmetric ones for a differentiator or a Hilbert transformer.
    fs : float
        The sampling rate.

    Returns
    -------
    Filter
        Its attribute `ripple` is the greatest weighted deviation on the grid.

    Raises
    ------
    ValueError
        If taps is below 3, the edges do not ascend from 0 to fs / 2 or are not two for each gain, a weight
        is not above 0, taps is even with a gain at fs / 2, or the exchange does not converge.

    Examples
    --------
    >>> import qx
    >>> f = qx.filters.equiripple(51, [0, 40, 60, 500], [1, 0], fs=1000)
    >>> bool(f.response([20]).magnitude[0] - 1 <= f.ripple)
    True
    """
    name = "filters.equiripple"
    taps = whole_number(name, "taps", taps, 1, "ErrOrderNotPositive")
    code = chosen(name, "kind", kind, {"symmetric": 0, "differentiator": 1, "hilbert": 2})
    edges, gains = np.ravel(np.asarray(bands, float)), np.atleast_1d(np.asarray(desired, float))
    weights = np.ones(len(gains)) if weight is None else np.atleast_1d(np.asarray(weight, float))
    if len(edges) != 2 * len(gains) or len(weights) != len(gains):
        refuse(name, "bands, desired, weight", f"each band has two edges, a gain and a weight; got {len(edges)}, "
               f"{len(gains)} and {len(weights)}", "ErrSizesDisagree")
    if np.any(np.diff(edges) < 0) or edges[0] < 0 or edges[-1] > fs / 2:
        refuse(name, "bands", f"the edges must ascend from 0 to half the sampling rate, {fs / 2:g}; got "
               f"{bands!r}", "ErrAboveNyquist" if edges[-1] > fs / 2 else "ErrBadCutoff")
    if code == 0 and taps % 2 == 0 and edges[-1] == fs / 2 and gains[-1]:
        refuse(name, "taps", f"must be odd with a gain at fs / 2; got {taps}", "ErrBadTapCount")
    rows = [tuple(row) for row in np.column_stack([gains, edges[::2], edges[1::2], weights])]
    h, ripple = core.equiripple(taps, fs, rows, code, 0)
    best = int(np.argmax(np.abs(gains)))
    made = Filter(h, EMPTY, False, fs, f"equiripple {kind}, fs {fs:g}",
                  (edges[2 * best] + edges[2 * best + 1]) / 2 / fs)
    made.ripple = float(ripple)
    return made


def narrow(edges: ArrayLike, kind: Literal["lowpass", "highpass", "bandpass", "bandstop"] = "lowpass",
           ripple: float = 0.1, attenuation: float = 60.0, fs: float = 1.0) -> Filter:
    """A linear-phase filter for a narrow band, designed in two stages: a filter with zeros between its
    taps, and a second filter that removes its images.

    Parameters
    ----------
    edges : sequence of float
        The edges of the bands in ascending order, in the unit of fs: two for a lowpass or a highpass, four,
        symmetric about a common centre, for the others.
    kind : {"lowpass", "highpass", "bandpass", "bandstop"}
        Which frequencies pass.
    ripple : float
        The largest deviation of the gain from 1 in the pass band, in dB.
    attenuation : float
        The attenuation in the stop band, in dB.
    fs : float
        The sampling rate.

    Returns
    -------
    Filter
        Its taps are those of both stages, convolved.

    Raises
    ------
    ValueError
        If the edges are not increasing between 0 and fs / 2, their number does not suit kind, or ripple or
        attenuation is not above 0.

    Examples
    --------
    >>> import qx
    >>> f = qx.filters.narrow((10, 20), fs=1000)
    >>> bool(f.response([30]).decibels[0] < -60)
    True
    """
    name = "filters.narrow"
    code = chosen(name, "kind", kind, KINDS)
    corners = np.asarray(edges, float).ravel()
    if len(corners) != (2 if code < 2 else 4):
        refuse(name, "edges", f"a {kind} needs {2 if code < 2 else 4}; got {len(corners)}", "ErrSizesDisagree")
    if np.any(np.diff(corners) <= 0) or corners[0] <= 0 or corners[-1] >= fs / 2:
        refuse(name, "edges", f"must be increasing between 0 and half the sampling rate, {fs / 2:g}", "ErrBadCutoff")
    if code < 2:
        (fpass, fstop), centre = corners[::1 if code == 0 else -1], 0.0
    else:
        inner, outer, centre = corners[2] - corners[1], corners[3] - corners[0], corners.mean()
        fpass, fstop = (inner, outer) if code == 2 else (outer, inner)
    design = core.narrow(fs, float(fpass), float(fstop), float(centre), 10 ** (ripple / 20) - 1,
                         float(attenuation), code, {})
    taps = core.narrow_filter([1.0], design)
    main = (0.0, 0.5, centre / fs, 0.0)[code]
    return Filter(taps, EMPTY, False, fs, f"narrow {kind}, edges {', '.join(f'{edge:g}' for edge in corners)}, "
                  f"fs {fs:g}", main)


def from_sos(sos: ArrayLike, fs: float = 1.0) -> Filter:
    """The filter with the given second-order sections, in the layout that other programs use.

    Parameters
    ----------
    sos : array_like
        One section to a row: b0, b1, b2, a0, a1, a2.
    fs : float
        The sampling rate.

    Returns
    -------
    Filter

    Raises
    ------
    ValueError
        If sos does not have rows of six, or an a0 is 0.

    Examples
    --------
    >>> import qx
    >>> qx.filters.from_sos([[0.5, 0.5, 0, 1, 0, 0]])([1.0, 1.0])
    array([0.5, 1. ])
    """
    rows = np.asarray(sos, float)
    if rows.ndim != 2 or rows.shape[1] != 6 or not len(rows):
        refuse("filters.from_sos", "sos", f"rows of six are needed; got shape {rows.shape}",
               "ErrCoefficientSizes")
    if np.any(rows[:, 3] == 0):
        refuse("filters.from_sos", "sos", "a0 must not be 0", "ErrBadCoefficients")
    rows = rows / rows[:, 3:4]
    return Filter(rows[:, :3].ravel(), rows[:, 4:].ravel(), True, fs)


def from_ba(b: ArrayLike, a: ArrayLike = (1.0,), fs: float = 1.0) -> Filter:
    """The filter with the given numerator and denominator, in direct form. Without a denominator, b are the
    taps of a filter without feedback.

    Parameters
    ----------
    b, a : array_like
        Coefficients in ascending powers of 1/z, real or complex; with complex ones the output is complex.
    fs : float
        The sampling rate.

    Returns
    -------
    Filter

    Raises
    ------
    ValueError
        If b is empty or a begins with 0.

    Examples
    --------
    >>> import qx
    >>> qx.filters.from_ba([0.5], [1, -0.5])([1.0, 0.0, 0.0])
    array([0.5  , 0.25 , 0.125])
    """
    b, a = vector(b, "filters.from_ba", "b"), vector(a, "filters.from_ba", "a")
    if not len(b) or not len(a) or a[0] == 0:
        refuse("filters.from_ba", "b, a", "b must not be empty, and a must not begin with 0",
               "ErrBadCoefficients")
    if len(a) == 1:
        return Filter(b / a[0], EMPTY, False, fs)
    return Filter(b, a, False, fs)


# Smoothing

def savgol(x: ArrayLike, window_length: int, polyorder: int, deriv: int = 0, delta: float = 1.0,
           axis: int = LAST) -> Any:
    """Smooths by a least-squares polynomial through the neighbours of each value (Savitzky-Golay), or
    returns its derivative. At the ends, the polynomial through the first or last values is used.

    A. Savitzky and M. J. E. Golay, "Smoothing and differentiation of data by simplified least squares
    procedures", 1964.

    Parameters
    ----------
    x : array_like
        Real values.
    window_length : int
        Number of values around each, odd, and at most the number of values.
    polyorder : int
        The order of the polynomial, at least 1 and below window_length.
    deriv : int
        The order of the derivative; 0 for the values themselves.
    delta : float
        The distance between values, for derivatives.
    axis : int
        The axis along which to smooth.

    Returns
    -------
    ndarray, or the pandas type of x
        The same shape as x.

    Raises
    ------
    ValueError
        If window_length is even or greater than the length of x, or polyorder or deriv is out of range.

    Examples
    --------
    >>> import qx
    >>> qx.filters.savgol([0.0, 1.0, 4.0, 9.0, 16.0], 3, 2).round(9)
    array([ 0.,  1.,  4.,  9., 16.])
    >>> qx.filters.savgol([0.0, 1.0, 4.0, 9.0, 16.0], 3, 2, deriv=1).round(9) + 0.0
    array([0., 2., 4., 6., 8.])
    """
    name = "filters.savgol"
    frame = whole_number(name, "window_length", window_length, 1)
    order = whole_number(name, "polyorder", polyorder, 1, "ErrBadCoefficients")
    deriv = whole_number(name, "deriv", deriv, 0, "ErrNegativeCount")
    if frame % 2 == 0:
        refuse(name, "window_length", f"must be odd; got {frame}", "ErrBadTapCount")
    if order >= frame:
        refuse(name, "polyorder", f"must be below window_length, {frame}; got {order}",
               "ErrPolynomialOrderTooHigh")
    if count_of(x, axis) < frame:
        refuse(name, "window_length", f"{frame} exceeds the number of values, {count_of(x, axis)}",
               "ErrSizesDisagree")
    if not deriv:
        return along(lambda channel: core.savgol(channel, order, frame, EMPTY), x, axis)
    if deriv > order:
        return along(lambda channel: np.zeros(len(channel)), x, axis)
    rows = core.savgol_coefficients(order, frame, EMPTY, 1)[1]
    return along(lambda channel: _derivative(channel, rows, deriv) / delta**deriv, x, axis)


def _derivative(x: Any, rows: Any, deriv: Any) -> Any:
    """The derivative. Row i of rows gives the coefficient of t^i of the polynomial about the frame's centre."""
    frame, half = rows.shape[1], rows.shape[1] // 2
    weights = math.factorial(deriv) * rows[deriv]
    inner = core.Filter_direct(x, EMPTY, weights[::-1], EMPTY, EMPTY, 0)[0][frame - 1:]
    t = np.arange(-half, half + 1.0)
    ends = [np.polynomial.Polynomial(rows @ part).deriv(deriv)(t) for part in (x[:frame], x[-frame:])]
    return np.concatenate([ends[0][:half], inner, ends[1][half + 1:]])


def median(x: ArrayLike, size: int = 3, ends: Literal["reflect", "nearest", "zero"] = "reflect",
           axis: int = LAST) -> Any:
    """The running median of the `size` values around each.

    Parameters
    ----------
    x : array_like
        Real values without NaN.
    size : int
        Number of values. For an even number, one more value is taken before than after, and the median
        is the mean of the two in the middle.
    ends : {"reflect", "nearest", "zero"}
        How the values are continued beyond the ends: by the mirror image, with the end value twice, by the
        end value, or by zeros.
    axis : int
        The axis along which to filter.

    Returns
    -------
    ndarray, or the pandas type of x
        The same shape as x.

    Raises
    ------
    ValueError
        If x is empty, size is below 1, or ends is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.filters.median([1.0, 9.0, 2.0, 3.0, 3.0])
    array([1., 2., 3., 3., 3.])
    """
    size = whole_number("filters.median", "size", size, 1, "ErrNegativeCount")
    mode = chosen("filters.median", "ends", ends, {"reflect": "symmetric", "nearest": "edge",
                                                   "zero": "constant"})
    before, behind = size // 2, (size - 1) // 2

    def of_channel(channel: Any) -> Any:
        if not len(channel):
            refuse("filters.median", "x", "is empty", "ErrEmptyInput")
        if mode == "constant" and len(channel) > behind:
            return core.median(channel, before, behind)
        long = np.pad(channel, (before, behind), mode)
        return core.median(long, before, behind)[before:before + len(channel)]

    return along(of_channel, x, axis)
