// SPDX-License-Identifier: MIT
#include "support/cancelAt.hpp"

namespace vclink::test
{

void cancelAt(LogCapture &log, TestInteractor &interactor, const std::string &beginning, int number)
{
    log.onRecord(
        [&interactor, beginning, number](const LogRecord &record) mutable
        {
            if (record.message.compare(0, beginning.size(), beginning) == 0 && --number == 0)
                interactor.cancel();
        });
}

} // namespace vclink::test
