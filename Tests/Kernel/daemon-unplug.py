"""The claims of daemon-unplug.sh."""

import os
import subprocess
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from daemon import DOWN, HOLD_KEYS, TAP_KEYS, UP, Surface, milliseconds, start
from lab import expect

LIMIT_NS = 500e6
TAP_NS = 250e6    # a tap's reports, at the surface's pace


def hold_open(node):
    """Another program that has the node open, until its input ends."""
    program = subprocess.Popen(["bash", "-c", 'exec 9<"$0"; echo open; read', node], stdin=subprocess.PIPE,
                               stdout=subprocess.PIPE)
    expect("another program has the node open", b"open\n", program.stdout.readline())
    return program


def check_release(surface, daemon, keys, region):
    key = HOLD_KEYS[region]
    surface.press(region)
    keys.take(key, DOWN)
    keys.take_repeat(key)
    gone = surface.unplug()
    released = keys.take(key, UP)
    print(f"   {region}: released {milliseconds(released - gone)} after the surface began to go")
    expect("a key that is down goes up when the surface goes", True, 0 < released - gone < LIMIT_NS)
    daemon.hear_surface("removed", surface=surface.serial)
    expect("and no other is down", [], keys.pressed())


def check_return(surface, daemon, keys, node, region):
    bound = surface.plug()
    expect("the surface is back at another node", node, bound["node"])
    opened = daemon.hear_surface("opened", node=node)["timeNs"]
    surface.say(*surface.finger.tap(region))
    pressed = keys.take_tap(TAP_KEYS[region])
    print(f"   {node}: opened {milliseconds(opened - bound['ns'])}, a key {milliseconds(pressed - bound['ns'])} after"
          " its return")
    expect("a tap at once gives its key in time", True, pressed - bound["ns"] < LIMIT_NS + TAP_NS)


def check_two(first, daemon, keys):
    """A key that two surfaces hold is down until the last of them lets go of it."""
    region = "volume-down"
    second = Surface(serial="ZT-2")
    second.hear("bound")
    daemon.hear_surface("opened", surface=second.serial)
    first.press(region)
    keys.take(HOLD_KEYS[region], DOWN)
    second.press(region)
    daemon.hear("gesture", gesture="hold-start", surface=second.serial)
    first.unplug()
    daemon.hear_surface("removed", surface=first.serial)
    expect("a key that another surface holds stays down", [HOLD_KEYS[region]], keys.pressed())
    gone = second.unplug()
    released = keys.take(HOLD_KEYS[region], UP)
    expect("until that goes, too", True, 0 < released - gone < LIMIT_NS)
    expect("the second surface ends when it is told to", 0, second.finish())


def main():
    daemon, keys = start()
    surface = Surface()
    node = surface.hear("bound")["node"]
    daemon.hear_surface("opened", surface="ZT-1", node=node)
    other = hold_open(node)
    check_release(surface, daemon, keys, "volume-up")
    check_return(surface, daemon, keys, "/dev/hidraw1", "volume-up")
    check_release(surface, daemon, keys, "play/pause")
    other.communicate()
    check_return(surface, daemon, keys, "/dev/hidraw0", "play/pause")
    check_two(surface, daemon, keys)
    expect("the surface ends when it is told to", 0, surface.finish())
    daemon.end()


main()
