#!/bin/sh
# SPDX-License-Identifier: MIT
# Merges THEIRS into OURS without asking anybody, and writes the result to MERGED. The status is 0
# when there are no conflicts; otherwise MERGED is left as it is.
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
