#!/usr/bin/env python3
"""Runs the host in C: on a recording in many layouts, whose gestures it prints, and on what it cannot use.

    check_c_host.py HOST PLUGIN ZORVATOUCH TEXT FOLDER

TEXT is a recording in text form of one tap that raises the volume. FOLDER is for what is made of it.
"""

import json
import os
import subprocess
import sys

TAP = "tap         volume up\n"


def run(*command):
    return subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True, timeout=60,
                          env={**os.environ, "ZORVATOUCH_LOG": "error"})


def expect(holds, what, result):
    if not holds:
        sys.exit(f"{what}\n  exit status {result.returncode}\n  stdout: {result.stdout!r}\n  stderr: {result.stderr!r}")


def make_recording(zorvatouch, text, folder):
    os.makedirs(folder, exist_ok=True)
    recording = os.path.join(folder, "tap.json")
    result = run(zorvatouch, "make", text, recording)
    expect(result.returncode == 0, "the recording cannot be made", result)
    return recording


def reset_report():
    """A firmware event that withdraws the touch: played, it changes what is printed."""
    return {"Type": "InputReport", "Timestamp": 0, "Data": "02 00 00 00 00 00 00 00 00 00 "}


def with_decoys(container):
    """Members and frames that are not input reports but look like them."""
    decoy = reset_report()
    frames = []
    for frame in container["Frames"]:
        frames.append({"Type": "State", "Timestamp": 0, "Key": '"Data":"02 00 "', "Value": decoy, "Data": decoy["Data"]})
        frames.append({"Type": "Metadata", "Timestamp": 0, "Key": "Label", "Value": [decoy, "InputReport"]})
        frames.append({"Note": decoy, "More": [[decoy]], **frame, "Report": decoy["Data"]})
    return {"Other": [decoy], "Reports": [decoy], **container, "Frames": frames, "Frame": {"a": decoy}}


def with_resets(container):
    """The decoys as reports: proof that a host that takes one for a report prints something else."""
    return {**container, "Frames": [played for frame in container["Frames"] for played in (reset_report(), frame)]}


def escaped(text):
    return "".join(f"\\u{ord(character):04X}" for character in text)


def older(container, version):
    """The same recording in version 1, or 0."""
    reports = [(frame["Timestamp"], frame["Data"]) for frame in container["Frames"] if frame["Type"] == "InputReport"]
    if version == 1:
        return {"Version": 1, "Frames": [{"Type": "InputReport", "Timestamp": time, "Report": data, "Data": "02 "}
                                         for time, data in reports]}
    return {"Version": 0, "Reports": [{"Timestamp": time, "ReportData": data} for time, data in reports]}


def layouts(compact):
    """The recording's text in every layout that is allowed."""
    container = json.loads(compact)
    yield "compact", compact
    yield "indented", json.dumps(container, indent=4)
    yield "with tabs and carriage returns", json.dumps(container, indent="\t").replace("\n", "\r\n").replace(":", "\t:\r\n")
    yield "in reverse order", json.dumps(
        {"Frames": [dict(reversed(frame.items())) for frame in container["Frames"]], "Version": 2.0}, indent=1)
    yield "with decoys", json.dumps(with_decoys(container), indent=2)
    yield "in older version 1", json.dumps(older(container, 1))
    yield "in older version 0", json.dumps(older(container, 0))
    yield "with escaped names", compact.replace('"Data"', f'"{escaped("Data")}"').replace('"InputReport"', '"\\u0049nputReport"')
    yield "with other spellings of bytes", json.dumps({**container, "Frames": [
        {**frame, "Data": "\t" + frame["Data"].upper().replace(" 0", "\n0x0")} for frame in container["Frames"]]})


def check_layouts(host, plugin, recording, folder):
    with open(recording, encoding="utf-8") as file:
        compact = file.read()
    for layout, text in layouts(compact):
        check_output(host, plugin, written(folder, text), TAP, layout)
    check_output(host, plugin, written(folder, json.dumps(with_resets(json.loads(compact)))), "", "with resets")


def check_pieces(host, plugin, recording, folder):
    """A text that ends early, or goes wrong, is not a crash."""
    with open(recording, encoding="utf-8") as file:
        text = file.read()
    for end in (*range(1, 120, 17), len(text) // 2, len(text) - 1):
        for tail in ("", "\\", "\\u00", '"', "]]]}}}"):
            result = run(host, plugin, written(folder, text[:end] + tail))
            expect(result.returncode in (0, 1), f"the first {end} characters and {tail!r}", result)


def written(folder, text):
    file = os.path.join(folder, "layout.json")
    with open(file, "w", encoding="utf-8", newline="") as stream:
        stream.write(text)
    return file


def check_output(host, plugin, recording, expected, what):
    result = run(host, plugin, recording)
    expect(result.returncode == 0 and result.stdout == expected, f"{what}: expected {expected!r}", result)


def check_failure(what, *command):
    result = run(*command)
    expect(result.returncode == 1 and result.stdout == "" and result.stderr.count("\n") == 1
           and result.stderr.startswith("CHost: "), f"{what}: expected one line and exit status 1", result)


def main(host, plugin, zorvatouch, text, folder):
    recording = make_recording(zorvatouch, text, folder)
    check_layouts(host, plugin, recording, folder)
    check_pieces(host, plugin, recording, folder)
    check_failure("a plug-in that is missing", host, os.path.join(folder, "missing.so"), recording)
    check_failure("a plug-in that is none", host, recording, recording)
    check_failure("a recording of an unknown version", host, plugin, written(folder, '{"Version":3,"Frames":[]}'))
    check_failure("a recording that is missing", host, plugin, os.path.join(folder, "missing.json"))
    check_failure("no arguments", host)


main(*sys.argv[1:])
