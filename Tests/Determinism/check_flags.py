"""Fails unless every source of the core is compiled with exact arithmetic.

Usage: check_flags.py COMPILE_COMMANDS_JSON CORE_FOLDER
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


def main(commands_file, core_folder):
    core = pathlib.Path(core_folder).resolve()
    commands = [
        command
        for command in json.loads(pathlib.Path(commands_file).read_text())
        if core in pathlib.Path(command["file"]).resolve().parents
    ]
    if not commands:
        print(f"{commands_file}: no source of {core_folder} is compiled")
        return 1
    found = [
        f"{command['file']}: {fault}"
        for command in commands
        for fault in faults(shlex.split(command["command"]))
    ]
    print("\n".join(found) or f"{len(commands)} sources: exact arithmetic")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
