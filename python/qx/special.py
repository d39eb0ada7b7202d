"""Special functions of numbers and of arrays of any shape, with the names and the order of arguments of
`scipy.special`. Outside their domain they return NaN. The measured errors are in docs/accuracy.

M. Abramowitz and I. A. Stegun, "Handbook of mathematical functions", 1964, has the definitions.
"""

from __future__ import annotations

from typing import Any

import numpy as np
from numpy.typing import ArrayLike

from .topical import served

__all__ = ["airy", "beta", "betainc", "dawsn", "digamma", "ellipe", "ellipeinc", "ellipj", "ellipk",
           "ellipkinc", "erf", "erfc", "expn", "factorial", "factorialln", "fresnel", "gamma",
           "gammainc", "gammaincc", "gammaln", "hankel1", "hankel2", "hyp1f1", "hyp2f1",
           "hyperu", "iv", "jv", "kelvin", "kn", "kv", "pbdv", "shichi", "sici", "spence",
           "spherical_jn", "spherical_yn", "stirling", "struve", "yv", "zeta"]

core = served("special")


def gamma(x: ArrayLike) -> Any:
    r"""The gamma function; NaN at 0 and negative integers.

    .. math:: \Gamma(x) = \int_0^\infty t^{x-1} e^{-t} dt

    Parameters
    ----------
    x : float or array_like
        The argument.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.gamma([0.5, 5.0])
    array([ 1.77245385, 24.        ])
    """
    return core.gamma(x, 0.0, 1)


def gammaln(x: ArrayLike) -> Any:
    """The logarithm of the gamma function, for x of at least 0.

    Parameters
    ----------
    x : float or array_like
        The argument.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.gammaln(100.0)
    359.1342053695754
    """
    return core.gammaln(x)


def _incomplete(a: Any, x: Any, direct: Any, large: Any, what: int) -> Any:
    """An incomplete gamma function. For large a, it is computed as the chi-square distribution, which costs
    several times as much and keeps the digits."""
    a, x = np.broadcast_arrays(np.asarray(a, float), np.asarray(x, float))
    value = np.asarray(direct(a, x))
    is_large = (a > 100) & (a < 5e24) & (x >= 0) & (x < 8e307)
    if np.any(is_large):
        value = value.copy()
        value[is_large] = large(2 * x[is_large], 2 * a[is_large], what)
    return value[()]


def gammainc(a: ArrayLike, x: ArrayLike) -> Any:
    r"""The regularised lower incomplete gamma function.

    .. math:: P(a, x) = \frac{1}{\Gamma(a)} \int_0^x t^{a-1} e^{-t} dt

    Parameters
    ----------
    a : float or array_like
        Above 0.
    x : float or array_like
        At least 0.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.gammainc(2.0, 3.0)
    0.8008517265285442
    """
    return _incomplete(a, x, lambda a, x: core.gammainc(a, x, 0), core.gammainc_large, 0)


def gammaincc(a: ArrayLike, x: ArrayLike) -> Any:
    r"""The regularised upper incomplete gamma function, 1 - P(a, x).

    .. math:: Q(a, x) = \frac{1}{\Gamma(a)} \int_x^\infty t^{a-1} e^{-t} dt

    Parameters
    ----------
    a : float or array_like
        Above 0.
    x : float or array_like
        At least 0.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.gammaincc(2.0, 3.0)
    0.1991482734714558
    """
    return _incomplete(a, x, core.gammaincc, core.gammaincc_large, 1)


def beta(a: ArrayLike, b: ArrayLike) -> Any:
    r"""The beta function.

    .. math:: B(a, b) = \Gamma(a) \Gamma(b) / \Gamma(a + b)

    Parameters
    ----------
    a, b : float or array_like
        The arguments.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.beta(2.0, 3.0)
    0.08333333333333333
    """
    return core.beta(a, b, 0.0, 1)


def betainc(a: ArrayLike, b: ArrayLike, x: ArrayLike) -> Any:
    r"""The regularised incomplete beta function.

    .. math:: I_x(a, b) = \frac{1}{B(a, b)} \int_0^x t^{a-1} (1-t)^{b-1} dt

    Parameters
    ----------
    a, b : float or array_like
        At least 0.
    x : float or array_like
        From 0 to 1.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.betainc(2.0, 3.0, 0.5)
    0.6874999999999998
    """
    return core.betainc(a, b, x, 0)


