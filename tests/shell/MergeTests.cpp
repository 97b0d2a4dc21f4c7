// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ShellMergeFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;

const std::string failed = "vclink-shell: \"other\" could not be merged into the current branch.\n";
const std::string wayOn =
    "\nEdit each until it is right, and mark it with \"vclink-shell resolved\". Then conclude the "
    "merge\nwith \"vclink-shell commit\", or undo it with \"git merge --abort\".\n";

class ShellMerge : public ShellMergeFixture
{
  protected:
    /// Merges "other" with the program, and with git in a twin, which has to give the same.
    /// @return what the program wrote to standard output
    std::string mergeAsGit(const std::vector<std::string> &options = {}) const
    {
        const GitRepository twin = makeTwin();
        twin.tryGit({"merge", "--no-edit", "other"});
        std::vector<std::string> arguments{"merge"};
        arguments.insert(arguments.end(), options.begin(), options.end());
        arguments.emplace_back("other");
        const CommandResult result = run(arguments);
        EXPECT_EQ(result.exitStatus, 0) << result.errors;
        EXPECT_EQ(result.errors, "");
        EXPECT_EQ(describe(repository_), describe(twin));
        return result.output;
    }
    std::string parents() const
    {
        return repository_.line({"log", "-1", "--format=%P"});
    }
};

TEST_F(ShellMerge, DoesNothingWhenThereIsNothingToDo)
{
    repository_.git({"branch", "other"});
    commitFiles({{"a", "ours\n"}});
    const std::string before = head();
    EXPECT_EQ(mergeAsGit(), "Already up to date.\n");
    EXPECT_EQ(head(), before);
    EXPECT_EQ(run({"merge", "main"}).output, "Already up to date.\n");
}

TEST_F(ShellMerge, FastForwards)
{
    makeBranch("other", {{"a", "theirs\n"}, {"new", "theirs\n"}});
    const std::string theirs = repository_.line({"rev-parse", "other"});
    EXPECT_EQ(mergeAsGit(), "Fast-forward to " + theirs + ".\n");
    EXPECT_EQ(head(), theirs);
    EXPECT_EQ(repository_.line({"symbolic-ref", "HEAD"}), "refs/heads/main");
}

TEST_F(ShellMerge, MakesAMergeCommit)
{
    diverge();
    const std::string ours = head();
    const std::string output = mergeAsGit();
    EXPECT_EQ(output, "Merge commit " + head() + ".\n");
    EXPECT_EQ(parents(), ours + ' ' + repository_.line({"rev-parse", "other"}));
}

TEST_F(ShellMerge, MakesAMergeCommitInPlaceOfAFastForwardWhereTheConfigurationWantsIt)
{
    makeBranch("other", {{"a", "theirs\n"}});
    repository_.git({"config", "merge.ff", "false"});
    EXPECT_THAT(mergeAsGit(), StartsWith("Merge commit "));
}

TEST_F(ShellMerge, TakesAnyRevisionOfACommit)
{
    diverge();
    repository_.git({"tag", "-a", "-m", "tagged", "v1", "other"});
    EXPECT_EQ(refuse({"merge", "v1"}), "Nothing was merged: 'v1' is an annotated tag. Use "
                                       "\"vclink-shell merge 'v1^{commit}'\".\n");
    EXPECT_EQ(refuse({"merge", "HEAD^{tree}"}),
              "Nothing was merged: there is no branch and no commit 'HEAD^{tree}'.\n");
    EXPECT_THAT(run({"merge", "v1^{commit}"}).output, StartsWith("Merge commit "));
    EXPECT_EQ(run({"merge", repository_.line({"rev-parse", "other"})}).output,
              "Already up to date.\n");
}

