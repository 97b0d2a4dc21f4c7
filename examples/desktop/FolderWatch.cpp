// SPDX-License-Identifier: MIT
#include "FolderWatch.hpp"

#include <array>
#include <set>
#include <system_error>
#include <utility>

#include <sys/inotify.h>
#include <unistd.h>

#include "hostTools.hpp"

namespace vclink::desktop
{
namespace
{

namespace fs = std::filesystem;

constexpr int pauseMilliseconds = 500;
constexpr unsigned changes = IN_CREATE | IN_DELETE | IN_MOVED_FROM | IN_MOVED_TO | IN_CLOSE_WRITE |
                             IN_ATTRIB | IN_ONLYDIR | IN_DONT_FOLLOW;

} // namespace

FolderWatch::FolderWatch(std::function<void()> changed)
    : changed_(std::move(changed)), queue_(::inotify_init1(IN_NONBLOCK | IN_CLOEXEC)),
      notifier_(queue_, QSocketNotifier::Read)
{
    pause_.setSingleShot(true);
    pause_.setInterval(pauseMilliseconds);
    QObject::connect(&pause_, &QTimer::timeout, changed_);
    QObject::connect(&notifier_, &QSocketNotifier::activated, [this] { read(); });
}

FolderWatch::~FolderWatch()
{
    notifier_.setEnabled(false);
    ::close(queue_);
}

void FolderWatch::watch(const Snapshot &snapshot)
{
    const fs::path root = host_tools::toStdPath(snapshot.root);
    if (root != root_)
    {
        for (const auto &watched : folders_)
            ::inotify_rm_watch(queue_, watched.first);
        folders_.clear();
        root_ = root;
    }
    std::set<fs::path> folders{root, root / ".git", root / ".git/refs/heads"};
    for (const auto &entry : snapshot.states)
    {
        // Files of one folder follow each other.
        const fs::path folder = host_tools::toStdPath(entry.first).parent_path();
        for (fs::path above = folder; above != root && folders.insert(above).second;)
            above = above.parent_path();
    }
    for (const auto &folder : folders)
        add(folder);
}

void FolderWatch::add(const fs::path &folder)
{
    // Fails when there is no such folder, and when the system's watches are used up: then the
    // window shows changes when it is activated.
    const int number = ::inotify_add_watch(queue_, folder.c_str(), changes);
    if (number >= 0)
        folders_[number] = folder;
}

void FolderWatch::addWithFolders(const fs::path &folder)
{
    add(folder);
    std::error_code error;
    fs::recursive_directory_iterator entry(folder, error);
    for (; !error && entry != fs::recursive_directory_iterator(); entry.increment(error))
    {
        std::error_code ignored;
        if (fs::is_directory(entry->symlink_status(ignored)))
            add(entry->path());
    }
}

void FolderWatch::read()
{
    alignas(inotify_event) std::array<char, 16'384> bytes{};
    for (;;)
    {
        const ssize_t count = ::read(queue_, bytes.data(), bytes.size());
        if (count <= 0)
            break;
        for (ssize_t place = 0; place < count;)
        {
            const auto *event = reinterpret_cast<const inotify_event *>(bytes.data() + place);
            place += static_cast<ssize_t>(sizeof(inotify_event) + event->len);
            const auto folder = folders_.find(event->wd);
            if ((event->mask & IN_IGNORED) != 0)
                folders_.erase(event->wd);
            else if (folder != folders_.end() && (event->mask & IN_ISDIR) != 0 &&
                     (event->mask & (IN_CREATE | IN_MOVED_TO)) != 0)
                addWithFolders(fs::path(folder->second) / event->name);
        }
    }
    if (!pause_.isActive())
        pause_.start();
}

} // namespace vclink::desktop
