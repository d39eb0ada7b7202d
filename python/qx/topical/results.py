"""Results of several parts, shown as text, or as a table in notebooks."""

from __future__ import annotations

import dataclasses
import html
from collections.abc import Iterator
from typing import TYPE_CHECKING, Any, ClassVar

import numpy as np


__all__ = ["Result", "result"]


class Result:
    """The base of results. They are shown line by line, and unpack into the fields that `_unpacked` names,
    or into all."""

    _unpacked: ClassVar[tuple[str, ...]] = ()

    def _shown(self) -> list[tuple[str, str]]:
        """The names and texts of the fields that are shown."""
        return [(field.name, _text(getattr(self, field.name))) for field in dataclasses.fields(self)
                if field.repr]

    def __repr__(self) -> str:
        rows = self._shown()
        width = max((len(name) for name, _ in rows), default=0)
        return "\n".join([type(self).__name__, *(f"  {name:<{width}}  {text}" for name, text in rows)])

    def _repr_html_(self) -> str:
        rows = "".join(f"<tr><th style='text-align:left'>{html.escape(name)}</th>"
                       f"<td style='text-align:left'>{html.escape(text)}</td></tr>"
                       for name, text in self._shown())
        return f"<table><caption>{type(self).__name__}</caption>{rows}</table>"

    def __iter__(self) -> Iterator[Any]:
        return iter([getattr(self, name) for name in self._unpacked or
                     [field.name for field in dataclasses.fields(self)]])

    def __len__(self) -> int:
        return len(self._unpacked or dataclasses.fields(self))


def _text(value: Any) -> str:
    if isinstance(value, np.ndarray):
        shown = np.array2string(value, precision=6, threshold=6, edgeitems=2, separator=" ")
        shape = " x ".join(map(str, value.shape))
        return " ".join(shown.split()) if value.size <= 6 else f"{shape}: {' '.join(shown.split())}"
    if isinstance(value, (float, np.floating)):
        return f"{value:.6g}"
    if isinstance(value, dict):
        return ", ".join(f"{name} {_text(one)}" for name, one in value.items())
    return str(value)


if TYPE_CHECKING:
    from dataclasses import dataclass as result
else:
    def result(of_class):
        """Makes a dataclass that keeps the representation of Result."""
        return dataclasses.dataclass(eq=False, repr=False)(of_class)
