#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# lint.bash TIDY: tests in a small repository which units scripts/lint reads with clang-tidy, and which it knows to
# be clean.
set -euo pipefail

tidy=$1
failures=0

copy=$(mktemp -d)
trap 'rm -rf "$copy"' EXIT
export HOME=$copy XDG_CACHE_HOME=$copy/cache GIT_CONFIG_NOSYSTEM=1
export GIT_AUTHOR_NAME=A GIT_AUTHOR_EMAIL=a@example.org
export GIT_COMMITTER_NAME=A GIT_COMMITTER_EMAIL=a@example.org
unset CMAKE_CXX_COMPILER_LAUNCHER CMAKE_C_COMPILER_LAUNCHER
output=$copy/output

# lint STATUS OPTION...: reads what has changed since the last commit; it must end with this status.
lint()
{
    local expected=$1 status=0
    shift
    python3 "$tidy" --base HEAD "$@" >"$output" 2>&1 || status=$?
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

# case TEXT: begins a test with the committed files, and with no unit known to be clean.
case_of()
{
    what=$1
    git reset --quiet --hard
    git clean --quiet -d --force
    rm -rf "$XDG_CACHE_HOME"
}

git init --quiet --initial-branch=main "$copy/birds"
cd "$copy/birds"
echo /build/ >.gitignore
cat >CMakeLists.txt <<'END'
cmake_minimum_required(VERSION 3.22)
project(birds LANGUAGES CXX)
file(GLOB sources CONFIGURE_DEPENDS birds/*.cpp)
add_library(birds OBJECT ${sources})
target_include_directories(birds PRIVATE "${PROJECT_SOURCE_DIR}")
target_compile_options(birds PRIVATE -Wsign-compare)
END
cat >CMakePresets.json <<'END'
{
  "version": 6,
  "configurePresets": [
    {
      "name": "editor",
      "generator": "Ninja",
      "binaryDir": "${sourceDir}/build/${presetName}",
      "cacheVariables": { "CMAKE_EXPORT_COMPILE_COMMANDS": true, "CMAKE_CXX_COMPILER": "clang++" }
    }
  ]
}
END
cat >.clang-tidy <<'END'
Checks: '-*,clang-diagnostic-*,misc-unused-using-decls,modernize-use-nullptr'
WarningsAsErrors: '*'
HeaderFilterRegex: '.*'
END
mkdir birds other
for number in {1..70}; do
    printf '#include "birds/sing.hpp"\nint bird%d() { return sing(nullptr); }\n' "$number" \
        >"birds/bird$number.cpp"
done
printf '#pragma once\ninline int sing(const int *song) { return song == nullptr ? 0 : *song; }\n' \
    >birds/sing.hpp
echo '#pragma once' >birds/alone.hpp
echo 'int nest();' >other/nest.cpp
git add .
git commit --quiet --message Birds

case_of "nothing has changed"
lint 0
says '0 units changed'
says '0 read in 0 runs'

case_of "a remark in a changed unit, among others that are clean"
for number in 1 2 3 4 5; do echo "int more$number();" >>"birds/bird$number.cpp"; done
echo 'int *none = 0;' >>birds/bird4.cpp
lint 1
says 'birds/bird4\.cpp:4:13: error: use nullptr'
lint 1
says 'birds/bird4\.cpp:4:13: error: use nullptr'

case_of "a remark in a header that unchanged units include"
echo 'inline int *none = 0;' >>birds/sing.hpp
lint 1
says 'birds/sing\.hpp:3:20: error: use nullptr'
says '0 units changed .* 70 include'

case_of "a remark in a header that is due to one of the units that include it"
printf '#pragma once\ntemplate <class T> bool isLess(T a, int b) { return a < b; }\n' >birds/alone.hpp
for number in 1 2 3 4; do
    printf '#include "birds/alone.hpp"\nbool less%d() { return isLess(%s, 3); }\n' "$number" \
        "$( ((number == 3)) && echo 1U || echo 1)" >>"birds/bird$number.cpp"
done
lint 1
says 'birds/alone\.hpp:2:55: error: comparison of integers of different signs'

case_of "a remark in an unchanged unit, for a header's change"
sed -i 's/nullptr/0/' birds/bird70.cpp
sed -i 's/const int \*song/int song/; s/song == .*;/song;/' birds/sing.hpp
sed -i 's/nullptr/0/' birds/*.cpp
git commit --quiet --all --message 'Songs are numbers'
lint 0
git checkout --quiet HEAD^ -- birds/sing.hpp
lint 1
says 'birds/bird70\.cpp:2:28: error: use nullptr'
git reset --quiet --hard HEAD^

case_of "a remark in one of more than 60 changed units"
for number in {1..70}; do echo "int more$number();" >>"birds/bird$number.cpp"; done
echo 'int *none = 0;' >>birds/bird61.cpp
lint 1
says 'birds/bird61\.cpp:4:13: error: use nullptr'
says '70 units changed'

case_of "units that are clean are not read again"
for number in {1..9}; do echo "int more$number();" >>"birds/bird$number.cpp"; done
lint 0
says '9 read in'
touch birds/bird*.cpp
lint 0
says '9 are known to be clean'
says '0 read in 0 runs'
lint 0 --no-cache
says '9 read in'
echo 'int *none = 0;' >>birds/bird7.cpp
lint 1
says '8 are known to be clean'
cp -r . "$copy/copy"
(
    cd "$copy/copy"
    rm -rf build
    sed -i '/none/d' birds/bird7.cpp
    lint 0
    says '9 are known to be clean'
    exit "$failures"
) || failures=$((failures + 1))
rm -rf "$copy/copy"

case_of "another configuration: all is read again"
lint 0
echo 'int more();' >>birds/bird1.cpp
lint 0
says '1 read in'
sed -i 's/modernize-use-nullptr/&,readability-implicit-bool-conversion,modernize-use-trailing-return-type/' \
    .clang-tidy
lint 1
says '71 units changed .* 1 include'
says 'birds/bird1\.cpp:2:5: error: use a trailing return type'
says 'birds/bird70\.cpp:2:5: error: use a trailing return type'

case_of "names that clash, and a remark beside them"
for number in 1 2 3 4; do
    printf 'static int same() { return 1; }\nint more%d() { return same(); }\n' "$number" \
        >>"birds/bird$number.cpp"
done
lint 0
echo 'int *none = 0;' >>birds/bird3.cpp
lint 1
says 'birds/bird3\.cpp:5:13: error: use nullptr'

case_of "a name that only another unit uses"
printf 'namespace a { inline int sing() { return 1; } }\n' >birds/alone.hpp
for number in 1 2 3; do
    printf '#include "birds/alone.hpp"\nusing a::sing;\n' >>"birds/bird$number.cpp"
    ((number == 2)) || printf 'int more%d() { return sing(); }\n' "$number" \
        >>"birds/bird$number.cpp"
done
sed -i '1i #pragma once' birds/alone.hpp
lint 1
says "birds/bird2\.cpp:4:10: error: using decl 'sing' is unused"

case_of "a unit that needs what another one includes"
echo '#include <cstddef>' >>birds/bird1.cpp
echo 'std::size_t size();' >>birds/bird2.cpp
echo 'int more();' >>birds/bird3.cpp
lint 1
says 'birds/bird2\.cpp:3:1: error: use of undeclared'

case_of "a file that is yet to be made is made for the units that include it"
cat >>CMakeLists.txt <<'END'
add_custom_command(OUTPUT made/made.inc
    COMMAND "${CMAKE_COMMAND}" -E copy "${PROJECT_SOURCE_DIR}/made.txt" made/made.inc VERBATIM)
target_sources(birds PRIVATE "${CMAKE_CURRENT_BINARY_DIR}/made/made.inc")
target_include_directories(birds PRIVATE "${CMAKE_CURRENT_BINARY_DIR}/made")
END
echo 'int *none = 0;' >made.txt
lint 0
says '0 read in 0 runs'
echo '#include "made.inc"' >>birds/bird2.cpp
lint 1
says 'made/made\.inc:1:13: error: use nullptr'

case_of "a unit whose includes are not known is read each time"
echo '#include nothing' >>birds/bird9.cpp
git commit --quiet --all --message Lost
echo >>birds/bird1.cpp
for _ in 1 2; do
    lint 1
    says 'birds/bird9\.cpp:3:10: error: expected "FILENAME"'
done
git reset --quiet --hard HEAD^

case_of "files that no target compiles"
echo 'int *none = 0;' >>other/nest.cpp
echo 'inline int *nobody = 0;' >>birds/alone.hpp
lint 1
says 'other/nest\.cpp:2:13: error: use nullptr'
says 'birds/alone\.hpp:2:22: error: use nullptr'

exit $((failures > 0))
