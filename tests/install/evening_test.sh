#!/usr/bin/env bash
# A stranger's evening: packages into a minimal Debian, register, find out what is missing, ask,
# upgrade, change over, remove, purge; and every file accounted for.
#
#   evening_test.sh SOURCE BUILD VERSION
set -euo pipefail
arguments=("$@")
source "$(dirname "$0")/common.sh"
source "$(dirname "$0")/root.sh"

source=$1 build=$2 version=$3
begin_root_test "$source"
server=""
stop_server() { [ -z "$server" ] || { kill "$server" && wait "$server"; } 2>/dev/null || true; }
before_leaving() { stop_server; }
architecture=$(dpkg --print-architecture)
said="" status=0 port=47588

# STATUS COMMAND...: shows a command in the root, what it says, and its status.
shows() {
    local wanted=$1
    shift
    echo "\$ $*"
    status=0
    said=$(in_root "$root" "$@" 2>&1 </dev/null) || status=$?
    # Of apt's lines those about our packages.
    grep -vP '^(Unpacking|Setting up|Preparing|Removing|Purging|Selecting)(?!.*plexor)' <<<"$said" |
        grep -vE '^(Reading|Building|Selecting|\(Reading|Preparing|Need to get|After this|Get:|Fetched|debconf:|Processing triggers|Updating cert|Running hooks|done\.|E: Can not write log|  \| |Note, |Suggested|Recommended|[0-9]+ (added|upgraded)|  [a-z]|The following)' |
        sed '/^$/d' || true
    [ "$status" = 0 ] || echo "(status $status)"
    [ "$status" = "$wanted" ] ||
        fail "\"$*\": status $status, not $wanted"
}
expect_said() { grep -qF -- "$1" <<<"$said" || fail "not said: \"$1\""; }

# Everything but what dpkg, apt and the tools that they call keep about packages.
list_files() {
    (cd "$root" && find . -xdev -printf '%P %y\n' | grep -vE \
        '^(proc|var/lib/dpkg|var/lib/apt|var/cache|var/log|etc/ld.so.cache|tmp|root|etc/apt)(/| )' | sort)
}

# Each new file belongs to a package.
expect_owned() {
    local path kind stranger=""
    while read -r path kind; do
        [ "$kind" != d ] || continue
        in_root "$root" dpkg -S "/$path" >/dev/null 2>&1 ||
            in_root "$root" dpkg -S "/${path#usr/}" >/dev/null 2>&1 || stranger+=" $path"
    done < <(comm -13 <(echo "$before") <(list_files) | grep -vE '^(etc/ssl/certs|etc/ca-certificates)')
    [ -z "$stranger" ] || fail "$1: nobody's files:$stranger"
}

serve() {
    stop_server
    echo "\$ plexor-testbed serve --port $port --scenario $* &"
    # Without a shell between, so that a signal reaches it.
    env -i PATH=/usr/sbin:/usr/bin:/sbin:/bin LANG=C.UTF-8 chroot "$root" \
        plexor-testbed serve --port $port --scenario "$@" </dev/null >"$scratch/serve.log" 2>&1 &
    server=$!
    await_serving
}

await_serving() {
    for _ in $(seq 300); do
        ! grep -q '^serving ' "$scratch/serve.log" || return 0
        sleep 0.1
    done
    fail "does not serve: $(cat "$scratch/serve.log")"
}

# NAME JSON
scenario() { echo "$2" >"$root/root/$1.json"; }

