# shellcheck shell=bash disable=SC2154
# Part of plexor-register: the commands that make a manager take up what was written.

class_names() { sed -n 's/^\[\(.*\)\]$/\1/p' "$registrations/PlexorProvider.section"; }

# As a manager of the kind "module" wants it: a class that it knows in the same version is left as it
# is, or refused, so what was there goes first.
print_module_removal() {
    echo "cimprovider -d -m PlexorProviderModule"
    echo "cimprovider -r -m PlexorProviderModule"
    print_class_removal
}

print_class_removal() {
    local name
    while read -r name; do echo "cimcli dc -n root/cimv2 $name"; done < <(class_names)
}

print_module_steps() {
    if [ -n "$remove" ]; then
        print_module_removal
        return
    fi
    if [ "$known_before" = 1 ] && [ "$changed" = 1 ]; then print_module_removal; fi
    if [ "$changed" = 0 ]; then
        # The files are as before, the library is not.
        echo "cimprovider -d -m PlexorProviderModule"
        echo "cimprovider -e -m PlexorProviderModule"
        return
    fi
    printf 'cimmof -n root/cimv2 %q\n' "$classes"
    printf 'cimmof -n %q %q\n' "$interop" "$registration"
}

print_restart() {
    if [ -n "$service" ]; then
        printf 'systemctl try-restart %q\n' "$service"
    else
        echo "restart the manager (--service NAME prints the command)"
    fi
}

print_plain_removal() {
    local name
    echo "take the six classes out with the manager's own tool, or"
    while read -r name; do
        echo "wbemcli dc http://localhost:5988/root/cimv2:$name"
    done < <(class_names)
}

# Lines for the administrator; of a manager of the kind "module", commands and nothing else.
print_steps() {
    case $manager in
        module) print_module_steps ;;
        section)
            [ "$changed" = 0 ] ||
                echo "rebuild the class repository from the stage with the manager's own tool"
            print_restart
            ;;
        plain)
            if [ -n "$remove" ]; then
                print_plain_removal
            elif [ "$changed" = 1 ]; then
                [ "$classes_differ" = 0 ] || print_plain_removal
                echo "give $registration and $classes to the manager's own tool"
            fi
            print_restart
            ;;
    esac
}

run_steps() {
    local step failed=0
    while read -r step; do
        echo "running: $step"
        # What is not there any more cannot be taken away.
        bash -c "$step" </dev/null || { [ -n "$remove" ] || failed=1; }
    done <"$scratch/steps"
    [ $failed = 0 ] || refuse "the manager has not taken all of it; does it run?"
}

finish_registration() {
    print_steps >"$scratch/steps"
    if [ -n "$run" ]; then
        run_steps
        return
    fi
    if [ -n "$remove" ]; then
        echo "next, for the manager still knows it:"
    elif [ "$changed" = 0 ]; then
        echo "next, for the manager may still hold the library of before:"
    else
        echo "next, for the manager does not know it yet:"
    fi
    sed 's/^/    /' "$scratch/steps"
}
