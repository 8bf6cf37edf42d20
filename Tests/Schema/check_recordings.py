"""Fails unless the schema of recordings accepts what is written and refuses what is broken.

Usage: check_recordings.py ZORVATOUCH SCHEMA GOLDEN_FOLDER DATA_FOLDER

Accepted must be every golden case, made into a recording by the program ZORVATOUCH, and every version-2 file in
DATA_FOLDER; refused, the files of older versions there and the containers of BROKEN.
"""

import json
import pathlib
import subprocess
import sys

import jsonschema  # Debian's python3-jsonschema; without it there is nothing to test, which is a failure

REPORT = {"Type": "InputReport", "Timestamp": 1, "Data": "01 ab "}
STATE = {"Type": "State", "Timestamp": 1, "Key": "Algs.ActivationThreshold", "Value": 200.0}


def without(frame, key):
    return {name: value for name, value in frame.items() if name != key}


def container(*frames):
    return {"Version": 2, "Frames": list(frames)}


# What is wrong, and a container with just that.
BROKEN = {
    "an unknown version": {"Version": 3, "Frames": []},
    "no version": {"Frames": []},
    "no frames": {"Version": 2},
    "frames that are no array": {"Version": 2, "Frames": {}},
    "an unknown key in the container": {"Version": 2, "Frames": [], "Comment": ""},
    "a frame that is no object": container(7),
    "a frame of an unknown type": container(REPORT | {"Type": "Report"}),
    "a frame without a type": container(without(REPORT, "Type")),
    "a report without a time stamp": container(without(REPORT, "Timestamp")),
    "a time stamp as text": container(REPORT | {"Timestamp": "1"}),
    "a fraction as a time stamp": container(REPORT | {"Timestamp": 1.5}),
    "a time stamp before zero": container(REPORT | {"Timestamp": -1}),
    "a time stamp of 65 bits": container(REPORT | {"Timestamp": 2**64}),
    "a report without data": container(without(REPORT, "Data")),
    "a report with its data under an older name": container(without(REPORT, "Data") | {"Report": "01 ab "}),
    "data in upper case": container(REPORT | {"Data": "01 AB "}),
    "data without the last space": container(REPORT | {"Data": "01 ab"}),
    "data with a number above ff": container(REPORT | {"Data": "01 100 "}),
    "a report with a key": container(REPORT | {"Key": "Accel"}),
    "a state without a key": container(without(STATE, "Key")),
    "a state without a value": container(without(STATE, "Value")),
    "a state with data": container(STATE | {"Data": "01 ab "}),
    "a metadata key that is no text": container(STATE | {"Type": "Metadata", "Key": 7}),
    "one broken frame after a good one": container(REPORT, without(STATE, "Value")),
}


def refuse_constant(name):
    raise ValueError(name + " is no JSON")


def parse(text):
    return json.loads(text, parse_constant=refuse_constant)


def golden_recordings(program, folder):
    """The golden cases made into recordings, by name."""
    for text in sorted(folder.glob("*.txt")):
        made = subprocess.run([program, "make", text, "-"], stdout=subprocess.PIPE, check=True)
        yield text.name, parse(made.stdout)
    for file in sorted(folder.glob("Synth/*.json")):
        yield file.name, parse(file.read_bytes())


def data_recordings(folder):
    for file in sorted(folder.glob("*.json")):
        yield file.name, parse(file.read_bytes())


def problem(validator, recording):
    """What the schema has against a recording, in one line; None if nothing."""
    error = jsonschema.exceptions.best_match(validator.iter_errors(recording))
    if error is None:
        return None
    place = "/".join(str(step) for step in error.absolute_path)
    return f"{place or 'container'}: {error.message[:200]}"


def faults(validator, valid, invalid):
    for name, recording in valid.items():
        found = problem(validator, recording)
        if found is not None:
            yield f"{name} is refused: {found}"
    for name, recording in invalid.items():
        if problem(validator, recording) is None:
            yield f"{name} is accepted"


def main(program, schema_file, golden_folder, data_folder):
    schema = parse(pathlib.Path(schema_file).read_bytes())
    jsonschema.Draft7Validator.check_schema(schema)
    golden = dict(golden_recordings(program, pathlib.Path(golden_folder)))
    data = dict(data_recordings(pathlib.Path(data_folder)))
    current = {name: recording for name, recording in data.items() if recording["Version"] == 2}
    older = {name: recording for name, recording in data.items() if recording["Version"] != 2}
    if not (golden and current and older):
        print(f"{len(golden)} golden cases, {len(current)} current and {len(older)} older recordings: some are missing")
        return 1
    found = list(faults(jsonschema.Draft7Validator(schema), golden | current, older | BROKEN))
    print("\n".join(found) or f"{len(golden) + len(current)} accepted, {len(older) + len(BROKEN)} refused")
    return 1 if found else 0


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
