// SPDX-License-Identifier: MIT
// What the command is given, how it is read, how it ends.
#include "DriverContract.hpp"
#include "support/gitRelease.hpp"

namespace vclink::test
{
namespace
{

using Kind = DriverExpectation;

/// Writes what its words are into the word whose number is the first: the content of a temporary
/// file, or the word itself.
const std::string describing = R"(position=$1
shift
text=$(for word in "$@"; do
    case $word in
    .merge_file_*|/*) printf 'file:'; cat "$word" ;;
    *) printf 'word:%s\n' "$word" ;;
    esac
done)
eval target=\${$position}
printf '%s\n' "$text" >"$target")";

DriverCase describes(const std::string &name, const std::string &words,
                     const DriverExpectation &expectation = {})
{
    return {name, "%T " + words, describing, expectation};
}

DriverCase describesPath(const std::string &name, const std::string &words, const std::string &file,
                         const DriverExpectation &expectation = {})
{
    DriverCase result = describes(name, words, expectation);
    result.file = file;
    result.base = writes(file, "base\n");
    result.ours = writes(file, "ours\n");
    result.theirs = writes(file, "theirs\n");
    return result;
}

DriverCase refuses(const std::string &name, const std::string &end)
{
    return runs(name, "echo kept >\"$2\"; " + end,
                {Kind::OtherFileInConflict, "kept\n", conflictMarkers});
}

/// A refusal by which git may give the whole merge up.
DriverCase refusesAll(const std::string &name, const std::string &end)
{
    DriverCase result = refuses(name, end);
    if (git_release::driverCanEndMerge())
    {
        result.expectation = {Kind::GitGivesUpAConflict, "ours\n", conflictMarkers};
    }
    return result;
}

DriverCase commands(const std::string &name, const std::string &command,
                    const DriverExpectation &expectation)
{
    DriverCase result{name, command};
    result.expectation = expectation;
    return result;
}

} // namespace

std::vector<DriverCase> placeholderCases()
{
    return {
        describes("InOrder", "2 %O %A %B"),
        describes("TheOtherWayRound", "2 %B %A %O"),
        describes("OursFirst", "1 %A %B %O"),
        describes("OursLast", "3 %O %B %A"),
        describes("OursTwice", "2 %O %A %B %A"),
        describes("OursOnly", "1 %A"),
        describes("TheAncestorTwice", "3 %O %O %A"),
        describes("TheirsThrice", "4 %B %B %B %A"),
        describes("Unknown", "1 %A %Q %a %o"),
        describes("ALonePercentSign", "1 %A 100% %"),
        describes("TwoPercentSigns", "1 %A %%",
                  {Kind::OtherContent, "file:ours\nword:%\n", "file:ours\nword:%%\n"}),
        // libgit2 reports no size if nobody requests one.
        describes("TheMarkerSize", "1 %A %L",
                  {Kind::OtherContent, "file:ours\nword:7\n", "file:ours\nword:0\n"}),
        describesPath("ThePath", "1 %A %P", "file"),
        describesPath("ThePathInFolders", "1 %A %P", "some/folder/file"),
        describesPath("ThePathTwice", "1 %A %P %P", "folder/file"),
        describesPath("ThePathInAWord", "1 %A --name=%P,", "folder/file"),
        describesPath("ThePathBeyondAscii", "1 %A %P", "\xC3\xA9/\xE2\x82\xAC"),
        describesPath("ThePathWithABlank", "1 %A %P", "a folder/file",
                      {Kind::OtherContent, "file:ours\nword:a folder/file\n",
                       "file:ours\nword:a\nword:folder/file\n"}),
        describesPath("ThePathWithABlankInQuotes", "1 %A \"%P\"", "a folder/file",
                      {Kind::OtherContent, "file:ours\nword:'a folder/file'\n",
                       "file:ours\nword:a folder/file\n"}),
        describesPath("ThePathWithAQuote", "1 %A %P", "it's"),
    };
}

std::vector<DriverCase> commandCases()
{
    const std::string fiftyThousand = "dd if=/dev/zero bs=1000 count=50 2>/dev/null";
    const DriverExpectation notStarted{Kind::OnlyLibraryGivesUp, "", ""};
    const DriverExpectation noneStarted{Kind::BothGiveUp, "ours\n", "ours\n"};
    return {
        describes("WordsInDoubleQuotes", "1 %A \"a b\" \"\""),
        describes("ManyBlanks", "  1   %A    a  "),
        // No shell takes part in the library.
        describes("WordsInSingleQuotes", "1 %A 'a b'",
                  {Kind::OtherContent, "file:ours\nword:a b\n", "file:ours\nword:'a\nword:b'\n"}),
        describes("AVariable", "1 %A x${NO_SUCH_VARIABLE}x",
                  {Kind::OtherContent, "file:ours\nword:xx\n",
                   "file:ours\nword:x${NO_SUCH_VARIABLE}x\n"}),
        describes("ARedirection", "1 %A 2>x",
                  {Kind::OtherContent, "file:ours\n", "file:ours\nword:2>x\n"}),
        describes("TwoCommands", "1 %A ; false",
                  {Kind::OnlyLibraryMerges, "file:ours\n", "file:ours\nword:;\nword:false\n"}),
        runs("Status0", "echo merged >\"$2\"; exit 0"),
        refuses("Status1", "exit 1"),
        refuses("Status2", "exit 2"),
        refuses("Status127", "exit 127"),
        refuses("Status128", "exit 128"),
        refusesAll("Status255", "exit 255"),
        refusesAll("SignalKill", "kill -9 $$"),
        refusesAll("SignalTerm", "kill -15 $$"),
        runs("PrintsNothing", "echo merged >\"$2\""),
        runs("PrintsALot", "seq 1 200000; echo merged >\"$2\""),
        runs("PrintsALotBeforeAnEmptyLine", "seq 1 200000; echo; echo merged >\"$2\""),
        runs("PrintsALotAfterAnEmptyLine", "echo; " + fiftyThousand + "; echo merged >\"$2\""),
        runs("PrintsErrors", "seq 1 200000 >&2; echo merged >\"$2\""),
        runs("PrintsBytes", fiftyThousand + "; printf '\\377\\n'; echo merged >\"$2\""),
        commands("IsMissing", "/nowhere/tool %A", notStarted),
        commands("IsNotExecutable", "/etc/hostname %A", notStarted),
        commands("IsAFolder", "/ %A", notStarted),
        commands("IsNotClosed", "true \"", notStarted),
        commands("IsEmpty", "", git_release::emptyDriverEndsMerge() ? noneStarted : notStarted),
        commands("IsBlank", "  ", notStarted),
    };
}

} // namespace vclink::test
