// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "fl/ustring.hpp"
#include "resource_core/BaseMsgID.hpp"
#include "vclink/git/export.hpp"

/// The messages of the catalogue "shared_vclink:git". Each class has the name of its key, and holds
/// the message's arguments. Unless its description says otherwise, the library throws it as
/// foundation::core::except::Exception<Identifier, vclink::exception::SourceControlException>, and
/// a host catches it by that type.
namespace shared_vclink::git
{
namespace detail
{

inline constexpr const char *catalogue = "shared_vclink:git";

/// Converts a value to an argument of a message.
inline long toArgument(long number)
{
    return number;
}
inline std::string toArgument(const char *text)
{
    return text;
}
inline const std::string &toArgument(const std::string &text)
{
    return text;
}
inline const ustring &toArgument(const ustring &text)
{
    return text;
}
inline ustring &&toArgument(ustring &&text)
{
    return std::move(text);
}

/// Makes no copies, as a list of initialisers would: a checkout needs such a message for every
/// file.
template <class... Values> std::vector<resource_core::MsgArgument> makeArguments(Values &&...values)
{
    std::vector<resource_core::MsgArgument> arguments;
    arguments.reserve(sizeof...(values));
    (arguments.emplace_back(toArgument(std::forward<Values>(values))), ...);
    return arguments;
}

} // namespace detail

/// A call of libgit2 failed. Thrown as vclink::git::LibGit2Exception.
class VCLINK_GIT_EXPORT LibGit2Error : public resource_core::BaseMsgID
{
  public:
    /// @param code libgit2's return code
    /// @param errorClass libgit2's error class
    /// @param text libgit2's text
    template <class Text>
    LibGit2Error(long code, long errorClass, const Text &text)
        : BaseMsgID(detail::makeArguments(code, errorClass, text), detail::catalogue,
                    "LibGit2Error")
    {
    }
    LibGit2Error(const LibGit2Error &) = default;
    ~LibGit2Error() override;
};

/// A merge failed. Thrown as vclink::git::GitException, with the cause as added text.
class VCLINK_GIT_EXPORT MergeFailed : public resource_core::BaseMsgID
{
  public:
    /// @param branchName the branch or revision to merge, UTF-8
    template <class Text>
    explicit MergeFailed(const Text &branchName)
        : BaseMsgID(detail::makeArguments(branchName), detail::catalogue, "MergeFailed")
    {
    }
    MergeFailed(const MergeFailed &) = default;
    ~MergeFailed() override;
};

/// A merge left conflicts. Hosts get only its text, as added text of MergeFailed.
class VCLINK_GIT_EXPORT HasConflicts : public resource_core::BaseMsgID
{
  public:
    HasConflicts();
    HasConflicts(const HasConflicts &) = default;
    ~HasConflicts() override;
};

/// A merge was requested while another operation is in progress. Hosts get only its text, as added
/// text of MergeFailed.
class VCLINK_GIT_EXPORT UnableToMergeBadRepositoryState : public resource_core::BaseMsgID
{
  public:
    UnableToMergeBadRepositoryState();
    UnableToMergeBadRepositoryState(const UnableToMergeBadRepositoryState &) = default;
    ~UnableToMergeBadRepositoryState() override;
};

/// The configuration allows only fast-forwards, and the branches need a merge commit. Hosts get
/// only its text, as added text of MergeFailed.
class VCLINK_GIT_EXPORT MergePreferenceFastForward : public resource_core::BaseMsgID
{
  public:
    MergePreferenceFastForward();
    MergePreferenceFastForward(const MergePreferenceFastForward &) = default;
    ~MergePreferenceFastForward() override;
};

/// Git already knows some of the files to add.
class VCLINK_GIT_EXPORT AlreadyAdded : public resource_core::BaseMsgID
{
  public:
    /// @param files the files, one path a line
    template <class Text>
    explicit AlreadyAdded(const Text &files)
        : BaseMsgID(detail::makeArguments(files), detail::catalogue, "AlreadyAdded")
    {
    }
    AlreadyAdded(const AlreadyAdded &) = default;
    ~AlreadyAdded() override;
};

/// None of the files can be removed.
class VCLINK_GIT_EXPORT NoFilesToRemove : public resource_core::BaseMsgID
{
  public:
    NoFilesToRemove();
    NoFilesToRemove(const NoFilesToRemove &) = default;
    ~NoFilesToRemove() override;
};

/// Some of the files to revert are in conflict.
class VCLINK_GIT_EXPORT Conflicted : public resource_core::BaseMsgID
{
  public:
    /// @param files the files, one path a line
    template <class Text>
    explicit Conflicted(const Text &files)
        : BaseMsgID(detail::makeArguments(files), detail::catalogue, "Conflicted")
    {
    }
    Conflicted(const Conflicted &) = default;
    ~Conflicted() override;
};

/// There is no name for the author of a commit.
class VCLINK_GIT_EXPORT NoUserName : public resource_core::BaseMsgID
{
  public:
    NoUserName();
    NoUserName(const NoUserName &) = default;
    ~NoUserName() override;
};

/// libgit2 returned an attribute value of an unknown kind. Thrown as vclink::git::GitException.
class VCLINK_GIT_EXPORT InvalidGitAttributeValue : public resource_core::BaseMsgID
{
  public:
    /// @param value the raw value, UTF-8
    template <class Text>
    explicit InvalidGitAttributeValue(const Text &value)
        : BaseMsgID(detail::makeArguments(value), detail::catalogue, "InvalidGitAttributeValue")
    {
    }
    InvalidGitAttributeValue(const InvalidGitAttributeValue &) = default;
    ~InvalidGitAttributeValue() override;
};

/// The file that a checkout has reached. A progress text, never thrown.
class VCLINK_GIT_EXPORT ProgressCallbackCheckoutMessage : public resource_core::BaseMsgID
{
  public:
    /// @param path the file, relative to the root
    template <class Text>
    explicit ProgressCallbackCheckoutMessage(const Text &path)
        : BaseMsgID(detail::makeArguments(path), detail::catalogue,
                    "ProgressCallbackCheckoutMessage")
    {
    }
    /// @param path the file, relative to the root; moved from
    explicit ProgressCallbackCheckoutMessage(ustring &&path)
        : BaseMsgID(detail::makeArguments(std::move(path)), detail::catalogue,
                    "ProgressCallbackCheckoutMessage")
    {
    }
    ProgressCallbackCheckoutMessage(const ProgressCallbackCheckoutMessage &) = default;
    ~ProgressCallbackCheckoutMessage() override;
};

} // namespace shared_vclink::git
