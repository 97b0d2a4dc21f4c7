// SPDX-License-Identifier: MIT
#include "Worker.hpp"

#include <array>
#include <fstream>
#include <stdexcept>
#include <utility>
#include <vector>

#include <git2.h>
#include <unistd.h>

#include "support/text.hpp"
#include "vclink/FileStateMap.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitConfig.hpp"
#include "vclink/git/GitRemote.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

/// Each of them has a command started.
constexpr int drivenFiles = 4;
constexpr int linesInFile = 60;

/// In one piece and unbuffered, so that nothing that has happened is unsaid.
void say(const std::string &line)
{
    const std::string bytes = line + '\n';
    if (::write(STDOUT_FILENO, bytes.data(), bytes.size()) < 0)
        throw std::runtime_error("nobody listens");
}

} // namespace

Worker::Worker(fs::path workplace, std::uint64_t seed)
    : workplace_(std::move(workplace)), root_(workplace_ / "repository"), random_(seed),
      adapter_(git::GitAdapterFactory().createAdapterFor(asPath(root_), interactor_)),
      branches_(git::BranchManager::create(*adapter_))
{
}

void Worker::tidy()
{
    revertAll();
    removeUnversioned();
    if (branches_->getCurrentBranch().getName() != "main")
        branches_->switchBranch("main");
}

void Worker::perform(const std::string &operation)
{
    prepare(operation);
    say("begin " + operation);
    call(operation);
    say("end " + operation + ' ' + head());
}

void Worker::prepare(const std::string &operation)
{
    if (operation == "commit" || operation == "revertFiles" || operation == "push")
        change("ours");
    else if (operation != "fetch" && operation != "generate" && operation != "writeConfig")
        advanceTopic(operation == "mergeDriven");
    if (operation == "push")
        commit();
    if (operation == "mergeThreeWay" || operation == "mergeDriven")
    {
        change("ours");
        if (operation == "mergeDriven")
            change("driven", drivenFiles);
        commit();
    }
    if (operation == "generate")
        fs::remove_all(workplace_ / "clone");
}

void Worker::call(const std::string &operation)
{
    if (operation == "commit")
        commit();
    else if (operation == "revertFiles")
        revertAll();
    else if (operation == "switchBranch")
        branches_->switchBranch("topic");
    else if (operation.compare(0, 5, "merge") == 0)
        branches_->merge("topic");
    else if (operation == "fetch")
        git::GitRemote::create("upstream", *adapter_)
            ->fetch({u"+refs/heads/*:refs/remotes/upstream/*"});
    else if (operation == "push")
        git::GitRemote::create("origin", *adapter_)->push({u"refs/heads/main:refs/heads/main"});
    else if (operation == "generate")
        git::GitAdapterFactory()
            .createWorkingCopyGenerator(interactor_)
            ->generate(asUtf16(workplace_ / "upstream"), asPath(workplace_ / "clone"));
    else if (operation == "writeConfig")
        git::GitConfig().writeMergeTool();
    else
        throw std::out_of_range(operation);
}

void Worker::change(const std::string &folder, int files)
{
    fs::create_directories(root_ / folder);
    for (int file = 0; file < files; ++file)
    {
        std::ofstream stream(root_ / folder / std::to_string(file));
        // Of another size each time: git may take an edit that keeps the size for none within the
        // second in which libgit2 wrote the index.
        stream << std::string(static_cast<std::size_t>(random_.below(50'000)), 'x') << '\n';
        for (int line = 0; line < linesInFile; ++line)
            stream << random_.below(1'000'000'000) << '\n';
    }
    std::vector<upath> unversioned;
    for (const auto &[path, state] : adapter_->getFolderStates(asPath(root_)))
        if (state.getState() == FileState::Unversioned)
            unversioned.push_back(path);
    if (!unversioned.empty())
        adapter_->addFiles(unversioned);
}

void Worker::commit()
{
    adapter_->commit(upath(), u"work");
}

void Worker::advanceTopic(bool isDriven)
{
    if (branches_->getCurrentBranch().getName() != "topic")
        branches_->switchBranch("topic");
    branches_->merge("main");
    change("theirs");
    if (isDriven)
        change("driven", drivenFiles);
    commit();
    branches_->switchBranch("main");
}

void Worker::revertAll()
{
    std::vector<upath> changed;
    for (const auto &[path, state] : adapter_->getFolderStates(asPath(root_)))
        if (state.getState() != FileState::Clean && state.getState() != FileState::Unversioned)
            changed.push_back(path);
    if (!changed.empty())
        adapter_->revertFiles(changed);
}

void Worker::removeUnversioned()
{
    for (const auto &[path, state] : adapter_->getFolderStates(asPath(root_)))
        if (state.getState() == FileState::Unversioned)
            fs::remove(asBytes(path));
}

std::string Worker::head() const
{
    std::array<char, GIT_OID_HEXSZ + 1> digits{};
    const git_oid id = branches_->getRevisionId("HEAD");
    return git_oid_tostr(digits.data(), digits.size(), &id);
}

} // namespace vclink::test
