# shellcheck shell=bash disable=SC2154
# Part of plexor-register: which build of the provider is there.

# The directories that managers of this system look for libraries in, as far as they are there. The
# first is the one that this tool was installed with.
provider_directories() {
    local directory
    for directory in "${root%/}"/usr/lib/*-linux-gnu*/cmpi "${root%/}"/usr/lib64/cmpi \
        "${root%/}"/usr/lib/cmpi "${root%/}"/usr/local/lib*/cmpi; do
        [ ! -d "$directory" ] || echo "$directory"
    done
}

# find_library DIRECTORIES: the first that has it; nothing when none has.
find_library() {
    local directory
    while read -r directory; do
        if [ -r "$directory/libPlexorProvider.so" ]; then
            echo "$directory/libPlexorProvider.so"
            return
        fi
    done <<<"$1"
}

# build_of LIBRARY: only the build for managers with a flush has something to say about its absence.
build_of() {
    if ! grep -q PlexorProvider_Create_InstanceMI "$1"; then
        echo unknown
    elif grep -q "context table has no flush" "$1"; then
        echo flush
    else
        echo standard
    fi
}

describe_build() {
    case $1 in
        flush) echo "the build for managers whose context table has flush" ;;
        standard) echo "the build for standard managers" ;;
        *) echo "not the provider" ;;
    esac
}

report_build() {
    local library
    library=$(find_library "$(provider_directories)")
    if [ -n "$library" ]; then
        echo "library $library: $(describe_build "$(build_of "$library")")"
    else
        echo "library: none in the provider directories of this system"
    fi
}
