"""What the judge of mutants makes of a test program that is slow or stumbles once.

    judges_test.py SOURCE_TREE
"""

import json
import sys
import tempfile
import unittest
from pathlib import Path
from unittest import mock

sys.dont_write_bytecode = True
sys.path.insert(0, str(Path(sys.argv.pop(1)) / "scripts"))
from mutation import judges  # noqa: E402

REPORT = {"testsuites": [{"testsuite": [
    {"classname": "Thing", "name": "Works", "file": "tests/provider/util/thing_test.cpp", "time": "0.001s"},
]}]}
# Writes its report when it is asked to; else it does what the file beside it says, line by line, one for
# each run.
PROGRAM = """\
#!/bin/bash
cd "${0%%/*}"
for argument in "$@"; do
    case $argument in --gtest_output=json:*) echo '%s' >"${argument#--gtest_output=json:}"; exit 0 ;; esac
done
behaviour=$(sed -n 1p behaviour)
sed -i 1d behaviour
eval "${behaviour:-exit 0}"
""" % json.dumps(REPORT)


class Judge(unittest.TestCase):
    def setUp(self):
        self.folder = tempfile.TemporaryDirectory()
        self.addCleanup(self.folder.cleanup)
        self.program = Path(self.folder.name) / "provider-tests"
        self.program.write_text(PROGRAM)
        self.program.chmod(0o755)
        limit = mock.patch.object(judges, "LEAST_SECONDS", 1)
        limit.start()
        self.addCleanup(limit.stop)

    def judge(self, *behaviour):
        (Path(self.folder.name) / "behaviour").write_text("".join(f"{line}\n" for line in behaviour))
        return judges.Tests(self.program, []).judge("cim/plexor/PlexorProviderUtilThing.cpp")

    def test_what_passes_is_not_noticed(self):
        self.assertIsNone(self.judge())

    def test_what_hangs_twice_hangs(self):
        self.assertEqual(self.judge("sleep 60", "sleep 60"), "hangs")

    def test_what_hangs_once_was_the_machine(self):
        self.assertIsNone(self.judge("sleep 60"))

    def test_a_checker_that_stumbles_once_was_the_machine(self):
        stumble = "echo LeakSanitizer: SEGV on unknown address 0x0; exit 1"
        self.assertIsNone(self.judge(stumble))
        self.assertIn("LeakSanitizer: SEGV", self.judge(stumble, stumble))

    def test_a_test_that_fails_once_was_the_machine(self):
        failure = "echo '[  FAILED  ] Thing.Works'; exit 1"
        self.assertIsNone(self.judge(failure))
        self.assertEqual(self.judge(failure, failure), "test Thing.Works")

    def test_a_crash_counts_at_once(self):
        self.assertEqual(self.judge("kill -SEGV $$"), "ends by SIGSEGV")


if __name__ == "__main__":
    unittest.main()
