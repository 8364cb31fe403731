"""Plays the transcripts of transcripts/*.txt, each file in an empty folder, and compares what is shown.

  # A remark.
  @ NAME FIELD=VALUE...    A photo is made, see photos.py. FIELD=- leaves the field out.
  $ COMMAND                The shell runs this: "quavel" is the command under test, $PHOTOS the bundled photos.
  80$ COMMAND              The same with its output on a terminal of 80 columns.
  > MORE                   The line above goes on.

What the command writes follows: its output, then its standard error with "! " before each line, then
its status in brackets unless that is 0. "..." stands for any text within a line.
"""

import re
import shlex
import subprocess
import unittest
from pathlib import Path

from command import ROOT, SAMPLES, CommandTest
from photos import photo

STEP = re.compile(r"^(@|\d*\$) (.*(?:\n> .*)*)\n((?:(?!@ |\d*\$ |# ).*\n)*)", re.M)
PHOTOS = ROOT / "examples/photos"
USAGE_END = "! Try 'quavel --help'.\n[2]\n"  # of all transcripts of usage.txt, which leave it out


class Transcripts(CommandTest):
    maxDiff = None

    def make(self, name, *fields):
        """Escapes, such as \\u200d, stand for what a reader would not see."""
        values = (field.encode("latin-1", "backslashreplace").decode("unicode_escape") for field in fields)
        self.put(name, photo(name.rpartition(".")[2], **dict(value.split("=", 1) for value in values)))

    def shown(self, width, line):
        shell = ["sh", "-c", f'PHOTOS="{PHOTOS}"; quavel() {{ "$QUAVEL_COMMAND" "$@"; }}\n{line}']
        if width:
            output, errors, status = self.on_terminal(*shell, width=int(width))
        else:
            done = subprocess.run(shell, cwd=self.folder, stdin=subprocess.DEVNULL, capture_output=True, timeout=60)
            output, errors, status = done.stdout.decode(), done.stderr.decode(), done.returncode
        return output + re.sub("(?m)^(?=.)", "! ", errors) + (f"[{status}]\n" if status else "")

    def play(self, path):
        text = path.read_text(encoding="utf-8")
        self.assertRegex(STEP.sub("", text), r"\A(# .*\n|\n)*\Z", "neither a step nor a remark")
        for prompt, line, following in STEP.findall(text):
            line = line.replace("\n> ", "\n")
            if prompt == "@":
                self.make(*shlex.split(line))
                continue
            expected = following.rstrip("\n") + "\n" if following.strip("\n") else ""
            expected += USAGE_END if path.stem == "usage" else ""
            with self.subTest(line):
                shown = self.shown(prompt[:-1], line)
                if not re.fullmatch(re.escape(expected).replace(r"\.\.\.", ".*"), shown):
                    self.assertEqual(shown, expected)


for file in Path(__file__).with_name("transcripts").glob("*.txt"):
    setattr(Transcripts, "test_" + file.stem, lambda self, file=file: self.play(file))
if not SAMPLES:
    Transcripts.test_samples = unittest.skip("QUAVEL_SAMPLES is not set")(Transcripts.test_samples)

if __name__ == "__main__":
    unittest.main()
