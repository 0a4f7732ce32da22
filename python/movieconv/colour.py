"""The colour routines, one function each, on arrays of bytes.

Pictures are C-contiguous uint8 arrays of NumPy's or memoryviews with a shape: (height, width, 3) or
(height, width, 4) with the bytes blue, green, red (, fourth); planes (height, width); packed 4:2:2
(height, width, 2) with an even width. Results are new arrays (memoryviews without NumPy). Colours are BT.601,
Y 16 to 235; every result is the same in every bit on every processor. "bottom_up" says that row 0 is the
bottom row of the picture; bitmaps are so by nature, arrays mostly are not.

A ValueError or TypeError tells what does not fit; the library itself would end the process.
"""

from __future__ import annotations

import ctypes as c
from typing import Any, NamedTuple, Tuple

from ._buffers import Pointer, new, view
from ._library import library


class Yuv420(NamedTuple):
    """Planes of a 4:2:0 picture: y (h, w), u and v ((h + 1) // 2, (w + 1) // 2)."""

    y: Any
    u: Any
    v: Any


class Yuva420(NamedTuple):
    """The same with alpha (h, w)."""

    y: Any
    u: Any
    v: Any
    a: Any


class _Header(c.Structure):
    _pack_ = 2
    _fields_ = [("biSize", c.c_uint32), ("biWidth", c.c_int32), ("biHeight", c.c_int32), ("biPlanes", c.c_uint16),
                ("biBitCount", c.c_uint16), ("rest", c.c_ubyte * 24)]


_P, _I, _U, _H = c.c_void_p, c.c_int, c.c_uint, c.POINTER(_Header)
_R = c.POINTER(c.c_int)
# The exported names, which carry the parameter types.
_ROUTINES = {
    "Rgb32_2_yuv420": ("_Z14Rgb32_2_yuv420PhS_S_iiiP19tagBITMAPINFOHEADERS_", [_P] * 3 + [_I] * 3 + [_H, _P]),
    "Argb_2_yuv420": ("_Z13Argb_2_yuv420PhS_S_iiiP19tagBITMAPINFOHEADERS_", [_P] * 3 + [_I] * 3 + [_H, _P]),
    "Rgb32_2_yuv420_Ex": ("_Z17Rgb32_2_yuv420_ExPhS_S_iiiS_iii", [_P] * 3 + [_I] * 3 + [_P] + [_I] * 3),
    "Rgb24_2_yuv420": ("_Z14Rgb24_2_yuv420PhS_S_iiiP19tagBITMAPINFOHEADERS_", [_P] * 3 + [_I] * 3 + [_H, _P]),
    "Rgb24_2_yuv420Simple": ("_Z20Rgb24_2_yuv420SimplePhS_S_iiiP19tagBITMAPINFOHEADERS_",
                             [_P] * 3 + [_I] * 3 + [_H, _P]),
    "PixelRGB_2_YUV": ("_Z14PixelRGB_2_YUViiiRiS_S_", [_I] * 3 + [_R] * 3),
    "Rgb32_2_yuv420A": ("_Z15Rgb32_2_yuv420APhS_S_S_iiiP19tagBITMAPINFOHEADERS_i",
                        [_P] * 4 + [_I] * 3 + [_H, _P, _I]),
    "Rgb32_2_yuv420A_R": ("_Z17Rgb32_2_yuv420A_RPhS_S_S_iiiP19tagBITMAPINFOHEADERS_",
                          [_P] * 4 + [_I] * 3 + [_H, _P]),
    "Yuv420_2_rgb24": ("_Z14Yuv420_2_rgb24P19tagBITMAPINFOHEADERPhS1_S1_S1_iii", [_H] + [_P] * 4 + [_I] * 3),
    "Yuv420_2_rgb32": ("_Z14Yuv420_2_rgb32P19tagBITMAPINFOHEADERPhS1_S1_S1_iii", [_H] + [_P] * 4 + [_I] * 3),
    "Yuv420_2_Argb": ("_Z13Yuv420_2_ArgbP19tagBITMAPINFOHEADERPhS1_S1_S1_iii", [_H] + [_P] * 4 + [_I] * 3),
    "Yuv420_2_rgb24Simple": ("_Z20Yuv420_2_rgb24SimpleP19tagBITMAPINFOHEADERPhS1_S1_S1_iii",
                             [_H] + [_P] * 4 + [_I] * 3),
    "PixelYUV_2_RGB": ("_Z14PixelYUV_2_RGBiiiRiS_S_", [_I] * 3 + [_R] * 3),
    "Rgb24_2_YUY2": ("_Z12Rgb24_2_YUY2PhiiiiijS_iiii", [_P] + [_I] * 5 + [_U, _P] + [_I] * 4),
    "YUY2_2_Rgb24": ("_Z12YUY2_2_Rgb24PhiiiiiiS_ijii", [_P] + [_I] * 6 + [_P, _I, _U] + [_I] * 2),
    "YUY2_2_Yuv420": ("_Z13YUY2_2_Yuv420PhS_S_iiiiiiiS_ijii", [_P] * 3 + [_I] * 7 + [_P, _I, _U] + [_I] * 2),
    "Yuv420_2_YUY2": ("_Z13Yuv420_2_YUY2PhiiiiijS_S_S_iiiii", [_P] + [_I] * 5 + [_U] + [_P] * 3 + [_I] * 5),
    "YV12_Blt_fast": ("_Z13YV12_Blt_fastPhS_S_iiiiiiiS_S_S_iiiii", [_P] * 3 + [_I] * 7 + [_P] * 3 + [_I] * 5),
    "YUY2_Blt_fast": ("_Z13YUY2_Blt_fastPhiiiiijS_ijii", [_P] + [_I] * 5 + [_U, _P, _I, _U] + [_I] * 2),
    "YUV444_2_420": ("_Z12YUV444_2_420PhS_ii", [_P] * 2 + [_I] * 2),
    "YUV420_2_444": ("_Z12YUV420_2_444PhS_ii", [_P] * 2 + [_I] * 2),
    "YUV420_2_444Ex": ("_Z14YUV420_2_444ExPhS_ii", [_P] * 2 + [_I] * 2),
}


