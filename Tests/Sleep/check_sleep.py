#!/usr/bin/python3
"""Checks that sleep is told in time, and only by logind.

    check_sleep.py PROGRAM    PROGRAM says on its output what it is told (SleepTeller.cpp)

Each test has a system bus of its own. Every wait is for the thing itself, and fails after a while.
"""

import os
import pathlib
import signal
import socket
import subprocess
import sys
import tempfile
import unittest

import dbus
import dbus.lowlevel
import dbus.mainloop.glib
from gi.repository import GLib

LOGIND = "org.freedesktop.login1"
LOGIND_PATH = "/org/freedesktop/login1"
MANAGER = "org.freedesktop.login1.Manager"
MOCK = "org.freedesktop.DBus.Mock"
TEMPLATE = pathlib.Path(__file__).resolve().parent / "logind_template.py"
LONGEST_WAIT_S = 30
STAYS_DOWN = "; keys that are down may stay down while the machine sleeps"

BUS_CONFIG = """<busconfig>
  <type>session</type>
  <listen>unix:path={socket}</listen>
  <auth>EXTERNAL</auth>
  <policy context="default">
    <allow user="*"/>
    <allow own="*"/>
    <allow send_destination="*"/>
    <allow send_type="signal"/>
    <allow receive_sender="*"/>
  </policy>
</busconfig>
"""


def wait_until(condition, what):
    """Serves what comes in until the condition holds."""
    late = []
    timer = GLib.timeout_add_seconds(LONGEST_WAIT_S, lambda: late.append(True))
    while not condition() and not late:
        GLib.MainContext.default().iteration(True)
    if late:
        raise AssertionError(f"waited in vain for {what()}")
    GLib.source_remove(timer)


def stop(process):
    process.kill()
    process.wait(LONGEST_WAIT_S)
    for stream in (process.stdin, process.stdout):
        if stream:
            stream.close()


class Program:
    """The program under test, and what it has said so far."""

    def __init__(self, environment):
        self.lines = []
        self._text = b""
        self.process = subprocess.Popen([PROGRAM], env=environment, stdin=subprocess.PIPE, stdout=subprocess.PIPE)
        self._source = GLib.unix_fd_add_full(GLib.PRIORITY_DEFAULT, self.process.stdout.fileno(),
                                             GLib.IOCondition.IN | GLib.IOCondition.HUP, self._read)

    def _read(self, descriptor, _):
        text = os.read(descriptor, 4096)
        *lines, self._text = (self._text + text).split(b"\n")
        self.lines += [line.decode() for line in lines]
        if not text:
            self._source = None
        return bool(text)

    def say(self, line=""):
        self.process.stdin.write(line.encode() + b"\n")
        self.process.stdin.flush()

    def wait_for(self, count):
        wait_until(lambda: len(self.lines) >= count, lambda: f"{count} lines: {self.lines}")

    def take(self, count):
        """The next lines, as many."""
        self.wait_for(count)
        taken, self.lines = self.lines[:count], self.lines[count:]
        return taken

    def retry(self):
        """All lines until it has tried to connect again."""
        return self.take_all("retry")

    def take_all(self, line=""):
        """All lines so far. The program serves, as it answers."""
        self.say(line)
        wait_until(lambda: self.lines and self.lines[-1] == "pong", lambda: f"an answer: {self.lines}")
        taken, self.lines = self.lines[:-1], []
        return taken

    def end(self):
        """Has it come to its end.

        @return Its status."""
        self.process.stdin.close()
        return self.process.wait(LONGEST_WAIT_S)

    def stop(self):
        if self._source:
            GLib.source_remove(self._source)
        stop(self.process)


