#!/bin/sh
# SPDX-License-Identifier: MIT
# Merges THEIRS into OURS without a prompt, and writes the result to MERGED. If there are conflicts, the
# status is not 0 and MERGED is unchanged.
set -eu

if [ $# -ne 4 ]; then
    echo "usage: vkAutoMerge.sh ANCESTOR OURS THEIRS MERGED" >&2
    exit 2
fi
result=$(mktemp)
trap 'rm -f "$result"' EXIT
trap 'exit 1' HUP INT TERM
git merge-file --quiet -p "$2" "$1" "$3" >"$result"
cat "$result" >"$4"
