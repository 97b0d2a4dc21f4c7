// SPDX-License-Identifier: MIT
#include "language.hpp"

#include <QCoreApplication>
#include <QHash>
#include <QTranslator>

#include "fl/i18n/VkLocale.hpp"
#include "owned.hpp"
#include "vclink_host/locale.hpp"

namespace vclink::desktop
{
namespace
{

struct Words
{
    const char *english;
    const char *german;
    const char *japanese;
};

// A larger host has these in catalogues of its own.
constexpr Words words[] = {
    {"File", "Datei", "ファイル"},
    {"Branch", "Branch", "ブランチ"},
    {"Remote", "Entfernt", "リモート"},
    {"Language", "Sprache", "言語"},
    {"Open…", "Öffnen…", "開く…"},
    {"Quit", "Beenden", "終了"},
    {"Add", "Hinzufügen", "追加"},
    {"Remove", "Entfernen", "削除"},
    {"Revert…", "Verwerfen…", "元に戻す…"},
    {"Undo revert", "Verwerfen zurücknehmen", "元に戻した変更を復元"},
    {"Commit…", "Commit…", "コミット…"},
    {"Conflicts…", "Konflikte…", "競合…"},
    {"New branch…", "Neuer Branch…", "新しいブランチ…"},
    {"Delete branch…", "Branch löschen…", "ブランチを削除…"},
    {"Switch…", "Wechseln…", "切り替え…"},
    {"Merge…", "Mergen…", "マージ…"},
    {"Fetch…", "Abrufen…", "フェッチ…"},
    {"Push…", "Pushen…", "プッシュ…"},
    {"Clone…", "Klonen…", "クローン…"},
    {"Cancel", "Abbrechen", "キャンセル"},
    {"State", "Zustand", "状態"},
    {"Filter names", "Namen filtern", "名前で絞り込み"},
    {"All changes", "Alle Änderungen", "すべての変更"},
    {"All files", "Alle Dateien", "すべてのファイル"},
    {"Log", "Protokoll", "ログ"},
    {"No log", "Kein Protokoll", "ログなし"},
    {"Decisions and failures", "Entscheidungen und Fehler", "判断と失敗"},
    {"Everything", "Alles", "すべて"},
    {"unversioned", "nicht versioniert", "管理外"},
    {"clean", "unverändert", "変更なし"},
    {"unknown", "sonstiges", "不明"},
    {"conflict", "Konflikt", "競合"},
    {"modified", "geändert", "変更"},
    {"added", "neu", "追加済み"},
    {"deleted", "gelöscht", "削除済み"},
    {"missing", "fehlt", "欠落"},
    {"no branch", "kein Branch", "ブランチなし"},
    {"Too late to cancel: it was done already.",
     "Zum Abbrechen war es zu spät: Es war schon erledigt.",
     "キャンセルできませんでした。すでに完了しています。"},
    {"Cancelled. No file has been written.", "Abgebrochen. Es wurde keine Datei geschrieben.",
     "キャンセルしました。ファイルは書き込まれていません。"},
    {"Closing as soon as this has ended: %1", "Schließt, sobald dies beendet ist: %1",
     "次の処理が終わると閉じます: %1"},
    {"The server does not answer. End the program now?",
     "Der Server antwortet nicht. Programm jetzt beenden?",
     "サーバーが応答しません。今すぐ終了しますか?"},
    {"Discard the changes in %1 files? Copies are kept for \"Undo revert\".",
     "Die Änderungen in %1 Dateien verwerfen? Kopien bleiben für „Verwerfen zurücknehmen“.",
     "%1 個のファイルの変更を破棄しますか? 復元用のコピーは保存されます。"},
    {"Delete branch \"%1\"? Commits that are on no other branch are lost.",
     "Branch „%1“ löschen? Commits, die auf keinem anderen Branch sind, gehen verloren.",
     "ブランチ \"%1\" を削除しますか? 他のブランチにないコミットは失われます。"},
    {"Message", "Nachricht", "メッセージ"},
    {"Author", "Autor", "作成者"},
    {"Changed files", "Geänderte Dateien", "変更されたファイル"},
    {"Name", "Name", "名前"},
    {"Start at", "Beginnt bei", "開始点"},
    {"Address", "Adresse", "アドレス"},
    {"Folder", "Ordner", "フォルダー"},
    {"Resolve the files in conflict first.", "Zuerst die Konflikte auflösen.",
     "先に競合を解決してください。"},
    {"There is nothing to commit.", "Es gibt nichts zu committen.",
     "コミットする変更がありません。"},
    {"Another operation is under way (%1). Finish it with git first.",
     "Ein anderer Vorgang läuft noch (%1). Zuerst mit git beenden.",
     "別の操作の途中です (%1)。先に git で完了してください。"},
    {"This would also act on other files. Rename the file, or use git: %1",
     "Das beträfe auch andere Dateien. Datei umbenennen oder git benutzen: %1",
     "ほかのファイルにも作用します。名前を変えるか、git を使ってください: %1"},
    {"Not a working copy: %1", "Keine Arbeitskopie: %1", "作業コピーではありません: %1"},
    {"The server rejected the branch \"%1\". The log says why.",
     "Der Server hat den Branch „%1“ abgelehnt. Das Protokoll sagt, warum.",
     "サーバーがブランチ \"%1\" を拒否しました。理由はログにあります。"},
    {"Deleted branch \"%1\", which was at %2.", "Branch „%1“ gelöscht; er stand auf %2.",
     "ブランチ \"%1\" (%2) を削除しました。"},
    {"These files have changed since, and were left alone:",
     "Diese Dateien haben sich inzwischen geändert und blieben unberührt:",
     "次のファイルは変更されているため、そのまま残しました:"},
    {"Another program works here. Try again in a moment.",
     "Ein anderes Programm arbeitet hier gerade. Gleich noch einmal versuchen.",
     "ほかのプログラムが処理中です。しばらくしてから再試行してください。"},
    {"The states of the files cannot be read.", "Der Zustand der Dateien ist nicht lesbar.",
     "ファイルの状態を読み取れません。"},
    {"Files in conflict", "Dateien mit Konflikt", "競合しているファイル"},
    {"Ancestor", "Vorfahr", "共通の祖先"},
    {"Ours", "Unsere", "自分側"},
    {"Theirs", "Ihre", "相手側"},
    {"Working copy", "Arbeitskopie", "作業コピー"},
    {"Merge tool", "Merge-Werkzeug", "マージツール"},
    {"Mark as resolved", "Als gelöst markieren", "解決済みにする"},
    {"Conclude the merge…", "Merge abschließen…", "マージを完了…"},
    {"To abort the merge, run \"git merge --abort\" in the working copy.",
     "Zum Abbrechen des Merges \"git merge --abort\" in der Arbeitskopie ausführen.",
     "マージを中止するには、作業コピーで \"git merge --abort\" を実行します。"},
    {"The merge tool left the file as it was.", "Das Merge-Werkzeug ließ die Datei, wie sie war.",
     "マージツールはファイルを変更しませんでした。"},
    {"not there", "nicht vorhanden", "なし"},
    {"binary, %1 bytes", "binär, %1 Bytes", "バイナリ、%1 バイト"},
};

class Translator : public QTranslator
{
  public:
    using QTranslator::QTranslator;

