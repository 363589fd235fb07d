# shellcheck shell=bash disable=SC2154
# Part of plexor-register: asks the manager, over CIM-XML, for everything that the provider needs. The
# provider itself is asked last and only when nothing is missing: a manager loads it for that, and
# one that finds no array then may not look again before the manager is restarted.

profile_name="Host Hardware RAID Controller"
most_profiles=8
verdict=0

fine() { echo "$1: ok, $2"; }

# missing STATUS WHAT TEXT: the first one decides the exit status.
missing() {
    echo "$2: missing, $3"
    [ "$verdict" != 0 ] || verdict=$1
}

skipped() { echo "$1: not asked, $2"; }

# ---- the wire

prepare_curl() {
    command -v curl >/dev/null || refuse "--check needs curl"
    curl_options=(--silent --show-error --max-time "$timeout" --dump-header "$scratch/head"
        --output "$scratch/body" --data-binary "@$scratch/request"
        --header 'Content-Type: application/xml; charset="utf-8"'
        --header 'CIMOperation: MethodCall' --header 'Expect:' --header 'TE: trailers')
    [ -z "$ca_file" ] || curl_options+=(--cacert "$ca_file")
    [ -z "$insecure" ] || curl_options+=(--insecure)
    [ -n "$user" ] || return 0
    local password=""
    if [ -n "$password_file" ]; then
        IFS= read -r password <"$password_file" || [ -n "$password" ] ||
            refuse "no password in $password_file"
    fi
    # Not as an argument: everybody on the host could read it there.
    local login="$user:$password"
    login=${login//\\/\\\\}
    (umask 077 && printf 'user = "%s"\n' "${login//\"/\\\"}" >"$scratch/curlrc")
    curl_options+=(--config "$scratch/curlrc")
}

# write_request METHOD NAMESPACE PARAMETERS
write_request() {
    local part
    {
        echo '<?xml version="1.0" encoding="utf-8"?>'
        echo '<CIM CIMVERSION="2.0" DTDVERSION="2.0"><MESSAGE ID="1" PROTOCOLVERSION="1.0">'
        echo "<SIMPLEREQ><IMETHODCALL NAME=\"$1\"><LOCALNAMESPACEPATH>"
        for part in ${2//\// }; do echo "<NAMESPACE NAME=\"$part\"/>"; done
        echo "</LOCALNAMESPACEPATH>$3</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>"
    } >"$scratch/request"
}

parameter() { printf '<IPARAMVALUE NAME="%s">%s</IPARAMVALUE>' "$1" "$2"; }
class_parameter() { parameter "$1" "<CLASSNAME NAME=\"$2\"/>"; }
# Inherited properties as well, and those of subclasses.
instances_of() {
    class_parameter ClassName "$1"
    parameter LocalOnly "<VALUE>FALSE</VALUE>"
    parameter DeepInheritance "<VALUE>TRUE</VALUE>"
}

# ask METHOD NAMESPACE PARAMETERS: the answer in one line in $scratch/answer; else false, with the
# reason in `failure` and the manager's status in `status`.
ask() {
    status="" failure=""
    write_request "$@"
    failure=$(curl "${curl_options[@]}" --header "CIMMethod: $1" \
        --header "CIMObject: ${2//\//%2F}" "${url%/}/cimom" 2>&1) || return 1
    failure=""
    tr -d '\r' <"$scratch/head" >"$scratch/lines"
    tr '\r\n\t' '   ' <"$scratch/body" | sed 's/> *</></g' >"$scratch/answer"
    local code
    code=$(sed -n 's/^HTTP[^ ]* \([0-9]*\).*/\1/p' "$scratch/lines" | tail -n 1)
    if [ "$code" != 200 ]; then
        failure="HTTP status $code"
    elif status=$(status_of_answer) && [ -n "$status" ]; then
        failure="status $status$(meaning_of "$status")"
    elif ! grep -q "<IMETHODRESPONSE [^>]*NAME=\"$1\"" "$scratch/answer"; then
        failure="no answer of a CIM object manager"
    fi
    [ -z "$failure" ]
}

# In the message, or behind a body that came in pieces.
status_of_answer() {
    grep -o '<ERROR [^>]*>' "$scratch/answer" | sed 's/.*CODE="\([0-9]*\)".*/\1/' | head -n 1 |
        grep . || sed -n 's/^CIMStatusCode: *\([1-9][0-9]*\) *$/\1/Ip' "$scratch/lines"
}

meaning_of() {
    case $1 in
        1) echo ": failed; with some managers, the library is in none of its directories" ;;
        2) echo ": access denied" ;;
        3) echo ": no such namespace" ;;
        5) echo ": no such class" ;;
        6) echo ": not found; with some managers, the library" ;;
        7) echo ": not supported; with some managers, the provider is disabled" ;;
    esac
}

# Elements of an answer, one a line.
elements() { sed "s/<$1>/\n&/g" "$scratch/answer" | grep "^<$1>" || true; }
count_elements() { grep -o "<$1[ >]" "$scratch/answer" | wc -l; }

# ---- what is looked for

check_library() {
    local directories library elsewhere
    directories=$(provider_directories)
    [ -z "$providers" ] || directories=$(tr : '\n' <<<"$providers")
    library=$(find_library "$directories")
    if [ -n "$library" ] && [ "$(build_of "$library")" != unknown ]; then
        fine library "$library, $(describe_build "$(build_of "$library")")"
        return
    fi
    elsewhere=$(find_library "$(provider_directories)")
    missing 3 library "no libPlexorProvider.so in the provider directories\
${directories:+ (${directories//$'\n'/, })}${elsewhere:+; it lies in $(dirname "$elsewhere")}"
}

