"""quavel --why: the reason it names is the one the file was built to have."""

import json
import os
import struct
import subprocess
import tempfile
import unittest
from pathlib import Path

COMMAND = os.environ["QUAVEL_COMMAND"]
SAMPLES = os.environ.get("QUAVEL_SAMPLES")

WIDTH, HEIGHT, SUBFILE, MODEL, DATE, SUBIFDS, EXIF = (
    0x100, 0x101, 0xFE, 0x110, 0x132, 0x14A, 0x8769)
ORIGINAL, FOCAL, PIXEL_X = 0x9003, 0x920A, 0xA002
# The reason for programs, and what the photo's owner is told first.
CUT = "cut-short", "cut short: "
KIND = "other-kind", "another kind of file, or damaged: "
ZIP = "other-kind", "The file looks like a ZIP archive; its extension has it read as DNG: the TIFF"
HEIC = ("other-kind",
        'The file looks like an ISO base media file of brand "heic"; its extension has it read as')
PNG = "other-kind", "The file looks like a PNG file; its extension has it read as CR3: the header"
ENTRY = "malformed-entry", "damaged or badly written: "
BOX = "malformed-box", "damaged or badly written: "
WORK = "too-much-work", "beyond what is read of one file: "
VALUES = "too-many-values", "beyond what is read of one file: "
PART = "missing-part", "a part is missing: "
IMAGE = "wrong-image", "of a layout that is not read: "
ASCII, SHORT, LONG, RATIONAL, UNDEFINED, SRATIONAL = 2, 3, 4, 5, 7, 10


def entry(tag, kind, count, value):
    """A little-endian entry; a SHORT in the value field reads the same as a LONG there."""
    return struct.pack("<HHII", tag, kind, count, value)


def number(tag, value):
    return entry(tag, LONG, 1, value)


def directory(*entries):
    return struct.pack("<H", len(entries)) + b"".join(entries) + bytes(4)


def tiff(*entries):
    return b"II*\0\x08\0\0\0" + directory(*entries)


def segment(marker, payload):
    return struct.pack(">HH", marker, len(payload) + 2) + payload


def box(kind, payload):
    return struct.pack(">I4s", len(payload) + 8, kind) + payload


def cr3(*children):
    identifier = bytes.fromhex("85c0b687820f11e08111f4ce462b6a48")
    return box(b"ftyp", b"crx ") + box(b"moov", box(b"uuid", identifier + b"".join(children)))


def raf(image, section):
    header = b"FUJIFILM".ljust(84, b"\0") + struct.pack(">I", 104)
    header = header.ljust(100, b"\0") + struct.pack(">I", 116 + len(image))
    return header + bytes(12) + image + section


def reduced(count, image, more=b""):
    """A reduced image that names the same reduced image `count` times."""
    end = 38 + 4 * count
    return (tiff(number(SUBFILE, 1), entry(SUBIFDS, LONG, count, 38)) +
            struct.pack("<I", end) * count + image + bytes(4) + more)


NEF_SIZE = (number(WIDTH, 160), number(HEIGHT, 120))
FULL = directory(number(WIDTH, 6000), number(HEIGHT, 4000), number(SUBFILE, 0))

