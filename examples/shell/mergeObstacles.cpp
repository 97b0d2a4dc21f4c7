// SPDX-License-Identifier: MIT
#include "mergeObstacles.hpp"

#include <filesystem>
#include <map>
#include <utility>
#include <vector>

#include "fl/i18n/convert.hpp"
#include "indexEntries.hpp"
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

/// What the back end reports as missing, told apart.
class MissingEntries
{
  public:
    MissingEntries(const git::BranchManager &manager, std::filesystem::path root)
        : manager_(manager), root_(std::move(root))
    {
    }

    /// To the back end a submodule is a file.
    bool isSubmodule(const std::string &name)
    {
        // Without git: its commit is not in this repository. Contents can lack in a partial clone.
        return canBeRead() ? find(name).mode == submoduleMode
                           : !findRevision(manager_, "HEAD:" + name);
    }

    /// Whether a sparse checkout leaves it out.
    bool isLeftOut(const std::string &name)
    {
        return canBeRead() && find(name).isSkipped;
    }

  private:
    bool canBeRead()
    {
        if (!isRead_)
        {
            isRead_ = true;
            const auto entries = readIndex(root_);
            canBeRead_ = entries.has_value();
            for (const IndexEntry &entry : entries.value_or(std::vector<IndexEntry>()))
            {
                entries_.emplace(entry.name, entry);
            }
        }
        return canBeRead_;
    }

    IndexEntry find(const std::string &name) const
    {
        const auto found = entries_.find(name);
        return found == entries_.end() ? IndexEntry() : found->second;
    }

    const git::BranchManager &manager_;
    std::filesystem::path root_;
    bool isRead_ = false;
    bool canBeRead_ = false;
    std::map<std::string, IndexEntry> entries_;
};

} // namespace

MergeObstacles findMergeObstacles(CMAdapter &adapter, const std::optional<std::string> &theirs)
{
    const auto manager = git::BranchManager::create(adapter);
    TopOfTheirs top(*manager, theirs.value_or(""));
    MissingEntries missing(*manager, nativePath(adapter.getRootFolder()));
    MergeObstacles obstacles;
    for (const auto &entry : wholeStates(adapter))
    {
        const FileState::State state = entry.second.getState();
        const std::string name =
            fl::i18n::ustring_to_utf8(relativeName(entry.first, adapter.getRootFolder()));
        if (state == FileState::Missing && missing.isSubmodule(name))
        {
            obstacles.missingSubmodules.insert(entry);
        }
        else if (state == FileState::Missing && missing.isLeftOut(name))
        {
            continue;
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
