// SPDX-License-Identifier: MIT
#include "UserWork.hpp"

#include <filesystem>
#include <system_error>

#include "support/strings.hpp"

namespace vclink::test
{
namespace
{

bool stands(const UserWork &work, const std::string &name, const std::string &value)
{
    const auto found = work.find(name);
    return found != work.end() && found->second == value;
}

} // namespace

std::vector<std::string> uncommittedFiles(const GitRepository &repository)
{
    return split(repository.git({"ls-files", "--modified", "--others"}));
}

UserWork userWork(const GitRepository &repository, const std::vector<std::string> &files)
{
    UserWork work;
    for (const auto &file : files)
    {
        std::error_code unreachable;
        if (std::filesystem::is_regular_file(repository / file, unreachable))
            work.emplace("file " + file, repository.read(file));
    }
    // "MODE ID STAGE\tNAME"; of a conflict our side.
    for (const auto &line : split(repository.git({"ls-files", "--stage"})))
    {
        const auto tab = line.find('\t');
        const char stage = line.at(tab - 1);
        if (stage == '0' || stage == '2')
            work.emplace("entry " + line.substr(tab + 1), line.substr(0, tab - 2));
    }
    // Ids of commits differ from run to run, those of trees do not.
    for (const auto &line : split(repository.git({"for-each-ref", "--format=%(refname) %(tree)"})))
    {
        const auto blank = line.find(' ');
        work.emplace(line.substr(0, blank), line.substr(blank + 1));
    }
    return work;
}

std::vector<std::string> lostWork(const UserWork &before, const UserWork &normal,
                                  const UserWork &after)
{
    std::vector<std::string> lost;
    for (const auto &[name, value] : before)
    {
        const auto expected = normal.find(name);
        const bool isDone = expected == normal.end() ? after.count(name) == 0
                                                     : stands(after, name, expected->second);
        if (!isDone && !stands(after, name, value))
            lost.push_back(name);
    }
    return lost;
}

} // namespace vclink::test
