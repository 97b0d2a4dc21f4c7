// SPDX-License-Identifier: MIT
#include "BranchCalls.hpp"

#include <tuple>

#include <git2/sys/merge.h>

#include "error/errorUtil/setGitError.hpp"
#include "support/interposition.hpp"

namespace
{

vclink::test::BranchCalls *current = nullptr;
int depth = 0;

class Inside
{
  public:
    Inside()
    {
        ++depth;
    }
    Inside(const Inside &) = delete;
    Inside &operator=(const Inside &) = delete;
    ~Inside()
    {
        --depth;
    }
};

/// Whether the call comes from the library, which is watched.
bool isWatched()
{
    return current != nullptr && depth == 0;
}

/// Notes the call and goes on to libgit2.
template <class Function, class... Arguments>
auto forward(const std::string &name, Arguments... arguments)
{
    if (isWatched())
        current->names.push_back(name.substr(4));
    const Inside inside;
    return vclink::test::findNext<Function>(name.c_str())(arguments...);
}

/// Notes the call, and fails or goes on to libgit2.
template <class Function, class... Arguments>
int answer(const std::string &name, Arguments... arguments)
{
    if (isWatched())
    {
        const auto failure = current->failing.find(name.substr(4));
        if (failure != current->failing.end())
        {
            current->names.push_back(name.substr(4));
            git_error_set_str(GIT_ERROR_OS, "injected");
            return failure->second;
        }
    }
    return forward<Function>(name, arguments...);
}

void noteCheckout(const git_checkout_options *options)
{
    if (!isWatched())
        return;
    current->checkouts.push_back(*options);
    std::vector<std::string> paths;
    for (std::size_t i = 0; i < options->paths.count; ++i)
        paths.emplace_back(options->paths.strings[i]);
    current->checkoutPaths.push_back(paths);
}

auto membersOf(const git_merge_options &options)
{
    return std::tie(options.version, options.flags, options.rename_threshold, options.target_limit,
                    options.metric, options.recursion_limit, options.default_driver,
                    options.file_favor, options.file_flags);
}

void noteMergeOptions(const git_merge_options *options)
{
    git_merge_options initial;
    git_merge_options_init(&initial, GIT_MERGE_OPTIONS_VERSION);
    if (isWatched() && membersOf(initial) != membersOf(*options))
        ++current->changedMergeOptions;
}

} // namespace

namespace vclink::test
{

BranchCalls::BranchCalls()
{
    current = this;
}

BranchCalls::~BranchCalls()
{
    current = nullptr;
}

} // namespace vclink::test

int git_repository_open_ext(git_repository **out, const char *path, unsigned flags,
                            const char *ceilings)
{
    return answer<decltype(git_repository_open_ext)>(__func__, out, path, flags, ceilings);
}

void git_repository_free(git_repository *repository)
{
    forward<decltype(git_repository_free)>(__func__, repository);
}

int git_repository_state(git_repository *repository)
{
    return answer<decltype(git_repository_state)>(__func__, repository);
}

int git_repository_head(git_reference **out, git_repository *repository)
{
    return answer<decltype(git_repository_head)>(__func__, out, repository);
}

int git_repository_set_head(git_repository *repository, const char *name)
{
    return answer<decltype(git_repository_set_head)>(__func__, repository, name);
}

int git_repository_index(git_index **out, git_repository *repository)
{
    return answer<decltype(git_repository_index)>(__func__, out, repository);
}

void git_index_free(git_index *index)
{
    forward<decltype(git_index_free)>(__func__, index);
}

int git_index_has_conflicts(const git_index *index)
{
    return answer<decltype(git_index_has_conflicts)>(__func__, index);
}

int git_index_conflict_iterator_new(git_index_conflict_iterator **out, git_index *index)
{
    return answer<decltype(git_index_conflict_iterator_new)>(__func__, out, index);
}

int git_index_conflict_next(const git_index_entry **ancestor, const git_index_entry **ours,
                            const git_index_entry **theirs, git_index_conflict_iterator *iterator)
{
    return answer<decltype(git_index_conflict_next)>(__func__, ancestor, ours, theirs, iterator);
}

void git_index_conflict_iterator_free(git_index_conflict_iterator *iterator)
{
    forward<decltype(git_index_conflict_iterator_free)>(__func__, iterator);
}

int git_revparse_single(git_object **out, git_repository *repository, const char *spec)
{
    return answer<decltype(git_revparse_single)>(__func__, out, repository, spec);
}

int git_object_lookup(git_object **out, git_repository *repository, const git_oid *id,
                      git_object_t type)
{
    return answer<decltype(git_object_lookup)>(__func__, out, repository, id, type);
}

void git_object_free(git_object *object)
{
    forward<decltype(git_object_free)>(__func__, object);
}

int git_annotated_commit_lookup(git_annotated_commit **out, git_repository *repository,
                                const git_oid *id)
{
    return answer<decltype(git_annotated_commit_lookup)>(__func__, out, repository, id);
}

