r"""Fourier and related transforms of any length, along any axis.

The transform of :math:`x_0, \ldots, x_{n-1}` is

.. math:: X_k = \sum_{j=0}^{n-1} x_j e^{-2\pi i j k / n}.

Names, order of arguments, defaults and scaling are those of `numpy.fft` and `scipy.fft`. Plans are cached
for each length and thread.
"""

from __future__ import annotations

import math
from typing import Any, Literal

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .topical import LAST, along, chosen, count_of, either, positive, refuse, served, whole_number

__all__ = ["czt", "dct", "dst", "dzt", "fft", "fft2", "fftfreq", "fftshift", "half_complex", "hartley",
           "hilbert", "iczt", "idct", "idst", "ifft", "ifft2", "ifftshift", "ihalf_complex",
           "ihartley", "ihilbert", "irfft", "rfft", "rfftfreq", "zoom"]

core = served("fft")

# The factor of a forward transform; an inverse transform takes the factor of the opposite word.
NORMS = {"backward": lambda n: 1.0, "ortho": lambda n: n**-0.5, "forward": lambda n: 1 / n}
OPPOSITE = {"backward": "forward", "ortho": "ortho", "forward": "backward"}


def _scaled(spectrum: Any, function: Any, norm: Any, n: Any, axis: Any, forward: Any = True) -> Any:
    """Rescales a transform to another norm. The exports scale only the inverse transform, by 1 / n."""
    factor = chosen(function, "norm", norm, NORMS)(n) if forward else \
        chosen(function, "norm", OPPOSITE.get(norm, norm), NORMS)(n) * n
    return spectrum * factor


def _length(function: Any, n: Any, x: Any, axis: Any) -> int:
    if n is None:
        n = count_of(x, axis)
        if not n:
            refuse(function, "x", "is empty", "ErrEmptyInput")
        return n
    return whole_number(function, "n", n, 1, "ErrFFTSizeNotPositive")


def _fitted(channel: Any, n: Any) -> Any:
    """The first n values, zero-padded where there are fewer."""
    if len(channel) >= n:
        return channel[:n]
    return np.concatenate([channel, np.zeros(n - len(channel), channel.dtype)])


def fft(x: ArrayLike, n: int | None = None, axis: int = LAST,
        norm: Literal["backward", "ortho", "forward"] = "backward") -> NDArray[np.complex128]:
    r"""The discrete Fourier transform.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    n : int, optional
        Length of the transform. Longer input is cut off, shorter input is zero-padded. By default, the
        number of values.
    axis : int
        The axis along which to transform.
    norm : {"backward", "ortho", "forward"}
        The factor: 1, :math:`1/\sqrt n`, or :math:`1/n`.

    Returns
    -------
    ndarray of complex128
        :math:`X_k`, for frequencies `fftfreq(n, d)`.

    Raises
    ------
    ValueError
        If x is empty, n is below 1, or norm is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.fft.fft([1.0, 2.0, 0.0, -1.0]).round(12)
    array([2.+0.j, 1.-3.j, 0.+0.j, 1.+3.j])
    """
    if n is None and norm == "backward":
        return either(core.fft_real, core.fft, x, axis)
    n = _length("fft.fft", n, x, axis)
    return _scaled(either(lambda channel: core.fft_real_sized(channel, 0, n, 0),
                          lambda channel: core.fft_sized(channel, 0, n, 0), x, axis),
                   "fft.fft", norm, n, axis)


def ifft(x: ArrayLike, n: int | None = None, axis: int = LAST,
         norm: Literal["backward", "ortho", "forward"] = "backward") -> NDArray[np.complex128]:
    r"""The inverse of `fft`: :math:`x_j = \frac1n \sum_k X_k e^{2\pi i j k / n}`.

    Parameters
    ----------
    x : array_like
        A spectrum, as `fft` returns it.
    n : int, optional
        Length of the transform; the number of values by default.
    axis : int
        The axis along which to transform.
    norm : {"backward", "ortho", "forward"}
        The factor: :math:`1/n`, :math:`1/\sqrt n`, or 1.

    Returns
    -------
    ndarray of complex128

    Raises
    ------
    ValueError
        If x is empty, n is below 1, or norm is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.fft.ifft([2, 1 - 3j, 0, 1 + 3j]).real.round(12)
    array([ 1.,  2.,  0., -1.])
    """
    if n is None and norm == "backward":
        return along(core.ifft, x, axis)
    n = _length("fft.ifft", n, x, axis)
    return _scaled(along(lambda channel: core.ifft(_fitted(channel, n)), x, axis), "fft.ifft", norm, n,
                   axis, False)


