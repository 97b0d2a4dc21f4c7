// SPDX-License-Identifier: MIT
#include "translations.hpp"

#include <iterator>

namespace vclink::shell
{
namespace
{

constexpr Translation failureRows[] = {
    {"%1% was made %2% ago. If no other program is using Git here, remove it, and try again.",
     "%1% ist seit %2% da. Wenn hier kein anderes Programm mit Git arbeitet, entfernen Sie die "
     "Datei, und\nversuchen Sie es noch einmal.",
     "%1% は %2%前に作られました。ほかのプログラムがここで Git "
     "を使っていなければ、削除して、もう一度試して\nください。"},
    {"Another program was using Git here. Try again.",
     "Ein anderes Programm hat hier mit Git gearbeitet. Versuchen Sie es noch einmal.",
     "別のプログラムがここで Git を使っていました。もう一度試してください。"},
    {"The file is not locked: you have no permission to read or write it. Check the permissions of "
     "the file\nand of the folders that contain it.",
     "Die Datei ist nicht gesperrt: Sie dürfen sie nicht lesen oder schreiben. Prüfen Sie die "
     "Rechte der Datei\nund der Ordner, in denen sie liegt.",
     "ファイルはロックされていません。読み取りまたは書き込みの権限がありません。ファイルと、"
     "それを含む\nフォルダーの権限を確認してください。"},
    {"The repository belongs to %1%. If you trust it, run: git config --global --add "
     "safe.directory %2%",
     "Das Repository gehört %1%. Wenn Sie ihm vertrauen: git config --global --add safe.directory "
     "%2%",
     "リポジトリの所有者は %1% です。信頼できる場合: git config --global --add safe.directory %2%"},
    {"Download the remote's commits with \"vclink-shell fetch\", merge them, and push again. To "
     "discard\nthem there instead, put a plus before the branch: \"vclink-shell push REMOTE "
     "+BRANCH\".",
     "Holen Sie die Commits von dort mit \"vclink-shell fetch\", führen Sie sie zusammen, und "
     "laden Sie noch einmal\nhoch. Um sie stattdessen dort zu verwerfen, setzen Sie ein Plus vor "
     "den Branch:\n\"vclink-shell push REMOTE +BRANCH\".",
     "\"vclink-shell fetch\" "
     "でリモートのコミットを取得し、マージしてからもう一度送ってください。代わりにリモートの\nコミ"
     "ットを破棄するには、ブランチの前に + を付けてください: \"vclink-shell push REMOTE "
     "+BRANCH\"。"},
    {"Branches such as \"a\" and \"a/b\" can't exist side by side. If the remote has deleted the "
     "older one,\n\"git fetch --prune REMOTE\" deletes it here too, and fetches the new one.",
     "Branches wie \"a\" und \"a/b\" kann es nicht zugleich geben. Wenn der ältere dort gelöscht "
     "ist, "
     "löscht\n\"git fetch --prune REMOTE\" ihn auch hier und holt den neuen.",
     "\"a\" と \"a/b\" "
     "のようなブランチは同時に存在できません。古い方がリモートで削除されていれば、\n"
     "\"git fetch --prune REMOTE\" でここでも削除され、新しい方が取得されます。"},
    {"libgit2 does not know the format of this repository; core.repositoryformatversion and "
     "extensions in\n%1% describe it. If git can work here, use git.",
     "libgit2 kennt das Format dieses Repositorys nicht; core.repositoryformatversion und "
     "extensions in\n%1% beschreiben es. Wenn git hier arbeiten kann, benutzen Sie git.",
     "libgit2 はこのリポジトリの形式に対応していません。形式は %1% "
     "の\ncore.repositoryformatversion と extensions にあります。git が使える場合は、git "
     "を使ってください。"},
    {"libgit2 does not know the format of the remote repository; core.repositoryformatversion and "
     "extensions in\nits configuration describe it. If git can work with it, use git.",
     "libgit2 kennt das Format des entfernten Repositorys nicht; core.repositoryformatversion und "
     "extensions\nin dessen Konfiguration beschreiben es. Wenn git damit arbeiten kann, benutzen "
     "Sie git.",
     "libgit2 はリモートのリポジトリの形式に対応していません。形式はその設定の\n"
     "core.repositoryformatversion と extensions にあります。git が使える場合は、git "
     "を使ってください。"},
    {"%1%.", "%1%.", "%1%。"},
    {"There is a branch '%1%' already. Choose another name, or use the branch that is "
     "there:\n\"vclink-shell switch %2%\".",
     "Einen Branch '%1%' gibt es schon. Wählen Sie einen anderen Namen, oder benutzen Sie "
     "diesen:\n\"vclink-shell switch %2%\".",
     "ブランチ '%1%' "
     "は既にあります。別の名前を選ぶか、そのブランチを使ってください:\n\"vclink-shell "
     "switch %2%\"。"},
    {"Git can't have the branches '%1%' and '%2%' at a time, as one is like a folder of the "
     "other.\nChoose another name.",
     "Git kann die Branches '%1%' und '%2%' nicht zugleich haben, da einer wie ein Ordner des "
     "anderen ist.\nWählen Sie einen anderen Namen.",
     "Git ではブランチ '%1%' と '%2%' は同時に存在できません "
     "(一方が他方のフォルダーのような名前です)。\n別の名前を選んでください。"},
    {"'%1%' can't be the name of a branch. Blanks, control characters, \"..\", \"@{\", and any of "
     "~^:?*[\\ can't\nbe in it; \"git help check-ref-format\" has all rules.",
     "'%1%' kann kein Branch heißen. Leerzeichen, Steuerzeichen, \"..\", \"@{\" und ~^:?*[\\ sind "
     "nicht\nerlaubt; alle Regeln stehen in \"git help check-ref-format\".",
     "'%1%' はブランチの名前にできません。空白、制御文字、\"..\"、\"@{\"、~^:?*[\\ "
     "は使えません。\n規則の全体は \"git help check-ref-format\" にあります。"},
    {"Nothing was deleted: '%1%' is the current branch. Switch to another one first.",
     "Nichts wurde gelöscht: '%1%' ist der aktuelle Branch. Wechseln Sie erst zu einem anderen.",
     "何も削除されませんでした。'%1%' "
     "は現在のブランチです。先に別のブランチに切り替えてください。"},
    {"There is no revision '%1%'.", "Es gibt keine Revision '%1%'.",
     "リビジョン '%1%' はありません。"},
    {"More than one object has an id that begins with '%1%', or the beginning is too short. Give "
     "more of it.",
     "Mehr als ein Objekt hat eine Id, die mit '%1%' beginnt, oder der Anfang ist zu kurz. Geben "
     "Sie mehr davon an.",
     "'%1%' で始まる ID のオブジェクトが複数あるか、短すぎます。もっと長く指定してください。"},
    {"'%1%' is not a revision. \"git help revisions\" describes how one is written; a range is "
     "none.",
     "'%1%' ist keine Revision. Wie man eine schreibt, steht in \"git help revisions\"; ein "
     "Bereich "
     "ist keine.",
     "'%1%' はリビジョンではありません。書き方は \"git help revisions\" "
     "にあります。範囲は指定できません。"},
    {"Nothing was pushed: the tag '%1%' is another one at %2%. To replace it there:\n%3%",
     "Nichts wurde hochgeladen: Der Tag '%1%' ist bei %2% ein anderer. Um ihn dort zu "
     "ersetzen:\n%3%",
     "何も送られませんでした。%2% のタグ '%1%' は別のものです。置き換えるには:\n%3%"},
    {"Nothing was pushed: the branch '%1%' at %2% has commits that yours does not have.\nDownload "
     "them with \"vclink-shell fetch\", merge them, and push again. To discard them there "
     "instead:\n%3%",
     "Nichts wurde hochgeladen: Der Branch '%1%' bei %2% hat Commits, die Ihrer nicht hat.\nHolen "
     "Sie sie mit \"vclink-shell fetch\", führen Sie sie zusammen, und laden Sie noch einmal "
     "hoch.\nUm sie stattdessen dort zu verwerfen:\n%3%",
     "何も送られませんでした。%2% のブランチ '%1%' "
     "には、手元のブランチにないコミットがあります。\n\"vclink-shell fetch\" "
     "で取得し、マージしてからもう一度送ってください。代わりにリモートのものを\n破棄するには:\n%"
     "3%"},
    {"Nothing was committed: a merge was interrupted before all of it was written, and a commit "
     "would\nleave the rest out. To begin again, run this in the root of the working copy:\n%1%",
     "Nichts wurde committet: Ein Merge wurde unterbrochen, bevor alles geschrieben war; einem "
     "Commit\nwürde der Rest fehlen. Um neu zu beginnen, führen Sie dies im Wurzelordner der "
     "Arbeitskopie aus:\n%1%",
     "何もコミットされませんでした。マージがすべて書き込まれる前に中断され、コミットすると残りが含"
     "ま"
     "れません。\nやり直すには、作業コピーのルートで次を実行してください:\n%1%"},
    {"Nothing was committed: the index has nothing of what only the other side of the merge has "
     "changed.\nIf you put that back intentionally, run \"git commit\". To begin again, run this "
     "in the root of the\nworking copy:\n%1%",
     "Nichts wurde committet: Im Index fehlt, was nur die andere Seite des Merge geändert "
     "hat.\nIst "
     "das Absicht, benutzen Sie \"git commit\". Um neu zu beginnen, führen Sie dies im "
     "Wurzelordner "
     "der\nArbeitskopie aus:\n%1%",
     "何もコミットされませんでした。マージの相手側だけが変更した内容がインデックスにありません。"
     "\n意図したものであれば \"git commit\" "
     "を使ってください。やり直すには、作業コピーのルートで次を実行して\nください:\n%1%"},
    {"There is no remote '%1%'.", "Es gibt kein Remote '%1%'.", "リモート '%1%' はありません。"},
    {"Add one with \"git remote add %1% ADDRESS\".",
     "Fügen Sie eines hinzu: \"git remote add %1% ADRESSE\".",
     "\"git remote add %1% ADDRESS\" で追加してください。"},
    {"There is no commit yet that a branch could begin at.",
     "Es gibt noch keinen Commit, an dem ein Branch beginnen könnte.",
     "ブランチの起点になるコミットがまだありません。"},
    {"No branch was made: the commit of '%1%' can't be read.",
     "Es wurde kein Branch angelegt: Der Commit von '%1%' kann nicht gelesen werden.",
     "ブランチは作成されませんでした。'%1%' のコミットを読み取れません。"},
    {"Nothing was merged: the commit of '%1%' can't be read.",
     "Nichts wurde zusammengeführt: Der Commit von '%1%' kann nicht gelesen werden.",
     "何もマージされませんでした。'%1%' のコミットを読み取れません。"},
    {"There is no current branch: HEAD is at a commit, not at a branch.",
     "Es gibt keinen aktuellen Branch: HEAD steht auf einem Commit, nicht auf einem Branch.",
     "現在のブランチはありません。HEAD はブランチではなくコミットを指しています。"},
    {"There is no current branch: nothing was committed yet.",
     "Es gibt keinen aktuellen Branch: Noch wurde nichts committet.",
     "現在のブランチはありません。まだ何もコミットされていません。"},
    {"There is no branch '%1%'.", "Es gibt keinen Branch '%1%'.", "ブランチ '%1%' はありません。"},
    {"There is no branch and no commit '%1%'.", "Es gibt keinen Branch und keinen Commit '%1%'.",
     "'%1%' というブランチもコミットもありません。"},
    {"Nothing was merged: there is no branch and no commit '%1%'.",
     "Nichts wurde zusammengeführt: Es gibt keinen Branch und keinen Commit '%1%'.",
     "何もマージされませんでした。'%1%' というブランチもコミットもありません。"},
    {"Make it from %1% with \"vclink-shell branch %2% %1%\".",
     "Legen Sie ihn aus %1% an: \"vclink-shell branch %2% %1%\".",
     "%1% から作るには \"vclink-shell branch %2% %1%\" を使ってください。"},
    {"Nothing was fetched: %1% has no reference '%2%'.",
     "Nichts wurde geholt: %1% hat keine Referenz '%2%'.",
     "何も取得されませんでした。%1% に参照 '%2%' はありません。"},
    {"Nothing was cloned: %1% can't be found: %2%.",
     "Nichts wurde geklont: %1% ist nicht zu finden: %2%.",
     "何もクローンされませんでした。%1% が見つかりません: %2%。"},
    {"%1% second", "%1% Sekunde", "%1% 秒"},
    {"%1% seconds", "%1% Sekunden", "%1% 秒"},
    {"%1% minute", "%1% Minute", "%1% 分"},
    {"%1% minutes", "%1% Minuten", "%1% 分"},
    {"%1% hour", "%1% Stunde", "%1% 時間"},
    {"%1% hours", "%1% Stunden", "%1% 時間"},
    {"%1% day", "%1% Tag", "%1% 日"},
    {"%1% days", "%1% Tagen", "%1% 日"},
    {"Neither %1% nor any folder above it is a Git working copy.",
     "Weder %1% noch ein Ordner darüber ist eine Git-Arbeitskopie.",
     "%1% もその上のどのフォルダーも Git の作業コピーではありません。"},
    {"There is a repository in %1%, but it can't be opened.",
     "In %1% liegt ein Repository, aber es kann nicht geöffnet werden.",
     "%1% にリポジトリがありますが、開けません。"},
    {"%1% is a bare repository inside the working copy %2%. If it came with a clone, so did\nits "
     "configuration, which can run commands. If you trust it, use --bare.",
     "%1% ist ein bloßes Repository in der Arbeitskopie %2%. Wenn es mit einem Klon kam, kam auch "
     "seine\nKonfiguration so und kann Befehle nennen, die dann laufen. Wenn Sie ihm vertrauen, "
     "benutzen Sie\n--bare.",
     "%1% は作業コピー %2% "
     "の中のベアリポジトリです。クローンと一緒に来たものなら、その設定も同様で、実行\nされるコマン"
     "ドを含むかもしれません。信頼できる場合は --bare を使ってください。"},
    {"The server asked for a key. Only an ssh agent provides keys, and SSH_AUTH_SOCK names "
     "none.\nStart one with \"eval $(ssh-agent)\", and add the key with \"ssh-add\".",
     "Der Server verlangt einen Schlüssel. Schlüssel kommen nur von einem ssh-Agenten, und "
     "SSH_AUTH_SOCK\nnennt keinen. Starten Sie einen mit \"eval $(ssh-agent)\" und geben Sie ihm "
     "den Schlüssel mit\n\"ssh-add\".",
     "サーバーが鍵を要求しました。鍵は ssh エージェントからだけ取得しますが、SSH_AUTH_SOCK "
     "がありません。\n\"eval $(ssh-agent)\" でエージェントを起動し、\"ssh-add\" "
     "で鍵を渡してください。"},
    {"The server asked for a key. Only an ssh agent provides keys, and the one that\nSSH_AUTH_SOCK "
     "names does not answer: %1%",
     "Der Server verlangt einen Schlüssel. Schlüssel kommen nur von einem ssh-Agenten, und der, "
     "den\nSSH_AUTH_SOCK nennt, antwortet nicht: %1%",
     "サーバーが鍵を要求しました。鍵は ssh エージェントからだけ取得しますが、SSH_AUTH_SOCK "
     "のエージェントが\n応答しません: %1%"},
    {"The server accepts none of the keys that the ssh agent holds; \"ssh-add -l\" shows these.",
     "Der Server nimmt keinen der Schlüssel, die der ssh-Agent hat; \"ssh-add -l\" zeigt sie.",
     "ssh エージェントが持つ鍵はどれもサーバーに受け入れられません。\"ssh-add -l\" "
     "で確認できます。"},
    {"The server asked for a user name: put it before the host, as in ssh://NAME@HOST/PATH.",
     "Der Server verlangt einen Benutzernamen: Setzen Sie ihn vor den Host, wie in "
     "ssh://NAME@HOST/PFAD.",
     "サーバーがユーザー名を要求しました。ssh://NAME@HOST/PATH "
     "のようにホストの前に付けてください。"},
    {"The server asked for a password. This program never sends one; it only uses the keys of an "
     "ssh agent.",
     "Der Server verlangt ein Passwort. Dieses Programm sendet nie eines; es benutzt nur die "
     "Schlüssel\neines ssh-Agenten.",
     "サーバーがパスワードを要求しましたが、パスワードは送りません。ssh "
     "エージェントの鍵だけを使います。"},
    {"%1% was written to %2%, but git uses the value in\n%3%. Remove that one: %4%",
     "%1% wurde in %2% geschrieben, aber git benutzt den Wert in\n%3%. Entfernen Sie diesen: %4%",
     "%1% を %2% に書き込みましたが、git は\n%3% の値を使います。その値を削除してください: %4%"},
    {"The remote's current branch does not exist, so no files were written. List its branches "
     "with\n\"vclink-shell branches -r\", and check one out with \"git switch NAME\".",
     "Den aktuellen Branch des Remotes gibt es nicht, daher wurden keine Dateien geschrieben. "
     "Seine "
     "Branches\nzeigt \"vclink-shell branches -r\"; \"git switch NAME\" wechselt zu einem.",
     "リモートの現在のブランチが存在しないため、ファイルは書き込まれませんでした。"
     "\"vclink-shell branches -r\" で\nブランチを確認し、\"git switch NAME\" "
     "で切り替えてください。"},
    {"The server rejects the user name or the password in the address.",
     "Der Server weist den Benutzernamen oder das Passwort in der Adresse zurück.",
     "アドレスのユーザー名またはパスワードがサーバーに拒否されました。"},
    {"The operation was cancelled.", "Der Vorgang wurde abgebrochen.",
     "操作はキャンセルされました。"},
    {"The command ended with an error of an unknown kind.",
     "Der Befehl endete mit einem Fehler unbekannter Art.",
     "コマンドは不明な種類のエラーで終わりました。"},
    {"The log is incomplete: %1%.", "Das Protokoll ist unvollständig: %1%.",
     "ログは不完全です: %1%。"},
    {"The log is incomplete, for a reason that is not known.",
     "Das Protokoll ist aus unbekanntem Grund unvollständig.", "ログは不明な理由で不完全です。"},
    {"The folder %1% can't be entered: %2%.", "Der Ordner %1% kann nicht betreten werden: %2%.",
     "フォルダー %1% に入れません: %2%。"},
    {"The current folder can't be found: %1%.", "Der aktuelle Ordner ist nicht zu finden: %1%.",
     "現在のフォルダーが見つかりません: %1%。"},
    {"Standard output can't be written: %1%.",
     "Die Standardausgabe kann nicht geschrieben werden: %1%.", "標準出力に書き込めません: %1%。"},
    {"The operation makes no progress.", "Der Vorgang kommt nicht voran.",
     "処理が進んでいません。"},
    {"The operation can't be asked to stop: %1%.",
     "Der Vorgang kann nicht abgebrochen werden: %1%.", "処理に中止を要求できません: %1%。"},
    {"This can't be cancelled. It goes on to its end.",
     "Das kann nicht abgebrochen werden. Es läuft zu Ende.",
     "これはキャンセルできません。最後まで実行します。"},
    {"Too late to cancel: files are being written.",
     "Zum Abbrechen ist es zu spät: Dateien werden geschrieben.",
     "キャンセルできません。ファイルを書き込んでいます。"},
    {"Cancelling, as soon as the server answers.", "Wird abgebrochen, sobald der Server antwortet.",
     "サーバーが応答したらキャンセルします。"},
    {"Cancelling.", "Wird abgebrochen.", "キャンセルしています。"},
    {"The next Ctrl-C ends the program at once.", "Strg-C beendet das Programm jetzt sofort.",
     "Ctrl-C を押すと、すぐにプログラムを終了します。"},
    {"It was done before it could be cancelled.",
     "Es war erledigt, bevor es abgebrochen werden konnte.", "キャンセルする前に完了しました。"},
};

} // namespace

TranslationTable failureTexts()
{
    return {std::begin(failureRows), std::size(failureRows)};
}

} // namespace vclink::shell
