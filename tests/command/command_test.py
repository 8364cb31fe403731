"""What a transcript cannot show of the command: odd bytes, many files, signals, terminals, permissions."""

import contextlib
import csv
import fcntl
import io
import json
import os
import pty
import re
import select
import shlex
import signal
import struct
import subprocess
import termios
import time
import unittest
from pathlib import Path

from command import COMMAND, ROOT, SAMPLES, CommandTest, open_terminal
from photos import photo

SOURCE = ROOT / "apps/quavel"

for number in (signal.SIGINT, signal.SIGTERM, signal.SIGHUP):
    signal.signal(number, signal.SIG_DFL)  # whoever runs this may ignore them


class Names(CommandTest):
    def test_every_name_can_be_recovered(self):
        names = [b"sp ace.tif", b"new\nline.TIF", b"back\\slash\".tif", b"\xc2\x9b\x7f.tif", b'quo"te,.tif',
                 b"-dash.tif", b"caf\xe9.tif", b"-q=1.tif", b"lone\rcr.tif", b"only\\back.tif",
                 "é\u202e\x1b[2J.tif".encode()]
        for name in names:
            self.put(name, photo())
        table = self.run_quavel("--csv", "--", *names).stdout.decode()
        listed = b"".join(name + b"\0" for name in names)
        for records in (self.objects("--", *names), json.loads(self.run_quavel("--json", "--", *names).stdout),
                        self.objects("-0", "--files-from", "-", input=listed),
                        csv.DictReader(io.StringIO(table, newline=""))):
            paths = [bytes.fromhex(record["pathBytes"]) if record.get("pathBytes") else record["path"].encode()
                     for record in records]
            self.assertEqual(paths, names)
        done = self.run_quavel("--print0", "--sort", "-path", ".")
        self.assertEqual(done.stdout.split(b"\0")[0], "./é\u202e\x1b[2J.tif".encode())
        self.assertEqual(sorted(done.stdout.split(b"\0")), [b"", *sorted(b"./" + name for name in names)])

    def test_nothing_steers_the_terminal(self):
        self.put(b"\x1b]0;owned\x07\xe9\xe2\x80\xae.cr3", photo("cr3", model=b"\x1b[31m\r\n\xff"))
        self.put(b"\x1b[1m.nef", b"")
        self.put(b"delete\x7f.tif", photo())  # within eight bytes
        self.put(b"12345\x7f78.tif", photo())  # and elsewhere
        steering = set("\x1b\x07\r\x7f\u202e")
        for arguments in ([], ["--card"], ["--sort", "path"]):
            done = self.run_quavel(*arguments, ".", status=1)
            text = (done.stdout + done.stderr).decode()
            self.assertFalse(set(text) & steering, text)
            self.assertIn(r"\x1b]0;owned\x07\xe9\u{202e}.cr3", text)
            self.assertIn(r"\x1b[31m\x0d\nÿ", text)
        for form in (["--json"], ["--jsonl"], ["--csv"], ["--why", "--json"], ["--print0"], []):
            text = self.on_terminal(COMMAND, *form, ".")[0].replace("\r\n", "\n")  # CSV has them
            self.assertFalse(set(text) & steering, text)
            piped = self.run_quavel(*form, ".", status=1).stdout.decode(errors="replace")
            self.assertEqual("\u202e" in piped, form != [], form)
            if "--json" in form:
                self.assertEqual(json.loads(text), json.loads(piped))
        self.put("é\\.tif", photo())
        for form in ("--csv", "--print0", "--table", "--jsonl"):
            self.assertIn(r"é\\.tif", self.on_terminal(COMMAND, form, "é\\.tif")[0], form)

    def test_bytes_beyond_utf8_end_no_run(self):
        odd = [b"\xe9", b"\xf4\x90\x80\x80", b"\xf8\x88\x80\x80\x80", b"\xfc\x84\x80\x80\x80\x80", b"\xed\xa0\x80",
               b"\xc0\xaf", b"\xe0\x80\xaf", b"\xf0\x8f\xbf\xbf"]
        for number, text in enumerate(odd):
            self.put(b"%d%s.cr3" % (number, text), photo("cr3", model=b"A" + text))
        self.put("even.cr3", photo("cr3", model="\U0010ffff\ud7ff\u0800"))
        for form in ([], ["--card"], ["--json"], ["--csv"]):
            self.assertIn("even.cr3", self.run_quavel(*form, ".").stdout.decode())  # strict
        *found, even = self.objects(".")
        self.assertEqual([record["model"] for record in found], ["A" + text.decode("latin-1") for text in odd])
        self.assertEqual([record["path"] for record in found],
                         [f"./{number}" + "\ufffd" * len(text) + ".cr3" for number, text in enumerate(odd)])
        self.assertEqual(even["model"], "\U0010ffff\ud7ff\u0800")

    def test_long_texts_are_cut(self):
        for model, most in (("x" * 5000, 203), ("x" + "\u0301" * 5000, 1603)):
            self.put("a.cr3", photo("cr3", model=model))
            card = self.run_quavel("--fields", "model", "a.cr3").stdout.decode()
            self.assertRegex(card, r"^  Camera +x.*…\n$")
            self.assertLessEqual(len(card.split()[1].encode()), most)


