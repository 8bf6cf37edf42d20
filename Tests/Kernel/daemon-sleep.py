"""The claims of daemon-sleep.sh."""

import os
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from daemon import DOWN, UP, VOICECOMMAND, Surface, expect_tap, milliseconds, start
from lab import expect
from logind import Logind


def check_sleep(logind, daemon, surface, keys):
    surface.press("play/pause")
    keys.take(VOICECOMMAND, DOWN)
    keys.take_repeat(VOICECOMMAND)
    expect("the machine is kept from sleeping", True, logind.is_inhibited())
    told = logind.tell(True)
    released = keys.take(VOICECOMMAND, UP)
    let_go = logind.wait_let_go()
    print(f"   released after {milliseconds(released - told)}, let go after {milliseconds(let_go - told)}")
    expect("the key is released, and then the machine may sleep", True, told <= released < let_go)
    daemon.hear("sleep", state="begins")
    logind.tell(False)
    daemon.hear("sleep", state="ends")
    surface.release("play/pause")


def main():
    logind = Logind()
    daemon, keys = start()
    asked = ("sleep", "zorvatouchd", "Release keys before sleep", "delay")
    expect("the daemon wants to know of sleep", asked, logind.wait_inhibitor())
    surface = Surface()
    surface.hear("bound")
    daemon.hear_surface("opened")
    for _ in range(2):
        check_sleep(logind, daemon, surface, keys)
        expect("after the sleep it wants to know again", asked, logind.wait_inhibitor())
        expect_tap(surface, keys)
    expect("the surface ends when it is told to", 0, surface.finish())
    daemon.end()
    logind.wait_let_go()
    print("ok: the daemon's end lets the machine sleep")


main()
