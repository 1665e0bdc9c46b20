"""pelo from the outside: what it prints and writes, what it refuses, and its exit codes."""
import json
import os
import shutil
import struct
import subprocess
import unittest

from tool_test import CANNOT_OPEN, REFUSED, USAGE, WRITE_FAILURE, Pixmap, ToolTest, pictures


class PeloTest(ToolTest):
    def setUp(self):
        super().setUp()
        self.photo = self.picture("photo", 160, 120)

    def pelo(self, *arguments, **options):
        return self.run_tool("PELO", *arguments, **options)

    def decode(self, *arguments, **options):
        return Pixmap(self.pelo("decode", *arguments, **options))

    def info(self, picture):
        return json.loads(self.pelo("info", "--json", picture))

    def exiftool(self, *arguments):
        done = subprocess.run(["exiftool", *map(str, arguments)], capture_output=True)
        self.assertEqual(done.returncode, 0, done.stderr.decode())
        return done.stdout

    # ---- info ----

    def test_info_of_each_kind(self):
        progressive = self.picture("progressive", 70, 50, None, "-progressive")
        gif = self.folder / "two.gif"
        frame = b"\x2c" + struct.pack("<4HB", 0, 0, 1, 1, 0) + b"\x02\x02\x44\x01\x00"
        gif.write_bytes(b"GIF89a" + struct.pack("<2H3B", 3, 2, 0, 0, 0) + frame * 2 + b";")
        expected = {self.photo: ("JPEG", 160, 120, 1, False), progressive: ("JPEG", 70, 50, 1, True),
                    gif: ("animated GIF", 3, 2, 2, False)}
        for path, (name, width, height, frames, is_progressive) in expected.items():
            self.assertEqual(self.info(path), {
                "picture": str(path), "format": name, "width": width, "height": height, "frames": frames,
                "bytes": path.stat().st_size, "progressive": is_progressive, "thumbnail": None, "exif": None})
            self.assertIn(f"{name}, {width}x{height}, {frames} frame", self.pelo("info", path).decode())
        self.assertEqual(json.loads(self.pelo("info", "--json", "-", input=self.photo.read_bytes()))["width"], 160)

    # ---- EXIF, compared with exiftool as writer and as reader ----

    PLAIN = {"orientation": "Orientation", "isoSpeed": "ISO", "flash": "Flash", "colourSpace": "ColorSpace",
             "exposureMode": "ExposureMode", "whiteBalance": "WhiteBalance", "pixelXDimension": "ExifImageWidth",
             "pixelYDimension": "ExifImageHeight", "resolutionUnit": "ResolutionUnit",
             "ycbcrPositioning": "YCbCrPositioning", "make": "Make", "model": "Model", "software": "Software",
             "rights": "Copyright", "captureTime": "DateTimeOriginal", "digitizingTime": "CreateDate"}
    RATIONALS = {"exposureTime": "ExposureTime", "fNumber": "FNumber", "exposureBias": "ExposureCompensation",
                 "focalLength": "FocalLength", "digitalZoom": "DigitalZoomRatio", "xResolution": "XResolution",
                 "yResolution": "YResolution"}

    def write_exif(self, order, path):
        thumbnail = self.picture("thumbnail", 64, 48, (200, 30, 30))
        pictures.write_jpeg(path, 160, 120, (30, 30, 200))
        self.exiftool(
            "-q", "-overwrite_original", f"-ExifByteOrder={order}", "-n", "-Make=Mak", "-Model=A model, 7 words",
            "-Orientation=8", "-Software=firm 1.2", "-Copyright=\u00a9 someone", "-XResolution=300", "-YResolution=72.5",
            "-ResolutionUnit=3", "-YCbCrPositioning=2", "-ExposureTime=0.0125", "-FNumber=2.8", "-ISO=1600",
            "-DateTimeOriginal=2021:02:03 04:05:06", "-CreateDate=2020:01:02 03:04:05", "-ShutterSpeedValue=0.0125",
            "-ExposureCompensation=-0.6666666667", "-EXIF:Flash=16", "-FocalLength=4.15", "-ColorSpace=1",
            "-ExifImageWidth=7000", "-ExifImageHeight=120", "-ExposureMode=1", "-WhiteBalance=1",
            "-DigitalZoomRatio=1.5", "-GPSLatitude=12.3456789", "-GPSLatitudeRef=S", "-GPSLongitude=98.7654321",
            "-GPSLongitudeRef=E", "-GPSAltitude=432.1", "-GPSAltitudeRef=1", "-GPSTimeStamp=09:08:07",
            "-GPSDateStamp=2021:02:03", "-GPSMapDatum=WGS-84", "-GPSProcessingMethod=CELLID",
            f"-ThumbnailImage<={thumbnail}", path)
        return thumbnail

    def test_exif_agrees_with_exiftool_in_both_byte_orders(self):
        for order in ("II", "MM"):
            with self.subTest(order=order):
                path = self.folder / f"{order}.jpg"
                thumbnail = self.write_exif(order, path).read_bytes()
                self.assertIn(b"Exif\0\0" + order.encode(), path.read_bytes()[:64])
                theirs, = json.loads(self.exiftool("-j", "-n", path))
                ours = json.loads(self.pelo("exif", "--json", path))
                for name, tag in self.PLAIN.items():
                    self.assertEqual(ours[name], theirs[tag], name)
                self.assertEqual(ours["exifVersion"], f"{theirs['ExifVersion']:04}")  # a number to exiftool
                for name, tag in self.RATIONALS.items():
                    numerator, denominator = ours[name]
                    self.assertAlmostEqual(numerator / denominator, theirs[tag], 6, name)
                # exiftool gives seconds, the field holds the exponent.
                numerator, denominator = ours["shutterSpeed"]
                self.assertAlmostEqual(2 ** -(numerator / denominator), theirs["ShutterSpeedValue"], 6)

                gps = ours["gps"]
                for name in ("Latitude", "Longitude", "Altitude"):
                    self.assertAlmostEqual(gps[name.lower()], theirs["GPS" + name], 6)
                for name, tag in {"time": "GPSTimeStamp", "date": "GPSDateStamp", "datum": "GPSMapDatum",
                                  "method": "GPSProcessingMethod"}.items():
                    self.assertEqual(gps[name], theirs[tag], name)
                self.assertEqual(gps["version"].replace(".", " "), theirs["GPSVersionID"])

                stored = ours["thumbnail"]
                self.assertEqual((stored["offset"], stored["bytes"]),
                                 (theirs["ThumbnailOffset"], theirs["ThumbnailLength"]))
                self.assertEqual((stored["width"], stored["height"], stored["compression"]), (64, 48, 6))
                self.assertEqual(path.read_bytes()[stored["offset"]:][:stored["bytes"]], thumbnail)
                self.assertEqual(self.info(path)["exif"], ours)

    def test_exif_as_text(self):
        path = self.picture("text", 8, 8)
        self.exiftool("-q", "-overwrite_original", "-n", "-Make=tab\tbell\a", "-ExposureTime=0.008", path)
        lines = dict(line.split(None, 1) for line in self.pelo("exif", path).decode().splitlines())
        self.assertEqual((lines["make"], lines["exposureTime"]), ("tab?bell?", "1/125"))
        self.pelo("exif", self.photo, expect=REFUSED)

    # ---- decode ----

    def test_decode_agrees_with_djpeg(self):
        expected = pictures.Picture(self.photo.read_bytes())
        for source, options in ((self.photo, {}), ("-", {"input": self.photo.read_bytes()})):
            picture = self.decode(source, "-", **options)
            self.assertEqual(picture.size(), (160, 120))
            self.assert_close(picture.pixels, expected.pixels, 12)
        grey = self.decode(self.photo, "-", "--pgm")
        red, green, blue = picture.pixel(150, 20)
        self.assertAlmostEqual(grey.pixel(150, 20)[0], 0.299 * red + 0.587 * green + 0.114 * blue, delta=0.51)
        file = self.folder / "out.ppm"
        self.pelo("decode", self.photo, file)
        self.assertEqual(Pixmap(file.read_bytes()).pixels, picture.pixels)

    def test_bitmaps_and_gifs_of_djpeg(self):
        """An independent program's files, of 24 bits and with palettes, pixel for pixel."""
        file = self.folder / "picture"
        for options in (("-bmp",), ("-bmp", "-colors", "16"), ("-bmp", "-grayscale"),
                        ("-gif", "-colors", "64")):
            expected = [o for o in options if o[1:] not in ("bmp", "gif")]
            pnm = subprocess.run(["djpeg", "-pnm", "-rgb", *expected, self.photo], capture_output=True, check=True)
            file.write_bytes(subprocess.run(["djpeg", *options, self.photo], capture_output=True, check=True).stdout)
            want, got = Pixmap(pnm.stdout), self.decode(file, "-")
            pixels = want.pixels if want.channels == 3 else bytes(v for v in want.pixels for _ in range(3))
            self.assertEqual(got.pixels, pixels, options)

    def test_sizes_and_fits(self):
        for options, expected in ((("80x80",), (80, 60)), (("1000x1000",), (160, 120)),
                                  (("50x70", "--rotate", 90), (50, 66)), (("90x50", "--fit", "pad"), (90, 50))):
            self.assertEqual(self.decode(self.photo, "-", "--size", *options).size(), expected)
        padded = self.decode(self.photo, "-", "--size", "100x60", "--fit", "pad")
        self.assertEqual(padded.pixel(5, 30), (0, 0, 0))
        self.assertGreater(padded.pixel(50, 30)[2], 100)
        # Red grows to the right, green downwards.
        filled = self.decode(self.photo, "-", "--size", "60x60", "--fit", "fill")
        self.assertGreater(filled.pixel(1, 30)[0], 25)
        stretched = self.decode(self.photo, "-", "--size", "60x60", "--fit", "stretch")
        self.assertLess(stretched.pixel(1, 30)[0], 15)

    def test_rotation_and_modes(self):
        red_corner = {0: (155, 5), 90: (115, 155), 180: (5, 115), 270: (5, 5)}
        for degrees, (x, y) in red_corner.items():
            picture = self.decode(self.photo, "-", "--rotate", degrees)
            self.assertEqual(picture.size(), (160, 120) if degrees % 180 == 0 else (120, 160))
            red, green, _ = picture.pixel(x, y)
            self.assertTrue(red > 230 and green < 30, (degrees, red, green))
        exact = self.decode(self.photo, "-").pixels
        for mode in range(5):
            picture = self.decode(self.photo, "-", "--mode", mode)
            self.assertEqual(picture.size(), (160, 120))
            self.assert_close(picture.pixels, exact, 30)
        self.assertNotEqual(picture.pixels, exact)

    def test_raw_formats(self):
        rgb = self.pelo("decode", self.photo, "-", "--raw", "rgb")
        self.assertEqual(rgb, self.decode(self.photo, "-").pixels)
        pixels = [rgb[i:i + 3] for i in range(0, len(rgb), 3)]
        layouts = {"argb": lambda p: b"\xff" + p, "rgba": lambda p: p + b"\xff", "bgra": lambda p: p[::-1] + b"\xff",
                   "rgb565": lambda p: struct.pack("<H", p[0] >> 3 << 11 | p[1] >> 2 << 5 | p[2] >> 3)}
        for name, layout in layouts.items():
            self.assertEqual(self.pelo("decode", self.photo, "-", "--raw", name), b"".join(map(layout, pixels)))
        self.assertEqual(len(self.pelo("decode", self.photo, "-", "--raw", "yuv420", "--size", "33x21", "--fit", "stretch")),
                         33 * 21 + 2 * 17 * 11)
        self.pelo("decode", self.photo, "-", "--raw", "yuv420", "--rotate", "90", expect=USAGE)

    def test_embedded_thumbnails(self):
        path = self.folder / "both.jpg"
        self.write_exif("MM", path)  # a blue picture with a red thumbnail

        for size, use, red in (("60x45", "never", False), ("60x45", "enough", True), ("80x60", "enough", False),
                               ("80x60", "any", True)):
            pixel = self.decode(path, "-", "--size", size, "--thumbnail", use).pixel(20, 15)
            self.assertEqual(pixel[0] > pixel[2], red, (size, use))

    # ---- encode ----

    def test_encode(self):
        ppm = self.folder / "in.ppm"
        pictures.write_ppm(ppm, 48, 36)
        sizes = []
        for quality in (20, 60, 95):
            jpeg = self.pelo("encode", ppm, "-", "--quality", quality)
            seen = pictures.Picture(jpeg)
            self.assertEqual((seen.width, seen.height), (48, 36))
            sizes.append(len(jpeg))
        self.assertEqual(sizes, sorted(sizes))
        self.assertLess(max(abs(a - b) for a, b in zip(seen.pixel(40, 30), (212, 212, 128))), 10)
        output = self.folder / "out.jpg"
        self.pelo("encode", "-", output, input=b"P5 # a comment\n3\t2 # another\n100\n" + bytes([0, 50, 100] * 2))
        grey = self.decode(output, "-", "--pgm")
        self.assert_close(grey.pixels, bytes([0, 128, 255] * 2), 25)

    def test_what_encode_refuses(self):
        for bad in (b"", b"P6", b"P3 1 1 255 0 0 0", b"P6 0 1 255 ", b"P6 2 1 255\n12345", b"P6 1 1 65535 abcdef",
                    b"P6 1 1 0 abc", b"P6 99999999999 1 255 a", b"P6 1 1 255", self.photo.read_bytes()):
            self.pelo("encode", "-", self.folder / "no.jpg", input=bad, expect=REFUSED)
        self.pelo("encode", "-", self.folder / "no.jpg", input=b"P5 5000 1 255\n" + bytes(5000), expect=REFUSED)
        self.assertFalse((self.folder / "no.jpg").exists())

    # ---- manners ----

    def test_rotate(self):
        pictures.write_jpeg(self.photo, 160, 128)
        turned = self.folder / "turned.jpg"
        for angle, flip in ((90, False), (180, False), (270, False), (0, True), (90, True)):
            self.pelo("rotate", self.photo, turned, "--angle", angle, *(["--flip"] if flip else []))
            options = [] if angle == 0 else ["--rotate", angle]
            source = self.photo
            if flip:  # mirrored by an independent program
                source = self.folder / "mirrored.jpg"
                subprocess.run(["jpegtran", "-flip", "horizontal", "-outfile", source, self.photo], check=True)
            expected = self.decode(source, "-", *options)
            got = self.decode(turned, "-")
            self.assertEqual(got.size(), expected.size())
            self.assert_close(got.pixels, expected.pixels, 12)

    def test_rotate_follows_the_orientation_tag(self):
        pictures.write_jpeg(self.photo, 160, 128)
        upright = self.folder / "upright.jpg"
        self.pelo("rotate", self.photo, upright)  # no tag: copied
        self.assertEqual(upright.read_bytes(), self.photo.read_bytes())
        inverse = {2: ("-flip", "horizontal"), 3: ("-rotate", "180"), 4: ("-flip", "vertical"), 5: ("-transpose",),
                   6: ("-rotate", "90"), 7: ("-transverse",), 8: ("-rotate", "270")}
        for orientation, options in inverse.items():
            tagged, expected = self.folder / "tagged.jpg", self.folder / "expected.jpg"
            shutil.copy(self.photo, tagged)
            self.exiftool("-overwrite_original", f"-Orientation#={orientation}", tagged)
            subprocess.run(["jpegtran", *options, "-copy", "none", "-outfile", expected, self.photo], check=True)
            self.pelo("rotate", tagged, upright)
            self.assertEqual(self.decode(upright, "-").pixels, self.decode(expected, "-").pixels, orientation)

    def test_what_rotate_refuses(self):
        pictures.write_jpeg(self.photo, 32, 32, None, "-progressive")
        self.pelo("rotate", self.photo, "-", "--angle", 90, expect=REFUSED)
        self.pelo("rotate", __file__, "-", expect=REFUSED)
        self.pelo("rotate", self.photo, "-", "--angle", 45, expect=USAGE)

    def test_shrink(self):
        small = self.folder / "small.jpg"
        for limit in (6000, 2000, 1000):
            self.pelo("shrink", self.photo, small, "--max-bytes", limit)
            self.assertEqual(self.info(small)["format"], "JPEG")
            self.assertLessEqual(small.stat().st_size, limit)
        self.pelo("shrink", self.photo, small, "--max-bytes", 100, expect=REFUSED)
        self.pelo("shrink", self.photo, small, expect=USAGE)

    def test_files_that_cannot_be_used(self):
        text = self.folder / "text.jpg"
        text.write_text("not a picture")
        empty = self.folder / "empty.jpg"
        empty.touch()
        pipe = self.folder / "pipe"
        os.mkfifo(pipe)
        for command, rest in (("info", ()), ("exif", ()), ("decode", ("-",))):
            self.pelo(command, self.folder / "absent.jpg", *rest, expect=CANNOT_OPEN)
            self.pelo(command, self.folder, *rest, expect=CANNOT_OPEN)
            self.pelo(command, empty, *rest, expect=CANNOT_OPEN)
            self.pelo(command, pipe, *rest, expect=CANNOT_OPEN)
            self.pelo(command, text, *rest, expect=REFUSED)
        for path in (self.folder / "absent.ppm", "/dev/zero"):
            self.pelo("encode", path, "-", expect=CANNOT_OPEN)
        headless = self.folder / "headless.jpg"
        headless.write_bytes(self.photo.read_bytes().replace(b"\xff\xc4", b"\xff\xfe"))  # no Huffman tables
        self.pelo("decode", headless, "-", expect=REFUSED)
        self.assertIn(b"TavirPelo", subprocess.run([os.environ["PELO"], "--log", "decode", headless, "-"],
                                                   capture_output=True).stderr)

    def test_full_disks(self):
        self.pelo("decode", self.photo, "/dev/full", expect=WRITE_FAILURE)
        self.pelo("decode", self.photo, self.folder / "missing" / "out.ppm", expect=WRITE_FAILURE)
        with open("/dev/full", "wb") as full:
            for command in (("info", self.photo), ("decode", self.photo, "-")):
                self.pelo(*command, expect=WRITE_FAILURE, stdout=full)

    def test_help_version_and_usage(self):
        self.assertIn(b"Exit codes", self.pelo("--help"))
        self.assertRegex(self.pelo("--version"), rb"^pelo \d+\.\d+\.\d+\n$")
        for wrong in ((), ("paint",), ("info",), ("decode", self.photo), ("decode", self.photo, "-", "--size", "0x5"),
                      ("decode", self.photo, "-", "--rotate", "45"), ("decode", self.photo, "-", "--mode", "5"),
                      ("decode", self.photo, "-", "--fit", "loose"), ("encode", self.photo, "-", "--quality", "0"),
                      ("decode", self.photo, "-", "--pgm", "--raw", "rgb")):
            self.pelo(*wrong, expect=USAGE)


if __name__ == "__main__":
    unittest.main()
