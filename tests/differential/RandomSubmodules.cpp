// SPDX-License-Identifier: MIT
#include "RandomWorkingCopy.hpp"

#include "quoting.hpp"

namespace vclink::test
{

std::string RandomWorkingCopy::someCommit()
{
    return random_.chance(60) ? other_.secondCommit : other_.firstCommit;
}

void RandomWorkingCopy::planSubmodules(std::vector<PlannedFile> &files)
{
    std::string modules;
    for (std::size_t count = 1 + random_.below(2); count > 0; --count)
    {
        // libgit2 can't look up a submodule whose path holds a line feed: the whole walk fails.
        std::string path = names_.fresh();
        while (path.find('\n') != std::string::npos)
        {
            path = names_.fresh();
        }
        if (random_.chance(85))
        {
            files.push_back({path, "160000", someCommit()});
        }
        else
        {
            sides_.push_back({path, "160000", someCommit(), 0});
        }
        modules += "[submodule \"s" + std::to_string(count) +
                   "\"]\n\tpath = " + quoteConfigValue(path) + "\n\turl = ../other\n";
        submodules_.push_back(path);
    }
    if (random_.chance(80))
    {
        files.push_back({".gitmodules", "100644", modules});
    }
}

void RandomWorkingCopy::populateSubmodules()
{
    for (const auto &path : submodules_)
    {
        const std::size_t kind = random_.below(8);
        if (kind == 0 && maker_.exists(path))
        {
            maker_.remove(path);
        }
        else if (kind != 1)
        {
            maker_.copyRepository(other_.folder, path, random_.chance(40));
        }
        if (random_.chance(15))
        {
            sides_.push_back({path, "160000", someCommit(), 0});
        }
        else if (random_.chance(10))
        {
            toUnstage_.push_back(path);
        }
    }
}

void RandomWorkingCopy::changeSubmodule(const std::string &path)
{
    if (!maker_.isFolder(path + "/inner"))
    {
        return;
    }
    switch (random_.below(6))
    {
    case 0:
        return maker_.write(path + "/inner/file", "three\n");
    case 1:
        return maker_.write(path + "/new", "new\n");
    case 2:
        return maker_.remove(path);
    case 3:
        maker_.remove(path);
        return maker_.write(path, "a file instead\n");
    default:
        return;
    }
}

void RandomWorkingCopy::addNestedRepository()
{
    const std::string path = freshPath();
    if (!path.empty())
    {
        maker_.copyRepository(other_.folder, path, false);
    }
}

} // namespace vclink::test
