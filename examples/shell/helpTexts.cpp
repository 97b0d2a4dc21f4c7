// SPDX-License-Identifier: MIT
#include "translations.hpp"

#include <iterator>

namespace vclink::shell
{
namespace
{

constexpr Translation helpRows[] = {
    {"The option '%1%' must follow the command.", "Die Option '%1%' muss nach dem Befehl stehen.",
     "オプション '%1%' はコマンドの後に置いてください。"},
    {"The option '%1%' must be before the command.", "Die Option '%1%' muss vor dem Befehl stehen.",
     "オプション '%1%' はコマンドの前に置いてください。"},
    {"\"%1%\" is none of the languages en, de and ja",
     "\"%1%\" ist keine der Sprachen en, de und ja", "\"%1%\" は en、de、ja のどれでもありません"},
    {"Usage", "Aufruf", "使い方"},
    {"OPTION...", "OPTION...", "オプション..."},
    {"COMMAND ...", "BEFEHL ...", "コマンド ..."},
    {"Arguments", "Argumente", "引数"},
    {"Options", "Optionen", "オプション"},
    {"Shows and changes a Git working copy, as a desktop host does it through the vclink_git "
     "library.",
     "Zeigt und ändert eine Git-Arbeitskopie so, wie es eine Desktop-Anwendung über die "
     "Bibliothek\nvclink_git tut.",
     "デスクトップアプリケーションと同じように、vclink_git ライブラリを通して Git "
     "の作業コピーを表示、変更します。"},
    {"Show this help", "Diese Hilfe zeigen", "このヘルプを表示する"},
    {"Show the versions, as version does", "Die Versionen zeigen, wie version",
     "バージョンを表示する (version と同じ)"},
    {"\"vclink-shell help COMMAND\" describes a command.\n\nExit status: 0 done, 1 failed, 2 wrong "
     "usage, 128 plus a signal's number if that stopped it.",
     "\"vclink-shell help BEFEHL\" sagt mehr über einen Befehl.\n\nStatus: 0 erledigt, 1 "
     "misslungen, 2 falscher Aufruf, 128 plus die Nummer eines Signals, wenn es abbrach.",
     "\"vclink-shell help コマンド\" でコマンドの詳細を表示します。\n\n終了ステータス: 0 成功、1 "
     "失敗、2 使い方の誤り、128 + シグナル番号 中断。"},
    {"Work as if started in FOLDER", "Arbeiten, als wäre in FOLDER gestartet worden",
     "FOLDER で起動したものとして動作する"},
    {"\"%1%\" is neither a number nor a list of these names: %2%",
     "\"%1%\" ist weder eine Zahl noch eine Liste dieser Namen: %2%",
     "\"%1%\" は数値でも次の名前の並びでもありません: %2%"},
    {"Show the library's log on standard error: a number, or\nnames separated by commas: %1%",
     "Das Protokoll der Bibliothek auf der Fehlerausgabe zeigen: eine Zahl\noder Namen, durch "
     "Kommas getrennt: %1%",
     "ライブラリのログを標準エラー出力に表示する: 数値、または\nコンマ区切りの名前: %1%"},
    {"Use the language of this locale: en, de or ja",
     "Die Sprache dieser Locale benutzen: en, de oder ja", "このロケールの言語を使う: en、de、ja"},
    {"\"%1%\" is not auto, always or never", "\"%1%\" ist weder auto noch always noch never",
     "\"%1%\" は auto、always、never のいずれでもありません"},
    {"Draw the progress of long operations on standard error: always,\nnever, or auto (if that is "
     "a terminal)",
     "Den Fortschritt langer Vorgänge auf der Fehlerausgabe zeichnen: always,\nnever oder auto "
     "(wenn sie ein Terminal ist)",
     "長い処理の進行状況を標準エラー出力に描く: always、never、\nauto (端末の場合だけ)"},
    {"Also work in a bare repository inside a working copy. Its configuration\nmay have come with "
     "a clone, and can run commands",
     "Auch in einem bloßen Repository innerhalb einer Arbeitskopie arbeiten.\nSeine Konfiguration "
     "kann mit einem Klon gekommen sein und Befehle nennen",
     "作業コピー内のベアリポジトリでも動作する "
     "(その設定は\nクローンと一緒に来て、コマンドを実行することがあります)"},
    {"Commands", "Befehle", "コマンド"},
    {"Show the help of a command", "Die Hilfe eines Befehls zeigen", "コマンドのヘルプを表示する"},
    {"The command; without it, all commands", "Der Befehl; ohne Angabe alle Befehle",
     "コマンド。省略するとすべてのコマンド"},
    {"A command is missing.", "Ein Befehl fehlt.", "コマンドがありません。"},
    {"Unknown command '%1%'.", "Unbekannter Befehl '%1%'.", "不明なコマンド '%1%' です。"},
    {"%1% needs a value.", "%1% braucht einen Wert.", "%1% には値が必要です。"},
    {"%1% can be given only once.", "%1% kann nur einmal angegeben werden.",
     "%1% は 1 回しか指定できません。"},
    {"Unknown option '%1%'.", "Unbekannte Option '%1%'.", "不明なオプション '%1%' です。"},
    {"Unexpected argument '%1%'.", "Unerwartetes Argument '%1%'.", "余分な引数 '%1%' です。"},
    {"%1% is missing.", "%1% fehlt.", "%1% がありません。"},
    {"See \"%1%\".", "Siehe \"%1%\".", "\"%1%\" を参照してください。"},
    {"must not be empty", "darf nicht leer sein", "空にはできません"},
    {"Show the state of files that are not clean",
     "Den Zustand geänderter und unbekannter Dateien zeigen", "変更のあるファイルの状態を表示する"},
    {"Start tracking new files: they are in the next commit",
     "Neue Dateien aufnehmen: Sie sind im nächsten Commit",
     "新しいファイルの追跡を始める (次のコミットに入る)"},
    {"Stop tracking files; they stay on disk",
     "Dateien nicht mehr verwalten; auf der Platte bleiben sie",
     "ファイルの追跡をやめる (ディスクには残る)"},
    {"Mark files in conflict as resolved", "Dateien in Konflikt als gelöst markieren",
     "競合しているファイルを解決済みにする"},
    {"Commit all changes to tracked files", "Alle Änderungen an Dateien committen, die Git kennt",
     "追跡されているファイルの変更をすべてコミットする"},
    {"Discard all changes to files", "Alle Änderungen an Dateien verwerfen",
     "ファイルの変更をすべて破棄する"},
    {"Show the names of branches", "Die Namen der Branches zeigen", "ブランチの名前を表示する"},
    {"Make or delete a branch", "Einen Branch anlegen oder löschen",
     "ブランチを作成または削除する"},
    {"Make another branch the current one, and write its files",
     "Einen anderen Branch zum aktuellen machen und seine Dateien schreiben",
     "別のブランチに切り替え、そのファイルを書き出す"},
    {"Show the name of the current branch", "Den Namen des aktuellen Branch zeigen",
     "現在のブランチの名前を表示する"},
    {"Show the id of a revision", "Die Id einer Revision zeigen", "リビジョンの ID を表示する"},
    {"Show whether a merge or another operation is unfinished",
     "Sagen, ob ein Merge oder ein anderer Vorgang unvollendet ist",
     "マージなどの操作が途中かどうかを表示する"},
    {"Merge a branch into the current one", "Einen Branch in den aktuellen zusammenführen",
     "ブランチを現在のブランチにマージする"},
    {"Copy a repository into a new working copy",
     "Ein Repository in eine neue Arbeitskopie kopieren",
     "リポジトリを新しい作業コピーにコピーする"},
    {"Download a remote's branches", "Die Branches eines entfernten Repositorys abrufen",
     "リモートのブランチを取得する"},
    {"Upload commits to a remote, and move its branches",
     "Commits in ein entferntes Repository hochladen und seine Branches bewegen",
     "コミットをリモートに送り、そのブランチを動かす"},
    {"Show the references of a remote", "Die Referenzen eines entfernten Repositorys zeigen",
     "リモートの参照を表示する"},
    {"Show Git's attributes of a file", "Die Git-Attribute einer Datei zeigen",
     "ファイルの Git 属性を表示する"},
    {"Show or install the merge and diff tools in Git's configuration",
     "Die Merge- und Diff-Werkzeuge in der Git-Konfiguration zeigen oder eintragen",
     "Git の設定にあるマージツールと差分ツールを表示または設定する"},
    {"Show whether a folder is a working copy or repository that can be served",
     "Sagen, ob ein Ordner eine nutzbare Arbeitskopie oder ein Repository ist",
     "フォルダーが扱える作業コピーまたはリポジトリかどうかを表示する"},
    {"Show the versions of this program and of libgit2",
     "Die Versionen dieses Programms und von libgit2 zeigen",
     "このプログラムと libgit2 のバージョンを表示する"},
    {"Did you mean '%1%'?", "Meinten Sie '%1%'?", "'%1%' のことですか?"},
    {"This program does not do that, git does: use \"%1%\".",
     "Das kann nur git: Benutzen Sie \"%1%\".",
     "このプログラムにはない機能です。git を使ってください: \"%1%\"。"},
    {"Use \"%1%\".", "Benutzen Sie \"%1%\".", "\"%1%\" を使ってください。"},
};

} // namespace

TranslationTable helpTexts()
{
    return {std::begin(helpRows), std::size(helpRows)};
}

} // namespace vclink::shell
