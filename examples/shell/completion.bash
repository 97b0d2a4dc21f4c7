# SPDX-License-Identifier: MIT
# shellcheck shell=bash
# Completion of vclink-shell for bash. Commands and options are what its --help tells.

# The first words of the entries of a section in the help: all that stand before the blanks.
_vclink_shell_entries()
{
    local section=$1
    shift
    "$@" --help 2>/dev/null | awk -v section="$section:" '
        /^[A-Z]/ { inside = ($0 == section); next }
        inside && /^  [^ ]/ {
            count = split($1, names, ",")
            for (i = 1; i <= count; i++) print names[i]
        }'
}

_vclink_shell()
{
    local program=$1 current=$2 previous=$3 words='' command='' folders=() index word
    COMPREPLY=()
    for ((index = 1; index < COMP_CWORD; ++index)); do
        word=${COMP_WORDS[index]}
        case "$word" in
            -C)
                folders+=(-C "${COMP_WORDS[index + 1]-}")
                ((++index))
                ;;
            --log | --lang | --progress) ((++index)) ;;
            -*) ;;
            *)
                command=$word
                break
                ;;
        esac
    done
    case "$command$previous" in
        -C)
            mapfile -t COMPREPLY < <(compgen -d -- "$current")
            compopt -o filenames 2>/dev/null
            return
            ;;
        --log) words='parameter progress diagnostic exception scope-entry scope-exit stack-trace all' ;;
        --lang) words='de en ja' ;;
        --progress) words='always auto never' ;;
        commit-m) return ;;
        *)
            if [[ -z $command && $current == -* ]]; then
                words=$(_vclink_shell_entries Options "$program")
            elif [[ -z $command ]]; then
                words=$(_vclink_shell_entries Commands "$program")
            elif [[ $current == -* ]]; then
                words=$(_vclink_shell_entries Options "$program" "$command")
            elif [[ $command == branch || $command == switch || $command == merge ]]; then
                words=$("$program" "${folders[@]}" branches 2>/dev/null)
            fi
            ;;
    esac
    if [[ -n $words ]]; then
        while read -r word; do
            if [[ $word != "$current"* ]]; then continue; fi
            # Names of branches may hold what the shell would expand.
            printf -v word '%q' "$word"
            COMPREPLY+=("$word")
        done < <(tr -s ' ' '\n' <<<"$words")
    fi
}

# Where nothing is offered, the names of files are.
complete -o bashdefault -o default -F _vclink_shell vclink-shell
