// SPDX-License-Identifier: MIT
#include "main/checkout/noticedObstacles.hpp"

#include <git2/diff.h>
#include <sys/stat.h>

#include "main/checkout/gitlinks.hpp"
#include "main/checkout/obstaclesAhead.hpp"

namespace vclink::git
{
namespace
{

bool isFolder(const git_diff_file *file)
{
    return file != nullptr && S_ISDIR(file->mode);
}

/// Returns true if the checkout will create a file or link here.
bool makesFile(const CheckoutNotice &notice)
{
    return notice.why == GIT_CHECKOUT_NOTIFY_UPDATED && notice.target != nullptr &&
           !isGitlink(notice.target) && !isFolder(notice.target);
}

/// Returns the name of what is in the place, which can be something above the path.
std::string nameOf(const git_diff_file &workdir)
{
    std::string name = workdir.path;
    if (!name.empty() && name.back() == '/')
    {
        name.pop_back();
    }
    return name;
}

} // namespace

Finding findUnseen(WorkingCopy &copy, const CheckoutNotice &notice)
{
    if (notice.why != GIT_CHECKOUT_NOTIFY_UPDATED || notice.target == nullptr ||
        notice.workdir != nullptr)
    {
        return {};
    }
    const std::string name = notice.path;
    const WorkingCopy::Way &way = copy.wayTo(name);
    const bool goes = notice.baseline == nullptr && way.standing == Standing::Link;
    if (!way.blocker.empty() && !(goes && copy.isIgnored(way.blocker)))
    {
        return inTheWay(way.blocker, way.standing);
    }
    const Standing standing = copy.at(name);
    if (standing == Standing::Folder && copy.isFolderInHead(name))
    {
        // libgit2 first removes what HEAD has there.
        const std::string foreign = copy.foreignBelow(name);
        return foreign.empty() ? Finding() : inChangedFolder(foreign, copy.at(foreign));
    }
    const bool isInTheWay =
        standing == Standing::Special || (!isGitlink(notice.target) && copy.holdsFiles(name));
    return isInTheWay ? inTheWay(name, standing) : Finding();
}

Finding findMissingFile(WorkingCopy & /*copy*/, const CheckoutNotice &notice)
{
    const bool isMissing = notice.why == GIT_CHECKOUT_NOTIFY_UPDATED && isFolder(notice.target) &&
                           notice.baseline != nullptr && notice.workdir == nullptr;
    if (!isMissing)
    {
        return {};
    }
    const std::string name = notice.path;
    return Obstacle{name, "the file '" + name + "', which becomes a folder, is missing: bring it " +
                              "back with 'git restore --source=HEAD --staged --worktree' first"};
}

Finding findEdit(WorkingCopy & /*copy*/, const CheckoutNotice &notice)
{
    const bool isEdit = notice.why == GIT_CHECKOUT_NOTIFY_DIRTY && notice.baseline != nullptr &&
                        notice.workdir != nullptr;
    const bool isSubmodule =
        isGitlink(notice.workdir) || (isGitlink(notice.baseline) && isFolder(notice.workdir));
    if (!isEdit || isSubmodule)
    {
        return {};
    }
    return editBeforeMerge(nameOf(*notice.workdir));
}

Finding findUntrackedNoticed(WorkingCopy &copy, const CheckoutNotice &notice)
{
    if (!makesFile(notice) || notice.baseline != nullptr || notice.workdir == nullptr)
    {
        return {};
    }
    const std::string name = nameOf(*notice.workdir);
    const Standing standing = copy.at(name);
    const bool isEmpty =
        standing == Standing::Nothing || (standing == Standing::Folder && !copy.holdsFiles(name));
    if (isEmpty || copy.entryOf(name) != nullptr || copy.isIgnored(name))
    {
        return {};
    }
    return inTheWay(name, standing);
}

Finding findForeignInFolderNoticed(WorkingCopy &copy, const CheckoutNotice &notice)
{
    if (!makesFile(notice) || !isFolder(notice.baseline) || !isFolder(notice.workdir))
    {
        return {};
    }
    const std::string name = copy.foreignBelow(nameOf(*notice.workdir));
    return name.empty() ? Finding() : inChangedFolder(name, copy.at(name));
}

Finding findFolderNoticed(WorkingCopy &copy, const CheckoutNotice &notice)
{
    const bool isInTheWay = makesFile(notice) && notice.baseline != nullptr &&
                            !isFolder(notice.baseline) && isFolder(notice.workdir) &&
                            copy.holdsFiles(notice.path);
    return isInTheWay ? inTheWay(notice.path, Standing::Folder) : Finding();
}

Finding findSubmoduleNoticed(WorkingCopy &copy, const CheckoutNotice &notice)
{
    const bool isInTheWay =
        makesFile(notice) && isGitlink(notice.baseline) && copy.holdsFiles(notice.path);
    return isInTheWay ? inTheWay(notice.path, Standing::Folder) : Finding();
}

Finding findHiddenEditNoticed(WorkingCopy &copy, const CheckoutNotice &notice)
{
    if (!makesFile(notice) || notice.baseline == nullptr || notice.workdir == nullptr ||
        isFolder(notice.workdir) || !copy.hasHidden())
    {
        return {};
    }
    const git_index_entry *const entry = copy.entryOf(notice.path);
    const bool isEdited = entry != nullptr && isHidden(*entry) && copy.isEdited(*entry);
    return isEdited ? hiddenEdit(*entry) : Finding();
}

} // namespace vclink::git
