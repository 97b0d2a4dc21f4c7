// SPDX-License-Identifier: MIT
#include "main/files/IdentifiedFiles.hpp"

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

#include <fcntl.h>
#include <git2/attr.h>
#include <git2/blob.h>
#include <git2/buffer.h>
#include <git2/errors.h>
#include <git2/filter.h>
#include <git2/index.h>
#include <git2/odb.h>
#include <git2/oid.h>
#include <git2/repository.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/raiseSystemError.hpp"
#include "util/repository/objectIds.hpp"
#include "util/scope/FileDescriptor.hpp"

namespace vclink::git
{
namespace
{

constexpr std::string_view beginOfIds = "$Id";

bool isStagedFile(const git_index_entry &entry)
{
    return GIT_INDEX_ENTRY_STAGE(&entry) == GIT_INDEX_STAGE_NORMAL &&
           (entry.mode == GIT_FILEMODE_BLOB || entry.mode == GIT_FILEMODE_BLOB_EXECUTABLE);
}

/// libgit2 sets this flag, which is not written, when it stages a file.
bool isStagedJustNow(const git_index_entry &entry)
{
    return (entry.flags_extended & GIT_INDEX_ENTRY_UPTODATE) != 0;
}

/// Calls `visit` with the letter after each dollar sign that begins `$Id` or `$Jd`.
template <class Visit> void forEachMark(char *text, std::size_t size, Visit visit)
{
    const std::string_view view(text, size);
    for (std::size_t at = view.find('$'); at < size; at = view.find('$', at + 1))
    {
        const bool isMark = at + 2 < size && view[at + 2] == 'd';
        if (isMark && (view[at + 1] == 'I' || view[at + 1] == 'J'))
        {
            visit(text[at + 1]);
        }
    }
}

/// Hides ids from libgit2's filter of `ident`. The conversion of line ends neither makes nor breaks
/// them, and judges the text as it would with them.
class HiddenIds
{
  public:
    explicit HiddenIds(std::string &text)
    {
        forEachMark(text.data(), text.size(),
                    [this](char &letter)
                    {
                        letters_.push_back(letter);
                        letter = 'J';
                    });
    }

    void show(std::string &text) const
    {
        std::size_t next = 0;
        forEachMark(text.data(), text.size(), [&](char &letter) { letter = letters_.at(next++); });
    }

  private:
    std::string letters_;
};

/// Replaces each `$Id: ...$` that is in one line, as git does.
std::string withoutIds(std::string_view text)
{
    constexpr std::string_view begin = "$Id:";
    std::string result;
    result.reserve(text.size());
    for (std::size_t id = text.find(begin); id != std::string_view::npos; id = text.find(begin))
    {
        const std::size_t end = text.find_first_of("$\n", id + begin.size());
        const bool isId = end != std::string_view::npos && text[end] == '$';
        const std::size_t rest = isId ? end + 1 : id + begin.size();
        result += text.substr(0, isId ? id : rest);
        result += isId ? "$Id$" : "";
        text.remove_prefix(rest);
    }
    result += text;
    return result;
}

/// An id as a checkout writes it.
struct WrittenId
{
    std::size_t place = 0;
    std::size_t size = 0;
    git_oid content{};
};

std::optional<WrittenId> findWrittenId(std::string_view text)
{
    constexpr std::string_view begin = "$Id: ";
    constexpr std::string_view end = " $";
    for (std::size_t at = text.find(begin); at != std::string_view::npos;
         at = text.find(begin, at + 1))
    {
        const std::size_t size = begin.size() + idTextSize + end.size();
        const std::string written(text.substr(at, size));
        const std::string digits(written, begin.size(), idTextSize);
        if (written.size() == size && written.compare(size - end.size(), end.size(), end) == 0 &&
            digits.find_first_not_of("0123456789abcdef") == std::string::npos)
        {
            WrittenId id{at, size, {}};
            check(git_oid_fromstr, &id.content, digits.c_str());
            return id;
        }
    }
    return std::nullopt;
}

/// Restores what libgit2's checkout has replaced: whatever was between the first `$Id` and the next
/// dollar sign. git's checkout leaves that alone if it is not an id, and writes to other places.
void restoreFirst(std::string &text, const WrittenId &id, std::string_view checkedOut)
{
    const std::size_t begin = std::min(checkedOut.find(beginOfIds), checkedOut.size());
    const std::size_t last = checkedOut.find('$', begin + beginOfIds.size());
    if (last == std::string_view::npos)
    {
        return;
    }
    const std::string clean = withoutIds(checkedOut);
    const bool hasIds = clean != checkedOut || clean.find("$Id$") != std::string::npos;
    const bool isInItsPlace =
        id.place == begin && checkedOut.compare(0, begin, text, 0, begin) == 0;
    if (isInItsPlace || !hasIds)
    {
        text.replace(id.place, id.size, checkedOut.substr(begin, last + 1 - begin));
    }
}

[[noreturn]] void raiseUnreadable(int error, const std::string &path)
{
    raiseSystemError(error, "could not read '" + path + "'");
}

/// Reads a file in blocks.
class Reader
{
  public:
    /// Reads nothing if there is no file.
    explicit Reader(const std::string &path)
        : path_(path), file_(::open(path.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC))
    {
        const bool isGone = errno == ENOENT || errno == ENOTDIR || errno == ELOOP;
        if (!file_ && !isGone)
        {
            raiseUnreadable(errno, path_);
        }
    }

