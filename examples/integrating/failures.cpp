// SPDX-License-Identifier: MIT
#include <exception>
#include <functional>
#include <iostream>

#include "fl/i18n/convert.hpp"
#include "hostTools.hpp"

void runAndReport(const std::function<void()> &operation)
{
    using Kind = host_tools::FailureKind;
    try
    {
        operation();
    }
    catch (...)
    {
        const auto failure = host_tools::describe(std::current_exception());
        switch (failure.kind)
        {
        case Kind::Cancelled:
            break;
        case Kind::AlreadyAdded:
        case Kind::Conflicted:
            std::cout << "These files: " << fl::i18n::ustring_to_utf8(failure.files) << '\n';
            break;
        default:
            std::cout << fl::i18n::ustring_to_utf8(failure.text) << '\n';
        }
        if (failure.isLocked())
            std::cout << "Another program works here. Try again.\n";
    }
}
