// SPDX-License-Identifier: MIT
#include "vclink/git/GitError.hpp"

#include <string_view>

#include <git2/errors.h>

#include "fl/i18n/convert.hpp"

namespace vclink::git
{
namespace
{

/// Whether libgit2 has no error record, or (since 1.8) one that says so.
bool isSilent(const git_error *record) noexcept
{
    return record == nullptr ||
           (record->klass == GIT_ERROR_NONE && std::string_view(record->message) == "no error");
}

} // namespace

GitError::GitError(int code) : code_(code)
{
    const git_error *const record = git_error_last();
    if (code == 0 || isSilent(record))
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
