r"""Windows, as one function for each or by name.

A window of n values is either symmetric, :math:`w_i = w_{n-1-i}`, for filters, or periodic,
:math:`w_i = w_{n-i}`, for spectra. The periodic form is the first n values of the symmetric window of
n + 1 values. The functions return the symmetric form by default, as those of `scipy.signal.windows` and of
NumPy do; `get` and `apply`, which the spectra use, return the periodic one.

F. J. Harris, "On the use of windows for harmonic analysis with the discrete Fourier transform", 1978,
defines most of them.
"""

from __future__ import annotations

from typing import Any

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .topical import LAST, Result, chosen, either, refuse, result, served, vector, whole_number

__all__ = ["Constants", "apply", "bartlett_hann", "blackman", "blackman_exact", "blackman_harris",
           "blackman_harris3", "blackman_harris7", "blackman_nuttall", "bohman", "boxcar", "chebyshev",
           "constants", "cosine_sum", "exponential", "flattop", "force", "gaussian", "get", "hamming",
           "hann", "kaiser", "low_sidelobe", "parzen", "triangle", "tukey", "welch"]

core = served("windows")

PLAIN = {"boxcar": 0, "hann": 1, "hamming": 2, "blackman_harris3": 3, "blackman_exact": 4, "blackman": 5,
         "flattop": 6, "blackman_harris": 7, "blackman_harris7": 8, "low_sidelobe": 9,
         "blackman_nuttall": 11, "triangle": 30, "bartlett_hann": 31, "bohman": 32, "parzen": 33,
         "welch": 34}
WITH_PARAMETER = {"tukey": 12, "kaiser": 60, "chebyshev": 61, "gaussian": 62, "force": 64,
                  "exponential": 65}
ALIASES = {"rectangular": "boxcar", "hanning": "hann", "blackmanharris": "blackman_harris",
           "bartlett": "triangle", "barthann": "bartlett_hann", "chebwin": "chebyshev",
           "nuttall": "blackman_nuttall"}
WORDS = {**{name: name for name in (*PLAIN, *WITH_PARAMETER)}, **ALIASES}
DEFAULTS = {"tukey": 0.5, "chebyshev": 60.0, "force": 50.0, "exponential": 0.1}
ONE_FORM = ("force", "exponential")  # neither symmetric nor periodic


def _described(window: Any) -> Any:
    """The name and the parameter of a window that is given by a word, or by a word and a parameter."""
    word, *parameters = window if isinstance(window, tuple) else (window,)
    name = chosen("windows.get", "window", word, WORDS)
    if name in PLAIN:
        if parameters:
            refuse("windows.get", "window", f"{name} takes no parameter; got {parameters}")
        return name, 0.0
    if not parameters and name not in DEFAULTS or len(parameters) > 1:
        refuse("windows.get", "window", f"{name} takes one parameter: pass ({name!r}, value)")
    return name, float(parameters[0] if parameters else DEFAULTS[name])


def _windowed(call: Any, x: Any, name: Any, parameter: Any, symmetric: Any) -> Any:
    """x times a window."""
    n = len(x)
    code = PLAIN.get(name, WITH_PARAMETER.get(name))
    if name == "tukey":  # the export has the symmetric form; fully tapered, it is the periodic Hann window
        if parameter >= 1:
            code = 1
        elif not symmetric:
            return x * _windowed(core.get, np.ones(n + 1), name, parameter, True)[:n]
        else:
            symmetric = False
    elif name == "gaussian":  # the export takes the deviation in units of the length
        parameter /= n if symmetric else n + 1
    return call(x, code, parameter, 0, int(symmetric and name not in ONE_FORM))


def get(window: str | tuple[Any, ...] | ArrayLike, n: int, symmetric: bool = False) -> NDArray[np.float64]:
    """A window by its name.

    Parameters
    ----------
    window : str, tuple or array_like
        The name of a function of this module; a tuple for windows with a parameter, such as
        ``("kaiser", 8.6)``; or n values, which are returned.
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1, the name is unknown, or the number of values given is not n.

    Examples
    --------
    >>> import qx
    >>> qx.windows.get("hann", 4)
    array([0. , 0.5, 1. , 0.5])
    """
    n = whole_number("windows.get", "n", n, 1)
    if not isinstance(window, (str, tuple)):
        values = vector(window, "windows.get", "window").astype(float)
        if len(values) != n:
            refuse("windows.get", "window", f"{n} values are needed; got {len(values)}", "ErrSizesDisagree")
        return values
    name, parameter = _described(window)
    return _windowed(core.get, np.ones(n), name, parameter, symmetric)


