#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# documents.bash SOURCE: tests in a small repository which results scripts/evidence reads from the output of
# measurements and writes into the documents, and which notes scripts/release-notes prints.
set -euo pipefail

source=$1
failures=0

copy=$(mktemp -d)
trap 'rm -rf "$copy"' EXIT
export HOME=$copy GIT_CONFIG_NOSYSTEM=1
export GIT_AUTHOR_NAME=A GIT_AUTHOR_EMAIL=a@example.org
export GIT_COMMITTER_NAME=A GIT_COMMITTER_EMAIL=a@example.org
output=$copy/output
mkdir -p "$copy/birds/docs" "$copy/birds/scripts" "$copy/birds/main"
cd "$copy/birds"
cp "$source/scripts/evidence" "$source/scripts/release-notes" scripts
echo '# name, date, commit, result' >docs/figures.tsv
for page in README.md docs/reliability.md; do
    printf '%s\n' before '<!-- evidence:begin -->' '<!-- evidence:end -->' after >"$page"
done
git init --quiet
git add .
git commit --quiet --message Birds
commit=$(git rev-parse --short HEAD)

complain()
{
    failures=$((failures + 1))
    {
        echo "$*"
        cat "$output"
    } >&2
}

# run STATUS COMMAND...: the command must end with this status.
run()
{
    local expected=$1 status=0
    shift
    "$@" >"$output" 2>&1 || status=$?
    ((status == expected)) || complain "$*: status $status, not $expected"
}

# reads NAME RESULT: scripts/evidence must find the result in the log on standard input.
reads()
{
    cat >"$copy/log"
    run 0 scripts/evidence read "$1" "$copy/log"
    grep -qxF "$1	$(date +%F)	$commit	$2" docs/figures.tsv || complain "$1: not \"$2\""
    grep -qF " $2 | $(date +%F) | $commit |" docs/reliability.md || complain "$1: not in the table"
}

reads tests '30 cases under ASan and UBSan, 1,020 optimised, 8 with clang, 2 under ThreadSanitizer; none failed' <<'END_OF_LOG'
== release: test
1020 cases of GoogleTest ran.

100% tests passed, 0 tests failed out of 591
== clang: test
8 cases of GoogleTest ran.

100% tests passed, 0 tests failed out of 2
== tsan: test
2 cases of GoogleTest ran.

100% tests passed, 0 tests failed out of 2
== debug: test
30 cases of GoogleTest ran.

100% tests passed, 0 tests failed out of 3
END_OF_LOG
reads faults 'calls of libgit2: 372 places, 4,152 runs; allocations: 3 places, 3 runs; calls of the file system: 7 places, 9 runs' <<'END_OF_LOG'
libgit2: 372 places, 4152 runs, 0 failed tests
allocation: 3 places, 3 runs, 0 failed tests
file: 7 places, 9 runs, 0 failed tests
END_OF_LOG
reads disks '30 operations, 12 of them ended with an exception; nothing lost' <<'END_OF_LOG'
83: commit: 5 of 10 failed
84: push: 7 of 20 failed
END_OF_LOG
reads crashes '300 kills, 281 of them inside an operation; 200 commits kept, nothing lost' <<'END_OF_LOG'
commit: killed inside 28, of these left a lock 24, a merge 0
300 kills, 281 of them inside; 200 commits kept, 111 times locks removed
END_OF_LOG
reads situations '1,300 situations, 33 more with a similar name beside them, and 240 in a linked working tree; nothing lost' <<'END_OF_LOG'
1000 situations of merge
300 situations of switch
33 situations of merge beside siblings
200 situations of merge in a linked tree
40 situations of merge beside siblings in a linked tree
END_OF_LOG
reads sequences '1,000 sequences; nothing lost' <<'END_OF_LOG'
seeds 0 to 499
seeds 500 to 999
END_OF_LOG
reads rounds '30 operations done, 12 commands of git refused beside them; nothing lost' <<'END_OF_LOG'
commitBesideGc: the library 10 times done, git 12, refused 5
commitBesideAdd: the library 20 times done, git 12, refused 7
END_OF_LOG
reads signals '20 signals, 12 of them before the end; nothing left behind' <<'END_OF_LOG'
merge: 5 of 10 signals came before the end; a run takes 7 us
clone: 7 of 10 signals came before the end; a run takes 7 us
END_OF_LOG
reads coverage '99.7 % of 1,940 lines; 94.1 % of 1,736 branches' <<'END_OF_LOG'
lines: 99.7% (1934 out of 1940)
branches: 94.1% (1634 out of 1736)
END_OF_LOG
reads mutants '99.4 % of 167 mutants killed, 1 survives' <<'END_OF_LOG'
167 mutants, 166 killed (1 by the time limit): 99.4 %; 1 survive. Not counted: 40
END_OF_LOG
reads memcheck '2 programs, no error' <<'END_OF_LOG'
memcheck: a * 1 test, 2 s
memcheck: b * 1 test, 2 s
END_OF_LOG
reads fuzzing '2 targets, 1,300 inputs tried; nothing found' <<'END_OF_LOG'
paths: 300 inputs tried, cov: 10
text: 1000 inputs tried, cov: 10
END_OF_LOG

# A log without a result changes nothing.
cp docs/figures.tsv "$copy/figures"
echo 'libgit2: 372 places, 4152 runs, 1 failed tests' >"$copy/log"
run 1 scripts/evidence read faults "$copy/log"
cmp -s docs/figures.tsv "$copy/figures" || complain "a failure was kept"
run 2 scripts/evidence read owls "$copy/log"

# A plus sign shows that the library differs from the commit.
run 0 scripts/evidence --check
echo 'int owl;' >main/owl.cpp
printf 'seeds 0 to 9\n' >"$copy/log"
run 0 scripts/evidence read sequences "$copy/log"
grep -q "^sequences.*	$commit+	10 sequences" docs/figures.tsv || complain "no sign of a change"
sed -i 's/10 sequences/11 sequences/' README.md
run 1 scripts/evidence --check
[[ $(head -n 1 README.md) == before && $(tail -n 1 README.md) == after ]] || complain "text around is lost"

cat >CMakeLists.txt <<'END_OF_FILE'
project(birds
    VERSION 1.2.0
END_OF_FILE
cat >CHANGELOG.md <<'END_OF_FILE'
# Change log

## Unreleased

- Owls.

## 1.2.0

### Nests

- Nests are [round](docs/nests.md).

## 1.1.0

- Eggs.
END_OF_FILE
cat >docs/compatibility.md <<'END_OF_FILE'
### From 1.1.0

- Turn the eggs.

### From 1.0.0

- Fly.
END_OF_FILE
run 0 scripts/release-notes
diff "$output" - <<'END_OF_NOTES' || complain "other notes"
birds 1.2.0

### Nests

- Nests are round.

### Upgrade from 1.1.0

- Turn the eggs.
END_OF_NOTES
run 0 scripts/release-notes v1.2.0
run 1 scripts/release-notes 1.1.0
sed -i 's/^## 1.2.0/## 1.2/' CHANGELOG.md
run 1 scripts/release-notes

exit $((failures > 0))
