#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# documents.bash SHELL MAN COMPLETION: every command and option in the help of vclink-shell is in
# the manual page, and the completion offers it.
set -euo pipefail

shell=$1 manual=$2
# shellcheck source=/dev/null
source "$3"
failures=0

complain()
{
    echo "$*" >&2
    failures=$((failures + 1))
}

# entries SECTION COMMAND...: read here with other means than the completion's.
entries()
{
    local section=$1
    shift
    "$shell" "$@" --help | sed -n "/^$section:\$/,/^\$/p" |
        grep -oE '^  [^ ]+' | tr -d ' ' | tr ',' '\n'
}

# The manual page's lines between two headings, without the marks of its layout.
part()
{
    sed -n "/^$1\$/,/^\.S[HS]/{/^$1\$/d;/^\.S[HS]/d;p}" "$manual" | sed -e 's/\\f[BIPR]//g' -e 's/\\-/-/g'
}

# has LINES LINE
has()
{
    [[ $'\n'$1$'\n' == *$'\n'"$2"$'\n'* ]]
}

offers()
{
    COMP_WORDS=(vclink-shell "$@")
    COMP_CWORD=$#
    _vclink_shell "$shell" "${COMP_WORDS[COMP_CWORD]}" "${COMP_WORDS[COMP_CWORD - 1]}"
    printf '%s\n' "${COMPREPLY[@]-}"
}

mapfile -t commands < <(entries Commands)
((${#commands[@]} > 10)) || complain "the help tells of ${#commands[@]} commands"
for command in "${commands[@]}"; do
    grep -qxF -- ".SS $command" "$manual" || complain "the manual page does not have $command"
    has "$(offers "${command:0:1}")" "$command" || complain "$command is not offered"
    for option in $(entries Options "$command"); do
        if [[ $option != -h && $option != --help ]]; then
            grep -qE -- "(^|, )$option(,| |\$)" <<<"$(part "\.SS $command")" ||
                complain "the manual page does not have $option of $command"
        fi
        has "$(offers "$command" -)" "$option" ||
            complain "$option of $command is not offered"
    done
done
for option in $(entries Options); do
    grep -qE -- "(^|, )$option(,| |\$)" <<<"$(part '\.SH OPTIONS')" ||
        complain "the manual page does not have $option"
    has "$(offers -)" "$option" || complain "$option is not offered"
done

[[ $(offers --progress a) == $'always\nauto' ]] || complain "the values of --progress are not offered"
[[ $(offers --log stack) == stack-trace ]] || complain "the values of --log are not offered"
[[ -z $(offers -C /nowhere status m) ]] || complain "a path is taken for a command"

copy=$(mktemp -d)
trap 'rm -rf "$copy"' EXIT
export HOME=$copy GIT_CONFIG_NOSYSTEM=1
git init --quiet --initial-branch=main "$copy/birds"
git -C "$copy/birds" -c user.name=A -c user.email=a@example.org commit --quiet --allow-empty -m B
git -C "$copy/birds" branch "sea\$(id)"
[[ $(offers -C "$copy/birds" switch s) == "sea\\\$\\(id\\)" ]] || complain "no branch is offered"
git -C "$copy/birds" remote add nest "$copy/nest"
touch "$copy/birds/a new one" "$copy/birds/tracked"
git -C "$copy/birds" add tracked
[[ $(offers -C "$copy/birds" fetch n) == nest ]] || complain "no remote is offered"
[[ $(offers -C "$copy/birds" push nest m) == main ]] || complain "no branch to push is offered"
[[ $(offers -C "$copy/birds" add "") == 'a\ new\ one' ]] || complain "no new file is offered"
[[ $(offers -C "$copy/birds" revert "") == tracked ]] || complain "no changed file is offered"
[[ $(offers help sta) == $'status\nstate' ]] || complain "no command is offered to help"

exit $((failures > 0))
