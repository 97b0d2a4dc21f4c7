// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

namespace vclink::test
{

/// Stands between the program that links this file and the C library's gethostname and getenv:
/// answers the former, and notes which variables are read. For one thread.
class HostName
{
  public:
    explicit HostName(const std::string &name);
    /// @param answer is given the buffer and its size, and answers with gethostname's result
    explicit HostName(std::function<int(char *buffer, std::size_t size)> answer);
    HostName(const HostName &) = delete;
    HostName &operator=(const HostName &) = delete;
    ~HostName();

    std::function<int(char *buffer, std::size_t size)> answer;
    /// What errno was at each call of gethostname, and the size of its buffer.
    std::vector<int> errors;
    std::vector<std::size_t> sizes;
    /// The variables that were read, in order, as far as they tell a user's name.
    std::vector<std::string> variables;
};

} // namespace vclink::test
