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

# SOURCE LIBDIR PACKAGE: mode and path of what a package of the provider puts below /usr.
expected_provider_files() {
    local source=$1 libdir=$2 package=$3 file
    echo "755 usr/sbin/plexor-register"
    echo "644 usr/$libdir/cmpi/libPlexorProvider.so"
    for file in $provider_documents; do
        echo "644 usr/share/doc/$package/$file"
    done
    echo "644 usr/share/man/man7/plexor-provider.7"
    echo "644 usr/share/man/man8/plexor-register.8"
    for file in "$source"/cim/schema/*.mof; do
        echo "644 usr/share/plexor-provider/mof/$(basename "$file")"
    done
    for file in "$source"/scripts/register/*; do
        echo "644 usr/share/plexor-provider/register/$(basename "$file")"
    done
    for file in PlexorProvider.plain PlexorProvider.section PlexorProviderModule.mof; do
        echo "644 usr/share/plexor-provider/registration/$file"
    done
}
provider_documents="copyright install.md messages.md operating.md runbook.md"

# SOURCE LIBDIR: the same of the test bed. $with_standard is empty where there is one build only.
expected_testbed_files() {
    local source=$1 libdir=$2 file
    echo "755 usr/bin/plexor-testbed"
    for file in libPlexorProvider.so libplexor-manager-flush.so \
        ${with_standard:+standard/libPlexorProvider.so}; do
        echo "644 usr/$libdir/plexor-testbed/$file"
    done
    for file in $testbed_documents; do
        echo "644 usr/share/doc/plexor-testbed/$file"
    done
    for file in plexor-check.service plexor-check.timer plexor-icinga2.conf plexor-nagios.cfg; do
        echo "644 usr/share/doc/plexor-testbed/examples/$file"
    done
    for file in check_plexor plexor-testbed; do
        echo "644 usr/share/bash-completion/completions/$file"
    done
    echo "755 usr/lib/nagios/plugins/check_plexor"
    echo "644 usr/lib/systemd/system/plexor-testbed.service"
    echo "644 usr/share/man/man1/plexor-testbed.1"
    echo "644 usr/share/man/man5/plexor-scenario.5"
    for file in "$source"/cim/schema/*.mof; do
        echo "644 usr/share/plexor-testbed/mof/$(basename "$file")"
    done
    echo "644 usr/share/plexor-testbed/scenario.schema.json"
    for file in "$source"/scenarios/*.json; do
        echo "644 usr/share/plexor-testbed/scenarios/$(basename "$file")"
    done
}
testbed_documents="copyright managers.md page.md operating.md runbook.md scenarios.md security.md"

# ROOT: mode and path of what is there; of a link, the mode of what it leads to.
found_files() { (cd "$1" && find -L . -type f -printf '%m %P\n'); }

# EXPECTED FOUND, both lists: fails with the difference.
expect_same_files() {
    local difference
    difference=$(diff <(sort <<<"$1") <(sort <<<"$2")) || fail "files differ: $difference"
}

# FILE TYPE: hardened as the distributions want it. TYPE is that of its ELF header.
expect_hardened() {
    local file=$1 dynamic headers
    dynamic=$(readelf -dW "$file")
    headers=$(readelf -lW "$file")
    grep -q "Type: *DYN ($2" <<<"$(readelf -hW "$file")" || fail "$file is no $2"
    ! grep -qE 'RPATH|RUNPATH' <<<"$dynamic" || fail "$file has a search path"
    grep -q 'GNU_STACK.* RW ' <<<"$headers" || fail "$file wants an executable stack"
    grep -q 'GNU_RELRO' <<<"$headers" && grep -q 'BIND_NOW' <<<"$dynamic" ||
        fail "$file leaves its tables writable"
}

# FILE: what the compiler put in against overruns.
expect_guarded() {
    local symbols
    symbols=$(readelf -W --dyn-syms "$1")
    grep -q '__stack_chk_fail' <<<"$symbols" || fail "$1 has no stack protector"
    grep -q '__[a-z]*printf_chk' <<<"$symbols" || fail "$1 is not fortified"
}

# LIBRARY: a provider as a manager needs it.
expect_sound_library() {
    local needed
    grep -q ' T PlexorProvider_Create_InstanceMI$' <<<"$(nm -D --defined-only "$1")" ||
        fail "$1 has no factory"
    expect_hardened "$1" Shared
    expect_guarded "$1"
    needed=$(readelf -d "$1" | sed -n 's/.*(NEEDED).*\[\(.*\)\]/\1/p' |
        grep -vE '^(libc|libm|libstdc\+\+|libgcc_s|ld-linux.*)\.so' || true)
    [ -z "$needed" ] || fail "$1 needs $needed"
}

# LIBRARY standard|flush
expect_build() {
    local said=standard
    ! grep -q 'context table has no flush' "$1" || said=flush
    [ $said = "$2" ] || fail "$1 is the build $said, not $2"
}

# ROOT LIBDIR: the tool and what lies beside it.
expect_sound_tool() {
    local tool=$1/usr/bin/plexor-testbed module=$1/usr/$2/plexor-testbed/libplexor-manager-flush.so
    local own
    ! grep -q ' tool_mm_flush$' <<<"$(nm -D --defined-only "$tool")" ||
        fail "the tool exports the flush for every manager"
    grep -q ' T tool_mm_flush$' <<<"$(nm -D --defined-only "$module")" ||
        fail "the module does not export the flush"
    expect_hardened "$tool" Position-Independent
    expect_guarded "$tool"
    expect_hardened "$module" Shared
    expect_sound_library "$1/usr/$2/plexor-testbed/libPlexorProvider.so"
    own=$1/usr/$2/plexor-testbed/standard/libPlexorProvider.so
    [ -z "${with_standard:-}" ] || expect_build "$own" standard
}
