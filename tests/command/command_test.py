"""The quavel command, driven as its users drive it."""

import contextlib
import csv
import fcntl
import io
import json
import math
import os
import pty
import re
import select
import shlex
import signal
import struct
import subprocess
import tempfile
import termios
import time
import unittest
from pathlib import Path

COMMAND = os.environ["QUAVEL_COMMAND"]
SAMPLES = os.environ.get("QUAVEL_SAMPLES")
COMMAND_SOURCE = Path(__file__).resolve().parents[2] / "apps/quavel"

ASCII, SHORT, RATIONAL, SRATIONAL = 2, 3, 5, 10

for number in (signal.SIGINT, signal.SIGTERM, signal.SIGHUP):
    signal.signal(number, signal.SIG_DFL)  # whoever runs this may ignore them


def directory(entries, start):
    """A little-endian directory of (tag, type, value) entries that lies at `start`, with its values."""
    entry_bytes, data = b"", b""
    data_start = start + 2 + 12 * len(entries) + 4
    for tag, kind, value in entries:
        if kind == SHORT:
            entry_bytes += struct.pack("<HHIHH", tag, kind, 1, value, 0)
            continue
        raw = value if kind == ASCII else struct.pack("<ii" if kind == SRATIONAL else "<II", *value)
        raw = raw.ljust(5, b"\0")  # never inline
        count = len(raw) if kind == ASCII else 1
        entry_bytes += struct.pack("<HHII", tag, kind, count, data_start + len(data))
        data += raw
    return struct.pack("<H", len(entries)) + entry_bytes + bytes(4) + data


def tiff(entries):
    return b"II*\0\x08\0\0\0" + directory(entries, 8)


def photo(date=b"2020:07:06 15:32:17", width=6000):
    return tiff([(0x100, SHORT, width), (0x101, SHORT, 4000), (0x112, SHORT, 6), (0x132, ASCII, date)])


def box(kind, payload):
    return struct.pack(">I4s", len(payload) + 8, kind) + payload


def cr3(model=b"Box Camera", exposure=(1, 80), main=(), exif=()):
    """Entries of `main` and `exif` replace those with their tag; a tag alone leaves it out."""
    def merged(entries, others):
        kept = {entry[0]: entry for entry in (*entries, *others)}
        return tiff([entry for entry in kept.values() if len(entry) > 1])
    cmt1 = merged([(0x100, SHORT, 6000), (0x101, SHORT, 4000), (0x110, ASCII, model),
                   (0x112, SHORT, 8), (0x132, ASCII, b"2021:01:02 03:04:05")], main)
    cmt2 = merged([(0x829A, RATIONAL, exposure), (0x829D, RATIONAL, (28, 5)), (0x8827, SHORT, 400),
                   (0x9204, SRATIONAL, (-1, 3)), (0x9207, SHORT, 5), (0x920A, RATIONAL, (35, 1)),
                   (0xA403, SHORT, 1)], exif)
    identifier = bytes.fromhex("85c0b687820f11e08111f4ce462b6a48")
    return box(b"moov", box(b"uuid", identifier + box(b"CMT1", cmt1) + box(b"CMT2", cmt2)))


def float32(value):
    return struct.unpack("f", struct.pack("f", value))[0]


class CommandTest(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)

    def put(self, name, content):
        path = os.path.join(os.fsencode(self.folder), os.fsencode(name))
        os.makedirs(os.path.dirname(path), exist_ok=True)
        with open(path, "wb") as file:
            file.write(content)
        return path

    def run_quavel(self, *arguments, status=0, **options):
        options.setdefault("timeout", 60)
        done = subprocess.run([COMMAND, *arguments], cwd=self.folder, capture_output=True, **options)
        self.assertEqual(done.returncode, status, done.stderr)
        return done

    def on_terminal(self, *arguments, width=80, stream="stdout", status=0):
        """What the command writes to a terminal of that width."""
        main, side = pty.openpty()
        fcntl.ioctl(side, termios.TIOCSWINSZ, struct.pack("HHHH", 24, width, 0, 0))
        with subprocess.Popen([COMMAND, *arguments], cwd=self.folder, stdin=subprocess.DEVNULL,
                              **{"stdout": subprocess.PIPE, "stderr": subprocess.PIPE, stream: side}) as process:
            os.close(side)
            shown = b""
            with contextlib.suppress(OSError):  # the end, to Linux
                while piece := os.read(main, 65536):
                    shown += piece
            os.close(main)
            process.communicate(timeout=60)
        self.assertEqual(process.returncode, status)
        return shown.decode().replace("\r\n", "\n")

    def objects(self, *arguments, **options):
        output = self.run_quavel("--jsonl", *arguments, **options).stdout.decode()
        return [json.loads(line) for line in output.splitlines()]

    def names(self, *arguments, **options):
        return [record["path"] for record in self.objects(*arguments, **options)]

    def rows(self, *arguments, **options):
        output = self.run_quavel("--csv", *arguments, **options).stdout.decode()
        return list(csv.DictReader(io.StringIO(output, newline="")))