def factorial(n: ArrayLike) -> Any:
    """The factorial; infinite from 171 on.

    Parameters
    ----------
    n : int or array_like
        A whole number.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.factorial(5)
    120.0
    """
    return core.factorial(n)


def factorialln(n: ArrayLike) -> Any:
    """The logarithm of the factorial.

    Parameters
    ----------
    n : int or array_like
        A whole number.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.factorialln(100)
    363.73937555556347
    """
    return core.factorialln(n)


def digamma(x: ArrayLike) -> Any:
    r"""The derivative of the logarithm of the gamma function.

    .. math:: \psi(x) = \Gamma'(x) / \Gamma(x)

    Parameters
    ----------
    x : float or array_like
        The argument.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.digamma(1.0)
    -0.5772156649015329
    """
    return core.digamma(x)


def zeta(x: ArrayLike) -> Any:
    r"""Riemann's zeta function and its continuation.

    .. math:: \zeta(x) = \sum_{k=1}^\infty k^{-x}

    Parameters
    ----------
    x : float or array_like
        The argument.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.zeta(2.0)
    1.6449340668482264
    """
    return core.zeta(x)


def stirling(x: ArrayLike) -> Any:
    """The gamma function by Stirling's formula, for x above 33.

    Parameters
    ----------
    x : float or array_like
        The argument.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.stirling(40.0)
    2.0397882081197442e+46
    """
    return core.stirling(x)


def erf(x: ArrayLike) -> Any:
    r"""The error function.

    .. math:: \mathrm{erf}\,x = \frac{2}{\sqrt\pi} \int_0^x e^{-t^2} dt

    Parameters
    ----------
    x : float or array_like
        The argument.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.erf([0.0, 0.5])
    array([0.        , 0.52049988])
    """
    return core.erf(x)


def erfc(x: ArrayLike) -> Any:
    """The complementary error function, 1 - erf x, without loss of digits.

    Parameters
    ----------
    x : float or array_like
        The argument.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.erfc(5.0)
    1.5374597944280351e-12
    """
    return core.erfc(x)


def expn(n: ArrayLike, x: ArrayLike) -> Any:
    r"""The exponential integral.

    .. math:: E_n(x) = \int_1^\infty e^{-xt} t^{-n} dt

    Parameters
    ----------
    n : int or array_like
        The order.
    x : float or array_like
        At least 0.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.expn(1, 1.0)
    0.2193839343955203
    """
    return core.expn(x, n)


def sici(x: ArrayLike) -> tuple[Any, Any]:
    r"""The sine and the cosine integral.

    .. math:: \mathrm{Si}(x) = \int_0^x \frac{\sin t}{t} dt,\quad
              \mathrm{Ci}(x) = \gamma + \ln |x| + \int_0^x \frac{\cos t - 1}{t} dt

    Parameters
    ----------
    x : float or array_like
        The argument.

    Returns
    -------
    two floats or ndarrays

    Examples
    --------
    >>> import qx
    >>> qx.special.sici(1.0)
    (0.9460830703671831, 0.3374039229009681)
    """
    return core.sici(x), core.sici_cosine(x)


def shichi(x: ArrayLike) -> tuple[Any, Any]:
    """The hyperbolic sine and cosine integral.

    Parameters
    ----------
    x : float or array_like
        The argument.

    Returns
    -------
    two floats or ndarrays

    Examples
    --------
    >>> import qx
    >>> qx.special.shichi(1.0)
    (1.0572508753757286, 0.8378669409802082)
    """
    return core.shichi(x), core.shichi_cosine(x)


def spence(x: ArrayLike) -> Any:
    r"""The dilogarithm of 1 - x, as in `scipy.special.spence`.

    .. math:: \mathrm{Li}_2(1 - x) = -\int_1^x \frac{\ln t}{t - 1} dt

    Parameters
    ----------
    x : float or array_like
        At least 0.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.spence(0.0)
    1.6449340668482264
    """
    return core.spence(x)


def dawsn(x: ArrayLike) -> Any:
    r"""Dawson's integral.

    .. math:: e^{-x^2} \int_0^x e^{t^2} dt

    Parameters
    ----------
    x : float or array_like
        The argument.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.dawsn(1.0)
    0.5380795069127685
    """
    return core.dawsn(x)


