#compdef vclink-shell
# SPDX-License-Identifier: MIT
# Completion of vclink-shell for zsh. Commands and options are what its --help tells.

# The entries of a section in the help, each as WORD:DESCRIPTION.
_vclink_shell_entries()
{
    local section=$1
    shift
    "$@" --help 2>/dev/null | awk -v section="$section:" '
        /^[A-Z]/ { inside = ($0 == section); next }
        inside && /^  [^ ]/ {
            count = split($1, names, ",")
            sub(/^  [^ ]+ +([A-Z][A-Z]+ +)?/, "")
            for (i = 1; i <= count; i++) print names[i] ":" $0
        }'
}

_vclink_shell()
{
    local program=${(Q)words[1]} command='' index
    local -a folders entries
    for ((index = 2; index < CURRENT; ++index)); do
        case ${words[index]} in
            -C)
                folders+=(-C "${(Q)words[index + 1]}")
                ((++index))
                ;;
            --log | --lang | --progress) ((++index)) ;;
            -*) ;;
            *)
                command=${words[index]}
                break
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
        commit-m) return 1 ;;
        *)
            if [[ -z $command && ${words[CURRENT]} == -* ]]; then
                entries=("${(@f)$(_vclink_shell_entries Options "$program")}")
                _describe option entries
            elif [[ -z $command ]]; then
                entries=("${(@f)$(_vclink_shell_entries Commands "$program")}")
                _describe command entries
            elif [[ ${words[CURRENT]} == -* ]]; then
                entries=("${(@f)$(_vclink_shell_entries Options "$program" "$command")}")
                _describe option entries
            elif [[ $command == (branch|switch|merge) ]]; then
                entries=("${(@f)$("$program" "${folders[@]}" branches 2>/dev/null)}")
                compadd -- "${entries[@]}"
            else
                _files
            fi
            ;;
    esac
}

_vclink_shell "$@"
