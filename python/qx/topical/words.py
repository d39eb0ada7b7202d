"""Words for choices, and refusals in the words of the caller."""

import difflib
import operator

from ..library import library
from ..outcomes import kind_of


def refuse(function, argument, rule, name="ErrInvalidSelector"):
    """Raises the exception for the code of that name, which names function, argument and rule."""
    raise kind_of(name)(f"qx.{function}", library().catalogue["codes"][name], None, "",
                        f"qx.{function}: {argument}: {rule} ({name})")


def chosen(function, argument, value, words):
    """What the dictionary has for a word; others are refused with a list of the words."""
    try:
        return words[value]
    except (KeyError, TypeError):
        pass
    near = difflib.get_close_matches(value.lower(), [word for word in words if isinstance(word, str)], 1) \
        if isinstance(value, str) else []
    known = ", ".join(repr(word) for word in words)
    refuse(function, argument, f"{value!r} is none of {known}" + "".join(
        f"; did you mean {word!r}?" for word in near))


def whole_number(function, argument, value, least=None, name="ErrCountNotPositive"):
    """An int of at least `least`."""
    try:
        number = operator.index(value)
    except TypeError:
        if not (isinstance(value, float) and value.is_integer()):
            raise TypeError(f"qx.{function}: {argument}: a whole number is needed; {value!r} came") from None
        number = int(value)
    if least is not None and number < least:
        refuse(function, argument, f"must be at least {least}; {number} came", name)
    return number