def fresnel(x: ArrayLike) -> tuple[Any, Any]:
    r"""The Fresnel integrals S and C, in this order.

    .. math:: S = \int_0^x \sin\frac{\pi t^2}{2} dt,\quad C = \int_0^x \cos\frac{\pi t^2}{2} dt

    Parameters
    ----------
    x : float or array_like
        The argument.

    Returns
    -------
    two floats or ndarrays

    Examples
    --------
    >>> import qx
    >>> qx.special.fresnel(1.0)
    (0.4382591473903547, 0.779893400376823)
    """
    c, s = core.fresnel(x)
    return s, c


def ellipk(m: ArrayLike) -> Any:
    r"""The complete elliptic integral of the first kind, as a function of the parameter m = k^2.

    .. math:: K(m) = \int_0^{\pi/2} (1 - m \sin^2 t)^{-1/2} dt

    Parameters
    ----------
    m : float or array_like
        From 0 to 1.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.ellipk(0.5)
    1.8540746773013719
    """
    return core.ellipk(m, 0.0, 1)


def ellipkinc(phi: ArrayLike, m: ArrayLike) -> Any:
    r"""The incomplete elliptic integral of the first kind.

    .. math:: F(\varphi, m) = \int_0^\varphi (1 - m \sin^2 t)^{-1/2} dt

    Parameters
    ----------
    phi : float or array_like
        The amplitude, in radians.
    m : float or array_like
        From 0 to 1.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.ellipkinc(1.0, 0.5)
    1.0832167728451685
    """
    return core.ellipkinc(m, phi, 0)


def ellipe(m: ArrayLike) -> Any:
    r"""The complete elliptic integral of the second kind.

    .. math:: E(m) = \int_0^{\pi/2} (1 - m \sin^2 t)^{1/2} dt

    Parameters
    ----------
    m : float or array_like
        From 0 to 1.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.ellipe(0.5)
    1.3506438810476755
    """
    return core.ellipe(m, 0.0, 1)


def ellipeinc(phi: ArrayLike, m: ArrayLike) -> Any:
    r"""The incomplete elliptic integral of the second kind.

    .. math:: E(\varphi, m) = \int_0^\varphi (1 - m \sin^2 t)^{1/2} dt

    Parameters
    ----------
    phi : float or array_like
        The amplitude, in radians.
    m : float or array_like
        From 0 to 1.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.ellipeinc(1.0, 0.5)
    0.92732988362444
    """
    return core.ellipeinc(m, phi, 0)


def ellipj(u: ArrayLike, m: ArrayLike) -> tuple[Any, Any, Any, Any]:
    """The Jacobian elliptic functions sn, cn and dn, and the amplitude.

    Parameters
    ----------
    u : float or array_like
        The argument.
    m : float or array_like
        From 0 to 1.

    Returns
    -------
    four floats or ndarrays

    Examples
    --------
    >>> import qx
    >>> [round(one, 12) for one in qx.special.ellipj(1.0, 0.5)]
    [0.803001824896, 0.595976567672, 0.823161001632, 0.932315079884]
    """
    return core.ellipj(u, m)


def hyp2f1(a: ArrayLike, b: ArrayLike, c: ArrayLike, x: ArrayLike) -> Any:
    r"""Gauss's hypergeometric function, for x up to 1.

    .. math:: {}_2F_1 = \sum_k \frac{(a)_k (b)_k}{(c)_k k!} x^k

    Parameters
    ----------
    a, b, c : float or array_like
        The parameters.
    x : float or array_like
        At most 1.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.hyp2f1(1.0, 1.0, 2.0, 0.5)
    1.3862943611198901
    """
    return core.hyp2f1(x, a, b, c)


def hyp1f1(a: ArrayLike, b: ArrayLike, x: ArrayLike) -> Any:
    r"""Kummer's confluent hypergeometric function.

    .. math:: M(a, b, x) = \sum_k \frac{(a)_k}{(b)_k k!} x^k

    Parameters
    ----------
    a, b : float or array_like
        The parameters.
    x : float or array_like
        The argument.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.hyp1f1(1.0, 2.0, 0.5)
    1.2974425414002562
    """
    return core.hyp1f1(x, a, b)


def hyperu(a: ArrayLike, b: ArrayLike, x: ArrayLike) -> Any:
    """Tricomi's confluent hypergeometric function.

    Parameters
    ----------
    a, b : float or array_like
        The parameters.
    x : float or array_like
        At least 0.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.hyperu(1.0, 1.5, 8.0)
    0.11832619145678037
    """
    return core.hyperu(x, a, b)


