"""Fails unless every source of these folders is compiled with exact arithmetic.

Usage: check_flags.py COMPILE_COMMANDS_JSON FOLDER...
"""

import json
import pathlib
import shlex
import sys

FORBIDDEN = {"-ffast-math", "-Ofast", "-funsafe-math-optimizations", "-fassociative-math", "-freciprocal-math"}


def faults(arguments):
    contraction = [argument for argument in arguments if argument.startswith("-ffp-contract=")]
    if contraction[-1:] != ["-ffp-contract=off"]:
        yield "operations may be fused: " + (contraction[-1] if contraction else "no -ffp-contract=off")
    for argument in FORBIDDEN.intersection(arguments):
        yield "inexact arithmetic: " + argument


def commands_below(folder, commands):
    folder = pathlib.Path(folder).resolve()
    return [command for command in commands if folder in pathlib.Path(command["file"]).resolve().parents]


def main(commands_file, *folders):
    commands = json.loads(pathlib.Path(commands_file).read_text())
    status = 0
    for folder in folders:
        below = commands_below(folder, commands)
        found = [
            f"{command['file']}: {fault}" for command in below for fault in faults(shlex.split(command["command"]))
        ]
        if not below:
            found = ["no source of it is compiled"]
        print(f"{folder}: " + ("\n".join(found) or f"{len(below)} sources, exact arithmetic"))
        status |= bool(found)
    return status


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
