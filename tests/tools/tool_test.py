"""What the tests of the tools share: a folder of their own, and programs whose exit codes are checked."""
import os
import pathlib
import shutil
import subprocess
import sys
import tempfile
import unittest

sys.path.insert(0, str(pathlib.Path(__file__).parents[1] / "support"))
import pictures  # noqa: E402

DONE, USAGE, CANNOT_OPEN, REFUSED, WRITE_FAILURE = 0, 2, 3, 4, 5


class Pixmap:
    """A binary PPM or PGM file."""

    def __init__(self, data):
        magic, size, maximum, self.pixels = data.split(b"\n", 3)
        self.width, self.height = map(int, size.split())
        self.channels = {b"P5": 1, b"P6": 3}[magic]
        assert maximum == b"255" and len(self.pixels) == self.width * self.height * self.channels

    def pixel(self, x, y):
        at = (y * self.width + x) * self.channels
        return tuple(self.pixels[at:at + self.channels])

    def size(self):
        return self.width, self.height


class ToolTest(unittest.TestCase):
    def setUp(self):
        self.folder = pathlib.Path(tempfile.mkdtemp())
        self.addCleanup(shutil.rmtree, self.folder)

    def picture(self, name, *style):
        path = self.folder / f"{name}.jpg"
        pictures.write_jpeg(path, *style)
        return path

    def run_tool(self, tool, *arguments, expect=DONE, **options):
        """Its standard output. A message exactly when something is wrong."""
        done = subprocess.run([os.environ[tool], *map(str, arguments)], cwd=self.folder, stderr=subprocess.PIPE,
                              stdout=options.pop("stdout", subprocess.PIPE), **options)
        self.assertEqual(done.returncode, expect, f"{arguments}\n{done.stderr.decode()}")
        self.assertEqual(bool(done.stderr), expect != DONE, done.stderr.decode())
        return done.stdout

    def assert_close(self, a, b, limit):
        self.assertLessEqual(max(abs(x - y) for x, y in zip(a, b, strict=True)), limit)
