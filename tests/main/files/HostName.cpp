// SPDX-License-Identifier: MIT
#include "HostName.hpp"

#include <cerrno>
#include <cstring>
#include <utility>

#include <unistd.h>

namespace
{

vclink::test::HostName *current = nullptr;

} // namespace

namespace vclink::test
{

HostName::HostName(const std::string &name)
    : HostName(
          [name](char *buffer, std::size_t size)
          {
              std::strncpy(buffer, name.c_str(), size);
              return 0;
          })
{
}

HostName::HostName(std::function<int(char *, std::size_t)> given) : answer(std::move(given))
{
    current = this;
}

HostName::~HostName()
{
    current = nullptr;
}

} // namespace vclink::test

// The C library declares that neither of them throws.
int gethostname(char *buffer, std::size_t size) noexcept
{
    if (current == nullptr)
    {
        errno = ENOSYS;
        return -1;
    }
    current->errors.push_back(errno);
    current->sizes.push_back(size);
    return current->answer(buffer, size);
}

char *getenv(const char *name) noexcept
{
    const std::string text = name;
    if (current != nullptr && (text == "USER" || text == "LOGNAME"))
        current->variables.push_back(text);
    for (char **variable = ::environ; variable != nullptr && *variable != nullptr; ++variable)
    {
        if (std::strncmp(*variable, name, text.size()) == 0 && (*variable)[text.size()] == '=')
            return *variable + text.size() + 1;
    }
    return nullptr;
}