class Forms(CommandTest):
    def test_machine_forms_agree_and_are_exact(self):
        self.put("a.cr3", cr3())
        self.put("b.tif", photo())
        self.put("c.nef", b"no")
        array = json.loads(self.run_quavel("--json", ".", status=1).stdout)
        self.assertEqual(array, self.objects(".", status=1))
        first, second, third = array
        self.assertEqual((first["model"], first["iso"], first["isRaw"]), ("Box Camera", 400, True))
        self.assertEqual(float32(first["exposureTime"]), float32(1 / 80))
        self.assertEqual(float32(first["exposureBiasValue"]), float32(-1 / 3))
        self.assertEqual((first["lensModel"], first["apertureValue"]), (None, None))
        self.assertEqual(second["captureDate"], "2020:07:06 15:32:17")
        self.assertEqual(list(third), ["path", "error", "reason", "position"])
        self.assertEqual((third["reason"], third["position"]), ("other-kind", 0))
        for record, row in zip(array, self.rows(".", status=1)):
            for key, value in record.items():
                if isinstance(value, float):
                    self.assertEqual(float(row[key]), value)
                elif isinstance(value, bool):
                    self.assertEqual(row[key], str(value).lower())
                else:
                    self.assertEqual(row[key], "" if value is None else str(value))

    def test_infinity_is_told_from_absence(self):
        self.put("a.cr3", cr3(exposure=(1, 0), exif=[(0x9204, SRATIONAL, (-1, 0))]))
        self.put("b.cr3", cr3(exposure=(0, 0)))
        self.assertEqual(self.objects("a.cr3")[0]["exposureBiasValue"], "-Infinity")
        times = [r["exposureTime"] for r in self.objects(".")]
        self.assertEqual(times, ["Infinity", None])
        self.assertEqual(float(self.rows("a.cr3")[0]["exposureTime"]), math.inf)
        self.assertIn("∞ s\n", self.run_quavel("a.cr3").stdout.decode())

    def test_long_texts_are_cut(self):
        self.put("a.cr3", cr3(model=b"x" * 5000))
        self.put("b.cr3", cr3(model=b"x" + "\u0301".encode() * 5000))
        for name, most in (("a.cr3", 203), ("b.cr3", 1603)):
            card = self.run_quavel("--fields", "model", name).stdout.decode()
            self.assertRegex(card, r"^  Camera +x.*…\n$")
            self.assertLessEqual(len(card.split()[1].encode()), most)

    def test_card_reads_as_photographers_speak(self):
        self.put("a.cr3", cr3())
        card = self.run_quavel("a.cr3")
        for words in ("1/80 s", "f/5.6", "400", "35 mm", "-0.33 EV", "pattern", "manual",
                      "turn 270 CW", "2021-01-02 03:04:05"):
            self.assertRegex(card.stdout.decode(), rf"(?m)  {words}$")
        self.assertNotIn(b"Lens", card.stdout)
        self.assertEqual(card.stderr, b"")
        self.assertRegex(self.run_quavel("--absent", "show", "a.cr3").stdout, rb"Lens +-\n")
        self.put("half.tif", tiff([(0x100, SHORT, 6000), (0x132, ASCII, b"2021:01:02 at noon!")]))
        for words in (b" 2021:01:02 at noon! ", b" 6000x?"):
            self.assertIn(words, self.run_quavel("--table", "half.tif").stdout)
        self.put("b.tif", photo())
        chosen = [["--fields", "iso,model", "b.tif"], ["--card", "--fields", "iso,model", "b.tif"]]
        for arguments in chosen:
            self.assertRegex(self.run_quavel(*arguments).stdout, rb"^  ISO +-\n  Camera +-\n$")
            self.assertEqual(self.run_quavel("--absent", "skip", *arguments).stdout, b"")

    def test_piped_table_depends_on_rows_alone(self):
        first = self.put("0000.tif", photo())
        for i in range(1, 1100):
            os.link(first, self.folder / f"{i:04}.tif")
        self.put("later/x.cr3", cr3(model="写真機".encode()))
        tables = {self.run_quavel("-j", jobs, ".").stdout for jobs in ("1", "2", "256", "1")}
        self.assertEqual(len(tables), 1)
        lines = tables.pop().decode().splitlines()
        self.assertRegex(lines[0], r"^File        Captured          Size       Orient. +Camera +Lens +Exposure$")
        self.assertEqual((len(lines), lines[-1].split()[6]), (1102, "写真機"))
        self.assertEqual({line.index("2020-07-06 15:32") for line in lines[1:501]}, {12})
        with subprocess.Popen([COMMAND, "-q", "--files-from", "-"], stdin=subprocess.PIPE,
                              stdout=subprocess.PIPE, cwd=self.folder) as process:
            process.stdin.write(b"0001.tif\n0002.tif\n")
            process.stdin.flush()
            time.sleep(0.3)  # a pause brings no second header
            late, _ = process.communicate(b"later/x.cr3\n", 60)
        self.assertEqual(late, self.run_quavel("0001.tif", "0002.tif", "later/x.cr3").stdout)

    def test_fields_sort_and_absent(self):
        self.put("a.tif", photo(date=b"2022"))
        self.put("b.tif", photo(date=b""))
        self.put("c.tif", photo(date=b"2021", width=9))
        picked = self.objects("--fields", "width,path", "--sort", "captureDate", ".")
        self.assertEqual([list(r.items()) for r in picked],
                         [[("width", 9), ("path", "./c.tif")], [("width", 6000), ("path", "./a.tif")],
                          [("width", 6000), ("path", "./b.tif")]])
        self.assertEqual(self.names("--sort", "width", "."), ["./c.tif", "./a.tif", "./b.tif"])
        self.assertNotIn("iso", self.objects("--absent", "skip", "a.tif")[0])
        for name, exposure in (("d", (1, 0)), ("e", (2, 1)), ("f", (0, 0)), ("g", (1, 80))):
            self.put(name + ".cr3", cr3(exposure=exposure))
        self.assertEqual("".join(name[2] for name in self.names("--sort", "exposureTime", ".")),
                         "gedabcf")
        self.assertEqual("".join(name[2] for name in self.names("--sort", "-exposureTime", ".")),
                         "degabcf")

    def test_sorting_is_stable(self):
        names = [f"{i * 17 % 40:02}.tif" for i in range(40)]
        for i, name in enumerate(names):
            self.put(name, photo(width=100 + i % 2))
        for sort, first in (("width", 0), ("-width", 1)):
            self.assertEqual(self.names("--sort", sort, *names), names[first::2] + names[1 - first::2])

    def test_where_compares_exact_values(self):
        self.put("a.cr3", cr3(model=b"EOS R6", exif=[(0x8827, SHORT, 3200)]))
        self.put("b.cr3", cr3(model=b"EOS M50", exif=[(0x829D,)]))
        self.put("c.tif", photo(date=b"    :  :     :  :  "))
        self.put("d.nef", b"no")
        for conditions, shown in (
                (["iso>=3200"], "a"), (["iso>400"], "a"), (["iso<3200"], "b"), (["iso<=400"], "b"),
                (["iso=400"], "b"), (["iso==400"], "b"), (["iso != 400"], "a"), (["model~EOS"], "ab"),
                (["model~EOS", "iso > 400"], "a"), (["model~eos"], ""), (["model==EOS R6"], "a"),
                (["fNumber==5.6"], "a"), (["isRaw=false"], "c"), (["reason==other-kind"], "d"),
                (["captureDate<9"], "ab"), (["captureDate>=2021-01-02"], "ab"), (["captureDate>2021-01-03"], ""),
                (["captureDate~2021:01"], "ab"), (["captureDate==2021-01-02T03:04:05"], "ab"), (["captureDate>="], None), (["position<9"], "d"),
                (["exposureTime<Infinity"], "ab"), (["exposureBiasValue<-0.3"], "ab")):
            where = [word for condition in conditions for word in ("--where", condition)]
            done = self.run_quavel("--jsonl", *where, ".", status=1 if shown is not None else 2)
            found = [json.loads(line)["path"][2] for line in done.stdout.splitlines()]
            self.assertEqual("".join(found), shown or "", conditions)
        done = self.run_quavel("-q", "--jsonl", "--where", "iso=400", ".", status=1)
        self.assertIn(b"d.nef: ", done.stderr)
        self.assertIn(b"1 without record, 2 shown, ",
                      self.run_quavel("--print0", "--where", "model~EOS", ".", status=1).stderr)

    def test_print0_writes_what_is_shown(self):
        self.put(b"b\n\xff.cr3", cr3())
        self.put("a.tif", photo())
        self.put("c.nef", b"no")
        done = self.run_quavel("-q", "--print0", "--sort", "-path", ".", status=1)
        self.assertEqual(done.stdout, b"./b\n\xff.cr3\0./a.tif\0")
        self.assertIn(b"c.nef: ", done.stderr)

    def test_blank_dates_are_absent_to_people(self):
        blank = "    :  :     :  :  "
        for name, date in (("a", blank), ("b", "2018:02:21 12:08:56"), ("c", "2018:13:01 00:00:00"),
                           ("d", "2018: 2:21 12:08:56"), ("e", "2018:02:21 12: 8:56"), ("f", "0999:12:31 23:59:60"),
                           ("g", "2018:02:21 12:08:56Z"), ("h", "2021:02:29 00:00:00"), ("i", "2020:02:29 00:00:00")):
            self.put(name + ".tif", photo(date=date.encode()))
        dates = [row["dateTime"] for row in self.rows(".")]
        self.assertEqual((dates[0], dates[1]), (blank, "2018:02:21 12:08:56"))
        iso = [None, "2018-02-21T12:08:56", dates[2], dates[3], dates[4], "0999-12-31T23:59:60", *dates[6:8], "2020-02-29T00:00:00"]
        self.assertEqual([r["captureDate"] for r in self.objects("--dates", "iso", ".")], iso)
        self.assertEqual(self.objects("--dates", "exif", "."), self.objects("."))
        self.assertEqual(self.names("--sort", "dateTime", "a.tif", "b.tif"), ["b.tif", "a.tif"])
        for dated in ([], ["--dates", "iso"]):
            card = self.run_quavel(*dated, "--absent", "show", "--card", "a.tif", "b.tif").stdout
            self.assertRegex(card, rb"(?s)Captured +-\n.*File date +-\n.*Captured +2018-02-21 12:08:56\n")
        main = [(0x100, SHORT, 1), (0x101, SHORT, 1), (0x132, ASCII, b"2021:01:02 03:04:05"), (0x8769, SHORT, 83)]
        self.put("a.tif", tiff(main).ljust(83, b"\0") + directory([(0x9003, ASCII, blank.encode())], 83))
        self.assertRegex(self.run_quavel("a.tif").stdout, rb"Captured +2021-01-02 03:04:05\n")
        self.assertEqual([self.objects("--dates", form, "a.tif")[0]["captureDate"] for form in ("exif", "iso")],
                         [blank, "2021-01-02T03:04:05"])
        self.put("e.nef", b"")
        self.assertEqual(self.run_quavel("--print0", "--where", "reason==empty", ".", status=1).stdout, b"./e.nef\0")
        for form in (["--csv"], ["--print0"], ["--table"]):  # the same photos in every form
            done = self.run_quavel(*form, "--where", "captureDate<2022", "a.tif")
            self.assertIn(b"a.tif", done.stdout)

    def test_csv_says_once_what_it_leaves_out(self):
        self.put("a.nef", b"no")
        self.put("b.nef", b"no")
        done = self.run_quavel("-q", "--csv", "--lf", "--fields", "path,iso", ".", status=1)
        self.assertEqual((done.stdout, done.stderr.count(b"add error to --fields")),
                         (b"path,iso\n./a.nef,\n./b.nef,\n", 1))
        for arguments in (["--fields", "error"], [], ["--fields", "iso", "--where", "iso>0"]):
            self.assertNotIn(b"add error", self.run_quavel("--csv", *arguments, ".", status=1).stderr)

    def test_completions_know_fields_options_and_extensions(self):
        self.put("a.tif", photo())
        header = self.run_quavel("--csv", "a.tif").stdout.decode().splitlines()[0].split(",")
        folder = COMMAND_SOURCE / "completions"
        for name, pattern in (("quavel", r"_fields='([^']*)'"), ("_quavel", r"fields=\(([^)]*)\)"),
                              ("quavel.fish", r"set -g __quavel_fields ((?:[^\n]*\\\n)*[^\n]*)")):
            found = re.search(pattern, (folder / name).read_text(encoding="utf-8"))
            self.assertEqual(found[1].replace("\\", " ").split(), header, name)
        options = re.findall(r"(?m)^  (?:-\w,)?--([a-z0-9-]+)", self.run_quavel("--help").stdout.decode())
        self.assertGreater(len(options), 20)
        usage = self.run_quavel("--stdin", "--extension", "none", status=2).stderr.decode()
        extensions = re.search(r"these do: ([a-z0-9 ]+)", usage)[1]
        for name in ("completions/quavel", "completions/_quavel", "completions/quavel.fish", "quavel.1"):
            text = (folder.parent / name).read_text(encoding="utf-8").replace("\\-", "-")
            self.assertRegex(text, rf"\b{extensions}\b", name)
            for option in options:
                self.assertRegex(text, rf"(--| -l ){option}(?![\w-])", name)

    def test_bash_completes_values_and_names(self):
        self.put("-a.tif", b"")
        script = COMMAND_SOURCE / "completions/quavel"
        for words, expected in ((["--absent", "=", "sh"], "show"), (["--absent", "="], "skip show"),
                                (["--absent", "s"], "skip show"), (["--fields", "=", "iso,mod"], "iso,model"),
                                (["--fields", "iso,i"], "iso,isRaw"), (["--fields", "pathBytes,pa"], "pathBytes,path"),
                                (["--sort", "=", "-is"], "-isRaw -iso"), (["--sort", "ca"], "captureDate"),
                                (["--where", "mod"], "model"), (["--dates", "=", ""], "exif iso"), (["-j", ""], ""),
                                (["--why", "--cs"], "--csv"), (["--", "-"], "-a.tif"), (["--", "--sort", "i"], "")):
            run = 'compopt() { :; }; . "$0"; COMP_WORDS=(quavel "$@"); COMP_CWORD=$#; _quavel; ' \
                  'echo "${COMPREPLY[*]}"'
            done = subprocess.run(["bash", "-c", run, script, *words], cwd=self.folder,
                                  capture_output=True, text=True, check=True, timeout=60)
            self.assertEqual(done.stdout.strip(), expected, words)