class SleepTest(unittest.TestCase):

    def setUp(self):
        self.folder = tempfile.TemporaryDirectory()
        self.addCleanup(self.folder.cleanup)
        self.environment = dict(os.environ, DBUS_SYSTEM_BUS_ADDRESS=f"unix:path={self.folder.name}/bus")
        self.inhibitors = []  # their number, at each change
        self.owner = ""

    # --- The surroundings --------------------------------------------------------------------------------------

    def start_bus(self):
        config = pathlib.Path(self.folder.name) / "bus.conf"
        config.write_text(BUS_CONFIG.format(socket=f"{self.folder.name}/bus"), encoding="utf-8")
        self.broker = subprocess.Popen(
            ["dbus-daemon", "--nofork", "--nopidfile", "--print-address=1", f"--config-file={config}"],
            stdout=subprocess.PIPE)
        self.addCleanup(stop, self.broker)
        address = self.broker.stdout.readline().decode().strip()
        self.bus = dbus.bus.BusConnection(address, mainloop=dbus.mainloop.glib.DBusGMainLoop())
        self.bus.set_exit_on_disconnect(False)
        self.addCleanup(self.bus.close)
        self.bus.add_signal_receiver(lambda count: self.inhibitors.append(int(count)), "InhibitorsAre",
                                     "org.zorva.Test")
        self.bus.watch_name_owner(LOGIND, lambda owner: setattr(self, "owner", str(owner)))

    def start_logind(self):
        self.logind_process = subprocess.Popen(
            ["/usr/bin/python3", "-m", "dbusmock", "--system", "--template", str(TEMPLATE)],
            env=self.environment, stdout=subprocess.DEVNULL)
        self.addCleanup(stop, self.logind_process)
        wait_until(lambda: self.owner, lambda: "logind")

    def stop_logind(self):
        stop(self.logind_process)
        wait_until(lambda: not self.owner, lambda: "logind to be gone")

    def start_program(self):
        program = Program(self.environment)
        self.addCleanup(program.stop)
        return program

    def start_all(self):
        """@return The program, when it holds sleep."""
        self.start_bus()
        self.start_logind()
        program = self.start_program()
        self.assertEqual(program.take(1), ["ready"])
        self.wait_for_inhibitors(1)
        return program

    def logind(self, interface):
        return dbus.Interface(self.bus.get_object(LOGIND, LOGIND_PATH, introspect=False), interface)

    def prepare_for_sleep(self, *arguments, signature="b"):
        """Has logind say so."""
        self.logind(MOCK).EmitSignal(MANAGER, "PrepareForSleep", signature,
                                     dbus.Array(arguments, signature="v"))

    def have_inhibit(self, result, code):
        """Has logind answer in another way."""
        self.logind(MOCK).AddMethod(MANAGER, "Inhibit", "ssss", result, code)

    def wait_for_inhibitors(self, count):
        wait_until(lambda: self.inhibitors and self.inhibitors[-1] == count,
                   lambda: f"{count} inhibitors: {self.inhibitors}")

    def forge(self, path, interface, member, signature, *arguments):
        """Sends a signal to every peer on its own, past the bus's filters."""
        for peer in self.bus.list_names():
            if peer.startswith(":") and peer not in (self.bus.get_unique_name(), self.owner):
                message = dbus.lowlevel.SignalMessage(path, interface, member)
                message.set_destination(peer)
                message.append(*arguments, signature=signature)
                self.bus.send_message(message)
        self.bus.get_name_owner("org.freedesktop.DBus")  # they have been passed on

    # --- With logind -------------------------------------------------------------------------------------------

    def test_the_machine_waits_for_us(self):
        program = self.start_all()
        (inhibitor,) = self.logind(MANAGER).ListInhibitors()
        self.assertEqual([str(field) for field in inhibitor[:4]],
                         ["sleep", "zorvatouchd", "Release keys before sleep", "delay"])
        self.assertEqual(program.take_all(), [])
        self.assertEqual(program.end(), 0)
        self.wait_for_inhibitors(0)

    def test_sleep_comes_after_what_there_is_to_do_and_is_held_again_after_it(self):
        program = self.start_all()
        for _ in range(3):
            self.prepare_for_sleep(True)
            self.assertEqual(program.take(1), ["sleep"])
            self.assertEqual(len(self.logind(MANAGER).ListInhibitors()), 1)
            program.say()
            self.wait_for_inhibitors(0)
            self.prepare_for_sleep(False)
            self.assertEqual(program.take(1), ["wake"])
            self.wait_for_inhibitors(1)
        self.assertEqual(self.inhibitors, [1, 0, 1, 0, 1, 0, 1])

    def test_a_sleep_that_is_told_twice_is_passed_on_twice_and_ends_once(self):
        program = self.start_all()
        for _ in range(2):
            self.prepare_for_sleep(True)
            self.assertEqual(program.take(1), ["sleep"])
            program.say()
            self.wait_for_inhibitors(0)
        self.prepare_for_sleep(False)
        self.prepare_for_sleep(False)
        self.assertEqual(program.take(1), ["wake"])
        self.wait_for_inhibitors(1)
        self.assertEqual(program.take_all(), [])
        self.assertEqual(self.inhibitors, [1, 0, 1])

    def test_a_wake_without_a_sleep_is_none(self):
        program = self.start_all()
        self.prepare_for_sleep(False)
        self.prepare_for_sleep(True)
        self.assertEqual(program.take(1), ["sleep"])
        program.say()
        self.wait_for_inhibitors(0)
        self.assertEqual(self.inhibitors, [1, 0])

    # --- Logind comes and goes ---------------------------------------------------------------------------------

    def test_a_logind_that_restarts_is_found(self):
        program = self.start_all()
        self.stop_logind()
        self.inhibitors.clear()
        self.start_logind()
        self.wait_for_inhibitors(1)
        self.prepare_for_sleep(True)
        self.assertEqual(program.take(1), ["sleep"])
        program.say()
        self.wait_for_inhibitors(0)

    def test_a_sleep_ends_with_logind(self):
        program = self.start_all()
        self.prepare_for_sleep(True)
        self.assertEqual(program.take(1), ["sleep"])
        program.say()
        self.wait_for_inhibitors(0)
        self.stop_logind()
        self.assertEqual(program.take(1), ["wake"])
        self.start_logind()
        self.wait_for_inhibitors(1)
        self.assertEqual(program.take_all(), [])

    def test_a_logind_that_comes_late_is_found(self):
        self.start_bus()
        program = self.start_program()
        line = "log: logind is not there: Could not get owner of name 'org.freedesktop.login1': no such name"
        self.assertEqual(program.take(2), ["ready", line + STAYS_DOWN])
        self.start_logind()
        self.wait_for_inhibitors(1)
        self.assertEqual(program.take_all(), [])

    def test_a_logind_that_answers_late_keeps_nobody_waiting(self):
        self.start_bus()
        self.start_logind()
        os.kill(self.logind_process.pid, signal.SIGSTOP)
        program = self.start_program()
        self.assertEqual(program.take_all(), ["ready"])
        self.assertEqual(program.take_all(), [])
        os.kill(self.logind_process.pid, signal.SIGCONT)
        self.wait_for_inhibitors(1)
        self.assertEqual(program.take_all(), [])

    def test_a_sleep_that_overtakes_the_answer_is_not_held(self):
        self.start_bus()
        self.start_logind()
        self.have_inhibit("h", f"from dbusmock.templates import logind\n"
                               f"self.EmitSignal('{MANAGER}', 'PrepareForSleep', 'b', [True])\n"
                               f"ret = logind.Inhibit(self, *args)")
        program = self.start_program()
        self.assertEqual(program.take(2), ["ready", "sleep"])
        self.wait_for_inhibitors(1)
        program.say()
        self.wait_for_inhibitors(0)
        self.assertEqual(program.take_all(), [])

    # --- Logind says other things ------------------------------------------------------------------------------

    def test_a_refusal_is_one_line_and_sleep_is_told_all_the_same(self):
        self.start_bus()
        self.start_logind()
        self.have_inhibit("h", "raise dbus.exceptions.DBusException('not now', name='org.zorva.Test.No')")
        program = self.start_program()
        self.assertEqual(program.take(2), ["ready", "log: logind does not wait for us: not now" + STAYS_DOWN])
        for _ in range(2):
            self.prepare_for_sleep(True)
            self.assertEqual(program.take(1), ["sleep"])
            program.say()
            self.prepare_for_sleep(False)
            self.assertEqual(program.take(1), ["wake"])
        self.assertEqual(program.take_all(), [])

    def test_an_answer_without_a_descriptor_is_one_line(self):
        self.start_bus()
        self.start_logind()
        self.have_inhibit("s", "ret = 'yes'")
        program = self.start_program()
        self.assertEqual(
            program.take(2),
            ["ready", "log: logind does not wait for us: the answer is not understood" + STAYS_DOWN])

    def test_a_signal_of_other_types_is_none(self):
        program = self.start_all()
        self.prepare_for_sleep("true", signature="s")
        self.prepare_for_sleep(dbus.Int32(1), signature="i")
        self.prepare_for_sleep(signature="")
        self.prepare_for_sleep(True)
        self.assertEqual(program.take(1), ["sleep"])
        program.say()
        self.assertEqual(program.take_all(), [])

    def test_only_logind_is_listened_to(self):
        program = self.start_all()
        self.forge(LOGIND_PATH, MANAGER, "PrepareForSleep", "b", True)
        self.forge("/org/freedesktop/DBus", "org.freedesktop.DBus", "NameOwnerChanged", "sss", LOGIND,
                   self.owner, self.bus.get_unique_name())
        self.forge(LOGIND_PATH, MANAGER, "PrepareForSleep", "b", True)
        self.prepare_for_sleep(True)
        self.assertEqual(program.take(1), ["sleep"])
        program.say()
        self.wait_for_inhibitors(0)
        self.prepare_for_sleep(False)  # nobody else has taken its place
        self.assertEqual(program.take(1), ["wake"])

    # --- The bus -----------------------------------------------------------------------------------------------

    def test_no_bus_is_one_line_and_it_is_looked_for_less_and_less_often(self):
        program = self.start_program()
        self.assertEqual(program.take_all(),
                         ["log: no system bus: No such file or directory" + STAYS_DOWN, "retry in 250 ms", "ready"])
        delays = [program.retry() for _ in range(8)]
        self.assertEqual(delays, [[f"retry in {delay} ms"]
                                  for delay in (500, 1000, 2000, 4000, 8000, 16000, 30000, 30000)])
        self.assertEqual(program.end(), 0)

    def test_a_bus_that_comes_late_is_found(self):
        program = self.start_program()
        self.assertEqual(program.take(3)[1:], ["retry in 250 ms", "ready"])
        self.start_bus()
        self.start_logind()
        self.assertEqual(program.retry(), [])
        self.wait_for_inhibitors(1)
        self.prepare_for_sleep(True)
        self.assertEqual(program.take(1), ["sleep"])
        program.say()
        self.wait_for_inhibitors(0)

    def test_a_bus_that_comes_again_is_found_and_may_go_again(self):
        program = self.start_all()
        for _ in range(2):
            self.prepare_for_sleep(True)
            self.assertEqual(program.take(1), ["sleep"])
            program.say()
            self.wait_for_inhibitors(0)
            stop(self.broker)
            stop(self.logind_process)
            self.assertEqual(program.take(3), ["log: the system bus is gone" + STAYS_DOWN, "wake", "retry in 250 ms"])
            self.assertEqual(program.retry(), ["retry in 500 ms"])
            self.inhibitors.clear()
            self.start_bus()
            self.start_logind()
            self.assertEqual(program.retry(), [])
            self.wait_for_inhibitors(1)

    def test_a_bus_that_closes_each_connection_is_tried_less_and_less_often(self):
        with open_silent_socket(f"{self.folder.name}/bus") as listener:
            program = self.start_program()
            self.assertEqual(program.take(1), ["ready"])
            listener.accept()[0].close()
            self.assertEqual(program.take(2), ["log: the system bus is gone" + STAYS_DOWN, "retry in 250 ms"])
            for delay in (500, 1000):
                self.assertEqual(program.retry(), [])
                listener.accept()[0].close()
                self.assertEqual(program.take(1), [f"retry in {delay} ms"])

    def test_a_bus_that_says_nothing_keeps_nobody_waiting(self):
        with open_silent_socket(f"{self.folder.name}/bus"):
            program = self.start_program()
            self.assertEqual(program.take_all(), ["ready"])
            self.assertEqual(program.end(), 0)

    def test_a_bus_that_goes_away_is_one_line(self):
        program = self.start_all()
        stop(self.broker)
        self.assertEqual(program.take(2), ["log: the system bus is gone" + STAYS_DOWN, "retry in 250 ms"])
        self.assertEqual(program.take_all(), [])
        self.assertEqual(program.end(), 0)

    def test_a_sleep_ends_with_the_bus(self):
        program = self.start_all()
        self.prepare_for_sleep(True)
        self.assertEqual(program.take(1), ["sleep"])
        program.say()
        self.wait_for_inhibitors(0)
        stop(self.broker)
        self.assertEqual(program.take(3), ["log: the system bus is gone" + STAYS_DOWN, "wake", "retry in 250 ms"])


def open_silent_socket(path):
    silent = socket.socket(socket.AF_UNIX)
    silent.bind(path)
    silent.listen()
    return silent


if __name__ == "__main__":
    PROGRAM = sys.argv.pop(1)
    unittest.main(verbosity=2)
