#!/usr/bin/env bash
# Registers with each kind of manager below a scratch root, again, and takes it back.
#
#   register_test.sh SOURCE_TREE
set -euo pipefail

tree=$1
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT
failures=0
root="" said="" status=0

fail() {
    echo "FAIL: $1"
    failures=$((failures + 1))
}

# The arguments of plexor-register; leaves what it said and its status.
register() {
    status=0
    said=$("$tree/scripts/plexor-register" "$@" --root "$root" 2>&1) || status=$?
}

expect_status() { [ "$status" = "$1" ] || fail "$2: status $status, not $1: $said"; }
expect_said() { grep -qF -- "$1" <<<"$said" || fail "$2: did not say \"$1\": $said"; }
expect_not_said() { ! grep -qF -- "$1" <<<"$said" || fail "$2: said \"$1\": $said"; }
expect_same() { cmp -s "$1" "$2" || fail "$2 is not $1"; }
# Without the notes that the tool keeps.
count_files() { find "$root" -type f ! -path '*/plexor-provider/registrations' \
    ! -path '*/plexor-provider/directories' | wc -l; }
expect_files() { [ "$(count_files)" = "$1" ] || fail "$2: $(count_files) files, not $1"; }

stage=srv/cim/stage
mofs=$tree/cim/schema
# A manager's staging area below $root.
make_stage() { mkdir -p "$root/$stage/regs" "$root/$stage/mofs/root/cimv2"; }
staged_classes=$stage/mofs/root/cimv2/Tovexa_Plexor.mof

# All six classes, each once, and nothing to include.
expect_classes() {
    local names registered
    names=$(sed -n 's/^class \(Tovexa_[A-Za-z]*\) :.*/\1/p' "$root/$staged_classes" | sort)
    registered=$(sed -n 's/^\[\(.*\)\]$/\1/p' "$mofs/registration/PlexorProvider.section" | sort)
    [ "$names" = "$registered" ] || fail "$1: classes staged: $names"
    [ "$(wc -l <<<"$names")" = 6 ] || fail "$1: not six classes"
    ! grep -q '#pragma' "$root/$staged_classes" || fail "$1: an include is staged"
}

# SOURCE TARGET of the registration itself, below their folders.
test_manager() {
    local manager=$1 source=$2 target=$3
    root=$scratch/$manager
    mkdir "$root"
    make_stage

    register --manager "$manager" --stage /$stage
    expect_status 0 "$manager, first"
    expect_said "PlexorProvider files written ($manager)" "$manager, first"
    expect_said "next, for the manager does not know it yet" "$manager, first"
    expect_files 2 "$manager, first"
    expect_same "$mofs/registration/$source" "$root/$stage/$target"
    expect_classes "$manager"
    [ "$(stat -c %a "$root/$stage/$target")" = 644 ] || fail "$manager: mode of the registration"

    register --manager "$manager" --stage /$stage
    expect_status 0 "$manager, again"
    expect_said "was registered already" "$manager, again"
    expect_not_said "written" "$manager, again"
    expect_not_said "next," "$manager, again"

    echo "spoilt" >"$root/$stage/$target"
    register --manager "$manager" --stage /$stage
    expect_said "written $root/$stage/$target" "$manager, spoilt"
    expect_same "$mofs/registration/$source" "$root/$stage/$target"

    touch "$root/$stage/mofs/root/cimv2/Other.mof"
    register --manager "$manager" --stage /$stage --remove
    expect_status 0 "$manager, remove"
    expect_said "PlexorProvider files removed" "$manager, remove"
    expect_files 1 "$manager, remove (another's file stays)"
    rm "$root/$stage/mofs/root/cimv2/Other.mof"

    register --manager "$manager" --stage /$stage --remove
    expect_status 0 "$manager, remove again"
    expect_said "was not registered" "$manager, remove again"
    expect_not_said "next," "$manager, remove again"
}

test_two_managers_share_the_classes() {
    root=$scratch/two
    mkdir "$root"
    make_stage
    register --manager section --stage /$stage
    register --manager module --stage /$stage
    register --manager section --stage /$stage --remove
    expect_said "in use by another registration" "two managers"
    expect_files 2 "two managers, one removed"
    expect_classes "two managers, one removed"
    register --manager module --stage /$stage --remove
    expect_files 0 "two managers, both removed"
}

