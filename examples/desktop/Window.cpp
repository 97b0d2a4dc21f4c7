// SPDX-License-Identifier: MIT
#include "Window.hpp"

#include <algorithm>
#include <cstdlib>
#include <utility>

#include <QCloseEvent>
#include <QFileDialog>
#include <QMenuBar>
#include <QSplitter>
#include <QStatusBar>
#include <QToolBar>
#include <QVBoxLayout>

#include "language.hpp"
#include "messages.hpp"
#include "owned.hpp"
#include "text.hpp"

namespace vclink::desktop
{

Window::Window(std::shared_mutex &guards)
    : files_(makeOwned<StatesView>(this, [this] { update(); })),
      progress_(makeOwned<ProgressRow>(this, [this] { runner_.cancel(); })),
      log_(makeOwned<LogPane>(this)), severities_(makeOwned<QComboBox>(this)),
      branch_(makeOwned<QLabel>(this)), runner_(guards, makeListener()),
      fileCommands_(makeContext()), branchCommands_(makeContext(), [this] { showConflicts(); }),
      remoteCommands_(makeContext(), [this](const upath &folder) { open(folder); }),
      watch_([this] { runner_.refresh(); })
{
    resize(900, 640);
    makeLayout();
    makeCommands();
    makeLanguages();
    retranslate();
    update();
}

Window::~Window() = default;

Context Window::makeContext()
{
    return {this, runner_, [this] { return snapshot_; }, [this] { return files_->selection(); },
            [this](const QString &text) { statusBar()->showMessage(text); }};
}

RunnerListener Window::makeListener()
{
    RunnerListener listener;
    listener.changed = [this] { update(); };
    listener.progress = [this](double fraction, const QString &step)
    { progress_->setProgress(fraction, step); };
    listener.failed = [this](const Operation &operation, const host_tools::Failure &failure)
    { failed(operation, failure); };
    listener.told = [this](const QString &text) { statusBar()->showMessage(text); };
    listener.refreshed = [this](std::shared_ptr<const Snapshot> snapshot)
    { refreshed(std::move(snapshot)); };
    return listener;
}

void Window::makeLayout()
{
    log_->setObjectName(QStringLiteral("log"));
    severities_->setObjectName(QStringLiteral("severities"));
    severities_->addItems({QString(), QString(), QString()});
    connect(severities_, &QComboBox::currentIndexChanged, this,
            [](int index)
            {
                constexpr unsigned masks[] = {0, LogPane::decisions, LogPane::everything};
                LogPane::setSeverities(masks[index]);
            });
    auto *const lower = makeOwned<QWidget>(this);
    auto *const lowerRows = makeOwned<QVBoxLayout>(lower);
    lowerRows->setContentsMargins({});
    lowerRows->addWidget(severities_);
    lowerRows->addWidget(log_);
    auto *const halves = makeOwned<QSplitter>(this, Qt::Vertical);
    halves->addWidget(files_);
    halves->addWidget(lower);
    halves->setStretchFactor(0, 3);
    halves->setStretchFactor(1, 1);
    auto *const centre = makeOwned<QWidget>(this);
    auto *const rows = makeOwned<QVBoxLayout>(centre);
    rows->addWidget(halves);
    rows->addWidget(progress_);
    setCentralWidget(centre);
    branch_->setTextFormat(Qt::PlainText);
    branch_->setObjectName(QStringLiteral("branch"));
    statusBar()->addPermanentWidget(branch_);
}

QMenu *Window::addTo(const char *title)
{
    auto *const menu = menuBar()->addMenu(QString());
    menus_.emplace_back(menu, title);
    return menu;
}

void Window::addCommand(QMenu *menu, const char *name, const char *text, Needs needs,
                        std::function<void()> act)
{
    auto *const action = menu->addAction(QString());
    action->setObjectName(QString::fromLatin1(name));
    connect(action, &QAction::triggered, this, std::move(act));
    commands_.push_back({action, text, needs});
}

void Window::makeCommands()
{
    auto *const file = addTo("File");
    addCommand(file, "open", "Open…", Needs::Nothing, [this] { chooseFolder(); });
    addCommand(file, "clone", "Clone…", Needs::Nothing, [this] { remoteCommands_.clone(); });
    addCommand(file, "add", "Add", Needs::Selection, [this] { fileCommands_.add(); });
    addCommand(file, "remove", "Remove", Needs::Selection, [this] { fileCommands_.remove(); });
    addCommand(file, "revert", "Revert…", Needs::Selection, [this] { fileCommands_.revert(); });
    addCommand(file, "undo", "Undo revert", Needs::Reverted,
               [this] { fileCommands_.undoRevert(); });
    addCommand(file, "commit", "Commit…", Needs::WorkingCopy, [this] { fileCommands_.commit(); });
    addCommand(file, "conflict", "Conflicts…", Needs::Conflicts, [this] { showConflicts(); });
    auto *const branch = addTo("Branch");
    addCommand(branch, "switch", "Switch…", Needs::WorkingCopy,
               [this] { branchCommands_.change(); });
    addCommand(branch, "merge", "Merge…", Needs::WorkingCopy, [this] { branchCommands_.merge(); });
    addCommand(branch, "newBranch", "New branch…", Needs::WorkingCopy,
               [this] { branchCommands_.create(); });
    addCommand(branch, "deleteBranch", "Delete branch…", Needs::WorkingCopy,
               [this] { branchCommands_.remove(); });
    auto *const remote = addTo("Remote");
    addCommand(remote, "fetch", "Fetch…", Needs::WorkingCopy, [this] { remoteCommands_.fetch(); });
    addCommand(remote, "push", "Push…", Needs::WorkingCopy, [this] { remoteCommands_.push(); });
    auto *const bar = addToolBar(QString());
    bar->setMovable(false);
    for (const auto &command : commands_)
    {
        const QString name = command.action->objectName();
        if (QStringList{"add", "revert", "commit", "switch", "merge", "fetch", "push"}.contains(
                name))
            bar->addAction(command.action);
    }
}

void Window::makeLanguages()
{
    auto *const menu = addTo("Language");
    const std::pair<const char *, QString> languages[] = {{"en", QStringLiteral("English")},
                                                          {"de", QStringLiteral("Deutsch")},
                                                          {"ja", QStringLiteral("日本語")}};
    for (const auto &[code, name] : languages)
    {
        auto *const action = menu->addAction(name);
        action->setObjectName(QString::fromLatin1(code));
        connect(action, &QAction::triggered, this,
                [language = QString::fromLatin1(code)] { setLanguage(language); });
    }
}

void Window::open(const upath &folder)
{
    const auto isRepository = std::make_shared<bool>(false);
    Operation operation;
    operation.title = say("Open…");
    operation.run = [folder, isRepository](Work &work) { *isRepository = work.serves(folder); };
    operation.done = [this, folder, isRepository]
    {
        if (*isRepository)
            runner_.setRoot(folder);
        else
            showMessage(this, say("Not a working copy: %1").arg(printable(folder.string())));
    };
    runner_.run(std::move(operation));
}

void Window::chooseFolder()
{
    auto *const dialog = makeOwned<QFileDialog>(this);
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    dialog->setFileMode(QFileDialog::Directory);
    connect(dialog, &QFileDialog::fileSelected, this,
            [this](const QString &folder) { open(upath(toUstring(folder))); });
    dialog->open();
}

void Window::showConflicts()
{
    if (conflicts_ == nullptr)
        conflicts_ =
            makeOwned<ConflictDialog>(this, makeContext(), [this] { fileCommands_.commit(); });
    conflicts_->show();
    conflicts_->raise();
}

void Window::refreshed(std::shared_ptr<const Snapshot> snapshot)
{
    snapshot_ = std::move(snapshot);
    files_->display(*snapshot_);
    watch_.watch(*snapshot_);
    update();
}

void Window::failed(const Operation &operation, const host_tools::Failure &failure)
{
    if (failure.kind == host_tools::FailureKind::Cancelled)
    {
        statusBar()->showMessage(say("Cancelled. No file has been written."));
        return;
    }
    // The person has to see it.
    isClosing_ = false;
    showFailure(this, operation.title, failure);
}

bool Window::isMet(Needs needs) const
{
    const bool hasCopy = !snapshot_->root.string().empty();
    switch (needs)
    {
    case Needs::Nothing:
        return true;
    case Needs::WorkingCopy:
        return hasCopy;
    case Needs::Selection:
        return hasCopy && !files_->selection().empty();
    case Needs::Conflicts:
        return snapshot_->repositoryState == "Conflicts";
    case Needs::Reverted:
        return fileCommands_.canUndoRevert();
    }
    return false;
}

void Window::update()
{
    const bool isIdle = runner_.current() == nullptr;
    for (const auto &command : commands_)
        command.action->setEnabled(isIdle && isMet(command.needs));
    progress_->display(runner_.current(), runner_.canCancel());
    const QString branch =
        snapshot_->branch.empty() ? say("no branch") : fromUtf8(snapshot_->branch);
    branch_->setText(snapshot_->repositoryState == "Normal"
                         ? branch
                         : branch + QStringLiteral(" – ") + fromUtf8(snapshot_->repositoryState));
    setWindowTitle(printable(snapshot_->root.string()));
    if (conflicts_ != nullptr)
        conflicts_->follow();
    if (isIdle && isClosing_)
        close();
}

void Window::retranslate()
{
    for (const auto &command : commands_)
        command.action->setText(say(command.text));
    for (const auto &[menu, title] : menus_)
        menu->setTitle(say(title));
    severities_->setItemText(0, say("No log"));
    severities_->setItemText(1, say("Decisions and failures"));
    severities_->setItemText(2, say("Everything"));
    files_->retranslate();
    progress_->retranslate();
}

void Window::changeEvent(QEvent *event)
{
    QMainWindow::changeEvent(event);
    if (event->type() == QEvent::LanguageChange)
    {
        retranslate();
        update();
    }
    // Changes that could not be watched are seen when the person comes back.
    if (event->type() == QEvent::ActivationChange && isActiveWindow())
        runner_.refresh();
}

void Window::closeEvent(QCloseEvent *event)
{
    const Operation *const operation = runner_.current();
    const bool isToolOpen = conflicts_ != nullptr && conflicts_->isToolOpen();
    if (operation == nullptr && !isToolOpen)
    {
        event->accept();
        return;
    }
    event->ignore();
    if (operation == nullptr)
        return;
    const bool talks =
        operation->kind == Operation::Kind::Download || operation->kind == Operation::Kind::Upload;
    // A silent server can't be cancelled. A transfer that is cut off has written no file of an
    // existing working copy.
    if (isClosing_ && talks)
        askFor(this, say("The server does not answer. End the program now?"),
               [] { std::_Exit(EXIT_FAILURE); });
    isClosing_ = true;
    statusBar()->showMessage(say("Closing as soon as this has ended: %1").arg(operation->title));
    runner_.cancel();
}

} // namespace vclink::desktop
