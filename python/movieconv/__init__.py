"""Movies from Python, by the MovieConv library.

    import movieconv

    movieconv.write("out.mp4", pictures, rate=25)             # pictures: arrays of RGB from any iterable
    for progress in movieconv.convert("in.mkv", "out.mp4"):   # a movie file into another
        print(f"{progress.percent:.1f} %")
    y, u, v = movieconv.colour.rgb24_to_yuv420(bitmap)        # the colour routines, on arrays

NumPy is used where it is installed; without it, pictures and sound are bytes or memoryviews.
What goes wrong is raised as ConversionError, whose text is a sentence for users.
"""

from . import colour
from ._convert import Conversion, FileProgress, convert
from ._engine import (
    Category,
    ConversionError,
    LogLevel,
    Progress,
    Result,
    set_log_function,
    version,
    write,
)

__all__ = [
    "Category", "Conversion", "ConversionError", "FileProgress", "LogLevel", "Progress", "Result", "colour",
    "convert", "set_log_function", "version", "write",
]
__version__ = "1.1.0"
