#!/usr/bin/env bash
# Installs the build into a scratch root and uses it from there.
#
#   tree_test.sh SOURCE BUILD LIBDIR PACKAGE
set -euo pipefail
source "$(dirname "$0")/common.sh"

source=$1 build=$2 libdir=$3 package=$4
root=$(mktemp -d)
trap 'rm -rf "$root"' EXIT

# A umask that would show in the modes.
(umask 022 && DESTDIR=$root cmake --install "$build" --prefix /usr >/dev/null)
expect_same_files "$(expected_files "$source" "$libdir" "$package")" "$(found_files "$root")"
expect_sound_binaries "$root" "$libdir"

# The tool finds provider and classes by their place relative to its own.
cp "$root/usr/share/plexor-testbed/scenarios/healthy-array.json" "$root/scenario.json"
tree=$(env -i "$root/usr/bin/plexor-testbed" show --scenario "$root/scenario.json" 2>&1) ||
    fail "show: $tree"
grep -qF 'RAID5 data Logical Volume 0 on controller C0' <<<"$tree" || fail "show: $tree"

# The plugin finds itself, whatever directory it is called from.
said=$(cd / && env -i "$root/usr/lib/nagios/plugins/check_plexor" -H 127.0.0.1 -p 1 2>&1) &&
    fail "check_plexor: $said"
[ "$said" = 'PLEXOR UNKNOWN - 127.0.0.1:1: no connection: Connection refused' ] ||
    fail "check_plexor: $said"

# Without its classes it says so.
mv "$root/usr/share/plexor-provider/mof" "$root/mof"
said=$(env -i "$root/usr/bin/plexor-testbed" show --scenario "$root/scenario.json" 2>&1) &&
    fail "show without classes: $said"
grep -qF 'Tovexa_Plexor.mof' <<<"$said" || fail "show without classes: $said"
env -i "$root/usr/bin/plexor-testbed" show --scenario "$root/scenario.json" --schema "$root/mof" \
    >/dev/null 2>&1 || fail "show with --schema"
mv "$root/mof" "$root/usr/share/plexor-provider/mof"

said=$("$root/usr/sbin/plexor-register" --manager section --root "$root/host" 2>&1) ||
    fail "register: $said"
[ -s "$root/host/var/lib/plexor-provider/stage/regs/PlexorProvider.reg" ] ||
    fail "register: no registration: $said"

finish "install tree"