class ManyFiles(CommandTest):
    def test_piped_table_depends_on_rows_alone(self):
        self.put("0/first.cr3", photo("cr3"))
        second = self.put("0000.tif", photo())
        for i in range(1, 1099):
            os.link(second, self.folder / f"{i:04}.tif")
        self.put("later/folder/x.cr3", photo("cr3", model="写真機"))
        tables = {self.run_quavel("-j", jobs, ".").stdout for jobs in ("1", "2", "256", "1")}
        self.assertEqual(len(tables), 1)
        lines = tables.pop().decode().splitlines()
        self.assertEqual(len(lines), 1102)
        self.assertRegex(lines[0], r"^File           Captured          Size       Orient. +Camera +Lens +Exposure$")
        self.assertEqual({line.index("  6000x4000") for line in lines[1:1001]}, {31})  # no later page narrows it
        self.assertRegex(lines[-1], r"^./later/folder/x.cr3  2021-.* 写真機 ")

    def test_order_is_the_inputs_whatever_the_jobs(self):
        names = [f"{i * 7919 % 1000:03}.tif" for i in range(1000)]
        kinds = [self.put(str(size), photo(width=size)) for size in (1, 2)] + [self.put("empty", b"")]
        for i, name in enumerate(names):
            os.link(kinds[i % 2 if i % 10 else 2], self.folder / name)
        expected = self.objects(*names, "--jobs", "1", status=1)
        self.assertEqual([record["path"] for record in expected], names)
        for jobs in ("2", "5"):  # no assertEqual: to find the differences of so much takes minutes
            self.assertTrue(self.objects(*names, "--jobs", jobs, status=1) == expected, jobs)
        for sort, order in (("width", 1), ("-width", -1)):  # kept among equals
            by_width = sorted(expected, key=lambda record: record.get("width", order * 10) * order)
            self.assertTrue(self.objects(*names, "--sort", sort, status=1) == by_width, sort)


