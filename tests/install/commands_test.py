#!/usr/bin/env python3
"""Runs the commands of README, of the pages for those who install and operate, and of the manual pages.

    commands_test.py SOURCE BUILD PAGE...

A block of commands is run line by line, in the page's order and in one shell; a line ends with status
0, or says "(status N)" in its comment. Blocks that need a real host are marked in the page, as are those
that another test runs, which then has to exist.
"""

import os
import pathlib
import re
import socket
import subprocess
import sys
import tempfile

sys.dont_write_bytecode = True
from page_commands import OUTPUT_OF, RUN, PageError, blocks_of

SOURCE, BUILD = (pathlib.Path(argument).resolve() for argument in sys.argv[1:3])
LIMIT_SECONDS = 300

PRELUDE = r"""
set -u
cd "$SANDBOX"
trap 'kill $(jobs -p) 2>/dev/null' EXIT
# STATUS LINE: runs it, in this shell.
run_line() {
    local wanted=$1 status=0
    echo "+ $2"
    eval "$2" </dev/null || status=$?
    [ $status = "$wanted" ] && return
    echo "FAIL: status $status, not $wanted: $2"
    exit 1
}
# A server in the background: goes on when it serves.
serve_line() {
    echo "+ $1"
    # Here and now: what the one before has said must not be taken for this one's.
    : >"$SANDBOX/served"
    eval "exec $1" >"$SANDBOX/served" 2>&1 </dev/null &
    for _ in $(seq 300); do
        grep -q '^serving ' "$SANDBOX/served" && return
        sleep 0.1
    done
    echo "FAIL: does not serve: $1: $(cat "$SANDBOX/served")"
    exit 1
}
stop_servers() { kill $(jobs -p) 2>/dev/null; wait 2>/dev/null; }
"""


def free_port():
    with socket.socket() as listener:
        listener.bind(("127.0.0.1", 0))
        return listener.getsockname()[1]


def make_sandbox(root):
    """A directory with what the pages expect beside the reader, and a host that nobody else sees."""
    (root / "scenarios").symlink_to(SOURCE / "scenarios")
    (root / "build").symlink_to(BUILD.parent)
    cmpi = root / "usr/lib/cmpi"
    cmpi.mkdir(parents=True)
    standard = BUILD / "lib/standard/libPlexorProvider.so"
    library = standard if standard.exists() else BUILD / "lib/libPlexorProvider.so"
    (cmpi / library.name).symlink_to(library)
    binaries = root / "bin"
    binaries.mkdir()
    for name in ("plexor-testbed", "check_plexor"):
        (binaries / name).symlink_to(BUILD / "bin/plexor-testbed")
    # Where the tool reads and writes is below the sandbox.
    register = binaries / "plexor-register"
    register.write_text(
        f'#!/bin/bash\nargs=()\nfor word; do args+=("${{word#{root}}}"); done\n'
        f'exec {SOURCE}/scripts/plexor-register "${{args[@]}}" --root {root}\n'
    )
    register.chmod(0o755)


def logical_lines(lines):
    """Joins what ends in a backslash; takes the comments away; (line, status)."""
    text = re.sub(r"(\\|\|)\n\s*", lambda found: found.group(1).strip("\\") + " ", "\n".join(lines))
    for line in text.splitlines():
        status = re.search(r"#.*\(status (\d+)\)", line)
        command = re.sub(r"(^|\s+)#.*$", "", line).strip()
        if command:
            yield command, int(status.group(1)) if status else 0


def quoted(text):
    return "'" + text.replace("'", "'\\''") + "'"


def script_of(blocks, port):
    yield PRELUDE
    for block in blocks:
        for command, status in logical_lines(block.lines):
            command = command.replace("5988", str(port))
            command = re.sub(r"(plexor-testbed serve) (?!.*--port)", rf"\1 --port {port} ", command)
            command = command.replace("/tmp/", "$SANDBOX/").replace("http://localhost/", f"http://localhost:{port}/")
            if "plexor-testbed serve" in command:
                # One server at a time has the port.
                yield "stop_servers"
                yield f"serve_line {quoted(command.removesuffix('&').strip())}"
            elif "--check" in command and command.startswith("plexor-register"):
                yield f"run_line {status} {quoted(f'{command} --url http://localhost:{port}')}"
            else:
                yield f"run_line {status} {quoted(command)}"
    yield "stop_servers"


def missing_programs(block):
    """The benchmarks are built by the long form only, but there is always a target of that name."""
    targets = "".join(file.read_text() for file in SOURCE.glob("*/**/CMakeLists.txt")) + "".join(
        file.read_text() for file in SOURCE.glob("bench/CMakeLists.txt")
    )
    for line in block.lines:
        for program in re.findall(r"build/release/bin/(\S+)", line):
            if not (BUILD / "bin" / program).exists() and not re.search(rf"\b{program}\b", targets):
                yield f"{block.page}:{block.line}: there is no program {program}"


def wrong_output(block, environment):
    command = OUTPUT_OF.match(block.how).group(1)
    done = subprocess.run(
        ["bash", "-c", f"cd $SANDBOX && {command}"],
        env=environment, stdout=subprocess.PIPE, text=True, timeout=LIMIT_SECONDS,
    )
    if done.stdout.strip() != "\n".join(block.lines).strip():
        yield f"{block.page}:{block.line}: not what the command says now:\n{done.stdout}"


def known_tests():
    listing = subprocess.run(["ctest", "-N"], cwd=BUILD, capture_output=True, text=True, check=True)
    return set(re.findall(r"Test +#\d+: (\S+)", listing.stdout)) | {".ci/run"}


def run_page(path, tests):
    """What is wrong with the page's commands."""
    blocks = blocks_of(path)
    shown = [block for block in blocks if OUTPUT_OF.match(block.how)]
    mine = [block for block in blocks if block.how == RUN]
    for block in blocks:
        if block.how == "programs":
            yield from missing_programs(block)
        elif block.how != "host" and block not in shown + mine and block.how not in tests:
            yield f"{block.page}:{block.line}: there is no test {block.how}"
    if not mine + shown:
        return
    with tempfile.TemporaryDirectory() as name:
        root = pathlib.Path(name).resolve()
        make_sandbox(root)
        environment = dict(os.environ, SANDBOX=str(root), PATH=f"{root}/bin:{os.environ['PATH']}")
        environment.update(HOME=str(root), LC_ALL="C.UTF-8")
        for block in shown:
            yield from wrong_output(block, environment)
        script = "\n".join(script_of(mine, free_port()))
        done = subprocess.run(
            ["bash", "-c", script],
            env=environment,
            stdout=subprocess.PIPE,
            stderr=subprocess.STDOUT,
            timeout=LIMIT_SECONDS,
            text=True,
        )
        if done.returncode != 0:
            yield f"{path.name}: {done.stdout}"
        print(f"{path.name}: {done.stdout.count(chr(10) + '+ ') + 1} commands")


def main():
    tests = known_tests()
    wrong = []
    for page in sys.argv[3:]:
        try:
            wrong += run_page(pathlib.Path(page), tests)
        except PageError as error:
            wrong.append(str(error))
    for line in wrong:
        print(f"FAIL: {line}")
    return 1 if wrong else 0


if __name__ == "__main__":
    sys.exit(main())
