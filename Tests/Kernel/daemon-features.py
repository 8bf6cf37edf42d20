"""The claims of daemon-features.sh."""

import json
import os
import subprocess
import sys
import time

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from daemon import Surface, expect_tap, start
from lab import expect, fail

DEBUG_REPORTS = (0x04, 0x10, 0x11, 0x12, 0x13, 0x1D, 0x32, 0x3B, 0x3C, 0x3F)
REFUSED = {0x12, 0x3B}    # by the surface, unless told otherwise
HOLD, HOLD_DURATION = 31, 10000
MUTE = {0x13, 0x3C, HOLD}


def describing():
    return subprocess.Popen(["zorvatouchd", "--describe"], stdout=subprocess.PIPE, stderr=subprocess.DEVNULL)


def described(program):
    """What it says of the surface."""
    text, _ = program.communicate(timeout=90)
    expect("the description is made", 0, program.returncode)
    surfaces = json.loads(text)["Surfaces"]
    expect("of one surface, which may be opened", ["allowed"], [surface["Access"] for surface in surfaces])
    return surfaces[0]


def expect_reports(what, surface, failing):
    """Those fail, the others have their answers."""
    reports = surface["FirmwareDebugReports"]
    expect(f"{what}: it has all ten debug reports", sorted(f"0x{report:02x}" for report in DEBUG_REPORTS),
           sorted(reports))
    for report in DEBUG_REPORTS:
        text = reports[f"0x{report:02x}"]
        if report in failing:
            text = text.rsplit(": ", 1)[0]    # without the reason
        wanted = f"Failed to get report ID 0x{report:x}" if report in failing else f"{report:02x} 01 02 03 04 "
        if text != wanted:
            fail(f"{what}: report {report:#x} is {text!r}, not {wanted!r}")
    expect(f"{what}: {len(DEBUG_REPORTS) - len(REFUSED | failing)} are answered, the others have failed",
           None if HOLD in failing else HOLD_DURATION, surface["FactoryResetHoldDuration"])


def check_mute(surface, keys):
    """The daemon goes on while another program waits for an answer that does not come."""
    surface.say(*(f"feature {report}=mute" for report in sorted(MUTE)))
    began = time.monotonic()
    program = describing()
    for _ in MUTE:
        surface.hear("request", what="get", answer="mute")
        expect_tap(surface, keys)
        expect("while a request waits for its answer", None, program.poll())
    expect_reports("mute", described(program), REFUSED | MUTE)
    print(f"   {time.monotonic() - began:.1f} s for {len(MUTE)} requests that nobody answers")


def main():
    daemon, keys = start()
    surface = Surface()
    surface.hear("bound")
    daemon.hear_surface("opened")
    expect_reports("as it is", described(describing()), REFUSED)
    check_mute(surface, keys)
    everything = {*DEBUG_REPORTS, HOLD}
    surface.say(*(f"feature {report}=refuse" for report in sorted(everything)))
    expect_reports("all refused", described(describing()), everything)
    expect_tap(surface, keys)
    expect("the surface ends when it is told to", 0, surface.finish())
    daemon.end()


main()
