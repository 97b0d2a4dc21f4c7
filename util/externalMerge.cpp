// SPDX-License-Identifier: MIT
#include "util/externalMerge.hpp"

#include <array>
#include <cstdio>
#include <cstring>
#include <ios>
#include <map>
#include <vector>

#include <git2/buffer.h>
#include <git2/errors.h>
#include <sys/stat.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/raiseGitError.hpp"
#include "error/logging/logger.hpp"
#include "fl/filesystem/fstream.hpp"
#include "fl/i18n/convert.hpp"
#include "util/command/runCommand.hpp"
#include "util/scope/ScopedCleanup.hpp"
#include "util/temporaryFile.hpp"

namespace vclink::git
{
namespace
{

std::string formatMarkerSize(unsigned short size)
{
    std::array<char, 8> text{};
    std::snprintf(text.data(), text.size(), "%d", size);
    return text.data();
}

/// Owns a temporary file with one side's content.
class SideFile
{
  public:
    SideFile(const git_index_entry &entry, git_repository *repository)
        : path_(writeBlobToTemporaryFile(entry, repository)),
          cleanup_([this] { removeTemporaryFile(path_); })
    {
    }
    SideFile(const SideFile &) = delete;
    SideFile &operator=(const SideFile &) = delete;
    ~SideFile() = default;

    const upath &path() const
    {
        return path_;
    }
    std::string narrowPath() const
    {
        return fl::i18n::to_string(path_.string());
    }

  private:
    upath path_;
    ScopedCleanup cleanup_;
};

/// Returns what must not be opened. A link could lead to any file of the user, which the commit
/// would then contain. A FIFO is never read to its end, and a socket would count as an empty file.
const char *describeObstacle(mode_t mode)
{
    if (S_ISLNK(mode))
    {
        return "symbolic link";
    }
    return S_ISREG(mode) || S_ISDIR(mode) ? nullptr : "FIFO, socket or device";
}

void refuseObstacle(const upath &file)
{
    const std::string name = fl::i18n::ustring_to_utf8(file.string());
    struct stat status = {};
    const char *const obstacle =
        ::lstat(name.c_str(), &status) == 0 ? describeObstacle(status.st_mode) : nullptr;
    if (obstacle != nullptr)
    {
        raiseGitError(GIT_ERROR, GIT_ERROR_MERGE,
                      std::string("a ") + obstacle + " is in the place of the merged file '" +
                          name + "'");
    }
}

/// Intentionally treats an unreadable file as an empty one.
std::vector<char> readFile(const upath &file)
{
    refuseObstacle(file);
    fl::filesystem::basic_ifstream<char> stream(file.string(),
                                                std::ios_base::in | std::ios_base::binary);
    constexpr std::streamsize blockSize = 65536;
    std::vector<char> content;
    std::array<char, blockSize> block;
    std::streamsize count = 0;
    do
    {
        count = stream.rdbuf()->sgetn(block.data(), blockSize);
        content.insert(content.end(), block.data(), block.data() + count);
    } while (count == blockSize);
    return content;
}

} // namespace

FileVersions::FileVersions(const git_merge_driver_source *source)
    : ancestor(git_merge_driver_source_ancestor(source)),
      ours(git_merge_driver_source_ours(source)), theirs(git_merge_driver_source_theirs(source)),
      options(git_merge_driver_source_file_options(source))
{
}

const char *FileVersions::resultPath() const noexcept
{
    return std::strcmp(ancestor->path, ours->path) == 0 ? theirs->path : ours->path;
}

std::uint32_t FileVersions::resultMode() const noexcept
{
    return ancestor->mode == ours->mode ? theirs->mode : ours->mode;
}

int runExternalMerge(const std::string &command, const FileVersions &sides,
                     git_repository *repository, const MergedFile &merged)
{
    const SideFile ancestor(*sides.ancestor, repository);
    const SideFile ours(*sides.ours, repository);
    const SideFile theirs(*sides.theirs, repository);
    const std::map<std::string, std::string> placeholders{
        {"%O", ancestor.narrowPath()},
        {"%A", ours.narrowPath()},
        {"%B", theirs.narrowPath()},
        {"%L", formatMarkerSize(sides.options->marker_size)},
        {"%P", sides.resultPath()}};
    if (runCommand(command, placeholders) != 0)
    {
        writeRecord(SeverityDiagnostic, "Auto-merge unsuccessful");
        return GIT_EMERGECONFLICT;
    }
    writeRecord(SeverityDiagnostic, "Auto-merge successful");
    const std::vector<char> result = readFile(ours.path());
    check(git_buf_set, merged.content, result.data(), result.size());
    // Last, because a driver that fails leaves these unchanged.
    *merged.path = sides.resultPath();
    *merged.mode = sides.resultMode();
    return 0;
}

} // namespace vclink::git
