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

DriverCase leaves(const std::string &name, const std::string &script,
                  const DriverExpectation &expectation = {})
{
    DriverCase result{name, "%T %O %A %B", script};
    result.expectation = expectation;
    return result;
}

/// Enough lines for a rename to be found.
std::string lines(const std::string &first, const std::string &last = "last")
{
    return first + "\n2\n3\n4\n5\n6\n7\n8\n9\n" + last + '\n';
}

Change moves(const std::string &from, const std::string &to)
{
    return [from, to](const GitRepository &repository) { repository.git({"mv", from, to}); };
}

Change sets(const std::string &name, unsigned mode)
{
    return [name, mode](const GitRepository &repository) { repository.setMode(name, mode); };
}

Change removes(const std::string &name)
{
    return [name](const GitRepository &repository) { repository.remove(name); };
}

Change links(const std::string &name, const std::string &target)
{
    return [name, target](const GitRepository &repository)
    {
        std::filesystem::remove(repository / name);
        repository.symlink(target, name);
    };
}

void nothing(const GitRepository &)
{
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

/// A driver that a file of Git's configuration names.
DriverCase configured(const std::string &name, decltype(DriverCase::configure) configure)
{
    DriverCase result{name};
    result.configure = std::move(configure);
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
        leaves("OursAsItIs", ":"),
        leaves("OursRemoved", "rm \"$2\"", {Kind::OnlyGitGivesUp, "ours\n", ""}),
        leaves("OursEmpty", ": >\"$2\""),
        leaves("OursWithoutALineFeed", "printf merged >\"$2\""),
        leaves("FiftyMebibytes", "yes 123456789abcdef | head -c 52428800 >\"$2\""),
        leaves("Bytes", "printf 'a\\r\\n\\000\\377\\r' >\"$2\""),
        leaves("AnotherMode", "chmod 755 \"$2\"; echo merged >\"$2\""),
        leaves("AnotherFileInItsPlace", "echo merged >\"$2.new\"; mv \"$2.new\" \"$2\""),
        leaves("AChangedAncestorAndTheirs", "echo x >\"$1\"; echo y >\"$3\""),
        leaves("NoAncestorAndTheirs", "rm \"$1\" \"$3\"; echo merged >\"$2\""),
    };
}

std::vector<DriverCase> sideCases()
{
    const Change base = writes("file", lines("base"));
    const Change ours = writes("file", lines("ours"));
    const Change theirs = writes("file", lines("theirs"));
    const Change movedByOurs = both(moves("file", "new"), writes("new", lines("ours")));
    const Change movedByTheirs = both(moves("file", "new"), writes("new", lines("theirs")));
    return {
        sides("MovedByOurs", base, movedByOurs, theirs),
        sides("MovedByTheirs", base, ours, movedByTheirs),
        sides("MovedByOursIntoAFolder", base,
              both(both([](const GitRepository &repository) { repository.makeFolder("sub"); },
                        moves("file", "sub/file")),
                   writes("sub/file", lines("ours"))),
              theirs),
        sides("MovedApart", base, both(moves("file", "one"), writes("one", lines("ours"))),
              both(moves("file", "two"), writes("two", lines("theirs"))),
              // git merges the content all the same, and libgit2 leaves it to the user.
              {Kind::OtherStages, "no file", "no file"}),
        sides("ExecutableByOurs", base, both(ours, sets("file", 0755)), theirs),
        sides("ExecutableByTheirs", base, ours, both(theirs, sets("file", 0755))),
        sides("ExecutableByBoth", base, both(ours, sets("file", 0755)),
              both(theirs, sets("file", 0755))),
        sides("NoLongerExecutableByOurs", both(base, sets("file", 0755)),
              both(ours, sets("file", 0644)), theirs),
        sides("MovedByOursExecutableByTheirs", base, movedByOurs, both(theirs, sets("file", 0755))),
        sides("ExecutableByOursMovedByTheirs", base, both(ours, sets("file", 0755)), movedByTheirs),
        sides("RemovedByOurs", base, removes("file"), theirs),
        sides("RemovedByTheirs", base, ours, removes("file")),
        // git gives the command an empty ancestor.
        sides("AddedByBoth", nothing, writes("file", "ours\n"), writes("file", "theirs\n"),
              {Kind::OnlyGitMerges, "ours\ntheirs\nfile\n", conflictMarkers}),
        sides("AddedByBothAlike", nothing, writes("file", "same\n"), writes("file", "same\n")),
        sides("ChangedByTheirsOnly", base, writes("other", "x\n"), theirs),
        sides("ChangedByOursOnly", base, ours, writes("other", "x\n")),
        sides("ChangedAlike", base, writes("file", "same\n"), writes("file", "same\n")),
        sides("ChangedInDifferentLines", base, ours, writes("file", lines("base", "theirs"))),
        // libgit2 has the targets of links merged as if they were files.
        sides("ALinkOfBoth", links("file", "base"), links("file", "ours"), links("file", "theirs"),
              {Kind::OnlyLibraryMerges, "120000 ours", "120000 oursbasetheirsfile\n"}),
        sides("BinaryOfBoth", writes("file", std::string("b\0", 2)),
              writes("file", std::string("o\0", 2)), writes("file", std::string("t\0", 2))),
        sides("EmptyBase", writes("file", ""), ours, theirs),
    };
}

