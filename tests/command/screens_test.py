"""What the command shows to people, cell by cell."""

import shlex
import unittest
from pathlib import Path

from command_test import ASCII, RATIONAL, SHORT, SRATIONAL, CommandTest, cr3, photo

SCREENS = Path(__file__).with_name("screens.txt")
FULL = {"main": [(0x110, ASCII, b"Canon EOS M50")],
        "exif": [(0x9201, SRATIONAL, (13, 2)), (0x9202, RATIONAL, (497, 100)), (0xA405, SHORT, 56),
                 (0xA434, ASCII, b"EF-M15-45mm f/3.5-6.3 IS STM  ")]}
# A tag, the field that shows it, and what it shows for each value.
WORDS = [
    (0x112, "orientation", SHORT, ["not standard (0)", "upright", "mirrored", "turn 180", "mirrored, 180",
                                   "mirrored, 270 CW", "turn 90 CW", "mirrored, 90 CW", "turn 270 CW",
                                   (9, "not standard (9)")]),
    (0x9207, "meteringMode", SHORT, ["unknown", "average", "center-weighted average", "spot", "multi-spot", "pattern",
                                     "partial", "not standard (7)", (255, "other"), (256, "not standard (256)")]),
    (0xA403, "whiteBalance", SHORT, ["automatic", "manual", "not standard (2)"]),
    (0x8827, "iso", SHORT, [(100, "100"), (51200, "51200")]),
    (0xA405, "focalLengthIn35mmFilm", SHORT, [(56, "56 mm")]),
    (0x829A, "exposureTime", RATIONAL, [
        ((1, 8000), "1/8000 s"), ((1, 3), "0.3 s"), ((1, 4), "1/4 s"), ((10, 25), "0.4 s"), ((10, 65), "1/6.5 s"),
        ((1, 1), "1 s"), ((25, 10), "2.5 s"), ((30, 1), "30 s"), ((1, 0), "∞ s"), ((0, 1), "0 s"), ((0, 0), "-"),
        ((1, 2000000), "0.0000005 s"), ((4000000000, 1), "4e+09 s")]),
    (0x829D, "fNumber", RATIONAL, [((14, 10), "f/1.4"), ((8, 1), "f/8"), ((95, 100), "f/0.95"), ((11, 1), "f/11")]),
    (0x920A, "focalLength", RATIONAL, [((50, 1), "50 mm"), ((105, 10), "10.5 mm"), ((333, 100), "3.3 mm")]),
    (0x9204, "exposureBiasValue", SRATIONAL, [((2, 3), "+0.67 EV"), ((-1, 3), "-0.33 EV"), ((0, 1), "0 EV"),
                                              ((-1, 1000), "0 EV"), ((-1, 0), "-∞ EV")]),
    (0x9202, "apertureValue", RATIONAL, [((497, 100), "4.97 APEX")]),
    (0x9202, "apexFNumber", RATIONAL, [((6, 1), "f/8")]),
    (0x9201, "shutterSpeedValue", SRATIONAL, [((13, 2), "6.5 APEX")]),
    (0x9201, "apexExposureTime", SRATIONAL, [((8, 1), "1/256 s")]),
]


class Screens(CommandTest):
    def test_words(self):
        for tag, field, kind, values in WORDS:
            rows = [value if isinstance(value, tuple) else (i, value) for i, value in enumerate(values)]
            for i, (stored, _) in enumerate(rows):
                part = "main" if tag == 0x112 else "exif"
                self.put(f"{field}/{i:02}.cr3", cr3(**{part: [(tag, kind, stored)]}))
            table = self.run_quavel("--table", "--fields", field, field).stdout.decode().splitlines()
            self.assertEqual(table[1:], [words for _, words in rows], field)

    def test_screens(self):
        """Each screen of the file: "$ WIDTH ARGUMENTS" (no WIDTH: a pipe), then all lines."""
        self.put("trip/2021/a.cr3", cr3(**FULL))
        self.put("trip/2021/day 2/b.cr3", cr3(exposure=(0, 0), main=[(0x112,), (0x132,)]))
        self.put("trip/2021/day 2/b2.tif", photo(date=b"2022"))
        self.put("trip/none.nef", b"")
        self.maxDiff = None
        for screen in SCREENS.read_text(encoding="utf-8").split("$ ")[1:]:
            command, expected = screen.split("\n", 1)
            width, *arguments = shlex.split(command)
            with self.subTest(command):
                shown = (self.run_quavel("-q", *arguments).stdout.decode() if width == "pipe" else
                         self.on_terminal("-q", "--sort", "path", *arguments, width=int(width)))
                self.assertEqual(shown, expected)


if __name__ == "__main__":
    unittest.main()
