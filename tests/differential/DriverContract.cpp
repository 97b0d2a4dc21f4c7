// SPDX-License-Identifier: MIT
#include "DriverContract.hpp"

#include <algorithm>
#include <filesystem>
#include <iostream>
#include <ostream>
#include <sstream>
#include <utility>

#include <gtest/gtest.h>

#include "support/Scripts.hpp"
#include "support/adapterFor.hpp"
#include "support/strings.hpp"
#include "support/text.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitException.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

/// Cuts the label off a conflict marker.
std::string withoutLabels(const std::string &text)
{
    std::string result;
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);)
    {
        const std::string beginning = line.substr(0, 8);
        const bool isMarker = beginning == "<<<<<<< " || beginning == ">>>>>>> ";
        result += isMarker ? beginning.substr(0, 7) : line;
        result += lines.eof() ? "" : "\n";
    }
    return result;
}

std::string describe(const GitRepository &repository, const fs::path &name)
{
    const fs::path file = repository.path() / name;
    if (fs::is_symlink(file))
        return "120000 " + fs::read_symlink(file).string();
    const bool isExecutable =
        (fs::status(file).permissions() & fs::perms::owner_exec) != fs::perms{};
    return (isExecutable ? "100755 " : "100644 ") + withoutLabels(repository.read(name));
}

DriverOutcome readOutcome(const GitRepository &repository)
{
    DriverOutcome outcome;
    outcome.isInConflict = !repository.git({"ls-files", "--unmerged"}).empty();
    outcome.index = split(repository.git({"ls-files", "--stage"}));
    for (auto entry = fs::recursive_directory_iterator(repository.path());
         entry != fs::recursive_directory_iterator(); ++entry)
    {
        const fs::path name = fs::relative(entry->path(), repository.path());
        if (name == ".git")
            entry.disable_recursion_pending();
        else if (!entry->is_directory() || entry->is_symlink())
            outcome.files[name] = describe(repository, name);
    }
    return outcome;
}

/// Long contents are described by their length.
std::string shorten(const std::string &text)
{
    constexpr std::size_t most = 400;
    return text.size() <= most
               ? text
               : text.substr(0, most) + "... (" + std::to_string(text.size()) + " bytes)";
}

/// What has become of a merge.
enum class End
{
    Merged,
    Conflict,
    GivenUp
};

std::ostream &operator<<(std::ostream &stream, End end)
{
    static const char *const names[] = {"merged", "in conflict", "given up"};
    return stream << names[static_cast<std::size_t>(end)];
}

End endOf(const DriverOutcome &outcome)
{
    if (!outcome.failure.empty())
        return End::GivenUp;
    return outcome.isInConflict ? End::Conflict : End::Merged;
}

/// The content of a file; without the usual mode.
std::string contentOf(const DriverOutcome &outcome, const std::string &file)
{
    const auto found = outcome.files.find(file);
    if (found == outcome.files.end())
        return "no file";
    const std::string usual = "100644 ";
    const bool isUsual = found->second.compare(0, usual.size(), usual) == 0;
    return isUsual ? found->second.substr(usual.size()) : found->second;
}

/// The entries of the index without their ids.
std::vector<std::string> stagesOf(const DriverOutcome &outcome)
{
    std::vector<std::string> stages;
    for (const std::string &entry : outcome.index)
    {
        const std::size_t id = entry.find(' ');
        stages.push_back(entry.substr(0, id) + entry.substr(entry.find(' ', id + 1)));
    }
    return stages;
}

/// How git and the library are to end.
std::pair<End, End> endsFor(DriverExpectation::Kind kind)
{
    switch (kind)
    {
    case DriverExpectation::OtherFileInConflict:
    case DriverExpectation::OtherStages:
        return {End::Conflict, End::Conflict};
    case DriverExpectation::OnlyGitMerges:
        return {End::Merged, End::Conflict};
    case DriverExpectation::OnlyLibraryMerges:
        return {End::Conflict, End::Merged};
    case DriverExpectation::OnlyGitGivesUp:
        return {End::GivenUp, End::Merged};
    case DriverExpectation::GitGivesUpAConflict:
        return {End::GivenUp, End::Conflict};
    case DriverExpectation::BothGiveUp:
        return {End::GivenUp, End::GivenUp};
    default:
        return {End::Merged, End::Merged};
    }
}

