# SPDX-License-Identifier: MIT
# shellcheck shell=bash disable=SC2154
# Functions that all parts of the demonstration use. The script that sources this file then sets `shell`, the
# program to show, and `answer`, a file for its output.

fail()
{
    echo "demo: $*" >&2
    exit 1
}

say()
{
    printf '\n%s\n' "$*"
}

# run_in FOLDER PROMPT STATUS ARGUMENT...: shows a command and its output. Fails if its status is not STATUS.
run_in()
{
    local folder=$1 prompt=$2 wanted=$3 status=0 shown
    shift 3
    printf -v shown ' %q' "$@"
    echo "  $prompt\$ vclink-shell$shown"
    "$shell" -C "$folder" "$@" >"$answer" 2>&1 </dev/null || status=$?
    sed 's/^/    /' "$answer"
    ((status == wanted)) || fail "vclink-shell$shown ended with $status, not with $wanted"
}

# expect WORDS ACTUAL WANTED: fails if both texts differ.
expect()
{
    if [[ $2 != "$3" ]]; then
        printf 'demo: %s is not as it should be.\n--- wanted:\n%s\n--- is:\n%s\n' "$1" "$3" "$2" >&2
        exit 1
    fi
    echo "    ok: $1"
}
