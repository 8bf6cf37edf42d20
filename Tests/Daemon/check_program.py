#!/usr/bin/python3
"""Checks the daemon as others start it: what it is told, what it says, and how it ends.

    check_program.py PROGRAM SCHEMA RECORDING    SCHEMA is that of a line of `--events json`, RECORDING that of
                                                 a recording

No surface is needed: all of it is simulated. Every wait is for the thing itself, and fails after a while.
"""

import json
import os
import pathlib
import pty
import resource
import signal
import subprocess
import sys
import tempfile
import time
import unittest

import jsonschema  # Debian's python3-jsonschema; without it there is nothing to test, which is a failure

LONGEST_WAIT_S = 30
FINGER = ["--no-keys", "--accel", "none", "--device", "sim:taps"]  # the first tap comes after 0.6 s
ENDLESS = FINGER + ["--events", "json"]


def run(*arguments, **more):
    more = {"stdin": subprocess.DEVNULL, "stdout": subprocess.PIPE, "stderr": subprocess.PIPE} | more
    return subprocess.run([PROGRAM, *arguments], text=True, timeout=LONGEST_WAIT_S, check=False, **more)


def wait_until(is_so, complaint):
    deadline = time.monotonic() + LONGEST_WAIT_S
    while not is_so():
        if time.monotonic() > deadline:
            raise AssertionError(complaint)


class Running:
    """The daemon while it runs. Its log goes to a file."""

    def __init__(self, *arguments, **more):
        self.log = tempfile.TemporaryFile()
        self.process = subprocess.Popen([PROGRAM, *arguments], stdin=subprocess.DEVNULL, text=True,
                                        stderr=self.log, **({"stdout": subprocess.PIPE} | more))

    def __enter__(self):
        return self

    def __exit__(self, *_):
        if self.process.poll() is None:
            self.process.kill()
        self.process.wait()
        if self.process.stdout:
            self.process.stdout.close()
        self.log.close()

    def line_with(self, part):
        """The next line of its output that has this in it."""
        for line in self.process.stdout:
            if part in line:
                return line
        raise AssertionError(f"it ended without a line with {part}")

    def wait_until_it_works(self):
        """For those that have no output: the log says so."""
        self.wait_for_log("gestures work")

    def log_text(self):
        return pathlib.Path(f"/proc/self/fd/{self.log.fileno()}").read_text(encoding="utf-8")

    def wait_for_log(self, part):
        wait_until(lambda: part in self.log_text(), f"the log has no line with {part}")

    def status_field(self, name):
        for line in pathlib.Path(f"/proc/{self.process.pid}/status").read_text(encoding="utf-8").splitlines():
            if line.startswith(name + ":"):
                return line.split()[1]
        raise AssertionError(f"/proc has no {name}")

    def send_together(self, *numbers):
        """Signals that are all pending before it serves the first one."""
        self.process.send_signal(signal.SIGSTOP)
        wait_until(lambda: self.status_field("State") == "T", "it does not stop")
        for number in (*numbers, signal.SIGCONT):
            self.process.send_signal(number)

    def wait_until_taken(self, number):
        """Until a signal that was sent is no longer pending."""
        wait_until(lambda: not int(self.status_field("ShdPnd"), 16) & 1 << (number - 1),
                   "the signal is not taken")

    def end_by(self, number):
        """Its status, and how long it took, in seconds."""
        begin = time.monotonic()
        self.process.send_signal(number)
        return self.process.wait(LONGEST_WAIT_S), time.monotonic() - begin


