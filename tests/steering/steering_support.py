"""`plexor-testbed serve` and `watch` as users run them."""
import os
import queue
import subprocess
import threading
import time

TOOL = os.environ["PLEXOR_TESTBED"]
SOURCE = os.environ["PROJECT_SOURCE_DIR"]
DEADLINE = int(os.environ.get("STEERING_DEADLINE", "120"))  # seconds, on a busy machine


def scenario_file(name):
    return os.path.join(SOURCE, "scenarios", name + ".json")


def wait_until(condition):
    end = time.monotonic() + DEADLINE
    while time.monotonic() < end:
        if condition():
            return True
        time.sleep(0.1)
    return False


def run(*arguments, **options):
    """The tool run to its end."""
    return subprocess.run([TOOL, *arguments], capture_output=True, text=True, timeout=DEADLINE,
                          check=False, **options)


class Session:
    """The tool at work: commands in, lines out. To be used in a with statement."""

    def __init__(self, command, *arguments, stdin=subprocess.PIPE, **options):
        self.process = subprocess.Popen([TOOL, command, *arguments], stdin=stdin, text=True,
                                        bufsize=1, stdout=subprocess.PIPE,
                                        stderr=subprocess.STDOUT, **options)
        self.lines = []
        self.arrived = queue.Queue()
        self.reader = threading.Thread(target=self._receive, daemon=True)
        self.reader.start()

    def _receive(self):
        for line in self.process.stdout:
            self.arrived.put(line.rstrip("\n"))
        self.arrived.put(None)

    def say(self, command):
        self.process.stdin.write(command + "\n")
        self.process.stdin.flush()

    def next_line(self):
        """The next line; None behind the last."""
        line = self.arrived.get(timeout=DEADLINE)
        if line is not None:
            self.lines.append(line)
        return line

    def await_line(self, text):
        """The first line from here on that holds the text."""
        while (line := self.next_line()) is not None:
            if text in line:
                return line
        raise AssertionError(f"no {text!r} in:\n" + "\n".join(self.lines))

    def end(self):
        """Waits for the end, which must come by itself; gives the exit status."""
        return self.process.wait(DEADLINE)

    def __enter__(self):
        return self

    def __exit__(self, *_):
        self.process.kill()
        self.process.wait()
        self.reader.join()
        for stream in (self.process.stdin, self.process.stdout):
            if stream:
                stream.close()


def serve(*arguments, scenario="healthy-array", port="0", **options):
    """A server, on a free port unless it is said, when it serves."""
    session = Session("serve", "--scenario", scenario_file(scenario) if "/" not in scenario
                      else scenario, "--port", port, *arguments, **options)
    session.url = session.await_line("serving http").removeprefix("serving ")
    return session
