#!/usr/bin/env bash
# plexor-register --check against the test bed as manager: each thing that is missing in turn.
#
#   check_test.sh SOURCE TOOL LIBRARY
set -euo pipefail
source "$(dirname "$0")/common.sh"

register=$1/scripts/plexor-register tool=$2 library=$3
scratch=$(mktemp -d)
server=""
stop_server() { [ -z "$server" ] || { kill "$server" && wait "$server"; } 2>/dev/null || true; }
trap 'stop_server; rm -rf "$scratch"' EXIT
url="" said="" status=0

# SCENARIO [OPTION...]: the manager.
serve() {
    stop_server
    : >"$scratch/log"
    "$tool" serve --port 0 --scenario "$@" </dev/null >"$scratch/log" 2>&1 &
    server=$!
    for _ in $(seq 300); do
        url=$(sed -n 's/^serving \(.*\)\/cimom$/\1/p' "$scratch/log")
        [ -z "$url" ] || return 0
        sleep 0.1
    done
    fail "the manager does not serve: $(cat "$scratch/log")"
    finish check
}

# STATUS LINE [OPTION...]
expect_check() {
    local wanted=$1 line=$2
    shift 2
    status=0
    said=$("$register" --check --url "$url" --providers "$(dirname "$library")" "$@" 2>&1) || status=$?
    [ "$status" = "$wanted" ] || fail "status $status, not $wanted, for \"$line\": $said"
    expect_said "$line"
}
expect_said() { grep -qF -- "$1" <<<"$said" || fail "not said: \"$1\": $said"; }

# NAME JSON: a scenario with one controller of one battery, but for what JSON says.
scenario() {
    echo "{\"controllers\": [{\"id\": \"C0\", \"batteries\": [{\"id\": \"0\"}]}]$2}" >"$scratch/$1.json"
}
scenario whole ''
scenario hostless ', "host": {"absent": true}'
scenario unregistered ', "profiles": []'
echo '{"controllers": []}' >"$scratch/empty.json"

serve "$scratch/whole.json" --control "$scratch/socket"
expect_check 0 'registration: ok, six classes are answered, controllers: 1'
[ "$(grep -c ': ok, ' <<<"$said")" = 7 ] || fail "not seven lines: $said"
expect_said "library: ok, $library, the build for standard managers"
status=0
said=$("$register" --check --url "$url" --providers "$scratch/none" 2>&1) || status=$?
[ "$status" = 3 ] && grep -q '^library: missing, no libPlexorProvider.so in the provider' <<<"$said" ||
    fail "no library, status $status: $said"
"$tool" tell "$scratch/socket" \
    'server status=6 operation=GetClass class=Tovexa_PlexorBattery' >/dev/null
expect_check 5 'classes: missing, root/cimv2 lacks Tovexa_PlexorBattery'
expect_said 'registration: not asked'
"$tool" tell "$scratch/socket" 'clear server' \
    'server status=7 operation=EnumerateInstanceNames class=Tovexa_PlexorBattery' >/dev/null
expect_check 9 'registration: missing, no answer for Tovexa_PlexorBattery: status 7: not supported'
"$tool" tell "$scratch/socket" 'clear server' \
    'server trailer=1 operation=EnumerateInstanceNames class=Tovexa_PlexorBattery' >/dev/null
expect_check 9 'registration: missing, no answer for Tovexa_PlexorBattery: status 1'
"$tool" tell "$scratch/socket" 'clear server' 'server http=503' >/dev/null
expect_check 4 'HTTP status 503'

serve "$scratch/hostless.json"
expect_check 6 'host identity: missing'
expect_said 'registration: not asked, the provider would be loaded, and find nothing'
serve "$scratch/unregistered.json"
expect_check 7 'profile: missing, no vendor has registered "Host Hardware RAID Controller"'
expect_said 'controllers: not asked'
serve "$scratch/empty.json"
expect_check 8 'controllers: missing, no CIM_PortController behind the profile'

echo 'se"cr\et' >"$scratch/password"
serve "$scratch/whole.json" --user monitor --password-file "$scratch/password" --tls-self-signed
expect_check 4 'manager: missing'
expect_check 4 'HTTP status 401' --insecure
expect_check 0 'registration: ok' --insecure --user monitor --password-file "$scratch/password"

stop_server
server=""
expect_check 4 'manager: missing'

finish check
