"""The library by ctypes: where it is, its records, and its functions with their types."""

from __future__ import annotations

import ctypes as c
import functools
import os
from pathlib import Path

TICKS_PER_SECOND = 10_000_000


class VideoFormat(c.Structure):
    _pack_ = 4
    _fields_ = [("nWidth", c.c_int32), ("nHeight", c.c_int32), ("dFrameRate", c.c_double), ("dDuration", c.c_double)]


class AudioFormat(c.Structure):
    _pack_ = 4
    _fields_ = [("nSampleRate", c.c_int32), ("nChannels", c.c_int32), ("nBitsPerSample", c.c_int32),
                ("nBytesPerSecond", c.c_int32), ("dDuration", c.c_double)]


class VideoImage(c.Structure):
    _pack_ = 4
    _fields_ = [("nType", c.c_int32), ("nFormat", c.c_int32), ("pY", c.c_void_p), ("pU", c.c_void_p),
                ("pV", c.c_void_p), ("nReserved", c.c_int32), ("nWidth", c.c_int32), ("nHeight", c.c_int32),
                ("nPitchY", c.c_int32), ("nPitchU", c.c_int32), ("nPitchV", c.c_int32),
                ("reserved", c.c_ubyte * 12), ("llTime2", c.c_int64), ("llTime", c.c_int64), ("nDuration", c.c_int32)]


class AudioFrame(c.Structure):
    _pack_ = 4
    _fields_ = [("nType", c.c_int32), ("nSampleRate", c.c_int32), ("nChannels", c.c_int32),
                ("nBitsPerSample", c.c_int32), ("pData", c.c_void_p), ("nLength", c.c_int32),
                ("nBufferSize", c.c_int32), ("reserved", c.c_ubyte * 28), ("llTime2", c.c_int64),
                ("llTime", c.c_int64), ("nDuration", c.c_int32)]


class EncodeParam(c.Structure):
    _pack_ = 4
    _fields_ = [("fccVideo", c.c_uint32), ("fccColorFormat", c.c_uint32), ("nBitCount", c.c_int32),
                ("nWidth", c.c_int32), ("nHeight", c.c_int32), ("dFrameRate", c.c_double),
                ("nVideoRateMode", c.c_int32), ("nVideoBitrate", c.c_int32), ("nVideoMaxBitrate", c.c_int32),
                ("bResize", c.c_int32), ("nReserved", c.c_uint32 * 5), ("fccAudio", c.c_uint32),
                ("nSampleRate", c.c_int32), ("nChannels", c.c_int32), ("nBitsPerSample", c.c_int32),
                ("nAudioRateMode", c.c_int32), ("nAudioBitrate", c.c_int32), ("nAudioMaxBitrate", c.c_int32),
                ("bNoVideo", c.c_int32), ("bNoAudio", c.c_int32), ("fccFileFormat", c.c_uint32)]


class WriterOptions(c.Structure):
    """As in its first version, which the library fills up."""

    _fields_ = [("nSize", c.c_uint32), ("nSampleAspectNum", c.c_int32), ("nSampleAspectDen", c.c_int32),
                ("bFullRange", c.c_int32), ("nColorPrimaries", c.c_int32), ("nColorTransfer", c.c_int32),
                ("nColorMatrix", c.c_int32), ("nEncoderThreads", c.c_int32), ("bBitExact", c.c_int32),
                ("bKeepExisting", c.c_int32), ("bRemovePartial", c.c_int32), ("pfnListener", c.c_void_p),
                ("pfnFullDisk", c.c_void_p), ("pContext", c.c_void_p)]


class TimeData(c.Structure):
    _fields_ = [("nHours", c.c_uint32), ("nMinutes", c.c_uint32), ("nSeconds", c.c_uint32),
                ("nMilliseconds", c.c_uint32)]


class ProgressInfo(c.Structure):
    _pack_ = 4
    _fields_ = [("dTotalLength", c.c_double), ("dPosition", c.c_double), ("nPercent", c.c_int32),
                ("nProgress", c.c_int32), ("pPreviewImage", c.c_void_p), ("tElapsed", TimeData),
                ("tRemaining", TimeData), ("dDoneLength", c.c_double), ("dSpeed", c.c_double)]


class MCResult(c.Structure):
    _pack_ = 4
    _fields_ = [("nSize", c.c_uint32), ("bDone", c.c_int32), ("nCategory", c.c_int32), ("nOutcome", c.c_int32),
                ("nSystemError", c.c_int32), ("nFilesCreated", c.c_int32), ("nFilesComplete", c.c_int32),
                ("nReserved", c.c_int32), ("llPicturesSent", c.c_int64), ("llPicturesRefused", c.c_int64),
                ("llPicturesWritten", c.c_int64), ("llSamplesSent", c.c_int64), ("llSamplesRefused", c.c_int64),
                ("llSamplesWritten", c.c_int64), ("llPicturesRestamped", c.c_int64), ("llLargestShift", c.c_int64),
                ("szWhat", c.c_char * 512), ("szPath", c.c_char * 4096)]


