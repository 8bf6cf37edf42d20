"""The claims of daemon-keys.sh."""

import os
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from daemon import DOWN, HOLD_KEYS, REGIONS, SURFACE, TAP_KEYS, UP, VOICECOMMAND, milliseconds, start
from lab import Emulated, expect

# Scenarios in which all that is done is meant. Docs/Synth.md counts few fingertips that land between two regions or are
# too light for their length, of which the recognizer makes something else; with these seeds there are none.
FINGERS = [("taps", 34, 9), ("holds", 1, 14)]
FIRST_REPEAT_NS = 250e6    # the kernel's delay, for as long as nobody sets another


def play(scenario, seed, seconds):
    """The labels of all that the finger means."""
    surface = Emulated(SURFACE, "--scenario", scenario, "--seed", str(seed), "--seconds", str(seconds),
                       "--serial", f"ZT-{scenario}")
    labels = [line for line in surface.hear_all() if line["event"] == "label" and line["region"]]
    surface.process.wait()
    return labels


def wanted_changes(label):
    region = REGIONS[label["region"]]
    key = (HOLD_KEYS if label["kind"] == "Hold" else TAP_KEYS)[region]
    return [(key, DOWN), (key, UP)]


def presses(events):
    """(key, ns that it was down, repeats) of each time a key was down."""
    down, repeats = 0, 0
    for when, code, value in events:
        if value == DOWN:
            down, repeats = when, 0
        elif value == UP:
            yield code, when - down, repeats
        else:
            repeats += 1


def check_repeats(events):
    """Keys that are held repeat from the kernel's delay on; others do not."""
    all_of_them = list(presses(events))
    print("  ", *(f"{code}: {milliseconds(held)}, {repeats} repeats;" for code, held, repeats in all_of_them))
    taps = [repeats for _, held, repeats in all_of_them if held < FIRST_REPEAT_NS]
    holds = [repeats for _, held, repeats in all_of_them if held > 1.5 * FIRST_REPEAT_NS]
    expect("keys that are tapped do not repeat", {0}, set(taps))
    expect("there are some that are held", True, len(holds) > 0)
    expect("and all of them repeat", True, min(holds) > 0)


def main():
    daemon, keys = start()
    wanted = []
    for finger in FINGERS:
        labels = play(*finger)
        daemon.hear_surface("removed", surface=f"ZT-{finger[0]}")
        print(f"   {finger[0]}:", *(f"{label['kind']} {REGIONS[label['region']]}" for label in labels))
        wanted += [change for label in labels for change in wanted_changes(label)]
    daemon.end()
    keys.wait_gone()
    expect(f"{len(wanted) // 2} labels gave their keys", wanted, keys.changes())
    expect("there are taps in all regions", {*TAP_KEYS.values()},
           {code for code, _ in wanted} & {*TAP_KEYS.values()})
    expect("and a voice command", True, (VOICECOMMAND, DOWN) in wanted)
    check_repeats(keys.events)


main()
