// SPDX-License-Identifier: MIT
#pragma once

#include "fl/ustring.hpp"
#include "vclink_host/export.hpp"

/// Operations on the text of a path. They never read the file system.
///
/// The elements of a path: leading slashes are one element, "/", the root; the names between
/// slashes follow. A trailing slash adds no element.
namespace fl::filesystem::detail
{

/// Returns the number of leading slashes, 0 for a relative path.
VCLINK_HOST_EXPORT unsigned long get_root_path_length(const ustring &path);

/// Returns the first element of `path`, whose root has `root_length` code units. Empty for an empty
/// path.
VCLINK_HOST_EXPORT ustring extract_first_element(const ustring &path, unsigned long root_length);

/// Moves from the element at `position` to the next one.
/// @param position in: the start of the current element; out: the start of the next one, or the
/// path's length if there is none
/// @param element out: the next element, empty if there is none
VCLINK_HOST_EXPORT void move_down(const ustring &path, unsigned long root_length,
                                  unsigned long &position, ustring &element);

/// Appends `name` to `path`. If both are not empty, exactly one separator is between them; an
/// existing one counts. An empty `name` changes nothing.
/// @param native true if the path is in native form; both forms use a slash on this platform
VCLINK_HOST_EXPORT void concatenate_pathname(ustring &path, const ustring &name, bool native);

/// Replaces the extension of the last element (from its last dot, but not a leading one) by
/// `extension`. Adds a dot if `extension` has none. An empty extension removes it.
VCLINK_HOST_EXPORT void replace_extension(ustring &path, const ustring &extension);

/// Returns the path with forward slashes. On this platform a backslash is an ordinary character of
/// a name, so the text is unchanged.
VCLINK_HOST_EXPORT ustring make_generic_form(const ustring &path);

/// Returns the path with the platform's separators.
/// @param native true if `path` is already in native form
VCLINK_HOST_EXPORT ustring make_native_form(const ustring &path, bool native);

/// Returns the path in the form for the system's calls.
VCLINK_HOST_EXPORT ustring make_native_access_form(const ustring &path);

} // namespace fl::filesystem::detail
