// SPDX-License-Identifier: MIT
#include <algorithm>
#include <chrono>
#include <exception>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "Peer.hpp"
#include "differential/Random.hpp"
#include "differential/Snapshot.hpp"
#include "support/GitFixture.hpp"
#include "support/LibGit2Session.hpp"
#include "support/adapterFor.hpp"
#include "support/numberFrom.hpp"
#include "support/text.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/BranchParameters.hpp"
#include "vclink/git/GitRemote.hpp"

namespace
{

namespace fs = std::filesystem;
namespace git = vclink::git;
using namespace vclink::test;

constexpr int filesInFolder = 30;
const std::string work = "the work of the user\n";
/// `git commit` reads the index before it locks it, so that it takes back what another process,
/// also `git add`, stages at that moment. The files remain as they are.
const std::string committing = "add and commit";

/// The library in one working copy.
struct Library
{
    explicit Library(const GitRepository &repository)
        : copy(repository), adapter(adapterFor(repository)),
          branches(git::BranchManager::create(*adapter))
    {
    }
    std::vector<upath> path(const std::string &name) const
    {
        return asPaths({(copy / name).string()});
    }

    const GitRepository &copy;
    std::unique_ptr<vclink::CMAdapter> adapter;
    std::unique_ptr<git::BranchManager> branches;
};

bool isIndexed(const GitRepository &copy, const std::string &path)
{
    return takeSnapshot(copy.path(), copy.path()).index.count(path + " 0") == 1;
}

/// Empty for none.
std::string idOf(const GitRepository &copy, const std::string &name)
{
    return copy.tryGit({"rev-parse", "--quiet", "--verify", name}).output;
}

/// The bare repository of the remote "upstream": in the copy, so that each round has its own.
GitRepository upstreamOf(const GitRepository &copy)
{
    return GitRepository(copy / ".git/upstream");
}

/// Whether another branch than this one has its commit.
bool isReached(const GitRepository &copy, const std::string &branch)
{
    const std::string names =
        copy.git({"branch", "--format=%(refname:short)", "--contains", branch});
    return std::count(names.begin(), names.end(), '\n') > 1;
}

/// One of the library's operations that write.
struct Operation
{
    std::string name;
    /// the user's file that it begins with, with `work` in it; empty for none
    std::string edited;
    void (*perform)(const Library &library);
    /// whether everything is there that the library has said is done
    bool (*isDone)(const GitRepository &copy);
    bool isOnlyStaged = false;
};

bool isWorkKept(const GitRepository &copy)
{
    const auto index = takeSnapshot(copy.path(), copy.path()).indexIds;
    return index.count(blobIdOf(work)) == 1 || tipContents(copy.path()).count(blobIdOf(work)) == 1;
}

bool isWorkCommitted(const GitRepository &copy)
{
    return tipContents(copy.path()).count(blobIdOf(work)) == 1;
}

const std::vector<Operation> operations{
    {"add", "new", [](const Library &library) { library.adapter->addFiles(library.path("new")); },
     isWorkKept, true},
    {"remove", "",
     [](const Library &library) { library.adapter->removeFiles(library.path("removed")); },
     [](const GitRepository &copy) { return !isIndexed(copy, "removed"); }, true},
    {"resolve", "conflict",
     [](const Library &library)
     { library.adapter->markResolved(library.path("conflict").front()); },
     isWorkKept},
    {"commit", "mine", [](const Library &library) { library.adapter->commit(upath(), u"library"); },
     isWorkCommitted},
    {"revert", "",
     [](const Library &library)
     {
         library.copy.write("mine", "not wanted\n");
         library.adapter->revertFiles(library.path("mine"));
     },
     [](const GitRepository &copy) { return copy.read("mine") == "mine\n"; }},
    {"switch", "new", [](const Library &library) { library.branches->switchBranch("other"); },
     [](const GitRepository &copy) { return copy.read("new") == work; }},
    {"fastForward", "new", [](const Library &library) { library.branches->merge("ahead"); },
     [](const GitRepository &copy) { return isReached(copy, "ahead"); }},
    {"merge", "new", [](const Library &library) { library.branches->merge("topic"); },
     [](const GitRepository &copy) { return isReached(copy, "topic"); }},
    {"createBranch", "",
     [](const Library &library) {
         library.branches->createBranch({"made", "main"});
     },
     [](const GitRepository &copy) { return !idOf(copy, "refs/heads/made").empty(); }},
    {"deleteBranch", "", [](const Library &library) { library.branches->deleteBranch("gone"); },
     [](const GitRepository &copy) { return idOf(copy, "refs/heads/gone").empty(); }},
    {"fetch", "",
     [](const Library &library)
     { git::GitRemote::create("upstream", *library.adapter)->fetch({}); },
     [](const GitRepository &copy)
     {
         const std::string far = idOf(upstreamOf(copy), "refs/heads/far");
         return idOf(copy, "refs/remotes/upstream/far^{commit}") == far &&
                copy.read(".git/FETCH_HEAD").find(far.substr(0, 40)) != std::string::npos;
     }},
    {"push", "",
     [](const Library &library)
     {
         git::GitRemote::create("upstream", *library.adapter)
             ->push({u"refs/heads/ahead:refs/heads/pushed"});
     },
     // libgit2 reports success even if it cannot move the tracking branch.
     [](const GitRepository &copy)
     {
         const std::string ahead = idOf(copy, "refs/heads/ahead");
         const std::string tracking = idOf(copy, "refs/remotes/upstream/pushed");
         return idOf(upstreamOf(copy), "refs/heads/pushed^{commit}") == ahead &&
                (tracking.empty() || tracking == ahead);
     }}};

std::ostream &operator<<(std::ostream &stream, const Operation &operation)
{
    return stream << operation.name;
}

/// Each of the library's operations beside each operation of the peer, each time in a new working
/// copy. VCLINK_ROUNDS sets how many times, VCLINK_SEED when the library begins.
class TwoProcesses : public GitFixture, public testing::WithParamInterface<Operation>
{
  protected:
    TwoProcesses()
    {
        std::ofstream(environment().home() / ".gitconfig")
            << "[user]\n\tname = Somebody\n\temail = somebody@example.com\n"
               "[gc]\n\tauto = 0\n";
        GitRepository origin = GitRepository::init(origin_);
        for (const auto *name : {"mine", "removed", "conflict"})
            origin.write(name, std::string(name) + '\n');
        writeFolder(origin, "shared", "main");
        origin.commitAll("first");
        origin.git({"branch", "gone"});
        for (const auto *name : {"other", "ahead"})
        {
            origin.git({"switch", "--quiet", "--create", name, "main"});
            writeFolder(origin, "shared", name);
            origin.commitAll(name);
        }
        origin.git({"switch", "--quiet", "main"});
        if (GetParam().name == "merge")
            diverge(origin, "topic", "of topic");
        if (GetParam().name == "resolve")
        {
            diverge(origin, "topic", "conflict");
            origin.tryGit({"merge", "--quiet", "topic"});
        }
        if (GetParam().name == "fetch" || GetParam().name == "push")
            addUpstream(origin);
    }

