#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# places.bash SOURCE: what scripts/places finds out about file systems and the output of tests. As root where
# file systems may be mounted, also a whole run with a small program.
set -euo pipefail

# shellcheck source=/dev/null
source "$1/scripts/portability.d/runs.bash"
# shellcheck source=/dev/null
source "$1/scripts/places.d/surroundings.bash"
failures=0

folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT
log=$folder/log

# is WHAT EXPECTED COMMAND...: the command prints this.
is()
{
    local what=$1 expected=$2 output
    shift 2
    output=$("$@" 2>&1) || output+=" (status $?)"
    if [[ $output != "$expected" ]]; then
        failures=$((failures + 1))
        printf '%s: "%s" instead of "%s"\n' "$what" "$output" "$expected" >&2
    fi
}

is 'a usual folder' '' missing_in "$folder"
is 'nothing stays' '' ls -A "$folder"
is 'no folder' 'nothing can be written' missing_in "$folder/none"
(
    # shellcheck disable=SC2317 # missing_in calls them
    ln() { false; }
    # shellcheck disable=SC2317
    mkfifo() { false; }
    # shellcheck disable=SC2317
    chmod() { true; }
    is 'a poor file system' 'no links, pipes, executable files' missing_in "$folder"
    exit "$failures"
) || failures=$((failures + 1))

cat >"$log" <<'END_OF_LOG'
30 situations of merge
  20 x git goes through, the library goes through
  3 x git goes through, the library refuses
  7 x git refuses, the library refuses
8 situations of switch in a linked tree
  1 x git refuses, the library goes through
  7 x git stops in conflicts, the library stops in conflicts
[==========] 2 tests from 1 test suite ran. (7 ms total)
[  PASSED  ] 1 test.
END_OF_LOG
is 'situations' '1 of 2 cases, 38 situations, git differs in 4' surroundings_result "$log"
sed -i '1,7d' "$log"
is 'other tests' '1 of 2 cases' surroundings_result "$log"
echo 'killed' >"$log"
is 'tests that were ended' ' (status 1)' surroundings_result "$log"

copy=$folder/copy
program=$folder/program
mkdir -p "$copy/scripts"
cp -R "$1/scripts/places" "$1/scripts/places.d" "$1/scripts/portability.d" "$copy/scripts"
cat >"$program" <<'END_OF_PROGRAM'
#!/bin/sh
stat --file-system --format=%T "$TMPDIR"
echo '[==========] 1 test from 1 test suite ran.'
test "$NEST" = empty || { echo '[  FAILED  ] Owl.Nests'; echo '[  PASSED  ] 0 tests.'; exit 1; }
echo '[  PASSED  ] 1 test.'
END_OF_PROGRAM
chmod +x "$program"


if ((EUID == 0)) && unshare --mount true 2>/dev/null; then
    places="$copy/scripts/places --surroundings"
    mkdir "$copy/docs"
    printf '%s\n' '| System | libgit2 | git | Place | Tests | Date | Commit | Result |' \
        '<!-- end of places -->' >"$copy/docs/portability.md"
    is 'a run' 'memory     1 of 1 cases
places: 1 runs, 0 failed' env NEST=empty bash -c "$places '$program' memory | sed 1d"
    is 'its temporary folder' tmpfs head -n 1 "$copy/build/logs/places-memory.log"
    is 'a run that fails' 'memory     0 of 1 cases
    see build/logs/places-memory.log
    [  FAILED  ] Owl.Nests
places: 1 runs, 1 failed (status 1)' env NEST=full bash -c "set -o pipefail; $places --write '$program' memory | sed 1d"
    is 'its line in the table' '1' \
        grep -c '^| [^|]* | [0-9.]* | [0-9.]* | memory | surroundings | ....-..-.. | no history | 0 of 1 cases |$' "$copy/docs/portability.md"
    is 'a setting' "scripts/places: 'nolinks' is a setting, not a file system (status 1)" \
        bash -c "set -o pipefail; $places '$program' nolinks | sed 1d"
else
    echo 'No file system can be mounted here, so no whole run was tried.'
fi
is 'no program' 'scripts/places: none is not a program (status 1)' "$copy/scripts/places" none

exit $((failures > 0))
