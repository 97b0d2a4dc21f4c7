// SPDX-License-Identifier: MIT
#include "BranchCommands.hpp"

#include <utility>

#include "FormDialog.hpp"
#include "language.hpp"
#include "messages.hpp"
#include "owned.hpp"
#include "text.hpp"

namespace vclink::desktop
{
namespace
{

QStringList toList(const std::vector<std::string> &names)
{
    QStringList list;
    for (const auto &name : names)
        list += fromUtf8(name);
    return list;
}

std::vector<std::string> without(std::vector<std::string> names, const std::string &name)
{
    names.erase(std::remove(names.begin(), names.end(), name), names.end());
    return names;
}

} // namespace

BranchCommands::BranchCommands(Context context, std::function<void()> conflicts)
    : context_(std::move(context)), conflicts_(std::move(conflicts))
{
}

void BranchCommands::askForBranch(const char *title, const std::vector<std::string> &names,
                                  std::function<void(const std::string &)> chosen) const
{
    const auto accepted = [chosen = std::move(chosen)](const QStringList &values)
    { chosen(toUtf8(values.front())); };
    auto *const form = makeOwned<FormDialog>(context_.window, say(title), accepted);
    const QStringList list = toList(names);
    form->addChoice(say("Branch"), list, list.value(0));
    form->open();
}

void BranchCommands::create()
{
    const auto accepted = [this](const QStringList &values)
    {
        Operation operation;
        operation.title = say("New branch…");
        operation.run = [name = toUtf8(values[0]), start = toUtf8(values[1])](Work &work)
        { work.branches()->createBranch(git::BranchParameters(name, start)); };
        context_.runner.run(std::move(operation));
    };
    const auto snapshot = context_.snapshot();
    auto *const form = makeOwned<FormDialog>(context_.window, say("New branch…"), accepted);
    form->addLine(say("Name"), {});
    form->addChoice(say("Start at"),
                    QStringList{QStringLiteral("HEAD")} + toList(snapshot->localBranches) +
                        toList(snapshot->remoteBranches),
                    QStringLiteral("HEAD"));
    form->open();
}

void BranchCommands::remove()
{
    const auto snapshot = context_.snapshot();
    askForBranch("Delete branch…", without(snapshot->localBranches, snapshot->branch),
                 [this](const std::string &name)
                 {
                     askFor(
                         context_.window,
                         say("Delete branch \"%1\"? Commits that are on no other branch are lost.")
                             .arg(fromUtf8(name)),
                         [this, name] { remove(name); });
                 });
}

void BranchCommands::remove(const std::string &name)
{
    const auto id = std::make_shared<std::string>();
    Operation operation;
    operation.title = say("Delete branch…");
    operation.run = [name, id](Work &work)
    {
        const auto manager = work.branches();
        *id = manager->getRevision("refs/heads/" + name);
        manager->deleteBranch(name);
    };
    // The way back: a branch of this name at this commit.
    operation.done = [this, name, id]
    {
        context_.tell(say("Deleted branch \"%1\", which was at %2.")
                          .arg(fromUtf8(name), QString::fromStdString(*id)));
    };
    context_.runner.run(std::move(operation));
}

void BranchCommands::change()
{
    const auto snapshot = context_.snapshot();
    askForBranch("Switch…", without(snapshot->localBranches, snapshot->branch),
                 [this](const std::string &name)
                 {
                     Operation operation;
                     operation.title = say("Switch…");
                     operation.kind = Operation::Kind::Checkout;
                     operation.run = [name](Work &work) { work.branches()->switchBranch(name); };
                     context_.runner.run(std::move(operation));
                 });
}

void BranchCommands::merge()
{
    const auto snapshot = context_.snapshot();
    auto names = without(snapshot->localBranches, snapshot->branch);
    names.insert(names.end(), snapshot->remoteBranches.begin(), snapshot->remoteBranches.end());
    askForBranch("Merge…", names, [this](const std::string &name) { merge(name); });
}

void BranchCommands::merge(const std::string &name)
{
    const auto leftConflicts = std::make_shared<bool>(false);
    Operation operation;
    operation.title = say("Merge…");
    operation.kind = Operation::Kind::Checkout;
    operation.run = [name, leftConflicts](Work &work)
    {
        const auto manager = work.branches();
        // A merge that is refused because another one is under way finds the same state after it.
        const bool wasNormal = manager->getRepositoryState() == "Normal";
        try
        {
            work.merge(name);
        }
        catch (...)
        {
            *leftConflicts = wasNormal && manager->getRepositoryState() == "Conflicts";
            throw;
        }
    };
    operation.failed = [this, leftConflicts](const host_tools::Failure &)
    {
        if (*leftConflicts)
            conflicts_();
        return *leftConflicts;
    };
    context_.runner.run(std::move(operation));
}

} // namespace vclink::desktop
