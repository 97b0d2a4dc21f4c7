// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <functional>
#include <map>
#include <memory>
#include <string>

#include <QSocketNotifier>
#include <QTimer>

#include "Snapshot.hpp"

namespace vclink::desktop
{

/// Reports changes of files in a working copy, at most twice a second. Watches the
/// folders that have files, with inotify itself: QFileSystemWatcher does not see that a file is
/// written, and loses names that are not UTF-8.
class FolderWatch
{
  public:
    explicit FolderWatch(std::function<void()> changed);
    FolderWatch(const FolderWatch &) = delete;
    FolderWatch &operator=(const FolderWatch &) = delete;
    ~FolderWatch();

    /// Watches what the snapshot has, and Git's own folder for what other programs do there.
    void watch(const Snapshot &snapshot);

  private:
    void add(const std::filesystem::path &folder);
    /// A new folder can have files that inotify has not reported.
    void addWithFolders(const std::filesystem::path &folder);
    void read();

    std::function<void()> changed_;
    int queue_;
    std::filesystem::path root_;
    std::map<int, std::filesystem::path> folders_;
    QSocketNotifier notifier_;
    QTimer pause_;
};

} // namespace vclink::desktop
