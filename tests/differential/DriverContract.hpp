// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <functional>
#include <iosfwd>
#include <map>
#include <string>
#include <vector>

#include "support/Change.hpp"
#include "support/GitRepository.hpp"
#include "support/HermeticEnvironment.hpp"

namespace vclink::test
{

/// What a merge has come to. The labels of conflict markers are left out.
struct DriverOutcome
{
    /// why the merge was given up; empty for one that is done or that conflicts stop
    std::string failure;
    bool isInConflict = false;
    /// mode, stage, id and name of each entry
    std::vector<std::string> index;
    /// "mode bytes" of each file, by its name
    std::map<std::string, std::string> files;
};

bool operator==(const DriverOutcome &left, const DriverOutcome &right);
std::ostream &operator<<(std::ostream &stream, const DriverOutcome &outcome);

/// A file whose only line both sides have changed.
inline const std::string conflictMarkers = "<<<<<<<\nours\n=======\ntheirs\n>>>>>>>\n";

/// How the library's outcome is to stand to git's. The contents are those of the case's file, with
/// its mode before them where it is not 100644.
struct DriverExpectation
{
    enum Kind
    {
        /// everything is equal
        Same,
        /// both have merged, to the two contents
        OtherContent,
        /// both are in conflict with equal indexes, the file having the two contents
        OtherFileInConflict,
        /// both are in conflict, with equal names and stages, the file having the two contents
        OtherStages,
        /// git has merged, the library is in conflict
        OnlyGitMerges,
        /// git is in conflict, the library has merged
        OnlyLibraryMerges,
        /// git gives the merge up, the library has merged
        OnlyGitGivesUp,
        /// git gives the merge up, the library is in conflict
        GitGivesUpAConflict,
        /// the library gives the merge up and has changed nothing, git does not give up
        OnlyLibraryGivesUp,
        /// nothing is changed by either
        BothGiveUp
    };
    Kind kind = Same;
    std::string git{};
    std::string library{};
};

/// One configuration of attributes, driver and sides. "%T" in the driver's command is the path of
/// the script.
struct DriverCase
{
    std::string name;
    std::string command = "%T %O %A %B";
    std::string script = "cat \"$1\" \"$3\" >>\"$2\"";
    DriverExpectation expectation{};
    std::string attributes = "* merge=tool\n";
    std::string file = "file";
    Change base = writes("file", "base\n");
    Change ours = writes("file", "ours\n");
    Change theirs = writes("file", "theirs\n");
    /// what `git config` is given, "%C" being the command
    std::vector<std::vector<std::string>> settings{{"merge.tool.driver", "%C"}};
    /// what else there is to be configured
    std::function<void(const GitRepository &, const HermeticEnvironment &,
                       const std::string &command)>
        configure{};
};

std::ostream &operator<<(std::ostream &stream, const DriverCase &driverCase);

/// A driver that is given all three sides.
DriverCase runs(const std::string &name, const std::string &script,
                const DriverExpectation &expectation = {});

/// The cases, by what they are about.
std::vector<DriverCase> placeholderCases();
std::vector<DriverCase> commandCases();
std::vector<DriverCase> resultCases();
std::vector<DriverCase> sideCases();
std::vector<DriverCase> configurationCases();
std::vector<DriverCase> attributeCases();

/// Makes the repository of a case, with its branch "theirs" to be merged.
GitRepository makeRepositoryOf(const DriverCase &driverCase, const std::filesystem::path &folder,
                               const HermeticEnvironment &environment);

/// What `git merge theirs` makes of a repository.
DriverOutcome mergeByGit(const GitRepository &repository);
/// What the library makes of it.
DriverOutcome mergeByLibrary(const GitRepository &repository);

/// Fails the running test when the outcomes do not stand to each other as expected.
void expectOutcomes(const DriverCase &driverCase, const DriverOutcome &git,
                    const DriverOutcome &library);

} // namespace vclink::test
