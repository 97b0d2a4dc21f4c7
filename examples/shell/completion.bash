# SPDX-License-Identifier: MIT
# shellcheck shell=bash
# Completion of vclink-shell for bash. Commands and options come from its --help, branches and files
# from the program, remotes from git.

# Prints the names in a section of the help.
_vclink_shell_entries()
{
    local program=$1 section=$2
    shift 2
    "$program" --lang en "$@" --help 2>/dev/null | awk -v section="$section:" '
        /^[A-Z]/ { inside = ($0 == section); next }
        inside && /^  [^ ]/ {
            count = split($1, names, ",")
            for (i = 1; i <= count; i++) print names[i]
        }'
}

# Prints the names of files in these states, e.g. "modified|missing".
_vclink_shell_files()
{
    local states=$1 record
    shift
    while IFS= read -r -d '' record; do
        if [[ "|$states|" == *"|${record%%$'\t'*}|"* ]]; then printf '%s\n' "${record#*$'\t'}"; fi
    done < <("$@" status -z 2>/dev/null)
}

# _vclink_shell_arguments COMMAND COUNT PROGRAM...: prints what can follow a command after COUNT arguments.
_vclink_shell_arguments()
{
    local command=$1 count=$2
    shift 2
    local folders=("${@:2}")
    case $command in
        help) _vclink_shell_entries "$1" Commands ;;
        branch | switch) "$@" branches 2>/dev/null ;;
        merge) "$@" branches 2>/dev/null && "$@" branches -r 2>/dev/null ;;
        fetch | push | heads)
            if ((count == 0)); then
                git "${folders[@]}" remote 2>/dev/null
            elif [[ $command == push ]]; then
                "$@" branches 2>/dev/null
            fi
            ;;
        add) _vclink_shell_files unversioned "$@" ;;
        revert) _vclink_shell_files 'modified|added|deleted|missing|unknown' "$@" ;;
        resolved) _vclink_shell_files conflict "$@" ;;
    esac
}

_vclink_shell()
{
    local program=$1 current=$2 previous=$3 command='' folders=() words=() count=0 index word
    COMPREPLY=()
    for ((index = 1; index < COMP_CWORD; ++index)); do
        word=${COMP_WORDS[index]}
        case "$command$word" in
            -C)
                folders+=(-C "${COMP_WORDS[index + 1]-}")
                ((++index))
                ;;
            --log | --lang | --progress) ((++index)) ;;
            -*) ;;
            *)
                if [[ -z $command ]]; then
                    command=$word
                elif [[ $word != -* ]]; then
                    ((++count))
                fi
                ;;
        esac
    done
    case "$command$previous" in
        -C)
            mapfile -t COMPREPLY < <(compgen -d -- "$current")
            compopt -o filenames 2>/dev/null
            return
            ;;
        --log) words=(parameter progress diagnostic exception scope-entry scope-exit stack-trace all) ;;
        --lang) words=(de en ja) ;;
        --progress) words=(always auto never) ;;
        commit-m | commit-am) return ;;
        *)
            if [[ -z $command && $current == -* ]]; then
                mapfile -t words < <(_vclink_shell_entries "$program" Options)
            elif [[ -z $command ]]; then
                mapfile -t words < <(_vclink_shell_entries "$program" Commands)
            elif [[ $current == -* ]]; then
                mapfile -t words < <(_vclink_shell_entries "$program" Options "$command")
            else
                mapfile -t words < <(_vclink_shell_arguments "$command" "$count" "$program" \
                    "${folders[@]}")
            fi
            ;;
    esac
    for word in "${words[@]}"; do
        if [[ $word != "$current"* ]]; then continue; fi
        # The shell would expand some characters in names.
        printf -v word '%q' "$word"
        COMPREPLY+=("$word")
    done
}

# If there are no offers, bash offers names of files.
complete -o bashdefault -o default -F _vclink_shell vclink-shell
