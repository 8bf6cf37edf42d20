"""The claims of uinput.sh."""

import ctypes
import errno
import os
import struct
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from lab import expect, expect_error, take_report, wait_readable

EV_SYN, EV_KEY, EV_REP = 0, 1, 0x14
KEYS = {"play/pause": 164, "volume up": 115, "volume down": 114, "voice command": 582}
MANAGED = -2    # libevdev opens /dev/uinput itself
EVENT = struct.Struct("<qqHHi")

evdev = ctypes.CDLL("libevdev.so.2")
evdev.libevdev_new.restype = ctypes.c_void_p
evdev.libevdev_uinput_get_devnode.restype = ctypes.c_char_p


class Keyboard:
    def __init__(self, name, types):
        description = ctypes.c_void_p(evdev.libevdev_new())
        evdev.libevdev_set_name(description, name)
        for kind in types:
            evdev.libevdev_enable_event_type(description, kind)
        for code in KEYS.values():
            evdev.libevdev_enable_event_code(description, EV_KEY, code, None)
        self._device = ctypes.c_void_p()
        status = evdev.libevdev_uinput_create_from_device(description, MANAGED, ctypes.byref(self._device))
        expect(f"{name.decode()} is made", 0, status)
        self.node = evdev.libevdev_uinput_get_devnode(self._device).decode()

    def write(self, code, value):
        evdev.libevdev_uinput_write_event(self._device, EV_KEY, code, value)
        evdev.libevdev_uinput_write_event(self._device, EV_SYN, 0, 0)

    def destroy(self):
        evdev.libevdev_uinput_destroy(self._device)


def take_events(node, count):
    """(type, code, value) of so many events."""
    events = []
    while len(events) < count:
        data = take_report(node, "a key")
        events += [EVENT.unpack_from(data, at)[2:] for at in range(0, len(data), EVENT.size)]
    return events


def check_keys(keyboard, node):
    for name, code in KEYS.items():
        keyboard.write(code, 1)
        keyboard.write(code, 0)
        expect(f"{name} goes down and up", [(EV_KEY, code, 1), (EV_SYN, 0, 0), (EV_KEY, code, 0), (EV_SYN, 0, 0)],
               take_events(node, 4))


def check_repeating():
    keyboard = Keyboard(b"Repeating keys", [EV_KEY, EV_REP])
    node = os.open(keyboard.node, os.O_RDONLY | os.O_CLOEXEC)
    keyboard.write(KEYS["volume up"], 1)
    values = [value for kind, _, value in take_events(node, 8) if kind == EV_KEY]
    expect("a key that is held repeats", [1, 2, 2, 2], values[:4])
    keyboard.write(KEYS["volume up"], 0)
    while (EV_KEY, KEYS["volume up"], 0) not in take_events(node, 2):
        pass
    print("ok: until it is released")
    os.close(node)
    keyboard.destroy()


def check_end(keyboard, node):
    keyboard.write(KEYS["volume down"], 1)
    take_events(node, 2)
    keyboard.destroy()
    wait_readable(node, "the end of the keyboard")
    expect_error("a keyboard that goes with a key down sends no release", errno.ENODEV, lambda: os.read(node, 4096))
    expect("its node is gone", False, os.path.exists(keyboard.node))


def main():
    keyboard = Keyboard(b"Keys of the test", [EV_KEY])
    node = os.open(keyboard.node, os.O_RDONLY | os.O_CLOEXEC)
    check_keys(keyboard, node)
    check_repeating()
    check_end(keyboard, node)
    os.close(node)


main()
