"""simgp for Python: pictures as numpy arrays, and the library's functions over them.

    import simgp
    frame = simgp.Picture("nv12", 640, 480, buffer)      # any bytes-like object; no copy is made
    screen = simgp.Picture("rgb888", 640, 480)           # memory of its own
    simgp.csc_any(frame, screen, simgp.COLOUR_BT709)
    screen.planes[0]                                     # array of 480 x 640 x 3 bytes

The functions are those of C without the prefix, with its arguments in its order; the headers of the
library say what they do. They raise Error, with a text, for everything that the library refuses,
and before that for pictures whose sizes or formats do not go together: no call reads or writes
outside the arrays. Not checked is whether source and destination share memory; they must not.

Calls let other Python threads run. Bands of a picture (Picture.band) are pictures: threads share a
conversion by doing one each.

The shared library is the one that the environment variable SIMGP_LIBRARY names, else
libsimgp.so.1 beside this file or in the tree that this file is installed in, else that of the
system. Needs Python 3.9 and numpy.
"""

import ctypes
import glob
import os

import numpy

__all__ = ["Error", "Picture", "cpy", "csc", "csc_any", "csc_dither", "csc_rot", "dbf8x8_yuv",
           "format_name", "format_of_name", "get_tile_offset", "library", "result_text", "rot",
           "rsz", "rsz_csc", "rsz_rot", "version"]

OK, ERR_PARAM, ERR_UNSUPPORTED = 0, -1, -3
ROT_NONE, ROT_90L, ROT_90R, ROT_180, ROT_HORI, ROT_VERT = range(6)
(COLOUR_BT601, COLOUR_BT601_FULL, COLOUR_BT709, COLOUR_BT709_FULL, COLOUR_BT2020,
 COLOUR_BT2020_FULL) = range(6)
CHROMA_MEAN = 256
FMT_YUV400, FMT_YUV420, FMT_YUV422N, FMT_YUV444, FMT_YV12, FMT_YV16, FMT_NV12, FMT_NV21 = range(8)
FMT_YUV422W, FMT_T64X32, FMT_UYVY, FMT_YUYV, FMT_RGB565, FMT_BGR565 = 8, 11, 100, 101, 200, 201
FMT_RGB888, FMT_BGR888, FMT_RGBA8888, FMT_BGRA8888, FMT_ARGB8888 = 400, 401, 500, 501, 502

# Of each plane: bytes of a sample, and the shifts that make its size of the picture's.
_PLANES = {
    FMT_YUV400: ((1, 0, 0),),
    **dict.fromkeys((FMT_YUV420, FMT_YV12), ((1, 0, 0), (1, 1, 1), (1, 1, 1))),
    **dict.fromkeys((FMT_YUV422N, FMT_YV16), ((1, 0, 0), (1, 1, 0), (1, 1, 0))),
    FMT_YUV422W: ((1, 0, 0), (1, 0, 1), (1, 0, 1)),
    FMT_YUV444: ((1, 0, 0),) * 3,
    **dict.fromkeys((FMT_NV12, FMT_NV21, FMT_T64X32), ((1, 0, 0), (2, 1, 1))),
    **dict.fromkeys((FMT_UYVY, FMT_YUYV, FMT_RGB565, FMT_BGR565), ((2, 0, 0),)),
    **dict.fromkeys((FMT_RGB888, FMT_BGR888), ((3, 0, 0),)),
    **dict.fromkeys((FMT_RGBA8888, FMT_BGRA8888, FMT_ARGB8888), ((4, 0, 0),)),
}
_WORDS = (FMT_RGB565, FMT_BGR565)
_LARGEST = 2**31 - 1


class Error(ValueError):
    """What the library, or the check before the call, refused; `code` is the result of C."""

    def __init__(self, text, code=ERR_PARAM):
        super().__init__(text)
        self.code = code


class _Img(ctypes.Structure):
    _fields_ = [("width", ctypes.c_int32 * 4), ("height", ctypes.c_int32 * 4),
                ("stride", ctypes.c_int32 * 4), ("reserved0", ctypes.c_uint32 * 4),
                ("plane", ctypes.c_void_p * 4), ("reserved1", ctypes.c_uint32 * 4),
                ("format", ctypes.c_int32)]


