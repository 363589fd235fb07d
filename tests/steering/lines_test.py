#!/usr/bin/env python3
"""Output and log of `serve` in one place: whichever threads print, a line is never cut in two."""
import socket
import subprocess
import unittest

from steering_support import DEADLINE, TOOL, scenario_file


def writes_of(*arguments):
    """What the tool writes to either output, one entry for each write; ends with the socket."""
    here, there = socket.socketpair(socket.AF_UNIX, socket.SOCK_SEQPACKET)  # keeps writes apart
    here.settimeout(DEADLINE)
    # Without a buffer: what else would hide that a line is printed in pieces.
    with here, there, subprocess.Popen(["stdbuf", "-o0", TOOL, *arguments], stdin=subprocess.PIPE,
                                       stdout=there, stderr=there) as process:
        there.close()
        process.stdin.write(b"fail drive C0 32_1\nlist\nwait 2\nquit\n")
        process.stdin.flush()
        while piece := here.recv(1 << 16):
            yield piece.decode()


class WholeLines(unittest.TestCase):
    def test_each_line_of_a_server_and_its_log_is_one_write(self):
        pieces = list(writes_of("serve", "--log", "--interval", "1", "--port", "0", "--scenario",
                                scenario_file("healthy-array")))
        self.assertEqual([piece for piece in pieces if not piece.endswith("\n")], [])
        self.assertEqual(sum(piece.startswith("serving http") for piece in pieces), 1)
        self.assertIn("> fail drive C0 32_1\n", pieces)
        self.assertGreater(sum("associators" in piece.lower() for piece in pieces), 20)


if __name__ == "__main__":
    unittest.main(verbosity=2)
