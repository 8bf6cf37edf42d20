#!/usr/bin/env python3
"""Runs the commands whose output the documents show, and compares the output with the documents.

    samples.py BUILD_DIR [--update] [DOCUMENT...]

Without DOCUMENT: README.md, CONTRIBUTING.md and Docs/*.md. --update rewrites the samples that differ.

A comment on the line before a fenced block says what the block is:

    <!-- sample: COMMAND -->     the output of COMMAND
    <!-- sample -->              commands on lines that begin with "$ ", each followed by its output
    <!-- times vary: COMMAND --> as sample; times and time stamps are not compared (COMMAND may be left out, too)
    <!-- input: FILE -->         the content of FILE for the commands that follow
    <!-- session: REASON -->     commands that are not run, for this reason

and anywhere:

    <!-- setup: COMMAND -->      a command whose output is not shown and whose exit status is 0

A comment may have several lines.

The commands of a document run in their order, by sh, in a temporary directory that also has the tree's Examples; the
programs of BUILD_DIR come first in PATH. Standard output and standard error are both compared, blanks at the ends of
lines and the exit status are not; a command that crashes or cannot be found fails. A block that has lines with "$ "
and no such comment is an error.
"""

import argparse
import os
import pathlib
import re
import subprocess
import sys
import tempfile

ROOT = pathlib.Path(__file__).resolve().parents[2]
LONGEST_RUN_S = 60
FENCE = re.compile(r"```\w*")
MARK = re.compile(r"<!-- (sample|times vary|input|session|setup)(?:: (.*))? -->")
VARYING = (re.compile(r"\d+\.\d{3} s\b"), re.compile(r'(?<="timeNs":)\d+'), re.compile(r"\d{4}-\d\d-\d\dT[\d:.+]+"))


class Fault(Exception):
    """What is wrong with a document, without its name."""


class Shell:
    """Runs a document's commands in a directory of its own."""

    def __init__(self, build):
        self._build = build.resolve()
        self._folder = tempfile.TemporaryDirectory()
        self.place = pathlib.Path(self._folder.name).resolve() / "work"
        self._home = self.place.parent / "home"
        self.place.mkdir()
        self._home.mkdir()
        (self.place / "Examples").symlink_to(ROOT / "Examples")

    def __enter__(self):
        return self

    def __exit__(self, *_):
        self._folder.cleanup()

    def run(self, command):
        """Its exit status and its output, as lines, without what only this machine has."""
        environment = {"PATH": f"{self._build / 'bin'}:{os.environ['PATH']}", "HOME": str(self._home),
                       "LC_ALL": "C.UTF-8", "COLUMNS": "80"}
        environment |= {name: value for name, value in os.environ.items() if name.endswith("SAN_OPTIONS")}
        done = subprocess.run(["/bin/sh", "-c", command], cwd=self.place, env=environment, text=True, check=False,
                              stdin=subprocess.DEVNULL, stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                              timeout=LONGEST_RUN_S)
        text = done.stdout.replace(str(self._build), "/usr").replace(str(self._home), "/home/me")
        if done.returncode < 0 or done.returncode >= 126:
            raise Fault(f"'{command}' ended with {done.returncode}: {text}")
        return done.returncode, stripped(text.splitlines())


def stripped(lines):
    return [line.rstrip() for line in lines]


def comparable(lines, times_vary):
    text = "\n".join(stripped(lines))
    for pattern in VARYING if times_vary else ():
        text = pattern.sub("#", text)
    return text


def commands_of(block):
    """The commands in a block; a backslash at the end of a line goes on with the next."""
    commands, is_continued = [], False
    for line in block:
        if is_continued:
            commands[-1].append(line)
        elif line.startswith("$ "):
            commands.append([line])
        is_continued = (is_continued or line.startswith("$ ")) and line.endswith("\\")
    return commands


def produce(shell, kind, argument, block):
    """What the block must be."""
    if kind == "input":
        (shell.place / argument).write_text("\n".join(block) + "\n", encoding="utf-8")
    if kind in ("input", "session"):
        return block
    if argument:
        return shell.run(argument)[1]
    commands = commands_of(block)
    if not commands:
        raise Fault("a sample without a command")
    lines = []
    for command in commands:
        lines += command + shell.run("\n".join(command)[len("$ "):])[1]
    return lines


