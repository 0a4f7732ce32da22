"""Writing movies from pictures and sound that Python makes."""

from __future__ import annotations

import contextlib
import ctypes as c
import enum
import math
import os
from dataclasses import dataclass
from typing import Any, Callable, Iterable, Iterator, Optional, Tuple

from . import _library as lib
from ._buffers import Pointer, numpy, view

_WAIT_STEP_MS = 50  # how soon a KeyboardInterrupt is seen
_WAIT_TIMEOUT = 258


class Category(enum.IntEnum):
    """What was wrong with a conversion; see MCResult."""

    DONE = 0
    NONE = 1
    RUNNING = 2
    STOPPED = 3
    CANCELLED = 4
    SOURCE = 5
    CALLBACK = 6
    REFUSED = 7
    PARAMETERS = 8
    FORMAT = 9
    EXISTS = 10
    CANNOT_OPEN = 11
    NO_SPACE = 12
    WRITE = 13
    ENCODE = 14
    INTERNAL = 15


@dataclass(frozen=True)
class Result:
    """What has become of a movie. Sound counts in sample frames."""

    done: bool
    category: Category
    what: str  # a sentence for users; empty when nothing was wrong
    path: str  # the file that it is about; empty when it is about none
    system_error: int  # an errno, or 0
    files_complete: int
    pictures_sent: int
    pictures_refused: int
    pictures_written: int
    samples_sent: int
    samples_refused: int
    samples_written: int
    pictures_restamped: int  # moved by more than 10 ms, since sound is the clock
    largest_shift: float  # of these, in seconds


class ConversionError(Exception):
    """A movie that is not done; the text is a sentence for users. `result` tells more, where there is one."""

    def __init__(self, text: str, result: Optional[Result] = None) -> None:
        super().__init__(text)
        self.result = result


@dataclass(frozen=True)
class Progress:
    """How far a movie is. Times are seconds."""

    position: float
    percent: float
    elapsed: float
    speed: float  # seconds of movie a second; 0 while it is not known


class LogLevel(enum.IntEnum):
    ERROR = 1
    WARNING = 2
    INFO = 3
    DEBUG = 4


_log_function: Optional[Callable[[LogLevel, str], None]] = None
_log_is_taken = False


@lib.LogFunction
def _log(_user: Any, level: int, line: bytes) -> None:
    function = _log_function
    if function is not None:
        function(LogLevel(level), line.decode("utf-8", "replace"))


def set_log_function(function: Optional[Callable[[LogLevel, str], None]]) -> None:
    """Sends every line of the library and of FFmpeg to `function(level, line)`; None drops them, which is how it
    is at first. It is called on any thread, possibly on several at once, and may still be called for a line under way
    when another one is set. What it raises is lost."""
    global _log_function
    _log_function = function
    _engine()


def version() -> Tuple[int, int, int]:
    """The library's version."""
    number = _engine().MCGetVersion()
    return number >> 16, number >> 8 & 0xFF, number & 0xFF


def _engine() -> Any:
    global _log_is_taken
    engine = lib.library()
    if not _log_is_taken:  # a Python program's standard streams are its own
        if engine.MCSetLogCallback(_log, None) == 0:
            raise MemoryError
        _log_is_taken = True
    return engine


class _Failure:
    """The first exception of a callback, which is raised again when the library has returned."""

    error: Optional[BaseException] = None

    def __call__(self, function: Callable[..., int], failed: int) -> Callable[..., int]:
        def guarded(*arguments: Any) -> int:
            try:
                return function(*arguments)
            except BaseException as error:  # noqa: B902 - nothing may cross into C
                self.error = self.error or error
                return failed

        return guarded


