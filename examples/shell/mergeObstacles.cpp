// SPDX-License-Identifier: MIT
#include "mergeObstacles.hpp"

#include <map>
#include <utility>

#include "fl/i18n/convert.hpp"
#include "names.hpp"
#include "revisions.hpp"
#include "states.hpp"
#include "vclink/git/BranchManager.hpp"
#include "workingCopy.hpp"

namespace vclink::shell
{
namespace
{

/// What the other side has at the top, looked up once for each name.
class TopOfTheirs
{
  public:
    TopOfTheirs(const git::BranchManager &manager, std::string theirs)
        : manager_(manager), theirs_(std::move(theirs))
    {
    }

    /// Whether their side has something in the place of this file. Looks only at the top, because
    /// libgit2's own refusals concern files there, and the library's refusals name a file.
    bool collidesWith(const std::string &name)
    {
        const std::size_t end = name.find('/');
        const std::string top = name.substr(0, end);
        auto known = kinds_.find(top);
        if (known == kinds_.end())
        {
            known = kinds_.emplace(top, kindOf(top)).first;
        }
        return known->second == Kind::File ||
               (known->second == Kind::Folder && end == std::string::npos);
    }

  private:
    enum class Kind
    {
        Nothing,
        File,
        Folder
    };

    Kind kindOf(const std::string &top) const
    {
        const auto id = findRevision(manager_, theirs_ + ':' + top);
        if (!id)
        {
            return Kind::Nothing;
        }
        return findRevision(manager_, *id + "^{tree}") ? Kind::Folder : Kind::File;
    }

    const git::BranchManager &manager_;
    std::string theirs_;
    std::map<std::string, Kind> kinds_;
};

/// To the back end a submodule is a file. Its commit is not in this repository.
bool isSubmodule(const git::BranchManager &manager, const std::string &name)
{
    return !findRevision(manager, "HEAD:" + name);
}

} // namespace

MergeObstacles findMergeObstacles(CMAdapter &adapter, const std::optional<std::string> &theirs)
{
    const auto manager = git::BranchManager::create(adapter);
    TopOfTheirs top(*manager, theirs.value_or(""));
    MergeObstacles obstacles;
    for (const auto &entry : wholeStates(adapter))
    {
        const FileState::State state = entry.second.getState();
        const std::string name =
            fl::i18n::ustring_to_utf8(relativeName(entry.first, adapter.getRootFolder()));
        if (state == FileState::Missing && isSubmodule(*manager, name))
        {
            obstacles.missingSubmodules.insert(entry);
        }
        else if (isChanged(state))
        {
            obstacles.changed.insert(entry);
        }
        else if (state == FileState::Unversioned && theirs && top.collidesWith(name))
        {
            obstacles.untracked.insert(entry);
        }
    }
    return obstacles;
}

} // namespace vclink::shell