def jv(v: ArrayLike, z: ArrayLike, scaled: bool = False) -> Any:
    r"""The Bessel function J of real order.

    .. math:: z^2 w'' + z w' + (z^2 - v^2) w = 0

    Parameters
    ----------
    v : float or array_like
        The real order.
    z : float, complex or array_like
        The argument.
    scaled : bool
        Whether to multiply by :math:`e^{-|\operatorname{Im} z|}`, which avoids overflow.

    Returns
    -------
    float, complex or ndarray

    Raises
    ------
    QxError
        For complex arguments, if one is not finite or beyond 2^31, or the result exceeds the range.

    Examples
    --------
    >>> import qx
    >>> qx.special.jv(0.0, [0.0, 1.0]), qx.special.jv(0.5, 1j)
    (array([1.        , 0.76519769]), (0.6630362720267223+0.6630362720267224j))
    """
    if not scaled and not np.iscomplexobj(z):
        return core.jv(v, z)
    return core.jv_complex(v, z, int(scaled))


def yv(v: ArrayLike, z: ArrayLike, scaled: bool = False) -> Any:
    r"""The Bessel function Y of real order.

    .. math:: Y_v = \frac{J_v \cos v\pi - J_{-v}}{\sin v\pi}

    Parameters
    ----------
    v : float or array_like
        The real order.
    z : float, complex or array_like
        The argument.
    scaled : bool
        Whether to multiply by :math:`e^{-|\operatorname{Im} z|}`, which avoids overflow.

    Returns
    -------
    float, complex or ndarray

    Raises
    ------
    QxError
        For complex arguments, if one is not finite or beyond 2^31, or the result exceeds the range.

    Examples
    --------
    >>> import qx
    >>> qx.special.yv(0.0, 1.0)
    0.08825696421567694
    """
    if not scaled and not np.iscomplexobj(z):
        return core.yv(v, z)
    return core.yv_complex(v, z, int(scaled))


def iv(v: ArrayLike, z: ArrayLike, scaled: bool = False) -> Any:
    r"""The modified Bessel function I of real order.

    .. math:: z^2 w'' + z w' - (z^2 + v^2) w = 0

    Parameters
    ----------
    v : float or array_like
        The real order.
    z : float, complex or array_like
        The argument.
    scaled : bool
        Whether to multiply by :math:`e^{-|\operatorname{Re} z|}`, which avoids overflow.

    Returns
    -------
    float, complex or ndarray

    Raises
    ------
    QxError
        For complex arguments, if one is not finite or beyond 2^31, or the result exceeds the range.

    Examples
    --------
    >>> import qx
    >>> qx.special.iv(0.0, 1.0)
    1.2660658777520084
    """
    if not scaled and not np.iscomplexobj(z):
        return core.iv(v, z)
    return core.iv_complex(v, z, int(scaled))


def kn(n: ArrayLike, x: ArrayLike) -> Any:
    """The modified Bessel function K of integer order.

    Parameters
    ----------
    n : int or array_like
        The order.
    x : float or array_like
        At least 0.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.kn(1, 2.0)
    0.13986588181652243
    """
    return core.kn(n, x)


def kv(v: ArrayLike, z: ArrayLike, scaled: bool = False) -> Any:
    r"""The modified Bessel function K of real order.

    .. math:: K_v = \frac\pi2 \frac{I_{-v} - I_v}{\sin v\pi}

    Parameters
    ----------
    v : float or array_like
        The real order.
    z : float, complex or array_like
        The argument.
    scaled : bool
        Whether to multiply by exp(z), which avoids underflow.

    Returns
    -------
    float, complex or ndarray

    Raises
    ------
    QxError
        For complex arguments, if one is not finite or beyond 2^31, or the result exceeds the range.

    Examples
    --------
    >>> import qx
    >>> qx.special.kv(0.5, 2.0)
    0.11993777196806146
    """
    found = core.kv(v, z, int(scaled))
    return found if np.iscomplexobj(z) or np.any(np.asarray(z) < 0) else np.asarray(found).real[()]


def hankel1(v: ArrayLike, z: ArrayLike, scaled: bool = False) -> Any:
    """The Hankel function of the first kind, J + i Y.

    Parameters
    ----------
    v : float or array_like
        The real order.
    z : float, complex or array_like
        The argument.
    scaled : bool
        Whether to multiply by exp(-i z), which avoids overflow.

    Returns
    -------
    float, complex or ndarray

    Raises
    ------
    QxError
        For complex arguments, if one is not finite or beyond 2^31, or the result exceeds the range.

    Examples
    --------
    >>> import qx
    >>> qx.special.hankel1(0.0, 1.0)
    (0.7651976865579667+0.08825696421567697j)
    """
    return core.hankel1(v, z, int(scaled))


