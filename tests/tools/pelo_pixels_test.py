"""pelo's work on pixels: crop, scale, yuv2rgb and the views of zoom."""
import unittest

from tool_test import REFUSED, USAGE, Pixmap, ToolTest


def pixmap(width, height, pixel):
    body = bytes(channel for y in range(height) for x in range(width) for channel in pixel(x, y))
    return f"P6\n{width} {height}\n255\n".encode() + body


class PeloPixelsTest(ToolTest):
    def setUp(self):
        super().setUp()
        self.photo = self.picture("photo", 160, 120)

    def pelo(self, *arguments, **options):
        return self.run_tool("PELO", *arguments, **options)

    def pixels(self, *arguments, **options):
        seen = Pixmap(self.pelo(*arguments, **options))
        return *seen.size(), seen.pixels

    def test_crop_is_the_part_of_the_decoded_picture(self):
        width, height, whole = self.pixels("decode", self.photo, "-")
        size = self.pixels("crop", self.photo, "-", "--part", "30,20,64,48")
        self.assertEqual(size[:2], (64, 48))
        part = b"".join(whole[(y * width + 30) * 3:(y * width + 94) * 3] for y in range(20, 68))
        self.assert_close(part, size[2], 8)  # 5 and 6 bits a channel
        padded = self.pixels("crop", self.photo, "-", "--part", "30,20,64,48", "--size", "32x48")
        self.assertEqual(padded[2][:32 * 3 * 12], bytes(32 * 3 * 12))  # centred on black
        self.pelo("crop", self.photo, "-", "--part", "100,20,64,48", expect=REFUSED)
        self.pelo("crop", self.photo, "-", "--part", "1,2,3", expect=USAGE)

    def test_scale(self):
        picture = pixmap(4, 2, lambda x, y: (60 * x, 100 * y, 7))
        self.assertEqual(self.pixels("scale", "-", "-", "--size", "2x1", input=picture),
                         (2, 1, bytes((30, 50, 7, 150, 50, 7))))
        self.assertEqual(self.pixels("scale", "-", "-", "--size", "2x1", "--nearest", input=picture),
                         (2, 1, bytes((60, 100, 7, 180, 100, 7))))
        self.pelo("scale", self.photo, "-", "--size", "2x1", expect=REFUSED)

    def test_frames(self):
        grey = bytes(range(100, 115)) + bytes([127] * 6 + [127] * 6)  # 5 x 3
        for layout in ([], ["--pairs"]):
            width, height, pixels = self.pixels("yuv2rgb", "-", "-", "--size", "5x3", *layout, input=grey)
            self.assertEqual((width, height), (5, 3))
            self.assert_close(pixels[:3], (100, 100, 100), 8)
        self.pelo("yuv2rgb", "-", "-", "--size", "5x4", input=grey, expect=REFUSED)

    def test_zoom_writes_every_view(self):
        lines = self.pelo("zoom", self.photo, "-d", "80x80", "-o", "v", "in", "pan", "10,5", "left", "ratio", "200",
                          "jump", "1,0,0").decode().splitlines()
        self.assertEqual(lines, [
            "v000.ppm: start, 100 percent at 0,0",
            "v001.ppm: in, 120 percent at 8,0",
            "v002.ppm: pan, 120 percent at 10,0",
            "v003.ppm: left, 120 percent at 0,0, limit",
            "v004.ppm: ratio, 200 percent at 32,20",
            "v005.ppm: jump, 120 percent at 0,0"])
        whole = self.pixels("decode", self.photo, "-")[2]
        view = Pixmap((self.folder / "v004.ppm").read_bytes())  # the picture at its own size
        rows = b"".join(whole[((20 + y) * 160 + 32) * 3:((20 + y) * 160 + 112) * 3] for y in range(80))
        self.assertEqual((view.size(), view.pixels), ((80, 80), rows))

    def test_zoom_refuses(self):
        for words in (["over"], ["pan", "3"], ["jump", "1,2"], ["ratio"]):
            self.assertEqual(b"", self.pelo("zoom", self.photo, "-d", "8x8", *words, expect=USAGE))
        self.pelo("zoom", self.photo, "in", expect=USAGE)
        (self.folder / "no.jpg").write_bytes(pixmap(1, 1, lambda x, y: (1, 2, 3)))
        self.pelo("zoom", "no.jpg", "-d", "8x8", expect=REFUSED)


if __name__ == "__main__":
    unittest.main()
