"""Python functions as the C procedures that some exports call."""

import ctypes

import numpy as np

from .outcomes import at
from .scalars import shown

# The context argument is not used, since a Python function has its own.
FIT = ctypes.CFUNCTYPE(ctypes.c_int32, ctypes.c_void_p, ctypes.c_void_p, ctypes.c_int32, ctypes.c_void_p,
                       ctypes.c_int32, ctypes.c_void_p, ctypes.c_int32)


class Procedure:
    """A function f(x, p) of arrays that returns the values of a model at all samples, or their derivatives, a row
    for each sample. An exception that it raises ends the call of the export and is raised again after it."""

    def __init__(self, function, gives_rows, place):
        if function is not None and not callable(function):
            raise TypeError(f"{at(place)}: a function is needed; got {shown(function)}")
        self.raised = None
        self._function, self._gives_rows, self._place = function, gives_rows, place
        # Null if there is no function.
        self.address = FIT(0) if function is None else FIT(self._call)

    def _call(self, _context, x, x_count, p, count, out, n):
        try:
            values = np.asarray(self._function(numbers(x, x_count).copy(), numbers(p, count).copy()))
            if np.iscomplexobj(values):
                raise TypeError(f"{at(self._place)}: real values are needed; got complex ones")
            shape = (n, count) if self._gives_rows else (n,)
            try:
                values = np.broadcast_to(values, shape)
            except ValueError:
                raise ValueError(f"{at(self._place)}: values of shape {shape} are needed; got "
                                 f"{values.shape}") from None
            numbers(out, values.size)[:] = values.ravel()
        except BaseException as error:  # no exception of any kind may pass through the export
            self.raised = error
            return 1
        return 0

    def raise_again(self):
        if self.raised is not None:
            raise self.raised


def numbers(address, count):
    """The doubles at an address of any alignment."""
    if not count:
        return np.empty(0)
    return np.frombuffer((ctypes.c_char * (8 * count)).from_address(address), np.float64)
