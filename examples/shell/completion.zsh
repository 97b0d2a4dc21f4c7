#compdef vclink-shell
# SPDX-License-Identifier: MIT
# Completion of vclink-shell for zsh. Commands and options come from its --help, branches and files
# from the program, remotes from git.

# The entries of a section in the help, each as WORD:DESCRIPTION.
_vclink_shell_entries()
{
    local program=$1 section=$2
    shift 2
    "$program" --lang en "$@" --help 2>/dev/null | awk -v section="$section:" '
        /^[A-Z]/ { inside = ($0 == section); next }
        inside && /^  [^ ]/ {
            count = split($1, names, ",")
            sub(/^  [^ ]+ +([A-Z][A-Z]+ +)?/, "")
            for (i = 1; i <= count; i++) print names[i] ":" $0
        }'
}

# Names of files in these states, e.g. "modified|missing", in reply.
_vclink_shell_files()
{
    local states=$1 record
    shift
    reply=()
    for record in "${(@0)$("$@" status -z 2>/dev/null)}"; do
        [[ "|$states|" == *"|${record%%$'\t'*}|"* ]] && reply+=("${record#*$'\t'}")
    done
}

_vclink_shell_arguments()
{
    local command=$1 count=$2
    shift 2
    local -a names folders=("${@[2,-1]}") reply
    case $command in
        help)
            names=("${(@f)$(_vclink_shell_entries "$1" Commands)}")
            _describe command names
            return
            ;;
        branch | switch) reply=("${(@f)$("$@" branches 2>/dev/null)}") ;;
        merge)
            reply=("${(@f)$("$@" branches 2>/dev/null)}" "${(@f)$("$@" branches -r 2>/dev/null)}")
            ;;
        fetch | push | heads)
            if ((count == 0)); then
                reply=("${(@f)$(git "${folders[@]}" remote 2>/dev/null)}")
            elif [[ $command == push ]]; then
                reply=("${(@f)$("$@" branches 2>/dev/null)}")
            fi
            ;;
        add) _vclink_shell_files unversioned "$@" ;;
        revert) _vclink_shell_files 'modified|added|deleted|missing|unknown' "$@" ;;
        resolved) _vclink_shell_files conflict "$@" ;;
    esac
    reply=(${reply:#})
    if (($#reply)) && compadd -- "${reply[@]}"; then return; fi
    _files
}

_vclink_shell()
{
    local program=${(Q)words[1]} command='' index
    local -a folders entries
    integer count=0
    for ((index = 2; index < CURRENT; ++index)); do
        case $command${words[index]} in
            -C)
                folders+=(-C "${(Q)words[index + 1]}")
                ((++index))
                ;;
            --log | --lang | --progress) ((++index)) ;;
            -*) ;;
            *)
                if [[ -z $command ]]; then
                    command=${words[index]}
                elif [[ ${words[index]} != -* ]]; then
                    ((++count))
                fi
                ;;
        esac
    done
    case "$command${words[CURRENT - 1]}" in
        -C) _files -/ ;;
        --log)
            _values -s , severity parameter progress diagnostic exception scope-entry scope-exit \
                stack-trace all
            ;;
        --lang) compadd -- de en ja ;;
        --progress) compadd -- always auto never ;;
        commit-m | commit-am) return 1 ;;
        *)
            if [[ -z $command && ${words[CURRENT]} == -* ]]; then
                entries=("${(@f)$(_vclink_shell_entries "$program" Options)}")
                _describe option entries
            elif [[ -z $command ]]; then
                entries=("${(@f)$(_vclink_shell_entries "$program" Commands)}")
                _describe command entries
            elif [[ ${words[CURRENT]} == -* ]]; then
                entries=("${(@f)$(_vclink_shell_entries "$program" Options "$command")}")
                _describe option entries
            else
                _vclink_shell_arguments $command $count "$program" "${folders[@]}"
            fi
            ;;
    esac
}

_vclink_shell "$@"