test_chosen_places() {
    root=$scratch/chosen
    mkdir "$root"
    make_stage
    register --manager section --stage /srv/cim/stage --service cimd
    expect_said "systemctl try-restart cimd" "chosen places"
    [ -e "$root/srv/cim/stage/regs/PlexorProvider.reg" ] || fail "chosen places: no registration"
    register --manager module --stage /srv/cim/stage
    expect_said "cimmof -n root/interop $root/srv/cim/stage/mofs/PlexorProviderModule.mof" \
        "chosen places, module"
    register --manager module --stage /srv/cim/other --interop root/own
    expect_said "cimmof -n root/own" "chosen places, interop"
    register --manager module --stage /srv/cim/stage --remove
    expect_said "cimprovider -r -m PlexorProviderModule" "chosen places, module"
}

test_refusals() {
    root=$scratch/refused
    mkdir "$root"
    register
    expect_status 2 "no manager"
    register --manager carrot
    expect_status 2 "unknown manager"
    expect_said "unknown manager carrot" "unknown manager"
    register --manager section --carrot
    expect_status 2 "unknown argument"
    PLEXOR_SHARE=$scratch register --manager module
    expect_status 1 "no class files"
    expect_files 0 "refusals"
    register --manager module --check
    expect_status 2 "two tasks"
    register --all
    expect_status 2 "all without remove"
    register --manager module --stage '/srv/a|b'
    expect_status 2 "a stage that the notes cannot hold"
    register --manager plain --run
    expect_status 2 "run for a manager without commands"
    # A file stands where the stage's directory should be.
    touch "$root/var"
    register --manager module
    expect_status 1 "stage cannot be made"
    expect_not_said "files written" "stage cannot be made"
}

# A stage that nobody reads would take the files without a word.
test_foreign_stages() {
    root=$scratch/foreign
    mkdir -p "$root/srv/only/regs"
    register --manager section
    expect_status 2 "section without a stage"
    register --manager section --stage /srv/none
    expect_status 1 "a stage that is not there"
    expect_said "is no manager's staging area" "a stage that is not there"
    register --manager section --stage /srv/only
    expect_status 1 "a stage without mofs"
    [ -z "$(find "$root" -type f)" ] || fail "foreign stages: files written"
}

test_nothing_is_left() {
    local before
    root=$scratch/left
    mkdir -p "$root/var/lib"
    make_stage
    before=$(find "$root" | sort)
    register --manager section --stage /$stage --service cimd
    register --manager module
    register --remove --all
    expect_status 0 "remove all"
    expect_said "files removed (section)" "remove all"
    expect_said "systemctl try-restart cimd" "remove all"
    expect_said "files removed (module)" "remove all"
    [ "$(find "$root" | sort)" = "$before" ] || fail "left behind: $(find "$root" | sort)"
    register --remove --all
    expect_status 0 "remove all, again"

    # As between removal and purge of the package, or from one build to the other.
    register --manager section --stage /$stage --service cimd
    register --manager module
    register --remove --all --keep-notes
    expect_files 0 "removed, but not forgotten"
    [ ! -e "$root/var/lib/plexor-provider/stage" ] || fail "removed, but a directory is left"
    register --again
    expect_said "files written (section)" "registered again"
    expect_said "files written (module)" "registered again"
    expect_files 4 "registered again"
    register --remove --all
    [ "$(find "$root" | sort)" = "$before" ] || fail "left behind at last: $(find "$root" | sort)"
}