    void setLanguage(const QString &language)
    {
        texts_.clear();
        const bool isGerman = language == u"de";
        if (!isGerman && language != u"ja")
            return;
        for (const auto &row : words)
            texts_.insert(row.english, QString::fromUtf8(isGerman ? row.german : row.japanese));
    }
    QString translate(const char * /*context*/, const char *english, const char * /*remark*/,
                      int /*number*/) const override
    {
        return texts_.value(english);
    }
    bool isEmpty() const override
    {
        return texts_.isEmpty();
    }

  private:
    QHash<QByteArray, QString> texts_;
};

} // namespace

QString say(const char *english)
{
    return QCoreApplication::translate("desktop", english);
}

void setLanguage(const QString &language)
{
    vclink_host::setGlobalLocale(fl::i18n::VkLocale(language.toStdString()));
    auto *const application = QCoreApplication::instance();
    auto *translator =
        static_cast<Translator *>(application->findChild<QTranslator *>(QStringLiteral("words")));
    if (translator == nullptr)
    {
        translator = makeOwned<Translator>(application);
        translator->setObjectName(QStringLiteral("words"));
    }
    // Both tell the widgets; a translator without words is not installed.
    QCoreApplication::removeTranslator(translator);
    translator->setLanguage(language);
    QCoreApplication::installTranslator(translator);
}

} // namespace vclink::desktop
