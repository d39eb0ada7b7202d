"""The building blocks of the topical modules, `qx/TOPIC.py`: one file per topic, a thin layer over the exports.

How to write one:

- The exports come from the table in `newest.py`, the only place that names them: `core = served("TOPIC")`,
  then `core.KEY(...)`. A key is the name of the topic's function, or begins with it (`rfft_full`). When a
  newer revision of an export appears, its name goes into the table, and nothing else changes.
- `along(function, x, axis)` applies a function of one channel to arrays of any dimension. It handles the
  axis, threads for many channels, and pandas input and output. Its fast path, one channel as a NumPy array,
  costs about 0.2 us. `either(real, complex, x, axis)` chooses by the type of x. The default axis is `LAST`.
  Where the result for a channel is not an array, `by_channel(function, x, axis)` returns a list by channels.
- A choice is a word: `chosen("filters.butterworth", "kind", kind, KINDS)` looks it up in a dictionary
  and refuses other words with a list of the known ones.
- Where an export would refuse an argument in terms that the caller does not know, the function refuses it
  first by `refuse(function, argument, rule, code)`. Other failures of exports are passed on unchanged:
  `QxError`, which is also `ValueError`, `numpy.linalg.LinAlgError` or `MemoryError`, depending on its code.
- Results of several parts are dataclasses, `@result class NAME(Result)`. They are shown line by line, in
  notebooks as a table, and can be unpacked like tuples.
- Classes that work on blocks derive from `Stream` and define how a channel starts and how it takes a block.
- `__all__` lists the public names; the error for `qx.NAME` with such a name says which topic has it.
- Docstrings are numpydoc with units, formulas as LaTeX and an example that runs: `tests/test_topics.py`
  runs the examples of every topic, and checks that each key of the table belongs to a function.
"""

from .axes import LAST, along, along_pairs, by_channel, count_of, either, vector
from .newest import LOW_ORDER, TOPICS, served
from .results import Result as Result, result as result
from .streams import Stream
from .words import chosen, positive, procedure, refuse, whole_number

__all__ = ["LAST", "LOW_ORDER", "Result", "Stream", "TOPICS", "along", "along_pairs", "by_channel", "chosen",
           "count_of", "either", "positive", "procedure", "refuse", "result", "served", "vector", "whole_number"]