package() { echo "/root/$1_$version-${2}_$architecture.deb"; }
check=(plexor-register --check --url http://localhost:$port)

make_packages "$source" "$scratch" >&2
make_root "$build" "$root"
cp "$scratch"/*.deb "$root/root/"
scenario hostless '{"controllers": [], "host": {"absent": true}}'
scenario unregistered '{"controllers": [], "profiles": []}'
scenario empty '{"controllers": []}'
# Recommended by others, too, and so not taken away again.
in_root "$root" apt-get install -y -qq ca-certificates >/dev/null 2>&1
before=$(list_files)
echo "# A minimal Debian: $(wc -l <<<"$before") files and directories."

echo; echo "# The packages"
shows 0 apt-get install -y "$(package plexor-provider 1)" "$(package plexor-testbed 1)"
expect_owned "installed"

echo; echo "# What is missing, in turn"
shows 3 "${check[@]}" --providers /usr/lib/cmpi
shows 4 "${check[@]}"
serve /root/hostless.json
shows 6 "${check[@]}"
serve /root/unregistered.json
shows 7 "${check[@]}"
serve /root/empty.json
shows 8 "${check[@]}"
serve healthy-array --control /run/array --interval 1
in_root "$root" plexor-testbed tell /run/array \
    'server status=5 operation=GetClass class=Tovexa_PlexorBattery'
shows 5 "${check[@]}"
in_root "$root" plexor-testbed tell /run/array 'clear server' \
    'server status=6 operation=EnumerateInstanceNames class=Tovexa_PlexorBattery'
shows 9 "${check[@]}"
in_root "$root" plexor-testbed tell /run/array 'clear server'
shows 0 "${check[@]}"
expect_said "the build for standard managers"

echo; echo "# Registering"
shows 2 plexor-register --manager section
shows 1 plexor-register --manager section --stage /var/lib/cim
shows 0 mkdir -p /var/lib/cim/regs /var/lib/cim/mofs/root/cimv2
shows 0 plexor-register --manager section --stage /var/lib/cim --service cimd
shows 0 plexor-register --manager module
shows 0 find /var/lib/cim /var/lib/plexor-provider -type f

echo; echo "# Asking"
shows 0 /usr/lib/nagios/plugins/check_plexor -H localhost -p $port --expect volumes=2,drives=8
in_root "$root" plexor-testbed tell /run/array 'fail drive C0 32_1'
shows 1 /usr/lib/nagios/plugins/check_plexor -H localhost -p $port --refresh 5 \
    --level FAILED=warning
for kind in small large worst; do
    serve degraded-array --manager $kind
    shows 0 "${check[@]}"
    shows 2 /usr/lib/nagios/plugins/check_plexor -H localhost -p $port
done

echo; echo "# The service's command, as a user without rights"
stop_server
unit=$(sed -n 's/^ExecStart=//p' "$root/usr/lib/systemd/system/plexor-testbed.service")
in_root "$root" sh -c 'mkdir -m 700 /run/plexor-testbed && chown nobody /run/plexor-testbed'
: >"$scratch/serve.log"
env -i PATH=/usr/sbin:/usr/bin:/sbin:/bin SCENARIO=degraded-array OPTIONS="--port $port" \
    chroot "$root" setpriv --reuid=nobody --regid=nogroup --clear-groups --no-new-privs \
    sh -c "exec $unit" </dev/null >"$scratch/serve.log" 2>&1 &
server=$!
await_serving
shows 2 /usr/lib/nagios/plugins/check_plexor -H localhost -p $port

echo; echo "# Upgrading, and changing over to the other build and back"
shows 0 apt-get install -y "$(package plexor-provider 2)" "$(package plexor-testbed 2)"
expect_said "was registered already (section)"
shows 0 apt-get install -y "$(package plexor-provider-flush 2)"
expect_said "cmpi/libPlexorProvider.so: the build for managers whose context table has flush"
expect_said "files written (module)"
shows 0 apt-get purge -y plexor-provider
[ -e "$root/var/lib/cim/regs/PlexorProvider.reg" ] || fail "changing over has unregistered"
shows 0 apt-get install -y "$(package plexor-provider 2)"
[ -e "$root/var/lib/plexor-provider/registrations" ] || fail "changing back has forgotten"

echo; echo "# Leaving"
stop_server
server=""
# As `systemctl enable` does it.
mkdir -p "$root/etc/systemd/system/multi-user.target.wants"
ln -s /usr/lib/systemd/system/plexor-testbed.service \
    "$root/etc/systemd/system/multi-user.target.wants/plexor-testbed.service"
shows 0 apt-get remove -y plexor-provider plexor-testbed
expect_said "files removed (section)"
[ -z "$(find "$root/var/lib/cim" -type f)" ] || fail "removal left $(find "$root/var/lib/cim" -type f)"
shows 0 find /var/lib/plexor-provider
[ "$(sort <<<"$said")" = "/var/lib/plexor-provider
/var/lib/plexor-provider/directories
/var/lib/plexor-provider/registrations" ] || fail "more than notes is left: $said"
shows 0 apt-get purge -y plexor-provider plexor-provider-flush plexor-testbed
shows 0 apt-get autoremove -y --purge
rm -rf "${root:?}/var/lib/cim" "$root/run/array" "$root/run/plexor-testbed"
rmdir --ignore-fail-on-non-empty -p "$root/etc/systemd/system/multi-user.target.wants" 2>/dev/null || true
shows 0 find / -xdev -iname '*plexor*' -not -path '/proc/*' -not -path '/root/*' -not -path '/var/lib/dpkg/*'
[ -z "$said" ] || fail "left behind: $said"
difference=$(diff <(echo "$before") <(list_files)) ||
    fail "files differ from before: $(head -n 40 <<<"$difference")"
echo "# $(list_files | wc -l) files and directories, the same as before."

finish "evening"
