# shellcheck shell=bash
# Shared by the tests of this folder; sourced.
failures=0

fail() {
    echo "FAIL: $1"
    failures=$((failures + 1))
}

finish() {
    [ "$failures" = 0 ] || exit 1
    echo "$1: fine"
}

# SOURCE LIBDIR PACKAGE: mode and path of everything that an installation below /usr holds.
expected_files() {
    local source=$1 libdir=$2 package=$3 file
    echo "755 usr/bin/plexor-testbed"
    echo "755 usr/sbin/plexor-register"
    echo "644 usr/$libdir/cmpi/libPlexorProvider.so"
    echo "644 usr/$libdir/plexor-testbed/libplexor-manager-flush.so"
    for file in copyright messages.md operating.md page.md scenarios.md security.md; do
        echo "644 usr/share/doc/$package/$file"
    done
    for file in plexor-icinga2.conf plexor-nagios.cfg; do
        echo "644 usr/share/doc/$package/examples/$file"
    done
    for file in check_plexor plexor-testbed; do
        echo "644 usr/share/bash-completion/completions/$file"
    done
    echo "755 usr/lib/nagios/plugins/check_plexor"
    echo "644 usr/share/man/man1/plexor-testbed.1"
    echo "644 usr/share/man/man5/plexor-scenario.5"
    echo "644 usr/share/man/man7/plexor-provider.7"
    echo "644 usr/share/man/man8/plexor-register.8"
    for file in "$source"/cim/schema/*.mof; do
        echo "644 usr/share/plexor-provider/mof/$(basename "$file")"
    done
    for file in PlexorProvider.plain PlexorProvider.section PlexorProviderModule.mof; do
        echo "644 usr/share/plexor-provider/registration/$file"
    done
    echo "644 usr/share/plexor-testbed/scenario.schema.json"
    for file in "$source"/scenarios/*.json; do
        echo "644 usr/share/plexor-testbed/scenarios/$(basename "$file")"
    done
}

# ROOT: mode and path of what is there; of a link, the mode of what it leads to.
found_files() { (cd "$1" && find -L . -type f -printf '%m %P\n'); }

# EXPECTED FOUND, both lists: fails with the difference.
expect_same_files() {
    local difference
    difference=$(diff <(sort <<<"$1") <(sort <<<"$2")) || fail "files differ: $difference"
}

# ROOT LIBDIR: the binaries of an installation are what a manager and a user need.
expect_sound_binaries() {
    local library=$1/usr/$2/cmpi/libPlexorProvider.so tool=$1/usr/bin/plexor-testbed file needed
    local flush=$1/usr/$2/plexor-testbed/libplexor-manager-flush.so
    grep -q ' T PlexorProvider_Create_InstanceMI$' <<<"$(nm -D --defined-only "$library")" ||
        fail "the library has no factory"
    ! grep -q ' tool_mm_flush$' <<<"$(nm -D --defined-only "$tool")" ||
        fail "the tool exports the flush for every manager"
    grep -q ' T tool_mm_flush$' <<<"$(nm -D --defined-only "$flush")" ||
        fail "the module does not export the flush"
    for file in "$library" "$tool" "$flush"; do
        ! grep -qE 'RPATH|RUNPATH' <<<"$(readelf -d "$file")" || fail "$file has a search path"
        grep -q 'GNU_STACK.* RW ' <<<"$(readelf -lW "$file")" ||
            fail "$file wants an executable stack"
    done
    needed=$(readelf -d "$library" | sed -n 's/.*(NEEDED).*\[\(.*\)\]/\1/p' |
        grep -vE '^(libc|libm|libstdc\+\+|libgcc_s|ld-linux.*)\.so' || true)
    [ -z "$needed" ] || fail "the library needs $needed"
}
