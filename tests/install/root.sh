# shellcheck shell=bash disable=SC2154
# Shared by the tests that install packages in a Debian of their own; sourced. They need root, a mirror
# and minutes, so they are the long form of `scripts/test`.

# SOURCE: goes on only where it makes sense, in a mount namespace of its own.
require_long_form() {
    if [ -z "${PLEXOR_LONG:-}" ]; then
        echo "takes minutes and a Debian mirror; set PLEXOR_LONG to run it"
        exit 0
    fi
    [ "$(id -u)" = 0 ] || {
        echo "FAIL: a root of its own takes root"
        exit 1
    }
    if [ -z "${PLEXOR_OWN_MOUNTS:-}" ]; then
        "$1/scripts/install-deps" root
        PLEXOR_OWN_MOUNTS=yes exec unshare --mount "$0" "${arguments[@]}"
    fi
}

# SOURCE: begins such a test, with $scratch and $root, which go at its end; before that before_leaving
# is called, where the test has one.
begin_root_test() {
    require_long_form "$1"
    scratch=$(mktemp -d)
    root=$scratch/root
    trap leave_root_test EXIT
}
leave_root_test() {
    if declare -F before_leaving >/dev/null; then before_leaving; fi
    umount "$root/proc" 2>/dev/null || true
    rm -rf --one-file-system "$scratch"
}

# The Debian sources that this system's apt uses, wherever they are.
mirror_sources() {
    # shellcheck disable=SC2016
    apt-get indextargets --format '$(ORIGIN)|deb $(REPO_URI) $(RELEASE) $(COMPONENT)' \
        'Created-By: Packages' | sed -n 's/^Debian|//p' | sort -u
}

# BUILD: a minimal root as a tar file, made once a day.
base_root() {
    local tar=$1/minimal-root.tar release
    if [ -z "$(find "$tar" -mmin -1440 2>/dev/null)" ]; then
        release=$(. /etc/os-release && echo "$VERSION_CODENAME")
        mirror_sources | mmdebstrap --quiet --mode=root --format=tar --variant=minbase "$release" "$tar.new" - >&2
        mv "$tar.new" "$tar"
    fi
    echo "$tar"
}

# BUILD ROOT: unpacks it, with what programs expect of a running system.
make_root() {
    mkdir -p "$2"
    tar -xf "$(base_root "$1")" -C "$2"
    mount -t proc proc "$2/proc"
    echo "127.0.0.1 localhost" >"$2/etc/hosts"
    cp -L /etc/resolv.conf "$2/etc/resolv.conf"
    # What the host's apt was told about proxies and the like holds here too.
    apt-config dump | grep -iE '^(Acquire::.*proxy|Acquire::Check-)' >"$2/etc/apt/apt.conf.d/99host" ||
        rm -f "$2/etc/apt/apt.conf.d/99host"
    in_root "$2" apt-get update -qq
}

# ROOT COMMAND...
in_root() {
    local root=$1
    shift
    env -i PATH=/usr/sbin:/usr/bin:/sbin:/bin HOME=/root LANG=C.UTF-8 DEBIAN_FRONTEND=noninteractive \
        chroot "$root" "$@"
}

# SOURCE DIRECTORY: the Debian packages as users make them, and again as their next release.
make_packages() {
    PLEXOR_PACKAGE_DIR=$2 "$1/scripts/package"
    (cd "$2" && cpack --config "$1/build/package-deb/CPackConfig.cmake" -G DEB -B "$2" \
        -D CPACK_DEBIAN_PACKAGE_RELEASE=2) >"$2/cpack.log" 2>&1 || {
        cat "$2/cpack.log"
        exit 1
    }
    rm -rf "$2/_CPack_Packages"
}