# Extension, reason, bytes, and what the verdict must say.
REFUSED = [
    ("tif", KIND, b"II+\0" + bytes(12),
     "TIFF header at 0 has magic 43, not 42; 43 marks a BigTIFF"),
    ("dng", ZIP, b"PK\3\4" + bytes(12), "TIFF header at 0 begins with 50 4b, not with 49 49"),
    ("cr2", CUT, b"II*\0\x08\0", "TIFF header at 0: 4 bytes wanted at 4, but the file ends at 6"),
    ("tif", CUT, tiff(number(WIDTH, 1))[:-4], "offset of the next directory, after the 1 entries "
     "of IFD0 at 8: 4 bytes wanted at 0x16 (22), but the file ends at 0x16 (22)"),
    ("tif", CUT, tiff(number(1, 1), number(2, 2))[:23], "entry 2 of 2 of IFD0 at 8: 2 bytes wanted "
     "at 0x16 (22), but"),
    ("tif", ENTRY, tiff(entry(WIDTH, 99, 1, 1)), "0x0100 ImageWidth at 0xa (10) in IFD0: field "
     "type 99"),
    ("tif", VALUES, tiff(entry(WIDTH, SHORT, 65537, 0)), "it declares 65537 SHORT values; more"),
    ("tif", ENTRY, tiff(entry(WIDTH, UNDEFINED, 1, 0)),
     "in IFD0 is of type UNDEFINED; one number wanted"),
    ("tif", CUT, tiff(entry(DATE, ASCII, 20, 912345)),
     "0x0132 DateTime at 0xa (10) in IFD0: its 20 "
     "ASCII values would begin at 0xdebd9 (912345) and end at 0xdebed (912365), but the file ends"),
    ("tif", ENTRY, tiff(number(DATE, 7)),
     "0x0132 DateTime at 0xa (10) in IFD0 holds 1 LONG value; ASCII"),
    ("3fr", PART, tiff(number(SUBFILE, 1)),
     "declares a reduced image (NewSubfileType bit 0) and names"),
    ("nrw", PART, tiff(number(SUBFILE, 1), number(SUBIFDS, 38)) + directory(number(SUBFILE, 1)),
     "and none of its 1 SubIFDs says that it is the full image"),
    ("nef", IMAGE, tiff(number(WIDTH, 6000), number(HEIGHT, 4000)),
     "IFD0 at 8 declares 6000 x 4000; a "
     "NEF's first directory must be 160 x 120"),
    ("nef", PART, tiff(NEF_SIZE[0]), "no 0x0101 ImageLength in IFD0 at 8; a NEF's first directory"),
    ("nef", ENTRY, tiff(*NEF_SIZE, entry(EXIF, LONG, 2, 8)),
     "in IFD0 holds 2 LONG values; exactly one"),
    ("arw", CUT, tiff(number(SUBIFDS, 9999), number(EXIF, 38)) + directory(),
     "count of SubIFD 1 of 1"
     " at 0x270f (9999): 2 bytes wanted"),
    ("arw", IMAGE, tiff(number(SUBIFDS, 44), number(EXIF, 38)) + directory() + directory(
        number(SUBFILE, 1)), "SubIFD 1 of 1 at 0x2c (44) declares a reduced image (NewSub"),
    ("jpg", HEIC, box(b"ftyp", b"heic"), "the file begins with 00 00, not with ff d8"),
    ("cr3", PNG, b"\x89PNG" + bytes(20), "8 bytes wanted at 0x89504e47"),
    ("jpg", KIND, b"\xff\xd8" + segment(0xFFE1, b"Exif\0\0\xff\xff"),
     "TIFF header of the Exif segment "
     "at 0xc (12) begins with ff ff"),
    ("jpg", ENTRY, b"\xff\xd8" + segment(0xFFE1, b"Exif\0\0" + tiff(number(EXIF, 26)) + directory(
        entry(PIXEL_X, SHORT, 2, 0))), "0xa002 PixelXDimension at 0x28 (40) in the Exif IFD holds"),
    ("jpeg", CUT, b"\xff\xd8\xff\xdb\0",
     "the length of the segment 0xffdb at 2: 2 bytes wanted at 4"),
    ("raf", KIND, b"FUJIFILN" + bytes(99),
     "the file begins with 46 55 4a 49 46 49 4c 4e, not with"),
    ("raf", KIND, raf(tiff(), b"no"),
     "TIFF header of the raw section at 0x82 (130) begins with 6e 6f"),
    ("raf", PART, raf(tiff(), tiff()),
     "no 0xf000 (the vendor directory) in IFD0 of the raw section"),
    ("cr3", CUT, box(b"ftyp", b"crx "),
     "the header of the next box before a moov box was met: 8 bytes "
     "wanted at 0xc (12)"),
    ("cr3", BOX, b"\0\0\0\1mdat" + bytes(8),
     "the mdat box at 0 before a moov box was met has size 1;"),
    ("cr3", PART, cr3(box(b"CMT3", b"")),
     "uuid box at 0x14 (20) has neither a CMT1 nor a CMT2 box"),
    ("cr3", BOX, cr3(box(b"CMT1", tiff()), b"\0\0\0\x07free"), "the free box at 0x42 (66) in the "
     "metadata uuid box at 0x14 (20) has size 7"),
    ("cr3", PART, box(b"moov", box(b"uuid", bytes(16))), "identifier is another one"),
    ("cr3", ENTRY, cr3(box(b"CMT2", tiff(entry(FOCAL, SRATIONAL, 1, 26)) + bytes(8))),
     "0x920a Focal"
     "Length at 0x3e (62) in IFD0 of the CMT2 box holds 1 SRATIONAL value; 1 RATIONAL value"),
    ("nrw", WORK, reduced(16384, b"\1\0" + number(SUBFILE, 1)), "more than 16384 directories"),
    ("tif", WORK, reduced(17, b"\2\0" + number(SUBFILE, 1) + entry(WIDTH, SHORT, 65536, 136), bytes(131072)),
     "more than 1048576 values"),
]

