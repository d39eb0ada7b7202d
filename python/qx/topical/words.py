"""Words for choices, and errors in terms that the caller knows."""

from __future__ import annotations

import difflib
import math
import operator
from collections.abc import Mapping
from typing import Any, NoReturn

from ..library import library
from ..outcomes import kind_of


MOST = 1 << 64  # larger counts, orders and seeds are refused


def refuse(function: str, argument: str, rule: str, name: str = "ErrInvalidSelector") -> NoReturn:
    """Raises the exception for the code of that name, which names function, argument and rule."""
    raise kind_of(name)(f"qx.{function}", library().catalogue["codes"][name], None, "",
                        f"qx.{function}: {argument}: {rule} ({name})")


def chosen(function: str, argument: str, value: Any, words: Mapping[Any, Any]) -> Any:
    """The dictionary's value for a word; unknown words are refused with a list of the known ones."""
    try:
        return words[value]
    except (KeyError, TypeError):
        pass
    near = difflib.get_close_matches(value.lower(), [word for word in words if isinstance(word, str)], 1) \
        if isinstance(value, str) else []
    known = ", ".join(repr(word) for word in words)
    refuse(function, argument, f"{value!r} is not one of {known}" + "".join(
        f"; did you mean {word!r}?" for word in near))


def positive(function: str, argument: str, value: Any, name: str = "ErrNotStrictlyPositive") -> float:
    """A finite float above 0."""
    try:
        number = float(value)
    except (TypeError, ValueError):
        raise TypeError(f"qx.{function}: {argument}: a number is needed; got {value!r}") from None
    if not 0 < number < math.inf:
        refuse(function, argument, f"must be above 0 and finite; got {value}", name)
    return number


def procedure(function: str, argument: str, value: Any) -> None:
    """Refuses a value that is not callable."""
    if not callable(value):
        raise TypeError(f"qx.{function}: {argument}: a function is needed; got {value!r}")


def whole_number(function: str, argument: str, value: Any, least: int | None = None,
                 name: str = "ErrCountNotPositive") -> int:
    """An int of at least `least`."""
    try:
        number = operator.index(value)
    except TypeError:
        if not (isinstance(value, float) and value.is_integer()):
            raise TypeError(f"qx.{function}: {argument}: a whole number is needed; got {value!r}") from None
        number = int(value)
    if abs(number) > MOST:
        refuse(function, argument, f"{value} is too large", name)
    if least is not None and number < least:
        refuse(function, argument, f"must be at least {least}; got {number}", name)
    return number
