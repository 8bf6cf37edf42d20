"""The claims of daemon-cycles.sh."""

import os
import signal
import subprocess
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from daemon import DOWN, OUT, UP, VOLUMEUP, Surface, expect_tap, start
from lab import Emulated, expect, fail

CYCLES = 200
SHOWN = (20, 100, 200)
WARM = 100     # by then every recording has been replaced, and the allocator has what the save thread needs
HASTY_CYCLES = 50
PACE_MS = 1    # the sensor's clock decides what a hold is


def unplug_idle(_, surface, __):
    surface.unplug()


def unplug_with_key(keys, surface, _):
    surface.press("volume-up")
    keys.take(VOLUMEUP, DOWN)
    surface.unplug()
    keys.take(VOLUMEUP, UP)


def unplug_with_reports(_, surface, daemon):
    """That the daemon has had no time to read: a hold among them."""
    daemon.process.send_signal(signal.SIGSTOP)
    surface.say(*(line for line in surface.finger.down("volume-down", touched_ms=590) if line[:4] != "wait"))
    surface.unplug()
    daemon.process.send_signal(signal.SIGCONT)


def unplug_in_touch(_, surface, __):
    surface.say(*surface.finger.down("play/pause", touched_ms=100), "destroy")
    surface.hear("destroyed")


def unplugging(cycle):
    if cycle % 10 == 0:
        return unplug_with_key
    if cycle % 5 == 0:
        return unplug_with_reports
    return unplug_in_touch if cycle % 7 == 0 else unplug_idle


def check_haste(daemon, keys, surface):
    """Unplugged and plugged in faster than anybody can follow: what holds is how it ends."""
    before = daemon.footprint()
    for cycle in range(HASTY_CYCLES):    # in none of them, in some, or in all is there time for a node
        surface.say("destroy", "create", f"wait {cycle % 12}")
    surface.say("mark")
    surface.hear("mark")
    subprocess.run(["udevadm", "settle", "--timeout=60"], check=True)
    after = daemon.footprint()
    keys.skip()
    expect(f"after {HASTY_CYCLES} cycles in haste nothing is left behind either", before[:2], after[:2])
    expect_tap(surface, keys)


def main():
    accelerometer = Emulated("zorvatouch-uhid-accelerometer")
    accelerometer.hear("bound")
    daemon, keys = start("--save", os.path.join(OUT, "touch.json"))
    surface = Surface(pace_ms=PACE_MS)
    surface.hear("bound")
    daemon.hear_surface("opened")
    print("   cycle  descriptors  threads  memory, kB")
    footprints = {}
    for cycle in range(1, CYCLES + 1):
        unplugging(cycle)(keys, surface, daemon)
        daemon.hear_surface("removed")
        if keys.pressed():
            fail(f"after cycle {cycle} keys are down: {keys.pressed()}")
        keys.skip()
        if cycle in SHOWN:
            footprints[cycle] = daemon.footprint()
            print(f"   {cycle:5}  {footprints[cycle][0]:11}  {footprints[cycle][1]:7}  {footprints[cycle][2]:10}")
        surface.plug()
        daemon.hear_surface("opened")
    early, late = footprints[WARM], footprints[CYCLES]
    expect("no descriptor is left behind", early[0], late[0])
    expect("no thread", early[1], late[1])
    expect("and no memory, by one part in fifty", True, late[2] <= early[2] * 1.02)
    print(f"ok: no key was down when the surface was gone; {len(keys.changes())} went down or up")
    expect_tap(surface, keys)
    check_haste(daemon, keys, surface)
    expect("the surface ends when it is told to", 0, surface.finish())
    daemon.end()
    expect("so does the accelerometer", 0, accelerometer.finish())


main()
