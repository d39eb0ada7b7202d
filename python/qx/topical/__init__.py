"""What the topical modules are made of: `qx/TOPIC.py`, one file per topic, thin over the exports.

How to write one:

- The exports come from the table in `newest.py`, which alone names them: `core = served("TOPIC")`, then
  `core.KEY(...)`. A key is the name of the topic's function, or begins with it (`rfft_full`). When a
  newer revision of an export appears, its name goes into the table, and nothing else changes.
- A function of one channel is taken to arrays of any dimension by `along(function, x, axis)`: the axis,
  threads for many channels, pandas in and out. Its fast way, one channel as a NumPy array, costs about
  0.2 us. `either(real, complex, x, axis)` chooses by the type of x. The axis has the default `LAST`. Where
  what is found in a channel is no array, `by_channel(function, x, axis)` lists it by channels.
- A choice is a word: `chosen("filters.butterworth", "kind", kind, KINDS)` looks it up in a dictionary
  and refuses others with a list of the words.
- What the export would refuse in words that are not the caller's is refused before by
  `refuse(function, argument, rule, code)`. Failures of exports pass as they are: `QxError`, which is
  also `ValueError`, `numpy.linalg.LinAlgError` or `MemoryError` by its code.
- Results of several parts are dataclasses, `@result class NAME(Result)`: shown line by line, in notebooks
  as a table, and unpacked as tuples.
- What runs on blocks derives from `Stream`: it says how one channel begins and how it takes a block.
- `__all__` lists the public names; `qx.NAME` for such a name is answered with where it is.
- Docstrings are numpydoc with units, formulas as LaTeX and an example that runs: `tests/test_topics.py`
  runs the examples of every topic, and holds each key of the table to a function.
"""

from .axes import LAST, along, along_pairs, by_channel, count_of, either, vector
from .newest import TOPICS, served
from .results import Result as Result, result as result
from .streams import Stream
from .words import chosen, positive, procedure, refuse, whole_number

__all__ = ["LAST", "Result", "Stream", "TOPICS", "along", "along_pairs", "by_channel", "chosen", "count_of",
           "either", "positive", "procedure", "refuse", "result", "served", "vector", "whole_number"]
