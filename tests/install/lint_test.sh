#!/usr/bin/env bash
# What Debian's own checker and systemd's say of packages and units. Both are installed into a Debian
# of their own.
#
#   lint_test.sh SOURCE BUILD
set -euo pipefail
arguments=("$@")
source "$(dirname "$0")/common.sh"
source "$(dirname "$0")/root.sh"

source=$1 build=$2
begin_root_test "$source"

make_packages "$source" "$scratch" >&2
rm "$scratch"/*-2_*.deb
make_root "$build" "$root"
in_root "$root" apt-get install -y -qq --no-install-recommends lintian systemd >"$scratch/log" 2>&1 || {
    cat "$scratch/log"
    exit 1
}
cp "$scratch"/*.deb "$root/root/"

# Only the owner has an address for the maintainers, and only an upload a bug to close.
said=$(in_root "$root" sh -c 'lintian --allow-root /root/*.deb 2>&1' || true)
findings=$(grep -E '^[EW]:' <<<"$said" |
    grep -vE ': (bogus-mail-host|bogus-mail-host-in-debian-changelog|initial-upload-closes-no-bugs) ' || true)
[ -z "$findings" ] || fail "lintian: $findings"
grep -q '^W: .*initial-upload' <<<"$said" || fail "lintian has looked at nothing: $said"

in_root "$root" sh -c 'for file in /root/*.deb; do dpkg-deb -x "$file" /; done'
units=/usr/share/doc/plexor-testbed/examples
said=$(in_root "$root" systemd-analyze verify --man=no \
    /usr/lib/systemd/system/plexor-testbed.service $units/plexor-check.service \
    $units/plexor-check.timer 2>&1) || fail "units: $said"
[ -z "$said" ] || fail "units: $said"
# Of ten, where ten is no protection at all.
said=$(in_root "$root" systemd-analyze security --offline=true --threshold=20 \
    /usr/lib/systemd/system/plexor-testbed.service 2>&1) || fail "the service is open: $said"

finish "lint"
