// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <string>

#include <QProcess>
#include <QString>
#include <QTemporaryDir>

#include "fl/filesystem/path.hpp"
#include "gitProgram.hpp"

namespace vclink::desktop
{

/// Runs the host's merge tool, bin/lnxhost/vkMerge below its place of installation, on copies of a
/// file's versions, and writes the result into the file if nobody has changed it since.
class MergeTool
{
  public:
    /// Called with an empty text when the file has the result.
    using Ended = std::function<void(const QString &problem)>;

    bool isOpen() const noexcept
    {
        return process_ != nullptr;
    }
    /// Does not wait for the tool.
    void open(const upath &file, const Sides &sides, Ended ended);

  private:
    QString takeOver() const;

    upath file_;
    std::string before_;
    std::optional<QTemporaryDir> folder_;
    struct Later
    {
        void operator()(QProcess *process) const;
    };
    std::unique_ptr<QProcess, Later> process_;
};

} // namespace vclink::desktop
