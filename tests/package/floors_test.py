"""Includes and calls point down the floors of docs/architecture.md: a room uses itself and what stands below it.

usage: floors_test.py ROOT NM OBJECTS     OBJECTS: the folder of the library's object files
"""
import pathlib
import re
import subprocess
import sys

root, nm, objects = pathlib.Path(sys.argv[1]), sys.argv[2], pathlib.Path(sys.argv[3])

# From the ground up; rooms of one line stand beside each other and know nothing of one another.
FLOORS = [
    ["include"],
    ["platform"],
    ["codec/base"],
    ["codec/pixel"],
    ["codec/kernels"],
    ["codec/image"],
    ["codec/formats"],
    ["codec/decode"],
    ["codec/zoom"],
    ["slideshow"],
    ["jni"],
    ["tools"],
]
# Inside the formats: what the JPEG rooms share stands in their folder, the rest are rooms of their own.
FORMATS = [
    ["codec/formats"],
    ["codec/formats/png", "codec/formats/gif", "codec/formats/bmp", "codec/formats/jpeg"],
    ["codec/formats/jpeg/encoder", "codec/formats/jpeg/decoder"],
    ["codec/formats/jpeg/exif", "codec/formats/jpeg/strips"],
    ["codec/formats/jpeg/transform"],
]


def room_of(path, floors):
    """Floor and name of the innermost room that holds a path; None outside all of them."""
    found = [(len(room), floor, room) for floor, rooms in enumerate(floors) for room in rooms
             if path.startswith(room + "/")]
    return max(found)[1:] if found else None


def judge(source, target):
    """What is wrong with an include, or None."""
    for floors in (FLOORS, FORMATS):
        here, there = room_of(source, floors), room_of(target, floors)
        if here is None or there is None or here[1] == there[1]:
            continue
        if there[0] > here[0]:
            return f"{there[1]} stands above {here[1]}"
        if there[0] == here[0]:
            return f"{there[1]} stands beside {here[1]}"
    return None


def includes():
    """(source, target) of every include between files of the project."""
    for file in sorted(f for folder in ("include", "platform", "codec", "slideshow", "jni", "tools")
                       for f in (root / folder).rglob("*") if f.suffix in (".h", ".hpp", ".cpp")):
        for name in re.findall(r'^#include "([^"]+)"', file.read_text(), flags=re.M):
            target = name if (root / name).exists() else f"include/{name}"
            if (root / target).exists():
                yield str(file.relative_to(root)), target


def calls():
    """(source, target) of every symbol that one object file takes from another: what a function declared in a
    public header leads to shows here alone."""
    defined, wanted = {}, set()
    for file in objects.rglob("*.o"):
        source = str(file.relative_to(objects)).removesuffix(".o")
        if not (root / source).exists():
            continue  # left over from a file that has moved
        table = subprocess.run([nm, "-P", file], capture_output=True, text=True, check=True).stdout
        for name, kind in (line.split()[:2] for line in table.splitlines()):
            if kind in "TDBR":
                defined[name] = source
            elif kind == "U":
                wanted.add((source, name))
    return sorted({(source, defined[name]) for source, name in wanted if name in defined})


wrong = 0
for word, pairs, least in (("includes", list(includes()), 500), ("calls into", calls(), 300)):
    for source, target in pairs:
        if reason := judge(source, target):
            print(f"{source} {word} {target}: {reason}")
            wrong += 1
    print(f"{len(pairs)} pairs of files by what one {word} the other")
    if len(pairs) < least:
        wrong += 1
print(f"{wrong} against the floors")
sys.exit(wrong != 0)
