"""The quavel command, driven as its users drive it."""

import csv
import fcntl
import io
import json
import math
import os
import pty
import re
import select
import shutil
import signal
import struct
import subprocess
import tempfile
import termios
import unittest
from pathlib import Path

COMMAND = os.environ["QUAVEL_COMMAND"]
SAMPLES = os.environ.get("QUAVEL_SAMPLES")
COMMAND_SOURCE = Path(__file__).resolve().parents[2] / "apps/quavel"

ASCII, SHORT, RATIONAL, SRATIONAL = 2, 3, 5, 10


def tiff(entries):
    """A little-endian TIFF structure of (tag, type, value) entries."""
    directory, data = b"", b""
    data_start = 8 + 2 + 12 * len(entries) + 4
    for tag, kind, value in entries:
        if kind == SHORT:
            directory += struct.pack("<HHIHH", tag, kind, 1, value, 0)
            continue
        raw = value if kind == ASCII else struct.pack("<ii" if kind == SRATIONAL else "<II", *value)
        raw = raw.ljust(5, b"\0")  # never inline
        count = len(raw) if kind == ASCII else 1
        directory += struct.pack("<HHII", tag, kind, count, data_start + len(data))
        data += raw
    return b"II*\0\x08\0\0\0" + struct.pack("<H", len(entries)) + directory + bytes(4) + data


def photo(date=b"2020:07:06 15:32:17", width=6000):
    return tiff([(0x100, SHORT, width), (0x101, SHORT, 4000), (0x112, SHORT, 6), (0x132, ASCII, date)])


def box(kind, payload):
    return struct.pack(">I4s", len(payload) + 8, kind) + payload


def cr3(model=b"Box Camera", exposure=(1, 80)):
    cmt1 = tiff([(0x100, SHORT, 6000), (0x101, SHORT, 4000), (0x110, ASCII, model),
                 (0x112, SHORT, 8), (0x132, ASCII, b"2021:01:02 03:04:05")])
    cmt2 = tiff([(0x829A, RATIONAL, exposure), (0x829D, RATIONAL, (28, 5)), (0x8827, SHORT, 400),
                 (0x9204, SRATIONAL, (-1, 3)), (0x9207, SHORT, 5), (0x920A, RATIONAL, (35, 1)),
                 (0xA403, SHORT, 1)])
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
        self.put("a.cr3", cr3(exposure=(1, 0)))
        self.put("b.cr3", cr3(exposure=(0, 0)))
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
        self.put("b.tif", photo())
        chosen = [["--fields", "iso,model", "b.tif"], ["--card", "--fields", "iso,model", "b.tif"]]
        for arguments in chosen:
            self.assertRegex(self.run_quavel(*arguments).stdout, rb"^  ISO +-\n  Camera +-\n$")
            self.assertEqual(self.run_quavel("--absent", "skip", *arguments).stdout, b"")

    def test_table_shows_what_a_later_page_brings(self):
        for i in range(600):
            self.put(f"{i:03}.tif", photo())
        self.put("600.cr3", cr3(model="写真機".encode()))
        lines = self.run_quavel(".").stdout.decode().splitlines()
        headers = [line for line in lines if line.startswith("File")]
        self.assertNotIn("Camera", headers[0])
        self.assertIn("Camera", headers[-1])
        self.assertIn("写真機", lines[-1])
        self.assertEqual(len([line for line in lines if line.startswith("./")]), 601)

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

    def test_completions_know_the_fields(self):
        self.put("a.tif", photo())
        header = self.run_quavel("--csv", "a.tif").stdout.decode().splitlines()[0].split(",")
        folder = COMMAND_SOURCE / "completions"
        for name, pattern in (("quavel", r"_fields='([^']*)'"), ("_quavel", r"fields=\(([^)]*)\)"),
                              ("quavel.fish", r"set -l fields ((?:[^\n]*\\\n)*[^\n]*)")):
            found = re.search(pattern, (folder / name).read_text(encoding="utf-8"))
            self.assertEqual(found[1].replace("\\", " ").split(), header, name)

    @unittest.skipUnless(shutil.which("bash"), "needs bash")
    def test_bash_completes_values_and_names(self):
        self.put("-a.tif", b"")
        script = COMMAND_SOURCE / "completions/quavel"
        for words, expected in ((["--absent", "=", "sh"], "show"), (["--absent", "="], "skip show"),
                                (["--absent", "s"], "skip show"), (["--fields", "=", "iso,mod"], "iso,model"),
                                (["--why", "--cs"], "--csv"), (["--", "-"], "-a.tif"), (["--", "--sort", "i"], "")):
            run = 'compopt() { :; }; . "$0"; COMP_WORDS=(quavel "$@"); COMP_CWORD=$#; _quavel; ' \
                  'echo "${COMPREPLY[*]}"'
            done = subprocess.run(["bash", "-c", run, script, *words], cwd=self.folder,
                                  capture_output=True, text=True, check=True, timeout=60)
            self.assertEqual(done.stdout.strip(), expected, words)


