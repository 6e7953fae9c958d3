"""The Python interface, against results worked out by numpy."""

import sys
import threading
import unittest

try:
    import numpy
except ImportError:
    print("numpy is missing (Debian: python3-numpy).")
    sys.exit(77)

sys.dont_write_bytecode = True
sys.path.insert(0, sys.argv.pop(1))
import simgp  # noqa: E402

NAMES = ("yuv400 yuv420 yuv422n yuv444 yv12 yv16 nv12 nv21 yuv422w t64x32 uyvy yuyv rgb565 bgr565 "
         "rgb888 bgr888 rgba8888 bgra8888 argb8888").split()
random = numpy.random.default_rng(1)


def noise(name, width, height):
    picture = simgp.Picture(name, width, height)
    for plane in picture.planes:
        plane[...] = random.integers(0, 65536 if plane.itemsize == 2 else 256, plane.shape)
    return picture


def framed(name, width, height):
    """A picture in the middle of memory of a pattern, and what is around it."""
    inner = simgp.Picture(name, width, height)
    size = sum(plane.nbytes for plane in inner.planes)
    memory = numpy.full(size + 256, 0x5A, numpy.uint8)
    return simgp.Picture(name, width, height, memory[128:-128]), memory


class Python(unittest.TestCase):
    def test_names(self):
        self.assertEqual(simgp.version()[0], 1)
        self.assertEqual(simgp.format_name(simgp.FMT_NV12), "nv12")
        self.assertIsNone(simgp.format_name(9))
        self.assertEqual(simgp.format_of_name("I420"), simgp.FMT_YUV420)
        self.assertEqual(simgp.format_of_name("none"), -1)
        self.assertEqual(simgp.result_text(0), "success")
        for name in NAMES:
            code = simgp.format_of_name(name)
            self.assertEqual(getattr(simgp, "FMT_" + name.upper()), code)
            self.assertIn(code, simgp._PLANES)
        self.assertEqual(len(simgp._PLANES), len(NAMES))

    def test_layouts_of_yuv(self):
        """From 4:4:4, chroma of every format is that of the top left pixel."""
        width, height = 7, 5
        source = noise("yuv444", width, height)
        y, u, v = source.planes
        by_two = numpy.stack((u[::2, ::2], v[::2, ::2]), axis=2)
        expected = {
            "yuv400": [y], "yuv444": [y, u, v], "yuv420": [y, u[::2, ::2], v[::2, ::2]],
            "yv12": [y, v[::2, ::2], u[::2, ::2]], "yuv422n": [y, u[:, ::2], v[:, ::2]],
            "yv16": [y, v[:, ::2], u[:, ::2]], "yuv422w": [y, u[::2], v[::2]],
            "nv12": [y, by_two], "nv21": [y, by_two[:, :, ::-1]],
        }
        for name, planes in expected.items():
            target = simgp.Picture(name, width, height)
            simgp.csc_any(source, target, simgp.COLOUR_BT709)
            for got, right in zip(target.planes, planes, strict=True):
                numpy.testing.assert_array_equal(got, right, name)
        for name, luma in (("uyvy", 1), ("yuyv", 0)):
            target = simgp.Picture(name, width - 1, height)
            simgp.csc_any(simgp.Picture("yuv444", width - 1, height, [p[:, :-1] for p in source.planes]),
                          target, simgp.COLOUR_BT709)
            packed = target.planes[0]
            numpy.testing.assert_array_equal(packed[:, :, luma], y[:, :-1])
            numpy.testing.assert_array_equal(packed[:, ::2, 1 - luma], u[:, :-1:2])
            numpy.testing.assert_array_equal(packed[:, 1::2, 1 - luma], v[:, :-1:2])

    def test_layouts_of_rgb(self):
        source = noise("rgb888", 6, 4)
        r, g, b = (source.planes[0][:, :, c].astype(numpy.uint16) for c in range(3))
        a = numpy.full_like(r, 255)
        for name, order in (("bgr888", (b, g, r)), ("rgba8888", (r, g, b, a)),
                            ("bgra8888", (b, g, r, a)), ("argb8888", (a, r, g, b))):
            target = simgp.Picture(name, 6, 4)
            simgp.csc_any(source, target)
            numpy.testing.assert_array_equal(target.planes[0], numpy.stack(order, axis=2), name)
        for name, high, low in (("rgb565", r, b), ("bgr565", b, r)):
            target = simgp.Picture(name, 6, 4)
            simgp.csc_any(source, target)
            numpy.testing.assert_array_equal(target.planes[0],
                                             high >> 3 << 11 | g >> 2 << 5 | low >> 3, name)

    def test_tiles(self):
        source = noise("nv12", 100, 70)
        tiled = simgp.Picture("t64x32", 100, 70)
        simgp.csc_any(source, tiled)
        for x, y in ((0, 0), (99, 0), (64, 33), (99, 69)):
            at = simgp.get_tile_offset(100, 70, x, y)
            self.assertEqual(tiled.planes[0][at], source.planes[0][y, x])
        with self.assertRaises(simgp.Error):
            simgp.get_tile_offset(100, 70, 100, 0)

    def test_calls_stay_inside_the_arrays(self):
        done = 0
        for name in NAMES:
            for other in NAMES:
                for width, height in ((1, 1), (5, 3), (8, 6), (67, 35)):
                    source = noise(name, width, height)
                    jobs = [(simgp.csc, ()), (simgp.csc_any, ()), (simgp.csc_any, (259,)),
                            (simgp.csc_dither, ()), (simgp.cpy, ()), (simgp.rsz, ()),
                            (simgp.rsz_csc, ())]
                    jobs += [(f, code) for f in (simgp.rot, simgp.csc_rot, simgp.rsz_rot)
                             for code in (simgp.ROT_90L, simgp.ROT_VERT)]
                    for function, more in jobs:
                        turned = more == simgp.ROT_90L
                        target, memory = framed(other, *((height, width) if turned else
                                                         (width, height)))
                        try:
                            if isinstance(more, int):
                                function(source, more, target)
                            else:
                                function(source, target, *more)
                            done += 1
                        except simgp.Error:
                            pass
                        self.assertTrue((memory[:128] == 0x5A).all(), (function, name, other))
                        self.assertTrue((memory[-128:] == 0x5A).all(), (function, name, other))
        self.assertGreater(done, 3000)

    def test_arrays_are_not_copied(self):
        whole = numpy.zeros((10, 20), numpy.uint8)
        window = whole[8:2:-2, 4:9]  # every other line, from bottom to top
        source = noise("yuv400", 5, 3)
        simgp.cpy(source, simgp.Picture("yuv400", 5, 3, [window]))
        numpy.testing.assert_array_equal(whole[8:2:-2, 4:9], source.planes[0])
        self.assertEqual(numpy.count_nonzero(whole), numpy.count_nonzero(source.planes[0]))
        frozen = simgp.Picture("nv12", 2, 2, bytes(range(6)))
        target = simgp.Picture("yuv420", 2, 2)
        simgp.csc(frozen, target)
        self.assertEqual([p.tolist() for p in target.planes], [[[0, 1], [2, 3]], [[4]], [[5]]])
        with self.assertRaisesRegex(simgp.Error, "cannot be written"):
            simgp.csc(target, frozen)

    def test_turns_sizes_and_blocks(self):
        source = noise("nv21", 6, 4)
        target = simgp.Picture("nv21", 4, 6)
        simgp.rot(source, simgp.ROT_90R, target)
        for got, plane in zip(target.planes, source.planes):
            numpy.testing.assert_array_equal(got, numpy.rot90(plane, -1))
        flat = simgp.Picture("rgb888", 30, 20)
        flat.planes[0][...] = (10, 20, 30)
        half = simgp.Picture("rgb888", 15, 10)
        simgp.rsz(flat, half)
        self.assertTrue((half.planes[0] == (10, 20, 30)).all())
        blocks = simgp.Picture("yuv400", 16, 16)
        blocks.planes[0][:8], blocks.planes[0][8:] = 100, 112
        simgp.dbf8x8_yuv(blocks, 4)
        self.assertEqual(blocks.planes[0][6:10, 0].tolist(), [102, 104, 108, 110])

    def test_threads_share_a_conversion(self):
        source = noise("nv12", 130, 97)
        whole, joined = (simgp.Picture("bgra8888", 130, 97) for _ in range(2))
        simgp.csc_any(source, whole)
        bands = [(0, 40), (40, 30), (70, 27)]
        threads = [threading.Thread(target=lambda b: simgp.csc_any(source.band(*b), joined.band(*b)),
                                    args=(b,)) for b in bands]
        for thread in threads:
            thread.start()
        for thread in threads:
            thread.join()
        numpy.testing.assert_array_equal(joined.planes[0], whole.planes[0])

    def test_refused(self):
        nv12, rgb = simgp.Picture("nv12", 6, 3), simgp.Picture("rgb565", 6, 3)
        luma, chroma = nv12.planes
        wide = numpy.zeros((3, 13), numpy.uint8)
        for text, call in (
                ("unknown format 'none'", lambda: simgp.Picture("none", 1, 1)),
                ("unknown format 9", lambda: simgp.Picture(9, 1, 1)),
                ("impossible size 0 x 3", lambda: simgp.Picture("nv12", 0, 3)),
                ("too small for the picture: 5 bytes of 6",
                 lambda: simgp.Picture("nv12", 2, 2, bytes(5))),
                ("has 2 planes, not 1", lambda: simgp.Picture("nv12", 6, 3, [luma])),
                ("plane 1 is an array", lambda: simgp.Picture("nv12", 6, 3, [luma, chroma[:1]])),
                ("plane 0 is an array",
                 lambda: simgp.Picture("nv12", 6, 3, [luma.astype(int), chroma])),
                ("samples of plane 0 do not follow",
                 lambda: simgp.Picture("yuv400", 6, 3, [wide[:, :12:2]])),
                ("stride of plane 0 is shorter",
                 lambda: simgp.Picture("yuv400", 6, 3, [numpy.broadcast_to(luma[0], (3, 6))])),
                ("no multiple of its samples",
                 lambda: simgp.Picture("uyvy", 6, 3, [numpy.lib.stride_tricks.as_strided(
                     wide, (3, 6, 2), (13, 2, 1))])),
                ("different sizes", lambda: simgp.csc(nv12, simgp.Picture("rgb565", 6, 4))),
                ("size of the turned", lambda: simgp.rot(nv12, simgp.ROT_90L, nv12)),
                ("format of the turned", lambda: simgp.rot(nv12, simgp.ROT_180, rgb)),
                (simgp.result_text(-3), lambda: simgp.rot(nv12, 2**32 + 1, nv12)),
                ("no such rows", lambda: nv12.band(2, 2)),
                ("multiples of 2", lambda: nv12.band(1, 2)),
                (simgp.result_text(-1), lambda: simgp.csc(rgb, simgp.Picture("rgb565", 6, 3))),
                (simgp.result_text(-1), lambda: simgp.csc_any(rgb, nv12, 99)),
                ("8-bit samples", lambda: simgp.dbf8x8_yuv(nv12, 4))):
            with self.assertRaisesRegex(simgp.Error, text):
                call()
        with self.assertRaises(simgp.Error) as refused:
            simgp.csc_dither(rgb, nv12)
        self.assertEqual(refused.exception.code, simgp.ERR_UNSUPPORTED)
        self.assertEqual(str(refused.exception), simgp.result_text(simgp.ERR_UNSUPPORTED))


if __name__ == "__main__":
    unittest.main()