TEST_F(ShellMerge, TakesABranchWhateverItsName)
{
    for (const std::string name : {"{}", "++", "a,b", "quo\"te", "ub\xC3\xBC", "#hash", "\xFF"})
    {
        makeBranch("next", {{"new", name}});
        repository_.git({"update-ref", "refs/heads/" + name, "next"});
        repository_.git({"branch", "--quiet", "-D", "next"});
        commitFiles({{"b", name}});
        EXPECT_THAT(run({"merge", name}).output, StartsWith("Merge commit ")) << name;
        EXPECT_EQ(repository_.line({"log", "-1", "--format=%s"}), "Merge branch '" + name + "'");
    }
}

TEST_F(ShellMerge, NamesTheFilesInConflictAndTheWayOn)
{
    clash();
    const GitRepository twin = makeTwin();
    EXPECT_EQ(twin.tryGit({"merge", "other"}).exitStatus, 1);
    const std::string before = head();
    EXPECT_EQ(fail({"merge", "other"}),
              failed +
                  "The merge left conflicts. Resolve them in the files concerned, mark these files "
                  "as resolved, and then commit to complete the merge.\n"
                  "vclink-shell: These files are in conflict:\n  a" +
                  wayOn);
    EXPECT_EQ(head(), before);
    EXPECT_EQ(state(), "Conflicts\n");
    EXPECT_EQ(letters().at("a"), "UU");
    EXPECT_EQ(letters().at("b"), "M ");
    // The markers name the sides in other words.
    EXPECT_THAT(repository_.read("a"),
                testing::AllOf(StartsWith("<<<<<<<"), HasSubstr("ours\n"), HasSubstr("theirs\n")));
    EXPECT_EQ(repository_.git({"ls-files", "--stage"}), twin.git({"ls-files", "--stage"}));
}

TEST_F(ShellMerge, IsConcludedByResolvedAndCommit)
{
    clash();
    const GitRepository twin = makeTwin();
    twin.tryGit({"merge", "other"});
    twin.write("a", "both\n");
    twin.git({"commit", "--quiet", "--all", "--message", "Merge both"});
    fail({"merge", "other"});
    EXPECT_THAT(fail({"commit", "-m", "Merge both"}), HasSubstr("are in conflict:\n  a\n"));
    repository_.write("a", "both\n");
    succeed({"resolved", "a"});
    succeed({"commit", "-m", "Merge both"});
    EXPECT_EQ(state(), "Normal\n");
    EXPECT_EQ(describe(repository_), describe(twin));
    EXPECT_EQ(run({"merge", "other"}).output, "Already up to date.\n");
}

TEST_F(ShellMerge, LeavesOurSideOfAFileThatIsNotToBeMerged)
{
    repository_.write(".gitattributes", "a -merge\n");
    repository_.commitAll("attributes");
    clash();
    const GitRepository twin = makeTwin();
    EXPECT_EQ(twin.tryGit({"merge", "other"}).exitStatus, 1);
    EXPECT_THAT(fail({"merge", "other"}), HasSubstr("in conflict:\n  a\n"));
    EXPECT_EQ(repository_.read("a"), "ours\n");
    EXPECT_EQ(repository_.read("a"), twin.read("a"));
    EXPECT_EQ(repository_.git({"ls-files", "--stage"}), twin.git({"ls-files", "--stage"}));
}

TEST_F(ShellMerge, NamesFilesInConflictWhateverTheirNames)
{
    makeBranch("other", {{"new\nline", "theirs\n"}, {"quo\"te", "theirs\n"}, {"ub\xC3\xBC", "1"}});
    commitFiles({{"new\nline", "ours\n"}, {"quo\"te", "ours\n"}, {"ub\xC3\xBC", "2"}});
    EXPECT_THAT(fail({"merge", "other"}),
                HasSubstr("in conflict:\n  \"new\\nline\"\n  \"quo\\\"te\"\n  ub\xC3\xBC\n"));
}

