"""vss from the outside: what it prints and writes, what it refuses, and its exit codes."""
import json
import os
import pathlib
import resource
import shutil
import struct
import unittest

from tool_test import CANNOT_OPEN, REFUSED, USAGE, WRITE_FAILURE, ToolTest, pictures

HEADER, RECORD, MARK = 628, 540, 12  # bytes of a container's parts


class VssTest(ToolTest):
    def setUp(self):
        super().setUp()
        self.show = self.folder / "show.vss"
        self.wide = self.picture("wide", 960, 480, (200, 30, 30))
        self.tall = self.picture("tall", 300, 600, (30, 30, 200))
        self.small = self.picture("small", 64, 48)

    def vss(self, *arguments, **options):
        return self.run_tool("VSS", *arguments, **options)

    def listed(self, show=None):
        return json.loads(self.vss("list", "--json", show or self.show))["pictures"]

    def names(self, show=None):
        return [entry["name"] for entry in self.listed(show)]

    def create(self, *added):
        self.vss("create", self.show)
        if added:
            self.vss("add", self.show, *added)

    def test_pictures_go_in_and_come_back(self):
        self.create(self.wide, self.tall)
        self.vss("insert", self.show, 1, self.small, "--name", "between")
        entries = self.listed()
        self.assertEqual([(e["index"], e["name"], e["width"], e["height"]) for e in entries],
                         [(0, "wide", 480, 240), (1, "between", 64, 48), (2, "tall", 240, 480)])
        self.assertEqual([e["source"] for e in entries], [str(p) for p in (self.wide, self.small, self.tall)])
        for entry, colour in ((entries[0], (200, 30, 30)), (entries[2], (30, 30, 200))):
            jpeg = self.vss("get", self.show, entry["index"], "-")
            self.assertEqual(len(jpeg), entry["bytes"])
            seen = pictures.Picture(jpeg)
            self.assertEqual((seen.width, seen.height), (entry["width"], entry["height"]))
            self.assertTrue(all(abs(a - b) < 6 for a, b in zip(seen.pixel(100, 100), colour)))

    def test_create_replaces_a_file_only_when_told(self):
        self.create(self.small)
        before = self.show.read_bytes()
        self.vss("create", self.show, expect=REFUSED)
        self.assertEqual(self.show.read_bytes(), before)
        self.vss("create", "--force", "--size", "320x200", self.show)
        self.assertEqual(self.listed(), [])
        self.assertEqual(self.show.stat().st_size, HEADER + MARK)
        self.vss("sheet", self.show, self.folder / "sheet.jpg", expect=REFUSED)
        self.vss("create", "--force", self.folder, expect=REFUSED)
        self.vss("create", self.folder / "missing" / "show.vss", expect=WRITE_FAILURE)

    def test_a_moved_show_is_the_one_that_is_named(self):
        self.create(self.small)
        moved = self.folder / "moved.vss"
        shutil.copy(self.show, moved)
        original = self.show.read_bytes()
        # Reading a copy works without its original and writes nothing.
        self.show.unlink()
        self.assertEqual(self.names(moved), ["small"])
        self.assertEqual(pictures.Picture(self.vss("get", moved, 0, "-")).width, 64)
        self.assertEqual(moved.read_bytes(), original)
        # Editing a copy leaves the original alone.
        self.show.write_bytes(original)
        self.vss("add", moved, self.wide)
        self.assertEqual(self.names(moved), ["small", "wide"])
        self.assertEqual(self.show.read_bytes(), original)

    def test_names(self):
        odd = 'say "hi" \\ \u00e9\n'
        self.create()
        self.vss("add", self.show, self.small, self.wide, "--name", odd)
        self.vss("add", self.show, self.small, "--name", b"\xff\xc3".decode("utf-8", "surrogateescape"))
        self.assertEqual(self.names(), [odd, "wide", "\ufffd\ufffd"])
        self.assertEqual(len(self.vss("list", self.show).splitlines()), 4)
        self.vss("add", self.show, self.small, "--name", "a", "--name", "b", expect=USAGE)

    def test_thumb_and_sheet(self):
        self.create(self.wide, self.tall, self.small)
        thumb = pictures.Picture(self.vss("thumb", self.show, 0, "100x100", "-", "--quality", 95))
        self.assertEqual((thumb.width, thumb.height), (100, 100))
        self.assertLess(max(thumb.pixel(50, 5)), 10)
        self.assertGreater(thumb.pixel(50, 50)[0], 180)
        sheet_file = self.folder / "sheet.jpg"
        self.vss("sheet", self.show, sheet_file, "--cell", "80x60", "--columns", 2)
        sheet = pictures.Picture(sheet_file.read_bytes())
        self.assertEqual((sheet.width, sheet.height), (2 * 88 + 8, 2 * 68 + 8))
        self.assertGreater(sheet.pixel(48, 38)[0], 180)
        self.assertGreater(sheet.pixel(136, 38)[2], 180)
        self.vss("sheet", self.show, sheet_file, "--cell", "4000x10", expect=REFUSED)

    def test_settings_stay(self):
        self.create(self.small)
        before = self.show.read_bytes()
        self.assertEqual(self.vss("settings", self.show).decode().split(),
                         "interval 1 effect 0 shuffle 0 loop 0 direction 0".split())
        self.assertEqual(self.show.read_bytes(), before)
        changed = "interval 7 effect -3 shuffle 1 loop 1 direction 0".split()
        self.assertEqual(self.vss("settings", self.show, "--interval", 7, "--effect", -3, "--shuffle", 1,
                                  "--loop", 1).decode().split(), changed)
        self.assertEqual(self.vss("settings", self.show).decode().split(), changed)

    def test_pictures_are_removed(self):
        self.create(self.wide, self.tall, self.small, self.wide)
        self.vss("insert", self.show, 1, self.small, "--name", "between")
        stale = self.show.read_bytes()
        self.vss("compact", self.show)
        self.assertEqual(self.show.read_bytes(), stale[:-MARK])
        self.vss("remove", self.show, 4, 0, 2)
        self.assertEqual(self.names(), ["between", "small"])
        before = self.show.read_bytes()
        self.assertEqual(len(before), HEADER + MARK + sum(RECORD + entry["bytes"] for entry in self.listed()))
        for wrong in ((0, 2), (-1,)):
            self.vss("remove", self.show, *wrong, expect=REFUSED)
        self.assertEqual(self.show.read_bytes(), before)

    def test_music_goes_in_and_comes_back(self):
        self.create(self.small)
        before = self.show.read_bytes()
        tune = self.folder / "tune"
        tune.write_bytes(bytes(range(256)) * 600)
        for command in ("remove", "get"):
            self.vss("music", command, self.show, *["-"] * (command == "get"), expect=REFUSED)
        self.vss("music", "add", self.show, self.folder / "absent", expect=CANNOT_OPEN)
        self.vss("music", "add", self.show, self.folder, expect=CANNOT_OPEN)
        self.vss("music", "add", self.show, "/dev/null", expect=CANNOT_OPEN)
        self.assertEqual(self.show.read_bytes(), before)
        self.vss("music", "add", self.show, tune)
        self.vss("music", "add", self.show, tune, expect=REFUSED)
        self.assertEqual(json.loads(self.vss("list", "--json", self.show))["musicBytes"], 256 * 600)
        self.assertEqual(self.names(), ["small"])
        self.assertEqual(self.vss("music", "get", self.show, "-"), tune.read_bytes())
        self.vss("music", "get", self.show, self.show, expect=REFUSED)
        self.vss("music", "remove", self.show)
        self.assertEqual(len(self.show.read_bytes()), len(before) + MARK)
        self.vss("compact", self.show)
        self.assertEqual(len(self.show.read_bytes()), len(before))
        self.assertEqual(self.names(), ["small"])

    def test_frames_of_a_gif(self):
        def image(left, top, width, height, *codes):  # codes of three bits: a clear code before each index
            bits = sum(code << 3 * i for i, code in enumerate(c for index in codes for c in (4, index)))
            data = (bits | 5 << 6 * len(codes)).to_bytes((6 * len(codes) + 10) // 8, "little")
            return b"," + struct.pack("<4HB", left, top, width, height, 0) + b"\2" + bytes([len(data)]) + data + b"\0"

        colours = ((255, 0, 0), (0, 255, 0), (0, 0, 255), (9, 8, 7))
        table = bytes(sum(colours, ()))
        screen = b"GIF89a" + struct.pack("<2H3B", 3, 2, 0x81, 0, 0) + table
        gif = self.folder / "two.gif"
        gif.write_bytes(screen + image(0, 0, 3, 2, 0, 1, 2, 3, 2, 1) + image(1, 1, 2, 1, 0, 0) + b";")
        shown = self.folder / "deep" / "frames"
        names = self.vss("frames", gif, shown).decode().split()
        self.assertEqual(names, [str(shown / f"frame-00{i}.ppm") for i in (0, 1)])
        for name, indices in zip(names, ((0, 1, 2, 3, 2, 1), (0, 1, 2, 3, 0, 0))):
            pixels = b"".join(bytes(colours[i]) for i in indices)
            self.assertEqual(pathlib.Path(name).read_bytes(), b"P6\n3 2\n255\n" + pixels)
        gif.write_bytes(gif.read_bytes()[:-6])
        self.vss("frames", gif, shown, expect=REFUSED)
        self.vss("frames", self.small, shown, expect=REFUSED)
        self.vss("frames", self.folder / "absent.gif", shown, expect=CANNOT_OPEN)
        self.vss("frames", self.folder, shown, expect=CANNOT_OPEN)

    def test_refusals_leave_the_show_as_it_was(self):
        self.create(self.small)
        before = self.show.read_bytes()
        text = self.folder / "text.jpg"
        text.write_text("not a picture")
        thin = self.picture("thin", 1000, 2)
        large = self.picture("large", 5008, 16)
        self.vss("add", self.show, text, thin, large, expect=REFUSED)
        pipe = self.folder / "pipe"
        os.mkfifo(pipe)
        for path in (self.folder / "absent.jpg", pipe):
            self.vss("add", self.show, path, expect=CANNOT_OPEN)
        self.vss("insert", self.show, 2, self.small, expect=REFUSED)
        self.vss("insert", self.show, -1, self.small, expect=REFUSED)
        self.vss("get", self.show, 1, self.folder / "out.jpg", expect=REFUSED)
        self.vss("thumb", self.show, -1, "10x10", self.folder / "out.jpg", expect=REFUSED)
        self.vss("get", self.show, 0, self.show, expect=REFUSED)
        self.assertEqual(self.show.read_bytes(), before)

    def test_a_refused_picture_does_not_keep_out_the_next_ones(self):
        self.create(*[self.small] * 18)
        self.vss("add", self.show, self.folder / "absent.jpg", self.small, expect=CANNOT_OPEN)
        self.vss("add", self.show, self.wide, self.tall, expect=REFUSED)
        self.assertEqual(self.names(), ["small"] * 19 + ["wide"])
        self.vss("insert", self.show, 0, self.tall, expect=REFUSED)

    def test_files_that_are_no_shows(self):
        self.create(self.small)
        data = bytearray(self.show.read_bytes())
        wrong_version = self.folder / "version.vss"
        data[-8] ^= 1
        wrong_version.write_bytes(data)
        for path in (wrong_version, self.small, self.folder, self.folder / "absent.vss"):
            for command in (("list", path), ("add", path, self.small), ("settings", path, "--loop", "1")):
                self.vss(*command, expect=CANNOT_OPEN)
        self.assertFalse((self.folder / "absent.vss").exists())

    def test_full_disks(self):
        self.create(self.small)
        before = self.show.read_bytes()
        self.vss("get", self.show, 0, "/dev/full", expect=WRITE_FAILURE)
        self.vss("get", self.show, 0, self.folder / "missing" / "out.jpg", expect=WRITE_FAILURE)
        with open("/dev/full", "wb") as full:
            self.vss("list", self.show, expect=WRITE_FAILURE, stdout=full)
            self.vss("get", self.show, 0, "-", expect=WRITE_FAILURE, stdout=full)
        limit = len(before) + 1000
        self.vss("add", self.show, self.wide, expect=WRITE_FAILURE, restore_signals=False,
                 preexec_fn=lambda: resource.setrlimit(resource.RLIMIT_FSIZE, (limit, limit)))
        self.assertEqual(self.show.read_bytes(), before)

    def test_help_version_and_usage(self):
        self.assertIn(b"Exit codes", self.vss("--help"))
        self.assertRegex(self.vss("--version"), rb"^vss \d+\.\d+\.\d+\n$")
        for wrong in ((), ("paint",), ("add", self.show), ("create", self.show, "--size", "480"),
                      ("create", self.show, "--size", "0x480"), ("create", "x" * 256),
                      ("get", self.show, "one", "-"), ("settings", self.show, "--loop", "2"), ("music", self.show), ("remove", self.show)):
            self.vss(*wrong, expect=USAGE)
        self.assertFalse(self.show.exists())


if __name__ == "__main__":
    unittest.main()
