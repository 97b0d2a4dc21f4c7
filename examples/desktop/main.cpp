// SPDX-License-Identifier: MIT
// A window for one working copy: vclink-desktop [--language LANGUAGE] [FOLDER]. With --screenshot
// it draws itself into a file and ends; scripts/desktop makes the pictures of the documents that
// way.
#include <cstdlib>
#include <filesystem>
#include <shared_mutex>
#include <string>

#include <QApplication>
#include <QCommandLineParser>
#include <QFile>
#include <QImage>
#include <QTimer>

#include "Window.hpp"
#include "hostTools.hpp"
#include "language.hpp"

namespace
{

using namespace vclink::desktop;

const QCommandLineOption languageOption("language", "en, de or ja", "LANGUAGE");
const QCommandLineOption pictureOption("screenshot", "Draw the window into this file, and end",
                                       "FILE");
const QCommandLineOption noteOption("note", "A text to put into the file", "TEXT");
const QCommandLineOption conflictsOption("conflicts", "Show the files in conflict");

upath folderOf(const QString &argument)
{
    std::error_code error;
    const std::filesystem::path given = QFile::encodeName(argument).toStdString();
    const auto folder = std::filesystem::canonical(given, error);
    return host_tools::toUpath(error ? given : folder);
}

bool isComplete(Window &window, bool showsConflicts)
{
    if (!window.runner().isSettled() || window.snapshot().root.string().empty())
        return false;
    const auto *const dialog = window.conflicts();
    return !showsConflicts || (dialog != nullptr && dialog->hasSides());
}

void draw(Window &window, const QCommandLineParser &line)
{
    QWidget *shown = &window;
    if (line.isSet(conflictsOption))
        shown = window.conflicts();
    QImage picture = shown->grab().toImage();
    picture.setText(QStringLiteral("Sources"), line.value(noteOption));
    const bool isSaved = picture.save(line.value(pictureOption));
    QCoreApplication::exit(isSaved ? EXIT_SUCCESS : EXIT_FAILURE);
}

} // namespace

int main(int count, char **arguments)
{
    // Ends last: what holds a guard is gone by then.
    std::shared_mutex guards;
    const QApplication application(count, arguments);
    QCoreApplication::setApplicationName(QStringLiteral("vclink-desktop"));
    QCommandLineParser line;
    line.addHelpOption();
    line.addOptions({languageOption, pictureOption, noteOption, conflictsOption});
    line.addPositionalArgument(QStringLiteral("FOLDER"), QStringLiteral("The working copy"),
                               QStringLiteral("[FOLDER]"));
    line.process(application);
    if (line.isSet(languageOption))
        setLanguage(line.value(languageOption));

    Window window(guards);
    window.show();
    if (!line.positionalArguments().isEmpty())
        window.open(folderOf(line.positionalArguments().front()));
    QTimer poll;
    bool isAsked = false;
    QObject::connect(&poll, &QTimer::timeout, &window,
                     [&]
                     {
                         if (isComplete(window, isAsked) && line.isSet(conflictsOption) && !isAsked)
                         {
                             isAsked = true;
                             window.showConflicts();
                         }
                         else if (isComplete(window, isAsked))
                             draw(window, line);
                     });
    if (line.isSet(pictureOption))
        poll.start(100);
    return QApplication::exec();
}
