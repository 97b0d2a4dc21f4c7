// SPDX-License-Identifier: MIT
#pragma once

#include <boost/version.hpp>

/// The differences between releases of Boost on which tests depend, a line for each.
namespace vclink::test::boost_release
{

constexpr bool isSince(int major, int minor)
{
    return BOOST_VERSION >= major * 100000 + minor * 100;
}

/// A result of Outcome has an error beside its value, made by default. Later releases keep both in
/// one place.
constexpr bool keepsErrorBesideValue = !isSince(1, 76);

/// A header formats numbers into a buffer of unknown size, which the C library cannot check. Not in
/// 1.83.
constexpr bool formatsIntoUnknownBuffers = isSince(1, 84);

} // namespace vclink::test::boost_release