class Usage(unittest.TestCase):
    def test_help_and_version_are_answers(self):
        for option in ("--help", "-h", "--version"):
            done = run(option)
            self.assertEqual((done.returncode, done.stderr), (0, ""), option)
            self.assertTrue(done.stdout.endswith("\n"), option)

    def test_what_cannot_be_followed_is_one_line_and_status_2(self):
        for arguments in (["--nonsense"], ["--device"], ["--device", "sim:nonsense"], ["--id", "1"],
                          ["--events", "xml"], ["--map", "hold:left=KEY_MUTE"], ["--duration", "0"], ["word"]):
            done = run(*arguments)
            self.assertEqual((done.returncode, done.stdout), (2, ""), arguments)
            self.assertRegex(done.stderr, r"\Azorvatouchd: [^\n]+ \(see zorvatouchd --help\)\n\Z")

    def test_a_plug_in_that_is_not_there_is_one_line_and_status_1(self):
        done = run("--plugin", "/nowhere/plugin.so", *FINGER)
        self.assertEqual((done.returncode, done.stdout), (1, ""))
        errors = [line for line in done.stderr.splitlines() if line.startswith("zorvatouchd: ")]
        self.assertEqual(len(errors), 1, done.stderr)
        self.assertIn("/nowhere/plugin.so", errors[0])

    def test_a_device_that_is_something_else_is_one_line_and_status_1(self):
        with tempfile.TemporaryDirectory() as folder:
            fifo = os.path.join(folder, "fifo")
            os.mkfifo(fifo)
            for device in ("/etc/passwd", "/dev/null", fifo):
                for more in ([], ["--describe"]):
                    done = run("--device", device, *more)
                    self.assertEqual((done.returncode, done.stdout), (1, ""), device)
                    self.assertIn(f"zorvatouchd: {device}: must be a hidraw device node, as /dev/hidraw0 is\n",
                                  done.stderr)

    def test_a_device_that_does_not_exist_is_waited_for_and_named(self):
        device = "/dev/no-such-hidraw"
        with Running("--no-keys", "--device", device) as daemon:
            daemon.wait_for_log(f"{device}: does not exist yet; waiting for it")
            self.assertEqual(daemon.end_by(signal.SIGTERM)[0], 0)

    def test_a_thread_that_cannot_be_made_is_named_with_its_limit(self):
        def limit():  # the stack of the first thread is larger than what an address can name
            resource.setrlimit(resource.RLIMIT_STACK, (1 << 47, resource.getrlimit(resource.RLIMIT_STACK)[1]))

        done = run(*FINGER, preexec_fn=limit)
        self.assertEqual((done.returncode, done.stdout), (1, ""), done.stderr)
        self.assertRegex(done.stderr, r"zorvatouchd: cannot start the thread zorva-\S+; raise the limit of threads "
                                      r"\(ulimit -u, TasksMax=\) or of memory \(ulimit -v, LimitAS=\)")

    def test_people_do_not_see_errors_about_what_is_optional(self):
        master, slave = pty.openpty()
        done = run(*FINGER, "--duration", "0.95", stderr=slave)
        os.close(slave)
        os.set_blocking(master, False)
        try:
            shown = os.read(master, 65536).decode()
        except (BlockingIOError, OSError):
            shown = ""
        os.close(master)
        self.assertEqual(done.returncode, 0)
        self.assertNotIn(" error ", shown)
        logged = run(*FINGER, "--duration", "0.95").stderr
        self.assertIn(" error subsystem=org.zorva.hid.ZorvaTouch category=HIDService "
                      "Failed to create accel system: copyServices returned empty array\n", logged)
        self.assertNotIn("\n\n", logged)

    def test_answers_do_without_anybody_who_reads_them(self):
        with open("/dev/full", "w", encoding="ascii") as full:
            self.assertIn(run("--version", stdout=full).returncode, (0, 1))


class Finger(unittest.TestCase):
    def test_it_ends_by_itself_and_its_lines_are_what_was_promised(self):
        with tempfile.TemporaryDirectory() as folder:
            file = os.path.join(folder, "touch.json")
            done = run(*ENDLESS, "--device", "sim:holds", "--duration", "3", "--save", file)
            self.assertEqual(done.returncode, 0, done.stderr)
            self.assertTrue(os.path.exists(file))
        lines = [json.loads(line) for line in done.stdout.splitlines()]
        validator = jsonschema.Draft7Validator(SCHEMA)
        for line in lines:
            validator.validate(line)
        self.assertEqual({line["type"] for line in lines}, {"surface", "gesture", "key", "recording"})
        down = set()
        for line in lines:
            if line["type"] == "key":
                self.assertEqual(line["key"] in down, line["state"] == "up")
                down ^= {line["key"]}
        self.assertEqual(down, set())

    def test_people_see_the_keys(self):
        done = run(*FINGER, "--duration", "0.95")
        self.assertEqual(done.returncode, 0, done.stderr)
        self.assertEqual([line.split()[-1] for line in done.stdout.splitlines()], ["is", "down", "up"])


