// SPDX-License-Identifier: MIT
#include "options/CheckoutCallbacks.hpp"

#include <string>

#include "error/logging/logger.hpp"
#include "fl/i18n/MessageCatalog.hpp"
#include "fl/i18n/VkLocale.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink/ProgressReporter.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::git
{

CheckoutCallbacks::CheckoutCallbacks(ApplicationInteractor &interactor)
    : interactor_(interactor), poller_(interactor)
{
}

int CheckoutCallbacks::notifyProgress(git_checkout_notify_t why, const char *path,
                                      const git_diff_file * /*baseline*/,
                                      const git_diff_file * /*target*/,
                                      const git_diff_file * /*workdir*/)
{
    poller_.throwIfCancelled();
    writeRecord(SeverityProgress, "Checkout Notify : ", static_cast<unsigned>(why), " (", path,
                ")");
    return 0;
}

void CheckoutCallbacks::checkoutProgress(const char *path, std::size_t completedSteps,
                                         std::size_t totalSteps)
{
    ProgressReporter *const reporter = interactor_.getProgressReporter();
    const bool hasPath = path != nullptr && *path != '\0';
    writeRecord(SeverityParameter, " pathStr=", path, " completed_steps=", completedSteps,
                " total_steps=", totalSteps);
    if (reporter == nullptr)
    {
        return;
    }
    if (completedSteps == 0)
    {
        // Intentionally again below, for a first step with a path.
        reporter->setProgress(0.0);
    }
    if (!hasPath || totalSteps == 0)
    {
        return;
    }
    reporter->setProgress(static_cast<double>(completedSteps) / static_cast<double>(totalSteps));
    const shared_vclink::git::ProgressCallbackCheckoutMessage message(
        fl::i18n::utf8_to_ustring(path));
    reporter->setProgressMessage(
        fl::i18n::MessageCatalog::get_message(message, fl::i18n::VkLocale::global()));
}

void CheckoutCallbacks::perfData(const git_checkout_perfdata *data)
{
    writeRecord(SeverityProgress, "Calls to chmod / mkdir / stat : ", data->chmod_calls, " / ",
                data->mkdir_calls, " / ", data->stat_calls);
}

} // namespace vclink::git
