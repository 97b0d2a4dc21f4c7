// SPDX-License-Identifier: MIT
#include <algorithm>

#include "RandomContent.hpp"
#include "RandomWorkingCopy.hpp"
#include "listedNames.hpp"

namespace vclink::test
{
namespace
{

const std::string noId(40, '0');

} // namespace

void RandomWorkingCopy::changeIndex()
{
    const std::vector<std::string> before = tracked_;
    for (const auto &path : before)
    {
        if (random_.chance(rate_) && (maker_.isFile(path) || maker_.isLink(path)))
        {
            stageChange(path);
        }
    }
    if (random_.chance(rate_ / 4))
    {
        stageFileInsteadOfFolder();
    }
    addFiles();
    applyIndexChanges();
}

void RandomWorkingCopy::stageChange(const std::string &path)
{
    switch (random_.below(12))
    {
    case 0:
    case 1:
        return stageEdit(path);
    case 2:
    case 3:
        return stageRemoval(path);
    case 4:
    case 5:
    case 6:
        return stageMove(path);
    case 7:
        return stageOtherType(path);
    case 8:
        return stageFolderInstead(path);
    case 9:
        return sides_.push_back({path, "100644", random_.pick(blobs_), 0});
    default:
        return stageConflict(path);
    }
}

void RandomWorkingCopy::stageEdit(const std::string &path)
{
    if (maker_.isLink(path))
    {
        maker_.link(makeLinkTarget(path), path);
    }
    else if (random_.chance(30))
    {
        maker_.setExecutable(path, random_.chance(70));
    }
    else
    {
        maker_.write(path, random_.chance(50) ? makeSimilar(random_, maker_.read(path))
                                              : makeContent(random_));
    }
    toStage_.push_back(path);
}

void RandomWorkingCopy::stageRemoval(const std::string &path)
{
    if (random_.chance(40))
    {
        toUnstage_.push_back(path);
        return;
    }
    maker_.remove(path);
    toStage_.push_back(path);
}

void RandomWorkingCopy::stageMove(const std::string &path)
{
    const std::string to = freshPath();
    if (to.empty())
    {
        return;
    }
    if (maker_.isLink(path))
    {
        maker_.link(maker_.readLink(path), to);
    }
    else
    {
        const std::string content = maker_.read(path);
        maker_.write(to, random_.chance(40) ? makeSimilar(random_, content) : content);
    }
    toStage_.push_back(to);
    tracked_.push_back(to);
    if (random_.chance(85))
    {
        stageRemoval(path);
    }
}

void RandomWorkingCopy::stageOtherType(const std::string &path)
{
    changeType(path);
    toStage_.push_back(path);
}

void RandomWorkingCopy::stageFolderInstead(const std::string &path)
{
    maker_.remove(path);
    toStage_.push_back(path);
    for (const auto *name : {"/inner", "/deeper/inner"})
    {
        maker_.write(path + name, makeContent(random_));
        toStage_.push_back(path + name);
        tracked_.push_back(path + name);
    }
}

void RandomWorkingCopy::stageFileInsteadOfFolder()
{
    const std::string folder = someTrackedFolder();
    if (folder.empty() || !maker_.isFolder(folder))
    {
        return;
    }
    maker_.remove(folder);
    maker_.write(folder, makeContent(random_));
    sides_.erase(std::remove_if(sides_.begin(), sides_.end(),
                                [&folder](const auto &side) { return isBelow(side.path, folder); }),
                 sides_.end());
    for (const auto &path : tracked_)
    {
        if (isBelow(path, folder))
        {
            toStage_.push_back(path);
        }
    }
    toStage_.push_back(folder);
    tracked_.push_back(folder);
}

void RandomWorkingCopy::stageConflict(const std::string &path)
{
    // The sides that there are: base 1, ours 2, theirs 4; one bit alone or any two or all of them.
    const std::size_t present = random_.chance(40) ? 7 : 1 + random_.below(7);
    sides_.push_back({path, "0", noId, 0});
    for (int stage = 1; stage <= 3; ++stage)
    {
        if ((present >> (stage - 1) & 1U) != 0)
        {
            const char *mode = random_.chance(90) ? "100644" : "120000";
            sides_.push_back({path, mode, random_.pick(blobs_), stage});
        }
    }
    if (random_.chance(50) && maker_.isFile(path))
    {
        maker_.write(path, makeConflictMarkers(random_));
    }
}

void RandomWorkingCopy::addFiles()
{
    for (std::size_t count = random_.below(4); count > 0; --count)
    {
        const std::string path = freshPath();
        if (path.empty())
        {
            continue;
        }
        if (random_.chance(15))
        {
            stageConflict(path);
            continue;
        }
        if (random_.chance(15))
        {
            maker_.link(makeLinkTarget(path), path);
        }
        else
        {
            maker_.write(path, makeContent(random_));
        }
        (random_.chance(20) ? toIntend_ : toStage_).push_back(path);
        tracked_.push_back(path);
    }
}

void RandomWorkingCopy::applyIndexChanges()
{
    if (!toStage_.empty())
    {
        maker_.stage(toStage_);
    }
    if (!toUnstage_.empty())
    {
        maker_.unstage(toUnstage_);
    }
    if (!sides_.empty())
    {
        maker_.setIndex(sides_);
    }
    if (!toIntend_.empty())
    {
        maker_.intendToAdd(toIntend_);
    }
    toStage_.clear();
    toUnstage_.clear();
    sides_.clear();
    toIntend_.clear();
}

} // namespace vclink::test