TEST_F(ShellMerge, TellsItsFailuresInTheLanguageThatWasAskedFor)
{
    clash();
    const std::string german =
        "vclink-shell: „other“ konnte nicht mit dem aktuellen Branch zusammengeführt werden.\n";
    repository_.git({"config", "merge.ff", "only"});
    EXPECT_THAT(fail({"--lang", "de", "merge", "other"}),
                StartsWith(german + "Die beiden Branches haben sich auseinanderentwickelt"));
    repository_.git({"config", "--unset", "merge.ff"});
    EXPECT_THAT(fail({"--lang", "de", "merge", "other"}),
                StartsWith(german + "Beim Zusammenführen sind Konflikte entstanden."));
    EXPECT_THAT(fail({"--lang", "de", "merge", "other"}),
                StartsWith(german + "Eine Zusammenführung kann nicht beginnen"));
    repository_.git({"merge", "--abort"});
    repository_.write(".git/index.lock", "");
    EXPECT_THAT(fail({"--lang", "de", "merge", "other"}),
                HasSubstr("\nGit konnte den Vorgang nicht abschließen: "));
}

TEST_F(ShellMerge, ChangesNothingWhereItCannotBegin)
{
    diverge();
    EXPECT_EQ(refuse({"merge", "nothing"}),
              "Nothing was merged: there is no branch and no commit 'nothing'.\n");
    EXPECT_EQ(refuse({"merge", "othr"}), "Nothing was merged: there is no branch and no commit "
                                         "'othr'. Did you mean 'other'?\n");
    EXPECT_THAT(refuse({"merge", "--", "-x"}), HasSubstr("no commit '-x'"));
    EXPECT_THAT(refuse({"merge", "HEAD:a"}), HasSubstr("no commit 'HEAD:a'"));
    repository_.git({"config", "merge.ff", "only"});
    EXPECT_THAT(refuse({"merge", "other"}), HasSubstr("(merge.ff is set to \"only\")"));
}

TEST_F(ShellMerge, DoesNotBeginBeforeAnotherOperationIsFinished)
{
    clash();
    fail({"merge", "other"});
    const std::string errors = refuse({"merge", "other"});
    EXPECT_THAT(errors, HasSubstr("A merge cannot begin while another operation"));
    EXPECT_THAT(errors, Not(HasSubstr("in conflict")));
}

TEST_F(ShellMerge, DoesNotBeginBeforeTheFirstCommit)
{
    repository_.git({"branch", "other"});
    repository_.git({"checkout", "--quiet", "--orphan", "fresh"});
    EXPECT_THAT(refuse({"merge", "other"}), HasSubstr("GIT_MERGE_ANALYSIS_UNBORN"));
}

TEST_F(ShellMerge, DoesNotBeginWhereTheCommitOfTheBranchCannotBeRead)
{
    makeBranch("other", {{"a", "theirs\n"}});
    const std::string tip = repository_.line({"rev-parse", "other"});
    repository_.remove(".git/objects/" + tip.substr(0, 2) + '/' + tip.substr(2));
    EXPECT_THAT(fail({"merge", "other"}),
                testing::StartsWith(
                    "vclink-shell: Nothing was merged: the commit of 'other' can't be read.\n"));
}

TEST_F(ShellMerge, ThatCannotBeCommittedTellsHowToConcludeIt)
{
    diverge();
    repository_.git({"config", "--unset", "user.name"});
    const std::string errors = fail({"merge", "other"});
    EXPECT_THAT(errors, HasSubstr("Git does not know who makes this commit."));
    EXPECT_THAT(errors, HasSubstr("\nvclink-shell: No file is in conflict. Conclude the merge with "
                                  "\"vclink-shell commit\".\n"));
    repository_.git({"config", "user.name", "A"});
    succeed({"commit", "-m", "Merge"});
    EXPECT_EQ(state(), "Normal\n");
    EXPECT_EQ(parents(), repository_.line({"rev-parse", "main~1"}) + ' ' +
                             repository_.line({"rev-parse", "other"}));
}

TEST_F(ShellMerge, ShowsItsProgress)
{
    diverge();
    const CommandResult result = run({"--progress", "always", "merge", "other"});
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_THAT(result.errors, testing::EndsWith("\r\33[K"));
    EXPECT_THAT(result.errors, HasSubstr("Checking out "));
}

} // namespace
} // namespace vclink::test
