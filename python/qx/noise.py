"""Noise of several distributions, reproducible from a seed.

A function with a seed returns the same values each time; without a seed, the key is drawn from the system.
A `Generator` continues from call to call, so that several blocks have the same values as a single long one.

The numbers come from a counter-based generator: J. K. Salmon, M. A. Moraes, R. O. Dror and D. E. Shaw,
"Parallel random numbers: as easy as 1, 2, 3", 2011. Each value is a function of the seed, the stream, the
position and the kind of noise. Any position is therefore reached directly, and streams and seeds are
independent: for several channels or processes, use one seed and a stream for each.
"""

from __future__ import annotations

import copy
import math
import os
from typing import Any

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .topical import refuse, served, whole_number

__all__ = ["Generator", "binomial", "gamma", "gaussian", "periodic", "permutation", "poisson", "shuffle",
           "uniform"]

core = served("noise")

LARGEST_SEED = 2**31 - 1
MOST_EVENTS = 1e15


class Generator:
    """A source of random numbers that continues from call to call.

    Parameters
    ----------
    seed : int, optional
        From 1 to 2^31 - 1, for reproducible numbers; by default, it is drawn from the system.
    stream : int
        From 0 to 2^31 - 1; the streams of a seed are independent sequences.

    Attributes
    ----------
    position : int
        Number of values drawn so far; set it to move to any position.

    Examples
    --------
    >>> import qx
    >>> source = qx.noise.Generator(7)
    >>> first, then = source.gaussian(3), source.gaussian(3)
    >>> bool((qx.noise.gaussian(6, seed=7)[3:] == then).all())
    True
    >>> source.position = 0
    >>> bool((source.gaussian(3) == first).all())
    True
    """

    def __init__(self, seed: int | None = None, stream: int = 0) -> None:
        if seed is not None:
            seed = whole_number("noise.Generator", "seed", seed, 1, "ErrCountNotPositive")
        self.stream = whole_number("noise.Generator", "stream", stream, 0)
        for name, value in (("seed", seed or 0), ("stream", self.stream)):
            if value > LARGEST_SEED:
                refuse("noise.Generator", name, f"must be at most {LARGEST_SEED}; got {value}")
        self.seed = seed
        self.reset()

    def reset(self) -> None:
        """Starts afresh, with the same numbers if a seed was given."""
        self._key = self.seed or 1 + int.from_bytes(os.urandom(8), "little") % LARGEST_SEED
        self.position = 0
        self._periodic: dict[str, int] = {}  # the state of periodic noise, after its first call

    def copy(self) -> Any:
        """A generator that returns the same numbers from this position on."""
        return copy.deepcopy(self)

    def _place(self, n: int) -> tuple[int, int, float]:
        """Seed, stream and position of the next n values; moves the position past them."""
        start = self.position
        self.position += n
        return self._key, self.stream, float(start)

    def uniform(self, n: Any, amplitude: Any = 1.0) -> Any:
        """n values, uniformly distributed between -amplitude and amplitude."""
        n = whole_number("noise.uniform", "n", n, 1)
        return core.uniform(n, float(amplitude), *self._place(n))

    def gaussian(self, n: Any, sigma: Any = 1.0) -> Any:
        """n values of a normal distribution with mean 0 and standard deviation sigma."""
        n = whole_number("noise.gaussian", "n", n, 1)
        return core.gaussian(n, float(sigma), *self._place(n))

    def periodic(self, n: Any, amplitude: Any = 1.0) -> Any:
        """One period, of n values, of a sum of cosines of this amplitude at all whole frequencies, with
        random phases. The phases come from a separate generator, that of B. A. Wichmann and I. D. Hill
        (1982), and do not depend on stream or position."""
        n = whole_number("noise.periodic", "n", n, 1)
        seed = 0 if self._periodic else self._key
        x, self._periodic = core.periodic(n, float(amplitude), seed, self._periodic)
        return x

    def gamma(self, n: Any, order: Any = 1) -> Any:
        """n values of a gamma distribution of shape `order`. For a whole order, these are the waiting times
        for that many events of a Poisson process of rate 1."""
        n = whole_number("noise.gamma", "n", n, 1)
        if not 0 < order < math.inf:
            refuse("noise.gamma", "order", f"must be above 0 and finite; got {order}", "ErrInvalidSelector")
        return core.gamma(n, float(order), *self._place(n))

    def poisson(self, n: Any, mean: Any = 1.0) -> Any:
        """n numbers of events with the given mean, up to 1e15."""
        n = whole_number("noise.poisson", "n", n, 1)
        if not 0 <= mean <= MOST_EVENTS:
            refuse("noise.poisson", "mean", f"must be from 0 to {MOST_EVENTS:g}; got {mean}")
        return core.poisson(n, float(mean), *self._place(n))

    def binomial(self, n: Any, trials: Any = 1, p: Any = 0.5) -> Any:
        """n numbers of successes in up to 2^52 trials of probability p."""
        n = whole_number("noise.binomial", "n", n, 1)
        trials = whole_number("noise.binomial", "trials", trials, 0, "ErrInvalidSelector")
        if trials > 2**52:
            refuse("noise.binomial", "trials", f"must be at most 2^52; got {trials}")
        if not 0 <= p <= 1:
            refuse("noise.binomial", "p", f"must be from 0 to 1; got {p}")
        return core.binomial(n, float(trials), float(p), *self._place(n)).astype(np.int64)

    def permutation(self, n: Any) -> Any:
        """The numbers 0 to n - 1 in a random order; all orders are equally likely."""
        n = whole_number("noise.permutation", "n", n, 1)
        return core.permutation(n, *self._place(n))

    def shuffle(self, x: Any) -> Any:
        """The elements of x along the first axis, in a random order."""
        x = np.asarray(x)
        return x[self.permutation(len(x))]


