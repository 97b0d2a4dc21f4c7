// SPDX-License-Identifier: MIT
#include "MergeTool.hpp"

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <utility>

#include <QFile>

#include "fl/filesystem/operations.hpp"
#include "hostTools.hpp"
#include "language.hpp"
#include "owned.hpp"
#include "text.hpp"

namespace vclink::desktop
{
namespace
{

namespace fs = std::filesystem;

std::string read(const fs::path &path)
{
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

bool write(const fs::path &path, const std::string &bytes)
{
    std::ofstream file(path, std::ios::binary);
    file << bytes;
    file.close();
    return !file.fail();
}

} // namespace

void MergeTool::Later::operator()(QProcess *process) const
{
    // This can run in a slot that one of its signals calls.
    process->disconnect();
    process->deleteLater();
}

void MergeTool::open(const upath &file, const Sides &sides, Ended ended)
{
    file_ = file;
    before_ = read(host_tools::toStdPath(file));
    folder_.emplace();
    const fs::path folder = QFile::encodeName(folder_->path()).toStdString();
    write(folder / "BASE", sides.ancestor.value_or(""));
    write(folder / "LOCAL", sides.ours.value_or(""));
    write(folder / "REMOTE", sides.theirs.value_or(""));
    write(folder / "MERGED", before_);
    process_.reset(makeOwned<QProcess>(static_cast<QObject *>(nullptr)));
    const auto end = [this, ended = std::move(ended)](const QString &problem)
    {
        process_.reset();
        folder_.reset();
        ended(problem);
    };
    QObject::connect(process_.get(), &QProcess::finished, process_.get(),
                     [this, end](int status, QProcess::ExitStatus how)
                     {
                         const bool succeeded = how == QProcess::NormalExit && status == 0;
                         end(succeeded ? takeOver()
                                       : say("The merge tool left the file as it was."));
                     });
    QObject::connect(process_.get(), &QProcess::errorOccurred, process_.get(),
                     [this, end](QProcess::ProcessError error)
                     {
                         if (error == QProcess::FailedToStart)
                             end(process_->errorString());
                     });
    const QStringList names{QStringLiteral("BASE"), QStringLiteral("LOCAL"),
                            QStringLiteral("REMOTE"), QStringLiteral("MERGED")};
    process_->setWorkingDirectory(folder_->path());
    process_->start(toQString(fl::filesystem::get_install_path()) +
                        QStringLiteral("/bin/lnxhost/vkMerge"),
                    names);
}

QString MergeTool::takeOver() const
{
    const fs::path target = host_tools::toStdPath(file_);
    // Somebody may have worked on the file while the tool was open.
    if (read(target) != before_)
        return say("These files have changed since, and were left alone:") + u'\n' +
               printable(file_.string());
    const std::string merged =
        read(fs::path(QFile::encodeName(folder_->path()).toStdString()) / "MERGED");
    return write(target, merged) ? QString() : QString::fromLocal8Bit(std::strerror(errno));
}

} // namespace vclink::desktop
