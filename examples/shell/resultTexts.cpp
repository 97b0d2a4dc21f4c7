// SPDX-License-Identifier: MIT
#include "translations.hpp"

#include <iterator>

namespace vclink::shell
{
namespace
{

constexpr Translation resultRows[] = {
    {"Nothing was added", "Nichts wurde hinzugefügt", "何も追加されませんでした"},
    {"There is no new file to add.", "Es gibt keine neue Datei.",
     "追加する新しいファイルはありません。"},
    {"Added %1%.", "Hinzugefügt: %1%.", "追加しました: %1%。"},
    {"Others were not added", "Andere wurden nicht hinzugefügt",
     "ほかのファイルは追加されませんでした"},
    {"%1% is not in the working copy %2%.", "%1% liegt nicht in der Arbeitskopie %2%.",
     "%1% は作業コピー %2% の中にありません。"},
    {"Deleted the branch %1%, which was at %2%.", "Branch %1% gelöscht; er stand auf %2%.",
     "ブランチ %1% (%2%) を削除しました。"},
    {"Made the branch %1%.", "Branch %1% angelegt.", "ブランチ %1% を作成しました。"},
    {"is not allowed with -d", "gehört nicht zum Löschen eines Branch",
     "ブランチの削除には指定できません"},
    {"%1% branch", "%1% Branch", "%1% 個のブランチ"},
    {"%1% branches", "%1% Branches", "%1% 個のブランチ"},
    {"Nothing was cloned: name a folder for the working copy.",
     "Nichts wurde geklont: Nennen Sie einen Ordner für die Arbeitskopie.",
     "何もクローンされませんでした。作業コピーのフォルダーを指定してください。"},
    {"Cloning into %1%:", "Klonen nach %1%:", "%1% にクローンしています:"},
    {"Done.", "Fertig.", "完了しました。"},
    {"Nothing was committed, because these files are in conflict:%1%\nEdit each until it is right, "
     "and mark it with \"vclink-shell resolved\". With --as-is the commit\ntakes them as they are, "
     "with any conflict markers.",
     "Nichts wurde committet, weil diese Dateien in Konflikt stehen:%1%\nBearbeiten Sie jede, bis "
     "sie richtig ist, und markieren Sie sie mit \"vclink-shell resolved\". Mit\n--as-is nimmt der "
     "Commit sie, wie sie sind, samt Konfliktmarkierungen.",
     "次のファイルが競合しているため、何もコミットされませんでした:%1%"
     "\nそれぞれを正しく編集し、\"vclink-shell resolved\" で解決済みにしてください。--as-is "
     "を付けると、\n競合マーカーも含めてそのままコミットします。"},
    {"Nothing was committed, because git converts these files before it stores them, and "
     "vclink-shell\ncannot:%1%\nUse \"git commit -a\". If you have not changed them, \"git "
     "status\" is enough: then commit again. With\n--as-is the commit stores what is on the disk.",
     "Nichts wurde committet, weil git diese Dateien umwandelt, bevor es sie speichert, und "
     "vclink-shell das\nnicht kann:%1%\nBenutzen Sie \"git commit -a\". Haben Sie sie nicht "
     "geändert, genügt \"git status\": Committen Sie dann noch\neinmal. Mit --as-is speichert der "
     "Commit, was auf der Platte ist.",
     "次のファイルは保存前に git が変換しますが、vclink-shell "
     "にはできないため、何もコミットされませんでした:%1%"
     "\n\"git commit -a\" を使ってください。変更していないファイルなら、\"git status\" "
     "を実行してから\nもう一度コミットしてください。--as-is "
     "を付けると、ディスク上の内容をそのまま保存します。"},
    {"Nothing was committed: no tracked file has changed.",
     "Nichts wurde committet: Keine Datei, die Git kennt, ist geändert.",
     "何もコミットされませんでした。追跡されているファイルに変更がありません。"},
    {"Untracked: %1%. To commit them, add them with \"vclink-shell add\".",
     "Git kennt nicht: %1%. Fügen Sie mit \"vclink-shell add\" hinzu, was in den Commit soll.",
     "追跡されていません: %1%。コミットするものを \"vclink-shell add\" で追加してください。"},
    {"Nothing was committed: the message is empty.",
     "Nichts wurde committet: Die Nachricht ist leer.",
     "何もコミットされませんでした。メッセージが空です。"},
    {"Committed.", "Committet.", "コミットしました。"},
    {"Committed %1%.", "Committet: %1%.", "コミットしました: %1%。"},
    {"Git's configuration of this user: %1%", "Git-Konfiguration dieses Benutzers: %1%",
     "このユーザーの Git の設定: %1%"},
    {"There is no .gitconfig in the home folder.", "Im Benutzerordner gibt es kein .gitconfig.",
     "ホームフォルダーに .gitconfig がありません。"},
    {"Fetching from %1%:", "Abrufen von %1%:", "%1% から取得しています:"},
    {"There was nothing new at %1%.", "Bei %1% gab es nichts Neues.",
     "%1% に新しいものはありませんでした。"},
    {"Fetched from %1%: %2%.", "Von %1% geholt: %2%.", "%1% から取得しました: %2%。"},
    {"%1% reference changed", "%1% Referenz geändert", "%1% 個の参照が変わりました"},
    {"%1% references changed", "%1% Referenzen geändert", "%1% 個の参照が変わりました"},
    {"Asking %1%:", "Anfrage an %1%:", "%1% に問い合わせています:"},
    {"%1% reference", "%1% Referenz", "%1% 個の参照"},
    {"%1% references", "%1% Referenzen", "%1% 個の参照"},
    {"Already up to date.", "Schon auf dem neuesten Stand.", "既に最新です。"},
    {"Fast-forward to %1%.", "Fast-Forward auf %1%.", "%1% に早送りしました。"},
    {"Merge commit %1%.", "Merge-Commit %1%.", "マージコミット %1%。"},
    {"served by the back end \"%1%\"", "bedient vom Backend \"%1%\"",
     "バックエンド \"%1%\" が対応します"},
    {"Pushing to %1%:", "Hochladen zu %1%:", "%1% に送っています:"},
    {"%1% rejected:%2%", "%1% hat abgelehnt:%2%", "%1% が拒否しました:%2%"},
    {"Everything is up to date at %1%.", "Bei %1% ist alles auf dem neuesten Stand.",
     "%1% はすべて最新です。"},
    {"Nothing was removed", "Nichts wurde entfernt", "何も削除されませんでした"},
    {"Removed %1% from Git, not from the disk.", "Aus Git entfernt, nicht von der Platte: %1%.",
     "Git から削除しました (ディスクには残ります): %1%。"},
    {"Not all were removed", "Nicht alle wurden entfernt", "一部は削除されませんでした"},
    {"it has only symbolic links, which would be followed",
     "nur symbolische Links liegen darin, denen gefolgt würde",
     "中にはシンボリックリンクしかなく、リンク先が対象になってしまいます"},
    {"Nothing was marked as resolved", "Nichts wurde als gelöst markiert",
     "何も解決済みになりませんでした"},
    {"It was not in conflict, and is staged as it is.",
     "Sie stand nicht in Konflikt und ist vorgemerkt, wie sie ist.",
     "競合していなかったので、そのままステージしました。"},
    {"Marked %1% as resolved.", "Als gelöst markiert: %1%.", "解決済みにしました: %1%。"},
    {"Not all were marked as resolved", "Nicht alle wurden als gelöst markiert",
     "一部は解決済みになりませんでした"},
    {"it is a symbolic link that leads nowhere, and would be removed: use \"%1%\"",
     "es ist ein symbolischer Link ins Leere und würde entfernt: Benutzen Sie \"%1%\"",
     "リンク先のないシンボリックリンクで、削除されてしまいます。\"%1%\" を使ってください"},
    {"no file in it is in conflict", "keine Datei darin steht in Konflikt",
     "中に競合しているファイルはありません"},
    {"only symbolic links are in conflict in it: use \"%1%\"",
     "nur symbolische Links darin stehen in Konflikt: Benutzen Sie \"%1%\"",
     "中で競合しているのはシンボリックリンクだけです。\"%1%\" を使ってください"},
    {"Nothing was marked as resolved: a folder is in the place of %1%, and these files in it are "
     "not tracked:%2%\nAdd them first if they belong to the solution. Otherwise run this, which "
     "leaves the folder as it is:\ngit update-index --force-remove %3%",
     "Nichts wurde als gelöst markiert: An der Stelle von %1% ist ein Ordner, und diese Dateien "
     "darin kennt Git\nnicht:%2%\nFügen Sie sie zuerst hinzu, wenn sie zur Lösung gehören. Sonst "
     "lässt dieser Befehl den Ordner, wie er ist:\ngit update-index --force-remove %3%",
     "何も解決済みになりませんでした。%1% "
     "の場所にフォルダーがあり、その中の次のファイルは追跡されていません:%2%"
     "\n解決に含めるなら、先に追加してください。含めないなら次を実行してください。フォルダーはその"
     "まま残ります。\ngit update-index --force-remove %3%"},
    {"Nothing was reverted", "Nichts wurde verworfen", "何も元に戻されませんでした"},
    {"There is no change to revert.", "Es gibt keine Änderung zu verwerfen.",
     "元に戻す変更はありません。"},
    {"Reverted %1%.", "Verworfen: %1%.", "元に戻しました: %1%。"},
    {"Not all were reverted", "Nicht alle wurden verworfen", "一部は元に戻されませんでした"},
    {"Not every name is known", "Nicht jeder Name ist bekannt", "不明な名前があります"},
    {"Nothing was switched: there is also a tag %1%, and its files would be written instead of "
     "the\nbranch's. Rename the tag or the branch first.",
     "Es wurde nicht gewechselt: %1% ist auch ein Tag, und dessen Dateien würden geschrieben statt "
     "der des\nBranch. Benennen Sie zuerst den Tag oder den Branch um.",
     "切り替えませんでした。%1% "
     "はタグでもあり、ブランチではなくタグのファイルが書き出されてしまいます。\n先にタグまたはブラ"
     "ンチの名前を変えてください。"},
    {"Nothing was switched: '%1%' also means something else here, and its files would be written "
     "instead of the\nbranch's. Use \"%2%\", or rename the branch.",
     "Es wurde nicht gewechselt: '%1%' bezeichnet hier auch etwas anderes, und dessen Dateien "
     "würden "
     "geschrieben statt der\ndes Branch. Benutzen Sie \"%2%\", oder benennen Sie den Branch um.",
     "切り替えませんでした。'%1%' "
     "はここで別のものも指していて、ブランチではなくそちらのファイルが書き出されてしまいます。"
     "\n\"%2%\" を使うか、ブランチの名前を変えてください。"},
    {"The current branch is %1%.", "Der aktuelle Branch ist %1%.", "現在のブランチは %1% です。"},
    {"%1% file", "%1% Datei", "%1% 個のファイル"},
    {"%1% files", "%1% Dateien", "%1% 個のファイル"},
};

} // namespace

TranslationTable resultTexts()
{
    return {std::begin(resultRows), std::size(resultRows)};
}

} // namespace vclink::shell