def uniform(n: int, amplitude: float = 1.0, seed: int | None = None) -> NDArray[Any]:
    """Uniform white noise: values uniformly distributed between -amplitude and amplitude.

    Parameters
    ----------
    n : int
        Number of values.
    amplitude : float
        The bound, in the unit of the result.
    seed : int, optional
        From 1 to 2^31 - 1, for reproducible values.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If n is below 1, or a parameter or the seed is out of range.

    Examples
    --------
    >>> import qx
    >>> qx.noise.uniform(3, seed=1).round(6)
    array([-0.765489,  0.323343,  0.17998 ])
    """
    return Generator(seed).uniform(n, amplitude)


def gaussian(n: int, sigma: float = 1.0, seed: int | None = None) -> NDArray[Any]:
    """Gaussian white noise of mean 0, by the inverse of the distribution function.

    Parameters
    ----------
    n : int
        Number of values.
    sigma : float
        The standard deviation, in the unit of the result.
    seed : int, optional
        From 1 to 2^31 - 1, for reproducible values.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If n is below 1, or a parameter or the seed is out of range.

    Examples
    --------
    >>> import qx
    >>> qx.noise.gaussian(3, seed=1).round(6)
    array([-0.203483, -0.55649 , -0.796057])
    """
    return Generator(seed).gaussian(n, sigma)


def periodic(n: int, amplitude: float = 1.0, seed: int | None = None) -> NDArray[Any]:
    """One period of cosines at 1, 2, ..., (n - 1) / 2 cycles, all of the same amplitude, with random phases.
    The spectrum of this noise is flat over a whole number of periods.

    Parameters
    ----------
    n : int
        Number of values.
    amplitude : float
        The amplitude of each cosine.
    seed : int, optional
        From 1 to 2^31 - 1, for reproducible values.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If n is below 1, or a parameter or the seed is out of range.

    Examples
    --------
    >>> import qx
    >>> qx.noise.periodic(3, seed=1).round(6)
    array([-0.129339, -0.794082,  0.923421])
    """
    return Generator(seed).periodic(n, amplitude)


def gamma(n: int, order: float = 1, seed: int | None = None) -> NDArray[Any]:
    """Gamma noise. For a whole order, the values are the waiting times for that many events of a Poisson
    process of rate 1.

    Parameters
    ----------
    n : int
        Number of values.
    order : float
        The shape, above 0: the number of events, which is also the mean and the variance.
    seed : int, optional
        From 1 to 2^31 - 1, for reproducible values.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If n is below 1, or a parameter or the seed is out of range.

    Examples
    --------
    >>> import qx
    >>> qx.noise.gamma(3, 2, seed=1).round(6)
    array([2.312407, 1.491892, 1.637872])
    """
    return Generator(seed).gamma(n, order)


def poisson(n: int, mean: float = 1.0, seed: int | None = None) -> NDArray[Any]:
    """Poisson noise: numbers of events.

    Parameters
    ----------
    n : int
        Number of values.
    mean : float
        The mean number of events, up to 1e15.
    seed : int, optional
        From 1 to 2^31 - 1, for reproducible values.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If n is below 1, or a parameter or the seed is out of range.

    Examples
    --------
    >>> import qx
    >>> qx.noise.poisson(5, 3.0, seed=1)
    array([7., 3., 3., 3., 1.])
    """
    return Generator(seed).poisson(n, mean)


def binomial(n: int, trials: int = 1, p: float = 0.5, seed: int | None = None) -> NDArray[Any]:
    """Binomial noise: numbers of successes.

    Parameters
    ----------
    n : int
        Number of values.
    trials : int
        Number of trials behind each value, up to 2^52.
    p : float
        The probability of success.
    seed : int, optional
        From 1 to 2^31 - 1, for reproducible values.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If n is below 1, or a parameter or the seed is out of range.

    Examples
    --------
    >>> import qx
    >>> qx.noise.binomial(5, 10, 0.5, seed=1)
    array([3, 5, 7, 8, 4])
    """
    return Generator(seed).binomial(n, trials, p)


def permutation(n: int, seed: int | None = None) -> NDArray[np.int32]:
    """The numbers 0 to n - 1 in a random order; all orders are equally likely (R. Durstenfeld, "Algorithm
    235: Random permutation", 1964).

    Parameters
    ----------
    n : int
        Number of elements.
    seed : int, optional
        From 1 to 2^31 - 1, for a reproducible order.

    Returns
    -------
    ndarray of int32

    Raises
    ------
    ValueError
        If there are no elements, or the seed is out of range.

    Examples
    --------
    >>> import qx
    >>> qx.noise.permutation(5, seed=1)
    array([1, 3, 2, 4, 0], dtype=int32)
    """
    return Generator(seed).permutation(n)


def shuffle(x: ArrayLike, seed: int | None = None) -> NDArray[Any]:
    """The elements of x along the first axis, in a random order; all orders are equally likely.

    Parameters
    ----------
    x : array_like
        The elements; x is not changed.
    seed : int, optional
        From 1 to 2^31 - 1, for a reproducible order.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If there are no elements, or the seed is out of range.

    Examples
    --------
    >>> import qx
    >>> qx.noise.shuffle([1.5, 2.5, 3.5], seed=1)
    array([2.5, 1.5, 3.5])
    """
    return Generator(seed).shuffle(x)
