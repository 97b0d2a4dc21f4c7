// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "support/LogCapture.hpp"
#include "support/TestInteractor.hpp"

namespace vclink::test
{

/// Has the application ask for cancellation at the record with this number, of those that come from
/// now on and begin like this.
/// @param interactor outlives the log, or the next LogCapture::onRecord()
void cancelAt(LogCapture &log, TestInteractor &interactor, const std::string &beginning,
              int number = 1);

} // namespace vclink::test
