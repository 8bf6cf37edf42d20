#!/usr/bin/env python3
"""Runs the host in C: on a recording, whose gestures it prints, and on plug-ins and recordings that are missing.

    check_c_host.py HOST PLUGIN ZORVATOUCH TEXT FOLDER

TEXT is a recording in text form of one tap that raises the volume. FOLDER is for what is made of it.
"""

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


def check_tap(host, plugin, recording):
    result = run(host, plugin, recording)
    expect(result.returncode == 0 and result.stdout == TAP, f"expected {TAP!r}", result)


def check_failure(what, *command):
    result = run(*command)
    expect(result.returncode == 1 and result.stdout == "" and result.stderr.count("\n") == 1
           and result.stderr.startswith("CHost: "), f"{what}: expected one line and exit status 1", result)


def main(host, plugin, zorvatouch, text, folder):
    recording = make_recording(zorvatouch, text, folder)
    check_tap(host, plugin, recording)
    check_failure("a plug-in that is missing", host, os.path.join(folder, "missing.so"), recording)
    check_failure("a plug-in that is none", host, recording, recording)
    check_failure("a recording that is missing", host, plugin, os.path.join(folder, "missing.json"))
    check_failure("no arguments", host)


main(*sys.argv[1:])