class _Pictures:
    """A source of pictures over an iterable."""

    def __init__(self, pictures: Iterable[Any], rate: float, size: Optional[Tuple[int, int]], duration: float,
                 failure: _Failure) -> None:
        self._iterator = iter(pictures)
        self._rate, self._duration = rate, duration
        self._next = next(self._iterator, None)
        self._size = size
        self._planes: Any = None  # what the library reads stays until the next picture
        self._keep: Any = None
        if self._next is None:
            raise ValueError("There is no picture.")
        self.width, self.height = size or self._size_of(self._next)
        if not (0 < self.width < 2**31 and 0 < self.height < 2**31):
            raise ValueError(f"Pictures have a width and a height above 0, not {self.width} x {self.height}.")
        self.table = lib.VideoSource(
            c.sizeof(lib.VideoSource), None, lib.GetVideoFormat(failure(self._describe, 0)), lib.Seek(),
            lib.GetPicture(failure(self._give, -1)), lib.Release())

    @staticmethod
    def _size_of(picture: Any) -> Tuple[int, int]:
        shape = getattr(picture[0] if isinstance(picture, tuple) else picture, "shape", None)
        if shape is None or len(shape) < 2:
            raise ValueError("Pictures without a shape, such as bytes, need size=(width, height).")
        return shape[1], shape[0]

    def release(self) -> None:
        """The library is done with it. Its table and it hold each other otherwise, and its pictures."""
        self.table = self._iterator = self._planes = self._keep = None

    def _describe(self, _user: Any, form: Any) -> int:
        form[0] = lib.VideoFormat(self.width, self.height, self._rate, self._duration)
        return 1

    def _give(self, _user: Any, image: Any) -> int:
        picture, self._next = self._next, None
        if picture is None:
            picture = next(self._iterator, None)
        if picture is None:
            return 0
        width, height = self._load(picture)
        out = image[0]
        out.nWidth = out.nPitchY = width
        out.nHeight = height
        out.nPitchU = out.nPitchV = (width + 1) // 2
        out.pY, out.pU, out.pV = (pointer.address for pointer in self._keep)
        return 1

    def _load(self, picture: Any) -> Tuple[int, int]:
        if isinstance(picture, tuple):
            planes = [view(plane, name) for plane, name in zip(picture, "yuv")]
            if len(planes) != 3 or any(len(plane.shape) != 2 for plane in planes):
                raise ValueError("A tuple must hold the planes y, u and v.")
            height, width = planes[0].shape
            if any(plane.shape != ((height + 1) // 2, (width + 1) // 2) for plane in planes[1:]):
                raise ValueError("The planes u and v must have half the size of y, rounded up.")
            self._keep = [Pointer(plane) for plane in planes]
            return width, height
        pixels = _blue_first(picture, self.width, self.height)
        self._planes = pixels[0]
        self._keep = _to_planes(*pixels)
        return pixels[1], pixels[2]


def _blue_first(picture: Any, width: int, height: int) -> Tuple[bytearray, int, int]:
    """RGB or RGBA as rows of blue, green, red and a byte that does not matter."""
    if numpy is not None and isinstance(picture, numpy.ndarray):
        if picture.dtype != numpy.uint8 or picture.ndim != 3 or picture.shape[2] not in (3, 4):
            raise TypeError(f"A picture is a uint8 array (height, width, 3 or 4), not {picture.dtype} {picture.shape}.")
        height, width = picture.shape[:2]
        pixels = bytearray(4 * width * height)
        numpy.frombuffer(pixels, numpy.uint8).reshape(height, width, 4)[:, :, :3] = picture[:, :, 2::-1]
        return pixels, width, height
    data = view(picture, "A picture")
    if len(data.shape) == 3:
        height, width = data.shape[:2]
    data = data.cast("B")
    channels, rest = divmod(data.nbytes, width * height)
    if rest != 0 or channels not in (3, 4):
        raise ValueError(f"A picture of {width} x {height} has 3 or 4 bytes a pixel, not {data.nbytes} in all.")
    pixels = bytearray(4 * width * height)
    raw = bytes(data)
    for to, origin in enumerate((2, 1, 0)):
        pixels[to::4] = raw[origin::channels]
    return pixels, width, height


def _to_planes(pixels: bytearray, width: int, height: int) -> list[Pointer]:
    chroma = (width + 1) // 2 * ((height + 1) // 2)
    planes = [Pointer(memoryview(bytearray(size))) for size in (width * height, chroma, chroma)]
    convert = lib.library()._Z17Rgb32_2_yuv420_ExPhS_S_iiiS_iii
    convert.restype = None
    convert.argtypes = [c.c_void_p] * 3 + [c.c_int] * 3 + [c.c_void_p] + [c.c_int] * 3
    half = (width + 1) // 2
    convert(*[plane.address for plane in planes], width, half, half, Pointer(memoryview(pixels)).address, width,
            height, 4 * width)
    return planes


class _Sound:
    """A source of sound over an iterable of blocks of 16-bit samples."""

    def __init__(self, blocks: Iterable[Any], rate: int, channels: int, duration: float, failure: _Failure) -> None:
        self._iterator = iter(blocks)
        self._rate, self._channels, self._duration = rate, channels, duration
        self._keep: Any = None
        self.table = lib.AudioSource(
            c.sizeof(lib.AudioSource), None, lib.GetAudioFormat(failure(self._describe, 0)), lib.Seek(),
            lib.GetBlock(failure(self._give, -1)), lib.Release())

    def release(self) -> None:
        """As that of pictures."""
        self.table = self._iterator = self._keep = None

    def _describe(self, _user: Any, form: Any) -> int:
        form[0] = lib.AudioFormat(self._rate, self._channels, 16, 0, self._duration)
        return 1

    def _give(self, _user: Any, block: Any) -> int:
        for samples in self._iterator:
            data = self._bytes(samples)
            if data:
                self._keep = c.create_string_buffer(data, len(data))
                block[0].pData = c.addressof(self._keep)
                block[0].nLength = len(data)
                return 1
        return 0

    def _bytes(self, samples: Any) -> bytes:
        if numpy is not None and isinstance(samples, numpy.ndarray):
            if samples.dtype.kind == "f":
                if numpy.isnan(samples).any():
                    raise ValueError("A block of sound has samples that are no numbers.")
                samples = numpy.clip(numpy.rint(samples * 32767.0), -32768, 32767).astype("<i2")
            elif samples.dtype != numpy.int16:
                raise TypeError(f"Sound is int16 or floating point, not {samples.dtype}.")
            if samples.ndim == 2 and samples.shape[1] != self._channels:
                raise ValueError(f"A block of sound has the shape (n, {self._channels}), not {samples.shape}.")
            data = samples.astype("<i2", copy=False).tobytes()
        else:
            data = bytes(samples)
        if len(data) % (2 * self._channels) != 0:
            raise ValueError("A block of sound ends within a sample frame.")
        return data


@contextlib.contextmanager
def _writer_set() -> Iterator[int]:
    """The number of a set of the writer's options. Files tell that their matrix is that of BT.601, as otherwise players
    take BT.709's from 720 lines on."""
    bt601 = 6
    engine = _engine()
    number = engine.MWRegisterOptions(c.byref(lib.WriterOptions(nSize=c.sizeof(lib.WriterOptions), nColorMatrix=bt601)))
    if number == 0:
        raise MemoryError
    try:
        yield number
    finally:
        engine.MWUnregisterOptions(number)


def _positive(name: str, value: Any) -> int:
    """As the library takes it, whose field would silently take another number of more than 31 bits."""
    if not 0 < value < 2**31:
        raise ValueError(f"The {name} is above 0 and below 2**31, not {value}.")
    return int(value)


def _parameters(path: str, options: dict[str, Any]) -> lib.EncodeParam:
    param = lib.EncodeParam()
    if _engine().MCEncodeParamForFile(path, c.byref(param)) == 0:
        raise ValueError(f"The extension of {path!r} tells no file format.")
    for name, field in (("video_codec", "fccVideo"), ("audio_codec", "fccAudio"), ("file_format", "fccFileFormat")):
        if options[name] is not None:
            setattr(param, field, lib.fourcc(options[name]))
    for name, field in (("video_bitrate", "nVideoBitrate"), ("audio_bitrate", "nAudioBitrate")):
        if options[name] is not None:
            setattr(param, field, _positive(name, options[name]))
    if options["output_size"] is not None:
        param.nWidth, param.nHeight = (_positive("output_size", side) for side in options["output_size"])
    return param


def _result_of(handle: Any) -> Result:
    raw = lib.MCResult(nSize=c.sizeof(lib.MCResult))
    _engine().MCGetResult(handle, c.byref(raw))
    return Result(
        bool(raw.bDone), Category(raw.nCategory), raw.szWhat.decode("utf-8", "replace"),
        raw.szPath.decode("utf-8", "surrogateescape"), raw.nSystemError, raw.nFilesComplete, raw.llPicturesSent,
        raw.llPicturesRefused, raw.llPicturesWritten, raw.llSamplesSent, raw.llSamplesRefused, raw.llSamplesWritten,
        raw.llPicturesRestamped, raw.llLargestShift / lib.TICKS_PER_SECOND)


def _await(handle: Any) -> None:
    engine = _engine()
    try:
        while engine.MCWait(handle, _WAIT_STEP_MS) == _WAIT_TIMEOUT:
            pass
    except BaseException:  # an interrupt: what is done is finished as a file
        engine.MCAbort(handle)
        engine.MCWait(handle, 0xFFFFFFFF)
        raise


def write(
    path: "str | os.PathLike[str]",
    pictures: Optional[Iterable[Any]] = None,
    *,
    rate: float = 25.0,
    size: Optional[Tuple[int, int]] = None,
    sound: Optional[Iterable[Any]] = None,
    sample_rate: int = 48000,
    channels: int = 1,
    duration: float = 0.0,
    output_size: Optional[Tuple[int, int]] = None,
    video_codec: Optional[str] = None,
    audio_codec: Optional[str] = None,
    file_format: Optional[str] = None,
    video_bitrate: Optional[int] = None,
    audio_bitrate: Optional[int] = None,
    progress: Optional[Callable[[Progress], Any]] = None,
) -> Result:
    """Writes a movie and returns when the file is complete, on the disk, under its name.

    pictures: RGB or RGBA as uint8 arrays (height, width, 3 or 4), tuples (y, u, v) of 4:2:0 planes by BT.601, or bytes
        of RGB with size=(width, height); `rate` a second. All of one size is usual; others are fitted into the first one's.
    sound: blocks of any length of `channels` interleaved channels: int16 or float (-1 to 1) arrays (n,) or
        (n, channels), or bytes of 16-bit little-endian samples.
    rate, sample_rate, channels: above 0.
    duration: the length in seconds if it is known, for `progress`.
    output_size, codecs, file_format (four-character codes as in docs/decoders.md), bitrates (bits a second; as sizes
        above 0): what the extension of `path` chooses, and the pictures' size, unless given.
    progress: called now and then; returning False ends the movie, which is finished as it is.

    The iterables are read on a thread of the library's. What they or `progress` raise is raised here, and so is
    KeyboardInterrupt, after the file was finished with what it has. ConversionError: the movie is not done.
    """
    name = lib.wide_path(path)
    if pictures is None and sound is None:
        raise ValueError("A movie has pictures or sound.")
    if pictures is not None and not (math.isfinite(rate) and rate > 0):
        raise ValueError(f"The rate of pictures is above 0, not {rate}.")
    if sound is not None and not (0 < sample_rate < 2**31 and 0 < channels < 2**31):
        raise ValueError(f"Sound has a sample rate and channels above 0, not {sample_rate} and {channels}.")
    engine = _engine()
    failure = _Failure()
    param = _parameters(name, dict(video_codec=video_codec, audio_codec=audio_codec, file_format=file_format,
                                   video_bitrate=video_bitrate, audio_bitrate=audio_bitrate, output_size=output_size))
    video = None if pictures is None else _Pictures(pictures, rate, size, duration, failure)
    audio = None if sound is None else _Sound(sound, sample_rate, channels, duration, failure)

    def report(_context: Any, kind: int, _value: int, info: Any) -> int:
        if kind != 0 or progress is None:
            return 1
        told = c.cast(info, c.POINTER(lib.ProgressInfo))[0]
        clock = told.tElapsed
        elapsed = clock.nHours * 3600 + clock.nMinutes * 60 + clock.nSeconds + clock.nMilliseconds / 1000
        wanted = progress(Progress(told.dPosition, told.nProgress / 100, elapsed, told.dSpeed))
        return 0 if wanted is False else 1

    callback = lib.ProgressCallback(failure(report, 0))
    handle = engine.MCCreateFromSources(c.byref(video.table) if video else None, c.byref(audio.table) if audio else None)
    if not handle:
        raise failure.error or ConversionError("The converter could not be created; the log tells why.")
    try:
        with _writer_set() as param.nReserved[0]:
            engine.MCEnableEvents(handle, 0)
            engine.MCEnableStopOnFailure(handle, 1)
            engine.MCSetEncodeParam(handle, c.byref(param))
            engine.MCSetOutputFile(handle, name)
            engine.MCStart(handle, 0.0, 0.0, None, callback, None)
            _await(handle)
            result = _result_of(handle)
    finally:
        engine.MCDestroy(handle)
        for source in filter(None, (video, audio)):
            source.release()
    if failure.error is not None:
        raise failure.error
    if not result.done and not (result.category is Category.CANCELLED and result.files_complete > 0):
        raise ConversionError(result.what + (f" ({result.path})" if result.path else ""), result)
    return result
