// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>
#include <vector>

namespace vclink::test
{

/// Whether a call fails instead of reaching libgit2, or after libgit2 has done its work.
enum class When
{
    Before,
    After
};

/// A call of the library that fails.
struct LibGit2Fault
{
    /// empty for whichever function gives a code
    std::string function;
    int code = 0;
    /// 1 for the first of these calls since the recorder was made or cleared, 0 for each of them
    std::size_t call = 0;
    When when = When::Before;
};

/// The text of the error record that a failing call leaves; its class is GIT_ERROR_OS.
inline const char *const injectedText = "injected";

/// The text of the error record after each call that has succeeded: libgit2 leaves texts there
/// where it goes on from a failure of its own. The library never shows it.
inline const char *const earlierText = "left by an earlier call";

/// A call of the library, or an event that a test has noted between two of them.
struct LibGit2Call
{
    std::string name;
    /// whether the function gives an int, which is nearly always a code
    bool givesCode = false;
    /// whether it can fail or releases a handle, or is an event of the test's own
    bool isStep = false;
    /// what it releases
    const void *handle = nullptr;
};

namespace detail
{

/// A function's name, as the compiler writes it.
template <auto Function> constexpr std::string_view nameOf()
{
    constexpr std::string_view begin = "Function = ";
    std::string_view text = __PRETTY_FUNCTION__;
    text.remove_prefix(text.find(begin) + begin.size());
    if (text.front() == '&')
        text.remove_prefix(1);
    return text.substr(0, text.find_first_of(";]"));
}

template <class Function> struct Hooks;
template <class Result, class... Arguments> struct Hooks<Result(Arguments...)>
{
    using Hook = std::function<void(Arguments...)>;
    using Answer = std::function<Result(Result (*)(Arguments...), Arguments...)>;
};
template <auto Function> using HooksOf = Hooks<std::remove_pointer_t<decltype(Function)>>;

class Passing;

} // namespace detail

/// Follows the library's calls of libgit2 while it lives: notes them in order, with the handles
/// that they give out and take back; lets chosen calls fail; shows a test the arguments, or lets it
/// answer in libgit2's place. A program whose tests use it links vclink_test_libgit2_recorder.
///
///     LibGit2Recorder calls;
///     calls.on<git_checkout_tree>(
///         [&](git_repository *, const git_object *, const git_checkout_options *options)
///         { strategies.push_back(options->checkout_strategy); });
///     branches().switchBranch("topic");
///     EXPECT_THAT(calls.steps(), ElementsAre("git_repository_open_ext", "git_branch_lookup",
///     ...)); EXPECT_THAT(calls.openHandles(), IsEmpty());
///
///     calls.clear();
///     calls.fail({{"git_repository_set_head", GIT_ELOCKED}});
///     EXPECT_EQ(failureOf([&] { branches().switchBranch("topic"); }),
///               (Failure{GIT_ELOCKED, GIT_ERROR_OS, injectedText}));
///
/// The functions are those that the library's objects call, so a call that is new in the library is
/// followed as soon as it is built. Naming another function fails the test, because it would have
/// no effect. The tests' own calls of these functions are followed as well, but not those that
/// hooks make. What libgit2 calls of itself is not seen. Only the calls of the thread that made the
/// recorder are seen, and one recorder lives at a time. Its end puts everything back.
class LibGit2Recorder
{
  public:
    /// What becomes of the calls that the library makes in its callbacks, while it is in a call.
    enum class InCallbacks
    {
        /// They go on to libgit2, and that is all.
        Ignored,
        Followed
    };

    explicit LibGit2Recorder(InCallbacks inCallbacks = InCallbacks::Ignored);
    LibGit2Recorder(const LibGit2Recorder &) = delete;
    LibGit2Recorder &operator=(const LibGit2Recorder &) = delete;
    ~LibGit2Recorder();

    const std::vector<LibGit2Call> &calls() const noexcept
    {
        return calls_;
    }
    /// The names of all calls, in order.
    const std::vector<std::string> &names() const noexcept
    {
        return names_;
    }
    /// The names of the calls that can fail or that release a handle: those whose order matters,
    /// without the many that read something of what is there.
    const std::vector<std::string> &steps() const noexcept
    {
        return steps_;
    }
    /// What was given out and not taken back, by the name of the function that gave it; what was
    /// taken back without being given out, as "foreign".
    std::vector<std::string> openHandles() const;
    /// How often libgit2 was started without being ended.
    int starts() const noexcept
    {
        return starts_;
    }
    /// Notes an event of the test's own among the steps.
    void note(const std::string &event);
    /// Forgets the calls, but not the handles that are open.
    void clear();

    /// Makes these calls fail, and no others any more. If several apply, the first one does.
    void fail(std::vector<LibGit2Fault> faults);

    /// Called with the name of each call, before anything else happens.
    std::function<void(const std::string &name)> onCall;

    /// Calls the hook with the arguments of each call of the function before the call goes on. Each
    /// function has one hook; an empty std::function removes it.
    template <auto Function> void on(typename detail::HooksOf<Function>::Hook hook)
    {
        place(hooks_, detail::nameOf<Function>(),
              hook ? std::make_shared<decltype(hook)>(std::move(hook)) : nullptr);
    }
    /// Lets a test answer instead of libgit2. The answer receives libgit2's own function, which it
    /// can call, and the arguments; `[](auto...) { return -1; }` fits any. An empty std::function
    /// removes the answer.
    template <auto Function> void answer(typename detail::HooksOf<Function>::Answer answer)
    {
        place(answers_, detail::nameOf<Function>(),
              answer ? std::make_shared<decltype(answer)>(std::move(answer)) : nullptr);
    }

  private:
    friend class detail::Passing;
    using Placed = std::map<std::string, std::shared_ptr<void>, std::less<>>;

    static void place(Placed &all, std::string_view function, std::shared_ptr<void> placed);
    void add(const LibGit2Call &call);
    void giveOut(const char *function, const void *handle);
    void takeBack(const char *function, const void *handle);
    void forgetHandlesOf(std::string_view function);
    /// The fault of a call that is noted already.
    std::optional<LibGit2Fault> findFault(std::string_view function) const;

    const InCallbacks inCallbacks_;
    std::vector<LibGit2Call> calls_;
    std::vector<std::string> names_;
    std::vector<std::string> steps_;
    std::vector<LibGit2Fault> faults_;
    std::multimap<const void *, std::string> handles_;
    int starts_ = 0;
    Placed hooks_;
    Placed answers_;
};

/// The functions of libgit2 that the library calls, in the order of their names.
std::vector<std::string> wrappedFunctions();

} // namespace vclink::test