def check(lines, shell):
    """The document as it must be, from its lines."""
    result, mark, position = [], None, 0
    while position < len(lines):
        line = lines[position]
        position += 1
        result.append(line)
        while line.startswith("<!-- ") and not line.endswith("-->") and position < len(lines):
            result.append(lines[position])
            line += " " + lines[position].strip()
            position += 1
        found = MARK.fullmatch(line)
        if found and found[1] == "setup":
            status, output = shell.run(found[2])
            if status != 0:
                raise Fault(f"'{found[2]}' ended with {status}: " + "\n".join(output))
        elif found:
            mark = found
        elif not FENCE.fullmatch(line):
            if mark:
                raise Fault(f"no block follows {mark[0]}")
        else:
            end = lines.index("```", position)
            block = lines[position:end]
            if mark:
                wanted = produce(shell, mark[1], mark[2], block)
                varies = mark[1] == "times vary"
                result += block if comparable(block, varies) == comparable(wanted, varies) else wanted
            elif commands_of(block):
                raise Fault(f"line {position}: a block with commands and without a comment that says what it is")
            else:
                result += block
            result.append("```")
            position, mark = end + 1, None
    return result


def differences(old, new):
    folder = tempfile.TemporaryDirectory()
    with folder:
        paths = [pathlib.Path(folder.name) / name for name in ("shown", "printed")]
        for path, lines in zip(paths, (old, new)):
            path.write_text("\n".join(lines) + "\n", encoding="utf-8")
        return subprocess.run(["diff", "-u", "--label", "in the document", "--label", "printed", *paths],
                              stdout=subprocess.PIPE, text=True, check=False).stdout


def check_document(path, build, update):
    """Whether it is right, or was put right."""
    lines = path.read_text(encoding="utf-8").splitlines()
    try:
        with Shell(build) as shell:
            right = check(lines, shell)
    except Fault as fault:
        print(f"{path}: {fault}")
        return False
    if right == lines:
        return True
    if update:
        path.write_text("\n".join(right) + "\n", encoding="utf-8")
        print(f"{path}: updated")
        return True
    print(f"{path}: samples differ; Tests/Docs/samples.py {build} --update rewrites them\n{differences(lines, right)}")
    return False


def self_test(build):
    """The check finds what it is for."""
    def checked(*lines):
        with Shell(build) as shell:
            return check(list(lines), shell)

    def fault_of(*lines):
        try:
            checked(*lines)
        except Fault as fault:
            return str(fault)
        raise AssertionError(f"no fault in {lines}")

    right = ["<!-- sample: printf 'a \\nb\\n' -->", "```", "a", "b", "```"]
    assert checked(*right) == right
    assert checked(right[0], "```", "b", "```") == right
    steps = ["<!-- sample -->", "```", "$ echo a; echo b >&2; false", "a", "b", "$ echo \\", "c", "c", "```"]
    assert checked(*steps) == steps
    assert checked(*steps[:3], "old", *steps[5:7], "```") == steps
    times = ["<!-- times vary: echo '1.500 s x' -->", "```", "1.400 s x", "```"]
    assert checked(*times) == times
    assert checked(*times[:2], "1.400 s y", "```")[2] == "1.500 s x"
    file = ["<!-- input: a.txt -->", "```", "text", "```", "<!-- sample: cat a.txt -->", "```", "text", "```"]
    assert checked(*file) == file
    long = ["<!-- sample: echo a;", "     echo b -->", "```", "a", "b", "```"]
    assert checked(*long) == long
    assert checked("```", "plain", "```") == ["```", "plain", "```"]
    assert "without a comment" in fault_of("```", "$ echo", "```")
    assert "no block" in fault_of("<!-- sample: echo -->", "text")
    assert "ended with 1" in fault_of("<!-- setup: false -->")
    assert "ended with 127" in fault_of("<!-- sample: no-such-program -->", "```", "```")


def main():
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("build", type=pathlib.Path)
    parser.add_argument("--update", action="store_true")
    parser.add_argument("documents", type=pathlib.Path, nargs="*")
    arguments = parser.parse_intermixed_args()
    self_test(arguments.build)
    documents = arguments.documents or [ROOT / "README.md", ROOT / "CONTRIBUTING.md",
                                        *sorted((ROOT / "Docs").glob("**/*.md"))]
    results = [check_document(path, arguments.build, arguments.update) for path in documents]
    print(f"{sum(results)} of {len(results)} documents have the samples that the programs print.")
    sys.exit(0 if all(results) else 1)


main()