class Names(CommandTest):
    def test_every_name_can_be_recovered(self):
        names = [b"sp ace.tif", b"new\nline.TIF", b"back\\slash\".tif", b"\xc2\x9b\x7f.tif", b'quo"te,.tif', b"-dash.tif",
                 b"caf\xe9.tif", b"-q=1.tif", b"lone\rcr.tif", b"only\\back.tif",
                 "é\u202e\x1b[2J.tif".encode()]
        for name in names:
            self.put(name, photo())
        listed = b"".join(name + b"\0" for name in names)
        for records in (self.objects("--", *names), json.loads(self.run_quavel("--json", "--", *names).stdout),
                        self.objects("-0", "--files-from", "-", input=listed),
                        self.rows("--", *names)):
            paths = [bytes.fromhex(r["pathBytes"]) if r.get("pathBytes") else r["path"].encode()
                     for r in records]
            self.assertEqual(paths, names)
        self.assertEqual(records[6]["path"], "caf\ufffd.tif")
        row, = self.rows("--files-from", "-", input=b"b\0c\n", status=1)
        self.assertEqual((row["path"], row["pathBytes"]), ("b\ufffdc", "620063"))

    def test_nothing_steers_the_terminal(self):
        name = b"\x1b]0;owned\x07\xe9\xe2\x80\xae.cr3"
        self.put(name, cr3(model=b"\x1b[31m\r\n\xff"))
        self.put(b"\x1b[1m.nef", b"")
        for arguments in ([], ["--card"], ["--sort", "path"]):
            done = self.run_quavel(*arguments, ".", status=1)
            text = (done.stdout + done.stderr).decode()
            self.assertFalse(set(text) & set("\x1b\x07\r\u202e"), text)
            self.assertIn(r"\x1b]0;owned\x07\xe9\u{202e}.cr3", text)
            self.assertIn(r"\x1b[31m\r\nÿ".replace(r"\r", r"\x0d"), text)
        for form in (["--json"], ["--jsonl"], ["--csv"], ["--why", "--json"], ["--print0"], []):
            text = self.on_terminal(*form, ".", status=1).replace("\r\n", "\n")
            self.assertFalse(set(text) & set("\x1b\x07\r\u202e"), text)
            if "--json" in form:
                self.assertEqual(json.loads(text), json.loads(self.run_quavel(*form, ".", status=1).stdout))
            piped = self.run_quavel(*form, ".", status=1).stdout.decode(errors="replace")
            self.assertEqual("\u202e" in piped, form != [], form)
        self.put("é\\.tif", photo())
        for form in ("--csv", "--print0", "--table", "--jsonl"):
            self.assertIn(r"é\\.tif", self.on_terminal(form, "é\\.tif"), form)
        self.assertIn(b"quavel: '': ", self.run_quavel("", status=1).stderr)
        self.put("back\\x1b.nef", b"")
        self.assertIn(rb"back\\x1b.nef: ", self.run_quavel("--csv", ".", status=1).stderr)
        usage = self.run_quavel("--\x1b[31m", status=2)
        self.assertNotIn(b"\x1b", usage.stderr)

    def test_columns_align_in_every_script(self):
        self.put("b.cr3", cr3(model=b"x" * 40))
        for model, shown, width in (
                ("e\u0301\u20dd", "e\u0301\u20dd", 1), ("漢字", "漢字", 4), ("हिन्दी", "हिन्दी", 5),
                ("\u1112\u1161\u11ab", "\u1112\u1161\u11ab", 2),  # 한 as macOS stores it
                ("❤\ufe0f\u200dن\u200c", "❤\ufe0f\u200dن\u200c", 2), ("\u06dd٠", "\u06dd٠", 2),
                ("a\u00adb\u2028\ufeff\x85", r"a\u{00ad}b\u{2028}\u{feff}\u{0085}", 34), ("\u2067", r"\u{2067}", 8),
                ("\U000e0041\u061c", r"\u{e0041}\u{061c}", 17)):
            self.put("a.cr3", cr3(model=model.encode()))
            table = self.run_quavel("--fields", "model,iso", ".").stdout.decode().splitlines()
            self.assertEqual(table[1], shown + " " * (42 - width) + "400")
            self.assertEqual(table[2], "x" * 40 + "  400")

    def test_bytes_beyond_utf8_end_no_run(self):
        for bad in (b"\xf4\x90\x80\x80", b"\xf8\x88\x80\x80\x80", b"\xfc\x84\x80\x80\x80\x80",
                    b"\xed\xa0\x80", b"\xc0\xaf", b"\xe0\x80\xaf", b"\xf0\x8f\xbf\xbf"):
            self.put(b"1" + bad + b".cr3", cr3(model=b"A" + bad))
            self.put("2.cr3", cr3(model="\U0010ffff\ud7ff\u0800".encode()))
            for form in ([], ["--card"], ["--json"], ["--jsonl"], ["--csv"]):
                output = self.run_quavel(*form, ".").stdout.decode()  # strict
                self.assertIn("2.cr3", output)
            first, second = json.loads(self.run_quavel("--json", ".").stdout)
            self.assertEqual(first["model"], "A" + bad.decode("latin1"))
            self.assertEqual(first["path"], "./1" + "\ufffd" * len(bad) + ".cr3")
            self.assertEqual(second["model"], "\U0010ffff\ud7ff\u0800")
            os.remove(os.path.join(os.fsencode(self.folder), b"1" + bad + b".cr3"))

    def test_texts_that_are_not_utf8_are_latin1(self):
        self.put("a.cr3", cr3(model=b"Cam\xe9ra"))
        self.put("b.cr3", cr3(model="Caméra".encode()))
        self.assertEqual([r["model"] for r in self.objects(".")], ["Caméra"] * 2)


