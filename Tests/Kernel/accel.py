"""The claims of accel.sh."""

import errno
import os
import struct
import sys
import threading

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from lab import Emulated, expect, fail, take_report

DEVICES = "/sys/bus/iio/devices"
SCAN = struct.Struct("<iii4xq")    # x, y, z in 1/1000 g, ns


def accelerometer():
    """The folder of the IIO device."""
    for name in sorted(os.listdir(DEVICES)):
        folder = os.path.join(DEVICES, name)
        if name.startswith("iio:device") and get(folder, "name") == "accel_3d":
            return folder
    return fail("there is no accelerometer")


def get(folder, attribute):
    with open(os.path.join(folder, attribute), encoding="ascii") as file:
        return file.read().strip()


def put(folder, attribute, value):
    with open(os.path.join(folder, attribute), "w", encoding="ascii") as file:
        file.write(str(value))


def check_attributes(folder):
    expect("a unit is 1/1000 g, in m/s^2", "0.009806650", get(folder, "in_accel_scale"))
    expect("it lies flat: z is 1 g", ("0", "0", "1000"),
           tuple(get(folder, f"in_accel_{axis}_raw") for axis in "xyz"))


def start_buffer(device, folder):
    """Its node, with scans of all axes and the time at 100 Hz."""
    put(folder, "current_timestamp_clock", "monotonic")
    for channel in ("accel_x", "accel_y", "accel_z", "timestamp"):
        put(folder, f"scan_elements/in_{channel}_en", 1)
    put(folder, "in_accel_sampling_frequency", 100)
    put(folder, "buffer/length", 64)
    node = os.open(os.path.join("/dev", os.path.basename(folder)), os.O_RDONLY | os.O_CLOEXEC)
    put(folder, "buffer/enable", 1)
    device.hear("set", on=True, intervalMs=10)
    print("ok: the kernel has set an interval of 10 ms")
    return node


def take_scan(node):
    scan = take_report(node, "a scan")
    return SCAN.unpack(scan[:SCAN.size])


def scans(node):
    """One scan after the other."""
    rest = b""
    while True:
        rest += take_report(node, "a scan")
        while len(rest) >= SCAN.size:
            yield SCAN.unpack(rest[:SCAN.size])
            rest = rest[SCAN.size:]


def check_buffer(device, node):
    stream = scans(node)
    taken = [next(stream) for _ in range(50)]
    expect("gravity, scan for scan", {(0, 0, 1000)}, {scan[:3] for scan in taken})
    times = [scan[3] for scan in taken]
    expect("times go up", sorted(set(times)), times)
    mean_ms = (times[-1] - times[0]) / 49 / 1e6
    print(f"   {mean_ms:.2f} ms between scans")
    # A slow machine leaves samples out, but the beat never is faster.
    expect("the interval is honoured", True, 9.5 < mean_ms < 20)
    device.say("bump 250 0 -400 60")
    began = device.hear("moved")["ns"]
    bump = next(scan for scan in stream if scan[2] != 1000)
    expect("a bump comes through", (250, 0, 600), bump[:3])
    expect("when it happens", True, -20e6 < bump[3] - began < 200e6)
    after = next(scan for scan in stream if scan[2] != 600)
    expect("and passes", (0, 0, 1000), after[:3])


def check_removal(device, node):
    """By a read that waits: poll is not woken here."""
    failure = []

    def read_on():
        try:
            while os.read(node, 4096):
                pass
        except OSError as error:
            failure.append(error.errno)

    reading = threading.Thread(target=read_on)
    reading.start()
    device.say("destroy")
    device.hear("destroyed")
    reading.join(10.0)
    expect("a read that waits ends when the device goes", [errno.ENODEV], failure)
    os.close(node)


def main():
    device = Emulated("zorvatouch-uhid-accelerometer")
    device.hear("bound")
    folder = accelerometer()
    check_attributes(folder)
    node = start_buffer(device, folder)
    check_buffer(device, node)
    check_removal(device, node)
    device.say("create")
    device.hear("bound")
    check_attributes(accelerometer())
    expect("it ends when it is told to", 0, device.finish())


main()