class Names(CommandTest):
    def test_any_name_comes_back(self):
        names = [b"sp ace.tif", b"new\nline.TIF", b'quo"te,.tif', b"-dash.tif", b"caf\xe9.tif",
                 "é\u202e\x1b[2J.tif".encode()]
        for name in names:
            self.put(name, photo())
        listed = b"".join(name + b"\0" for name in names)
        for records in (self.objects("--", *names),
                        self.objects("-0", "--files-from", "-", input=listed),
                        self.rows("--", *names)):
            paths = [bytes.fromhex(r["pathBytes"]) if r.get("pathBytes") else r["path"].encode()
                     for r in records]
            self.assertEqual(paths, names)
        self.assertEqual(records[4]["path"], "caf\ufffd.tif")
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
        usage = self.run_quavel("--\x1b[31m", status=2)
        self.assertNotIn(b"\x1b", usage.stderr)

    def test_columns_follow_the_script(self):
        self.put("b.cr3", cr3(model=b"x" * 40))
        for model, shown, width in (
                ("e\u0301\u20dd", "e\u0301\u20dd", 1), ("漢字", "漢字", 4), ("हिन्दी", "हिन्दी", 5),
                ("\u1112\u1161\u11ab", "\u1112\u1161\u11ab", 2),  # 한 as macOS stores it
                ("❤\ufe0f\u200dن\u200c", "❤\ufe0f\u200dن\u200c", 2), ("\u06dd٠", "\u06dd٠", 2),
                ("a\u00adb\u2028\ufeff\x85", r"a\u{00ad}b\u{2028}\u{feff}\u{0085}", 34),
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

    def test_texts_that_are_no_utf8_are_latin1(self):
        self.put("a.cr3", cr3(model=b"Cam\xe9ra"))
        self.put("b.cr3", cr3(model="Caméra".encode()))
        self.assertEqual([r["model"] for r in self.objects(".")], ["Caméra"] * 2)


class Inputs(CommandTest):
    def test_folder_is_walked_in_order_through_links(self):
        for name in ("in/b.tif", "in/a/z.JPG", "in/c.txt", "other/x.TIFF"):
            self.put(name, photo())
        os.mkfifo(self.folder / "in/pipe.jpg")
        for link, target in (("up", ".."), ("self", "self"), ("far", "../other"),
                             ("far2", "../other"), ("l.tif", "b.tif"), ("gone.tif", "nowhere.tif")):
            (self.folder / "in" / link).symlink_to(target)
        done = self.run_quavel("--jsonl", "in", status=1)
        found = [json.loads(line)["path"] for line in done.stdout.splitlines()]
        walked = [p for p in found if not p.startswith("in/up/")]
        self.assertEqual(walked, ["in/a/z.JPG", "in/b.tif", "in/far/x.TIFF", "in/gone.tif",
                                  "in/l.tif"])
        for name in (b"pipe.jpg: is not a regular file", b"in/self: is a symbolic link",
                     b"in/far2: another", b"in/up/in: symbolic-link loop"):
            self.assertIn(name, done.stderr)

    def test_what_cannot_be_read_is_told(self):
        os.mkfifo(self.folder / "pipe.jpg")
        self.put("empty.nef", b"")
        self.put("cut.nef", photo()[:20])
        self.put("notes.txt", b"x")
        self.put("folder/a.tif", photo())
        listed = b"pipe.jpg\nempty.nef\ncut.nef\n\nnotes.txt\nmissing.jpg\nfolder\n" + b"a" * 5000 + b"\nb\0c"
        done = self.run_quavel("--jsonl", "--files-from", "-", input=listed, status=1)
        manual = (COMMAND_SOURCE / "quavel.1").read_text(encoding="utf-8")
        for line, part, reason, position in zip(
                done.stdout.splitlines(),
                ("a FIFO, not a regular file", "is empty; copy it", "cut short: ", "tiff tif dng nef cr2 raf arw jpeg "
                 "jpg nrw 3fr cr3", "No such file or directory; check the name", "a folder; give it as an argument",
                 "longer than a path", "NUL"),
                ("special-file", "empty", "cut-short", "unknown-extension", "cannot-open", "folder",
                 "bad-path", "bad-path"), (None, None, 22, None, None, None, None, None), strict=True):
            found = json.loads(line)
            self.assertIn(part, found["error"])
            self.assertIn(found["error"].encode(), done.stderr)
            self.assertNotIn("--why", found["error"])
            self.assertEqual((found["reason"], found["position"]), (reason, position))
            self.assertIn("\n" + reason + "\t", manual)
        self.assertIn(b"8 files, 0 records, 8 without", done.stderr)
        self.assertEqual(self.run_quavel("-q", "--jsonl", "empty.nef", status=1).stderr, b"")

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
        self.run_quavel("--stdin", "--extension", "cr3", input=b"", status=1)

    def test_wrong_usage(self):
        for arguments in ([], ["--json", "--csv", "x"], ["--fields", "colour", "x"], ["--stdin"],
                          ["--fields", "iso,iso", "x"], ["-0", "x"], ["--jobs", "0", "x"],
                          ["--stdin", "--extension", "txt"], ["--stdin", "--extension", "nef", "x"],
                          ["--absent", "no", "x"], ["--files-from", "missing"], ["--nonsense"],
                          ["--files-from", "."], ["--files-from", "-"], ["--why"],
                          ["--files-from", ""], ["--sort", "", "x"],
                          ["--absent", "", "x"], ["--fields", "iso,,model", "x"],
                          ["--why", "--csv", "x"], ["--why", "--card", "x"],
                          ["--why", "--fields", "iso", "x"], ["--why", "--absent", "show", "x"],
                          ["--fields", "", "x"], ["--fields", "iso,", "x"]):
            done = self.run_quavel(*arguments, status=2, preexec_fn=lambda: os.close(0))
            self.assertRegex(done.stderr, rb"^quavel: .")
            self.assertEqual(done.stdout, b"")


class Endings(CommandTest):
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

    def test_table_fits_the_terminal(self):
        self.put("folder/with a long name/a.cr3", cr3())
        self.put("folder/with a long name/b.cr3", cr3())
        for width, file in ((120, "./folder/with a long name/a.cr3"), (40, "…ith a long name/a.cr3")):
            main, side = pty.openpty()
            fcntl.ioctl(side, termios.TIOCSWINSZ, struct.pack("HHHH", 24, width, 0, 0))
            subprocess.run([COMMAND, "-q", "."], cwd=self.folder, stdout=side, timeout=60, check=True)
            lines = os.read(main, 65536).decode().splitlines()
            os.close(side)
            os.close(main)
            self.assertTrue(all(len(line) <= width for line in lines), lines)
            self.assertEqual(lines[1].split("  ")[0], file)


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