# Extension, bytes, and a line of the explanation.
ACCEPTED = [
    ("nef", tiff(*NEF_SIZE), "absent: width, height: IFD0 at 8 names 0 SubIFDs (0x014a)"),
    ("nef", tiff(*NEF_SIZE, number(SUBIFDS, 50)) + FULL,
     "absent: width, height: IFD0 at 8 names 1 SubIFD (0x014a); the raw image is in number 2"),
    ("raf", raf(tiff(number(EXIF, 26)) + directory(), tiff(number(0xF000, 26)) + directory()),
     "read: the vendor directory at 0xae (174): has 0 of the 2 wanted entries"),
    ("jpg", b"\xff\xd8" + segment(0xFFE1, b"Exif\0\0" + tiff()) + segment(0xFFC0, b"\x08\x0f\xa0\x17\x70" + bytes(9)),
     "read: the SOF0 segment at 0x1a (26) declares 6000 x 4000"),
    ("nef", tiff(*NEF_SIZE), "dateTimeOriginal: no 0x8769 ExifIFDPointer in IFD0 at 8"),
    ("nef", tiff(*NEF_SIZE), "dateTimeDigitized, dateTime: never taken from NEF files"),
    ("arw", tiff(number(SUBIFDS, 26)) + FULL, "width, height: no 0x8769 ExifIFDPointer"),
    ("tif", tiff(entry(DATE, ASCII, 1, 0)), "dateTime: 0x0132 DateTime at 0xa (10) in IFD0 holds"),
    ("jpg", b"\xff\xd8" + segment(0xFFC2, bytes(9)), "The frame at 2 is progressive (SOF2)"),
    ("cr3", cr3(box(b"CMT1", tiff())), "fNumber: no CMT2 box in the metadata uuid box at 0x14"),
    ("cr3", cr3(box(b"CMT2", tiff(entry(FOCAL, RATIONAL, 1, 26)) + bytes(8))),
     "focalLength: 0x920a FocalLength at 0x3e (62) in IFD0 of the CMT2 box is 0/0"),
]

SAMPLE_REASONS = {
    "arw-03.arw": "the entry count of SubIFD 1 of 1",
    "cr3-04.cr3": "the header of the next box in the metadata uuid box",
    "dng-04.dng": "0x0132 DateTime at 0xe6 (230) in IFD0: its 20 ASCII values would begin at",
    "dng-05.dng": "magic 43, not 42",
    "jpg-08.jpg": "0xa002 PixelXDimension at 0x1e4 (484) in the Exif IFD holds 2 SHORT values",
    "jpg-09.jpg": "the TIFF header of the Exif segment at 0xc (12) begins with ff ff",
    "jpg-11.jpg": "not with ff d8 (SOI)",
    "nef-02.nef": "IFD0 at 8 declares 160 x 106",
    "nef-03.nef": "entry 11 of 28 of IFD0 at 8",
    "raf-01.raf": "the TIFF header of the raw section",
    "raf-02.raf": "the TIFF header of the raw section",
    "tif-01.tif": "the offset of the next directory, after the 15 entries of IFD0",
    "tif-04.tif": "magic 43, not 42",
    "tiff-02.tiff": "magic 43, not 42",
}


