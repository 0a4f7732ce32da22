"""Memory that is handed to the library, with NumPy and without."""

from __future__ import annotations

import ctypes as c
from typing import Any, Sequence

try:
    import numpy
except ImportError:  # bytes and memoryviews do as well
    numpy = None  # type: ignore[assignment]


def new(shape: Sequence[int]) -> Any:
    """Bytes of that shape: an array of NumPy's, or a memoryview without it."""
    if numpy is not None:
        return numpy.zeros(tuple(shape), numpy.uint8)
    count = 1
    for size in shape:
        count *= size
    return memoryview(bytearray(count)).cast("B", list(shape))


def view(data: Any, name: str) -> memoryview:
    """The bytes of `data` as a C-contiguous memoryview, copied only where they are not that already."""
    if numpy is not None and isinstance(data, numpy.ndarray):
        if data.dtype != numpy.uint8:
            raise TypeError(f"{name} must hold bytes (uint8), not {data.dtype}.")
        data = numpy.ascontiguousarray(data)
    seen = memoryview(data)
    if seen.itemsize != 1:
        raise TypeError(f"{name} must hold bytes.")
    return seen if seen.c_contiguous else memoryview(seen.tobytes()).cast("B", list(seen.shape))


class Pointer:
    """The address of the first byte of a buffer, and what keeps it there."""

    def __init__(self, data: memoryview) -> None:
        if data.readonly:
            self.keeper: Any = c.create_string_buffer(data.tobytes(), max(data.nbytes, 1))
        else:
            self.keeper = (c.c_ubyte * max(data.nbytes, 1)).from_buffer(data) if data.nbytes else c.c_ubyte(0)
        self.address = c.addressof(self.keeper)
