"""Fails unless the schema of the daemon's event lines accepts what is written and refuses what is broken.

Usage: check_events.py SCHEMA LINES

Accepted must be every line of the file LINES, which a unit test compares with what the daemon writes and which has
all kinds; refused, each of them with a key too few, a key too many or a number as text, and the lines of BROKEN.
"""

import json
import pathlib
import sys

import jsonschema  # Debian's python3-jsonschema; without it there is nothing to test, which is a failure

KINDS = {"surface", "gesture", "key", "quarantine", "accelerometer", "sleep", "recording", "dropped"}
SURFACE = {"type": "surface", "state": "added", "surface": "a", "node": "/dev/hidraw0", "name": "", "timeNs": 1}
GESTURE = {"type": "gesture", "surface": "a", "gesture": "tap", "region": None, "timeNs": 1}
KEY = {"type": "key", "key": None, "code": 1, "state": "up", "sent": True, "surface": "a", "timeNs": 1}

# What is wrong, and a line with just that.
BROKEN = {
    "no object": ["surface"],
    "an unknown kind": {"type": "touch", "timeNs": 1},
    "an unknown state of a surface": SURFACE | {"state": "closed"},
    "a failure without a reason": SURFACE | {"state": "failed"},
    "a loss without a reason": SURFACE | {"state": "lost"},
    "a reason where nothing failed": SURFACE | {"reason": "x"},
    "a reason for a removal": SURFACE | {"state": "removed", "reason": "x"},
    "a time before zero": SURFACE | {"timeNs": -1},
    "a time of 65 bits": SURFACE | {"timeNs": 2**64},
    "a fraction as a time": SURFACE | {"timeNs": 1.5},
    "an unknown gesture": GESTURE | {"gesture": "swipe"},
    "a region that is spelled otherwise": GESTURE | {"region": "play-pause"},
    "a key with an empty name": KEY | {"key": ""},
    "a key that is none": KEY | {"key": "none", "code": 0},
    "a code that the kernel does not have": KEY | {"code": 768},
    "a key in between": KEY | {"state": "repeat"},
    "a quarantine without a press": {"type": "quarantine", "state": "ends", "surface": "a", "suppressed": 0,
                                     "timeNs": 1},
    "no lost line": {"type": "dropped", "lines": 0},
}


def spoilt(line):
    """The line with one thing wrong, by what it is."""
    for key in line:
        yield f"without {key}", {name: value for name, value in line.items() if name != key}
        if isinstance(line[key], int):
            yield f"with {key} as text", line | {key: str(line[key])}
    yield "with another key", line | {"comment": ""}


def faults(validator, lines):
    for number, line in enumerate(lines, 1):
        error = jsonschema.exceptions.best_match(validator.iter_errors(line))
        if error is not None:
            yield f"line {number} is refused: {error.message[:200]}"
        for what, broken in spoilt(line):
            if validator.is_valid(broken):
                yield f"line {number} {what} is accepted"
    for name, line in BROKEN.items():
        if validator.is_valid(line):
            yield f"{name} is accepted"


def main(schema_file, lines_file):
    schema = json.loads(pathlib.Path(schema_file).read_bytes())
    jsonschema.Draft7Validator.check_schema(schema)
    lines = [json.loads(line) for line in pathlib.Path(lines_file).read_text(encoding="utf-8").splitlines()]
    missing = KINDS - {line["type"] for line in lines}
    if missing:
        print("no line of these kinds: " + ", ".join(sorted(missing)))
        return 1
    found = list(faults(jsonschema.Draft7Validator(schema), lines))
    print("\n".join(found) or f"{len(lines)} accepted; each of them spoilt and {len(BROKEN)} others refused")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
