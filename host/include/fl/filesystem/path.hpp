// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <utility>

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

namespace fl::filesystem
{
namespace detail
{

/// Names the two character types of a path: the narrow one of the system and the wide one of the
/// host.
template <class Narrow, class Wide> struct path_traits
{
    using narrow_type = Narrow;
    using wide_type = Wide;
};

/// Returns true if the path `left` sorts before `right`. Compares element by element, each by its
/// code units; a path sorts before its continuations. Allocates nothing.
VCLINK_HOST_EXPORT bool less(const ustring &left, const ustring &right) noexcept;

} // namespace detail

/// A path: a text, and a flag for native form. A plain value. The text is unchanged, without
/// normalisation.
template <class Narrow, class Wide, class Traits> class basic_path
{
  public:
    using string_type = std::basic_string<Wide>;

    basic_path() = default;
    basic_path(string_type text, bool native = true) : text_(std::move(text)), native_(native)
    {
    }

    const string_type &string() const noexcept
    {
        return text_;
    }
    bool native() const noexcept
    {
        return native_;
    }

    friend bool operator==(const basic_path &left, const basic_path &right)
    {
        return left.text_ == right.text_;
    }
    friend bool operator!=(const basic_path &left, const basic_path &right)
    {
        return !(left == right);
    }

  private:
    string_type text_;
    bool native_ = true;
};

} // namespace fl::filesystem

/// The path value of the host.
using upath =
    fl::filesystem::basic_path<char, char16_t, fl::filesystem::detail::path_traits<char, char16_t>>;

/// The order of paths in maps and reports; see fl::filesystem::detail::less.
template <> struct std::less<upath>
{
    bool operator()(const upath &left, const upath &right) const noexcept
    {
        return fl::filesystem::detail::less(left.string(), right.string());
    }
};