class Documents(CommandTest):
    def test_completions_and_manual_know_fields_options_extensions_and_reasons(self):
        self.put("a.tif", photo())
        header = self.run_quavel("--csv", "a.tif").stdout.decode().splitlines()[0].split(",")
        for name, pattern in (("quavel", r"_fields='([^']*)'"), ("_quavel", r"fields=\(([^)]*)\)"),
                              ("quavel.fish", r"set -g __quavel_fields ((?:[^\n]*\\\n)*[^\n]*)")):
            found = re.search(pattern, (SOURCE / "completions" / name).read_text(encoding="utf-8"))
            self.assertEqual(found[1].replace("\\", " ").split(), header, name)
        options = re.findall(r"(?m)^  (?:-\w,)?--([a-z0-9-]+)", self.run_quavel("--help").stdout.decode())
        self.assertGreater(len(options), 20)
        usage = self.run_quavel("--stdin", "--extension", "none", status=2).stderr.decode()
        extensions = re.search(r"these do: ([a-z0-9 ]+)", usage)[1]
        for name in ("completions/quavel", "completions/_quavel", "completions/quavel.fish", "quavel.1"):
            text = (SOURCE / name).read_text(encoding="utf-8").replace("\\-", "-")
            self.assertRegex(text, rf"\b{extensions}\b", name)
            for option in options:
                self.assertRegex(text, rf"(--| -l ){option}(?![\w-])", name)
        transcripts = "".join(file.read_text(encoding="utf-8") for file in ROOT.glob("tests/command/transcripts/*.txt"))
        for reason in set(re.findall(r'"error":.*?"reason":"([a-z-]+)"', transcripts)):
            self.assertIn(f"\n{reason}\t", text)


def written(terminal):
    """What a terminal has been sent and nobody has read; it holds 4 KB at most."""
    text = b""
    with contextlib.suppress(OSError):  # the end, to Linux
        while select.select([terminal], [], [], 0)[0]:
            text += os.read(terminal, 4096)
    return text


