// SPDX-License-Identifier: MIT
#pragma once

#include <memory>

#include "Context.hpp"
#include "Rescue.hpp"

namespace vclink::desktop
{

/// Add, remove, revert and its way back, commit.
class FileCommands
{
  public:
    explicit FileCommands(Context context);

    void add();
    void remove();
    void revert();
    bool canUndoRevert() const noexcept
    {
        return rescue_ != nullptr;
    }
    void undoRevert();
    void commit();

  private:
    void revert(const std::vector<upath> &files);
    void askForMessage(const Snapshot &snapshot, const QString &author);

    Context context_;
    /// What the last revert has kept.
    std::shared_ptr<const Rescue> rescue_;
};

/// Runs an operation on these files, unless it would act on others too, or on none.
void runOn(const Context &context, Operation operation, const std::vector<upath> &files,
           std::function<void(CMAdapter &, const std::vector<upath> &)> act);

} // namespace vclink::desktop
