#!/usr/bin/env python3
"""Asks every program and script for its help: it fits 80 columns, and a script answers without building.

    check_help.py ZORVATOUCH ZORVATOUCHD ROOT
"""

import os
import pathlib
import subprocess
import sys
import tempfile

COMMANDS = ["replay", "info", "show", "convert", "trim", "make", "synth", "host", "demo", "help"]
SCRIPTS = ["run", "test", "bench", "fuzz", "plot-scenarios", "test-kernel"]
BUILD_TOOLS = ["apt-get", "cmake", "ninja", "ctest"]
COLUMNS = 80

problems = []


def check(command, **options):
    result = subprocess.run(command, capture_output=True, text=True, stdin=subprocess.DEVNULL, **options)
    name = " ".join([os.path.basename(command[0]), *command[1:]])
    if result.returncode != 0 or result.stderr:
        problems.append(f"{name}: status {result.returncode}, {result.stderr.strip()!r}")
    if result.stdout.count("\n") < 5:
        problems.append(f"{name}: too short: {result.stdout!r}")
    for line in result.stdout.splitlines():
        if len(line) > COLUMNS:
            problems.append(f"{name}: {len(line)} columns: {line}")
        if line != line.rstrip():
            problems.append(f"{name}: blanks at the end: {line!r}")
    return result.stdout


def main(zorvatouch, zorvatouchd, root):
    main_help = check([zorvatouch, "--help"])
    if check([zorvatouch, "help"]) != main_help:
        problems.append("zorvatouch help: differs from --help")
    for command in COMMANDS:
        if f"\n  {command} " not in main_help:
            problems.append(f"zorvatouch --help: {command} is missing")
        if check([zorvatouch, "help", command]) != check([zorvatouch, command, "--help"]):
            problems.append(f"zorvatouch help {command}: differs from {command} --help")
    check([zorvatouchd, "--help"])
    with tempfile.TemporaryDirectory() as folder:
        for tool in BUILD_TOOLS:
            path = pathlib.Path(folder, tool)
            path.write_text("#!/bin/sh\necho \"$0 was started\" >&2\nexit 1\n")
            path.chmod(0o755)
        environment = dict(os.environ, PATH=folder + os.pathsep + os.environ["PATH"])
        for script in SCRIPTS:
            for option in ["-h", "--help"]:
                check([os.path.join(root, "scripts", script), option], env=environment)
    for problem in problems:
        print(problem)
    return 1 if problems else 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
