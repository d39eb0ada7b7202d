"""Noise of several distributions, repeatable by its seed.

A function with a seed returns the same values each time; without one a start is drawn from the system. A
`Generator` goes on from call to call, so that blocks are those of one piece.

The uniform numbers are those of B. A. Wichmann and I. D. Hill, "Algorithm AS 183: An efficient and
portable pseudo-random number generator", 1982. Streams of different seeds are not independent; for several
channels go on with one generator.
"""

from __future__ import annotations

import copy
import os
from typing import Any

import numpy as np
from numpy.typing import ArrayLike, NDArray

from .topical import refuse, served, whole_number

__all__ = ["Generator", "binomial", "gamma", "gaussian", "periodic", "permutation", "poisson", "shuffle",
           "uniform"]

core = served("noise")

MODULI = (30269, 30307, 30323)
LARGEST_SEED = 2**31 - 1


class Generator:
    """A source of random numbers that goes on from call to call.

    Parameters
    ----------
    seed : int, optional
        From 1 to 2^31 - 1, for numbers that can be repeated; without one the start is drawn from the
        system.

    Examples
    --------
    >>> import qx
    >>> source = qx.noise.Generator(7)
    >>> first, then = source.gaussian(3), source.gaussian(3)
    >>> bool((qx.noise.gaussian(6, seed=7)[3:] == then).all())
    True
    """

    def __init__(self, seed: int | None = None) -> None:
        if seed is not None:
            seed = whole_number("noise.Generator", "seed", seed, 1, "ErrCountNotPositive")
            if seed > LARGEST_SEED:
                refuse("noise.Generator", "seed", f"must be at most {LARGEST_SEED}; {seed} came")
        self.seed = seed
        self.reset()

    def reset(self) -> None:
        """Begins anew: with the same numbers where there is a seed."""
        self._seed, self._spare, self._cache = self.seed or 0, {}, {}
        self._state = {} if self.seed else {name: 1 + int.from_bytes(os.urandom(8), "little") % (modulus - 1)
                                            for name, modulus in zip(("s1", "s2", "s3"), MODULI)}

    def copy(self) -> Any:
        """A generator that gives the same numbers from here on."""
        return copy.deepcopy(self)

    def _begun(self) -> Any:
        """The seed for the next call: its own for the first one, then 0, which goes on."""
        seed, self._seed = self._seed, 0
        return seed

    def uniform(self, n: Any, amplitude: Any = 1.0) -> Any:
        """n values spread evenly over -amplitude to below amplitude."""
        n = whole_number("noise.uniform", "n", n, 1)
        x, self._state = core.uniform(n, float(amplitude), self._begun(), self._state)
        return x

    def gaussian(self, n: Any, sigma: Any = 1.0) -> Any:
        """n values of a normal distribution of mean 0 and standard deviation sigma."""
        n = whole_number("noise.gaussian", "n", n, 1)
        x, self._state, self._spare = core.gaussian(n, float(sigma), self._begun(), self._state, self._spare)
        return x

    def periodic(self, n: Any, amplitude: Any = 1.0) -> Any:
        """One period of n values of cosines of this amplitude at all whole frequencies, with random
        phases."""
        n = whole_number("noise.periodic", "n", n, 1)
        x, self._state = core.periodic(n, float(amplitude), self._begun(), self._state)
        return x

    def gamma(self, n: Any, order: Any = 1) -> Any:
        """n waiting times for `order` events of a Poisson process of rate 1."""
        n = whole_number("noise.gamma", "n", n, 1)
        order = whole_number("noise.gamma", "order", order, 1, "ErrInvalidSelector")
        x, self._state = core.gamma(n, order, self._begun(), self._state)
        return x

    def poisson(self, n: Any, mean: Any = 1.0) -> Any:
        """n numbers of events whose mean is given."""
        n = whole_number("noise.poisson", "n", n, 1)
        if not mean >= 0:
            refuse("noise.poisson", "mean", f"must be at least 0; {mean} came")
        x, self._state = core.poisson(n, float(mean), self._begun(), self._state)
        return x

    def binomial(self, n: Any, trials: Any = 1, p: Any = 0.5) -> Any:
        """n numbers of successes among trials of probability p."""
        n = whole_number("noise.binomial", "n", n, 1)
        trials = whole_number("noise.binomial", "trials", trials, 0, "ErrInvalidSelector")
        if not 0 <= p <= 1:
            refuse("noise.binomial", "p", f"must be from 0 to 1; {p} came")
        x, self._state, self._cache = core.binomial(n, trials, float(p), self._begun(), self._state, self._cache)
        return x.astype(np.int64)

    def permutation(self, n: Any) -> Any:
        """0 to n - 1 in a random order, all orders equally likely."""
        n = whole_number("noise.permutation", "n", n, 1)
        x, self._state = core.permutation(n, self._begun(), self._state, 1)
        return x

    def shuffle(self, x: Any) -> Any:
        """The elements of x, along the first axis, in a random order."""
        x = np.asarray(x)
        return x[self.permutation(len(x))]


