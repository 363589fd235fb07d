#!/usr/bin/env bash
# Makes the Debian packages of the build and looks at what is in them.
#
#   package_test.sh SOURCE BUILD LIBDIR VERSION PACKAGE=BUILD_KIND...
set -euo pipefail
source "$(dirname "$0")/common.sh"

source=$1 build=$2 libdir=$3 version=$4
shift 4
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT
with_standard=""
[ $# -lt 2 ] || with_standard=yes

(cd "$scratch" && umask 027 &&
    cpack --config "$build/CPackConfig.cmake" -G DEB -B "$scratch" >"$scratch/log" 2>&1) || {
    cat "$scratch/log"
    exit 1
}

deb="" root=""

# PACKAGE: its file and what it unpacks to.
unpack() {
    deb=$scratch/${1}_$version-1_$(dpkg --print-architecture).deb root=$scratch/root-$1
    [ -f "$deb" ] || {
        echo "FAIL: no $deb: $(ls "$scratch")"
        exit 1
    }
    dpkg-deb -x "$deb" "$root"
}

# FIELD PATTERN
expect_field() {
    local value
    value=$(dpkg-deb -f "$deb" "$1")
    grep -qE "$2" <<<"$value" || fail "$(basename "$deb"): $1 is \"$value\""
}

# PACKAGE LINKS: what is true of each package. Its files without changelog are on standard input.
expect_package() {
    local expected listing strangers modes paths binary
    expected=$(sed -E 's|(/man/.*)$|\1.gz|'; echo "644 usr/share/doc/$1/changelog.Debian.gz")
    expect_same_files "$expected" "$(found_files "$root")"
    listing=$(dpkg-deb -c "$deb")
    strangers=$(awk '$2 != "root/root"' <<<"$listing")
    [ -z "$strangers" ] || fail "not root's: $strangers"
    modes=$(awk '$1 !~ /^(drwxr-xr-x|-rwxr-xr-x|-rw-r--r--|lrwxrwxrwx)$/' <<<"$listing")
    [ -z "$modes" ] || fail "modes: $modes"
    [ "$(sed -n 's/^l.* \(\.[^ ]* -> .*\)/\1/p' <<<"$listing")" = "$2" ] || fail "links of $1"
    expect_field Package "^$1\$"
    expect_field Version "^$version-1\$"
    expect_field Maintainer '^[^<]+ <[^>@]+@[^>@]+>$'
    grep -q "^$1 ($version-1)" <<<"$(zcat "$root/usr/share/doc/$1/changelog.Debian.gz")" ||
        fail "changelog of $1"
    paths=$(cd "$root" && grep -rlF -e "$source" -e "$build" -e "$scratch" . || true)
    [ -z "$paths" ] || fail "paths of this machine in: $paths"
    while read -r binary; do
        ! grep -qE ' \.(symtab|debug_info)' <<<"$(readelf -SW "$binary")" ||
            fail "$binary is not stripped"
    done < <(find "$root/usr/bin" "$root/usr/$libdir" \( -name plexor-testbed -o -name '*.so' \) \
        -type f 2>/dev/null)
}

# PACKAGE BUILD_KIND: that of the library in it.
test_provider() {
    unpack "$1"
    expected_provider_files "$source" "$libdir" "$1" | expect_package "$1" ""
    expect_sound_library "$root/usr/$libdir/cmpi/libPlexorProvider.so"
    expect_build "$root/usr/$libdir/cmpi/libPlexorProvider.so" "$2"
    expect_field Description '^CMPI instance provider'
    expect_field Depends '^libc6 \([^,]*, libgcc-s1 \([^,]*, libstdc\+\+6 \([^,]*$'
    local other=plexor-provider-flush
    [ "$1" = plexor-provider ] || other=plexor-provider
    expect_field Conflicts "^$other(,|\$)"
    expect_field Replaces "^$other(,|\$)"
}

test_testbed() {
    unpack plexor-testbed
    expected_testbed_files "$source" "$libdir" | expect_package plexor-testbed \
        './usr/lib/nagios/plugins/check_plexor -> ../../../bin/plexor-testbed'
    expect_sound_tool "$root" "$libdir"
    expect_field Depends 'libexpat1 .*libssl3'
    [ -z "$(dpkg-deb -f "$deb" Depends | grep plexor)" ] || fail "the test bed needs the provider"
    [ -z "$(dpkg-deb -f "$deb" Conflicts)" ] || fail "the test bed excludes something"
}

for each in "$@"; do test_provider "${each%=*}" "${each#*=}"; done
test_testbed

finish "packages"
