"""What the daemon's tests share: the daemon, its keyboard as other programs see it, a surface that obeys."""

import array
import fcntl
import os
import signal
import struct
import subprocess
import threading
import time

# pylint: disable=wrong-import-position
from finger import Finger
from lab import PATIENCE, Emulated, Story, expect, fail

OUT = "/run/lab/out"
SURFACE = "zorvatouch-uhid-surface"
KEYBOARD = "ZorvaTouch Keyboard"

VOLUMEDOWN, VOLUMEUP, PLAYPAUSE, VOICECOMMAND = 114, 115, 164, 582
REGIONS = {1: "play/pause", 2: "volume-down", 3: "volume-up"}    # as labels and gestures have them
TAP_KEYS = {"play/pause": PLAYPAUSE, "volume-down": VOLUMEDOWN, "volume-up": VOLUMEUP}
HOLD_KEYS = {"play/pause": VOICECOMMAND, "volume-down": VOLUMEDOWN, "volume-up": VOLUMEUP}
UP, DOWN, REPEAT = 0, 1, 2

EV_SYN, EV_KEY, SYN_DROPPED = 0, 1, 3
EVENT = struct.Struct("<qqHHi")
EVIOCSCLOCKID = 0x400445A0
KEY_BYTES = 96    # KEY_CNT / 8
EVIOCGKEY = 2 << 30 | KEY_BYTES << 16 | ord("E") << 8 | 0x18


def milliseconds(nanoseconds):
    return f"{nanoseconds / 1e6:.1f} ms"


class Log:
    """The daemon's log: (ns, text) of each line, as it comes, and a file of it that is kept."""

    def __init__(self, stream, path):
        self.lines = []
        self._stream = stream
        self._path = path
        self._change = threading.Condition()
        self._reading = threading.Thread(target=self._read, daemon=True)
        self._reading.start()

    def _read(self):
        with open(self._path, "ab", buffering=0) as file:
            for line in self._stream:
                file.write(line)
                with self._change:
                    self.lines.append((time.monotonic_ns(), line.decode(errors="replace").rstrip("\n")))
                    self._change.notify_all()

    def having(self, text):
        """The lines with this text in them."""
        return [line for _, line in list(self.lines) if text in line]

    def wait(self, text, count=1):
        """Until so many lines have this text."""
        with self._change:
            if not self._change.wait_for(lambda: len(self.having(text)) >= count, PATIENCE):
                fail(f"the log does not say {text!r}: {[line for _, line in self.lines]}")
        return self.having(text)

    def close(self):
        """All that there is: once the daemon has ended."""
        self._reading.join(PATIENCE)
        return [line for _, line in self.lines]


class Daemon(Story):
    """zorvatouchd, which has its keyboard once this is made."""

    def __init__(self, *arguments, before=(), log="daemon.log", **settings):
        """before: what the command begins with. settings: subprocess.Popen's."""
        process = subprocess.Popen([*before, "zorvatouchd", "--events", "json", *arguments],
                                   stdout=subprocess.PIPE, stderr=subprocess.PIPE, **settings)
        super().__init__("zorvatouchd", process, kind="type")
        self.log = Log(process.stderr, os.path.join(OUT, log))

    @property
    def pid(self):
        return self.process.pid

    def hear_surface(self, state, **wanted):
        """wanted: also the `patience`."""
        return self.hear("surface", state=state, **wanted)

    def hear_key(self, code, state):
        return self.hear("key", code=code, state=state)

    def save(self):
        """What it says of the recording, which is complete when this returns."""
        self.process.send_signal(signal.SIGUSR1)
        return self.hear("recording")

    def status(self, key):
        """A number of /proc/PID/status."""
        with open(f"/proc/{self.pid}/status", encoding="ascii") as file:
            for line in file:
                if line.startswith(key + ":"):
                    return int(line.split()[1])
        return fail(f"there is no {key}")

    def descriptors(self):
        """The files that it has open; one twice if it is so."""
        folder = f"/proc/{self.pid}/fd"
        files = []
        for number in os.listdir(folder):
            try:
                files.append(os.readlink(os.path.join(folder, number)))
            except OSError:    # it has just been closed
                continue
        return files

    def threads(self):
        """(state, how often it has gone to sleep) of each thread, by its name and number."""
        threads = {}
        for thread in sorted(os.listdir(f"/proc/{self.pid}/task"), key=int):
            try:
                with open(f"/proc/{self.pid}/task/{thread}/status", encoding="utf-8") as file:
                    status = dict(line.rstrip("\n").split(":\t", 1) for line in file if ":\t" in line)
            except OSError:    # it has just ended
                continue
            threads[f"{status['Name']} {thread}"] = (status["State"][0], int(status["voluntary_ctxt_switches"]))
        return threads

    def footprint(self):
        """Descriptors, threads, kilobytes in memory, taken when no thread is doing anything, and none waits for the
        kernel to set something up."""
        deadline = time.monotonic() + PATIENCE
        while time.monotonic() < deadline:
            before = self.threads()
            files = self.descriptors()
            memory = self.status("VmRSS")
            is_asleep = before == self.threads() and all(state == "S" for state, _ in before.values())
            if is_asleep and not any(file.startswith("/sys/") for file in files):
                return len(files), len(before), memory
        return fail(f"the daemon does not come to rest: {self.threads()}")

    def thread(self, name):
        """The number of the thread of this name."""
        for known in self.threads():
            if known.rsplit(" ", 1)[0] == name:
                return int(known.rsplit(" ", 1)[1])
        return fail(f"there is no thread {name}")

    def end(self):
        """SIGTERM; it ends well, and all of its log has been read."""
        expect("the daemon ends when it is told to", 0, self.finish())
        return self.log.close()


