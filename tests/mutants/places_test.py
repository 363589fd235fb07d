"""Which places the kinds of mutants find in a source, and what they make of them.

    places_test.py SOURCE_TREE
"""

import sys
import unittest
from pathlib import Path

sys.dont_write_bytecode = True
sys.path.insert(0, str(Path(sys.argv.pop(1)) / "scripts"))
from mutation.kinds import KINDS, mutants_of
from mutation.source import Source


def changes(text, kind):
    """What the mutants of a kind make of a function's body, each mutant's whole line."""
    source = Source("Thing.cpp", f"void F() {{\n{text}\n}}\n")
    return [mutant.after for mutant in mutants_of(source, [kind])]


class Places(unittest.TestCase):
    def test_conditions(self):
        self.assertEqual(changes("if (a == b) c();", "condition"), ["if (a != b) c();"])
        self.assertEqual(changes("if (!a) c();", "condition"), ["if (a) c();"])
        self.assertEqual(changes("while (Item* a = b()) c();", "condition"), [])
        self.assertEqual(changes("for (int i = 0; a; i++) c();", "condition"),
                         ["for (int i = 0; !(a); i++) c();"])
        self.assertEqual(changes("x = a ? b : c;", "condition"), ["x = !(a) ? b : c;"])
        self.assertEqual(changes("x = y != nullptr ? b : c;", "condition"),
                         ["x = y == nullptr ? b : c;"])
        self.assertEqual(sorted(changes("if (a && b) c();", "condition")),
                         ["if (!(a && b)) c();", "if (a || b) c();"])

    def test_bounds_and_constants(self):
        self.assertEqual(changes("if (a < b) c<d>();", "bound"), ["if (a <= b) c<d>();"])
        self.assertEqual(changes("a = 1'000; // 7", "constant"), ["a = 1001; // 7"])
        self.assertEqual(changes("a = true;", "constant"), ["a = false;"])
        self.assertEqual(changes('a = "5";', "constant"), [])

    def test_calls(self):
        self.assertEqual(changes("a->b.c(d);", "call"), ["(void)0;"])
        self.assertEqual(changes("if (a) c();", "call"), ["if (a) (void)0;"])
        self.assertEqual(changes("x = c();\nreturn d();\nExpectHeld(m, f);", "call"), [])

    def test_codes_and_priorities(self):
        self.assertEqual(changes("return RESULT_OK;", "code"), ["return RESULT_BAD_ARGUMENT;"])
        self.assertEqual(changes("return CMPI_RC_OK;", "code"), ["return CMPI_RC_ERR_FAILED;"])
        self.assertEqual(changes("syslog(LOG_INFO, a);", "priority"),
                         ["syslog(LOG_DEBUG, a);", "syslog(LOG_ERR, a);"])

    def test_texts(self):
        (after,) = changes('a("%5.2f\\n%s x");', "text")
        self.assertIn(after, ('a("%5.2f\\n%s_x");', 'a("%5.2f\\n%s y");'))
        self.assertEqual(changes('a("%s\\n");', "text"), [])

    def test_locks(self):
        unheld = "pthread_mutex_t unheld = PTHREAD_MUTEX_INITIALIZER; "
        self.assertEqual(changes("MutexGuard lock(a->b);", "lock"),
                         [unheld + "MutexGuard lock(unheld);"])
        self.assertEqual(changes("ClassLock lock(a, b, c);", "lock"),
                         [unheld + "ClassLock lock(a, unheld, c);"])
        self.assertEqual(changes("const RequestInFlight here;", "lock"), [";"])
        self.assertEqual(changes("pthread_mutex_lock(&a);", "lock"), ["(void)0;"])

    def test_atomics(self):
        self.assertEqual(changes("a = LoadShared(b->*c);", "atomic"), ["a = (b->*c);"])
        self.assertEqual(changes("StoreShared(a, b(c, d));", "atomic"), ["a = b(c, d);"])

    def test_a_header_only_where_code_is(self):
        source = Source("Thing.h", "int A(int b = 5);\nconstexpr int kC = 5;\n")
        self.assertEqual([mutant.line for mutant in mutants_of(source, KINDS)], [2])


if __name__ == "__main__":
    unittest.main()