GetVideoFormat = c.CFUNCTYPE(c.c_int, c.c_void_p, c.POINTER(VideoFormat))
GetAudioFormat = c.CFUNCTYPE(c.c_int, c.c_void_p, c.POINTER(AudioFormat))
Seek = c.CFUNCTYPE(c.c_int, c.c_void_p, c.c_double)
GetPicture = c.CFUNCTYPE(c.c_int, c.c_void_p, c.POINTER(VideoImage))
GetBlock = c.CFUNCTYPE(c.c_int, c.c_void_p, c.POINTER(AudioFrame))
Release = c.CFUNCTYPE(None, c.c_void_p)
ProgressCallback = c.CFUNCTYPE(c.c_uint, c.c_void_p, c.c_uint, c.c_uint, c.c_void_p)
LogFunction = c.CFUNCTYPE(None, c.c_void_p, c.c_int, c.c_char_p)


class VideoSource(c.Structure):
    _fields_ = [("nSize", c.c_uint32), ("pUser", c.c_void_p), ("pfnGetFormat", GetVideoFormat), ("pfnSeek", Seek),
                ("pfnGetPicture", GetPicture), ("pfnRelease", Release)]


class AudioSource(c.Structure):
    _fields_ = [("nSize", c.c_uint32), ("pUser", c.c_void_p), ("pfnGetFormat", GetAudioFormat), ("pfnSeek", Seek),
                ("pfnGetBlock", GetBlock), ("pfnRelease", Release)]


_HANDLE = c.c_void_p
_FUNCTIONS = {
    "MCGetVersion": (c.c_uint, []),
    "MCSetLogCallback": (c.c_int, [LogFunction, c.c_void_p]),
    "MCCreateFromSources": (_HANDLE, [c.POINTER(VideoSource), c.POINTER(AudioSource)]),
    "MCDestroy": (None, [_HANDLE]),
    "MCEncodeParamForFile": (c.c_int, [c.c_wchar_p, c.POINTER(EncodeParam)]),
    "MCSetEncodeParam": (c.c_int, [_HANDLE, c.POINTER(EncodeParam)]),
    "MCSetOutputFile": (c.c_int, [_HANDLE, c.c_wchar_p]),
    "MCEnablePreview": (c.c_uint, [_HANDLE, c.c_uint]),
    "MCEnableEvents": (c.c_uint, [_HANDLE, c.c_uint]),
    "MCEnableStopOnFailure": (c.c_uint, [_HANDLE, c.c_uint]),
    "MCStart": (c.c_int, [_HANDLE, c.c_double, c.c_double, c.c_void_p, ProgressCallback, c.c_void_p]),
    "MCAbort": (c.c_int, [_HANDLE]),
    "MCWait": (c.c_int, [_HANDLE, c.c_uint]),
    "MCGetResult": (c.c_int, [_HANDLE, c.POINTER(MCResult)]),
    "MWRegisterOptions": (c.c_uint32, [c.POINTER(WriterOptions)]),  # of the media writer, which the library loads
    "MWUnregisterOptions": (c.c_int, [c.c_uint32]),
}


def _candidates() -> list[str]:
    chosen = os.environ.get("MOVIECONV_LIBRARY")
    if chosen:
        return [chosen]
    bundled = Path(__file__).parent / "lib" / "libmovieconv.so.1"
    return [str(bundled)] * bundled.exists() + ["libmovieconv.so.1"]


@functools.lru_cache(maxsize=None)
def library() -> c.CDLL:
    """The loaded library: that which MOVIECONV_LIBRARY names, else one in the package, else the system's."""
    problems = []
    for name in _candidates():
        try:
            loaded = c.CDLL(name)
            break
        except OSError as error:
            problems.append(str(error))
    else:
        raise ImportError("The MovieConv library cannot be loaded: " + "; ".join(problems)
                          + ". Install it, or name it in MOVIECONV_LIBRARY.")
    for name, (result, arguments) in _FUNCTIONS.items():
        try:
            function = getattr(loaded, name)
        except AttributeError:
            raise ImportError(f"The MovieConv library is older than 1.1: it has no {name}.") from None
        function.restype = result
        function.argtypes = arguments
    return loaded


def fourcc(code: str) -> int:
    """The number of a four-character code; shorter ones are filled up with blanks."""
    raw = code.encode("ascii")
    if not 1 <= len(raw) <= 4:
        raise ValueError(f"A code has one to four ASCII characters, not {code!r}.")
    return int.from_bytes(raw.ljust(4), "little")


def wide_path(path: "str | os.PathLike[str]") -> str:
    """A path as the library takes it: bytes that are not UTF-8 as surrogates, which is what Python does too."""
    text = os.fspath(path)
    if "\0" in text:
        raise ValueError("A path holds no null characters.")
    return text
