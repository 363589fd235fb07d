#!/usr/bin/env bash
# What README promises on plain Debian: the demonstration, from nothing, with the time and the disk that
# it takes.
#
#   first_steps_test.sh SOURCE BUILD
set -euo pipefail
arguments=("$@")
source "$(dirname "$0")/common.sh"
source "$(dirname "$0")/root.sh"

source=$1 build=$2
begin_root_test "$source"
megabytes() { du -smx "$root" | cut -f1; }

make_root "$build" "$root"
mkdir "$root/srv/plexor"
(cd "$source" && git ls-files -z | tar -c --null -T -) | tar -x -C "$root/srv/plexor"
before=$(megabytes) start=$SECONDS
said=$(in_root "$root" sh -c 'cd /srv/plexor && scripts/demo' 2>&1) || fail "demo: $said"
grep -qF 'building, log in build/demo.log' <<<"$said" || fail "demo does not say what it does: $said"
grep -qF 'PLEXOR CRITICAL - ' <<<"$said" || fail "demo shows no check: $said"
echo "demo: $((SECONDS - start)) s, $(($(megabytes) - before)) MB of disk, on $(nproc) processors"
for package in clang-format libgtest-dev libgmock-dev; do
    ! in_root "$root" dpkg -s $package >/dev/null 2>&1 || fail "demo has installed $package"
done

finish "first steps"
