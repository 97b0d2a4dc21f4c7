// SPDX-License-Identifier: MIT
#include "LibGit2Recorder.hpp"

#include <algorithm>
#include <iterator>
#include <utility>

#include <git2.h>
#include <gtest/gtest.h>

#include "Passing.hpp"
#include "error/errorUtil/libgit2Errors.hpp"

namespace vclink::test
{
namespace
{

thread_local LibGit2Recorder *current = nullptr;
thread_local int depth = 0;

/// A test that waits for a call that the library does not make can't fail.
void expectWrapped(std::string_view function)
{
    static const std::vector<std::string> wrapped = wrappedFunctions();
    EXPECT_TRUE(std::binary_search(wrapped.begin(), wrapped.end(), function))
        << "the library does not call " << function;
}

} // namespace

namespace detail
{

Unseen::Unseen() noexcept : recorder_(std::exchange(current, nullptr))
{
}

Unseen::~Unseen()
{
    current = recorder_;
}

Passing::Passing(const char *function) noexcept : function_(function), recorder_(current)
{
    const bool isInCallback = depth > 0;
    ++depth;
    if (isInCallback && recorder_ != nullptr &&
        recorder_->inCallbacks_ == LibGit2Recorder::InCallbacks::Ignored)
        recorder_ = nullptr;
}

Passing::~Passing()
{
    --depth;
}

void Passing::note(bool givesCode, bool releases, const void *taken) const
{
    recorder_->add({function_, givesCode, givesCode || releases, taken});
    if (taken != nullptr)
        recorder_->takeBack(function_, taken);
    const std::string_view name = function_;
    recorder_->starts_ += static_cast<int>(name == "git_libgit2_init");
    recorder_->starts_ -= static_cast<int>(name == "git_libgit2_shutdown");
    if (!recorder_->onCall)
        return;
    const Unseen unseen;
    recorder_->onCall(function_);
}

void Passing::giveOut(const void *handle) const
{
    recorder_->giveOut(function_, handle);
}

void Passing::takeBackFromCallbacks() const
{
    if (std::string_view(function_) == "git_clone")
    {
        recorder_->forgetHandlesOf("git_repository_init");
        recorder_->forgetHandlesOf("git_remote_create");
    }
}

void Passing::setError()
{
    const Unseen unseen;
    git_error_set_str(GIT_ERROR_OS, injectedText);
}

void Passing::leaveText() const
{
    const std::string_view name = function_;
    // libgit2 looks at what is left in a callback. After its end nothing can be left. What making a
    // commit leaves is the only sign of a full disk.
    if (depth > 1 || name == "git_libgit2_shutdown" || name == "git_commit_create")
        return;
    const Unseen unseen;
    const git_error *const error = git_error_last();
    if (error == nullptr || error->klass == GIT_ERROR_NONE)
        git_error_set_str(GIT_ERROR_CONFIG, earlierText);
}

} // namespace detail

LibGit2Recorder::LibGit2Recorder(InCallbacks inCallbacks) : inCallbacks_(inCallbacks)
{
    EXPECT_EQ(current, nullptr) << "another recorder is alive";
    if (current == nullptr)
        current = this;
}

LibGit2Recorder::~LibGit2Recorder()
{
    if (current == this)
        current = nullptr;
}

std::vector<std::string> LibGit2Recorder::openHandles() const
{
    std::vector<std::string> open;
    for (const auto &[handle, function] : handles_)
        open.push_back(function);
    return open;
}

void LibGit2Recorder::note(const std::string &event)
{
    add({event, false, true, nullptr});
}

void LibGit2Recorder::clear()
{
    calls_.clear();
    names_.clear();
    steps_.clear();
}

void LibGit2Recorder::fail(std::vector<LibGit2Fault> faults)
{
    for (const auto &fault : faults)
    {
        if (!fault.function.empty())
            expectWrapped(fault.function);
    }
    faults_ = std::move(faults);
}

void LibGit2Recorder::place(Placed &all, std::string_view function, std::shared_ptr<void> placed)
{
    expectWrapped(function);
    if (placed != nullptr)
        all.insert_or_assign(std::string(function), std::move(placed));
    else
        all.erase(std::string(function));
}

std::optional<LibGit2Fault> LibGit2Recorder::findFault(std::string_view function) const
{
    const auto isMeant = [this, function](const LibGit2Fault &fault)
    {
        if (!fault.function.empty() && fault.function != function)
            return false;
        const auto calls = std::count_if(
            calls_.begin(), calls_.end(),
            [&fault](const LibGit2Call &call)
            { return call.givesCode && (fault.function.empty() || fault.function == call.name); });
        return fault.call == 0 || static_cast<std::size_t>(calls) == fault.call;
    };
    const auto found = std::find_if(faults_.begin(), faults_.end(), isMeant);
    return found != faults_.end() ? std::make_optional(*found) : std::nullopt;
}

void LibGit2Recorder::add(const LibGit2Call &call)
{
    calls_.push_back(call);
    names_.push_back(call.name);
    if (call.isStep)
        steps_.push_back(call.name);
}

void LibGit2Recorder::giveOut(const char *function, const void *handle)
{
    handles_.emplace(handle, function);
}

void LibGit2Recorder::takeBack(const char *function, const void *handle)
{
    const auto found = handles_.find(handle);
    if (found != handles_.end())
        handles_.erase(found);
    else
        handles_.emplace(handle, "foreign: " + std::string(function));
}

void LibGit2Recorder::forgetHandlesOf(std::string_view function)
{
    for (auto handle = handles_.begin(); handle != handles_.end();)
        handle = handle->second == function ? handles_.erase(handle) : std::next(handle);
}

} // namespace vclink::test