    void round(const std::string &trade)
    {
        const Operation &operation = GetParam();
        const GitRepository copy(copy_);
        fs::copy(origin_, copy.path(), fs::copy_options::recursive);
        if (!operation.edited.empty())
            copy.write(operation.edited, work);
        const Library library(copy);
        Peer peer(copy, trade);
        std::this_thread::sleep_for(std::chrono::microseconds(random_.below(20'000)));
        std::string raised;
        try
        {
            operation.perform(library);
        }
        catch (const std::exception &exception)
        {
            raised = exception.what();
        }
        peer.stop();
        ++counts_[trade + (raised.empty() ? ", done" : ", refused: " + raised)];
        git_ += peer.succeeded();
        refused_ += peer.failed();
        done_ += raised.empty() ? 1 : 0;

        const bool isDone = !raised.empty() || operation.isDone(copy);
        const bool isUnstaged = !isDone && operation.isOnlyStaged && trade == committing;
        unstaged_ += isUnstaged ? 1 : 0;
        EXPECT_TRUE(isDone || isUnstaged)
            << "the library's work is lost\n"
            << copy.git({"log", "--graph", "--all", "--oneline", "--decorate"})
            << copy.git({"reflog", "main"}) << copy.git({"status", "--short"});
        expectKept(copy, peer.acknowledged(), operation.edited, raised);
        EXPECT_EQ(locksIn(copy), "") << raised;
        fs::remove_all(copy.path());
    }

    void report() const
    {
        std::cout << GetParam().name << ": the library " << done_ << " times done, git " << git_
                  << ", refused " << refused_ << '\n';
        for (const auto &[outcome, count] : counts_)
            std::cout << "  " << count << " x " << outcome << '\n';
        std::cout << "  unstaged by git commit: " << unstaged_ << '\n';
        EXPECT_LE(unstaged_, std::max<std::uint64_t>(1, rounds() / 50));
        // Else it proves nothing.
        EXPECT_GE(done_, 1);
        EXPECT_GE(git_, 1);
    }

    std::uint64_t rounds() const
    {
        return numberFrom("VCLINK_ROUNDS", 1);
    }

  private:
    static void writeFolder(const GitRepository &copy, const std::string &name,
                            const std::string &text)
    {
        for (int file = 0; file < filesInFolder; ++file)
            copy.write(name + '/' + std::to_string(file), text + std::to_string(file) + '\n');
    }
    static void diverge(GitRepository &copy, const std::string &branch, const std::string &path)
    {
        copy.git({"switch", "--quiet", "--create", branch});
        copy.write(path, "of " + branch + '\n');
        copy.commitAll(branch);
        copy.git({"switch", "--quiet", "main"});
        copy.write(path == "conflict" ? path : "of main", "of main\n");
        copy.commitAll("ours");
    }
    /// With a branch "far" that only upstream has.
    void addUpstream(const GitRepository &origin) const
    {
        const GitRepository upstream = upstreamOf(origin);
        origin.git({"clone", "--quiet", "--bare", "--single-branch", ".", upstream.path()});
        upstream.git({"branch", "far",
                      upstream.line({"commit-tree", "-p", "main", "-m", "far", "main^{tree}"})});
        origin.git({"remote", "add", "upstream", upstreamOf(GitRepository(copy_)).path()});
    }
    /// What git has acknowledged, and the user's own file.
    static void expectKept(const GitRepository &copy, const std::vector<std::string> &acknowledged,
                           const std::string &edited, const std::string &raised)
    {
        const auto after = takeSnapshot(copy.path(), copy.path());
        const auto committed = tipContents(copy.path());
        for (const auto &id : acknowledged)
            EXPECT_TRUE(after.indexIds.count(id) == 1 || committed.count(id) == 1)
                << id << ", acknowledged by git, is neither in the index nor in a branch\n"
                << raised;
        const std::set<std::string> user{blobIdOf(edited.empty() ? "" : work)};
        EXPECT_TRUE(edited.empty() || lostOf(user, after, copy.path()).empty()) << raised;
    }
    static std::string locksIn(const GitRepository &copy)
    {
        std::string locks;
        for (const auto &entry : fs::recursive_directory_iterator(copy / ".git"))
            if (entry.path().extension() == ".lock")
                locks += entry.path().string() + '\n';
        return locks;
    }

    LibGit2Session session_{environment()};
    const fs::path origin_ = folder() / "origin";
    const fs::path copy_ = folder() / "copy";
    Random random_{numberFrom("VCLINK_SEED", 1)};
    std::map<std::string, int> counts_;
    int done_ = 0;
    std::uint64_t unstaged_ = 0;
    int git_ = 0;
    int refused_ = 0;
};

TEST_P(TwoProcesses, LoseNothingThatEitherHasAcknowledged)
{
    for (std::uint64_t turn = 0; turn < rounds(); ++turn)
    {
        for (const auto &trade : Peer::trades())
        {
            SCOPED_TRACE("round " + std::to_string(turn) + " beside git " + trade);
            round(trade);
        }
    }
    report();
}

INSTANTIATE_TEST_SUITE_P(Operations, TwoProcesses, testing::ValuesIn(operations),
                         [](const auto &instance) { return instance.param.name; });

} // namespace