def _load():
    named = os.environ.get("SIMGP_LIBRARY")
    if named:
        return ctypes.CDLL(named)
    here = os.path.dirname(os.path.abspath(__file__))
    tree = os.path.join(here, "..", "..", "..")  # of <tree>/share/simgp/python
    for pattern in (here, os.path.join(tree, "lib"), os.path.join(tree, "lib64"),
                    os.path.join(tree, "lib", "*")):
        for path in sorted(glob.glob(os.path.join(pattern, "libsimgp.so.1"))):
            return ctypes.CDLL(path)
    return ctypes.CDLL("libsimgp.so.1")


# The library itself, for the functions that are not here.
library = _load()
_img, _int = ctypes.POINTER(_Img), ctypes.c_int32
for _name, _result, _arguments in (
        ("cpy", _int, (_img, _img)), ("csc", _int, (_img, _img)),
        ("csc_any", _int, (_img, _img, _int)), ("csc_dither", _int, (_img, _img)),
        ("csc_rot", _int, (_img, _int, _img)), ("rot", _int, (_img, _int, _img)),
        ("rsz", _int, (_img, _img)), ("rsz_csc", _int, (_img, _img)),
        ("rsz_rot", _int, (_img, _int, _img)), ("dbf8x8_yuv", _int, (_img, ctypes.c_int16)),
        ("version", _int, ()), ("result_text", ctypes.c_char_p, (_int,)),
        ("format_name", ctypes.c_char_p, (_int,)), ("format_of_name", _int, (ctypes.c_char_p,)),
        ("get_tile_offset", _int, (_int, _int, _int, _int))):
    _function = getattr(library, "simgp_" + _name)
    _function.restype, _function.argtypes = _result, _arguments


def version():
    """The version of the library as three numbers."""
    number = library.simgp_version()
    return number >> 16, number >> 8 & 255, number & 255


def result_text(code):
    """What a result means."""
    return library.simgp_result_text(code).decode()


def format_name(code):
    """The name of a format, or None."""
    name = library.simgp_format_name(code)
    return name and name.decode()


def format_of_name(name):
    """The code of a format by one of its names, or -1."""
    return library.simgp_format_of_name(name.encode())


def get_tile_offset(width, height, x, y):
    """Where byte x of row y of a tiled plane of width bytes x height rows lies in it."""
    if not (0 < width <= _LARGEST and 0 < height <= _LARGEST and 0 <= x < width
            and 0 <= y < height and _tiled_bytes(width, height) <= _LARGEST):
        raise Error("there is no such byte in the plane")
    return library.simgp_get_tile_offset(width, height, x, y)