def _call(name: str, *arguments: Any) -> None:
    symbol, types = _ROUTINES[name]
    function = getattr(library(), symbol)
    function.restype = None
    function.argtypes = types
    pointers = [Pointer(a) if isinstance(a, memoryview) else a for a in arguments]
    function(*[p.address if isinstance(p, Pointer) else p for p in pointers])


def _picture(data: Any, name: str, *shape: "int | None") -> memoryview:
    seen = view(data, name)
    fits = len(seen.shape) == len(shape) and all(w is None or w == g for w, g in zip(shape, seen.shape))
    if not fits or 0 in seen.shape:
        wanted = ", ".join("n" if size is None else str(size) for size in shape)
        raise ValueError(f"{name} must have the shape ({wanted}), not {tuple(seen.shape)}.")
    return seen


def _planes(yuv: Any) -> Tuple[memoryview, memoryview, memoryview]:
    y = _picture(yuv[0], "y", None, None)
    chroma = ((y.shape[0] + 1) // 2, (y.shape[1] + 1) // 2)
    return y, _picture(yuv[1], "u", *chroma), _picture(yuv[2], "v", *chroma)


def _new_planes(height: int, width: int) -> Yuv420:
    chroma = ((height + 1) // 2, (width + 1) // 2)
    return Yuv420(new((height, width)), new(chroma), new(chroma))


def _views(*arrays: Any) -> list[memoryview]:
    return [memoryview(array) for array in arrays]


def _pitches(width: int) -> Tuple[int, int, int]:
    return width, (width + 1) // 2, (width + 1) // 2


def _header(height: int, width: int, bits: int) -> _Header:
    return _Header(40, width, height, 1, bits)


def _bitmap_rows(pixels: memoryview) -> memoryview:
    """24-bit rows filled up to a multiple of four bytes, as a bitmap has them."""
    height, width = pixels.shape[:2]
    pitch = (3 * width + 3) // 4 * 4
    if pitch == 3 * width:
        return pixels
    rows = bytearray(pitch * height)
    flat = pixels.cast("B")
    for row in range(height):
        rows[row * pitch : row * pitch + 3 * width] = flat[row * 3 * width : (row + 1) * 3 * width]
    return memoryview(rows)


def _from_bitmap_rows(rows: memoryview, height: int, width: int) -> Any:
    pitch = (3 * width + 3) // 4 * 4
    out = new((height, width, 3))
    flat = memoryview(out).cast("B")
    for row in range(height):
        flat[row * 3 * width : (row + 1) * 3 * width] = rows[row * pitch : row * pitch + 3 * width]
    return out


def _to_planes(routine: str, pixels: Any, channels: int) -> Yuv420:
    source = _picture(pixels, "pixels", None, None, channels)
    height, width = source.shape[:2]
    out = _new_planes(height, width)
    bits = _bitmap_rows(source) if channels == 3 else source
    _call(routine, *_views(*out), *_pitches(width), c.byref(_header(height, width, 8 * channels)), bits)
    return out


def rgb32_to_yuv420(pixels: Any, bottom_up: bool = False) -> Yuv420:
    """(h, w, 4) to planes; the fourth byte is ignored. Argb_2_yuv420, or Rgb32_2_yuv420 when bottom-up."""
    return _to_planes("Rgb32_2_yuv420" if bottom_up else "Argb_2_yuv420", pixels, 4)


def rgb32_rows_to_yuv420(pixels: Any, bottom_up: bool = False) -> Yuv420:
    """The same as rgb32_to_yuv420 by Rgb32_2_yuv420_Ex, which takes bare rows instead of a bitmap."""
    source = _picture(pixels, "pixels", None, None, 4)
    height, width = source.shape[:2]
    out = _new_planes(height, width)
    _call("Rgb32_2_yuv420_Ex", *_views(*out), *_pitches(width), source, width, -height if bottom_up else height,
          4 * width)
    return out


def rgb24_to_yuv420(pixels: Any) -> Yuv420:
    """(h, w, 3), bottom-up, to planes. Rgb24_2_yuv420."""
    return _to_planes("Rgb24_2_yuv420", pixels, 3)


def rgb24_to_yuv420_simple(pixels: Any) -> Yuv420:
    """The same by the equations of rgb_to_yuv; an odd last column or row stays 0. Rgb24_2_yuv420Simple."""
    return _to_planes("Rgb24_2_yuv420Simple", pixels, 3)


def rgb32_to_yuva420(pixels: Any, bottom_up: bool = False) -> Yuva420:
    """(h, w, 4) to planes and alpha. Rgb32_2_yuv420A, or Rgb32_2_yuv420A_R when bottom-up."""
    source = _picture(pixels, "pixels", None, None, 4)
    height, width = source.shape[:2]
    out = _new_planes(height, width)
    alpha = new((height, width))
    arguments = [*_views(*out, alpha), *_pitches(width), c.byref(_header(height, width, 32)), source]
    if bottom_up:
        _call("Rgb32_2_yuv420A_R", *arguments)
    else:
        _call("Rgb32_2_yuv420A", *arguments, 0)
    return Yuva420(*out, alpha)


def _to_bitmap(routine: str, yuv: Any, channels: int) -> Any:
    y, u, v = _planes(yuv)
    height, width = y.shape
    header = c.byref(_header(height, width, 8 * channels))
    if channels == 4:
        out = new((height, width, 4))
        _call(routine, header, memoryview(out), y, u, v, *_pitches(width))
        return out
    rows = memoryview(bytearray((3 * width + 3) // 4 * 4 * height))
    _call(routine, header, rows, y, u, v, *_pitches(width))
    return _from_bitmap_rows(rows, height, width)


def yuv420_to_rgb24(yuv: Any) -> Any:
    """Planes to (h, w, 3), bottom-up. Yuv420_2_rgb24."""
    return _to_bitmap("Yuv420_2_rgb24", yuv, 3)


def yuv420_to_rgb24_simple(yuv: Any) -> Any:
    """The same by the equations of yuv_to_rgb; an odd last column or row stays 0. Yuv420_2_rgb24Simple."""
    return _to_bitmap("Yuv420_2_rgb24Simple", yuv, 3)


def yuv420_to_rgb32(yuv: Any) -> Any:
    """Planes to (h, w, 4), bottom-up, the fourth byte 0. Yuv420_2_rgb32."""
    return _to_bitmap("Yuv420_2_rgb32", yuv, 4)


def yuv420_to_argb(yuv: Any) -> Any:
    """Planes to (h, w, 4), top-down, the fourth byte 255. Yuv420_2_Argb."""
    return _to_bitmap("Yuv420_2_Argb", yuv, 4)


def _pixel(routine: str, a: int, b: int, d: int) -> Tuple[int, int, int]:
    out = [c.c_int(), c.c_int(), c.c_int()]
    _call(routine, a, b, d, *[c.byref(value) for value in out])
    return out[0].value, out[1].value, out[2].value


def rgb_to_yuv(red: int, green: int, blue: int) -> Tuple[int, int, int]:
    """One pixel, rounded to the nearest. PixelRGB_2_YUV."""
    return _pixel("PixelRGB_2_YUV", red, green, blue)


def yuv_to_rgb(y: int, u: int, v: int) -> Tuple[int, int, int]:
    """One pixel, rounded to the nearest. PixelYUV_2_RGB."""
    return _pixel("PixelYUV_2_RGB", y, u, v)


def _even(width: int) -> int:
    if width % 2 != 0:
        raise ValueError(f"Packed 4:2:2 has an even width, not {width}.")
    return width


def rgb24_to_yuy2(pixels: Any, yuy2: bool = True) -> Any:
    """(h, w, 3), bottom-up, to (h, w, 2): Y0 U Y1 V, or U Y0 V Y1 with yuy2 false. Rgb24_2_YUY2."""
    source = _picture(pixels, "pixels", None, None, 3)
    height, width = source.shape[:2]
    out = new((height, _even(width), 2))
    _call("Rgb24_2_YUY2", memoryview(out), 2 * width, 0, 0, width, height, int(yuy2), source, height, 3 * width, 0, 0)
    return out


def yuy2_to_rgb24(packed: Any, yuy2: bool = True) -> Any:
    """(h, w, 2) to (h, w, 3), bottom-up. YUY2_2_Rgb24."""
    source = _picture(packed, "packed", None, None, 2)
    height, width = source.shape[:2]
    out = new((height, _even(width), 3))
    _call("YUY2_2_Rgb24", memoryview(out), height, 3 * width, 0, 0, width, height, source, 2 * width, int(yuy2), 0, 0)
    return out


def yuy2_to_yuv420(packed: Any, yuy2: bool = True) -> Yuv420:
    """(h, w, 2) with an even height to planes. YUY2_2_Yuv420."""
    source = _picture(packed, "packed", None, None, 2)
    height, width = source.shape[:2]
    out = _new_planes(_even_height(height), _even(width))
    _call("YUY2_2_Yuv420", *_views(*out), *_pitches(width), 0, 0, width, height, source, 2 * width, int(yuy2), 0, 0)
    return out


def _even_height(height: int) -> int:
    if height % 2 != 0:
        raise ValueError(f"Between 4:2:0 and 4:2:2 the height is even, not {height}.")
    return height


def yuv420_to_yuy2(yuv: Any, yuy2: bool = True) -> Any:
    """Planes of even width and height to (h, w, 2). Yuv420_2_YUY2."""
    y, u, v = _planes(yuv)
    height, width = y.shape
    out = new((_even_height(height), _even(width), 2))
    _call("Yuv420_2_YUY2", memoryview(out), 2 * width, 0, 0, width, height, int(yuy2), y, u, v, *_pitches(width), 0, 0)
    return out


def _rectangle(x: int, y: int, width: int, height: int, full_width: int, full_height: int) -> None:
    if min(x, y, width, height) < 0 or x + width > full_width or y + height > full_height:
        raise ValueError(f"The rectangle at ({x}, {y}) of {width} x {height} leaves the picture.")
    if x % 2 or y % 2 or width % 2 or height % 2:
        raise ValueError("The rectangle's place and size must be even.")


def copy_yuv420(yuv: Any, x: int, y: int, width: int, height: int) -> Yuv420:
    """The rectangle of a 4:2:0 picture, at an even place and of an even size. YV12_Blt_fast."""
    planes = _planes(yuv)
    full_height, full_width = planes[0].shape
    _rectangle(x, y, width, height, full_width, full_height)
    out = _new_planes(height, width)
    _call("YV12_Blt_fast", *_views(*out), *_pitches(width), 0, 0, width, height, *planes, *_pitches(full_width), x, y)
    return out


def copy_yuy2(packed: Any, x: int, y: int, width: int, height: int, swap: bool = False) -> Any:
    """The rectangle of a 4:2:2 picture; swap changes the byte order of each pair. YUY2_Blt_fast."""
    source = _picture(packed, "packed", None, None, 2)
    full_height, full_width = source.shape[:2]
    _rectangle(x, y, width, height, full_width, full_height)
    out = new((height, width, 2))
    _call("YUY2_Blt_fast", memoryview(out), 2 * width, 0, 0, width, height, int(not swap), source, 2 * full_width, 1,
          x, y)
    return out


def plane_444_to_420(plane: Any) -> Any:
    """(h, w) to ((h + 1) // 2, (w + 1) // 2) by averages. YUV444_2_420."""
    source = _picture(plane, "plane", None, None)
    height, width = source.shape
    out = new(((height + 1) // 2, (width + 1) // 2))
    _call("YUV444_2_420", memoryview(out), source, width, height)
    return out


def plane_420_to_444(plane: Any) -> Any:
    """(h, w) to (2h, 2w), each sample four times. YUV420_2_444."""
    source = _picture(plane, "plane", None, None)
    height, width = source.shape
    out = new((2 * height, 2 * width))
    _call("YUV420_2_444", memoryview(out), source, width, height)
    return out


def chroma_to_full(plane: Any, width: int, height: int) -> Any:
    """The chroma plane of a picture of that size to (height, width); an odd last column or row stays 0.
    YUV420_2_444Ex."""
    source = _picture(plane, "plane", (height + 1) // 2, (width + 1) // 2)
    out = new((height, width))
    _call("YUV420_2_444Ex", memoryview(out), source, width, height)
    return out


def kernel_level() -> str:
    """The instruction set that the routines use. ImageConvertLevel."""
    function = library()._Z17ImageConvertLevelv
    function.restype = c.c_char_p
    function.argtypes = []
    return function().decode("ascii")
