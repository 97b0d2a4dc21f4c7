// SPDX-License-Identifier: MIT
#include "ConflictDialog.hpp"

#include <fstream>
#include <iterator>
#include <utility>

#include <QGridLayout>
#include <QPointer>
#include <QSignalBlocker>

#include "FileCommands.hpp"
#include "language.hpp"
#include "messages.hpp"
#include "owned.hpp"
#include "text.hpp"

namespace vclink::desktop
{
namespace
{

QString textOf(const std::optional<std::string> &bytes)
{
    if (!bytes)
        return u'(' + say("not there") + u')';
    if (bytes->find('\0') != std::string::npos)
        return u'(' + say("binary, %1 bytes").arg(bytes->size()) + u')';
    return fromUtf8(*bytes);
}

std::optional<std::string> readFile(const upath &path)
{
    std::ifstream file(host_tools::toStdPath(path), std::ios::binary);
    if (!file)
        return std::nullopt;
    return std::string(std::istreambuf_iterator<char>(file), {});
}

} // namespace

ConflictDialog::ConflictDialog(Context context, std::function<void()> conclude, QWidget *parent)
    : QDialog(parent), context_(std::move(context)), list_(makeOwned<QListWidget>(this)),
      toolButton_(makeOwned<QPushButton>(this)), resolved_(makeOwned<QPushButton>(this)),
      conclude_(makeOwned<QPushButton>(this))
{
    setObjectName(QStringLiteral("conflicts"));
    setWindowTitle(say("Conflicts…"));
    setAttribute(Qt::WA_DeleteOnClose);
    resize(900, 600);
    list_->setObjectName(QStringLiteral("conflictFiles"));
    toolButton_->setObjectName(QStringLiteral("mergeTool"));
    toolButton_->setText(say("Merge tool"));
    resolved_->setObjectName(QStringLiteral("resolved"));
    resolved_->setText(say("Mark as resolved"));
    conclude_->setObjectName(QStringLiteral("conclude"));
    conclude_->setText(say("Conclude the merge…"));

    auto *const grid = makeOwned<QGridLayout>(this);
    makePanes(*grid);
    connect(list_, &QListWidget::currentRowChanged, this, [this] { readSelected(); });
    connect(toolButton_, &QPushButton::clicked, this, [this] { openTool(); });
    connect(resolved_, &QPushButton::clicked, this, [this] { markResolved(); });
    connect(conclude_, &QPushButton::clicked, this,
            [this, conclude = std::move(conclude)]
            {
                close();
                conclude();
            });
    follow();
}

void ConflictDialog::makePanes(QGridLayout &grid)
{
    constexpr std::array<const char *, PaneCount> titles{"Ancestor", "Ours", "Theirs",
                                                         "Working copy"};
    constexpr std::array<const char *, PaneCount> names{"ancestor", "ours", "theirs", "working"};
    grid.addWidget(makeOwned<QLabel>(this, say("Files in conflict")), 0, 0);
    grid.addWidget(list_, 1, 0, 1, 3);
    for (int pane = 0; pane < PaneCount; ++pane)
    {
        auto *&text = panes_[static_cast<std::size_t>(pane)];
        text = makeOwned<QPlainTextEdit>(this);
        text->setReadOnly(true);
        text->setLineWrapMode(QPlainTextEdit::NoWrap);
        text->setObjectName(QString::fromLatin1(names[static_cast<std::size_t>(pane)]));
        const bool isWorking = pane == WorkingCopy;
        const int column = isWorking ? 0 : pane;
        const int row = isWorking ? 4 : 2;
        grid.addWidget(makeOwned<QLabel>(this, say(titles[static_cast<std::size_t>(pane)])), row,
                       column);
        grid.addWidget(text, row + 1, column, 1, isWorking ? 3 : 1);
    }
    auto *const hint = makeOwned<QLabel>(
        this, say("To abort the merge, run \"git merge --abort\" in the working copy."));
    grid.addWidget(hint, 6, 0, 1, 3);
    grid.addWidget(toolButton_, 7, 0);
    grid.addWidget(resolved_, 7, 1);
    grid.addWidget(conclude_, 7, 2);
    grid.setRowStretch(1, 1);
    grid.setRowStretch(3, 2);
    grid.setRowStretch(5, 2);
}

void ConflictDialog::follow()
{
    const auto snapshot = context_.snapshot();
    const upath before = selected();
    auto files = snapshot->filesWith(FileState::InConflict);
    if (files != files_)
    {
        const QSignalBlocker blocker(list_);
        files_ = std::move(files);
        list_->clear();
        for (const auto &file : files_)
        {
            list_->addItem(printable(host_tools::relativeName(file, snapshot->root)));
            if (file == before)
                list_->setCurrentRow(list_->count() - 1);
        }
        if (list_->currentRow() < 0 && !files_.empty())
            list_->setCurrentRow(0);
    }
    const bool isIdle = context_.runner.current() == nullptr;
    conclude_->setEnabled(isIdle && files_.empty() && snapshot->repositoryState == "Conflicts");
    resolved_->setEnabled(isIdle && !files_.empty());
    toolButton_->setEnabled(isIdle && hasSides() && !tool_.isOpen());
    if (isIdle && selected() != shown_)
        readSelected();
}

upath ConflictDialog::selected() const
{
    const auto row = static_cast<std::size_t>(list_->currentRow());
    return row < files_.size() ? files_[row] : upath();
}

void ConflictDialog::readSelected()
{
    const upath file = selected();
    if (file.string().empty())
    {
        shown_ = file;
        for (auto *pane : panes_)
            pane->clear();
        return;
    }
    const auto sides = std::make_shared<Sides>();
    Operation operation;
    operation.title = say("Conflicts…");
    operation.run = [sides, file](Work &work) { *sides = readSides(work.root(), file); };
    operation.done = [dialog = QPointer<ConflictDialog>(this), file, sides]
    {
        if (dialog != nullptr)
            dialog->showSides(file, *sides);
    };
    context_.runner.run(std::move(operation));
}

void ConflictDialog::showSides(const upath &file, const Sides &sides)
{
    shown_ = file;
    sides_ = sides;
    panes_[Ancestor]->setPlainText(textOf(sides.ancestor));
    panes_[Ours]->setPlainText(textOf(sides.ours));
    panes_[Theirs]->setPlainText(textOf(sides.theirs));
    panes_[WorkingCopy]->setPlainText(textOf(readFile(file)));
    follow();
}

void ConflictDialog::reject()
{
    if (!isToolOpen())
        QDialog::reject();
}

void ConflictDialog::openTool()
{
    std::error_code ignored;
    if (std::filesystem::is_symlink(host_tools::toStdPath(shown_), ignored))
        return;
    tool_.open(shown_, sides_,
               [this](const QString &problem)
               {
                   if (!problem.isEmpty())
                       showMessage(this, problem);
                   panes_[WorkingCopy]->setPlainText(textOf(readFile(shown_)));
                   follow();
               });
    follow();
}

void ConflictDialog::markResolved()
{
    const upath file = selected();
    Operation operation;
    operation.title = say("Mark as resolved");
    if (!file.string().empty())
        runOn(context_, std::move(operation), {file},
              [](CMAdapter &adapter, const std::vector<upath> &files)
              { adapter.markResolved(files.front()); });
}

} // namespace vclink::desktop
