// SPDX-License-Identifier: MIT
#include "LibGit2Faults.hpp"
#include "error/errorUtil/setGitError.hpp"

#include <string_view>

#include <git2.h>

namespace vclink::test
{
namespace
{

LibGit2Faults *current = nullptr;

} // namespace

LibGit2Faults::LibGit2Faults() : LibGit2Faults(LibGit2Fault())
{
}

LibGit2Faults::LibGit2Faults(const LibGit2Fault &fault) : fault_(fault)
{
    current = this;
}

LibGit2Faults::~LibGit2Faults()
{
    current = nullptr;
}

std::vector<std::string> LibGit2Faults::openHandles() const
{
    std::vector<std::string> open;
    for (const auto &[handle, function] : handles_)
        open.push_back(function);
    return open;
}

LibGit2Faults::Call LibGit2Faults::begin(const char *function, bool givesCode)
{
    return current != nullptr ? current->note(function, givesCode) : Call();
}

LibGit2Faults::Call LibGit2Faults::note(const char *function, bool givesCode)
{
    functions_.insert(function);
    if (givesCode)
        calls_.emplace_back(function);
    starts_ += static_cast<int>(std::string_view(function) == "git_libgit2_init");
    starts_ -= static_cast<int>(std::string_view(function) == "git_libgit2_shutdown");
    const bool fails = givesCode && calls_.size() == fault_.call;
    return {true, fails && fault_.when == When::Before, fails && fault_.when == When::After,
            fault_.code};
}

void LibGit2Faults::fail()
{
    // Not a call of the library's.
    LibGit2Faults *const noting = current;
    current = nullptr;
    git_error_set_str(GIT_ERROR_OS, injectedText);
    current = noting;
}

void LibGit2Faults::giveOut(const char *function, const void *handle)
{
    current->handles_.emplace(handle, function);
}

void LibGit2Faults::takeBack(const char *function, const void *handle)
{
    const auto found = current->handles_.find(handle);
    if (found != current->handles_.end())
        current->handles_.erase(found);
    else
        current->handles_.emplace(handle, "foreign: " + std::string(function));
}

} // namespace vclink::test
