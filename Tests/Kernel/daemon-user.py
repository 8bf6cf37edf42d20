"""The claims of daemon-user.sh."""

import os
import sys

sys.path.insert(0, os.path.join(os.path.dirname(os.path.abspath(__file__)), "lib"))
# pylint: disable=wrong-import-position
from daemon import TAP_KEYS, Daemon, Surface, expect_tap, start
from lab import expect

USER = 1000
GROUP = int(sys.argv[1])    # which udev's rules let in
PRIORITY = 63
REFUSAL = f"real-time priority {PRIORITY} is not allowed"
THREADS = ("zorva-keys", "zorva-input")
ACCOUNT = ("setpriv", f"--reuid={USER}", f"--regid={USER}")
MEMBER = (*ACCOUNT, f"--groups={GROUP}")
STRANGER = (*ACCOUNT, "--clear-groups")
ALLOWED = ("prlimit", f"--rtprio={PRIORITY}:{PRIORITY}")


def policies(daemon):
    """Of the threads that reports and keys take their way through."""
    threads = [daemon.thread(name) for name in THREADS]
    return {(os.sched_getscheduler(thread), os.sched_getparam(thread).sched_priority) for thread in threads}


def check_member(surface, before, wanted, refusals, log):
    daemon, keys = start(before=before, log=log)
    surface.plug()
    daemon.hear_surface("opened")
    expect("the daemon is not root", USER, daemon.status("Uid"))
    expect_tap(surface, keys)
    expect("its threads have the priority that is allowed", wanted, policies(daemon))
    surface.unplug()
    daemon.hear_surface("removed")
    daemon.end()
    lines = daemon.log.having(REFUSAL)
    for line in lines:
        print(f"   {line}")
    expect("a refusal is one line", refusals, len(lines))


def check_stranger(surface):
    daemon = Daemon(before=STRANGER, log="stranger.log")
    daemon.log.wait("keys are shown, not pressed: open /dev/uinput: Permission denied")
    node = surface.plug()["node"]
    reason = daemon.hear_surface("failed")["reason"]
    expect("a user outside the group learns why nothing works", True, reason.startswith("open: Permission denied;"))
    print(f"   {reason}")
    os.chmod(node, 0o666)
    daemon.hear_surface("opened")
    surface.touch("volume-up")
    expect("it is tried again, and works when that is allowed; the key is shown", False,
           daemon.hear_key(TAP_KEYS["volume-up"], "down")["sent"])
    surface.unplug()
    daemon.hear_surface("removed")
    daemon.end()


def main():
    surface = Surface()
    surface.hear("bound")
    surface.unplug()
    check_stranger(surface)
    check_member(surface, MEMBER, {(os.SCHED_OTHER, 0)}, 1, "refused.log")
    check_member(surface, (*ALLOWED, *MEMBER), {(os.SCHED_RR, PRIORITY)}, 0, "allowed.log")
    expect("the surface ends when it is told to", 0, surface.finish())


main()
