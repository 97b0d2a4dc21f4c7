// SPDX-License-Identifier: MIT
#include "vclink/git/GitError.hpp"

#include <git2/errors.h>

#include "fl/i18n/convert.hpp"

namespace vclink::git
{

GitError::GitError(int code) : code_(code)
{
    const git_error *const record = git_error_last();
    if (code == 0 || record == nullptr)
    {
        return;
    }
    errorClass_ = record->klass;
    message_ = fl::i18n::utf8_to_ustring(record->message);
}

std::int32_t GitError::getCode() const noexcept
{
    return code_;
}

std::int32_t GitError::getErrorClass() const noexcept
{
    return errorClass_;
}

ustring GitError::getMessage() const
{
    return message_;
}

} // namespace vclink::git
