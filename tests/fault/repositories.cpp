// SPDX-License-Identifier: MIT
#include "repositories.hpp"

#include <filesystem>

#include "support/Change.hpp"

namespace vclink::test
{
namespace
{

void configureIdentity(const GitRepository &repository)
{
    repository.identify("Test Person", "person@example.com");
}

void diverge(GitRepository &repository, const Change &ours, const Change &theirs)
{
    repository.makeBranch("topic", theirs);
    repository.commitAll(ours, "on main");
}

void divergeInFile(GitRepository &repository)
{
    diverge(repository, writes("file", "ours\n"), writes("file", "theirs\n"));
}

/// Stages a repository of its own.
void addSubmodule(const GitRepository &repository, const std::string &path)
{
    auto submodule = GitRepository::init(repository / path);
    submodule.write("inner", path);
    submodule.commitAll("inner");
    repository.add({path});
}

void makeConflictUnder(GitRepository &repository, const std::string &attributes)
{
    repository.write(".gitattributes", attributes);
    makePlain(repository);
    divergeInFile(repository);
}

} // namespace

void makePlain(GitRepository &repository)
{
    configureIdentity(repository);
    repository.commitAll(writes("file", "1\n2\n3\n") + writes("other", "other\n") +
                             writes("sub/inside", "inside\n"),
                         "first");
}

void makeEmpty(GitRepository &repository)
{
    configureIdentity(repository);
    repository.write("file", "1\n");
    repository.add({"file"});
}

void makeChanged(GitRepository &repository)
{
    makePlain(repository);
    repository.write("file", "changed\n");
    repository.remove("other");
    repository.write("staged", "staged\n");
    repository.add({"staged"});
    repository.write("new", "new\n");
}

void makeUnindexed(GitRepository &repository)
{
    makePlain(repository);
    repository.git({"rm", "--quiet", "--cached", "-r", "."});
}

void makeAnonymous(GitRepository &repository)
{
    makeChanged(repository);
    repository.git({"config", "--unset", "user.name"});
    repository.git({"config", "--unset", "user.email"});
}

void makeSparse(GitRepository &repository)
{
    makePlain(repository);
    repository.git({"update-index", "--skip-worktree", "sub/inside"});
    repository.remove("sub");
    repository.remove("file");
    repository.write("file/untracked", "x");
}

void makeEmptied(GitRepository &repository)
{
    repository.write(".gitattributes", "* text\n");
    makePlain(repository);
    writesEach({"file", "other"}, "")(repository);
    repository.write("new", "new\n");
}

void makeIdentified(GitRepository &repository)
{
    repository.write(".gitattributes", "* text ident\n");
    makePlain(repository);
    const std::string ofNoContent(40, '1');
    writesEach({"file", "new"}, "$Id: " + ofNoContent + " $\r\n$Id: 2$\r\n")(repository);
}

void makeUnreadable(GitRepository &repository)
{
    makePlain(repository);
    repository.remove("sub");
    repository.symlink("sub", "sub");
}

void makeTypeChange(GitRepository &repository)
{
    makePlain(repository);
    repository.remove("file");
    repository.symlink("other", "file");
    repository.add({"file"});
}

void makeBranches(GitRepository &repository)
{
    makePlain(repository);
    repository.makeBranch("topic", writes("file", "theirs\n") + writes("added", "added\n"));
    repository.git({"update-ref", "refs/remotes/origin/main", "HEAD"});
}

void makeLinkedTree(GitRepository &repository)
{
    makeBranches(repository);
    const std::string linked = repository.path().parent_path() / "linked";
    repository.git({"worktree", "add", "--quiet", "-b", "elsewhere", linked});
    repository.git({"-C", linked, "bisect", "start"});
}

void makeMovedTree(GitRepository &repository)
{
    const std::filesystem::path root = repository.path();
    const std::filesystem::path old = root.parent_path() / "old";
    auto main = GitRepository::init(root.parent_path() / "main");
    makePlain(main);
    main.git({"worktree", "add", "--quiet", "-b", "own", old.string()});
    std::filesystem::remove_all(root);
    std::filesystem::rename(old, root);
    repository.write("file", "changed\n");
}

void makeSettings(GitRepository &repository)
{
    makeBranches(repository);
    repository.git({"config", "branch.topic.remote", "origin"});
    repository.git({"config", "branch.topic.base", "one"});
    repository.git({"config", "--add", "branch.topic.base", "two"});
}

void makeLinkedFolder(GitRepository &repository)
{
    makeBranches(repository);
    repository.remove("sub");
    repository.symlink("nowhere", "sub");
}

void makeReplacedFolder(GitRepository &repository)
{
    makePlain(repository);
    repository.commitAll(writes("folder/deep/inside", "x\n"), "deeper");
    repository.makeBranch("topic", removes("folder") + writes("folder", "theirs\n"));
}

void makeChangedAttributes(GitRepository &repository)
{
    makePlain(repository);
    repository.commitAll(writes(".gitattributes", "* -text\n"), "attributes");
    repository.makeBranch("topic", writes(".gitattributes", "* text eol=crlf\n") +
                                       writes("added", "added\n"));
}

void makeDivergedAttributes(GitRepository &repository)
{
    makeChangedAttributes(repository);
    repository.commitAll(writes("other", "ours\n"), "ours");
}

void makeBrokenLink(GitRepository &repository)
{
    makeBranches(repository);
    links("nowhere", ".git/refs/heads/broken")(repository);
}

void makePromising(GitRepository &repository)
{
    makeBranches(repository);
    repository.write(".git/objects/info/alternates", "../lender\n");
    repository.write(".git/lender/pack/pack-of-another-repository.promisor", "");
}

void makeUpToDate(GitRepository &repository)
{
    makeBranches(repository);
    repository.git({"merge", "--quiet", "topic"});
}

void makeDiverged(GitRepository &repository)
{
    makeBranches(repository);
    repository.commitAll(writes("other", "ours\n"), "on main");
}

void makeHidden(GitRepository &repository)
{
    makePlain(repository);
    repository.commitAll(links("file", "link"), "link");
    diverge(repository, writes("other", "ours\n"), writes("sub/inside", "theirs\n"));
    repository.git({"update-index", "--skip-worktree", "link", "sub/inside"});
}

void makeIgnored(GitRepository &repository)
{
    makeDiverged(repository);
    repository.write(".git/info/exclude", "added\n");
    repository.write("added/ignored", "x");
}

void makeSubmodules(GitRepository &repository)
{
    makePlain(repository);
    addSubmodule(repository, "gone");
    repository.commit("submodule");
    repository.git({"checkout", "--quiet", "-b", "topic"});
    repository.git({"rm", "--quiet", "--cached", "gone"});
    repository.write("file", "theirs\n");
    repository.add({"file"});
    addSubmodule(repository, "come");
    repository.commit("on topic");
    repository.git({"checkout", "--quiet", "main"});
}

void makeDivergedSubmodules(GitRepository &repository)
{
    makeSubmodules(repository);
    repository.write("other", "ours\n");
    repository.add({"other"});
    repository.commit("on main");
}

void makeMergingWithoutMark(GitRepository &repository)
{
    makeMerging(repository);
    repository.remove(".git/AUTO_MERGE");
    repository.write(".git/MERGE_MODE", "no-ff");
}

void makeMergingSubmodule(GitRepository &repository)
{
    makePlain(repository);
    addSubmodule(repository, "moved");
    repository.commit("submodule");
    GitRepository submodule(repository / "moved");
    const std::string before = submodule.line({"rev-parse", "HEAD"});
    repository.makeBranch("topic", [&](const GitRepository &) { submodule.commitAll("moved"); });
    submodule.git({"checkout", "--quiet", before});
    repository.commitAll(writes("other", "ours\n"), "on main");
    repository.git({"merge", "--quiet", "--no-commit", "topic"});
}

void makeMerging(GitRepository &repository)
{
    makeDiverged(repository);
    repository.git({"merge", "--quiet", "--no-commit", "topic"});
}

void makeConflict(GitRepository &repository)
{
    makePlain(repository);
    divergeInFile(repository);
}

void makeMergedBesideLock(GitRepository &repository)
{
    makePlain(repository);
    diverge(repository, writes("file", "ours\n2\n3\n"),
            writes("file", "1\n2\ntheirs\n") + writes("file.lock", "theirs\n"));
}

void makeFileAndFolder(GitRepository &repository)
{
    makePlain(repository);
    diverge(repository, writes("new/inside", "ours\n"), writes("new", "theirs\n"));
}

void makeUnmergeableConflict(GitRepository &repository)
{
    makeConflictUnder(repository, "file -merge\n");
}

void makeConflictForTool(GitRepository &repository)
{
    makeConflictUnder(repository, "file merge=tool\n");
    repository.git({"config", "merge.tool.driver", "cp %B %A"});
}

void makeConflicted(GitRepository &repository)
{
    makeConflict(repository);
    repository.tryGit({"merge", "--quiet", "topic"});
}

void makeRemote(GitRepository &repository)
{
    makePlain(repository);
    const std::string origin = repository.path().parent_path() / "origin";
    repository.git({"clone", "--quiet", "--bare", ".", origin});
    repository.git({"remote", "add", "origin", origin});
    repository.commitAll(writes("file", "theirs\n"), "on origin");
    repository.git({"push", "--quiet", origin, "main"});
    repository.git({"reset", "--quiet", "--hard", "HEAD~1"});
    // So that the objects have to be fetched.
    repository.git({"reflog", "expire", "--expire=now", "--all"});
    repository.git({"gc", "--quiet", "--prune=now"});
    repository.commitAll(writes("other", "ours\n"), "here");
}

void makeGuardedFetch(GitRepository &repository)
{
    makeRemote(repository);
    repository.git({"branch", "copy", "main~1"});
    // Otherwise libgit2 itself finds out whether the branch moves forward.
    repository.git({"config", "--add", "remote.origin.fetch", "refs/heads/main:refs/heads/copy"});
    repository.git({"config", "fetch.prune", "true"});
}

void makeGuardedPush(GitRepository &repository)
{
    makeRemote(repository);
    const GitRepository origin(repository.path().parent_path() / "origin");
    repository.git({"tag", "v1", "main~1"});
    repository.git({"push", "--quiet", "origin", "v1", "v1:refs/heads/kept"});
    repository.git({"config", "remote.origin.pushurl", origin.path().string()});
    origin.git({"worktree", "add", "--quiet", "../linked", "kept"});
    origin.git({"config", "receive.denyCurrentBranch", "ignore"});
    origin.git({"config", "receive.denyNonFastForwards", "true"});
}

void makeAttributes(GitRepository &repository)
{
    makePlain(repository);
    repository.write(".gitattributes", "file colour=blue\n");
}

} // namespace vclink::test
