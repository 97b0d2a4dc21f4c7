// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <cerrno>
#include <chrono>
#include <cstddef>
#include <exception>
#include <filesystem>
#include <functional>
#include <stdexcept>
#include <string>
#include <system_error>
#include <utility>
#include <vector>

#include <boost/variant/get.hpp>

#include "fl/filesystem/path.hpp"
#include "fl/i18n/convert.hpp"
#include "fl/ustring.hpp"
#include "foundation/core/except/IUserException.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/FileState.hpp"
#include "vclink/FileStateMap.hpp"
#include "vclink/ProgressReporter.hpp"
#include "vclink/Terminator.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

/// Code that most hosts need around the library: copy this header into your host, and change it
/// there. It is not a part of the library's interface, so each release can change it.
namespace host_tools
{

// ---- Paths. Both ways keep every byte, also of names that are not UTF-8.

inline std::filesystem::path toStdPath(const upath &path)
{
    return fl::i18n::ustring_to_utf8(path.string());
}

inline upath toUpath(const std::filesystem::path &path)
{
    return upath(fl::i18n::utf8_to_ustring(path.string()));
}

/// The part of an adapter's path after the adapter's root.
inline ustring relativeName(const upath &path, const upath &root)
{
    std::size_t start = root.string().size();
    while (start < path.string().size() && path.string()[start] == u'/')
        ++start;
    return path.string().substr(start);
}

/// The order of FileStateMap, for std::sort and others: upath has std::less, but no operator<.
struct PathOrder
{
    bool operator()(const upath &left, const upath &right) const noexcept
    {
        return fl::filesystem::detail::less(left.string(), right.string());
    }
};

/// For std::unordered_map and std::unordered_set.
struct PathHash
{
    std::size_t operator()(const upath &path) const noexcept
    {
        return std::hash<ustring>()(path.string());
    }
};

/// Whether an operation on this path acts on this file and on no other one. In a list of files the
/// characters '*', '?' and '[' act as patterns, a backslash acts as a slash, and a symbolic link
/// means its target.
inline bool meansOnlyItself(const upath &path)
{
    std::error_code ignored;
    return path.string().find_first_of(u"*?[\\") == ustring::npos &&
           !std::filesystem::is_symlink(toStdPath(path), ignored);
}

// ---- States.

/// A word for the state, in lower case. A number that is not known counts as "unknown".
inline const char *nameOf(vclink::FileState state) noexcept
{
    switch (state.getState())
    {
    case vclink::FileState::Unversioned:
        return "unversioned";
    case vclink::FileState::Clean:
        return "clean";
    case vclink::FileState::InConflict:
        return "conflict";
    case vclink::FileState::Modified:
        return "modified";
    case vclink::FileState::Added:
        return "added";
    case vclink::FileState::Deleted:
        return "deleted";
    case vclink::FileState::Missing:
        return "missing";
    case vclink::FileState::Unknown:
        break;
    }
    return "unknown";
}

/// libgit2 can't read the working copy, or the commit of HEAD. A state query then returns no files,
/// so that everything looks clean, or each file as added. It does not fail.
class StatesUnknown : public std::runtime_error
{
  public:
    StatesUnknown() : std::runtime_error("The states of the files cannot be read.")
    {
    }
};

inline bool isBeforeFirstCommit(const vclink::git::BranchManager &branches)
{
    constexpr int unborn = -9; // GIT_EUNBORNBRANCH
    try
    {
        branches.getCurrentBranch();
        return false;
    }
    catch (const vclink::git::LibGit2Exception &failure)
    {
        return failure.getError().getCode() == unborn;
    }
}

/// @throws StatesUnknown if the commit of HEAD or its tree can't be read
inline bool hasFilesInHead(const vclink::git::BranchManager &branches)
{
    const std::string emptyTree = "4b825dc642cb6eb9a060e54bf8d69288fbee4904";
    try
    {
        return branches.getRevision("HEAD^{tree}") != emptyTree;
    }
    catch (const vclink::git::LibGit2Exception &)
    {
        // Throws if the repository can't be opened.
        (void)branches.getRepositoryState();
        if (!isBeforeFirstCommit(branches))
            throw StatesUnknown();
        return false;
    }
}

/// The states of all files, ignored ones left out.
/// @throws StatesUnknown
inline vclink::FileStateMap readStates(vclink::CMAdapter &adapter)
{
    const bool hasFiles = hasFilesInHead(*vclink::git::BranchManager::create(adapter));
    vclink::FileStateMap states = adapter.getFolderStates(adapter.getRootFolder());
    if (states.empty() && hasFiles)
        throw StatesUnknown();
    return states;
}

/// The files that have to be resolved before a commit; in the order of FileStateMap.
/// @throws StatesUnknown
inline std::vector<upath> filesInConflict(vclink::CMAdapter &adapter)
{
    std::vector<upath> files;
    for (const auto &[path, state] : readStates(adapter))
    {
        if (state.getState() == vclink::FileState::InConflict)
            files.push_back(path);
    }
    return files;
}

// ---- Progress.

/// Forwards at most one report in an interval, because a checkout makes two for each file. Always
/// forwards the first one, which has no message yet, and the end. Runs on the thread of the
/// operation, and calls `show` there.
class ThrottledProgress : public vclink::ProgressReporter
{
  public:
    using Clock = std::chrono::steady_clock;
    using Show = std::function<void(double fraction, const ustring &message)>;

    explicit ThrottledProgress(Show show, Clock::duration interval = std::chrono::milliseconds(50))
        : show_(std::move(show)), interval_(interval)
    {
    }

