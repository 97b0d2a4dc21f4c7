// SPDX-License-Identifier: MIT
#include "FileCommands.hpp"

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <utility>

#include <QDateTime>
#include <QFile>
#include <QStandardPaths>

#include "FormDialog.hpp"
#include "gitProgram.hpp"
#include "language.hpp"
#include "messages.hpp"
#include "owned.hpp"
#include "text.hpp"

namespace vclink::desktop
{
namespace
{

namespace fs = std::filesystem;

/// @throws std::runtime_error with the refusal
void requireOnly(CMAdapter &adapter, const std::vector<upath> &files, const QString &refusal)
{
    if (std::all_of(files.begin(), files.end(), host_tools::meansOnlyItself))
        return;
    FileStateMap reached = adapter.getFileStates(files);
    for (const auto &file : files)
    {
        if (reached.erase(file) == 0)
            throw std::runtime_error(toUtf8(
                refusal.arg(printable(host_tools::relativeName(file, adapter.getRootFolder())))));
    }
    if (!reached.empty())
    {
        const auto &other = reached.begin()->first;
        throw std::runtime_error(toUtf8(
            refusal.arg(printable(host_tools::relativeName(other, adapter.getRootFolder())))));
    }
}

fs::path newRescueFolder()
{
    const QString folder = QStandardPaths::writableLocation(QStandardPaths::AppLocalDataLocation);
    const QString moment = QDateTime::currentDateTime().toString(u"yyyy-MM-dd-hh-mm-ss-zzz");
    return fs::path(QFile::encodeName(folder).toStdString()) / "reverted" / moment.toStdString();
}

QString names(const std::vector<upath> &files, const upath &root)
{
    constexpr std::size_t most = 15;
    QString text;
    for (std::size_t index = 0; index < std::min(files.size(), most); ++index)
        text += printable(host_tools::relativeName(files[index], root)) + u'\n';
    return files.size() > most ? text + QStringLiteral("… (%1)").arg(files.size())
                               : text.chopped(1);
}

/// What libgit2 proposes for a merge that is under way.
QString proposedMessage(const upath &root)
{
    std::ifstream file(host_tools::toStdPath(root) / ".git/MERGE_MSG");
    QString message;
    for (std::string line; std::getline(file, line);)
    {
        if (line.empty() || line.front() != '#')
            message += fromUtf8(line) + u'\n';
    }
    return message.trimmed();
}

/// Why nothing may be committed; empty if it may.
QString refusalToCommit(const Snapshot &snapshot)
{
    const bool merges = snapshot.repositoryState == "Conflicts";
    if (!snapshot.filesWith(FileState::InConflict).empty())
        return say("Resolve the files in conflict first.");
    // The library counts a series of picked commits as a merge, and a commit would end it.
    std::error_code ignored;
    const bool isSeries =
        fs::exists(host_tools::toStdPath(snapshot.root) / ".git/sequencer", ignored);
    if ((!merges && snapshot.repositoryState != "Normal") || isSeries)
        return say("Another operation is under way (%1). Finish it with git first.")
            .arg(fromUtf8(snapshot.repositoryState));
    if (!merges && snapshot.changedFiles().empty())
        return say("There is nothing to commit.");
    return {};
}

} // namespace

void runOn(const Context &context, Operation operation, const std::vector<upath> &files,
           std::function<void(CMAdapter &, const std::vector<upath> &)> act)
{
    const QString refusal =
        say("This would also act on other files. Rename the file, or use git: %1");
    operation.run = [files, refusal, act = std::move(act)](Work &work)
    {
        requireOnly(work.adapter(), files, refusal);
        act(work.adapter(), files);
    };
    if (!files.empty())
        context.runner.run(std::move(operation));
}

FileCommands::FileCommands(Context context) : context_(std::move(context))
{
}

void FileCommands::add()
{
    Operation operation;
    operation.title = say("Add");
    runOn(context_, std::move(operation), context_.selection(),
          [](CMAdapter &adapter, const std::vector<upath> &files) { adapter.addFiles(files); });
}

void FileCommands::remove()
{
    Operation operation;
    operation.title = say("Remove");
    runOn(context_, std::move(operation), context_.selection(),
          [](CMAdapter &adapter, const std::vector<upath> &files) { adapter.removeFiles(files); });
}

void FileCommands::revert()
{
    const auto changed = context_.snapshot()->changedFiles();
    std::vector<upath> files;
    for (const auto &file : context_.selection())
    {
        if (std::binary_search(changed.begin(), changed.end(), file, host_tools::PathOrder()))
            files.push_back(file);
    }
    if (!files.empty())
    {
        askFor(context_.window,
               say("Discard the changes in %1 files? Copies are kept for \"Undo revert\".")
                       .arg(files.size()) +
                   QStringLiteral("\n\n") + names(files, context_.runner.root()),
               [this, files] { revert(files); });
    }
}

void FileCommands::revert(const std::vector<upath> &files)
{
    const auto kept = std::make_shared<std::shared_ptr<const Rescue>>();
    const auto remember = [this, kept]
    {
        if (*kept != nullptr)
            rescue_ = *kept;
    };
    Operation operation;
    operation.title = say("Revert…");
    operation.kind = Operation::Kind::Checkout;
    operation.done = remember;
    // A revert that fails may have written some of the files.
    operation.failed = [remember](const host_tools::Failure &)
    {
        remember();
        return false;
    };
    runOn(context_, std::move(operation), files,
          [kept, folder = newRescueFolder()](CMAdapter &adapter, const std::vector<upath> &reverted)
          {
              *kept = std::make_shared<Rescue>(folder, adapter, reverted);
              adapter.revertFiles(reverted);
          });
}

void FileCommands::undoRevert()
{
    const auto left = std::make_shared<std::vector<upath>>();
    Operation operation;
    operation.title = say("Undo revert");
    operation.run = [left, rescue = rescue_](Work &work)
    { *left = rescue->putBack(work.adapter()); };
    operation.done = [this, left]
    {
        rescue_.reset();
        if (!left->empty())
            showMessage(context_.window,
                        say("These files have changed since, and were left alone:") + u'\n' +
                            names(*left, context_.runner.root()));
    };
    if (rescue_ != nullptr)
        context_.runner.run(std::move(operation));
}

void FileCommands::commit()
{
    struct Found
    {
        Snapshot snapshot;
        QString author;
    };
    const auto found = std::make_shared<Found>();
    Operation operation;
    operation.title = say("Commit…");
    // The current states, which the list may not show yet.
    operation.run = [found](Work &work)
    {
        found->snapshot = readSnapshot(work);
        found->author = findAuthor(work.root());
    };
    operation.done = [this, found]
    {
        const QString refusal = refusalToCommit(found->snapshot);
        if (refusal.isEmpty())
            askForMessage(found->snapshot, found->author);
        else
            showMessage(context_.window, refusal);
    };
    context_.runner.run(std::move(operation));
}

void FileCommands::askForMessage(const Snapshot &snapshot, const QString &author)
{
    const auto commit = [this](const QStringList &values)
    {
        Operation operation;
        operation.title = say("Commit…");
        operation.run = [message = toUstring(values.front() + u'\n')](Work &work)
        { work.adapter().commit(work.root(), message); };
        context_.runner.run(std::move(operation));
    };
    auto *const form = makeOwned<FormDialog>(context_.window, say("Commit…"), commit);
    form->addRemark(say("Author"), author);
    form->addRemark(say("Changed files"), names(snapshot.changedFiles(), snapshot.root));
    form->addText(say("Message"), proposedMessage(snapshot.root));
    form->open();
}

} // namespace vclink::desktop