def uniform(n: int, amplitude: float = 1.0, seed: int | None = None) -> NDArray[Any]:
    """Uniform white noise: values spread evenly over -amplitude to below amplitude.

    Parameters
    ----------
    n : int
        How many values.
    amplitude : float
        The bound, in the unit of the result.
    seed : int, optional
        From 1 to 2^31 - 1, for values that can be repeated.

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
    array([-0.005436,  0.031277,  0.635329])
    """
    return Generator(seed).uniform(n, amplitude)


def gaussian(n: int, sigma: float = 1.0, seed: int | None = None) -> NDArray[Any]:
    """Gaussian white noise of mean 0, by the polar method of G. Marsaglia and T. A. Bray, 1964.

    Parameters
    ----------
    n : int
        How many values.
    sigma : float
        The standard deviation, in the unit of the result.
    seed : int, optional
        From 1 to 2^31 - 1, for values that can be repeated.

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
    array([ 3.659959, -0.636107, -0.378626])
    """
    return Generator(seed).gaussian(n, sigma)


def periodic(n: int, amplitude: float = 1.0, seed: int | None = None) -> NDArray[Any]:
    """One period of cosines at 1, 2, ..., (n - 1) / 2 cycles, each of the same amplitude, with random phases: noise
    whose spectrum is flat over whole numbers of periods.

    Parameters
    ----------
    n : int
        How many values.
    amplitude : float
        The amplitude of each cosine.
    seed : int, optional
        From 1 to 2^31 - 1, for values that can be repeated.

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


def gamma(n: int, order: int = 1, seed: int | None = None) -> NDArray[Any]:
    """Gamma noise: waiting times for `order` events of a Poisson process of rate 1.

    Parameters
    ----------
    n : int
        How many values.
    order : int
        How many events; mean and variance.
    seed : int, optional
        From 1 to 2^31 - 1, for values that can be repeated.

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
    array([1.360947, 1.114181, 1.890588])
    """
    return Generator(seed).gamma(n, order)


def poisson(n: int, mean: float = 1.0, seed: int | None = None) -> NDArray[Any]:
    """Poisson noise: numbers of events.

    Parameters
    ----------
    n : int
        How many values.
    mean : float
        The mean number.
    seed : int, optional
        From 1 to 2^31 - 1, for values that can be repeated.

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
    array([4., 5., 3., 4., 2.])
    """
    return Generator(seed).poisson(n, mean)


def binomial(n: int, trials: int = 1, p: float = 0.5, seed: int | None = None) -> NDArray[Any]:
    """Binomial noise: numbers of successes.

    Parameters
    ----------
    n : int
        How many values.
    trials : int
        How many trials each number counts.
    p : float
        The probability of a success.
    seed : int, optional
        From 1 to 2^31 - 1, for values that can be repeated.

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
    array([3, 6, 5, 5, 6])
    """
    return Generator(seed).binomial(n, trials, p)


def permutation(n: int, seed: int | None = None) -> NDArray[np.int32]:
    """0 to n - 1 in a random order, all orders equally likely (R. Durstenfeld, "Algorithm 235: Random
    permutation", 1964).

    Parameters
    ----------
    n : int
        How many numbers.
    seed : int, optional
        From 1 to 2^31 - 1, for an order that can be repeated.

    Returns
    -------
    ndarray of int32

    Raises
    ------
    ValueError
        If there is no element, or the seed is out of range.

    Examples
    --------
    >>> import qx
    >>> qx.noise.permutation(5, seed=1)
    array([1, 0, 3, 4, 2], dtype=int32)
    """
    return Generator(seed).permutation(n)


def shuffle(x: ArrayLike, seed: int | None = None) -> NDArray[Any]:
    """The elements of x, along the first axis, in a random order, all orders equally likely.

    Parameters
    ----------
    x : array_like
        The elements; x stays as it is.
    seed : int, optional
        From 1 to 2^31 - 1, for an order that can be repeated.

    Returns
    -------
    ndarray

    Raises
    ------
    ValueError
        If there is no element, or the seed is out of range.

    Examples
    --------
    >>> import qx
    >>> qx.noise.shuffle([1.5, 2.5, 3.5], seed=1)
    array([1.5, 3.5, 2.5])
    """
    return Generator(seed).shuffle(x)