# What the package's upgrade does: new classes, and a manager whose stage is gone.
test_again() {
    root=$scratch/again
    mkdir "$root"
    make_stage
    register --again
    [ "$status" = 0 ] && [ -z "$said" ] || fail "again, nothing registered: $said"
    register --manager section --stage /$stage
    register --manager module
    register --again
    expect_said "was registered already (section)" "again, unchanged"
    expect_said "may still hold the library of before" "again: the library is another one"
    expect_said "cimprovider -e -m PlexorProviderModule" "again: the library is another one"
    expect_not_said "cimmof" "again, unchanged"

    cp -r "$mofs" "$scratch/newer"
    mkdir -p "$scratch/share" && mv "$scratch/newer" "$scratch/share/mof"
    ln -s "$mofs/registration" "$scratch/share/registration"
    sed -i 's/Version("1.0.0")/Version("9.0.0")/' "$scratch/share/mof/Tovexa_PlexorBattery.mof"
    PLEXOR_SHARE=$scratch/share register --again
    expect_status 0 "again, newer classes"
    grep -q 9.0.0 "$root/$staged_classes" || fail "again: the newer classes are not staged"
    # A class that the manager knows goes before it comes.
    local deleted compiled
    deleted=$(grep -n 'cimcli dc -n root/cimv2 Tovexa_PlexorBattery' <<<"$said" | cut -d: -f1)
    compiled=$(grep -n 'cimmof -n root/cimv2' <<<"$said" | cut -d: -f1)
    [ -n "$deleted" ] && [ -n "$compiled" ] && [ "$deleted" -lt "$compiled" ] ||
        fail "again, newer classes: $said"

    rm -r "${root:?}/srv"
    register --again
    expect_status 0 "again without the stage"
    expect_said "is gone, not registered again" "again without the stage"
    [ ! -e "$root/srv" ] || fail "again: a stage that nobody reads was made"
}

# Runs a manager's commands: here those that stand on the PATH.
test_run() {
    root=$scratch/run
    mkdir -p "$root" "$scratch/bin"
    local tool
    for tool in cimmof cimcli cimprovider; do
        printf '#!/bin/sh\necho "%s $*" >>%s/called\n[ ! -e %s/down ]\n' \
            "$tool" "$scratch" "$scratch" >"$scratch/bin/$tool"
        chmod +x "$scratch/bin/$tool"
    done
    PATH=$scratch/bin:$PATH register --manager module --run
    expect_status 0 "run"
    [ "$(cat "$scratch/called")" = "cimmof -n root/cimv2 $root/var/lib/plexor-provider/stage/mofs/root/cimv2/Tovexa_Plexor.mof
cimmof -n root/interop $root/var/lib/plexor-provider/stage/mofs/PlexorProviderModule.mof" ] ||
        fail "run: called $(cat "$scratch/called")"
    rm "$scratch/called"
    PATH=$scratch/bin:$PATH register --remove --all
    [ "$(wc -l <"$scratch/called")" = 8 ] || fail "run, removed: called $(cat "$scratch/called")"
    PATH=$scratch/bin:$PATH register --manager module --run --stage '/srv/with $(blanks)'
    expect_status 0 "run, a stage with blanks"
    grep -qF "root/interop $root/srv/with \$(blanks)/mofs" "$scratch/called" ||
        fail "run, blanks: called $(cat "$scratch/called")"
    PATH=$scratch/bin:$PATH register --remove --all
    touch "$scratch/down"
    PATH=$scratch/bin:$PATH register --manager module --run
    expect_status 1 "run, the manager is down"
    PATH=$scratch/bin:$PATH register --remove --all
    expect_status 0 "a manager that is down does not keep the files"
    expect_files 0 "a manager that is down does not keep the files"
}

test_builds() {
    root=$scratch/builds
    mkdir -p "$root/usr/lib/x86_64-linux-gnu/cmpi"
    local library=$root/usr/lib/x86_64-linux-gnu/cmpi/libPlexorProvider.so
    register --manager module
    expect_said "library: none in the provider directories" "no library"
    echo "PlexorProvider_Create_InstanceMI" >"$library"
    register --manager module
    expect_said "cmpi/libPlexorProvider.so: the build for standard managers" "standard build"
    echo "the manager's context table has no flush" >>"$library"
    register --manager module
    expect_said "the build for managers whose context table has flush" "build with flush"
}

# One process for all six classes.
test_one_process() {
    local section=$mofs/registration/PlexorProvider.section
    [ "$(grep -c '^   group: PlexorProvider$' "$section")" = 6 ] || fail "not all in one group"
}

test_manager section PlexorProvider.section regs/PlexorProvider.reg
test_manager module PlexorProviderModule.mof mofs/PlexorProviderModule.mof
test_manager plain PlexorProvider.plain regs/PlexorProvider.plain
test_two_managers_share_the_classes
test_chosen_places
test_refusals
test_foreign_stages
test_nothing_is_left
test_again
test_run
test_builds
test_one_process

[ $failures = 0 ] || exit 1
echo "register: fine"
