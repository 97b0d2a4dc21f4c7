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

/// Reports a failure by a message of the catalogue "shared_vclink:git", with an optional added
/// text.
///
/// The text is in the process's locale current when the text is requested. The stack is recorded
/// when the exception is created. An object belongs to one thread at a time.
class VCLINK_GIT_EXPORT GitException : public foundation::core::except::IMsgIDException,
                                       public vclink::exception::SourceControlException
{
  public:
    /// Copies the message and its arguments.
    /// @param message the message
    /// @param addedText follows the message's text on a line of its own; can be empty
    GitException(const resource_core::BaseMsgID &message, const ustring &addedText);
    /// Copies the message, without an added text.
    explicit GitException(const resource_core::BaseMsgID &message);
    /// Makes a deep copy, including the recorded stack.
    GitException(const GitException &other);
    /// Leaves `other` without a message: the moved-from object may only be destroyed.
    GitException(GitException &&other);
    GitException &operator=(const GitException &) = delete;
    ~GitException() noexcept override;

    /// Returns a copy on the heap. The caller owns it.
    [[nodiscard]] const GitException *clone() const override;
    /// Throws a copy whose type is GitException.
    void rethrow() const override;

    /// Returns the text in UTF-8, as foundation::core::except::IException::what() does. Logs the
    /// stack first if stack traces are enabled.
    const char *what() const noexcept override;

    /// Returns catalogue and key of the message, e.g. "shared_vclink:git:MergeFailed".
    std::string GetID() const override;
    /// Returns the message's text, followed by a line feed and the added text if there is one.
    ustring GetUnicodeMessageTxt() const override;
    /// Returns the message, which lives as long as the exception.
    /// @throws resource_core::GenericMsgIDHolder::EmptyGenericMsgIDHolder after a move
    const resource_core::BaseMsgID &GetBaseMsgIDObj() const override;

  private:
    resource_core::GenericMsgIDHolder message_;
    ustring addedText_;
};

} // namespace vclink::git
