"""The claims of daemon-kill.sh."""

import errno
import os
import signal
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from daemon import DOWN, UP, VOLUMEDOWN, VOLUMEUP, Daemon, Keys, Surface, expect_tap, find_keyboard, start
from lab import expect


def check_killed(surface):
    daemon, keys = start()
    surface.plug()
    daemon.hear_surface("opened")
    surface.press("volume-up")
    keys.take(VOLUMEUP, DOWN)
    keys.take_repeat(VOLUMEUP)
    daemon.process.kill()
    expect("its reader is told that the keyboard is gone", errno.ENODEV, keys.wait_gone())
    # The kernel lets go of keys of a keyboard that goes, but its reader may be too late to read that.
    print(f"   what it read: {keys.changes()}")
    expect("there is no keyboard any more", None, find_keyboard())
    expect("the daemon was killed", -signal.SIGKILL, daemon.process.wait())
    surface.release("volume-up")


def check_successor(surface):
    daemon = Daemon(log="successor.log")
    daemon.hear_surface("opened", surface="ZT-1")
    keys = Keys()
    expect("no key of the new keyboard is down", [], keys.pressed())
    expect_tap(surface, keys, "volume-down")
    surface.press("volume-down")
    keys.take(VOLUMEDOWN, DOWN)
    daemon.end()
    expect("a keyboard whose daemon is asked to end goes, too", errno.ENODEV, keys.wait_gone())
    expect("after its keys are released", (VOLUMEDOWN, UP), keys.changes()[-1])
    surface.release("volume-down")


def check_unheard(surface):
    """Who reads what the daemon says has gone."""
    daemon = Daemon(log="unheard.log")
    daemon.hear_surface("opened", surface="ZT-1")
    keys = Keys()
    daemon.process.stdout.close()
    for _ in range(3):
        expect_tap(surface, keys)
    daemon.end()
    lines = daemon.log.having("standard output")
    print("  ", *lines)
    expect("that is one line in the log", 1, len(lines))


def main():
    surface = Surface()
    surface.hear("bound")
    surface.unplug()
    check_killed(surface)
    check_successor(surface)
    check_unheard(surface)
    expect("the surface ends when it is told to", 0, surface.finish())


main()
