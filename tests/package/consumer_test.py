"""Builds the examples against an installed tree, by its CMake package or by pkg-config, and runs them."""
import argparse
import os
import pathlib
import shutil
import subprocess
import sys

sys.path.insert(0, str(pathlib.Path(__file__).parents[1] / "support"))
import pictures  # noqa: E402

parser = argparse.ArgumentParser()
parser.add_argument("kind", choices=("cmake", "pkgconfig"))
for option in ("prefix", "libdir", "source", "work", "cc", "cxx"):
    parser.add_argument("--" + option, required=True)
arguments = parser.parse_args()
samples = pathlib.Path(arguments.source) / "samples"
# Used from another place than it was installed to: nothing in the packages may name the old one.
work = pathlib.Path(arguments.work)
shutil.rmtree(work, ignore_errors=True)
prefix = work / "moved"
shutil.copytree(arguments.prefix, prefix)


def run(*command, **options):
    return subprocess.run([str(word) for word in command], check=True, text=True, **options)


def build_by_cmake():
    project = pathlib.Path(__file__).parent / "consumer"
    run("cmake", "-G", "Ninja", "-S", project, "-B", work, f"-DCMAKE_PREFIX_PATH={prefix}",
        f"-DSAMPLES={samples}", f"-DCMAKE_C_COMPILER={arguments.cc}",
        f"-DCMAKE_CXX_COMPILER={arguments.cxx}")
    run("cmake", "--build", work)


def flags(package, *which):
    environment = dict(os.environ, PKG_CONFIG_PATH=str(prefix / arguments.libdir / "pkgconfig"))
    return run("pkg-config", *which, package, capture_output=True, env=environment).stdout.split()


def build_by_pkgconfig():
    shared, static = (flags(name, "--cflags", "--libs") for name in ("TavirSlideShow", "TavirSlideShow-static"))
    c = (arguments.cc, "-std=c99", "-Wall", "-Wextra", "-Wpedantic", "-Werror", samples / "thumbnail.c")
    run(*c, *shared, "-o", work / "thumbnail_shared")
    run(*c, *static, "-o", work / "thumbnail_static")
    run(arguments.cxx, "-std=c++20", "-Wall", "-Wextra", "-Werror", samples / "slides.cpp", *static,
        "-o", work / "slides")


def run_examples():
    picture = work / "picture.jpg"
    pictures.write_jpeg(picture, 640, 320)
    environment = dict(os.environ, LD_LIBRARY_PATH=str(prefix / arguments.libdir))
    for kind in ("shared", "static"):
        thumbnail = work / f"thumbnail_{kind}.jpg"
        run(work / f"thumbnail_{kind}", picture, thumbnail, env=environment)
        seen = pictures.Picture(thumbnail.read_bytes())
        assert (seen.width, seen.height) == (160, 120), (seen.width, seen.height)
    lines = run(work / "slides", work / "show.vss", picture, picture, capture_output=True).stdout.splitlines()
    assert [line.split(",")[0] for line in lines[:2]] == ["0: 480x240", "1: 480x240"], lines
    # The gradient starts at (0, 0, 128), opaque.
    pixel = int(lines[2].split()[-1], 16)
    assert pixel >> 24 == 0xFF and abs((pixel & 0xFF) - 128) < 8, lines


build_by_cmake() if arguments.kind == "cmake" else build_by_pkgconfig()
run_examples()
