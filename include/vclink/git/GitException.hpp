// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "fl/ustring.hpp"
#include "foundation/core/except/IMsgIDException.hpp"
#include "resource_core/BaseMsgID.hpp"
#include "resource_core/GenericMsgIDHolder.hpp"
#include "vclink/exception/SourceControlException.hpp"
#include "vclink/git/export.hpp"

namespace vclink::git
{

/// A failure told by a message of the catalogue "shared_vclink:git", with an optional added text.
///
/// The text is produced when it is asked for, in the process's locale of that moment. The stack is
/// recorded when the exception is made. An object belongs to one thread at a time.
class VCLINK_GIT_EXPORT GitException : public foundation::core::except::IMsgIDException,
                                       public vclink::exception::SourceControlException
{
  public:
    /// @param message is copied, its arguments with it
    /// @param addedText follows the message's text on a line of its own; may be empty
    GitException(const resource_core::BaseMsgID &message, const ustring &addedText);
    /// Without an added text.
    explicit GitException(const resource_core::BaseMsgID &message);
    /// A deep copy, the recorded stack included.
    GitException(const GitException &other);
    /// Leaves `other` without a message; only destruction makes sense of it then.
    GitException(GitException &&other);
    GitException &operator=(const GitException &) = delete;
    ~GitException() noexcept override;

    /// A copy on the heap, which the caller owns.
    [[nodiscard]] const GitException *clone() const override;
    /// Throws a copy of this class.
    void rethrow() const override;

    /// The text in UTF-8, as foundation::core::except::IException::what() gives it. Reports the
    /// stack to the log first, where stack traces are enabled.
    const char *what() const noexcept override;

    /// catalogue + ":" + key of the message.
    std::string GetID() const override;
    /// The message's text; if there is an added text, a line feed and the added text after it.
    ustring GetUnicodeMessageTxt() const override;
    /// The message, which lives as long as the exception.
    /// @throws resource_core::GenericMsgIDHolder::EmptyGenericMsgIDHolder after a move
    const resource_core::BaseMsgID &GetBaseMsgIDObj() const override;

  private:
    resource_core::GenericMsgIDHolder message_;
    ustring addedText_;
};

} // namespace vclink::git