def find_keyboard():
    """The node of the daemon's keyboard; None if there is none."""
    folder = "/sys/class/input"
    for name in os.listdir(folder):
        if not name.startswith("event"):
            continue
        try:
            with open(os.path.join(folder, name, "device/name"), encoding="utf-8") as file:
                if file.read().strip() == KEYBOARD:
                    return os.path.join("/dev/input", name)
        except FileNotFoundError:    # it has just gone
            continue
    return None


class Keys:
    """The daemon's keyboard as another program sees it: (ns, code, value) of each event of a key.

    Times are the kernel's, of the monotonic clock.
    """

    def __init__(self):
        self.node = find_keyboard() or fail("there is no keyboard")
        self.events = []
        self.error = None    # what ended it
        self._taken = 0
        self._descriptor = os.open(self.node, os.O_RDONLY | os.O_CLOEXEC)
        fcntl.ioctl(self._descriptor, EVIOCSCLOCKID, struct.pack("<i", time.CLOCK_MONOTONIC))
        self._change = threading.Condition()
        self._reading = threading.Thread(target=self._read, daemon=True)
        self._reading.start()

    def _read(self):
        try:
            while True:
                data = os.read(self._descriptor, EVENT.size * 64)
                for seconds, micros, kind, code, value in EVENT.iter_unpack(data):
                    if kind == EV_SYN and code == SYN_DROPPED:
                        raise OverflowError("the test reads keys too slowly")
                    if kind == EV_KEY:
                        self._append((seconds * 10**9 + micros * 1000, code, value))
        except (OSError, OverflowError) as error:
            self._end(error)

    def _append(self, event):
        with self._change:
            self.events.append(event)
            self._change.notify_all()

    def _end(self, error):
        with self._change:
            self.error = error
            self._change.notify_all()

    def take(self, code, value, patience=PATIENCE):
        """When this happened. It must be the next that happens, except for repeats."""
        with self._change:
            while True:
                if not self._change.wait_for(lambda: len(self.events) > self._taken or self.error, patience):
                    fail(f"key {code} did not become {value}; the last were {self.events[-4:]}")
                if len(self.events) == self._taken:
                    fail(f"key {code} did not become {value}: {self.error}")
                event = self.events[self._taken]
                self._taken += 1
                if event[1:] == (code, value):
                    return event[0]
                if event[2] != REPEAT:
                    fail(f"expected key {code} to become {value}, got {event[1:]}")

    def take_repeat(self, code):
        """When a key that is down is repeated."""
        return self.take(code, REPEAT)

    def take_tap(self, code):
        """When the key went down; it goes up, too."""
        down = self.take(code, DOWN)
        self.take(code, UP)
        return down

    def skip(self):
        """Passes over all that has happened so far."""
        with self._change:
            self._taken = len(self.events)

    def pressed(self):
        """The keys that are down now, says the kernel."""
        keys = array.array("B", bytes(KEY_BYTES))
        fcntl.ioctl(self._descriptor, EVIOCGKEY, keys, True)
        return [code for code in range(KEY_BYTES * 8) if keys[code // 8] >> code % 8 & 1]

    def wait_gone(self):
        """Until the keyboard is gone. Returns the error with which its reader ends."""
        self._reading.join(PATIENCE)
        if not self.error:
            fail("the keyboard is still there")
        os.close(self._descriptor)
        return getattr(self.error, "errno", self.error)

    def changes(self):
        """(code, value) of all so far, without repeats."""
        return [event[1:] for event in self.events if event[2] != REPEAT]


class Surface(Emulated):
    """A surface that is touched when a test says so."""

    def __init__(self, *arguments, serial="ZT-1", pace_ms=10, before=()):
        command = [*before, SURFACE, "--input", "--keep", "--serial", serial, *arguments]
        super().__init__(command[0], *command[1:])
        self.serial = serial
        self.finger = Finger(pace_ms)

    def unplug(self):
        """When it began to go."""
        self.say("mark", "destroy")
        began = self.hear("mark")["ns"]
        self.hear("destroyed")
        return began

    def plug(self):
        """The line of its story that says so."""
        self.say("create")
        return self.hear("bound")

    def touch(self, region, **settings):
        """A tap, after a little rest."""
        self.say(*self.finger.rest(5), *self.finger.tap(region, **settings))

    def press(self, region):
        """A hold that has begun."""
        self.say(*self.finger.rest(5), *self.finger.down(region))

    def release(self, region):
        self.say(*self.finger.up(region))


def start(*arguments, **settings):
    """(daemon, its keys): a daemon without any surface yet."""
    daemon = Daemon(*arguments, **settings)
    daemon.log.wait("no touch surface found; waiting for one")
    return daemon, Keys()


def expect_tap(surface, keys, region="play/pause"):
    """A touch gives its key. Returns when."""
    surface.touch(region)
    down = keys.take_tap(TAP_KEYS[region])
    print(f"ok: a tap in {region} gives its key")
    return down
