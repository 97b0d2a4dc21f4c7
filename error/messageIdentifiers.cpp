// SPDX-License-Identifier: MIT
#include "vclink/git/messageIdentifiers.hpp"

namespace shared_vclink::git
{

HasConflicts::HasConflicts() : BaseMsgID({}, detail::catalogue, "HasConflicts")
{
}

UnableToMergeBadRepositoryState::UnableToMergeBadRepositoryState()
    : BaseMsgID({}, detail::catalogue, "UnableToMergeBadRepositoryState")
{
}

MergePreferenceFastForward::MergePreferenceFastForward()
    : BaseMsgID({}, detail::catalogue, "MergePreferenceFastForward")
{
}

NoFilesToRemove::NoFilesToRemove() : BaseMsgID({}, detail::catalogue, "NoFilesToRemove")
{
}

NoUserName::NoUserName() : BaseMsgID({}, detail::catalogue, "NoUserName")
{
}

// Defined here, so that the type information of each class is in the library and the host can link
// to it.
LibGit2Error::~LibGit2Error() = default;
MergeFailed::~MergeFailed() = default;
HasConflicts::~HasConflicts() = default;
UnableToMergeBadRepositoryState::~UnableToMergeBadRepositoryState() = default;
MergePreferenceFastForward::~MergePreferenceFastForward() = default;
AlreadyAdded::~AlreadyAdded() = default;
NoFilesToRemove::~NoFilesToRemove() = default;
Conflicted::~Conflicted() = default;
NoUserName::~NoUserName() = default;
InvalidGitAttributeValue::~InvalidGitAttributeValue() = default;
ProgressCallbackCheckoutMessage::~ProgressCallbackCheckoutMessage() = default;

} // namespace shared_vclink::git
