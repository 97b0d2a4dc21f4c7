// SPDX-License-Identifier: MIT
#include "translations.hpp"

#include <iterator>

namespace vclink::shell
{
namespace
{

constexpr Translation refusalRows[] = {
    {"it lies outside the working copy %1%", "liegt außerhalb der Arbeitskopie %1%",
     "作業コピー %1% の外にあります"},
    {"a backslash in a name is read as a slash", "ein Backslash im Namen gilt als Schrägstrich",
     "名前の中のバックスラッシュはスラッシュとみなされます"},
    {"Git knows no file of this name", "Git kennt keine Datei dieses Namens",
     "この名前のファイルは Git の管理下にありません"},
    {"there is no such file", "es gibt keine solche Datei", "そのようなファイルはありません"},
    {"a name with *, ? or [ is read as a pattern", "*, ? und [ in einem Namen gelten als Muster",
     "名前の中の *、?、[ はパターンとみなされます"},
    {"it has only ignored files", "darin liegen nur ignorierte Dateien",
     "中には無視されるファイルしかありません"},
    {"it has no files", "darin liegen keine Dateien", "中にファイルがありません"},
    {"it is ignored by Git", "Git ignoriert die Datei", "Git に無視されます"},
    {"it is a FIFO, socket or device, which Git does not track",
     "ein FIFO, Socket oder Gerät, was Git nicht verwaltet",
     "FIFO、ソケット、デバイスのいずれかで、Git は追跡しません"},
    {"A name with *, ? or [ is a pattern, and matches these files too:%1%\nName them as well if "
     "you want them, or use git for the file with that name.",
     "Ein Name mit *, ? oder [ ist ein Muster und meint auch diese Dateien:%1%\nNennen Sie sie "
     "auch, wenn Sie sie meinen, oder benutzen Sie für die Datei dieses Namens git.",
     "*、?、[ "
     "を含む名前はパターンで、次のファイルも対象になります:%1%"
     "\n対象にするならそれらも指定し、そうでなければその名前のファイルには git を使ってください。"},
    {"These files have lost a mark, which \"git update-index %1%\" sets again:%2%",
     "Diese Dateien haben eine Markierung verloren, die \"git update-index %1%\" wieder setzt:%2%",
     "次のファイルの印が失われました。\"git update-index %1%\" で付け直せます:%2%"},
    {"%1% is a file now: move it out of the way, or revert it too",
     "%1% ist jetzt eine Datei: Räumen Sie sie aus dem Weg, oder verwerfen Sie sie auch",
     "%1% は今はファイルです。別の場所に移すか、一緒に元に戻してください"},
    {"it is in conflict: edit it until it is right, then mark it with \"vclink-shell resolved\"",
     "sie steht in Konflikt: Bearbeiten Sie sie, bis sie richtig ist, und markieren Sie sie dann "
     "mit \"vclink-shell resolved\"",
     "競合しています。正しく編集し、\"vclink-shell resolved\" で解決済みにしてください"},
    {"it is gone from the disk, and from the next commit",
     "sie ist von der Platte verschwunden und fehlt im nächsten Commit",
     "ディスクになく、次のコミットにも含まれません"},
    {"Git tracks it already: its changes are in the next commit anyway",
     "Git kennt sie schon: Ihre Änderungen sind ohnehin im nächsten Commit",
     "Git が既に追跡しています。その変更は常に次のコミットに入ります"},
    {"Nothing can be added in their place before you commit. git can do it: use \"git add\".",
     "An ihre Stelle kann vor einem Commit nichts hinzugefügt werden. git kann es: \"git add\".",
     "コミットするまで、その場所には何も追加できません。git ではできます: \"git add\"。"},
    {"It merges these files:%1%", "Er führt diese Dateien zusammen:%1%",
     "次のファイルをマージするコマンドです:%1%"},
    {"Git tracks no file in it", "Git kennt keine Datei darin",
     "中に Git が追跡しているファイルはありません"},
    {"it is not tracked by Git", "Git kennt die Datei nicht", "Git に追跡されていません"},
    {"it lies behind a symbolic link, which would be followed: use \"%1%\"",
     "liegt hinter einem symbolischen Link, dem gefolgt würde: Benutzen Sie \"%1%\"",
     "シンボリックリンクの先にあり、リンクがたどられてしまいます。\"%1%\" を使ってください"},
    {"it is a symbolic link, which would be followed: use \"%1%\"",
     "ein symbolischer Link, dem gefolgt würde: Benutzen Sie \"%1%\"",
     "シンボリックリンクなので、リンクがたどられてしまいます。\"%1%\" を使ってください"},
    {"because a backslash in a name is read as a slash:",
     "weil ein Backslash im Namen als Schrägstrich gilt:",
     "名前の中のバックスラッシュはスラッシュとみなされます:"},
    {"because a symbolic link would be followed:", "weil einem symbolischen Link gefolgt würde:",
     "シンボリックリンクがたどられてしまいます:"},
    {"because a submodule keeps its commit until \"git submodule update\":",
     "weil ein Submodul seinen Commit bis zu \"git submodule update\" behält:",
     "サブモジュールは \"git submodule update\" までそのコミットのままです:"},
    {"%1%, %2%%3%", "%1%, %2%%3%", "%1%。%2%%3%"},
    {"for an unknown reason:", "aus unbekanntem Grund:", "理由は不明です:"},
    {"A rebase is under way. Continue it with \"git rebase --continue\", or undo it with \"git "
     "rebase --abort\".",
     "Ein Rebase läuft. Setzen Sie ihn mit \"git rebase --continue\" fort, oder nehmen Sie ihn "
     "mit\n\"git rebase --abort\" zurück.",
     "リベースの途中です。\"git rebase --continue\" で続けるか、\"git rebase --abort\" "
     "で取り消してください。"},
    {"A bisection is under way. End it with \"git bisect reset\".",
     "Eine Bisection läuft. Beenden Sie sie mit \"git bisect reset\".",
     "二分探索の途中です。\"git bisect reset\" で終わらせてください。"},
    {"Patches are being applied. Continue with \"git am --continue\", or undo it with \"git am "
     "--abort\".",
     "Patches werden angewendet. Fahren Sie mit \"git am --continue\" fort, oder nehmen Sie es "
     "mit\n\"git am --abort\" zurück.",
     "パッチを適用している途中です。\"git am --continue\" で続けるか、\"git am --abort\" "
     "で取り消してください。"},
    {"A rebase or the application of patches is under way. Continue with \"git rebase "
     "--continue\"\nor \"git am --continue\", or undo it with --abort.",
     "Ein Rebase oder das Anwenden von Patches läuft. Fahren Sie mit \"git rebase --continue\" "
     "oder\n\"git am --continue\" fort, oder nehmen Sie es mit --abort zurück.",
     "リベースまたはパッチ適用の途中です。\"git rebase --continue\" または \"git am --continue\" "
     "で続けるか、--abort で\n取り消してください。"},
    {"A series of picked or reverted commits is under way. Continue with \"git cherry-pick "
     "--continue\"\nor \"git revert --continue\", or undo it with --abort.",
     "Eine Reihe von Cherry-Picks oder Reverts läuft. Fahren Sie mit \"git cherry-pick "
     "--continue\" oder\n\"git revert --continue\" fort, oder nehmen Sie es mit --abort zurück.",
     "連続したチェリーピックまたはリバートの途中です。\"git cherry-pick --continue\" または \"git "
     "revert --continue\" で\n続けるか、--abort で取り消してください。"},
    {"Nothing was committed. %1%\nA commit would end it, and lose its other steps. To commit "
     "nevertheless, use --as-is.",
     "Nichts wurde committet. %1%\nEin Commit würde das beenden und den Rest verlieren. Um "
     "trotzdem zu committen, benutzen Sie --as-is.",
     "何もコミットされませんでした。%1%"
     "\nコミットするとそれが終わり、残りは失われます。それでもコミットするには --as-is "
     "を使ってください。"},
    {"A commit of another author is being picked. Conclude it with \"git commit\", which keeps the "
     "author, or\nundo it with \"git cherry-pick --abort\".",
     "Ein Cherry-Pick des Commits eines anderen Autors läuft. Schließen Sie ihn mit \"git commit\" "
     "ab, das den\nAutor behält, oder nehmen Sie ihn mit \"git cherry-pick --abort\" zurück.",
     "別の作者のコミットをチェリーピックしています。作者が保たれる \"git commit\" で完了するか、"
     "\n\"git cherry-pick --abort\" で取り消してください。"},
    {"Nothing was committed. %1%\nTo commit it under your own name, use --as-is.",
     "Nichts wurde committet. %1%\nUm unter Ihrem eigenen Namen zu committen, benutzen Sie "
     "--as-is.",
     "何もコミットされませんでした。%1%\n自分の名前でコミットするには --as-is を使ってください。"},
    {"A merge is under way. Conclude it with \"vclink-shell commit\", or undo it with \"git merge "
     "--abort\".",
     "Ein Merge läuft. Schließen Sie ihn mit \"vclink-shell commit\" ab, oder nehmen Sie ihn "
     "mit\n\"git merge --abort\" zurück.",
     "マージの途中です。\"vclink-shell commit\" で完了するか、\"git merge --abort\" "
     "で取り消してください。"},
    {"If no other program is using Git here, remove .git/index.lock first.",
     "Entfernen Sie zuerst .git/index.lock, wenn hier nicht gerade ein anderes Programm mit Git "
     "arbeitet.",
     "ほかのプログラムがここで Git を使っていなければ、先に .git/index.lock を削除してください。"},
    {"A merge was interrupted before all of it was written, and can't be concluded. \"vclink-shell "
     "commit\"\nprints the commands that restore the working copy.",
     "Ein Merge wurde unterbrochen, bevor alles geschrieben war, und kann nicht abgeschlossen "
     "werden.\n\"vclink-shell commit\" sagt das und nennt die Befehle, die die Arbeitskopie "
     "wiederherstellen.",
     "マージがすべて書き込まれる前に中断され、完了できません。\"vclink-shell commit\" "
     "を実行すると、作業コピーを\n元に戻すコマンドが表示されます。"},
    {"A commit is being picked or reverted. Conclude it with \"vclink-shell commit\", or undo it "
     "with\n\"git cherry-pick --abort\" or \"git revert --abort\".",
     "Ein Cherry-Pick oder Revert läuft. Schließen Sie ihn mit \"vclink-shell commit\" ab, oder "
     "nehmen Sie\nihn mit \"git cherry-pick --abort\" oder \"git revert --abort\" zurück.",
     "チェリーピックまたはリバートの途中です。\"vclink-shell commit\" で完了するか、\"git "
     "cherry-pick --abort\" または\n\"git revert --abort\" で取り消してください。"},
    {"These files have uncommitted changes, and differ on that branch:%1%",
     "Diese Dateien haben Änderungen ohne Commit und unterscheiden sich auf dem anderen Branch:%1%",
     "次のファイルには未コミットの変更があり、そのブランチでは内容が異なります:%1%"},
    {"These files are not tracked, and that branch has something in their place:%1%",
     "Diese Dateien kennt Git nicht, und der Branch hat etwas an ihrer Stelle:%1%",
     "次のファイルは追跡されておらず、そのブランチの同じ場所に何かがあります:%1%"},
    {"Nothing was switched. Commit the changes or revert them, move untracked files out of the "
     "way, and\nswitch again.",
     "Es wurde nicht gewechselt. Committen oder verwerfen Sie die Änderungen, räumen Sie "
     "unversionierte\nDateien aus dem Weg, und wechseln Sie noch einmal.",
     "切り替えられませんでした。変更をコミットするか元に戻し、追跡されていないファイルを移してから"
     "、\nもう一度切り替えてください。"},
    {"These files have uncommitted changes:%1%", "Diese Dateien haben Änderungen ohne Commit:%1%",
     "次のファイルには未コミットの変更があります:%1%"},
    {"These files are not tracked, and the other side has something in their place:%1%",
     "Diese Dateien kennt Git nicht, und die andere Seite hat etwas an ihrer Stelle:%1%",
     "次のファイルは追跡されておらず、相手側の同じ場所に何かがあります:%1%"},
    {"The folders of these submodules are missing:%1%\nRestore them with \"git submodule update "
     "--init\" first. A commit would leave these submodules out.",
     "Die Ordner dieser Submodule fehlen:%1%\nHolen Sie sie zuerst mit \"git submodule update "
     "--init\" zurück. Einem Commit würden diese Submodule\nfehlen.",
     "次のサブモジュールのフォルダーがありません:%1%\n先に \"git submodule update --init\" "
     "で復元してください。コミットするとこれらのサブモジュールがなくなります。"},
    {"No file is in conflict. Conclude the merge with \"vclink-shell commit\".",
     "Keine Datei steht in Konflikt. Schließen Sie den Merge mit \"vclink-shell commit\" ab.",
     "競合しているファイルはありません。\"vclink-shell commit\" でマージを完了してください。"},
    {"These files are in conflict:%1%\nEdit each until it is right, and mark it with "
     "\"vclink-shell resolved\". Then conclude the merge\nwith \"vclink-shell commit\", or undo it "
     "with \"git merge --abort\".",
     "Diese Dateien stehen in Konflikt:%1%\nBearbeiten Sie jede, bis sie richtig ist, und "
     "markieren Sie sie mit \"vclink-shell resolved\". Schließen\nSie dann den Merge mit "
     "\"vclink-shell commit\" ab, oder nehmen Sie ihn mit \"git merge --abort\" zurück.",
     "次のファイルが競合しています:%1%\nそれぞれを正しく編集し、\"vclink-shell resolved\" "
     "で解決済みにしてください。その後 \"vclink-shell commit\" で\nマージを完了するか、\"git merge "
     "--abort\" で取り消してください。"},
    {"A merge command refused these files. They may be a mix of both sides without conflict "
     "markers:%1%",
     "Ein Merge-Befehl hat diese Dateien abgelehnt. Sie können eine Mischung beider Seiten "
     "ohne\nKonfliktmarkierungen sein:%1%",
     "マージコマンドが次のファイルを拒否しました。競合マーカーなしで両方の内容が混ざっていることが"
     "あります:%1%"},
    {"Nothing was merged. Commit the changes that would be lost, or move the files out of the way, "
     "and\nmerge again.",
     "Nichts wurde zusammengeführt. Committen Sie die Änderungen, die verloren gingen, oder räumen "
     "Sie die\nDateien aus dem Weg, und führen Sie noch einmal zusammen.",
     "何もマージされませんでした。失われる変更をコミットするか、ファイルを別の場所に移してから、も"
     "う一度\nマージしてください。"},
    {"Nothing was merged. Use \"git merge\" for this, which downloads what is missing.",
     "Nichts wurde zusammengeführt. Benutzen Sie dafür \"git merge\", das herunterlädt, was fehlt.",
     "何もマージされませんでした。不足しているものをダウンロードする \"git merge\" "
     "を使ってください。"},
    {"The merge command can't be started: '%1%' is no program. Correct the setting "
     "merge.%2%.driver: %3%",
     "Der Merge-Befehl kann nicht gestartet werden: '%1%' ist kein Programm. Berichtigen Sie die "
     "Einstellung\nmerge.%2%.driver: %3%",
     "マージコマンドを起動できません。'%1%' はプログラムではありません。設定 merge.%2%.driver "
     "を直してください: %3%"},
    {"The merge has renamed these files, because something else has their names:%1%\nThey are not "
     "in the merge: move each that you want to keep to its place, and add it.",
     "Diese Dateien heißen jetzt anders, weil etwas anderes ihren Namen hat:%1%\nIm Merge fehlen "
     "sie: Bringen Sie an seinen Platz, was Sie behalten wollen, und fügen Sie es hinzu.",
     "次のファイルは、元の名前を別のものが使っているため、名前が変わっています:%1%"
     "\nマージには含まれません。残したいものは元の場所に移して追加してください。"},
    {"Nothing was reverted, because the changes can't be stored first: %1%.\nTo discard them "
     "without a copy, use --forget.",
     "Nichts wurde verworfen, weil nicht gespeichert werden kann, was verworfen würde: %1%.\nUm es "
     "endgültig zu verwerfen, benutzen Sie --forget.",
     "破棄する内容を保存できないため、何も元に戻されませんでした: %1%。\n完全に破棄するには "
     "--forget "
     "を使ってください。"},
    {"Nothing was reverted, because these can't be stored first:%1%\nMove them out of the way, or "
     "discard them without a copy with --forget.",
     "Nichts wurde verworfen, weil hiervon keine Kopie möglich ist:%1%\nRäumen Sie es aus dem Weg, "
     "oder verwerfen Sie es endgültig mit --forget.",
     "次の内容の控えを作れないため、何も元に戻されませんでした:%1%\n別の場所に移すか、--forget "
     "で完全に破棄してください。"},
    {"a repository is in its place", "an seiner Stelle liegt ein Repository",
     "その場所にリポジトリがあります"},
    {"git can't read the index, or is not installed",
     "git kann den Index nicht lesen oder ist nicht installiert",
     "git がインデックスを読めないか、インストールされていません"},
    {"Before you restore, move the folder '%1%' out of the way.\n",
     "Vor dem Zurückholen den Ordner '%1%' beiseite räumen.\n",
     "復元する前に、フォルダー '%1%' を別の場所に移動してください。\n"},
    {"To restore what was discarded: %1%", "Verworfenes zurückholen: %1%",
     "破棄した内容を復元するには: %1%"},
    {"To restore what was staged: %1%", "Vorgemerktes zurückholen: %1%",
     "ステージした内容を復元するには: %1%"},
    {"The states of the files are not known: .gitmodules is in conflict, and can't be read before "
     "it\nis resolved. Edit it, and mark it with \"vclink-shell resolved\".",
     "Die Zustände der Dateien sind nicht bekannt: .gitmodules steht in Konflikt und kann nicht "
     "gelesen\nwerden, bevor er gelöst ist. Bearbeiten Sie die Datei, und markieren Sie sie dann "
     "mit \"vclink-shell resolved\".",
     "ファイルの状態がわかりません。.gitmodules "
     "が競合していて、解決するまで読み取れません。編集して、\n\"vclink-shell resolved\" "
     "で解決済みにしてください。"},
    {"The states of the files are not known: libgit2 can't read this working copy. \"git status\" "
     "may\nsay why: an error in .gitmodules, a setting with an invalid value, a tracked file that "
     "you have no\npermission to read, or folders more than 100 levels deep.",
     "Die Zustände der Dateien sind nicht bekannt: libgit2 kann diese Arbeitskopie nicht lesen. "
     "\"git status\"\nkann sagen, warum: ein fehlerhaftes .gitmodules, eine Einstellung mit einem "
     "unmöglichen Wert, eine\nversionierte Datei, die Sie nicht lesen dürfen, oder Ordner tiefer "
     "als 100 Ebenen.",
     "ファイルの状態がわかりません。libgit2 がこの作業コピーを読み取れません。\"git status\" "
     "で理由がわかることが\nあります: .gitmodules "
     "の誤り、設定の不正な値、読み取り権限のない追跡対象のファイル、100 "
     "階層より深い\nフォルダーなど。"},
    {"The states of the files are not known: the commit of HEAD, or its tree, can't be read. \"git "
     "fsck\" says\nwhat is missing. If the repository borrows objects from another one, make that "
     "available again.",
     "Die Zustände der Dateien sind nicht bekannt: Der Commit von HEAD oder dessen Tree kann nicht "
     "gelesen\nwerden. \"git fsck\" sagt, was fehlt. Leiht sich das Repository Objekte von einem "
     "anderen, machen Sie\ndieses wieder verfügbar.",
     "ファイルの状態がわかりません。HEAD のコミットまたはそのツリーを読み取れません。\"git "
     "fsck\" で何が\n欠けているかがわかります。別のリポジトリのオブジェクトを借りている場合は、"
     "それを再び使えるようにしてください。"},
    {"No file here has a state: either Git ignores all files, or libgit2 can't read this working "
     "copy,\nfor example because a setting has an invalid value. \"git status\" may say which.",
     "Keine Datei hier hat einen Zustand: Entweder ignoriert Git alle Dateien, oder libgit2 kann "
     "diese\nArbeitskopie nicht lesen. \"git status\" kann sagen, was: zum Beispiel eine "
     "Einstellung mit einem\nunmöglichen Wert.",
     "ここには状態のあるファイルがありません。Git がすべてのファイルを無視しているか、libgit2 "
     "がこの作業コピーを\n読み取れません。\"git status\" でどちらかわかることがあります "
     "(設定の不正な値など)。"},
    {"Nothing was pushed: there are a branch and a tag '%1%'. Use refs/heads/%1% or refs/tags/%1%.",
     "Nichts wurde hochgeladen: Es gibt einen Branch und einen Tag '%1%'. Schreiben Sie "
     "refs/heads/%1% oder\nrefs/tags/%1%.",
     "何も送られませんでした。ブランチとタグの両方に '%1%' があります。refs/heads/%1% または "
     "refs/tags/%1% と\n指定してください。"},
    {"Nothing was pushed: the remote has no branch and no tag '%1%'. Use a full name, e.g. "
     "refs/heads/%1%.",
     "Nichts wurde hochgeladen: Dort gibt es keinen Branch und keinen Tag '%1%'. Schreiben Sie "
     "einen vollen\nNamen, z. B. refs/heads/%1%.",
     "何も送られませんでした。リモートにはブランチもタグも '%1%' がありません。refs/heads/%1% "
     "のような完全な\n名前を使ってください。"},
    {"Nothing was pushed: %1% has another address for pushes, which cannot be listed. Use full "
     "names, e.g. refs/heads/NAME:refs/heads/NAME.",
     "Nichts wurde hochgeladen: Für %1% ist eine andere Adresse zum Hochladen eingestellt, die "
     "sich "
     "nicht\nauflisten lässt. Schreiben Sie volle Namen, z. B. refs/heads/NAME:refs/heads/NAME.",
     "何も送られませんでした。%1% には送信用の別のアドレスがあり、その一覧は取得できません。"
     "refs/heads/NAME:refs/heads/NAME\nのような完全な名前を使ってください。"},
    {"Deleted %1% at %2%.", "%1% bei %2% gelöscht.", "%2% の %1% を削除しました。"},
    {"Pushed %1% to %2%.", "%1% zu %2% hochgeladen.", "%1% を %2% に送りました。"},
    {"Pushed %1% to %2% at %3%.", "%1% zu %3% hochgeladen, dort %2%.",
     "%1% を %3% の %2% に送りました。"},
    {"No branch was made: START must be the name of a branch, or of a tag that is not annotated. "
     "For any\nother commit, use \"git branch %1% %2%\".",
     "Kein Branch wurde angelegt: START muss der Name eines Branch oder eines nicht annotierten "
     "Tags sein.\nFür jeden anderen Commit benutzen Sie \"git branch %1% %2%\".",
     "ブランチは作成されませんでした。START "
     "にはブランチか、注釈のないタグの名前を指定してください。\nほかのコミットには \"git branch "
     "%1% %2%\" を使ってください。"},
    {"Nothing was merged: '%1%' is an annotated tag.",
     "Nichts wurde zusammengeführt: '%1%' ist ein annotierter Tag.",
     "何もマージされませんでした。'%1%' は注釈付きのタグです。"},
    {"Nothing was deleted. %1%", "Nichts wurde gelöscht. %1%", "何も削除されませんでした。%1%"},
    {"Nothing was deleted: the commit of '%1%' can't be read, so there would be no way back. To\n"
     "delete the branch nevertheless, use \"git branch -D %2%\".",
     "Nichts wurde gelöscht: Der Commit von '%1%' kann nicht gelesen werden, also gäbe es keinen "
     "Weg\nzurück. Um den Branch trotzdem zu löschen, benutzen Sie \"git branch -D %2%\".",
     "何も削除されませんでした。'%1%' のコミットを読み取れないため、元に戻せなくなります。"
     "それでもブランチを\n削除するには \"git branch -D %2%\" を使ってください。"},
    {"Nothing was deleted: '%1%' is checked out in %2%.\nSwitch to another branch there first.",
     "Nichts wurde gelöscht: '%1%' ist in %2% ausgecheckt.\nWechseln Sie dort zuerst zu einem "
     "anderen Branch.",
     "何も削除されませんでした。'%1%' は%2%でチェックアウトされています。\n"
     "先にそこで別のブランチに切り替えてください。"},
    {"Nothing was deleted: a rebase in %2% moves '%1%' when it ends.\nEnd the rebase first.",
     "Nichts wurde gelöscht: Ein Rebase in %2% bewegt '%1%', wenn er endet.\nBeenden Sie zuerst "
     "den Rebase.",
     "何も削除されませんでした。%2%で実行中のリベースが終わるときに '%1%' を動かします。\n"
     "先にリベースを終わらせてください。"},
    {"Nothing was switched. %1%", "Es wurde nicht gewechselt. %1%", "切り替えませんでした。%1%"},
    {"the main working copy", "der Haupt-Arbeitskopie", "メインの作業コピー"},
    {"the working copy %1%", "der Arbeitskopie %1%", "作業コピー %1% "},
    {"Nothing was switched: '%1%' is checked out in %2%.\nWork there, or switch to another branch "
     "there first.",
     "Es wurde nicht gewechselt: '%1%' ist in %2% ausgecheckt.\nArbeiten Sie dort, oder wechseln "
     "Sie dort zuerst zu einem anderen Branch.",
     "切り替えませんでした。'%1%' "
     "は%2%"
     "でチェックアウトされています。\nそこで作業するか、先にそこで別のブランチに切り替えてください"
     "。"},
    {"The branch '%1%' is checked out in the working copy %2%, whose folder is missing.\nIf it is "
     "gone for good, use \"git worktree prune\" first.",
     "Der Branch '%1%' ist in der Arbeitskopie %2% ausgecheckt, deren Ordner fehlt.\nWenn sie "
     "endgültig weg ist, benutzen Sie zuerst \"git worktree prune\".",
     "ブランチ '%1%' は作業コピー %2% "
     "でチェックアウトされていますが、そのフォルダーがありません。\nもう使わないのであれば、先に "
     "\"git worktree prune\" を実行してください。"},
    {"There was no other current branch before.", "Vorher gab es keinen anderen aktuellen Branch.",
     "前に現在だった別のブランチはありません。"},
    {"%1% is a bare repository, which has no files. Work in a clone of it.",
     "%1% ist ein bloßes Repository ohne Dateien. Arbeiten Sie in einem Klon davon.",
     "%1% はファイルのないベアリポジトリです。そのクローンで作業してください。"},
    {"it is a repository of its own: use \"%1%\"",
     "es ist ein eigenes Repository: Benutzen Sie \"%1%\"",
     "独立したリポジトリです。\"%1%\" を使ってください"},
    {"because these are repositories of their own:", "weil es eigene Repositorys sind:",
     "独立したリポジトリです:"},
    {"Nothing was cloned: %1% exists, and is not an empty folder.",
     "Nichts wurde geklont: %1% gibt es schon, und es ist kein leerer Ordner.",
     "何もクローンされませんでした。%1% は既にあり、空のフォルダーではありません。"},
    {"%1% is unfinished, and can't be removed: %2%. Remove it yourself.",
     "%1% ist unfertig und kann nicht entfernt werden: %2%. Entfernen Sie es selbst.",
     "%1% は未完成ですが、削除できません: %2%。手動で削除してください。"},
    {"Nothing was pushed: there is no current branch. Name what to push, e.g. "
     "HEAD:refs/heads/NAME.",
     "Nichts wurde hochgeladen: Es gibt keinen aktuellen Branch. Nennen Sie, was hochzuladen "
     "ist,\nz. B. HEAD:refs/heads/NAME.",
     "何も送られませんでした。現在のブランチがありません。HEAD:refs/heads/NAME "
     "のように、送るものを\n指定してください。"},
    {"Nothing was fetched: that would move the branch '%1%', which is checked out in %2%.\nFetch "
     "into refs/remotes/%3%/ instead, and merge.",
     "Nichts wurde geholt: Das würde den Branch '%1%' bewegen, der in %2% ausgecheckt ist.\nHolen "
     "Sie stattdessen nach refs/remotes/%3%/, und führen Sie zusammen.",
     "何も取得されませんでした。%2%でチェックアウトされているブランチ '%1%' "
     "が動いてしまいます。\n代わりに refs/remotes/%3%/ に取得して、マージしてください。"},
    {"Nothing was fetched: that would move the branch '%1%', which a rebase in %2% moves when it "
     "ends.\nFetch into refs/remotes/%3%/ instead, or end the rebase first.",
     "Nichts wurde geholt: Das würde den Branch '%1%' bewegen, den ein Rebase in %2% bewegt, wenn "
     "er endet.\nHolen Sie stattdessen nach refs/remotes/%3%/, oder beenden Sie zuerst den Rebase.",
     "何も取得されませんでした。%2%で実行中のリベースが終わるときに動かすブランチ '%1%' "
     "が動いてしまいます。\n代わりに refs/remotes/%3%/ "
     "に取得するか、先にリベースを終わらせてください。"},
    {"To use an address, give it a name: \"%1%\".", "Geben Sie einer Adresse einen Namen: \"%1%\".",
     "アドレスを使うには名前を付けてください: \"%1%\"。"},
    {"'%1%' is a branch: name the remote before it, e.g. \"%2% %1%\".",
     "'%1%' ist ein Branch: Nennen Sie davor das Remote, z. B. \"%2% %1%\".",
     "'%1%' はブランチです。その前に \"%2% %1%\" のようにリモートを指定してください。"},
    {"Remotes: %1%.", "Remotes: %1%.", "リモート: %1%。"},
    {"There is no repository under the path of the remote '%1%', %2%: %3%.",
     "Unter dem Pfad des Remotes '%1%', %2%, gibt es kein Repository: %3%.",
     "リモート '%1%' のパス %2% にリポジトリがありません: %3%。"},
    {"Nothing was pushed: there is no branch and no tag '%1%' here.",
     "Nichts wurde hochgeladen: Hier gibt es keinen Branch und keinen Tag '%1%'.",
     "何も送られませんでした。ここにはブランチもタグも '%1%' がありません。"},
};

} // namespace

TranslationTable refusalTexts()
{
    return {std::begin(refusalRows), std::size(refusalRows)};
}

} // namespace vclink::shell