class Inputs(CommandTest):
    def test_folder_is_walked_in_order_through_links(self):
        for name in ("in/b.tif", "in/a/z.JPG", "in/c.txt", "other/x.TIFF"):
            self.put(name, photo())
        os.mkfifo(self.folder / "in/pipe.jpg")
        for link, target in (("up", ".."), ("self", "self"), ("far", "../other"),
                             ("far2", "../other"), ("l.tif", "b.tif"), ("gone.tif", "nowhere.tif"),
                             ("gone.txt", "nowhere.txt")):
            (self.folder / "in" / link).symlink_to(target)
        done = self.run_quavel("--jsonl", "in", status=1)
        found = [json.loads(line)["path"] for line in done.stdout.splitlines()]
        walked = [p for p in found if not p.startswith("in/up/")]
        self.assertEqual(walked, ["in/a/z.JPG", "in/b.tif", "in/far/x.TIFF", "in/gone.tif",
                                  "in/l.tif"])
        for name in (b"pipe.jpg: is not a regular file", b"in/self: is a symbolic link",
                     b"in/far2: another", b"in/up/in: symbolic-link loop"):
            self.assertIn(name, done.stderr)

    def test_what_a_walk_leaves_out(self):
        for name in ("a.tif", "._a.tif", ".h.tif", ".Trash-1/b.tif", "cache/c.tif", "in/cache/d.tif"):
            self.put("x/" + name, photo())
        (self.folder / "x/.link").symlink_to("in")
        for options, found in (
                ([], ".h.tif a.tif cache/c.tif in/cache/d.tif"),
                (["--hidden"], "._a.tif .Trash-1/b.tif .h.tif .link/cache/d.tif a.tif cache/c.tif in/cache/d.tif"),
                (["--exclude", "cache", "--exclude", ".?.*"], "a.tif"),
                (["--exclude", "x/*/d.tif"], ".h.tif a.tif cache/c.tif"),
                (["--exclude", "cache/"], ".h.tif a.tif"),
                (["--exclude", "in/*"], ".h.tif a.tif cache/c.tif"),
                (["--exclude=[!.]*"], ".h.tif"), (["--exclude", "x", "--exclude", "A*"], ".h.tif a.tif "
                                                  "cache/c.tif in/cache/d.tif")):
            names = self.names(*options, "x")
            self.assertEqual(names, ["x/" + name for name in sorted(found.split())], options)
        self.assertEqual(self.names("x/._a.tif", "x/.Trash-1", "--exclude", "*.Trash-1", "--exclude", "._*"),
                         ["x/._a.tif", "x/.Trash-1/b.tif"])
        (self.folder / "y").mkdir()
        for before, folder, options in (("x/a.tif", "x", ["--exclude", "*"]), ("x", "y", [])):
            done = self.run_quavel("-q", *options, before, folder)
            self.assertRegex(done.stderr.decode(), rf"^quavel: {folder}: no photos .* tiff tif dng .*\n$")

    def test_lists_with_crlf_are_read(self):
        self.put("a.tif", photo())
        self.put("b.tif\r", photo())
        self.put("c.tif", photo())
        done = self.run_quavel("--jsonl", "--files-from", "-", input=b"a.tif\r\n\r\nc.tif\r\nb.tif\r\n", status=1)
        found = [json.loads(line)["path"] for line in done.stdout.splitlines()]
        self.assertEqual((found, done.stderr.count(b"CRLF")), (["a.tif", "c.tif", "b.tif\r"], 1))
        gone, = self.objects("-0", "--files-from", "-", input=b"a.tif\r\0", status=1)
        self.assertEqual(gone["path"], "a.tif\r")

    def test_what_cannot_be_read_is_told(self):
        os.mkfifo(self.folder / "pipe.jpg")
        self.put("empty.nef", b"")
        self.put("cut.nef", photo()[:20])
        self.put("notes.txt", b"x")
        self.put("folder/a.tif", photo())
        listed = b"pipe.jpg\nempty.nef\ncut.nef\n\nnotes.txt\nmissing.jpg\nfolder\n"
        listed += b"a" * 4096 + b"\n" + b"a" * 4097 + b"\nb\0c"
        done = self.run_quavel("--jsonl", "--files-from", "-", input=listed, status=1)
        manual = (COMMAND_SOURCE / "quavel.1").read_text(encoding="utf-8")
        for line, part, reason, position in zip(
                done.stdout.splitlines(),
                ("a FIFO, not a regular file", "is empty; copy it", "cut short: ",
                 "names no format; these do: tiff tif dng ", "No such file or directory; check the name", "a folder; give it as an argument",
                 "File name too long", "longer than a path", "NUL"),
                ("special-file", "empty", "cut-short", "unknown-extension", "cannot-open", "folder",
                 "cannot-open", "bad-path", "bad-path"), (None, None, 22, *[None] * 6), strict=True):
            found = json.loads(line)
            self.assertIn(part, found["error"])
            self.assertIn(found["error"].encode(), done.stderr)
            self.assertNotIn("--why", found["error"])
            self.assertEqual((found["reason"], found["position"]), (reason, position))
            self.assertIn("\n" + reason + "\t", manual)
        self.assertIn(b"9 files, 0 records, 9 without", done.stderr)
        self.assertEqual(self.run_quavel("-q", "--jsonl", "empty.nef", status=1).stderr, b"")
        self.assertIn(b"1 file, 0 records, 1 without", self.run_quavel("empty.nef", status=1).stderr)
        self.assertEqual(self.run_quavel("--why", "empty.nef", status=1).stderr, b"")

    def test_what_the_system_refuses_is_told(self):
        self.put("a/b.tif", photo())
        os.chmod(self.put("c.tif", photo()), 0)
        self.folder.chmod(0o755)
        (self.folder / "a").chmod(0)
        self.addCleanup((self.folder / "a").chmod, 0o700)
        nobody = {"user": 65534, "group": 65534, "extra_groups": []}  # root reads anything
        options = nobody if os.geteuid() == 0 else {}
        try:
            subprocess.run([COMMAND, "--version"], check=True, capture_output=True, **options)
        except PermissionError:
            self.skipTest("the command lies where only root can run it")
        self.assertIn(b"Permission denied", self.run_quavel(".", status=1, **options).stderr)
        folder, file = self.objects(".", status=1, **options)
        self.assertEqual((folder["path"], folder["reason"]), ("./a", "unreadable-folder"))
        self.assertEqual((file["path"], file["reason"]), ("./c.tif", "cannot-open"))
        self.assertIn("check its permissions", file["error"])

    def test_list_that_breaks_off_is_told(self):
        lost, = self.objects("--files-from", "/proc/self/mem", status=1)  # nothing lies at its start
        self.assertEqual((lost["path"], lost["reason"]), ("/proc/self/mem", "unreadable-list"))

    def test_order_is_the_inputs_whatever_the_jobs(self):
        names = [f"{i * 7919 % 1000:03}.tif" for i in range(1000)]
        for i, name in enumerate(names):
            self.put(name, photo(width=i) if i % 10 else b"")
        expected = self.objects(*names, "--jobs", "1", status=1)
        self.assertEqual([r["path"] for r in expected], names)
        for jobs in ("2", "5"):
            self.assertEqual(self.objects(*names, "--jobs", jobs, status=1), expected)

    def test_ten_thousand_arguments(self):
        self.put("a.tif", photo())
        self.assertEqual(len(self.objects(*["a.tif"] * 10000)), 10000)

    def test_standard_input_holds_an_image(self):
        records = self.objects("--stdin", "--extension", "CR3", input=cr3())
        self.assertEqual((records[0]["path"], records[0]["iso"]), ("-", 400))
        large, = self.objects("--stdin", "--extension", "tif", input=photo() + bytes(100000))
        self.assertEqual(large["width"], 6000)
        self.run_quavel("--stdin", "--extension", "cr3", input=b"", status=1)

    def test_wrong_usage(self):
        for line, word in (
                ("", "no photos given"), ("--json --csv x", "excludes"), ("--fields colour x", "'colour'"),
                ("--stdin", "requires --extension"), ("--fields iso,iso x", "'iso' is named twice"),
                ("-0 x", "--files-from"),
                ("--jobs 0 x", "'0' is not a number from 1 to 256"), ("-j 257 x", "'257'"), ("-j 0x10 x", "'0x10'"),
                ("--jobs 2.5 x", "'2.5'"), ("--jobs=+2 x", "'+2'"), ("-j ٣ x", "'٣'"), ("-q=0 x", "'-q=0'"),
                ("--quiet=false x", "'--quiet=false'"), ("--stdin --extension txt", '"txt"'),
                ("--csv=1 x", "'--csv=1'"),
                ("--stdin --extension nef x", "--stdin"), ("--absent no x", "'no'"), ("--dates us x", "'us'"),
                ("--files-from missing", "missing"), ("--nonsense", "--nonsense"), ("--files-from .", ".: "),
                ("--files-from -", "-: "), ("--why", "no photos"), ("--files-from ''", "is empty"),
                ("--sort '' x", "''"), ("--sort - x", "''"), ("--sort --iso x", "'-iso'"), ("--absent '' x", "''"),
                ("--fields iso,,model x", "''"), ("--why --csv x", "excludes"), ("--why --card x", "excludes"),
                ("--why --table x", "excludes"), ("--why --print0 x", "excludes"), ("--table --card x", "excludes"),
                ("--print0 --csv x", "excludes"), ("--lf --json x", "--csv"), ("--why --fields iso x", "--fields"),
                ("--why --absent show x", "--absent"), ("--fields '' x", "''"), ("--fields iso, x", "''"),
                ("--where iso x", "'iso' is not a comparison"), ("--where '' x", "''"), ("--where '>3' x", "''"),
                ("--where 'hue>3' x", "'hue'"), ("--where 'iso>3k' x", "'3k' is not a whole number"),
                ("--where iso>= x", "'iso>=' lacks"), ("--where iso=>3 x", "'iso=>3'"),
                ("--where model=~R6 x", "'model=~R6'"), ("--where 'model<>R6' x", "'model<>R6'"),
                ("--exclude= x y", "'--exclude='"), ("--where= x", "'--where='"), ("--files-from= x", "'--files-from='"),
                ("-j= x", "'-j='"), ("--where iso~3 x", "'~'"),
                ("--where fNumber=nan x", "'nan' is not a number"), ("--where isRaw=yes x", "'yes'"),
                ("--where iso!3 x", "'iso!3'"), ("--where fNumber<1,5 x", "'1,5'")):
            done = self.run_quavel(*shlex.split(line), status=2, preexec_fn=lambda: os.close(0))
            self.assertRegex(done.stderr.decode(), "^quavel: .*" + re.escape(word), line)
            self.assertEqual(done.stdout, b"")
        self.assertEqual(self.objects("-qj4", "--where=width>1", "--sort=iso", "/dev/null", status=1), [])


