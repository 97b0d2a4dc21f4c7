// SPDX-License-Identifier: MIT
#include "util/lock/IndexLock.hpp"

#include <cerrno>
#include <climits>
#include <cstddef>
#include <string>
#include <utility>

#include <fcntl.h>
#include <git2/errors.h>
#include <git2/index.h>
#include <git2/repository.h>
#include <git2/sys/repository.h>
#include <sys/stat.h>
#include <unistd.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/raiseGitError.hpp"
#include "error/errorUtil/raiseSystemError.hpp"
#include "util/lock/referenceLocks.hpp"
#include "util/repository/repository.hpp"
#include "util/scope/FileDescriptor.hpp"

namespace vclink::git
{
namespace
{

/// As many as git and libgit2 follow.
constexpr int maximumLinks = 5;

[[noreturn]] void raiseUnresolvable(int error, const std::string &index)
{
    raiseSystemError(error, "failed to read index: '" + index + "'", GIT_ERROR_INDEX);
}

/// Returns the target of a link, empty if the path is not a link.
std::string readIndexLink(const std::string &path)
{
    struct stat status = {};
    if (::lstat(path.c_str(), &status) != 0 && errno != ENOENT)
    {
        raiseUnresolvable(errno, path);
    }
    if (!S_ISLNK(status.st_mode))
    {
        return {};
    }
    std::string target(PATH_MAX, '\0');
    const ssize_t size = ::readlink(path.c_str(), target.data(), target.size());
    if (size < 0)
    {
        raiseUnresolvable(errno, path);
    }
    target.resize(static_cast<std::size_t>(size));
    return target;
}

/// Returns the file to lock and replace: the target of a symbolic link.
std::string findIndex(git_repository *repository)
{
    std::string path = git_repository_path(repository) + std::string("index");
    for (int links = 0; links < maximumLinks; ++links)
    {
        const std::string target = readIndexLink(path);
        if (target.empty())
        {
            return path;
        }
        const std::string folder = path.substr(0, path.rfind('/') + 1);
        path = target.front() == '/' ? target : folder + target;
    }
    raiseUnresolvable(ELOOP, path);
}

[[noreturn]] void raiseLocked(const std::string &lock)
{
    raiseGitError(GIT_ELOCKED, GIT_ERROR_INDEX,
                  "the index is locked by '" + lock +
                      "'; this might be due to a concurrent or crashed process");
}

} // namespace

/// The lock file, which git and libgit2 respect.
class IndexLock::LockFile
{
  public:
    LockFile(std::string path, ReferenceLockWait wait) : path_(std::move(path))
    {
        int error = create();
        while (error == EEXIST && wait.pause())
        {
            error = create();
        }
        if (error == EEXIST)
        {
            raiseLocked(path_);
        }
        if (error != 0)
        {
            raiseSystemError(error, "failed to create locked file '" + path_ + "'");
        }
    }
    LockFile(const LockFile &) = delete;
    LockFile &operator=(const LockFile &) = delete;
    ~LockFile()
    {
        ::unlink(path_.c_str());
    }

  private:
    /// @return 0, or an errno
    int create() const
    {
        const FileDescriptor file(
            ::open(path_.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, S_IRUSR | S_IWUSR));
        return file ? 0 : errno;
    }

    std::string path_;
};

/// Everything that lives as long as the lock. The copy is destroyed first, because the next holder
/// of the lock makes its own.
class IndexLock::Held
{
  public:
    Held(std::string index, IndexTime time, std::chrono::milliseconds patience)
        : path(std::move(index)), lock(path + ".lock", ReferenceLockWait(patience)),
          copy(path, time)
    {
    }

    const std::string path;
    const LockFile lock;
    const IndexCopy copy;
};

IndexLock::IndexLock(git_repository *repository, IndexTime time, std::chrono::milliseconds patience)
    : held_(std::make_unique<Held>(findIndex(repository), time, patience))
{
    const OwnedHandle<git_index> index = openIndex(held_->copy.path().c_str());
    check(git_repository_set_index, repository, index.get());
    check(git_index_set_caps, index.get(), GIT_INDEX_CAPABILITY_FROM_OWNER);
}

IndexLock::~IndexLock()
{
    if (held_ != nullptr)
    {
        static_cast<void>(held_->copy.replaceIndex());
    }
}

void IndexLock::publish()
{
    const int error = held_->copy.replaceIndex();
    if (error != 0)
    {
        raiseSystemError(error, "could not replace the index '" + held_->path + "'");
    }
}

void IndexLock::discard() noexcept
{
    held_.reset();
}

void IndexLock::release()
{
    publish();
    held_.reset();
}

} // namespace vclink::git
