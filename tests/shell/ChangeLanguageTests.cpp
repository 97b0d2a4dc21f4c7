// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>

#include "ChangeFixture.hpp"

namespace vclink::test
{
namespace
{

using testing::StartsWith;

class ShellChangeFailures : public ChangeFixture
{
};

TEST_F(ShellChangeFailures, AreToldInTheLanguageThatWasAskedFor)
{
    makeConflict();
    succeed({"rm", "b"});
    const std::string file = "  a\n";
    const struct
    {
        std::vector<std::string> arguments;
        std::string german;
        std::string japanese;
    } cases[] = {
        {{"add", "a"},
         "Nichts wurde hinzugefügt:\n  a: sie steht in Konflikt: ",
         "何も追加されませんでした:\n  a: 競合しています。"},
        {{"rm", "b"},
         "Es gibt keine Dateien zu entfernen. Es wurde nichts geändert.\n",
         "削除するファイルがありません。何も変更されていません。\n"},
        {{"revert", "a"},
         "Es wurde nichts zurückgesetzt, denn diese Dateien haben ungelöste Konflikte:\n" + file,
         "次のファイルに未解決の競合があるため、何も元に戻されませんでした。\n" + file},
        {{"commit", "--as-is", "-m", "Work"},
         "Git weiß nicht, von wem dieser Commit stammt.",
         "このコミットの作成者が Git に設定されていません。"},
    };
    for (const auto &[arguments, german, japanese] : cases)
    {
        for (const auto &[language, text] :
             {std::pair("de", german), std::pair("ja_JP.UTF-8", japanese)})
        {
            std::vector<std::string> words{"--lang", language};
            words.insert(words.end(), arguments.begin(), arguments.end());
            EXPECT_THAT(refuse(words), StartsWith(text));
        }
    }
}

} // namespace
} // namespace vclink::test
