#!/usr/bin/env bash
# Makes the Debian package of the build and looks at what is in it.
#
#   package_test.sh SOURCE BUILD LIBDIR PACKAGE OTHER_PACKAGE VERSION
set -euo pipefail
source "$(dirname "$0")/common.sh"

source=$1 build=$2 libdir=$3 package=$4 other=$5 version=$6
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT

(cd "$scratch" && umask 027 &&
    cpack --config "$build/CPackConfig.cmake" -G DEB -B "$scratch" >"$scratch/log" 2>&1) || {
    cat "$scratch/log"
    exit 1
}
deb=$scratch/${package}_$version-1_$(dpkg --print-architecture).deb
[ -f "$deb" ] || {
    echo "FAIL: no $deb: $(ls "$scratch")"
    exit 1
}

expected_package_files() {
    expected_files "$source" "$libdir" "$package" | sed -E 's|(/man/.*)$|\1.gz|'
    echo "644 usr/share/doc/$package/changelog.Debian.gz"
}

dpkg-deb -x "$deb" "$scratch/root"
expect_same_files "$(expected_package_files)" "$(found_files "$scratch/root")"
expect_sound_binaries "$scratch/root" "$libdir"

listing=$(dpkg-deb -c "$deb")
strangers=$(awk '$2 != "root/root"' <<<"$listing")
[ -z "$strangers" ] || fail "not root's: $strangers"
modes=$(awk '$1 !~ /^(drwxr-xr-x|-rwxr-xr-x|-rw-r--r--|lrwxrwxrwx)$/' <<<"$listing")
[ -z "$modes" ] || fail "modes: $modes"
links=$(sed -n 's/^l.* \(\.[^ ]* -> .*\)/\1/p' <<<"$listing")
[ "$links" = './usr/lib/nagios/plugins/check_plexor -> ../../../bin/plexor-testbed' ] ||
    fail "links: $links"

# FIELD PATTERN
expect_field() {
    local value
    value=$(dpkg-deb -f "$deb" "$1")
    grep -qE "$2" <<<"$value" || fail "$1 is \"$value\""
}
expect_field Package "^$package\$"
expect_field Version "^$version-1\$"
expect_field Conflicts "^$other\$"
expect_field Depends 'libc6 \(>= .*libstdc\+\+6'
expect_field Description '^CMPI instance provider'
expect_field Maintainer '^[^<]+ <[^>@]+@[^>@]+>$'
[ -z "$(dpkg-deb -f "$deb" Replaces)" ] || fail "replaces another package by itself"

for file in "$scratch/root/usr/bin/plexor-testbed" \
    "$scratch/root/usr/$libdir/cmpi/libPlexorProvider.so"; do
    ! grep -qE ' \.(symtab|debug_info)' <<<"$(readelf -SW "$file")" || fail "$file is not stripped"
done
paths=$(cd "$scratch/root" && grep -rlF -e "$source" -e "$build" -e "$scratch" . || true)
[ -z "$paths" ] || fail "paths of this machine in: $paths"

finish "package $package"
