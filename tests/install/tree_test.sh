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
with_standard=""
[ ! -e "$build/lib/standard" ] || with_standard=yes
expect_same_files "$(expected_provider_files "$source" "$libdir" "$package"
    expected_testbed_files "$source" "$libdir")" "$(found_files "$root")"
expect_sound_library "$root/usr/$libdir/cmpi/libPlexorProvider.so"
expect_sound_tool "$root" "$libdir"

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
mv "$root/usr/share/plexor-testbed/mof" "$root/mof"
said=$(env -i "$root/usr/bin/plexor-testbed" show --scenario "$root/scenario.json" 2>&1) &&
    fail "show without classes: $said"
grep -qF 'Tovexa_Plexor.mof' <<<"$said" || fail "show without classes: $said"
env -i "$root/usr/bin/plexor-testbed" show --scenario "$root/scenario.json" --schema "$root/mof" \
    >/dev/null 2>&1 || fail "show with --schema"
mv "$root/mof" "$root/usr/share/plexor-testbed/mof"

# So it does without its library; the one that managers load is not the test bed's.
mv "$root/usr/$libdir/plexor-testbed/libPlexorProvider.so" "$root/library.so"
said=$(env -i "$root/usr/bin/plexor-testbed" show --scenario "$root/scenario.json" 2>&1) &&
    fail "show without library: $said"
grep -qF 'libPlexorProvider.so not found' <<<"$said" || fail "show without library: $said"
mv "$root/library.so" "$root/usr/$libdir/plexor-testbed/libPlexorProvider.so"

# Of two builds it takes the one that the manager is for: the other would say so.
said=$(env -i "$root/usr/bin/plexor-testbed" show --log --manager large \
    --scenario "$root/scenario.json" 2>&1) || fail "show on a large manager: $said"
! grep -qF 'this build of the provider is for another manager' <<<"$said" ||
    fail "the wrong build on a large manager"

mkdir -p "$root/host/srv/stage/regs" "$root/host/srv/stage/mofs"
said=$("$root/usr/sbin/plexor-register" --manager section --root "$root/host" \
    --stage /srv/stage 2>&1) || fail "register: $said"
[ -s "$root/host/srv/stage/regs/PlexorProvider.reg" ] || fail "register: no registration: $said"

finish "install tree"