def _tiled_bytes(width, rows):
    tile_rows = (rows + 31) // 32
    return 8192 * ((width + 127) // 128 * (tile_rows // 2)
                   + (width + 255) // 256 * (tile_rows % 2))


class Picture:
    """A picture: `planes` are arrays over its memory, whichever it is.

    A plane of bytes is an array of height x width; one of pairs, of packed YUV and of RGB of 24 and
    32 bits has the bytes of a sample as a third dimension, in memory order; one of 16-bit RGB is an
    array of height x width little-endian words. Tiled planes are arrays of one dimension.

        Picture(format, width, height)                   new memory, filled with 0
        Picture(format, width, height, buffer)           bytes-like memory of raw frames, not copied
        Picture(format, width, height, [array, ...])     one array for each plane, not copied

    format is a name or a code. Arrays may lie apart, with gaps between lines and from bottom to
    top, but samples must follow each other in a line. Buffers and arrays that cannot be written may
    be sources."""

    def __init__(self, format, width, height, memory=None):
        code = format_of_name(format) if isinstance(format, str) else int(format)
        if code not in _PLANES:
            raise Error(f"unknown format {format!r}")
        width, height = int(width), int(height)
        if not 1 <= width <= _LARGEST // 4 or not 1 <= height <= _LARGEST:
            raise Error(f"impossible size {width} x {height}")
        self._format, self._width, self._height = code, width, height
        shapes = self._shapes()
        if isinstance(memory, (list, tuple)):
            if len(memory) != len(shapes):
                raise Error(f"{format_name(code)} has {len(shapes)} planes, not {len(memory)}")
            self._planes = tuple(self._taken(k, array, *shape)
                                 for k, (array, shape) in enumerate(zip(memory, shapes)))
            return
        sizes = [int(numpy.prod(shape, dtype=object)) * dtype.itemsize for shape, dtype in shapes]
        if memory is None:
            memory = numpy.zeros(sum(sizes), numpy.uint8)
        else:
            memory = numpy.frombuffer(memory, numpy.uint8)
        if memory.size < sum(sizes):
            raise Error(f"memory is too small for the picture: {memory.size} bytes of {sum(sizes)}")
        planes, start = [], 0
        for (shape, dtype), size in zip(shapes, sizes):
            planes.append(memory[start:start + size].view(dtype).reshape(shape))
            start += size
        self._planes = tuple(planes)

    format = property(lambda self: self._format, doc="the code of the format")
    width = property(lambda self: self._width, doc="in pixels")
    height = property(lambda self: self._height, doc="in pixels")
    planes = property(lambda self: self._planes, doc="an array for each plane")

    def _shapes(self):
        """Shape and type of each plane's array."""
        shapes = []
        for sample, x_shift, y_shift in _PLANES[self.format]:
            width = (self.width + x_shift) >> x_shift
            height = (self.height + y_shift) >> y_shift
            if self.format == FMT_T64X32:
                shape = (_tiled_bytes(self.width, self.height >> y_shift),)
            elif sample == 1 or self.format in _WORDS:
                shape = (height, width)
            else:
                shape = (height, width, sample)
            words = self.format in _WORDS
            shapes.append((shape, numpy.dtype("<u2" if words else numpy.uint8)))
        return shapes

    def _taken(self, k, array, shape, dtype):
        array = numpy.asarray(array)
        if array.dtype != dtype or array.shape != shape:
            raise Error(f"plane {k} is an array of {array.dtype} and shape {array.shape}, "
                        f"not of {dtype} and {shape}")
        inner, at_once = dtype.itemsize, array.ndim > 1
        for axis in range(array.ndim - 1, int(at_once) - 1, -1):
            if array.shape[axis] > 1 and array.strides[axis] != inner:
                raise Error(f"samples of plane {k} do not follow each other in a line")
            inner *= array.shape[axis]
        if at_once and array.shape[0] > 1:
            stride, sample = array.strides[0], _PLANES[self.format][k][0]
            if not inner <= abs(stride) <= _LARGEST:
                raise Error(f"stride of plane {k} is shorter than a line, or too long")
            if sample != 3 and stride % sample:
                raise Error(f"stride of plane {k} is no multiple of its samples")
        return array

    def _img(self):
        img = _Img(format=self.format)
        for k, (plane, (_, x_shift, y_shift)) in enumerate(zip(self.planes, _PLANES[self.format])):
            tiled = self.format == FMT_T64X32
            img.width[k] = (self.width + x_shift) >> x_shift
            img.height[k] = (self.height + (0 if tiled else y_shift)) >> y_shift
            img.stride[k] = plane.strides[0] if plane.ndim > 1 and plane.shape[0] > 1 else (
                plane.size * plane.itemsize if plane.ndim > 1 else 0)
            img.plane[k] = plane.ctypes.data
        return img

    def band(self, first, rows):
        """Rows first ... first + rows - 1 as a picture in the same memory. Both are even where
        lines share chroma, but for a band that ends with the picture. Not of tiled pictures."""
        step = 1 << _PLANES[self.format][-1][2]
        if self.format == FMT_T64X32:
            raise Error("tiled pictures have no bands here")
        if first < 0 or rows < 1 or first + rows > self.height:
            raise Error("the picture has no such rows")
        if first % step or (rows % step and first + rows != self.height):
            raise Error(f"rows of a band are multiples of {step}")
        return Picture(self.format, self.width, rows,
                       [plane[first >> y_shift:(first + rows + y_shift) >> y_shift]
                        for plane, (_, _, y_shift) in zip(self.planes, _PLANES[self.format])])

    def __repr__(self):
        return f"<simgp.Picture {format_name(self.format)} {self.width} x {self.height}>"


def _call(function, *arguments):
    code = function(*arguments)
    if code != OK:
        raise Error(result_text(code), code)


def _pair(src, dst, same_size=True, turned=False):
    """The descriptors of a source and a destination."""
    for plane in dst.planes:
        if not plane.flags.writeable:
            raise Error("the destination cannot be written")
    if same_size and (dst.width, dst.height) != ((src.height, src.width) if turned else
                                                 (src.width, src.height)):
        raise Error("the destination has not the size of the turned source" if turned else
                    "source and destination have different sizes")
    return src._img(), dst._img()


def _is_quarter(rot):
    # Other numbers, which ctypes would cut to 32 bits, get the answer of the library.
    if rot not in range(6):
        raise Error(result_text(ERR_UNSUPPORTED), ERR_UNSUPPORTED)
    return rot in (ROT_90L, ROT_90R)


def _check_turned(src, rot, dst):
    """A quarter turn makes 4:2:2 of one kind that of the other."""
    expected = src.format
    if _is_quarter(rot):
        expected = {FMT_YUV422N: FMT_YUV422W, FMT_YUV422W: FMT_YUV422N,
                    FMT_YV16: None}.get(expected, expected)
    if dst.format != expected:
        raise Error("the destination has not the format of the turned source")


def _overflows(src, dst):
    """That kernel makes one line of chroma more than the picture has (layout.h)."""
    return (src.format, dst.format) == (FMT_YUV420, FMT_YUV422N) and src.height % 2 == 1


def cpy(src, dst):
    s, d = _pair(src, dst)
    _call(library.simgp_cpy, s, d)


def csc(src, dst):
    s, d = _pair(src, dst)
    if _overflows(src, dst):
        raise Error("simgp_csc writes a line of chroma more at odd heights")
    _call(library.simgp_csc, s, d)


def csc_any(src, dst, colour=COLOUR_BT601):
    s, d = _pair(src, dst)
    # The flag asks for the rule of csc_any.h, by which nothing is averaged here.
    _call(library.simgp_csc_any, s, d, colour | CHROMA_MEAN if _overflows(src, dst) else colour)


def csc_dither(src, dst):
    s, d = _pair(src, dst)
    _call(library.simgp_csc_dither, s, d)


def csc_rot(src, rot, dst):
    s, d = _pair(src, dst, turned=_is_quarter(rot))
    _call(library.simgp_csc_rot, s, rot, d)


def rot(src, rot, dst):
    s, d = _pair(src, dst, turned=_is_quarter(rot))
    _check_turned(src, rot, dst)
    _call(library.simgp_rot, s, rot, d)


def rsz(src, dst):
    s, d = _pair(src, dst, same_size=False)
    _call(library.simgp_rsz, s, d)


def rsz_csc(src, dst):
    s, d = _pair(src, dst, same_size=False)
    _call(library.simgp_rsz_csc, s, d)


def rsz_rot(src, rot, dst):
    s, d = _pair(src, dst, same_size=False)
    if _is_quarter(rot) and (src.width, src.height) == (dst.height, dst.width):
        _check_turned(src, rot, dst)
    _call(library.simgp_rsz_rot, s, rot, d)


def dbf8x8_yuv(img, strength):
    if img.format == FMT_T64X32 or any(sample != 1 for sample, _, _ in _PLANES[img.format]):
        raise Error("deblocking takes planes of 8-bit samples", ERR_UNSUPPORTED)
    if not all(plane.flags.writeable for plane in img.planes):
        raise Error("the picture cannot be written")
    if not 0 <= strength <= 15:
        raise Error(result_text(ERR_PARAM))
    _call(library.simgp_dbf8x8_yuv, img._img(), strength)
