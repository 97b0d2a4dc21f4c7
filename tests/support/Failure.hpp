// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <iosfwd>
#include <optional>
#include <string>

namespace vclink::test
{

/// What a LibGit2Exception says.
struct Failure
{
    int code = 0;
    int errorClass = 0;
    std::string text;
};

bool operator==(const Failure &left, const Failure &right);
std::ostream &operator<<(std::ostream &stream, const Failure &failure);
/// As text.
std::string printed(const Failure &failure);

/// Returns the LibGit2Exception that `action` throws. The test fails if it throws none, one of
/// another class, or one whose message does not show its text.
Failure failureOf(const std::function<void()> &action);
/// The same of an action that may also succeed.
std::optional<Failure> failureIfAny(const std::function<void()> &action);

} // namespace vclink::test
