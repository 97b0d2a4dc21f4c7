#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# portability.bash SOURCE: what scripts/portability takes from the output of tests and writes into its
# table of runs, in a small repository of its own.
set -euo pipefail

# shellcheck source=/dev/null
source "$1/scripts/portability.d/runs.bash"
failures=0

copy=$(mktemp -d)
trap 'rm -rf "$copy"' EXIT
export HOME=$copy GIT_CONFIG_NOSYSTEM=1
export GIT_AUTHOR_NAME=A GIT_AUTHOR_EMAIL=a@example.org
export GIT_COMMITTER_NAME=A GIT_COMMITTER_EMAIL=a@example.org
log=$copy/log
cases=$copy/cases
page=docs/portability.md
today=$(date +%F)

# is WHAT EXPECTED COMMAND...: the command succeeds and prints this.
is()
{
    local what=$1 expected=$2 output status=0
    shift 2
    output=$("$@" 2>&1) || status=$?
    if ((status != 0)) || [[ $output != "$expected" ]]; then
        failures=$((failures + 1))
        printf '%s: status %d, "%s" instead of "%s"\n' "$what" "$status" "$output" "$expected" >&2
    fi
}

# fails WHAT COMMAND...
fails()
{
    local what=$1
    shift
    if "$@" >/dev/null 2>&1; then
        failures=$((failures + 1))
        echo "$what: succeeded" >&2
    fi
}

is 'a folder without history' 'no history' commit_of "$copy"
mkdir -p "$copy/birds/docs"
cd "$copy/birds"
echo owl >owl
printf '%s\n' before '|---|' '<!-- end of runs -->' 'after \n' >"$page"
git init --quiet
git add .
git commit --quiet --message Birds
head=$(git rev-parse --short HEAD)

is 'a clean tree' "$head" commit_of .
echo untracked >new
is 'an untracked file' "$head" commit_of .
echo wren >owl
is 'a change' "$head+" commit_of docs
git add owl
is 'a staged change' "$head+" commit_of .
git reset --quiet --hard

printf '12\n30\n' >"$cases"
printf '\n100%% tests passed, 0 tests failed out of 157\n\nTotal Test time (real) = 3 sec\n' >"$log"
is 'all of ctest' '157 of 157, with 42 cases' ctest_result "$log" "$cases"
is 'no cases of GoogleTest' '157 of 157' ctest_result "$log" "$copy/none"
printf '\n94%% tests passed, 3 tests failed out of 55\n' >"$log"
is 'failures in ctest' '52 of 55' ctest_result "$log" "$copy/none"
echo 'Test project /nests' >"$log"
fails 'ctest without a summary' ctest_result "$log" "$cases"

printf '[==========] 92 tests from 10 test suites ran. (7 ms total)\n[  PASSED  ] 92 tests.\n' >"$log"
is 'all of a program' '92 of 92 cases' program_result "$log"
printf '[==========] 9 tests from 1 test suite ran.\n[  PASSED  ] 8 tests.\n[  FAILED  ] 1 test, listed below:\n' >"$log"
is 'a failure in a program' '8 of 9 cases' program_result "$log"
printf '[==========] Running 9 tests from 1 test suite.\n' >"$log"
fails 'a program that was ended' program_result "$log"

record "$page" 'Owl 12 | gcc 1 | 1.5 | 1.7' unit "$head" '3 of 3'
record "$page" 'Owl 12 | gcc 1 | 1.5 | 1.7' git "$head" '4 of 4'
record "$page" 'Owl 12 | gcc 1 | 1.5 | 1.74' unit "$head" '5 of 5'
is 'three runs' "| Owl 12 | gcc 1 | 1.5 | 1.7 | unit | $today | $head | 3 of 3 |
| Owl 12 | gcc 1 | 1.5 | 1.7 | git | $today | $head | 4 of 4 |
| Owl 12 | gcc 1 | 1.5 | 1.74 | unit | $today | $head | 5 of 5 |
<!-- end of runs -->" sed -n '3,/end of runs/p' "$page"
is 'the table is not a change' "$head" commit_of .
record "$page" 'Owl 12 | gcc 1 | 1.5 | 1.7' unit "$head" '2 of 3'
is 'a second run' "| Owl 12 | gcc 1 | 1.5 | 1.7 | git | $today | $head | 4 of 4 |
| Owl 12 | gcc 1 | 1.5 | 1.7 | unit | $today | $head | 2 of 3 |
| Owl 12 | gcc 1 | 1.5 | 1.74 | unit | $today | $head | 5 of 5 |
<!-- end of runs -->" sed -n '3,/end of runs/p' "$page"
is 'text around' $'before\nafter \\n' sed '2,/end of runs/d' "$page"
record "$page" 'Owl 12 | 1.5' 'xfs | steps' "$head" '15, as with git' places 2>"$log" && failures=$((failures + 1))
is 'a table that is missing' "$page has no place for places" cat "$log"
printf '%s\n' '| Owl 12 | 1.5 | xfs | steps | never | 0 | 0 |' '<!-- end of places -->' >>"$page"
record "$page" 'Owl 12 | 1.5' 'xfs | steps' "$head" '15, as with git' places
record "$page" 'Owl 12 | 1.5' 'xfs | surroundings' "$head" '7 of 7 cases' places
record "$page" 'Owl 13 | 1.9' 'xfs | steps' "$head" '15, 1 listed difference' places
is 'another table' "after \\n
| Owl 12 | 1.5 | xfs | steps | $today | $head | 15, as with git |
| Owl 12 | 1.5 | xfs | surroundings | $today | $head | 7 of 7 cases |
| Owl 13 | 1.9 | xfs | steps | $today | $head | 15, 1 listed difference |
<!-- end of places -->" sed '1,/end of runs/d' "$page"
cp owl other
fails 'a page without a place' record other 'Owl 12' unit "$head" '1 of 1'
is 'such a page' owl cat other

exit $((failures > 0))
