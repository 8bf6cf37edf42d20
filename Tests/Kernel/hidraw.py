"""The claims of hidraw.sh."""

import array
import errno
import fcntl
import os
import struct
import sys
import threading

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from lab import Emulated, expect, expect_error, take_report, wait_readable

SURFACE = "zorvatouch-uhid-surface"
IMAGE, EVENT = 73, 10    # bytes of the two reports, report ID included


def request(direction, number, size):
    """The number of an ioctl of hidraw."""
    return direction << 30 | size << 16 | ord("H") << 8 | number


def read_ioctl(node, number, size):
    buffer = array.array("B", bytes(size))
    length = fcntl.ioctl(node, request(2, number, size), buffer, True)
    return length, buffer.tobytes()


def get_feature(node, report_id, size=64):
    """A feature report, as long as it is."""
    buffer = array.array("B", bytes([report_id]) + bytes(size - 1))
    length = fcntl.ioctl(node, request(3, 7, size), buffer, True)
    return buffer.tobytes()[:length].hex()


def set_feature(node, report):
    return fcntl.ioctl(node, request(3, 6, len(report)), array.array("B", report), True)


def hex_line(report):
    return report.hex(" ")


def open_node(surface):
    path = surface.hear("bound")["node"]
    return path, os.open(path, os.O_RDWR | os.O_CLOEXEC)


def check_identity(node):
    _, size = read_ioctl(node, 0x01, 4)
    expect("the descriptor has 101 bytes", 101, struct.unpack("<i", size)[0])
    length, name = read_ioctl(node, 0x04, 256)
    expect("it has a name", b"Surface of the test\0", name[:length])
    length, serial = read_ioctl(node, 0x08, 64)
    expect("it has a serial number", b"SER-42\0", serial[:length])
    _, info = read_ioctl(node, 0x03, 8)
    expect("it is a virtual device 1234:abcd", (6, 0x1234, 0xABCD), struct.unpack("<IHH", info))


def check_reports(surface, node):
    image, event = bytes([1]) + bytes(range(72)), bytes([2, 0]) + bytes(8)
    surface.say(hex_line(image), hex_line(event), hex_line(image))
    expect("the first report comes as it was sent", image, take_report(node))
    expect("the second too", event, take_report(node))
    expect("and the third", image, take_report(node))


def check_features(surface, node):
    expect("feature 31 is answered: 10000", "1f10270000", get_feature(node, 31))
    expect("the story tells of it", "answer", surface.hear("request", what="get", id=31)["answer"])
    expect("a debug report is answered", "0401020304", get_feature(node, 4))
    expect_error("one that is refused fails", errno.EIO, lambda: get_feature(node, 0x12))
    expect("the story tells of that too", "refuse", surface.hear("request", what="get", id=0x12)["answer"])
    expect_error("so does one that does not exist", errno.EIO, lambda: get_feature(node, 5))
    expect("a feature can be set", 5, set_feature(node, bytes([31, 1, 2, 3, 4])))
    expect("its bytes arrive", "1f 01 02 03 04 ", surface.hear("request", what="set", id=31)["data"])
    surface.say("feature 31=answer:1f 01", "02 00 00 00 00 00 00 00 00 00")
    take_report(node, "the report that says that the answer has changed")
    expect("an answer can be shorter than declared", "1f01", get_feature(node, 31))


def check_unplugging(surface, node, path):
    """With a request in flight that nobody answers."""
    failure = []

    def ask():
        try:
            failure.append(get_feature(node, 29))
        except OSError as error:
            failure.append(error.errno)

    asking = threading.Thread(target=ask)
    asking.start()
    surface.hear("request", what="get", id=29, answer="mute")
    surface.say("destroy")
    asking.join(4.0)
    expect("a request that nobody answers ends when the device goes", [errno.EIO], failure)
    wait_readable(node, "the end of the device")
    expect_error("there is nothing more to read", errno.EIO, lambda: os.read(node, 4096))
    expect_error("nor to ask", errno.ENODEV, lambda: get_feature(node, 31))
    expect("the node is gone", False, os.path.exists(path))


def check_return(surface, path):
    surface.say("create")
    again, node = open_node(surface)
    expect("the device comes back under another name", True, again != path)
    report = bytes([2]) + bytes(9)
    surface.say(hex_line(report))
    expect("and its reports come", report, take_report(node))
    os.close(node)


def check_by_hand():
    surface = Emulated(SURFACE, "--input", "--keep", "--name", "Surface of the test", "--serial", "SER-42",
                       "--feature", "29=mute")
    path, node = open_node(surface)
    check_identity(node)
    check_reports(surface, node)
    check_features(surface, node)
    check_unplugging(surface, node, path)
    check_return(surface, path)
    os.close(node)
    expect("it ends when it is told to", 0, surface.finish())


def read_until_gone(node):
    """(number, kind) of the images and lengths of all reports, until the device goes."""
    reports = []
    while True:
        try:
            reports.append(take_report(node))
        except OSError as error:
            expect("reading ends with the device", errno.EIO, error.errno)
            return reports


def check_finger():
    """A finger that the program makes up: its reports, at its pace, and what it says of it."""
    seconds = 3
    surface = Emulated(SURFACE, "--scenario", "taps", "--seed", "1", "--seconds", str(seconds), "--serial", "SER-43")
    _, node = open_node(surface)
    began = surface.hear("playing")["ns"]
    reports = read_until_gone(node)
    os.close(node)
    story = surface.hear_all()
    labels = [line for line in story if line["event"] == "label"]
    images = [report for report in reports if report[0] == 1]
    numbers = [struct.unpack_from("<I", image, 1)[0] for image in images]
    expect("all reports have their lengths", True,
           all(len(report) == (IMAGE if report[0] == 1 else EVENT) for report in reports))
    sent = story[-1]["reports"]
    print(f"   {len(reports)} of {sent} reports, {len(labels)} labels")
    # The node is opened after the first reports may have been sent; none is lost from then on.
    expect("the images are consecutive", list(range(numbers[0], numbers[0] + len(numbers))), numbers)
    expect("to the last", sent - len(reports), numbers[0])
    expect("the finger played as long as it was told, not faster", True,
           story[-1]["ns"] - began > (seconds - 0.1) * 1e9)
    expect("the finger tapped", True, len(labels) > 0)
    expect("each label begins before it ends, within the time played", True,
           all(began <= label["startNs"] < label["endNs"] <= story[-1]["ns"] for label in labels))


def check_loose():
    surface = Emulated(SURFACE, "--input", "--loose", "--serial", "SER-44")
    _, node = open_node(surface)
    surface.say("01 02 03 04 05", "01 " * 100)
    expect("a loose surface sends short reports", bytes([1, 2, 3, 4, 5]), take_report(node))
    expect("and long ones", b"\x01" * 100, take_report(node))
    os.close(node)
    surface.process.stdin.close()
    expect("it ends with its input", 0, surface.process.wait(10))


def main():
    check_by_hand()
    check_finger()
    check_loose()


main()
