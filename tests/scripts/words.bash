#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# words.bash WORDS: tests in a small repository what scripts/lint counts as a phrase that is hard to read, and as a
# misspelt word.
set -euo pipefail

words=$1
failures=0

copy=$(mktemp -d)
trap 'rm -rf "$copy"' EXIT
export HOME=$copy GIT_CONFIG_NOSYSTEM=1
output=$copy/output

# words STATUS: checks the repository; the check must end with this status.
words()
{
    local expected=$1 status=0
    shift
    python3 "$words" "$@" "$copy/birds" >"$output" 2>&1 || status=$?
    ((status == expected)) || complain "status $status, not $expected"
}

complain()
{
    failures=$((failures + 1))
    {
        echo "$what: $*"
        cat "$output"
    } >&2
}

says()
{
    grep -qE -- "$1" "$output" || complain "does not say: $1"
}

# case TEXT: begins a test with the first state of the files.
case_of()
{
    what=$1
    rm -rf "$copy/birds"
    mkdir -p "$copy/birds/include" "$copy/birds/scripts" "$copy/birds/examples" "$copy/birds/main"
    cd "$copy/birds"
    git init --quiet
    echo '# Birds' >README.md
    printf '/// Returns the number of birds.\nint birds();\n' >include/birds.hpp
    printf 'int birds()\n{\n    return 3; // all of them\n}\n' >main/birds.cpp
}

case_of "nothing to remark"
words 0
says 'README: 0\.00 in 1,000 of 1 words'

case_of "a phrase in each part"
echo 'The nest stands in the tree.' >>README.md
printf '/// Nobody is told by the owl.\nint owl();\n' >>include/birds.hpp
echo '// Made anew each year.' >>main/birds.cpp
printf '#!/usr/bin/env bash\n# It sleeps meanwhile.\n' >scripts/sleep
echo 'const char *const text = "The owl tells you";' >examples/owl.cpp
words 1
says '^README\.md:2: "stands in"'
says '^include/birds\.hpp:3: "told by"'
says '^main/birds\.cpp:5: "anew": again'
says '^scripts/sleep:2: "meanwhile"'
says '^examples/owl\.cpp:1: "tells"'

case_of "a phrase over two lines of a comment"
printf '/// The nest that the owl left stands\n/// in the tree.\nint owl();\n' >>include/birds.hpp
words 1
says '^include/birds\.hpp:3: "stands in"'

case_of "a condition that begins a sentence, and a place that does not"
printf '%s\n' '' 'Where the nest is empty, the owl leaves.' '' 'A tree where owls live, and a place.' >>README.md
words 1
says '^README\.md:3: "Where the nest is empty,": if'
says 'README: .* of 17 words'

case_of "code, generated text, links and names are no prose"
# shellcheck disable=SC2016 # backticks of Markdown
printf '%s\n' '```sh' 'stands in meanwhile' '```' '<!-- run:begin -->' 'likewise' '<!-- run:end -->' \
    '`anew` [owl](anew.md)' >>README.md
echo 'const char *const text = "anew"; int meanwhile = 0;' >>main/birds.cpp
words 0

case_of "one phrase in many words"
for _ in {1..80}; do echo 'The birds of this island sing in the morning.' >>README.md; done
echo 'The nest stands in the tree.' >>README.md
words 0
words 0 --list
says '^README\.md:82: "stands in"'
echo 'It stands in the tree.' >>README.md
words 1

case_of "a file that git ignores, and one that is deleted"
printf 'build/\n' >.gitignore
mkdir build
echo 'It stands in the tree.' >build/page.md
git add README.md
rm README.md
words 0

case_of "a misspelt word"
echo 'The brids recieve food.' >>README.md
words 1
says 'README\.md:2: recieve ==> receive'

exit $((failures > 0))
