// SPDX-License-Identifier: MIT
// What the command leaves, what the sides are, where the driver comes from.
#include <cstdlib>
#include <filesystem>

#include "DriverContract.hpp"

namespace vclink::test
{
namespace
{

using Kind = DriverExpectation;

/// Enough lines for a rename to be found.
std::string lines(const std::string &first, const std::string &last = "last")
{
    return first + "\n2\n3\n4\n5\n6\n7\n8\n9\n" + last + '\n';
}

DriverCase sides(const std::string &name, const Change &base, const Change &ours,
                 const Change &theirs, const DriverExpectation &expectation = {})
{
    DriverCase result{name, "%T %O %A %B %P", "{ cat \"$1\"; cat \"$3\"; echo \"$4\"; } >>\"$2\""};
    result.base = base;
    result.ours = ours;
    result.theirs = theirs;
    result.expectation = expectation;
    return result;
}

using Settings = decltype(DriverCase::settings);

/// A driver that these runs of `git config` define.
DriverCase configured(const std::string &name, const Settings &settings)
{
    DriverCase result{name};
    result.settings = settings;
    return result;
}

/// A driver that is defined otherwise.
DriverCase configured(const std::string &name, const decltype(DriverCase::configure) &configure)
{
    DriverCase result = configured(name, Settings());
    result.configure = configure;
    return result;
}

void defineIn(const GitRepository &repository, const std::filesystem::path &file,
              const std::string &command)
{
    std::filesystem::create_directories(file.parent_path());
    repository.git({"config", "--file", file.string(), "merge.tool.driver", command});
}

/// A driver that several files define, below the home folder or, without a name, of the repository;
/// the last of them with the command, the others with one that fails.
DriverCase definedIn(const std::string &name, const std::vector<std::string> &files)
{
    return configured(name,
                      [files](const GitRepository &repository,
                              const HermeticEnvironment &environment, const std::string &command)
                      {
                          for (const std::string &file : files)
                          {
                              const std::string value = &file == &files.back() ? command : "false";
                              if (file.empty())
                                  repository.git({"config", "merge.tool.driver", value});
                              else
                                  defineIn(repository, environment.home() / file, value);
                          }
                      });
}

/// A driver that the system's configuration file defines, and none of the files below the home
/// folder.
DriverCase inTheSystemFile(const std::string &name, const std::string &other)
{
    return configured(name,
                      [other](const GitRepository &repository,
                              const HermeticEnvironment &environment, const std::string &command)
                      {
                          // Where the environment has libgit2 look for it.
                          const auto system = environment.home().parent_path() / "etc/gitconfig";
                          defineIn(repository, system, other.empty() ? command : "false");
                          if (!other.empty())
                              defineIn(repository, environment.home() / other, command);
                          ::unsetenv("GIT_CONFIG_NOSYSTEM");
                          ::setenv("GIT_CONFIG_SYSTEM", system.c_str(), 1);
                      });
}

DriverCase attributed(const std::string &name, const std::string &attributes,
                      const DriverExpectation &expectation = {})
{
    DriverCase result{name};
    result.attributes = attributes;
    result.expectation = expectation;
    return result;
}

} // namespace

std::vector<DriverCase> resultCases()
{
    return {
        runs("OursAsItIs", ":"),
        runs("OursRemoved", "rm \"$2\"", {Kind::OnlyGitGivesUp, "ours\n", ""}),
        runs("OursEmpty", ": >\"$2\""),
        runs("OursWithoutALineFeed", "printf merged >\"$2\""),
        runs("FiftyMebibytes", "yes 123456789abcdef | head -c 52428800 >\"$2\""),
        runs("Bytes", "printf 'a\\r\\n\\000\\377\\r' >\"$2\""),
        runs("AnotherMode", "chmod 755 \"$2\"; echo merged >\"$2\""),
        runs("AnotherFileInItsPlace", "echo merged >\"$2.new\"; mv \"$2.new\" \"$2\""),
        runs("AChangedAncestorAndTheirs", "echo x >\"$1\"; echo y >\"$3\""),
        runs("NoAncestorAndTheirs", "rm \"$1\" \"$3\"; echo merged >\"$2\""),
    };
}

std::vector<DriverCase> sideCases()
{
    const Change base = writes("file", lines("base"));
    const Change ours = writes("file", lines("ours"));
    const Change theirs = writes("file", lines("theirs"));
    const Change movedByOurs = moves("file", "new") + writes("new", lines("ours"));
    const Change movedByTheirs = moves("file", "new") + writes("new", lines("theirs"));
    return {
        sides("MovedByOurs", base, movedByOurs, theirs),
        sides("MovedByTheirs", base, ours, movedByTheirs),
        sides("MovedByOursIntoAFolder", base,
              makesFolder("sub") + moves("file", "sub/file") + writes("sub/file", lines("ours")),
              theirs),
        sides("MovedApart", base, moves("file", "one") + writes("one", lines("ours")),
              moves("file", "two") + writes("two", lines("theirs")),
              // git merges the content all the same, and libgit2 leaves it to the user.
              {Kind::OtherStages, "no file", "no file"}),
        sides("ExecutableByOurs", base, ours + makesExecutable("file"), theirs),
        sides("ExecutableByTheirs", base, ours, theirs + makesExecutable("file")),
        sides("ExecutableByBoth", base, ours + makesExecutable("file"),
              theirs + makesExecutable("file")),
        sides(
            "NoLongerExecutableByOurs", base + makesExecutable("file"),
            ours + [](const GitRepository &copy) { copy.setMode("file", 0644); }, theirs),
        sides("MovedByOursExecutableByTheirs", base, movedByOurs, theirs + makesExecutable("file")),
        sides("ExecutableByOursMovedByTheirs", base, ours + makesExecutable("file"), movedByTheirs),
        sides("RemovedByOurs", base, removes("file"), theirs),
        sides("RemovedByTheirs", base, ours, removes("file")),
        // git gives the command an empty ancestor.
        sides("AddedByBoth", changesNothing, writes("file", "ours\n"), writes("file", "theirs\n"),
              {Kind::OnlyGitMerges, "ours\ntheirs\nfile\n", conflictMarkers}),
        sides("AddedByBothAlike", changesNothing, writes("file", "same\n"),
              writes("file", "same\n")),
        sides("ChangedByTheirsOnly", base, writes("other", "x\n"), theirs),
        sides("ChangedByOursOnly", base, ours, writes("other", "x\n")),
        sides("ChangedAlike", base, writes("file", "same\n"), writes("file", "same\n")),
        sides("ChangedInDifferentLines", base, ours, writes("file", lines("base", "theirs"))),
        // libgit2 has the targets of links merged as if they were files.
        sides("ALinkOfBoth", links("base", "file"), links("ours", "file"), links("theirs", "file"),
              {Kind::OnlyLibraryMerges, "120000 ours", "120000 oursbasetheirsfile\n"}),
        sides("BinaryOfBoth", writes("file", std::string("b\0", 2)),
              writes("file", std::string("o\0", 2)), writes("file", std::string("t\0", 2))),
        sides("EmptyBase", writes("file", ""), ours, theirs),
    };
}

std::vector<DriverCase> configurationCases()
{
    using Environment = HermeticEnvironment;
    const DriverCase none = configured("Nowhere", Settings());
    DriverCase clean = none;
    clean.name = "NowhereForAFileWithoutConflicts";
    clean.base = writes("file", lines("base"));
    clean.ours = writes("file", lines("ours"));
    clean.theirs = writes("file", lines("base", "theirs"));
    return {
        none,
        clean,
        inTheSystemFile("InTheSystemFile", {}),
        inTheSystemFile("InTheGlobalBeforeTheSystemFile", ".gitconfig"),
        inTheSystemFile("InTheXdgBeforeTheSystemFile", ".config/git/config"),
        definedIn("InTheGlobalFile", {".gitconfig"}),
        definedIn("InTheXdgFile", {".config/git/config"}),
        definedIn("InTheRepositoryBeforeTheGlobalFile", {".gitconfig", ""}),
        definedIn("InTheRepositoryBeforeTheXdgFile", {".config/git/config", ""}),
        definedIn("InTheGlobalBeforeTheXdgFile", {".config/git/config", ".gitconfig"}),
        configured("InAnIncludedFile",
                   [](const GitRepository &repository, const Environment &environment,
                      const std::string &command)
                   {
                       const auto included = environment.home() / "included";
                       defineIn(repository, included, command);
                       repository.git({"config", "include.path", included.string()});
                   }),
        configured("TwiceInOneFile",
                   {{"merge.tool.driver", "false"}, {"--add", "merge.tool.driver", "%C"}}),
        configured("UnderAnotherSpelling", {{"merge.Tool.driver", "%C"}}),
        configured("WithAName", {{"merge.tool.name", "a tool"}, {"merge.tool.driver", "%C"}}),
        configured("AsTheDefault", {{"merge.default", "other"}, {"merge.tool.driver", "%C"}}),
        configured("WithoutAValue",
                   [](const GitRepository &repository, const Environment &, const std::string &)
                   {
                       repository.write(".git/config", repository.read(".git/config") +
                                                           "[merge \"tool\"]\n\tdriver\n");
                   }),
    };
}

std::vector<DriverCase> attributeCases()
{
    DriverCase byDefault = attributed("NoneAndADefault", "");
    byDefault.settings.push_back({"merge.default", "tool"});
    // libgit2's own drivers can't be replaced.
    DriverCase text = attributed("TextThoughADriverHasItsName", "* merge=text\n",
                                 {Kind::OnlyGitMerges, "ours\nbase\ntheirs\n", conflictMarkers});
    text.settings = {{"merge.text.driver", "%C"}};
    DriverCase inRepository = attributed("InTheRepositorysOwnFile", "");
    inRepository.configure =
        [](const GitRepository &repository, const HermeticEnvironment &, const std::string &)
    { repository.write(".git/info/attributes", "file merge=tool\n"); };
    return {
        attributed("None", ""),
        attributed("Text", "* merge=text\n"),
        attributed("Union", "* merge=union\n"),
        // Only -merge, and -text with a driver's name, keep markers out.
        attributed("Binary", "* merge=binary\n",
                   {Kind::OtherFileInConflict, "ours\n", conflictMarkers}),
        attributed("Unset", "* -merge\n"),
        attributed("SetBack", "* merge=tool\nfile !merge\n"),
        attributed("Set", "* merge\n"),
        attributed("AnUnknownName", "* merge=unknown\n"),
        attributed("TheMacroBinary", "* binary\n"),
        attributed("AMacroOfItsOwn", "[attr]mine merge=tool\n* mine\n"),
        attributed("TheLastLineThatMatches", "* merge=unknown\nfile merge=tool\n"),
        attributed("NotText", "* -text merge=tool\n"),
        inRepository,
        text,
        byDefault,
    };
}

} // namespace vclink::test