LONG = 1 << 15  # from this length on, a spectrum in half-complex form, which takes half the memory, is faster


def _half(channel: Any) -> Any:
    n = len(channel)
    if n < LONG:
        return core.rfft(channel)[:n // 2 + 1]
    mixed = core.rfft_long(channel)
    found = np.zeros(n // 2 + 1, complex)
    found.real = mixed[:n // 2 + 1]
    found.imag[1:(n + 1) // 2] = mixed[:n // 2:-1]
    return found


def rfft(x: ArrayLike, n: int | None = None, axis: int = LAST,
         norm: Literal["backward", "ortho", "forward"] = "backward") -> NDArray[np.complex128]:
    r"""The Fourier transform of real values, at the non-negative frequencies.

    Parameters
    ----------
    x : array_like
        Real values.
    n : int, optional
        Length of the transform, as for `fft`.
    axis : int
        The axis along which to transform.
    norm : {"backward", "ortho", "forward"}
        The factor: 1, :math:`1/\sqrt n`, or :math:`1/n`.

    Returns
    -------
    ndarray of complex128
        :math:`X_0` to :math:`X_{\lfloor n/2 \rfloor}`, for frequencies `rfftfreq(n, d)`.

    Raises
    ------
    TypeError
        If x is complex.
    ValueError
        If x is empty, n is below 1, or norm is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.fft.rfft([1.0, 2.0, 0.0, -1.0])
    array([2.+0.j, 1.-3.j, 0.+0.j])
    """
    if n is None and norm == "backward":
        if type(x) is np.ndarray and x.ndim == 1 and axis is LAST and len(x) < LONG:
            return core.rfft(x)[:len(x) // 2 + 1]
        return along(_half, x, axis)
    size = _length("fft.rfft", n, x, axis)
    return _scaled(along(lambda channel: core.rfft_sized(channel, 0, size, 0)[:size // 2 + 1], x, axis),
                   "fft.rfft", norm, size, axis)


def irfft(x: ArrayLike, n: int | None = None, axis: int = LAST,
          norm: Literal["backward", "ortho", "forward"] = "backward") -> NDArray[np.float64]:
    r"""The inverse of `rfft`: real values.

    Parameters
    ----------
    x : array_like
        The spectrum at the non-negative frequencies. For even n, only the real part is used at zero
        and at the highest frequency.
    n : int, optional
        Number of values to return; by default, 2 less than twice the length of x.
    axis : int
        The axis along which to transform.
    norm : {"backward", "ortho", "forward"}
        The factor: :math:`1/n`, :math:`1/\sqrt n`, or 1.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1 or norm is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.fft.irfft([2, 1 - 3j, 0])
    array([ 1.,  2.,  0., -1.])
    """
    size = whole_number("fft.irfft", "n", 2 * (count_of(x, axis) - 1) if n is None else n, 1,
                        "ErrFFTSizeNotPositive")

    def inverse(channel: Any) -> Any:
        spectrum = np.zeros(size, np.complex128)
        given = min(size // 2 + 1, len(channel))
        spectrum[:given] = channel[:given]
        return core.irfft(spectrum)

    found = along(inverse, x, axis)
    return found if norm == "backward" else _scaled(found, "fft.irfft", norm, size, axis, False)


def fft2(x: ArrayLike) -> NDArray[np.complex128]:
    r"""The two-dimensional transform of the last two axes.

    .. math:: X_{rc} = \sum_a \sum_b x_{ab} e^{-2\pi i (r a / m + c b / n)}

    Parameters
    ----------
    x : array_like
        Real or complex, of at least two dimensions.

    Returns
    -------
    ndarray of complex128

    Raises
    ------
    ValueError
        If x is empty or has fewer than two dimensions.

    Examples
    --------
    >>> import qx
    >>> qx.fft.fft2([[1.0, 2.0], [3.0, 4.0]]).real
    array([[10., -2.],
           [-4.,  0.]])
    """
    x = np.asarray(x)
    transform = core.fft2 if x.dtype.kind == "c" else core.fft2_real
    return _matrices("fft.fft2", lambda matrix: transform(matrix, 0, 0, *matrix.shape, 0), x)


def ifft2(x: ArrayLike) -> NDArray[np.complex128]:
    """The inverse of `fft2`, with the factor 1 / (m n).

    Parameters
    ----------
    x : array_like
        A spectrum, of at least two dimensions.

    Returns
    -------
    ndarray of complex128

    Raises
    ------
    ValueError
        If x is empty or has fewer than two dimensions.

    Examples
    --------
    >>> import qx
    >>> qx.fft.ifft2([[10, -2], [-4, 0]]).real
    array([[1., 2.],
           [3., 4.]])
    """
    return _matrices("fft.ifft2", lambda matrix: core.ifft2(matrix, 0), np.asarray(x))


def _matrices(function: Any, transform: Any, x: Any) -> Any:
    if x.ndim < 2:
        refuse(function, "x", f"two dimensions are needed; got {x.ndim}", "ErrSizesDisagree")
    if x.ndim == 2:
        return transform(x)
    return np.stack([transform(one) for one in x.reshape(-1, *x.shape[-2:])]).reshape(x.shape)


def fftfreq(n: int, d: float = 1.0) -> NDArray[np.float64]:
    """The frequencies of `fft`, in cycles per unit of d.

    Parameters
    ----------
    n : int
        Length of the transform.
    d : float
        The time between samples, 1 / fs.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1, or d is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.fft.fftfreq(4, 0.001)
    array([   0.,  250., -500., -250.])
    """
    n = whole_number("fft.fftfreq", "n", n, 1, "ErrFFTSizeNotPositive")
    return np.fft.fftfreq(n, positive("fft.fftfreq", "d", d, "ErrSamplingNotPositive"))


def rfftfreq(n: int, d: float = 1.0) -> NDArray[np.float64]:
    """The frequencies of `rfft`, in cycles per unit of d.

    Parameters
    ----------
    n : int
        Length of the transform.
    d : float
        The time between samples, 1 / fs.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1, or d is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.fft.rfftfreq(5, 0.001)
    array([  0., 200., 400.])
    """
    n = whole_number("fft.rfftfreq", "n", n, 1, "ErrFFTSizeNotPositive")
    return np.fft.rfftfreq(n, positive("fft.rfftfreq", "d", d, "ErrSamplingNotPositive"))


def fftshift(x: ArrayLike, axis: int = LAST) -> NDArray[Any]:
    """The spectrum with the zero frequency in the middle, at n // 2.

    Parameters
    ----------
    x : array_like
        A spectrum in the order of `fft`.
    axis : int
        The axis of the frequencies.

    Returns
    -------
    ndarray

    Examples
    --------
    >>> import qx
    >>> qx.fft.fftshift([0, 1, 2, -2, -1])
    array([-2, -1,  0,  1,  2])
    """
    count_of(x, axis)  # refuses an axis that x does not have
    return np.fft.fftshift(x, axis)


def ifftshift(x: ArrayLike, axis: int = LAST) -> NDArray[Any]:
    """The inverse of `fftshift`.

    Parameters
    ----------
    x : array_like
        A spectrum with the zero frequency in the middle.
    axis : int
        The axis of the frequencies.

    Returns
    -------
    ndarray

    Examples
    --------
    >>> import qx
    >>> qx.fft.ifftshift([-2, -1, 0, 1, 2])
    array([ 0,  1,  2, -2, -1])
    """
    count_of(x, axis)  # refuses an axis that x does not have
    return np.fft.ifftshift(x, axis)


# Cosine and sine transforms: the exports compute the orthonormal cosine transform and the plain sine sums.

def _unscale(found: Any, n: Any, axis: Any, inverse: Any) -> Any:
    """Converts the orthonormal type II to the norm "backward", or with inverse the input of type III back."""
    factors = np.full(n, (2 * n) ** (-0.5 if inverse else 0.5))
    factors[0] *= 2**-0.5 if inverse else 2**0.5
    return found * factors


def dct(x: ArrayLike, n: int | None = None, axis: int = LAST,
        norm: Literal["backward", "ortho"] = "backward") -> NDArray[np.float64]:
    r"""The cosine transform of type II.

    .. math:: X_k = 2 \sum_{j=0}^{n-1} x_j \cos\frac{\pi k (2j+1)}{2n}

    Parameters
    ----------
    x : array_like
        Real values.
    n : int, optional
        Length of the transform. Longer input is cut off, shorter input is zero-padded.
    axis : int
        The axis along which to transform.
    norm : {"backward", "ortho"}
        "ortho" multiplies by :math:`\sqrt{1/(2n)}`, and by :math:`\sqrt{1/(4n)}` for k = 0, which makes
        the transform orthogonal.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If x is empty, n is below 1, or norm is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.fft.dct([1.0, 1.0, 1.0, 1.0], norm="ortho").round(12)
    array([2., 0., 0., 0.])
    """
    n = _length("fft.dct", n, x, axis)
    ortho = chosen("fft.dct", "norm", norm, {"backward": False, "ortho": True})
    if ortho:
        return along(lambda channel: core.dct(channel, n), x, axis)
    return along(lambda channel: _unscale(core.dct(channel, n), n, -1, False), x, axis)


def idct(x: ArrayLike, n: int | None = None, axis: int = LAST,
         norm: Literal["backward", "ortho"] = "backward") -> NDArray[np.float64]:
    """The inverse of `dct` with the same norm.

    Parameters
    ----------
    x : array_like
        A cosine transform.
    n : int, optional
        Length of the transform.
    axis : int
        The axis along which to transform.
    norm : {"backward", "ortho"}
        The norm that was passed to `dct`.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If x is empty, n is below 1, or norm is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.fft.idct(qx.fft.dct([1.0, 2.0, 4.0])).round(12)
    array([1., 2., 4.])
    """
    n = _length("fft.idct", n, x, axis)
    ortho = chosen("fft.idct", "norm", norm, {"backward": False, "ortho": True})

    def inverse(channel: Any) -> Any:
        fitted = _fitted(channel, n)
        return core.idct(fitted if ortho else _unscale(fitted, n, -1, True))

    return along(inverse, x, axis)


def dst(x: ArrayLike, n: int | None = None, axis: int = LAST,
        norm: Literal["backward", "ortho"] = "backward") -> NDArray[np.float64]:
    r"""The sine transform of type I.

    .. math:: X_k = 2 \sum_{j=0}^{n-1} x_j \sin\frac{\pi (j+1)(k+1)}{n+1}

    Parameters
    ----------
    x : array_like
        Real values.
    n : int, optional
        Length of the transform, as for `dct`.
    axis : int
        The axis along which to transform.
    norm : {"backward", "ortho"}
        "ortho" multiplies by :math:`1/\sqrt{2(n+1)}`, which makes the transform its own inverse.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If x is empty, n is below 1, or norm is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.fft.dst([1.0, 0.0, 0.0]).round(6)
    array([1.414214, 2.      , 1.414214])
    """
    size = _length("fft.dst", n, x, axis)
    factor = chosen("fft.dst", "norm", norm, {"backward": 2.0, "ortho": (2 / (size + 1))**0.5})
    return along(lambda channel: factor * core.dst(channel, size), x, axis)


def idst(x: ArrayLike, n: int | None = None, axis: int = LAST,
         norm: Literal["backward", "ortho"] = "backward") -> NDArray[np.float64]:
    """The inverse of `dst` with the same norm.

    Parameters
    ----------
    x : array_like
        A sine transform.
    n : int, optional
        Length of the transform.
    axis : int
        The axis along which to transform.
    norm : {"backward", "ortho"}
        The norm that was passed to `dst`.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If x is empty, n is below 1, or norm is not a valid choice.

    Examples
    --------
    >>> import qx
    >>> qx.fft.idst(qx.fft.dst([1.0, 2.0, 4.0])).round(12)
    array([1., 2., 4.])
    """
    size = _length("fft.idst", n, x, axis)
    factor = chosen("fft.idst", "norm", norm, {"backward": 0.5, "ortho": ((size + 1) / 2)**0.5})
    return along(lambda channel: factor * core.idst(_fitted(channel, size)), x, axis)


# Hartley, Hilbert, half-complex

def hartley(x: ArrayLike, axis: int = LAST) -> NDArray[np.float64]:
    r"""The Hartley transform of real values.

    .. math:: H_k = \sum_j x_j \left(\cos\frac{2\pi j k}{n} + \sin\frac{2\pi j k}{n}\right)

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis along which to transform.

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
    >>> qx.fft.hartley([1.0, 2.0, 0.0, -1.0])
    array([ 2.,  4.,  0., -2.])
    """
    return along(core.hartley, x, axis)


def ihartley(x: ArrayLike, axis: int = LAST) -> NDArray[np.float64]:
    """The inverse of `hartley`: the same transform with the factor 1 / n.

    Parameters
    ----------
    x : array_like
        A Hartley transform.
    axis : int
        The axis along which to transform.

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
    >>> qx.fft.ihartley([2.0, 4.0, 0.0, -2.0])
    array([ 1.,  2.,  0., -1.])
    """
    return along(core.ihartley, x, axis)


def hilbert(x: ArrayLike, axis: int = LAST) -> NDArray[np.float64]:
    """The Hilbert transform of real values: a cosine becomes a sine, and the mean is removed.

    This is the imaginary part of the analytic signal, which `qx.spectra.analytic` returns as a whole.

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis along which to transform.

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
    >>> qx.fft.hilbert([1.0, 0.0, -1.0, 0.0]).round(12)
    array([ 0.,  1.,  0., -1.])
    """
    return along(core.hilbert, x, axis)


def ihilbert(x: ArrayLike, axis: int = LAST) -> NDArray[np.float64]:
    """The inverse of `hilbert`, up to the mean and, for even n, the highest frequency.

    Parameters
    ----------
    x : array_like
        A Hilbert transform.
    axis : int
        The axis along which to transform.

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
    >>> qx.fft.ihilbert([0.0, 1.0, 0.0, -1.0]).round(12) + 0.0
    array([ 1.,  0., -1.,  0.])
    """
    return along(core.ihilbert, x, axis)


def half_complex(x: ArrayLike, axis: int = LAST) -> NDArray[np.float64]:
    r"""The spectrum of n real values, packed in n real numbers: :math:`\mathrm{Re}\,X_k` at index k and
    :math:`\mathrm{Im}\,X_k` at index n - k.

    Parameters
    ----------
    x : array_like
        Real values.
    axis : int
        The axis along which to transform.

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
    >>> qx.fft.half_complex([1.0, 2.0, 0.0, -1.0])
    array([ 2.,  1.,  0., -3.])
    """
    return along(core.half_complex, x, axis)


def ihalf_complex(x: ArrayLike, axis: int = LAST) -> NDArray[np.float64]:
    """The inverse of `half_complex`, with the factor 1 / n.

    Parameters
    ----------
    x : array_like
        A half-complex spectrum.
    axis : int
        The axis along which to transform.

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
    >>> qx.fft.ihalf_complex([2.0, 1.0, 0.0, -3.0])
    array([ 1.,  2.,  0., -1.])
    """
    return along(lambda channel: core.ihalf_complex(channel)[1], x, axis)


# Chirp-Z

def czt(x: ArrayLike, m: int | None = None, w: complex | None = None, a: complex = 1.0,
        axis: int = LAST) -> NDArray[np.complex128]:
    r"""The chirp-Z transform: the z-transform at m points on a spiral.

    .. math:: X_k = \sum_j x_j\, a^{-j} w^{jk}

    Parameters
    ----------
    x : array_like
        Real or complex values.
    m : int, optional
        Number of points; the number of values by default.
    w : complex, optional
        The ratio between successive points; :math:`e^{-2\pi i/m}` by default.
    a : complex
        The first point.
    axis : int
        The axis along which to transform.

    Returns
    -------
    ndarray of complex128

    Raises
    ------
    ValueError
        If x is empty, m is below 1, or a or w is 0 or not finite.

    Examples
    --------
    >>> import qx
    >>> qx.fft.czt([1.0, 0.0, -1.0, 0.0]).real.round(12)
    array([0., 2., 0., 2.])
    """
    m = whole_number("fft.czt", "m", count_of(x, axis) if m is None else m, 1)
    w = np.exp(-2j * np.pi / m) if w is None else w
    return either(lambda channel: core.czt(channel, a, w, m, 1),
                  lambda channel: core.czt_complex(channel, a, w, m, 1), x, axis)


def iczt(x: ArrayLike, w: complex | None = None, a: complex = 1.0, axis: int = LAST) -> NDArray[np.complex128]:
    r"""The inverse of `czt`: the values whose transform at the same number of points is x.

    Unless the points cover the whole unit circle, the error grows exponentially with the length.

    Parameters
    ----------
    x : array_like
        A chirp-Z transform.
    w : complex, optional
        The ratio between successive points, as for `czt`.
    a : complex
        The first point, as for `czt`.
    axis : int
        The axis along which to transform.

    Returns
    -------
    ndarray of complex128

    Raises
    ------
    ValueError
        If x is empty, or two points agree to rounding.

    Examples
    --------
    >>> import qx
    >>> qx.fft.iczt([0, 2, 0, 2]).real.round(12) + 0.0
    array([ 1.,  0., -1.,  0.])
    """
    n = count_of(x, axis)
    w = np.exp(-2j * np.pi / max(n, 1)) if w is None else w
    return along(lambda channel: core.iczt(channel, a, w, n), x, axis)


def dzt(x: ArrayLike, start: int, size: int, n: int | None = None, axis: int = LAST) -> NDArray[np.complex128]:
    r"""A range of neighbouring bins of a long transform, without the others (dilated Z transform).

    .. math:: X_k = \sum_j x_j\, e^{-2\pi i j k / n}, \quad k = \text{start} \ldots \text{start} + \text{size} - 1

    The bins are computed from transforms whose length divides n, so nothing is gained where n is prime.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    start : int
        The first bin, counted cyclically: -1 is the last one.
    size : int
        Number of bins.
    n : int, optional
        Length of the transform; the values are cut off or zero-padded to it. The number of values by
        default.
    axis : int
        The axis along which to transform.

    Returns
    -------
    ndarray of complex128

    Raises
    ------
    ValueError
        If x is empty, or n or size is below 1.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = qx.signals.sine(4096, 0.1)
    >>> bool(np.allclose(qx.fft.dzt(x, 400, 20), qx.fft.fft(x)[400:420]))
    True
    """
    length = _length("fft.dzt", n, x, axis)
    count = whole_number("fft.dzt", "size", size, 1, "ErrFFTSizeNotPositive")
    first = whole_number("fft.dzt", "start", start) % length
    pieces = _pieces(length, count)

    def of(export: Any) -> Any:
        # The export folds longer input and works in place.
        return lambda channel: export(channel[:length], pieces, length // pieces, first, count)[1]

    return either(of(core.dzt), of(core.dzt_complex), x, axis)


def _pieces(length: int, count: int) -> int:
    """The number of shorter transforms that gives `count` bins of a long one with the least work."""
    divisors = [one for small in range(1, math.isqrt(length) + 1) if length % small == 0
                for one in (small, length // small)]
    return min(divisors, key=lambda pieces: length * math.log2(2 * length / pieces) + 4 * count * pieces)


def zoom(x: ArrayLike, band: tuple[float, float], m: int | None = None, fs: float = 1.0,
         axis: int = LAST) -> NDArray[np.complex128]:
    r"""The spectrum at m evenly spaced frequencies of a band, whose end is excluded.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    band : (float, float)
        The first frequency and the end, in the unit of fs.
    m : int, optional
        Number of frequencies; the number of values by default.
    fs : float
        The sampling rate.
    axis : int
        The axis along which to transform.

    Returns
    -------
    ndarray of complex128
        At the frequencies `band[0] + k (band[1] - band[0]) / m`.

    Raises
    ------
    ValueError
        If x is empty, m is below 1, or the band does not have two frequencies.

    Examples
    --------
    >>> import numpy as np, qx
    >>> x = np.cos(2 * np.pi * 50.2 * np.arange(1000) / 1000)
    >>> int(np.abs(qx.fft.zoom(x, (49, 51), 100, fs=1000)).argmax())
    60
    """
    if np.shape(band) != (2,):
        refuse("fft.zoom", "band", f"two frequencies are needed; got {band!r}", "ErrSizesDisagree")
    m = count_of(x, axis) if m is None else whole_number("fft.zoom", "m", m, 1)
    fs = positive("fft.zoom", "fs", fs, "ErrSamplingNotPositive")
    first, end = (float(edge) / fs for edge in band)
    return czt(x, m, np.exp(-2j * np.pi * (end - first) / m), np.exp(2j * np.pi * first), axis)