check_answering() {
    # Any class will do; whoever refuses it has answered, too.
    if ask EnumerateInstanceNames root/interop "$(class_parameter ClassName CIM_RegisteredProfile)" ||
        [ -n "$status" ]; then
        fine manager "$url answers"
        return
    fi
    missing 4 manager "$url: ${failure#curl: }"
    return 1
}

check_classes() {
    local name absent=()
    while read -r name; do
        ask GetClass root/cimv2 "$(class_parameter ClassName "$name")" || absent+=("$name")
    done < <(class_names)
    if [ ${#absent[@]} = 0 ]; then
        fine classes "all six are defined in root/cimv2"
    else
        missing 5 classes "root/cimv2 lacks ${absent[*]}; the last answer: ${failure:-fine}"
    fi
}

check_identity() {
    local what="host identity"
    if ! ask EnumerateInstances root/cimv2 "$(instances_of OMC_UnitaryComputerSystem)"; then
        missing 6 "$what" "OMC_UnitaryComputerSystem in root/cimv2: $failure"
    elif ! elements VALUE.NAMEDINSTANCE | grep -qE '<PROPERTY [^>]*NAME="Name"[^>]*><VALUE>[^<]'; then
        missing 6 "$what" "no instance of OMC_UnitaryComputerSystem with a Name in root/cimv2"
    else
        fine "$what" "OMC_UnitaryComputerSystem in root/cimv2"
    fi
}

# The paths of the profiles go to $scratch/profiles.
check_profile() {
    local named='<PROPERTY [^>]*NAME="RegisteredName"[^>]*><VALUE>'"$profile_name"'</VALUE>' count
    : >"$scratch/profiles"
    if ! ask EnumerateInstances root/interop "$(instances_of CIM_RegisteredProfile)"; then
        missing 7 profile "CIM_RegisteredProfile in root/interop: $failure"
        return
    fi
    elements VALUE.NAMEDINSTANCE | grep "$named" | grep -o '<INSTANCENAME .*</INSTANCENAME>' \
        >"$scratch/profiles" || true
    count=$(wc -l <"$scratch/profiles")
    if [ "$count" = 0 ]; then
        missing 7 profile "no vendor has registered \"$profile_name\" in root/interop"
    elif [ "$count" -gt "$most_profiles" ]; then
        missing 7 profile "$count are registered; of more than $most_profiles none is used"
    else
        fine profile "$count of \"$profile_name\" in root/interop"
    fi
}

# walk NAMESPACE PATH ASSOCIATION RESULT: "NAMESPACE PATH" of what is there in $scratch/found.
walk() {
    local line
    : >"$scratch/found"
    ask AssociatorNames "$1" "$(parameter ObjectName "$2")$(class_parameter AssocClass "$3"
    )$(class_parameter ResultClass "$4")" || return 1
    elements OBJECTPATH | while read -r line; do
        printf '%s %s\n' "$(grep -o '<NAMESPACE NAME="[^"]*"' <<<"$line" |
            sed 's/.*NAME="\(.*\)"/\1/' | paste -sd /)" \
            "$(grep -o '<INSTANCENAME .*</INSTANCENAME>' <<<"$line")"
    done >"$scratch/found"
}

check_controllers() {
    local profile name_space path total=0
    : >"$scratch/ports"
    while read -r profile; do
        walk root/interop "$profile" CIM_ElementConformsToProfile CIM_PortController || break
        cat "$scratch/found" >>"$scratch/ports"
    done <"$scratch/profiles"
    while read -r name_space path; do
        walk "$name_space" "$path" CIM_LogicalIdentity CIM_ComputerSystem || break
        [ ! -s "$scratch/found" ] || total=$((total + 1))
    done <"$scratch/ports"
    if [ -n "$failure" ]; then
        missing 8 controllers "the vendor's associations cannot be followed: $failure"
    elif [ ! -s "$scratch/ports" ]; then
        missing 8 controllers "no CIM_PortController behind the profile (CIM_ElementConformsToProfile)"
    elif [ $total = 0 ]; then
        missing 8 controllers "no CIM_ComputerSystem behind a CIM_PortController (CIM_LogicalIdentity)"
    else
        fine controllers "$total behind the profile"
    fi
}

check_registration() {
    local name absent=() reason="" controllers=0
    while read -r name; do
        if ! ask EnumerateInstanceNames root/cimv2 "$(class_parameter ClassName "$name")"; then
            absent+=("$name")
            reason=$failure
        elif [ "$name" = Tovexa_PlexorController ]; then
            controllers=$(count_elements INSTANCENAME)
        fi
    done < <(class_names)
    if [ ${#absent[@]} -gt 0 ]; then
        missing 9 registration "no answer for ${absent[*]}: $reason"
    elif [ "$controllers" = 0 ]; then
        missing 9 registration "six classes are answered, but no controller: a class that is not \
registered looks like that, and so does a provider that was loaded before the array was there; \
restart the manager"
    else
        fine registration "six classes are answered, controllers: $controllers"
    fi
}

check_manager() {
    scratch=$(mktemp -d)
    trap 'rm -rf "$scratch"' EXIT
    prepare_curl
    check_library
    check_answering || exit "$verdict"
    check_classes
    check_identity
    check_profile
    if [ -s "$scratch/profiles" ]; then
        check_controllers
    else
        skipped controllers "there is no profile to begin at"
    fi
    if [ "$verdict" = 0 ] || [ "$verdict" = 3 ]; then
        check_registration
    else
        skipped registration "the provider would be loaded, and find nothing"
    fi
    exit "$verdict"
}