class Endings(CommandTest):
    def test_a_full_pipe_that_does_not_block_is_waited_for(self):
        first = self.put("0.tif", photo())
        for i in range(1, 300):
            os.link(first, self.folder / f"{i}.tif")
        end, start = os.pipe()
        os.set_blocking(start, False)
        process = subprocess.Popen([COMMAND, "-q", "--jsonl", "."], stdout=start, cwd=self.folder)
        os.close(start)
        time.sleep(0.1)
        with open(end, "rb") as pipe:
            self.assertEqual(len(pipe.read().splitlines()), 300)
        self.assertEqual(process.wait(60), 0)

    def many(self):
        self.put("a.tif", photo())
        return b"a.tif\0" * 20000

    def test_full_disk_is_an_error(self):
        self.put("a.tif", photo())
        for form in ([], ["--json"], ["--jsonl"], ["--csv"], ["--help"]):
            with open("/dev/full", "wb") as full:
                done = subprocess.run([COMMAND, *form, "a.tif"], cwd=self.folder, stdout=full,
                                      stderr=subprocess.PIPE, timeout=60)
            self.assertEqual((done.returncode, b"No space" in done.stderr), (1, True), form)

    def test_closed_pipe_ends_it_quietly(self):
        with tempfile.TemporaryFile() as listed:
            listed.write(self.many())
            listed.seek(0)
            process = subprocess.Popen([COMMAND, "--jsonl", "-0", "--files-from", "-"], stdin=listed,
                                       cwd=self.folder, stdout=subprocess.PIPE, stderr=subprocess.PIPE)
            process.stdout.readline()
            process.stdout.close()
            self.assertEqual((process.wait(60), process.stderr.read()), (0, b""))
            process.stderr.close()

    def test_interrupt_leaves_whole_output(self):
        for jobs, signals in (("1", [signal.SIGINT]), ("3", [signal.SIGINT]),
                              ("1", [signal.SIGINT, signal.SIGTERM, signal.SIGHUP])):
            with tempfile.TemporaryFile() as listed:
                listed.write(self.many())
                listed.seek(0)
                # Nobody reads: the command is stuck in a write when the signal comes.
                with subprocess.Popen([COMMAND, "--json", "--jobs", jobs, "-0", "--files-from", "-"],
                                      stdin=listed, stdout=subprocess.PIPE, cwd=self.folder) as process:
                    select.select([process.stdout], [], [], 60)
                    for number in signals:
                        process.send_signal(number)
                    output = process.stdout.read()
                    self.assertIn(process.wait(60), [-number for number in signals])
            self.assertLess(len(json.loads(output)), 20000)

    def test_interrupt_cuts_no_line(self):
        listed = self.many()
        for form, check in (("--jsonl", json.loads), ("--csv", lambda row: row.index(",,\r"))):
            with tempfile.TemporaryFile() as file:
                file.write(listed)
                file.seek(0)
                with subprocess.Popen([COMMAND, form, "-0", "--files-from", "-"], stdin=file,
                                      stdout=subprocess.PIPE, cwd=self.folder) as process:
                    select.select([process.stdout], [], [], 60)
                    process.send_signal(signal.SIGTERM)
                    lines = process.stdout.read().decode().split("\n")
                    self.assertEqual(process.wait(60), -signal.SIGTERM)
            self.assertEqual(lines.pop(), "")
            self.assertLess(len(lines), 20000)
            for line in lines[form == "--csv":]:
                check(line)

    def test_records_come_before_the_list_ends(self):
        self.put("a.tif", photo())
        with subprocess.Popen([COMMAND, "-q", "--jsonl", "--files-from", "-"], stdin=subprocess.PIPE,
                              stdout=subprocess.PIPE, cwd=self.folder) as process:
            for _ in range(3):
                process.stdin.write(b"a.tif\n")
                process.stdin.flush()
                self.assertTrue(select.select([process.stdout], [], [], 60)[0])
                self.assertEqual(json.loads(process.stdout.readline())["path"], "a.tif")
            process.stdin.close()
            self.assertEqual(process.wait(60), 0)

    def test_ignored_interrupts_stay_ignored(self):
        with subprocess.Popen([COMMAND, "--jsonl", "--files-from", "-"], stdin=subprocess.PIPE, cwd=self.folder,
                              stdout=subprocess.PIPE, stderr=subprocess.PIPE,
                              preexec_fn=lambda: signal.signal(signal.SIGINT, signal.SIG_IGN)) as process:
            process.stdin.write(b"a.tif\n")
            process.stdin.flush()
            process.stdout.readline()
            process.send_signal(signal.SIGINT)
            process.stdin.write(b"b.tif\n")
            process.stdin.flush()
            self.assertIn(b"b.tif", process.stdout.readline())
            process.send_signal(signal.SIGTERM)
            self.assertEqual(process.wait(60), -signal.SIGTERM)

    def test_interrupt_in_a_shell_ends_its_loop(self):
        self.many()
        (self.folder / "list").write_bytes(b"a.tif\n" * 2000000)
        main, side = pty.openpty()
        run = f"{shlex.quote(COMMAND)} -q --csv --files-from list >/dev/null"
        loop = f"for i in 1 2 3; do echo $i; {run}; done; echo end"
        with subprocess.Popen(["bash", "-c", loop], stdin=side, stdout=side, stderr=side, cwd=self.folder,
                              start_new_session=True,
                              preexec_fn=lambda: fcntl.ioctl(0, termios.TIOCSCTTY, 0)) as process:
            os.close(side)
            self.assertEqual(os.read(main, 99), b"1\r\n")
            time.sleep(0.3)
            os.write(main, b"\x03")
            self.assertEqual(process.wait(60), -signal.SIGINT)
            self.assertEqual(os.read(main, 99), b"^C")
            os.close(main)

    def test_closed_standard_streams(self):
        self.put("a.tif", photo())
        self.put("b.nef", b"")
        for closed, status, output in (([0], 1, b'"./b.nef"'), ([1], 1, b""), ([2], 1, b'"./b.nef"'),
                                       ([0, 1, 2], 1, b""), ([1, 2], 1, b"")):
            done = subprocess.run([COMMAND, "--jsonl", "."], cwd=self.folder, capture_output=True, timeout=60,
                                  preexec_fn=lambda: [os.close(fd) for fd in closed])
            self.assertEqual((done.returncode, output in done.stdout), (status, True), closed)
            self.assertEqual(b"the output cannot be written" in done.stderr, closed == [1], closed)
        done = self.run_quavel("--stdin", "--extension", "tif", status=1, preexec_fn=lambda: os.close(0))
        self.assertIn(b"-: cannot be read: ", done.stderr)

    def test_progress_shows_on_a_terminal_and_goes(self):
        (self.folder / "list").write_bytes(self.many().replace(b"\0", b"\n"))
        main, side = pty.openpty()
        fcntl.ioctl(side, termios.TIOCSWINSZ, struct.pack("HHHH", 24, 60, 0, 0))
        with subprocess.Popen([COMMAND, "--jsonl", "--files-from", "list"], stdout=subprocess.PIPE, stderr=side,
                              cwd=self.folder) as process:
            os.close(side)
            time.sleep(0.6)  # a slow reader makes a slow run
            for megabytes in range(0, 20, 2):
                if megabytes == 6:
                    fcntl.ioctl(main, termios.TIOCSWINSZ, struct.pack("HHHH", 24, 24, 0, 0))
                process.stdout.read(2000000)
                time.sleep(0.15 if process.poll() is None else 0)
            process.stdout.read()
            process.wait(60)  # the summary comes last
            shown = os.read(main, 65536).decode()
            os.close(main)
        self.assertRegex(shown, r"^\r\x1b\[K\d+ files, \d+ files/s\r")
        self.assertRegex(shown, r"\r\x1b\[K\d+ of 20000 files, \d+ files/s, \d+ s left\r\x1b\[K")
        self.assertRegex(shown, r"\r\x1b\[K\d{5} of 20000 files, …\r\x1b\[K")  # 23 of 24 cells
        self.assertRegex(shown, r"\r\x1b\[Kquavel: 20000 files, 20000 records, 0 without record, .* files/s\r\n$")
        seconds, rate = re.search(r"(\d+\.\d+) s, (\d+) files/s\r\n$", shown).groups()
        self.assertAlmostEqual(float(seconds) * int(rate), 20000, delta=200)
        self.assertEqual(self.on_terminal("--jsonl", "a.tif", stream="stderr"), "")
        self.assertNotIn("\x1b", self.on_terminal("--jsonl", ".", "a.tif", stream="stderr"))


@unittest.skipUnless(SAMPLES, "QUAVEL_SAMPLES is not set")
class Samples(CommandTest):
    def test_records_are_the_expected_ones(self):
        with open(Path(SAMPLES) / "expected.ndjson", encoding="utf-8") as lines:
            expected = {row["file"]: row["expected"] for row in map(json.loads, lines)}
        found = {Path(r["path"]).name: r for r in self.objects(SAMPLES, status=1)}
        self.assertEqual(set(found), set(expected))
        for name, record in expected.items():
            self.assertEqual("error" in found[name], record is None, name)
            for key, value in (record or {}).items():
                got = found[name][key]
                if value in ("nan", "", -1):
                    self.assertIsNone(got, (name, key))
                elif isinstance(value, float):
                    self.assertAlmostEqual(got, value, delta=abs(value) * 1e-6)
                else:
                    self.assertEqual(got, value, (name, key))


if __name__ == "__main__":
    unittest.main()