class Saving(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = folder.name
        self.file = os.path.join(folder.name, "touch.json")

    def test_a_recording_that_is_lost_is_status_1(self):
        with Running(*ENDLESS, "--save", self.file) as daemon:
            daemon.line_with('"opened"')
            os.mkdir(self.file)
            self.assertEqual(daemon.end_by(signal.SIGTERM)[0], 1)

    def test_a_limit_on_files_is_an_error_and_leaves_none(self):
        def limit():
            resource.setrlimit(resource.RLIMIT_FSIZE, (1000, resource.RLIM_INFINITY))

        with Running(*ENDLESS, "--save", self.file, preexec_fn=limit) as daemon:
            daemon.line_with('"may-begin"')
            self.assertEqual(daemon.end_by(signal.SIGTERM)[0], 1)
        self.assertEqual(os.listdir(self.folder), [])

    def test_other_programs_read_what_it_was_made_with(self):
        done = run(*ENDLESS, "--duration", "0.3", "--save", self.file)
        self.assertEqual(done.returncode, 0, done.stderr)
        with open(self.file, encoding="utf-8") as file:
            recording = json.load(file)
        jsonschema.Draft7Validator(RECORDING_SCHEMA).validate(recording)
        notes = {frame["Key"]: frame["Value"] for frame in recording["Frames"] if frame["Type"] == "Metadata"}
        self.assertEqual(notes["Device"], {"Name": "Simulated touch sensor", "ProductID": 0xABCD,
                                           "VendorID": 0x1234})
        self.assertEqual(notes["Tunables"], {})
        self.assertEqual(sorted(notes["Software"]), ["Program", "Service"])


class End(unittest.TestCase):
    def test_each_signal_ends_it_with_0_at_once(self):
        for number in (signal.SIGTERM, signal.SIGINT, signal.SIGHUP, signal.SIGQUIT, signal.SIGALRM,
                       signal.SIGUSR2):
            with Running(*ENDLESS) as daemon:
                daemon.line_with('"opened"')
                status, seconds = daemon.end_by(number)
            self.assertEqual(status, 0, number)
            self.assertLess(seconds, 1, number)

    def test_a_key_that_is_down_is_told_to_be_up(self):
        with Running("--no-keys", "--events", "json", "--accel", "none", "--device", "sim:holds") as daemon:
            daemon.line_with('"state":"down"')
            daemon.process.send_signal(signal.SIGTERM)
            daemon.line_with('"state":"up"')
            self.assertEqual(daemon.process.wait(LONGEST_WAIT_S), 0)

    def end_with_a_key_down(self, end):
        """Ends it in the middle of a hold, by a function, with a recording; returns its status, the key lines
        after that, the names in the recording's directory and the log."""
        with tempfile.TemporaryDirectory() as folder:
            file = os.path.join(folder, "touch.json")
            with Running("--no-keys", "--events", "json", "--accel", "none", "--device", "sim:holds",
                         "--save", file) as daemon:
                daemon.line_with('"state":"down"')
                end(daemon)
                output = daemon.process.communicate(timeout=LONGEST_WAIT_S)[0]
                keys = [line["state"] for line in map(json.loads, output.splitlines())
                        if line["type"] == "key"]
                return daemon.process.returncode, keys, os.listdir(folder), daemon.log_text()

    def test_a_second_signal_during_the_end_is_acknowledged_and_changes_nothing(self):
        for pair in ((signal.SIGTERM, signal.SIGHUP), (signal.SIGTERM, signal.SIGINT)):
            status, keys, files, log = self.end_with_a_key_down(lambda daemon, pair=pair:
                                                                daemon.send_together(*pair))
            self.assertEqual((status, keys, files), (0, ["up"], ["touch.json"]), log)
            self.assertEqual(log.count(": the end is in progress"), 1, log)

    def test_the_same_signal_twice_is_no_more_than_once(self):
        for number in (signal.SIGINT, signal.SIGHUP):
            def twice(daemon, number=number):
                daemon.process.send_signal(number)
                daemon.wait_until_taken(number)
                daemon.process.send_signal(number)

            status, keys, files, log = self.end_with_a_key_down(twice)
            self.assertEqual((status, keys, files), (0, ["up"], ["touch.json"]), log)

    def test_a_third_signal_may_leave_out_recordings_but_never_a_key(self):
        status, keys, files, log = self.end_with_a_key_down(
            lambda daemon: daemon.send_together(signal.SIGTERM, signal.SIGHUP, signal.SIGINT))
        self.assertIn(status, (0, 1), log)
        self.assertEqual(keys, ["up"], log)
        self.assertIn(files, ([], ["touch.json"]), log)
        self.assertIn(": recordings that are not saved yet are left out", log)

    def test_without_a_file_sigusr1_is_answered_in_the_log(self):
        with Running(*ENDLESS) as daemon:
            daemon.line_with('"opened"')
            daemon.process.send_signal(signal.SIGUSR1)
            daemon.wait_for_log("SIGUSR1: there is no file to save the recording to; start with --save FILE")
            self.assertEqual(daemon.end_by(signal.SIGTERM)[0], 0)

    def test_it_saves_when_told_to_and_goes_on(self):
        with tempfile.TemporaryDirectory() as folder:
            file = os.path.join(folder, "touch.json")
            with Running(*ENDLESS, "--save", file) as daemon:
                daemon.line_with('"may-begin"')
                daemon.process.send_signal(signal.SIGUSR1)
                told = json.loads(daemon.line_with('"recording"'))
                self.assertEqual(told["file"], file)
                self.assertGreater(told["reports"], 0)
                self.assertEqual(os.stat(file).st_mode & 0o7777, 0o600)
                daemon.line_with('"tap"')
                self.assertEqual(daemon.end_by(signal.SIGTERM)[0], 0)


class Streams(unittest.TestCase):
    """Whatever its standard streams are, it plays to the end."""

    DONE = ENDLESS + ["--duration", "0.95"]

    def test_a_full_output(self):
        with open("/dev/full", "w", encoding="ascii") as full:
            done = run(*self.DONE, stdout=full)
        self.assertEqual(done.returncode, 0)
        self.assertEqual(done.stderr.count("standard output"), 1, done.stderr)

    def test_no_output_at_all(self):
        with tempfile.TemporaryDirectory() as folder:
            file = os.path.join(folder, "touch.json")
            done = run(*self.DONE, "--save", file, stdout=None, preexec_fn=lambda: os.close(1))
            self.assertEqual(done.returncode, 0, done.stderr)
            json.loads(pathlib.Path(file).read_text(encoding="utf-8"))

    def test_nothing_else_gets_the_number_of_a_stream_that_is_closed(self):
        def close():
            os.close(0)
            os.close(1)

        with Running(*ENDLESS, stdout=None, preexec_fn=close) as daemon:
            daemon.wait_until_it_works()
            for number in (0, 1):
                self.assertEqual(os.readlink(f"/proc/{daemon.process.pid}/fd/{number}"), "/dev/null")
            self.assertEqual(daemon.end_by(signal.SIGTERM)[0], 0)

    def test_no_input_at_all(self):
        done = run(*self.DONE, stdin=None, preexec_fn=lambda: os.close(0))
        self.assertEqual(done.returncode, 0, done.stderr)
        self.assertIn('"tap"', done.stdout)

    def test_no_stream_at_all(self):
        done = run(*self.DONE, stdin=None, stdout=None, stderr=None,
                   preexec_fn=lambda: [os.close(number) for number in range(3)])
        self.assertEqual(done.returncode, 0)

    def test_an_output_whose_reader_has_gone(self):
        reader, writer = os.pipe()
        os.close(reader)
        with os.fdopen(writer, "w") as output:
            done = run(*self.DONE, stdout=output)
        self.assertEqual(done.returncode, 0, done.stderr)

    def test_an_output_whose_reader_hangs(self):
        reader, writer = os.pipe()
        os.set_blocking(writer, False)
        try:
            while True:
                os.write(writer, b"x" * 4096)
        except BlockingIOError:
            os.set_blocking(writer, True)
        with os.fdopen(writer, "w") as output, Running(*ENDLESS, stdout=output) as daemon:
            daemon.wait_until_it_works()
            status, seconds = daemon.end_by(signal.SIGTERM)
            self.assertEqual(status, 0)
            self.assertLess(seconds, 3)
        os.close(reader)


if __name__ == "__main__":
    PROGRAM = sys.argv.pop(1)
    SCHEMA, RECORDING_SCHEMA = (json.loads(pathlib.Path(sys.argv.pop(1)).read_text(encoding="utf-8"))
                                for _ in range(2))
    unittest.main()
