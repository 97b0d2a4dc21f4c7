// SPDX-License-Identifier: MIT
#include "vclink/git/GitException.hpp"

#include <memory>

#include "computils/exception/getStackTraceReport.hpp"
#include "error/logging/logger.hpp"
#include "fl/i18n/MessageCatalog.hpp"
#include "fl/i18n/VkLocale.hpp"
#include "fl/i18n/convert.hpp"

namespace vclink::git
{

GitException::GitException(const resource_core::BaseMsgID &message, const ustring &addedText)
    : message_(message), addedText_(addedText)
{
}

GitException::GitException(const resource_core::BaseMsgID &message)
    : GitException(message, ustring())
{
}

GitException::GitException(const GitException &other) = default;

GitException::GitException(GitException &&other) = default;

GitException::~GitException() noexcept = default;

const GitException *GitException::clone() const
{
    return std::make_unique<GitException>(*this).release();
}

void GitException::rethrow() const
{
    throw GitException(*this);
}

const char *GitException::what() const noexcept
{
    try
    {
        writeRecord(SeverityStackTrace, []
                    { return fl::i18n::to_string(computils::exception::getStackTraceReport()); });
    }
    catch (...)
    {
        // The text matters more than its trace, and nobody can handle the failure of a sink here.
    }
    return IException::what();
}

std::string GitException::GetID() const
{
    return get_error_id(GetBaseMsgIDObj());
}

ustring GitException::GetUnicodeMessageTxt() const
{
    const fl::i18n::VkLocale &locale = fl::i18n::VkLocale::global();
    ustring text = fl::i18n::MessageCatalog::get_message(GetBaseMsgIDObj(), locale);
    if (!addedText_.empty())
    {
        text += u'\n';
        text += addedText_;
    }
    return text;
}

const resource_core::BaseMsgID &GitException::GetBaseMsgIDObj() const
{
    return message_.get();
}

} // namespace vclink::git
