// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <set>
#include <string>
#include <vector>

namespace vclink::test
{

/// Whether a call fails instead of reaching libgit2, or after libgit2 has done its work.
enum class When
{
    Before,
    After
};

/// One call of the library that fails.
struct LibGit2Fault
{
    /// 1 for the first call that gives a code
    std::size_t call = 0;
    int code = 0;
    When when = When::Before;
};

/// The text of the error record that a failing call leaves; its class is GIT_ERROR_OS.
inline const char *const injectedText = "injected";

/// Stands between the library and libgit2 in a program whose calls of libgit2 are wrapped: notes
/// the library's calls, what they give out and what they take back, and lets one of them fail. What
/// libgit2 calls of itself is not seen, what a callback of the library calls is. For one thread,
/// and one object at a time.
class LibGit2Faults
{
  public:
    /// Only notes.
    LibGit2Faults();
    explicit LibGit2Faults(const LibGit2Fault &fault);
    LibGit2Faults(const LibGit2Faults &) = delete;
    LibGit2Faults &operator=(const LibGit2Faults &) = delete;
    ~LibGit2Faults();

    /// The names of the calls that give a code, in order.
    const std::vector<std::string> &calls() const noexcept
    {
        return calls_;
    }
    /// The names of all functions called.
    const std::set<std::string> &functions() const noexcept
    {
        return functions_;
    }
    /// What was given out and not taken back, by the name of the function that gave it; what was
    /// taken back without being given out, as "foreign".
    std::vector<std::string> openHandles() const;
    /// How often libgit2 was started without being ended.
    int starts() const noexcept
    {
        return starts_;
    }

    /// For the shims.
    struct Call
    {
        bool isNoted = false;
        bool failsBefore = false;
        bool failsAfter = false;
        int code = 0;
    };
    static Call begin(const char *function, bool givesCode);
    static void fail();
    static void giveOut(const char *function, const void *handle);
    static void takeBack(const char *function, const void *handle);

  private:
    Call note(const char *function, bool givesCode);

    LibGit2Fault fault_;
    std::vector<std::string> calls_;
    std::set<std::string> functions_;
    std::multimap<const void *, std::string> handles_;
    int starts_ = 0;
};

/// The functions of libgit2 that the library imports, in the order of their names.
std::vector<std::string> wrappedFunctions();

} // namespace vclink::test
