# shellcheck shell=bash disable=SC2034,SC2154
# Part of plexor-register: writes registrations, takes them back, and notes what was written, so
# that upgrade and removal of the package find it again.

# The registration of each kind of manager: where it comes from, and its place below the stage.
declare -A sources=(
    [section]=PlexorProvider.section
    [module]=PlexorProviderModule.mof
    [plain]=PlexorProvider.plain
)
declare -A targets=(
    [section]=regs/PlexorProvider.reg
    [module]=mofs/PlexorProviderModule.mof
    [plain]=regs/PlexorProvider.plain
)
own_stage=/var/lib/plexor-provider/stage

notes_dir() { echo "${root%/}/var/lib/plexor-provider"; }

# All classes in one text without includes: a manager may compile every file of its stage, and must
# not meet a class twice.
print_classes() {
    local file
    sed -n 's/^#pragma include ("\(.*\)")$/\1/p' "$mofs/Tovexa_Plexor.mof" |
        while read -r file; do cat "$mofs/$file"; done
}

# Notes the directories that have to be made, the outermost first.
make_directory() {
    local missing=$1 made="" notes
    notes=$(notes_dir)
    [ "$1" = "$notes" ] || make_directory "$notes"
    while [ ! -d "$missing" ]; do
        made=$missing${made:+$'\n'$made}
        missing=$(dirname "$missing")
    done
    [ -n "$made" ] || return 0
    mkdir -p "$1" 2>/dev/null || refuse "cannot make $1"
    echo "$made" >>"$notes/directories" || refuse "cannot write $notes/directories"
}

# put SOURCE TARGET: a reader of TARGET sees the old or the new file, never half of one.
put() {
    if cmp -s "$1" "$2"; then
        echo "unchanged $2"
        return
    fi
    make_directory "$(dirname "$2")"
    install -m 644 "$1" "$2.new" || refuse "cannot write $2"
    mv -f "$2.new" "$2"
    echo "written $2"
    changed=1
}

take() {
    if [ ! -e "$1" ]; then
        echo "not there $1"
        return
    fi
    rm -f "$1" || refuse "cannot remove $1"
    echo "removed $1"
    changed=1
}

# Whether another kind of registration in the same stage still needs the classes.
classes_needed() {
    local other
    for other in "${targets[@]}"; do
        [ ! -e "$stage_dir/$other" ] || return 0
    done
    return 1
}

# A directory that nobody reads would take the files, and read like success.
require_stage() {
    if [ -z "$stage" ]; then
        [ "$manager" != section ] ||
            refuse "--stage is missing: the manager's staging area, which has regs and mofs in it" 2
        stage=$own_stage
    fi
    # The notes have a line for each registration, with fields that a bar ends.
    case $stage$service$interop in
        *'|'* | *$'\n'*) refuse "a bar or line end in --stage, --service or --interop" 2 ;;
    esac
    stage_dir=${root%/}/${stage#/}
    [ "$manager" = section ] && [ -z "$remove" ] || return 0
    [ -d "$stage_dir/regs" ] && [ -d "$stage_dir/mofs" ] ||
        refuse "$stage_dir is no manager's staging area: it lacks regs or mofs"
}

register() {
    print_classes >"$scratch/classes" || refuse "cannot read the classes in $mofs"
    if [ -e "$classes" ] && ! cmp -s "$scratch/classes" "$classes"; then classes_differ=1; fi
    if [ -e "$registration" ]; then known_before=1; fi
    put "$registrations/${sources[$manager]}" "$registration"
    put "$scratch/classes" "$classes"
    note_registration
}

unregister() {
    take "$registration"
    if classes_needed; then
        echo "kept $classes: in use by another registration"
    else
        take "$classes"
    fi
    forget_registration
}

# One line for each registration: kind, stage, service, interop namespace, whether to run commands.
record_line() { printf '%s|%s|%s|%s|%s\n' "$manager" "$stage" "$service" "$interop" "$run"; }

other_records() {
    local notes
    notes=$(notes_dir)/registrations
    [ ! -e "$notes" ] || awk -F'|' -v manager="$manager" -v stage="$stage" \
        '!($1 == manager && $2 == stage)' "$notes"
}

note_registration() {
    local notes
    notes=$(notes_dir)/registrations
    make_directory "$(notes_dir)"
    { other_records; record_line; } >"$scratch/registrations"
    install -m 644 "$scratch/registrations" "$notes" || refuse "cannot write $notes"
}

forget_registration() {
    local notes
    notes=$(notes_dir)
    [ -d "$notes" ] || return 0
    [ -z "$keep_notes" ] || return 0
    other_records >"$scratch/registrations"
    if [ -s "$scratch/registrations" ]; then
        install -m 644 "$scratch/registrations" "$notes/registrations"
        return
    fi
    rm -f "$notes/registrations"
    remove_directories
}

# The directories that were made for registrations, as far as they are empty.
remove_directories() {
    local notes directory
    notes=$(notes_dir)
    [ -e "$notes/directories" ] || return 0
    LC_ALL=C sort -ru "$notes/directories" >"$scratch/directories"
    rm -f "$notes/directories"
    while read -r directory; do
        rmdir --ignore-fail-on-non-empty "$directory" 2>/dev/null || true
        # That of the notes stays with them.
        [ -z "$keep_notes" ] || [ ! -d "$directory" ] || echo "$directory" >>"$notes/directories"
    done <"$scratch/directories"
}

handle_registration() {
    local known_before=0 classes_differ=0 done_
    changed=0
    require_stage
    classes=$stage_dir/mofs/root/cimv2/Tovexa_Plexor.mof
    registration=$stage_dir/${targets[$manager]}
    if [ -n "$remove" ]; then
        unregister
        [ $changed = 1 ] && done_="files removed" || done_="was not registered"
    else
        report_build
        register
        [ $changed = 1 ] && done_="files written" || done_="was registered already"
    fi
    echo "plexor-register: PlexorProvider $done_ ($manager)"
    # After an upgrade the library is another one, also where the files are the same.
    if [ $changed = 1 ] || [ -n "$again" ]; then finish_registration; fi
}

# for_each_record COMMAND
for_each_record() {
    local notes line
    notes=$(notes_dir)/registrations
    [ -e "$notes" ] || return 0
    mapfile -t lines <"$notes"
    for line in "${lines[@]}"; do
        IFS='|' read -r manager stage service interop run <<<"$line"
        "$1"
    done
    [ -z "$keep_notes" ] || remove_directories
}

# A manager that was taken away has taken its stage with it: that is no reason to fail.
repeat_record() {
    if [ -n "$again" ] && [ ! -d "${root%/}/${stage#/}" ] && [ "$manager" = section ]; then
        echo "plexor-register: $stage is gone, not registered again" >&2
        return
    fi
    (handle_registration) || echo "plexor-register: $manager, $stage: not done" >&2
}