class Endings(CommandTest):
    def setUp(self):
        super().setUp()
        self.put("a.tif", photo())
        self.put("list", b"a.tif\n" * 20000)

    def start(self, *arguments, **options):
        return subprocess.Popen([COMMAND, *arguments], cwd=self.folder, **options)

    def test_a_full_pipe_that_does_not_block_is_waited_for(self):
        end, start = os.pipe()
        os.set_blocking(start, False)
        process = self.start("-q", "--jsonl", *["a.tif"] * 300, stdout=start)
        os.close(start)
        time.sleep(0.1)
        with open(end, "rb") as pipe:
            self.assertEqual(len(pipe.read().splitlines()), 300)
        self.assertEqual(process.wait(60), 0)

    def interrupted(self, *arguments, signals=(signal.SIGTERM,)):
        """The output of a run that is stuck in a write, because nobody reads, when the signals come."""
        with self.start(*arguments, "--files-from", "list", stdout=subprocess.PIPE) as process:
            select.select([process.stdout], [], [], 60)
            for number in signals:
                process.send_signal(number)
            output = process.stdout.read().decode()
            self.assertIn(process.wait(60), [-number for number in signals])
        return output

    def test_interrupt_cuts_nothing(self):
        for jobs, *signals in (("1", signal.SIGINT), ("3", signal.SIGINT),
                               ("1", signal.SIGINT, signal.SIGTERM, signal.SIGHUP)):
            self.assertLess(len(json.loads(self.interrupted("--json", "-j", jobs, signals=signals))), 20000)
        for form, check in (("--jsonl", json.loads), ("--csv", lambda row: row.index(",,\r"))):
            *lines, last = self.interrupted(form).split("\n")
            self.assertEqual(last, "")
            self.assertLess(len(lines), 20000)
            for line in lines[form == "--csv":]:
                check(line)

    def test_few_files_wait_for_one_that_takes_long(self):
        self.put("list", b"a.tif\n" * 3 + b"slow.tif\n" + (b"./" * 1000 + b"a.tif\n") * 1000)
        signal.signal(signal.SIGIO, signal.SIG_IGN)  # it would tell that the command waits in open
        held = os.open(self.put("slow.tif", photo()), os.O_RDWR)
        fcntl.fcntl(held, fcntl.F_SETLEASE, fcntl.F_WRLCK)  # whoever opens the file waits until this ends
        with self.start("-q", "-j", "2", "--csv", "--files-from", "list", stdout=subprocess.PIPE) as process:
            time.sleep(0.2)
            process_folder = Path(f"/proc/{process.pid}")
            lists = [fd.name for fd in (process_folder / "fd").iterdir() if os.readlink(fd).endswith("/list")]
            read = [int((process_folder / "fdinfo" / fd).read_text().split()[1]) for fd in lists]
            os.close(held)
            self.assertEqual(len(process.stdout.read().splitlines()), 1005)
        self.assertTrue(read and read[0] < 200_000, read)  # no list: it has been read to its end

    def test_interrupt_completes_json_that_lacks_only_its_end(self):
        length = len(self.run_quavel("-q", "--json", "a.tif").stdout.removesuffix(b"\n]\n"))
        end, start = os.pipe()
        fcntl.fcntl(start, fcntl.F_SETPIPE_SZ, 4096)
        process = self.start("-q", "--json", "." + "/" * (4094 - length) + "a.tif", stdout=start)  # 1 byte is left
        os.close(start)
        time.sleep(0.1)
        process.send_signal(signal.SIGINT)
        with open(end, "rb") as pipe:
            self.assertEqual(len(json.loads(pipe.read())), 1)
        self.assertEqual(process.wait(60), -signal.SIGINT)

    def test_records_come_before_the_list_ends_and_ignored_interrupts_stay_ignored(self):
        os.makedirs(os.path.join(self.folder, "walked", "z"))  # nothing is found in z, the last
        for name in ("walked/b.tif", "walked/c.tif"):
            self.put(name, photo())
        with self.start("-q", "--jsonl", "walked", "--files-from", "-", stdin=subprocess.PIPE, stdout=subprocess.PIPE,
                        bufsize=0,  # or a second line could wait in a buffer, where `select` does not see it
                        preexec_fn=lambda: signal.signal(signal.SIGINT, signal.SIG_IGN)) as process:
            for name in ["walked/b.tif", "walked/c.tif"] + 3 * ["a.tif"]:
                self.assertTrue(select.select([process.stdout], [], [], 60)[0])
                self.assertEqual(json.loads(process.stdout.readline())["path"], name)
                if name != "walked/b.tif":
                    process.stdin.write(b"a.tif\n")
                process.send_signal(signal.SIGINT)
            process.send_signal(signal.SIGTERM)
            self.assertEqual(process.wait(60), -signal.SIGTERM)

    def test_interrupt_in_a_shell_ends_its_loop(self):
        self.put("list", b"a.tif\n" * 2000000)
        main, side = pty.openpty()
        run = f"{shlex.quote(COMMAND)} -q --csv --files-from list >/dev/null"
        loop = f"for i in 1 2 3; do echo $i; {run}; done; echo end"
        with subprocess.Popen(["bash", "-c", loop], stdin=side, stdout=side, stderr=side, cwd=self.folder,
                              start_new_session=True,
                              preexec_fn=lambda: fcntl.ioctl(0, termios.TIOCSCTTY, 0)) as process:
            os.close(side)
            self.assertEqual(os.read(main, 99), b"1\r\n")
            time.sleep(0.1)
            os.write(main, b"\x03")
            self.assertEqual(process.wait(60), -signal.SIGINT)
            self.assertEqual(os.read(main, 99), b"^C")
            os.close(main)

    def test_progress_shows_on_a_terminal_and_goes(self):
        main, side = open_terminal(60)
        _, other = open_terminal(60)
        shrunk, shrunk_side = open_terminal(60)
        self.put("shrunk", b"a.tif\n" * 20000)
        self.put("long", (b"./" * 2040 + b"a.tif\n") * 100)  # each record is written in pieces
        with self.start("--jsonl", "--files-from", "list", stdout=subprocess.PIPE, stderr=side) as process, \
                self.start("--print0", "--files-from", "-", stdin=subprocess.PIPE, stdout=subprocess.PIPE,
                           stderr=other) as piped, \
                self.start("--jsonl", "--files-from", "shrunk", stdout=subprocess.PIPE, stderr=shrunk_side) as fewer, \
                self.start("-q", "--jsonl", "--files-from", "long", stdout=subprocess.PIPE) as stuck:
            os.close(side)
            time.sleep(0.3)  # a slow reader makes a slow run
            stuck.send_signal(signal.SIGINT)  # which a write that has begun delays, but not for long
            os.replace(self.put("one", b"a.tif\n"), self.folder / "shrunk")  # before it is counted
            time.sleep(0.3)
            names = piped.communicate(b"a.tif\n" * 12000, 60)[0]
            self.assertEqual(names.count(b"\0"), 12000)  # its files are not counted ahead: a pipe is read once
            shown = b""
            for size in (20_000, 20_000, 20_000, 2_000_000, 2_000_000):
                process.stdout.read(size)
                fewer.stdout.read(20_000)
                time.sleep(0.15)
                shown += written(main)
            fcntl.ioctl(main, termios.TIOCSWINSZ, struct.pack("HHHH", 24, 24, 0, 0))
            process.stdout.read()
            process.wait(60)  # the summary comes last
            shown += written(main)
            os.close(main)
            self.assertRegex(written(shrunk).decode(), r"^(\r\x1b\[K\d+ files, \d+ files/s){3,}$")
            self.assertEqual(stuck.wait(10), -signal.SIGINT)
            fewer.kill()
        shown = shown.decode()
        self.assertLess(shown.count("\r\x1b[K"), 20)  # in some two seconds
        self.assertRegex(shown, r"^\r\x1b\[K\d+ files, \d+ files/s\r")
        estimates = re.findall(r"\[K(\d+) of 20000 files, (\d+) files/s, (\d+) (s|min) left\r", shown)
        self.assertEqual({unit for *_, unit in estimates}, {"s", "min"})
        for files, rate, left, unit in estimates:  # both are rounded down, then a second is added
            seconds = 60 if unit == "min" else 1
            self.assertGreaterEqual((20000 - int(files)) / int(rate), int(left) * seconds - 1)
            self.assertLess((20000 - int(files)) / (int(rate) + 1), (int(left) + 1) * seconds - 1)
        self.assertRegex(shown, r"\r\x1b\[K(?=[^\r]{23}\r)\d+ of 20000 files, [^\r]*…\r\x1b\[K")  # of 24 cells
        self.assertRegex(shown, r"\r\x1b\[Kquavel: 20000 files, 20000 records, 0 without record, .* files/s\r\n$")
        seconds, rate = re.search(r"(\d+\.\d+) s, (\d+) files/s\r\n$", shown).groups()
        self.assertAlmostEqual(float(seconds) * int(rate), 20000, delta=200)


