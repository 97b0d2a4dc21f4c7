// SPDX-License-Identifier: MIT
#include "expectedOutcomes.hpp"

#include <algorithm>
#include <vector>

#include <git2/errors.h>

#include "Operation.hpp"
#include "fl/i18n/MessageCatalog.hpp"
#include "fl/i18n/VkLocale.hpp"
#include "support/strings.hpp"
#include "support/text.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::test
{
namespace
{

constexpr int any = 0;

/// A failing call that does not end its operation with an exception of its own.
struct Tolerance
{
    /// how the names of the operations begin
    std::string operations;
    std::string function;
    /// which of the function's calls, and with which code
    std::size_t call = any;
    int code = any;
    std::string outcome;
    /// whether only the call that has done its work is tolerated
    bool isAfter = false;
};

/// The function and how the names of its operations begin.
struct Unexamined
{
    std::string operations;
    std::string function;
};

bool isMerge(const std::string &operation)
{
    return startsWith(operation, "merge");
}

std::string textOf(const resource_core::BaseMsgID &message)
{
    return asUtf8(fl::i18n::MessageCatalog::get_message(message, fl::i18n::VkLocale::global()));
}

std::string failureIn(const std::string &operation, int code, int errorClass,
                      const std::string &text)
{
    using shared_vclink::git::LibGit2Error;
    return isMerge(operation) ? mergeFailure(textOf(LibGit2Error(code, errorClass, asUtf16(text))))
                              : failure(code, errorClass, text);
}

const std::vector<Unexamined> &allUnexamined()
{
    static const std::vector<Unexamined> functions{
        {"", "git_libgit2_init"},
        {"", "git_libgit2_shutdown"},
        {"", "git_libgit2_version"},
        {"", "git_merge_driver_register"},
        {"", "git_merge_driver_unregister"},
        {"", "git_status_foreach_ext"},
        {"", "git_attr_cache_flush"},
        {"", "git_oid_cpy"},
        {"", "git_oid_fmt"},
        {"", "git_index_caps"},
        {"merge", "git_merge_analysis"},
        {"merge", "git_attr_get"},
    };
    return functions;
}

std::string missed(const std::string &file)
{
    return failure(GIT_ERROR, GIT_ERROR_OS,
                   "could not read '" + file + "', which is tracked: Input/output error");
}

std::vector<Tolerance> tolerancesOfCommits(const std::string &operation, const std::string &normal)
{
    const std::string isOtherTip =
        failureIn(operation, GIT_EMODIFIED, GIT_ERROR_OBJECT,
                  "failed to create commit: current tip is not the first parent");
    return {
        // A HEAD that can't be read makes the commit a first one, which libgit2 refuses.
        {"commitFirst", "git_reference_dwim", any, any, normal},
        {"commitUnreadable", "git_reference_dwim", any, any, normal},
        {"commitUnreadable", "git_commit_lookup", any, any, normal},
        {"commit", "git_reference_dwim", 1, any, isOtherTip},
        {"commit", "git_commit_lookup", 1, any, isOtherTip},
        // There is no commit then, for all one knows, and the text is what making it has left:
        // none,
        // or that of a look for the branch. A fast-forward makes none, and looks for the one that
        // it
        // goes to.
        {"mergeFastForward", "git_object_lookup", any, GIT_ENOTFOUND,
         failureIn(operation, GIT_ENOTFOUND, GIT_ERROR_OS, injectedText)},
        {"merge", "git_object_lookup", any, GIT_ENOTFOUND, failureIn(operation, GIT_ERROR, 0, "")},
        {"commitFirst", "git_object_lookup", any, GIT_ENOTFOUND,
         failure(GIT_ERROR, GIT_ERROR_REFERENCE, "reference 'refs/heads/main' not found")},
        {"commit", "git_object_lookup", any, GIT_ENOTFOUND, failure(GIT_ERROR, 0, "")},
        // The identity comes from the environment then.
        {"", "git_signature_default", any, GIT_ENOTFOUND, normal},
        // A file that is there, and not in the refreshed index, was missed.
        {"commitSparse", "git_index_find", 2, GIT_ENOTFOUND, missed("other")},
        {"commitSparse", "git_index_find", any, GIT_ENOTFOUND, normal},
        {"commitUnreadable", "git_index_find", 1, GIT_ENOTFOUND, missed("file")},
        {"commitUnreadable", "git_index_find", 2, GIT_ENOTFOUND, missed("other")},
        {"commitUnreadable", "git_index_find", any, GIT_ENOTFOUND, normal},
        // The refresh takes the files that can't be taken by their paths.
        {"commit", "git_diff_index_to_workdir", any, any, normal},
        {"merge", "git_diff_index_to_workdir", any, any, normal},
        {"commit", "git_index_add_bypath", any, any, normal},
        {"commit", "git_index_remove_bypath", any, any, normal},
        // So does the addition.
        {"markResolved", "git_diff_index_to_workdir", any, any, normal},
        {"markResolved", "git_index_add_bypath", any, any, normal},
        // The content that an id in a file names can be in another repository.
        {"commitIdentified", "git_odb_read", any, GIT_ENOTFOUND, normal},
        {"addFilesIdentified", "git_odb_read", any, GIT_ENOTFOUND, normal},
        // The text of the failure is the injected one then.
        {"commit", "git_error_set_str", any, any, failure(GIT_ERROR, GIT_ERROR_OS, injectedText)},
    };
}

std::vector<Tolerance> tolerancesOfMerges(const std::string &operation, const std::string &normal)
{
    const std::string isOtherMerge =
        failureIn(operation, GIT_EMODIFIED, GIT_ERROR_MERGE,
                  "the merge was not committed, because another process has moved the current "
                  "branch or ended the merge meanwhile: see git status");
    const std::string hasConflicts = mergeFailure(textOf(shared_vclink::git::HasConflicts()));
    const std::string badState =
        mergeFailure(textOf(shared_vclink::git::UnableToMergeBadRepositoryState()));
    return {
        // Any state but the normal one refuses the merge, any answer but no means conflicts.
        {"merge", "git_repository_state", 1, any, badState},
        {"merge", "git_repository_state", 2, any, badState},
        {"merge", "git_index_has_conflicts", any, any, hasConflicts},
        // The first look-up chooses the words of the message, the second is the commit's, after
        // those of the look before the merge.
        {"merge", "git_reference_dwim", 1, any, normal},
        {"merge", "git_reference_dwim", 2, any, isOtherMerge},
        {"merge", "git_commit_lookup", 3, any, isOtherMerge},
        // There need be no file of patterns.
        {"mergeOverIgnored", "git_config_get_path", any, GIT_ENOTFOUND, normal},
        // Without its command a driver leaves the file to libgit2's own merge.
        {"mergeByTool", "git_config_get_entry", any, any, hasConflicts},
    };
}

std::vector<Tolerance> tolerancesOfRemotes(const std::string &normal)
{
    return {
        // It prunes then, for all one knows. So it does.
        {"fetchGuarded", "git_remote_prune_refs", any, any, normal},
        // What is not there can't be lost.
        {"fetchGuarded", "git_reference_name_to_id", any, GIT_ENOTFOUND, normal},
        {"pushGuarded", "git_reference_name_to_id", any, GIT_ENOTFOUND, normal},
        // The push itself reports what is not here.
        {"pushGuarded", "git_revparse_single", 1, GIT_ENOTFOUND, normal},
        // Below the commits of a shallow repository there are none, for all one knows.
        {"fetchGuarded", "git_commit_lookup", any, GIT_ENOTFOUND,
         failure(GIT_ENONFASTFORWARD, GIT_ERROR_REFERENCE,
                 "'refs/heads/copy' has commits that the remote does not have: fetch into "
                 "refs/remotes/ and merge, or begin the refspec with '+' to discard them")},
        {"pushGuarded", "git_commit_lookup", any, GIT_ENOTFOUND,
         failure(GIT_ERROR, GIT_ERROR_REFERENCE,
                 "'refs/heads/kept' cannot lose commits at the remote, because "
                 "receive.denyNonFastForwards is set there: fetch and merge them")},
        // A setting need not be there.
        {"pushGuarded", "git_config_get_bool", any, GIT_ENOTFOUND, normal},
        {"pushGuarded", "git_config_get_string", any, GIT_ENOTFOUND,
         failure(GIT_ERROR, GIT_ERROR_REFERENCE,
                 "'refs/heads/kept' is checked out in a linked working tree of the remote: push to "
                 "another branch")},
    };
}

std::vector<Tolerance> tolerancesOfLists(const std::string &normal)
{
    return {
        // The end of a list.
        {"getLocalBranches", "git_branch_next", 1, GIT_ITEROVER, "done: "},
        {"getLocalBranches", "git_branch_next", 2, GIT_ITEROVER, "done: refs/heads/main "},
        {"getLocalBranches", "git_branch_next", 3, GIT_ITEROVER, normal},
        {"listBesideBrokenLink", "git_branch_next", any, GIT_ITEROVER, normal},
        // What cannot be looked up is no branch. The first one is the link.
        {"listBesideBrokenLink", "git_branch_lookup", 1, any, normal},
        {"listBesideBrokenLink", "git_branch_lookup", 2, any, "done: refs/heads/topic "},
        {"listBesideBrokenLink", "git_branch_lookup", 3, any, "done: refs/heads/main "},
        {"getRemoteBranches", "git_branch_next", 1, GIT_ITEROVER, "done: "},
        {"getRemoteBranches", "git_branch_next", 2, GIT_ITEROVER, normal},
    };
}

/// The look for patterns that would not end passes over what cannot be read.
std::vector<Tolerance> tolerancesOfPatterns(const std::string &normal)
{
    return {
        {"getF", "git_repository_index", 1, any, normal},
        {"addFiles", "git_repository_index", 1, any, normal},
        {"removeFiles", "git_repository_index", 1, any, normal},
        {"revertFiles", "git_repository_index", 1, any, normal},
        {"commitMergeOfSubmodule", "git_repository_open_ext", 2, any, normal},
        {"commitMergeOfSubmodule", "git_repository_index", 2, any, normal},
        {"switchBranchWithSubmodules", "git_repository_open_ext", 2, any, normal},
        {"switchBranchWithSubmodules", "git_repository_index", 2, any, normal},
        {"mergeSubmodules", "git_repository_open_ext", 2, any, normal},
        {"mergeSubmodules", "git_repository_index", 2, any, normal},
        {"mergeSubmodules", "git_repository_open_ext", 4, any, normal},
        {"mergeSubmodules", "git_repository_index", 6, any, normal},
    };
}

std::vector<Tolerance> tolerancesOfOthers(const std::string &operation, const std::string &normal)
{
    return {
        // Only a missing folder is no failure of a probe.
        {"isAdapterFor", "git_repository_open_ext", any, GIT_ENOTFOUND, "done: 0"},
        // A setting need not be there.
        {"", "git_config_get_mapped", any, GIT_ENOTFOUND, normal},
        // Any answer but no means that the file is listed.
        {"", "git_pathspec_matches_path", any, any, normal},
        // Without a commit the files are taken out of the index.
        {"revertFilesUnborn", "git_revparse_single", any, any, normal},
        // The look for conflicts finds none.
        {"revert", "git_index_has_conflicts", any, any, normal},
        {"merge", "git_index_conflict_next", any, GIT_ITEROVER, normal},
        // Nothing in the index below a name.
        {"", "git_index_find_prefix", any, GIT_ENOTFOUND, normal},
        // A submodule need not be in .gitmodules.
        {"", "git_submodule_lookup", any, GIT_ENOTFOUND, normal},
        // A name that HEAD does not have, and histories without a common commit.
        {"mergeFileAndFolder", "git_tree_entry_bypath", 3, GIT_ENOTFOUND,
         failureIn(operation, GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
                   "the folder 'new' is in the way of the checkout")},
        {"switchBranchOverFolder", "git_tree_entry_bypath", 2, GIT_ENOTFOUND,
         failureIn(operation, GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
                   "the folder 'folder/deep' is in a folder that becomes a file")},
        {"switchBranchOverFolder", "git_tree_entry_bypath", 3, GIT_ENOTFOUND,
         failureIn(operation, GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
                   "the file 'folder/deep/inside' is in a folder that becomes a file")},
        {"", "git_tree_entry_bypath", any, GIT_ENOTFOUND, normal},
        // Both sides have added the file then, for all one knows. What the call has given counts.
        {"mergeBesideLock", "git_merge_bases", any, GIT_ENOTFOUND, normal, true},
        {"mergeBesideLock", "git_merge_bases", any, GIT_ENOTFOUND,
         failureIn(operation, GIT_ECONFLICT, GIT_ERROR_CHECKOUT,
                   "the conflict in 'file' cannot be written beside 'file.lock': merge with 'git "
                   "merge'")},
        {"merge", "git_merge_bases", any, GIT_ENOTFOUND, normal},
        // Only no is an answer.
        {"switchBranchInPartialClone", "git_odb_exists", any, any, normal},
        {"getFolderStatesOfMovedTree", "git_repository_is_worktree", any, any, normal},
        // A state without a name.
        {"getRepositoryState", "git_repository_state", any, any, "done: "},
        // The library ends the comparison itself as soon as it has seen something of that.
        {"commitMergeWithoutMark", "git_diff_tree_to_tree", any, any, normal, true},
        {"commitMergeWithoutMark", "git_merge_bases", any, GIT_ENOTFOUND, normal},
        // Whether the handle has its configuration again.
        {"deleteBranch", "git_repository_set_config", 2, any, normal},
        // No value is what the reads of the configuration make of every failure.
        {"globalFilePath", "git_config_find_global", any, any, "done: nothing"},
        {"read", "git_config_get_string_buf", any, any, "done: nothing"},
        {"read", "git_config_snapshot", any, any, "done: nothing"},
        // The handle then has what it has read before.
        {"write", "git_config_snapshot", any, any, normal},
        // Only the mode of the file is not kept then.
        {"write", "git_config_find_xdg", any, any, normal},
        {"write", "git_config_find_global", any, any, normal},
    };
}

std::vector<Tolerance> tolerancesOf(const std::string &operation, const std::string &normal)
{
    std::vector<Tolerance> all = tolerancesOfCommits(operation, normal);
    const std::vector<Tolerance> merges = tolerancesOfMerges(operation, normal);
    all.insert(all.end(), merges.begin(), merges.end());
    const std::vector<Tolerance> remotes = tolerancesOfRemotes(normal);
    all.insert(all.end(), remotes.begin(), remotes.end());
    const std::vector<Tolerance> lists = tolerancesOfLists(normal);
    all.insert(all.end(), lists.begin(), lists.end());
    const std::vector<Tolerance> patterns = tolerancesOfPatterns(normal);
    all.insert(all.end(), patterns.begin(), patterns.end());
    const std::vector<Tolerance> others = tolerancesOfOthers(operation, normal);
    all.insert(all.end(), others.begin(), others.end());
    return all;
}

} // namespace

bool isUnexamined(const std::string &operation, const std::string &function)
{
    const auto &all = allUnexamined();
    return std::any_of(all.begin(), all.end(),
                       [&](const Unexamined &entry) {
                           return startsWith(operation, entry.operations) &&
                                  function == entry.function;
                       });
}

std::string expectedOutcome(const FaultSite &site, const std::string &normal)
{
    if (isUnexamined(site.operation, site.fault.function))
        return normal;
    const auto tolerances = tolerancesOf(site.operation, normal);
    const auto found =
        std::find_if(tolerances.begin(), tolerances.end(),
                     [&site](const Tolerance &tolerance)
                     {
                         return startsWith(site.operation, tolerance.operations) &&
                                site.fault.function == tolerance.function &&
                                (tolerance.call == any || tolerance.call == site.fault.call) &&
                                (tolerance.code == any || tolerance.code == site.fault.code) &&
                                (!tolerance.isAfter || site.fault.when == When::After);
                     });
    return found != tolerances.end()
               ? found->outcome
               : failureIn(site.operation, site.fault.code, GIT_ERROR_OS, injectedText);
}

} // namespace vclink::test
