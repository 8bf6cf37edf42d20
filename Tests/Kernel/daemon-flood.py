"""The claims of daemon-flood.sh."""

import collections
import os
import random
import re
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from daemon import Surface, expect_tap, start
from lab import expect

ROUNDS, REPORTS = 3, 5000
IMAGE, RESET = 73, bytes([2]) + bytes(9)
WINDOW_NS, PER_CAUSE = 30e9, 5
COUNT = " more of this in the last "


def nonsense(chance):
    """A report: of a kind that exists or not, of a length that is right or not, its bytes anything."""
    length = IMAGE if chance.random() < 0.3 else chance.randint(2, 150)
    return bytes([chance.choice((1, 1, 1, 2, 31, 77))]) + chance.randbytes(length - 1)


def flood(surface, daemon, chance):
    """As fast as the kernel takes them, and in the middle of it the surface goes."""
    half = [nonsense(chance).hex(" ") for _ in range(REPORTS // 2)]
    surface.say(*half, "destroy")
    surface.hear("destroyed", patience=120)
    daemon.hear_surface("removed", patience=120)
    surface.plug()
    daemon.hear_surface("opened")
    surface.say(*half, RESET.hex(" "), "destroy")
    surface.hear("destroyed", patience=120)
    daemon.hear_surface("removed", patience=120)


def cause(line):
    """What stays the same of a line that comes again, without its time."""
    return re.sub(r"\d+", "#", line.split(" ", 1)[-1])


def check_log(lines):
    """No cause has more lines within the window than the limit, counts apart."""
    times = collections.defaultdict(list)
    for when, line in lines:
        if line and COUNT not in line:    # a text may end with empty lines
            times[cause(line)].append(when)
    for text, at in sorted(times.items()):
        print(f"   {len(at):4} x {text}")
    most = max(sum(1 for later in at[first:] if later < at[first] + WINDOW_NS)
               for at in times.values() for first in range(len(at)))
    expect("no cause has more than five lines in half a minute", True, most <= PER_CAUSE)
    counts = [line for _, line in lines if COUNT in line]
    expect("what was held back is counted", True, len(counts) > 0)
    for line in counts:
        print("  ", line.split(" ", 1)[-1])


def main():
    chance = random.Random(1)
    daemon, keys = start()
    surface = Surface("--loose")
    surface.hear("bound")
    daemon.hear_surface("opened")
    print("   reports  descriptors  threads  memory, kB")
    footprints = []
    for number in range(1, ROUNDS + 1):
        flood(surface, daemon, chance)
        footprints.append(daemon.footprint())
        print(f"   {number * REPORTS:7}  {footprints[-1][0]:11}  {footprints[-1][1]:7}  {footprints[-1][2]:10}")
        expect("no key is down", [], keys.pressed())
        surface.plug()
        daemon.hear_surface("opened")
    expect("no descriptor and no thread is left behind", footprints[0][:2], footprints[-1][:2])
    expect("and no memory, by one part in twenty", True, footprints[-1][2] <= footprints[0][2] * 1.05)
    print(f"   {len(keys.changes())} changes of keys meanwhile")
    keys.skip()
    expect_tap(surface, keys)
    expect("the surface ends when it is told to", 0, surface.finish())
    daemon.end()
    check_log(daemon.log.lines)


main()
