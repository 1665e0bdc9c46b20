"""Pictures for tests of programs: made by cjpeg, read back by djpeg, both independent of the library."""
import pathlib
import subprocess


def write_ppm(path, width, height, colour=None):
    """A PPM of one colour, or a gradient that differs in every corner."""
    rows = bytearray()
    for y in range(height):
        for x in range(width):
            rows += bytes(colour or (255 * x // width, 255 * y // height, 128))
    pathlib.Path(path).write_bytes(b"P6 %d %d 255\n" % (width, height) + rows)


def write_jpeg(path, width, height, colour=None, *options):
    ppm = pathlib.Path(path).with_suffix(".ppm")
    write_ppm(ppm, width, height, colour)
    subprocess.run(["cjpeg", "-quality", "95", *options, "-outfile", path, ppm], check=True)
    ppm.unlink()


class Picture:
    """A JPEG as djpeg sees it."""

    def __init__(self, jpeg):
        ppm = subprocess.run(["djpeg", "-pnm", "-rgb"], input=jpeg, capture_output=True, check=True)
        if ppm.stderr:
            raise ValueError(ppm.stderr.decode())
        _, size, _, self.pixels = ppm.stdout.split(b"\n", 3)
        self.width, self.height = map(int, size.split())

    def pixel(self, x, y):
        at = (y * self.width + x) * 3
        return tuple(self.pixels[at:at + 3])