def apply(x: ArrayLike, window: str | tuple[Any, ...], axis: int = LAST, symmetric: bool = False) -> Any:
    """The values multiplied by a window.

    Parameters
    ----------
    x : array_like
        Real or complex values.
    window : str or tuple
        As for `get`.
    axis : int
        The axis along which the window is applied.
    symmetric : bool
        Whether to use the symmetric form rather than the periodic one.

    Returns
    -------
    ndarray, or the pandas type of x
        The same shape as x.

    Raises
    ------
    ValueError
        If x is empty, or the name is unknown.

    Examples
    --------
    >>> import qx
    >>> qx.windows.apply([2.0, 2.0, 2.0, 2.0], "hann")
    array([0., 1., 2., 1.])
    """
    name, parameter = _described(window)
    return either(lambda channel: _windowed(core.apply, channel, name, parameter, symmetric),
                  lambda channel: _windowed(core.apply_complex, channel, name, parameter, symmetric),
                  x, axis)


@result
class Constants(Result):
    """The effect of a window on noise and tones.

    Attributes
    ----------
    enbw : float
        The equivalent noise bandwidth in bins, n sum(w^2) / sum(w)^2.
    coherent_gain : float
        The mean of the window.
    """

    enbw: float
    coherent_gain: float


def constants(window: str | tuple[Any, ...] | ArrayLike, n: int = 1024) -> Constants:
    r"""Equivalent noise bandwidth and coherent gain of a window.

    .. math:: \mathrm{ENBW} = n \frac{\sum w_i^2}{(\sum w_i)^2},\quad
              \mathrm{CG} = \frac1n \sum w_i

    Parameters
    ----------
    window : str, tuple or array_like
        As for `get`; or the values of a window.
    n : int
        Number of values of a window that is given by its name.

    Returns
    -------
    Constants

    Raises
    ------
    ValueError
        If the window is empty, or the name is unknown.

    Examples
    --------
    >>> import qx
    >>> qx.windows.constants("hann")
    Constants
      enbw           1.5
      coherent_gain  0.5
    """
    if isinstance(window, (str, tuple)):
        window = get(window, n)
    found = core.constants(vector(window, "windows.constants", "window"))
    return Constants(found["enbw"], found["cg"])


def cosine_sum(n: int, coefficients: ArrayLike, symmetric: bool = True) -> NDArray[np.float64]:
    r"""A window as a sum of cosines with given coefficients.

    .. math:: w_i = \sum_k (-1)^k a_k \cos\frac{2\pi k i}{n - 1}

    with n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    coefficients : array_like
        The coefficients :math:`a_k`.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1, or there are no coefficients.

    Examples
    --------
    >>> import qx
    >>> qx.windows.cosine_sum(5, [0.5, 0.5])
    array([0. , 0.5, 1. , 0.5, 0. ])
    """
    n = whole_number("windows.cosine_sum", "n", n, 1)
    if not symmetric or n == 1:
        return core.cosine_sum(np.ones(n), coefficients)
    half = core.cosine_sum(np.ones(n - 1), coefficients)
    return np.append(half, half[0])


