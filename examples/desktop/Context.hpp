// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <vector>

#include "Runner.hpp"

class QWidget;

namespace vclink::desktop
{

/// What the commands of the menus work on.
struct Context
{
    /// The parent of their dialogs.
    QWidget *window;
    Runner &runner;
    /// Never null.
    std::function<std::shared_ptr<const Snapshot>()> snapshot;
    /// The files that are selected in the list.
    std::function<std::vector<upath>()> selection;
    std::function<void(const QString &)> tell;
};

} // namespace vclink::desktop