DriverCase inAnIncludedFile()
{
    return configured("InAnIncludedFile",
                      [](const GitRepository &repository, const HermeticEnvironment &environment,
                         const std::string &command)
                      {
                          const auto included = environment.home() / "included";
                          defineIn(repository, included, command);
                          repository.git({"config", "include.path", included.string()});
                      });
}

std::vector<DriverCase> configurationCases()
{
    using Environment = HermeticEnvironment;
    DriverCase none = configured(
        "Nowhere", [](const GitRepository &, const Environment &, const std::string &) {});
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
        inAnIncludedFile(),
        configured(
            "TwiceInOneFile",
            [](const GitRepository &repository, const Environment &, const std::string &command)
            {
                repository.git({"config", "merge.tool.driver", "false"});
                repository.git({"config", "--add", "merge.tool.driver", command});
            }),
        configured(
            "UnderAnotherSpelling",
            [](const GitRepository &repository, const Environment &, const std::string &command) {
                repository.git({"config", "merge.Tool.driver", command});
            }),
        configured(
            "WithAName",
            [](const GitRepository &repository, const Environment &, const std::string &command)
            {
                repository.git({"config", "merge.tool.name", "a tool"});
                repository.git({"config", "merge.tool.driver", command});
            }),
        configured(
            "AsTheDefault",
            [](const GitRepository &repository, const Environment &, const std::string &command)
            {
                repository.git({"config", "merge.default", "other"});
                repository.git({"config", "merge.tool.driver", command});
            }),
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
    byDefault.configure =
        [](const GitRepository &repository, const HermeticEnvironment &, const std::string &command)
    {
        repository.git({"config", "merge.default", "tool"});
        repository.git({"config", "merge.tool.driver", command});
    };
    DriverCase text = attributed("TextThoughADriverHasItsName", "* merge=text\n");
    text.configure = [](const GitRepository &repository, const HermeticEnvironment &,
                        const std::string &command) {
        repository.git({"config", "merge.text.driver", command});
    };
    // libgit2's own drivers can't be replaced.
    text.expectation = {Kind::OnlyGitMerges, "ours\nbase\ntheirs\n", conflictMarkers};
    DriverCase inRepository = attributed("InTheRepositorysOwnFile", "");
    inRepository.configure =
        [](const GitRepository &repository, const HermeticEnvironment &, const std::string &command)
    {
        repository.git({"config", "merge.tool.driver", command});
        repository.write(".git/info/attributes", "file merge=tool\n");
    };
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