def boxcar(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The rectangular window: all ones.

    .. math:: w_i = 1

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.boxcar(5).round(4)
    array([1., 1., 1., 1., 1.])
    """
    return get("boxcar", n, symmetric)


def hann(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Hann window: the raised cosine.

    .. math:: w_i = \frac12 - \frac12 \cos\theta_i

    with :math:`\theta_i = 2\pi i / (n-1)`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.hann(5).round(4)
    array([0. , 0.5, 1. , 0.5, 0. ])
    """
    return get("hann", n, symmetric)


def hamming(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Hamming window: the raised cosine on a pedestal, with a low first side lobe.

    .. math:: w_i = 0.54 - 0.46 \cos\theta_i

    with :math:`\theta_i = 2\pi i / (n-1)`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.hamming(5).round(4)
    array([0.08, 0.54, 1.  , 0.54, 0.08])
    """
    return get("hamming", n, symmetric)


def blackman(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Blackman window: a cosine sum of three terms.

    .. math:: w_i = 0.42 - 0.5 \cos\theta_i + 0.08 \cos 2\theta_i

    with :math:`\theta_i = 2\pi i / (n-1)`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.blackman(5).round(4)
    array([-0.  ,  0.34,  1.  ,  0.34, -0.  ])
    """
    return get("blackman", n, symmetric)


def blackman_exact(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The exact Blackman window: a cosine sum of three terms, with zeros at the third and fourth side lobes.

    .. math:: w_i = \tfrac{7938}{18608} - \tfrac{9240}{18608} \cos\theta_i + \tfrac{1430}{18608} \cos 2\theta_i

    with :math:`\theta_i = 2\pi i / (n-1)`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.blackman_exact(5).round(4)
    array([0.0069, 0.3497, 1.    , 0.3497, 0.0069])
    """
    return get("blackman_exact", n, symmetric)


def blackman_harris3(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Blackman-Harris window of three terms, with side lobes 67 dB down.

    .. math:: w_i = 0.42323 - 0.49755 \cos\theta_i + 0.07922 \cos 2\theta_i

    with :math:`\theta_i = 2\pi i / (n-1)`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.blackman_harris3(5).round(4)
    array([0.0049, 0.344 , 1.    , 0.344 , 0.0049])
    """
    return get("blackman_harris3", n, symmetric)


def blackman_harris(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Blackman-Harris window of four terms, with side lobes 92 dB down.

    .. math:: w_i = 0.35875 - 0.48829 \cos\theta_i + 0.14128 \cos 2\theta_i - 0.01168 \cos 3\theta_i

    with :math:`\theta_i = 2\pi i / (n-1)`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.blackman_harris(5).round(4)
    array([1.000e-04, 2.175e-01, 1.000e+00, 2.175e-01, 1.000e-04])
    """
    return get("blackman_harris", n, symmetric)


def blackman_harris7(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Blackman-Harris window of seven terms, with side lobes more than 160 dB down.

    .. math:: w_i = \sum_{k=0}^{6} (-1)^k a_k \cos k\theta_i

    with :math:`\theta_i = 2\pi i / (n-1)`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.blackman_harris7(5).round(4)
    array([0.    , 0.0637, 1.    , 0.0637, 0.    ])
    """
    return get("blackman_harris7", n, symmetric)


def blackman_nuttall(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Blackman-Nuttall window: a cosine sum of four terms, with side lobes 98 dB down.

    .. math:: w_i = 0.3635819 - 0.4891775 \cos\theta_i + 0.1365995 \cos 2\theta_i - 0.0106411 \cos 3\theta_i

    with :math:`\theta_i = 2\pi i / (n-1)`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.blackman_nuttall(5).round(4)
    array([4.00e-04, 2.27e-01, 1.00e+00, 2.27e-01, 4.00e-04])
    """
    return get("blackman_nuttall", n, symmetric)


def flattop(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The flat-top window: a cosine sum of five terms. The amplitude of a tone between bins is read correctly.

    .. math:: w_i = \sum_{k=0}^{4} (-1)^k a_k \cos k\theta_i

    with :math:`\theta_i = 2\pi i / (n-1)`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.flattop(5).round(4)
    array([-4.00e-04, -5.47e-02,  1.00e+00, -5.47e-02, -4.00e-04])
    """
    return get("flattop", n, symmetric)


def low_sidelobe(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""A cosine sum of five terms with low side lobes.

    .. math:: w_i = \sum_{k=0}^{4} (-1)^k a_k \cos k\theta_i

    with :math:`\theta_i = 2\pi i / (n-1)`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.low_sidelobe(5).round(4)
    array([0.    , 0.1489, 1.    , 0.1489, 0.    ])
    """
    return get("low_sidelobe", n, symmetric)


def triangle(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The triangular window with zeros at the ends (Bartlett).

    .. math:: w_i = 1 - |u_i|

    with :math:`u_i = 2i / (n-1) - 1`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.triangle(5).round(4)
    array([0. , 0.5, 1. , 0.5, 0. ])
    """
    return get("triangle", n, symmetric)


def bartlett_hann(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Bartlett-Hann window: a triangle plus a cosine.

    .. math:: w_i = 0.62 - 0.24 |u_i| + 0.38 \cos \pi u_i

    with :math:`u_i = 2i / (n-1) - 1`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.bartlett_hann(5).round(4)
    array([0. , 0.5, 1. , 0.5, 0. ])
    """
    return get("bartlett_hann", n, symmetric)


def bohman(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Bohman window: two half cosines, convolved.

    .. math:: w_i = (1 - |u_i|) \cos \pi |u_i| + \tfrac1\pi \sin \pi |u_i|

    with :math:`u_i = 2i / (n-1) - 1`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.bohman(5).round(4)
    array([0.    , 0.3183, 1.    , 0.3183, 0.    ])
    """
    return get("bohman", n, symmetric)


def parzen(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Parzen window: a cubic spline.

    .. math:: w_i = 1 - 6 u_i^2 + 6 |u_i|^3\ (|u_i| \le \tfrac12),\quad 2 (1 - |u_i|)^3

    with :math:`u_i = 2i / (n-1) - 1`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.parzen(5).round(4)
    array([0.  , 0.25, 1.  , 0.25, 0.  ])
    """
    return get("parzen", n, symmetric)


def welch(n: int, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Welch window: a parabola.

    .. math:: w_i = 1 - u_i^2

    with :math:`u_i = 2i / (n-1) - 1`, or n in place of n - 1 in the periodic form.

    Parameters
    ----------
    n : int
        Number of values.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.welch(5).round(4)
    array([0.  , 0.75, 1.  , 0.75, 0.  ])
    """
    return get("welch", n, symmetric)


def kaiser(n: int, beta: float, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Kaiser window, whose main lobe holds nearly the largest possible part of the energy.

    .. math:: w_i = \frac{I_0(\beta \sqrt{1 - u_i^2})}{I_0(\beta)}

    with :math:`u_i = 2i / (n-1) - 1`, or n in place of n - 1 in the periodic form.

    The Bessel series has 25 terms: the window is off by 6e-10 at beta 20 and by 3e-5 at 30.

    Parameters
    ----------
    n : int
        Number of values.
    beta : float
        The shape: 0 gives a rectangle, 8.6 gives side lobes 70 dB down.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.kaiser(5, 8.6).round(4)
    array([0.0013, 0.3404, 1.    , 0.3404, 0.0013])
    """
    return get(("kaiser", beta), n, symmetric)


def chebyshev(n: int, attenuation: float = 60.0, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Dolph-Chebyshev window, which has the narrowest main lobe for a given level of the side lobes.

    Parameters
    ----------
    n : int
        Number of values.
    attenuation : float
        How far all side lobes are down, in dB.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.chebyshev(5, 60).round(4)
    array([0.1876, 0.6862, 1.    , 0.6862, 0.1876])
    """
    return get(("chebyshev", attenuation), n, symmetric)


def gaussian(n: int, std: float, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Gaussian window.

    .. math:: w_i = e^{-(i - (n-1)/2)^2 / (2 \sigma^2)}

    Parameters
    ----------
    n : int
        Number of values.
    std : float
        The standard deviation in samples.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.gaussian(5, 1).round(4)
    array([0.1353, 0.6065, 1.    , 0.6065, 0.1353])
    """
    return get(("gaussian", std), n, symmetric)


def tukey(n: int, alpha: float = 0.5, symmetric: bool = True) -> NDArray[np.float64]:
    r"""The Tukey window: a rectangle with cosine tapers at both ends.

    .. math:: w_i = \sin^2\frac{\pi i}{2m},\quad m = \lfloor \alpha n / 2 \rfloor

    for the first m values, and mirrored for the last ones.

    Parameters
    ----------
    n : int
        Number of values.
    alpha : float
        The fraction of the values that is tapered: 0 gives a rectangle, 1 a Hann window.
    symmetric : bool
        Whether to return the symmetric form, for filters, rather than the periodic one, for spectra.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 1.

    Examples
    --------
    >>> import qx
    >>> qx.windows.tukey(5, 0.5).round(4)
    array([0., 1., 1., 1., 0.])
    """
    return get(("tukey", alpha), n, symmetric)


def force(n: int, percent: float = 50.0) -> NDArray[np.float64]:
    """The force window: ones followed by zeros, for the force of an impact hammer.

    Parameters
    ----------
    n : int
        Number of values, at least 2.
    percent : float
        The percentage of values that are 1.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 2.

    Examples
    --------
    >>> import qx
    >>> qx.windows.force(4, 50).round(4)
    array([1., 1., 0., 0.])
    """
    return get(("force", percent), n)


def exponential(n: int, final: float = 0.1) -> NDArray[np.float64]:
    """The exponential window, from 1 at the first value to `final` at the last, for decaying vibrations.

    Parameters
    ----------
    n : int
        Number of values, at least 2.
    final : float
        The last value, above 0.

    Returns
    -------
    ndarray of float64

    Raises
    ------
    ValueError
        If n is below 2, or final is not above 0.

    Examples
    --------
    >>> import qx
    >>> qx.windows.exponential(4, 0.1).round(4)
    array([1.    , 0.4642, 0.2154, 0.1   ])
    """
    return get(("exponential", final), n)
