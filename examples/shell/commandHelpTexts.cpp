// SPDX-License-Identifier: MIT
#include "translations.hpp"

#include <iterator>

namespace vclink::shell
{
namespace
{

constexpr Translation commandHelpRows[] = {
    {"New files, and folders: all new files below them",
     "Neue Dateien und Ordner: alle neuen Dateien darin",
     "新しいファイルとフォルダー (その中のすべての新しいファイル)"},
    {"All new files of the working copy", "Alle neuen Dateien der Arbeitskopie",
     "作業コピーのすべての新しいファイル"},
    {"The files are in the next commit. Ignored files in a folder are left out; an ignored file "
     "that is\nnamed itself is refused. A file that Git tracks already is refused too: commit "
     "takes its changes\nanyway.",
     "Die Dateien sind im nächsten Commit. Ignorierte Dateien eines Ordners bleiben weg; einzeln "
     "genannt\nwerden sie abgelehnt. Das gilt auch für Dateien, die Git schon kennt: Ihre "
     "Änderungen sind ohnehin\nim nächsten Commit.",
     "ファイルは次のコミットに入ります。フォルダー内の無視されるファイルは除かれ、名前で指定すると"
     "拒否さ\nれます。Git "
     "が既に追跡しているファイルも同様です。その変更は常に次のコミットに入ります。"},
    {"A file, which need not exist", "Eine Datei; sie muss nicht vorhanden sein",
     "ファイル (存在しなくてもかまいません)"},
    {"Attributes", "Attribute", "属性"},
    {"One line for each attribute, as a .gitattributes file has it: \"NAME\", \"-NAME\", "
     "\"NAME=VALUE\",\nor \"!NAME\" if it is not specified.",
     "Eine Zeile je Attribut, wie in einer Datei .gitattributes: \"NAME\", \"-NAME\", "
     "\"NAME=WERT\" oder\n\"!NAME\", wenn es nicht angegeben ist.",
     "属性ごとに 1 行を .gitattributes と同じ形式で表示します: "
     "\"NAME\"、\"-NAME\"、\"NAME=値\"、\n指定がなければ \"!NAME\"。"},
    {"The branch", "Der Branch", "ブランチ"},
    {"Where the new branch begins: a branch, or a tag that is not annotated;\nwithout it, HEAD",
     "Wo der neue Branch beginnt: ein Branch oder ein nicht annotierter Tag;\nohne Angabe HEAD",
     "新しいブランチの開始点: ブランチ、または注釈のないタグ。\n省略すると HEAD"},
    {"Delete the branch, merged or not", "Den Branch löschen, zusammengeführt oder nicht",
     "ブランチを削除する (マージ済みかどうかを問わない)"},
    {"Makes or deletes a branch. The current branch stays the same, and can't be deleted.",
     "Legt einen Branch an oder löscht ihn. Der aktuelle Branch bleibt derselbe und kann nicht "
     "gelöscht\nwerden.",
     "ブランチを作成または削除します。現在のブランチは変わらず、削除できません。"},
    {"The branches that were fetched from remote repositories",
     "Die Branches, die von entfernten Repositorys geholt wurden", "リモートから取得したブランチ"},
    {"End each line with NUL, and write names byte for byte",
     "Jede Zeile mit NUL beenden und Namen Byte für Byte schreiben",
     "各行を NUL で終え、名前をバイト単位でそのまま出力する"},
    {"One line for each branch: its short name, which the other commands take.",
     "Eine Zeile je Branch: sein kurzer Name, den auch die anderen Befehle nehmen.",
     "ブランチごとに 1 行、ほかのコマンドでも使う短い名前を表示します。"},
    {"The repository: a path, or an address such as https://HOST/PATH,\nssh://NAME@HOST/PATH or "
     "NAME@HOST:PATH",
     "Das Repository: ein Pfad oder eine Adresse wie https://HOST/PFAD,\nssh://NAME@HOST/PFAD oder "
     "NAME@HOST:PFAD",
     "リポジトリ: パス、または https://HOST/PATH、\nssh://NAME@HOST/PATH、NAME@HOST:PATH "
     "のようなアドレス"},
    {"The working copy to be made: new, or an empty folder; without it,\nnamed like the repository",
     "Die neue Arbeitskopie: ein neuer oder leerer Ordner; ohne Angabe\nheißt er wie das "
     "Repository",
     "作成する作業コピー: 新しいフォルダーまたは空のフォルダー。\n省略するとリポジトリと同じ名前"},
    {"Copies a repository with its history, and writes the files of its current branch. It becomes "
     "the\nremote \"origin\" of the working copy.\n\nNever prompts: keys come from an ssh agent, "
     "and a password only from the address. Every\ncertificate and host key is accepted.",
     "Kopiert ein Repository mit seiner Geschichte und schreibt die Dateien seines aktuellen "
     "Branch. Es\nwird das entfernte Repository \"origin\" der Arbeitskopie.\n\nFragt nie nach: "
     "Schlüssel kommen von einem ssh-Agenten, ein Passwort nur aus der Adresse. Jedes\nZertifikat "
     "und jeder Hostschlüssel wird akzeptiert.",
     "リポジトリを履歴ごとコピーし、現在のブランチのファイルを書き出します。元のリポジトリは作業コ"
     "ピーの\nリモート \"origin\" になります。\n\n入力は求めません。鍵は ssh "
     "エージェントから、パスワードはアドレスからのみ取得します。\n証明書とホスト鍵はすべて受け入れ"
     "ます。"},
    {"What the commit says", "Die Nachricht des Commits", "コミットメッセージ"},
    {"Has no effect: a commit takes all changes anyway",
     "Ändert nichts: Ein Commit nimmt ohnehin alle Änderungen",
     "何も変わりません (コミットは常にすべての変更を含みます)"},
    {"Commit even if nothing has changed", "Auch committen, wenn nichts geändert ist",
     "変更がなくてもコミットする"},
    {"Commit with an empty message", "Mit einer leeren Nachricht committen",
     "空のメッセージでコミットする"},
    {"Commit files as they are on the disk, also with conflict markers, or if git would convert\n"
     "them by a filter; commit also during a rebase, a bisection or a series of picked\ncommits, "
     "which ends it",
     "Dateien committen, wie sie auf der Platte sind, auch mit Konfliktmarkierungen, und wenn\ngit "
     "sie durch einen Filter umwandeln würde; auch mitten in einem Rebase, einer Bisection\noder "
     "einer Reihe von Cherry-Picks committen, was sie beendet",
     "ファイルをディスク上のままコミットする。競合マーカーがある場合や、git "
     "がフィルターで変換する場合も含む。\nリベース、二分探索、連続したチェリーピックの途中でも行い"
     "、そ"
     "れを終わらせる"},
    {"Commits all changes to tracked files, staged or not, and all that was added or removed. "
     "Concludes a\nmerge that is under way. The author comes from git's settings user.name and "
     "user.email; if they are\nnot set, from USER or LOGNAME and the machine's name.",
     "Committet alle Änderungen an Dateien, die Git kennt, vorgemerkt oder nicht, und was "
     "hinzugefügt oder\nentfernt wurde. Schließt einen laufenden Merge ab. Der Autor kommt aus den "
     "Git-Einstellungen\nuser.name und user.email, sonst aus USER oder LOGNAME und dem Namen des "
     "Rechners.",
     "追跡されているファイルの変更を、ステージの有無にかかわらず、追加や削除とともにすべてコミット"
     "します。\n進行中のマージを完了します。作成者は Git の設定 user.name と user.email "
     "から、なければ USER または\nLOGNAME とホスト名から決まります。"},
    {"Install the tools that come along; this replaces the values that are set",
     "Die mitgelieferten Werkzeuge eintragen; vorhandene Werte werden ersetzt",
     "既存の値の代わりに付属のツールを設定する"},
    {"Shows the merge and diff tools in Git's configuration of this user: one line for each that "
     "is set,\nits key, a tab, and its value.",
     "Zeigt die Merge- und Diff-Werkzeuge in der Git-Konfiguration dieses Benutzers: eine Zeile "
     "für jedes,\ndas gesetzt ist, mit Schlüssel, Tabulator und Wert.",
     "このユーザーの Git "
     "の設定にあるマージツールと差分ツールを表示します。設定されているものごとに 1 "
     "行、\nキー、タブ、値を出力します。"},
    {"There is none before the first commit, nor while a commit is checked out instead of a "
     "branch.",
     "Vor dem ersten Commit gibt es keinen, ebenso wenn statt eines Branch ein Commit ausgecheckt "
     "ist.",
     "最初のコミットの前と、ブランチではなくコミットをチェックアウトしている間はありません。"},
    {"What to fetch, and where to, e.g. refs/heads/a:refs/remotes/origin/a;\nwithout any, what the "
     "remote's configuration says",
     "Was zu holen ist und wohin, z. B. refs/heads/a:refs/remotes/origin/a;\nohne Angabe, was die "
     "Konfiguration des entfernten Repositorys sagt",
     "取得するものと保存先。例: "
     "refs/heads/a:refs/remotes/origin/a。\n省略するとリモートの設定に従う"},
    {"Downloads the remote's branches, e.g. as origin/main, and their tags. The working copy stays "
     "as it\nis: see merge for the next step. A branch that was deleted at the remote stays "
     "here.\n\nNever prompts (see clone).",
     "Bringt die Branches des entfernten Repositorys und ihre Tags hier auf den neuesten Stand, z. "
     "B.\norigin/main. Die Arbeitskopie bleibt, wie sie ist; für den nächsten Schritt siehe merge. "
     "Ein dort\ngelöschter Branch bleibt hier.\n\nFragt nie nach (siehe clone).",
     "リモートのブランチとそのタグ (origin/main など) "
     "を更新します。作業コピーは変わりません。次の手順は\nmerge "
     "を参照してください。リモートで削除されたブランチはここに残ります。\n\n入力は求めません "
     "(clone を参照)。"},
    {"One line for each reference of the remote: the id, a tab, and the full name. A symbolic "
     "reference\nsuch as HEAD has another tab and the name that it points to. A name that ends in "
     "\"^{}\" is the\nobject that a tag points to.\n\nNever prompts (see clone).",
     "Eine Zeile je Referenz des entfernten Repositorys: die Id, ein Tabulator und der volle Name; "
     "bei\neiner symbolischen wie HEAD noch ein Tabulator und der Name, für den sie steht. Ein "
     "Name mit \"^{}\"\nam Ende ist das Objekt, zu dem ein Tag führt.\n\nFragt nie nach (siehe "
     "clone).",
     "リモートの参照ごとに 1 行、ID、タブ、完全な名前を表示します。HEAD "
     "のようなシンボリック参照では、さらに\nタブと参照先の名前が続きます。\"^{}\" "
     "で終わる名前は、タグが指すオブジェクトです。\n\n入力は求めません (clone を参照)。"},
    {"A branch, or any revision of a commit, e.g. v1^{commit} for a tag",
     "Ein Branch oder die Revision eines Commits, z. B. v1^{commit} für einen Tag",
     "ブランチ、またはコミットのリビジョン。例: タグは v1^{commit}"},
    {"Brings the changes of another branch into the current one: by a fast-forward or a merge "
     "commit.\nRefuses to lose uncommitted changes or untracked files.\n\nAfter conflicts the "
     "status is 1. Resolve each file, mark it with resolved, and conclude the merge\nwith commit; "
     "or undo the merge with \"git merge --abort\".\n\nUntil the first file is written, Ctrl-C "
     "stops it: nothing has changed then.",
     "Bringt die Änderungen eines anderen Branch in den aktuellen: durch einen Fast-Forward oder "
     "einen\nMerge-Commit. Weigert sich, Änderungen ohne Commit oder unversionierte Dateien zu "
     "verlieren.\n\nNach Konflikten ist der Status 1. Lösen Sie die Konflikte jeder Datei, "
     "markieren Sie sie mit resolved und schließen\nSie den Merge mit commit ab; oder nehmen Sie "
     "ihn mit \"git merge --abort\" zurück.\n\nSolange keine Datei geschrieben ist, bricht Strg-C "
     "ab: Dann ist nichts geändert.",
     "別のブランチの変更を、早送りまたはマージコミットで現在のブランチに取り込みます。未コミットの"
     "変更や\n追跡されていないファイルが失われる場合は拒否します。\n\n競合すると終了ステータスは 1 "
     "です。各ファイルを解決し、resolved で解決済みにして、commit "
     "でマージを\n完了してください。\"git merge --abort\" で取り消すこともできます。\n\nCtrl-C "
     "は最初のファイルを書く前なら中止します。その場合は何も変わりません。"},
    {"The folder to look at", "Der Ordner, um den es geht", "調べるフォルダー"},
    {"Prints \"yes\" or \"no\", and ends with status 0 or 1. The answer is \"yes\" for the root of "
     "a working\ncopy and for a bare repository, and \"no\" for a folder inside one.",
     "Gibt \"yes\" oder \"no\" aus und endet mit Status 0 oder 1. Die Antwort ist \"yes\" für die "
     "Wurzel einer\nArbeitskopie und für ein bloßes Repository, \"no\" für einen Ordner darin.",
     "\"yes\" または \"no\" を出力し、ステータス 0 または 1 "
     "で終わります。作業コピーのルートとベアリポジトリは\n\"yes\"、その中のフォルダーは \"no\" "
     "です。"},
    {"What to push: main, or mine:main to push mine to the remote's main.\n:main deletes the "
     "remote's main; +main overwrites it, and can lose\ncommits there. Without any, the current "
     "branch",
     "Was hochzuladen ist: main, oder mine:main, um mine nach main hochzuladen.\n:main löscht main "
     "dort; +main überschreibt es, dort können Commits\nverloren gehen. Ohne Angabe der aktuelle "
     "Branch",
     "送るもの: main、または mine:main (mine をリモートの main に送る)。\n:main はリモートの main "
     "を削除し、+main は上書きします "
     "(コミットが失われること\nがあります)。省略すると現在のブランチ"},
    {"Sends commits to the remote, and moves its branches or tags. If the server rejects some, "
     "they are\nlisted with its reason, and the status is 1.\n\nNever prompts (see clone).",
     "Lädt Commits in das entfernte Repository hoch und bewegt seine Branches oder Tags. Was der "
     "Server\nablehnt, wird mit seinem Grund genannt, und der Status ist 1.\n\nFragt nie nach "
     "(siehe clone).",
     "リモートにコミットを送り、そのブランチやタグを動かします。サーバーが拒否したものは理由ととも"
     "に表示し、\n終了ステータスは 1 です。\n\n入力は求めません (clone を参照)。"},
    {"Tracked files, and folders: all tracked files below them",
     "Dateien, die Git kennt, und Ordner: alle solchen Dateien darin",
     "追跡されているファイルとフォルダー (その中のすべての追跡されているファイル)"},
    {"The next commit removes the files. They stay on the disk, untracked.",
     "Die Dateien fehlen im nächsten Commit. Auf der Platte bleiben sie, unversioniert.",
     "ファイルは次のコミットからなくなります。ディスクには追跡されない状態で残ります。"},
    {"Files, and folders: all files in conflict below them",
     "Dateien und Ordner: alle Dateien in Konflikt darin",
     "ファイルとフォルダー (その中の競合しているすべてのファイル)"},
    {"The file as it is now becomes the solution of its conflict. If it is gone from the disk, the "
     "solution\nis to delete it. The text is not checked for conflict markers. A file that is not "
     "in conflict is\nstaged as it is.",
     "Die Datei, wie sie jetzt ist, wird zur Lösung ihres Konflikts. Ist sie von der Platte "
     "verschwunden,\nist die Lösung, sie zu löschen. Konfliktmarkierungen im Text werden nicht "
     "bemerkt. Eine Datei ohne\nKonflikt wird vorgemerkt, wie sie ist.",
     "今のファイルを競合の解決結果とします。ディスクから消えていれば、削除が解決結果です。競合マー"
     "カーが\n残っていても調べません。競合していないファイルは、そのままステージされます。"},
    {"Keep no copy of what is discarded", "Keine Kopie dessen behalten, was verworfen wird",
     "破棄する内容を保存しない"},
    {"Discards all changes to the files, staged or not: they become as in the last commit. What "
     "is\ndiscarded is stored in the repository first, and the command that restores it is "
     "printed. A file\nthat was only added becomes untracked, and keeps its text.\n\nUntil the "
     "first file is written, Ctrl-C stops it. The files are unchanged then, but staged "
     "changes\nmay be unstaged.",
     "Verwirft alle Änderungen an den Dateien, vorgemerkt oder nicht: Sie werden wie im letzten "
     "Commit. Was\nverworfen wird, bleibt als Git-Objekt erhalten, und eine Zeile sagt, wie es "
     "zurückkommt. Eine nur\nhinzugefügte Datei wird unversioniert und behält ihren "
     "Text.\n\nSolange keine Datei geschrieben ist, bricht Strg-C ab: Dann sind die Dateien wie "
     "zuvor; Vorgemerktes\nkann seine Vormerkung verloren haben.",
     "ファイルのすべての変更を、ステージの有無にかかわらず破棄し、最後のコミットの状態に戻します。"
     "破棄した\n内容は Git のオブジェクトとして保存され、復元方法が 1 "
     "行で表示されます。追加しただけのファイルは追跡\nされない状態になり、内容は残ります。\n\nCtrl-"
     "C "
     "は最初のファイルを書く前なら中止します。ファイルはそのままですが、ステージした変更は解除\nさ"
     "れていることがあります。"},
    {"A revision as git reads it, e.g. main~2 or HEAD:file",
     "Eine Revision, wie git sie liest, z. B. main~2 oder HEAD:datei",
     "git と同じ書き方のリビジョン。例: main~2、HEAD:file"},
    {"\"Normal\", or the operation that is not finished: \"Conflicts\" is a merge, a revert or a "
     "cherry-pick,\neven if no file is in conflict.",
     "\"Normal\" oder der unvollendete Vorgang: \"Conflicts\" ist ein Merge, ein Revert oder ein "
     "Cherry-Pick,\nauch wenn keine Datei in Konflikt steht.",
     "\"Normal\"、または完了していない操作を表示します。\"Conflicts\" "
     "は、競合しているファイルがなくても、マージ、\nリバート、チェリーピックのいずれかです。"},
    {"One line for each file that is not clean: its state, a tab, and its path from the current "
     "folder.\nIgnored files are left out. The states:",
     "Eine Zeile je geänderter oder unbekannter Datei: Zustand, Tabulator und der Pfad vom "
     "aktuellen Ordner.\nIgnorierte Dateien bleiben weg. Die Zustände:",
     "変更のあるファイルごとに 1 "
     "行、状態、タブ、現在のフォルダーからのパスを表示します。無視されるファイルは\n除かれます。状"
     "態:"},
    {"Show clean files too", "Auch unveränderte Dateien zeigen", "変更のないファイルも表示する"},
    {"End each line with NUL, and write names byte for byte, without colour",
     "Jede Zeile mit NUL beenden und Namen Byte für Byte schreiben, ohne Farbe",
     "各行を NUL で終え、名前をバイト単位でそのまま、色なしで出力する"},
    {"Only these files, and all files below these folders",
     "Nur diese Dateien und alle Dateien in diesen Ordnern",
     "これらのファイルと、これらのフォルダー内のすべてのファイルだけ"},
    {"A local branch, or - for the previous one", "Ein lokaler Branch, oder - für den vorigen",
     "ローカルブランチ。- は一つ前のブランチ"},
    {"Makes the branch the current one, and writes its files. Uncommitted changes to a file are "
     "kept if\nthe file is the same in both branches; otherwise switch refuses. Ignored files that "
     "the branch\ntracks are overwritten without a copy.\n\nUntil the first file is written, "
     "Ctrl-C stops it: nothing has changed then.",
     "Macht den Branch zum aktuellen und schreibt seine Dateien. Änderungen ohne Commit an einer "
     "Datei\nbleiben, wenn die Datei in beiden Branches gleich ist; sonst wird nicht gewechselt. "
     "Ignorierte\nDateien, die der Branch kennt, werden ohne Kopie überschrieben.\n\nSolange keine "
     "Datei geschrieben ist, bricht Strg-C ab: Dann ist nichts geändert.",
     "ブランチのファイルを書き出し、現在のブランチにします。両方のブランチで内容が同じファイルの未"
     "コミットの\n変更は残ります。そうでない場合は切り替えません。ブランチが追跡する、無視されるフ"
     "ァイルは上書きします。\n\nCtrl-C "
     "は最初のファイルを書く前なら中止します。その場合は何も変わりません。"},
    {"The remote's name; without it, that of the current branch, or\nelse origin",
     "Der Name des entfernten Repositorys; ohne Angabe das des aktuellen\nBranch, sonst origin",
     "リモートの名前。省略すると現在のブランチのリモート、\nなければ origin"},
    {"tracked and unchanged", "bekannt und unverändert", "追跡されていて変更がない"},
    {"changed, staged or not", "geändert, vorgemerkt oder nicht",
     "変更がある (ステージの有無を問わない)"},
    {"new, and in the next commit", "neu, und im nächsten Commit", "新規で、次のコミットに入る"},
    {"deleted by the next commit", "im nächsten Commit nicht mehr da", "次のコミットからなくなる"},
    {"tracked, but gone from the disk", "bekannt, aber von der Platte verschwunden",
     "追跡されているが、ディスクにない"},
    {"in a conflict that is not resolved yet", "in einem Konflikt, der noch nicht gelöst ist",
     "競合していて、まだ解決されていない"},
    {"not tracked", "Git nicht bekannt", "追跡されていない"},
    {"anything else, e.g. replaced by a symbolic link",
     "alles andere, z. B. durch einen symbolischen Link ersetzt",
     "それ以外 (シンボリックリンクに置き換えた場合など)"},
};

} // namespace

TranslationTable commandHelpTexts()
{
    return {std::begin(commandHelpRows), std::size(commandHelpRows)};
}

} // namespace vclink::shell
