// SPDX-License-Identifier: MIT
#include "MergeDriverFixture.hpp"

#include <filesystem>

#include <git2.h>

#include "error/errorUtil/GitResult.hpp"
#include "support/strings.hpp"

namespace vclink::test
{

OpenedMerge::OpenedMerge(const GitRepository &repository)
    : repository_(
          git::acquire<git_repository>(git_repository_open, repository.path().c_str()).value())
{
    const auto branch =
        git::acquire<git_reference>(git_reference_dwim, repository_.get(), "theirs").value();
    theirs_ = git::acquire<git_annotated_commit>(git_annotated_commit_from_ref, repository_.get(),
                                                 branch.get())
                  .value();
}

int OpenedMerge::run() const
{
    const git_annotated_commit *heads[] = {theirs_.get()};
    git_checkout_options checkout;
    git_checkout_options_init(&checkout, GIT_CHECKOUT_OPTIONS_VERSION);
    checkout.checkout_strategy = GIT_CHECKOUT_FORCE | GIT_CHECKOUT_ALLOW_CONFLICTS;
    git_merge_options options;
    git_merge_options_init(&options, GIT_MERGE_OPTIONS_VERSION);
    return git_merge(repository_.get(), heads, 1, &options, &checkout);
}

MergeDriverFixture::~MergeDriverFixture()
{
    git::unregisterMergeDrivers(drivers_);
}

void MergeDriverFixture::define(const std::string &driver, const std::string &command) const
{
    repository_.git({"config", "merge." + driver + ".driver", command});
}

void MergeDriverFixture::defineScript(const std::string &driver, const std::string &script)
{
    define(driver, scripts_.shell(script) + " %O %A %B %L %P");
}

void MergeDriverFixture::diverge(const std::function<void()> &base,
                                 const std::function<void()> &ours,
                                 const std::function<void()> &theirs)
{
    base();
    repository_.commitAll("base");
    repository_.git({"checkout", "--quiet", "-b", "theirs"});
    theirs();
    repository_.commitAll("theirs");
    repository_.git({"checkout", "--quiet", "main"});
    ours();
    repository_.commitAll("ours");
}

void MergeDriverFixture::makeConflicts(const std::vector<std::string> &names,
                                       const std::string &attributes)
{
    const auto writing = [&](const std::string &bytes)
    {
        return [this, &names, bytes]
        {
            for (const auto &name : names)
                repository_.write(name, bytes);
        };
    };
    repository_.write(".gitattributes", attributes);
    diverge(writing("base\n"), writing("ours\n"), writing("theirs\n"));
}

void MergeDriverFixture::makeConflict(const std::string &driver)
{
    makeConflicts({"file"}, "file merge=" + driver + "\n");
}

int MergeDriverFixture::merge(TemporaryFiles files) const
{
    const NothingLeft check(environment().temporary());
    const int code = OpenedMerge(repository_).run();
    if (files == TemporaryFiles::Stay)
    {
        for (const auto &entry : std::filesystem::directory_iterator(environment().temporary()))
            std::filesystem::remove_all(entry.path());
    }
    return code;
}

void MergeDriverFixture::mergeOrThrow() const
{
    const NothingLeft check(environment().temporary());
    git::makeResult(OpenedMerge(repository_).run()).value();
}

std::vector<std::string> MergeDriverFixture::index() const
{
    return split(repository_.git({"ls-files", "--format=%(objectmode)%x09%(stage)%x09%(path)"}));
}

std::string MergeDriverFixture::staged(const std::string &name, int stage) const
{
    return repository_.git({"cat-file", "blob", ":" + std::to_string(stage) + ":" + name});
}

bool MergeDriverFixture::isInConflict(const std::string &name) const
{
    return !repository_.git({"ls-files", "--unmerged", "--", name}).empty();
}

} // namespace vclink::test