def hankel2(v: ArrayLike, z: ArrayLike, scaled: bool = False) -> Any:
    """The Hankel function of the second kind, J - i Y.

    Parameters
    ----------
    v : float or array_like
        The real order.
    z : float, complex or array_like
        The argument.
    scaled : bool
        Whether to multiply by exp(i z), which avoids overflow.

    Returns
    -------
    float, complex or ndarray

    Raises
    ------
    QxError
        For complex arguments, if one is not finite or beyond 2^31, or the result exceeds the range.

    Examples
    --------
    >>> import qx
    >>> qx.special.hankel2(0.0, 1.0)
    (0.7651976865579667-0.08825696421567697j)
    """
    return core.hankel2(v, z, int(scaled))


def spherical_jn(n: ArrayLike, x: ArrayLike) -> Any:
    r"""The spherical Bessel function j.

    .. math:: j_n(x) = \sqrt{\pi / (2x)}\, J_{n + 1/2}(x)

    Parameters
    ----------
    n : int or array_like
        The order.
    x : float or array_like
        At least 0.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.spherical_jn(1, 2.0)
    0.4353977749799916
    """
    return core.spherical_jn(n, x)


def spherical_yn(n: ArrayLike, x: ArrayLike) -> Any:
    r"""The spherical Bessel function y.

    .. math:: y_n(x) = \sqrt{\pi / (2x)}\, Y_{n + 1/2}(x)

    Parameters
    ----------
    n : int or array_like
        The order.
    x : float or array_like
        At least 0.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.spherical_yn(1, 2.0)
    -0.3506120042760552
    """
    return core.spherical_yn(n, x)


def airy(z: ArrayLike, scaled: bool = False) -> Any:
    r"""The Airy functions Ai, Ai', Bi, Bi'.

    .. math:: w'' = z w

    Parameters
    ----------
    z : float, complex or array_like
        The argument.
    scaled : bool
        Whether to multiply Ai and Ai' by :math:`e^\zeta`, and Bi and Bi' by
        :math:`e^{-|\operatorname{Re} \zeta|}`, with :math:`\zeta = \frac23 z^{3/2}`.

    Returns
    -------
    four floats, complex numbers or ndarrays

    Raises
    ------
    QxError
        For complex arguments, if one is not finite or beyond 2^31, or the result exceeds the range.

    Examples
    --------
    >>> import qx
    >>> [round(one, 12) for one in qx.special.airy(0.0)]
    [0.355028053888, -0.258819403793, 0.614926627446, 0.448288357354]
    """
    if not scaled and not np.iscomplexobj(z):
        return core.airy(z)
    return tuple(getattr(core, key)(z, int(scaled)) for key in ("airy_ai", "airy_aip", "airy_bi", "airy_bip"))


def kelvin(n: ArrayLike, x: ArrayLike) -> tuple[Any, Any, Any, Any]:
    """The Kelvin functions ber, bei, ker and kei of integer order.

    Parameters
    ----------
    n : int or array_like
        The order.
    x : float or array_like
        Above 0 for the last two.

    Returns
    -------
    four floats or ndarrays

    Examples
    --------
    >>> import qx
    >>> [round(one, 6) for one in qx.special.kelvin(0, 1.0)]
    [0.984382, 0.249566, 0.286706, -0.494995]
    """
    (ber, bei), (ker, kei) = core.kelvin(x, n), core.kelvin_k(x, n)
    return ber, bei, ker, kei


def struve(v: ArrayLike, x: ArrayLike) -> Any:
    """The Struve function H.

    Parameters
    ----------
    v : float or array_like
        The real order.
    x : float or array_like
        The argument.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.struve(0.0, 1.0)
    0.5686566270482879
    """
    return core.struve(x, v)


def pbdv(v: ArrayLike, x: ArrayLike) -> Any:
    r"""The parabolic cylinder function D.

    .. math:: w'' = (x^2 / 4 - v - 1/2) w

    Parameters
    ----------
    v : float or array_like
        The real order.
    x : float or array_like
        The argument.

    Returns
    -------
    float or ndarray

    Examples
    --------
    >>> import qx
    >>> qx.special.pbdv(1.0, 1.0)
    0.7788007830714049
    """
    return core.pbdv(x, v)
