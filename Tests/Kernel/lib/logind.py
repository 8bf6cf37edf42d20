"""Who tells programs that the machine is about to sleep, and waits for them: so much of logind as that takes."""

import os
import select
import threading
import time

import dbus
import dbus.mainloop.glib
import dbus.service
from gi.repository import GLib

from lab import PATIENCE, fail

NAME, PATH, MANAGER = "org.freedesktop.login1", "/org/freedesktop/login1", "org.freedesktop.login1.Manager"


class Logind(dbus.service.Object):
    """On the system bus, from now on."""

    def __init__(self):
        dbus.mainloop.glib.DBusGMainLoop(set_as_default=True)
        dbus.mainloop.glib.threads_init()
        super().__init__(dbus.service.BusName(NAME, dbus.SystemBus()), PATH)
        self._inhibitors = []    # (what was asked, our end of its pipe)
        self._asked = threading.Semaphore(0)
        self._loop = GLib.MainLoop()
        threading.Thread(target=self._loop.run, daemon=True).start()

    @dbus.service.method(MANAGER, in_signature="ssss", out_signature="h")
    def Inhibit(self, what, who, why, mode):    # pylint: disable=invalid-name
        ours, theirs = os.pipe2(os.O_CLOEXEC)
        self._inhibitors.append(((str(what), str(who), str(why), str(mode)), ours))
        self._asked.release()
        try:
            return dbus.types.UnixFd(theirs)
        finally:
            os.close(theirs)

    @dbus.service.signal(MANAGER, signature="b")
    def PrepareForSleep(self, begins):    # pylint: disable=invalid-name
        """Tells all who listen."""

    def tell(self, begins):
        """When it began to tell."""
        when = time.monotonic_ns()
        GLib.idle_add(self.PrepareForSleep, begins)
        return when

    def wait_inhibitor(self):
        """What the next who inhibits sleep asked for."""
        if not self._asked.acquire(timeout=PATIENCE):
            fail("nobody wants to know of sleep")
        return self._inhibitors[-1][0]

    def is_inhibited(self):
        return not select.select([self._inhibitors[-1][1]], [], [], 0)[0]

    def wait_let_go(self):
        """When the last inhibitor was closed."""
        if not select.select([self._inhibitors[-1][1]], [], [], PATIENCE)[0]:
            fail("the machine is kept from sleeping")
        when = time.monotonic_ns()
        os.close(self._inhibitors.pop()[1])
        return when
