// SPDX-License-Identifier: MIT
#include "failures.hpp"

#include <csignal>
#include <exception>
#include <iostream>

#include "fl/i18n/VkLocale.hpp"
#include "fl/i18n/convert.hpp"
#include "foundation/core/except/IUserException.hpp"
#include "names.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::shell
{
namespace
{

/// Cancellation has no text in the back end's catalogue: what to call it is the host's affair.
std::string cancelledText()
{
    const std::string locale = fl::i18n::VkLocale::global().name();
    const std::string language = locale.substr(0, locale.find_first_of("_.@"));
    if (language == "de")
    {
        return "Der Vorgang wurde abgebrochen.";
    }
    if (language == "ja")
    {
        return "操作はキャンセルされました。";
    }
    return "The operation was cancelled.";
}

} // namespace

void complain(const std::string &text)
{
    std::cerr << "vclink-shell: " << makePrintable(fl::i18n::utf8_to_ustring(text)) << '\n';
}

ExitStatus reportFailure()
{
    try
    {
        throw;
    }
    catch (const util::exception::CancelledOperationException &)
    {
        complain(cancelledText());
        return Cancelled;
    }
    catch (const OutputClosed &)
    {
        return endedBy(SIGPIPE);
    }
    catch (const foundation::core::except::IUserException &failure)
    {
        complain(fl::i18n::ustring_to_utf8(failure.GetUnicodeMessageTxt()));
    }
    catch (const std::exception &failure)
    {
        complain(failure.what());
    }
    catch (...)
    {
        complain("The command ended with an error of an unknown kind.");
    }
    return Failed;
}

} // namespace vclink::shell