class Refusals(CommandTest):
    def test_what_the_system_refuses_is_told(self):
        self.put("a/b.tif", photo())
        os.chmod(self.put("c.tif", photo()), 0)
        self.folder.chmod(0o755)
        (self.folder / "a").chmod(0)
        self.addCleanup((self.folder / "a").chmod, 0o700)
        nobody = {"user": 65534, "group": 65534, "extra_groups": []}
        options = nobody if os.geteuid() == 0 else {}  # root reads anything
        try:
            subprocess.run([COMMAND, "--version"], check=True, capture_output=True, **options)
        except PermissionError:
            self.skipTest("the command lies where only root can run it")
        folder, file = self.objects(".", status=1, **options)
        self.assertEqual((folder["path"], folder["reason"]), ("./a", "unreadable-folder"))
        self.assertRegex(folder["error"], "Permission denied; its photos are missing$")
        self.assertEqual((file["path"], file["reason"]), ("./c.tif", "cannot-open"))
        self.assertRegex(file["error"], "Permission denied; check its permissions and those of its folders$")


@unittest.skipUnless(SAMPLES, "QUAVEL_SAMPLES is not set")
class Samples(CommandTest):
    """QUAVEL_SAMPLES names a folder of real photos with their expected records."""

    def test_records_are_the_expected_ones(self):
        with open(Path(SAMPLES) / "expected.ndjson", encoding="utf-8") as lines:
            expected = {row["file"]: row["expected"] for row in map(json.loads, lines)}
        found = {Path(record["path"]).name: record for record in self.objects(SAMPLES, status=1)}
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
