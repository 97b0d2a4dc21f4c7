// SPDX-License-Identifier: MIT
#include <algorithm>

#include "RandomContent.hpp"
#include "RandomWorkingCopy.hpp"

namespace vclink::test
{
namespace
{

constexpr std::size_t blobsAside = 12;

} // namespace

std::string RandomWorkingCopy::makeLinkTarget(const std::string &link)
{
    static const std::vector<std::string> others{".",      "missing", "/nowhere/at all", "..",
                                                 "\xFF/a", "loop",    "../outside"};
    std::string up;
    for (auto depth = std::count(link.begin(), link.end(), '/'); depth > 0; --depth)
    {
        up += "../";
    }
    const std::string folder = names_.someFolder();
    if (random_.chance(40) && !folder.empty())
    {
        return up + folder;
    }
    return tracked_.empty() || random_.chance(40) ? random_.pick(others)
                                                  : up + random_.pick(tracked_);
}

PlannedFile RandomWorkingCopy::planFile(const std::vector<PlannedFile> &before)
{
    PlannedFile file{names_.fresh(), random_.chance(85) ? "100644" : "100755", {}};
    if (random_.chance(12))
    {
        file.mode = "120000";
        file.content = makeLinkTarget(file.path);
    }
    else if (duplicates_ && !before.empty() && random_.chance(40) && before.back().mode != "120000")
    {
        file.content = before.back().content;
    }
    else
    {
        file.content = makeContent(random_);
    }
    tracked_.push_back(file.path);
    return file;
}

void RandomWorkingCopy::commitTree(std::size_t files)
{
    std::vector<PlannedFile> tree;
    for (std::size_t i = 0; i < files; ++i)
    {
        tree.push_back(planFile(tree));
    }
    if (random_.chance(35))
    {
        const PlannedFile rules{".gitignore", "100644", makeIgnoreRules(random_)};
        tree.push_back(rules);
        tracked_.push_back(rules.path);
    }
    if (random_.chance(20))
    {
        planSubmodules(tree);
    }
    std::vector<std::string> blobs(blobsAside);
    std::generate(blobs.begin(), blobs.end(), [this] { return makeContent(random_); });
    blobs_ = maker_.import(tree, blobs);
    maker_.checkOut();
    populateSubmodules();
}

void RandomWorkingCopy::fillUnbornBranch(std::size_t files)
{
    std::vector<std::string> blobs(blobsAside);
    std::generate(blobs.begin(), blobs.end(), [this] { return makeContent(random_); });
    blobs_ = maker_.import({}, blobs);
    for (std::size_t i = 0; i < files; ++i)
    {
        const PlannedFile file = planFile({});
        if (file.mode == "120000")
        {
            maker_.link(file.content, file.path);
        }
        else
        {
            maker_.write(file.path, file.content);
        }
        if (random_.chance(60))
        {
            toStage_.push_back(file.path);
        }
        else
        {
            tracked_.pop_back();
        }
    }
    applyIndexChanges();
}

} // namespace vclink::test
