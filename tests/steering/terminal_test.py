#!/usr/bin/env python3
"""`serve` as a job of an interactive shell: in the background the terminal does not stop it, in the
foreground it takes what is typed."""
import os
import pty
import re
import select
import signal
import time
import unittest

from steering_support import DEADLINE, TOOL, run, scenario_file


class Terminal:
    """An interactive shell on a pseudo-terminal."""

    def __init__(self):
        self.process, self.master = pty.fork()
        if self.process == 0:
            os.environ.update(PS1="ready> ", HISTFILE="/dev/null", TERM="dumb")
            os.execvp("bash", ["bash", "--norc", "--noprofile", "-i"])
        self.screen = ""

    def type(self, keys):
        os.write(self.master, keys.encode())

    def await_text(self, pattern):
        """What matches next on the screen."""
        end = time.monotonic() + DEADLINE
        while not (match := re.search(pattern, self.screen)):
            if time.monotonic() > end:
                raise AssertionError(f"no {pattern!r} in: {self.screen}")
            if select.select([self.master], [], [], 1)[0]:
                self.screen += os.read(self.master, 4096).decode(errors="replace")
        self.screen = self.screen[match.end():]
        return match

    def close(self):
        os.close(self.master)
        os.kill(self.process, signal.SIGKILL)
        os.waitpid(self.process, 0)


class BackgroundJob(unittest.TestCase):
    def setUp(self):
        self.terminal = Terminal()
        self.addCleanup(self.terminal.close)

    def start(self):
        self.terminal.type(f"{TOOL} serve --port 0 --scenario {scenario_file('healthy-array')} &\n")
        job = int(self.terminal.await_text(r"\[1\] (\d+)").group(1))
        self.addCleanup(self.end, job)
        return self.terminal.await_text(r"serving (http://\S+)").group(1)

    @staticmethod
    def end(job):
        try:
            os.kill(job, signal.SIGKILL)
        except ProcessLookupError:
            pass

    def test_keys_do_not_stop_it(self):
        url = self.start()
        for _ in range(3):
            self.terminal.type("echo typed\n")
            self.terminal.await_text(r"\ntyped")
        time.sleep(1.5)  # longer than it takes to look at the terminal again
        self.terminal.type("jobs\n")
        self.assertEqual(self.terminal.await_text(r"\[1\]\S* +(\w+)").group(1), "Running")
        self.assertNotEqual(run("ask", url).returncode, 1, "the server does not answer")

    def test_it_takes_commands_in_the_foreground(self):
        self.start()
        self.terminal.type("fg\n")
        self.terminal.await_text(r"serve --port 0")
        self.terminal.type("fail drive C0 32_0\n")
        self.terminal.await_text(r"> fail drive C0 32_0")
        self.terminal.type("quit\n")
        self.terminal.await_text(r"ready> ")
        self.terminal.type("echo status $?\n")
        self.assertEqual(self.terminal.await_text(r"\nstatus (\d+)").group(1), "0")


if __name__ == "__main__":
    unittest.main(verbosity=2)
