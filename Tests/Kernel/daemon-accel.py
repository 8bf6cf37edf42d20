"""The claims of daemon-accel.sh."""

import json
import os
import sys
import time

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from daemon import DOWN, OUT, UP, VOLUMEDOWN, Surface, expect_tap, milliseconds, start
from lab import PATIENCE, Emulated, expect, fail

ACCELEROMETER = "zorvatouch-uhid-accelerometer"
NAME = "accel_3d"
RECORDING = os.path.join(OUT, "touch.json")
CYCLES = 40
BEFORE_NS = 1e9    # samples are kept from a little before a touch on


def attach(*serial):
    device = Emulated(ACCELEROMETER, *serial)
    device.hear("bound")
    return device


def samples(daemon, since_ns):
    """(ns, x, y, z) of the accelerometer in the recording, as of now."""
    daemon.save()
    with open(RECORDING, encoding="utf-8") as file:
        frames = json.load(file)["Frames"]
    return [(frame["Timestamp"], *(frame["Value"][axis] for axis in "XYZ")) for frame in frames
            if frame["Type"] == "Metadata" and frame["Key"] == "Accel" and frame["Timestamp"] >= since_ns]


def samples_until(daemon, since_ns, until_ns):
    """They go to the recording with the first that comes after a gesture."""
    deadline = time.monotonic() + PATIENCE
    while time.monotonic() < deadline:
        taken = samples(daemon, since_ns)
        if taken and taken[-1][0] > until_ns:
            return taken
    return fail(f"no samples came after the touch: {taken[-3:]}")


def check_touch(surface, daemon, keys, device):
    """A touch that shakes the machine: the recording has its samples."""
    device.say("bump 250 0 -400 400")
    began = device.hear("moved")["ns"]
    ended = expect_tap(surface, keys)
    taken = samples_until(daemon, began - BEFORE_NS, ended)
    during = [sample for sample in taken if began <= sample[0] <= ended]
    print(f"   {len(taken)} samples, {len(during)} of them within {milliseconds(ended - began)}")
    expect("there are samples of the touch", True, len(during) > 0)
    expect("that show how it shook the machine, in g", True,
           any(abs(x - 0.25) < 0.01 and abs(y) < 0.01 and abs(z - 0.6) < 0.01 for _, x, y, z in taken))


def check_many_times(surface, daemon, keys, device):
    """Nothing is left behind, not even if it goes while the surface is touched."""
    print("   cycle  descriptors  threads")
    footprints = []
    for cycle in range(1, CYCLES + 1):
        if cycle % 5 == 0:
            surface.press("volume-down")
            keys.take(VOLUMEDOWN, DOWN)
        device.say("destroy")
        daemon.hear("accelerometer", state="gone")
        if cycle in (CYCLES // 4, CYCLES):
            footprints.append(daemon.footprint()[:2])
            print(f"   {cycle:5}  {footprints[-1][0]:11}  {footprints[-1][1]:7}")
        device.say("create")
        device.hear("bound")
        daemon.hear("accelerometer", state="used")
        if cycle % 5 == 0:
            surface.release("volume-down")
            keys.take(VOLUMEDOWN, UP)
        device.hear("set", on=True)
    expect("no descriptor and no thread is left behind", *footprints)
    check_touch(surface, daemon, keys, device)


def check_coming_and_going():
    device = attach()
    daemon, keys = start("--save", RECORDING)
    daemon.hear("accelerometer", state="used", name=NAME)
    surface = Surface()
    surface.hear("bound")
    daemon.hear_surface("opened")
    device.hear("set", on=True)
    check_touch(surface, daemon, keys, device)

    gone = time.monotonic_ns()
    device.say("destroy")
    noticed = daemon.hear("accelerometer", state="gone", name=NAME)["timeNs"]
    print(f"ok: it is noticed that the accelerometer has gone, after {milliseconds(noticed - gone)}")
    touched = expect_tap(surface, keys)
    expect("then there are no samples", [], samples(daemon, touched - 100e6))

    device.say("create")
    device.hear("bound")
    daemon.hear("accelerometer", state="used", name=NAME)
    device.hear("set", on=True)
    print("ok: one that comes is used")
    check_touch(surface, daemon, keys, device)

    check_many_times(surface, daemon, keys, device)
    expect("the surface ends when it is told to", 0, surface.finish())
    daemon.hear_surface("removed")
    device.hear("set", on=False)
    print("ok: without a surface the accelerometer is off")
    daemon.end()
    expect("the accelerometer ends when it is told to", 0, device.finish())


def node_of(device):
    """/dev/iio:deviceN, once it is there."""
    for _, folders, _ in os.walk(device.hear("bound")["folder"]):
        for name in folders:
            if name.startswith("iio:device"):
                return os.path.join("/dev", name)
    return fail("the accelerometer has no node")


def check_choice():
    """Of two that have the same name the second is chosen by its node."""
    devices = [Emulated(ACCELEROMETER, serial) for serial in ("ZA-1", "ZA-2")]
    nodes = [node_of(device) for device in devices]
    expect("there are two accelerometers", {"/dev/iio:device0", "/dev/iio:device1"}, set(nodes))
    daemon, keys = start("--accel", nodes[1], "--save", RECORDING, log="choice.log")
    daemon.hear("accelerometer", state="used", name=NAME)
    surface = Surface(serial="ZT-2")
    surface.hear("bound")
    daemon.hear_surface("opened")
    devices[1].hear("set", on=True)
    print("ok: the second is asked for samples")
    check_touch(surface, daemon, keys, devices[1])
    expect("the first ends when it is told to", 0, devices[0].finish())
    expect("and was never on", [], [line for line in devices[0].hear_all() if line["event"] == "set" and line["on"]])
    expect("the surface ends when it is told to", 0, surface.finish())
    daemon.end()
    expect("so does the second", 0, devices[1].finish())


def check_none():
    daemon, keys = start(log="none.log")
    surface = Surface(serial="ZT-3")
    surface.hear("bound")
    daemon.hear_surface("opened")
    expect_tap(surface, keys)
    surface.unplug()
    daemon.hear_surface("removed")
    surface.plug()
    daemon.hear_surface("opened")
    expect_tap(surface, keys)
    expect("the surface ends when it is told to", 0, surface.finish())
    lines = [line for line in daemon.end() if "accel" in line.lower()]
    print(f"   {lines[0]}")
    expect("each time that the surface comes that is one line", [True, True], [" error " in line for line in lines])


def main():
    check_coming_and_going()
    check_choice()
    check_none()


main()
