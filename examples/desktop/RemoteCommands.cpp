// SPDX-License-Identifier: MIT
#include "RemoteCommands.hpp"

#include <utility>

#include "FormDialog.hpp"
#include "language.hpp"
#include "messages.hpp"
#include "owned.hpp"
#include "text.hpp"
#include "vclink/git/GitRemote.hpp"

namespace vclink::desktop
{
namespace
{

std::string toHexadecimal(const git::GitRemoteHead::Id &id)
{
    const QByteArray bytes(reinterpret_cast<const char *>(id.data()),
                           static_cast<qsizetype>(id.size()));
    return bytes.toHex().toStdString();
}

/// The library counts a branch that the server rejected as pushed.
bool stands(const git::GitRemote &remote, const std::string &reference, const std::string &id)
{
    for (const auto &head : remote.getRemoteHeads())
    {
        if (head.name == reference)
            return toHexadecimal(head.oid) == id;
    }
    return false;
}

} // namespace

RemoteCommands::RemoteCommands(Context context, std::function<void(const upath &)> cloned)
    : context_(std::move(context)), cloned_(std::move(cloned))
{
}

void RemoteCommands::askForRemote(const char *title,
                                  std::function<void(const std::string &)> chosen) const
{
    QStringList names;
    for (const auto &name : context_.snapshot()->remotes())
        names += fromUtf8(name);
    const auto accepted = [chosen = std::move(chosen)](const QStringList &values)
    { chosen(toUtf8(values.front())); };
    auto *const form = makeOwned<FormDialog>(context_.window, say(title), accepted);
    form->addChoice(say("Remote"), names, QStringLiteral("origin"), true);
    form->open();
}

void RemoteCommands::fetch()
{
    askForRemote("Fetch…",
                 [this](const std::string &name)
                 {
                     Operation operation;
                     operation.title = say("Fetch…");
                     operation.kind = Operation::Kind::Download;
                     operation.run = [name](Work &work)
                     { git::GitRemote::create(name, work.adapter())->fetch({}); };
                     context_.runner.run(std::move(operation));
                 });
}

void RemoteCommands::push()
{
    const std::string branch = context_.snapshot()->branch;
    if (branch.empty())
        showMessage(context_.window, say("no branch"));
    else
        askForRemote("Push…", [this, branch](const std::string &name) { push(name, branch); });
}

void RemoteCommands::push(const std::string &name, const std::string &branch)
{
    const auto isRejected = std::make_shared<bool>(false);
    Operation operation;
    operation.title = say("Push…");
    operation.kind = Operation::Kind::Upload;
    operation.run = [name, branch, isRejected](Work &work)
    {
        const std::string reference = "refs/heads/" + branch;
        const std::string id = work.branches()->getRevision(reference);
        const auto remote = git::GitRemote::create(name, work.adapter());
        remote->push({fl::i18n::utf8_to_ustring(reference + ':' + reference)});
        *isRejected = !stands(*remote, reference, id);
    };
    operation.done = [this, branch, isRejected]
    {
        if (*isRejected)
            showMessage(context_.window,
                        say("The server rejected the branch \"%1\". The log says why.")
                            .arg(fromUtf8(branch)));
    };
    context_.runner.run(std::move(operation));
}

void RemoteCommands::clone()
{
    const auto accepted = [this](const QStringList &values)
    {
        const upath folder(toUstring(values[1]));
        Operation operation;
        operation.title = say("Clone…");
        operation.kind = Operation::Kind::Download;
        operation.run = [address = toUstring(values[0]), folder](Work &work)
        { work.clone(address, folder); };
        operation.done = [this, folder] { cloned_(folder); };
        context_.runner.run(std::move(operation));
    };
    auto *const form = makeOwned<FormDialog>(context_.window, say("Clone…"), accepted);
    form->addLine(say("Address"), {});
    form->addLine(say("Folder"), {});
    form->open();
}

} // namespace vclink::desktop