void expectDifference(const DriverCase &driverCase, const DriverOutcome &git,
                      const DriverOutcome &library)
{
    const DriverExpectation &expected = driverCase.expectation;
    const auto [gitsEnd, librarysEnd] = endsFor(expected.kind);
    EXPECT_EQ(endOf(git), gitsEnd);
    EXPECT_EQ(endOf(library), librarysEnd);
    EXPECT_EQ(contentOf(git, driverCase.file), expected.git);
    EXPECT_EQ(contentOf(library, driverCase.file), expected.library);
    if (expected.kind == DriverExpectation::OtherFileInConflict)
    {
        EXPECT_EQ(library.index, git.index);
    }
    if (expected.kind == DriverExpectation::OtherStages)
    {
        EXPECT_EQ(stagesOf(library), stagesOf(git));
    }
}

} // namespace

bool operator==(const DriverOutcome &left, const DriverOutcome &right)
{
    return left.failure.empty() == right.failure.empty() &&
           left.isInConflict == right.isInConflict && left.index == right.index &&
           left.files == right.files;
}

std::ostream &operator<<(std::ostream &stream, const DriverOutcome &outcome)
{
    stream << (outcome.isInConflict ? "in conflict" : "merged");
    if (!outcome.failure.empty())
        stream << ", given up: " << outcome.failure;
    for (const std::string &entry : outcome.index)
        stream << "\n  " << entry;
    for (const auto &[name, content] : outcome.files)
        stream << "\n  " << name << ": " << testing::PrintToString(shorten(content));
    return stream;
}

std::ostream &operator<<(std::ostream &stream, const DriverCase &driverCase)
{
    return stream << driverCase.name;
}

DriverCase runs(const std::string &name, const std::string &script,
                const DriverExpectation &expectation)
{
    return {name, "%T %O %A %B", script, expectation};
}

GitRepository makeRepositoryOf(const DriverCase &driverCase, const fs::path &folder,
                               const HermeticEnvironment &environment)
{
    auto repository = GitRepository::init(folder / "git");
    repository.identify("Test Author", "author@example.com");
    repository.write(".gitattributes", driverCase.attributes);
    driverCase.base(repository);
    repository.commitAll("base");
    repository.git({"checkout", "--quiet", "-b", "theirs"});
    driverCase.theirs(repository);
    repository.commitAll("theirs");
    repository.git({"checkout", "--quiet", "main"});
    driverCase.ours(repository);
    repository.commitAll("ours");

    std::string command = driverCase.command;
    const auto placeholder = command.find("%T");
    if (placeholder != std::string::npos)
        command.replace(placeholder, 2, Scripts(folder / "scripts").shell(driverCase.script));
    for (auto arguments : driverCase.settings)
    {
        std::replace(arguments.begin(), arguments.end(), std::string("%C"), command);
        arguments.insert(arguments.begin(), "config");
        repository.git(arguments);
    }
    if (driverCase.configure)
        driverCase.configure(repository, environment, command);
    return repository;
}

DriverOutcome mergeByGit(const GitRepository &repository)
{
    const CommandResult result = repository.tryGit({"merge", "--quiet", "--no-edit", "theirs"});
    DriverOutcome outcome = readOutcome(repository);
    if (!result.succeeded() && !outcome.isInConflict)
        outcome.failure = "git merge: " + result.errors;
    return outcome;
}

DriverOutcome mergeByLibrary(const GitRepository &repository)
{
    const auto adapter = adapterFor(repository);
    std::string failure;
    try
    {
        git::BranchManager::create(*adapter)->merge("theirs");
    }
    catch (const git::GitException &exception)
    {
        failure = asUtf8(exception.GetUnicodeMessageTxt());
    }
    DriverOutcome outcome = readOutcome(repository);
    if (!outcome.isInConflict)
        outcome.failure = failure;
    return outcome;
}

void expectOutcomes(const DriverCase &driverCase, const DriverOutcome &git,
                    const DriverOutcome &library)
{
    switch (driverCase.expectation.kind)
    {
    case DriverExpectation::Same:
        EXPECT_EQ(library, git);
        break;
    case DriverExpectation::OnlyLibraryGivesUp:
        EXPECT_NE(endOf(git), End::GivenUp);
        EXPECT_EQ(endOf(library), End::GivenUp);
        EXPECT_EQ(contentOf(library, driverCase.file), "ours\n");
        break;
    default:
        expectDifference(driverCase, git, library);
    }
    if (testing::Test::HasFailure())
        std::cerr << "git: " << git << "\nlibrary: " << library << '\n';
}

} // namespace vclink::test