void git_annotated_commit_free(git_annotated_commit *commit)
{
    forward<decltype(git_annotated_commit_free)>(__func__, commit);
}

int git_merge_analysis(git_merge_analysis_t *analysis, git_merge_preference_t *preference,
                       git_repository *repository, const git_annotated_commit **heads,
                       std::size_t count)
{
    return answer<decltype(git_merge_analysis)>(__func__, analysis, preference, repository, heads,
                                                count);
}

int git_merge(git_repository *repository, const git_annotated_commit **heads, std::size_t count,
              const git_merge_options *options, const git_checkout_options *checkout)
{
    noteMergeOptions(options);
    noteCheckout(checkout);
    return answer<decltype(git_merge)>(__func__, repository, heads, count, options, checkout);
}

int git_checkout_tree(git_repository *repository, const git_object *tree,
                      const git_checkout_options *options)
{
    noteCheckout(options);
    return answer<decltype(git_checkout_tree)>(__func__, repository, tree, options);
}

int git_checkout_index(git_repository *repository, git_index *index,
                       const git_checkout_options *options)
{
    noteCheckout(options);
    return answer<decltype(git_checkout_index)>(__func__, repository, index, options);
}

int git_reference_dwim(git_reference **out, git_repository *repository, const char *name)
{
    return answer<decltype(git_reference_dwim)>(__func__, out, repository, name);
}

int git_reference_set_target(git_reference **out, git_reference *reference, const git_oid *id,
                             const char *message)
{
    const int code =
        answer<decltype(git_reference_set_target)>(__func__, out, reference, id, message);
    if (isWatched() && message != nullptr)
        current->names.emplace_back("a message for the reflog");
    return code;
}

void git_reference_free(git_reference *reference)
{
    forward<decltype(git_reference_free)>(__func__, reference);
}

int git_branch_iterator_new(git_branch_iterator **out, git_repository *repository,
                            git_branch_t type)
{
    return answer<decltype(git_branch_iterator_new)>(__func__, out, repository, type);
}

int git_branch_next(git_reference **out, git_branch_t *type, git_branch_iterator *iterator)
{
    return answer<decltype(git_branch_next)>(__func__, out, type, iterator);
}

void git_branch_iterator_free(git_branch_iterator *iterator)
{
    forward<decltype(git_branch_iterator_free)>(__func__, iterator);
}

int git_branch_lookup(git_reference **out, git_repository *repository, const char *name,
                      git_branch_t type)
{
    return answer<decltype(git_branch_lookup)>(__func__, out, repository, name, type);
}

int git_branch_create(git_reference **out, git_repository *repository, const char *name,
                      const git_commit *target, int force)
{
    return answer<decltype(git_branch_create)>(__func__, out, repository, name, target, force);
}

int git_branch_delete(git_reference *branch)
{
    return answer<decltype(git_branch_delete)>(__func__, branch);
}

int git_branch_name(const char **out, const git_reference *branch)
{
    return answer<decltype(git_branch_name)>(__func__, out, branch);
}

int git_attr_get(const char **out, git_repository *repository, std::uint32_t flags,
                 const char *path, const char *name)
{
    if (isWatched())
        current->attributeFlags.push_back(flags);
    return answer<decltype(git_attr_get)>(__func__, out, repository, flags, path, name);
}

git_attr_value_t git_attr_value(const char *value)
{
    if (isWatched() && current->onAttributeValue)
        return static_cast<git_attr_value_t>(current->onAttributeValue());
    return forward<decltype(git_attr_value)>(__func__, value);
}

int git_attr_cache_flush(git_repository *repository)
{
    return answer<decltype(git_attr_cache_flush)>(__func__, repository);
}

int git_config_open_default(git_config **out)
{
    return answer<decltype(git_config_open_default)>(__func__, out);
}

int git_config_open_global(git_config **out, git_config *config)
{
    return answer<decltype(git_config_open_global)>(__func__, out, config);
}

void git_config_free(git_config *config)
{
    forward<decltype(git_config_free)>(__func__, config);
}

int git_config_get_string_buf(git_buf *out, const git_config *config, const char *name)
{
    return answer<decltype(git_config_get_string_buf)>(__func__, out, config, name);
}

int git_config_set_string(git_config *config, const char *name, const char *value)
{
    return answer<decltype(git_config_set_string)>(__func__, config, name, value);
}

int git_config_find_global(git_buf *out)
{
    return answer<decltype(git_config_find_global)>(__func__, out);
}

int git_libgit2_init()
{
    return answer<decltype(git_libgit2_init)>(__func__);
}

int git_libgit2_shutdown()
{
    return answer<decltype(git_libgit2_shutdown)>(__func__);
}

int git_merge_driver_register(const char *name, git_merge_driver *driver)
{
    return answer<decltype(git_merge_driver_register)>(__func__, name, driver);
}

int git_merge_driver_unregister(const char *name)
{
    return answer<decltype(git_merge_driver_unregister)>(__func__, name);
}
