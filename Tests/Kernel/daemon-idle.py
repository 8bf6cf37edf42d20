"""The claims of daemon-idle.sh."""

import os
import select
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from daemon import Surface, expect_tap, start
from lab import expect

WINDOW_S = 5.0    # in which nothing happens; longer than whatever settles after a touch


def let_pass(daemon):
    """The time is the claim's: nothing is to be heard while it passes."""
    heard, _, _ = select.select([daemon.process.stdout], [], [], WINDOW_S)
    expect(f"for {WINDOW_S} s the daemon has nothing to say", [], heard)


def check(daemon, when):
    let_pass(daemon)    # what is still to be done
    before = daemon.threads()
    let_pass(daemon)
    print("  ", ", ".join(before))
    expect(f"{when} no thread wakes up", before, daemon.threads())


def main():
    daemon, keys = start()
    check(daemon, "without a surface")
    surface = Surface()
    surface.hear("bound")
    daemon.hear_surface("opened")
    check(daemon, "with a surface")
    expect_tap(surface, keys)
    daemon.hear_key(164, "up")
    check(daemon, "after a touch")
    expect("the surface ends when it is told to", 0, surface.finish())
    daemon.end()


main()
