"""The claims of daemon-latency.sh."""

import math
import os
import subprocess
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from daemon import DOWN, HOLD_KEYS, TAP_KEYS, UP, Surface, start
from lab import expect, fail

REPETITIONS = 100
# The reports of a touch, counted from its first, that make it a tap (it is let go) and a hold (500 ms are over).
TOUCHED_MS = 120
TAP_REPORT, HOLD_REPORT = 3 + TOUCHED_MS // 10 + 1, 1 + 51
AS_IT_IS = ("chrt", "--rr", "80")    # what plays the surface: nothing keeps it from its next report
NO_REAL_TIME = ("setpriv", "--bounding-set=-sys_nice", "--inh-caps=-sys_nice")
PACE_MS = 3
BUSY = 8    # programs that want the processor


def marked(lines, report):
    """The same lines, with a mark before this report."""
    reports = [at for at, line in enumerate(lines) if not line.startswith("wait")]
    return lines[:reports[report]] + ["mark"] + lines[reports[report]:]


def latency(surface, keys, report, lines, key):
    """Nanoseconds from this report to the key."""
    surface.say(*surface.finger.rest(3), *marked(lines, report))
    # Not until all is over, so that the test itself has nothing to do when it counts.
    pressed = keys.take(key, DOWN)
    keys.take(key, UP)
    written = surface.hear("mark")["ns"]
    if pressed < written:
        fail("the key came before the report that decides")
    return pressed - written


def measure(surface, keys):
    """Nanoseconds of taps and of holds."""
    taps, holds = [], []
    finger = surface.finger
    regions = list(TAP_KEYS)
    for number in range(REPETITIONS):
        region = regions[number % len(regions)]
        taps.append(latency(surface, keys, TAP_REPORT, finger.tap(region, TOUCHED_MS), TAP_KEYS[region]))
        if number % 3 == 0:
            holds.append(latency(surface, keys, HOLD_REPORT, finger.hold(region, 560), HOLD_KEYS[region]))
    return taps, holds


def percentile(times, part):
    return sorted(times)[math.ceil(len(times) * part) - 1] / 1e6


def show(how, what, times):
    print(f"   {how:24} {what:6} {len(times):4} {percentile(times, 0.5):8.2f} {percentile(times, 0.99):8.2f}"
          f" {max(times) / 1e6:8.2f}")


def busy():
    """Somebody else who has much to do."""
    return subprocess.Popen(["sh", "-c", "while :; do :; done"])


def check(how, surface, **settings):
    daemon, keys = start(log=f"{how.replace(' ', '-').replace(',', '')}.log", **settings)
    refusals = daemon.log.having("real-time priority")
    expect(f"{how}: as it should be", not settings, not refusals)
    surface.plug()
    daemon.hear_surface("opened")
    for load in ("", ", busy"):
        others = [busy() for _ in range(BUSY)] if load else []
        taps, holds = measure(surface, keys)
        for other in others:
            other.kill()
            other.wait()
        show(how + load, "tap", taps)
        show(how + load, "hold", holds)
    surface.unplug()
    daemon.hear_surface("removed")
    daemon.end()


def main():
    surface = Surface(before=AS_IT_IS, pace_ms=PACE_MS)
    surface.hear("bound")
    surface.unplug()
    print("   from the report that decides to the key, in ms")
    print(f"   {'':24} {'':6} {'n':>4} {'p50':>8} {'p99':>8} {'most':>8}")
    check("real time", surface)
    check("not real time", surface, before=NO_REAL_TIME)
    expect("the surface ends when it is told to", 0, surface.finish())


main()
