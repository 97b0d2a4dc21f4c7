// SPDX-License-Identifier: MIT
#include "GitReport.hpp"

#include <algorithm>
#include <filesystem>
#include <set>
#include <sstream>
#include <stdexcept>

#include "support/strings.hpp"

namespace vclink::test
{
namespace
{

const std::string emptyBlob = "e69de29bb2d1d6434b8b29ae775ad8c2e48c5391";

/// "1 XY sub mH mI mW hH hI path"
void readChange(std::istringstream fields, GitReport &report)
{
    GitFile file;
    std::string states;
    std::string skipped;
    fields >> states >> skipped >> file.headMode >> skipped >> file.workTreeMode >> file.headId >>
        skipped;
    file.index = states.at(0);
    file.workTree = states.at(1);
    std::string path;
    std::getline(fields.ignore(), path, '\0');
    report[path] = file;
}

/// "u XY sub m1 m2 m3 mW h1 h2 h3 path"
void readConflict(std::istringstream fields, GitReport &report)
{
    std::string skipped;
    for (int i = 0; i < 9; ++i)
    {
        fields >> skipped;
    }
    std::string path;
    std::getline(fields.ignore(), path, '\0');
    report[path].unmerged = true;
}

void readRecord(const std::string &record, GitReport &report)
{
    const std::string rest = record.substr(2);
    switch (record.at(0))
    {
    case '1':
        return readChange(std::istringstream(rest), report);
    case 'u':
        return readConflict(std::istringstream(rest), report);
    case '?':
        report[rest].untracked = true;
        return;
    default:
        throw std::runtime_error("unexpected record of git status: " + record);
    }
}

/// "tag mode id stage<TAB>path"
void readIndexEntry(const std::string &record, GitReport &report)
{
    const std::size_t tab = record.find('\t');
    std::istringstream fields(record.substr(0, tab));
    GitFile &file = report[record.substr(tab + 1)];
    int stage = 0;
    std::string tag;
    fields >> tag >> file.indexMode >> file.indexId >> stage;
    file.unmerged = stage != 0;
}

/// If a file is only intended to be added, without content in the index, and missing from the
/// working tree, git reports it as if HEAD had it too.
void removeFalseHeads(const GitRepository &repository, GitReport &report)
{
    const auto isSuspect = [](const GitFile &file)
    { return file.index == '.' && file.workTree == 'D' && file.indexId == emptyBlob; };
    if (std::none_of(report.begin(), report.end(),
                     [&](const auto &entry) { return isSuspect(entry.second); }))
    {
        return;
    }
    const auto listed =
        split(repository.tryGit({"ls-tree", "-r", "-z", "--name-only", "HEAD"}).output, '\0');
    const std::set<std::string> inHead(listed.begin(), listed.end());
    for (auto &[path, file] : report)
    {
        if (isSuspect(file) && inHead.count(path) == 0)
        {
            file.headMode = noMode;
            file.headId.clear();
        }
    }
}

} // namespace

std::string runGitStatus(const GitRepository &repository)
{
    return repository.git({"--no-optional-locks", "status", "--porcelain=v2", "-z", "--ignored=no",
                           "--untracked-files=all", "--no-renames"});
}

std::string listIndex(const GitRepository &repository)
{
    return repository.git({"ls-files", "-z", "-v", "--stage"});
}

GitReport readGitReport(const GitRepository &repository, const std::string &status)
{
    return readGitReport(repository, status, listIndex(repository));
}

GitReport readGitReport(const GitRepository &repository, const std::string &status,
                        const std::string &index)
{
    GitReport report;
    for (const auto &record : split(status, '\0'))
    {
        readRecord(record, report);
    }
    for (const auto &record : split(index, '\0'))
    {
        readIndexEntry(record, report);
    }
    for (auto &[path, file] : report)
    {
        std::error_code noFile;
        const auto size = std::filesystem::file_size(repository / path, noFile);
        file.hasBytes = noFile || size > 0;
    }
    removeFalseHeads(repository, report);
    return report;
}

Blobs readBlobs(const GitRepository &repository, const std::vector<std::string> &ids)
{
    Blobs blobs;
    if (ids.empty())
    {
        return blobs;
    }
    std::string input;
    for (const auto &id : ids)
    {
        input += id + '\n';
    }
    const CommandResult result = repository.command({"cat-file", "--batch"}).input(input).run();
    std::istringstream output(result.output);
    std::string id;
    std::string type;
    while (output >> id >> type)
    {
        if (type == "missing")
        {
            continue;
        }
        std::size_t size = 0;
        output >> size;
        output.ignore();
        std::string content(size, '\0');
        output.read(content.data(), static_cast<std::streamsize>(size));
        if (type == "blob")
        {
            blobs[id] = content;
        }
    }
    return blobs;
}

} // namespace vclink::test
