"""Judging mutants one after the other, several workers beside each other, and what came of them."""

import json
import queue
import threading
from dataclasses import asdict, dataclass

from mutation.judges import Tests, clang_refuses, sanitizer_refuses
from mutation.tree import PROGRAMS, Tree

KILLED, SURVIVED, EQUIVALENT, SAME_CODE, NOT_COMPILED, FOR_SANITIZER = (
    "killed", "survived", "equivalent", "same code", "not compiled", "for the sanitizer")


@dataclass
class Verdict:
    """Of one mutant: what became of it, and who or what says so."""

    mutant: object
    state: str
    by: list


def programs_of(tree):
    """The release build's test program with most of the tests, and the others."""
    first, *others = (tree.program("release", name) for name in PROGRAMS)
    return first, others


class Worker:
    """One copy of the tree with its judges."""

    def __init__(self, checkout, folder, build_jobs, sanitizers):
        self.tree = Tree(checkout, folder, build_jobs)
        self.tree.update()
        self.tree.configure("release")
        self.tests = Tests(*programs_of(self.tree))
        self.sanitizers = sanitizers
        for preset in sanitizers:
            self.tree.configure(preset)

    def judge(self, mutant):
        with self.tree.with_mutant(mutant):
            return self._judge(mutant)

    def _judge(self, mutant):
        if not self.tree.compiles(mutant, "release"):
            return Verdict(mutant, NOT_COMPILED, [])
        threads = mutant.kind in ("lock", "atomic")
        same = self.tree.same_code(mutant, "release")
        if same and not threads:
            return Verdict(mutant, SAME_CODE, [])
        by = ["clang"] if mutant.kind == "lock" and clang_refuses(self.tree, mutant) else []
        if not same:
            if not self.tree.links("release"):
                return Verdict(mutant, NOT_COMPILED, [])
            why = self.tests.judge(mutant.file)
            by += [why] if why else []
        for preset in self.sanitizers:
            if not by and (preset != "tsan" or threads):
                why = sanitizer_refuses(self.tree, mutant, preset)
                by += [why] if why else []
        if by:
            return Verdict(mutant, KILLED, by)
        # Whether an access is atomic shows in what the processor does now and then, if at all.
        left = threads and "tsan" not in self.sanitizers
        return Verdict(mutant, FOR_SANITIZER if left else SURVIVED, [])


class Report:
    """What came of the mutants so far; also in a file, for whoever breaks the run off."""

    def __init__(self, path, say):
        self.verdicts = []
        self._path = path
        self._say = say
        self._lock = threading.Lock()

    def add(self, verdict):
        with self._lock:
            self.verdicts.append(verdict)
            by = f" ({', '.join(verdict.by)})" if verdict.by else ""
            mutant = verdict.mutant
            self._say(f"{mutant.file}:{mutant.line}: {mutant.kind}: {verdict.state}{by}")
            self._write()

    def of(self, state):
        found = [verdict for verdict in self.verdicts if verdict.state == state]
        return sorted(found, key=lambda verdict: (verdict.mutant.file, verdict.mutant.start))

    def _write(self):
        if self._path is None:
            return
        entries = [
            {**asdict(verdict.mutant), "state": verdict.state, "by": verdict.by}
            for verdict in self.verdicts
        ]
        self._path.write_text(json.dumps({"summary": self.summary(), "mutants": entries}, indent=1))

    def summary(self):
        killed, survived = len(self.of(KILLED)), len(self.of(SURVIVED))
        total = killed + survived
        percent = 100 * killed / total if total else 100
        return f"{total} mutants, {killed} killed, {survived} survived ({percent:.1f} %)"

    def text(self):
        """The survivors, the equivalent ones, what was not counted, and the summary."""
        parts = [f"survived: {verdict.mutant.title()}" for verdict in self.of(SURVIVED)]
        parts += [
            f"equivalent: {verdict.mutant.title()}\n  = {verdict.by[0]}"
            for verdict in self.of(EQUIVALENT)
        ]
        parts += [f"take --tsan: {verdict.mutant.title()}" for verdict in self.of(FOR_SANITIZER)]
        counts = {
            "known to be equivalent": EQUIVALENT,
            "compiled to the same code": SAME_CODE,
            "not compiled": NOT_COMPILED,
            "left to --tsan": FOR_SANITIZER,
        }
        left = [f"{len(self.of(state))} {name}" for name, state in counts.items() if self.of(state)]
        if left:
            parts.append("not counted: " + ", ".join(left))
        return "\n".join([*parts, self.summary()])


def judge_all(mutants, equivalents, make_worker, jobs, report):
    """Has `jobs` workers judge the mutants. Those that are known to be equivalent are not built."""
    waiting = queue.Queue()
    for mutant in mutants:
        reason = equivalents.reason(mutant)
        if reason is not None:
            report.add(Verdict(mutant, EQUIVALENT, [reason]))
        else:
            waiting.put(mutant)
    if waiting.empty():
        return
    workers = [make_worker(number) for number in range(jobs)]
    failures = []

    def work(worker):
        try:
            while not failures:
                report.add(worker.judge(waiting.get_nowait()))
        except queue.Empty:
            pass
        except BaseException as error:  # told by the thread that waits for all
            failures.append(error)

    threads = [threading.Thread(target=work, args=(worker,)) for worker in workers]
    for thread in threads:
        thread.start()
    for thread in threads:
        thread.join()
    if failures:
        raise failures[0]
