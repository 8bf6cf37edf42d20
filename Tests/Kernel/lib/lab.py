"""What the tests written in Python share inside their machine: claims, and the programs that play devices."""

import json
import os
import select
import subprocess
import sys
import time

# Longer than anything here takes on a slow machine; shorter than a test's limit.
PATIENCE = 30.0


def fail(text):
    print(f"FAILED: {text}")
    sys.exit(1)


def expect(what, wanted, got):
    if wanted != got:
        fail(f"{what}: expected {wanted!r}, got {got!r}")
    print(f"ok: {what}")


def expect_error(what, number, action):
    """The action fails with this errno."""
    try:
        got = action()
    except OSError as error:
        expect(what, os.strerror(number), error.strerror)
    else:
        fail(f"{what}: expected {os.strerror(number)!r}, got {got!r}")


def wait_readable(descriptor, what):
    """Until there is something to read, or the other end is gone."""
    poll = select.poll()
    poll.register(descriptor, select.POLLIN)
    if not poll.poll(PATIENCE * 1000):
        fail(f"nothing came: {what}")


def take_report(descriptor, what="a report"):
    wait_readable(descriptor, what)
    return os.read(descriptor, 4096)


class Story:
    """What a program tells on its standard output, a JSON object a line."""

    def __init__(self, program, process, kind="event"):
        """kind: the key under which a line says what it is about."""
        self.program = program
        self.process = process
        self._kind = kind
        self._rest = b""

    def hear(self, event, patience=PATIENCE, **wanted):
        """The next line of this kind with these values; lines before it are passed over."""
        deadline = time.monotonic() + patience
        while True:
            line = self.next(deadline, f"{event} {wanted or ''}".rstrip())
            if line[self._kind] == event and all(line.get(key) == value for key, value in wanted.items()):
                return line

    def next(self, deadline, awaited):
        """The next line; `awaited` is what the failure names if there is none in time."""
        while b"\n" not in self._rest:
            left = max(0.0, deadline - time.monotonic())
            if not select.select([self.process.stdout], [], [], left)[0]:
                fail(f"{self.program} did not say {awaited!r}")
            more = os.read(self.process.stdout.fileno(), 65536)
            if not more:
                fail(f"{self.program} ended before it said {awaited!r}")
            self._rest += more
        line, self._rest = self._rest.split(b"\n", 1)
        return json.loads(line)

    def finish(self):
        """SIGTERM, and its end. Returns its exit status."""
        self.process.terminate()
        return self.process.wait(PATIENCE)


class Emulated(Story):
    """A device that one of the zorvatouch-uhid programs plays: its story, line by line, and its input."""

    def __init__(self, program, *arguments):
        super().__init__(program, subprocess.Popen([program, *arguments], stdin=subprocess.PIPE,
                                                   stdout=subprocess.PIPE))

    def say(self, *lines):
        self.process.stdin.write("".join(f"{line}\n" for line in lines).encode())
        self.process.stdin.flush()

    def hear_all(self):
        """Everything up to the end of the story."""
        deadline = time.monotonic() + PATIENCE
        story = []
        while not story or story[-1]["event"] != "end":
            story.append(self.next(deadline, "end"))
        return story
