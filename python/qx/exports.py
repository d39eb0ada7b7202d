"""Every export of the module as a plain function. Inputs are passed in the order of the declaration or by name;
outputs are NumPy arrays and numbers.

    from qx import exports
    exports.Moment_head([1.0, 2.0, 4.0], 2)      # 1.5555555555555554
    help(exports.Moment_head)                    # arguments, formula, codes

The topics (`qx.filters`, `qx.fft`, ...) call the newest revision of each, under the field's usual name. Elder
revisions are here for comparison.
"""

from .calls import NoSuchExport as _NoSuchExport, export as _export
from .library import library as _library
from .topical.newest import answer as _answer


def __getattr__(name):
    if name.startswith("__"):
        raise AttributeError(name)
    try:
        function = _export(name)
    except _NoSuchExport:
        raise AttributeError(f"qx.exports has no function {name}{_answer(name)}") from None
    globals()[name] = function
    return function


def __dir__():
    return [*_library().entries]
