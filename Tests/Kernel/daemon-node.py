"""The claims of daemon-node.sh."""

import os
import subprocess
import sys
import time

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from daemon import Daemon, Surface
from lab import PATIENCE, expect

UDEVD_SOCKET = "/run/udev/control"


def hide_events():
    """Daemons that start from now on wait for the events of a udevd that does not run: what is there when they start
    is all that they get to know."""
    os.makedirs(os.path.dirname(UDEVD_SOCKET), exist_ok=True)
    with open(UDEVD_SOCKET, "w", encoding="ascii"):
        pass


def show_events():
    os.unlink(UDEVD_SOCKET)


def lines_until_opened(daemon):
    """What the daemon writes, as "surface failed", up to a surface that it opens."""
    lines = []
    while True:
        line = daemon.next(time.monotonic() + PATIENCE, "opened")
        if line.get("state") == "opened":
            return lines
        lines.append(f"{line['type']} {line.get('state')}")


def check_reuse():
    hide_events()
    surface = Surface()
    node = surface.hear("bound")["node"]
    daemon = Daemon("--no-keys", log="reuse.log")
    daemon.hear_surface("opened", surface="ZT-1", node=node)
    surface.unplug()
    daemon.hear_surface("lost", surface="ZT-1")
    other = Surface(serial="ZT-2")
    expect("another device takes the node", node, other.hear("bound")["node"])
    daemon.hear_surface("failed", surface="ZT-1", reason="open: another device has taken the node")
    other.touch("play/pause")
    other.unplug()
    expect("the surface is back at its node", node, surface.plug()["node"])
    expect("the other device was not read, and the surface is opened again", set(),
           set(lines_until_opened(daemon)) - {"surface failed"})
    daemon.end()
    expect("the other surface ends when it is told to", 0, other.finish())
    show_events()
    return surface


def check_regular_file():
    done = subprocess.run(["zorvatouchd", "--no-keys", "--device", "/etc/passwd"], timeout=PATIENCE, check=False,
                          stderr=subprocess.PIPE, text=True)
    expect("a regular file is an error", 1, done.returncode)
    print("  ", done.stderr.strip())


def check_two(surface):
    first = Daemon("--no-keys", log="first.log")
    opened = first.hear_surface("opened", surface="ZT-1")
    for arguments in ([], ["--device", opened["node"]]):
        done = subprocess.run(["zorvatouchd", "--no-keys", *arguments], timeout=PATIENCE, check=False,
                              stderr=subprocess.PIPE, text=True)
        expect("a second daemon ends with status 3", 3, done.returncode)
        print("  ", done.stderr.strip().splitlines()[-1])
    waiting = Daemon("--no-keys", "--wait", log="waiting.log")
    waiting.hear_surface("failed", surface="ZT-1", reason="open: in use by another program")
    first.process.kill()
    first.process.wait()
    waiting.hear_surface("opened", surface="ZT-1")
    surface.touch("play/pause")
    waiting.hear("gesture", gesture="tap")
    print("ok: one that waits takes over when the first is killed")
    waiting.end()


def main():
    check_regular_file()
    surface = check_reuse()
    check_two(surface)
    expect("the surface ends when it is told to", 0, surface.finish())


main()
