// SPDX-License-Identifier: MIT
#include <utility>

#include "Operation.hpp"
#include "repositories.hpp"
#include "support/text.hpp"
#include "vclink/FileStateMap.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/LibGit2Guard.hpp"
#include "vclink/git/LibGit2Version.hpp"

namespace vclink::test
{
namespace
{

using Names = std::vector<std::string>;

/// The number of a state and the name, for each.
std::string textOf(const FileStateMap &states)
{
    std::string text;
    for (const auto &[path, state] : states)
    {
        const std::string name = asBytes(path);
        text += std::to_string(state.getState()) + name.substr(name.rfind('/') + 1) + ' ';
    }
    return text;
}

/// An operation of an adapter on a list of files.
std::function<Action(const Subject &)>
onFiles(void (git::GitAdapter::*operation)(const std::vector<upath> &), const Names &names)
{
    return [=](const Subject &subject) -> Action
    {
        return [=, files = subject.pathsOf(names)]
        {
            ((*subject.adapter).*operation)(files);
            return std::string();
        };
    };
}

Action commit(const Subject &subject)
{
    return [=]
    {
        subject.adapter->commit(upath(), u"a message");
        return std::string();
    };
}

std::function<Action(const Subject &)> markResolved(const std::string &name)
{
    return [=](const Subject &subject) -> Action
    {
        return [=, file = subject.pathOf(name)]
        {
            subject.adapter->markResolved(file);
            return std::string();
        };
    };
}

Action getFileStates(const Subject &subject)
{
    return [=, files = subject.pathsOf({"file", "other", "staged", "new", "sub/inside"})]
    { return textOf(subject.adapter->getFileStates(files)); };
}

Action getFolderStates(const Subject &subject)
{
    return [=] { return textOf(subject.adapter->getFolderStates(subject.pathOf("."))); };
}

Action getVersion(const Subject & /*subject*/)
{
    return [] { return git::LibGit2Version().toString(); };
}

Action holdGuard(const Subject & /*subject*/)
{
    return []
    {
        const git::LibGit2Guard guard;
        return std::string();
    };
}

Action isAdapterFor(const Subject &subject)
{
    return [root = asPath(subject.repository.path())]
    { return std::to_string(static_cast<int>(git::GitAdapterFactory().isAdapterFor(root))); };
}

Action createAdapterFor(const Subject &subject)
{
    return [root = asPath(subject.repository.path()), interactor = subject.interactor] {
        return asBytes(
            git::GitAdapterFactory().createAdapterFor(root, interactor)->getRootFolder());
    };
}

const std::string alreadyAdded =
    "foundation::core::except::Exception<shared_vclink::git::AlreadyAdded,";
const std::string noFilesToRemove =
    "foundation::core::except::Exception<shared_vclink::git::NoFilesToRemove,";

} // namespace

std::vector<Operation> adapterOperations()
{
    using Adapter = git::GitAdapter;
    const std::vector<Names> unstage{{"reset", "--quiet"}};
    return {
        {"LibGit2Version", makePlain, getVersion, "", {}, false},
        {"LibGit2Guard", makePlain, holdGuard, "", {}, false},
        {"isAdapterFor", makePlain, isAdapterFor, "", {}, false},
        {"createAdapterFor", makePlain, createAdapterFor, "", {}, false},
        {"getFileStates", makeChanged, getFileStates, "", {}, false},
        {"getFolderStates", makeChanged, getFolderStates, "", {}, false},
        {"getFolderStatesOfMovedTree", makeMovedTree, getFolderStates, "", {}, false},
        {"addFiles", makeChanged, onFiles(&Adapter::addFiles, {"new"}), alreadyAdded, unstage},
        {"addFilesBesideEmptied", makeEmptied, onFiles(&Adapter::addFiles, {"new"}), alreadyAdded,
         unstage},
        {"addFilesIdentified", makeIdentified, onFiles(&Adapter::addFiles, {"new"}), alreadyAdded,
         unstage},
        {"removeFiles", makePlain, onFiles(&Adapter::removeFiles, {"file"}), noFilesToRemove,
         unstage},
        {"markResolved", makeConflicted, markResolved("file")},
        {"markResolvedEmptied", makeEmptied, markResolved("file")},
        {"markResolvedMissing", makeChanged, markResolved("other")},
        {"revertFiles", makeChanged, onFiles(&Adapter::revertFiles, {"file", "other", "staged"})},
        {"revertFilesTypeChange", makeTypeChange, onFiles(&Adapter::revertFiles, {"file"})},
        {"revertFilesUnborn", makeEmpty, onFiles(&Adapter::revertFiles, {"file"})},
        {"commit", makeChanged, commit},
        {"commitFirst", makeEmpty, commit},
        {"commitAnonymous", makeAnonymous, commit},
        {"commitSparse", makeSparse, commit},
        {"commitEmptied", makeEmptied, commit},
        {"commitIdentified", makeIdentified, commit},
        {"commitNothing", makeUnindexed, commit},
        {"commitUnreadable", makeUnreadable, commit},
        {"commitMerge", makeMerging, commit},
        {"commitMergeWithoutMark", makeMergingWithoutMark, commit},
        {"commitMergeOfSubmodule", makeMergingSubmodule, commit},
    };
}

} // namespace vclink::test