class WhyTest(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)

    def run_quavel(self, *arguments, **options):
        return subprocess.run([COMMAND, *arguments], capture_output=True, timeout=60, **options)

    def objects(self, *arguments, **options):
        done = self.run_quavel("--jsonl", "--quiet", *arguments, **options)
        return [json.loads(line) for line in done.stdout.splitlines()]

    def why(self, path):
        done = self.run_quavel("--why", path, encoding="utf-8")
        self.assertEqual(done.stderr, "")
        self.assertLessEqual(len(done.stdout.splitlines()), 24)
        self.assertRegex(done.stdout, r"\A[^\x00-\x09\x0b-\x1f\x7f]*\Z")
        return done.returncode, done.stdout

    def write(self, name, content):
        path = self.folder / name
        path.write_bytes(content)
        return path

    def test_names_the_step_that_failed(self):
        for extension, (reason, lead), content, words in REFUSED:
            with self.subTest(words):
                path = self.write("x." + extension, content)
                status, text = self.why(path)
                self.assertEqual(status, 1)
                self.assertIn("no record: " + lead, text.splitlines()[0])
                self.assertIn(words, text.splitlines()[0])
                found, = self.objects(path)
                self.assertEqual(text.splitlines()[0], f"{path}: no record: {found['error']}.")
                self.assertEqual(found["reason"], reason)
                noted, = self.objects("--why", path)
                refusal, = [n for n in noted.pop("notes") if n["kind"] in ("refusal", "limit")]
                self.assertIn(refusal["text"], noted["error"])
                self.assertEqual([refusal.get(k) for k in ("reason", "position")],
                                 [found[k] for k in ("reason", "position")])
                noted.pop("furtherSteps", None)
                self.assertEqual(noted, found)

    def test_tells_why_fields_are_absent(self):
        for extension, content, line in ACCEPTED:
            with self.subTest(line):
                status, text = self.why(self.write("x." + extension, content))
                self.assertEqual(status, 0)
                self.assertIn(line, text)

    def test_says_what_the_content_looks_like(self):
        path = self.write("x.jpg", box(b"ftyp", b"he\x1bc"))
        text = self.why(path)[1]
        self.assertIn(r'looks like an ISO base media file of brand "he\x1bc"', text)
        hint = self.objects("--why", path)[0]["notes"][-1]
        self.assertEqual((hint["kind"], hint["reason"]), ("hint", "other-content"))

    def test_opens_nothing_but_photos(self):
        os.mkfifo(self.folder / "pipe.nef")
        self.write("empty.nef", b"")
        self.write("x.txt", b"II*")
        for name, reason in (
                ("none.nef", "No such file"), ("pipe.nef", "FIFO"),
                ("x.txt", "names no format; these do: tiff tif dng "),
                ("empty.nef", "is empty")):
            with self.subTest(name):
                status, text = self.why(self.folder / name)
                self.assertEqual(status, 1)
                self.assertIn(reason, text)

    def test_explains_all_files_as_it_explains_one(self):
        (self.folder / "in").mkdir()
        self.write("in/a.nef", b"")
        self.write("in/b.jpg", b"\xff\xd8" + 20 * segment(0xFFE1, b"none"))
        self.write("c.tif", tiff(number(WIDTH, 3)))
        paths = [self.folder / "c.tif", self.folder / "in/a.nef", self.folder / "in/b.jpg"]
        done = self.run_quavel("--why", paths[0], self.folder / "in", encoding="utf-8")
        self.assertEqual(done.returncode, 1)
        self.assertEqual(done.stdout, "\n".join(self.why(path)[1] for path in paths))
        self.assertRegex(done.stderr, r"\Aquavel: 3 files, 2 records, 1 without record.*\n\Z")
        good, empty, steps = self.objects("--why", paths[0], self.folder / "in")
        array = json.loads(self.run_quavel("--why", "--json", *paths).stdout)
        self.assertEqual(array, [good, empty, steps])
        absences = [note for note in good["notes"] if note["kind"] == "absence"]
        self.assertEqual([note["field"] for note in absences],
                         [k for k, v in good.items() if v is None and k != "captureDate"])
        self.assertEqual([(n["kind"], n["reason"]) for n in empty["notes"]], [("refusal", "empty")])
        kinds = [note["kind"] for note in steps["notes"]]
        self.assertIn(f"read: {steps['furtherSteps']} more\n", done.stdout)
        self.assertEqual(steps["furtherSteps"] + kinds.count("step"), 21)  # the end of the data too

    def test_explains_standard_input(self):
        content = tiff(*NEF_SIZE)
        by_path = self.why(self.write("x.nef", content))[1].splitlines()[1:]
        done = self.run_quavel("--why", "--stdin", "--extension", "nef", input=content)
        self.assertEqual(done.stdout.decode().splitlines(), ["-: a record, read as NEF."] + by_path)

    @unittest.skipUnless(SAMPLES, "QUAVEL_SAMPLES is not set")
    def test_names_the_reasons_of_real_files(self):
        for line in (Path(SAMPLES) / "expected.ndjson").read_text().splitlines():
            sample = json.loads(line)
            with self.subTest(sample["file"]):
                status, text = self.why(Path(SAMPLES) / sample["file"])
                self.assertEqual(status, 1 if sample["expected"] is None else 0)
                if status == 1:
                    self.assertIn(SAMPLE_REASONS[sample["file"]], text.splitlines()[0])


if __name__ == "__main__":
    unittest.main()