    void setProgress(double fraction) override
    {
        fraction_ = fraction;
        const bool isFirst = !begun_.exchange(true);
        pass(isFirst || fraction >= 1.0);
    }
    void setProgressMessage(const ustring &message) override
    {
        message_ = message;
        pass(false);
    }

    /// Whether the checkout writes files: from then on it can't be cancelled. Any thread.
    bool hasBegun() const noexcept
    {
        return begun_.load();
    }

  private:
    void pass(bool always)
    {
        const auto now = Clock::now();
        if (!always && now - passed_ < interval_)
            return;
        passed_ = now;
        show_(fraction_, message_);
    }

    Show show_;
    Clock::duration interval_;
    Clock::time_point passed_;
    double fraction_ = 0.0;
    ustring message_;
    std::atomic<bool> begun_{false};
};

/// Receives the progress of an operation, and has the terminator that cancels it. Make a new one,
/// and a new adapter with it, for each operation that can be cancelled: an adapter remembers a
/// request that comes too late, and stops its next operation.
class Interactor : public vclink::ApplicationInteractor
{
  public:
    /// @param show see ThrottledProgress
    explicit Interactor(ThrottledProgress::Show show) : progress_(std::move(show))
    {
    }

    vclink::Terminator &getTerminator() override
    {
        return terminator_;
    }
    vclink::ProgressReporter *getProgressReporter() override
    {
        return &progress_;
    }

    /// Whether a checkout writes files, which can't be cancelled. Any thread.
    bool isWriting() const noexcept
    {
        return progress_.hasBegun();
    }

  private:
    vclink::Terminator terminator_;
    ThrottledProgress progress_;
};

// ---- Failures.

/// What an exception of an operation means, by the identifier of its message.
enum class FailureKind
{
    Cancelled,                ///< the host asked for it
    LibGit2Error,             ///< a call to libgit2 failed; `code` says more
    MergeFailed,              ///< any failed merge, a cancelled one and one with conflicts included
    AlreadyAdded,             ///< `files` are known to Git
    NoFilesToRemove,          ///< nothing was named that can be removed
    Conflicted,               ///< `files` are in conflict
    NoUserName,               ///< a commit has no author
    InvalidGitAttributeValue, ///< an attribute of an unknown kind
    Other                     ///< of the system, or of the host itself
};

/// A failure as a host shows it.
struct Failure
{
    FailureKind kind = FailureKind::Other;
    /// e.g. "shared_vclink:git:AlreadyAdded"; empty for exceptions without a message identifier
    std::string id;
    /// For the user, in the locale that was current when the failure was described. For the kinds
    /// Cancelled and Other it is what(), in English. For AlreadyAdded and Conflicted it lists the
    /// files.
    ustring text;
    /// One path in each line, if the kind has files.
    ustring files;
    /// libgit2's return code, or 0.
    int code = 0;
    /// Whether the user has no permission to read or write a file. libgit2 often has the code of a
    /// lock for this.
    bool isDenied = false;

    /// Whether another operation or program holds a lock: try again.
    bool isLocked() const noexcept
    {
        constexpr int locked = -14; // GIT_ELOCKED
        return code == locked && !isDenied;
    }
};

/// Returns the kind of failure of an identifier of the catalogue.
inline FailureKind kindOf(const std::string &id)
{
    static constexpr std::pair<const char *, FailureKind> kinds[] = {
        {"LibGit2Error", FailureKind::LibGit2Error},
        {"MergeFailed", FailureKind::MergeFailed},
        {"AlreadyAdded", FailureKind::AlreadyAdded},
        {"NoFilesToRemove", FailureKind::NoFilesToRemove},
        {"Conflicted", FailureKind::Conflicted},
        {"NoUserName", FailureKind::NoUserName},
        {"InvalidGitAttributeValue", FailureKind::InvalidGitAttributeValue}};
    for (const auto &[key, kind] : kinds)
    {
        if (id == std::string("shared_vclink:git:") + key)
            return kind;
    }
    return FailureKind::Other;
}

/// Describes an exception of the library. Any thread, but one thread at a time for each exception.
inline Failure describe(const std::exception_ptr &exception)
{
    Failure failure;
    try
    {
        std::rethrow_exception(exception);
    }
    catch (const vclink::util::exception::CancelledOperationException &cancelled)
    {
        failure.kind = FailureKind::Cancelled;
        failure.text = fl::i18n::to_ustring(cancelled.what());
    }
    catch (const foundation::core::except::IUserException &user)
    {
        failure.id = user.GetID();
        failure.kind = kindOf(failure.id);
        failure.text = user.GetUnicodeMessageTxt();
        if (const auto *git = dynamic_cast<const vclink::git::LibGit2Exception *>(&user))
        {
            const std::string denied = std::generic_category().message(EACCES);
            failure.code = git->getError().getCode();
            failure.isDenied = git->getError().getMessage().find(
                                   fl::i18n::utf8_to_ustring(denied)) != ustring::npos;
        }
        const auto &arguments = user.GetBaseMsgIDObj().getArguments();
        const bool hasFiles =
            failure.kind == FailureKind::AlreadyAdded || failure.kind == FailureKind::Conflicted;
        if (hasFiles && !arguments.empty())
        {
            if (const auto *files = boost::get<ustring>(&arguments.front()))
                failure.files = *files;
        }
    }
    catch (const std::exception &other)
    {
        failure.text = fl::i18n::to_ustring(other.what());
    }
    catch (...)
    {
        failure.text = u"An error of an unknown kind.";
    }
    return failure;
}

} // namespace host_tools
