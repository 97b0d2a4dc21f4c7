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
    {"The repository belongs to %1%. If you trust it, run: git config --global --add "
     "safe.directory %2%",
     "Das Repository gehört %1%. Wenn Sie ihm vertrauen: git config --global --add safe.directory "
     "%2%",
     "リポジトリの所有者は %1% です。信頼できる場合: git config --global --add safe.directory %2%"},
    {"Get the remote's commits with \"vclink-shell fetch\", merge them, and push again. To lose "
     "them "
     "there,\nput a plus before the branch: \"vclink-shell push REMOTE +BRANCH\".",
     "Holen Sie die Commits von dort mit \"vclink-shell fetch\", führen Sie sie zusammen, und "
     "pushen "
     "Sie noch\neinmal. Um sie dort zu verlieren, setzen Sie ein Plus vor den Branch: "
     "\"vclink-shell push REMOTE +BRANCH\".",
     "\"vclink-shell fetch\" "
     "でリモートのコミットを取得し、マージしてからもう一度プッシュしてください。リモートの\nコミッ"
     "ト"
     "を失ってよい場合は、ブランチの前に + を付けてください: \"vclink-shell push REMOTE "
     "+BRANCH\"。"},
    {"%1% has the format, in core.repositoryformatversion and extensions. If git can work "
     "here,\nuse "
     "git.",
     "Das Format steht in %1%, unter core.repositoryformatversion und extensions. Wenn git hier "
     "arbeiten kann,\nbenutzen Sie git.",
     "形式は %1% の core.repositoryformatversion と extensions にあります。git "
     "が使える場合は、git を使ってください。"},
    {"%1%.", "%1%.", "%1%。"},
    {"There is no remote '%1%'.", "Es gibt kein Remote '%1%'.", "リモート '%1%' はありません。"},
    {"Add one with \"git remote add %1% ADDRESS\".",
     "Fügen Sie eines hinzu: \"git remote add %1% ADRESSE\".",
     "\"git remote add %1% ADDRESS\" で追加してください。"},
    {"There is no commit yet that a branch could begin at.",
     "Es gibt noch keinen Commit, an dem ein Branch beginnen könnte.",
     "ブランチの起点になるコミットがまだありません。"},
    {"There is no current branch: HEAD is at a commit, not at a branch.",
     "Es gibt keinen aktuellen Branch: HEAD steht auf einem Commit, nicht auf einem Branch.",
     "現在のブランチはありません。HEAD はブランチではなくコミットを指しています。"},
    {"There is no current branch: nothing was committed yet.",
     "Es gibt keinen aktuellen Branch: Noch wurde nichts committet.",
     "現在のブランチはありません。まだ何もコミットされていません。"},
    {"There is no branch '%1%'.", "Es gibt keinen Branch '%1%'.", "ブランチ '%1%' はありません。"},
    {"There is no branch and no commit '%1%'.", "Es gibt keinen Branch und keinen Commit '%1%'.",
     "ブランチもコミットも '%1%' という名前ではありません。"},
    {"Nothing was merged: there is no branch and no commit '%1%'.",
     "Nichts wurde zusammengeführt: Es gibt keinen Branch und keinen Commit '%1%'.",
     "何もマージされませんでした。ブランチもコミットも '%1%' という名前ではありません。"},
    {"Make it from %1% with \"vclink-shell branch %2% %1%\".",
     "Machen Sie ihn aus %1%: \"vclink-shell branch %2% %1%\".",
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
    {"%1% is a bare repository inside the working copy %2%. If it came with a clone, "
     "its\nconfiguration did too, and may name commands that then run. If you trust it, use "
     "--bare.",
     "%1% ist ein bloßes Repository in der Arbeitskopie %2%. Wenn es mit einem Klon kam, kam auch "
     "seine\nKonfiguration so und kann Befehle nennen, die dann laufen. Wenn Sie ihm vertrauen, "
     "benutzen Sie\n--bare.",
     "%1% は作業コピー %2% "
     "の中のベアリポジトリです。クローンと一緒に来たものなら、その設定も同様で、実行\nされるコマン"
     "ドを含むかもしれません。信頼できる場合は --bare を使ってください。"},
    {"The server asked for a key. Keys are taken from an ssh agent only, and SSH_AUTH_SOCK names "
     "none.\nStart one with \"eval $(ssh-agent)\", and give it the key with \"ssh-add\".",
     "Der Server verlangt einen Schlüssel. Schlüssel kommen nur von einem ssh-Agenten, und "
     "SSH_AUTH_SOCK\nnennt keinen. Starten Sie einen mit \"eval $(ssh-agent)\" und geben Sie ihm "
     "den Schlüssel mit\n\"ssh-add\".",
     "サーバーが鍵を要求しました。鍵は ssh エージェントからだけ取得しますが、SSH_AUTH_SOCK "
     "がありません。\n\"eval $(ssh-agent)\" でエージェントを起動し、\"ssh-add\" "
     "で鍵を渡してください。"},
    {"The server asked for a key. Keys are taken from an ssh agent only, and the one "
     "that\nSSH_AUTH_SOCK names does not answer: %1%",
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
    {"The server asked for a password, and none is ever given: only an ssh agent is asked, for "
     "keys.",
     "Der Server verlangt ein Passwort, und es wird nie eines gesendet: Nur ein ssh-Agent wird "
     "nach\nSchlüsseln gefragt.",
     "サーバーがパスワードを要求しましたが、パスワードは送りません。ssh "
     "エージェントの鍵だけを使います。"},
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
    {"Nothing was heard of the operation for a while.",
     "Von dem Vorgang war eine Weile nichts zu hören.", "しばらく処理からの応答がありません。"},
    {"The operation can't be asked to stop: %1%.",
     "Der Vorgang kann nicht gebeten werden aufzuhören: %1%.", "処理に中止を要求できません: %1%。"},
    {"This can't be cancelled. It goes on to its end.",
     "Das kann nicht abgebrochen werden. Es läuft zu Ende.",
     "これはキャンセルできません。最後まで実行します。"},
    {"Too late to cancel: files are being written.",
     "Zum Abbrechen ist es zu spät: Dateien werden geschrieben.",
     "キャンセルできません。ファイルを書き込んでいます。"},
    {"Cancelling, as soon as the server answers.", "Wird abgebrochen, sobald der Server antwortet.",
     "サーバーが応答したらキャンセルします。"},
    {"Cancelling.", "Wird abgebrochen.", "キャンセルしています。"},
    {"Ctrl-C ends the program at once now.", "Strg-C beendet das Programm jetzt sofort.",
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
