#!/usr/bin/env bash
# Makes the RPM packages and looks at what is in them.
#
#   rpm_test.sh SOURCE VERSION
set -euo pipefail
source "$(dirname "$0")/common.sh"

source=$1 version=$2
if [ -z "${PLEXOR_LONG:-}" ]; then
    echo "builds everything anew; set PLEXOR_LONG to run it"
    exit 0
fi
scratch=$(mktemp -d)
trap 'rm -rf "$scratch"' EXIT
PLEXOR_PACKAGE_DIR=$scratch "$source/scripts/package" rpm
with_standard=yes
architecture=$(rpm --eval '%{_arch}')

# PACKAGE: its files are those on standard input.
expect_package() {
    local file=$scratch/$1-$version-1.$architecture.rpm expected found
    expected=$(sed -E 's/^.{4}//; s|(/man/.*)$|\1.gz|')
    found=$(rpm -qp --qf '[%{FILEMODES:perms} %{FILENAMES}\n]' "$file" | sed -n 's|^[-l][^ ]* /||p')
    expect_same_files "$expected" "$found"
    [ "$(rpm -qp --qf '[%{FILEUSERNAME}\n]' "$file" | sort -u)" = root ] || fail "$1: not root's"
    [ "$(rpm -qp --qf '%{NAME} %{LICENSE}' "$file")" = "$1 not stated" ] || fail "$1: name or licence"
    ! rpm -qpl "$file" | grep -qxE '/usr/(sbin|lib64|lib64/cmpi|lib/systemd|share/man)' ||
        fail "$1: takes directories of the system's"
}

# PACKAGE SCRIPTLET PATTERN
expect_scriptlet() {
    grep -qE "$3" <<<"$(rpm -qp --qf "%{$2}" "$scratch/$1-$version-1.$architecture.rpm")" ||
        fail "$1: $2"
}

for package in plexor-provider plexor-provider-flush; do
    expected_provider_files "$source" lib64 $package | expect_package $package
    expect_scriptlet $package POSTIN 'plexor-register --again'
    expect_scriptlet $package PREUN 'plexor-register --remove --all'
done
rpm -qp --conflicts "$scratch/plexor-provider-$version-1.$architecture.rpm" |
    grep -qx plexor-provider-flush || fail "both builds can be installed at once"
expected_testbed_files "$source" lib64 | expect_package plexor-testbed
expect_scriptlet plexor-testbed PREUN 'disable --now plexor-testbed.service'
! rpm -qp --requires "$scratch/plexor-testbed-$version-1.$architecture.rpm" | grep -q plexor ||
    fail "the test bed needs the provider"

# PACKAGE BUILD_KIND
expect_packed_build() {
    mkdir "$scratch/$1"
    rpm2archive - <"$scratch/$1-$version-1.$architecture.rpm" | tar -xz -C "$scratch/$1"
    expect_build "$scratch/$1/usr/lib64/cmpi/libPlexorProvider.so" "$2"
}
expect_packed_build plexor-provider standard
expect_packed_build plexor-provider-flush flush

finish "rpm"
