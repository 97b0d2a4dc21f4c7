// SPDX-License-Identifier: MIT
#include "RandomWorkingCopy.hpp"

#include <algorithm>

namespace vclink::test
{

OtherRepository::OtherRepository(const std::filesystem::path &path) : folder(path)
{
    auto repository = GitRepository::init(folder);
    repository.write("inner/file", "one\n");
    firstCommit = repository.commitAll("first");
    repository.write("inner/file", "two\n");
    secondCommit = repository.commitAll("second");
}

RandomWorkingCopy::RandomWorkingCopy(std::uint64_t seed, const std::filesystem::path &folder,
                                     const OtherRepository &other)
    : random_(seed), maker_(folder), other_(other),
      rate_(random_.pick(std::vector<unsigned>{4, 20, 20, 50})), duplicates_(random_.chance(40))
{
}

void RandomWorkingCopy::make()
{
    const std::size_t files = 1 + std::min(random_.below(60), random_.below(60));
    if (random_.chance(93))
    {
        commitTree(files);
    }
    else
    {
        fillUnbornBranch(files);
    }
    changeIndex();
    if (random_.chance(50))
    {
        maker_.settle();
    }
    changeWorkingTree();
}

std::string RandomWorkingCopy::freshPath()
{
    const std::string path = names_.fresh();
    return maker_.canHold(path) ? path : std::string();
}

std::string RandomWorkingCopy::someTrackedFolder()
{
    std::vector<std::string> folders;
    for (const auto &path : tracked_)
    {
        const std::size_t slash = path.rfind('/');
        if (slash != std::string::npos)
        {
            folders.push_back(path.substr(0, slash));
        }
    }
    return folders.empty() ? std::string() : random_.pick(folders);
}

} // namespace vclink::test
