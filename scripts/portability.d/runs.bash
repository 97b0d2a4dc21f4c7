# shellcheck shell=bash
# SPDX-License-Identifier: MIT
# The tables of runs in docs/portability.md, which scripts/portability and scripts/places write.

# commit_of FOLDER: the abbreviated id of HEAD, with a plus sign if a tracked file differs from it. The
# table itself, which each run changes, is not looked at.
commit_of()
{
    local commit git=(git -C "$1" -c safe.directory='*')
    commit=$("${git[@]}" rev-parse --short HEAD 2>/dev/null) || {
        echo 'no history'
        return
    }
    "${git[@]}" diff --quiet HEAD -- ':/' ':(top,exclude)docs/portability.md' || commit+=+
    echo "$commit"
}

# ctest_result LOG CASES: what ctest has printed, and how many cases the programs have counted in a
# file, which may be missing. Fails if the log has no result.
ctest_result()
{
    local cases=0
    if [[ -e $2 ]]; then cases=$(awk '{ sum += $1 } END { print sum + 0 }' "$2"); fi
    awk -v cases="$cases" '
        /^[0-9]+% tests passed/ {
            result = $NF - $4 " of " $NF
            if (cases > 0) result = result ", with " cases " cases"
        }
        END { if (result == "") exit 1; print result }' "$1"
}

# program_result LOG: what a program of GoogleTest has printed. Fails if it did not come to its end.
program_result()
{
    awk '
        /^\[=+\] [0-9]+ tests? from / { all = $2 }
        /^\[  PASSED  \] / { passed = $4 }
        END { if (all == "" || passed == "") exit 1; print passed " of " all " cases" }' "$1"
}

# record DOCUMENT SYSTEM TESTS COMMIT RESULT [TABLE]: a line with today's date below the other lines of this
# system, in place of the line of these tests. SYSTEM and TESTS have columns, separated by " | ". The
# TABLE, "runs" or another word, has a comment at its end.
record()
{
    local document=$1 key="| $2 | $3 |" end="<!-- end of ${6-runs} -->" new
    if ! grep -qxF -- "$end" "$document"; then
        echo "$document has no place for ${6-runs}" >&2
        return 1
    fi
    new=$(awk -v on="| $2 |" -v key="$key" -v line="$key $(date +%F) | $4 | $5 |" -v mark="$end" '
        index($0, key) == 1 { next }
        { lines[++count] = $0 }
        index($0, on) == 1 { last = count }
        $0 == mark { end = count - 1 }
        END {
            if (last == 0) last = end
            for (i = 1; i <= count; ++i) {
                print lines[i]
                if (i == last) print line
            }
        }' "$document")
    # In place: the file is shared with a root folder, by a mount.
    printf '%s\n' "$new" >"$document"
}
