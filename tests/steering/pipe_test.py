#!/usr/bin/env python3
"""`serve` with a named pipe as standard input: every writer is heard, not the first one only."""
import os
import tempfile
import unittest

from steering_support import serve


class NamedPipe(unittest.TestCase):
    def test_every_writer_is_heard(self):
        with tempfile.TemporaryDirectory() as directory:
            name = os.path.join(directory, "commands")
            os.mkfifo(name)
            # Opening a pipe for reading waits for a writer.
            first = os.open(name, os.O_RDWR)
            with open(name, encoding="ascii") as reader, serve(stdin=reader) as server:
                os.close(first)
                for drive in ("32_0", "32_1", "32_2"):
                    with open(name, "w", encoding="ascii") as writer:
                        writer.write(f"set drive C0 {drive} firmware=X")  # without an end of line
                    self.assertEqual(server.await_line("> set drive"),
                                     f"> set drive C0 {drive} firmware=X")
                with open(name, "w", encoding="ascii") as writer:
                    writer.write("quit\n")
                self.assertEqual(server.end(), 0)


if __name__ == "__main__":
    unittest.main(verbosity=2)
