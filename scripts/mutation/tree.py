"""A copy of the source tree in which mutants are made and built; the checkout stays as it is."""

import hashlib
import os
import shutil
import subprocess
from contextlib import contextmanager
from pathlib import Path

SOURCES = "cim/plexor"
_BUILD = "build"  # in the copy, never copied
# The provider's tests; the second one has functions of its own in front of the provider's.
PROGRAMS = ("provider-tests", "interposed-tests")


class TreeError(Exception):
    """The copy cannot be made, or does not build without a mutant."""


def _listed(checkout):
    """Files of the checkout, also those that are not committed yet."""
    output = subprocess.run(
        ["git", "ls-files", "-coz", "--exclude-standard"],
        cwd=checkout, check=True, capture_output=True,
    ).stdout
    names = (name for name in os.fsdecode(output).split("\0") if name)
    return sorted(name for name in names if (checkout / name).is_file())


class Tree:
    """A copy at `folder`, and its builds: one directory for each preset."""

    def __init__(self, checkout, folder, build_jobs):
        self.checkout = checkout
        self.folder = folder
        self.build_jobs = build_jobs
        self._objects = {}

    def update(self):
        """Makes the copy equal to the checkout. What has not changed keeps its time."""
        names = _listed(self.checkout)
        self.folder.mkdir(parents=True, exist_ok=True)
        for name in names:
            self._copy(self.checkout / name, self.folder / name)
        wanted = set(names)
        for path in sorted(self.folder.rglob("*")):
            name = path.relative_to(self.folder)
            if name.parts[0] != _BUILD and path.is_file() and str(name) not in wanted:
                path.unlink()

    @staticmethod
    def _copy(source, target):
        if target.is_file() and target.read_bytes() == source.read_bytes():
            shutil.copymode(source, target)
            return
        target.parent.mkdir(parents=True, exist_ok=True)
        shutil.copyfile(source, target)
        shutil.copymode(source, target)

    def directory(self, preset):
        return self.folder / _BUILD / preset

    def program(self, preset, name=PROGRAMS[0]):
        return self.directory(preset) / "bin" / name

    def configure(self, preset):
        """Configures and builds without a mutant."""
        # Of the linkers that come with the compiler the faster one. The checker of leaks needs no
        # sanitizer's code: a free that is dropped shows in no result.
        linking = "-fuse-ld=gold" + (" -fsanitize=leak" if preset == "release" else "")
        self._command("cmake", "--preset", preset, "-DPLEXOR_BUILD_BENCH=OFF",
                      f"-DCMAKE_EXE_LINKER_FLAGS={linking}", "--log-level=WARNING")
        self._command("cmake", "--build", str(self.directory(preset)), "--target", *PROGRAMS,
                      f"-j{self.build_jobs}")
        self._objects[preset] = self._object_sums(preset, None)

    def _command(self, *command):
        done = subprocess.run(command, cwd=self.folder, capture_output=True, text=True)
        if done.returncode != 0:
            raise TreeError(f"{' '.join(command)}:\n{(done.stdout + done.stderr)[-4000:]}")

    def _object_files(self, preset, source):
        """The provider's objects that a source goes into; all of them for a header or None."""
        folder = self.directory(preset) / SOURCES / "CMakeFiles" / "plexor_objects.dir"
        if source is not None and source.endswith(".cpp"):
            return [folder / f"{Path(source).name}.o"]
        return sorted(folder.glob("*.o"))

    def _object_sums(self, preset, source):
        return {
            path.name: hashlib.sha256(path.read_bytes()).digest()
            for path in self._object_files(preset, source)
        }

    @contextmanager
    def with_mutant(self, mutant):
        """Has the mutant in the copy for as long as the context lasts."""
        path = self.folder / mutant.file
        original = path.read_text()
        path.write_text(mutant.applied(original))
        try:
            yield
        finally:
            path.write_text(original)

    def _ninja(self, preset, targets):
        done = subprocess.run(
            ["ninja", "-C", str(self.directory(preset)), f"-j{self.build_jobs}", *targets],
            capture_output=True,
        )
        return done.returncode == 0

    def compiles(self, mutant, preset):
        """Builds the objects that the mutant is in. False when a compiler refuses it."""
        objects = self._object_files(preset, mutant.file)
        return self._ninja(preset, [str(path.relative_to(self.directory(preset))) for path in objects])

    def same_code(self, mutant, preset):
        """Whether the compiler has made the same of the mutant as of the original."""
        sums = self._object_sums(preset, mutant.file)
        return all(self._objects[preset][name] == value for name, value in sums.items())

    def links(self, preset):
        """Builds the rest. False when that fails, as where a header is of the tests as well."""
        return self._ninja(preset, PROGRAMS)
