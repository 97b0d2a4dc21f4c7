// SPDX-License-Identifier: MIT
#include "fl/i18n/english_texts.hpp"

#include <algorithm>
#include <iterator>
#include <string_view>

// The template of the translations is extracted from this file, the key being the message's
// context: see host/po/CMakeLists.txt.
#define VCLINK_TEXT(key, text) (EnglishTextOfKey{key, {text, u"" text}})

namespace fl::i18n
{
namespace
{

struct EnglishTextOfKey
{
    std::string_view key;
    EnglishText text;
};

// A checkout requests the first one for every file.
constexpr EnglishTextOfKey texts[] = {
    VCLINK_TEXT("ProgressCallbackCheckoutMessage",
                // TRANSLATORS: %1% is the path of one file.
                "Checking out %1%"),
    VCLINK_TEXT("LibGit2Error",
                // TRANSLATORS: %1% and %2% are numbers; %3% is Git's own explanation, always
                // English, without a full stop.
                "Git could not complete the operation: %3% (code %1%, category %2%)"),
    VCLINK_TEXT("MergeFailed",
                // TRANSLATORS: %1% is the branch that was to be merged into the current one. The
                // reason follows on a line of its own.
                "\"%1%\" could not be merged into the current branch."),
    VCLINK_TEXT("HasConflicts",
                "The merge left conflicts. Resolve them in the files concerned, mark these files "
                "as resolved, and then commit to complete the merge."),
    VCLINK_TEXT("UnableToMergeBadRepositoryState",
                "A merge cannot begin while another operation, such as a merge, a rebase or a "
                "cherry-pick, is unfinished in this working copy. Complete or abort that operation "
                "first."),
    VCLINK_TEXT(
        "MergePreferenceFastForward",
        "The two branches have diverged, and the Git configuration allows only fast-forward "
        "merges (merge.ff is set to \"only\"). Nothing was changed."),
    VCLINK_TEXT("AlreadyAdded",
                // TRANSLATORS: %1% is a list of files, one on each line.
                "Nothing was added, because these files are not new to Git:\n%1%"),
    VCLINK_TEXT("NoFilesToRemove", "There are no files to remove. Nothing was changed."),
    VCLINK_TEXT("Conflicted",
                // TRANSLATORS: %1% is a list of files, one on each line.
                "Nothing was reverted, because these files have unresolved conflicts:\n%1%"),
    VCLINK_TEXT("NoUserName",
                "Git does not know who makes this commit. Set user.name and user.email in the Git "
                "configuration, and try again."),
    VCLINK_TEXT("InvalidGitAttributeValue",
                // TRANSLATORS: %1% is the value as it is in a .gitattributes file.
                "\"%1%\" cannot be understood as the value of a Git attribute."),
};

} // namespace

const EnglishText *findEnglishText(const std::string &key) noexcept
{
    const auto *const found = std::find_if(std::begin(texts), std::end(texts),
                                           [&key](const EnglishTextOfKey &text)
                                           { return text.key == std::string_view(key); });
    return found == std::end(texts) ? nullptr : &found->text;
}

} // namespace fl::i18n
