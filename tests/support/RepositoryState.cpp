// SPDX-License-Identifier: MIT
#include "support/RepositoryState.hpp"

#include <array>
#include <cerrno>
#include <functional>
#include <ostream>
#include <sstream>
#include <system_error>
#include <tuple>

#include <gtest/gtest.h>
#include <sys/stat.h>

#include "support/readFile.hpp"
#include "support/strings.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

constexpr std::array filesUnderWay{"MERGE_HEAD",       "MERGE_MSG",   "MERGE_MODE",
                                   "CHERRY_PICK_HEAD", "REVERT_HEAD", "BISECT_LOG",
                                   "ORIG_HEAD",        "index.lock",  "HEAD.lock"};
constexpr std::size_t longestContent = 120;

std::string shortened(const std::string &bytes)
{
    if (bytes.size() <= longestContent)
        return bytes;
    return std::to_string(bytes.size()) + " bytes of hash " +
           std::to_string(std::hash<std::string>()(bytes));
}

/// The reference that HEAD names, if any, and the id of its commit, if it has one.
std::string headIn(const fs::path &gitFolder, const std::string &references)
{
    const std::string beginning = "ref: ";
    const fs::path file = gitFolder / "HEAD";
    const std::string head =
        fs::is_symlink(file) ? beginning + fs::read_symlink(file).string() + '\n' : readFile(file);
    if (!startsWith(head, beginning))
        return head;
    const std::string name = head.substr(beginning.size(), head.size() - beginning.size() - 1);
    for (const auto &reference : split(references))
    {
        if (startsWith(reference, name + ' '))
            return name + '\n' + reference.substr(name.size() + 1) + '\n';
    }
    return name + '\n';
}

std::string contentOf(const fs::directory_entry &entry)
{
    if (entry.is_symlink())
        return "link to " + fs::read_symlink(entry.path()).string();
    std::ostringstream text;
    text << std::oct << static_cast<unsigned>(entry.status().permissions()) << ' ';
    // Nobody reads a FIFO: that waits for a writer.
    if (entry.is_other())
        text << "special file " << static_cast<int>(entry.status().type());
    else
        text << (entry.is_directory() ? "folder" : shortened(readFile(entry.path())));
    return text.str();
}

void print(std::ostream &stream, const char *title, const RepositoryState::Entries &entries)
{
    stream << title << ":\n";
    for (const auto &[name, content] : entries)
        stream << "  " << testing::PrintToString(name) << ": " << testing::PrintToString(content)
               << '\n';
}

std::int64_t nanoseconds(const timespec &time)
{
    return std::int64_t{time.tv_sec} * 1'000'000'000 + time.tv_nsec;
}

auto members(const RepositoryState &state)
{
    return std::tie(state.head, state.references, state.reflog, state.underWay, state.index,
                    state.workingTree);
}

auto members(const FileStamp &stamp)
{
    return std::tie(stamp.inode, stamp.modified, stamp.changed, stamp.bytes);
}

} // namespace

RepositoryState stateOf(const GitRepository &repository)
{
    const fs::path folder = repository.gitFolder();
    RepositoryState state;
    state.references = repository.git({"for-each-ref", "--format=%(refname) %(objectname)"});
    state.head = headIn(folder, state.references);
    state.reflog = readFile(folder / "logs/HEAD");
    for (const auto *name : filesUnderWay)
    {
        if (fs::exists(folder / name))
            state.underWay.emplace(name, readFile(folder / name));
    }
    state.index = indexOf(repository);
    state.workingTree = workingTreeOf(repository);
    return state;
}

RepositoryState::Entries indexOf(const GitRepository &repository)
{
    RepositoryState::Entries entries;
    for (const auto &record : split(repository.git({"ls-files", "-v", "--stage", "-z"}), '\0'))
    {
        const auto tab = record.find('\t');
        std::string &lines = entries[record.substr(tab + 1)];
        lines += (lines.empty() ? "" : "\n") + record.substr(0, tab);
    }
    return entries;
}

RepositoryState::Entries workingTreeOf(const GitRepository &repository)
{
    RepositoryState::Entries entries;
    fs::recursive_directory_iterator entry(repository.path());
    for (; entry != fs::recursive_directory_iterator(); ++entry)
    {
        if (entry->path() == repository / ".git")
        {
            entry.disable_recursion_pending();
            continue;
        }
        entries.emplace(entry->path().lexically_relative(repository.path()).string(),
                        contentOf(*entry));
    }
    return entries;
}

bool operator==(const RepositoryState &left, const RepositoryState &right)
{
    return members(left) == members(right);
}

bool operator!=(const RepositoryState &left, const RepositoryState &right)
{
    return !(left == right);
}

std::ostream &operator<<(std::ostream &stream, const RepositoryState &state)
{
    stream << "HEAD:\n"
           << state.head << "references:\n"
           << state.references << "reflog:\n"
           << state.reflog;
    print(stream, "under way", state.underWay);
    print(stream, "index", state.index);
    print(stream, "working tree", state.workingTree);
    return stream;
}

FileStamp stampOf(const fs::path &file)
{
    struct stat status = {};
    if (::lstat(file.c_str(), &status) != 0)
    {
        if (errno == ENOENT)
            return {};
        throw std::system_error(errno, std::generic_category(), file.string());
    }
    const bool isFile = S_ISREG(status.st_mode);
    return {status.st_ino, nanoseconds(status.st_mtim), nanoseconds(status.st_ctim),
            isFile ? readFile(file) : std::string()};
}

FileStamp indexStampOf(const GitRepository &repository)
{
    return stampOf(repository.gitFolder() / "index");
}

bool operator==(const FileStamp &left, const FileStamp &right)
{
    return members(left) == members(right);
}

bool operator!=(const FileStamp &left, const FileStamp &right)
{
    return !(left == right);
}

std::ostream &operator<<(std::ostream &stream, const FileStamp &stamp)
{
    return stream << "inode " << stamp.inode << ", modified " << stamp.modified << ", changed "
                  << stamp.changed << ", " << stamp.bytes.size() << " bytes";
}

NothingChanges::NothingChanges(const GitRepository &repository)
    : repository_(repository), state_(stateOf(repository)), index_(indexStampOf(repository))
{
}

NothingChanges::~NothingChanges()
{
    EXPECT_EQ(indexStampOf(repository_), index_);
    EXPECT_EQ(stateOf(repository_), state_);
}

} // namespace vclink::test