    /// Returns what it could read behind the first bytes of the block; 0 at the end.
    std::size_t read(std::string &block, std::size_t first)
    {
        ssize_t count = 0;
        do
        {
            count = file_ ? ::read(file_.get(), block.data() + first, block.size() - first) : 0;
        } while (count < 0 && errno == EINTR);
        if (count < 0)
        {
            raiseUnreadable(errno, path_);
        }
        return static_cast<std::size_t>(count);
    }

  private:
    const std::string &path_;
    FileDescriptor file_;
};

/// The files of one index.
class IdentifiedFiles
{
  public:
    IdentifiedFiles(git_repository *repository, git_index *index)
        : repository_(repository), index_(index), path_(git_repository_workdir(repository)),
          rootSize_(path_.size())
    {
    }

    void stage(const git_index_entry &entry)
    {
        path_.replace(rootSize_, std::string::npos, entry.path);
        std::string content;
        if (mentionsIds() && hasAttribute(entry.path))
        {
            content = readAll();
        }
        // libgit2 must not convert a file that was emptied in between: see EmptiedFiles.
        if (!content.empty())
        {
            content = convertLineEnds(std::move(content), entry.path);
            restoreCheckedOut(content);
            content = withoutIds(content);
            git_index_entry staged = entry;
            check(git_blob_create_from_buffer, &staged.id, repository_, content.data(),
                  content.size());
            if (!isSameId(staged.id, entry.id))
            {
                check(git_index_add, index_, &staged);
            }
        }
    }

  private:
    /// Reads the file in blocks: it may be large.
    bool mentionsIds()
    {
        block_.resize(std::size_t{64} * 1024);
        constexpr std::size_t most = beginOfIds.size() - 1;
        Reader reader(path_);
        std::size_t kept = 0;
        for (std::size_t count = reader.read(block_, 0); count != 0;
             count = reader.read(block_, kept))
        {
            const std::string_view text(block_.data(), kept + count);
            if (text.find(beginOfIds) != std::string_view::npos)
            {
                return true;
            }
            kept = std::min(most, text.size());
            std::copy_n(text.end() - kept, kept, block_.begin());
        }
        return false;
    }

    git_attr_value_t readAttribute(const char *path, const char *name)
    {
        const char *value = nullptr;
        check(git_attr_get, &value, repository_, std::uint32_t{0}, path, name);
        return git_attr_value(value);
    }

    bool hasAttribute(const char *path)
    {
        return readAttribute(path, "ident") == GIT_ATTR_VALUE_TRUE &&
               readAttribute(path, "filter") != GIT_ATTR_VALUE_STRING;
    }

    std::string readAll()
    {
        Reader reader(path_);
        std::string content;
        while (const std::size_t count = reader.read(block_, 0))
        {
            content.append(block_, 0, count);
        }
        return content;
    }

    std::string convertLineEnds(std::string content, const char *path)
    {
        const HiddenIds ids(content);
        git_filter_list *raw = nullptr;
        // libgit2 has refused unsafe line ends (core.safecrlf) when it has staged the file.
        const GitResult<void> loaded =
            call(git_filter_list_load, &raw, repository_, static_cast<git_blob *>(nullptr), path,
                 GIT_FILTER_TO_ODB, unsigned{GIT_FILTER_ALLOW_UNSAFE});
        const std::unique_ptr<git_filter_list, void (*)(git_filter_list *)> filters(
            raw, git_filter_list_free);
        check(loaded);
        git_buf buffer = {};
        const std::unique_ptr<git_buf, void (*)(git_buf *)> owner(&buffer, git_buf_dispose);
        check(git_filter_list_apply_to_buffer, &buffer, filters.get(), content.data(),
              content.size());
        content.assign(buffer.ptr, buffer.size);
        ids.show(content);
        return content;
    }

    void restoreCheckedOut(std::string &content)
    {
        const std::optional<WrittenId> id = findWrittenId(content);
        if (!id)
        {
            return;
        }
        const auto database = acquire<git_odb>(git_repository_odb, repository_).value();
        const auto object = acquire<git_odb_object>(git_odb_read, database.get(), &id->content);
        // The id can be that of a file in another repository.
        if (!object.has_error() || object.error().getCode() != GIT_ENOTFOUND)
        {
            git_odb_object *const found = object.value().get();
            restoreFirst(content, *id,
                         {static_cast<const char *>(git_odb_object_data(found)),
                          git_odb_object_size(found)});
        }
    }

    git_repository *repository_;
    git_index *index_;
    std::string path_;
    std::size_t rootSize_;
    std::string block_;
};

} // namespace

void stageIdentifiedFiles(git_repository *repository, git_index *index,
                          const std::vector<ChangedFile> &changed)
{
    IdentifiedFiles files(repository, index);
    for (const ChangedFile &file : changed)
    {
        const git_index_entry *const entry =
            git_index_get_bypath(index, file.path.c_str(), GIT_INDEX_STAGE_NORMAL);
        if (entry != nullptr && isStagedFile(*entry) && !isStagedJustNow(*entry))
        {
            files.stage(*entry);
        }
    }
    const std::size_t count = git_index_entrycount(index);
    for (std::size_t i = 0; i < count; ++i)
    {
        const git_index_entry *const entry = git_index_get_byindex(index, i);
        if (isStagedFile(*entry) && isStagedJustNow(*entry))
        {
            files.stage(*entry);
        }
    }
}

} // namespace vclink::git
